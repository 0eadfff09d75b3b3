// KTString.h: the library's one text type.
//
// A value holding UTF-16 code units (unsigned short) in a standard basic string, always followed by a terminating zero
// unit. Nothing is normalised and surrogate pairs are not checked; positions and counts are in units.
//
// Byte strings (char const *) in operators are UTF-8. Malformed UTF-8 never fails: each maximal ill-formed part becomes
// one U+FFFD (Unicode 15, section 3.9, table 3-8). A null pointer operand, of any kind, is the empty string.
//
//     KTString title("Größe", KTString::kKTEncodingUTF8);
//     title += " 12";
//     if (title.Contains("12")) ...
//
// Positions past the end throw std::out_of_range("invalid string position"), lengths past the maximum
// std::length_error("string too long"); memory shortage throws std::bad_alloc from every member that can grow a string.
// Distinct strings may be used from any thread; one string is not locked.

#pragma once

#include "KTComBSTR.h"
#include "KTErrorCodes.h"
#include "KTReal.h"
#include "KTTypes.h"
#include "KTUnitTraits.h"
#include "OString.h"

#include <cstddef>
#include <ios>
#include <string>
#include <utility>
#include <vector>

#include "KTBeginExports.h"

/// UTF-16 string. See the top of this file for encodings, errors and threads.
class KT_PUBLIC_API KTString {
  public:
    using value_type = unsigned short;
    using size_type = KTUnits::size_type;
    using difference_type = KTUnits::difference_type;
    using reference = KTUnits::reference;
    using const_reference = KTUnits::const_reference;
    using iterator = KTUnits::iterator;
    using const_iterator = KTUnits::const_iterator;
    using reverse_iterator = KTUnits::reverse_iterator;
    using const_reverse_iterator = KTUnits::const_reverse_iterator;

    /// Encoding of a byte string handed to the constructor. Any other value yields an empty string.
    enum KTCharEncodingType : int {
        kKTEncodingBytes = 0, ///< each byte becomes one unit, sign-extended: 0xE9 becomes 0xFFE9
        kKTEncodingUTF8 = 1   ///< decoded as UTF-8
    };

    /// A base manipulator of the standard streams: std::dec, std::hex or std::oct.
    using BaseManipulator = std::ios_base &(*)(std::ios_base &);

    /// The not-found position of every search, and "to the end" as a count: the largest unsigned 64-bit value.
    static const size_type npos = static_cast<size_type>(-1);

    /// npos, for callers that cannot read a static constant across the boundary.
    static size_type GetNPos();

    // ---- construction and conversion ----

    KTString() = default;
    KTString(KTString const &other) = default;
    KTString(KTString &&other) noexcept = default;
    KTString &operator=(KTString const &other) = default;
    KTString &operator=(KTString &&other) noexcept = default;
    ~KTString() = default;

    /// The zero-terminated bytes in the given encoding; null gives an empty string.
    KTString(char const *bytes, KTCharEncodingType encoding = kKTEncodingUTF8);

    /// The units up to the terminating zero; null gives an empty string.
    KTString(unsigned short const *units);

    /// The wide characters up to the terminating zero, one unit each; null gives an empty string.
    KTString(wchar_t const *text);

    /// The units of the file layer's string.
    KTString(OString const &text);

    /// The text's units, zeros inside included: all of them, or the first `length` when that is neither 0 nor more
    /// than there are.
    KTString(CComBSTR text, KTUInt32 length);

    /// The text as UTF-8; an unpaired surrogate becomes U+FFFD (EF BF BD).
    std::string GetUTF8String() const;

    /// The units as wide characters.
    std::wstring GetWstring() const;

    /// The units as the file layer's string.
    OString GetOString() const;

    /// The zero-terminated units, valid until the string changes.
    unsigned short const *c_str() const noexcept { return m_Units.c_str(); }

    // ---- numbers as text ----
    //
    // Each member formats into a buffer of 100 bytes, appends the result and returns kKTErrorNone. Text that does not
    // fit the buffer is reported as an assertion and nothing is appended.

    /// Appends the number in decimal.
    KTErrorCodeEnum AppendNumber(int number);

    /// Appends the number as the printf format says, for example "%04x". REQUIRES: at most one conversion, which reads
    /// an int. A format that would read the number as a pointer (s, S, Z, n) is reported and appends nothing.
    KTErrorCodeEnum AppendNumber(int number, KTString const &format);

    /// Appends the unsigned number in decimal.
    KTErrorCodeEnum AppendUNumber(unsigned int number);

    /// Appends the unsigned 64-bit number in decimal.
    KTErrorCodeEnum AppendUInt64(KTUInt64 number);

    /// Appends the pointer's value as an unsigned decimal number (not hexadecimal: GetPointerValue does not read this
    /// form back).
    KTErrorCodeEnum AppendPointer(void *pointer);

    /// Appends the number with `precision` digits after the point, never in exponent notation.
    /// REQUIRES: precision is not negative.
    KTErrorCodeEnum AppendRealNumber(KTReal number, int precision);

