// ThreadTest.cpp: message threads: the loop, plain, suppressing and flushing posts, and the ring that tests see through
// them.

#include "GatedThread.h"
#include "KTThread.h"

#include <boost/thread/exceptions.hpp>
#include <gtest/gtest.h>

#include <atomic>
#include <memory>
#include <numeric>

namespace {

constexpr std::size_t kCapacity = 1024;

constexpr auto kZero = static_cast<KT_THREAD_MESSAGE>(0);
constexpr auto kWork = static_cast<KT_THREAD_MESSAGE>(100);
constexpr auto kOther = static_cast<KT_THREAD_MESSAGE>(101);

bool Post(KTThread &thread, KTUInt64 number) { return thread.postMessage(kWork, number, 0, 0, 0); }

bool PostNew(KTThread &thread, KTUInt64 number) {
    return thread.postMessageIfNotSameAsPreviousMessage(kWork, number, 0, 0, 0);
}

void Fill(KTThread &thread, std::size_t count = kCapacity) {
    for (std::size_t i = 1; i <= count; ++i) {
        ASSERT_TRUE(Post(thread, i)) << i;
    }
}

std::vector<KTUInt64> UpTo(std::size_t count) {
    std::vector<KTUInt64> numbers(count);
    std::iota(numbers.begin(), numbers.end(), 1);
    return numbers;
}

// What the thread handles if it is started now and given the quit message last; that one is left out.
std::vector<KTUInt64> Drain(GatedThread &thread) {
    thread.start();
    thread.FinishAll();
    std::vector<KTUInt64> numbers = thread.Numbers();
    numbers.pop_back();
    return numbers;
}

// A thread that is in the handler of a first message, number 0, taken from slot 0 of its ring.
class BusyThread : public GatedThread {
  public:
    BusyThread() {
        Post(*this, 0);
        start();
        EXPECT_TRUE(Enters(1));
    }
    BusyThread(BusyThread const &) = delete;
    BusyThread &operator=(BusyThread const &) = delete;

    // Lets the present message go and waits for the next one's handler.
    void TakeNext() {
        std::size_t const count = Messages().size();
        LetThrough();
        EXPECT_TRUE(Enters(count + 1));
    }

    // What follows the messages handled so far, quit message left out.
    std::vector<KTUInt64> Rest() {
        std::size_t const before = Messages().size();
        FinishAll();
        std::vector<KTUInt64> const numbers = Numbers();
        return {numbers.begin() + static_cast<std::ptrdiff_t>(before), numbers.end() - 1};
    }
};

} // namespace

// ---- the loop ----

TEST(Thread, HandlesMessagesInOrderOnItsOwnThreadUntilQuit) {
    GatedThread thread;
    std::thread::id handler;
    thread.OnMessage([&](KTThreadMsg const &) { handler = std::this_thread::get_id(); });
    thread.Open();
    for (KTUInt64 i = 1; i <= 3; ++i) {
        EXPECT_TRUE(thread.postMessage(kWork, i, i + 1, i + 2, i + 3));
    }
    EXPECT_TRUE(thread.postMessage(KT_THREAD_MSG_QUIT, 14, 15, 16, 17));
    EXPECT_TRUE(Post(thread, 5)); // behind the quit message: stays in the queue
    thread.start();
    thread.join();

    std::vector<KTThreadMsg> const messages = thread.Messages();
    ASSERT_EQ(4U, messages.size());
    for (KTUInt64 i = 0; i < 3; ++i) {
        EXPECT_EQ(kWork, messages[i].message);
        EXPECT_EQ(i + 1, messages[i].param1);
        EXPECT_EQ(i + 2, messages[i].param2);
        EXPECT_EQ(i + 3, messages[i].param3);
        EXPECT_EQ(i + 4, messages[i].param4);
    }
    EXPECT_EQ(KT_THREAD_MSG_QUIT, messages[3].message);
    EXPECT_EQ(17U, messages[3].param4);
    EXPECT_NE(std::this_thread::get_id(), handler);
}

