// BenchDigests.cpp: Base64 beside two others, the digest of a stream beside the system's plain call on the same bytes,
// and copies of variants.

#include "Bench.h"

#include "FileXferBytes.h"
#include "KTPublicUtils.h"
#include "KTStreamUtil.h"
#include "KTVariant.h"

#include <boost/beast/core/detail/base64.hpp>
#include <windows.h>

#include <bcrypt.h>
#include <wincrypt.h>

#include <filesystem>
#include <fstream>
#include <memory>
#include <random>
#include <vector>

namespace bench {

namespace {

constexpr char kEncode[] = "base64-encode";
constexpr char kDecode[] = "base64-decode";
constexpr char kHash[] = "hash-stream";
constexpr char kHashBytes[] = "hash-bytes";
constexpr char kVariantGrowth[] = "variant-growth";
constexpr char kBeast[] = "Beast";
constexpr char kSystem[] = "system";

// The strings of a conversion both ways, and what the system asks for besides.
constexpr std::size_t kRoom = 4;

struct Size {
    char const *name;
    std::size_t bytes;
};

constexpr Size kSizes[] = {{"64", 64}, {"1K", 1024}, {"64K", 65536}, {"1M", 1048576}};

std::string RandomBytes(std::size_t size) {
    std::mt19937 random(42);
    std::string bytes(size, '\0');
    for (char &byte : bytes) {
        byte = static_cast<char>(random());
    }
    return bytes;
}

namespace beast = boost::beast::detail::base64;

std::string BeastEncoded(std::string const &bytes) {
    std::string text(beast::encoded_size(bytes.size()), '\0');
    text.resize(beast::encode(text.data(), bytes.data(), bytes.size()));
    return text;
}

std::string BeastDecoded(std::string const &text) {
    std::string bytes(beast::decoded_size(text.size()), '\0');
    bytes.resize(beast::decode(bytes.data(), text.data(), text.size()).first);
    return bytes;
}

// A call for the size and one for the text, as the system's documentation has it.
std::string SystemEncoded(std::string const &bytes) {
    auto const *const from = reinterpret_cast<BYTE const *>(bytes.data());
    auto const size = static_cast<DWORD>(bytes.size());
    DWORD const flags = CRYPT_STRING_BASE64 | CRYPT_STRING_NOCRLF;
    DWORD length = 0;
    CryptBinaryToStringA(from, size, flags, nullptr, &length);
    std::string text(length, '\0');
    CryptBinaryToStringA(from, size, flags, text.data(), &length);
    text.resize(length);
    return text;
}

std::string SystemDecoded(std::string const &text) {
    auto const size = static_cast<DWORD>(text.size());
    DWORD length = 0;
    CryptStringToBinaryA(text.data(), size, CRYPT_STRING_BASE64, nullptr, &length, nullptr, nullptr);
    std::string bytes(length, '\0');
    CryptStringToBinaryA(text.data(), size, CRYPT_STRING_BASE64, reinterpret_cast<BYTE *>(bytes.data()), &length,
                         nullptr, nullptr);
    return bytes;
}

template <typename Convert> void AddConversion(char const *group, char const *kase, Size const &size,
                                               char const *contender, std::string const &input, Convert convert) {
    Add({group, kase, size.name}, contender, [input, convert](benchmark::State &state) {
        HeapRoom const room(kRoom * input.size());
        for (auto _ : state) {
            benchmark::DoNotOptimize(convert(input));
        }
    });
}

// Text in lines of 76 characters, as mail has it. Beast takes no line breaks.
std::string InLines(std::string const &text) {
    constexpr std::size_t kWidth = 76;
    std::string lines;
    for (std::size_t at = 0; at < text.size(); at += kWidth) {
        lines += text.substr(at, kWidth) + "\r\n";
    }
    return lines;
}

void AddBase64() {
    for (Size const &size : kSizes) {
        std::string const bytes = RandomBytes(size.bytes);
        AddConversion(kEncode, "bytes", size, kOurs, bytes, KTPublicUtils::Base64_encode);
        AddConversion(kEncode, "bytes", size, kBeast, bytes, BeastEncoded);
        AddConversion(kEncode, "bytes", size, kSystem, bytes, SystemEncoded);
        std::string const text = KTPublicUtils::Base64_encode(bytes);
        AddConversion(kDecode, "text", size, kOurs, text, KTPublicUtils::Base64_decode);
        AddConversion(kDecode, "text", size, kBeast, text, BeastDecoded);
        AddConversion(kDecode, "text", size, kSystem, text, SystemDecoded);
        std::string const lines = InLines(text);
        AddConversion(kDecode, "lines", size, kOurs, lines, KTPublicUtils::Base64_decode);
        AddConversion(kDecode, "lines", size, kSystem, lines, SystemDecoded);
    }
}

// ---- digests ----

void SystemHash(std::string const &bytes) {
    BCRYPT_ALG_HANDLE algorithm = nullptr;
    BCRYPT_HASH_HANDLE hash = nullptr;
    UCHAR digest[32];
    BCryptOpenAlgorithmProvider(&algorithm, BCRYPT_SHA256_ALGORITHM, nullptr, 0);
    BCryptCreateHash(algorithm, &hash, nullptr, 0, nullptr, 0, 0);
    BCryptHashData(hash, reinterpret_cast<PUCHAR>(const_cast<char *>(bytes.data())), static_cast<ULONG>(bytes.size()),
                   0);
    BCryptFinishHash(hash, digest, sizeof digest, 0);
    BCryptDestroyHash(hash);
    BCryptCloseAlgorithmProvider(algorithm, 0);
    benchmark::DoNotOptimize(digest);
}

void AddSystemHash(char const *group, char const *kase, Size const &size, std::string const &bytes) {
    Add({group, kase, size.name}, kSystem, [bytes](benchmark::State &state) {
        for (auto _ : state) {
            SystemHash(bytes);
        }
    });
}

// A stream over memory, which holds at most 256 KiB, or over a file that the system has in its cache.
std::unique_ptr<IKTStream> MemoryStream(std::string const &bytes) {
    std::unique_ptr<IKTReadWriteStream> stream(KTStreamUtil::CreateMemoryStreamReadWrite());
    stream->SetMode(IKTReadWriteStream::kModeWrite);
    std::vector<unsigned char> copy(bytes.begin(), bytes.end()); // what is written need not be constant
    stream->XferByte(copy.data(), static_cast<int>(copy.size()));
    stream->SetMode(IKTReadWriteStream::kModeRead);
    return stream;
}

std::unique_ptr<IKTStream> FileStream(std::string const &bytes) {
    auto const path = std::filesystem::temp_directory_path() / "hash.bin";
    std::ofstream(path, std::ios::binary) << bytes;
    return std::unique_ptr<IKTStream>(
        KTStreamUtil::CreateFileStreamRead(KTFile(KTString(path.c_str())), FileXferBytes::kOpenRead, 0, 0));
}

void AddStreamHash(char const *kase, Size const &size, std::unique_ptr<IKTStream> (*open)(std::string const &bytes)) {
    std::string const bytes = RandomBytes(size.bytes);
    Add({kHash, kase, size.name}, kOurs, [bytes, open](benchmark::State &state) {
        auto const stream = open(bytes);
        for (auto _ : state) {
            benchmark::DoNotOptimize(KTPublicUtils::GenerateHash(stream.get(), kKTHashSHA256));
        }
    });
    AddSystemHash(kHash, kase, size, bytes);
}

void AddHashes() {
    for (Size const &size : kSizes) {
        std::string const bytes = RandomBytes(size.bytes);
        Add({kHashBytes, "bytes", size.name}, kOurs, [bytes](benchmark::State &state) {
            for (auto _ : state) {
                benchmark::DoNotOptimize(
                    KTPublicUtils::GenerateHash(reinterpret_cast<unsigned char const *>(bytes.data()),
                                                static_cast<unsigned int>(bytes.size()), kKTHashSHA256));
            }
        });
        AddSystemHash(kHashBytes, "bytes", size, bytes);
    }
    AddStreamHash("memory", {"256K", 262144}, MemoryStream);
    AddStreamHash("file", {"8M", 8388608}, FileStream);
}

// ---- variants ----

KTVariant Course(int pages) {
    std::map<KTString, KTVariant> course;
    for (int number = 0; number < pages; ++number) {
        KTString name("page");
        name.AppendNumber(number);
        std::map<KTString, KTVariant> page;
        page["Title"] = KTVariant(name + " of the course");
        page["Width"] = KTVariant(1024);
        page["Delay"] = KTVariant(2.5);
        page["Accent"] = KTVariant(KTColor(0xFF1F6FA8));
        course[name].SetObject(std::move(page));
    }
    KTVariant variant;
    variant.SetObject(std::move(course));
    return variant;
}

void AddVariants() {
    for (auto const &[name, pages] : {std::pair{"1x", 100}, {"10x", 1000}, {"100x", 10000}}) {
        Add({kVariantGrowth, "copy-and-destroy", name}, kOurs, [pages = pages](benchmark::State &state) {
            KTVariant const course = Course(pages);
            for (auto _ : state) {
                KTVariant copy;
                copy = course;
                benchmark::DoNotOptimize(&copy);
            }
        });
        Add({kVariantGrowth, "compare", name}, kOurs, [pages = pages](benchmark::State &state) {
            KTVariant const course = Course(pages);
            KTVariant const other = Course(pages);
            for (auto _ : state) {
                benchmark::DoNotOptimize(course == other);
            }
        });
    }
}

} // namespace

void AddDigestBenchmarks() {
    DescribeGroup(kEncode, "KTPublicUtils::Base64_encode");
    ExpectSpeed(kEncode, kBeast, 3);
    ExpectSpeed(kEncode, kSystem, 3);
    DescribeGroup(kDecode, "KTPublicUtils::Base64_decode");
    ExpectSpeed(kDecode, kBeast, 3);
    ExpectSpeed(kDecode, kSystem, 3);
    AddBase64();
    DescribeGroup(kHash, "KTPublicUtils::GenerateHash of streams, beside the plain call on the same bytes in memory");
    ExpectSpeed(kHash, kSystem, 1 / 1.05);
    DescribeGroup(kHashBytes, "KTPublicUtils::GenerateHash of bytes: the call and a fresh string of 64 digits");
    AddHashes();
    DescribeGrowthGroup(kVariantGrowth, "cost as the pages of a course become 10 and 100 times as many");
    AddVariants();
}

} // namespace bench
