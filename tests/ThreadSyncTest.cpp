// ThreadSyncTest.cpp: synchronous posts: who waits for what, and who is released by whom.
//
// A poster that has queued its message holds the synchronous-post mutex until it waits, so once the message is seen in
// the queue, what the thread does next meets the poster waiting. The queue is seen to have grown by its occupancy, which
// goes from 0 to 1 percent with the eleventh message.

#include "GatedThread.h"
#include "KTThread.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>

namespace {

constexpr std::size_t kCapacity = 1024;
constexpr std::size_t kJustUnderOnePercent = 10;

constexpr auto kZero = static_cast<KT_THREAD_MESSAGE>(0);
constexpr auto kFirst = static_cast<KT_THREAD_MESSAGE>(5);
constexpr auto kSecond = static_cast<KT_THREAD_MESSAGE>(6);
constexpr auto kFiller = static_cast<KT_THREAD_MESSAGE>(100);

// A thread in the handler of a first message, with fillers behind it.
class BusyThread : public GatedThread {
  public:
    explicit BusyThread(std::size_t fillers = 0) {
        postMessage(kFiller, 0, 0, 0, 0);
        start();
        EXPECT_TRUE(Enters(1));
        for (std::size_t i = 0; i < fillers; ++i) {
            EXPECT_TRUE(postMessage(kFiller, i, 0, 0, 0));
        }
    }
    BusyThread(BusyThread const &) = delete;
    BusyThread &operator=(BusyThread const &) = delete;

    void WaitForOccupancy(unsigned int percentage) {
        while (getPercentageOfMessageQueueThatIsOccupied() != percentage) {
            boost::this_thread::yield();
        }
    }

    // Lets handlers return until that many messages have been entered.
    void LetThroughUntil(std::size_t count) {
        for (std::size_t entered = Messages().size(); entered < count; ++entered) {
            LetThrough();
            ASSERT_TRUE(Enters(entered + 1));
        }
    }
};

// A call on a thread of its own.
class Caller {
  public:
    template <typename Call> explicit Caller(Call call)
        : m_Thread([this, call] {
              call();
              m_Done.Set();
          }) {}
    Caller(Caller const &) = delete;
    Caller &operator=(Caller const &) = delete;
    ~Caller() { m_Thread.join(); }

    bool IsDone() { return m_Done.IsSet(); }
    bool IsDoneSoon() { return m_Done.IsSet(1, kSoon); }

  private:
    Signal m_Done;
    boost::thread m_Thread;
};

} // namespace

TEST(ThreadSync, ReturnsAfterTheHandlerHasReturned) {
    GatedThread thread;
    thread.start();
    Caller poster([&] { thread.syncPostMessage(kFirst, 1, 2, 3, 4); });
    ASSERT_TRUE(thread.Enters(1));
    EXPECT_FALSE(poster.IsDoneSoon());
    thread.LetThrough();
    EXPECT_TRUE(poster.IsDone());
    KTThreadMsg const msg = thread.Messages()[0];
    EXPECT_EQ(kFirst, msg.message);
    EXPECT_EQ(1U, msg.param1);
    EXPECT_EQ(2U, msg.param2);
    EXPECT_EQ(3U, msg.param3);
    EXPECT_EQ(4U, msg.param4);
    thread.FinishAll();
}

TEST(ThreadSync, WaitsForAThreadThatStartsLater) {
    GatedThread thread;
    Caller poster([&] { thread.syncPostMessage(kFirst, 0, 0, 0, 0); });
    EXPECT_FALSE(poster.IsDoneSoon());
    thread.Open();
    thread.start();
    EXPECT_TRUE(poster.IsDone());
    thread.FinishAll();
}