    // ---- text as numbers ----
    //
    // Each member reads the beginning of the text as a wide standard stream does: leading white space is skipped, text
    // that does not begin with a number gives 0, and a number out of range gives the nearest limit.

    /// The number in the given base, as an unsigned 32-bit value; "-1" gives 4294967295.
    KTUInt32 GetIntValue(BaseManipulator base = std::dec) const;

    /// The number in the given base, as an unsigned 64-bit value.
    KTUInt64 GetUInt64Value(BaseManipulator base = std::dec) const;

    /// The floating-point number.
    double GetDoubleValue() const;

    /// The pointer, written as the standard streams write pointers (hexadecimal).
    void *GetPointerValue() const;

    // ---- comparison: unit by unit; the first difference decides, then the length ----

    bool operator==(KTString const &other) const;
    bool operator==(char const *utf8) const;
    bool operator==(unsigned short const *units) const;
    bool operator==(wchar_t const *text) const;
    bool operator!=(KTString const &other) const;
    bool operator!=(char const *utf8) const;
    bool operator!=(unsigned short const *units) const;
    bool operator!=(wchar_t const *text) const;
    bool operator<(KTString const &other) const;
    bool operator<(char const *utf8) const;
    bool operator<(unsigned short const *units) const;
    bool operator<(wchar_t const *text) const;

    // ---- concatenation ----

    KTString &operator+=(KTString const &other);
    KTString &operator+=(char const *utf8);
    KTString &operator+=(unsigned short const *units);
    KTString &operator+=(wchar_t const *text);
    KTString &operator+=(unsigned short unit);
    KTString operator+(KTString const &other) const;
    KTString operator+(char const *utf8) const;
    KTString operator+(unsigned short const *units) const;
    KTString operator+(wchar_t const *text) const;
    KTString operator+(unsigned short unit) const;

    // ---- search: the position found, or npos; with a count, `units` holds that many and need not end in zero ----

    size_type find(KTString const &text, size_type from = 0) const;
    size_type find(unsigned short const *units, size_type from = 0) const;
    size_type find(unsigned short const *units, size_type from, size_type count) const;
    size_type find(unsigned short unit, size_type from = 0) const;
    size_type rfind(KTString const &text, size_type from = npos) const;
    size_type rfind(unsigned short const *units, size_type from = npos) const;
    size_type rfind(unsigned short const *units, size_type from, size_type count) const;
    size_type rfind(unsigned short unit, size_type from = npos) const;
    size_type find_first_of(KTString const &text, size_type from = 0) const;
    size_type find_first_of(unsigned short const *units, size_type from = 0) const;
    size_type find_first_of(unsigned short const *units, size_type from, size_type count) const;
    size_type find_first_of(unsigned short unit, size_type from = 0) const;
    size_type find_last_of(KTString const &text, size_type from = npos) const;
    size_type find_last_of(unsigned short const *units, size_type from = npos) const;
    size_type find_last_of(unsigned short const *units, size_type from, size_type count) const;
    size_type find_last_of(unsigned short unit, size_type from = npos) const;
    size_type find_first_not_of(KTString const &text, size_type from = 0) const;
    size_type find_first_not_of(unsigned short const *units, size_type from = 0) const;
    size_type find_first_not_of(unsigned short const *units, size_type from, size_type count) const;
    size_type find_first_not_of(unsigned short unit, size_type from = 0) const;
    size_type find_last_not_of(KTString const &text, size_type from = npos) const;
    size_type find_last_not_of(unsigned short const *units, size_type from = npos) const;
    size_type find_last_not_of(unsigned short const *units, size_type from, size_type count) const;
    size_type find_last_not_of(unsigned short unit, size_type from = npos) const;

    /// Negative, 0 or positive as this string (or `count` of its units at `pos`) sorts before, with or after the other.
    int compare(KTString const &other) const;
    int compare(size_type pos, size_type count, KTString const &other) const;
    int compare(size_type pos, size_type count, KTString const &other, size_type otherPos, size_type otherCount) const;
    int compare(unsigned short const *units) const;
    int compare(size_type pos, size_type count, unsigned short const *units) const;
    int compare(size_type pos, size_type count, unsigned short const *units, size_type unitCount) const;

    /// A copy of at most `count` units from `pos`.
    KTString substr(size_type pos = 0, size_type count = npos) const;

    // ---- edit ----

    KTString &insert(size_type pos, KTString const &text);
    KTString &insert(size_type pos, KTString const &text, size_type textPos, size_type textCount);
    KTString &insert(size_type pos, unsigned short const *units);
    KTString &insert(size_type pos, unsigned short const *units, size_type count);
    KTString &insert(size_type pos, size_type count, unsigned short unit);
    iterator insert(const_iterator at, unsigned short unit);

    KTString &erase(size_type pos = 0, size_type count = npos);
    iterator erase(const_iterator at);
    iterator erase(const_iterator first, const_iterator last);

    KTString &replace(size_type pos, size_type count, KTString const &text);
    KTString &replace(size_type pos, size_type count, KTString const &text, size_type textPos, size_type textCount);
    KTString &replace(size_type pos, size_type count, unsigned short const *units);
    KTString &replace(size_type pos, size_type count, unsigned short const *units, size_type unitCount);
    KTString &replace(size_type pos, size_type count, size_type unitCount, unsigned short unit);

