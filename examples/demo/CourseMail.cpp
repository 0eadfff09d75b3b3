// CourseMail.cpp: the mail sender.

#include "CourseMail.h"

#include "KTPublicUtils.h"
#include "KTRegistryUtils.h"
#include "KTSendMail.h"
#include "KTStringDictionary.h"
#include "Table.h"

#include <memory>
#include <new>

namespace {

// The machine's default mail program, where the library finds it too; empty if there is none.
KTString MailProgram() {
    KTString const programs("Software\\Clients\\Mail\\");
    KTString name;
    KTString library;
    bool const isThere = KTRegistryUtils::GetSystemItem(programs, name) == kKTErrorNone && !name.empty() &&
                         KTRegistryUtils::GetSystemItem(programs + name + "\\DLLPath", library) == kKTErrorNone;
    return isThere ? name : KTString();
}

} // namespace

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
