// WKTSimpleMapi.h: a mail through the mail program's simple programming interface. Windows half only.

#pragma once

#include "KTSendMail.h"

/// What became of a mail.
struct WKTMapiResult {
    enum class Outcome {
        Sent,         ///< the mail program has taken it
        NotSupported, ///< there is no MAPI32.DLL, or it has no MAPISendMail
        Unfit,        ///< an attachment is no valid path, or a text has a zero inside or does not fit the code page
        Refused,      ///< the mail program did not take it, or the user cancelled
    };

    Outcome outcome = Outcome::NotSupported;
    unsigned long code = 0; ///< what the mail program returned, if it was called
};

/// Hands the mail to MAPI32.DLL and waits until it is sent; the DLL is released afterwards. Without `silently` the mail
/// program shows the message, above the calling thread's active window, and signs the user in where it must; with it,
/// no window appears.
///
/// MAPISendMail takes texts in the system's code page. A mail that this cannot hold goes to MAPISendMailW where the DLL
/// has that, and nowhere otherwise: question marks in an address, a path or the author's text are worse than a failure.
WKTMapiResult WKTSendBySimpleMapi(KTSendMail::Content const &content);
