// WCrash.cpp: a fault while saving, and what the library and its host make of it.

#include "WCrash.h"

#include "KTPublic.h"
#include "Table.h"
#include "TextReader.h"
#include "WDisk.h"

#include <boost/thread/thread.hpp>

#include <windows.h>

#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace {

// The project that is open: what the callbacks, which take no arguments, save and print.
struct Project {
    Console const *console = nullptr;
    KTPath folder;
    std::vector<std::pair<KTString, KTString>> texts; // name, text
};
Project g_Project;

// Flushed at once: the process ends without doing so.
void Print(std::string const &text) {
    g_Project.console->Print(text + "\n");
    std::fflush(stdout);
}

KTFile FileNamed(KTString const &name) {
    KTPath path = g_Project.folder;
    path.Append(name);
    return KTFile(path);
}

std::string Shown(KTFile const &file) {
    return Printable(file.GetPathString()) + " (" + std::to_string(file.GetSize()) + " bytes)";
}

// What a bad pointer does in a program that has worked for years.
[[gnu::noinline]] void UseBadPointer() {
    std::uintptr_t volatile address = 0x40;
    *reinterpret_cast<int volatile *>(address) = 1; // NOLINT(performance-no-int-to-ptr)
}

// Writes the project; with `faultAt`, faults before the text of that number.
bool Save(KTFile const &file, std::size_t faultAt) {
    std::unique_ptr<IKTStream> const stream(
        KTStreamUtil::CreateFileStreamWrite(file, FileXferBytes::kOpenWrite | FileXferBytes::kCreateOrTruncate, 0, 0));
    int count = static_cast<int>(g_Project.texts.size());
    stream->XferInt32(count);
    for (std::size_t i = 0; i < g_Project.texts.size(); ++i) {
        if (i == faultAt) {
            UseBadPointer();
        }
        KTString name = g_Project.texts[i].first;
        KTString text = g_Project.texts[i].second;
        stream->XferString(name, true, true);
        stream->XferString(text, true, true);
    }
    stream->Flush();
    return stream->GetStreamState() == kKTStreamStateGood;
}

// Whether the file holds the project, whole.
bool IsWhole(KTFile const &file) {
    std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateFileStreamRead(file, FileXferBytes::kOpenRead, 0, 0));
    int count = 0;
    if (stream == nullptr || stream->XferInt32(count) != static_cast<int>(g_Project.texts.size())) {
        return false;
    }
    for (auto const &[name, text] : g_Project.texts) {
        KTString readName;
        KTString readText;
        stream->XferString(readName, true, true);
        stream->XferString(readText, true, true);
        if (readName != name || readText != text) {
            return false;
        }
    }
    return true;
}

constexpr KTUInt64 kMostBytes = 1ULL << 20; // of each text
constexpr std::size_t kNoFault = static_cast<std::size_t>(-1);

std::string Verdict(KTFile const &file) { return IsWhole(file) ? "whole" : "NOT whole"; }

// ---- the host's callbacks ----

KTErrorCodeEnum BackUp() {
    KTFile const file = FileNamed("course.ktbak");
    bool const isSaved = Save(file, kNoFault);
    Print("  back-up callback   " + Shown(file) + ", read back " + Verdict(file));
    Print("  saved before       " + Shown(FileNamed("course.ktdoc")) + ", read back " +
          Verdict(FileNamed("course.ktdoc")));
    return isSaved ? kKTErrorNone : kKTErrorFailed;
}

void CleanUp() {
    KTExceptionUtils::UnRegisterCleanUpCallBack(&CleanUp);
    KTPath const dumps = KTExceptionUtils::GetDumpFolderPath();
    std::vector<KTString> names;
    KTFileUtil::GetFileNamesInFolderAtPath(dumps, names);
    for (KTString const &name : names) {
        KTPath dump = dumps;
        dump.Append(name);
        Print("  crash dump         " + Shown(KTFile(dump)));
    }
    Print("  clean-up callback  done");
}

KTString GiveText(KTString const &) {
    return "A fatal error has occured and the application is being terminated. Quillon Veltrain has tried to save all "
           "your work in the respective project folders as \".ktbak\" files.\n\nPlease restart Quillon Veltrain.";
}

// ---- the user ----

HWND FindMessage() {
    for (HWND box = nullptr; (box = FindWindowExW(nullptr, box, L"#32770", L"Quillon Veltrain")) != nullptr;) {
        DWORD process = 0;
        GetWindowThreadProcessId(box, &process);
        if (process == GetCurrentProcessId()) {
            return box;
        }
    }
    return nullptr;
}

// The demo runs without a display, so that it reads its own message and presses OK.
void ReadMessage() {
    constexpr int kText = 0xFFFF; // the system's number of the text in a message box
    HWND box = nullptr;
    while ((box = FindMessage()) == nullptr || GetDlgItem(box, kText) == nullptr) {
        Sleep(20);
    }
    wchar_t text[1024] = L"";
    GetDlgItemTextW(box, kText, text, 1024);
    std::string message = Printable(KTString(text));
    Print("  message            " + message.substr(0, message.find('.') + 1) + ".. (answered with OK)");
    while (IsWindow(box) != FALSE) {
        PostMessageW(box, WM_COMMAND, IDOK, 0);
        Sleep(20);
    }
}

// ---- the application ----

bool OpenProject(CourseFolder const &folder) {
    for (CourseFile const &file : folder.files) {
        if (file.kind == FileKind::Text) {
            DiskBytes content = DiskRead(file.path, kMostBytes);
            bool const isCut = content.size > content.bytes.size();
            g_Project.texts.emplace_back(file.name, DecodeText(std::move(content.bytes), isCut).text);
        }
    }
    g_Project.folder = KTFileUtil::GetSystemTempFolder().GetPath();
    g_Project.folder.Append("ktdemo-project");
    KTFileUtil::DeleteDirectory(g_Project.folder);
    return !g_Project.texts.empty() && KTFileUtil::CreateDirectoryW(g_Project.folder, true) == KTFileUtil::kErrorNone &&
           Save(FileNamed("course.ktdoc"), kNoFault);
}

void Work() {
    KTExceptionUtils::InstallExceptionHandler();
    try {
        Save(FileNamed("course-2.ktdoc"), g_Project.texts.size() / 2);
    } catch (WKTSEHException const &exception) {
        char code[16];
        std::snprintf(code, sizeof code, "0x%08X", exception.getSENumber());
        Print(std::string("  structured error   ") + code + " caught as a C++ exception");
        KTExceptionUtils::HandleException(exception);
    }
}

} // namespace

void CrashWhileSaving(Console const &console, CourseFolder const &folder) {
    g_Project.console = &console;
    KTExceptionUtils::InstallExceptionHandler();
    RegisterBackUpDataCallBack(&BackUp);
    KTExceptionUtils::RegisterCleanUpCallBack(&CleanUp);
    RegisterMsgStrGetterCallBack(&GiveText);
    KTExceptionMsgManager::RegisterBaseExceptionMsgs(false);
    if (!OpenProject(folder)) {
        console.PrintError("the project could not be saved");
        return;
    }
    Print("Crash while saving");
    Print("  texts in project   " + std::to_string(g_Project.texts.size()));
    boost::thread user(&ReadMessage);
    boost::thread worker(&Work);
    worker.join();
    user.join();
}
