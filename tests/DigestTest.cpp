// DigestTest.cpp: digests and signatures against the published vectors: the examples of FIPS 180-4 with their intermediate
// values page, the Monte Carlo tests of the Secure Hash Algorithm Validation System, RFC 2202.

#include "KTPublicUtils.h"
#include "LogLines.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdlib>
#include <numeric>
#include <string>
#include <vector>

namespace {

using Lines = std::vector<std::string>;
using Bytes = std::vector<unsigned char>;

constexpr auto kUnknownFunction = static_cast<KTHashFunctionEnum>(1);
constexpr char kOfNothing[] = "e3b0c44298fc1c149afbf4c8996fb92427ae41e4649b934ca495991b7852b855";

Bytes ToBytes(std::string const &text) { return {text.begin(), text.end()}; }

Bytes FromHex(std::string const &digits) {
    Bytes bytes;
    for (std::size_t at = 0; at < digits.size(); at += 2) {
        bytes.push_back(static_cast<unsigned char>(std::strtoul(digits.substr(at, 2).c_str(), nullptr, 16)));
    }
    return bytes;
}

std::string ToHex(Bytes const &bytes) {
    std::string digits;
    for (unsigned char const byte : bytes) {
        constexpr char kDigits[] = "0123456789abcdef";
        digits += kDigits[byte / 16];
        digits += kDigits[byte % 16];
    }
    return digits;
}

unsigned int Length(Bytes const &bytes) { return static_cast<unsigned int>(bytes.size()); }

Bytes Sha1(Bytes const &message) {
    Bytes digest(22, 0xEE); // two more, which must stay
    KTPublicUtils::GenerateSHA1Digest(message.data(), Length(message), digest.data());
    EXPECT_EQ(digest[20], 0xEE);
    EXPECT_EQ(digest[21], 0xEE);
    digest.resize(20);
    return digest;
}

Bytes Sha256(Bytes const &message) {
    unsigned char const none = 0;
    KTString const digits =
        KTPublicUtils::GenerateHash(message.empty() ? &none : message.data(), Length(message), kKTHashSHA256);
    return FromHex(digits.GetUTF8String());
}

std::string Hmac(Bytes const &key, Bytes const &message) {
    Bytes signature(22, 0xEE);
    unsigned int length = 0;
    KTPublicUtils::GetHMACSignature(message.data(), Length(message), key.data(), Length(key), signature.data(), length);
    EXPECT_EQ(length, 20U);
    EXPECT_EQ(signature[20], 0xEE);
    signature.resize(20);
    return ToHex(signature);
}

struct Example {
    std::string message;
    std::string sha1;
    std::string sha256;
};

// One block, two blocks, two blocks with a longer message, a million characters, nothing.
std::vector<Example> const &Examples() {
    static std::vector<Example> const examples = {
        {"abc", "a9993e364706816aba3e25717850c26c9cd0d89d",
         "ba7816bf8f01cfea414140de5dae2223b00361a396177a9cb410ff61f20015ad"},
        {"abcdbcdecdefdefgefghfghighijhijkijkljklmklmnlmnomnopnopq", "84983e441c3bd26ebaae4aa1f95129e5e54670f1",
         "248d6a61d20638b8e5c026930c3e6039a33ce45964ff2167f6ecedd419db06c1"},
        {"abcdefghbcdefghicdefghijdefghijkefghijklfghijklmghijklmn"
         "hijklmnoijklmnopjklmnopqklmnopqrlmnopqrsmnopqrstnopqrstu",
         "a49b2446a02c645bf419f995b67091253a04a259",
         "cf5b16a778af8380036ce59e7b0492370b249b11e8f07a51afac45037afee9d1"},
        {std::string(1'000'000, 'a'), "34aa973cd4c4daa4f61eeb2bdbad27316534016f",
         "cdc76e5c9914fb9281a1c7e284d73e67f1809a48a497200e046d39ccc7112cd0"},
        {"", "da39a3ee5e6b4b0d3255bfef95601890afd80709", kOfNothing}};
    return examples;
}

// The seeds of the Monte Carlo test: each round digests three digests at a time, a thousand times over.
template <typename Digest> std::vector<std::string> MonteCarlo(Digest digest, std::string const &seed) {
    std::vector<std::string> checkpoints;
    Bytes start = FromHex(seed);
    for (int round = 0; round < 100; ++round) {
        std::array<Bytes, 3> last = {start, start, start};
        for (int i = 0; i < 1000; ++i) {
            Bytes message = last[0];
            message.insert(message.end(), last[1].begin(), last[1].end());
            message.insert(message.end(), last[2].begin(), last[2].end());
            last = {last[1], last[2], digest(message)};
        }
        start = last[2];
        checkpoints.push_back(ToHex(start));
    }
    return checkpoints;
}

} // namespace

