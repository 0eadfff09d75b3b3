// KTStringDictionary.cpp: the facade: KTString on one side, the engine's bytes and units on the other.

#include "KTStringDictionary.h"

#include "DictionaryFile.h"
#include "DictionaryReader.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>
#include <new>

using orvik_private::DictionaryForm;
using orvik_private::DictionaryReader;
using orvik_private::UnitsView;

namespace {

// Copies units as bytes and tells whether all of them are ASCII. Apart, as a loop that is compiled where nothing has to
// be cleaned up is compiled to several units at a time.
bool NarrowAscii(unsigned short const *units, std::size_t count, char *bytes) noexcept {
    unsigned all = 0;
    for (std::size_t i = 0; i < count; ++i) {
        all |= units[i];
        bytes[i] = static_cast<char>(units[i]);
    }
    return all < 0x80;
}

// A key as UTF-8. Keys are ASCII and short nearly always, and are looked up all the time, so such ones need no memory.
class KeyBytes {
  public:
    explicit KeyBytes(KTString const &key) { // NOLINT(cppcoreguidelines-pro-type-member-init): see m_Short
        std::size_t const count = key.size();
        if (count <= m_Short.size() && NarrowAscii(key.c_str(), count, m_Short.data())) {
            m_Bytes = {m_Short.data(), count};
            return;
        }
        m_Long = key.GetUTF8String();
        m_Bytes = m_Long;
    }
    KeyBytes(KeyBytes const &) = delete;
    KeyBytes &operator=(KeyBytes const &) = delete;
    ~KeyBytes() = default;

    std::string_view Get() const { return m_Bytes; }

  private:
    std::array<char, 256> m_Short; // only what is used is ever written
    std::string m_Long;
    std::string_view m_Bytes;
};

UnitsView ViewOf(KTString const &text) { return {text.c_str(), text.size()}; }

// Whether a default is nothing but its bytes: no escape, no zero. Most are, and need not be converted twice.
bool IsPlain(std::string_view text) noexcept {
    bool isPlain = true;
    for (char const byte : text) {
        isPlain &= byte != '\\' && byte != '^' && byte != '#' && byte != 0;
    }
    return isPlain;
}

// One unit for each byte, sign-extended, behind what `target` holds.
void WidenSigned(std::string_view bytes, KTString &target) {
    if (bytes.empty()) {
        return;
    }
    target.append(bytes.size(), 0);
    unsigned short *const units = &target[target.size() - bytes.size()];
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        units[i] = static_cast<unsigned short>(
            static_cast<short>(static_cast<signed char>(bytes[i]))); // NOLINT(bugprone-signed-char-misuse)
    }
}

// Units before the first zero.
std::size_t CountToZero(unsigned short const *units, std::size_t count) noexcept {
    constexpr std::size_t kAtOnce = 16;
    std::size_t at = 0;
    for (; at + kAtOnce <= count; at += kAtOnce) {
        bool hasZero = false;
        for (std::size_t i = 0; i < kAtOnce; ++i) {
            hasZero |= units[at + i] == 0;
        }
        if (hasZero) {
            break;
        }
    }
    while (at < count && units[at] != 0) {
        ++at;
    }
    return at;
}

// Puts units up to the first zero among them into an empty text. At an odd address they are no units yet: they are
// copied first.
void PutUpToZero(std::string_view bytes, KTString &target) {
    std::size_t const count = bytes.size() / sizeof(unsigned short);
    if (reinterpret_cast<std::uintptr_t>(bytes.data()) % sizeof(unsigned short) == 0) {
        auto const *const units = reinterpret_cast<unsigned short const *>(bytes.data());
        target.append(units, CountToZero(units, count));
        return;
    }
    target.append(count, 0);
    std::memcpy(&target[0], bytes.data(), count * sizeof(unsigned short));
    std::size_t const end = CountToZero(target.c_str(), count);
    if (end < count) {
        target.erase(end);
    }
}

} // namespace

IKTStringDictionary::IKTStringDictionary() = default;

IKTStringDictionary::IKTStringDictionary(IKTStringDictionary const &) = default;

IKTStringDictionary &IKTStringDictionary::operator=(IKTStringDictionary const &) = default;

IKTStringDictionary::~IKTStringDictionary() = default;

KTStringDictionary *KTStringDictionary::m_StringDictionary = nullptr;

KTStringDictionary *KTStringDictionary::GetStringDictionary() {
    if (m_StringDictionary == nullptr) {
        m_StringDictionary = new (std::nothrow) KTStringDictionary;
    }
    return m_StringDictionary;
}

KTStringDictionary::KTStringDictionary() {
    try {
        m_Dictionary = std::make_unique<DictionaryReader>();
    } catch (std::bad_alloc const &) {
        m_Dictionary = nullptr; // every operation says what it does then
    }
}

KTStringDictionary::~KTStringDictionary() {
    if (m_StringDictionary == this) {
        m_StringDictionary = nullptr;
    }
}

KTErrorCodeEnum KTStringDictionary::AddString(KTString const &key, KTString const &value) {
    if (m_Dictionary != nullptr) {
        m_Dictionary->Add(KeyBytes(key).Get(), ViewOf(value));
    }
    return kKTErrorNone;
}

KTErrorCodeEnum KTStringDictionary::AddString(char const *key, char const *value) {
    if (key == nullptr || value == nullptr) {
        return kKTErrorFailed;
    }
    // Through the table, for classes that derive from this one.
    return static_cast<IKTStringDictionary *>(this)->AddString(KTString(key), KTString(value));
}

KTString KTStringDictionary::GetKeyValue(KTString const &key) {
    KTString result;
    if (m_Dictionary == nullptr) {
        return result;
    }
    KeyBytes const bytes(key);
    orvik_private::KeyText const parts = orvik_private::SplitKeyText(bytes.Get());
    KTUnits scratch;
    std::string_view text;
    if (!m_Dictionary->LookupBytes(parts.name, scratch, text)) {
        if (!parts.name.empty() && IsPlain(parts.defaultText)) {
            WidenSigned(parts.defaultText, result);
            return result;
        }
        UnitsView unescaped;
        m_Dictionary->Lookup(bytes.Get(), scratch, unescaped);
        text = orvik_private::BytesOf(unescaped);
    }
    PutUpToZero(text, result);
    return result;
}

KTErrorCodeEnum KTStringDictionary::WriteToFile(KTFile const &file, bool binary) {
    if (m_Dictionary == nullptr || file.Exists()) {
        return kKTErrorFailed;
    }
    bool isTaken = false;
    auto const target = orvik_private::CreateDictionaryFile(file.GetOPath(), isTaken);
    if (target == nullptr) {
        return isTaken ? kKTErrorFailed : kKTErrorNone;
    }
    DictionaryForm form;
    form.isBinary = binary;
    bool isComplete = false;
    m_Dictionary->Write(*target, form, &isComplete);
    if (isComplete) {
        target->Finish();
    }
    return kKTErrorNone;
}

KTErrorCodeEnum KTStringDictionary::ReadFromFile(KTFile const &file) {
    if (m_Dictionary == nullptr || !file.Exists()) {
        return kKTErrorFailed;
    }
    if (auto const source = orvik_private::OpenDictionaryFile(file.GetOPath()); source != nullptr) {
        m_Dictionary->Read(*source);
    }
    return kKTErrorNone;
}