    KTString &append(KTString const &text);
    KTString &append(KTString const &text, size_type pos, size_type count);
    KTString &append(unsigned short const *units);
    KTString &append(unsigned short const *units, size_type count);
    KTString &append(size_type count, unsigned short unit);

    KTString &assign(KTString const &text);
    KTString &assign(KTString const &text, size_type pos, size_type count);
    KTString &assign(unsigned short const *units);
    KTString &assign(unsigned short const *units, size_type count);
    KTString &assign(size_type count, unsigned short unit);

    void push_back(unsigned short unit);
    void clear() noexcept { m_Units.clear(); }

    /// Exchanges the content of both strings.
    void swap(KTString &other) noexcept { m_Units.swap(other.m_Units); }

    /// Makes room for `count` units in all, so that growing up to there does not allocate.
    void reserve(size_type count);

    // ---- access ----

    /// The unit at `pos`. Throws std::out_of_range("invalid string position") unless pos < size().
    reference at(size_type pos);
    const_reference at(size_type pos) const;

    /// The unit at `pos`, unchecked. REQUIRES: pos <= size(); the unit at size() is the terminating zero.
    reference operator[](size_type pos) { return m_Units[pos]; }
    const_reference operator[](size_type pos) const { return m_Units[pos]; }

    size_type size() const noexcept { return m_Units.size(); }
    size_type length() const noexcept { return m_Units.size(); }
    size_type max_size() const noexcept { return m_Units.max_size(); }
    size_type capacity() const noexcept { return m_Units.capacity(); }
    bool empty() const noexcept { return m_Units.empty(); }

    iterator begin() noexcept { return m_Units.begin(); }
    iterator end() noexcept { return m_Units.end(); }
    const_iterator begin() const noexcept { return m_Units.begin(); }
    const_iterator end() const noexcept { return m_Units.end(); }
    const_iterator cbegin() const noexcept { return m_Units.cbegin(); }
    const_iterator cend() const noexcept { return m_Units.cend(); }
    reverse_iterator rbegin() noexcept { return m_Units.rbegin(); }
    reverse_iterator rend() noexcept { return m_Units.rend(); }
    const_reverse_iterator rbegin() const noexcept { return m_Units.rbegin(); }
    const_reverse_iterator rend() const noexcept { return m_Units.rend(); }

    // ---- predicates and transforms ----

    /// Whether `text` occurs; an empty text always does.
    KTBool16 Contains(KTString const &text) const;

    /// Whether any unit of `set` occurs, matched as the flags (OString::AnyOfFlags) say.
    KTBool16 ContainsAny(KTString const &set, unsigned long flags) const;

    /// Whether any of these 32 characters occurs: ~ ` ! @ # $ % ^ & * ( ) _ + { } : " < > ? / . , ' ; [ ] = - | and \ .
    KTBool16 ContainsSpecialCharacters() const;

    /// Whether none of these 9 characters occurs: / \ : * ? " < > | . An empty string is permissible.
    KTBool16 IsPermissableFileName() const;

    /// Replaces the first occurrence of `find` until there is none left, searching from the beginning each time.
    /// WRONG: a replacement that contains `find`, or an empty `find`: the call then never ends. ReplaceAll2 does.
    KTString &ReplaceAll(KTString const &find, KTString const &with);

    /// Replaces every occurrence of `find` from left to right; what a replacement creates is not replaced again. An
    /// empty `find` changes nothing.
    KTString &ReplaceAll2(KTString const &find, KTString const &with);

    /// The pieces between separators, where every unit of `delimiters` is one. Adjacent separators give empty pieces,
    /// a separator at an end gives an empty first or last piece, and an empty string gives one empty piece.
    std::vector<KTString> Split(KTString const &delimiters) const;

  private:
    explicit KTString(KTUnits units) : m_Units(std::move(units)) {}

    KTUnits m_Units;
};

/// The same comparisons and concatenations with the other kinds of text on the left.
KT_PUBLIC_API bool operator==(char const *left, KTString const &right);
KT_PUBLIC_API bool operator==(unsigned short const *left, KTString const &right);
KT_PUBLIC_API bool operator==(wchar_t const *left, KTString const &right);
KT_PUBLIC_API bool operator!=(char const *left, KTString const &right);
KT_PUBLIC_API bool operator!=(unsigned short const *left, KTString const &right);
KT_PUBLIC_API bool operator!=(wchar_t const *left, KTString const &right);
KT_PUBLIC_API bool operator<(char const *left, KTString const &right);
KT_PUBLIC_API bool operator<(unsigned short const *left, KTString const &right);
KT_PUBLIC_API bool operator<(wchar_t const *left, KTString const &right);
KT_PUBLIC_API KTString operator+(char const *left, KTString const &right);
KT_PUBLIC_API KTString operator+(unsigned short const *left, KTString const &right);
KT_PUBLIC_API KTString operator+(wchar_t const *left, KTString const &right);
KT_PUBLIC_API KTString operator+(unsigned short left, KTString const &right);

#include "KTEndExports.h"
