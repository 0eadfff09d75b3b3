// StreamUtilTest.cpp: the toolbox of the streams: factories, copies, clones, comparisons; the stream on a temporary file;
// and data providers.

#include "CKTStreamRead.h"
#include "CKTStreamReadWrite.h"
#include "CKTStreamWrite.h"
#include "KTDataProvider.h"
#include "KTFileUtil.h"
#include "KTStreamUtil.h"
#include "LogLines.h"
#include "StreamSupport.h"

#include <limits>
#include <memory>
#include <stdexcept>

namespace {

using Stream = std::unique_ptr<IKTStream>;
using ReadWrite = std::unique_ptr<IKTReadWriteStream>;
using Lines = std::vector<std::string>;

constexpr unsigned int kIgnored = 0x3F3F3F3F;
constexpr char kNullReport[] =
    "Assert failed: null input stream in Stream copy at source/private/streams/KTStreamUtil:163";
constexpr char kWrongReport[] =
    "Assert failed: incorrect streams passed to stream copy at source/private/streams/KTStreamUtil:169";

void WriteText(IKTStream &stream, std::string text) {
    stream.XferByte(reinterpret_cast<unsigned char *>(text.data()), static_cast<int>(text.size()));
}
std::string ReadText(IKTStream &stream, std::size_t count) {
    std::string text(count, '?');
    text.resize(static_cast<std::size_t>(
        stream.XferByte(reinterpret_cast<unsigned char *>(text.data()), static_cast<int>(count))));
    return text;
}

// A reader of given bytes, or a writer, whose transport records.
template <typename Kind> struct Recorded {
    explicit Recorded(std::string const &bytes = "")
        : transport(new RecordingTransport(std::vector<unsigned char>(bytes.begin(), bytes.end()))) {
        stream.SetXferBytes(transport);
    }
    std::string Text() const { return {transport->data.begin(), transport->data.end()}; }

    RecordingTransport *transport; // the stream's
    Kind stream;
};
using Source = Recorded<CKTStreamRead>;
using Target = Recorded<CKTStreamWrite>;

class StreamUtilTest : public StreamFixture {};

// ---- factories ----

TEST_F(StreamUtilTest, ReadFactoriesDifferWhenTheFileIsMissing) {
    EXPECT_EQ(KTStreamUtil::CreateFileStreamRead(File("none"), 1, kIgnored, kIgnored), nullptr);
    Stream const lazy(KTStreamUtil::CreateFileStreamReadLazy(File("none"), 1, kIgnored, kIgnored));
    ASSERT_NE(lazy, nullptr);
    EXPECT_EQ(lazy->GetStreamState(), kKTStreamStateClosed);
    EXPECT_EQ(lazy->IsReading(), 1);
    EXPECT_EQ(ReadText(*lazy, 3), "");
    for (auto *const create : {&KTStreamUtil::CreateFileStreamRead, &KTStreamUtil::CreateFileStreamReadLazy}) {
        Stream const stream(create(File("file", "abc"), 1, 0, 0));
        ASSERT_NE(dynamic_cast<CKTStreamRead *>(stream.get()), nullptr);
        EXPECT_EQ(stream->GetStreamState(), kKTStreamStateGood);
        EXPECT_EQ(ReadText(*stream, 3), "abc");
    }
}

TEST_F(StreamUtilTest, WriteFactoriesAlwaysReturnAStream) {
    for (auto *const create : {&KTStreamUtil::CreateFileStreamWrite, &KTStreamUtil::CreateFileStreamWriteLazy}) {
        Stream const denied(create(File("none/file"), 2, kIgnored, kIgnored));
        ASSERT_NE(denied, nullptr);
        EXPECT_EQ(denied->GetStreamState(), kKTStreamStateClosed);
        EXPECT_EQ(denied->IsWriting(), 1);
        Stream stream(create(File("file", "old text"), 2, kIgnored, kIgnored));
        ASSERT_NE(dynamic_cast<CKTStreamWrite *>(stream.get()), nullptr);
        WriteText(*stream, "new");
        stream.reset();
        EXPECT_EQ(Content("file"), "new text");
        stream.reset(create(File("file"), 0xA, kIgnored, kIgnored)); // the mode is passed on
        stream.reset();
        EXPECT_EQ(Content("file"), "");
    }
}

TEST_F(StreamUtilTest, ReadWriteFactoriesDifferWhenTheFileCannotBeOpened) {
    EXPECT_EQ(KTStreamUtil::CreateFileStreamReadWrite(File("none/file"), 3, kIgnored, kIgnored), nullptr);
    ReadWrite const lazy(KTStreamUtil::CreateFileStreamReadWriteLazy(File("none/file"), 3, kIgnored, kIgnored));
    ASSERT_NE(lazy, nullptr);
    EXPECT_EQ(lazy->GetStreamState(), kKTStreamStateClosed);
    for (auto *const create :
         {&KTStreamUtil::CreateFileStreamReadWrite, &KTStreamUtil::CreateFileStreamReadWriteLazy}) {
        ReadWrite const stream(create(File("file", "old"), 3, 0, 0));
        ASSERT_NE(dynamic_cast<CKTStreamReadWrite *>(stream.get()), nullptr);
        EXPECT_EQ(stream->IsReading(), 1);
        EXPECT_EQ(ReadText(*stream, 3), "old");
        stream->SetMode(IKTReadWriteStream::kModeWrite);
        WriteText(*stream, "er");
        stream->Seek(0, kKTSeekFromBeginning);
        stream->SetMode(IKTReadWriteStream::kModeRead);
        EXPECT_EQ(ReadText(*stream, 9), "older");
    }
}

TEST_F(StreamUtilTest, MemoryStreamsHoldAQuarterMegabyte) {
    Stream const reader(KTStreamUtil::CreateMemoryStreamRead());
    ASSERT_NE(dynamic_cast<CKTStreamRead *>(reader.get()), nullptr);
    EXPECT_EQ(ReadText(*reader, 1), "");
    EXPECT_EQ(reader->GetStreamState(), kKTStreamStateEndOfStream);
    Stream const writer(KTStreamUtil::CreateMemoryStreamWrite());
    ASSERT_NE(dynamic_cast<CKTStreamWrite *>(writer.get()), nullptr);
    WriteText(*writer, Pattern(262144));
    EXPECT_EQ(writer->Tell(), 262144U);
    WriteText(*writer, "x");
    EXPECT_EQ(writer->Tell(), 262144U);
    ReadWrite const both(KTStreamUtil::CreateMemoryStreamReadWrite());
    both->SetMode(IKTReadWriteStream::kModeWrite);
    WriteText(*both, "abc");
    both->Seek(0, kKTSeekFromBeginning);
    both->SetMode(IKTReadWriteStream::kModeRead);
    EXPECT_EQ(ReadText(*both, 9), "abc");
}

// ---- copies ----

TEST_F(StreamUtilTest, CopiesInBlocksAndLeavesTheSourceWhereItWas) {
    std::string const bytes = Pattern(10000);
    Source source(bytes);
    Target target("0123456789");
    source.transport->position = 77;
    target.transport->position = 5;
    EXPECT_EQ(KTStreamUtil::StreamCopy(&source.stream, &target.stream), kKTErrorNone);
    std::vector<unsigned int> const blocks = {4096, 4096, 1808};
    EXPECT_EQ(source.transport->reads, blocks);
    EXPECT_EQ(target.transport->writes, blocks);
    EXPECT_EQ(source.transport->position, 77U);
    EXPECT_EQ(target.Text(), "01234" + bytes);
    EXPECT_EQ(target.transport->position, 10005U);
    EXPECT_EQ(target.transport->flushes, 0);
}

TEST_F(StreamUtilTest, CopiesEverySize) {
    for (std::size_t const size : {0U, 1U, 4095U, 4096U, 4097U, 8192U}) {
        Source source(Pattern(size));
        Target target;
        EXPECT_EQ(KTStreamUtil::StreamCopy(&source.stream, &target.stream), kKTErrorNone);
        EXPECT_EQ(target.Text(), Pattern(size)) << size;
    }
}

TEST_F(StreamUtilTest, CopyRefusesWrongStreams) {
    LogLines log;
    Source source("abc");
    Source otherSource("abc");
    Target target;
    Target otherTarget;
    EXPECT_EQ(KTStreamUtil::StreamCopy(nullptr, &target.stream), kKTErrorFailed);
    EXPECT_EQ(KTStreamUtil::StreamCopy(&source.stream, nullptr), kKTErrorFailed);
    EXPECT_EQ(KTStreamUtil::StreamCopy(nullptr, nullptr), kKTErrorFailed);
    EXPECT_EQ(log.Take(), (Lines{kNullReport, kNullReport, kNullReport}));
    EXPECT_EQ(KTStreamUtil::StreamCopy(&otherTarget.stream, &target.stream), kKTErrorFailed);
    EXPECT_EQ(KTStreamUtil::StreamCopy(&source.stream, &otherSource.stream), kKTErrorFailed);
    EXPECT_EQ(log.Take(), (Lines{kWrongReport, kWrongReport}));
    EXPECT_TRUE(source.transport->reads.empty());
    EXPECT_TRUE(otherSource.transport->reads.empty());
    EXPECT_TRUE(target.transport->writes.empty());
    EXPECT_TRUE(otherTarget.transport->writes.empty());
}

// A source whose bytes are fewer than its size: whole blocks are written all the same.
class ShrunkTransport : public RecordingTransport {
  public:
    ShrunkTransport(unsigned int there, unsigned int size)
        : RecordingTransport(std::vector<unsigned char>(there, 'x')), m_Size(size) {}
    unsigned int Seek(int offset, KTSeekFromWhere origin) override {
        if (origin == kKTSeekFromEnd) {
            position = m_Size;
            return position;
        }
        return RecordingTransport::Seek(offset, origin);
    }
    unsigned int Read(void *buffer, unsigned int count) override {
        position = std::min(position, static_cast<unsigned int>(data.size()));
        return RecordingTransport::Read(buffer, count);
    }

