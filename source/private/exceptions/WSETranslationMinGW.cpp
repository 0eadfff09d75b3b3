// WSETranslationMinGW.cpp: turning structured exceptions into C++ exceptions for code compiled by GCC.
//
// A vectored handler looks at every exception of the process and passes on all but those of threads that have a
// translator. For these it keeps the system's record, and has the thread resume in a thunk, below the stack pointer of
// the faulting code, as if that code had called it:
//
//     faulting frame's stack
//     ----------------------  faulting RSP
//     (rounded down to 16)
//     SS                      machine frame: to the unwinder, the thunk was entered by an interrupt of the faulting
//     RSP                     instruction. RIP is one more than its address, since the unwinder takes every return
//     flags                   address as standing behind a call and looks up the byte before.
//     CS
//     RIP + 1
//     ----------------------  the thunk's frame, then the translator's, which throws
//
// Unwinding then runs the destructors of the faulting function and reaches its catch clause, if it was compiled with
// -fnon-call-exceptions: without that option the compiler takes for granted that only calls throw. The faulting code
// itself is never resumed, so its volatile registers are free to carry the thunk's arguments.

#include "WSEGuards.h"
#include "WSETranslation.h"

#include <windows.h>

#include <atomic>
#include <cstring>
#include <iterator>
#include <memory>
#include <stdexcept>

namespace {

// What the translator is given; lives as long as the thread, as the exception object keeps a pointer to it.
struct Fault {
    EXCEPTION_RECORD record;
    CONTEXT context;
    EXCEPTION_POINTERS pointers;
    WKTSETranslator translator;
    bool canUnwind; // false if the stack is damaged
};

struct ThreadState {
    WKTSETranslator translator = nullptr;
    WKTSETranslator previous = nullptr;
    bool isInstalled = false;
    unsigned faultCount = 0;
    Fault faults[2]{}; // a second fault, while the first is being handled, leaves its record alone
    bool isSearching = false;
    bool hasSearchFaulted = false;
    CONTEXT searchStart{};
};

// Codes of the C++ run-times: GCC's throw, unwinding and forced unwinding, and Visual C++'s throw.
bool IsRunTimeCode(DWORD code) {
    return code == 0x20474343 || code == 0x21474343 || code == 0x22474343 || code == 0xE06D7363;
}

// Success and information codes are messages to debuggers and between the system's own parts. A stack overflow leaves
// no stack to translate on: it ends the process as the system does.
bool IsTranslatedCode(DWORD code) {
    return (code & 0x80000000U) != 0 && code != EXCEPTION_STACK_OVERFLOW && !IsRunTimeCode(code);
}

// The system restores only what the flags name; states that lie outside of the structure are not copied with it.
constexpr DWORD kExtendedState = 0x40;

constexpr DWORD kTrapFlag = 0x100;
constexpr DWORD kDirectionFlag = 0x400;
constexpr DWORD kAlignmentFlag = 0x40000;
constexpr WORD kPendingX87Exceptions = 0x80FF;

// A call through a bad pointer: the fault counts as one of the call, whose return address is on the stack.
bool IsBadCall(EXCEPTION_RECORD const &record) {
    constexpr ULONG_PTR kExecute = 8;
    return record.ExceptionCode == EXCEPTION_ACCESS_VIOLATION && record.NumberParameters >= 2 &&
           (record.ExceptionInformation[0] == kExecute ||
            record.ExceptionInformation[1] == reinterpret_cast<ULONG_PTR>(record.ExceptionAddress));
}

} // namespace

extern "C" {

void KTResumeInTranslator(); // the thunk

// A translator that returns has not taken the exception, and nobody else will. On a damaged stack no exception gets
// anywhere: the translator's dump is all that can be saved.
[[noreturn]] __attribute__((used)) void KTTranslateFault(Fault *fault) {
    DWORD const code = fault->record.ExceptionCode;
    if (fault->canUnwind) {
        fault->translator(code, &fault->pointers);
    } else {
        try {
            fault->translator(code, &fault->pointers);
        } catch (...) { // NOLINT(bugprone-empty-catch)
        }
    }
    TerminateProcess(GetCurrentProcess(), code);
    __builtin_unreachable();
}
}

// rcx: the fault; rdx: return address into the faulting function; r8: its stack pointer.
asm(R"(
    .text
    .globl KTResumeInTranslator
    .def KTResumeInTranslator; .scl 2; .type 32; .endef
    .seh_proc KTResumeInTranslator
KTResumeInTranslator:
    pushq $0x2B
    pushq %r8
    pushq $0x2
    pushq $0x33
    pushq %rdx
    .seh_pushframe
    subq $40, %rsp
    .seh_stackalloc 40
    .seh_endprologue
    call KTTranslateFault
    int3
    .seh_endproc
)");

