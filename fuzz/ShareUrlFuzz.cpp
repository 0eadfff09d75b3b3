// ShareUrlFuzz.cpp: any text as a share URL, against a plain reader; and its elements from any position.
//
// Input: the text as UTF-8; the same bytes are also taken as units. The first two bytes are a position.

#include "KTSMBUtils.h"
#include "ShareUrl.h"

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>

namespace {

void Check(bool holds) {
    if (!holds) {
        std::abort();
    }
}

void CheckUrl(KTString const &text) {
    ShareUrlParts const expected = ReferenceShareUrl(text);
    KTSmbUrl const url(text);
    Check(url.getScheme() == expected.scheme.c_str());
    Check(url.getAuthority() == expected.authority);
    Check(url.getShare() == expected.share);
    Check(url.getSmbPath() == expected.path);
    KTString scheme;
    KTString authority;
    KTString share;
    KTString path;
    Check(KTSMBUtils::parseFdfSmbUrl(text, scheme, authority, share, path) == expected.found);
    Check(scheme == url.getScheme() && authority == url.getAuthority() && share == url.getShare() &&
          path == url.getSmbPath());
}

// An element that is found ends at its slash and has none inside; otherwise nothing has changed.
void CheckElement(KTString const &text, unsigned int start) {
    KTString element("old");
    unsigned int position = start;
    if (KTSMBUtils::getFirstPathElement(text, position, element)) {
        Check(position > start && position <= text.size() && text[position - 1] == '/');
        Check(element == text.substr(start, position - 1 - start) && !element.empty());
        Check(element.find(static_cast<unsigned short>('/')) == KTString::npos);
    } else {
        Check(position == start && element == KTString("old"));
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    std::string const bytes(reinterpret_cast<char const *>(data), size);
    KTString const text(OString::FromUTF8(bytes));
    Units units(size / 2);
    if (!units.empty()) {
        std::memcpy(units.data(), data, units.size() * 2);
    }
    unsigned int const position = units.empty() ? 0U : units[0];
    for (KTString const &one : {text, KTString("smb://") + text, FromUnits(units)}) {
        CheckUrl(one);
        for (unsigned int const start : {0U, position, position % 32, 0xFFFFFFFFU - position}) {
            CheckElement(one, start);
        }
    }
    return 0;
}
