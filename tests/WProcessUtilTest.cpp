// WProcessUtilTest.cpp: real processes, and windows that nobody looks after.

#include "KTProcessUtil.h"

#include "KTFileUtil.h"
#include "WChildProcess.h"
#include "WFileFixture.h"
#include "WHandlesLeft.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <string>
#include <vector>

namespace {

using Util = KTProcessUtil;

constexpr wchar_t kLibrary[] = L"KTPublic.dll";
constexpr char kOwnName[] = "test_services.exe";
constexpr RECT kPlace = {40, 50, 240, 150};
constexpr DWORD kNoProcess = 0xFFFFFFF0;

bool operator==(RECT const &a, RECT const &b) { return EqualRect(&a, &b) != FALSE; }

// A window without a frame, so that it is where it is put.
class Window {
  public:
    Window(std::wstring const &title, DWORD style, RECT const &place = kPlace, HWND owner = nullptr)
        : m_Handle(CreateWindowExW(0, L"STATIC", title.c_str(), WS_POPUP | style, place.left, place.top,
                                   place.right - place.left, place.bottom - place.top, owner, nullptr, nullptr,
                                   nullptr)) {
        EXPECT_NE(nullptr, m_Handle);
    }
    Window(Window const &) = delete;
    Window &operator=(Window const &) = delete;
    ~Window() { DestroyWindow(m_Handle); }

    HWND Get() const { return m_Handle; }
    void Raise() const { SetWindowPos(m_Handle, HWND_TOP, 0, 0, 0, 0, SWP_NOMOVE | SWP_NOSIZE | SWP_NOACTIVATE); }

  private:
    HWND m_Handle;
};

std::wstring NameOfSignal(wchar_t const *what, DWORD process) {
    return std::wstring(L"KTPublicTest-") + what + std::to_wstring(process);
}

// A child with a window and a hidden one, which answers no message until it is ended.
class ChildWithWindow {
  public:
    ChildWithWindow() : m_Child("ProcessWithWindow.DISABLED_Waits"), m_Ready(NameOfSignal(L"ready", m_Child.Id())) {
        EXPECT_TRUE(m_Ready.IsSetWithin(60000));
    }

    KTUInt32 Id() const { return m_Child.Id(); }
    void End() { m_Child.Kill(); }
    KTString Title() const { return KTString((L"KT child " + std::to_wstring(Id())).c_str()); }
    HWND Window() const { return FindWindowW(L"STATIC", Title().GetWstring().c_str()); }

  private:
    WChildProcess m_Child;
    WSignal m_Ready;
};

// A process of another program that has started and does nothing.
class IdleProcess {
  public:
    explicit IdleProcess(std::wstring const &program) {
        STARTUPINFOW startup{};
        startup.cb = sizeof startup;
        EXPECT_TRUE(CreateProcessW(program.c_str(), nullptr, nullptr, nullptr, FALSE, CREATE_SUSPENDED, nullptr,
                                   nullptr, &startup, &m_Process));
    }
    IdleProcess(IdleProcess const &) = delete;
    IdleProcess &operator=(IdleProcess const &) = delete;
    ~IdleProcess() {
        End();
        CloseHandle(m_Process.hThread);
        CloseHandle(m_Process.hProcess);
    }

    DWORD Id() const { return m_Process.dwProcessId; }

    // Its handles stay open.
    void End() const {
        TerminateProcess(m_Process.hProcess, 0);
        WaitForSingleObject(m_Process.hProcess, 60000);
    }

