// WTimerServiceTest.cpp: what the timer service asks Windows for, and its timers in real time, with generous bounds.

#include "GatedThread.h"
#include "KTException.h"
#include "KTExceptionMsgManager.h"
#include "KTExceptionUtils.h"
#include "KTTimerService.h"
#include "Receiver.h"
#include "TestTimerWindow.h"
#include "WChildProcess.h"
#include "WHandleCount.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>

#include <windows.h>

#include <tlhelp32.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <functional>
#include <set>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

constexpr wchar_t kLibrary[] = L"KTPublic.dll";
constexpr wchar_t kClass[] = L"InvisibleTimerServiceClass";
constexpr long kNever = 1'000'000'000; // milliseconds
constexpr std::chrono::minutes kLong{1};

KT_THREAD_MESSAGE Message(int number) { return static_cast<KT_THREAD_MESSAGE>(number); }

void Ignore(KTInt64, void *) {}

// This process's threads.
std::set<DWORD> Threads() {
    std::set<DWORD> threads;
    HANDLE const snapshot = CreateToolhelp32Snapshot(TH32CS_SNAPTHREAD, 0);
    THREADENTRY32 entry{};
    entry.dwSize = sizeof entry;
    for (BOOL more = Thread32First(snapshot, &entry); more != FALSE; more = Thread32Next(snapshot, &entry)) {
        if (entry.th32OwnerProcessID == GetCurrentProcessId()) {
            threads.insert(entry.th32ThreadID);
        }
    }
    CloseHandle(snapshot);
    return threads;
}

// Pumps this thread's messages until `isOver`, or for a minute. Whether it was over.
bool PumpUntil(std::function<bool()> const &isOver) {
    auto const end = std::chrono::steady_clock::now() + kLong;
    while (!isOver()) {
        if (std::chrono::steady_clock::now() > end) {
            return false;
        }
        MsgWaitForMultipleObjects(0, nullptr, FALSE, 100, QS_ALLINPUT);
        MSG msg;
        while (PeekMessageW(&msg, nullptr, 0, 0, PM_REMOVE) != FALSE) {
            DispatchMessageW(&msg);
        }
    }
    return true;
}

struct Ticks {
    std::atomic<int> count{0};
    std::atomic<DWORD> thread{0};

    static void Count(KTInt64, void *ticks) {
        auto &self = *static_cast<Ticks *>(ticks);
        self.thread = GetCurrentThreadId();
        ++self.count;
    }
};

class WTimers : public testing::Test {
  protected:
    WTimers() { KTCreateTimerService(); }
    ~WTimers() override { KTDestroyTimerService(); }
};

// What the library asked the system for.
struct Calls {
    WNDCLASSEXW description{};
    std::vector<UINT_PTR> killed;
    HWND timerWindow = nullptr;
    UINT_PTR timerId = 0;
    UINT interval = 0;
    TIMERPROC procedure = reinterpret_cast<TIMERPROC>(1);
    int windows = 0;
};
Calls calls;

ATOM WINAPI SeeClass(WNDCLASSEXW const *description) {
    calls.description = *description;
    return RegisterClassExW(description);
}

HWND WINAPI SeeWindow(DWORD exStyle, LPCWSTR className, LPCWSTR name, DWORD style, int x, int y, int width, int height,
                      HWND parent, HMENU menu, HINSTANCE instance, LPVOID data) {
    ++calls.windows;
    EXPECT_EQ(0U, exStyle);
    EXPECT_STREQ(kClass, className);
    EXPECT_STREQ(L"InvisibleTimerService", name);
    EXPECT_EQ(0x80880000U, style);
    EXPECT_EQ(6, x);
    EXPECT_EQ(8, y);
    EXPECT_EQ(10, width);
    EXPECT_EQ(10, height);
    EXPECT_EQ(nullptr, parent);
    EXPECT_EQ(nullptr, menu);
    EXPECT_EQ(nullptr, data);
    return CreateWindowExW(exStyle, className, name, style, x, y, width, height, parent, menu, instance, data);
}

