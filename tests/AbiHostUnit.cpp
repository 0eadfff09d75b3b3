// AbiHostUnit.cpp: a host's translation unit, compiled four times: <windows.h> before and after the library's headers,
// with its W and with its A names. KT_HOST_FUNCTION names the function that it defines.
//
// The system's header makes macros of ordinary names; a member that shares one would get a different symbol in one
// order than in the other. So each exported function whose name the system's headers might take is called here, and the
// four units must link in one program. None of the project's own compile options apply: hosts have other ones.

#if defined(KT_WINDOWS_FIRST)
#include <KTPublic.h>
#include <windows.h>
#else
#include <KTPublic.h>
#include <windows.h>
#endif

#include "AbiHostUnits.h"

#include <algorithm>
#include <limits>

std::string ktabi::KT_HOST_FUNCTION() {
    KTMutex mutex;
    KTLock lock(mutex);
    KTCondition condition;
    condition.notify_one();
    bool const woken = condition.timed_wait(lock, 0);

    KTFile const file(KTString("C:\\folder") + "\\file");
    KTPath path = file.GetPath();
    path.Append("more");
    path = path.GetParentKTPath();
    KTString text = path.GetPathAsKTString();
    text.ReplaceAll2("\\", "/");
    text.AppendNumber(static_cast<int>(text.find('f')));

    KTFile const temporary = KTFileUtil::GetSystemTempFolder();
    bool const refused = KTFileUtil::CreateDirectoryW(KTPath()) != KTFileUtil::kErrorNone &&
                         KTFileUtil::MoveFileW(KTFile(), KTFile()) != KTFileUtil::kErrorNone &&
                         !file.CanOpen(KTFile::kAccessRead, KTFile::kShareAll);
    KTVariant variant;
    variant.SetObject({{KTString("key"), KTVariant(3)}});
    bool const found = variant.GetObject().at("key").GetInt() == 3 && GetObject(nullptr, 0, nullptr) == 0;
    int width = 0;
    bool const set = KTSimpleIniFileReader(KTString("missing.ini")).GetIntValForVariable("Player", "Width", width);
    bool const captioned = !KTClosedCaptionFileReader().GetLinesFromFile(KTString("missing.txt"), 4U).empty();
    Deallocate(Allocate(10));
    gKTLogger->Log("host unit %d", 1);
    gKTLogger->Log(std::wstring(L"host unit"));
    KTAssertFailed("host unit", "tests/AbiHostUnit", 1);
    std::size_t const largest = (std::numeric_limits<std::size_t>::max)();
    // The system's own names still mean the system's functions.
    bool const running = GetModuleHandle(nullptr) != nullptr && GetTickCount64() != 0;
    return text.GetUTF8String() +
           (woken || !running || !refused || !found || set || captioned || largest != KTString::npos ? " wrong"
                                                                                                     : " right") +
           (temporary == KTFile() ? " nowhere" : "") + KTPublicUtils::ConstructLogStr(" v", 1.5F);
}
