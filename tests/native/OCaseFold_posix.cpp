// OCaseFold_posix.cpp: lower case for the native developer build: ASCII and the Latin-1 letters.

#include "OCaseFold.h"

KTUnits OFoldCase(KTUnits const &text) {
    KTUnits folded = text;
    for (unsigned short &unit : folded) {
        bool const ascii = unit >= 'A' && unit <= 'Z';
        bool const latin = unit >= 0xC0 && unit <= 0xDE && unit != 0xD7;
        if (ascii || latin) {
            unit = static_cast<unsigned short>(unit + 0x20);
        }
    }
    return folded;
}
