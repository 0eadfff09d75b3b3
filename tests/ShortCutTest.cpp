// ShortCutTest.cpp: shortcuts: packing, texts, and both conversions over all keys against tables written down here.

#include "KTScrapDataFlavor.h"
#include "KTShortCut.h"

#include <gtest/gtest.h>

#include <array>
#include <climits>
#include <cstring>
#include <map>
#include <string>
#include <type_traits>

namespace {

KTShortCutModifiers Modifiers(int bits) { return static_cast<KTShortCutModifiers>(bits); }
KTShortCutKey Key(int code) { return static_cast<KTShortCutKey>(code); }
KTShortCut ShortCut(int modifiers, int key) { return {Modifiers(modifiers), Key(key)}; }
std::string Text(KTShortCut const &shortCut) { return shortCut.GetShortCutString().GetUTF8String(); }

constexpr int kNone = 0;
constexpr int kForeign = 1;
constexpr int kShift = 2;
constexpr int kCtrl = 4;
constexpr int kAlt = 8;
constexpr int kReserved = 16;
constexpr int kKeypad = 32;
constexpr int kAll = 63;

// Virtual key to key.
std::map<unsigned int, int> const kKeyOf = {
    {8, 12},    {9, 9},     {13, 10},   {19, 149},  {27, 14},   {32, 32},   {33, 7},    {34, 8},    {35, 6},
    {36, 5},    {37, 3},    {38, 1},    {39, 4},    {40, 2},    {45, 15},   {46, 13},   {48, 48},   {49, 49},
    {50, 50},   {51, 51},   {52, 52},   {53, 53},   {54, 54},   {55, 55},   {56, 56},   {57, 57},   {65, 65},
    {66, 66},   {67, 67},   {68, 68},   {69, 69},   {70, 70},   {71, 71},   {72, 72},   {73, 73},   {74, 74},
    {75, 75},   {76, 76},   {77, 77},   {78, 78},   {79, 79},   {80, 80},   {81, 81},   {82, 82},   {83, 83},
    {84, 84},   {85, 85},   {86, 86},   {87, 87},   {88, 88},   {89, 89},   {90, 90},   {96, 48},   {97, 49},
    {98, 50},   {99, 51},   {100, 52},  {101, 53},  {102, 54},  {103, 55},  {104, 56},  {105, 57},  {106, 42},
    {107, 43},  {108, 124}, {109, 45},  {110, 46},  {111, 47},  {112, 129}, {113, 130}, {114, 131}, {115, 132},
    {116, 133}, {117, 134}, {118, 135}, {119, 136}, {120, 137}, {121, 138}, {122, 139}, {123, 140}, {124, 141},
    {125, 142}, {126, 143}, {127, 144}, {128, 145}, {129, 146}, {130, 147}, {131, 148}, {186, 59},  {187, 61},
    {188, 44},  {189, 45},  {190, 46},  {191, 47},  {192, 96},  {219, 91},  {220, 92},  {221, 93},  {222, 39}};

// Key to virtual key, elsewhere than on the numeric keypad.
std::map<int, unsigned int> const kVirtualKeyOf = {
    {1, 38},    {2, 40},    {3, 37},    {4, 39},    {5, 36},    {6, 35},    {7, 33},    {8, 34},    {9, 9},
    {10, 13},   {12, 8},    {13, 46},   {14, 27},   {15, 45},   {32, 32},   {39, 222},  {42, 106},  {43, 107},
    {44, 188},  {45, 189},  {46, 190},  {47, 191},  {48, 48},   {49, 49},   {50, 50},   {51, 51},   {52, 52},
    {53, 53},   {54, 54},   {55, 55},   {56, 56},   {57, 57},   {59, 186},  {61, 187},  {65, 65},   {66, 66},
    {67, 67},   {68, 68},   {69, 69},   {70, 70},   {71, 71},   {72, 72},   {73, 73},   {74, 74},   {75, 75},
    {76, 76},   {77, 77},   {78, 78},   {79, 79},   {80, 80},   {81, 81},   {82, 82},   {83, 83},   {84, 84},
    {85, 85},   {86, 86},   {87, 87},   {88, 88},   {89, 89},   {90, 90},   {91, 219},  {92, 220},  {93, 221},
    {96, 192},  {124, 108}, {129, 112}, {130, 113}, {131, 114}, {132, 115}, {133, 116}, {134, 117}, {135, 118},
    {136, 119}, {137, 120}, {138, 121}, {139, 122}, {140, 123}, {141, 124}, {142, 125}, {143, 126}, {144, 127},
    {145, 128}, {146, 129}, {147, 130}, {148, 131}, {149, 19},  {153, 44}};

// What differs on the numeric keypad.
std::map<int, unsigned int> const kKeypadKeyOf = {{45, 109}, {46, 110}, {47, 111}, {48, 96},  {49, 97},
                                                  {50, 98},  {51, 99},  {52, 100}, {53, 101}, {54, 102},
                                                  {55, 103}, {56, 104}, {57, 105}};

// Names of keys that are not the character itself.
std::map<int, std::string> const kNameOf = {
    {1, "Up"},     {2, "Down"},          {3, "Left"},          {4, "Right"},  {5, "Home"},   {6, "End"},
    {7, "PageUp"}, {8, "PageDown"},      {9, "Tab"},           {10, "Enter"}, {11, "Enter"}, {12, "Backspace"},
    {13, "Del"},   {14, "Esc"},          {15, "Insert"},       {129, "F1"},   {130, "F2"},   {131, "F3"},
    {132, "F4"},   {133, "F5"},          {134, "F6"},          {135, "F7"},   {136, "F8"},   {137, "F9"},
    {138, "F10"},  {139, "F11"},         {140, "F12"},         {141, "F13"},  {142, "F14"},  {143, "F15"},
    {144, "F16"},  {145, "F17"},         {146, "F18"},         {147, "F19"},  {148, "F20"},  {149, "Pause"},
    {150, "Help"}, {152, "Scroll Lock"}, {153, "Print Screen"}};

template <typename Map, typename KeyType> auto Find(Map const &map, KeyType key) {
    auto const found = map.find(key);
    return found == map.end() ? typename Map::mapped_type{} : found->second;
}

std::string NameOf(int code) {
    return code >= 32 && code <= 126 ? std::string(1, static_cast<char>(code)) : Find(kNameOf, code);
}

// Codes around and beyond all that have a meaning.
constexpr int kOddCodes[] = {-1, INT_MIN, INT_MAX, 1000, 4095, 4096, 65536 + 65, 0x01000041};

} // namespace

