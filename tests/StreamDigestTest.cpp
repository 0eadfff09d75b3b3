// StreamDigestTest.cpp: digests of streams: over memory, over files of every size around the parts that are read, and
// over a transport that tells what it was asked.

#include "CKTStreamRead.h"
#include "CKTStreamReadWrite.h"
#include "FileXferBytes.h"
#include "KTPublicUtils.h"
#include "KTStreamUtil.h"
#include "LogLines.h"

#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <vector>

namespace {

namespace fs = std::filesystem;
using Lines = std::vector<std::string>;

constexpr unsigned int kPart = 0x40000;
constexpr char kOfNothing[] = "e3b0c44298fc1c149afbf4c8996fb92427ae41e4649b934ca495991b7852b855";
constexpr auto kUnknownFunction = static_cast<KTHashFunctionEnum>(1);

Lines const kNotValid = {"Assert failed: Generate Hash - not valid stream at source/private/utils/KTPublicUtils:71"};
Lines const kCutShort = {"Assert failed: Generate Hash - not valid stream at source/private/utils/KTPublicUtils:88"};

std::string Hash(IKTStream *stream) { return KTPublicUtils::GenerateHash(stream, kKTHashSHA256).GetUTF8String(); }

std::string HashOf(std::string const &bytes) {
    return KTPublicUtils::GenerateHash(reinterpret_cast<unsigned char const *>(bytes.data()),
                                       static_cast<unsigned int>(bytes.size()), kKTHashSHA256)
        .GetUTF8String();
}

std::string Bytes(std::size_t size) {
    std::string bytes(size, '\0');
    for (std::size_t i = 0; i < size; ++i) {
        bytes[i] = static_cast<char>(i * 31 + i / 256);
    }
    return bytes;
}

class TemporaryFile {
  public:
    explicit TemporaryFile(std::string const &bytes) : m_Path(fs::temp_directory_path() / "digest.bin") {
        std::ofstream(m_Path, std::ios::binary) << bytes;
    }
    TemporaryFile(TemporaryFile const &) = delete;
    TemporaryFile &operator=(TemporaryFile const &) = delete;
    ~TemporaryFile() {
        std::error_code ignored;
        fs::remove(m_Path, ignored);
    }

    std::unique_ptr<IKTStream> Open() const {
        return std::unique_ptr<IKTStream>(KTStreamUtil::CreateFileStreamRead(KTFile(KTString(m_Path.wstring().c_str())),
                                                                             FileXferBytes::kOpenRead, 0, 0));
    }

  private:
    fs::path m_Path;
};

// A transport over bytes that may say that there are more of them than come, and remembers what it was asked.
class WatchedBytes : public IKTXferBytes {
  public:
    WatchedBytes(std::string bytes, unsigned int size) : m_Bytes(std::move(bytes)), m_Size(size) {}

    unsigned int Read(void *buffer, unsigned int count) override {
        reads.push_back(count);
        largest = std::max(largest, count);
        std::size_t const from = std::min<std::size_t>(m_Position, m_Bytes.size());
        std::size_t const got = std::min<std::size_t>(count, m_Bytes.size() - from);
        std::memcpy(buffer, m_Bytes.data() + from, got);
        m_Position += static_cast<unsigned int>(got);
        if (got < count) {
            state = kKTStreamStateEndOfStream;
        }
        return static_cast<unsigned int>(got);
    }
    unsigned int Write(void *, unsigned int) override { return 0; }
    unsigned int Seek(int offset, KTSeekFromWhere origin) override {
        seeks.push_back(origin);
        m_Position = (origin == kKTSeekFromEnd ? m_Size : 0) + static_cast<unsigned int>(offset);
        return m_Position;
    }
    unsigned int Tell() override { return m_Position; }
    void Flush() override {}
    KTStreamState GetStreamState() override { return state; }
    void SetEndOfStream() override {}

    KTStreamState state = kKTStreamStateGood;
    std::vector<unsigned int> reads;
    std::vector<int> seeks;
    unsigned int largest = 0;

  private:
    std::string m_Bytes;
    unsigned int m_Size;
    unsigned int m_Position = 7; // somewhere
};

struct WatchedStream {
    WatchedBytes *transport; // the stream's
    CKTStreamRead stream;

    WatchedStream(std::string const &bytes, unsigned int size) : transport(new WatchedBytes(bytes, size)) {
        stream.SetXferBytes(transport);
    }
};

} // namespace

TEST(StreamHash, IsThatOfAllBytesFromTheBeginning) {
    for (std::size_t const size : {0U, 1U, 1000U, kPart - 1, kPart}) {
        std::unique_ptr<IKTReadWriteStream> const stream(KTStreamUtil::CreateMemoryStreamReadWrite());
        std::string bytes = Bytes(size);
        stream->SetMode(IKTReadWriteStream::kModeWrite);
        stream->XferByte(reinterpret_cast<unsigned char *>(bytes.data()), static_cast<int>(size));
        stream->SetMode(IKTReadWriteStream::kModeRead);
        stream->Seek(static_cast<int>(size / 2), kKTSeekFromBeginning);
        LogLines log;
        EXPECT_EQ(Hash(stream.get()), HashOf(bytes)) << size;
        EXPECT_EQ(stream->Tell(), size) << "left at its end";
        EXPECT_EQ(stream->GetStreamState(), kKTStreamStateGood);
        EXPECT_EQ(log.Take(), Lines{});
    }
}