  private:
    PROCESS_INFORMATION m_Process{};
};

class ProcessFiles : public WFileFixture {
  protected:
    // A program under a name that nobody else uses.
    std::wstring CopyOfProgram(KTString const &name) const {
        KTPath recorder = KTFileUtil::GetResourcesFolderPath();
        recorder.Append("ktrecorder.exe");
        EXPECT_EQ(KTFileUtil::kErrorNone, KTFileUtil::FileCopy(KTFile(recorder), KTFile(Path(name))));
        return Wide(name);
    }
};

HANDLE WINAPI DenyProcess(DWORD, BOOL, DWORD) {
    SetLastError(ERROR_ACCESS_DENIED);
    return nullptr;
}

struct HungWindow {
    HANDLE ready;
    HANDLE done;
    wchar_t const *title;
};

DWORD WINAPI KeepHungWindow(void *argument) {
    auto const &hung = *static_cast<HungWindow *>(argument);
    Window const window(hung.title, WS_VISIBLE);
    SetEvent(hung.ready);
    WaitForSingleObject(hung.done, INFINITE);
    return 0;
}

} // namespace

TEST(ProcessWithWindow, DISABLED_Waits) {
    DWORD const self = GetCurrentProcessId();
    Window const window(L"KT child " + std::to_wstring(self), WS_VISIBLE);
    Window const hidden(L"KT hidden " + std::to_wstring(self), 0);
    WSignal ready(NameOfSignal(L"ready", self));
    ready.Set();
    WSignal(NameOfSignal(L"never", self)).IsSetWithin(INFINITE);
}

TEST(Process, OwnId) { EXPECT_EQ(GetCurrentProcessId(), Util::GetCurrentProcessPID()); }

TEST(Process, TheSystemHas64Bits) { EXPECT_TRUE(Util::Is64BitOS()); } // or this program would not run

TEST(Process, MemoryIsWhatIsInUse) {
    KTUInt64 const before = Util::GetProcessMemoryUsage(GetCurrentProcessId());
    EXPECT_GT(before, 1U << 20);
    std::vector<char> const more(64U << 20, 'x');
    EXPECT_GT(Util::GetProcessMemoryUsage(GetCurrentProcessId()), before + (32U << 20)) << more.size();
    EXPECT_EQ(0U, Util::GetProcessMemoryUsage(kNoProcess));
    EXPECT_EQ(0U, Util::GetProcessMemoryUsage(0));
}

TEST(Process, AnotherMe) {
    EXPECT_FALSE(Util::IsAnotherMeRunning());
    {
        ChildWithWindow child;
        EXPECT_TRUE(Util::IsAnotherMeRunning());
        child.End();
        EXPECT_FALSE(Util::IsAnotherMeRunning()) << "although a handle of it is open";
    }
    EXPECT_FALSE(Util::IsAnotherMeRunning());
}

TEST_F(ProcessFiles, AnotherMeIsNotAProgramOfTheSameName) {
    IdleProcess const process(CopyOfProgram(kOwnName));
    EXPECT_TRUE(Util::IsProcessRunning(process.Id()));
    EXPECT_FALSE(Util::IsAnotherMeRunning());
}

TEST_F(ProcessFiles, OpenIsByName) {
    std::wstring const program = CopyOfProgram(KTString(L"kt Pr\u00F6cess test.exe"));
    KTString const name(L"kt Pr\u00F6cess test.exe");
    KTString const upper(L"KT PR\u00D6CESS TEST.EXE");
    EXPECT_FALSE(Util::IsProcessOpen(name));
    IdleProcess const process(program);
    EXPECT_TRUE(Util::IsProcessOpen(name));
    EXPECT_TRUE(Util::IsProcessOpen(upper));
    EXPECT_FALSE(Util::IsProcessOpen(KTString(L"kt Pr\u00F6cess test")));
    EXPECT_FALSE(Util::IsProcessOpen(KTString(program.c_str())));
    EXPECT_FALSE(Util::IsProcessOpen(""));
    EXPECT_TRUE(Util::IsProcessOpen(kOwnName));
    process.End();
    EXPECT_FALSE(Util::IsProcessOpen(name)) << "although a handle of it is open";
}

