// StreamShortcutTest.cpp: values that the typed streams take out of a file transport's buffers, and put there, at one
// go. A stream on a transport of the host's has no such way: both must make the same bytes and values of the same calls.

#include "CKTStreamRead.h"
#include "CKTStreamWrite.h"
#include "FileXferBytes.h"
#include "StreamSupport.h"

#include <random>

namespace {

constexpr std::size_t kSeveralBuffers = 0x180000;

// One value of a random kind; what was read is compared as text.
struct Step {
    enum Kind { kByte, kShort, kInt, kLong, kReal, kBool, kUtf8, kUtf16, kBare8, kBare16, kKinds };
    Kind kind;
    bool swapping;
    long long number;
    KTString text;

    std::string Xfer(IKTStream &stream, bool reads) const {
        stream.SetSwapping(swapping ? 1 : 0);
        auto const start = reads ? 0 : number;
        switch (kind) {
        case kByte: {
            auto value = static_cast<unsigned char>(start);
            return std::to_string(stream.XferByte(value)) + '=' + std::to_string(value);
        }
        case kShort: {
            auto value = static_cast<short>(start);
            return std::to_string(stream.XferInt16(value)) + '=' + std::to_string(value);
        }
        case kInt: {
            auto value = static_cast<int>(start);
            return std::to_string(stream.XferInt32(value)) + '=' + std::to_string(value);
        }
        case kLong: {
            long long value = start;
            return std::to_string(stream.XferInt64(value)) + '=' + std::to_string(value);
        }
        case kReal: {
            KTReal value(static_cast<double>(start) / 3);
            std::string const returned = std::to_string(stream.XferRealNumber(value).AsDouble());
            return returned + '=' + std::to_string(value.AsDouble());
        }
        case kBool: {
            auto value = static_cast<KTBool16>(start & 1);
            return std::to_string(stream.XferBool(value)) + '=' + std::to_string(value);
        }
        default:
            break;
        }
        bool const bare = kind == kBare8 || kind == kBare16;
        KTString value = reads && !bare ? KTString("before") : text; // a bare text is read into one of its size
        KTString const returned = stream.XferString(value, kind == kUtf8 || kind == kBare8, !bare);
        EXPECT_EQ(value, returned);
        return value.GetUTF8String();
    }
};

// Texts of all lengths about the sizes of blocks and buffers: ASCII, ASCII but for one character, and anything.
KTString RandomText(std::mt19937 &random) {
    std::size_t const length = random() % 8 == 0 ? random() % 600 : random() % 40;
    KTString text;
    for (std::size_t i = 0; i < length; ++i) {
        text.push_back(static_cast<unsigned short>(1 + random() % 127));
    }
    constexpr unsigned short kOthers[] = {0x80, 0xFF, 0x7FF, 0x800, 0xFF80, 0xFFFD, 0x17F, 0x4141};
    if (length != 0 && random() % 3 == 0) {
        text[random() % length] = kOthers[random() % std::size(kOthers)];
    }
    return text;
}

Step RandomStep(std::mt19937 &random) {
    auto const number = static_cast<long long>(static_cast<std::uint64_t>(random()) << 32 | random());
    return {static_cast<Step::Kind>(random() % Step::kKinds), random() % 4 == 0, number, RandomText(random)};
}

using StreamShortcutTest = StreamFixture;

TEST_F(StreamShortcutTest, FilesAndOtherTransportsGetTheSameBytesAndGiveTheSameValues) {
    std::mt19937 random(20); // NOLINT(*-msc51-cpp): the same each time
    std::vector<Step> steps;
    KTFile const file = File("steps");
    std::vector<unsigned char> bytes;
    {
        CKTStreamWrite onFile;
        CKTStreamWrite onHost;
        auto *const transport = new FileXferBytes;
        auto *const host = new RecordingTransport;
        onFile.SetXferBytes(transport);
        onHost.SetXferBytes(host);
        ASSERT_NE(0, transport->Open(file, FileXferBytes::kOpenWrite, 0, 0));
        while (host->data.size() < kSeveralBuffers) {
            Step const &step = steps.emplace_back(RandomStep(random));
            ASSERT_EQ(step.Xfer(onHost, false), step.Xfer(onFile, false)) << "step " << steps.size();
            ASSERT_EQ(onHost.Tell(), onFile.Tell()) << "step " << steps.size();
        }
        bytes = host->data;
    }
    std::string const written = Content("steps");
    ASSERT_TRUE(std::equal(bytes.begin(), bytes.end(), written.begin(), written.end(),
                           [](unsigned char a, char b) { return a == static_cast<unsigned char>(b); }));
    CKTStreamRead onFile;
    CKTStreamRead onHost;
    auto *const transport = new FileXferBytes;
    onFile.SetXferBytes(transport);
    onHost.SetXferBytes(new RecordingTransport(bytes));
    ASSERT_NE(0, transport->Open(file, FileXferBytes::kOpenRead, 0, 0));
    for (std::size_t i = 0; i < steps.size(); ++i) {
        ASSERT_EQ(steps[i].Xfer(onHost, true), steps[i].Xfer(onFile, true)) << "step " << i;
        ASSERT_EQ(onHost.Tell(), static_cast<unsigned int>(onFile.Seek(0, kKTSeekFromCurrent))) << "step " << i;
    }
}

// Readers of a file behind enough bytes that the rest is read ahead.
class StreamReadAheadTest : public StreamFixture {
  protected:
    // A reader that stands at the first of these bytes.
    template <typename Stream> void Open(Stream &stream, std::string const &bytes) {
        auto *const transport = new FileXferBytes;
        stream.SetXferBytes(transport);
        KTFile const file = File("ahead", std::string(kBefore, 'x') + bytes + "........");
        ASSERT_NE(0, transport->Open(file, FileXferBytes::kOpenRead, 0, 0));
        std::string skipped(kBefore / 2, 0);
        for (int i = 0; i < 2; ++i) {
            stream.XferByte(reinterpret_cast<unsigned char *>(skipped.data()), kBefore / 2);
        }
    }
    static constexpr int kBefore = 80000;
};

TEST_F(StreamReadAheadTest, TextsEndAtTheirFirstZeroWhereverItIs) {
    constexpr std::size_t kLongest = 40;
    std::string bytes;
    for (std::size_t length = 1; length <= kLongest; ++length) {
        for (std::size_t zero = 0; zero < length; ++zero) {
            bytes += std::string(1, static_cast<char>(length)) + std::string(3, '\0');
            bytes += std::string(zero, 'a') + '\0' + std::string(length - zero - 1, 'b');
        }
    }
    CKTStreamRead stream;
    Open(stream, bytes);
    for (std::size_t length = 1; length <= kLongest; ++length) {
        for (std::size_t zero = 0; zero < length; ++zero) {
            KTString value("before");
            stream.XferString(value, true, true);
            EXPECT_EQ(KTString(std::string(zero, 'a').c_str()), value) << length << ' ' << zero;
        }
    }
    EXPECT_EQ(kKTStreamStateGood, stream.GetStreamState());
}

TEST_F(StreamReadAheadTest, HostileLengthsTakeWhatIsThere) {
    for (char const *const hex : {"FF FF FF 7F ", "00 00 00 80 ", "FF FF FF FF ", "0D 00 00 00 "}) {
        std::vector<unsigned char> const count = Bytes(hex);
        CKTStreamRead stream;
        Open(stream, std::string(count.begin(), count.end()) + "text");
        KTString value("before");
        stream.XferString(value, true, true);
        bool const isNegative = count[3] >= 0x80;
        EXPECT_EQ(KTString(isNegative ? "" : "text........"), value) << hex;
        EXPECT_EQ(isNegative ? kKTStreamStateGood : kKTStreamStateEndOfStream, stream.GetStreamState()) << hex;
    }
}

// A host's stream may change what a value's parts are.
class Shifted : public CKTStreamRead {
  public:
    Shifted() = default;
    explicit Shifted(CKTStreamRead const &other) : CKTStreamRead(other) {}

