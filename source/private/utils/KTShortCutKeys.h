// KTShortCutKeys.h: the keys of shortcuts beside the system's virtual keys.

#pragma once

#include "KTShortCut.h"

#include <array>
#include <cstddef>
#include <cstdint>

namespace KTShortCutKeys {

/// The system's numbers of its keys, which never change.
enum VirtualKey : std::uint8_t {
    kNone = 0,
    kBack = 8,
    kTab = 9,
    kReturn = 13,
    kPause = 19,
    kEscape = 27,
    kSpace = 32,
    kPrior = 33,
    kNext = 34,
    kEnd = 35,
    kHome = 36,
    kLeft = 37,
    kUp = 38,
    kRight = 39,
    kDown = 40,
    kSnapshot = 44,
    kInsert = 45,
    kDelete = 46,
    kNumpad0 = 96,
    kMultiply = 106,
    kAdd = 107,
    kSeparator = 108,
    kSubtract = 109,
    kDecimal = 110,
    kDivide = 111,
    kF1 = 112,
    kOem1 = 186,
    kOemPlus = 187,
    kOemComma = 188,
    kOemMinus = 189,
    kOemPeriod = 190,
    kOem2 = 191,
    kOem3 = 192,
    kOem4 = 219,
    kOem5 = 220,
    kOem6 = 221,
    kOem7 = 222
};

struct Pair {
    VirtualKey virtualKey;
    int key;
};

/// Keys that convert both ways.
inline constexpr Pair kBothWays[] = {{kBack, kKTShortCutBackspace},
                                     {kTab, kKTShortCutTab},
                                     {kReturn, kKTShortCutEnter},
                                     {kPause, kKTShortCutPause},
                                     {kEscape, kKTShortCutEscape},
                                     {kSpace, kKTShortCutSpace},
                                     {kPrior, kKTShortCutPageUp},
                                     {kNext, kKTShortCutPageDown},
                                     {kEnd, kKTShortCutEnd},
                                     {kHome, kKTShortCutHome},
                                     {kLeft, kKTShortCutLeft},
                                     {kUp, kKTShortCutUp},
                                     {kRight, kKTShortCutRight},
                                     {kDown, kKTShortCutDown},
                                     {kInsert, kKTShortCutInsert},
                                     {kDelete, kKTShortCutDelete},
                                     {kMultiply, '*'},
                                     {kAdd, '+'},
                                     {kSeparator, '|'},
                                     {kOem1, ';'},
                                     {kOemPlus, '='},
                                     {kOemComma, ','},
                                     {kOemMinus, '-'},
                                     {kOemPeriod, '.'},
                                     {kOem2, '/'},
                                     {kOem3, '`'},
                                     {kOem4, '['},
                                     {kOem5, '\\'},
                                     {kOem6, ']'},
                                     {kOem7, '\''}};

/// Keys of the numeric keypad that are also elsewhere; the way back leads here only with kKTShortCutKeypad.
inline constexpr Pair kKeypad[] = {{kSubtract, '-'}, {kDecimal, '.'}, {kDivide, '/'}};

inline constexpr int kFunctionKeys = 20;

inline constexpr std::size_t kVirtualKeys = 256;
inline constexpr std::size_t kKeys = kKTShortCutPrintScreen + 1; // codes from here on convert to nothing

using ToKey = std::array<std::uint8_t, kVirtualKeys>;
using ToVirtualKey = std::array<std::uint8_t, kKeys>;

/// The key of each virtual key.
inline constexpr ToKey kToKey = [] {
    ToKey table{};
    auto const set = [&table](int virtualKey, int key) {
        table[static_cast<std::size_t>(virtualKey)] = static_cast<std::uint8_t>(key);
    };
    for (Pair const &pair : kBothWays) {
        set(pair.virtualKey, pair.key);
    }
    for (Pair const &pair : kKeypad) {
        set(pair.virtualKey, pair.key);
    }
    for (int digit = 0; digit < 10; ++digit) {
        set('0' + digit, '0' + digit);
        set(kNumpad0 + digit, '0' + digit);
    }
    for (int letter = 'A'; letter <= 'Z'; ++letter) {
        set(letter, letter);
    }
    for (int i = 0; i < kFunctionKeys; ++i) {
        set(kF1 + i, kKTShortCutF1 + i);
    }
    return table;
}();

/// The virtual key of each key, on the numeric keypad or elsewhere.
constexpr ToVirtualKey MakeToVirtualKey(bool keypad) {
    ToVirtualKey table{};
    auto const set = [&table](int key, int virtualKey) {
        table[static_cast<std::size_t>(key)] = static_cast<std::uint8_t>(virtualKey);
    };
    for (Pair const &pair : kBothWays) {
        set(pair.key, pair.virtualKey);
    }
    if (keypad) {
        for (Pair const &pair : kKeypad) {
            set(pair.key, pair.virtualKey);
        }
    }
    for (int digit = 0; digit < 10; ++digit) {
        set('0' + digit, digit + (keypad ? int{kNumpad0} : int{'0'}));
    }
    for (int letter = 'A'; letter <= 'Z'; ++letter) {
        set(letter, letter);
    }
    for (int i = 0; i < kFunctionKeys; ++i) {
        set(kKTShortCutF1 + i, kF1 + i);
    }
    set(kKTShortCutPrintScreen, kSnapshot);
    return table;
}

inline constexpr ToVirtualKey kToVirtualKey = MakeToVirtualKey(false);
inline constexpr ToVirtualKey kToKeypadKey = MakeToVirtualKey(true);

/// The names of the keys 1 to 15.
inline constexpr std::array<char const *, 16> kFirstNames = {
    "",         "Up",  "Down",  "Left",  "Right",     "Home", "End", "PageUp",
    "PageDown", "Tab", "Enter", "Enter", "Backspace", "Del",  "Esc", "Insert"};

/// The names of the keys from kKTShortCutPause on.
inline constexpr std::array<char const *, 5> kLastNames = {"Pause", "Help", "", "Scroll Lock", "Print Screen"};

} // namespace KTShortCutKeys
