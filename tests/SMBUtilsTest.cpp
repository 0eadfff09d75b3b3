// SMBUtilsTest.cpp: share URLs taken apart.

#include "KTSMBUtils.h"

#include "LogLines.h"
#include "ShareUrl.h"
#include "Units.h"

#include <gtest/gtest.h>

#include <limits>
#include <random>
#include <string>
#include <vector>

namespace {

constexpr unsigned int kLastPosition = std::numeric_limits<unsigned int>::max();

std::string ReportedAt(int line) {
    return "Assert failed:  at source/private/utils/KTSMBUtils:" + std::to_string(line);
}

// What parsing gives, the results being "old" before.
struct Parsed {
    explicit Parsed(KTString const &url) : found(KTSMBUtils::parseFdfSmbUrl(url, scheme, authority, share, path)) {}

    KTString scheme = KTString("old");
    KTString authority = KTString("old");
    KTString share = KTString("old");
    KTString path = KTString("old");
    bool found;
};

void ExpectParsed(char const *url, bool found, Parsed const &parsed, std::vector<char const *> const &expected) {
    EXPECT_EQ(found, parsed.found) << url;
    EXPECT_EQ(KTString(expected[0]), parsed.scheme) << url;
    EXPECT_EQ(KTString(expected[1]), parsed.authority) << url;
    EXPECT_EQ(KTString(expected[2]), parsed.share) << url;
    EXPECT_EQ(KTString(expected[3]), parsed.path) << url;
}

void ExpectFound(char const *url, char const *authority, char const *share, char const *path) {
    ExpectParsed(url, true, Parsed(url), {"smb", authority, share, path});
}

void ExpectNotFound(char const *url, char const *scheme, char const *authority) {
    ExpectParsed(url, false, Parsed(url), {scheme, authority, "old", "old"});
}

TEST(UrlPrefixTest, MustBeThereAndBeFollowedBySomething) {
    unsigned int length = 77;
    EXPECT_TRUE(KTSMBUtils::urlBeginsWith("smb://s", "smb://", &length));
    EXPECT_EQ(6U, length);
    EXPECT_TRUE(KTSMBUtils::urlBeginsWith("smb://s", "smb", &length));
    EXPECT_EQ(3U, length);
    EXPECT_TRUE(KTSMBUtils::urlBeginsWith("x", "", &length));
    EXPECT_EQ(0U, length);

    length = 77;
    EXPECT_FALSE(KTSMBUtils::urlBeginsWith("smb://", "smb://", &length)) << "not longer";
    EXPECT_FALSE(KTSMBUtils::urlBeginsWith("smb:/", "smb://", &length));
    EXPECT_FALSE(KTSMBUtils::urlBeginsWith("", "smb://", &length));
    EXPECT_FALSE(KTSMBUtils::urlBeginsWith("", "", &length));
    EXPECT_FALSE(KTSMBUtils::urlBeginsWith("SMB://s", "smb://", &length)) << "case counts";
    EXPECT_FALSE(KTSMBUtils::urlBeginsWith("xsmb://s", "smb://", &length));
    EXPECT_EQ(77U, length) << "only written on success";
}

TEST(UrlPrefixTest, ComparesBytes) {
    EXPECT_TRUE(KTSMBUtils::urlBeginsWith("\xC3\xA4/x", "\xC3\xA4", nullptr));
    EXPECT_TRUE(KTSMBUtils::urlBeginsWith("\xC3\xA4/x", "\xC3", nullptr));
    EXPECT_FALSE(KTSMBUtils::urlBeginsWith("\xC3\xA4/x", "\xC3\xA5", nullptr));
}

TEST(UrlPrefixTest, TheLengthMayBeLeftOut) { EXPECT_TRUE(KTSMBUtils::urlBeginsWith("smb://s", "smb://", nullptr)); }

TEST(UrlPrefixTest, ReportsNullPointers) {
    LogLines log;
    unsigned int length = 77;
    EXPECT_FALSE(KTSMBUtils::urlBeginsWith(nullptr, "smb://", &length));
    EXPECT_EQ(std::vector<std::string>{ReportedAt(126)}, log.Take());
    EXPECT_FALSE(KTSMBUtils::urlBeginsWith("smb://s", nullptr, &length));
    EXPECT_EQ(std::vector<std::string>{ReportedAt(127)}, log.Take());
    EXPECT_FALSE(KTSMBUtils::urlBeginsWith(nullptr, nullptr, &length));
    EXPECT_EQ((std::vector<std::string>{ReportedAt(126), ReportedAt(127)}), log.Take());
    EXPECT_EQ(77U, length);
}

TEST(PathElementTest, EndsAtASlashAndMovesBehindIt) {
    unsigned int position = 0;
    KTString element;
    KTString const text("ab/c/d");
    ASSERT_TRUE(KTSMBUtils::getFirstPathElement(text, position, element));
    EXPECT_EQ(KTString("ab"), element);
    EXPECT_EQ(3U, position);
    ASSERT_TRUE(KTSMBUtils::getFirstPathElement(text, position, element));
    EXPECT_EQ(KTString("c"), element);
    EXPECT_EQ(5U, position);
    EXPECT_FALSE(KTSMBUtils::getFirstPathElement(text, position, element)) << "one unit is left";
    EXPECT_EQ(KTString("c"), element);
    EXPECT_EQ(5U, position);
}

TEST(PathElementTest, NeedsTwoUnitsNoSlashInFrontAndOneBehind) {
    LogLines log;
    struct Case {
        char const *text;
        unsigned int position;
    };
    for (Case const &one : {Case{"", 0}, Case{"a", 0}, Case{"/", 0}, Case{"/a/", 0}, Case{"//", 0}, Case{"abc", 0},
                            Case{"a/b", 2}, Case{"a//b/", 2}, Case{"a/bc", 2}, Case{"a/", 1}, Case{"a/", 2},
                            Case{"a/", 3}, Case{"a/", kLastPosition - 1}, Case{"a/", kLastPosition}}) {
        unsigned int position = one.position;
        KTString element("old");
        EXPECT_FALSE(KTSMBUtils::getFirstPathElement(one.text, position, element)) << one.text << one.position;
        EXPECT_EQ(KTString("old"), element);
        EXPECT_EQ(one.position, position);
    }
    EXPECT_TRUE(log.Take().empty());
}

// The two units that it asks for may be the element and its slash.
TEST(PathElementTest, MayBeOneUnitLong) {
    unsigned int position = 1;
    KTString element;
    EXPECT_TRUE(KTSMBUtils::getFirstPathElement("/b/", position, element));
    EXPECT_EQ(KTString("b"), element);
    EXPECT_EQ(3U, position);
}

TEST(ShareUrlTest, ThreePrefixesNameTheSamePlace) {
    ExpectFound("smb://server/share/dir/file.txt", "server", "share", "dir/file.txt");
    ExpectFound("file://///server/share/dir/", "server", "share", "dir/");
    ExpectFound("file://localhost///server/share/dir/", "server", "share", "dir/");
}

TEST(ShareUrlTest, ShareAndServerNeedTheirSlash) {
    ExpectNotFound("smb://server/share", "smb", "server");
    ExpectNotFound("smb://server", "smb", "old");
    ExpectNotFound("smb://server/", "smb", "server");
    ExpectNotFound("smb://s", "smb", "old");
    ExpectNotFound("smb:///share/x", "smb", "old");
    ExpectNotFound("smb://server//x", "smb", "server");
}

TEST(ShareUrlTest, APathOfOneUnitIsNotTaken) {
    ExpectFound("smb://server/share/", "server", "share", "old");
    ExpectFound("smb://server/share/x", "server", "share", "old");
    ExpectFound("smb://server/share/xy", "server", "share", "xy");
    ExpectFound("smb://server/share//", "server", "share", "old");
    ExpectFound("smb://server/share//x", "server", "share", "/x");
}

TEST(ShareUrlTest, OtherUrlsAreNone) {
    for (char const *const url :
         {"", "s", "SMB://server/share/", "Smb://server/share/", "smb:/server/share/", "file:///server/share/",
          "file:////server/share/", "file://LOCALHOST///server/share/", "file://localhost//server/share/",
          "File://///server/share/", "http://server/share/", " smb://server/share/", "smb://", "file://///",
          "file://localhost///", "\\\\server\\share\\"}) {
        ExpectNotFound(url, "old", "old");
    }
}

// The first prefix that fits counts, so a fourth slash is the beginning of an authority that is not there.
TEST(ShareUrlTest, MoreSlashesAreNotSkipped) {
    ExpectNotFound("file://////server/share/", "smb", "old");
    ExpectNotFound("file://localhost////server/share/", "smb", "old");
}

TEST(ShareUrlTest, TakesEveryUnitAsItIs) {
    KTString const url(L"smb://s\u00E9rveur/d\U0001F41D%20\\x/\u8AB2\u7A0B?#/ \u00E4");
    Parsed const parsed(url);
    EXPECT_TRUE(parsed.found);
    EXPECT_EQ(KTString(L"s\u00E9rveur"), parsed.authority);
    EXPECT_EQ(KTString(L"d\U0001F41D%20\\x"), parsed.share);
    EXPECT_EQ(KTString(L"\u8AB2\u7A0B?#/ \u00E4"), parsed.path);
    Parsed const broken(FromUnits({'s', 'm', 'b', ':', '/', '/', 0xD800, '/', 0xDC00, '/', 0xD800, 0xD800}));
    EXPECT_TRUE(broken.found);
    EXPECT_EQ(FromUnits({0xD800}), broken.authority);
    EXPECT_EQ(FromUnits({0xDC00}), broken.share);
    EXPECT_EQ(FromUnits({0xD800, 0xD800}), broken.path);
}

// The prefix ends the URL where a zero does, as byte strings end there; behind it zeros are units like others.
TEST(ShareUrlTest, ZerosInside) {
    EXPECT_FALSE(Parsed(FromUnits({'s', 'm', 'b', ':', '/', '/', 0, '/', 'b', '/'})).found);
    Parsed const parsed(FromUnits({'s', 'm', 'b', ':', '/', '/', 'a', 0, '/', 0, '/'}));
    EXPECT_TRUE(parsed.found);
    EXPECT_EQ(FromUnits({'a', 0}), parsed.authority);
    EXPECT_EQ(FromUnits({0}), parsed.share);
}

TEST(ShareUrlTest, VeryLongParts) {
    std::string const part(1'000'000, 'p');
    Parsed const parsed(KTString(("smb://" + part + "/" + part + "/" + part).c_str()));
    EXPECT_TRUE(parsed.found);
    EXPECT_EQ(part.size(), parsed.authority.size());
    EXPECT_EQ(part.size(), parsed.share.size());
    EXPECT_EQ(part.size(), parsed.path.size());
}

TEST(ShareUrlTest, AgreesWithAPlainReader) {
    unsigned const seed = std::random_device()();
    SCOPED_TRACE(seed);
    std::mt19937 random(seed);
    std::vector<KTString> const pieces = {
        "smb://", "file://///",        "file://localhost///", "/", "//", "a", "server", "share", "smb:", "\\",
        "%2F",    FromUnits({0xD83D}), FromUnits({0}),        "x/"};
    for (int i = 0; i < 20'000; ++i) {
        KTString url;
        for (unsigned left = random() % 7; left > 0; --left) {
            url += pieces[random() % pieces.size()];
        }
        ShareUrlParts const expected = ReferenceShareUrl(url);
        KTSmbUrl const parsed(url);
        ASSERT_EQ(KTString(expected.scheme.c_str()), parsed.getScheme()) << url.GetUTF8String();
        ASSERT_EQ(expected.authority, parsed.getAuthority()) << url.GetUTF8String();
        ASSERT_EQ(expected.share, parsed.getShare()) << url.GetUTF8String();
        ASSERT_EQ(expected.path, parsed.getSmbPath()) << url.GetUTF8String();
        ASSERT_EQ(expected.found, Parsed(url).found) << url.GetUTF8String();
    }
}

TEST(ShareUrlTest, SlashesAreNotTouched) {
    KTString text("\\\\server\\share/x");
    KTSMBUtils::deMicrosoftizeSlashes(text);
    EXPECT_EQ(KTString("\\\\server\\share/x"), text);
}

TEST(SmbUrlTest, HoldsThePartsThatWereReached) {
    KTSmbUrl const whole(KTString("smb://server/share/dir/file.txt"));
    EXPECT_EQ(KTString("smb"), whole.getScheme());
    EXPECT_EQ(KTString("server"), whole.getAuthority());
    EXPECT_EQ(KTString("share"), whole.getShare());
    EXPECT_EQ(KTString("dir/file.txt"), whole.getSmbPath());

    KTSmbUrl const shareless(KTString("smb://server/share"));
    EXPECT_EQ(KTString("smb"), shareless.getScheme());
    EXPECT_EQ(KTString("server"), shareless.getAuthority());
    EXPECT_TRUE(shareless.getShare().empty());
    EXPECT_TRUE(shareless.getSmbPath().empty());

    EXPECT_TRUE(KTSmbUrl(KTString("smb://server/share/x")).getSmbPath().empty());

    LogLines log;
    KTSmbUrl const none(KTString("SMB://server/share/"));
    EXPECT_TRUE(none.getScheme().empty());
    EXPECT_TRUE(none.getAuthority().empty());
    EXPECT_TRUE(none.getShare().empty());
    EXPECT_TRUE(none.getSmbPath().empty());
    EXPECT_TRUE(log.Take().empty()) << "nothing is reported";
}

TEST(SmbUrlTest, CopiesAllFour) {
    KTSmbUrl const url(KTString("smb://server/share/dir"));
    KTSmbUrl const copy(url); // NOLINT(performance-unnecessary-copy-initialization): it is what is tested
    KTSmbUrl assigned(KTString("file://///other/place/x/y"));
    assigned = url;
    for (KTSmbUrl const *const one : {&copy, static_cast<KTSmbUrl const *>(&assigned)}) {
        EXPECT_EQ(KTString("smb"), one->getScheme());
        EXPECT_EQ(KTString("server"), one->getAuthority());
        EXPECT_EQ(KTString("share"), one->getShare());
        EXPECT_EQ(KTString("dir"), one->getSmbPath());
    }
}

} // namespace
