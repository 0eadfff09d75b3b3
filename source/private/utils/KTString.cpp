// KTString.cpp: construction, conversion, comparison, search and edit.
//
// The standard string does the work; this file adds what the standard leaves open: null pointers count as empty text,
// and the texts of the position and length errors are the library's own. Numbers, replacing and splitting are in
// KTStringNumbers.cpp and KTStringTransforms.cpp.

#include "KTString.h"

#include "OUtf.h"

#include <algorithm>
#include <stdexcept>

namespace {

using Size = KTString::size_type;
using Unit = unsigned short;

constexpr Unit kEmpty[] = {0};

void CheckPosition(Size pos, Size size) {
    if (pos > size) {
        throw std::out_of_range("invalid string position");
    }
}

// `kept` units stay and `added` come.
void CheckLength(KTUnits const &units, Size kept, Size added) {
    if (added > units.max_size() - kept) {
        throw std::length_error("string too long");
    }
}

// Checks the range [pos, pos + count) that an edit replaces by `added` units.
void CheckEdit(KTUnits const &units, Size pos, Size count, Size added) {
    CheckPosition(pos, units.size());
    CheckLength(units, units.size() - std::min(count, units.size() - pos), added);
}

Unit const *OrEmpty(Unit const *units) { return units == nullptr ? kEmpty : units; }

Size LengthOf(Unit const *units) { return units == nullptr ? 0 : OUnitLength(units); }

KTUnits FromBytes(char const *bytes, KTString::KTCharEncodingType encoding) {
    if (bytes == nullptr) {
        return {};
    }
    switch (encoding) {
    case KTString::kKTEncodingBytes:
        return OWidenSigned({bytes, OByteLength(bytes)});
    case KTString::kKTEncodingUTF8:
        return OUtf8TextToUnits(bytes);
    }
    return {};
}

KTUnits FromUtf8(char const *bytes) { return FromBytes(bytes, KTString::kKTEncodingUTF8); }

KTUnits FromWide(wchar_t const *text) { return text == nullptr ? KTUnits() : OWideToUnits(text, OWideLength(text)); }

KTUnits FromBStr(CComBSTR const &text, KTUInt32 length) {
    KTUInt32 const available = text.Length();
    return OWideToUnits(text.m_str, length != 0 && length < available ? length : available);
}

// Compares with zero-terminated text in units or wide characters without copying it.
template <typename Char> int CompareWith(KTUnits const &units, Char const *text) {
    if (text == nullptr) {
        return units.empty() ? 0 : 1;
    }
    for (Unit const unit : units) {
        auto const other = static_cast<Unit>(*text);
        if (*text == 0) {
            return 1;
        }
        if (unit != other) {
            return unit < other ? -1 : 1;
        }
        ++text;
    }
    return *text == 0 ? 0 : -1;
}

int CompareWith(KTUnits const &units, char const *utf8) { return units.compare(FromUtf8(utf8)); }

KTUnits Joined(KTUnits const &left, Unit const *right, Size count) {
    CheckLength(left, left.size(), count);
    KTUnits joined;
    joined.reserve(left.size() + count);
    joined.append(left).append(right, count);
    return joined;
}

} // namespace

// Hosts that bind a reference to the constant, as std::min does, import it.
KTString::size_type const KTString::npos;

KTString::size_type KTString::GetNPos() { return npos; }

// ---- construction and conversion ----

KTString::KTString(char const *bytes, KTCharEncodingType encoding) : m_Units(FromBytes(bytes, encoding)) {}

KTString::KTString(unsigned short const *units) : m_Units(OrEmpty(units), LengthOf(units)) {}

KTString::KTString(wchar_t const *text) : m_Units(FromWide(text)) {}

KTString::KTString(OString const &text) : m_Units(text.GetUnits()) {}

// By value, as its callers link it.
// NOLINTNEXTLINE(performance-unnecessary-value-param)
KTString::KTString(CComBSTR text, KTUInt32 length) : m_Units(FromBStr(text, length)) {}

std::string KTString::GetUTF8String() const { return OUnitsToUtf8(m_Units.data(), m_Units.size()); }

std::wstring KTString::GetWstring() const { return OUnitsToWide(m_Units.data(), m_Units.size()); }

OString KTString::GetOString() const { return OString(m_Units); }

// ---- comparison ----

bool KTString::operator==(KTString const &other) const { return m_Units == other.m_Units; }
bool KTString::operator==(char const *utf8) const { return CompareWith(m_Units, utf8) == 0; }
bool KTString::operator==(unsigned short const *units) const { return CompareWith(m_Units, units) == 0; }
bool KTString::operator==(wchar_t const *text) const { return CompareWith(m_Units, text) == 0; }

