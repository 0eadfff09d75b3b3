// MemXferBytesTest.cpp: the transport over one block of memory.

#include "MemXferBytes.h"
#include "FileXferBytes.h"
#include "StreamSupport.h"

#include <random>

namespace {

constexpr unsigned int kCapacity = 262144;

TEST(MemXferBytesTest, TakesExactlyItsCapacity) {
    MemXferBytes transport;
    std::string bytes = Pattern(kCapacity);
    EXPECT_EQ(transport.Write(bytes.data(), kCapacity), kCapacity);
    EXPECT_EQ(transport.Write(bytes.data(), 1), 0U);
    EXPECT_EQ(transport.Tell(), kCapacity);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
    EXPECT_EQ(transport.Seek(0, kKTSeekFromBeginning), 0U);
    EXPECT_EQ(ReadText(transport, kCapacity), bytes);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
}

TEST(MemXferBytesTest, RefusesAWriteThatDoesNotFitWhole) {
    MemXferBytes transport;
    EXPECT_EQ(WriteText(transport, Pattern(kCapacity - 10)), kCapacity - 10);
    EXPECT_EQ(WriteText(transport, "12345678901"), 0U);
    EXPECT_EQ(transport.Tell(), kCapacity - 10);
    EXPECT_EQ(transport.Seek(0, kKTSeekFromEnd), kCapacity - 10);
    EXPECT_EQ(transport.Write(nullptr, 0xFFFFFFFF), 0U);
    EXPECT_EQ(WriteText(transport, "1234567890"), 10U);
    EXPECT_EQ(WriteText(transport, ""), 0U);
}

TEST(MemXferBytesTest, ReadsWhatThereIsAndTellsTheEnd) {
    MemXferBytes transport;
    WriteText(transport, "12345");
    EXPECT_EQ(ReadText(transport, 1), "");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateEndOfStream);
    EXPECT_EQ(transport.Seek(1, kKTSeekFromBeginning), 1U);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
    EXPECT_EQ(ReadText(transport, 4), "2345");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
    transport.Seek(3, kKTSeekFromBeginning);
    EXPECT_EQ(ReadText(transport, 100), "45");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateEndOfStream);
    EXPECT_EQ(transport.Tell(), 5U);
    transport.Flush();
    WriteText(transport, "6");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateEndOfStream); // only a seek clears it
    EXPECT_EQ(transport.Seek(0, kKTSeekFromCurrent), 6U);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
}

TEST(MemXferBytesTest, SeeksWithinTheData) {
    MemXferBytes transport;
    WriteText(transport, "1234567890");
    EXPECT_EQ(transport.Seek(11, kKTSeekFromBeginning), 10U);
    EXPECT_EQ(transport.Seek(4, kKTSeekFromBeginning), 4U);
    EXPECT_EQ(transport.Seek(3, kKTSeekFromCurrent), 7U);
    EXPECT_EQ(transport.Seek(-2, kKTSeekFromCurrent), 5U);
    EXPECT_EQ(transport.Seek(-3, kKTSeekFromEnd), 7U);
    EXPECT_EQ(transport.Seek(1, kKTSeekFromEnd), 10U);
    EXPECT_EQ(transport.Seek(-1, kKTSeekFromBeginning), 10U);
    transport.Seek(4, kKTSeekFromBeginning);
    EXPECT_EQ(transport.Seek(-5, kKTSeekFromCurrent), 10U);
    EXPECT_EQ(transport.Seek(-11, kKTSeekFromEnd), 10U);
    transport.Seek(4, kKTSeekFromBeginning);
    EXPECT_EQ(transport.Seek(2, static_cast<KTSeekFromWhere>(3)), 4U);
    EXPECT_EQ(transport.Seek(2, static_cast<KTSeekFromWhere>(0)), 4U);
}

TEST(MemXferBytesTest, EndsWhereItIsTold) {
    MemXferBytes transport;
    WriteText(transport, "1234567890");
    transport.Seek(4, kKTSeekFromBeginning);
    WriteText(transport, "x");
    EXPECT_EQ(transport.Seek(0, kKTSeekFromEnd), 10U); // a write within the data does not shorten them
    transport.Seek(5, kKTSeekFromBeginning);
    transport.SetEndOfStream();
    EXPECT_EQ(transport.Seek(0, kKTSeekFromEnd), 5U);
    transport.Seek(0, kKTSeekFromBeginning);
    EXPECT_EQ(ReadText(transport, 10), "1234x");
}

