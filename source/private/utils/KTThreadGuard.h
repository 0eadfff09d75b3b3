// KTThreadGuard.h: what the loops of the library's own threads run under.

#pragma once

#include "KTException.h"
#include "KTExceptionMsgManager.h"
#include "KTExceptionUtils.h"

/// Installs the exception handler on the calling thread and runs `body`. An exception that ends it goes to
/// KTExceptionUtils::HandleException: a KTException as it is, a structured exception among them; for any other a
/// KTFatalException with the key of the fatal-error message.
template <typename Body> void KTRunGuarded(Body const &body) {
    try {
        KTExceptionUtils::InstallExceptionHandler();
        body();
    } catch (KTException const &exception) {
        KTExceptionUtils::HandleException(exception);
    } catch (...) {
        KTExceptionUtils::HandleException(KTFatalException(kKTExceptionMsgStr));
    }
}