bool KTString::operator!=(KTString const &other) const { return m_Units != other.m_Units; }
bool KTString::operator!=(char const *utf8) const { return CompareWith(m_Units, utf8) != 0; }
bool KTString::operator!=(unsigned short const *units) const { return CompareWith(m_Units, units) != 0; }
bool KTString::operator!=(wchar_t const *text) const { return CompareWith(m_Units, text) != 0; }

bool KTString::operator<(KTString const &other) const { return m_Units < other.m_Units; }
bool KTString::operator<(char const *utf8) const { return CompareWith(m_Units, utf8) < 0; }
bool KTString::operator<(unsigned short const *units) const { return CompareWith(m_Units, units) < 0; }
bool KTString::operator<(wchar_t const *text) const { return CompareWith(m_Units, text) < 0; }

bool operator==(char const *left, KTString const &right) { return right.operator==(left); }
bool operator==(unsigned short const *left, KTString const &right) { return right.operator==(left); }
bool operator==(wchar_t const *left, KTString const &right) { return right.operator==(left); }

bool operator!=(char const *left, KTString const &right) { return right.operator!=(left); }
bool operator!=(unsigned short const *left, KTString const &right) { return right.operator!=(left); }
bool operator!=(wchar_t const *left, KTString const &right) { return right.operator!=(left); }

bool operator<(char const *left, KTString const &right) { return KTString(left) < right; }
bool operator<(unsigned short const *left, KTString const &right) { return KTString(left) < right; }
bool operator<(wchar_t const *left, KTString const &right) { return KTString(left) < right; }

// ---- concatenation ----

KTString &KTString::operator+=(KTString const &other) { return append(other); }
KTString &KTString::operator+=(char const *utf8) { return append(KTString(FromUtf8(utf8))); }
KTString &KTString::operator+=(unsigned short const *units) { return append(units); }
KTString &KTString::operator+=(wchar_t const *text) { return append(KTString(FromWide(text))); }

KTString &KTString::operator+=(unsigned short unit) {
    push_back(unit);
    return *this;
}

KTString KTString::operator+(KTString const &other) const {
    return KTString(Joined(m_Units, other.m_Units.data(), other.m_Units.size()));
}

KTString KTString::operator+(char const *utf8) const { return *this + KTString(FromUtf8(utf8)); }

KTString KTString::operator+(unsigned short const *units) const {
    return KTString(Joined(m_Units, OrEmpty(units), LengthOf(units)));
}

KTString KTString::operator+(wchar_t const *text) const { return *this + KTString(FromWide(text)); }

KTString KTString::operator+(unsigned short unit) const { return KTString(Joined(m_Units, &unit, 1)); }

KTString operator+(char const *left, KTString const &right) { return KTString(left) + right; }
KTString operator+(unsigned short const *left, KTString const &right) { return KTString(left) + right; }
KTString operator+(wchar_t const *left, KTString const &right) { return KTString(left) + right; }
KTString operator+(unsigned short left, KTString const &right) { return KTString().append(1, left) + right; }

// ---- search ----

#define KT_DEFINE_SEARCH(name)                                                                                         \
    Size KTString::name(KTString const &text, size_type from) const { return m_Units.name(text.m_Units, from); }       \
    Size KTString::name(unsigned short const *units, size_type from) const {                                           \
        return m_Units.name(OrEmpty(units), from, LengthOf(units));                                                    \
    }                                                                                                                  \
    Size KTString::name(unsigned short const *units, size_type from, size_type count) const {                          \
        return m_Units.name(OrEmpty(units), from, units == nullptr ? 0 : count);                                       \
    }                                                                                                                  \
    Size KTString::name(unsigned short unit, size_type from) const { return m_Units.name(unit, from); }

KT_DEFINE_SEARCH(find)
KT_DEFINE_SEARCH(rfind)
KT_DEFINE_SEARCH(find_first_of)
KT_DEFINE_SEARCH(find_last_of)
KT_DEFINE_SEARCH(find_first_not_of)
KT_DEFINE_SEARCH(find_last_not_of)

#undef KT_DEFINE_SEARCH

int KTString::compare(KTString const &other) const { return m_Units.compare(other.m_Units); }

int KTString::compare(size_type pos, size_type count, KTString const &other) const {
    CheckPosition(pos, size());
    return m_Units.compare(pos, count, other.m_Units);
}

int KTString::compare(size_type pos, size_type count, KTString const &other, size_type otherPos,
                      size_type otherCount) const {
    CheckPosition(pos, size());
    CheckPosition(otherPos, other.size());
    return m_Units.compare(pos, count, other.m_Units, otherPos, otherCount);
}

int KTString::compare(unsigned short const *units) const { return CompareWith(m_Units, units); }

