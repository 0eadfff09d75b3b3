// MailRecipientsFuzz.cpp: lists of recipients. Input: the list, UTF-8.

#include "email/KTMailRecipients.h"
#include "KTString.h"

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

namespace {

void Check(bool holds) {
    if (!holds) {
        std::abort();
    }
}

bool IsSeparator(unsigned short unit) { return unit == ';' || unit == ',' || unit == '\r' || unit == '\n'; }

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    KTString const list(std::string(data, data + size).c_str());
    std::vector<KTMailRecipient> const recipients = KTParseMailRecipients(list);

    auto const separators = std::count_if(list.begin(), list.end(), IsSeparator);
    Check(recipients.size() <= static_cast<std::size_t>(separators) + 1);
    for (KTMailRecipient const &one : recipients) {
        Check(!one.name.empty());
        Check(one.name.size() <= list.size());
        Check(one.address.empty() || one.address.find(static_cast<unsigned short>(':')) != KTString::npos);
    }

    // Written one by one in brackets, addresses come back as they were.
    for (KTMailRecipient const &one : recipients) {
        if (!one.address.empty() && one.address.find(static_cast<unsigned short>('>')) == KTString::npos) {
            std::vector<KTMailRecipient> const again = KTParseMailRecipients("A <" + one.address + ">");
            Check(again.size() == 1 && again[0].name == "A" && again[0].address == one.address);
        }
    }
    return 0;
}