// ---- the value ----

TEST(ShortCut, NumbersAndLayoutAreFixed) {
    EXPECT_EQ(sizeof(KTShortCut), 8U);
    EXPECT_EQ(sizeof(KTShortCutModifiers), 4U);
    EXPECT_EQ(sizeof(KTShortCutKey), 4U);
    KTShortCut const shortCut = ShortCut(0x12, 0x34);
    std::array<int, 2> fields{};
    std::memcpy(fields.data(), static_cast<void const *>(&shortCut), sizeof fields);
    EXPECT_EQ(fields[0], 0x12) << "modifiers first";
    EXPECT_EQ(fields[1], 0x34);
    EXPECT_EQ(kKTShortCutForeign, kForeign);
    EXPECT_EQ(kKTShortCutShift, kShift);
    EXPECT_EQ(kKTShortCutCtrl, kCtrl);
    EXPECT_EQ(kKTShortCutAlt, kAlt);
    EXPECT_EQ(kKTShortCutReserved, kReserved);
    EXPECT_EQ(kKTShortCutKeypad, kKeypad);
}

TEST(ShortCut, DefaultIsNone) {
    KTShortCut const none;
    EXPECT_EQ(none.GetKey(), 0);
    EXPECT_EQ(none.GetModifiers(), 0);
    EXPECT_EQ(none.GetIntegralValue(), 0);
    EXPECT_TRUE(none.IsNoShortCut());
    EXPECT_TRUE(none.IsValid());
    EXPECT_TRUE(none.IsValidPlatformShortCut());
    EXPECT_EQ(Text(none), "");
}

TEST(ShortCut, PacksModifiersAndKey) {
    KTShortCut const shortCut(0x00060041);
    EXPECT_EQ(shortCut.GetModifiers(), kShift | kCtrl);
    EXPECT_EQ(shortCut.GetKey(), 65);
    EXPECT_EQ(Text(shortCut), "Shift+Ctrl+A");
    EXPECT_EQ(shortCut.GetIntegralValue(), 0x00060041);
    for (int modifiers = 0; modifiers <= kAll; ++modifiers) {
        for (int const key : {0, 1, 65, 153, 4095}) {
            int const packed = (modifiers << 16) | key;
            EXPECT_EQ(ShortCut(modifiers, key).GetIntegralValue(), packed);
            EXPECT_EQ(KTShortCut(packed), ShortCut(modifiers, key));
        }
    }
}

