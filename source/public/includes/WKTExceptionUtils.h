// WKTExceptionUtils.h: crash handling on Windows.
//
// docs/exceptions.md tells how a structured exception is turned into a C++ exception, and which are not.

#pragma once

#include "KTExceptionUtils.h"

#include "KTBeginExports.h"

/// Turns a structured exception on its own thread into a C++ exception by throwing one.
using WKTSETranslator = void (*)(unsigned int code, _EXCEPTION_POINTERS *pointers);

/// The instance behind KTExceptionUtils on Windows.
class KT_PUBLIC_API WKTExceptionUtils : public KTExceptionUtils {
  public:
    ~WKTExceptionUtils() override;
    void InstallExceptionHandlerImpl() override;
    void DefaultHandler(KTException const &exception) override;
    void RestorePreviousHandler() const override;

    /// The one instance, made by the first call.
    static KTExceptionUtils &GetInstance();

  private:
    WKTExceptionUtils();

    // What the last first installation on a thread replaced; each thread's own is kept with its translator.
    std::atomic<WKTSETranslator> m_PreviousTranslator;
};

#include "KTEndExports.h"