namespace {

Fault &Keep(EXCEPTION_POINTERS const &pointers, ThreadState &state) {
    Fault &fault = state.faults[state.faultCount++ % std::size(state.faults)];
    fault.record = *pointers.ExceptionRecord;
    fault.context = *pointers.ContextRecord;
    fault.context.ContextFlags &= ~kExtendedState;
    fault.pointers = {&fault.record, &fault.context};
    fault.translator = state.translator;
    fault.canUnwind = !state.hasSearchFaulted;
    return fault;
}

// Goes back to the caller of a bad pointer. What is left is the place that the exception counts for.
CONTEXT PlaceOf(EXCEPTION_POINTERS const &pointers) {
    CONTEXT place = *pointers.ContextRecord;
    if (IsBadCall(*pointers.ExceptionRecord)) {
        std::memcpy(&place.Rip, reinterpret_cast<void const *>(place.Rsp), sizeof place.Rip);
        place.Rsp += sizeof place.Rip;
    } else {
        ++place.Rip;
    }
    return place;
}

// A damaged stack may make the search fault in turn: OnException then has this function return from the call of
// RtlCaptureContext a second time. Nobody guards such a stack.
__attribute__((noinline)) bool IsGuarded(CONTEXT const &place, ThreadState &state) {
    state.hasSearchFaulted = false;
    state.isSearching = true;
    RtlCaptureContext(&state.searchStart);
    bool const isGuarded = !state.hasSearchFaulted && WIsGuarded(place);
    state.isSearching = false;
    return isGuarded;
}

void ResumeInThunk(CONTEXT &context, CONTEXT const &place, Fault &fault) {
    context.Rcx = reinterpret_cast<ULONG64>(&fault);
    context.Rdx = place.Rip;
    context.R8 = place.Rsp;
    context.Rsp = place.Rsp & ~ULONG64{15};
    context.Rip = reinterpret_cast<ULONG64>(&KTResumeInTranslator);
    context.EFlags &= ~(kTrapFlag | kDirectionFlag | kAlignmentFlag);
    context.FltSave.StatusWord &= static_cast<WORD>(~kPendingX87Exceptions);
}

LONG CALLBACK OnException(EXCEPTION_POINTERS *pointers);

// The slot of the threads' states and the handler, from the first installation to the library's end.
class Translation {
  public:
    Translation() : m_Slot(FlsAlloc(&FreeState)), m_Handler(AddVectoredExceptionHandler(0, &OnException)) {
        if (m_Slot == FLS_OUT_OF_INDEXES || m_Handler == nullptr) {
            Release();
            throw std::runtime_error("no slot or handler left for structured exceptions");
        }
        WPrepareGuardSearch();
        s_Slot = m_Slot;
    }
    Translation(Translation const &) = delete;
    Translation &operator=(Translation const &) = delete;
    ~Translation() { Release(); }

    static Translation &Get() {
        static Translation translation;
        return translation;
    }

    /// The calling thread's state, or null; leaves the thread's last error as it is.
    static ThreadState *FindState() {
        if (s_Slot == FLS_OUT_OF_INDEXES) {
            return nullptr;
        }
        DWORD const lastError = GetLastError();
        auto *const state = static_cast<ThreadState *>(FlsGetValue(s_Slot));
        SetLastError(lastError);
        return state;
    }

    ThreadState &MakeState() {
        if (ThreadState *const state = FindState()) {
            return *state;
        }
        auto state = std::make_unique<ThreadState>();
        if (FlsSetValue(m_Slot, state.get()) == FALSE) {
            throw std::bad_alloc();
        }
        return *state.release();
    }

  private:
    static void WINAPI FreeState(void *state) { delete static_cast<ThreadState *>(state); }

    void Release() {
        s_Slot = FLS_OUT_OF_INDEXES;
        if (m_Handler != nullptr) {
            RemoveVectoredExceptionHandler(m_Handler);
        }
        if (m_Slot != FLS_OUT_OF_INDEXES) {
            FlsFree(m_Slot);
        }
    }

    static inline std::atomic<DWORD> s_Slot = FLS_OUT_OF_INDEXES;
    DWORD m_Slot;
    void *m_Handler;
};

LONG CALLBACK OnException(EXCEPTION_POINTERS *pointers) {
    if (!IsTranslatedCode(pointers->ExceptionRecord->ExceptionCode)) {
        return EXCEPTION_CONTINUE_SEARCH;
    }
    ThreadState *const state = Translation::FindState();
    if (state == nullptr || state->translator == nullptr) {
        return EXCEPTION_CONTINUE_SEARCH;
    }
    if (state->isSearching) {
        state->hasSearchFaulted = true;
        *pointers->ContextRecord = state->searchStart;
        return EXCEPTION_CONTINUE_EXECUTION;
    }
    if (!WIsOnStack(pointers->ContextRecord->Rsp)) {
        return EXCEPTION_CONTINUE_SEARCH;
    }
    CONTEXT const place = PlaceOf(*pointers);
    if (IsGuarded(place, *state)) {
        return EXCEPTION_CONTINUE_SEARCH;
    }
    ResumeInThunk(*pointers->ContextRecord, place, Keep(*pointers, *state));
    return EXCEPTION_CONTINUE_EXECUTION;
}

} // namespace

WKTSETranslator WInstallTranslator(WKTSETranslator translator) {
    ThreadState &state = Translation::Get().MakeState();
    WKTSETranslator const replaced = state.translator;
    if (replaced != translator) {
        state.previous = replaced;
        state.translator = translator;
        state.isInstalled = true;
    }
    return replaced;
}

void WRestoreTranslator() noexcept {
    ThreadState *const state = Translation::FindState();
    if (state != nullptr && state->isInstalled) {
        state->translator = state->previous;
        state->previous = nullptr;
        state->isInstalled = false;
    }
}
