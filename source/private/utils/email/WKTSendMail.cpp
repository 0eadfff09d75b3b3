// WKTSendMail.cpp: sends a mail through the machine's default mail program.
//
//     registry -> the program's name -> "Microsoft Outlook": automation
//                                       every other:         Simple MAPI
//
// Whatever fails is told by a message key and, for support, in the log. Each step of the automation has an assertion
// line of its own:
//
//     141  OLE              178  GetNameSpace       213  Subject       246  Attachments
//     148  class id         187  GetDefaultFolder   221  Body          258  Add
//     163  new instance     195  Display            229  To            269  GetInspector
//                           204  CreateItem         237  Cc            278  Send
//                                                                      284  Activate
//
// and 357 is a missing Simple MAPI.

#include "WKTSendMail.h"

#include "KTAssert.h"
#include "KTFileUtil.h"
#include "KTLogger.h"
#include "KTMailKeys.h"
#include "WKTAutomation.h"
#include "WKTMailClient.h"
#include "WKTSimpleMapi.h"

#include <array>
#include <cstdio>
#include <new>
#include <string>

namespace {

constexpr char kSource[] = "source/private/utils/email/WKTSendMail";
constexpr wchar_t kOutlook[] = L"Microsoft Outlook";
constexpr wchar_t kOutlookApplication[] = L"Outlook.Application";
constexpr long kInboxFolder = 6; // every mailbox has one, and showing it brings up the usual window
constexpr long kMailItem = 0;

std::string Utf8(std::wstring const &text) { return KTString(text.c_str()).GetUTF8String(); }

// Whether the step succeeded; a failed one is reported as "STEP: CODE REASON".
bool Check(char const *step, KTInt32 line, WKTAutomationResult const &result) {
    if (result.Succeeded()) {
        return true;
    }
    std::array<char, 16> code{};
    std::snprintf(code.data(), code.size(), ": 0x%08lX", static_cast<unsigned long>(result.code));
    std::string message = std::string(step) + code.data();
    if (!result.reason.empty()) {
        message += ' ';
        message += Utf8(result.reason);
    }
    KTAssertFailed(message.c_str(), kSource, line);
    return false;
}

bool Check(char const *step, KTInt32 line, HRESULT result) {
    return Check(step, line, WKTAutomationResult{result, {}});
}

// Brings Outlook's main window up, as a user who starts it would; without one, a message's window cannot be shown.
bool ShowInbox(WKTAutomationObject &application) {
    WKTAutomationObject session;
    WKTAutomationObject folder;
    return Check("GetNameSpace", 178, application.Call(L"GetNameSpace", WKTVariant(KTString("MAPI")), &session)) &&
           Check("GetDefaultFolder", 187, session.Call(L"GetDefaultFolder", WKTVariant(kInboxFolder), &folder)) &&
           Check("Display", 195, folder.Call(L"Display"));
}

bool AddFiles(WKTAutomationObject &item, std::vector<KTString> const &files) {
    WKTAutomationObject attachments;
    if (!Check("Attachments", 246, item.Read(L"Attachments", &attachments))) {
        return false;
    }
    for (KTString const &file : files) {
        KTString const path = KTFileUtil::GetFullPath(KTFile(file)); // Outlook has a folder of its own
        WKTAutomationResult const added =
            path.empty() ? WKTAutomationResult{E_INVALIDARG, {}} : attachments.Call(L"Add", WKTVariant(path));
        if (!Check("Add", 258, added)) {
            return false;
        }
    }
    return true;
}

bool SendItem(WKTAutomationObject &item, KTSendMail::Content const &content) {
    WKTAutomationObject inspector;
    if (!Check("Subject", 213, item.Set(L"Subject", content.subject)) ||
        !Check("Body", 221, item.Set(L"Body", content.body + "\r\n\r\n")) ||
        !Check("To", 229, item.Set(L"To", content.to)) || !Check("Cc", 237, item.Set(L"Cc", content.cc)) ||
        !AddFiles(item, content.files) || !Check("GetInspector", 269, item.Read(L"GetInspector", &inspector))) {
        return false;
    }
    return content.silently != 0 ? Check("Send", 278, item.Call(L"Send"))
                                 : Check("Activate", 284, inspector.Call(L"Activate"));
}

bool SendByOutlook(KTSendMail::Content const &content) {
    WKTOleScope const ole;
    CLSID classId{};
    if (!Check("OleInitialize", 141, ole.Result()) ||
        !Check("CLSIDFromProgID", 148, CLSIDFromProgID(kOutlookApplication, &classId))) {
        return false;
    }
    WKTAutomationObject application;
    if (FAILED(application.Attach(classId)) && !Check("CoCreateInstance", 163, application.Create(classId))) {
        return false;
    }
    WKTAutomationObject item;
    return ShowInbox(application) &&
           Check("CreateItem", 204, application.Call(L"CreateItem", WKTVariant(kMailItem), &item)) &&
           SendItem(item, content);
}

bool SendByMapi(KTSendMail::Content const &content) {
    WKTMapiResult const result = WKTSendBySimpleMapi(content);
    switch (result.outcome) {
    case WKTMapiResult::Outcome::Sent:
        return true;
    case WKTMapiResult::Outcome::NotSupported:
        KTAssertFailed("Doesn't Support MAPI", kSource, 357);
        return false;
    case WKTMapiResult::Outcome::Unfit:
        gKTLogger->Log("KTSendMail: a path or a text cannot be handed to MAPISendMail");
        return false;
    case WKTMapiResult::Outcome::Refused:
        gKTLogger->Log("KTSendMail: MAPISendMail returned %lu", result.code);
        return false;
    }
    return false;
}

// PreFirstRun is the mail program's own advice to a user who has not set it up: the likeliest reason of a failure.
void LogClient(WKTMailClient const &client) {
    gKTLogger->Log("KTSendMail: not sent through %s, DLLPath \"%s\", PreFirstRun \"%s\"", Utf8(client.name).c_str(),
                   Utf8(client.dllPath).c_str(), Utf8(client.preFirstRun).c_str());
}

} // namespace

KTSendMail *KTSendMail::GetSendMailHandler(IKTStringDictionary &dictionary) {
    return new (std::nothrow) WKTSendMail(dictionary);
}

WKTSendMail::WKTSendMail(IKTStringDictionary &dictionary) : KTSendMail(dictionary) {}

WKTSendMail::~WKTSendMail() = default;

KTErrorCodeEnum WKTSendMail::SendMail() {
    auto const client = WKTFindMailClient();
    if (!client) {
        return SetOutcome(kKTErrorFailed, kKTMailClientErrorKey);
    }
    bool const isOutlook = client->name == kOutlook;
    bool const isSent = isOutlook ? SendByOutlook(GetContent()) : SendByMapi(GetContent());
    if (isSent) {
        return SetOutcome(kKTErrorNone, kKTNoneKey);
    }
    LogClient(*client);
    return SetOutcome(kKTErrorFailed, isOutlook ? kKTMailClientErrorKey : kKTMAPIErrorKey);
}
