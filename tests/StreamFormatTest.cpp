// StreamFormatTest.cpp: the typed streams: what each operation leaves on the stream, byte by byte, in both byte orders
// and both directions, and what it returns when the transport fails.
//
// Longer than other files: every operation of the reader and of the writer is held against the same golden bytes.

#include "CKTStreamRead.h"
#include "CKTStreamReadWrite.h"
#include "CKTStreamWrite.h"
#include "KTStreamUtil.h"
#include "LogLines.h"
#include "MemXferBytes.h"
#include "StreamSupport.h"

#include <limits>
#include <memory>

namespace {

constexpr char kReadBoolReport[] =
    "Assert failed: CKTStreamRead::XferBool - this isn't a bool you are reading. Something's wrong. at "
    "source/private/streams/CKTStreamRead:131";
constexpr char kWriteBoolReport[] = "Assert failed: CStreamWrite::XferBool - this isn't a bool you are writing at "
                                    "source/private/streams/CKTStreamWrite:129";
constexpr char kBoolArrayReport[] = "Assert failed: Warning: Using XferBool(KTBool16 *buf, KTInt32 num) is currently "
                                    "not crossplatfom savvy at source/private/streams/CKTStreamWrite:118";

// A writer, or a reader of the given bytes, and its transport.
struct Writer {
    Writer() : transport(new RecordingTransport) { stream.SetXferBytes(transport); }
    std::string Written() const { return Hex(transport->data); }

    RecordingTransport *transport; // the stream's
    CKTStreamWrite stream;
};
struct Reader {
    explicit Reader(std::string const &hex) : transport(new RecordingTransport(Bytes(hex))) {
        stream.SetXferBytes(transport);
    }

    RecordingTransport *transport; // the stream's
    CKTStreamRead stream;
};

// ---- the golden stream ----

// One of everything, as one sequence of calls for both directions.
struct Values {
    unsigned char byte = 0;
    unsigned char bytes[3] = {};
    KTBool16 yes = 0;
    KTBool16 no = 1;
    short small = 0;
    short smalls[2] = {};
    int number = 0;
    int numbers[2] = {};
    long long large = 0;
    int id = 0;
    int ids[2] = {};
    int property = 0;
    int properties[2] = {};
    KTReal real;
    KTReal reals[2] = {};
    KTString utf8;
    KTString utf16;
    KTString plainUtf8 = "....";
    KTString plainUtf16 = "..";

    void Xfer(IKTStream &stream) {
        char remark[] = "leaves nothing";
        stream.XferByte(byte);
        EXPECT_EQ(3, stream.XferByte(bytes, 3));
        stream.XferBool(yes);
        stream.XferBool(no);
        stream.XferInt16(small);
        EXPECT_EQ(2, stream.XferInt16(smalls, 2));
        stream.XferInt32(number);
        EXPECT_EQ(2, stream.XferInt32(numbers, 2));
        stream.XferInt64(large);
        stream.Comment(remark);
        stream.XferID(id);
        EXPECT_EQ(2, stream.XferID(ids, 2));
        stream.XferPropertyID(property);
        EXPECT_EQ(2, stream.XferPropertyID(properties, 2));
        stream.XferRealNumber(real);
        EXPECT_EQ(2, stream.XferRealNumber(reals, 2));
        stream.XferString(utf8, true, true);
        stream.XferString(utf16, false, true);
        stream.XferString(plainUtf8, true, false);
        stream.XferString(plainUtf16, false, false);
    }

