// WKTExceptionUtils.cpp: crash handling on Windows: the translator, the dump files, and the end of the process.

#include "WKTExceptionUtils.h"

#include "KTAssert.h"
#include "KTCrashCallBacks.h"
#include "KTFileUtil.h"
#include "KTSystemUtils.h"
#include "WDumpWriter.h"
#include "WOHandle.h"
#include "WOLongPath.h"
#include "WSETranslation.h"

#include <windows.h>

#include <cstdlib>
#include <mutex>
#include <string>

namespace {

constexpr char kSource[] = "source/private/exceptions/WKTExceptionUtils";

// The message box's caption, set when the library is loaded.
KTString const g_ApplicationTitle("Quillon Veltrain");

// The last dump's path. Exceptions that copy a dump may meet one that is being written on another thread.
class LastDump {
  public:
    void Set(KTString const &path) {
        std::scoped_lock const lock(m_Mutex);
        m_Path = path;
    }
    KTString Get() {
        std::scoped_lock const lock(m_Mutex);
        return m_Path;
    }

  private:
    std::mutex m_Mutex;
    KTString m_Path;
};

LastDump &GetLastDump() {
    static LastDump lastDump;
    return lastDump;
}

[[noreturn]] void ThrowAsException(unsigned int code, _EXCEPTION_POINTERS *pointers) {
    throw WKTSEHException(code, pointers);
}

void Report(char const *what, DWORD error, KTInt32 line) {
    KTAssertFailed((what + std::to_string(error)).c_str(), kSource, line);
}

// Not by the run-time's _exit alone: that has the system call every library's entry point, and those run the
// destructors of their static objects.
[[noreturn]] void EndProcessAtOnce() {
    TerminateProcess(GetCurrentProcess(), 1);
    _exit(1);
}

} // namespace

WKTExceptionUtils::WKTExceptionUtils() : m_PreviousTranslator(nullptr) {}

WKTExceptionUtils::~WKTExceptionUtils() = default;

KTExceptionUtils &KTExceptionUtils::GetInstance() { return WKTExceptionUtils::GetInstance(); }

KTExceptionUtils &WKTExceptionUtils::GetInstance() {
    static WKTExceptionUtils instance;
    return instance;
}

void WKTExceptionUtils::InstallExceptionHandlerImpl() {
    WLoadDumpWriter(); // a failure is reported with the dump that it prevents
    WKTSETranslator const replaced = WInstallTranslator(&ThrowAsException);
    if (replaced != &ThrowAsException) {
        m_PreviousTranslator = replaced;
    }
}

void WKTExceptionUtils::RestorePreviousHandler() const { WRestoreTranslator(); }

void WKTExceptionUtils::DefaultHandler(KTException const &exception) {
    if (!EnterDefaultHandler()) {
        return;
    }
    if (KTBackUpDataCallBack const backUpData = KTGetBackUpDataCallBack()) {
        backUpData();
    }
    MessageBoxW(nullptr, exception.What().GetWstring().c_str(), g_ApplicationTitle.GetWstring().c_str(), MB_OK);
    RestorePreviousHandler();
    RunCleanUpCallBacks();
    EndProcessAtOnce();
}

void KTExceptionUtils::GenerateCrashDumpFile(void *pointers) {
    WOLongPath const path(OPath(GetDumpFileName().GetOString()));
    WOHandle const file(CreateFileW(path.IsValid() ? path.c_str() : L"", GENERIC_READ | GENERIC_WRITE, 0, nullptr,
                                    CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file.IsValid()) {
        Report("CreateFile failed. Error: ", GetLastError(), 97);
        return;
    }
    DWORD error = ERROR_SUCCESS;
    if (!WWriteDump(file.Get(), static_cast<_EXCEPTION_POINTERS *>(pointers), error)) {
        Report("MiniDumpWriteDump failed. Error: ", error, 88);
    }
}

// Empty if this process has no session folder: a path from the current folder on would be another place.
KTPath KTExceptionUtils::GetDumpFolderPath() {
    KTPath folder = KTFileUtil::GetSessionTempFolder();
    if (folder.GetPathAsKTString().empty()) {
        return folder;
    }
    folder.Append("Dump");
    KTFileUtil::CreateDirectoryW(folder, true);
    return folder;
}

KTString KTExceptionUtils::GetDumpFileName() {
    KTPath path = GetDumpFolderPath();
    if (!path.GetPathAsKTString().empty()) {
        path.Append("KtDump" + KTSystemUtils::CreateGUID() + ".dmp");
    }
    GetLastDump().Set(path.GetPathAsKTString());
    return path.GetPathAsKTString();
}

void KTExceptionUtils::CopyLastDumpToDumpOnceFolder() {
    KTFile const dump(GetLastDump().Get());
    if (!dump.Exists()) {
        return;
    }
    KTPath folder = GetDumpFolderPath();
    folder.Append("DumpOnce");
    KTFileUtil::CreateDirectoryW(folder, true);
    KTPath copy = folder;
    copy.Append(KTFileUtil::GetFileName(dump));
    KTFileUtil::FileCopy(dump, KTFile(copy), true);
}