TEST(ThreadSync, OtherMessagesDoNotReleaseThePoster) {
    BusyThread thread(kJustUnderOnePercent);
    Caller poster([&] { thread.syncPostMessage(kFirst, 0, 0, 0, 0); });
    thread.WaitForOccupancy(1);
    thread.LetThroughUntil(2 + kJustUnderOnePercent); // the poster's own message is in the handler
    EXPECT_FALSE(poster.IsDoneSoon());
    thread.LetThrough();
    EXPECT_TRUE(poster.IsDone());
    thread.FinishAll();
}

TEST(ThreadSync, TheFirstHandledMessageOfThatIdentifierReleasesThePoster) {
    BusyThread thread;
    thread.postMessage(kFirst, 1, 0, 0, 0); // somebody else's, asynchronous
    for (std::size_t i = 0; i + 1 < kJustUnderOnePercent; ++i) {
        thread.postMessage(kFiller, i, 0, 0, 0);
    }
    Caller poster([&] { thread.syncPostMessage(kFirst, 2, 0, 0, 0); });
    thread.WaitForOccupancy(1);
    thread.LetThroughUntil(3); // the earlier one has been handled, the poster's own waits
    EXPECT_TRUE(poster.IsDone());
    EXPECT_EQ(3U, thread.Messages().size());
    thread.FinishAll();
}

TEST(ThreadSync, IdentifierZeroReturnsWhenQueued) {
    GatedThread thread; // not even started
    thread.syncPostMessage(kZero, 1, 2, 3, 4);
    thread.flushMessageQueueAndSyncPostMessage(kZero, 5, 0, 0, 0);
    thread.syncPostMessage(kZero, 6, 0, 0, 0);
    thread.start();
    thread.FinishAll();
    EXPECT_EQ((std::vector<KTUInt64>{5, 6, 0}), thread.Numbers());
}

TEST(ThreadSync, IdentifierZeroStrandsNoOtherPoster) {
    BusyThread thread(kJustUnderOnePercent);
    Caller poster([&] { thread.syncPostMessage(kFirst, 0, 0, 0, 0); });
    thread.WaitForOccupancy(1);
    thread.syncPostMessage(kZero, 0, 0, 0, 0);
    thread.LetThroughUntil(2 + kJustUnderOnePercent + 1); // in the handler of identifier 0
    EXPECT_TRUE(poster.IsDone());                         // released by its own message, handled before
    thread.FinishAll();
}

TEST(ThreadSync, ALaterPosterTakesTheSlotAndItsMessageReleasesBoth) {
    BusyThread thread(kJustUnderOnePercent);
    Caller first([&] { thread.syncPostMessage(kFirst, 0, 0, 0, 0); });
    thread.WaitForOccupancy(1);
    for (std::size_t i = 0; i + 2 < kJustUnderOnePercent; ++i) {
        thread.postMessage(kFiller, i, 0, 0, 0); // up to 19 messages; 21 are 2 percent
    }
    thread.postMessage(kFiller, 0, 0, 0, 0);
    Caller second([&] { thread.syncPostMessage(kSecond, 0, 0, 0, 0); });
    thread.WaitForOccupancy(2);
    thread.LetThroughUntil(1 + 21); // the first poster's message was handled, the second's is in the handler
    EXPECT_FALSE(first.IsDoneSoon());
    thread.LetThrough();
    EXPECT_TRUE(first.IsDone());
    EXPECT_TRUE(second.IsDone());
    thread.FinishAll();
}

TEST(ThreadSync, APosterBehindASynchronousQuitMessageKeepsBothWaiting) {
    BusyThread thread(kJustUnderOnePercent);
    Caller quitting([&] { thread.syncPostMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0); });
    thread.WaitForOccupancy(1);
    for (std::size_t i = 0; i + 1 < kJustUnderOnePercent; ++i) {
        thread.postMessage(kFiller, i, 0, 0, 0); // up to 20 messages; 21 are 2 percent
    }
    Caller later([&] { thread.syncPostMessage(kSecond, 0, 0, 0, 0); });
    thread.WaitForOccupancy(2);
    thread.Open();
    thread.join(); // the quit message was handled: it is not what the slot holds
    EXPECT_FALSE(quitting.IsDoneSoon());
    EXPECT_FALSE(later.IsDoneSoon());
    thread.start(); // so that they can end
    EXPECT_TRUE(quitting.IsDone());
    EXPECT_TRUE(later.IsDone());
    thread.FinishAll();
}

