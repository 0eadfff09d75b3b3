// WSETranslationMSVC.cpp: Visual C++'s own translation of structured exceptions (not checked here).

#include "WSETranslation.h"

#include <eh.h>

namespace {

thread_local WKTSETranslator t_Installed = nullptr;
thread_local WKTSETranslator t_Previous = nullptr;

} // namespace

WKTSETranslator WInstallTranslator(WKTSETranslator translator) {
    WKTSETranslator const replaced = _set_se_translator(translator);
    if (replaced != translator) {
        t_Installed = translator;
        t_Previous = replaced;
    }
    return replaced;
}

void WRestoreTranslator() noexcept {
    if (t_Installed != nullptr) {
        _set_se_translator(t_Previous);
        t_Installed = nullptr;
        t_Previous = nullptr;
    }
}
