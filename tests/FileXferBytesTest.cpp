// FileXferBytesTest.cpp: the transport over a file: how files are opened, what is gathered and read ahead, where seeks
// lead, and what is reported.

#include "FileXferBytes.h"
#include "LogLines.h"
#include "StreamSupport.h"
#include "TempFileXferBytes.h"

#include <memory>

namespace {

constexpr unsigned int kBuffer = 524288;

std::string NoHandle(int line) {
    return "Assert failed: fCoreFileHandle is nil at source/private/streams/WFileXferBytes:" + std::to_string(line);
}
constexpr int kClose = 181;
constexpr int kRead = 209;
constexpr int kWrite = 334;
constexpr int kWriteBytes = 377;
constexpr int kSeek = 421;
constexpr char kNoBuffer[] =
    "Assert failed: FileXferBytes::Write - nil buffer at source/private/streams/WFileXferBytes:352";

using Lines = std::vector<std::string>;

class FileXferBytesTest : public StreamFixture {
  protected:
    void Open(KTFile const &file, unsigned int mode) { ASSERT_EQ(transport.Open(file, mode, 0x3F3F3F3F, 7), 1); }

    // Reads small pieces until the buffer reads ahead, and one byte through it.
    void ReadAhead() {
        ASSERT_EQ(ReadText(transport, 65536).size(), 65536U);
        ASSERT_EQ(ReadText(transport, 1).size(), 1U);
        ASSERT_GT(transport.Tell(), 65537U);
    }

    FileXferBytes transport;
};

// ---- open ----

TEST_F(FileXferBytesTest, OpensAsTheModeSays) {
    struct Row {
        unsigned int mode;
        bool creates; // a missing file is created; else that fails
        char const *content;
        unsigned int position;
    };
    constexpr Row kRows[] = {
        {0x1, false, "old", 0}, {0x2, true, "old", 0}, {0x3, true, "old", 0},  {0x4, true, "old", 0},
        {0x5, true, "old", 0},  {0x6, true, "old", 3}, {0x7, true, "old", 3},  {0x8, false, "", 0},
        {0x9, false, "", 0},    {0xA, true, "", 0},    {0xB, true, "", 0},     {0xC, true, "old", 0},
        {0xE, true, "old", 3},  {0xF, true, "old", 3}, {0x0, false, "old", 0},
    };
    for (Row const &row : kRows) {
        SCOPED_TRACE(row.mode);
        std::filesystem::remove(Path("file"));
        EXPECT_EQ(transport.Open(File("file"), row.mode, 0, 0), row.creates ? 1 : 0);
        EXPECT_EQ(transport.GetStreamState(), row.creates ? kKTStreamStateGood : kKTStreamStateClosed);
        EXPECT_EQ(std::filesystem::exists(Path("file")), row.creates);
        transport.Close();
        ASSERT_EQ(transport.Open(File("file", "old"), row.mode, 0, 0), 1);
        EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
        EXPECT_EQ(transport.Tell(), row.position);
        transport.Close();
        EXPECT_EQ(transport.GetStreamState(), kKTStreamStateClosed);
        EXPECT_EQ(Content("file"), row.content);
    }
}

TEST_F(FileXferBytesTest, ReadsOrWritesOnlyWhatItWasOpenedFor) {
    Open(File("file", "old"), 2);
    EXPECT_EQ(ReadText(transport, 3), "");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
    Open(File("file"), 1);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
    EXPECT_EQ(ReadText(transport, 3), "old");
    transport.SetEndOfStream();
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
}

TEST_F(FileXferBytesTest, OpenClosesWhatIsOpen) {
    class Counting : public FileXferBytes {
      public:
        void Close() override {
            ++closes;
            FileXferBytes::Close();
        }
        int closes = 0;
    };
    Counting counting;
    counting.Open(File("a", ""), 2, 0, 0);
    EXPECT_EQ(counting.closes, 0);
    WriteText(counting, "one");
    counting.Open(File("b", ""), 2, 0, 0);
    EXPECT_EQ(counting.closes, 1);
    EXPECT_EQ(Content("a"), "one");
    counting.Close();
    counting.Open(File("a"), 2, 0, 0);
    EXPECT_EQ(counting.closes, 2);
}

TEST_F(FileXferBytesTest, BytesForAFileThatNeverOpenedGoToNoOther) {
    LogLines log;
    LeavesMemory const firstBuffer;
    EXPECT_EQ(transport.Open(File("none/file"), 2, 0, 0), 0);
    EXPECT_EQ(WriteText(transport, "lost"), 4U); // gathered
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateClosed);
    EXPECT_EQ(transport.Tell(), 4U);
    Open(File("file", ""), 2);
    EXPECT_EQ(transport.Tell(), 0U);
    EXPECT_EQ(WriteText(transport, "kept"), 4U);
    transport.Close();
    EXPECT_EQ(Content("file"), "kept");
    EXPECT_TRUE(log.Take().empty());
}

