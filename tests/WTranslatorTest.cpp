// WTranslatorTest.cpp: structured exceptions that become C++ exceptions, and those that must not.
//
// A real dump takes seconds, so that only the first test writes some; the others have the library's CreateFileW fail,
// which leaves one line in the log for each dump that was to be written.

#include "KTPublic.h"
#include "LogLines.h"
#include "WChildProcess.h"
#include "WDumps.h"
#include "WFaults.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <boost/thread/thread.hpp>

#include <algorithm>
#include <atomic>
#include <functional>
#include <string>

namespace {

HANDLE WINAPI RefuseFile(LPCWSTR, DWORD, DWORD, LPSECURITY_ATTRIBUTES, DWORD, DWORD, HANDLE) {
    SetLastError(ERROR_ACCESS_DENIED);
    return INVALID_HANDLE_VALUE;
}

// Counts the dumps that are tried while it lives, and lets none be written.
class NoDumps {
  public:
    std::ptrdiff_t CountTried() {
        auto const lines = m_Log.Take();
        return std::count(
            lines.begin(), lines.end(),
            "Assert failed: CreateFile failed. Error: 5 at source/private/exceptions/WKTExceptionUtils:97");
    }

  private:
    WImportHook m_Hook{L"KTPublic.dll", "CreateFileW", &RefuseFile};
    LogLines m_Log;
};

struct Counter {
    int &count;
    ~Counter() { ++count; }
};

// The code of the exception that comes out of `body`, 0 for none; `destroyed` counts the frames that were unwound.
DWORD CodeOf(std::function<void()> const &body, int &destroyed) {
    try {
        Counter const outer{destroyed};
        Counter const inner{destroyed};
        body();
    } catch (WKTSEHException const &exception) {
        EXPECT_STREQ(kKTExceptionMsgStr, exception.GetExceptionType());
        return exception.getSENumber();
    }
    return 0;
}

DWORD CodeOf(std::function<void()> const &body) {
    int destroyed = 0;
    DWORD const code = CodeOf(body, destroyed);
    EXPECT_EQ(2, destroyed);
    return code;
}

// Runs the body on a thread of its own and waits for its end.
void OnThread(std::function<void()> const &body) {
    boost::thread thread(body);
    thread.join();
}

constexpr DWORD kCaught = 55;

DWORD StatusOfChild(char const *name, std::size_t dumps, std::size_t argument = 0) {
    WChildProcess::Options options;
    options.argument = std::to_wstring(argument);
    WChildProcess child(name, options);
    EXPECT_TRUE(child.Started());
    DWORD const status = child.ExitStatus();
    EXPECT_EQ(dumps, wdumps::In(child.Temp()).size()) << child.Log();
    return status;
}

TEST(TranslatorTest, EveryKindBecomesAnExceptionWithADumpOnTheMainThread) {
    KTExceptionUtils::InstallExceptionHandler();
    wdumps::Observer const observer;
    wdumps::Written written;
    for (WFault const &fault : kFaults) {
        SCOPED_TRACE(fault.name);
        EXPECT_EQ(fault.code, CodeOf(fault.raise));
        auto const dumps = written.Take();
        ASSERT_EQ(1U, dumps.size());
        EXPECT_EQ(fault.code, wdumps::Observer::Last().code);
        wdumps::Keep(*dumps.begin(), fault.name, wdumps::Observer::Last());
    }
}

TEST(TranslatorTest, EveryKindBecomesAnExceptionOnASecondThread) {
    NoDumps dumps;
    OnThread([] {
        KTExceptionUtils::InstallExceptionHandler();
        for (WFault const &fault : kFaults) {
            SCOPED_TRACE(fault.name);
            EXPECT_EQ(fault.code, CodeOf(fault.raise));
            EXPECT_EQ(fault.code, CodeOf(fault.raise)); // and again
        }
    });
    EXPECT_EQ(static_cast<std::ptrdiff_t>(2 * std::size(kFaults)), dumps.CountTried());
}

// Faults between library and host: in the library's own code, below the library in a callback, and with the library's
// frames between the fault and the catch.
void CallBackThatFaults(char const *, char const *, char const *) { wfaults::Read(); }

TEST(TranslatorTest, FaultsInTheLibraryAndInCallbacksAreCaughtByTheHost) {
    NoDumps dumps;
    KTExceptionUtils::InstallExceptionHandler();
    EXPECT_EQ(EXCEPTION_ACCESS_VIOLATION,
              CodeOf([] { KTString const text(wfaults::BadAddress<unsigned short const *>()); }));
    EXPECT_EQ(EXCEPTION_ACCESS_VIOLATION, CodeOf([] { delete wfaults::BadAddress<KTFile *>(); }));
    KTUserEventUtil::RegisterLogFunctionCallBack(&CallBackThatFaults);
    EXPECT_EQ(EXCEPTION_ACCESS_VIOLATION, CodeOf([] { KTUserEventUtil::LogUserEvent("a", "b", "c"); }));
    EXPECT_EQ(3, dumps.CountTried());
}

// Caught where it is raised, in the same function, and rethrown through frames of all kinds.
TEST(TranslatorTest, AFaultIsCaughtInItsOwnFunctionAndRethrown) {
    NoDumps const dumps;
    KTExceptionUtils::InstallExceptionHandler();
    int steps = 0;
    try {
        try {
            *wfaults::BadAddress<int volatile *>() = 1;
        } catch (KTFatalException const &) {
            ++steps;
            throw;
        }
    } catch (std::exception const &exception) {
        ++steps;
        EXPECT_STREQ("kKTExceptionMsg", exception.what());
    }
    EXPECT_EQ(2, steps);
}

// An exception object stays whole while another fault is handled inside its catch clause.
TEST(TranslatorTest, AFaultInACatchClauseIsAnExceptionToo) {
    NoDumps const dumps;
    KTExceptionUtils::InstallExceptionHandler();
    try {
        wfaults::Divide();
        FAIL();
    } catch (WKTSEHException const &outer) {
        EXPECT_EQ(EXCEPTION_ACCESS_VIOLATION, CodeOf(&wfaults::Write));
        EXPECT_EQ(EXCEPTION_INT_DIVIDE_BY_ZERO, outer.getSENumber());
    }
}

// ---- what is left alone ----

std::atomic<DWORD> g_PassedOn;

// Comes after the library's handler, and takes what that passes on.
LONG CALLBACK TakePassedOn(EXCEPTION_POINTERS *pointers) {
    g_PassedOn = pointers->ExceptionRecord->ExceptionCode;
    return EXCEPTION_CONTINUE_EXECUTION;
}

DWORD PassedOn(DWORD code) {
    g_PassedOn = 0;
    void *const handler = AddVectoredExceptionHandler(0, &TakePassedOn);
    RaiseException(code, 0, 0, nullptr);
    RemoveVectoredExceptionHandler(handler);
    return g_PassedOn;
}

TEST(TranslatorTest, CodesOfTheCppRunTimeAndMessagesArePassedOn) {
    NoDumps dumps;
    KTExceptionUtils::InstallExceptionHandler();
    // Both compilers' throws; success and information severity: debugger output, remote calls.
    for (DWORD const code :
         {0x20474343U, 0x21474343U, 0x22474343U, 0xE06D7363U, 0x00001234U, 0x40010006U, 0x60001234U, 1722U}) {
        EXPECT_EQ(code, PassedOn(code));
    }
    EXPECT_EQ(0, dumps.CountTried());
}

TEST(TranslatorTest, CppExceptionsAndTheLastErrorAreLeftAlone) {
    NoDumps dumps;
    KTExceptionUtils::InstallExceptionHandler();
    SetLastError(1234);
    try {
        throw 7;
    } catch (int number) {
        EXPECT_EQ(7, number);
    }
    PassedOn(0x40001234);
    EXPECT_EQ(1234U, GetLastError());
    EXPECT_EQ(0, dumps.CountTried());
}

// The system tries some things in guarded blocks of its own and answers with a value.
TEST(TranslatorTest, TheSystemsOwnGuardedBlocksKeepTheirExceptions) {
    NoDumps dumps;
    KTExceptionUtils::InstallExceptionHandler();
    EXPECT_EQ(0, lstrlenW(wfaults::BadAddress<wchar_t const *>()));
    EXPECT_NE(FALSE, IsBadReadPtr(wfaults::BadAddress<void const *>(), 4));
    OutputDebugStringA("a message to debuggers");
    EXPECT_EQ(0, dumps.CountTried());
    EXPECT_EQ(EXCEPTION_ACCESS_VIOLATION, CodeOf(&wfaults::Read)); // still on guard
}

TEST(TranslatorTest, AThreadWithoutTranslatorIsLeftAlone) {
    NoDumps dumps;
    KTExceptionUtils::InstallExceptionHandler(); // this thread's
    OnThread([] {
        EXPECT_EQ(wfaults::kOwnCode, PassedOn(wfaults::kOwnCode));
        EXPECT_EQ(static_cast<DWORD>(EXCEPTION_BREAKPOINT), PassedOn(EXCEPTION_BREAKPOINT));
    });
    EXPECT_EQ(0, dumps.CountTried());
}

TEST(TranslatorTest, DISABLED_FaultOnAThreadWithoutTranslator) {
    KTExceptionUtils::InstallExceptionHandler();
    OnThread([] {
        try {
            kFaults[std::stoul(WChildProcess::Argument())].raise();
        } catch (...) {
            ExitProcess(kCaught);
        }
    });
}

TEST(TranslatorTest, EveryKindOnAThreadWithoutTranslatorEndsTheProcessAsTheSystemDoes) {
    for (std::size_t i = 0; i < std::size(kFaults); ++i) {
        SCOPED_TRACE(kFaults[i].name);
        EXPECT_EQ(kFaults[i].code, StatusOfChild("TranslatorTest.DISABLED_FaultOnAThreadWithoutTranslator", 0, i));
    }
}

// ---- saved and restored ----

TEST(TranslatorTest, RestoringLeavesTheThreadAsItWasBeforeTheFirstInstallation) {
    NoDumps dumps;
    OnThread([] {
        KTExceptionUtils &utils = KTExceptionUtils::GetInstance();
        utils.RestorePreviousHandler(); // nothing to restore
        EXPECT_EQ(wfaults::kOwnCode, PassedOn(wfaults::kOwnCode));
        KTExceptionUtils::InstallExceptionHandler();
        KTExceptionUtils::InstallExceptionHandler();
        EXPECT_EQ(wfaults::kOwnCode, CodeOf(&wfaults::Own));
        utils.RestorePreviousHandler();
        EXPECT_EQ(wfaults::kOwnCode, PassedOn(wfaults::kOwnCode));
        utils.RestorePreviousHandler();
        EXPECT_EQ(wfaults::kOwnCode, PassedOn(wfaults::kOwnCode));
        KTExceptionUtils::InstallExceptionHandler();
        EXPECT_EQ(wfaults::kOwnCode, CodeOf(&wfaults::Own));
    });
    EXPECT_EQ(2, dumps.CountTried());
}

TEST(TranslatorTest, ThreadsAreRestoredOneByOne) {
    NoDumps const dumps;
    KTExceptionUtils::InstallExceptionHandler();
    OnThread([] {
        KTExceptionUtils::InstallExceptionHandler();
        KTExceptionUtils::GetInstance().RestorePreviousHandler();
    });
    EXPECT_EQ(wfaults::kOwnCode, CodeOf(&wfaults::Own));
}

// ---- no way on ----

// A stack overflow is left to the system.
[[gnu::noinline]] int Recurse(int volatile *outer) {
    int volatile block[1024];
    block[0] = *outer + 1;
    int volatile *volatile inner = block;
    return block[0] < 0 ? 0 : Recurse(inner) + block[0];
}

void OverflowTheStack() {
    try {
        int volatile start = 0;
        Recurse(&start);
    } catch (...) {
        ExitProcess(kCaught);
    }
}

TEST(TranslatorTest, DISABLED_OverflowTheStackWithoutTranslator) { OverflowTheStack(); }

TEST(TranslatorTest, DISABLED_OverflowTheStack) {
    KTExceptionUtils::InstallExceptionHandler();
    OverflowTheStack();
}

TEST(TranslatorTest, AStackOverflowEndsTheProcessAsTheSystemDoes) {
    DWORD const status = StatusOfChild("TranslatorTest.DISABLED_OverflowTheStackWithoutTranslator", 0);
    EXPECT_NE(kCaught, status);
    EXPECT_EQ(status, StatusOfChild("TranslatorTest.DISABLED_OverflowTheStack", 0));
}

extern "C" void KTFaultWithDamagedFrame();

// A function whose frame is found by rbp, which it has lost when it faults.
asm(R"(
    .text
    .globl KTFaultWithDamagedFrame
    .def KTFaultWithDamagedFrame; .scl 2; .type 32; .endef
    .seh_proc KTFaultWithDamagedFrame
KTFaultWithDamagedFrame:
    pushq %rbp
    .seh_pushreg %rbp
    movq %rsp, %rbp
    .seh_setframe %rbp, 0
    .seh_endprologue
    movl $0x40, %ebp
    movl $0, (%rbp)
    popq %rbp
    ret
    .seh_endproc
)");

TEST(TranslatorTest, DISABLED_FaultOnADamagedStack) {
    KTExceptionUtils::InstallExceptionHandler();
    try {
        KTFaultWithDamagedFrame();
    } catch (...) {
        ExitProcess(kCaught);
    }
}

TEST(TranslatorTest, AFaultOnADamagedStackIsDumpedAndEndsTheProcess) {
    EXPECT_EQ(EXCEPTION_ACCESS_VIOLATION, StatusOfChild("TranslatorTest.DISABLED_FaultOnADamagedStack", 1));
}

TEST(TranslatorTest, DISABLED_FaultInANoexceptFunction) {
    KTExceptionUtils::InstallExceptionHandler();
    std::set_terminate([] { TerminateProcess(GetCurrentProcess(), 77); });
    try {
        []() noexcept { wfaults::Read(); }();
    } catch (...) {
        ExitProcess(kCaught);
    }
}

// As any exception that leaves such a function; the dump is written before.
TEST(TranslatorTest, AFaultThatLeavesANoexceptFunctionTerminates) {
    EXPECT_EQ(77U, StatusOfChild("TranslatorTest.DISABLED_FaultInANoexceptFunction", 1));
}

// ---- failures ----

HANDLE WINAPI FaultInCreateFile(LPCWSTR, DWORD, DWORD, LPSECURITY_ATTRIBUTES, DWORD, DWORD, HANDLE) {
    wfaults::Write();
    return INVALID_HANDLE_VALUE;
}

TEST(TranslatorTest, AFaultOfTheDumpWriterDoesNotReplaceTheFirst) {
    WImportHook const hook(L"KTPublic.dll", "CreateFileW", &FaultInCreateFile);
    ASSERT_TRUE(hook.IsActive());
    LogLines log;
    KTExceptionUtils::InstallExceptionHandler();
    EXPECT_EQ(EXCEPTION_INT_DIVIDE_BY_ZERO, CodeOf(&wfaults::Divide));
    EXPECT_EQ((std::vector<std::string>{
                  "Assert failed: The crash dump was given up at source/private/exceptions/WKTSEHException:34"}),
              log.Take());
    EXPECT_EQ(wfaults::kOwnCode, CodeOf(&wfaults::Own)); // and the next is tried again
    EXPECT_EQ(1U, log.Take().size());
}

// Two threads that fault: the second waits for the first one's dump. The first, when it has left the lock of the dumps and
// woken the second, goes on only once the second writes its own dump, and that dump's writer faults only once the first
// is back in its catch clause.
struct Meeting {
    static std::wstring Name(wchar_t const *what) { return what + std::to_wstring(GetCurrentProcessId()); }

