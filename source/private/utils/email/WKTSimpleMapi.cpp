// WKTSimpleMapi.cpp: Simple MAPI, whose two functions differ in the characters of their texts only:
//
//     Message                     Recipient               File
//     u32  reserved, 0            u32  reserved, 0        u32  reserved, 0
//     ptr  subject                u32  1 to, 2 cc         u32  flags, 0
//     ptr  text                   ptr  name               u32  position in the text, -1: beside it
//     ptr  type, date,            ptr  address or null    ptr  full path
//          conversation: null     u32  entry id's size    ptr  name to show
//     u32  flags, 0               ptr  entry id, null     ptr  type, null
//     ptr  sender, null
//     u32  number, ptr recipients
//     u32  number, ptr files

#include "WKTSimpleMapi.h"

#include "KTFileUtil.h"
#include "KTMailRecipients.h"

#include <windows.h>

#include <mapi.h>

#include <bit>
#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <type_traits>
#include <vector>

namespace {

using Outcome = WKTMapiResult::Outcome;

// ---- what the functions take; the system's headers here know the byte form only ----

template <typename Unit> struct MapiFile {
    ULONG reserved;
    ULONG flags;
    ULONG position;
    Unit const *path;
    Unit const *name;
    void *type;
};

template <typename Unit> struct MapiRecipient {
    ULONG reserved;
    ULONG kind;
    Unit const *name;
    Unit const *address;
    ULONG idSize;
    void *id;
};

template <typename Unit> struct MapiMail {
    ULONG reserved;
    Unit const *subject;
    Unit const *text;
    Unit const *type;
    Unit const *date;
    Unit const *conversation;
    ULONG flags;
    MapiRecipient<Unit> *sender;
    ULONG recipientCount;
    MapiRecipient<Unit> *recipients;
    ULONG fileCount;
    MapiFile<Unit> *files;
};

static_assert(sizeof(MapiFile<char>) == sizeof(MapiFileDesc) &&
              offsetof(MapiFile<char>, name) == offsetof(MapiFileDesc, lpszFileName));
static_assert(sizeof(MapiRecipient<char>) == sizeof(MapiRecipDesc) &&
              offsetof(MapiRecipient<char>, address) == offsetof(MapiRecipDesc, lpszAddress));
static_assert(sizeof(MapiMail<char>) == sizeof(MapiMessage) &&
              offsetof(MapiMail<char>, recipients) == offsetof(MapiMessage, lpRecips) &&
              offsetof(MapiMail<char>, files) == offsetof(MapiMessage, lpFiles));

template <typename Unit> using SendFunction = ULONG(WINAPI *)(LHANDLE session, ULONG_PTR window, MapiMail<Unit> *mail,
                                                              FLAGS flags, ULONG reserved);

constexpr ULONG kBesideTheText = 0xFFFFFFFF;

// ---- the mail with its texts, which the structures above point to ----

template <typename Unit> struct Recipient {
    ULONG kind;
    std::basic_string<Unit> name;
    std::basic_string<Unit> address;
};

template <typename Unit> struct File {
    std::basic_string<Unit> path;
    std::basic_string<Unit> name;
};

template <typename Unit> struct Mail {
    std::basic_string<Unit> subject;
    std::basic_string<Unit> text;
    std::vector<Recipient<Unit>> recipients;
    std::vector<File<Unit>> files;
};

void AddRecipients(Mail<wchar_t> &mail, ULONG kind, KTString const &list) {
    for (KTMailRecipient const &one : KTParseMailRecipients(list)) {
        mail.recipients.push_back({kind, one.name.GetWstring(), one.address.GetWstring()});
    }
}

// The mail program would take such a text up to the zero only.
bool HasZero(KTString const &text) { return text.find(static_cast<unsigned short>(0)) != KTString::npos; }

std::optional<Mail<wchar_t>> MakeMail(KTSendMail::Content const &content) {
    if (HasZero(content.to) || HasZero(content.cc) || HasZero(content.subject) || HasZero(content.body)) {
        return std::nullopt;
    }
    Mail<wchar_t> mail{content.subject.GetWstring(), content.body.GetWstring(), {}, {}};
    AddRecipients(mail, MAPI_TO, content.to);
    AddRecipients(mail, MAPI_CC, content.cc);
    for (KTString const &file : content.files) {
        KTString const path = KTFileUtil::GetFullPath(KTFile(file)); // the mail program has a folder of its own
        if (path.empty()) {
            return std::nullopt;
        }
        mail.files.push_back({path.GetWstring(), KTFileUtil::GetFileName(path).GetWstring()});
    }
    return mail;
}

// Text in the system's code page. Fails if reading it back would give another text.
class Narrowing {
  public:
    std::string operator()(std::wstring const &text) {
        int const length = static_cast<int>(text.size());
        std::string bytes(Needed(WideCharToMultiByte(CP_ACP, 0, text.c_str(), length, nullptr, 0, nullptr, nullptr)),
                          '\0');
        int const size = static_cast<int>(bytes.size());
        WideCharToMultiByte(CP_ACP, 0, text.c_str(), length, bytes.data(), size, nullptr, nullptr);
        std::wstring back(Needed(MultiByteToWideChar(CP_ACP, 0, bytes.c_str(), size, nullptr, 0)), L'\0');
        MultiByteToWideChar(CP_ACP, 0, bytes.c_str(), size, back.data(), static_cast<int>(back.size()));
        m_IsExact = m_IsExact && back == text;
        return bytes;
    }

