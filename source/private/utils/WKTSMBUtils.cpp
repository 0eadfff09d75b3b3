// WKTSMBUtils.cpp: shares as the file system reaches them.

#include "KTAssert.h"
#include "KTFile.h"
#include "KTSMBUtils.h"

namespace {

constexpr char kFilePrefix[] = "file://";
constexpr char kSmbPrefix[] = "smb://";

// The URL's share, and what is below it.
KTString Compose(char const *prefix, KTSmbUrl const &url) {
    KTString text(prefix);
    text += url.getAuthority();
    text += "/";
    text += url.getShare();
    text += "/";
    text += url.getSmbPath();
    return text;
}

} // namespace

unsigned short const KTSMBConnector::CONNECTION_ESTABLISHED;
unsigned short const KTSMBConnector::ERROR_AUTH_FAILED;
unsigned short const KTSMBConnector::ERROR_SERVER_NOT_FOUND;
unsigned short const KTSMBConnector::GENERAL_SERVER_ERROR;

KTSMBConnector::KTSMBConnector() : m_ConnectionFailed(false) {}

KTSMBConnector::KTSMBConnector(KTSMBConnector const &other) = default;

KTSMBConnector &KTSMBConnector::operator=(KTSMBConnector const &other) = default;

KTSMBConnector::~KTSMBConnector() = default;

unsigned short KTSMBConnector::connect(KTString const &url) {
    KTSmbUrl const parsed(url);
    m_Url = url;
    unsigned short const status = mountSmbUrl(parsed);
    m_ConnectionFailed = status != CONNECTION_ESTABLISHED;
    return status;
}

// A member although it needs no object: hosts call it on one.
unsigned short
KTSMBConnector::mountSmbUrl(KTSmbUrl const &url) { // NOLINT(readability-convert-member-functions-to-static)
    if (url.getAuthority().empty() || url.getShare().empty()) {
        KTAssertFailed("", "source/private/utils/WKTSMBUtils", 66);
        return ERROR_SERVER_NOT_FOUND;
    }
    try {
        KTString location(kFilePrefix);
        location += url.getAuthority();
        location += "/";
        location += url.getShare();
        return KTFile(location).Exists() ? CONNECTION_ESTABLISHED : GENERAL_SERVER_ERROR;
    } catch (...) {
        return GENERAL_SERVER_ERROR;
    }
}

// NOLINTNEXTLINE(readability-convert-member-functions-to-static): as above
unsigned short KTSMBConnector::disconnect() { return 0; }

// NOLINTNEXTLINE(readability-make-member-function-const): its exported name is that of a member that may change it
bool KTSMBConnector::connectionFailed() { return m_ConnectionFailed; }

void KTSMBConnector::getLocalPath(KTString &path) const { path = Compose(kFilePrefix, KTSmbUrl(m_Url)); }

void KTSMBConnector::getSmbUrl(KTString &url) const { url = Compose(kSmbPrefix, KTSmbUrl(m_Url)); }
