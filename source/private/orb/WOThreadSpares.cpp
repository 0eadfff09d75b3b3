// WOThreadSpares.cpp: the slot of a thread's spare blocks in Windows thread-local storage.
//
// The system's own slot costs a nanosecond or two a visit, the compiler's emulated thread_local several times that. The
// first 64 slots are an array in the thread's own block, which <winternl.h> describes; they are read there, as
// TlsGetValue would clear the last error, which must survive the copying of a text. The library's entry point frees a
// thread's blocks when the thread ends.

#include "OThreadSpareLists.h"

#include <windows.h>

#include <winternl.h>

#include <new>

namespace {

// Until the initialiser below has run, and after the system refused a slot, the index is the invalid one.
DWORD g_Slot = TLS_OUT_OF_INDEXES;

// Stands in the slot of a thread that ends, closed, so that blocks which come later are not kept: those of a program's
// own thread-local texts, say.
OThreadSpares g_None;

struct SlotOwner {
    SlotOwner() {
        g_None.Close();
        g_Slot = TlsAlloc();
    }
};
SlotOwner const g_Owner;

class LastErrorKeeper {
  public:
    LastErrorKeeper() noexcept : m_Error(GetLastError()) {}
    ~LastErrorKeeper() { SetLastError(m_Error); }

    LastErrorKeeper(LastErrorKeeper const &) = delete;
    LastErrorKeeper &operator=(LastErrorKeeper const &) = delete;

  private:
    DWORD m_Error;
};

#if defined(__GNUC__)
#pragma GCC diagnostic push
// GCC 12 takes the thread's block, which lies at offset 0 of a segment, for an access through a null pointer.
#pragma GCC diagnostic ignored "-Warray-bounds"
#endif

void *ReadSlot() noexcept {
    if (g_Slot < TLS_MINIMUM_AVAILABLE) {
        return NtCurrentTeb()->TlsSlots[g_Slot];
    }
    LastErrorKeeper const keeper;
    return g_Slot == TLS_OUT_OF_INDEXES ? nullptr : TlsGetValue(g_Slot);
}

#if defined(__GNUC__)
#pragma GCC diagnostic pop
#endif

bool WriteSlot(void *value) noexcept {
    LastErrorKeeper const keeper;
    return g_Slot != TLS_OUT_OF_INDEXES && TlsSetValue(g_Slot, value) != 0;
}

[[gnu::noinline]] OThreadSpares *MakeThreadSpares() noexcept {
    auto *const spares = g_Slot == TLS_OUT_OF_INDEXES ? nullptr : ::new (std::nothrow) OThreadSpares;
    if (spares == nullptr || WriteSlot(spares)) {
        return spares;
    }
    delete spares;
    return nullptr;
}

void EndThreadSpares() noexcept {
    auto *const spares = static_cast<OThreadSpares *>(ReadSlot());
    WriteSlot(&g_None);
    if (spares != &g_None) {
        delete spares;
    }
}

// This thread's spare blocks, made at the first call; null where there is no memory or no slot left for them. Once the
// thread's end has begun: null, or spares that are closed.
OThreadSpares *FindThreadSpares() noexcept {
    auto *const spares = static_cast<OThreadSpares *>(ReadSlot());
    return spares == nullptr ? MakeThreadSpares() : spares;
}

} // namespace

void *OTakeBlock(std::size_t size) { return OTakeBlockFrom(FindThreadSpares, size); }

void OGiveBlock(void *block, std::size_t size) noexcept { OGiveBlockTo(FindThreadSpares, block, size); }

// The system calls this for every thread that ends and for the library's own unload (`process` is null then, and the
// slot goes back; at process end everything does).
BOOL WINAPI DllMain(HINSTANCE, DWORD reason, LPVOID process) {
    bool const unload = reason == DLL_PROCESS_DETACH && process == nullptr;
    if (reason == DLL_THREAD_DETACH || unload) {
        EndThreadSpares();
    }
    if (unload && g_Slot != TLS_OUT_OF_INDEXES) {
        TlsFree(g_Slot);
        g_Slot = TLS_OUT_OF_INDEXES;
    }
    return TRUE;
}