TEST(Thread, TheQuitMessageIsFourteen) {
    EXPECT_EQ(14, KT_THREAD_MSG_QUIT);
    EXPECT_EQ(4U, sizeof(KT_THREAD_MESSAGE));
    GatedThread thread;
    thread.Open();
    thread.postMessage(static_cast<KT_THREAD_MESSAGE>(13), 0, 0, 0, 0);
    thread.postMessage(static_cast<KT_THREAD_MESSAGE>(15), 0, 0, 0, 0);
    thread.postMessage(static_cast<KT_THREAD_MESSAGE>(14), 0, 0, 0, 0);
    thread.start();
    thread.join();
    EXPECT_EQ(3U, thread.Messages().size());
}

TEST(Thread, WaitsForMessagesThatComeLater) {
    GatedThread thread;
    thread.Open();
    thread.start();
    for (std::size_t i = 1; i <= 5; ++i) {
        EXPECT_TRUE(Post(thread, i));
        EXPECT_TRUE(thread.Enters(i)); // it waits again each time
    }
    thread.FinishAll();
}

TEST(Thread, JoinWithoutStartReturnsAndSoDoesASecondJoin) {
    GatedThread thread;
    thread.join();
    thread.Open();
    thread.postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
    thread.start();
    thread.join();
    thread.join();
}

TEST(Thread, CannotJoinItself) {
    GatedThread thread;
    Signal refused;
    thread.OnMessage([&](KTThreadMsg const &msg) {
        if (msg.message == kWork) {
            EXPECT_THROW(thread.join(), boost::thread_resource_error);
            refused.Set();
        }
    });
    thread.start();
    Post(thread, 1);
    EXPECT_TRUE(refused.IsSet());
    thread.FinishAll(); // it goes on and can be joined
    EXPECT_EQ(2U, thread.Messages().size());
}

TEST(Thread, GoesOnWithItsQueueWhenStartedAgainAfterItsEnd) {
    GatedThread thread;
    thread.Open();
    thread.postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
    Post(thread, 7);
    thread.start();
    thread.join();
    EXPECT_EQ(1U, thread.Messages().size());
    thread.start();
    thread.FinishAll();
    EXPECT_EQ((std::vector<KTUInt64>{0, 7, 0}), thread.Numbers());
}

TEST(Thread, ASecondStartDetachesTheFirstThreadWhichGoesOn) {
    // Never destroyed: nobody can wait for the end of a detached thread.
    struct Shared {
        GatedThread thread;
        std::mutex mutex;
        std::vector<std::thread::id> handlers;
        Signal handled;
    };
    static Shared &shared = *new Shared;
    GatedThread &thread = shared.thread;
    thread.OnMessage([](KTThreadMsg const &) {
        std::lock_guard const lock(shared.mutex);
        shared.handlers.push_back(std::this_thread::get_id());
        shared.handled.Set();
    });
    Post(thread, 1);
    thread.start();
    ASSERT_TRUE(shared.handled.IsSet(1)); // the first thread stays in its handler
    Post(thread, 2);
    thread.start();
    ASSERT_TRUE(shared.handled.IsSet(2)); // so the second one takes this

    thread.postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
    thread.postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
    thread.Open();
    thread.join(); // the second thread's end
    ASSERT_TRUE(shared.handled.IsSet(4));
    std::lock_guard const lock(shared.mutex);
    EXPECT_NE(shared.handlers[0], shared.handlers[1]);
    EXPECT_NE(shared.handlers[2], shared.handlers[3]); // each took one
}

TEST(Thread, ThreadsEqualThemselvesOnly) {
    GatedThread one;
    GatedThread other;
    KTThread const &same = one;
    EXPECT_TRUE(one == same);
    EXPECT_FALSE(one != same);
    EXPECT_FALSE(one == other);
    EXPECT_TRUE(one != other);
}

TEST(Thread, TheHandlerMayUseItsOwnThreadWithoutDeadlock) {
    GatedThread thread;
    thread.Open();
    unsigned int percentage = 1;
    bool isFlushed = false;
    thread.OnMessage([&](KTThreadMsg const &msg) {
        if (msg.param1 == 1) {
            Post(thread, 2);
            PostNew(thread, 3);
        } else if (msg.param1 == 3) {
            percentage = thread.getPercentageOfMessageQueueThatIsOccupied();
            Post(thread, 4);
            isFlushed = thread.flushMessageQueueAndPostMessage(kWork, 5, 0, 0, 0);
        } else if (msg.param1 == 5) {
            thread.postMessage(KT_THREAD_MSG_QUIT, 6, 0, 0, 0);
        }
    });
    Post(thread, 1);
    thread.start();
    thread.join();
    EXPECT_EQ((std::vector<KTUInt64>{1, 2, 3, 5, 6}), thread.Numbers());
    EXPECT_EQ(0U, percentage);
    EXPECT_TRUE(isFlushed);
}

