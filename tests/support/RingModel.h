// RingModel.h: what the queue of a message thread is supposed to do, written plainly, without locks and cleverness.

#pragma once

#include "KTThread.h"

#include <array>
#include <cstddef>

class RingModel {
  public:
    static constexpr std::size_t kCapacity = 1024;

    bool Append(KTThreadMsg const &msg) {
        if (m_Count == kCapacity) {
            if (msg.message == KT_THREAD_MSG_QUIT) {
                Flush(msg);
                return true;
            }
            return false;
        }
        m_Slots[m_Tail] = msg;
        m_Tail = m_Tail == kCapacity - 1 ? 0 : m_Tail + 1;
        ++m_Count;
        return true;
    }

    bool AppendIfNotSame(KTThreadMsg const &msg) {
        if (m_Count > 0) {
            if (m_Tail > 0 && AreSame(m_Slots[m_Tail - 1], msg)) {
                return true;
            }
            if (AreSame(m_Slots[kCapacity - 1], msg)) {
                return true;
            }
        }
        return Append(msg);
    }

    void Flush(KTThreadMsg const &msg) {
        m_Slots[0] = msg;
        m_Head = 0;
        m_Tail = 1;
        m_Count = 1;
    }

    /// REQUIRES: it is not empty.
    KTThreadMsg Take() {
        KTThreadMsg const msg = m_Slots[m_Head];
        m_Head = m_Head == kCapacity - 1 ? 0 : m_Head + 1;
        --m_Count;
        return msg;
    }

    std::size_t Count() const { return m_Count; }
    unsigned int Percentage() const { return static_cast<unsigned int>(m_Count * 100 / kCapacity); }
    KTThreadMsg const &BeforeTail() const { return m_Slots[m_Tail > 0 ? m_Tail - 1 : kCapacity - 1]; }
    KTThreadMsg const &LastSlot() const { return m_Slots[kCapacity - 1]; }

    static bool AreSame(KTThreadMsg const &one, KTThreadMsg const &other) {
        return one.message == other.message && one.param1 == other.param1 && one.param2 == other.param2 &&
               one.param3 == other.param3 && one.param4 == other.param4;
    }

  private:
    std::array<KTThreadMsg, kCapacity> m_Slots{};
    std::size_t m_Head = 0;
    std::size_t m_Tail = 0;
    std::size_t m_Count = 0;
};
