// WKTFileUtilOpen.cpp: documents and their applications, through the registry and the shell.

#include "KTFileUtil.h"

#include "KTFileUtilErrors.h"
#include "OUtf.h"
#include "WKTRedirection.h"
#include "WOCom.h"
#include "WOLongPath.h"
#include "WORegistry.h"

#include <windows.h>

#include <shellapi.h>

#include <cwchar>
#include <string>

namespace {

constexpr wchar_t kOpen[] = L"open";
constexpr wchar_t kEdit[] = L"edit";
constexpr wchar_t kUserClasses[] = L"Software\\Classes\\";

std::wstring WideOf(KTString const &text) { return text.GetWstring(); }

// The unnamed value of a key; empty if there is none.
std::wstring UnnamedValue(HKEY root, std::wstring const &name) {
    WORegistryKey const key(root, name.c_str(), KEY_QUERY_VALUE);
    KTUnits value;
    if (!key.IsOpen() || !WOReadText(key.Get(), nullptr, value)) {
        return {};
    }
    return {value.begin(), value.end()};
}

// The same among the registered classes. The user's own come first; Windows shows both as one, Wine does not.
std::wstring ClassValue(std::wstring const &key) {
    std::wstring const own = UnnamedValue(HKEY_CURRENT_USER, kUserClasses + key);
    return own.empty() ? UnnamedValue(HKEY_CLASSES_ROOT, key) : own;
}

bool IsFileThere(std::wstring const &path) {
    OFileFacts facts;
    return OGetFacts(WOMakePath(path.data(), path.size()), facts) == OError::None && !facts.isFolder;
}

// The file that the system would start by this name, which may lack its extension; empty if there is none.
std::wstring FileToStart(std::wstring const &name) {
    std::wstring const full = name + L".exe";
    return IsFileThere(name) ? name : IsFileThere(full) ? full : std::wstring();
}

// The program of a command line such as "C:\App\app.exe" "%1". Without quotation marks a path may have blanks in it:
// then the first beginning of the line that is a file counts, as when the system starts it.
std::wstring ProgramOf(std::wstring const &command) {
    std::size_t const start = command.find_first_not_of(L" \t");
    if (start == std::wstring::npos) {
        return {};
    }
    if (command[start] == L'"') {
        std::size_t const end = command.find(L'"', start + 1);
        return command.substr(start + 1, end == std::wstring::npos ? end : end - start - 1);
    }
    std::wstring const line = command.substr(start);
    std::size_t const first = line.find(L' ');
    for (std::size_t end = first;; end = line.find(L' ', end + 1)) {
        std::wstring file = FileToStart(line.substr(0, end));
        if (!file.empty()) {
            return file;
        }
        if (end == std::wstring::npos) {
            return line.substr(0, first);
        }
    }
}

std::wstring CommandOf(std::wstring const &className) {
    std::wstring const command = ClassValue(className + L"\\shell\\open\\command");
    return command.empty() ? ClassValue(className + L"\\shell\\edit\\command") : command;
}

// The shell knows no extended paths: it gets the ordinary form.
KTFileUtil::ErrorCodeEnum ErrorOfShell(INT_PTR result) {
    switch (result) {
    case SE_ERR_NOASSOC:
    case SE_ERR_ASSOCINCOMPLETE:
        return KTFileUtil::kErrorNoApplication;
    case SE_ERR_FNF:
    case SE_ERR_PNF:
        return KTFileUtil::kErrorNotFound;
    case SE_ERR_ACCESSDENIED:
        return KTFileUtil::kErrorAccessDenied;
    case SE_ERR_SHARE:
        return KTFileUtil::kErrorInUse;
    default:
        return KTFileUtil::kErrorFailed;
    }
}

// The class that the user registered for the extension, as far as it has the verb.
std::wstring UserClassWithVerb(KTString const &extension, std::wstring const &verb) {
    std::wstring const key = WideOf(extension);
    std::wstring const className = UnnamedValue(HKEY_CURRENT_USER, kUserClasses + key);
    for (std::wstring const &name : {className, key}) {
        std::wstring command = kUserClasses + name;
        command.append(L"\\shell\\").append(verb).append(L"\\command");
        if (!name.empty() && !UnnamedValue(HKEY_CURRENT_USER, command).empty()) {
            return name;
        }
    }
    return {};
}

KTFileUtil::ErrorCodeEnum Execute(SHELLEXECUTEINFOW &request) {
    if (ShellExecuteExW(&request) != FALSE) {
        return KTFileUtil::kErrorNone;
    }
    return ErrorOfShell(reinterpret_cast<INT_PTR>(request.hInstApp));
}

KTFileUtil::ErrorCodeEnum Open(KTFile const &file, wchar_t const *verb) {
    OPath const path = file.GetPath().GetOPath();
    OFileFacts facts;
    OError const error = OGetFacts(path, facts);
    if (error != OError::None) {
        return KTFileUtilError(error);
    }
    std::wstring const full = WOGetFullText(path);
    std::wstring const folder = WOGetFullText(OGetFullPath(path).GetParent());
    WOComScope const com;
    WKTRedirectionOff const redirection;
    SHELLEXECUTEINFOW request{};
    request.cbSize = sizeof request;
    request.fMask = SEE_MASK_FLAG_NO_UI | SEE_MASK_NOASYNC; // errors are returned, and the thread may end at once
    request.lpVerb = verb;
    request.lpFile = full.c_str();
    request.lpDirectory = folder.empty() ? nullptr : folder.c_str();
    request.nShow = SW_SHOWNORMAL;
    KTFileUtil::ErrorCodeEnum result = Execute(request);
    std::wstring const own = result == KTFileUtil::kErrorNoApplication && !facts.isFolder
                                 ? UserClassWithVerb(KTFileUtil::GetExtension(file), verb)
                                 : std::wstring();
    if (!own.empty()) { // see ClassValue: not every shell finds it
        WORegistryKey const key(HKEY_CURRENT_USER, (kUserClasses + own).c_str(), KEY_READ);
        request.fMask |= SEE_MASK_CLASSKEY;
        request.hkeyClass = key.Get();
        result = Execute(request);
    }
    return result;
}

} // namespace