UINT_PTR WINAPI SeeTimer(HWND window, UINT_PTR id, UINT interval, TIMERPROC procedure) {
    calls.timerWindow = window;
    calls.timerId = id;
    calls.interval = interval;
    calls.procedure = procedure;
    return SetTimer(window, id, interval, procedure);
}

BOOL WINAPI SeeKill(HWND window, UINT_PTR id) {
    EXPECT_EQ(FindTimerWindow(), window);
    calls.killed.push_back(id);
    return KillTimer(window, id);
}

} // namespace

// ---- the window ----

TEST(WTimerWindow, IsMadeWithItsClassStyleAndGeometry) {
    calls = {};
    WImportHook const classes(kLibrary, "RegisterClassExW", SeeClass);
    WImportHook const windows(kLibrary, "CreateWindowExW", SeeWindow);
    ASSERT_TRUE(classes.IsActive() && windows.IsActive());
    KTCreateTimerService();
    EXPECT_EQ(1, calls.windows);
    WNDCLASSEXW const &description = calls.description;
    EXPECT_EQ(80U, description.cbSize);
    EXPECT_NE(nullptr, description.lpfnWndProc);
    EXPECT_EQ(0U, description.style);
    EXPECT_EQ(0, description.cbClsExtra);
    EXPECT_EQ(0, description.cbWndExtra);
    EXPECT_EQ(nullptr, description.hInstance);
    EXPECT_EQ(nullptr, description.hIcon);
    EXPECT_EQ(nullptr, description.hCursor);
    EXPECT_EQ(nullptr, description.hbrBackground);
    EXPECT_EQ(nullptr, description.lpszMenuName);
    EXPECT_EQ(nullptr, description.hIconSm);
    KTCreateTimerService();
    EXPECT_EQ(1, calls.windows);
    KTDestroyTimerService();
}

TEST_F(WTimers, TheWindowIsThereAndHidden) {
    HWND const window = FindTimerWindow();
    ASSERT_NE(nullptr, window);
    EXPECT_EQ(GetCurrentThreadId(), GetWindowThreadProcessId(window, nullptr));
    EXPECT_FALSE(IsWindowVisible(window));
    // The system clips siblings of every window without a parent.
    auto const style = static_cast<DWORD>(GetWindowLongPtrW(window, GWL_STYLE));
    EXPECT_EQ(0x80880000U, style & ~static_cast<DWORD>(WS_CLIPSIBLINGS));
    EXPECT_EQ(nullptr, GetParent(window));
    EXPECT_EQ(nullptr, GetMenu(window));
    RECT place{};
    GetWindowRect(window, &place);
    EXPECT_EQ(6, place.left);
    EXPECT_EQ(8, place.top);
    EXPECT_EQ(16, place.right);
    EXPECT_EQ(18, place.bottom);
    WNDCLASSEXW description{};
    description.cbSize = sizeof description;
    ASSERT_NE(0, GetClassInfoExW(GetModuleHandleW(nullptr), kClass, &description));
    EXPECT_EQ(0U, description.style);
    EXPECT_EQ(0, description.cbClsExtra);
    EXPECT_EQ(0, description.cbWndExtra);
    EXPECT_EQ(nullptr, description.hbrBackground);
}

TEST_F(WTimers, TheWindowHandlesTimersAndLeavesTheRestToTheSystem) {
    HWND const window = FindTimerWindow();
    wchar_t text[64]{};
    EXPECT_EQ(21, SendMessageW(window, WM_GETTEXT, 64, reinterpret_cast<LPARAM>(text)));
    EXPECT_STREQ(L"InvisibleTimerService", text);
    Ticks ticks;
    KTInt64 id = 0;
    KTCreateUITimer(kNever, &id, Ticks::Count, &ticks);
    EXPECT_EQ(0, SendMessageW(window, WM_TIMER, static_cast<WPARAM>(id), 77));
    EXPECT_EQ(0, SendMessageW(window, WM_TIMER, static_cast<WPARAM>(id) + 1, 0));
    SendMessageW(window, WM_NULL, static_cast<WPARAM>(id), 0);
    EXPECT_EQ(1, ticks.count);
}

