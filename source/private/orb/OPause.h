// OPause.h: short sleeps, as exact as the system can make them.

#pragma once

#include "KTTypes.h"

#include <memory>

/// Puts threads to sleep; one thread uses the object at a time. Holds what the system needs for that.
class OPause {
  public:
    OPause();
    OPause(OPause const &) = delete;
    OPause &operator=(OPause const &) = delete;
    ~OPause();

    /// Blocks the calling thread for about that long. It may be shorter or longer: look at the clock afterwards.
    void For(KTUInt64 microseconds) noexcept;

  private:
    struct Timer;
    std::unique_ptr<Timer> m_Timer;
};
