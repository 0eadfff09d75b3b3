// FileXferModelTest.cpp: the transport over a file beside a plain model of it, under a million random operations.
//
// The model keeps the file's bytes, the gathered bytes and the bytes read ahead as strings, and knows nothing of chunks.
// The seed is random, and printed when anything differs; KT_STREAM_SEED repeats a run.

#include "FileXferBytes.h"
#include "StreamSupport.h"

#include <cstdlib>
#include <iostream>
#include <random>

namespace {

constexpr std::size_t kBuffer = 524288;
constexpr std::size_t kBlock = 65536;
constexpr std::size_t kThreshold = 65537;
constexpr std::size_t kSmall = 262143;
constexpr long long kNear = 32768;

class Model {
  public:
    std::string disk; // survives Open

    void Open(unsigned int mode) {
        Close();
        m_Reads = (mode & 1) != 0;
        m_Writes = (mode & 6) != 0;
        if ((mode & 8) != 0 && (mode & 4) == 0) {
            disk.clear();
        }
        m_Handle = (mode & 6) == 6 ? disk.size() : 0;
        m_Total = 0;
        m_State = kKTStreamStateGood;
    }

    void Close() {
        Flush();
        m_HasBuffer = false;
        Empty();
        m_State = kKTStreamStateClosed;
    }

    std::size_t Write(std::string const &bytes) {
        if (!m_Pending.empty() && bytes.size() > kBuffer - m_Pending.size()) {
            Flush();
        }
        if (bytes.size() > kBuffer) {
            return ToDisk(bytes) ? bytes.size() : 0;
        }
        m_Pending += bytes;
        return bytes.size();
    }

    std::string Read(std::size_t count) {
        Flush();
        m_Total += count;
        if (!m_HasBuffer && m_Total >= kThreshold && count != m_Total && count <= kSmall) {
            m_HasBuffer = true;
        }
        std::string read;
        std::size_t const unread = m_Ahead.size() - m_Cursor;
        if (unread != 0) {
            read = m_Ahead.substr(m_Cursor, count);
            m_Cursor += read.size();
            if (read.size() == count) {
                return read;
            }
        }
        std::size_t rest = count - read.size();
        if (rest >= kBlock) {
            Empty();
            std::size_t const whole = rest / kBlock * kBlock;
            std::string const blocks = FromDisk(whole);
            read += blocks;
            rest -= blocks.size();
            if (blocks.size() < whole || rest == 0) {
                return read;
            }
        }
        Empty();
        if (m_HasBuffer && rest != 0 && m_Total >= kThreshold) {
            m_Base = m_Handle;
            m_Ahead = m_Reads ? disk.substr(std::min(m_Handle, disk.size()), kBuffer) : "";
            m_Handle += m_Ahead.size();
            if (m_Ahead.size() <= rest) {
                m_State = m_Reads ? kKTStreamStateEndOfStream : kKTStreamStateError;
            }
            m_Cursor = std::min(rest, m_Ahead.size());
            return read + m_Ahead.substr(0, m_Cursor);
        }
        return read + (rest == 0 ? "" : FromDisk(rest));
    }

    std::size_t Seek(long long offset, KTSeekFromWhere origin) {
        Flush();
        if (m_State == kKTStreamStateEndOfStream) {
            m_State = kKTStreamStateGood;
        }
        auto const handle = static_cast<long long>(m_Handle);
        auto const base = static_cast<long long>(m_Base);
        auto const next = base + static_cast<long long>(m_Cursor);
        if (origin == kKTSeekFromEnd) {
            m_Total = 0;
            Empty();
            return MoveTo(static_cast<long long>(disk.size()) + offset);
        }
        if (origin == kKTSeekFromCurrent) {
            return Move(offset);
        }
        if (offset >= handle) {
            if (offset > next + kNear) {
                m_Total = 0;
            }
            Empty();
            return Move(offset - handle);
        }
        if (!m_Ahead.empty() && offset >= base) {
            return Move(offset - next);
        }
        m_Total = 0;
        Empty();
        return MoveTo(offset);
    }