  private:
    unsigned int m_Size;
};

TEST_F(StreamUtilTest, CopyWritesWholeBlocksWhateverWasRead) {
    CKTStreamRead source;
    source.SetXferBytes(new ShrunkTransport(100, 5000));
    Target target;
    EXPECT_EQ(KTStreamUtil::StreamCopy(&source, &target.stream), kKTErrorNone);
    EXPECT_EQ(target.transport->writes, (std::vector<unsigned int>{4096, 904}));
    std::string const text = target.Text();
    EXPECT_EQ(text.substr(0, 4096), std::string(100, 'x') + std::string(3996, '\0')); // nothing of our memory
    target.transport->room = 10;
    EXPECT_EQ(KTStreamUtil::StreamCopy(&source, &target.stream), kKTErrorNone); // the target's state would tell
}

TEST_F(StreamUtilTest, CopyBetweenFilesIsExact) {
    std::string const bytes = Pattern(1234567);
    Stream const source(KTStreamUtil::CreateFileStreamRead(File("from", bytes), 1, 0, 0));
    source->Seek(1000, kKTSeekFromBeginning);
    Stream target(KTStreamUtil::CreateFileStreamWrite(File("to"), 2, 0, 0));
    EXPECT_EQ(KTStreamUtil::StreamCopy(source.get(), target.get()), kKTErrorNone);
    EXPECT_EQ(source->Tell(), 1000U);
    target.reset();
    EXPECT_EQ(Content("to"), bytes);
}

TEST_F(StreamUtilTest, SavesAStreamAsAFile) {
    Source source("new");
    source.transport->position = 1;
    EXPECT_EQ(KTStreamUtil::SaveReadStreamToFile(&source.stream, File("a", "much longer")), kKTErrorNone);
    EXPECT_EQ(Content("a"), "new");
    EXPECT_EQ(source.transport->position, 1U);
    EXPECT_EQ(KTStreamUtil::SaveReadStreamToFile(&source.stream, File("b").GetPathString()), kKTErrorNone);
    EXPECT_EQ(Content("b"), "new");
}

TEST_F(StreamUtilTest, SavingToADeniedFileIsNotReported) {
    Source source("new");
    LogLines log;
    EXPECT_EQ(KTStreamUtil::SaveReadStreamToFile(&source.stream, File("none/file")), kKTErrorNone);
    EXPECT_TRUE(log.Take().empty());
}

TEST_F(StreamUtilTest, SavingAWrongStreamLeavesTheFile) {
    LogLines log;
    Target target;
    EXPECT_EQ(KTStreamUtil::SaveReadStreamToFile(nullptr, File("a", "old")), kKTErrorFailed);
    EXPECT_EQ(KTStreamUtil::SaveReadStreamToFile(&target.stream, File("a")), kKTErrorFailed);
    EXPECT_EQ(log.Take(), (Lines{kNullReport, kWrongReport}));
    EXPECT_EQ(Content("a"), "old");
}

// ---- clones ----

// The ".ikt" files in the session folder.
std::vector<std::filesystem::path> SessionFiles() {
    std::string folder = KTFileUtil::GetSessionTempFolder().GetPathAsKTString().GetUTF8String();
    std::replace(folder.begin(), folder.end(), '\\', '/');
    std::vector<std::filesystem::path> files;
    for (auto const &entry : std::filesystem::directory_iterator(folder)) {
        if (entry.path().extension() == ".ikt") {
            files.push_back(entry.path());
        }
    }
    return files;
}

TEST_F(StreamUtilTest, ClonesInBlocks) {
    for (std::size_t const size : {0U, 1U, 4096U, 8192U, 10000U}) {
        SCOPED_TRACE(size);
        std::string const bytes = Pattern(size);
        Source source(bytes);
        source.transport->position = 1;
        std::size_t const files = SessionFiles().size();
        Stream clone(KTStreamUtil::Clone(&source.stream));
        ASSERT_NE(dynamic_cast<CKTStreamReadWrite *>(clone.get()), nullptr);
        EXPECT_EQ(source.transport->position, 1U);
        EXPECT_EQ(source.transport->reads.size(), (size + 4095) / 4096);
        EXPECT_EQ(clone->IsReading(), 1);
        EXPECT_EQ(clone->Tell(), size);
        EXPECT_EQ(clone->Seek(0, kKTSeekFromBeginning), 0);
        EXPECT_EQ(ReadText(*clone, size + 1), bytes);
        EXPECT_EQ(SessionFiles().size(), files + 1);
        clone.reset();
        EXPECT_EQ(SessionFiles().size(), files + 1); // the file stays
    }
}

TEST_F(StreamUtilTest, ClonesOnlyWhatCanBeRead) {
    Target target("precious");
    EXPECT_EQ(KTStreamUtil::Clone(nullptr), nullptr);
    EXPECT_EQ(KTStreamUtil::Clone(&target.stream), nullptr);
    EXPECT_EQ(target.Text(), "precious");
}

// ---- comparisons ----

KTBool16 Compare(std::string const &first, std::string const &second) {
    Source one(first);
    Source other(second);
    return KTStreamUtil::Compare(&one.stream, &other.stream, KTStreamUtil::kCompareByteByByte);
}

TEST_F(StreamUtilTest, ComparesAllBytes) {
    for (std::size_t const size : {1U, 4096U, 4097U, 10000U}) {
        std::string const bytes = Pattern(size);
        std::string different = bytes;
        different.back() = static_cast<char>(different.back() ^ 1);
        EXPECT_EQ(Compare(bytes, bytes), 1) << size;
        EXPECT_EQ(Compare(bytes, different), 0) << size;
        EXPECT_EQ(Compare(bytes, bytes + "x"), 0) << size;
        EXPECT_EQ(Compare(bytes, ""), 0) << size;
    }
    EXPECT_EQ(Compare("", ""), 1);
}

TEST_F(StreamUtilTest, OtherStrategiesCompareNothing) {
    Source source("a");
    auto const other = static_cast<KTStreamUtil::StreamCompareStrategies>(1);
    EXPECT_EQ(KTStreamUtil::Compare(&source.stream, nullptr, other), 1);
    EXPECT_EQ(KTStreamUtil::Compare(nullptr, nullptr, other), 1);
    Source longer("longer");
    EXPECT_EQ(KTStreamUtil::Compare(&source.stream, &longer.stream, other), 1);
    EXPECT_TRUE(longer.transport->reads.empty());
}

TEST_F(StreamUtilTest, NothingEqualsANullStreamOrAWriter) {
    Source source("a");
    Target target("a");
    EXPECT_EQ(KTStreamUtil::Compare(&source.stream, nullptr, KTStreamUtil::kCompareByteByByte), 0);
    EXPECT_EQ(KTStreamUtil::Compare(nullptr, &source.stream, KTStreamUtil::kCompareByteByByte), 0);
    EXPECT_EQ(KTStreamUtil::Compare(nullptr, nullptr, KTStreamUtil::kCompareByteByByte), 0);
    EXPECT_EQ(KTStreamUtil::Compare(&source.stream, &target.stream, KTStreamUtil::kCompareByteByByte), 0);
    EXPECT_EQ(target.Text(), "a");
}

TEST_F(StreamUtilTest, ComparisonsStopAtTheDifference) {
    std::string bytes = Pattern(20000);
    Source one(bytes);
    bytes[5000] = static_cast<char>(bytes[5000] ^ 1);
    Source other(bytes);
    one.transport->position = 7;
    EXPECT_EQ(KTStreamUtil::Compare(&one.stream, &other.stream, KTStreamUtil::kCompareByteByByte), 0);
    EXPECT_EQ(one.transport->position, 8192U);
    EXPECT_EQ(other.transport->position, 8192U);
}

TEST_F(StreamUtilTest, AStreamThatEndsEarlyIsDifferent) {
    CKTStreamRead shrunk;
    shrunk.SetXferBytes(new ShrunkTransport(100, 5000));
    Source whole(std::string(5000, 'x'));
    EXPECT_EQ(KTStreamUtil::Compare(&shrunk, &whole.stream, KTStreamUtil::kCompareByteByByte), 0);
}

// A host's stream whose count is none.
class LyingStream : public CKTStreamRead {
  public:
    explicit LyingStream(int count) : m_Count(count) { SetXferBytes(new RecordingTransport(Bytes("01 02 03 "))); }
    using CKTStreamRead::XferByte;
    int XferByte(unsigned char *, int) override { return m_Count; }

