// KTExceptionUtils.cpp: the part of crash handling that needs no operating system: who handles an exception, the
// callbacks, and who may go through the default handler.

#include "KTExceptionUtils.h"

#include "KTAssert.h"
#include "KTCrashCallBacks.h"

#include <algorithm>
#include <vector>

namespace {

constexpr char kSource[] = "source/private/exceptions/KTExceptionUtils";

KTBackUpDataCallBack g_BackUpData = nullptr;

bool g_IsFirstEntry = true; // guarded by KTExceptionUtils::m_Mutex

// In the order of registration.
std::vector<KTCleanUpCallBack> &CleanUpCallBacks() {
    static std::vector<KTCleanUpCallBack> callbacks;
    return callbacks;
}

} // namespace

KTMutex KTExceptionUtils::m_Mutex;

void RegisterBackUpDataCallBack(KTBackUpDataCallBack callback) { g_BackUpData = callback; }

void UnRegisterBackUpDataCallBack() { g_BackUpData = nullptr; }

KTBackUpDataCallBack KTGetBackUpDataCallBack() { return g_BackUpData; }

IKTExceptionHandler::~IKTExceptionHandler() = default;

KTExceptionUtils::KTExceptionUtils() : m_ApplicationCrashed(false), m_ClientHandler(nullptr) {}

KTExceptionUtils::~KTExceptionUtils() = default;

void KTExceptionUtils::InstallExceptionHandler() {
    try {
        static KTExceptionUtils &instance = GetInstance();
        instance.InstallExceptionHandlerImpl();
    } catch (...) {
        KTAssertFailed("Failed to install exception handler functions", kSource, 81);
    }
}

void KTExceptionUtils::HandleException(KTException const &exception) {
    static KTExceptionUtils &instance = GetInstance();
    try {
        if (IKTExceptionHandler *const handler = instance.m_ClientHandler) {
            handler->HandleException(exception);
        } else {
            instance.DefaultHandler(exception);
        }
    } catch (...) {
        KTAssertFailed("Failed to handle the exception", kSource, 97);
    }
}

void KTExceptionUtils::SetHandler(IKTExceptionHandler &handler) { m_ClientHandler = &handler; }

bool KTExceptionUtils::IsApplicationCrashed() const { return m_ApplicationCrashed; }

KTErrorCodeEnum KTExceptionUtils::RegisterCleanUpCallBack(KTCleanUpCallBack callback) {
    auto &callbacks = CleanUpCallBacks();
    if (callback == nullptr || std::find(callbacks.begin(), callbacks.end(), callback) != callbacks.end()) {
        return kKTErrorFailed;
    }
    callbacks.push_back(callback);
    return kKTErrorNone;
}

KTErrorCodeEnum KTExceptionUtils::UnRegisterCleanUpCallBack(KTCleanUpCallBack callback) {
    return std::erase(CleanUpCallBacks(), callback) == 0 ? kKTErrorFailed : kKTErrorNone;
}

// Always the first one: a callback that does not unregister itself is called for ever, as its contract says.
void KTExceptionUtils::RunCleanUpCallBacks() {
    while (!CleanUpCallBacks().empty()) {
        CleanUpCallBacks().front()();
    }
}

bool KTExceptionUtils::EnterDefaultHandler() {
    m_ApplicationCrashed = true;
    KTLock const lock(m_Mutex);
    bool const isFirst = g_IsFirstEntry;
    g_IsFirstEntry = false;
    return isFirst;
}