TEST(ShortCut, UnpackingDropsOtherBits) {
    EXPECT_EQ(KTShortCut(-1), ShortCut(kAll, 0xFFF));
    EXPECT_EQ(KTShortCut(static_cast<int>(0xFFC0F000)), KTShortCut());
    EXPECT_EQ(KTShortCut(INT_MIN), KTShortCut());
    EXPECT_EQ(KTShortCut(-1).GetIntegralValue(), 0x003F0FFF);
}

TEST(ShortCut, OnlyPackedNumbersConvert) {
    EXPECT_TRUE((std::is_convertible_v<int, KTShortCut>));
    EXPECT_FALSE((std::is_constructible_v<KTShortCut, KTShortCutKey>));
    EXPECT_FALSE((std::is_constructible_v<KTShortCut, KTShortCutModifiers>));
}

TEST(ShortCut, ValidityAsksForAKeyWhereModifiersAre) {
    for (int modifiers = 0; modifiers <= kAll; ++modifiers) {
        EXPECT_EQ(ShortCut(modifiers, 0).IsValid(), modifiers == 0) << modifiers;
        EXPECT_EQ(ShortCut(modifiers, 0).IsNoShortCut(), modifiers == 0) << modifiers;
        EXPECT_TRUE(ShortCut(modifiers, 65).IsValid()) << modifiers;
        EXPECT_FALSE(ShortCut(modifiers, 65).IsNoShortCut()) << modifiers;
    }
    EXPECT_FALSE(ShortCut(kCtrl, 0).IsValid());
}

TEST(ShortCut, OneModifierMakesItInvalidHereWhateverTheKey) {
    for (int modifiers = 0; modifiers <= kAll; ++modifiers) {
        for (int const key : {0, 65, 151}) {
            EXPECT_EQ(ShortCut(modifiers, key).IsValidPlatformShortCut(), (modifiers & kForeign) == 0) << modifiers;
        }
    }
}

TEST(ShortCut, ModifiersAreAddedAndTakenAway) {
    KTShortCut shortCut = ShortCut(kShift, 65);
    EXPECT_TRUE(shortCut += kKTShortCutAlt);
    EXPECT_EQ(shortCut, ShortCut(kShift | kAlt, 65));
    EXPECT_TRUE(shortCut += kKTShortCutAlt);
    EXPECT_EQ(shortCut, ShortCut(kShift | kAlt, 65));
    EXPECT_FALSE(shortCut -= kKTShortCutCtrl);
    EXPECT_FALSE(shortCut -= kKTShortCutNoModifiers);
    EXPECT_EQ(shortCut, ShortCut(kShift | kAlt, 65));
    EXPECT_TRUE(shortCut -= Modifiers(kCtrl | kAlt)) << "one of them is set";
    EXPECT_EQ(shortCut, ShortCut(kShift, 65));
    EXPECT_TRUE(shortCut += kKTShortCutTab);
    EXPECT_EQ(shortCut, ShortCut(kShift, 9));
    EXPECT_TRUE(shortCut += kKTShortCutNoKey);
    EXPECT_EQ(shortCut, ShortCut(kShift, 0));
}

TEST(ShortCut, ComparesAndCopies) {
    EXPECT_TRUE(ShortCut(kShift, 1) < ShortCut(kShift, 2));
    EXPECT_TRUE(ShortCut(kShift, 4095) < ShortCut(kCtrl, 0));
    EXPECT_FALSE(ShortCut(kCtrl, 0) < ShortCut(kShift, 4095));
    EXPECT_FALSE(ShortCut(kCtrl, 7) < ShortCut(kCtrl, 7));
    EXPECT_TRUE(ShortCut(0x8000, 0) < ShortCut(0, 0)) << "packed values are signed";
    EXPECT_TRUE(ShortCut(kCtrl, 7) == ShortCut(kCtrl, 7));
    EXPECT_FALSE(ShortCut(kCtrl, 7) == ShortCut(kAlt, 7));
    EXPECT_FALSE(ShortCut(kCtrl, 7) == ShortCut(kCtrl, 8));
    EXPECT_TRUE(ShortCut(kCtrl, 7) != ShortCut(kCtrl, 8));
    KTShortCut copy;
    copy = ShortCut(kAlt, 9);
    EXPECT_EQ(copy, ShortCut(kAlt, 9));
    EXPECT_EQ(KTShortCut(copy), copy);
}

