// WFileLockTest.cpp: the lock between processes: its system calls, its exclusions and its errors.

#include "KTInterProcessFileLock.h"
#include "Units.h"
#include "WChildProcess.h"
#include "WImportHook.h"

#include <boost/interprocess/exceptions.hpp>
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <memory>
#include <string>

namespace {

using boost::interprocess::interprocess_exception;

// An empty file for the time of a test.
class FileToLock {
  public:
    explicit FileToLock(std::wstring const &name = L"lock \u20AC")
        : m_Path(std::filesystem::temp_directory_path() / name) {
        std::ofstream const file(m_Path);
    }
    FileToLock(FileToLock const &) = delete;
    FileToLock &operator=(FileToLock const &) = delete;
    ~FileToLock() {
        std::error_code ignored;
        std::filesystem::remove(m_Path, ignored);
    }

    KTString Path() const { return KTString(m_Path.c_str()); }

  private:
    std::filesystem::path m_Path;
};

// What `action` throws.
template <typename Action> interprocess_exception Thrown(Action action) {
    try {
        action();
    } catch (interprocess_exception const &error) {
        return error;
    }
    ADD_FAILURE() << "nothing thrown";
    return interprocess_exception("");
}

// The system's message for a code, as the exception should carry it.
std::string SystemMessage(DWORD code) {
    char buffer[1024];
    DWORD const length = FormatMessageA(FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS, nullptr, code,
                                        MAKELANGID(LANG_NEUTRAL, SUBLANG_DEFAULT), buffer, sizeof buffer, nullptr);
    std::string message(buffer, length);
    while (!message.empty() && (message.back() == '\r' || message.back() == '\n')) {
        message.pop_back();
    }
    // Boost.Interprocess's own words where the system has none.
    return message.empty() ? "WinApi FormatMessage returned error" : message;
}

// ---- what the library hands to the system ----

struct Call {
    DWORD numbers[5];
    ULONG_PTR overlapped[4];
};

Call g_Call{};
DWORD g_Error = 0;
std::wstring g_Name;

HANDLE WINAPI RecordCreateFile(wchar_t const *name, DWORD access, DWORD share, SECURITY_ATTRIBUTES *security,
                               DWORD disposition, DWORD flags, HANDLE pattern) {
    g_Name = name;
    g_Call = {{access, share, disposition, flags, 0},
              {reinterpret_cast<ULONG_PTR>(security), reinterpret_cast<ULONG_PTR>(pattern), 0, 0}};
    SetLastError(g_Error);
    return INVALID_HANDLE_VALUE;
}

void RecordRange(DWORD flags, DWORD reserved, DWORD low, DWORD high, OVERLAPPED const &start) {
    g_Call = {{flags, reserved, low, high, 0},
              {start.Internal, start.InternalHigh, start.Offset + start.OffsetHigh,
               reinterpret_cast<ULONG_PTR>(start.hEvent)}};
    SetLastError(g_Error);
}

BOOL WINAPI RecordLockFile(HANDLE, DWORD flags, DWORD reserved, DWORD low, DWORD high, OVERLAPPED *start) {
    RecordRange(flags, reserved, low, high, *start);
    return FALSE;
}

BOOL WINAPI RecordUnlockFile(HANDLE, DWORD reserved, DWORD low, DWORD high, OVERLAPPED *start) {
    RecordRange(0, reserved, low, high, *start);
    return FALSE;
}

constexpr wchar_t kLibrary[] = L"KTPublic.dll";

} // namespace

TEST(FileLock, OpensTheFileAsLaidDown) {
    WImportHook const hook(kLibrary, "CreateFileW", &RecordCreateFile);
    ASSERT_TRUE(hook.IsActive());
    g_Error = ERROR_ACCESS_DENIED;
    interprocess_exception const error = Thrown([] { KTInterProcessFileLock const lock("C:\\any"); });
    EXPECT_EQ(g_Call.numbers[0], GENERIC_READ | GENERIC_WRITE);
    EXPECT_EQ(g_Call.numbers[1], static_cast<DWORD>(FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE));
    EXPECT_EQ(g_Call.numbers[2], static_cast<DWORD>(OPEN_EXISTING));
    EXPECT_EQ(g_Call.numbers[3], 0U);
    EXPECT_EQ(g_Call.overlapped[0], 0U); // no security attributes
    EXPECT_EQ(g_Call.overlapped[1], 0U); // no template
    EXPECT_EQ(error.get_native_error(), ERROR_ACCESS_DENIED);
}