int KTString::compare(size_type pos, size_type count, unsigned short const *units) const {
    return compare(pos, count, units, LengthOf(units));
}

int KTString::compare(size_type pos, size_type count, unsigned short const *units, size_type unitCount) const {
    CheckPosition(pos, size());
    return m_Units.compare(pos, count, OrEmpty(units), units == nullptr ? 0 : unitCount);
}

KTString KTString::substr(size_type pos, size_type count) const {
    CheckPosition(pos, size());
    return KTString(m_Units.substr(pos, count));
}

// ---- edit: every form comes down to replace with units or with a repeated unit ----

KTString &KTString::replace(size_type pos, size_type count, unsigned short const *units, size_type unitCount) {
    Size const added = units == nullptr ? 0 : unitCount;
    CheckEdit(m_Units, pos, count, added);
    m_Units.replace(pos, count, OrEmpty(units), added);
    return *this;
}

KTString &KTString::replace(size_type pos, size_type count, size_type unitCount, unsigned short unit) {
    CheckEdit(m_Units, pos, count, unitCount);
    m_Units.replace(pos, count, unitCount, unit);
    return *this;
}

KTString &KTString::replace(size_type pos, size_type count, KTString const &text) {
    return replace(pos, count, text.c_str(), text.size());
}

KTString &KTString::replace(size_type pos, size_type count, KTString const &text, size_type textPos,
                            size_type textCount) {
    CheckPosition(textPos, text.size());
    return replace(pos, count, text.c_str() + textPos, std::min(textCount, text.size() - textPos));
}

KTString &KTString::replace(size_type pos, size_type count, unsigned short const *units) {
    return replace(pos, count, units, LengthOf(units));
}

KTString &KTString::insert(size_type pos, KTString const &text) { return replace(pos, 0, text); }

KTString &KTString::insert(size_type pos, KTString const &text, size_type textPos, size_type textCount) {
    return replace(pos, 0, text, textPos, textCount);
}

KTString &KTString::insert(size_type pos, unsigned short const *units) { return replace(pos, 0, units); }

KTString &KTString::insert(size_type pos, unsigned short const *units, size_type count) {
    return replace(pos, 0, units, count);
}

KTString &KTString::insert(size_type pos, size_type count, unsigned short unit) { return replace(pos, 0, count, unit); }

KTString::iterator KTString::insert(const_iterator at, unsigned short unit) { return m_Units.insert(at, unit); }

KTString &KTString::erase(size_type pos, size_type count) {
    CheckPosition(pos, size());
    m_Units.erase(pos, count);
    return *this;
}

KTString::iterator KTString::erase(const_iterator at) { return m_Units.erase(at); }

KTString::iterator KTString::erase(const_iterator first, const_iterator last) { return m_Units.erase(first, last); }

KTString &KTString::append(KTString const &text) { return append(text.c_str(), text.size()); }

KTString &KTString::append(KTString const &text, size_type pos, size_type count) {
    return replace(size(), 0, text, pos, count);
}

KTString &KTString::append(unsigned short const *units) { return append(units, LengthOf(units)); }

KTString &KTString::append(unsigned short const *units, size_type count) {
    Size const added = units == nullptr ? 0 : count;
    CheckLength(m_Units, size(), added);
    m_Units.append(OrEmpty(units), added);
    return *this;
}

KTString &KTString::append(size_type count, unsigned short unit) { return replace(size(), 0, count, unit); }

KTString &KTString::assign(KTString const &text) {
    m_Units = text.m_Units;
    return *this;
}

KTString &KTString::assign(KTString const &text, size_type pos, size_type count) {
    return replace(0, npos, text, pos, count);
}

KTString &KTString::assign(unsigned short const *units) { return replace(0, npos, units); }

KTString &KTString::assign(unsigned short const *units, size_type count) {
    Size const added = units == nullptr ? 0 : count;
    CheckLength(m_Units, 0, added);
    m_Units.assign(OrEmpty(units), added);
    return *this;
}

KTString &KTString::assign(size_type count, unsigned short unit) { return replace(0, npos, count, unit); }

void KTString::push_back(unsigned short unit) {
    CheckLength(m_Units, size(), 1);
    m_Units.push_back(unit);
}

void KTString::reserve(size_type count) {
    CheckLength(m_Units, 0, count);
    m_Units.reserve(count);
}

// ---- access ----

KTString::reference KTString::at(size_type pos) {
    CheckPosition(pos == npos ? pos : pos + 1, size());
    return m_Units[pos];
}

KTString::const_reference KTString::at(size_type pos) const {
    CheckPosition(pos == npos ? pos : pos + 1, size());
    return m_Units[pos];
}
