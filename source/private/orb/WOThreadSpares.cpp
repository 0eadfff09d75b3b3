// WOThreadSpares.cpp: the spare list's slot in Windows thread-local storage.
//
// The system's own slot costs two nanoseconds a visit, the compiler's emulated thread_local several times that. The
// library's entry point frees a thread's list when the thread ends.

#include "OThreadSpares.h"

#include <windows.h>

namespace {

// Until the initialiser below has run, and after the system refused a slot, the index is the invalid one: reads give
// null then and writes fail, which the portable half takes as "no spares".
DWORD g_Slot = TLS_OUT_OF_INDEXES;

struct SlotOwner {
    SlotOwner() { g_Slot = TlsAlloc(); }
};
SlotOwner const g_Owner;

} // namespace

void *OGetThreadSpares() noexcept { return g_Slot == TLS_OUT_OF_INDEXES ? nullptr : TlsGetValue(g_Slot); }

bool OSetThreadSpares(void *head) noexcept { return g_Slot != TLS_OUT_OF_INDEXES && TlsSetValue(g_Slot, head) != 0; }

// The system calls this for every thread that ends and for the library's own unload (`process` is null then, and the
// slot goes back; at process end everything does).
BOOL WINAPI DllMain(HINSTANCE, DWORD reason, LPVOID process) {
    bool const unload = reason == DLL_PROCESS_DETACH && process == nullptr;
    if (reason == DLL_THREAD_DETACH || unload) {
        OFreeSpareBlocks(OGetThreadSpares());
        OSetThreadSpares(nullptr);
    }
    if (unload && g_Slot != TLS_OUT_OF_INDEXES) {
        TlsFree(g_Slot);
        g_Slot = TLS_OUT_OF_INDEXES;
    }
    return TRUE;
}
