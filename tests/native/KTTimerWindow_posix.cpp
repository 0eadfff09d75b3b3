// KTTimerWindow_posix.cpp: the timer window of the native developer build: it remembers its timers, and tests tick them.

#include "KTTimerWindow.h"

#include "OTestTimerWindow.h"

#include <atomic>
#include <mutex>

namespace {

struct Window {
    std::mutex mutex;
    std::map<KTInt64, KTUInt32> timers;
};

std::atomic<Window *> theWindow{nullptr};
std::atomic<bool> refuseWindows{false};
std::atomic<bool> refuseTimers{false};

} // namespace

void *KTCreateTimerWindow() noexcept {
    if (refuseWindows) {
        return nullptr;
    }
    theWindow = new Window;
    return theWindow;
}

void KTDestroyTimerWindow(void *window) noexcept {
    theWindow = nullptr;
    delete static_cast<Window *>(window);
}

bool KTSetWindowTimer(void *window, KTInt64 id, KTUInt32 milliseconds) noexcept {
    if (refuseTimers) {
        return false;
    }
    Window &there = *static_cast<Window *>(window);
    std::lock_guard const lock(there.mutex);
    there.timers[id] = milliseconds;
    return true;
}

void KTKillWindowTimer(void *window, KTInt64 id) noexcept {
    Window &there = *static_cast<Window *>(window);
    std::lock_guard const lock(there.mutex);
    there.timers.erase(id);
}

void OTickTestTimer(KTInt64 id) {
    if (theWindow != nullptr) {
        KTTimerWindowTicked(id);
    }
}

std::map<KTInt64, KTUInt32> OTestTimers() {
    Window *const window = theWindow;
    if (window == nullptr) {
        return {};
    }
    std::lock_guard const lock(window->mutex);
    return window->timers;
}

bool OHasTestTimerWindow() { return theWindow != nullptr; }

void ORefuseTestTimerWindows(bool refuse) { refuseWindows = refuse; }

void ORefuseTestTimers(bool refuse) { refuseTimers = refuse; }
