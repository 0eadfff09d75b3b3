// KTSMBUtils.cpp: share URLs, taken apart.

#include "KTSMBUtils.h"

#include "KTAssert.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstring>
#include <limits>
#include <string>

namespace {

constexpr char kSourcePath[] = "source/private/utils/KTSMBUtils";
constexpr unsigned short kSlash = '/';
constexpr std::array<unsigned short, 3> kScheme = {'s', 'm', 'b'};

// In the order in which they are tried.
constexpr std::array<char const *, 3> kPrefixes = {"file://///", "file://localhost///", "smb://"};

// More units than the longest prefix has, as a URL must be longer than its prefix.
constexpr std::size_t kDecidingUnits = 20;
static_assert(kDecidingUnits > std::char_traits<char>::length(kPrefixes[1]));

// The URL's beginning as bytes. A unit that is not ASCII has several in UTF-8, and no prefix has any of them: one that
// is not ASCII either stands for them.
std::array<char, kDecidingUnits + 1> BeginningOf(KTString const &url) {
    std::array<char, kDecidingUnits + 1> bytes{};
    std::size_t const count = std::min(url.size(), kDecidingUnits);
    for (std::size_t i = 0; i < count; ++i) {
        bytes[i] = url[i] < 0x80 ? static_cast<char>(url[i]) : '\xFF';
    }
    return bytes;
}

// Prefixes are ASCII: as many bytes as units.
bool SkipPrefix(KTString const &url, unsigned int &position) {
    auto const beginning = BeginningOf(url);
    return std::any_of(kPrefixes.begin(), kPrefixes.end(), [&](char const *prefix) {
        return KTSMBUtils::urlBeginsWith(beginning.data(), prefix, &position);
    });
}

} // namespace

bool KTSMBUtils::urlBeginsWith(char const *url, char const *prefix, unsigned int *length) {
    if (url == nullptr) {
        KTAssertFailed("", kSourcePath, 126);
    }
    if (prefix == nullptr) {
        KTAssertFailed("", kSourcePath, 127);
    }
    if (url == nullptr || prefix == nullptr) {
        return false;
    }
    std::size_t const prefixLength = std::strlen(prefix);
    if (std::strncmp(url, prefix, prefixLength) != 0 || url[prefixLength] == '\0') {
        return false;
    }
    if (length != nullptr) {
        *length = static_cast<unsigned int>(prefixLength);
    }
    return true;
}

bool KTSMBUtils::getFirstPathElement(KTString const &text, unsigned int &position, KTString &element) {
    std::size_t const start = position; // wider than the position, so that no sum wraps around
    if (start + 1 >= text.size() || text[start] == kSlash) {
        return false;
    }
    std::size_t const slash = text.find(kSlash, start);
    // The position behind the slash must fit its type, too. No slash is npos, which is larger still.
    if (slash >= std::numeric_limits<unsigned int>::max()) {
        return false;
    }
    if (slash == 0) {
        KTAssertFailed("", kSourcePath, 101);
    }
    if (slash == start) {
        KTAssertFailed("", kSourcePath, 103);
    }
    element.assign(text, start, slash - start);
    position = static_cast<unsigned int>(slash + 1);
    return true;
}

bool KTSMBUtils::parseFdfSmbUrl(KTString const &url, KTString &scheme, KTString &authority, KTString &share,
                                KTString &path) {
    unsigned int position = 0;
    if (url.empty() || !SkipPrefix(url, position)) {
        return false;
    }
    scheme.assign(kScheme.data(), kScheme.size());
    if (!getFirstPathElement(url, position, authority) || !getFirstPathElement(url, position, share)) {
        return false;
    }
    std::size_t const rest = position;
    if (rest + 1 < url.size()) {
        path.assign(url, rest, KTString::npos);
    }
    return true;
}

void KTSMBUtils::deMicrosoftizeSlashes(KTString &) {}

KTSmbUrl::KTSmbUrl(KTString const &url) { KTSMBUtils::parseFdfSmbUrl(url, m_Scheme, m_Authority, m_Share, m_SmbPath); }

KTSmbUrl::KTSmbUrl(KTSmbUrl const &other) = default;

KTSmbUrl &KTSmbUrl::operator=(KTSmbUrl const &other) = default;

KTSmbUrl::~KTSmbUrl() = default;

KTString const &KTSmbUrl::getScheme() const { return m_Scheme; }

KTString const &KTSmbUrl::getAuthority() const { return m_Authority; }

KTString const &KTSmbUrl::getShare() const { return m_Share; }

KTString const &KTSmbUrl::getSmbPath() const { return m_SmbPath; }