    friend bool operator==(Values const &, Values const &) = default;
};

Values Golden() {
    Values values;
    values.byte = 0xFE;
    std::copy_n("\x01\x80\xFF", 3, reinterpret_cast<char *>(values.bytes));
    values.yes = 1;
    values.no = 0;
    values.small = -2;
    values.smalls[0] = 0x0102;
    values.smalls[1] = std::numeric_limits<short>::min();
    values.number = 0x01020304;
    values.numbers[0] = -1;
    values.numbers[1] = std::numeric_limits<int>::min();
    values.large = 0x0102030405060708;
    values.id = 0x11121314;
    values.ids[0] = 0x21222324;
    values.ids[1] = 0x31323334;
    values.property = 0x41424344;
    values.properties[0] = 0x51525354;
    values.properties[1] = 0x61626364;
    values.real = 1.5;
    values.reals[0] = -0.0;
    values.reals[1] = 1e300;
    values.utf8 = KTString("a\xC3\xA4\xE2\x82\xAC\xF0\x9D\x84\x9E"); // a, ae, Euro, G clef
    values.utf16 = values.utf8;
    values.plainUtf8 = "\xC3\xA4\xC3\xB6";
    values.plainUtf16 = "ab";
    return values;
}

// Written by hand.
constexpr char kGolden[] = "FE "                                              // XferByte
                           "01 80 FF "                                        // its array
                           "01 00 00 00 "                                     // XferBool, twice
                           "FE FF "                                           // XferInt16
                           "02 01 00 80 "                                     // its array
                           "04 03 02 01 "                                     // XferInt32
                           "FF FF FF FF 00 00 00 80 "                         // its array
                           "04 03 02 01 08 07 06 05 "                         // XferInt64
                           "14 13 12 11 24 23 22 21 34 33 32 31 "             // XferID
                           "44 43 42 41 54 53 52 51 64 63 62 61 "             // XferPropertyID
                           "00 00 00 00 00 00 F8 3F "                         // XferRealNumber
                           "00 00 00 00 00 00 00 80 9C 75 00 88 3C E4 37 7E " // its array
                           "0A 00 00 00 61 C3 A4 E2 82 AC F0 9D 84 9E "       // UTF-8
                           "0A 00 00 00 61 00 E4 00 AC 20 34 D8 1E DD "       // UTF-16
                           "C3 A4 C3 B6 "                                     // UTF-8, no count
                           "61 00 62 00 ";                                    // UTF-16, no count
constexpr char kGoldenSwapped[] = "FE 01 80 FF 00 01 00 00 FF FE 01 02 80 00 01 02 03 04 FF FF FF FF 80 00 00 00 "
                                  "01 02 03 04 05 06 07 08 11 12 13 14 21 22 23 24 31 32 33 34 "
                                  "41 42 43 44 51 52 53 54 61 62 63 64 "
                                  "3F F8 00 00 00 00 00 00 80 00 00 00 00 00 00 00 7E 37 E4 3C 88 00 75 9C "
                                  "00 00 00 0A 61 C3 A4 E2 82 AC F0 9D 84 9E "
                                  "00 00 00 0A 61 00 E4 00 AC 20 34 D8 1E DD "
                                  "C3 A4 C3 B6 61 00 62 00 ";

class StreamFormatTest : public StreamFixture {};

TEST_F(StreamFormatTest, WritesTheGoldenFile) {
    for (KTBool16 const swapping : {KTBool16{0}, KTBool16{1}}) {
        KTFile const file = File("golden");
        Values values = Golden();
        std::unique_ptr<IKTStream> stream(KTStreamUtil::CreateFileStreamWrite(file, 0xA, 0, 0));
        stream->SetSwapping(swapping);
        EXPECT_EQ(swapping, stream->GetSwapping());
        values.Xfer(*stream);
        EXPECT_EQ(values, Golden());
        stream.reset();
        EXPECT_EQ(Hex(Content("golden")), swapping != 0 ? kGoldenSwapped : kGolden);
    }
}

TEST_F(StreamFormatTest, ReadsTheGoldenFile) {
    for (KTBool16 const swapping : {KTBool16{0}, KTBool16{1}}) {
        auto const bytes = Bytes(swapping != 0 ? kGoldenSwapped : kGolden);
        KTFile const file = File("golden", std::string(bytes.begin(), bytes.end()));
        std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateFileStreamRead(file, 1, 0, 0));
        stream->SetSwapping(swapping);
        Values values;
        values.Xfer(*stream);
        EXPECT_EQ(values, Golden());
        EXPECT_EQ(stream->GetStreamState(), kKTStreamStateGood);
        EXPECT_EQ(stream->Tell(), bytes.size());
    }
}

// ---- single values ----

TEST(StreamValueTest, ReturnsWhatItMoved) {
    Writer out;
    unsigned char byte = 7;
    KTBool16 flag = 1;
    short small = -3;
    int number = 123456;
    long long large = -0x0102030405060708;
    KTReal real = 2.25;
    KTString text("text");
    EXPECT_EQ(out.stream.XferByte(byte), 7);
    EXPECT_EQ(out.stream.XferBool(flag), 1);
    EXPECT_EQ(out.stream.XferInt16(small), -3);
    EXPECT_EQ(out.stream.XferInt32(number), 123456);
    EXPECT_EQ(out.stream.XferID(number), 123456);
    EXPECT_EQ(out.stream.XferPropertyID(number), 123456);
    EXPECT_EQ(out.stream.XferInt64(large), -0x0102030405060708);
    EXPECT_EQ(&out.stream.XferRealNumber(real), &real);
    EXPECT_EQ(out.stream.XferString(text, true, true), "text");
    EXPECT_EQ(out.transport->writes, (std::vector<unsigned int>{1, 2, 2, 4, 4, 4, 4, 4, 8, 4, 4}));

    Reader in(out.Written());
    byte = 0;
    flag = 0;
    small = 0;
    number = 0;
    large = 0;
    real = 0;
    text = "";
    EXPECT_EQ(in.stream.XferByte(byte), 7);
    EXPECT_EQ(in.stream.XferBool(flag), 1);
    EXPECT_EQ(in.stream.XferInt16(small), -3);
    EXPECT_EQ(in.stream.XferInt32(number), 123456);
    EXPECT_EQ(in.stream.XferID(number), 123456);
    EXPECT_EQ(in.stream.XferPropertyID(number), 123456);
    EXPECT_EQ(in.stream.XferInt64(large), -0x0102030405060708);
    EXPECT_EQ(&in.stream.XferRealNumber(real), &real);
    EXPECT_EQ(real, 2.25);
    EXPECT_EQ(in.stream.XferString(text, true, true), "text");
    EXPECT_EQ(text, "text");
    EXPECT_EQ(in.transport->reads, (std::vector<unsigned int>{1, 2, 2, 4, 4, 4, 4, 4, 8, 4, 4}));
}

