// WMail.h: what the demo asks the system about mail.

#pragma once

#include "KTString.h"

/// The machine's default mail program, as the library would find it; empty if there is none.
KTString MailProgram();
