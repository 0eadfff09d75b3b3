// WSETranslation.h: turning structured exceptions of a thread into C++ exceptions. Windows half only.
//
// Visual C++'s run-time has this built in (WSETranslationMSVC.cpp). For MinGW it is made here (WSETranslationMinGW.cpp).

#pragma once

#include "WKTExceptionUtils.h"

/// Installs the translator on the calling thread. Returns the one that it replaces there, null for none. If `translator`
/// itself is installed already, returns it and changes nothing: what was there before the first time stays saved.
/// Throws std::bad_alloc, and std::runtime_error if the system refuses what it takes.
WKTSETranslator WInstallTranslator(WKTSETranslator translator);

/// Puts back what WInstallTranslator replaced on the calling thread; does nothing on a thread that installed nothing.
void WRestoreTranslator() noexcept;
