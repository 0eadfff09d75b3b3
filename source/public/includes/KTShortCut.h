// KTShortCut.h: a keyboard shortcut in the library's own codes, as menus and documents keep it.
//
// The codes mean the same on every system; conversions from and to the system's virtual keys and hot-key flags (those of
// RegisterHotKey: MOD_ALT 1, MOD_CONTROL 2, MOD_SHIFT 4) stand below.
//
//     KTShortCut const save(kKTShortCutCtrl, static_cast<KTShortCutKey>('S'));
//     save.GetShortCutString();                                    // "Ctrl+S"
//     unsigned int key = 0, flags = 0;
//     KTShortCut::GetPlatformShortCut(save, key, flags);           // 'S', MOD_CONTROL
//
// A shortcut is stored as one number:
//
//     bit  31 .. 22    21 .. 16     15 .. 12    11 .. 0
//          0           modifiers    0           key
//
// Threads: any thread may use its own shortcuts; one shortcut is not locked. Nothing throws but GetShortCutString
// (std::bad_alloc).

#pragma once

#include "KTString.h"

#include "KTBeginExports.h"

/// Modifiers, a set of bits.
enum KTShortCutModifiers : int {
    kKTShortCutNoModifiers = 0,
    kKTShortCutForeign = 1, ///< a modifier that Windows has no counterpart for: such a shortcut is not valid here
    kKTShortCutShift = 2,
    kKTShortCutCtrl = 4,
    kKTShortCutAlt = 8,
    kKTShortCutReserved = 16, ///< kept and packed, neither converted nor shown
    kKTShortCutKeypad = 32    ///< the key of the numeric keypad, for digits, "-", "." and "/"
};

/// Keys. Codes 32 to 126 are the printable ASCII characters themselves, letters in upper case; all codes without a name
/// here are kept and have no text.
enum KTShortCutKey : int {
    kKTShortCutNoKey = 0,
    kKTShortCutUp = 1,
    kKTShortCutDown = 2,
    kKTShortCutLeft = 3,
    kKTShortCutRight = 4,
    kKTShortCutHome = 5,
    kKTShortCutEnd = 6,
    kKTShortCutPageUp = 7,
    kKTShortCutPageDown = 8,
    kKTShortCutTab = 9,
    kKTShortCutEnter = 10,
    kKTShortCutSecondEnter = 11, ///< shown as "Enter", without a virtual key
    kKTShortCutBackspace = 12,
    kKTShortCutDelete = 13,
    kKTShortCutEscape = 14,
    kKTShortCutInsert = 15,
    kKTShortCutSpace = 32,
    kKTShortCutF1 = 129, ///< F2 to F20 follow
    kKTShortCutF20 = 148,
    kKTShortCutPause = 149,
    kKTShortCutHelp = 150,
    kKTShortCutScrollLock = 152,
    kKTShortCutPrintScreen = 153
};

/// A shortcut: modifiers and a key.
class KT_PUBLIC_API KTShortCut {
  public:
    /// No modifiers, no key.
    KTShortCut();

    /// The given modifiers and key, unchecked.
    KTShortCut(KTShortCutModifiers modifiers, KTShortCutKey key);

    /// The shortcut of a packed value: its key from the low 12 bits, its modifiers from bits 16 to 21; the other bits
    /// are dropped.
    KTShortCut(int packed);

    /// WRONG: modifiers or a key alone are no packed value.
    KTShortCut(KTShortCutModifiers) = delete;
    KTShortCut(KTShortCutKey) = delete;

    KTShortCut(KTShortCut const &other);
    KTShortCut &operator=(KTShortCut const &other);

    KTShortCutKey GetKey() const;
    KTShortCutModifiers GetModifiers() const;

    /// The packed value: the modifiers shifted left by 16, or the key.
    int GetIntegralValue() const;

    /// Whether there are neither modifiers nor a key.
    bool IsNoShortCut() const;

    /// Whether there is a key or no modifiers.
    bool IsValid() const;

    /// Whether this system has all the modifiers, that is, not kKTShortCutForeign. The key is not looked at. Text and
    /// conversions leave that modifier out and are otherwise the same.
    bool IsValidPlatformShortCut() const;

    /// Adds the modifiers. Returns true.
    bool operator+=(KTShortCutModifiers modifiers);

    /// Takes the modifiers away. False, with nothing changed, when the shortcut has none of them.
    bool operator-=(KTShortCutModifiers modifiers);

    /// Replaces the key. Returns true.
    bool operator+=(KTShortCutKey key);

    /// Order of the packed values as signed numbers.
    bool operator<(KTShortCut const &other) const;

    /// Whether modifiers and key are the same.
    bool operator==(KTShortCut const &other) const;
    bool operator!=(KTShortCut const &other) const;

    /// The text for a menu: "Shift+", "Ctrl+" and "Alt+" as far as they are set, in this order, and the key's name.
    KTString GetShortCutString() const;

    // ---- conversions; what has no counterpart is dropped or gives 0 ----

    /// The modifiers of hot-key flags.
    static KTShortCutModifiers GetKTShortCutModifiers(unsigned int hotKeyModifiers);

    /// The hot-key flags of modifiers.
    static unsigned int GetPlatformShortCutModifiers(KTShortCutModifiers modifiers);

    /// The key of a virtual key. The print-screen, scroll-lock and help keys and F21 to F24 give kKTShortCutNoKey.
    static KTShortCutKey GetKTShortCutKey(unsigned int virtualKey);

    /// The same, under the name by which documents of older versions are converted.
    static KTShortCutKey GetKTShortCutKeyForUpgrade(unsigned int virtualKey);

    /// The virtual key of a key. With kKTShortCutKeypad among the modifiers, digits, "-", "." and "/" give the keys of
    /// the numeric keypad; the other modifiers do not matter.
    static unsigned int GetPlatformShortCutKey(KTShortCutKey key, KTShortCutModifiers modifiers);

    /// The shortcut of a virtual key and hot-key flags.
    static KTShortCut GetKTShortCut(unsigned int virtualKey, unsigned int hotKeyModifiers);

    /// The virtual key and the hot-key flags of a shortcut.
    static void GetPlatformShortCut(KTShortCut const &shortCut, unsigned int &virtualKey,
                                    unsigned int &hotKeyModifiers);

  private:
    KTShortCutModifiers m_Modifiers = kKTShortCutNoModifiers;
    KTShortCutKey m_Key = kKTShortCutNoKey;
};

#include "KTEndExports.h"
