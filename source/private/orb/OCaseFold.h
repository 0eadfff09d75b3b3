// OCaseFold.h: language-neutral lower case, as the system's file names compare.

#pragma once

#include "KTUnitTraits.h"

/// The text with every unit in its lower case, one unit to one unit. Any thread.
KTUnits OFoldCase(KTUnits const &text);
