// SystemUtilsTest.cpp: services of the system that answer on every machine.

#include "KTSystemUtils.h"

#include "ByteStream.h"
#include "LogLines.h"
#include "Units.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <limits>
#include <regex>
#include <set>
#include <string>
#include <vector>

namespace {

using Bytes = std::vector<unsigned char>;

KTString const kSecret(L"p\u00E4ss w\u00F6rd \U0001F511");

Bytes Protected(KTString const &text) {
    ByteStream stream(ByteStream::kWrites);
    EXPECT_EQ(kKTErrorNone, KTSystemUtils::EncryptStringUsingSystemCredentials(text, stream));
    return stream.bytes;
}

KTErrorCodeEnum Read(Bytes const &bytes, KTString &text) {
    ByteStream stream(ByteStream::kReads, bytes);
    return KTSystemUtils::DecryptStringUsingSystemCredentials(stream, text);
}

// Refused, and the text left alone.
void ExpectRefused(Bytes const &bytes) {
    KTString text("old");
    EXPECT_EQ(kKTErrorFailed, Read(bytes, text));
    EXPECT_EQ(KTString("old"), text);
}

Bytes WithCount(int count, std::size_t size) {
    Bytes bytes(4 + size, 0x41);
    std::memcpy(bytes.data(), &count, sizeof count);
    return bytes;
}

int CountOf(Bytes const &bytes) {
    int count = 0;
    std::memcpy(&count, bytes.data(), sizeof count);
    return count;
}

} // namespace

TEST(Guid, IsGroupsOfDigitsJoinedByHyphensAndNewEachTime) {
    std::regex const form("[0-9a-f]{8}-[0-9a-f]{4}-[0-9a-f]{4}-[0-9a-f]{4}-[0-9a-f]{12}");
    LogLines log;
    std::set<std::string> seen;
    for (int i = 0; i < 1000; ++i) {
        std::string const text = KTSystemUtils::CreateGUID().GetUTF8String();
        EXPECT_TRUE(std::regex_match(text, form)) << text;
        EXPECT_TRUE(seen.insert(text).second) << text;
    }
    EXPECT_TRUE(log.Take().empty());
}