TEST(FileLock, OpensFilesInDeepFolders) {
    WImportHook const hook(kLibrary, "CreateFileW", &RecordCreateFile);
    ASSERT_TRUE(hook.IsActive());
    std::wstring const deep = L"C:\\" + std::wstring(200, L'a') + L"\\" + std::wstring(200, L'b') + L"\\x.lock";
    g_Error = ERROR_ACCESS_DENIED;
    Thrown([&] { KTInterProcessFileLock const lock(KTString(deep.c_str())); });
    EXPECT_EQ(g_Name, L"\\\\?\\" + deep) << "without the system's limit of 260 characters";
    // What has no such form goes to the system as it stands, for its own answer.
    Thrown([] { KTInterProcessFileLock const lock("C:\\a*b"); });
    EXPECT_EQ(g_Name, L"C:\\a*b");
}

// Cut at the zero, the name would be that of another file.
TEST(FileLock, ANameWithAZeroInsideIsRefused) {
    FileToLock const file;
    KTString const longer = file.Path() + static_cast<unsigned short>(0) + "x";
    interprocess_exception const error = Thrown([&] { KTInterProcessFileLock const lock(longer); });
    EXPECT_EQ(error.get_native_error(), ERROR_INVALID_NAME);
    EXPECT_EQ(error.get_error_code(), boost::interprocess::path_error);
}

TEST(FileLock, LocksAndUnlocksTheWholeFile) {
    FileToLock const file;
    KTInterProcessFileLock lock(file.Path());
    WImportHook const locking(kLibrary, "LockFileEx", &RecordLockFile);
    WImportHook const unlocking(kLibrary, "UnlockFileEx", &RecordUnlockFile);
    ASSERT_TRUE(locking.IsActive() && unlocking.IsActive());
    g_Error = ERROR_LOCK_VIOLATION;
    EXPECT_FALSE(lock.TryLock());
    EXPECT_EQ(g_Call.numbers[0], static_cast<DWORD>(LOCKFILE_EXCLUSIVE_LOCK | LOCKFILE_FAIL_IMMEDIATELY));
    for (int i = 0; i < 2; ++i) {
        EXPECT_EQ(g_Call.numbers[1], 0U);
        EXPECT_EQ(g_Call.numbers[2], 0xFFFFFFFFU);
        EXPECT_EQ(g_Call.numbers[3], 0xFFFFFFFFU);
        for (ULONG_PTR const field : g_Call.overlapped) {
            EXPECT_EQ(field, 0U);
        }
        g_Error = ERROR_NOT_LOCKED;
        EXPECT_EQ(Thrown([&] { lock.Unlock(); }).get_native_error(), ERROR_NOT_LOCKED);
    }
}

// Boost.Interprocess's table: every pair, a code outside it, and code 0.
TEST(FileLock, ErrorsAreTranslatedByTheTable) {
    using namespace boost::interprocess;
    struct Row {
        DWORD native;
        error_code_t code;
    };
    Row const rows[] = {{5, security_error},
                        {12, security_error},
                        {32, security_error},
                        {33, security_error},
                        {212, security_error},
                        {998, security_error},
                        {19, read_only_error},
                        {21, io_error},
                        {25, io_error},
                        {30, io_error},
                        {29, io_error},
                        {1011, io_error},
                        {1012, io_error},
                        {1013, io_error},
                        {267, path_error},
                        {123, path_error},
                        {2, not_found_error},
                        {3, not_found_error},
                        {55, not_found_error},
                        {2404, busy_error},
                        {2401, busy_error},
                        {142, busy_error},
                        {170, busy_error},
                        {80, already_exists_error},
                        {183, already_exists_error},
                        {145, not_empty_error},
                        {39, out_of_space_error},
                        {112, out_of_space_error},
                        {14, out_of_memory_error},
                        {8, out_of_memory_error},
                        {4, out_of_resource_error},
                        {1, system_error},
                        {87, system_error},
                        {158, system_error}};
    WImportHook const hook(kLibrary, "CreateFileW", &RecordCreateFile);
    for (Row const &row : rows) {
        g_Error = row.native;
        interprocess_exception const error = Thrown([] { KTInterProcessFileLock const lock("C:\\any"); });
        EXPECT_EQ(error.get_native_error(), static_cast<native_error_t>(row.native));
        EXPECT_EQ(error.get_error_code(), row.code) << row.native;
        EXPECT_EQ(error.what(), SystemMessage(row.native)) << row.native;
    }
    EXPECT_EQ(static_cast<int>(system_error), 1);
    g_Error = 0;
    EXPECT_STREQ(Thrown([] { KTInterProcessFileLock const lock("C:\\any"); }).what(), "");
}

