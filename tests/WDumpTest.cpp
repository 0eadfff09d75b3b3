// WDumpTest.cpp: crash dumps: their files, their content for another reader, and the copies that are kept once.

#include "KTPublic.h"
#include "LogLines.h"
#include "WChildProcess.h"
#include "WDumps.h"
#include "WFaults.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <boost/thread/barrier.hpp>
#include <boost/thread/thread.hpp>

#include <dbghelp.h>

#include <atomic>
#include <bit>
#include <cstring>
#include <map>
#include <mutex>
#include <regex>

namespace {

namespace fs = std::filesystem;

std::string NameOf(fs::path const &path) { return path.filename().string(); }

TEST(DumpTest, ADumpWithoutPointersHasNoException) {
    wdumps::Written written;
    KTExceptionUtils::GenerateCrashDumpFile(nullptr);
    auto const dumps = written.Take();
    ASSERT_EQ(1U, dumps.size());
    wdumps::KeepWithout(*dumps.begin(), "Nothing");
    EXPECT_TRUE(std::regex_match(
        NameOf(*dumps.begin()), std::regex("KtDump[0-9a-f]{8}-[0-9a-f]{4}-[0-9a-f]{4}-[0-9a-f]{4}-[0-9a-f]{12}\\.dmp")))
        << NameOf(*dumps.begin());
    KTPath folder = KTFileUtil::GetSessionTempFolder();
    folder.Append("Dump");
    EXPECT_EQ(folder, KTExceptionUtils::GetDumpFolderPath());
    EXPECT_EQ(fs::path(folder.GetPathAsKTString().GetWstring()), dumps.begin()->parent_path());
}

// The dump files that are open at a time.
std::atomic<int> g_Open;
std::atomic<int> g_MostOpen;
std::atomic<HANDLE> g_DumpFile;

HANDLE WINAPI CountOpen(LPCWSTR path, DWORD access, DWORD share, LPSECURITY_ATTRIBUTES security, DWORD disposition,
                        DWORD flags, HANDLE model) {
    HANDLE const file = CreateFileW(path, access, share, security, disposition, flags, model);
    g_DumpFile = file;
    int const open = ++g_Open;
    int most = g_MostOpen;
    while (open > most && !g_MostOpen.compare_exchange_weak(most, open)) {
    }
    return file;
}

BOOL WINAPI CountClose(HANDLE handle) {
    if (handle == g_DumpFile) {
        --g_Open;
    }
    return CloseHandle(handle);
}

TEST(DumpTest, EightThreadsFaultingTogetherWriteOneAfterTheOther) {
    constexpr int kThreads = 8;
    WImportHook const open(L"KTPublic.dll", "CreateFileW", &CountOpen);
    WImportHook const close(L"KTPublic.dll", "CloseHandle", &CountClose);
    ASSERT_TRUE(open.IsActive() && close.IsActive());
    wdumps::Observer const observer;
    wdumps::Written written;
    LogLines log;
    boost::barrier together(kThreads);
    std::mutex mutex;
    std::map<DWORD, wdumps::Expected> caught;
    boost::thread_group threads;
    for (int i = 0; i < kThreads; ++i) {
        threads.create_thread([&, i] {
            KTExceptionUtils::InstallExceptionHandler();
            WFault const &fault = kFaults[static_cast<std::size_t>(i) % 6];
            together.wait();
            try {
                fault.raise();
            } catch (WKTSEHException const &exception) {
                EXPECT_EQ(fault.code, exception.getSENumber());
                std::scoped_lock const lock(mutex);
                caught[GetCurrentThreadId()] = wdumps::Observer::Last();
            }
        });
    }
    threads.join_all();
    EXPECT_EQ(static_cast<std::size_t>(kThreads), caught.size());
    EXPECT_EQ(1, g_MostOpen);
    EXPECT_TRUE(log.Take().empty());
    auto const dumps = written.Take();
    ASSERT_EQ(static_cast<std::size_t>(kThreads), dumps.size());
    // Which dump is whose only their content tells: each is to hold one of these exceptions.
    std::string any;
    for (auto const &[thread, one] : caught) {
        any += (any.empty() ? "" : "|") + wdumps::Describe(one);
    }
    int number = 0;
    for (fs::path const &dump : dumps) {
        wdumps::Keep(dump, "Together" + std::to_string(number++), "@(" + any + ")");
    }
}

// ---- failures ----

struct CreateFileCall {
    std::wstring path;
    DWORD access = 0;
    DWORD share = 0;
    bool hasSecurity = false;
    DWORD disposition = 0;
    DWORD flags = 0;
};
CreateFileCall g_Call;

HANDLE WINAPI RecordAndRefuse(LPCWSTR path, DWORD access, DWORD share, LPSECURITY_ATTRIBUTES security,
                              DWORD disposition, DWORD flags, HANDLE) {
    g_Call = {path, access, share, security != nullptr, disposition, flags};
    SetLastError(ERROR_DISK_FULL);
    return INVALID_HANDLE_VALUE;
}

TEST(DumpTest, AFileThatCannotBeMadeIsReported) {
    LogLines log;
    WImportHook const hook(L"KTPublic.dll", "CreateFileW", &RecordAndRefuse);
    ASSERT_TRUE(hook.IsActive());
    KTExceptionUtils::GenerateCrashDumpFile(nullptr);
    EXPECT_EQ((std::vector<std::string>{
                  "Assert failed: CreateFile failed. Error: 112 at source/private/exceptions/WKTExceptionUtils:97"}),
              log.Take());
    EXPECT_EQ(GENERIC_READ | GENERIC_WRITE, g_Call.access);
    EXPECT_EQ(0U, g_Call.share);
    EXPECT_FALSE(g_Call.hasSecurity);
    EXPECT_EQ(static_cast<DWORD>(CREATE_ALWAYS), g_Call.disposition);
    EXPECT_EQ(static_cast<DWORD>(FILE_ATTRIBUTE_NORMAL), g_Call.flags);
    std::wstring const folder = KTExceptionUtils::GetDumpFolderPath().GetPathAsKTString().GetWstring();
    EXPECT_NE(std::wstring::npos, g_Call.path.find(folder + L"\\KtDump")) << NameOf(g_Call.path);
}

HMODULE WINAPI RefuseLibrary(LPCWSTR, HANDLE, DWORD) {
    SetLastError(ERROR_MOD_NOT_FOUND);
    return nullptr;
}

// A fresh process, in which the writer was not looked for yet.
TEST(DumpTest, DISABLED_DumpWithoutWriter) {
    LogLines log;
    WImportHook const hook(L"KTPublic.dll", "LoadLibraryExW", &RefuseLibrary);
    ASSERT_TRUE(hook.IsActive());
    KTExceptionUtils::InstallExceptionHandler();
    EXPECT_TRUE(log.Take().empty());
    KTExceptionUtils::GenerateCrashDumpFile(nullptr);
    EXPECT_EQ((std::vector<std::string>{"Assert failed: MiniDumpWriteDump failed. Error: 126 at "
                                        "source/private/exceptions/WKTExceptionUtils:88"}),
              log.Take());
}

TEST(DumpTest, ADumpThatCannotBeWrittenIsReported) {
    WChildProcess child("DumpTest.DISABLED_DumpWithoutWriter");
    EXPECT_EQ(0U, child.ExitStatus());
}

struct WriterCall {
    HANDLE process = nullptr;
    DWORD id = 0;
    MINIDUMP_TYPE type = MiniDumpWithFullMemory;
    bool hasException = false;
    MINIDUMP_EXCEPTION_INFORMATION exception{};
    bool hasMore = false;
};
WriterCall g_WriterCall;
DWORD g_WriterError = 0;

BOOL WINAPI RecordAndFail(HANDLE process, DWORD id, HANDLE, MINIDUMP_TYPE type,
                          MINIDUMP_EXCEPTION_INFORMATION *exception, MINIDUMP_USER_STREAM_INFORMATION *streams,
                          MINIDUMP_CALLBACK_INFORMATION *callback) {
    g_WriterCall = {process, id, type, exception != nullptr, {}, streams != nullptr || callback != nullptr};
    if (exception != nullptr) {
        g_WriterCall.exception = *exception;
    }
    SetLastError(g_WriterError);
    return FALSE;
}

FARPROC WINAPI FindOwnWriter(HMODULE library, LPCSTR name) {
    bool const isWriter = !IS_INTRESOURCE(name) && std::strcmp(name, "MiniDumpWriteDump") == 0;
    return isWriter ? std::bit_cast<FARPROC>(&RecordAndFail) : GetProcAddress(library, name);
}

// A fresh process, in which the writer was not looked for yet.
TEST(DumpTest, DISABLED_DumpByAFailingWriter) {
    WImportHook const hook(L"KTPublic.dll", "GetProcAddress", &FindOwnWriter);
    ASSERT_TRUE(hook.IsActive());
    EXCEPTION_POINTERS pointers{};
    for (DWORD const error : {5UL, 0UL, 0x80070070UL}) { // also one that the system gives no number of
        SCOPED_TRACE(error);
        for (EXCEPTION_POINTERS *const given : {static_cast<EXCEPTION_POINTERS *>(nullptr), &pointers}) {
            LogLines log;
            wdumps::Written written;
            g_WriterError = error;
            KTExceptionUtils::GenerateCrashDumpFile(given);
            EXPECT_EQ(
                (std::vector<std::string>{"Assert failed: MiniDumpWriteDump failed. Error: " + std::to_string(error) +
                                          " at source/private/exceptions/WKTExceptionUtils:88"}),
                log.Take());
            EXPECT_EQ(GetCurrentProcess(), g_WriterCall.process);
            EXPECT_EQ(GetCurrentProcessId(), g_WriterCall.id);
            EXPECT_EQ(MiniDumpNormal, g_WriterCall.type);
            EXPECT_FALSE(g_WriterCall.hasMore);
            EXPECT_EQ(given != nullptr, g_WriterCall.hasException);
            EXPECT_EQ(given, g_WriterCall.exception.ExceptionPointers);
            EXPECT_EQ(given != nullptr ? GetCurrentThreadId() : 0, g_WriterCall.exception.ThreadId);
            EXPECT_EQ(FALSE, g_WriterCall.exception.ClientPointers);
            auto const dumps = written.Take();
            ASSERT_EQ(1U, dumps.size());
            EXPECT_TRUE(fs::remove(*dumps.begin())) << "it is closed";
        }
    }
}

TEST(DumpTest, TheWritersFailureIsReportedWithItsNumber) {
    WChildProcess child("DumpTest.DISABLED_DumpByAFailingWriter");
    EXPECT_EQ(0U, child.ExitStatus());
}

// ---- kept once ----

std::size_t CountKept() { return wdumps::In(wdumps::Folder() / "DumpOnce").size(); }

TEST(DumpTest, DISABLED_NothingToKeep) {
    KTLCException::SetExtendedDebuggingEnabled(true);
    KTLCException const exception("reason", "source/private/utils/KTThing", 1);
    KTExceptionUtils::CopyLastDumpToDumpOnceFolder();
    EXPECT_EQ(0U, CountKept());
    EXPECT_FALSE(fs::exists(wdumps::Folder() / "DumpOnce"));
}

TEST(DumpTest, WithoutADumpNothingIsKept) {
    WChildProcess child("DumpTest.DISABLED_NothingToKeep");
    EXPECT_EQ(0U, child.ExitStatus());
}

TEST(DumpTest, TheLastDumpIsKeptOnceForEachSite) {
    wdumps::Written written;
    KTExceptionUtils::GenerateCrashDumpFile(nullptr);
    auto const dumps = written.Take();
    ASSERT_EQ(1U, dumps.size());
    fs::path const once = wdumps::Folder() / "DumpOnce";
    fs::path const kept = once / dumps.begin()->filename();
    fs::remove_all(once);

    KTLCException const quiet("reason", "source/private/utils/KTOnce", 1); // not enabled yet
    EXPECT_FALSE(fs::exists(once));

    KTLCException::SetExtendedDebuggingEnabled(true);
    KTLCException const first("reason", "source/private/utils/KTOnce", 1);
    ASSERT_TRUE(fs::exists(kept));
    EXPECT_EQ(fs::file_size(*dumps.begin()), fs::file_size(kept));
    EXPECT_EQ(1U, CountKept());

    fs::remove(kept);
    KTLCException const again("another reason", "elsewhere/KTOnce", 1); // the same base name and line
    EXPECT_FALSE(fs::exists(kept));
    KTLCException const otherLine("reason", "source/private/utils/KTOnce", 2);
    EXPECT_TRUE(fs::exists(kept));
    std::ofstream(kept, std::ios::trunc) << "older";
    KTLCException const otherFile("reason", "source/private/utils/KTTwice", 1); // copies over what is there
    EXPECT_EQ(fs::file_size(*dumps.begin()), fs::file_size(kept));

    fs::remove_all(once);
    fs::remove(*dumps.begin());
    KTLCException const dumpGone("reason", "source/private/utils/KTOnce", 3);
    EXPECT_FALSE(fs::exists(kept));

    // Each new name counts as the last dump's, also that of one that could not be made.
    std::ofstream(*dumps.begin()) << "a dump";
    {
        WImportHook const hook(L"KTPublic.dll", "CreateFileW", &RecordAndRefuse);
        KTExceptionUtils::GenerateCrashDumpFile(nullptr);
    }
    KTLCException const dumpFailed("reason", "source/private/utils/KTOnce", 4);
    EXPECT_FALSE(fs::exists(kept));
    fs::remove(*dumps.begin());
    KTLCException::SetExtendedDebuggingEnabled(false);
}

// A failed copy is ignored.
TEST(DumpTest, ACopyThatFailsIsIgnored) {
    wdumps::Written written;
    KTExceptionUtils::GenerateCrashDumpFile(nullptr);
    auto const dumps = written.Take();
    ASSERT_EQ(1U, dumps.size());
    fs::path const once = wdumps::Folder() / "DumpOnce";
    fs::remove_all(once);
    std::ofstream(once) << "a file in the way";
    LogLines log;
    EXPECT_NO_THROW(KTExceptionUtils::CopyLastDumpToDumpOnceFolder());
    EXPECT_TRUE(log.Take().empty());
    fs::remove(once);
}

// The session folder may have been deleted; dumps make it again.
TEST(DumpTest, TheDumpFolderIsMadeWithItsParents) {
    fs::path const folder = wdumps::Folder();
    EXPECT_TRUE(KTFileUtil::DeleteAllTempFilesCreated());
    ASSERT_FALSE(fs::exists(folder.parent_path()));
    EXPECT_EQ(folder, wdumps::Folder());
    EXPECT_TRUE(fs::is_directory(folder));
}

} // namespace