TEST(StreamValueTest, BoolsOtherThanZeroAndOneAreReported) {
    LogLines log;
    Writer out;
    KTBool16 flag = 2;
    EXPECT_EQ(out.stream.XferBool(flag), 1);
    EXPECT_EQ(flag, 1);
    EXPECT_EQ(out.Written(), "01 00 ");
    EXPECT_EQ(log.Take(), std::vector<std::string>{kWriteBoolReport});
    flag = -1;
    EXPECT_EQ(out.stream.XferBool(flag), 1);
    flag = 0;
    EXPECT_EQ(out.stream.XferBool(flag), 0);
    EXPECT_EQ(out.Written(), "01 00 01 00 00 00 ");
    EXPECT_EQ(log.Take(), std::vector<std::string>{kWriteBoolReport});

    Reader in("02 00 FF FF 01 00 ");
    EXPECT_EQ(in.stream.XferBool(flag), 2);
    EXPECT_EQ(flag, 2);
    EXPECT_EQ(log.Take(), std::vector<std::string>{kReadBoolReport});
    EXPECT_EQ(in.stream.XferBool(flag), -1);
    EXPECT_EQ(in.stream.XferBool(flag), 1);
    EXPECT_EQ(log.Take(), std::vector<std::string>{kReadBoolReport});
}

TEST(StreamValueTest, BoolArraysAreReportedWhenWrittenAndNotChecked) {
    LogLines log;
    Writer out;
    KTBool16 flags[] = {2, 1};
    EXPECT_EQ(out.stream.XferBool(flags, 2), 2);
    EXPECT_EQ(out.Written(), "02 00 01 00 ");
    EXPECT_EQ(log.Take(), std::vector<std::string>{kBoolArrayReport});
    EXPECT_EQ(out.stream.XferBool(flags, 0), 0);
    EXPECT_EQ(log.Take(), std::vector<std::string>{kBoolArrayReport});
    Reader in("03 00 01 00 ");
    EXPECT_EQ(in.stream.XferBool(flags, 2), 2);
    EXPECT_EQ(flags[0], 3);
    EXPECT_TRUE(log.Take().empty());
}

TEST(StreamValueTest, CommentAndCloseLeaveNothing) {
    Writer out;
    char text[] = "remark";
    out.stream.Comment(text);
    out.stream.Comment(nullptr);
    out.stream.Close();
    Reader in("01 ");
    in.stream.Comment(text);
    in.stream.Close();
    EXPECT_TRUE(out.transport->writes.empty());
    EXPECT_TRUE(in.transport->reads.empty());
}

TEST(StreamValueTest, ShortReadsKeepWhatWasThere) {
    for (KTBool16 const swapping : {KTBool16{0}, KTBool16{1}}) {
        Reader in("");
        in.stream.SetSwapping(swapping);
        unsigned char byte = 7;
        KTBool16 flag = 1;
        short small = 0x0102;
        int number = 0x01020304;
        long long large = 0x0102030405060708;
        KTReal real = 2.5;
        EXPECT_EQ(in.stream.XferByte(byte), 7);
        EXPECT_EQ(in.stream.XferBool(flag), 1);
        EXPECT_EQ(in.stream.XferInt16(small), 0x0102);
        EXPECT_EQ(in.stream.XferInt32(number), 0x01020304);
        EXPECT_EQ(in.stream.XferInt64(large), 0x0102030405060708);
        EXPECT_EQ(in.stream.XferRealNumber(real), 2.5);
        EXPECT_EQ(in.stream.GetStreamState(), kKTStreamStateEndOfStream);
    }
    Reader in("FF FF ");
    int number = 0x01020304;
    EXPECT_EQ(in.stream.XferInt32(number), 0x0102FFFF);
}

// ---- arrays ----

