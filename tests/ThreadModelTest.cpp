// ThreadModelTest.cpp: random posts to a message thread beside a plain model of its ring, and a check that both hand out
// the same messages in the same order.
//
// The thread under test takes a message only when it is told to: it stands in the handler of the message before. With
// KT_MODEL_SEED in the environment that seed is run alone.

#include "GatedThread.h"
#include "RingModel.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <random>
#include <string>

namespace {

class Pair {
  public:
    explicit Pair(unsigned int seed) : m_Random(seed) {
        m_Thread.postMessage(kQuiet, 0, 0, 0, 0);
        m_Model.Append({kQuiet, 0, 0, 0, 0});
        m_Model.Take();
        m_Thread.start();
        EXPECT_TRUE(m_Thread.Enters(1));
    }
    Pair(Pair const &) = delete;
    Pair &operator=(Pair const &) = delete;

    // Takes what is left, all but the quit messages having been handled on the way, and joins.
    ~Pair() {
        while (m_Model.Count() != 0) {
            Take();
        }
        m_Thread.FinishAll();
    }

    void Step() {
        switch (Draw(10)) {
        case 0:
            Repeat([this] { Post(RandomMessage()); }, 1 + Draw(400));
            break;
        case 1:
            Repeat([this] { Take(); }, 1 + Draw(60));
            break;
        case 2:
        case 3:
            Take();
            break;
        case 4:
        case 5:
            PostNew(Draw(2) == 0 ? m_Model.BeforeTail() : m_Model.LastSlot());
            break;
        case 6:
            PostNew(RandomMessage());
            break;
        case 7:
            if (Draw(8) == 0) {
                Flush(RandomMessage());
            }
            break;
        case 8:
            PostSynchronously();
            break;
        default:
            Post(RandomMessage());
            break;
        }
        ASSERT_EQ(m_Model.Percentage(), m_Thread.getPercentageOfMessageQueueThatIsOccupied());
    }

  private:
    static constexpr auto kQuiet = static_cast<KT_THREAD_MESSAGE>(1000);

    unsigned int Draw(unsigned int bound) { return std::uniform_int_distribution(0U, bound - 1)(m_Random); }

    template <typename Action> void Repeat(Action const &action, unsigned int times) {
        for (unsigned int i = 0; i < times && !testing::Test::HasFailure(); ++i) {
            action();
        }
    }

    // Few different ones, so that equal neighbours are common.
    KTThreadMsg RandomMessage() {
        return {static_cast<KT_THREAD_MESSAGE>(Draw(3)), Draw(2), KTUInt64{Draw(2)} << 40, 0, Draw(2)};
    }

    void Post(KTThreadMsg const &msg) {
        EXPECT_EQ(m_Model.Append(msg),
                  m_Thread.postMessage(msg.message, msg.param1, msg.param2, msg.param3, msg.param4));
    }

    void PostNew(KTThreadMsg const &msg) {
        EXPECT_EQ(m_Model.AppendIfNotSame(msg), m_Thread.postMessageIfNotSameAsPreviousMessage(
                                                    msg.message, msg.param1, msg.param2, msg.param3, msg.param4));
    }

    void Flush(KTThreadMsg const &msg) {
        m_Model.Flush(msg);
        EXPECT_TRUE(
            m_Thread.flushMessageQueueAndPostMessage(msg.message, msg.param1, msg.param2, msg.param3, msg.param4));
    }

    // Identifier 0 is queued like others and not waited for; a full queue would be.
    void PostSynchronously() {
        KTThreadMsg const msg{static_cast<KT_THREAD_MESSAGE>(0), Draw(2), 0, 0, 0};
        if (Draw(20) == 0) {
            m_Model.Flush(msg);
            m_Thread.flushMessageQueueAndSyncPostMessage(msg.message, msg.param1, 0, 0, 0);
        } else if (m_Model.Count() < RingModel::kCapacity) {
            m_Model.Append(msg);
            m_Thread.syncPostMessage(msg.message, msg.param1, 0, 0, 0);
        }
    }

    void Take() {
        if (m_Model.Count() == 0) {
            return; // the thread stays in its handler
        }
        m_Thread.LetThrough();
        ASSERT_TRUE(m_Thread.Enters(++m_Taken + 1));
        EXPECT_TRUE(RingModel::AreSame(m_Model.Take(), m_Thread.LastMessage()));
    }

    std::mt19937 m_Random;
    RingModel m_Model;
    GatedThread m_Thread;
    std::size_t m_Taken = 0;
};

} // namespace

TEST(ThreadModel, RandomPostsGiveWhatThePlainModelGives) {
    constexpr int kSteps = 600;
    char const *const wanted = std::getenv("KT_MODEL_SEED");
    for (int run = 0; run < (wanted == nullptr ? 4 : 1); ++run) {
        unsigned int const seed =
            wanted == nullptr ? std::random_device()() : static_cast<unsigned int>(std::stoul(wanted));
        SCOPED_TRACE("KT_MODEL_SEED=" + std::to_string(seed));
        std::printf("seed %u\n", seed);
        Pair pair(seed);
        for (int step = 0; step < kSteps && !HasFailure(); ++step) {
            pair.Step();
        }
    }
}