TEST_F(ProcessFiles, RunningIsById) {
    IdleProcess const process(CopyOfProgram("kt running.exe"));
    EXPECT_TRUE(Util::IsProcessRunning(process.Id()));
    EXPECT_TRUE(Util::IsProcessRunning(GetCurrentProcessId()));
    EXPECT_FALSE(Util::IsProcessRunning(0));
    EXPECT_FALSE(Util::IsProcessRunning(kNoProcess));
    process.End();
    EXPECT_FALSE(Util::IsProcessRunning(process.Id())) << "although a handle of it is open";
    WImportHook const hook(kLibrary, "OpenProcess", DenyProcess);
    ASSERT_TRUE(hook.IsActive());
    EXPECT_TRUE(Util::IsProcessRunning(4)) << "there, but not to be asked";
}

// The system takes the numbers behind an id for the id itself.
TEST(Process, NumbersBesideAnIdAreNoProcess) {
    KTUInt32 const self = GetCurrentProcessId();
    for (KTUInt32 const id : {self + 1, self + 2, self + 3}) {
        EXPECT_FALSE(Util::IsProcessRunning(id));
        EXPECT_EQ(0U, Util::GetProcessMemoryUsage(id));
    }
}

TEST(ProcessWindows, AreFoundByIdPathNameAndTitle) {
    EXPECT_EQ(nullptr, Util::GetTopWindowFromProcessID(GetCurrentProcessId())) << "this program shows none";
    RECT rectangle{1, 2, 3, 4};
    EXPECT_FALSE(Util::GetProcessWindowRectUsingProcessImageName(kOwnName, rectangle));
    KTString const path = KTFileUtil::GetCurrentExecutablePath().GetPathAsKTString();
    EXPECT_EQ(nullptr, Util::GetProcessWidnowUsingProcessImagePath(path));

    ChildWithWindow child;
    HWND const window = child.Window();
    ASSERT_NE(nullptr, window);
    EXPECT_EQ(window, Util::GetTopWindowFromProcessID(child.Id()));
    EXPECT_EQ(window, Util::GetProcessWidnowUsingProcessImagePath(path));
    EXPECT_FALSE(Util::GetProcessWindowRectUsingWindowTitle(child.Title() + "1", rectangle));
    EXPECT_TRUE(rectangle == (RECT{1, 2, 3, 4}));
    EXPECT_TRUE(Util::GetProcessWindowRectUsingWindowTitle(child.Title(), rectangle));
    EXPECT_TRUE(rectangle == kPlace);
    rectangle = {};
    EXPECT_TRUE(Util::GetProcessWindowRectUsingProcessImageName("TEST_Services.EXE", rectangle));
    EXPECT_TRUE(rectangle == kPlace);
    KTString const hidden(("KT hidden " + std::to_string(child.Id())).c_str());
    EXPECT_FALSE(Util::GetProcessWindowRectUsingWindowTitle(hidden, rectangle));
    child.End();
    EXPECT_EQ(nullptr, Util::GetTopWindowFromProcessID(child.Id()));
}

TEST(ProcessWindows, PathsMayHaveEveryForm) {
    ChildWithWindow child;
    HWND const window = child.Window();
    std::wstring path = KTFileUtil::GetCurrentExecutablePath().GetPathAsKTString().GetWstring();
    auto const find = [](std::wstring const &text) {
        return Util::GetProcessWidnowUsingProcessImagePath(KTString(text.c_str()));
    };
    std::wstring const original = path;
    CharUpperW(path.data());
    EXPECT_EQ(window, find(path));
    std::replace(path.begin(), path.end(), L'\\', L'/');
    EXPECT_EQ(window, find(path));
    wchar_t shortPath[MAX_PATH];
    ASSERT_NE(0U, GetShortPathNameW(original.c_str(), shortPath, MAX_PATH));
    EXPECT_EQ(window, find(shortPath));
    EXPECT_EQ(nullptr, find(L""));
    EXPECT_EQ(nullptr, find(L"test_services.exe\\"));
    EXPECT_EQ(nullptr, find(L"C:\\no such folder\\test_services.exe"));
    EXPECT_EQ(nullptr, find(L"a<b"));
}