  private:
    int m_Count;
};

TEST_F(StreamUtilTest, CountsThatCannotBeAreDifferent) {
    for (int const count : {-1, 4, 5000, std::numeric_limits<int>::max(), std::numeric_limits<int>::min()}) {
        LyingStream one(count);
        LyingStream other(count);
        EXPECT_EQ(KTStreamUtil::Compare(&one, &other, KTStreamUtil::kCompareByteByByte), 0) << count;
    }
}

// ---- on a temporary file ----

TEST_F(StreamUtilTest, TheTemporaryFileGoesWithItsStream) {
    std::size_t const before = SessionFiles().size();
    {
        CKTTempFileStreamReadWrite stream;
        EXPECT_EQ(stream.GetStreamState(), kKTStreamStateGood);
        EXPECT_EQ(stream.IsReading(), 1);
        ASSERT_EQ(SessionFiles().size(), before + 1);
        stream.SetMode(IKTReadWriteStream::kModeWrite);
        WriteText(stream, "abc");
        stream.Seek(0, kKTSeekFromBeginning);
        stream.SetMode(IKTReadWriteStream::kModeRead);
        EXPECT_EQ(ReadText(stream, 9), "abc");
        stream.SetMode(IKTReadWriteStream::kModeWrite);
        WriteText(stream, "never written out by the caller");
    }
    EXPECT_EQ(SessionFiles().size(), before);
}

// ---- data providers ----

TEST(KTMemoryDataProviderTest, HandsOutChunks) {
    char data[] = "0123456789";
    KTMemoryDataProvider provider(data, 10);
    EXPECT_EQ(provider.GetDataSize(), 10U);
    void *chunk = nullptr;
    unsigned long long size = 0;
    EXPECT_EQ(provider.GetNextData(4, &chunk, size), IKTDataProvider::kKTDataProviderNoError);
    EXPECT_EQ(chunk, data);
    EXPECT_EQ(size, 4U);
    provider.FreeDataMemory(chunk);
    KTMemoryDataProvider copy(provider);
    EXPECT_EQ(provider.GetNextData(4, &chunk, size), IKTDataProvider::kKTDataProviderNoError);
    EXPECT_EQ(chunk, data + 4);
    EXPECT_EQ(provider.GetNextData(4, &chunk, size), IKTDataProvider::kKTDataProviderEndOfData);
    EXPECT_EQ(chunk, data + 8);
    EXPECT_EQ(size, 2U);
    chunk = &size;
    size = 77;
    EXPECT_EQ(provider.GetNextData(4, &chunk, size), IKTDataProvider::kKTDataProviderEndOfData);
    EXPECT_EQ(provider.GetNextData(0, &chunk, size), IKTDataProvider::kKTDataProviderNoError);
    EXPECT_EQ(chunk, &size);
    EXPECT_EQ(size, 77U);
    EXPECT_EQ(copy.GetNextData(6, &chunk, size), IKTDataProvider::kKTDataProviderNoError); // exactly the rest
    EXPECT_EQ(chunk, data + 4);
    EXPECT_EQ(size, 6U);
    EXPECT_EQ(provider.GetDataSize(), 10U);
    EXPECT_STREQ(data, "0123456789");
}

TEST(KTMemoryDataProviderTest, HugeRequestsGetTheRest) {
    char data[] = "0123456789";
    KTMemoryDataProvider provider(data, 10);
    void *chunk = nullptr;
    unsigned long long size = 0;
    provider.GetNextData(3, &chunk, size);
    EXPECT_EQ(provider.GetNextData(~0ULL, &chunk, size), IKTDataProvider::kKTDataProviderEndOfData);
    EXPECT_EQ(chunk, data + 3);
    EXPECT_EQ(size, 7U);
}

TEST(KTMemoryDataProviderTest, ReportsBadArguments) {
    LogLines log;
    char data[] = "0123456789";
    KTMemoryDataProvider provider(data, 10);
    unsigned long long size = 77;
    EXPECT_EQ(provider.GetNextData(4, nullptr, size), IKTDataProvider::kKTDataProviderBadArgument);
    EXPECT_EQ(size, 77U);
    EXPECT_EQ(log.Take(), Lines{"Assert failed:  at source/private/utils/KTMemoryDataProvider:57"});
    EXPECT_THROW(KTMemoryDataProvider(nullptr, 0), std::invalid_argument);
    EXPECT_EQ(log.Take(), Lines{"Assert failed:  at source/private/utils/KTMemoryDataProvider:21"});
}

} // namespace
