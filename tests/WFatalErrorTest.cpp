// WFatalErrorTest.cpp: a fatal error from the host's hand-over to the end of the process. Each test is a child process,
// which writes each step to its trace as it happens.

#include "KTPublic.h"
#include "LogLines.h"
#include "WChildProcess.h"
#include "WDumps.h"
#include "WFaults.h"
#include "WImportHook.h"
#include "WMessageBox.h"

#include <gtest/gtest.h>

#include <atomic>
#include <exception>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <string>

namespace {

namespace fs = std::filesystem;

constexpr wchar_t kCaption[] = L"Quillon Veltrain";
constexpr char kNotHandled[] =
    "Assert failed: Failed to handle the exception at source/private/exceptions/KTExceptionUtils:97";

// ---- in the child ----

void Trace(std::string const &step) {
    std::ofstream(fs::temp_directory_path() / "trace.txt", std::ios::binary | std::ios::app) << step << "\n";
}

std::string Narrow(std::wstring const &text) { return {text.begin(), text.end()}; }

// Traces when it is destroyed: never, after a fatal error.
struct TracedAtExit {
    bool isWatching = false;
    ~TracedAtExit() {
        if (isWatching) {
            Trace("static destructor");
        }
    }
};
TracedAtExit g_AtExit;

KTErrorCodeEnum BackUp() {
    Trace(KTExceptionUtils::GetInstance().IsApplicationCrashed() ? "back-up, crashed" : "back-up, not crashed");
    return kKTErrorFailed; // is not used
}

void CleanUpFirst() {
    Trace("clean-up 1");
    KTExceptionUtils::UnRegisterCleanUpCallBack(&CleanUpFirst);
}

void CleanUpSecond() {
    Trace("clean-up 2");
    KTExceptionUtils::UnRegisterCleanUpCallBack(&CleanUpSecond);
}

void SetUpHost() {
    g_AtExit.isWatching = true;
    std::atexit([] { Trace("atexit"); });
    KTExceptionUtils::InstallExceptionHandler();
    RegisterBackUpDataCallBack(&BackUp);
    KTExceptionUtils::RegisterCleanUpCallBack(&CleanUpFirst);
    KTExceptionUtils::RegisterCleanUpCallBack(&CleanUpSecond);
}

void TraceBox(WMessageBox::Seen const &box) {
    Trace("box '" + Narrow(box.text) + "' with " + std::to_string(box.buttons) + " button");
}

// A refused file instead of a dump, which takes seconds.
HANDLE WINAPI RefuseFile(LPCWSTR, DWORD, DWORD, LPSECURITY_ATTRIBUTES, DWORD, DWORD, HANDLE) {
    SetLastError(ERROR_ACCESS_DENIED);
    return INVALID_HANDLE_VALUE;
}

// ---- in the parent ----

struct Outcome {
    DWORD status = 0;
    std::string trace;
    std::string log;
    std::size_t dumps = 0;

