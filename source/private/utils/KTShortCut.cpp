// KTShortCut.cpp: shortcuts, their texts and their conversions.

#include "KTShortCut.h"

#include "KTShortCutKeys.h"

namespace {

using namespace KTShortCutKeys;

constexpr int kModifierShift = 16;
constexpr unsigned int kModifierMask = 0x3F;
constexpr unsigned int kKeyMask = 0xFFF;

constexpr unsigned int kHotKeyAlt = 1; // MOD_ALT, MOD_CONTROL, MOD_SHIFT
constexpr unsigned int kHotKeyControl = 2;
constexpr unsigned int kHotKeyShift = 4;

struct ModifierPair {
    KTShortCutModifiers modifier;
    unsigned int hotKey;
    char const *text;
};

constexpr ModifierPair kModifiers[] = {{kKTShortCutShift, kHotKeyShift, "Shift+"},
                                       {kKTShortCutCtrl, kHotKeyControl, "Ctrl+"},
                                       {kKTShortCutAlt, kHotKeyAlt, "Alt+"}};

bool IsBetween(int value, int least, int greatest) { return value >= least && value <= greatest; }

KTString NameOf(int key) {
    if (IsBetween(key, 0, static_cast<int>(kFirstNames.size()) - 1)) {
        return {kFirstNames[static_cast<std::size_t>(key)]};
    }
    KTString name;
    if (IsBetween(key, ' ', '~')) {
        name.push_back(static_cast<unsigned short>(key));
    } else if (IsBetween(key, kKTShortCutF1, kKTShortCutF20)) {
        name.push_back('F');
        name.AppendNumber(key - kKTShortCutF1 + 1);
    } else if (IsBetween(key, kKTShortCutPause, kKTShortCutPrintScreen)) {
        name = kLastNames[static_cast<std::size_t>(key - kKTShortCutPause)];
    }
    return name;
}

} // namespace

KTShortCut::KTShortCut() = default;
KTShortCut::KTShortCut(KTShortCut const &) = default;
KTShortCut &KTShortCut::operator=(KTShortCut const &) = default;

KTShortCut::KTShortCut(KTShortCutModifiers modifiers, KTShortCutKey key) : m_Modifiers(modifiers), m_Key(key) {}

KTShortCut::KTShortCut(int packed)
    : m_Modifiers(
          static_cast<KTShortCutModifiers>((static_cast<unsigned int>(packed) >> kModifierShift) & kModifierMask)),
      m_Key(static_cast<KTShortCutKey>(static_cast<unsigned int>(packed) & kKeyMask)) {}

KTShortCutKey KTShortCut::GetKey() const { return m_Key; }

KTShortCutModifiers KTShortCut::GetModifiers() const { return m_Modifiers; }

int KTShortCut::GetIntegralValue() const {
    return static_cast<int>((static_cast<unsigned int>(m_Modifiers) << kModifierShift) |
                            static_cast<unsigned int>(m_Key));
}

bool KTShortCut::IsNoShortCut() const { return m_Modifiers == 0 && m_Key == 0; }

bool KTShortCut::IsValid() const { return m_Modifiers == 0 || m_Key != 0; }

bool KTShortCut::IsValidPlatformShortCut() const { return (m_Modifiers & kKTShortCutForeign) == 0; }

bool KTShortCut::operator+=(KTShortCutModifiers modifiers) {
    m_Modifiers = static_cast<KTShortCutModifiers>(m_Modifiers | modifiers);
    return true;
}

bool KTShortCut::operator-=(KTShortCutModifiers modifiers) {
    if ((m_Modifiers & modifiers) == 0) {
        return false;
    }
    m_Modifiers = static_cast<KTShortCutModifiers>(m_Modifiers & ~modifiers);
    return true;
}

bool KTShortCut::operator+=(KTShortCutKey key) {
    m_Key = key;
    return true;
}

bool KTShortCut::operator<(KTShortCut const &other) const { return GetIntegralValue() < other.GetIntegralValue(); }

bool KTShortCut::operator==(KTShortCut const &other) const {
    return m_Modifiers == other.m_Modifiers && m_Key == other.m_Key;
}

bool KTShortCut::operator!=(KTShortCut const &other) const { return !(*this == other); }

KTString KTShortCut::GetShortCutString() const {
    KTString text;
    for (ModifierPair const &pair : kModifiers) {
        if ((m_Modifiers & pair.modifier) != 0) {
            text += pair.text;
        }
    }
    return text + NameOf(m_Key);
}

// ---- conversions ----

KTShortCutModifiers KTShortCut::GetKTShortCutModifiers(unsigned int hotKeyModifiers) {
    int modifiers = 0;
    for (ModifierPair const &pair : kModifiers) {
        modifiers |= (hotKeyModifiers & pair.hotKey) != 0 ? pair.modifier : 0;
    }
    return static_cast<KTShortCutModifiers>(modifiers);
}

unsigned int KTShortCut::GetPlatformShortCutModifiers(KTShortCutModifiers modifiers) {
    unsigned int hotKeyModifiers = 0;
    for (ModifierPair const &pair : kModifiers) {
        hotKeyModifiers |= (modifiers & pair.modifier) != 0 ? pair.hotKey : 0;
    }
    return hotKeyModifiers;
}

KTShortCutKey KTShortCut::GetKTShortCutKey(unsigned int virtualKey) {
    return virtualKey < kToKey.size() ? static_cast<KTShortCutKey>(kToKey[virtualKey]) : kKTShortCutNoKey;
}

KTShortCutKey KTShortCut::GetKTShortCutKeyForUpgrade(unsigned int virtualKey) { return GetKTShortCutKey(virtualKey); }

unsigned int KTShortCut::GetPlatformShortCutKey(KTShortCutKey key, KTShortCutModifiers modifiers) {
    auto const &table = (modifiers & kKTShortCutKeypad) != 0 ? kToKeypadKey : kToVirtualKey;
    auto const index = static_cast<unsigned int>(key);
    return index < table.size() ? table[index] : 0;
}

KTShortCut KTShortCut::GetKTShortCut(unsigned int virtualKey, unsigned int hotKeyModifiers) {
    return {GetKTShortCutModifiers(hotKeyModifiers), GetKTShortCutKey(virtualKey)};
}

void KTShortCut::GetPlatformShortCut(KTShortCut const &shortCut, unsigned int &virtualKey,
                                     unsigned int &hotKeyModifiers) {
    virtualKey = GetPlatformShortCutKey(shortCut.m_Key, shortCut.m_Modifiers);
    hotKeyModifiers = GetPlatformShortCutModifiers(shortCut.m_Modifiers);
}
