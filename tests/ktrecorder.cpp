// ktrecorder: stands for an application that documents are opened with. It appends its command line, as UTF-16 with a
// line feed, to the file that its first argument names, and ends.
//
//     ktrecorder RECORD [ARGS...]

#include <windows.h>

#include <string>

int wmain(int count, wchar_t **arguments) {
    if (count < 2) {
        return 1;
    }
    std::wstring line;
    for (int i = 2; i < count; ++i) {
        line += (i == 2 ? L"" : L"|") + std::wstring(arguments[i]);
    }
    line += L'\n';
    HANDLE const file = CreateFileW(arguments[1], FILE_APPEND_DATA, FILE_SHARE_READ | FILE_SHARE_WRITE, nullptr,
                                    OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr);
    DWORD written = 0;
    auto const size = static_cast<DWORD>(line.size() * sizeof(wchar_t));
    bool const done = WriteFile(file, line.data(), size, &written, nullptr) != FALSE;
    CloseHandle(file);
    return done ? 0 : 1;
}
