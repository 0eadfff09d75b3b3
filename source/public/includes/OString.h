// OString.h: the text type of the file layer underneath the library.
//
// A value holding UTF-16 code units, always followed by a zero unit. It has just what the file layer and KTString
// need: the strict conversions from and to UTF-8 and the any-of test. Hosts meet it in file and path interfaces and
// turn it into a KTString, which has the full set of operations.

#pragma once

#include "KTUnitTraits.h"

#include <string_view>

#include "KTBeginExports.h"

/// UTF-16 text of the file layer. Distinct values may be used from any thread; one value is not locked.
class KT_PUBLIC_API OString {
  public:
    /// How ContainsAny matches; values may be combined, bits not named here are ignored.
    enum AnyOfFlags : unsigned long {
        kAnyOfExact = 0,     ///< unit by unit
        kAnyOfIgnoreCase = 1 ///< letters match in either case (the system's language-neutral lower case)
    };

    OString() = default;

    /// Takes the units as they are. No validation.
    explicit OString(KTUnits units);

    /// Copies `count` units. REQUIRES: units is not null unless count is 0.
    OString(unsigned short const *units, std::size_t count);

    /// Decodes UTF-8 (Unicode 15, section 3.9). Malformed input never fails: each maximal ill-formed part becomes one
    /// U+FFFD. Zero bytes become zero units. Throws std::bad_alloc, or std::length_error past the longest string.
    static OString FromUTF8(std::string_view bytes);

    /// The UTF-8 form. An unpaired surrogate becomes U+FFFD (EF BF BD). Throws std::bad_alloc.
    std::string GetUTF8() const;

    /// The units, zero-terminated, valid until the object changes.
    unsigned short const *c_str() const { return m_Units.c_str(); }

    /// Number of units, the terminating zero not counted.
    std::size_t length() const { return m_Units.length(); }

    /// Whether there is no unit.
    bool empty() const { return m_Units.empty(); }

    /// The units as a standard string.
    KTUnits const &GetUnits() const { return m_Units; }

    /// Adds `count` units at the end. REQUIRES: units is not null unless count is 0. Throws std::bad_alloc, or
    /// std::length_error past the longest string; the text is unchanged then.
    void Append(unsigned short const *units, std::size_t count);

    /// Whether any unit of `set` occurs in this text, matched as `flags` (AnyOfFlags) says. An empty set never does.
    bool ContainsAny(OString const &set, unsigned long flags = kAnyOfExact) const;

    friend bool operator==(OString const &a, OString const &b) { return a.m_Units == b.m_Units; }
    friend bool operator!=(OString const &a, OString const &b) { return a.m_Units != b.m_Units; }

  private:
    KTUnits m_Units;
};

#include "KTEndExports.h"
