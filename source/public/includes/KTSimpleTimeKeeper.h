// KTSimpleTimeKeeper.h: measures how long a piece of work takes and reports it once.
//
//     {
//         KTSimpleTimeKeeper const keeper("load");
//         Load();
//     } // the debugger output: PROFILE: Time taken by load = 1.5
//
// Time is what KTGetTickCountSinceAppStartTime counts: milliseconds of the UTC clock, in 32 bits.
//
// Threads: one keeper is not locked.

#pragma once

#include <string>

#include "KTBeginExports.h"

/// A stop-watch with a name, see the top of this file.
class KT_PUBLIC_API KTSimpleTimeKeeper {
  public:
    /// Starts timing. `name` says what is timed, in any bytes; they go into the report as they are. Throws
    /// std::bad_alloc.
    explicit KTSimpleTimeKeeper(std::string const &name);

    /// Starts timing, without a name: reports only to a function set by SetDumpFunction.
    KTSimpleTimeKeeper();

    /// Not copyable: a copy would report again.
    KTSimpleTimeKeeper(KTSimpleTimeKeeper const &other) = delete;
    KTSimpleTimeKeeper &operator=(KTSimpleTimeKeeper const &other) = delete;

    /// DoDumping, if it was not done. What a dump function throws here ends the process.
    ~KTSimpleTimeKeeper();

    /// Starts timing again. A report that was made is not made again.
    void Reset();

    /// Seconds since the start, in steps of a millisecond; negative when the system clock was set back. Wraps around
    /// after 2^31 milliseconds.
    double GetElapsedTime() const;

    /// Sets who receives the report; null: the debugger output, which is the default.
    void SetDumpFunction(void (*dump)(std::string const &));

    /// Makes the report, once for each keeper: "PROFILE: Time taken by ", the name, " = ", the seconds with up to six
    /// significant digits, and a line feed. Without a name and a dump function nothing happens, and the report can
    /// still be made later. Throws what the dump function throws; the report then counts as not made.
    void DoDumping() const;

  private:
    struct Record;

    Record *m_Record;
};

#include "KTEndExports.h"
