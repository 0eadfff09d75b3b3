// KTExceptionMsgManager.cpp: the messages' keys, default texts and cache.

#include "KTExceptionMsgManager.h"

namespace {

// Messages are found by the addresses of these characters.
constexpr char kFatalErrorKey[] = "kKTExceptionMsg";
constexpr char kDataBackUpFailedKey[] = "kKTDataBackUpFailedMsg";

struct Message {
    char const *key;
    char const *defaultText;
};

constexpr Message kMessages[] = {
    {kFatalErrorKey, "A fatal error has occured and the application is being terminated. Quillon Veltrain has tried to "
                     "save all your work in the respective project folders as \".ktbak\" files.\n\nPlease restart "
                     "Quillon Veltrain."},
    {kDataBackUpFailedKey, "Failed to back up the data."},
};

KTMsgRegistrarCallBack g_Registrar = nullptr;
KTMsgStrGetterCallBack g_Getter = nullptr;

} // namespace

char const *const kKTExceptionMsgStr = kFatalErrorKey;

std::map<char const *, KTString> KTExceptionMsgManager::m_ExceptionMsgMap;

void RegisterMsgRegistrarCallBack(KTMsgRegistrarCallBack callback) { g_Registrar = callback; }

void UnRegisterMsgRegistrarCallBack() { g_Registrar = nullptr; }

void RegisterMsgStrGetterCallBack(KTMsgStrGetterCallBack callback) { g_Getter = callback; }

void UnRegisterMsgStrGetterCallBack() { g_Getter = nullptr; }

void KTExceptionMsgManager::RegisterBaseExceptionMsgs(bool registerWithDictionary) {
    static bool isDone = false;
    if (isDone) {
        return;
    }
    isDone = true;
    if (registerWithDictionary) {
        RegisterExceptionMessages();
    }
    CacheExceptionMessages();
}

KTErrorCodeEnum KTExceptionMsgManager::RegisterExceptionMessages() {
    if (g_Registrar == nullptr) {
        return kKTErrorFailed;
    }
    KTErrorCodeEnum result = kKTErrorNone;
    for (Message const &message : kMessages) {
        KTErrorCodeEnum const one = g_Registrar(KTString(message.key), KTString(message.defaultText));
        result = result == kKTErrorNone ? one : result;
    }
    return result;
}

bool KTExceptionMsgManager::CacheExceptionMessages() {
    bool areAllCached = true;
    for (Message const &message : kMessages) {
        areAllCached = CacheExceptionMessage(message.key) && areAllCached;
    }
    return areAllCached;
}

bool KTExceptionMsgManager::CacheExceptionMessage(char const *key) {
    if (key == nullptr) {
        return false;
    }
    m_ExceptionMsgMap[key] = g_Getter == nullptr ? KTString() : g_Getter(KTString(key));
    return true;
}

KTString const &KTExceptionMsgManager::GetExceptionMessage(char const *key) {
    auto const found = m_ExceptionMsgMap.find(key);
    if (found != m_ExceptionMsgMap.end()) {
        return found->second;
    }
    static KTString missed;
    missed = KTString(key);
    return missed;
}

KTString const &KTExceptionMsgManager::GetDataBackUpFailedMsg() { return GetExceptionMessage(kDataBackUpFailedKey); }