KTPath KTFileUtil::FindExecutableForFile(KTFile const &file) {
    OPath const path = file.GetPath().GetOPath();
    OFileFacts facts;
    if (OGetFacts(path, facts) != OError::None || facts.isFolder) {
        return {};
    }
    std::wstring const full = WOGetFullText(path);
    if (full.size() < MAX_PATH) { // the shell's function knows no longer ones
        WKTRedirectionOff const redirection;
        wchar_t program[MAX_PATH] = {};
        constexpr INT_PTR kLastError = 32;
        HINSTANCE const result = FindExecutableW(full.c_str(), nullptr, program);
        if (reinterpret_cast<INT_PTR>(result) > kLastError && program[0] != 0) {
            return KTPath(WOMakePath(program, std::wcslen(program)));
        }
    }
    return GetAppForFileExtension(GetExtension(file));
}

KTPath KTFileUtil::GetAppForFileExtension(KTString const &extension) {
    if (extension.empty() || extension == ".") {
        return {};
    }
    std::wstring const key = (extension[0] == '.' ? L"" : L".") + WideOf(extension);
    if (key.find(L'\\') != std::wstring::npos) {
        return {};
    }
    // The extension names a class that has the commands, or has them itself.
    std::wstring const className = ClassValue(key);
    std::wstring command = className.empty() ? std::wstring() : CommandOf(className);
    if (command.empty()) {
        command = CommandOf(key);
    }
    std::wstring const program = ProgramOf(command);
    return KTPath(WOMakePath(program.data(), program.size()));
}

KTFileUtil::ErrorCodeEnum KTFileUtil::FileOpen(KTFile const &file) { return Open(file, kOpen); }

KTFileUtil::ErrorCodeEnum KTFileUtil::FileOpen2(KTFile const &file, bool forEditing) {
    return Open(file, forEditing ? kEdit : kOpen);
}

KTFileUtil::ErrorCodeEnum KTFileUtil::FileOpenMultiple(std::vector<KTFile> const &files, bool forEditing) {
    ErrorCodeEnum result = kErrorNone;
    for (KTFile const &file : files) {
        ErrorCodeEnum const error = FileOpen2(file, forEditing);
        if (result == kErrorNone) {
            result = error;
        }
    }
    return result;
}