TEST(StreamArrayTest, ReadersReturnWholeElements) {
    Reader in("01 00 02 00 03 ");
    short smalls[] = {9, 9, 9, 9};
    EXPECT_EQ(in.stream.XferInt16(smalls, 4), 2);
    EXPECT_EQ(in.transport->reads, std::vector<unsigned int>{8});
    EXPECT_EQ(smalls[1], 2);
    EXPECT_EQ(smalls[3], 9);

    Reader other("01 00 00 00 02 00 00 ");
    int numbers[] = {9, 9};
    EXPECT_EQ(other.stream.XferInt32(numbers, 2), 1);
    EXPECT_EQ(other.transport->reads, std::vector<unsigned int>{8});
}

TEST(StreamArrayTest, SwappingReversesElementsThatWereNotFilledToo) {
    Reader in("00 01 ");
    in.stream.SetSwapping(1);
    short smalls[] = {9, 0x0102};
    EXPECT_EQ(in.stream.XferInt16(smalls, 2), 1);
    EXPECT_EQ(smalls[0], 1);
    EXPECT_EQ(smalls[1], 0x0201);
    Reader other("00 00 00 01 ");
    other.stream.SetSwapping(1);
    int numbers[] = {9, 0x01020304};
    EXPECT_EQ(other.stream.XferInt32(numbers, 2), 1);
    EXPECT_EQ(numbers[0], 1);
    EXPECT_EQ(numbers[1], 0x04030201);
}

TEST(StreamArrayTest, WritersReturnWhatWasTakenOnlyWithoutSwapping) {
    short smalls[] = {1, 2, 3};
    int numbers[] = {1, 2, 3};
    Writer out;
    out.transport->room = 5;
    EXPECT_EQ(out.stream.XferInt16(smalls, 3), 2);
    EXPECT_EQ(out.transport->writes, std::vector<unsigned int>{6});
    out.transport->room = 5;
    EXPECT_EQ(out.stream.XferInt32(numbers, 3), 1);
    out.transport->writes.clear();
    out.transport->room = 0;
    out.stream.SetSwapping(1);
    EXPECT_EQ(out.stream.XferInt16(smalls, 3), 3);
    EXPECT_EQ(out.stream.XferInt32(numbers, 3), 3);
    EXPECT_EQ(out.transport->writes, (std::vector<unsigned int>{2, 2, 2, 4, 4, 4}));
}

TEST(StreamArrayTest, IdentifiersReturnTheCountWhateverWasMoved) {
    Reader in("01 00 00 00 ");
    int ids[] = {9, 9, 9};
    EXPECT_EQ(in.stream.XferID(ids, 3), 3);
    EXPECT_EQ(in.stream.XferPropertyID(ids, 3), 3);
    EXPECT_EQ(in.transport->reads, (std::vector<unsigned int>{4, 4, 4, 4, 4, 4}));
    EXPECT_EQ(ids[0], 1);
    EXPECT_EQ(ids[1], 9);
    Writer out;
    out.transport->room = 0;
    EXPECT_EQ(out.stream.XferID(ids, 3), 3);
    EXPECT_EQ(out.stream.XferPropertyID(ids, 3), 3);
    EXPECT_EQ(out.transport->writes, (std::vector<unsigned int>{4, 4, 4, 4, 4, 4}));
}

TEST(StreamArrayTest, RealsStopAtTheFirstBadState) {
    Reader in("00 00 00 00 00 00 F8 3F 00 00 00 00 00 00 00 40 00 00 00 ");
    KTReal reals[] = {9, 9, 9, 9};
    EXPECT_EQ(in.stream.XferRealNumber(reals, 4), 2);
    EXPECT_EQ(in.transport->reads, (std::vector<unsigned int>{8, 8, 8}));
    EXPECT_EQ(reals[0], 1.5);
    EXPECT_EQ(reals[1], 2.0);
    EXPECT_EQ(reals[3], 9.0);
    EXPECT_EQ(in.stream.XferRealNumber(reals, 4), 0);
    EXPECT_EQ(in.transport->reads.size(), 3U);

    Writer out;
    out.transport->room = 8;
    out.transport->state = kKTStreamStateError;
    EXPECT_EQ(out.stream.XferRealNumber(reals, 2), 2);
    EXPECT_EQ(out.transport->writes, (std::vector<unsigned int>{8, 8}));
    EXPECT_EQ(out.stream.XferRealNumber(reals, 0), 0);
}

TEST(StreamArrayTest, SwappedRealsGoByteByByteUntilOneFails) {
    Writer out;
    out.stream.SetSwapping(1);
    KTReal real = 1.5;
    out.transport->room = 2;
    out.stream.XferRealNumber(real);
    EXPECT_EQ(out.Written(), "3F F8 ");
    EXPECT_EQ(out.transport->writes, (std::vector<unsigned int>{1, 1, 1}));
    Reader in("40 04 ");
    in.stream.SetSwapping(1);
    real = 1.5;
    EXPECT_EQ(in.stream.XferRealNumber(real), 2.5); // the two bytes that came are the first two
    EXPECT_EQ(in.transport->reads, (std::vector<unsigned int>{1, 1, 1}));
}

