// KTExceptionMsgManager.h: the user-visible messages of exceptions, and how a host connects them to its texts.
//
// At start-up, on one thread:
//
//     RegisterMsgRegistrarCallBack(&AddToDictionary);   // takes a key and its default text
//     RegisterMsgStrGetterCallBack(&FindInDictionary);  // gives the localised text of a key
//     KTExceptionMsgManager::RegisterBaseExceptionMsgs(true);
//
// From then on the messages are in a cache, keyed by the address of a key's characters, and a crash needs no dictionary.
// WRONG: caching before the getter is registered; the cached texts are then empty.
//
// Threads: neither the two callbacks nor the cache is locked. Set them up on one thread before others ask for messages.

#pragma once

#include "KTErrorCodes.h"
#include "KTString.h"

#include <map>

#include "KTBeginExports.h"

/// Adds a key with its default text to the host's dictionary; kKTErrorNone if it is there then.
using KTMsgRegistrarCallBack = KTErrorCodeEnum (*)(KTString const &key, KTString const &defaultText);

/// Gives the text of a key in the user's language.
using KTMsgStrGetterCallBack = KTString (*)(KTString const &key);

/// Stores the registrar; null is allowed. Not locked.
KT_PUBLIC_API void RegisterMsgRegistrarCallBack(KTMsgRegistrarCallBack callback);

/// Forgets the registrar. Not locked.
KT_PUBLIC_API void UnRegisterMsgRegistrarCallBack();

/// Stores the getter; null is allowed. Not locked.
KT_PUBLIC_API void RegisterMsgStrGetterCallBack(KTMsgStrGetterCallBack callback);

/// Forgets the getter. Not locked.
KT_PUBLIC_API void UnRegisterMsgStrGetterCallBack();

/// The key of the message that tells the user of a fatal error. Its address finds the cached text.
extern KT_PUBLIC_API char const *const kKTExceptionMsgStr;

/// The messages. See the top of this file for threads.
class KT_PUBLIC_API KTExceptionMsgManager {
  public:
    KTExceptionMsgManager() = delete;

    /// The first call hands the library's keys and default texts to the registrar, if `registerWithDictionary` says so
    /// and there is a registrar, and then caches the text that the getter gives for each. Later calls do nothing. Throws
    /// what a callback throws; the call then counts as the first all the same.
    static void RegisterBaseExceptionMsgs(bool registerWithDictionary);

    /// Asks the getter for the key's text and caches that under the key's address, replacing what was there. Without a
    /// getter the text is empty. `key` is UTF-8 and must stay where it is. False, and nothing is cached, for a null key.
    /// Throws std::bad_alloc and what the getter throws.
    static bool CacheExceptionMessage(char const *key);

    /// The text that is cached for the key's address, valid until the process ends; else the key's characters (UTF-8;
    /// null is empty) in one string that the next miss overwrites. Throws std::bad_alloc.
    static KTString const &GetExceptionMessage(char const *key);

    /// The message that the user's work could not be backed up.
    static KTString const &GetDataBackUpFailedMsg();

  private:
    static KTErrorCodeEnum RegisterExceptionMessages();
    static bool CacheExceptionMessages();

    static std::map<char const *, KTString> m_ExceptionMsgMap;
};

#include "KTEndExports.h"