TEST_F(FileXferBytesTest, WritingOutToAFileThatNeverOpenedIsAnError) {
    EXPECT_EQ(transport.Open(File("none/file"), 2, 0, 0), 0);
    WriteText(transport, "lost");
    transport.Flush();
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
    EXPECT_EQ(transport.Seek(0, kKTSeekFromEnd), 0U);
    EXPECT_EQ(ReadText(transport, 1), "");
    transport.Close();
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateClosed);
}

// ---- reports ----

TEST_F(FileXferBytesTest, ReportsEveryUseWithoutAFile) {
    LogLines log;
    auto unopened = std::make_unique<FileXferBytes>();
    EXPECT_EQ(unopened->GetStreamState(), kKTStreamStateError);
    EXPECT_EQ(ReadText(*unopened, 3), "");
    EXPECT_EQ(log.Take(), Lines{NoHandle(kRead)});
    EXPECT_EQ(unopened->GetStreamState(), kKTStreamStateError);
    EXPECT_EQ(WriteText(*unopened, "abc"), 0U);
    EXPECT_EQ(log.Take(), (Lines{NoHandle(kWrite), NoHandle(kWriteBytes)}));
    EXPECT_EQ(unopened->Seek(5, kKTSeekFromBeginning), 0U);
    EXPECT_EQ(unopened->Seek(0, kKTSeekFromCurrent), 0U);
    EXPECT_EQ(unopened->Seek(-5, kKTSeekFromBeginning), 0U);
    EXPECT_EQ(log.Take(), (Lines{NoHandle(kSeek), NoHandle(kSeek), NoHandle(kSeek)}));
    unopened->SetEndOfStream();
    unopened->Flush();
    EXPECT_EQ(unopened->Tell(), 0U);
    EXPECT_TRUE(log.Take().empty());
    EXPECT_EQ(unopened->GetStreamState(), kKTStreamStateError);
    unopened.reset();
    EXPECT_EQ(log.Take(), Lines{NoHandle(kClose)});
}

TEST_F(FileXferBytesTest, ClosesOnceAndRefusesWritesAfterwards) {
    LogLines log;
    Open(File("file", ""), 2);
    transport.Close();
    transport.Close();
    EXPECT_TRUE(log.Take().empty());
    EXPECT_EQ(WriteText(transport, "abc"), 0U);
    EXPECT_EQ(log.Take(), (Lines{NoHandle(kWrite), kNoBuffer}));
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateClosed);
    EXPECT_EQ(WriteText(transport, std::string(kBuffer + 1, 'x')), 0U);
    EXPECT_EQ(log.Take(), (Lines{NoHandle(kWrite), NoHandle(kWriteBytes)}));
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
}

TEST_F(FileXferBytesTest, RefusesToWriteAFileOpenedToRead) {
    LogLines log;
    Open(File("file", "old"), 1);
    EXPECT_EQ(WriteText(transport, ""), 0U); // fits the capacity of 0, but there is no buffer
    EXPECT_EQ(log.Take(), Lines{kNoBuffer});
    EXPECT_EQ(WriteText(transport, "abc"), 0U);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
    EXPECT_TRUE(log.Take().empty());
    Open(File("file"), 2);
    Open(File("file"), 1);
    EXPECT_EQ(WriteText(transport, "abc"), 0U); // the capacity stays from the open before
    EXPECT_EQ(log.Take(), Lines{kNoBuffer});
    transport.Close();
    EXPECT_EQ(Content("file"), "old");
}

// ---- writing ----

TEST_F(FileXferBytesTest, GathersUpToItsCapacity) {
    Open(File("file", ""), 3);
    std::string const bytes = Pattern(kBuffer);
    EXPECT_EQ(WriteText(transport, bytes), kBuffer);
    EXPECT_EQ(std::filesystem::file_size(Path("file")), 0U);
    EXPECT_EQ(transport.Tell(), kBuffer);
    EXPECT_EQ(WriteText(transport, "x"), 1U);
    EXPECT_EQ(std::filesystem::file_size(Path("file")), kBuffer);
    EXPECT_EQ(transport.Tell(), kBuffer + 1);
    transport.Flush();
    EXPECT_EQ(Content("file"), bytes + "x");
    transport.Flush();
    EXPECT_EQ(transport.Tell(), kBuffer + 1);
}

