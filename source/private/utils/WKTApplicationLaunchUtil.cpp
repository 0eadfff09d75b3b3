// WKTApplicationLaunchUtil.cpp: starting other programs.

#include "KTApplicationLaunchUtil.h"

#include "OFileSystem.h"
#include "WOHandle.h"
#include "WOLongPath.h"

#include <windows.h>

#include <string>

namespace {

constexpr wchar_t kExtension[] = L".exe";
constexpr int kExtensionLength = 4;
constexpr std::size_t kLongestLine = 32'766; // without the terminating zero

bool HasExtension(std::wstring const &path) {
    return path.size() > kExtensionLength &&
           CompareStringOrdinal(path.c_str() + path.size() - kExtensionLength, kExtensionLength, kExtension,
                                kExtensionLength, TRUE) == CSTR_EQUAL;
}

bool IsFile(OPath const &path) {
    OFileFacts facts;
    return OGetFacts(path, facts) == OError::None && !facts.isFolder;
}

// Quoted so that the run-time's rules give the argument back: a back slash stands for itself unless a quotation mark
// follows the row of them; there two make one, and one makes the mark an ordinary character.
void AppendArgument(std::wstring &line, std::wstring const &argument) {
    if (!line.empty()) {
        line += L' ';
    }
    if (!argument.empty() && argument.find_first_of(L" \t\n\v\"") == std::wstring::npos) {
        line += argument;
        return;
    }
    line += L'"';
    std::size_t backSlashes = 0;
    for (wchar_t const character : argument) {
        if (character == L'"') {
            line.append(backSlashes + 1, L'\\');
        }
        backSlashes = character == L'\\' ? backSlashes + 1 : 0;
        line += character;
    }
    line.append(backSlashes, L'\\');
    line += L'"';
}

// Empty if an argument cannot be part of one. The program's name has no quotation marks, being a path.
std::wstring CommandLine(std::wstring const &program, std::vector<KTString> const &arguments) {
    std::wstring line = L"\"" + program + L"\"";
    for (KTString const &argument : arguments) {
        if (argument.find(static_cast<unsigned short>(0)) != KTString::npos) {
            return {};
        }
        AppendArgument(line, argument.GetWstring());
    }
    return line;
}

} // namespace

KTErrorCodeEnum KTApplicationLaunchUtil::LaunchApplication(KTString const &path, std::vector<KTString> const &arguments,
                                                           KTUInt32 *processId) {
    std::wstring program = WOGetFullText(OPath(path.GetOString()));
    if (program.empty()) {
        return kKTErrorFileNotFound;
    }
    if (!HasExtension(program)) {
        program += kExtension;
    }
    if (!IsFile(WOMakePath(program.data(), program.size()))) {
        return kKTErrorFileNotFound;
    }
    std::wstring line = CommandLine(program, arguments);
    if (line.empty() || line.size() > kLongestLine) {
        return kKTErrorFailed;
    }
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION process{};
    if (CreateProcessW(program.c_str(), line.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                       &process) == FALSE) {
        return kKTErrorFailed;
    }
    WOHandle const processHandle(process.hProcess);
    WOHandle const threadHandle(process.hThread);
    if (processId != nullptr) {
        *processId = process.dwProcessId;
    }
    return kKTErrorNone;
}
