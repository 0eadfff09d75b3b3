// KTMailRecipients.h: a list of recipients, as an author writes it, taken apart.
//
//     jane@example.com; "Doe, John" <john@example.com>; Harbour Office
//
//     name                address
//     jane@example.com    SMTP:jane@example.com
//     Doe, John           SMTP:john@example.com
//     Harbour Office                               for the mail program's address book to resolve

#pragma once

#include "KTString.h"

#include <vector>

struct KTMailRecipient {
    KTString name;
    KTString address; ///< type, colon, address; empty if only a name is known
};

/// The recipients in their order; empty pieces are left out. Semicolons and line ends separate; where the list has no
/// semicolon, commas do too. Inside double quotes (a backslash takes the next character as it is) and angle brackets
/// nothing separates; a quote or bracket that is never closed is an ordinary character. An address that begins with
/// letters and a colon has its type already, others are of type SMTP. Any thread.
std::vector<KTMailRecipient> KTParseMailRecipients(KTString const &list);
