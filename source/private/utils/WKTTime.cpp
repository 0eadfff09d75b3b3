// WKTTime.cpp: the two conversions of KTTime that need the system's own type.

#include "KTTime.h"

#include <windows.h>

FILETIME KTTime::InternalTimeToFILETIME(KTUInt64 count) {
    return {static_cast<DWORD>(count), static_cast<DWORD>(count >> 32)};
}

KTUInt64 KTTime::FILETIMEToInternalTime(FILETIME &time) {
    return (static_cast<KTUInt64>(time.dwHighDateTime) << 32) | time.dwLowDateTime;
}