TEST(Thread, ADestroyedThreadIsDetachedAndNotWaitedFor) {
    // Stays in its handler for ever, so that it never touches what is gone; the process ends without it.
    static Signal &inHandler = *new Signal;
    class Stuck : public KTThread {
        void processMessage(KTThreadMsg const &) override {
            static Signal &never = *new Signal;
            inHandler.Set();
            never.Wait();
        }
    };
    {
        Stuck stuck;
        stuck.postMessage(kWork, 0, 0, 0, 0);
        stuck.start();
        ASSERT_TRUE(inHandler.IsSet());
    }
    SUCCEED(); // the destructor has returned
}

// ---- plain posts ----

TEST(Thread, HoldsOneThousandAndTwentyFourMessages) {
    GatedThread thread;
    EXPECT_EQ(0U, thread.getPercentageOfMessageQueueThatIsOccupied());
    Fill(thread);
    EXPECT_FALSE(Post(thread, 1025));
    EXPECT_EQ(100U, thread.getPercentageOfMessageQueueThatIsOccupied());
    EXPECT_FALSE(Post(thread, 1026));
    thread.start();
    ASSERT_TRUE(thread.Enters(1)); // one was taken
    EXPECT_TRUE(Post(thread, 1027));
    EXPECT_FALSE(Post(thread, 1028));
    thread.FinishAll();
    std::vector<KTUInt64> expected = UpTo(kCapacity);
    expected.push_back(1027);
    expected.push_back(0); // quit
    EXPECT_EQ(expected, thread.Numbers());
}

TEST(Thread, OccupancyIsInWholePercentRoundedDown) {
    struct Row {
        std::size_t count;
        unsigned int percentage;
    };
    for (Row const &row :
         {Row{1, 0}, {10, 0}, {11, 1}, {20, 1}, {21, 2}, {512, 50}, {1013, 98}, {1014, 99}, {1023, 99}, {1024, 100}}) {
        GatedThread thread;
        Fill(thread, row.count);
        EXPECT_EQ(row.percentage, thread.getPercentageOfMessageQueueThatIsOccupied()) << row.count;
    }
}

TEST(Thread, TheQuitMessageEmptiesAFullQueue) {
    GatedThread thread;
    thread.Open();
    Fill(thread);
    EXPECT_TRUE(thread.postMessage(KT_THREAD_MSG_QUIT, 1, 2, 3, 4));
    EXPECT_EQ(0U, thread.getPercentageOfMessageQueueThatIsOccupied()); // one message
    thread.start();
    thread.join();
    ASSERT_EQ(1U, thread.Messages().size());
    EXPECT_EQ(KT_THREAD_MSG_QUIT, thread.Messages()[0].message);
    EXPECT_EQ(4U, thread.Messages()[0].param4);
}

TEST(Thread, TheQuitMessageEmptiesNothingWhileThereIsRoom) {
    GatedThread thread;
    thread.Open();
    Fill(thread, kCapacity - 1);
    EXPECT_TRUE(thread.postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0));
    EXPECT_EQ(100U, thread.getPercentageOfMessageQueueThatIsOccupied());
    thread.start();
    thread.join();
    EXPECT_EQ(kCapacity, thread.Messages().size());
}

// ---- flushing posts ----

TEST(Thread, AFlushingPostLeavesItsMessageAlone) {
    GatedThread thread;
    Fill(thread, 20);
    EXPECT_TRUE(thread.flushMessageQueueAndPostMessage(kOther, 21, 22, 23, 24));
    EXPECT_EQ(0U, thread.getPercentageOfMessageQueueThatIsOccupied());
    EXPECT_TRUE(Post(thread, 22));
    EXPECT_EQ((std::vector<KTUInt64>{21, 22}), Drain(thread));
    KTThreadMsg const first = thread.Messages()[0];
    EXPECT_EQ(kOther, first.message);
    EXPECT_EQ(22U, first.param2);
    EXPECT_EQ(23U, first.param3);
    EXPECT_EQ(24U, first.param4);
}

