// CourseMail.cpp: the mail sender.

#include "CourseMail.h"

#include "KTPublicUtils.h"
#include "KTSendMail.h"
#include "KTStringDictionary.h"
#include "Table.h"
#include "WMail.h"

#include <memory>
#include <new>

std::string ReportMail() {
    KTString const program = MailProgram();
    if (!program.empty()) {
        return "Mail\n  the course would be sent by: " + Printable(program) + "\n\n"; // the user has not asked for it
    }
    IKTStringDictionary &dictionary = KTPublicUtils::GetStringDictionary();
    dictionary.AddString("kKTMailClientError", "No mail program is set up on this machine.");
    std::unique_ptr<KTSendMail> const mail(KTSendMail::GetSendMailHandler(dictionary));
    if (!mail) {
        throw std::bad_alloc();
    }
    mail->SetEmailSubject("Course for review");
    mail->SendMail(); // without a mail program it can only fail, and shows nothing
    return "Mail\n  not sent: " + Printable(mail->GetFailureMessage(nullptr)) + "\n\n";
}