    bool IsExact() const noexcept { return m_IsExact; }

  private:
    static std::size_t Needed(int units) { return units < 0 ? 0 : static_cast<std::size_t>(units); }

    bool m_IsExact = true;
};

std::optional<Mail<char>> Narrowed(Mail<wchar_t> const &wide) {
    Narrowing narrow;
    Mail<char> mail{narrow(wide.subject), narrow(wide.text), {}, {}};
    for (auto const &one : wide.recipients) {
        mail.recipients.push_back({one.kind, narrow(one.name), narrow(one.address)});
    }
    for (auto const &one : wide.files) {
        mail.files.push_back({narrow(one.path), narrow(one.name)});
    }
    return narrow.IsExact() ? std::optional(std::move(mail)) : std::nullopt;
}

// ---- the call ----

template <typename Unit> WKTMapiResult Call(SendFunction<Unit> send, Mail<Unit> const &mail, bool silently) {
    std::vector<MapiRecipient<Unit>> recipients;
    recipients.reserve(mail.recipients.size());
    for (auto const &one : mail.recipients) {
        Unit const *const address = one.address.empty() ? nullptr : one.address.c_str();
        recipients.push_back({0, one.kind, one.name.c_str(), address, 0, nullptr});
    }
    std::vector<MapiFile<Unit>> files;
    files.reserve(mail.files.size());
    for (auto const &one : mail.files) {
        files.push_back({0, 0, kBesideTheText, one.path.c_str(), one.name.c_str(), nullptr});
    }
    MapiMail<Unit> message{};
    message.subject = mail.subject.c_str();
    message.text = mail.text.c_str();
    message.recipientCount = static_cast<ULONG>(recipients.size());
    message.recipients = recipients.empty() ? nullptr : recipients.data();
    message.fileCount = static_cast<ULONG>(files.size());
    message.files = files.empty() ? nullptr : files.data();
    auto const window = silently ? 0 : std::bit_cast<ULONG_PTR>(GetActiveWindow());
    ULONG const code = send(lhSessionNull, window, &message, silently ? 0 : MAPI_LOGON_UI | MAPI_DIALOG, 0);
    return {code == SUCCESS_SUCCESS ? Outcome::Sent : Outcome::Refused, code};
}

struct ReleaseModule {
    using pointer = HMODULE;
    void operator()(HMODULE module) const noexcept { FreeLibrary(module); }
};

} // namespace

WKTMapiResult WKTSendBySimpleMapi(KTSendMail::Content const &content) {
    // The program's own folder and the system's, never the current one, where a document's neighbour could pose as it.
    std::unique_ptr<HMODULE, ReleaseModule> const library(
        LoadLibraryExW(L"MAPI32.DLL", nullptr, LOAD_LIBRARY_SEARCH_DEFAULT_DIRS));
    if (!library) {
        return {Outcome::NotSupported};
    }
    auto const send = std::bit_cast<SendFunction<char>>(GetProcAddress(library.get(), "MAPISendMail"));
    if (send == nullptr) {
        return {Outcome::NotSupported};
    }
    bool const silently = content.silently != 0;
    auto const wide = MakeMail(content);
    if (!wide) {
        return {Outcome::Unfit};
    }
    if (auto const narrow = Narrowed(*wide)) {
        return Call(send, *narrow, silently);
    }
    auto const sendWide = std::bit_cast<SendFunction<wchar_t>>(GetProcAddress(library.get(), "MAPISendMailW"));
    if (sendWide == nullptr) {
        return {Outcome::Unfit};
    }
    return Call(sendWide, *wide, silently);
}
