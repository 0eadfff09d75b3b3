// KTUserEventUtil.h: relays user events to the host.

#pragma once

#include "KTString.h"

#include "KTBeginExports.h"

/// Holds one process-wide callback. Not locked: register before other threads log events.
class KT_PUBLIC_API KTUserEventUtil {
  public:
    /// Receives the three texts of an event as UTF-8, valid during the call; their meaning is the host's.
    using LogFunctionCallBack = void (*)(char const *, char const *, char const *);

    /// Stores the callback. Null is ignored: a stored callback can be replaced, never removed.
    static void RegisterLogFunctionCallBack(LogFunctionCallBack callBack);

    /// Hands the three texts to the callback in this order; without a callback does nothing. Writes no log line.
    /// Throws std::bad_alloc and whatever the callback throws.
    static void LogUserEvent(KTString const &first, KTString const &second, KTString const &third);

    /// Does nothing, as the class has no data of its own. Any thread.
    KTUserEventUtil &operator=(KTUserEventUtil const &other);

  private:
    static LogFunctionCallBack m_CallBack;
};

#include "KTEndExports.h"