// Random operations beside a vector.
TEST(MemXferBytesTest, DoesWhatAPlainModelDoes) {
    unsigned int const seed = std::random_device{}();
    RecordProperty("seed", std::to_string(seed));
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 generator(seed);
    auto const random = [&generator] { return static_cast<unsigned int>(generator()); };
    MemXferBytes transport;
    std::string model;
    unsigned int position = 0;
    bool atEnd = false;
    for (int i = 0; i < 200000; ++i) {
        unsigned int const count = random() % (random() % 16 == 0 ? 100000 : 100);
        switch (random() % 4) {
        case 0: {
            std::string const text = Pattern(count, random());
            bool const fits = position + count <= kCapacity;
            ASSERT_EQ(WriteText(transport, text), fits ? count : 0);
            if (fits) {
                model.resize(std::max<std::size_t>(model.size(), position + count));
                model.replace(position, count, text);
                position += count;
            }
            break;
        }
        case 1: {
            std::string const expected = model.substr(position, count);
            ASSERT_EQ(ReadText(transport, count), expected);
            atEnd = atEnd || expected.size() < count;
            position += static_cast<unsigned int>(expected.size());
            break;
        }
        case 2: {
            int const offset = static_cast<int>(random() % 300000) - 100000;
            auto const size = static_cast<long long>(model.size());
            KTSeekFromWhere const origins[] = {kKTSeekFromBeginning, kKTSeekFromCurrent, kKTSeekFromEnd};
            long long const bases[] = {0, position, size};
            unsigned int const which = random() % 3;
            long long const target = bases[which] + offset;
            position = static_cast<unsigned int>(target < 0 || target > size ? size : target);
            ASSERT_EQ(transport.Seek(offset, origins[which]), position);
            atEnd = false;
            break;
        }
        default:
            if (random() % 50 == 0) {
                transport.SetEndOfStream();
                model.resize(position);
            }
            break;
        }
        ASSERT_EQ(transport.Tell(), position);
        ASSERT_EQ(transport.GetStreamState(), atEnd ? kKTStreamStateEndOfStream : kKTStreamStateGood);
    }
}

// A file transport that only says what was asked of it.
class BackingStore : public FileXferBytes {
  public:
    explicit BackingStore(std::string &calls) : m_Calls(calls) {}
    BackingStore(BackingStore const &) = delete;
    BackingStore &operator=(BackingStore const &) = delete;
    ~BackingStore() override { m_Calls += "deleted "; }

    unsigned int Read(void *, unsigned int count) override { return Say("read", count); }
    unsigned int Write(void *, unsigned int count) override { return Say("write", count); }
    unsigned int Seek(int offset, KTSeekFromWhere origin) override {
        Say("seek", static_cast<unsigned int>(offset));
        return Say("from", static_cast<unsigned int>(origin)) + 1000;
    }
    void Flush() override { m_Calls += "flush "; }
    KTStreamState GetStreamState() override { return kKTStreamStateError; }
    void SetEndOfStream() override { m_Calls += "end "; }
    void Close() override { m_Calls += "close "; }

  private:
    unsigned int Say(char const *what, unsigned int number) {
        m_Calls += what;
        m_Calls += std::to_string(number) + " ";
        return number;
    }

    std::string &m_Calls;
};

// Nothing sets the flag, so the test does, in the object's memory: everything goes to the backing store then.
TEST(MemXferBytesTest, WouldForwardToABackingStore) {
    std::string calls;
    {
        MemXferBytes transport;
        FileXferBytes *const store = new BackingStore(calls);
        auto *const bytes = reinterpret_cast<unsigned char *>(&transport);
        auto const address = reinterpret_cast<std::uintptr_t>(store);
        std::memcpy(bytes + sizeof transport - sizeof address, &address, sizeof address);
        KTBool16 const active = 1;
        std::memcpy(bytes + 34, &active, sizeof active);
        EXPECT_EQ(transport.Read(nullptr, 300000), 300000U);
        EXPECT_EQ(transport.Write(nullptr, 400000), 400000U);
        EXPECT_EQ(transport.Seek(5, kKTSeekFromEnd), 1004U);
        EXPECT_EQ(transport.Tell(), 1004U);
        transport.Flush();
        transport.SetEndOfStream();
        EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
        EXPECT_EQ(calls, "read300000 write400000 seek5 from4 flush end ");
        calls.clear();
    }
    EXPECT_EQ(calls, "close deleted ");
}

} // namespace
