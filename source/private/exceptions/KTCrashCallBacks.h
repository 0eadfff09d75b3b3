// KTCrashCallBacks.h: what the platform's default handler needs of the portable half.

#pragma once

#include "KTExceptionUtils.h"

/// The data back-up callback, or null.
KTBackUpDataCallBack KTGetBackUpDataCallBack();