TEST(StreamArrayTest, NothingIsMovedForNoElements) {
    for (KTBool16 const swapping : {KTBool16{0}, KTBool16{1}}) {
        for (int const count : {0, -1, std::numeric_limits<int>::min()}) {
            Reader in("01 02 03 04 ");
            Writer out;
            in.stream.SetSwapping(swapping);
            out.stream.SetSwapping(swapping);
            for (IKTStream *const stream :
                 {static_cast<IKTStream *>(&in.stream), static_cast<IKTStream *>(&out.stream)}) {
                EXPECT_EQ(stream->XferByte(nullptr, count), 0);
                EXPECT_EQ(stream->XferInt16(nullptr, count), 0);
                EXPECT_EQ(stream->XferInt32(nullptr, count), 0);
                EXPECT_EQ(stream->XferRealNumber(nullptr, count), 0);
                EXPECT_EQ(stream->XferID(nullptr, count), count);
                EXPECT_EQ(stream->XferPropertyID(nullptr, count), count);
            }
            EXPECT_EQ(in.transport->position, 0U);
            EXPECT_TRUE(out.transport->data.empty());
        }
    }
}

// More elements than bytes can be counted: asked for as many whole ones as can.
TEST(StreamArrayTest, HugeCountsDoNotWrapAround) {
    Reader in("01 00 00 00 ");
    int number = 0;
    EXPECT_EQ(in.stream.XferInt32(&number, 0x40000001), 1);
    EXPECT_EQ(in.transport->reads, std::vector<unsigned int>{0xFFFFFFFC});
    EXPECT_EQ(number, 1);
}

// ---- strings ----

std::string WrittenText(KTString text, bool utf8, bool withCount, KTBool16 swapping = 0) {
    Writer out;
    out.stream.SetSwapping(swapping);
    EXPECT_EQ(out.stream.XferString(text, utf8, withCount), text);
    return out.Written();
}

KTString ReadText(std::string const &hex, bool utf8, KTString value, bool withCount = true) {
    Reader in(hex);
    KTString const result = in.stream.XferString(value, utf8, withCount);
    EXPECT_EQ(result, value);
    return value;
}

TEST(StreamStringTest, HasACountOfBytesInBothEncodings) {
    EXPECT_EQ(WrittenText("ab", true, true), "02 00 00 00 61 62 ");
    EXPECT_EQ(WrittenText("ab", false, true), "04 00 00 00 61 00 62 00 ");
    EXPECT_EQ(WrittenText("ab", true, true, 1), "00 00 00 02 61 62 ");
    EXPECT_EQ(WrittenText("ab", false, true, 1), "00 00 00 04 61 00 62 00 ");
    EXPECT_EQ(WrittenText("ab", true, false), "61 62 ");
    EXPECT_EQ(WrittenText("ab", false, false), "61 00 62 00 ");
    EXPECT_EQ(WrittenText("", true, true), "00 00 00 00 ");
    EXPECT_EQ(WrittenText("", false, true), "00 00 00 00 ");
    EXPECT_EQ(WrittenText("\xC3\xA4", true, true), "02 00 00 00 C3 A4 ");
}

TEST(StreamStringTest, LosesNothingOnItsWay) {
    unsigned short const units[] = {'a', 0, 0xD800, 'b', 0x20AC};
    KTString odd;
    odd.assign(units, 5);
    for (std::size_t const size : {0U, 1U, 7U, 8U, 127U, 128U, 255U, 256U, 257U, 1000U, 200000U}) {
        for (unsigned short const unit :
             {KTString::value_type{0x61}, KTString::value_type{0xE4}, KTString::value_type{0x20AC}}) {
            for (bool const utf8 : {false, true}) {
                KTString text;
                text.assign(size, unit);
                EXPECT_EQ(ReadText(WrittenText(text, utf8, true), utf8, "old"), text) << size << " " << unit;
            }
        }
    }
    EXPECT_EQ(ReadText(WrittenText(odd, false, true), false, ""), odd); // zeros and half pairs, too
}

TEST(StreamStringTest, ReadsAsManyBytesAsTheGivenStringHasWithoutACount) {
    EXPECT_EQ(ReadText("61 62 63 ", true, "..", false), "ab");
    EXPECT_EQ(ReadText("C3 A4 63 ", true, "\xC3\xB6", false), "\xC3\xA4");
    EXPECT_EQ(ReadText("61 00 62 00 63 00 ", false, "..", false), "ab");
    EXPECT_EQ(ReadText("61 62 ", true, "", false), "");
    EXPECT_EQ(ReadText("61 62 ", false, "", false), "");
}