TEST_F(WTimers, TheWindowAndItsTimersEndWithTheService) {
    calls = {};
    Ticks ticks;
    KTInt64 id = 0;
    KTCreateUITimer(kNever, &id, Ticks::Count, &ticks);
    {
        WImportHook const kills(kLibrary, "KillTimer", SeeKill);
        ASSERT_TRUE(kills.IsActive());
        KTDestroyTimerService();
    }
    EXPECT_TRUE(calls.killed.empty()); // they went with the window
    EXPECT_EQ(nullptr, FindTimerWindow());
    WNDCLASSEXW description{};
    description.cbSize = sizeof description;
    EXPECT_EQ(0, GetClassInfoExW(GetModuleHandleW(nullptr), kClass, &description)); // nor is its class left behind
}

TEST(WTimerWindow, OfAThreadThatDoesNotDestroyTheServiceStaysButDoesNothing) {
    KTCreateTimerService();
    HWND const window = FindTimerWindow();
    Ticks ticks;
    KTInt64 id = 0;
    KTCreateUITimer(kNever, &id, Ticks::Count, &ticks);
    boost::thread(&KTDestroyTimerService).join();
    EXPECT_EQ(nullptr, KTTimerService::GetInstance());
    EXPECT_TRUE(IsWindow(window));
    EXPECT_EQ(0, SendMessageW(window, WM_TIMER, static_cast<WPARAM>(id), 0));
    KTCreateTimerService();
    EXPECT_EQ(0, SendMessageW(window, WM_TIMER, static_cast<WPARAM>(id), 0));
    EXPECT_EQ(0, ticks.count);
    EXPECT_TRUE(DestroyWindow(window));
    EXPECT_TRUE(HasTimerWindow());
    KTDestroyTimerService();
}

// ---- the system's timers ----

TEST(WTimerWindow, DISABLED_TheFirstUITimers) {
    KTCreateTimerService();
    KTInt64 first = 0;
    KTCreateUITimer(kNever, &first, Ignore, nullptr);
    KTKillUITimer(first);
    KTInt64 second = 0;
    KTCreateUITimer(kNever, &second, Ignore, nullptr);
    KTDestroyTimerService();
    ExitProcess(first == 1 && second == 2 ? 42 : 1);
}

TEST(WTimerWindow, UITimersAreCountedFromOneInEveryProcess) {
    WChildProcess child("WTimerWindow.DISABLED_TheFirstUITimers");
    ASSERT_TRUE(child.Started());
    EXPECT_EQ(42U, child.ExitStatus());
}