    void SetEndOfStream() {
        if (m_Writes) {
            disk.resize(m_Handle);
        } else {
            m_State = kKTStreamStateError;
        }
    }

    void Flush() {
        if (!m_Pending.empty()) {
            ToDisk(m_Pending);
            m_Pending.clear();
        }
    }

    std::size_t Tell() const { return m_Handle + (m_Pending.empty() ? m_Cursor : m_Pending.size()); }
    KTStreamState State() const { return m_State; }

  private:
    void Empty() {
        m_Ahead.clear();
        m_Cursor = 0;
    }

    bool ToDisk(std::string const &bytes) {
        if (bytes.empty()) {
            return true;
        }
        if (!m_Writes) {
            m_State = kKTStreamStateError;
            return false;
        }
        disk.resize(std::max(disk.size(), m_Handle + bytes.size()));
        disk.replace(m_Handle, bytes.size(), bytes);
        m_Handle += bytes.size();
        return true;
    }

    std::string FromDisk(std::size_t count) {
        if (!m_Reads) {
            m_State = kKTStreamStateError;
            return "";
        }
        std::string const read = disk.substr(std::min(m_Handle, disk.size()), count);
        m_Handle += read.size();
        if (read.size() < count) {
            m_State = kKTStreamStateEndOfStream;
        }
        return read;
    }

    std::size_t Move(long long offset) {
        auto const cursor = static_cast<long long>(m_Cursor) + offset;
        auto const ahead = static_cast<long long>(m_Ahead.size());
        if (offset == 0 && ahead == 0) {
            return m_Handle;
        }
        if (offset == 0 || (ahead != 0 && cursor >= 0 && cursor <= ahead)) {
            m_Cursor = static_cast<std::size_t>(cursor);
            return m_Base + m_Cursor;
        }
        if (offset - ahead > kNear) {
            m_Total = 0;
        }
        Empty();
        return MoveTo(static_cast<long long>(m_Handle) + offset - ahead);
    }

    std::size_t MoveTo(long long position) {
        if (position < 0) {
            m_State = kKTStreamStateError;
        } else {
            m_Handle = static_cast<std::size_t>(position);
        }
        return m_Handle;
    }

    bool m_Reads = false;
    bool m_Writes = false;
    std::size_t m_Handle = 0;
    std::string m_Pending;
    bool m_HasBuffer = false;
    std::string m_Ahead;
    std::size_t m_Cursor = 0;
    std::size_t m_Base = 0;
    std::size_t m_Total = 0;
    KTStreamState m_State = kKTStreamStateError;
};

class FileXferModelTest : public StreamFixture {
  protected:
    // Sizes near those where the transport changes its ways, and many small ones.
    unsigned int Size() {
        static constexpr unsigned int kEdges[] = {4096, 8192, 65536, 65537, 131072, 262143, 262144, 524288};
        unsigned int const kind = Random(2000);
        if (kind < 8) {
            return kEdges[kind] - 2 + Random(5);
        }
        return kind < 40 ? Random(9000) : kind < 300 ? Random(600) : Random(20);
    }

    unsigned int Random(unsigned int end) { return static_cast<unsigned int>(m_Random() % end); }

    unsigned int Mode() {
        static constexpr unsigned int kModes[] = {3, 3, 3, 3, 1, 2, 7, 5, 11};
        return kModes[Random(std::size(kModes))];
    }

    void Reopen(FileXferBytes &transport, Model &model) {
        if (Random(2) == 0) {
            transport.Close();
            model.Close();
            ASSERT_EQ(transport.GetStreamState(), kKTStreamStateClosed);
            ASSERT_EQ(Content("model"), model.disk);
        }
        unsigned int const mode = Mode();
        ASSERT_EQ(transport.Open(File("model"), mode, Random(9), Random(9)), 1);
        model.Open(mode);
        // Bounds the work: the file is cut now and then.
        m_Writable = (mode & 2) != 0 || (mode & 4) != 0;
    }

