// TimerSoak.h: the timer service under everything that its users can do to it at once.
//
//     thread of timers     50 thread timers, created, adjusted, restarted and killed at random  --> a message thread
//     thread of bursts     50 single bursts, the same                                           --> a message thread
//     calling thread       20 UI timers in its message pump, whose functions kill themselves,
//                          kill others and create new ones
//     thread of killers    kills UI timers
//
// Every timer posts a number of its own, and its message thread is told beforehand what may come: what a killed timer
// posts later, and a burst too many, is a problem. In the end every timer that still lives must tick, and every burst
// that was not killed must have fired.

#pragma once

#include <cstdint>
#include <memory>
#include <string>

/// What rounds did.
struct TimerFigures {
    std::uint64_t created = 0;
    std::uint64_t refused = 0;  ///< with the table full
    std::uint64_t adjusted = 0; ///< or restarted
    std::uint64_t killed = 0;
    std::uint64_t ticks = 0; ///< of thread timers
    std::uint64_t bursts = 0;
    std::uint64_t calls = 0; ///< of UI timers

    TimerFigures &operator+=(TimerFigures const &other);
};

/// One round, on the calling thread, which creates the service and destroys it at the end.
class TimerSoak {
  public:
    explicit TimerSoak(unsigned int seed);
    TimerSoak(TimerSoak const &) = delete;
    TimerSoak &operator=(TimerSoak const &) = delete;
    ~TimerSoak();

    /// To be called again and again: the calling thread's part.
    void Turn();

    /// Ends the round. Returns what went wrong, one line each; nothing if all is well.
    std::string Finish(TimerFigures &figures);

  private:
    struct Parts;
    std::unique_ptr<Parts> m_Parts;
};