TEST(Thread, AFlushingPostIntoAnEmptyOrFullQueue) {
    GatedThread empty;
    EXPECT_TRUE(empty.flushMessageQueueAndPostMessage(kWork, 1, 0, 0, 0));
    EXPECT_EQ(UpTo(1), Drain(empty));
    GatedThread full;
    Fill(full);
    EXPECT_TRUE(full.flushMessageQueueAndPostMessage(kWork, 1, 0, 0, 0));
    EXPECT_EQ(UpTo(1), Drain(full));
}

TEST(Thread, AFlushingPostWakesTheWaitingThread) {
    GatedThread thread;
    thread.Open();
    thread.start();
    Post(thread, 1);
    ASSERT_TRUE(thread.Enters(1));
    std::this_thread::sleep_for(kSoon); // until it surely sleeps: before, it would find the message by itself
    EXPECT_TRUE(thread.flushMessageQueueAndPostMessage(kWork, 2, 0, 0, 0));
    EXPECT_TRUE(thread.Enters(2));
    thread.FinishAll();
}

TEST(Thread, AFlushDoesNotRecallTheMessageInTheHandler) {
    BusyThread thread;
    Post(thread, 1);
    thread.flushMessageQueueAndPostMessage(kWork, 2, 0, 0, 0);
    EXPECT_EQ((std::vector<KTUInt64>{2}), thread.Rest());
}

// ---- suppressing posts ----

TEST(ThreadSuppression, QueuesTheSameMessageOnce) {
    GatedThread thread;
    EXPECT_TRUE(PostNew(thread, 1));
    EXPECT_TRUE(PostNew(thread, 1));
    EXPECT_TRUE(PostNew(thread, 2));
    EXPECT_TRUE(PostNew(thread, 2));
    EXPECT_TRUE(PostNew(thread, 1)); // not the last one any more
    EXPECT_EQ((std::vector<KTUInt64>{1, 2, 1}), Drain(thread));
}

TEST(ThreadSuppression, ComparesAllFiveFieldsInFullWidth) {
    constexpr KTUInt64 kHigh = KTUInt64{1} << 32;
    KTThreadMsg const rows[] = {{kWork, 1, 2, 3, 4},         {kOther, 1, 2, 3, 4},        {kWork, 9, 2, 3, 4},
                                {kWork, 1, 9, 3, 4},         {kWork, 1, 2, 9, 4},         {kWork, 1, 2, 3, 9},
                                {kWork, 1 + kHigh, 2, 3, 4}, {kWork, 1, 2 + kHigh, 3, 4}, {kWork, 1, 2, 3 + kHigh, 4},
                                {kWork, 1, 2, 3, 4 + kHigh}};
    for (KTThreadMsg const &row : rows) {
        GatedThread thread;
        thread.postMessage(kWork, 1, 2, 3, 4);
        EXPECT_TRUE(
            thread.postMessageIfNotSameAsPreviousMessage(row.message, row.param1, row.param2, row.param3, row.param4));
        EXPECT_EQ(&row == rows ? 1U : 2U, Drain(thread).size()) << &row - rows;
    }
}

TEST(ThreadSuppression, NeverSuppressesOnAnEmptyQueue) {
    BusyThread thread; // its message 0 stands in slot 0, before the tail
    EXPECT_TRUE(PostNew(thread, 0));
    EXPECT_TRUE(PostNew(thread, 0)); // now it does
    EXPECT_EQ((std::vector<KTUInt64>{0}), thread.Rest());
    GatedThread fresh; // its last slot holds zeros
    EXPECT_TRUE(fresh.postMessageIfNotSameAsPreviousMessage(kZero, 0, 0, 0, 0));
    EXPECT_EQ(1U, Drain(fresh).size());
}

TEST(ThreadSuppression, AMessageOfZerosEqualsTheFreshLastSlot) {
    GatedThread thread;
    Post(thread, 1);
    EXPECT_TRUE(thread.postMessageIfNotSameAsPreviousMessage(kZero, 0, 0, 0, 0));
    EXPECT_TRUE(thread.postMessageIfNotSameAsPreviousMessage(kZero, 0, 0, 0, 1)); // no zeros
    EXPECT_EQ(2U, Drain(thread).size());
}

