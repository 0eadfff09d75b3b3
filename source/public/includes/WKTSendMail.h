// WKTSendMail.h: the mail sender on Windows. Hosts get one from KTSendMail::GetSendMailHandler.

#pragma once

#include "KTSendMail.h"

#include "KTBeginExports.h"

/// Sends through the machine's default mail program.
class KT_PUBLIC_API WKTSendMail : public KTSendMail {
  public:
    /// An empty mail. REQUIRES: the dictionary lives as long.
    explicit WKTSendMail(IKTStringDictionary &dictionary);

    KTErrorCodeEnum SendMail() override;
    ~WKTSendMail() override;
};

#include "KTEndExports.h"