    int XferInt32(int &value) override {
        ++calls;
        return CKTStreamRead::XferInt32(value);
    }
    int XferByte(unsigned char *buffer, int count) override {
        ++calls;
        return CKTStreamRead::XferByte(buffer, count);
    }
    short XferInt16(short &value) override {
        ++calls;
        return CKTStreamRead::XferInt16(value);
    }
    using CKTStreamRead::XferByte;
    using CKTStreamRead::XferInt16;
    using CKTStreamRead::XferInt32;
    int calls = 0;
};

TEST_F(StreamReadAheadTest, HostsThatDeriveSeeTheirPartsRead) {
    Shifted stream;
    Open(stream, std::string("\1\0\0\0\2\0\0\0\4\0\0\0text\1\0\0\0\0\0\0\0\0\0", 26));
    stream.calls = 0;
    long long number = 0;
    EXPECT_EQ(0x100000002, stream.XferInt64(number));
    EXPECT_EQ(2, stream.calls);
    KTString text;
    EXPECT_EQ(KTString("text"), stream.XferString(text, true, true));
    EXPECT_EQ(4, stream.calls);
    KTBool16 is = 0;
    EXPECT_EQ(1, stream.XferBool(is));
    EXPECT_EQ(5, stream.calls);
    KTReal real(1.0);
    EXPECT_EQ(0.0, stream.XferRealNumber(real).AsDouble());
    EXPECT_EQ(6, stream.calls);
}

// Expects both parts of the number to be seen, and gives the shared transport back.
void ExpectPartsRead(Shifted &stream, long long expected) {
    stream.calls = 0;
    long long number = 0;
    EXPECT_EQ(expected, stream.XferInt64(number));
    EXPECT_EQ(2, stream.calls);
    stream.SetXferBytes(nullptr);
}

TEST_F(StreamReadAheadTest, HostsThatDeriveFromACopySeeTheirPartsRead) {
    CKTStreamRead plain;
    Open(plain, std::string("\0\0\0\0\1\0\0\0\0\0\0\0\2\0\0\0\0\0\0\0\3\0\0\0\0", 25));
    Shifted copied(plain);
    ExpectPartsRead(copied, 1);
    Shifted assigned;
    static_cast<CKTStreamRead &>(assigned) = plain;
    ExpectPartsRead(assigned, 2);
    CKTStreamRead copy(plain);
    long long number = 0;
    EXPECT_EQ(3, copy.XferInt64(number));
    copy.SetXferBytes(nullptr);
}

class Counting : public CKTStreamWrite {
  public:
    Counting() = default;
    explicit Counting(CKTStreamWrite const &other) : CKTStreamWrite(other) {}

