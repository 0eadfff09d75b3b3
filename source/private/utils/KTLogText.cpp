// KTLogText.cpp: the byte-wise conversions between a message's narrow and wide forms. No character set is involved, on
// purpose: a log must never fail on its text.

#include "KTLogText.h"

std::string KTNarrowToLowBytes(std::wstring const &message) {
    std::string bytes(message.size(), '\0');
    for (std::size_t i = 0; i < message.size(); ++i) {
        bytes[i] = static_cast<char>(static_cast<unsigned char>(message[i] & 0xFF));
    }
    return bytes;
}

std::wstring KTWidenSigned(std::string const &message) {
    std::wstring text(message.size(), L'\0');
    for (std::size_t i = 0; i < message.size(); ++i) {
        text[i] = static_cast<wchar_t>(static_cast<unsigned short>(static_cast<signed char>(message[i])));
    }
    return text;
}
