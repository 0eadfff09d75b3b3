// WKTSEHException.cpp: the exception made of a structured exception, and its crash dump.

#include "KTAssert.h"
#include "KTException.h"
#include "KTExceptionMsgManager.h"
#include "KTExceptionUtils.h"
#include "KTLocks.h"

#include <windows.h>

#include <atomic>

namespace {

// The thread that is writing a dump; 0 for none.
std::atomic<DWORD> g_DumpingThread = 0;

// Names the calling thread there while it lives: inside the lock, or it would wipe out the next thread's name.
class Dumping {
  public:
    Dumping() noexcept { g_DumpingThread = GetCurrentThreadId(); }
    Dumping(Dumping const &) = delete;
    Dumping &operator=(Dumping const &) = delete;
    ~Dumping() { g_DumpingThread = 0; }
};

// One dump at a time. A fault of the dump writer itself becomes an exception of this kind, too, on the same thread: that
// one goes without a dump, and the first is thrown as if the dump had failed.
void WriteDump(_EXCEPTION_POINTERS *pointers) {
    if (g_DumpingThread == GetCurrentThreadId()) {
        return;
    }
    try {
        static KTMutex mutex;
        KTLock const lock(mutex);
        Dumping const dumping;
        KTExceptionUtils::GenerateCrashDumpFile(pointers);
    } catch (...) {
        KTAssertFailed("The crash dump was given up", "source/private/exceptions/WKTSEHException", 34);
    }
}

} // namespace

WKTSEHException::WKTSEHException(KTUInt32 code, _EXCEPTION_POINTERS *pointers)
    : KTFatalException(kKTExceptionMsgStr), m_SENumber(code), m_Pointers(pointers) {
    WriteDump(pointers);
}

WKTSEHException::WKTSEHException(WKTSEHException const &other) = default;
WKTSEHException &WKTSEHException::operator=(WKTSEHException const &other) = default;
WKTSEHException::~WKTSEHException() = default;

KTUInt32 WKTSEHException::getSENumber() const { return m_SENumber; }