TEST(StreamStringTest, Utf8EndsAtItsFirstZero) {
    Reader in("05 00 00 00 61 62 00 63 64 7F ");
    KTString text;
    unsigned char next = 0;
    EXPECT_EQ(in.stream.XferString(text, true, true), "ab");
    EXPECT_EQ(in.stream.XferByte(next), 0x7F);
}

TEST(StreamStringTest, MalformedTextBecomesReplacementCharacters) {
    EXPECT_EQ(ReadText("03 00 00 00 61 FF 62 ", true, ""), "a\xEF\xBF\xBD"
                                                           "b");
    EXPECT_EQ(WrittenText(KTString(std::vector<unsigned short>{0xD800, 0}.data()), true, true),
              "03 00 00 00 EF BF BD ");
}

TEST(StreamStringTest, OddBytesOfUtf16AreDropped) {
    Reader in("03 00 00 00 61 00 62 63 ");
    KTString text;
    unsigned char next = 0;
    EXPECT_EQ(in.stream.XferString(text, false, true), "a");
    EXPECT_EQ(in.stream.XferByte(next), 0x63);
}

// ---- lengths that are not true ----

TEST(StreamHostileLengthTest, KeepsWhatIsThere) {
    for (std::string const length : {"FF FF FF 7F ", "00 00 00 10 ", "00 10 00 00 ", "05 00 00 00 "}) {
        Reader in(length + "61 62 63 64 ");
        KTString text("old");
        EXPECT_EQ(in.stream.XferString(text, true, true), "abcd") << length;
        EXPECT_EQ(text, "abcd");
        EXPECT_EQ(in.stream.GetStreamState(), kKTStreamStateEndOfStream);
        EXPECT_LE(in.transport->reads.at(1), 0x40000U); // never more than one piece ahead of the bytes
    }
    EXPECT_EQ(ReadText("FF FF FF 7F 61 00 62 00 63 ", false, "old"), "ab");
}

TEST(StreamHostileLengthTest, NegativeLengthsAreNone) {
    for (std::string const length : {"FF FF FF FF ", "00 00 00 80 "}) {
        for (bool const utf8 : {false, true}) {
            Reader in(length + "61 62 63 64 ");
            KTString text("old");
            unsigned char next = 0;
            EXPECT_EQ(in.stream.XferString(text, utf8, true), "") << length;
            EXPECT_EQ(text, "");
            EXPECT_EQ(in.stream.XferByte(next), 0x61);
            EXPECT_EQ(in.stream.GetStreamState(), kKTStreamStateGood);
        }
    }
}

TEST(StreamHostileLengthTest, AMissingLengthIsNone) {
    EXPECT_EQ(ReadText("", true, "old"), "");
    EXPECT_EQ(ReadText("05 00 ", true, "old"), "");
    EXPECT_EQ(ReadText("", true, "old", false), "");
}

// A transport that makes up bytes up to a limit, and remembers the largest piece that was asked for.
class EndlessTransport : public RecordingTransport {
  public:
    explicit EndlessTransport(unsigned int length) : RecordingTransport(Bytes("FF FF FF 7F ")), m_Left(length) {}

    unsigned int Read(void *buffer, unsigned int count) override {
        if (position < data.size()) {
            return RecordingTransport::Read(buffer, count);
        }
        reads.push_back(count);
        count = std::min(count, m_Left);
        std::memset(buffer, 'x', count);
        m_Left -= count;
        return count;
    }

  private:
    unsigned int m_Left;
};

TEST(StreamHostileLengthTest, MemoryGrowsWithTheBytesThatCome) {
    constexpr unsigned int kLength = 3000000;
    auto *const transport = new EndlessTransport(kLength);
    CKTStreamRead stream;
    stream.SetXferBytes(transport);
    KTString text;
    stream.XferString(text, true, true);
    EXPECT_EQ(text.size(), kLength);
    EXPECT_EQ(text[kLength - 1], 'x');
    unsigned int come = 0;
    for (std::size_t i = 1; i < transport->reads.size(); ++i) {
        EXPECT_LE(transport->reads[i], std::max(come, 0x40000U));
        come += transport->reads[i];
    }
    EXPECT_EQ(transport->reads.size(), 1U + 5U); // 256 KiB, then as much again each time
}

