// KTSendMail.cpp: what a mail holds, and the texts of failures.

#include "KTSendMail.h"

#include "IKTStringDictionary.h"
#include "KTMailKeys.h"

#include <algorithm>
#include <array>
#include <string_view>

namespace {

struct DefaultText {
    std::string_view key;
    char const *text;
};

// What is told where the dictionary has no text.
constexpr std::array kDefaultTexts{
    DefaultText{
        kKTMailClientErrorKey,
        "The default mail program could not be used. Please choose one in the system's settings, start it once, "
        "and try again."},
    DefaultText{kKTMAPIErrorKey, "The message could not be handed to the default mail program."},
};

KTString DefaultTextOf(std::string_view key) {
    auto const *const found =
        std::find_if(kDefaultTexts.begin(), kDefaultTexts.end(), [key](auto const &one) { return one.key == key; });
    return found == kDefaultTexts.end() ? KTString() : KTString(found->text);
}

} // namespace

KTSendMail::KTSendMail(IKTStringDictionary &dictionary) : m_Dictionary(&dictionary), m_MessageKey(kKTNoneKey) {}

KTSendMail::~KTSendMail() = default;

KTErrorCodeEnum KTSendMail::SetToRecipients(KTString const &recipients) {
    m_Content.to = recipients;
    return kKTErrorNone;
}

KTErrorCodeEnum KTSendMail::SetCCRecipients(KTString const &recipients) {
    m_Content.cc = recipients;
    return kKTErrorNone;
}

KTErrorCodeEnum KTSendMail::SetEmailSubject(KTString const &subject) {
    m_Content.subject = subject;
    return kKTErrorNone;
}

KTErrorCodeEnum KTSendMail::SetEmailBody(KTString const &body) {
    m_Content.body = body;
    return kKTErrorNone;
}

KTErrorCodeEnum KTSendMail::SetFileList(std::vector<KTString> const &files) {
    m_Content.files = files;
    return kKTErrorNone;
}

KTErrorCodeEnum KTSendMail::SetSendMailSilently(short silently) {
    m_Content.silently = silently;
    return kKTErrorNone;
}

short KTSendMail::GetSendMailSilently() const { return m_Content.silently; }

KTString KTSendMail::GetFailureMessage(KTErrorCodeEnum *result) const {
    if (result != nullptr) {
        *result = m_Result;
    }
    KTString text = m_Dictionary->GetKeyValue(KTString(m_MessageKey));
    return text.empty() ? DefaultTextOf(m_MessageKey) : text;
}

KTSendMail::Content const &KTSendMail::GetContent() const { return m_Content; }

KTErrorCodeEnum KTSendMail::SetOutcome(KTErrorCodeEnum result, char const *messageKey) {
    m_Result = result;
    m_MessageKey = messageKey;
    return result;
}