TEST(StreamHash, OfAFileOfAnySize) {
    for (unsigned int const size :
         {0U, 1U, 65536U, kPart - 1, kPart, kPart + 1, 2 * kPart - 1, 2 * kPart, 2 * kPart + 1, 3 * kPart + 70001}) {
        std::string const bytes = Bytes(size);
        TemporaryFile const file(bytes);
        auto const stream = file.Open();
        ASSERT_NE(stream, nullptr);
        EXPECT_EQ(Hash(stream.get()), HashOf(bytes)) << size;
        EXPECT_EQ(stream->GetStreamState(), kKTStreamStateGood) << size;
        EXPECT_EQ(stream->Tell(), size);
        EXPECT_EQ(Hash(stream.get()), HashOf(bytes)) << size << " once more";
    }
}

// What one read of the whole file leaves is what the parts leave: state and position.
TEST(StreamHash, LeavesAFileAsOneReadOfItDoes) {
    for (unsigned int const small : {0U, 100U}) { // small reads before switch the transport's read-ahead on
        for (unsigned int const size : {kPart + 5, 2 * kPart, 2 * kPart + 5, 4 * kPart + 65535}) {
            TemporaryFile const file(Bytes(size));
            auto const hashed = file.Open();
            auto const read = file.Open();
            std::vector<unsigned char> buffer(size);
            for (unsigned int i = 0; i < small; ++i) {
                hashed->XferByte(buffer.data(), 1000);
                read->XferByte(buffer.data(), 1000);
            }
            Hash(hashed.get());
            read->Seek(0, kKTSeekFromEnd);
            read->Seek(0, kKTSeekFromBeginning);
            read->XferByte(buffer.data(), static_cast<int>(size));
            EXPECT_EQ(hashed->GetStreamState(), read->GetStreamState()) << size;
            EXPECT_EQ(hashed->Tell(), read->Tell()) << size;
        }
    }
}

TEST(StreamHash, ReadsPartsOfBoundedSize) {
    std::string const bytes = Bytes(5 * kPart + 3);
    WatchedStream watched(bytes, static_cast<unsigned int>(bytes.size()));
    EXPECT_EQ(Hash(&watched.stream), HashOf(bytes));
    EXPECT_EQ(watched.transport->reads, (std::vector<unsigned int>{kPart, kPart, kPart, kPart, kPart + 3}));
    EXPECT_EQ(watched.transport->seeks, (std::vector<int>{kKTSeekFromEnd, kKTSeekFromBeginning}));
}

TEST(StreamHash, StreamsThatCannotBeReadAreReported) {
    LogLines log;
    EXPECT_EQ(Hash(nullptr), "");
    EXPECT_EQ(log.Take(), kNotValid);
    EXPECT_TRUE(KTPublicUtils::GenerateHash(static_cast<IKTStream *>(nullptr), kUnknownFunction).empty());
    EXPECT_EQ(log.Take(), kNotValid) << "the stream is looked at first";

    std::unique_ptr<IKTStream> const writer(KTStreamUtil::CreateMemoryStreamWrite());
    EXPECT_EQ(Hash(writer.get()), "");
    EXPECT_EQ(log.Take(), kNotValid);

    for (KTStreamState const state : {kKTStreamStateEndOfStream, kKTStreamStateError, kKTStreamStateClosed}) {
        WatchedStream watched("abc", 3);
        watched.transport->state = state;
        EXPECT_EQ(Hash(&watched.stream), "");
        EXPECT_EQ(log.Take(), kNotValid) << state;
        EXPECT_TRUE(watched.transport->seeks.empty()) << "left where it is";
    }
}

TEST(StreamHash, OfAnEmptyStreamIsThatOfNoBytes) {
    std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateMemoryStreamRead());
    EXPECT_EQ(Hash(stream.get()), kOfNothing);
}

TEST(StreamHash, OtherFunctionsAreReportedAndTheStreamIsAtItsEnd) {
    WatchedStream watched("abc", 3);
    LogLines log;
    EXPECT_TRUE(KTPublicUtils::GenerateHash(&watched.stream, kUnknownFunction).empty());
    EXPECT_EQ(log.Take(),
              (Lines{"Assert failed: Algorithm - Hashing not implemented at source/private/utils/KTPublicUtils:112"}));
    EXPECT_EQ(watched.stream.Tell(), 3U);
}

// A digest of something else than the stream's bytes would be worse than none.
TEST(StreamHash, StreamsThatEndBeforeTheirSizeAreReported) {
    LogLines log;
    for (std::size_t const size : {0U, 5U, kPart + 5}) {
        WatchedStream watched(Bytes(size), 3 * kPart);
        EXPECT_EQ(Hash(&watched.stream), "");
        EXPECT_EQ(log.Take(), kCutShort) << size;
    }
}
