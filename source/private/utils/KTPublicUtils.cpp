// KTPublicUtils.cpp: digests and their printed forms, signatures, and small helpers.

#include "KTPublicUtils.h"

#include "IKTStream.h"
#include "KTAssert.h"
#include "KTBase64.h"
#include "KTException.h"
#include "KTHttpDate.h"
#include "KTRequireDictionary.h"
#include "KTStringDictionary.h"
#include "ODigest.h"

#include <algorithm>
#include <array>
#include <atomic>
#include <cstdlib>
#include <ctime>
#include <memory>
#include <sstream>
#include <string_view>

namespace {

constexpr char kPath[] = "source/private/utils/KTPublicUtils";

void Report(char const *message, KTInt32 line) { KTAssertFailed(message, kPath, line); }

bool IsKnown(KTHashFunctionEnum function) {
    if (function == kKTHashSHA256) {
        return true;
    }
    Report("Algorithm - Hashing not implemented", 112);
    return false;
}

// Ends a SHA-256 digest and prints it in lower-case hexadecimal.
KTString PrintDigest(ODigest &digest) {
    std::array<unsigned char, kOSha256Size> bytes{};
    digest.Finish(bytes.data());
    std::array<unsigned short, 2 * kOSha256Size + 1> units{};
    auto *next = units.data();
    for (unsigned char const byte : bytes) {
        constexpr std::u16string_view kDigits = u"0123456789abcdef";
        *next++ = kDigits[byte >> 4];
        *next++ = kDigits[byte & 15];
    }
    return KTString(units.data());
}

KTString PrintDigestOf(void const *bytes, std::size_t size) {
    ODigest digest(ODigestKind::Sha256);
    digest.Add(bytes, size);
    return PrintDigest(digest);
}

// How a stream is read. Parts of at least this size, a multiple of a file transport's own 64 KiB, are read straight into
// the buffer; smaller ones in a row would set off the transport's read-ahead, which leaves it in another state than one
// read of everything does. So the last part takes what is left over.
constexpr unsigned int kPart = 0x40000;

unsigned int NextPart(unsigned int left) { return left >= 2 * kPart ? kPart : left; }

// Digests the `size` bytes that follow in the stream. False if there are fewer.
bool AddStream(IKTStream &stream, unsigned int size, ODigest &digest) {
    auto const buffer = std::make_unique_for_overwrite<unsigned char[]>(std::min(size, 2 * kPart));
    while (size != 0) {
        unsigned int const part = NextPart(size);
        if (stream.XferByte(buffer.get(), static_cast<int>(part)) != static_cast<int>(part)) {
            return false;
        }
        digest.Add(buffer.get(), part);
        size -= part;
    }
    return true;
}

using KeyBlock = std::array<unsigned char, kOShaBlock>;

// SHA-1 of the key block, each byte changed by `pad`, and then the bytes.
void DigestPadded(KeyBlock const &key, unsigned char pad, void const *bytes, std::size_t size, unsigned char *result) {
    KeyBlock block{};
    std::transform(key.begin(), key.end(), block.begin(),
                   [pad](unsigned char byte) { return static_cast<unsigned char>(byte ^ pad); });
    ODigest digest(ODigestKind::Sha1);
    digest.Add(block.data(), block.size());
    digest.Add(bytes, size);
    digest.Finish(result);
}

} // namespace

// ---- digests ----

KTString KTPublicUtils::GenerateHash(IKTStream *stream, KTHashFunctionEnum const &function) {
    if (stream == nullptr || stream->GetStreamState() != kKTStreamStateGood || stream->IsReading() == 0) {
        Report("Generate Hash - not valid stream", 71);
        return {};
    }
    stream->Seek(0, kKTSeekFromEnd);
    if (!IsKnown(function)) {
        return {};
    }
    unsigned int const size = stream->Tell();
    stream->Seek(0, kKTSeekFromBeginning);
    ODigest digest(ODigestKind::Sha256);
    if (!AddStream(*stream, size, digest)) {
        Report("Generate Hash - not valid stream", 88);
        return {};
    }
    return PrintDigest(digest);
}

KTString KTPublicUtils::GenerateHash(KTString const &text, KTHashFunctionEnum const &function) {
    if (!IsKnown(function)) {
        return {};
    }
    std::string const utf8 = text.GetUTF8String();
    return PrintDigestOf(utf8.data(), utf8.size());
}

KTString KTPublicUtils::GenerateHash(unsigned char const *bytes, unsigned int length,
                                     KTHashFunctionEnum const &function) {
    if (bytes == nullptr) {
        Report("GenerateHash bytes NULL", 105);
        return {};
    }
    return IsKnown(function) ? PrintDigestOf(bytes, length) : KTString();
}

void KTPublicUtils::GenerateSHA1Digest(unsigned char const *data, unsigned int const &length, unsigned char *digest) {
    ODigest sha1(ODigestKind::Sha1);
    sha1.Add(data, length);
    sha1.Finish(digest);
}

// The message need not be copied behind the pad, so no buffer limits its length.
void KTPublicUtils::GetHMACSignature(unsigned char const *message, unsigned int const &messageLength,
                                     unsigned char const *key, unsigned int const &keyLength, unsigned char *signature,
                                     unsigned int &signatureLength) {
    KeyBlock block{};
    if (keyLength > block.size()) {
        GenerateSHA1Digest(key, keyLength, block.data());
    } else {
        std::copy_n(key, keyLength, block.begin());
    }
    std::array<unsigned char, kOSha1Size> inner{};
    DigestPadded(block, 0x36, message, messageLength, inner.data());
    DigestPadded(block, 0x5C, inner.data(), inner.size(), signature);
    signatureLength = kOSha1Size;
}

// ---- Base64 ----

std::string KTPublicUtils::Base64_encode(std::string const &bytes) { return KTBase64::Encode(bytes); }

std::string KTPublicUtils::Base64_decode(std::string const &text) { return KTBase64::Decode(text); }

// ---- others ----

KTString KTPublicUtils::GetRFC2616GMTTime() { return KTString(KTHttpDate(std::time(nullptr)).c_str()); }

unsigned int KTPublicUtils::GetARandomNumber(unsigned int maximum) {
    static std::atomic_flag isSeeded;
    if (!isSeeded.test_and_set(std::memory_order_relaxed)) {
        std::srand(static_cast<unsigned int>(std::time(nullptr)));
    }
    return static_cast<unsigned int>(std::rand()) % (maximum + 1);
}

// By value, as its callers link it.
// NOLINTNEXTLINE(performance-unnecessary-value-param)
std::string KTPublicUtils::ConstructLogStr(std::string text, float value) {
    std::ostringstream stream;
    stream << text << ": " << value;
    return stream.str();
}

IKTStringDictionary &KTRequireDictionary(KTStringDictionary *const dictionary) {
    if (dictionary == nullptr) {
        constexpr KTInt32 kLine = 159;
        KTAssertFailed("KTStringDictionary::GetStringDictionary()", kPath, kLine);
        throw KTLCException(KTString(kKTErrorInternal), kPath, kLine);
    }
    return *dictionary;
}

IKTStringDictionary &KTPublicUtils::GetStringDictionary() {
    return KTRequireDictionary(KTStringDictionary::GetStringDictionary());
}