TEST_F(FileXferBytesTest, WritesMoreThanItsCapacityStraight) {
    Open(File("file", ""), 2);
    std::string const bytes = Pattern(kBuffer + 1);
    WriteText(transport, "abc");
    EXPECT_EQ(WriteText(transport, bytes), kBuffer + 1);
    EXPECT_EQ(std::filesystem::file_size(Path("file")), kBuffer + 4);
    EXPECT_EQ(transport.Tell(), kBuffer + 4);
    transport.Close();
    EXPECT_EQ(Content("file"), "abc" + bytes);
}

TEST_F(FileXferBytesTest, WritesOutBeforeItReadsOrSeeks) {
    Open(File("file", "123456"), 3);
    WriteText(transport, "ab");
    EXPECT_EQ(ReadText(transport, 2), "34");
    EXPECT_EQ(Content("file"), "ab3456");
    WriteText(transport, "cd");
    EXPECT_EQ(transport.Seek(0, kKTSeekFromCurrent), 6U);
    EXPECT_EQ(Content("file"), "ab34cd");
    EXPECT_EQ(transport.Seek(1, kKTSeekFromBeginning), 1U);
    WriteText(transport, "e");
    transport.SetEndOfStream(); // does not write out first
    EXPECT_EQ(Content("file"), "a");
    transport.Close();
    EXPECT_EQ(Content("file"), "ae");
}

class ExposedTransport : public FileXferBytes {
  public:
    using FileXferBytes::FlushBuffer;
    using FileXferBytes::WriteBytes;
};

TEST_F(FileXferBytesTest, FlushBufferMakesRoom) {
    ExposedTransport exposed;
    exposed.Open(File("file", ""), 2, 0, 0);
    EXPECT_EQ(exposed.FlushBuffer(kBuffer + 1), 1); // nothing is gathered
    WriteText(exposed, "abc");
    EXPECT_EQ(exposed.FlushBuffer(kBuffer - 3), 1);
    EXPECT_EQ(Content("file"), "");
    EXPECT_EQ(exposed.FlushBuffer(kBuffer - 2), 1);
    EXPECT_EQ(Content("file"), "abc");
    char more[] = "de";
    EXPECT_EQ(exposed.WriteBytes(more, 2), 2U);
    EXPECT_EQ(Content("file"), "abcde");
    EXPECT_EQ(exposed.Tell(), 5U);
    ExposedTransport unopened;
    LogLines log;
    EXPECT_EQ(unopened.WriteBytes(more, 2), 0U);
    EXPECT_EQ(log.Take(), Lines{NoHandle(kWriteBytes)});
}

// ---- reading ----

TEST_F(FileXferBytesTest, TellsTheEndAndOnlyASeekClearsIt) {
    Open(File("file", "12345"), 1);
    EXPECT_EQ(ReadText(transport, 5), "12345");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
    EXPECT_EQ(ReadText(transport, 1), "");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateEndOfStream);
    EXPECT_EQ(transport.Seek(-2, kKTSeekFromEnd), 3U);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
    EXPECT_EQ(ReadText(transport, 100), "45");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateEndOfStream);
    transport.Flush();
    EXPECT_EQ(ReadText(transport, 0), "");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateEndOfStream);
}

TEST_F(FileXferBytesTest, LargeReadsPassTheBuffersBy) {
    std::string const bytes = Pattern(300000);
    Open(File("file", bytes), 1);
    EXPECT_EQ(ReadText(transport, 65536), bytes.substr(0, 65536));
    EXPECT_EQ(transport.Tell(), 65536U);
    EXPECT_EQ(ReadText(transport, 200000), bytes.substr(65536, 200000)); // its rest of 3,392 goes through the buffer
    EXPECT_EQ(transport.Seek(0, kKTSeekFromCurrent), 265536U);
    EXPECT_EQ(transport.Tell(), 300000U + 3392U);
    EXPECT_EQ(ReadText(transport, 65536), bytes.substr(265536));
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateEndOfStream);
}

TEST_F(FileXferBytesTest, AFirstReadOfAnySizeReadsNothingAhead) {
    Open(File("file", Pattern(600000)), 1);
    EXPECT_EQ(ReadText(transport, 70000).size(), 70000U);
    EXPECT_EQ(transport.Tell(), 70000U);
    EXPECT_EQ(ReadText(transport, 10).size(), 10U); // the second one does
    EXPECT_EQ(transport.Tell(), 70000U + kBuffer + 10U);
}

