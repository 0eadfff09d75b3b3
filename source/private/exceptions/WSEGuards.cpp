// WSEGuards.cpp: walks the stack from an exception outwards, as the system will.
//
// A frame's unwind data names its language handler. Two kinds matter: GCC's personality, of frames with destructors or
// catch clauses, and the system's handler of __try blocks, whose data is a table of code ranges:
//
//     u32 count, then for each range: u32 begin, u32 end, u32 filter, u32 target
//
// all from the image's base; a target of 0 makes it a __finally block, which catches nothing. Wine's own libraries keep
// their __try blocks in a list that begins at the thread block's first word instead; on Windows that list is empty.

#include "WSEGuards.h"

#include <cstdint>
#include <cstring>
#include <iterator>

extern "C" int __gxx_personality_seh0(...); // NOLINT(bugprone-reserved-identifier): the run-time's own name

namespace {

constexpr int kMaximalDepth = 2000;

// The frames in which a thread begins: the system's one or two and the run-time's one or two.
constexpr int kBaseFrames = 4;

// Follows the jump through an import table ("FF 25", offset from the next instruction).
void const *FollowImport(void const *code) noexcept {
    auto const *const bytes = static_cast<unsigned char const *>(code);
    if (bytes == nullptr || bytes[0] != 0xFF || bytes[1] != 0x25) {
        return code;
    }
    std::int32_t offset = 0;
    std::memcpy(&offset, bytes + 2, sizeof offset);
    void const *target = nullptr;
    std::memcpy(static_cast<void *>(&target), bytes + 6 + offset, sizeof target);
    return target;
}

struct KnownHandlers {
    void const *cpp = FollowImport(reinterpret_cast<void const *>(&__gxx_personality_seh0));
    void const *guards[4] = {}; // the handler of __try blocks, of each library that brings one

    KnownHandlers() noexcept {
        wchar_t const *const libraries[] = {L"ntdll", L"msvcrt", L"ucrtbase", L"vcruntime140"};
        static_assert(std::size(libraries) == std::size(decltype(guards){}));
        for (std::size_t i = 0; i < std::size(libraries); ++i) {
            if (HMODULE const library = GetModuleHandleW(libraries[i])) {
                guards[i] = reinterpret_cast<void const *>(GetProcAddress(library, "__C_specific_handler"));
            }
        }
    }

    bool IsGuard(void const *handler) const noexcept {
        for (void const *const guard : guards) {
            if (handler != nullptr && handler == guard) {
                return true;
            }
        }
        return false;
    }

    static KnownHandlers const &Get() noexcept {
        static KnownHandlers const handlers;
        return handlers;
    }
};

bool HasExceptBlock(DWORD const *table, ULONG64 offset) noexcept {
    DWORD const *range = table + 1;
    for (DWORD i = 0; i < *table; ++i, range += 4) {
        if (offset >= range[0] && offset < range[1] && range[3] != 0) {
            return true;
        }
    }
    return false;
}

// One frame after the other, from the place of an exception outwards.
class Walk {
  public:
    explicit Walk(CONTEXT const &place) noexcept : m_Context(place) {}

    bool IsAtEnd() const noexcept { return m_Context.Rip == 0 || !WIsOnStack(m_Context.Rsp); }

    /// Leaves the frame; returns its language handler, or null.
    void const *Leave() noexcept {
        m_Code = m_Context.Rip;
        RUNTIME_FUNCTION *const function = RtlLookupFunctionEntry(m_Code, &m_Base, nullptr);
        if (function == nullptr) { // a function that calls nothing: its return address is on top
            std::memcpy(&m_Context.Rip, reinterpret_cast<void const *>(m_Context.Rsp), sizeof m_Context.Rip);
            m_Context.Rsp += sizeof m_Context.Rip;
            return nullptr;
        }
        auto *const handler =
            RtlVirtualUnwind(UNW_FLAG_EHANDLER, m_Base, m_Code, function, &m_Context, &m_Data, &m_Frame, nullptr);
        return handler == nullptr ? nullptr : FollowImport(reinterpret_cast<void const *>(handler));
    }

    /// Whether the frame that was left, one of __try blocks, was in a block that catches.
    bool WasInExceptBlock() const noexcept {
        return HasExceptBlock(static_cast<DWORD const *>(m_Data), m_Code - m_Base);
    }

    /// The stack pointer behind the frame that was left.
    ULONG64 GetStack() const noexcept { return m_Context.Rsp; }

  private:
    CONTEXT m_Context;
    ULONG64 m_Code = 0;
    ULONG64 m_Base = 0;
    void *m_Data = nullptr;
    ULONG64 m_Frame = 0;
};

// Whether the thread block's list has an entry on this piece of stack.
bool IsListed(ULONG64 from, ULONG64 to) noexcept {
    ULONG64 first = 0;
    asm("movq %%gs:0, %0" : "=r"(first));
    return first >= from && first < to;
}

} // namespace

bool WIsOnStack(ULONG64 address) noexcept {
    ULONG_PTR low = 0;
    ULONG_PTR high = 0;
    GetCurrentThreadStackLimits(&low, &high);
    return address > low && address <= high - sizeof address;
}

void WPrepareGuardSearch() noexcept { KnownHandlers::Get(); }

bool WIsGuarded(CONTEXT const &place) noexcept {
    KnownHandlers const &known = KnownHandlers::Get();
    Walk walk(place);
    int guard = -1; // depth of the innermost block
    int depth = 0;
    for (; depth < kMaximalDepth && !walk.IsAtEnd(); ++depth) {
        void const *const handler = walk.Leave();
        if (handler == known.cpp) {
            return guard >= 0 || IsListed(place.Rsp, walk.GetStack());
        }
        if (guard < 0 && known.IsGuard(handler) && walk.WasInExceptBlock()) {
            guard = depth;
        }
    }
    return (guard >= 0 && depth - guard > kBaseFrames) || IsListed(place.Rsp, walk.GetStack());
}
