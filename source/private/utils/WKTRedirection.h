// WKTRedirection.h: the real system folders for 32-bit programs on 64-bit systems. Windows half only.

#pragma once

#include <windows.h>

/// Turns the file-system redirection off for the calling thread while this object lives, where the system has it. The
/// two functions are looked up at run time: not every system has them.
class WKTRedirectionOff {
  public:
    WKTRedirectionOff();
    WKTRedirectionOff(WKTRedirectionOff const &) = delete;
    WKTRedirectionOff &operator=(WKTRedirectionOff const &) = delete;
    ~WKTRedirectionOff();

  private:
    using Revert = BOOL(WINAPI *)(void *);

    Revert m_Revert = nullptr; // null unless redirection was turned off
    void *m_Before = nullptr;
};