TEST(ProcessWindows, TheNearestToTheUserWithoutOwner) {
    KTUInt32 const self = GetCurrentProcessId();
    Window const first(L"KT first", WS_VISIBLE, {1, 2, 30, 40});
    Window const second(L"KT second", WS_VISIBLE, {5, 6, 70, 80});
    first.Raise();
    EXPECT_EQ(first.Get(), Util::GetTopWindowFromProcessID(self));
    second.Raise();
    EXPECT_EQ(second.Get(), Util::GetTopWindowFromProcessID(self));
    RECT rectangle{};
    EXPECT_TRUE(Util::GetProcessWindowRectUsingProcessImageName(kOwnName, rectangle));
    EXPECT_TRUE(rectangle == (RECT{5, 6, 70, 80}));

    Window const dialog(L"KT dialog", WS_VISIBLE, kPlace, second.Get());
    dialog.Raise();
    EXPECT_EQ(second.Get(), Util::GetTopWindowFromProcessID(self)) << "the dialog is owned";
    ShowWindow(second.Get(), SW_HIDE);
    EXPECT_EQ(first.Get(), Util::GetTopWindowFromProcessID(self));
}

TEST(ProcessWindows, TitlesMatchWholeAndInEitherCase) {
    Window const window(L"KT t\u00EFtle of this test", WS_VISIBLE);
    RECT rectangle{1, 2, 3, 4};
    for (wchar_t const *const title :
         {L"", L"KT t\u00EFtle", L"KT t\u00EFtle of this test!", L"KT title of this test"}) {
        EXPECT_FALSE(Util::GetProcessWindowRectUsingWindowTitle(KTString(title), rectangle));
    }
    Window const untitled(L"", WS_VISIBLE);
    EXPECT_FALSE(Util::GetProcessWindowRectUsingWindowTitle("", rectangle));
    EXPECT_TRUE(rectangle == (RECT{1, 2, 3, 4}));
    EXPECT_TRUE(Util::GetProcessWindowRectUsingWindowTitle(KTString(L"KT T\u00CFTLE of this test"), rectangle));
    EXPECT_TRUE(rectangle == kPlace);
}

// A window of this process whose thread answers nothing: asking it for its title would wait for ever.
TEST(ProcessWindows, AHungWindowIsFoundToo) {
    HungWindow hung{CreateEventW(nullptr, TRUE, FALSE, nullptr), CreateEventW(nullptr, TRUE, FALSE, nullptr),
                    L"KT hung window"};
    HANDLE const thread = CreateThread(nullptr, 0, KeepHungWindow, &hung, 0, nullptr);
    WaitForSingleObject(hung.ready, INFINITE);
    RECT rectangle{};
    EXPECT_TRUE(Util::GetProcessWindowRectUsingWindowTitle("KT hung window", rectangle));
    EXPECT_TRUE(rectangle == kPlace);
    EXPECT_NE(nullptr, Util::GetTopWindowFromProcessID(GetCurrentProcessId()));
    SetEvent(hung.done);
    WaitForSingleObject(thread, INFINITE);
    for (HANDLE const handle : {hung.ready, hung.done, thread}) {
        CloseHandle(handle);
    }
}

TEST(Process, LeavesNoHandle) {
    KTString const path = KTFileUtil::GetCurrentExecutablePath().GetPathAsKTString();
    ExpectNoHandleLeft([&] {
        Util::IsAnotherMeRunning();
        Util::IsProcessOpen(kOwnName);
        Util::IsProcessRunning(GetCurrentProcessId());
        Util::GetProcessMemoryUsage(GetCurrentProcessId());
        Util::GetProcessWidnowUsingProcessImagePath(path);
        Util::GetTopWindowFromProcessID(GetCurrentProcessId());
    });
}