TEST_F(FileXferBytesTest, ReadsAheadFromTheThresholdOn) {
    Open(File("file", Pattern(600000)), 1);
    for (int i = 0; i < 65536; i += 4096) {
        ReadText(transport, 4096);
    }
    EXPECT_EQ(transport.Tell(), 65536U);
    ReadText(transport, 1);
    EXPECT_EQ(transport.Tell(), 65536U + kBuffer + 1);
    EXPECT_EQ(transport.Seek(0, kKTSeekFromCurrent), 65537U);
}

TEST_F(FileXferBytesTest, ReadsOfAQuarterMegabyteDoNotReadAhead) {
    Open(File("file", Pattern(2000000)), 1);
    ReadText(transport, 262144);
    ReadText(transport, 262144);
    EXPECT_EQ(transport.Tell(), 524288U);
    ReadText(transport, 262143); // the rest below 65,536 goes through the buffer
    EXPECT_EQ(transport.Seek(0, kKTSeekFromCurrent), 786431U);
    EXPECT_EQ(transport.Tell(), 524288U + 196608U + kBuffer + 65535U);
}

TEST_F(FileXferBytesTest, ReadingAheadExactlyToTheEndIsTheEndOfTheStream) {
    std::string const bytes = Pattern(65546);
    Open(File("file", bytes), 1);
    ReadText(transport, 65536);
    EXPECT_EQ(ReadText(transport, 10), bytes.substr(65536));
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateEndOfStream);

    Open(File("file"), 1); // taking the last bytes out of the buffer is not
    ReadText(transport, 65536);
    EXPECT_EQ(ReadText(transport, 9).size(), 9U);
    EXPECT_EQ(ReadText(transport, 1), bytes.substr(65545));
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
    EXPECT_EQ(ReadText(transport, 1), "");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateEndOfStream);
}

TEST_F(FileXferBytesTest, TakesWhatIsBufferedAndGoesOn) {
    std::string const bytes = Pattern(1200000);
    Open(File("file", bytes), 1);
    ReadAhead();
    std::size_t const next = 65537;
    EXPECT_EQ(ReadText(transport, kBuffer - 11), bytes.substr(next, kBuffer - 11));
    EXPECT_EQ(ReadText(transport, 30), bytes.substr(next + kBuffer - 11, 30));
    EXPECT_EQ(transport.Seek(0, kKTSeekFromCurrent), next + kBuffer + 19);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
}

// ---- seeking ----

TEST_F(FileXferBytesTest, SeeksFromEverywhere) {
    Open(File("file", "1234567890"), 3);
    EXPECT_EQ(transport.Seek(4, kKTSeekFromBeginning), 4U);
    EXPECT_EQ(transport.Seek(2, kKTSeekFromCurrent), 6U);
    EXPECT_EQ(transport.Seek(-3, kKTSeekFromCurrent), 3U);
    EXPECT_EQ(transport.Seek(-1, kKTSeekFromEnd), 9U);
    EXPECT_EQ(transport.Seek(5, kKTSeekFromEnd), 15U);
    EXPECT_EQ(transport.Seek(2, kKTSeekFromBeginning), 2U);
    EXPECT_EQ(transport.Seek(9, static_cast<KTSeekFromWhere>(3)), 2U);
    EXPECT_EQ(ReadText(transport, 2), "34");
    EXPECT_EQ(transport.Seek(12, kKTSeekFromBeginning), 12U);
    WriteText(transport, "x");
    transport.Close();
    EXPECT_EQ(Content("file"), std::string("1234567890\0\0x", 13));
}

TEST_F(FileXferBytesTest, PlacesBeforeTheBeginningAreRefused) {
    Open(File("file", "1234567890"), 1);
    transport.Seek(4, kKTSeekFromBeginning);
    for (auto const origin : {kKTSeekFromBeginning, kKTSeekFromCurrent, kKTSeekFromEnd}) {
        EXPECT_EQ(transport.Seek(-11, origin), 4U);
        EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
    }
    EXPECT_EQ(ReadText(transport, 3), "567");
}

TEST_F(FileXferBytesTest, MovesWithinTheBufferedBytesLeaveTheFileAlone) {
    std::string const bytes = Pattern(1000000);
    Open(File("file", bytes), 1);
    ReadAhead();
    unsigned int const base = 65536;
    unsigned int const position = base + kBuffer; // of the file
    EXPECT_EQ(transport.Seek(100, kKTSeekFromCurrent), base + 101);
    EXPECT_EQ(transport.Tell(), position + 101);
    EXPECT_EQ(transport.Seek(-101, kKTSeekFromCurrent), base);
    EXPECT_EQ(transport.Seek(kBuffer, kKTSeekFromCurrent), base + kBuffer); // their very end
    EXPECT_EQ(transport.Tell(), position + kBuffer);
    EXPECT_EQ(transport.Seek(static_cast<int>(base + 5), kKTSeekFromBeginning), base + 5);
    EXPECT_EQ(transport.Tell(), position + 5);
    EXPECT_EQ(ReadText(transport, 10), bytes.substr(base + 5, 10));
    EXPECT_EQ(transport.Seek(static_cast<int>(base + kBuffer - 1), kKTSeekFromBeginning), base + kBuffer - 1);
    EXPECT_EQ(transport.Tell(), position + kBuffer - 1);
}