TEST(StreamHostileLengthTest, TextOfUpToOnePieceIsReadAtOnce) {
    for (int const size : {512, 513, 0x40000}) {
        auto *const transport =
            new RecordingTransport(std::vector<unsigned char>(static_cast<std::size_t>(size) + 4, 'y'));
        std::memcpy(transport->data.data(), &size, 4);
        CKTStreamRead stream;
        stream.SetXferBytes(transport);
        KTString text;
        EXPECT_EQ(stream.XferString(text, true, true).size(), static_cast<std::size_t>(size));
        EXPECT_EQ(transport->reads, (std::vector<unsigned int>{4, static_cast<unsigned int>(size)}));
    }
}

// ---- the stream around the values ----

TEST(StreamTest, ForwardsToTheTransport) {
    Reader in("01 02 03 ");
    Writer out;
    for (auto const &[stream, transport] : {std::pair<IKTStream *, RecordingTransport *>(&in.stream, in.transport),
                                            std::pair<IKTStream *, RecordingTransport *>(&out.stream, out.transport)}) {
        transport->data = Bytes("01 02 03 ");
        EXPECT_EQ(stream->Seek(2, kKTSeekFromBeginning), 2);
        EXPECT_EQ(stream->Seek(-1, kKTSeekFromCurrent), 1);
        EXPECT_EQ(stream->Tell(), 1U);
        EXPECT_EQ(stream->Seek(-1, kKTSeekFromEnd), 2);
        stream->SetEndOfStream();
        EXPECT_EQ(Hex(transport->data), "01 02 ");
        stream->Flush();
        EXPECT_EQ(transport->flushes, 1);
        for (auto const state : {kKTStreamStateError, kKTStreamStateClosed, kKTStreamStateGood}) {
            transport->state = state;
            EXPECT_EQ(stream->GetStreamState(), state);
        }
    }
    EXPECT_EQ(in.stream.IsReading(), 1);
    EXPECT_EQ(in.stream.IsWriting(), 0);
    EXPECT_EQ(out.stream.IsReading(), 0);
    EXPECT_EQ(out.stream.IsWriting(), 1);
    EXPECT_EQ(in.stream.GetSwapping(), 0);
    EXPECT_EQ(out.stream.GetSwapping(), 0);
}

class WatchedTransport : public RecordingTransport {
  public:
    explicit WatchedTransport(int &destroyed) : m_Destroyed(destroyed) {}
    WatchedTransport(WatchedTransport const &) = delete;
    WatchedTransport &operator=(WatchedTransport const &) = delete;
    ~WatchedTransport() override { ++m_Destroyed; }

  private:
    int &m_Destroyed;
};

TEST(StreamTest, OwnsTheTransportThatItHoldsAtTheEnd) {
    int destroyed = 0;
    auto const first = std::make_unique<WatchedTransport>(destroyed);
    {
        CKTStreamRead reader;
        CKTStreamWrite writer;
        CKTStreamReadWrite both;
        reader.SetXferBytes(first.get());
        reader.SetXferBytes(new WatchedTransport(destroyed)); // the first stays the test's
        writer.SetXferBytes(new WatchedTransport(destroyed));
        both.SetXferBytes(new WatchedTransport(destroyed));
        EXPECT_EQ(destroyed, 0);
    }
    EXPECT_EQ(destroyed, 3);
    CKTStreamRead const none;
}

TEST(StreamTest, CopiesShareTheTransport) {
    int destroyed = 0;
    auto original = std::make_unique<CKTStreamWrite>();
    original->SetXferBytes(new WatchedTransport(destroyed));
    original->SetSwapping(1);
    {
        CKTStreamWrite copy(*original);
        EXPECT_EQ(copy.GetSwapping(), 1);
        short small = 1;
        copy.XferInt16(small);
        EXPECT_EQ(original->Tell(), 2U);
        copy.SetXferBytes(nullptr);
    }
    EXPECT_EQ(destroyed, 0);
    original.reset();
    EXPECT_EQ(destroyed, 1);
}

class ExposedWriter : public CKTStreamWrite {
  public:
    using CKTStreamWrite::GetXferBytes;
    using CKTStreamWrite::Open;
    using CKTStreamWrite::XferInt32;
    int XferInt32(int &value) override {
        ++numbers;
        return CKTStreamWrite::XferInt32(value);
    }
    int numbers = 0;
};
class ExposedReader : public CKTStreamRead {
  public:
    using CKTStreamRead::Open;
    using CKTStreamRead::XferInt32;
    int XferInt32(int &value) override {
        ++numbers;
        return CKTStreamRead::XferInt32(value);
    }
    int numbers = 0;
};
class ExposedReadWriter : public CKTStreamReadWrite {
  public:
    using CKTStreamReadWrite::Open;
};

