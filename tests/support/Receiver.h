// Receiver.h: a message thread that keeps the identifiers of what timers posted to it.

#pragma once

#include "KTThread.h"

#include <gtest/gtest.h>

#include <utility>
#include <vector>

class Receiver : public KTThread {
  public:
    /// Handles messages from the beginning, or from the first Take() on: until then they pile up.
    explicit Receiver(bool isStarted = true) {
        if (isStarted) {
            Start();
        }
    }
    Receiver(Receiver const &) = delete;
    Receiver &operator=(Receiver const &) = delete;
    ~Receiver() override {
        Start();
        postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
        join();
    }

    /// What was posted since the last call, in its order.
    std::vector<int> Take() {
        Start();
        syncPostMessage(kMarker, 0, 0, 0, 0); // all that came before has been handled then
        return std::exchange(m_Identifiers, {});
    }

    void processMessage(KTThreadMsg const &msg) override {
        if (msg.message != kMarker && msg.message != KT_THREAD_MSG_QUIT) {
            m_Identifiers.push_back(static_cast<int>(msg.message));
            EXPECT_EQ(0U, msg.param1 | msg.param2 | msg.param3 | msg.param4);
        }
    }

  private:
    static constexpr auto kMarker = static_cast<KT_THREAD_MESSAGE>(1'000'000);

    void Start() {
        if (!m_IsStarted) {
            m_IsStarted = true;
            start();
        }
    }

    bool m_IsStarted = false;
    std::vector<int> m_Identifiers; // the thread's own while it handles messages; Take reads it in between
};