TEST(FileLock, NeverCreatesTheFile) {
    std::filesystem::path const missing = std::filesystem::temp_directory_path() / "missing.lock";
    interprocess_exception const error = Thrown([&] { KTInterProcessFileLock const lock(KTString(missing.c_str())); });
    EXPECT_EQ(error.get_native_error(), ERROR_FILE_NOT_FOUND);
    EXPECT_EQ(error.get_error_code(), boost::interprocess::not_found_error);
    EXPECT_EQ(error.what(), SystemMessage(ERROR_FILE_NOT_FOUND));
    EXPECT_FALSE(std::filesystem::exists(missing));
    EXPECT_THROW(KTInterProcessFileLock{KTString()}, std::exception);
}

TEST(FileLock, ExcludesOtherHandlesOfThisProcess) {
    FileToLock const file;
    KTInterProcessFileLock first(file.Path());
    KTInterProcessFileLock second(file.Path());
    EXPECT_TRUE(first.TryLock());
    EXPECT_FALSE(second.TryLock());
    EXPECT_TRUE(first.Unlock());
    EXPECT_TRUE(second.TryLock());
    EXPECT_FALSE(first.TryLock());
    EXPECT_TRUE(second.Unlock());
}

TEST(FileLock, UnlockingWhatIsNotHeldThrows) {
    FileToLock const file;
    KTInterProcessFileLock lock(file.Path());
    EXPECT_THROW(lock.Unlock(), interprocess_exception);
    EXPECT_TRUE(lock.TryLock());
    EXPECT_TRUE(lock.Unlock());
    EXPECT_THROW(lock.Unlock(), interprocess_exception);
}

TEST(FileLock, TheSystemDropsTheLockWithTheHandle) {
    FileToLock const file;
    KTInterProcessFileLock other(file.Path());
    {
        KTInterProcessFileLock lock(file.Path());
        EXPECT_TRUE(lock.TryLock());
        EXPECT_FALSE(other.TryLock());
    }
    EXPECT_TRUE(other.TryLock());
}

TEST(FileLock, TheFileCanBeWrittenAndDeletedMeanwhile) {
    std::filesystem::path const path = std::filesystem::temp_directory_path() / "shared.lock";
    {
        std::ofstream const file(path);
    }
    KTInterProcessFileLock const lock(KTString(path.c_str()));
    EXPECT_TRUE(std::ofstream(path).good());
    EXPECT_TRUE(std::filesystem::remove(path));
}

// ---- two processes ----

TEST(FileLockChild, DISABLED_HoldsTheLock) {
    std::wstring const argument = WChildProcess::Argument();
    std::size_t const bar = argument.find(L'|');
    KTInterProcessFileLock lock(KTString(argument.substr(bar + 1).c_str()));
    ASSERT_TRUE(lock.TryLock());
    WSignal(argument.substr(0, bar)).Set();
    WSignal(argument.substr(0, bar) + L"-end").IsSetWithin(60000);
    lock.Unlock();
}

namespace {

// A child that holds the lock until told to end, or until it is killed.
class Holder {
  public:
    explicit Holder(FileToLock const &file)
        : m_Name(L"kt-file-lock-" + std::to_wstring(GetCurrentProcessId()) + L"-" + std::to_wstring(++m_Count)),
          m_Holds(m_Name), m_End(m_Name + L"-end"),
          m_Child("FileLockChild.DISABLED_HoldsTheLock",
                  {.argument = m_Name + L"|" + file.Path().GetWstring(), .flags = 0, .temp = {}}) {}

    bool Holds() { return m_Holds.IsSetWithin(60000); }
    void End() {
        m_End.Set();
        EXPECT_EQ(m_Child.ExitStatus(), 0U);
    }
    void Kill() { m_Child.Kill(); }

  private:
    static inline int m_Count = 0;
    std::wstring m_Name;
    WSignal m_Holds;
    WSignal m_End;
    WChildProcess m_Child;
};

// The system drops a dead process's lock, but not at once.
bool TryForAMinute(KTInterProcessFileLock &lock) {
    for (int i = 0; i < 6000; ++i) {
        if (lock.TryLock()) {
            return true;
        }
        Sleep(10);
    }
    return false;
}

} // namespace

TEST(FileLockChild, ExcludesAnotherProcessUntilItUnlocks) {
    FileToLock const file;
    Holder holder(file);
    ASSERT_TRUE(holder.Holds());
    KTInterProcessFileLock lock(file.Path());
    EXPECT_FALSE(lock.TryLock());
    holder.End();
    EXPECT_TRUE(TryForAMinute(lock));
}

TEST(FileLockChild, IsFreeAfterItsHolderWasKilled) {
    FileToLock const file;
    Holder holder(file);
    ASSERT_TRUE(holder.Holds());
    KTInterProcessFileLock lock(file.Path());
    EXPECT_FALSE(lock.TryLock());
    holder.Kill();
    EXPECT_TRUE(TryForAMinute(lock));
    EXPECT_TRUE(lock.Unlock());
}
