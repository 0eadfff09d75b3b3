// KTSendMail.h: a mail, written by the host and sent through the user's own mail program.
//
//     std::unique_ptr<KTSendMail> const mail(KTSendMail::GetSendMailHandler(dictionary));
//     mail->SetToRecipients("jane@example.com; Bob <bob@example.com>");
//     mail->SetEmailSubject("Course for review");
//     mail->SetFileList({"C:\\Courses\\Harbour.zip"});
//     if (mail->SendMail() != kKTErrorNone)
//         ... show mail->GetFailureMessage(nullptr)
//
// Microsoft Outlook, where it is the machine's default mail program, is driven by automation; every other program is
// called through Simple MAPI. docs/mail.md tells more.
//
// Threads: one object belongs to one thread at a time; several objects may be used at once. Sending returns when the
// mail program has taken the mail, and with a shown message that is when the user has closed it (Simple MAPI), so send
// on a thread that may wait. Outlook needs a thread that is not in the multithreaded apartment.

#pragma once

#include "KTErrorCodes.h"
#include "KTString.h"

#include <vector>

#include "KTBeginExports.h"

class IKTStringDictionary;

/// One mail and the outcome of its last sending. Abstract: GetSendMailHandler makes the one that sends.
class KT_PUBLIC_API KTSendMail {
  public:
    /// What the setters have stored.
    struct Content {
        KTString to;                 ///< recipients, as SetToRecipients takes them
        KTString cc;                 ///< recipients of copies, the same way
        KTString subject;            ///< one line
        KTString body;               ///< plain text
        std::vector<KTString> files; ///< paths of the attachments
        short silently = 0;          ///< 0: the user sees the message and sends it
    };

    KTSendMail(KTSendMail const &) = delete;
    KTSendMail &operator=(KTSendMail const &) = delete;

    /// A new, empty mail, which the caller deletes; null if there is no memory for it. It looks failure texts up in
    /// `dictionary`, which must live as long. Any thread.
    static KTSendMail *GetSendMailHandler(IKTStringDictionary &dictionary);

    /// Sends the mail as it stands; it may be sent again, changed or not. kKTErrorFailed if the default mail program
    /// cannot be determined (message key "kKTMailClientError"), Outlook does not do as it is told ("kKTMailClientError",
    /// and an assertion that names the step), or Simple MAPI is missing, refuses or is cancelled by the user, or cannot be
    /// handed the mail as it is: an attachment is no valid path, or a text has a zero inside or a character that it does
    /// not take ("kKTMAPIError"). Nothing has been sent then. kKTErrorNone ("kKTNone") if the mail program has taken the mail, or
    /// shows it, in the case of Outlook. Throws std::bad_alloc.
    virtual KTErrorCodeEnum SendMail() = 0;

    virtual ~KTSendMail();

    /// Stores the recipients: addresses, "Name <address>", or names that the user's address book has. Semicolons and
    /// line ends separate them; commas do where there is no semicolon. A name with a separator in it stands in double
    /// quotes. Outlook gets the text as it is. Returns kKTErrorNone, as all setters do.
    KTErrorCodeEnum SetToRecipients(KTString const &recipients);

    /// Stores the recipients of copies, in the same form.
    KTErrorCodeEnum SetCCRecipients(KTString const &recipients);

    /// Stores the subject.
    KTErrorCodeEnum SetEmailSubject(KTString const &subject);

    /// Stores the text. Outlook gets two line ends ("\r\n\r\n") more, so that attachments do not stick to the text.
    KTErrorCodeEnum SetEmailBody(KTString const &body);

    /// Stores the attachments' paths, in the forms that KTFileUtil takes. The files are read when the mail is sent; one
    /// that is not there makes the mail program refuse the mail.
    KTErrorCodeEnum SetFileList(std::vector<KTString> const &files);

    /// Stores whether the mail is sent without being shown: 0 shows it, as a new object does; anything else sends it at
    /// once, without any window of Simple MAPI, which fails then if the user would have to sign in.
    KTErrorCodeEnum SetSendMailSilently(short silently);

    /// The value that was stored.
    short GetSendMailSilently() const;

    /// Why the last sending failed: the dictionary's text for its message key, as the dictionary is now; where the
    /// dictionary has none, an English text. After a success, and before the first sending, that is the text for
    /// "kKTNone", empty unless the dictionary has one. Stores the last sending's result through `result` unless that is
    /// null.
    KTString GetFailureMessage(KTErrorCodeEnum *result) const;

  protected:
    /// REQUIRES: the dictionary lives as long as the object.
    explicit KTSendMail(IKTStringDictionary &dictionary);

    /// What is to be sent.
    Content const &GetContent() const;

    /// Keeps the outcome of a sending for GetFailureMessage and returns `result`. REQUIRES: `messageKey` lives as long as
    /// the object.
    KTErrorCodeEnum SetOutcome(KTErrorCodeEnum result, char const *messageKey);

  private:
    IKTStringDictionary *m_Dictionary;
    Content m_Content;
    KTErrorCodeEnum m_Result = kKTErrorNone;
    char const *m_MessageKey;
};

#include "KTEndExports.h"