    int XferInt32(int &value) override {
        ++calls;
        return CKTStreamWrite::XferInt32(value);
    }
    int XferByte(unsigned char *buffer, int count) override {
        ++calls;
        return CKTStreamWrite::XferByte(buffer, count);
    }
    short XferInt16(short &value) override {
        ++calls;
        return CKTStreamWrite::XferInt16(value);
    }
    using CKTStreamWrite::XferByte;
    using CKTStreamWrite::XferInt16;
    using CKTStreamWrite::XferInt32;
    int calls = 0;
};

TEST_F(StreamShortcutTest, HostsThatDeriveSeeTheirPartsWritten) {
    Counting stream;
    auto *const transport = new FileXferBytes;
    stream.SetXferBytes(transport);
    ASSERT_NE(0, transport->Open(File("parts"), FileXferBytes::kOpenWrite, 0, 0));
    long long number = 0x100000002;
    stream.XferInt64(number);
    EXPECT_EQ(2, stream.calls);
    KTString text("text");
    stream.XferString(text, true, true);
    EXPECT_EQ(3, stream.calls);
    KTBool16 is = 1;
    stream.XferBool(is);
    EXPECT_EQ(4, stream.calls);
    KTReal real(1.0);
    stream.XferRealNumber(real);
    EXPECT_EQ(5, stream.calls);
    stream.Flush();
    EXPECT_EQ(std::string("\1\0\0\0\2\0\0\0\4\0\0\0text\1\0\0\0\0\0\0\0\xF0\x3F", 26), Content("parts"));
}

TEST_F(StreamShortcutTest, HostsThatDeriveFromACopySeeTheirPartsWritten) {
    CKTStreamWrite plain;
    auto *const transport = new FileXferBytes;
    plain.SetXferBytes(transport);
    ASSERT_NE(0, transport->Open(File("copies"), FileXferBytes::kOpenWrite, 0, 0));
    Counting copied(plain);
    Counting assigned;
    static_cast<CKTStreamWrite &>(assigned) = plain;
    for (Counting *const stream : {&copied, &assigned}) {
        long long number = 1;
        stream->XferInt64(number);
        EXPECT_EQ(2, stream->calls);
        stream->SetXferBytes(nullptr);
    }
    plain.Flush();
    EXPECT_EQ(std::string("\0\0\0\0\1\0\0\0\0\0\0\0\1\0\0\0", 16), Content("copies"));
}

} // namespace
