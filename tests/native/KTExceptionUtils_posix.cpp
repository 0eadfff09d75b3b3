// KTExceptionUtils_posix.cpp: crash handling of the native developer build: no translator and no dumps. The default
// handler does what comes before the message and runs the clean-up callbacks; the process goes on.

#include "KTCrashCallBacks.h"
#include "KTExceptionUtils.h"

namespace {

class NativeExceptionUtils final : public KTExceptionUtils {
  public:
    void InstallExceptionHandlerImpl() override {}
    void RestorePreviousHandler() const override {}

    void DefaultHandler(KTException const &) override {
        if (!EnterDefaultHandler()) {
            return;
        }
        if (KTBackUpDataCallBack const backUpData = KTGetBackUpDataCallBack()) {
            backUpData();
        }
        RunCleanUpCallBacks();
    }
};

} // namespace

KTExceptionUtils &KTExceptionUtils::GetInstance() {
    static NativeExceptionUtils instance;
    return instance;
}

void KTExceptionUtils::CopyLastDumpToDumpOnceFolder() {}
