// ReaderStreamTest.cpp: the readers' inside on streams that are missing, not ready, or fail on the way.

#include "CaptionRows.h"
#include "SettingsTable.h"

#include "CKTStreamRead.h"
#include "LogLines.h"
#include "ReaderModel.h"
#include "StreamSupport.h"

#include <memory>

namespace {

constexpr char kSettingsReport[] = "Assert failed:  at source/private/utils/KTSimpleIniFileReader:220";
constexpr char kCaptionReport[] = "Assert failed:  at source/private/utils/KTClosedCaptionFileReader:165";

// Fails once so many bytes have been read.
class FailingTransport : public RecordingTransport {
  public:
    FailingTransport(std::string const &content, std::size_t good)
        : RecordingTransport({content.begin(), content.end()}), m_Good(good) {}

    unsigned int Read(void *buffer, unsigned int count) override {
        if (position + count <= m_Good) {
            return RecordingTransport::Read(buffer, count);
        }
        state = kKTStreamStateError;
        return 0;
    }
    unsigned int Seek(int offset, KTSeekFromWhere origin) override {
        KTStreamState const before = state;
        unsigned int const place = RecordingTransport::Seek(offset, origin);
        state = before == kKTStreamStateError ? before : state;
        return place;
    }

  private:
    std::size_t m_Good;
};

std::unique_ptr<IKTStream> StreamOn(IKTXferBytes *transport) {
    auto stream = std::make_unique<CKTStreamRead>();
    stream->SetXferBytes(transport);
    return stream;
}

orvik_private::UnitsView View(KTString const &text) { return {text.c_str(), text.size()}; }

TEST(ReaderStream, ReportsAMissingOne) {
    LogLines log;
    SettingsTable table;
    table.Read(nullptr);
    EXPECT_EQ(std::vector<std::string>{kSettingsReport}, log.Take());
    EXPECT_FALSE(table.Find({}, {}));
    EXPECT_TRUE(ReadCaptionRows(nullptr, 3).empty());
    EXPECT_EQ(std::vector<std::string>{kCaptionReport}, log.Take());
}

TEST(ReaderStream, ReportsOneThatIsNotReady) {
    for (KTStreamState const state : {kKTStreamStateError, kKTStreamStateClosed}) {
        struct Unready : FailingTransport {
            explicit Unready(KTStreamState is) : FailingTransport("a=1\n", 0), m_Is(is) {}
            KTStreamState GetStreamState() override { return m_Is; }
            KTStreamState m_Is;
        };
        LogLines log;
        SettingsTable table;
        table.Read(StreamOn(new Unready(state)).get());
        EXPECT_EQ(std::vector<std::string>{kSettingsReport}, log.Take());
        EXPECT_FALSE(table.Find({}, View("a")));
        EXPECT_TRUE(ReadCaptionRows(StreamOn(new Unready(state)).get(), 3).empty());
        EXPECT_EQ(std::vector<std::string>{kCaptionReport}, log.Take());
    }
}

TEST(ReaderStream, GivesNothingOfOneThatFailsOnTheWay) {
    std::string content;
    for (int i = 0; i < 1000; ++i) {
        content.append("n").append(std::to_string(i)).append("=1\n");
    }
    for (std::string const &file : {content, Utf16File(KTString(content.c_str()))}) {
        LogLines log;
        SettingsTable table;
        table.Read(StreamOn(new FailingTransport(file, 3000)).get());
        EXPECT_EQ(std::vector<std::string>{kSettingsReport}, log.Take());
        EXPECT_FALSE(table.Find({}, View("n0")));
        EXPECT_TRUE(ReadCaptionRows(StreamOn(new FailingTransport(file, 3000)).get(), 3).empty());
        EXPECT_EQ(std::vector<std::string>{kCaptionReport}, log.Take());
    }
}

TEST(ReaderStream, ReadsChunksOf1024UnitsAndTellsTheForm) {
    KTString text;
    text.append(1500, 'a').append(KTString("=1"));
    for (bool const isUtf16 : {false, true}) {
        std::string const file = isUtf16 ? Utf16File(text) : text.GetUTF8String();
        auto *const transport = new RecordingTransport({file.begin(), file.end()});
        auto const stream = StreamOn(transport);
        SettingsTable table;
        table.Read(stream.get());
        EXPECT_EQ(isUtf16, table.IsUtf16());
        EXPECT_TRUE(table.Find({}, View(text.substr(0, 1500))));
        ASSERT_LE(3U, transport->reads.size());
        EXPECT_EQ(2U, transport->reads[0]);
        EXPECT_EQ(isUtf16 ? 2048U : 1024U, transport->reads[1]);
        EXPECT_EQ(isUtf16 ? 2048U : 1024U, transport->reads[2]);
    }
}

// The stand-in's code page is Latin-1.
TEST(ReaderStream, ReadsLinesThatAreNotUtf8InTheAnsiCodePage) {
    std::string const file = "a=caf\xE9\nb=caf\xC3\xA9\nc=\xEF\xBF\xBD\xE9\n";
    SettingsTable table;
    table.Read(StreamOn(new RecordingTransport({file.begin(), file.end()})).get());
    EXPECT_TRUE(table.Find({}, View("a")) == View("caf\xC3\xA9"));
    EXPECT_TRUE(table.Find({}, View("b")) == View("caf\xC3\xA9"));
    EXPECT_TRUE(table.Find({}, View("c")) == View("\xC3\xAF\xC2\xBF\xC2\xBD\xC3\xA9"));
}

} // namespace