TEST(ThreadSync, ManyPostersAreAllReleased) {
    constexpr int kPosters = 6;
    constexpr int kRounds = 500;
    GatedThread thread;
    thread.Open();
    thread.start();
    {
        std::vector<std::unique_ptr<Caller>> posters;
        posters.reserve(kPosters);
        for (int i = 0; i < kPosters; ++i) {
            posters.push_back(std::make_unique<Caller>([&thread, i] {
                auto const own = static_cast<KT_THREAD_MESSAGE>(200 + (i / 2)); // two posters each
                for (int round = 0; round < kRounds; ++round) {
                    thread.syncPostMessage(own, 0, 0, 0, 0);
                }
            }));
        }
    }
    thread.FinishAll();
    EXPECT_EQ(kPosters * kRounds + 1U, thread.Messages().size());
}

// ---- full queues ----

TEST(ThreadSync, WaitsForRoom) {
    BusyThread thread(kCapacity);
    Caller poster([&] { thread.syncPostMessage(kFirst, 7, 0, 0, 0); });
    EXPECT_FALSE(poster.IsDoneSoon());
    EXPECT_EQ(1U, thread.Messages().size());
    // The thread needs the synchronous-post mutex to finish its message: a poster that kept it would block both.
    thread.Open();
    EXPECT_TRUE(poster.IsDone());
    thread.FinishAll();
    std::vector<KTUInt64> const numbers = thread.Numbers();
    EXPECT_EQ(1, std::count(numbers.begin(), numbers.end(), 7U) - 1); // a filler has that number too
    EXPECT_EQ(kCapacity + 3, numbers.size());
}

TEST(ThreadSync, IdentifierZeroWaitsForRoomToo) {
    BusyThread thread(kCapacity);
    Caller poster([&] { thread.syncPostMessage(kZero, 0, 0, 0, 0); });
    EXPECT_FALSE(poster.IsDoneSoon());
    thread.LetThroughUntil(2);
    EXPECT_TRUE(poster.IsDone());
    thread.FinishAll();
}

TEST(ThreadSync, PostersThatWaitForRoomHoldUpNobody) {
    BusyThread thread(kCapacity);
    Caller waiting([&] { thread.syncPostMessage(kFirst, 1, 0, 0, 0); });
    EXPECT_FALSE(waiting.IsDoneSoon());
    Caller flushing([&] { thread.flushMessageQueueAndSyncPostMessage(kSecond, 2, 0, 0, 0); });
    while (thread.getPercentageOfMessageQueueThatIsOccupied() == 100) {
        boost::this_thread::yield();
    }
    thread.Open();
    EXPECT_TRUE(flushing.IsDone());
    EXPECT_TRUE(waiting.IsDone());
    thread.FinishAll();
}

TEST(ThreadSync, ManyPostersThatWaitForRoomAllGetIt) {
    constexpr int kPosters = 5;
    BusyThread thread(kCapacity);
    std::vector<std::unique_ptr<Caller>> posters;
    posters.reserve(kPosters);
    for (int i = 0; i < kPosters; ++i) {
        posters.push_back(std::make_unique<Caller>([&thread] { thread.syncPostMessage(kFirst, 0, 0, 0, 0); }));
    }
    thread.Open();
    for (auto const &poster : posters) {
        EXPECT_TRUE(poster->IsDone());
    }
    thread.FinishAll();
    EXPECT_EQ(1 + kCapacity + kPosters + 1, thread.Messages().size());
}

