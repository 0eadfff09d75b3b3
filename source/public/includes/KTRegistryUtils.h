// KTRegistryUtils.h: reading the registry.
//
//     KTString client;
//     KTRegistryUtils::GetSystemItem("SOFTWARE\\Clients\\Mail\\", client);      // the unnamed value of a machine-wide key
//
//     HKEY__ *key = nullptr;
//     if (KTRegistryUtils::OpenKeyReadOnly(HKEY_CURRENT_USER, "Software\\Harbour", key) == kKTErrorNone) {
//         KTRegistryUtils::ReadString(key, "Course", course);
//         KTRegistryUtils::CloseKey(key);
//     }
//
// Names of keys and values match in either case. Values are read where their type says that they are text (REG_SZ, and
// REG_EXPAND_SZ with the environment's variables filled in), of any length, up to their first zero. Variables are left
// as they are where the text would have 32,767 units or more with them, which is more than the system fills in.
//
// Threads: any; one open key may be read on several threads. Nothing throws but std::bad_alloc.

#pragma once

#include "KTErrorCodes.h"
#include "KTString.h"

struct HKEY__; // what the system's HKEY points to

#include "KTBeginExports.h"

class KT_PUBLIC_API KTRegistryUtils {
  public:
    KTRegistryUtils() = delete;

    /// Opens the key `name` below `parent`, a predefined key such as HKEY_LOCAL_MACHINE or one opened before, for reading
    /// its values and its sub-keys. An empty name opens `parent` once more. On success the caller closes `key`.
    /// kKTErrorFailed, with `key` null, if it is not there or may not be read, for a null parent, and for a name with a
    /// zero inside.
    static KTErrorCodeEnum OpenKeyReadOnly(HKEY__ *parent, KTString const &name, HKEY__ *&key);

    /// Closes the key and sets it to null; null is success. kKTErrorFailed if it was no open key.
    static KTErrorCodeEnum CloseKey(HKEY__ *&key);

    /// The path of the key `child` below `parent`: both joined by one back slash, whatever `parent` ends and `child`
    /// begins with. Where one of them is empty, the other as it is. The registry is not asked.
    static KTString ConstructKey(KTString const &parent, KTString const &child);

    /// Makes of the path of an item the path of its key and the name of its value, which follows the last back slash:
    /// "Software\Harbour\Course" gives "Software\Harbour" and "Course"; after a back slash at the end the name is empty,
    /// which is the unnamed value's. False, with nothing changed, if there is no back slash or no key before it. The
    /// registry is not asked. Values whose names have back slashes are reached with ReadString.
    static bool ConstructKeyAndName(KTString const &item, KTString &key, KTString &name);

    /// Reads the text value that the path (see ConstructKeyAndName) names below the machine-wide HKEY_LOCAL_MACHINE.
    /// kKTErrorFailed, with `value` unchanged, if the path names none, it is not there, is no text, or may not be read.
    static KTErrorCodeEnum GetSystemItem(KTString const &item, KTString &value);

    /// Reads the text value `name` of an open or predefined key; an empty name is the unnamed value's. kKTErrorFailed,
    /// with `value` unchanged, if it is not there, is no text, or may not be read, for a null key, and for a name with a
    /// zero inside.
    static KTErrorCodeEnum ReadString(HKEY__ *key, KTString const &name, KTString &value);
};

#include "KTEndExports.h"