// The bytes of the buffer that have been read are not counted.
TEST_F(FileXferBytesTest, RelativeMovesOutOfTheBufferStartFromItsEnd) {
    std::string const bytes = Pattern(1000000);
    Open(File("file", bytes), 1);
    ReadAhead();
    unsigned int const base = 65536;
    ReadText(transport, 99); // cursor 100
    EXPECT_EQ(transport.Seek(-200, kKTSeekFromCurrent), base - 200);
    EXPECT_EQ(transport.Tell(), base - 200);
    EXPECT_EQ(ReadText(transport, 10), bytes.substr(base - 200, 10));
}

TEST_F(FileXferBytesTest, FarSeeksStopReadingAhead) {
    struct Row {
        int offset;
        KTSeekFromWhere origin;
        bool reads; // ahead again with the next small read
    };
    unsigned int const base = 65536;
    int const end = static_cast<int>(base + kBuffer);
    Row const rows[] = {
        {end, kKTSeekFromBeginning, false}, // far from the next byte, although the file stands there
        {0, kKTSeekFromBeginning, false},   // back, before the buffer
        {-1000000, kKTSeekFromEnd, false},  //
        {0, kKTSeekFromEnd, false},         //
        {-2, kKTSeekFromCurrent, true},     // back out of the buffer: never far
        {int{kBuffer} + 10, kKTSeekFromCurrent, true},
        {int{kBuffer} + 32768, kKTSeekFromCurrent, true},
        {int{kBuffer} + 32769, kKTSeekFromCurrent, false},
    };
    File("file", Pattern(2000000));
    for (Row const &row : rows) {
        SCOPED_TRACE(row.offset);
        Open(File("file"), 1);
        ReadAhead();
        unsigned int const position = transport.Seek(row.offset, row.origin);
        EXPECT_EQ(transport.Tell(), position);
        ReadText(transport, 1);
        EXPECT_EQ(transport.Tell() > position + 1, row.reads);
    }
}

TEST_F(FileXferBytesTest, NearSeeksFromTheBeginningGoOnReadingAhead) {
    Open(File("file", Pattern(2000000)), 1);
    ReadAhead();
    unsigned int const end = 65536 + kBuffer;
    ReadText(transport, kBuffer - 1); // all that is buffered
    EXPECT_EQ(transport.Seek(static_cast<int>(end + 32768), kKTSeekFromBeginning), end + 32768);
    ReadText(transport, 1);
    EXPECT_EQ(transport.Tell(), end + 32768 + kBuffer + 1);
    transport.Seek(static_cast<int>(end + 32768 + kBuffer), kKTSeekFromBeginning);
    EXPECT_EQ(transport.Tell(), end + 32768 + kBuffer);
    ReadText(transport, 1);
    EXPECT_EQ(transport.Tell(), end + 32768 + kBuffer + 1); // far
}

// ---- copies and temporary files ----

TEST_F(FileXferBytesTest, CopiesShareTheHandleAndTheBuffers) {
    LeavesMemory const pathOfTheOriginal;
    Open(File("file", ""), 2);
    WriteText(transport, "abc");
    alignas(FileXferBytes) std::byte place[sizeof(FileXferBytes)];
    auto *const copy = ::new (place) FileXferBytes(transport); // never destroyed
    EXPECT_EQ(copy->Tell(), 3U);
    EXPECT_EQ(copy->GetStreamState(), kKTStreamStateGood);
    copy->Flush();
    EXPECT_EQ(Content("file"), "abc");
    copy->~FileXferBytes();
    ::new (static_cast<void *>(&transport)) FileXferBytes; // what it held is gone with the copy
}

TEST_F(FileXferBytesTest, TemporaryTransportsLeaveTheFile) {
    {
        TempFileXferBytes temporary;
        EXPECT_EQ(temporary.Open(File("file"), 3, 0, 0), 1);
        WriteText(temporary, "abc");
    }
    EXPECT_EQ(Content("file"), "abc");
}

} // namespace