TEST(ThreadSync, AFlushDoesNotWakeThoseWhoWaitForRoom) {
    // A poster that is still on its way to sleep may find the room without being woken, and a busy machine makes that way
    // long. So: at least once it sleeps on, and every attempt gives it longer to fall asleep.
    bool hasSleptOn = false;
    for (int attempt = 0; attempt < 50 && !hasSleptOn; ++attempt) {
        BusyThread thread(kCapacity);
        Caller poster([&] { thread.syncPostMessage(kZero, 0, 0, 0, 0); }); // done as soon as it is queued
        for (int i = 0; i <= attempt; ++i) {
            EXPECT_FALSE(poster.IsDoneSoon());
        }
        thread.flushMessageQueueAndPostMessage(kFiller, 0, 0, 0, 0);
        hasSleptOn = !poster.IsDoneSoon();
        thread.LetThroughUntil(2); // the thread takes the next message: now it is woken
        EXPECT_TRUE(poster.IsDone());
        thread.FinishAll();
    }
    EXPECT_TRUE(hasSleptOn);
}

TEST(ThreadSync, TheQuitMessageEmptiesAFullQueueAndIsWaitedFor) {
    BusyThread thread(kCapacity);
    Caller poster([&] { thread.syncPostMessage(KT_THREAD_MSG_QUIT, 3, 0, 0, 0); });
    while (thread.getPercentageOfMessageQueueThatIsOccupied() == 100) {
        boost::this_thread::yield();
    }
    EXPECT_FALSE(poster.IsDoneSoon());
    thread.LetThroughUntil(2);
    EXPECT_FALSE(poster.IsDoneSoon());
    thread.Open();
    EXPECT_TRUE(poster.IsDone());
    thread.join();
    EXPECT_EQ((std::vector<KTUInt64>{0, 3}), thread.Numbers());
}

TEST(ThreadSync, TheQuitMessageWaitsItsTurnWhileThereIsRoom) {
    BusyThread thread(3);
    thread.Open();
    thread.syncPostMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
    thread.join();
    EXPECT_EQ(5U, thread.Messages().size());
}

// ---- flushing ----

TEST(ThreadSync, TheFlushingPostDiscardsTheRestAndWaits) {
    BusyThread thread(20);
    KTThread &base = thread; // through the virtual table
    Caller poster([&] { base.flushMessageQueueAndSyncPostMessage(kFirst, 1, 2, 3, 4); });
    thread.WaitForOccupancy(0);
    thread.LetThroughUntil(2);
    EXPECT_FALSE(poster.IsDoneSoon());
    thread.LetThrough();
    EXPECT_TRUE(poster.IsDone());
    KTThreadMsg const msg = thread.Messages()[1];
    EXPECT_EQ(kFirst, msg.message);
    EXPECT_EQ(4U, msg.param4);
    thread.FinishAll();
    EXPECT_EQ(3U, thread.Messages().size());
}

TEST(ThreadSync, AFlushedPosterIsReleasedByTheNextMessageOfItsIdentifier) {
    BusyThread thread(kJustUnderOnePercent);
    Caller poster([&] { thread.syncPostMessage(kFirst, 1, 0, 0, 0); });
    thread.WaitForOccupancy(1);
    thread.flushMessageQueueAndPostMessage(kFiller, 2, 0, 0, 0);
    thread.Open();
    ASSERT_TRUE(thread.Enters(2));
    EXPECT_FALSE(poster.IsDoneSoon());
    thread.postMessage(kFirst, 3, 0, 0, 0);
    EXPECT_TRUE(poster.IsDone());
    thread.FinishAll();
}

TEST(ThreadSync, HostsMayReplaceTheFlushingPost) {
    class Counting : public GatedThread {
      public:
        void flushMessageQueueAndSyncPostMessage(KT_THREAD_MESSAGE, KTUInt64, KTUInt64, KTUInt64, KTUInt64) override {
            ++calls;
        }
        int calls = 0;
    };
    Counting thread;
    KTThread &base = thread;
    base.flushMessageQueueAndSyncPostMessage(kFirst, 0, 0, 0, 0);
    EXPECT_EQ(1, thread.calls);
}
