// TestClock.h: sets the library's UTC clock for tests, so that what depends on time is exact and nobody sleeps.
//
//     TestClock clock(50'000'000'000'000);    // microseconds since 1970; stands still
//     clock.Advance(1500);
//
// On Windows the library's import of GetSystemTimeAsFileTime is replaced, natively the stand-in is asked. One at a time.

#pragma once

#include "KTTypes.h"

#if defined(_WIN32)
#include "WImportHook.h"

#include <atomic>
#else
#include "OTestClock.h"
#endif

class TestClock {
  public:
    explicit TestClock(KTUInt64 microseconds) : m_Now(microseconds) { Set(microseconds); }
    TestClock(TestClock const &) = delete;
    TestClock &operator=(TestClock const &) = delete;
#if !defined(_WIN32)
    ~TestClock() { OSetTestClock(0); }
#endif

    void Advance(KTInt64 microseconds) { Set(m_Now + static_cast<KTUInt64>(microseconds)); }

    void Set(KTUInt64 microseconds) {
        m_Now = microseconds;
#if defined(_WIN32)
        shown = kCountOf1970 + microseconds * 10;
#else
        OSetTestClock(microseconds);
#endif
    }

    KTUInt64 Now() const { return m_Now; }

    /// How often the library has read the clock: shows that a thread waits for it.
    static unsigned int Readings() {
#if defined(_WIN32)
        return readings;
#else
        return OTestClockReadings();
#endif
    }

  private:
    KTUInt64 m_Now;

#if defined(_WIN32)
    static constexpr KTUInt64 kCountOf1970 = 116'444'736'000'000'000;

    static void WINAPI Show(FILETIME *time) {
        ++readings;
        KTUInt64 const count = shown;
        *time = {static_cast<DWORD>(count), static_cast<DWORD>(count >> 32)};
    }

    static inline std::atomic<KTUInt64> shown{0};
    static inline std::atomic<unsigned int> readings{0};

    WImportHook m_Hook{L"KTPublic.dll", "GetSystemTimeAsFileTime", Show};
#endif
};
