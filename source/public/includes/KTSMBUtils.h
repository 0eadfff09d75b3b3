// KTSMBUtils.h: URLs of network shares, and whether a share can be reached.
//
//     smb://server/share/course/unit.txt
//           |      |     |
//           |      |     smbPath: all after the share's slash
//           |      share
//           authority
//
// The same place may be written file://///server/share/... or file://localhost///server/share/... . Prefixes are
// compared byte by byte, so "SMB://" is none; escapes ("%20") and back slashes stay as they are. Authority and share
// count only when a slash ends them: smb://server/share names no share, smb://server/share/ does.
//
//     KTSMBConnector connector;
//     if (connector.connect(KTString("smb://server/share/course/")) == KTSMBConnector::CONNECTION_ESTABLISHED) ...
//
// Threads: the operations of KTSMBUtils may be called on any thread; distinct values may be used on any thread, one value
// is not locked. Nothing throws but std::bad_alloc.

#pragma once

#include "KTString.h"
#include "KTTypes.h"

#include "KTBeginExports.h"

/// Takes share URLs apart.
class KT_PUBLIC_API KTSMBUtils {
  public:
    KTSMBUtils() = delete;

    /// Whether the URL begins with the prefix and is longer than it. Then the prefix's length in bytes is written through
    /// `length`, unless that is null; otherwise it is left alone. A null URL or prefix is reported as an assertion and
    /// gives false. REQUIRES: both end in a zero byte.
    static bool urlBeginsWith(char const *url, char const *prefix, unsigned int *length);

    /// The text from `position` (in units) up to the next "/", which must be there. On success `position` moves to just
    /// after that "/". False, with nothing changed, if no more than one unit is left, if the unit at `position` is "/", or
    /// if no "/" follows. Every position is allowed.
    static bool getFirstPathElement(KTString const &text, unsigned int &position, KTString &element);

    /// Takes the URL apart. The scheme becomes "smb" whatever prefix the URL has; then authority and share are set, as
    /// far as they are found, and the result tells whether both were. A path of two or more units is set; otherwise
    /// `path` is left as it was passed (so a path of a single unit is not taken). False, with nothing changed, for an
    /// empty URL and for one that begins with none of the three prefixes or is nothing but one. REQUIRES: no result is
    /// the URL itself.
    static bool parseFdfSmbUrl(KTString const &url, KTString &scheme, KTString &authority, KTString &share,
                               KTString &path);

    /// Does nothing: the text is left unchanged.
    static void deMicrosoftizeSlashes(KTString &text);
};

/// A share URL's parts. Fields that parsing did not reach are empty; no error is reported.
class KT_PUBLIC_API KTSmbUrl {
  public:
    /// Takes the URL apart with KTSMBUtils::parseFdfSmbUrl.
    KTSmbUrl(KTString const &url);
    KTSmbUrl(KTSmbUrl const &other);
    KTSmbUrl &operator=(KTSmbUrl const &other);
    ~KTSmbUrl();

    /// "smb" if the URL begins with one of the prefixes, else empty.
    KTString const &getScheme() const;

    /// The server.
    KTString const &getAuthority() const;

    /// The share's name.
    KTString const &getShare() const;

    /// What follows the share's slash, without a leading slash.
    KTString const &getSmbPath() const;

  private:
    KTString m_Share;
    KTString m_SmbPath;
    KTString m_Authority;
    KTString m_Scheme;
};

/// Tells whether a share can be reached through the file system. The system makes the connection, with the signed-in
/// user's rights; nothing is mounted and nothing is to be undone.
class KT_PUBLIC_API KTSMBConnector {
  public:
    // ---- status codes ----

    static unsigned short const CONNECTION_ESTABLISHED = 200; ///< the share answers
    static unsigned short const ERROR_AUTH_FAILED = 401;      ///< never returned by the library
    static unsigned short const ERROR_SERVER_NOT_FOUND = 404; ///< the URL names no server or no share
    static unsigned short const GENERAL_SERVER_ERROR = 500;   ///< the share does not answer, for whatever reason

    /// No URL, and no connection failed.
    KTSMBConnector();
    KTSMBConnector(KTSMBConnector const &other);
    KTSMBConnector &operator=(KTSMBConnector const &other);
    ~KTSMBConnector();

    /// Keeps the URL and tries its share. The status of mountSmbUrl; connectionFailed tells it afterwards. May take as
    /// long as the system waits for a server.
    unsigned short connect(KTString const &url);

    /// Whether the share of the URL exists: CONNECTION_ESTABLISHED or GENERAL_SERVER_ERROR. ERROR_SERVER_NOT_FOUND, with
    /// an assertion in the log, if authority or share is empty. Keeps nothing. An exception on the way counts as no
    /// answer.
    unsigned short mountSmbUrl(KTSmbUrl const &url);

    /// Does nothing and returns 0.
    unsigned short disconnect();

    /// Whether the last connect gave another status than CONNECTION_ESTABLISHED; false before the first.
    bool connectionFailed();

    /// "file://" + authority + "/" + share + "/" + path of the URL last given to connect, with empty parts for what it
    /// does not have.
    void getLocalPath(KTString &path) const;

    /// The same beginning with "smb://".
    void getSmbUrl(KTString &url) const;

  private:
    KTString m_Url;
    bool m_ConnectionFailed;
};

#include "KTEndExports.h"
