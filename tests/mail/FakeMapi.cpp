// FakeMapi.cpp: a MAPI32.DLL that sends nothing and writes down what it was handed.
//
// The environment variable KT_MAPI_RECORD names the file, KT_MAPI_RESULT the number that is returned. Texts are written
// as they came, wide ones as UTF-8, with line ends as \r and \n:
//
//     MAPISendMail
//     session 0 window 0 flags 9 reserved 0
//     message 0 0 sender none type null date null conversation null
//     subject Hello
//     text One line\r\n
//     to 0 0 none NAME|ADDRESS
//     file 0 0 4294967295 none PATH|NAME

#include <windows.h>

#include <string>

namespace {

std::string Escaped(std::string const &text) {
    std::string escaped;
    for (char const byte : text) {
        escaped += byte == '\r' ? "\\r" : byte == '\n' ? "\\n" : std::string(1, byte);
    }
    return escaped;
}

[[maybe_unused]] std::string Text(char const *text) { return text == nullptr ? "null" : Escaped(text); }

std::string Text(wchar_t const *text) {
    if (text == nullptr) {
        return "null";
    }
    std::string utf8(static_cast<std::size_t>(WideCharToMultiByte(CP_UTF8, 0, text, -1, nullptr, 0, nullptr, nullptr)),
                     '\0');
    WideCharToMultiByte(CP_UTF8, 0, text, -1, utf8.data(), static_cast<int>(utf8.size()), nullptr, nullptr);
    utf8.pop_back();
    return Escaped(utf8);
}

std::string Number(unsigned long long number) { return std::to_string(number); }

std::string Variable(wchar_t const *name) {
    char value[1024] = {};
    GetEnvironmentVariableA(Text(name).c_str(), value, sizeof value);
    return value;
}

// The structures of the two functions, which differ in the characters only.
template <typename Unit> struct MapiFile {
    ULONG reserved, flags, position;
    Unit *path, *name;
    void *type;
};
template <typename Unit> struct MapiRecipient {
    ULONG reserved, kind;
    Unit *name, *address;
    ULONG idSize;
    void *id;
};
template <typename Unit> struct MapiMessage {
    ULONG reserved;
    Unit *subject, *text, *type, *date, *conversation;
    ULONG flags;
    MapiRecipient<Unit> *sender;
    ULONG recipientCount;
    MapiRecipient<Unit> *recipients;
    ULONG fileCount;
    MapiFile<Unit> *files;
};

template <typename Unit> ULONG Record(char const *function, ULONG_PTR session, ULONG_PTR window,
                                      MapiMessage<Unit> const &message, ULONG flags, ULONG reserved) {
    std::string record = std::string(function) + "\n";
    record += "session " + Number(session) + " window " + Number(window) + " flags " + Number(flags) + " reserved " +
              Number(reserved) + "\n";
    record += "message " + Number(message.reserved) + " " + Number(message.flags) + " sender " +
              (message.sender == nullptr ? "none" : "some") + " type " + Text(message.type) + " date " +
              Text(message.date) + " conversation " + Text(message.conversation) + "\n";
    record += "subject " + Text(message.subject) + "\n";
    record += "text " + Text(message.text) + "\n";
    for (ULONG i = 0; i < message.recipientCount; ++i) {
        auto const &one = message.recipients[i];
        record += one.kind == 1 ? "to " : one.kind == 2 ? "cc " : "other ";
        record += Number(one.reserved) + " " + Number(one.idSize) + (one.id == nullptr ? " none " : " some ") +
                  Text(one.name) + "|" + Text(one.address) + "\n";
    }
    for (ULONG i = 0; i < message.fileCount; ++i) {
        auto const &one = message.files[i];
        record += "file " + Number(one.reserved) + " " + Number(one.flags) + " " + Number(one.position) +
                  (one.type == nullptr ? " none " : " some ") + Text(one.path) + "|" + Text(one.name) + "\n";
    }
    HANDLE const file = CreateFileA(Variable(L"KT_MAPI_RECORD").c_str(), FILE_APPEND_DATA, 0, nullptr, OPEN_ALWAYS,
                                    FILE_ATTRIBUTE_NORMAL, nullptr);
    DWORD written = 0;
    WriteFile(file, record.data(), static_cast<DWORD>(record.size()), &written, nullptr);
    CloseHandle(file);
    std::string const result = Variable(L"KT_MAPI_RESULT");
    return result.empty() ? 0 : static_cast<ULONG>(std::stoul(result));
}

} // namespace

extern "C" {

#ifdef KT_MAPI_BYTES
__declspec(dllexport) ULONG WINAPI MAPISendMail(ULONG_PTR session, ULONG_PTR window, MapiMessage<char> *message,
                                                ULONG flags, ULONG reserved) {
    return Record("MAPISendMail", session, window, *message, flags, reserved);
}
#endif

#ifdef KT_MAPI_WIDE
__declspec(dllexport) ULONG WINAPI MAPISendMailW(ULONG_PTR session, ULONG_PTR window, MapiMessage<wchar_t> *message,
                                                 ULONG flags, ULONG reserved) {
    return Record("MAPISendMailW", session, window, *message, flags, reserved);
}
#endif

__declspec(dllexport) ULONG WINAPI MAPILogoff(ULONG_PTR, ULONG_PTR, ULONG, ULONG) { return 0; }
}