// ---- texts ----

TEST(ShortCut, EveryKeyHasItsName) {
    for (int code = 0; code <= 4095; ++code) {
        ASSERT_EQ(Text(ShortCut(kNone, code)), NameOf(code)) << code;
    }
    for (int const code : kOddCodes) {
        EXPECT_EQ(Text(ShortCut(kNone, code)), "") << code;
    }
    EXPECT_EQ(Text(ShortCut(kCtrl, 32)), "Ctrl+ ");
}

TEST(ShortCut, ModifiersStandBeforeTheKeyInOneOrder) {
    for (int modifiers = 0; modifiers <= kAll; ++modifiers) {
        std::string const expected = std::string((modifiers & kShift) != 0 ? "Shift+" : "") +
                                     ((modifiers & kCtrl) != 0 ? "Ctrl+" : "") +
                                     ((modifiers & kAlt) != 0 ? "Alt+" : "");
        EXPECT_EQ(Text(ShortCut(modifiers, 13)), expected + "Del");
        EXPECT_EQ(Text(ShortCut(modifiers, 0)), expected);
    }
}

// ---- conversions ----

TEST(ShortCut, EveryVirtualKeyConverts) {
    for (unsigned int virtualKey = 0; virtualKey < 256; ++virtualKey) {
        EXPECT_EQ(KTShortCut::GetKTShortCutKey(virtualKey), Find(kKeyOf, virtualKey)) << virtualKey;
        EXPECT_EQ(KTShortCut::GetKTShortCutKeyForUpgrade(virtualKey), Find(kKeyOf, virtualKey)) << virtualKey;
    }
    for (unsigned int const virtualKey : {256U, 256U + 65U, 0x10041U, 0xFFFFFFFFU}) {
        EXPECT_EQ(KTShortCut::GetKTShortCutKey(virtualKey), 0) << virtualKey;
        EXPECT_EQ(KTShortCut::GetKTShortCutKeyForUpgrade(virtualKey), 0) << virtualKey;
    }
    EXPECT_EQ(kKeyOf.size(), 16U + 10 + 26 + 10 + 6 + 20 + 7 + 4);
}

TEST(ShortCut, NamedKeysWithoutAWayBack) {
    EXPECT_EQ(KTShortCut::GetKTShortCutKey(44), 0) << "VK_SNAPSHOT";
    EXPECT_EQ(KTShortCut::GetPlatformShortCutKey(kKTShortCutPrintScreen, kKTShortCutNoModifiers), 44U);
    EXPECT_EQ(KTShortCut::GetKTShortCutKey(145), 0) << "VK_SCROLL";
    EXPECT_EQ(KTShortCut::GetKTShortCutKey(47), 0) << "VK_HELP";
    for (unsigned int virtualKey = 132; virtualKey <= 135; ++virtualKey) {
        EXPECT_EQ(KTShortCut::GetKTShortCutKey(virtualKey), 0) << "F21 to F24";
    }
}

TEST(ShortCut, EveryKeyConvertsWithEveryModifier) {
    for (int modifiers = 0; modifiers <= kAll; ++modifiers) {
        for (int code = 0; code <= 4095; ++code) {
            unsigned int const onKeypad = (modifiers & kKeypad) != 0 ? Find(kKeypadKeyOf, code) : 0;
            unsigned int const expected = onKeypad != 0 ? onKeypad : Find(kVirtualKeyOf, code);
            ASSERT_EQ(KTShortCut::GetPlatformShortCutKey(Key(code), Modifiers(modifiers)), expected)
                << code << " with " << modifiers;
        }
        for (int const code : kOddCodes) {
            EXPECT_EQ(KTShortCut::GetPlatformShortCutKey(Key(code), Modifiers(modifiers)), 0U) << code;
        }
    }
}

