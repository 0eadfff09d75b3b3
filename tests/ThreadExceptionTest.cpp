// ThreadExceptionTest.cpp: exceptions that end a message thread, and who hears of them.

#include "GatedThread.h"
#include "KTException.h"
#include "KTExceptionMsgManager.h"
#include "KTExceptionUtils.h"
#include "KTThread.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>

#include <memory>
#include <stdexcept>
#include <string>

namespace {

constexpr auto kThrow = static_cast<KT_THREAD_MESSAGE>(100);
constexpr auto kAwaited = static_cast<KT_THREAD_MESSAGE>(101);
constexpr char kOwnKey[] = "kOwnKey";

// What the client handler was given.
class Witness : public IKTExceptionHandler {
  public:
    void HandleException(KTException const &exception) override {
        ++count;
        key = exception.GetExceptionType();
        isFatal = dynamic_cast<KTFatalException const *>(&exception) != nullptr;
        thread = std::this_thread::get_id();
    }

    int count = 0;
    char const *key = nullptr;
    bool isFatal = false;
    std::thread::id thread;
};

// The one handler of this program: it cannot be taken back, so it lives for ever and forwards to the present test's.
class Forwarder : public IKTExceptionHandler {
  public:
    void HandleException(KTException const &exception) override { to->HandleException(exception); }
    IKTExceptionHandler *to = nullptr;
};

class ThreadException : public testing::Test {
  protected:
    ThreadException() {
        static Forwarder &forwarder = *new Forwarder;
        forwarder.to = &m_Witness;
        KTExceptionUtils::GetInstance().SetHandler(forwarder);
    }

    // Runs `handler` on a message thread until it throws; three more messages stay behind.
    void Run(GatedThread::Handler const &handler) {
        m_Thread.Open();
        m_Thread.OnMessage([this, handler](KTThreadMsg const &msg) {
            m_Handler = std::this_thread::get_id();
            if (msg.message == kThrow) {
                handler(msg);
            }
        });
        for (KTUInt64 i = 0; i < 3; ++i) {
            m_Thread.postMessage(kThrow, i, 0, 0, 0);
        }
        m_Thread.start();
        m_Thread.join();
        EXPECT_EQ(1U, m_Thread.Messages().size());
        EXPECT_EQ(1, m_Witness.count);
        EXPECT_EQ(m_Handler, m_Witness.thread);
    }

    Witness m_Witness;
    GatedThread m_Thread;
    std::thread::id m_Handler;
};

} // namespace

TEST_F(ThreadException, AnExceptionOfTheLibraryGoesToTheHandlerAsItIs) {
    Run([](KTThreadMsg const &) { throw KTNonFatalException(kOwnKey); });
    EXPECT_EQ(kOwnKey, m_Witness.key);
    EXPECT_FALSE(m_Witness.isFatal);
}

TEST_F(ThreadException, AFatalOneToo) {
    Run([](KTThreadMsg const &) { throw KTFatalException(kOwnKey); });
    EXPECT_EQ(kOwnKey, m_Witness.key);
    EXPECT_TRUE(m_Witness.isFatal);
}

TEST_F(ThreadException, AnyOtherBecomesAFatalOneWithTheMessageKey) {
    Run([](KTThreadMsg const &) { throw std::runtime_error("of the host"); });
    EXPECT_EQ(kKTExceptionMsgStr, m_Witness.key); // the pointer, by which the message is found
    EXPECT_STREQ("kKTExceptionMsg", m_Witness.key);
    EXPECT_TRUE(m_Witness.isFatal);
}

TEST_F(ThreadException, WhatIsNoExceptionClassToo) {
    Run([](KTThreadMsg const &) { throw 5; });
    EXPECT_EQ(kKTExceptionMsgStr, m_Witness.key);
    EXPECT_TRUE(m_Witness.isFatal);
}

TEST_F(ThreadException, AnInternalErrorToo) {
    Run([](KTThreadMsg const &) { throw KTLCException(KTString("reason"), "file", 1); });
    EXPECT_EQ(kKTExceptionMsgStr, m_Witness.key);
    EXPECT_TRUE(m_Witness.isFatal);
}

TEST_F(ThreadException, WhatTheHandlerThrowsEndsNothingElse) {
    class Throwing : public IKTExceptionHandler {
        void HandleException(KTException const &) override { throw std::runtime_error("again"); }
    };
    static Throwing &throwing = *new Throwing;
    KTExceptionUtils::GetInstance().SetHandler(throwing);
    GatedThread thread;
    thread.OnMessage([](KTThreadMsg const &) { throw 5; });
    thread.postMessage(kThrow, 0, 0, 0, 0);
    thread.start();
    thread.join();
}

TEST_F(ThreadException, QueuedMessagesStayAndASynchronousPosterGoesOnWaiting) {
    Signal released;
    m_Thread.postMessage(kAwaited, 0, 0, 0, 0);
    for (int i = 0; i < 9; ++i) {
        m_Thread.postMessage(kAwaited, 0, 0, 0, 0); // ten: one more is 1 percent
    }
    boost::thread poster([&] {
        m_Thread.syncPostMessage(kAwaited, 7, 0, 0, 0);
        released.Set();
    });
    while (m_Thread.getPercentageOfMessageQueueThatIsOccupied() != 1) {
        boost::this_thread::yield();
    }
    bool hasThrown = false;
    m_Thread.OnMessage([&](KTThreadMsg const &) {
        if (!hasThrown) {
            hasThrown = true;
            throw KTNonFatalException(kOwnKey);
        }
    });
    m_Thread.Open();
    m_Thread.start();
    m_Thread.join();
    EXPECT_FALSE(released.IsSet(1, kSoon)); // the message was not handled to its end, and no other will be
    EXPECT_EQ(1U, m_Thread.Messages().size());
    EXPECT_EQ(0U, m_Thread.getPercentageOfMessageQueueThatIsOccupied()); // ten left
    EXPECT_TRUE(m_Thread.postMessage(kAwaited, 8, 0, 0, 0));             // posts still fill the queue
    EXPECT_EQ(1U, m_Thread.getPercentageOfMessageQueueThatIsOccupied());

    m_Thread.start(); // so that the poster can end
    EXPECT_TRUE(released.IsSet());
    poster.join();
    m_Thread.FinishAll();
}