// ---- GenerateHash ----

TEST(GenerateHash, OfBytesGivesThePublishedDigests) {
    for (Example const &example : Examples()) {
        EXPECT_EQ(ToHex(Sha256(ToBytes(example.message))), example.sha256) << example.message.substr(0, 60);
    }
}

TEST(GenerateHash, OfStringsGivesThePublishedDigests) {
    for (Example const &example : Examples()) {
        KTString const hash = KTPublicUtils::GenerateHash(KTString(example.message.c_str()), kKTHashSHA256);
        EXPECT_EQ(hash.GetUTF8String(), example.sha256) << example.message.substr(0, 60);
    }
}

TEST(GenerateHash, OfAStringIsThatOfItsUtf8FormWithoutATerminator) {
    EXPECT_EQ(KTPublicUtils::GenerateHash(KTString("Gr\xC3\xB6\xC3\x9F"
                                                   "e"),
                                          kKTHashSHA256),
              "aedc3f80989a6546962705852b2f4a481dbd1e490760693525c3724bacab3f50");
    KTString const withZero = KTString("ab") + static_cast<unsigned short>(0) + "c";
    Bytes const bytes = {'a', 'b', 0, 'c'};
    EXPECT_EQ(KTPublicUtils::GenerateHash(withZero, kKTHashSHA256).GetUTF8String(), ToHex(Sha256(bytes)));
}