TEST(ProtectedText, ComesBack) {
    LogLines log;
    KTString const large(std::string(300'000, 'x').c_str()); // several pieces
    for (KTString const &text : {kSecret, KTString(), KTString("a"), FromUnits({0xD800, 0, 'b', 0}), large}) {
        KTString read("old");
        EXPECT_EQ(kKTErrorNone, Read(Protected(text), read));
        EXPECT_TRUE(text == read);
    }
    EXPECT_TRUE(log.Take().empty());
}

TEST(ProtectedText, IsACountAndAsManyBytes) {
    Bytes const bytes = Protected(kSecret);
    ASSERT_GT(bytes.size(), 4U);
    EXPECT_EQ(bytes.size() - 4, static_cast<std::size_t>(CountOf(bytes)));
}

TEST(ProtectedText, DoesNotShowTheText) {
    KTString const text("a secret that nobody may read");
    Bytes const bytes = Protected(text);
    auto const *const plain = reinterpret_cast<unsigned char const *>(text.c_str());
    EXPECT_EQ(bytes.end(), std::search(bytes.begin(), bytes.end(), plain, plain + 8));
}

TEST(ProtectedText, TheCountHasTheStreamsByteOrder) {
    ByteStream writer(ByteStream::kWrites);
    writer.SetSwapping(1);
    ASSERT_EQ(kKTErrorNone, KTSystemUtils::EncryptStringUsingSystemCredentials(kSecret, writer));
    EXPECT_EQ(0, writer.bytes[0]);
    EXPECT_EQ(writer.bytes.size() - 4, writer.bytes[2] * 256U + writer.bytes[3]);
    ByteStream reader(ByteStream::kReads, writer.bytes);
    reader.SetSwapping(1);
    KTString text;
    EXPECT_EQ(kKTErrorNone, KTSystemUtils::DecryptStringUsingSystemCredentials(reader, text));
    EXPECT_EQ(kSecret, text);
}

TEST(ProtectedText, SeveralFollowOneAnother) {
    ByteStream writer(ByteStream::kWrites);
    KTSystemUtils::EncryptStringUsingSystemCredentials("one", writer);
    KTSystemUtils::EncryptStringUsingSystemCredentials("two", writer);
    ByteStream reader(ByteStream::kReads, writer.bytes);
    KTString text;
    EXPECT_EQ(kKTErrorNone, KTSystemUtils::DecryptStringUsingSystemCredentials(reader, text));
    EXPECT_EQ(KTString("one"), text);
    EXPECT_EQ(kKTErrorNone, KTSystemUtils::DecryptStringUsingSystemCredentials(reader, text));
    EXPECT_EQ(KTString("two"), text);
    EXPECT_EQ(kKTErrorFailed, KTSystemUtils::DecryptStringUsingSystemCredentials(reader, text));
    EXPECT_EQ(KTString("two"), text);
}

TEST(ProtectedText, RefusesTheWrongDirection) {
    ByteStream reader(ByteStream::kReads, Protected(kSecret));
    Bytes const before = reader.bytes;
    EXPECT_EQ(kKTErrorFailed, KTSystemUtils::EncryptStringUsingSystemCredentials(kSecret, reader));
    EXPECT_EQ(before, reader.bytes);
    EXPECT_EQ(0U, reader.position);
    ByteStream writer(ByteStream::kWrites);
    KTString text("old");
    EXPECT_EQ(kKTErrorFailed, KTSystemUtils::DecryptStringUsingSystemCredentials(writer, text));
    EXPECT_EQ(KTString("old"), text);
    EXPECT_TRUE(writer.bytes.empty());
}

TEST(ProtectedText, TellsThatTheStreamTookTooLittle) {
    std::size_t const whole = Protected(kSecret).size();
    for (std::size_t const capacity : {std::size_t{0}, std::size_t{3}, std::size_t{4}, whole - 1}) {
        ByteStream stream(ByteStream::kWrites);
        stream.capacity = capacity;
        EXPECT_EQ(kKTErrorFailed, KTSystemUtils::EncryptStringUsingSystemCredentials(kSecret, stream)) << capacity;
    }
    for (KTStreamState const state : {kKTStreamStateError, kKTStreamStateClosed}) {
        ByteStream broken(ByteStream::kWrites);
        broken.state = state;
        EXPECT_EQ(kKTErrorFailed, KTSystemUtils::EncryptStringUsingSystemCredentials(kSecret, broken));
    }
}

TEST(ProtectedText, RefusesTruncatedData) {
    Bytes const whole = Protected(kSecret);
    for (std::size_t size = 0; size < whole.size(); ++size) {
        ExpectRefused(Bytes(whole.begin(), whole.begin() + static_cast<std::ptrdiff_t>(size)));
    }
}

TEST(ProtectedText, RefusesCountsThatAreNoneAndTakesNoMemoryForThem) {
    for (int const count : {0, -1, std::numeric_limits<int>::min()}) {
        ExpectRefused(WithCount(count, 100));
    }
    ByteStream stream(ByteStream::kReads, WithCount(std::numeric_limits<int>::max(), 1000));
    KTString text("old");
    EXPECT_EQ(kKTErrorFailed, KTSystemUtils::DecryptStringUsingSystemCredentials(stream, text));
    EXPECT_LE(stream.largestRead, 65'536U);
}

TEST(ProtectedText, RefusesForeignData) {
    LogLines log;
    for (std::size_t const size : {1U, 2U, 10U, 300U, 100'000U}) {
        ExpectRefused(WithCount(static_cast<int>(size), size));
    }
    EXPECT_TRUE(log.Take().empty());
}

// A change is noticed, or does no harm; it never gives another text.
TEST(ProtectedText, AChangedByteGivesNoOtherText) {
    Bytes const whole = Protected(kSecret);
    ASSERT_GT(whole.size(), 4U);
    for (std::size_t i = 4; i < whole.size(); ++i) {
        Bytes changed = whole;
        changed[i] = static_cast<unsigned char>(changed[i] ^ 0x21);
        KTString text("old");
        if (Read(changed, text) == kKTErrorNone) {
            EXPECT_EQ(kSecret, text) << i;
        } else {
            EXPECT_EQ(KTString("old"), text) << i;
        }
    }
    Bytes cut = whole; // one byte less, and a count that says so
    cut.pop_back();
    int const count = CountOf(whole) - 1;
    std::memcpy(cut.data(), &count, sizeof count);
    ExpectRefused(cut);
}

TEST(NotImplemented, SaysSoAndFails) {
    LogLines log;
    EXPECT_FALSE(KTSystemUtils::GetAppFocused());
    EXPECT_FALSE(KTSystemUtils::IsConnectedToNetwork());
    EXPECT_EQ(kKTErrorFailed, KTSystemUtils::OpenURL("http://localhost/"));
    EXPECT_EQ((std::vector<std::string>{
                  "Assert failed: GetAppFocused - Not implemented at source/private/utils/SystemUtils:231",
                  "Assert failed: IsConnectedToNetwork - Not implemented at source/private/utils/SystemUtils:238",
                  "Assert failed: Not implemented OpenURL at source/private/utils/SystemUtils:245"}),
              log.Take());
}