TEST(ThreadSuppression, TheLastSlotCountsEvenIfItWasHandledLongAgo) {
    BusyThread thread;
    for (KTUInt64 i = 1; i <= 1023; ++i) { // slots 1 to 1023; the last holds number 1023
        ASSERT_TRUE(Post(thread, i));
    }
    for (KTUInt64 i = 1; i <= 1023; ++i) {
        thread.TakeNext();
    }
    EXPECT_EQ(0U, thread.getPercentageOfMessageQueueThatIsOccupied());
    EXPECT_TRUE(PostNew(thread, 1023)); // an empty queue never suppresses; slot 0
    EXPECT_TRUE(PostNew(thread, 5));    // slot 1
    EXPECT_TRUE(PostNew(thread, 1023)); // slot 1023
    EXPECT_TRUE(PostNew(thread, 6));
    EXPECT_EQ((std::vector<KTUInt64>{1023, 5, 6}), thread.Rest());
}

TEST(ThreadSuppression, WithTheTailInSlotZeroTheLastSlotAloneIsCompared) {
    BusyThread thread;
    for (KTUInt64 i = 1; i <= 1023; ++i) {
        ASSERT_TRUE(Post(thread, i));
    }
    thread.TakeNext(); // number 1; two slots are free
    // Tail 0: before it stands number 1023, in the last slot.
    EXPECT_TRUE(PostNew(thread, 1023)); // suppressed
    EXPECT_TRUE(PostNew(thread, 1022)); // queued, although it stands before the last
    EXPECT_TRUE(PostNew(thread, 1022)); // suppressed by slot 0
    EXPECT_TRUE(PostNew(thread, 1023)); // suppressed by the last slot
    std::vector<KTUInt64> const rest = thread.Rest();
    ASSERT_EQ(1023U, rest.size());
    EXPECT_EQ(1023U, rest[1021]);
    EXPECT_EQ(1022U, rest[1022]);
}

TEST(ThreadSuppression, AFullQueueRefusesWhatIsNewAndSuppressesWhatIsNot) {
    GatedThread thread;
    Fill(thread);
    EXPECT_FALSE(PostNew(thread, 1));    // slot 0, but the tail stands on slot 0
    EXPECT_TRUE(PostNew(thread, 1024));  // the last slot: the comparison comes first
    EXPECT_FALSE(PostNew(thread, 1025)); // new
    EXPECT_EQ(UpTo(kCapacity), Drain(thread));
}

TEST(ThreadSuppression, TheQuitMessageEmptiesAFullQueueUnlessItIsSuppressed) {
    GatedThread thread;
    thread.Open();
    Fill(thread);
    EXPECT_TRUE(thread.postMessageIfNotSameAsPreviousMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0));
    EXPECT_EQ(0U, thread.getPercentageOfMessageQueueThatIsOccupied());
    EXPECT_TRUE(thread.postMessageIfNotSameAsPreviousMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0)); // the same again
    thread.start();
    thread.join();
    ASSERT_EQ(1U, thread.Messages().size());

    GatedThread other;
    Fill(other, kCapacity - 1);
    other.postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0); // in the last slot
    EXPECT_TRUE(other.postMessageIfNotSameAsPreviousMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0));
    EXPECT_EQ(100U, other.getPercentageOfMessageQueueThatIsOccupied()); // suppressed: nothing flushed
}

TEST(ThreadSuppression, AFlushingPostStandsInSlotZeroAndTheLastSlotStays) {
    GatedThread thread;
    Fill(thread);
    thread.flushMessageQueueAndPostMessage(kWork, 7, 0, 0, 0);
    EXPECT_TRUE(PostNew(thread, 7));    // slot 0 is before the tail, 1
    EXPECT_TRUE(PostNew(thread, 1024)); // flushed, but still in the last slot
    EXPECT_TRUE(PostNew(thread, 2));    // written over nothing: slot 1 is where it goes
    EXPECT_EQ((std::vector<KTUInt64>{7, 2}), Drain(thread));
}