TEST(GenerateHash, OfTheEmptyStringIsThatOfNoBytes) {
    LogLines log;
    EXPECT_EQ(KTPublicUtils::GenerateHash(KTString(""), kKTHashSHA256), kOfNothing);
    EXPECT_EQ(KTPublicUtils::GenerateHash(KTString(), kKTHashSHA256).size(), 64U);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(GenerateHash, MonteCarlo) {
    auto const checkpoints = MonteCarlo(Sha256, "6d1e72ad03ddeb5de891e572e2396f8da015d899ef0e79503152d6010a3fe691");
    EXPECT_EQ(checkpoints[0], "e93c330ae5447738c8aa85d71a6c80f2a58381d05872d26bdd39f1fcd4f2b788");
    EXPECT_EQ(checkpoints[1], "2e78f8c8772ea7c9331d41ed3f9cdf27d8f514a99342ee766ee3b8b0d0b121c0");
    EXPECT_EQ(checkpoints[99], "6a912ba4188391a78e6f13d88ed2d14e13afce9db6f7dcbf4a48c24f3db02778");
}

TEST(GenerateHash, NullBytesAreReported) {
    LogLines log;
    Lines const expected = {"Assert failed: GenerateHash bytes NULL at source/private/utils/KTPublicUtils:105"};
    EXPECT_TRUE(KTPublicUtils::GenerateHash(nullptr, 5, kKTHashSHA256).empty());
    EXPECT_EQ(log.Take(), expected);
    EXPECT_TRUE(KTPublicUtils::GenerateHash(nullptr, 0, kKTHashSHA256).empty());
    EXPECT_EQ(log.Take(), expected);
    EXPECT_TRUE(KTPublicUtils::GenerateHash(nullptr, 5, kUnknownFunction).empty());
    EXPECT_EQ(log.Take(), expected) << "the bytes are looked at first";
}

TEST(GenerateHash, OtherFunctionsAreReported) {
    LogLines log;
    Lines const expected = {
        "Assert failed: Algorithm - Hashing not implemented at source/private/utils/KTPublicUtils:112"};
    Bytes const bytes = {1, 2, 3};
    EXPECT_TRUE(KTPublicUtils::GenerateHash(bytes.data(), 3, kUnknownFunction).empty());
    EXPECT_EQ(log.Take(), expected);
    EXPECT_TRUE(KTPublicUtils::GenerateHash(KTString("abc"), kUnknownFunction).empty());
    EXPECT_EQ(log.Take(), expected);
    EXPECT_TRUE(KTPublicUtils::GenerateHash(KTString(), static_cast<KTHashFunctionEnum>(-1)).empty());
    EXPECT_EQ(log.Take(), expected);
}

TEST(GenerateHash, FunctionsNumberIsFixed) {
    EXPECT_EQ(static_cast<int>(kKTHashSHA256), 0);
    EXPECT_EQ(sizeof(KTHashFunctionEnum), 4U);
}

// ---- GenerateSHA1Digest ----

TEST(Sha1Digest, GivesThePublishedDigests) {
    for (Example const &example : Examples()) {
        EXPECT_EQ(ToHex(Sha1(ToBytes(example.message))), example.sha1) << example.message.substr(0, 60);
    }
}

TEST(Sha1Digest, MonteCarlo) {
    auto const checkpoints = MonteCarlo(Sha1, "dd4df644eaf3d85bace2b21accaa22b28821f5cd");
    EXPECT_EQ(checkpoints[0], "11f5c38b4479d4ad55cb69fadf62de0b036d5163");
    EXPECT_EQ(checkpoints[1], "5c26de848c21586bec36995809cb02d3677423d9");
    EXPECT_EQ(checkpoints[99], "01b7be5b70ef64843a03fdbb3b247a6278d2cbe1");
}

TEST(Sha1Digest, MayBeWrittenOverItsData) {
    Bytes data(64, 0);
    std::copy_n("abc", 3, data.begin());
    KTPublicUtils::GenerateSHA1Digest(data.data(), 3, data.data());
    EXPECT_EQ(ToHex({data.begin(), data.begin() + 20}), "a9993e364706816aba3e25717850c26c9cd0d89d");
}

TEST(Sha1Digest, NullDataOfNoLengthIsNoBytes) {
    Bytes digest(20);
    KTPublicUtils::GenerateSHA1Digest(nullptr, 0, digest.data());
    EXPECT_EQ(ToHex(digest), "da39a3ee5e6b4b0d3255bfef95601890afd80709");
}

// ---- GetHMACSignature ----

TEST(HmacSignature, GivesThePublishedSignatures) {
    Bytes counted(25);
    std::iota(counted.begin(), counted.end(), static_cast<unsigned char>(1));
    EXPECT_EQ(Hmac(Bytes(20, 0x0B), ToBytes("Hi There")), "b617318655057264e28bc0b6fb378c8ef146be00");
    EXPECT_EQ(Hmac(ToBytes("Jefe"), ToBytes("what do ya want for nothing?")),
              "effcdf6ae5eb2fa2d27416d5f184df9c259a7c79");
    EXPECT_EQ(Hmac(Bytes(20, 0xAA), Bytes(50, 0xDD)), "125d7342b9ac11cd91a39af48aa17b4f63f175d3");
    EXPECT_EQ(Hmac(counted, Bytes(50, 0xCD)), "4c9007f4026250c6bc8414f9bf50c86c2d7235da");
    EXPECT_EQ(Hmac(Bytes(20, 0x0C), ToBytes("Test With Truncation")), "4c1a03424b55e07fe7f27be1d58bb9324a9a5a04");
    EXPECT_EQ(Hmac(Bytes(80, 0xAA), ToBytes("Test Using Larger Than Block-Size Key - Hash Key First")),
              "aa4ae5e15272d00e95705637ce8a3b55ed402112");
    EXPECT_EQ(
        Hmac(Bytes(80, 0xAA), ToBytes("Test Using Larger Than Block-Size Key and Larger Than One Block-Size Data")),
        "e8e99d0f45237d786d6bbaa7965c7808bbff1a91");
}

TEST(HmacSignature, LongKeysCountByTheirDigest) {
    Bytes const message = ToBytes("message");
    for (std::size_t const size : {65U, 80U, 1000U}) {
        Bytes const key(size, 0x5A);
        EXPECT_EQ(Hmac(key, message), Hmac(Sha1(key), message)) << size;
    }
    Bytes const longest(64, 0x5A);
    EXPECT_NE(Hmac(longest, message), Hmac(Sha1(longest), message)) << "64 bytes count as they are";
}

TEST(HmacSignature, TakesTheLongestMessageThatCallersRelyOn) {
    Bytes key(64);
    std::iota(key.begin(), key.end(), static_cast<unsigned char>(0));
    Bytes message(4032);
    for (std::size_t i = 0; i < message.size(); ++i) {
        message[i] = static_cast<unsigned char>(i * 7);
    }
    EXPECT_EQ(Hmac(key, message), "30efc4f87c42576b463a9b2ce60f86c83fc43ec7");
}

TEST(HmacSignature, KeyAndMessageMayBeEmpty) {
    EXPECT_EQ(Hmac({}, {}), "fbdb1d1b18aa6c08324b7d64b71fb76370690e1d");
    EXPECT_EQ(Hmac(Bytes(64, 0), {}), Hmac({}, {})) << "short keys are filled with zeros";
}