    WSignal firstWrites{Name(L"ktfirstwrites")};
    WSignal secondWaits{Name(L"ktsecondwaits")};
    WSignal secondWrites{Name(L"ktsecondwrites")};
    WSignal firstIsBack{Name(L"ktfirstisback")};
    std::atomic<DWORD> first = 0;
    std::atomic<DWORD> second = 0;
};
Meeting *g_Meeting = nullptr;

HANDLE WINAPI MeetInCreateFile(LPCWSTR, DWORD, DWORD, LPSECURITY_ATTRIBUTES, DWORD, DWORD, HANDLE) {
    if (GetCurrentThreadId() == g_Meeting->first) {
        g_Meeting->firstWrites.Set();
        g_Meeting->secondWaits.IsSetWithin(60000);
    } else {
        g_Meeting->secondWrites.Set();
        g_Meeting->firstIsBack.IsSetWithin(60000);
        wfaults::Write();
    }
    SetLastError(ERROR_ACCESS_DENIED);
    return INVALID_HANDLE_VALUE;
}

DWORD WINAPI MeetInWait(HANDLE handle, DWORD milliseconds, BOOL isAlertable) {
    if (GetCurrentThreadId() == g_Meeting->second) {
        g_Meeting->secondWaits.Set();
    }
    return WaitForSingleObjectEx(handle, milliseconds, isAlertable);
}

BOOL WINAPI MeetInSetEvent(HANDLE event) {
    BOOL const isSet = SetEvent(event);
    if (GetCurrentThreadId() == g_Meeting->first) {
        g_Meeting->secondWrites.IsSetWithin(60000);
    }
    return isSet;
}

TEST(TranslatorTest, DISABLED_TwoDumpsInTurn) {
    Meeting meeting;
    g_Meeting = &meeting;
    WImportHook const file(L"KTPublic.dll", "CreateFileW", &MeetInCreateFile);
    WImportHook const wait(L"KTPublic.dll", "WaitForSingleObjectEx", &MeetInWait);
    WImportHook const wake(L"KTPublic.dll", "SetEvent", &MeetInSetEvent);
    ASSERT_TRUE(file.IsActive() && wait.IsActive() && wake.IsActive());
    boost::thread first([&] {
        meeting.first = GetCurrentThreadId();
        KTExceptionUtils::InstallExceptionHandler();
        EXPECT_EQ(EXCEPTION_INT_DIVIDE_BY_ZERO, CodeOf(&wfaults::Divide));
        meeting.firstIsBack.Set();
    });
    boost::thread second([&] {
        KTExceptionUtils::InstallExceptionHandler();
        EXPECT_TRUE(meeting.firstWrites.IsSetWithin(60000));
        meeting.second = GetCurrentThreadId();
        EXPECT_EQ(wfaults::kOwnCode, CodeOf(&wfaults::Own));
    });
    first.join();
    second.join();
    EXPECT_TRUE(meeting.secondWaits.IsSetWithin(0) && meeting.secondWrites.IsSetWithin(0)) << "they did not meet";
}

TEST(TranslatorTest, AFaultOfTheDumpWriterDoesNotHangBehindAnotherThreadsDump) {
    EXPECT_EQ(0U, StatusOfChild("TranslatorTest.DISABLED_TwoDumpsInTurn", 0));
}

void *RefuseHandler(ULONG, void *) { return nullptr; }

// A fresh process, as the handler is registered once.
TEST(TranslatorTest, DISABLED_InstallWithoutHandler) {
    WImportHook const hook(L"KTPublic.dll", "AddVectoredExceptionHandler", &RefuseHandler);
    ASSERT_TRUE(hook.IsActive());
    LogLines log;
    KTExceptionUtils::InstallExceptionHandler();
    EXPECT_EQ((std::vector<std::string>{"Assert failed: Failed to install exception handler functions at "
                                        "source/private/exceptions/KTExceptionUtils:81"}),
              log.Take());
}

TEST(TranslatorTest, AFailedInstallationIsReported) {
    EXPECT_EQ(0U, StatusOfChild("TranslatorTest.DISABLED_InstallWithoutHandler", 0));
}

TEST(TranslatorTest, DISABLED_LoadDumpWriter) {
    EXPECT_EQ(nullptr, GetModuleHandleW(L"dbghelp"));
    KTExceptionUtils::InstallExceptionHandler();
    EXPECT_NE(nullptr, GetModuleHandleW(L"dbghelp"));
}

TEST(TranslatorTest, InstallingLoadsTheDumpWriter) {
    EXPECT_EQ(0U, StatusOfChild("TranslatorTest.DISABLED_LoadDumpWriter", 0));
}

} // namespace