TEST(StreamTest, OpenIsAlwaysReadyAndHostsMayDerive) {
    ExposedWriter writer;
    ExposedReader reader;
    ExposedReadWriter both;
    EXPECT_EQ(writer.Open(), 1);
    EXPECT_EQ(reader.Open(), 1);
    EXPECT_EQ(both.Open(), 1);
    auto *const transport = new RecordingTransport;
    writer.SetXferBytes(transport);
    EXPECT_EQ(writer.GetXferBytes(), transport);
    long long large = 1;
    writer.XferInt64(large);
    EXPECT_EQ(writer.numbers, 2); // both halves go through the virtual table
    reader.SetXferBytes(new RecordingTransport(transport->data));
    EXPECT_EQ(reader.XferInt64(large), 1);
    EXPECT_EQ(reader.numbers, 2);
}

// ---- reading and writing in turns ----

TEST(ReadWriteStreamTest, GoesTheWayOfItsMode) {
    auto *const transport = new RecordingTransport;
    CKTStreamReadWrite stream;
    stream.SetXferBytes(transport);
    EXPECT_EQ(stream.GetMode(), IKTReadWriteStream::kModeRead);
    EXPECT_EQ(stream.IsReading(), 1);
    EXPECT_EQ(stream.IsWriting(), 0);
    EXPECT_EQ(stream.SetMode(IKTReadWriteStream::kModeWrite), kKTErrorNone);
    EXPECT_EQ(stream.GetMode(), IKTReadWriteStream::kModeWrite);
    EXPECT_EQ(stream.IsReading(), 0);
    EXPECT_EQ(stream.IsWriting(), 1);
    Values written = Golden();
    written.Xfer(stream);
    KTBool16 flags[] = {1, 0};
    EXPECT_EQ(stream.XferBool(flags, 2), 2);
    EXPECT_EQ(Hex(transport->data), std::string(kGolden) + "01 00 00 00 ");
    stream.Flush();
    EXPECT_EQ(transport->flushes, 1);
    EXPECT_EQ(stream.Tell(), transport->data.size());
    EXPECT_EQ(stream.Seek(0, kKTSeekFromBeginning), 0);
    EXPECT_EQ(stream.SetMode(IKTReadWriteStream::kModeRead), kKTErrorNone);
    Values read;
    read.Xfer(stream);
    EXPECT_EQ(read, written);
    EXPECT_EQ(stream.XferBool(flags, 2), 2);
    EXPECT_EQ(stream.GetStreamState(), kKTStreamStateGood);
    stream.Seek(3, kKTSeekFromBeginning);
    stream.SetEndOfStream();
    EXPECT_EQ(transport->data.size(), 3U);
    transport->state = kKTStreamStateError;
    EXPECT_EQ(stream.GetStreamState(), kKTStreamStateError);
    stream.Close();
}

TEST(ReadWriteStreamTest, AnyOtherModeWritesWithoutBeingWriting) {
    auto *const transport = new RecordingTransport;
    CKTStreamReadWrite stream;
    stream.SetXferBytes(transport);
    EXPECT_EQ(stream.SetMode(static_cast<IKTReadWriteStream::Mode>(5)), kKTErrorNone);
    EXPECT_EQ(stream.IsReading(), 0);
    EXPECT_EQ(stream.IsWriting(), 0);
    unsigned char byte = 7;
    stream.XferByte(byte);
    EXPECT_EQ(Hex(transport->data), "07 ");
}

TEST(ReadWriteStreamTest, SwappingChangesNoByte) {
    auto *const transport = new RecordingTransport;
    CKTStreamReadWrite stream;
    stream.SetXferBytes(transport);
    EXPECT_EQ(stream.GetSwapping(), 0);
    stream.SetSwapping(1);
    EXPECT_EQ(stream.GetSwapping(), 1);
    stream.SetMode(IKTReadWriteStream::kModeWrite);
    int number = 0x01020304;
    stream.XferInt32(number);
    EXPECT_EQ(Hex(transport->data), "04 03 02 01 ");
    stream.SetMode(IKTReadWriteStream::kModeRead);
    stream.Seek(0, kKTSeekFromBeginning);
    EXPECT_EQ(stream.XferInt32(number), 0x01020304);
}

TEST(ReadWriteStreamTest, ClosesBeforeItsTransportGoes) {
    class Closing : public CKTStreamReadWrite {
      public:
        Closing(int const &destroyed, int &atClose) : m_Destroyed(destroyed), m_AtClose(atClose) {}
        Closing(Closing const &) = delete;
        Closing &operator=(Closing const &) = delete;
        ~Closing() override { Closing::Destroy(); }
        void Close() override { m_AtClose = m_Destroyed; }

      private:
        int const &m_Destroyed;
        int &m_AtClose;
    };
    int destroyed = 0;
    int atClose = -1;
    {
        Closing stream(destroyed, atClose);
        stream.SetXferBytes(new WatchedTransport(destroyed));
    }
    EXPECT_EQ(atClose, 0);
    EXPECT_EQ(destroyed, 1);
}

} // namespace