TEST_F(WTimers, AskTheSystemForATimerOfTheWindow) {
    WImportHook const timers(kLibrary, "SetTimer", SeeTimer);
    WImportHook const kills(kLibrary, "KillTimer", SeeKill);
    calls = {};
    KTInt64 id = 0;
    KTCreateUITimer(12'345, &id, Ignore, nullptr);
    EXPECT_EQ(FindTimerWindow(), calls.timerWindow);
    EXPECT_EQ(static_cast<UINT_PTR>(id), calls.timerId);
    EXPECT_EQ(12'345U, calls.interval);
    EXPECT_EQ(nullptr, calls.procedure);
    KTKillUITimer(id);
    KTKillUITimer(id + 1); // whatever the map knows
    EXPECT_EQ((std::vector<UINT_PTR>{calls.timerId, calls.timerId + 1}), calls.killed);
}

TEST_F(WTimers, TickInTheCreatingThreadsPumpOnly) {
    Ticks ticks;
    KTInt64 id = 0;
    KTCreateUITimer(10, &id, Ticks::Count, &ticks);
    Sleep(50);
    EXPECT_EQ(0, ticks.count); // nobody pumped
    EXPECT_TRUE(PumpUntil([&] { return ticks.count >= 3; }));
    EXPECT_EQ(GetCurrentThreadId(), ticks.thread);
    KTKillUITimer(id);
    int const count = ticks.count;
    Ticks others;
    KTInt64 other = 0;
    KTCreateUITimer(10, &other, Ticks::Count, &others);
    EXPECT_TRUE(PumpUntil([&] { return others.count >= 3; }));
    EXPECT_EQ(count, ticks.count);
}

TEST_F(WTimers, ATimerThatKillsItselfTicksOnceInRealTime) {
    static int ownTicks;
    ownTicks = 0;
    KTInt64 id = 0;
    KTCreateUITimer(
        10, &id,
        [](KTInt64 own, void *) {
            ++ownTicks;
            KTKillUITimer(own);
        },
        nullptr);
    Ticks others;
    KTInt64 other = 0;
    KTCreateUITimer(10, &other, Ticks::Count, &others);
    EXPECT_TRUE(PumpUntil([&] { return others.count >= 10; }));
    EXPECT_EQ(1, ownTicks);
}

// ---- the service's thread ----

TEST(WTimerThread, RunsAtTheHighestPriority) {
    std::set<DWORD> const before = Threads();
    KTCreateTimerService();
    // With the first tick the loop has set its priority.
    Receiver receiver;
    KTInt64 id = 0;
    KTCreateTimer(&receiver, 0, &id, Message(100));
    while (receiver.Take().empty()) {
    }
    int highest = 0;
    for (DWORD const thread : Threads()) {
        if (!before.contains(thread)) {
            HANDLE const handle = OpenThread(THREAD_QUERY_INFORMATION, FALSE, thread);
            highest += GetThreadPriority(handle) == THREAD_PRIORITY_HIGHEST ? 1 : 0;
            CloseHandle(handle);
        }
    }
    EXPECT_EQ(1, highest);
    KTDestroyTimerService();
}

TEST(WTimerThread, EndsWithTheServiceAndLeavesNothingBehind) {
    auto const round = [] {
        KTCreateTimerService();
        KTInt64 id = 0;
        Receiver receiver;
        KTCreateTimer(&receiver, 0, &id, Message(100));
        KTCreateUITimer(10, &id, Ignore, nullptr);
        while (receiver.Take().empty()) {
        }
        KTDestroyTimerService();
    };
    round();
    std::size_t const threads = Threads().size();
    std::size_t const handles = CountHandles();
    for (int i = 0; i < 20; ++i) {
        round();
    }
    EXPECT_EQ(threads, Threads().size());
    EXPECT_GE(handles + 2, CountHandles());
}

// ---- real time ----

TEST_F(WTimers, ThreadTimersTickInRealTime) {
    Receiver receiver;
    KTInt64 id = 0;
    auto const start = std::chrono::steady_clock::now();
    KTCreateTimer(&receiver, 50, &id, Message(100));
    std::size_t ticks = 0;
    while (ticks < 5 && std::chrono::steady_clock::now() < start + kLong) {
        ticks += receiver.Take().size();
        Sleep(5);
    }
    auto const elapsed = std::chrono::steady_clock::now() - start;
    EXPECT_GE(ticks, 5U);
    EXPECT_GE(elapsed, std::chrono::milliseconds(5 * 50 - 5 * 10 - 20)); // not early by more than a pass each
    KTKillTimer(id);
}

TEST_F(WTimers, BurstsFireInRealTime) {
    GatedThread receiver;
    receiver.Open();
    receiver.start();
    KTInt64 id = 0;
    auto const start = std::chrono::steady_clock::now();
    KTCreateSingleBurstTimer(&receiver, 100, &id, Message(100));
    EXPECT_TRUE(receiver.Enters(1));
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(100 - 10 - 20));
    receiver.FinishAll();
    EXPECT_EQ(2U, receiver.Messages().size());
}

// ---- exceptions that end the loop ----

namespace {

// What the clock throws next on other threads than the test's, if anything.
std::atomic<int> toThrow{0};
DWORD testThread = 0;
constexpr char kOwnKey[] = "kOwnKey";

void WINAPI ThrowingClock(FILETIME *time) {
    if (GetCurrentThreadId() != testThread) {
        int const what = toThrow.exchange(0);
        if (what == 1) {
            throw KTNonFatalException(kOwnKey);
        }
        if (what == 2) {
            throw std::runtime_error("not of the library");
        }
    }
    GetSystemTimeAsFileTime(time);
}

// The client handler of this program: it cannot be taken back, so it lives for ever.
class Witness : public IKTExceptionHandler {
  public:
    void HandleException(KTException const &exception) override {
        key = exception.GetExceptionType();
        isFatal = dynamic_cast<KTFatalException const *>(&exception) != nullptr;
        handled.Set();
    }

    char const *key = nullptr;
    bool isFatal = false;
    Signal handled;
};

// Lets the loop end by an exception; the service's other operations go on.
Witness &EndLoopBy(int what) {
    Witness &witness = *new Witness;
    KTExceptionUtils::GetInstance().SetHandler(witness);
    testThread = GetCurrentThreadId();
    WImportHook const clock(kLibrary, "GetSystemTimeAsFileTime", ThrowingClock);
    KTCreateTimerService();
    toThrow = what;
    EXPECT_TRUE(witness.handled.IsSet());
    Receiver receiver;
    KTInt64 id = 0;
    KTCreateTimer(&receiver, 0, &id, Message(100)); // the lock is free
    EXPECT_EQ(1, id);
    Ticks ticks;
    KTCreateUITimer(kNever, &id, Ticks::Count, &ticks);
    TickTimerWindow(id);
    EXPECT_EQ(1, ticks.count);
    KTDestroyTimerService();
    EXPECT_TRUE(receiver.Take().empty());
    return witness;
}

} // namespace

TEST(WTimerThread, AnExceptionOfTheLibraryGoesToTheHandlerAsItIs) {
    Witness const &witness = EndLoopBy(1);
    EXPECT_EQ(kOwnKey, witness.key);
    EXPECT_FALSE(witness.isFatal);
}

TEST(WTimerThread, AnyOtherExceptionBecomesAFatalOne) {
    Witness const &witness = EndLoopBy(2);
    EXPECT_EQ(kKTExceptionMsgStr, witness.key);
    EXPECT_TRUE(witness.isFatal);
}

TEST(WTimerThread, AStructuredExceptionGoesToTheHandlerToo) {
    Witness &witness = *new Witness;
    KTExceptionUtils::GetInstance().SetHandler(witness);
    KTCreateTimerService();
    // No thread at all: posting to it reads where nothing is.
    alignas(KTThread) static unsigned char noThread[sizeof(KTThread)];
    KTInt64 id = 0;
    KTCreateTimer(reinterpret_cast<KTThread *>(noThread), 0, &id, Message(100));
    EXPECT_TRUE(witness.handled.IsSet());
    EXPECT_TRUE(witness.isFatal);
    KTDestroyTimerService();
}

TEST(WTimerThread, TheHandlerOfItsExceptionMayDestroyTheService) {
    // As a host's clean-up does after a fatal error: here on the service's own thread, which nobody can wait for there.
    class Destroying : public IKTExceptionHandler {
      public:
        void HandleException(KTException const &) override {
            KTDestroyTimerService();
            destroyed.Set();
        }
        Signal destroyed;
    };
    Destroying &destroying = *new Destroying;
    KTExceptionUtils::GetInstance().SetHandler(destroying);
    testThread = GetCurrentThreadId();
    WImportHook const clock(kLibrary, "GetSystemTimeAsFileTime", ThrowingClock);
    ASSERT_TRUE(clock.IsActive());
    KTCreateTimerService();
    HWND const window = FindTimerWindow();
    toThrow = 1;
    ASSERT_TRUE(destroying.destroyed.IsSet());
    EXPECT_EQ(nullptr, KTTimerService::GetInstance());
    EXPECT_TRUE(DestroyWindow(window)); // it is this thread's, so it stayed
    KTCreateTimerService();
    Receiver receiver;
    KTInt64 id = 0;
    KTCreateTimer(&receiver, 0, &id, Message(100));
    EXPECT_EQ(1, id);
    while (receiver.Take().empty()) {
    }
    KTDestroyTimerService();
}