TEST(ShortCut, ModifiersConvertBothWays) {
    for (unsigned int flags = 0; flags < 32; ++flags) {
        int const expected =
            ((flags & 1) != 0 ? kAlt : 0) | ((flags & 2) != 0 ? kCtrl : 0) | ((flags & 4) != 0 ? kShift : 0);
        EXPECT_EQ(KTShortCut::GetKTShortCutModifiers(flags), expected) << flags;
        EXPECT_EQ(KTShortCut::GetKTShortCutModifiers(flags | 0x4008), expected) << "MOD_WIN, MOD_NOREPEAT";
    }
    for (int modifiers = 0; modifiers <= kAll; ++modifiers) {
        unsigned int const expected = ((modifiers & kAlt) != 0 ? 1U : 0U) | ((modifiers & kCtrl) != 0 ? 2U : 0U) |
                                      ((modifiers & kShift) != 0 ? 4U : 0U);
        EXPECT_EQ(KTShortCut::GetPlatformShortCutModifiers(Modifiers(modifiers)), expected) << modifiers;
    }
}

TEST(ShortCut, WholeShortCutsConvertBothWays) {
    EXPECT_EQ(KTShortCut::GetKTShortCut(116, 4 | 2), ShortCut(kShift | kCtrl, 133));
    EXPECT_EQ(KTShortCut::GetKTShortCut(44, 1), ShortCut(kAlt, 0));
    unsigned int virtualKey = 99;
    unsigned int flags = 99;
    KTShortCut::GetPlatformShortCut(ShortCut(kKeypad | kAlt, '7'), virtualKey, flags);
    EXPECT_EQ(virtualKey, 103U);
    EXPECT_EQ(flags, 1U);
    KTShortCut::GetPlatformShortCut(KTShortCut(), virtualKey, flags);
    EXPECT_EQ(virtualKey, 0U);
    EXPECT_EQ(flags, 0U);
}

// The modifier that Windows does not have only changes what is valid.
TEST(ShortCut, TheForeignModifierIsLeftOut) {
    KTShortCut const shortCut = ShortCut(kForeign | kReserved | kCtrl, 'A');
    unsigned int virtualKey = 0;
    unsigned int flags = 0;
    KTShortCut::GetPlatformShortCut(shortCut, virtualKey, flags);
    EXPECT_EQ(virtualKey, 65U);
    EXPECT_EQ(flags, 2U);
    EXPECT_EQ(Text(shortCut), "Ctrl+A");
    EXPECT_EQ(shortCut.GetIntegralValue(), 0x00150041);
}

// ---- clipboard formats ----

TEST(ScrapDataFlavor, DefaultsAndFields) {
    KTScrapDataFlavor const plain;
    EXPECT_EQ(plain.GetID(), 101);
    EXPECT_EQ(plain.GetString(), "");
    EXPECT_TRUE(plain.IsKTFlavor());
    EXPECT_EQ(plain.GetWinFormat(), 0U);

    KTScrapDataFlavor slide(7, "Slide", false);
    EXPECT_EQ(slide.GetID(), 7);
    EXPECT_EQ(slide.GetString(), "Slide");
    EXPECT_FALSE(slide.IsKTFlavor());
    EXPECT_EQ(slide.GetWinFormat(), 0U);
    EXPECT_EQ(slide.SetIsKTFlavor(true), kKTErrorNone);
    EXPECT_TRUE(slide.IsKTFlavor());
    EXPECT_EQ(slide.SetWinFormat(0xC0FEC0FE), kKTErrorNone);
    EXPECT_EQ(slide.GetWinFormat(), 0xC0FEC0FEU);
    EXPECT_TRUE(std::has_virtual_destructor_v<KTScrapDataFlavor>);
}

TEST(ScrapDataFlavor, CopiesAllFields) {
    KTScrapDataFlavor original(65535, "Slide", false);
    original.SetWinFormat(49152);
    KTScrapDataFlavor const copy(original);
    KTScrapDataFlavor assigned;
    assigned = original;
    for (KTScrapDataFlavor const *other : {&copy, static_cast<KTScrapDataFlavor const *>(&assigned)}) {
        EXPECT_EQ(other->GetID(), 65535);
        EXPECT_EQ(other->GetString(), "Slide");
        EXPECT_FALSE(other->IsKTFlavor());
        EXPECT_EQ(other->GetWinFormat(), 49152U);
    }
}

TEST(ScrapDataFlavor, ComparesByNameAlone) {
    KTScrapDataFlavor const a(1, "A", true);
    KTScrapDataFlavor const otherA(2, "A", false);
    KTScrapDataFlavor const b(1, "B", true);
    EXPECT_TRUE(a == otherA);
    EXPECT_FALSE(a < otherA);
    EXPECT_FALSE(otherA < a);
    EXPECT_FALSE(a == b);
    EXPECT_TRUE(a < b);
    EXPECT_FALSE(b < a);
}