    void Seek(FileXferBytes &transport, Model &model) {
        static constexpr KTSeekFromWhere kOrigins[] = {kKTSeekFromBeginning, kKTSeekFromCurrent, kKTSeekFromEnd};
        KTSeekFromWhere const origin = kOrigins[Random(3)];
        auto const size = static_cast<int>(model.disk.size());
        int offset = static_cast<int>(Random(4) == 0 ? Random(70000) : Random(200));
        offset = Random(3) == 0 ? -offset : offset;
        if (origin == kKTSeekFromBeginning && Random(2) == 0) {
            offset = size == 0 ? 0 : static_cast<int>(Random(static_cast<unsigned int>(size)));
        }
        if (origin != kKTSeekFromCurrent && Random(2) == 0) {
            offset = origin == kKTSeekFromEnd ? -offset : static_cast<int>(model.Tell()) + offset % 100;
        }
        if (model.Tell() > 1500000) {
            offset = origin == kKTSeekFromBeginning ? 0 : -1000000;
        }
        m_Step += " seek " + std::to_string(offset) + " from " + std::to_string(origin);
        ASSERT_EQ(transport.Seek(offset, origin), model.Seek(offset, origin));
    }

    void Step(FileXferBytes &transport, Model &model) {
        unsigned int const what = Random(1000);
        if (what < 450) {
            unsigned int const count = Size();
            m_Step = "read " + std::to_string(count);
            ASSERT_EQ(ReadText(transport, count), model.Read(count));
        } else if (what < 850) {
            if (!m_Writable) {
                return; // what happens then depends on earlier opens, and has a test of its own
            }
            unsigned int const count = Size();
            m_Step = "write " + std::to_string(count);
            std::string const bytes = m_Pattern.substr(Random(1000), count);
            ASSERT_EQ(WriteText(transport, bytes), model.Write(bytes));
        } else if (what < 985) {
            m_Step = "";
            Seek(transport, model);
        } else if (what < 995) {
            m_Step = "flush";
            transport.Flush();
            model.Flush();
        } else if (what < 999 || Random(10) != 0) {
            if (model.Tell() > 1000000 || Random(10) == 0) {
                m_Step = "end";
                transport.SetEndOfStream();
                model.SetEndOfStream();
            }
        } else {
            m_Step = "reopen";
            Reopen(transport, model);
        }
    }

    std::mt19937 m_Random;
    std::string m_Pattern = Pattern(600000);
    std::string m_Step;
    bool m_Writable = true;
};

TEST_F(FileXferModelTest, DoesWhatThePlainModelDoesInAMillionOperations) {
    char const *const given = std::getenv("KT_STREAM_SEED");
    unsigned int const seed = given == nullptr ? std::random_device{}() : static_cast<unsigned int>(std::atoll(given));
    std::cout << "seed " << seed << '\n';
    m_Random.seed(seed);
    Model model;
    File("model", "");
    {
        FileXferBytes transport;
        ASSERT_EQ(transport.Open(File("model"), 3, 0, 0), 1);
        model.Open(3);
        for (int i = 0; i < 1000000; ++i) {
            Step(transport, model);
            ASSERT_FALSE(HasFatalFailure()) << "operation " << i << ": " << m_Step << ", seed " << seed;
            ASSERT_EQ(transport.Tell(), model.Tell()) << "operation " << i << ": " << m_Step << ", seed " << seed;
            ASSERT_EQ(transport.GetStreamState(), model.State())
                << "operation " << i << ": " << m_Step << ", seed " << seed;
        }
        model.Close();
    }
    EXPECT_EQ(Content("model"), model.disk) << "seed " << seed;
}

} // namespace
