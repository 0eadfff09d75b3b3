// SendMailTest.cpp: what a mail holds, and the texts of failures. Sending is the host's own here.

#include "KTPublicUtils.h"
#include "KTSendMail.h"
#include "MailDictionary.h"
#include "Units.h"

#include <gtest/gtest.h>

#include <type_traits>

namespace {

// Tells what it was given, and ends as it is told.
class HostMail : public KTSendMail {
  public:
    explicit HostMail(IKTStringDictionary &dictionary) : KTSendMail(dictionary) {}
    KTErrorCodeEnum SendMail() override { return SetOutcome(result, key); }
    using KTSendMail::GetContent;

    KTErrorCodeEnum result = kKTErrorNone;
    char const *key = "kKTNone";
};

static_assert(std::is_abstract_v<KTSendMail>);
static_assert(std::has_virtual_destructor_v<KTSendMail>);
static_assert(!std::is_copy_constructible_v<KTSendMail>);

TEST(SendMailTest, BeginsEmpty) {
    MailDictionary dictionary;
    HostMail const mail(dictionary);
    EXPECT_TRUE(mail.GetContent().to.empty());
    EXPECT_TRUE(mail.GetContent().cc.empty());
    EXPECT_TRUE(mail.GetContent().subject.empty());
    EXPECT_TRUE(mail.GetContent().body.empty());
    EXPECT_TRUE(mail.GetContent().files.empty());
    EXPECT_EQ(0, mail.GetSendMailSilently());
}

TEST(SendMailTest, SettersStoreAndSucceed) {
    MailDictionary dictionary;
    HostMail mail(dictionary);
    std::vector<KTString> const files{KTString("C:\\a.txt"), KTString("Größe.pdf")};
    EXPECT_EQ(kKTErrorNone, mail.SetToRecipients("to@example.com"));
    EXPECT_EQ(kKTErrorNone, mail.SetCCRecipients("cc@example.com"));
    EXPECT_EQ(kKTErrorNone, mail.SetEmailSubject("subject"));
    EXPECT_EQ(kKTErrorNone, mail.SetEmailBody("λιμάνι ⚓"));
    EXPECT_EQ(kKTErrorNone, mail.SetFileList(files));
    EXPECT_EQ(kKTErrorNone, mail.SetSendMailSilently(1));
    EXPECT_EQ("to@example.com", mail.GetContent().to);
    EXPECT_EQ("cc@example.com", mail.GetContent().cc);
    EXPECT_EQ("subject", mail.GetContent().subject);
    EXPECT_EQ("λιμάνι ⚓", mail.GetContent().body);
    EXPECT_EQ(files, mail.GetContent().files);
    EXPECT_EQ(1, mail.GetContent().silently);
}

TEST(SendMailTest, SettersReplace) {
    MailDictionary dictionary;
    HostMail mail(dictionary);
    mail.SetToRecipients("a@example.com");
    mail.SetToRecipients("");
    mail.SetFileList({KTString("a"), KTString("b")});
    mail.SetFileList({KTString("c")});
    EXPECT_TRUE(mail.GetContent().to.empty());
    EXPECT_EQ(std::vector<KTString>{KTString("c")}, mail.GetContent().files);
}

TEST(SendMailTest, SilenceIsTheNumberThatWasStored) {
    MailDictionary dictionary;
    HostMail mail(dictionary);
    for (short const value : {short{1}, short{0}, short{-1}, short{32767}}) {
        EXPECT_EQ(kKTErrorNone, mail.SetSendMailSilently(value));
        EXPECT_EQ(value, mail.GetSendMailSilently());
    }
}

TEST(SendMailTest, FailureTextsComeFromTheDictionary) {
    FullMailDictionary dictionary;
    HostMail mail(dictionary);
    mail.result = kKTErrorFailed;
    mail.key = "kKTMAPIError";
    mail.SendMail();
    KTErrorCodeEnum result = kKTErrorNone;
    EXPECT_EQ("Das Mailprogramm hat die Nachricht abgelehnt.", mail.GetFailureMessage(&result));
    EXPECT_EQ(kKTErrorFailed, result);

    mail.result = kKTErrorNone;
    mail.key = "kKTNone";
    mail.SendMail();
    EXPECT_EQ("Gesendet.", mail.GetFailureMessage(&result));
    EXPECT_EQ(kKTErrorNone, result);
    EXPECT_EQ((std::vector<std::string>{"kKTMAPIError", "kKTNone"}), dictionary.askedFor);
}

TEST(SendMailTest, TheDictionaryOfTheMomentCounts) {
    MailDictionary dictionary;
    HostMail mail(dictionary);
    mail.result = kKTErrorFailed;
    mail.key = "kKTMailClientError";
    mail.SendMail();
    dictionary.AddString("kKTMailClientError", "later");
    EXPECT_EQ("later", mail.GetFailureMessage(nullptr));
}

TEST(SendMailTest, ADictionaryWithoutTheTextsHasEnglishOnes) {
    MailDictionary dictionary;
    HostMail mail(dictionary);
    mail.key = "kKTMailClientError";
    mail.SendMail();
    EXPECT_EQ(
        "The default mail program could not be used. Please choose one in the system's settings, start it once, and "
        "try again.",
        mail.GetFailureMessage(nullptr));
    mail.key = "kKTMAPIError";
    mail.SendMail();
    EXPECT_EQ("The message could not be handed to the default mail program.", mail.GetFailureMessage(nullptr));
    mail.key = "kKTNone";
    mail.SendMail();
    EXPECT_TRUE(mail.GetFailureMessage(nullptr).empty());
}

TEST(SendMailTest, TheProcessWideDictionaryServes) {
    IKTStringDictionary &dictionary = KTPublicUtils::GetStringDictionary();
    HostMail mail(dictionary);
    mail.result = kKTErrorFailed;
    mail.key = "kKTMAPIError";
    mail.SendMail();
    EXPECT_EQ("The message could not be handed to the default mail program.", mail.GetFailureMessage(nullptr));
    dictionary.AddString("kKTMAPIError", "Η αποστολή απέτυχε.");
    EXPECT_EQ("Η αποστολή απέτυχε.", mail.GetFailureMessage(nullptr));
}

TEST(SendMailTest, BeforeTheFirstSendingNothingHasFailed) {
    FullMailDictionary dictionary;
    HostMail const mail(dictionary);
    KTErrorCodeEnum result = kKTErrorFailed;
    EXPECT_EQ("Gesendet.", mail.GetFailureMessage(&result));
    EXPECT_EQ(kKTErrorNone, result);
}

} // namespace