    bool HasLogged(std::string const &text) const { return log.find(text) != std::string::npos; }
};

Outcome RunChild(std::string const &test) {
    WChildProcess child("FatalErrorTest.DISABLED_" + test);
    EXPECT_TRUE(child.Started());
    Outcome outcome;
    outcome.status = child.ExitStatus();
    std::ifstream file(child.Temp() / "trace.txt", std::ios::binary);
    outcome.trace.assign(std::istreambuf_iterator<char>(file), {});
    outcome.log = child.Log();
    outcome.dumps = wdumps::In(child.Temp()).size();
    return outcome;
}

// ---- the whole way ----

KTString GiveText(KTString const &key) { return key == "kKTExceptionMsg" ? KTString("All is lost.") : KTString(); }

TEST(FatalErrorTest, DISABLED_AFaultToTheEnd) {
    RegisterMsgStrGetterCallBack(&GiveText);
    KTExceptionMsgManager::RegisterBaseExceptionMsgs(false);
    SetUpHost();
    WMessageBox const user(kCaption, &TraceBox);
    try {
        wfaults::Write();
    } catch (KTException const &exception) {
        Trace("caught");
        KTExceptionUtils::HandleException(exception);
    }
    Trace("went on");
}

TEST(FatalErrorTest, AFaultGoesItsWayInOrder) {
    Outcome const outcome = RunChild("AFaultToTheEnd");
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("caught\nback-up, crashed\nbox 'All is lost.' with 1 button\nclean-up 1\nclean-up 2\n", outcome.trace);
    EXPECT_EQ(1U, outcome.dumps);
    EXPECT_FALSE(outcome.HasLogged("Assert")) << outcome.log;
}

TEST(FatalErrorTest, DISABLED_WithoutCallBacks) {
    WMessageBox const user(kCaption, &TraceBox);
    KTExceptionUtils::HandleException(KTFatalException("kKTOwnKey"));
    Trace("went on");
}

TEST(FatalErrorTest, CallbacksAreOptionalAndTheMessageIsTheExceptions) {
    Outcome const outcome = RunChild("WithoutCallBacks");
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("box 'kKTOwnKey' with 1 button\n", outcome.trace);
}

// ---- second errors ----

TEST(FatalErrorTest, DISABLED_ASecondError) {
    SetUpHost();
    WMessageBox const user(kCaption, [](WMessageBox::Seen const &) {
        Trace("box");
        KTExceptionUtils::HandleException(KTFatalException("second"));
        Trace("second returned");
    });
    KTExceptionUtils::HandleException(KTFatalException("first"));
}

TEST(FatalErrorTest, ASecondErrorReturnsAtOnce) {
    Outcome const outcome = RunChild("ASecondError");
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("back-up, crashed\nbox\nsecond returned\nclean-up 1\nclean-up 2\n", outcome.trace);
}

std::atomic<int> g_Returned;
constexpr int kThreads = 8;

// Waits in the first thread's way until all the others are back.
KTErrorCodeEnum BackUpWhenOthersReturned() {
    for (int attempt = 0; attempt < 3000 && g_Returned < kThreads - 1; ++attempt) {
        Sleep(10);
    }
    Trace("back-up after " + std::to_string(g_Returned));
    return kKTErrorNone;
}

TEST(FatalErrorTest, DISABLED_ManyErrorsTogether) {
    SetUpHost();
    RegisterBackUpDataCallBack(&BackUpWhenOthersReturned);
    WMessageBox const user(kCaption, [](WMessageBox::Seen const &) { Trace("box"); });
    boost::thread_group threads;
    for (int i = 0; i < kThreads; ++i) {
        threads.create_thread([] {
            KTExceptionUtils::HandleException(KTFatalException("one of many"));
            ++g_Returned;
        });
    }
    threads.join_all();
    Trace("went on");
}

TEST(FatalErrorTest, OnlyOneOfManyThreadsComesThrough) {
    Outcome const outcome = RunChild("ManyErrorsTogether");
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("back-up after 7\nbox\nclean-up 1\nclean-up 2\n", outcome.trace);
}

// ---- clean-up callbacks ----

void NeverDone() {
    static int count = 0;
    if (++count == 1000) {
        WSignal(WChildProcess::Argument()).Set();
    }
}

TEST(FatalErrorTest, DISABLED_CleanUpWithoutEnd) {
    KTExceptionUtils::RegisterCleanUpCallBack(&NeverDone);
    KTExceptionUtils::RegisterCleanUpCallBack(&CleanUpSecond);
    WMessageBox const user(kCaption, [](WMessageBox::Seen const &) {});
    KTExceptionUtils::HandleException(KTFatalException("first"));
}

// Kept on purpose: the contract says that a callback unregisters itself.
TEST(FatalErrorTest, ACleanUpCallbackThatStaysIsCalledWithoutEnd) {
    WChildProcess::Options options;
    options.argument = L"ktcleanup" + std::to_wstring(GetCurrentProcessId());
    WSignal called(options.argument);
    WChildProcess child("FatalErrorTest.DISABLED_CleanUpWithoutEnd", options);
    EXPECT_TRUE(called.IsSetWithin(60000));
    EXPECT_FALSE(child.EndsWithin(200));
    child.Kill();
    EXPECT_FALSE(fs::exists(child.Temp() / "trace.txt")); // the second one never had its turn
}

void FaultInCleanUp() {
    Trace("faulting");
    wfaults::Divide();
}

TEST(FatalErrorTest, DISABLED_CleanUpThatFaults) {
    KTExceptionUtils::InstallExceptionHandler();
    KTExceptionUtils::RegisterCleanUpCallBack(&FaultInCleanUp);
    WMessageBox const user(kCaption, [](WMessageBox::Seen const &) {});
    KTExceptionUtils::HandleException(KTFatalException("first"));
    Trace("went on");
}

// The thread's previous translator, none, is back by then.
TEST(FatalErrorTest, AFaultInACleanUpCallbackEndsTheProcessAsTheSystemDoes) {
    Outcome const outcome = RunChild("CleanUpThatFaults");
    EXPECT_EQ(EXCEPTION_INT_DIVIDE_BY_ZERO, outcome.status);
    EXPECT_EQ("faulting\n", outcome.trace);
    EXPECT_EQ(0U, outcome.dumps);
}

void ThrowInCleanUp() {
    KTExceptionUtils::UnRegisterCleanUpCallBack(&ThrowInCleanUp);
    throw std::runtime_error("no clean-up");
}

TEST(FatalErrorTest, DISABLED_CleanUpThatThrows) {
    KTExceptionUtils::RegisterCleanUpCallBack(&ThrowInCleanUp);
    WMessageBox const user(kCaption, [](WMessageBox::Seen const &) {});
    KTExceptionUtils::HandleException(KTFatalException("first"));
    Trace("went on");
}

TEST(FatalErrorTest, AThrowingCleanUpCallbackIsReported) {
    Outcome const outcome = RunChild("CleanUpThatThrows");
    EXPECT_EQ(0U, outcome.status);
    EXPECT_EQ("went on\n", outcome.trace);
    EXPECT_TRUE(outcome.HasLogged(kNotHandled));
}

// ---- a back-up callback in trouble ----

KTErrorCodeEnum BackUpThatThrows() { throw std::runtime_error("no back-up"); }

TEST(FatalErrorTest, DISABLED_BackUpThatThrows) {
    SetUpHost();
    RegisterBackUpDataCallBack(&BackUpThatThrows);
    KTExceptionUtils::HandleException(KTFatalException("first"));
    Trace(KTExceptionUtils::GetInstance().IsApplicationCrashed() ? "went on, crashed" : "went on");
    KTExceptionUtils::HandleException(KTFatalException("second"));
    Trace("second returned");
}

TEST(FatalErrorTest, AThrowingBackUpCallbackIsReported) {
    Outcome const outcome = RunChild("BackUpThatThrows");
    EXPECT_EQ(0U, outcome.status);
    EXPECT_EQ("went on, crashed\nsecond returned\natexit\nstatic destructor\n", outcome.trace);
    EXPECT_TRUE(outcome.HasLogged(kNotHandled));
}

KTErrorCodeEnum BackUpThatFaults() {
    wfaults::Read();
    return kKTErrorNone;
}

TEST(FatalErrorTest, DISABLED_BackUpThatFaults) {
    SetUpHost();
    WImportHook const hook(L"KTPublic.dll", "CreateFileW", &RefuseFile);
    RegisterBackUpDataCallBack(&BackUpThatFaults);
    KTExceptionUtils::HandleException(KTFatalException("first"));
    Trace("went on");
}

TEST(FatalErrorTest, AFaultingBackUpCallbackIsReported) {
    Outcome const outcome = RunChild("BackUpThatFaults");
    EXPECT_EQ(0U, outcome.status);
    EXPECT_EQ("went on\natexit\nstatic destructor\n", outcome.trace);
    EXPECT_TRUE(outcome.HasLogged("CreateFile failed. Error: 5")); // its dump was tried
    EXPECT_TRUE(outcome.HasLogged(kNotHandled));
}

// ---- the message box ----

int WINAPI FaultInBox(HWND owner, LPCWSTR text, LPCWSTR caption, UINT type) {
    Trace("box '" + Narrow(text) + "', '" + Narrow(caption) + "', type " + std::to_string(type) +
          (owner == nullptr ? "" : ", owned"));
    wfaults::Read();
    return IDOK;
}

TEST(FatalErrorTest, DISABLED_BoxThatFaults) {
    SetUpHost();
    WImportHook const file(L"KTPublic.dll", "CreateFileW", &RefuseFile);
    WImportHook const box(L"KTPublic.dll", "MessageBoxW", &FaultInBox);
    KTExceptionUtils::HandleException(KTFatalException("first"));
    Trace("went on");
}

// The translator is still there while the message is shown.
TEST(FatalErrorTest, AFaultOfTheMessageBoxIsReported) {
    Outcome const outcome = RunChild("BoxThatFaults");
    EXPECT_EQ(0U, outcome.status);
    EXPECT_EQ("back-up, crashed\nbox 'first', 'Quillon Veltrain', type 0\nwent on\natexit\nstatic destructor\n",
              outcome.trace);
    EXPECT_TRUE(outcome.HasLogged("CreateFile failed. Error: 5")); // its dump was tried
    EXPECT_TRUE(outcome.HasLogged(kNotHandled));
}

// ---- a host's terminate handler ----

TEST(FatalErrorTest, DISABLED_TerminateHandler) {
    SetUpHost();
    WImportHook const hook(L"KTPublic.dll", "CreateFileW", &RefuseFile);
    std::set_terminate([] { KTExceptionUtils::HandleException(KTFatalException(kKTExceptionMsgStr)); });
    WMessageBox const user(kCaption, [](WMessageBox::Seen const &) { Trace("box"); });
    []() noexcept { wfaults::Read(); }();
}

// A fault that no catch clause can be reached from still saves the work, if the host asks for it.
TEST(FatalErrorTest, ATerminateHandlerMayHandOver) {
    Outcome const outcome = RunChild("TerminateHandler");
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("back-up, crashed\nbox\nclean-up 1\nclean-up 2\n", outcome.trace);
}

// ---- a client handler that leaves it to the default ----

class Delegating final : public IKTExceptionHandler {
  public:
    void HandleException(KTException const &exception) override {
        KTExceptionUtils &utils = KTExceptionUtils::GetInstance();
        Trace(utils.IsApplicationCrashed() ? "client, crashed" : "client, not crashed");
        utils.DefaultHandler(exception);
        Trace("went on");
    }
};

TEST(FatalErrorTest, DISABLED_ClientHandler) {
    static Delegating handler;
    SetUpHost();
    KTExceptionUtils::GetInstance().SetHandler(handler);
    WMessageBox const user(kCaption, [](WMessageBox::Seen const &) { Trace("box"); });
    KTExceptionUtils::HandleException(KTFatalException("first"));
}

TEST(FatalErrorTest, AClientHandlerMayCallTheDefault) {
    Outcome const outcome = RunChild("ClientHandler");
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("client, not crashed\nback-up, crashed\nbox\nclean-up 1\nclean-up 2\n", outcome.trace);
}

} // namespace
