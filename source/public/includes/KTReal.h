// KTReal.h: a real number, one double passed by value.
//
// Arithmetic and comparison act on the double, with other reals and with plain numbers on either side:
//
//     KTReal width = 2.5;
//     KTReal const half = width / 2;      // 1.25
//     double const plain = width;         // 2.5
//     KTInt32 const whole = width;        // 2, checked
//
// The conversion to KTInt32 is the only one to an integer. Other integers, bool included, do not compile, as they would
// lose the fraction without a word; WRONG: `if (width)`, `width % 2`, `KTInt64 n = width`. Say what is meant:
// `width != 0`, `static_cast<KTInt64>(width.AsDouble())`.

#pragma once

#include "KTTypes.h"

#include <compare>
#include <concepts>
#include <type_traits>

#include "KTBeginExports.h"

/// What may stand beside a real in an expression: numbers, and enumerators that are numbers to the language. They are
/// converted to double first, so that integers beyond 2^53 are rounded.
template <typename T>
concept KTRealOperand = std::is_arithmetic_v<T> || (std::is_enum_v<T> && std::is_convertible_v<T, double>);

/// Integers that a real does not become by itself.
template <typename T>
concept KTRealRefusedInteger = std::is_integral_v<T> && !std::is_same_v<T, KTInt32>;

/// A real number. Any thread may use its own values; one value is not locked.
class KT_PUBLIC_API KTReal {
  public:
    /// The value 0.
    KTReal() = default;

    /// The given value, NaN and infinities included.
    KTReal(double value) : m_Value(value) {}

    /// The sum, difference or product as IEEE 754 defines it; nothing is reported.
    KTReal &operator+=(KTReal const &other);
    KTReal &operator-=(KTReal const &other);
    KTReal &operator*=(KTReal const &other);

    /// Divides as IEEE 754 does: by 0 gives an infinity or NaN, never an error.
    KTReal &operator/=(KTReal const &other);

    /// The number as a double, unchanged.
    double AsDouble() const { return m_Value; }

    /// The number truncated toward zero. A value below -2147483648 or above 2147483647 is reported as an assertion
    /// and gives the nearer limit; NaN gives 0 without a report. The report's message is made with FORMAT_ARGS, so
    /// convert out-of-range values on one thread at a time.
    operator KTInt32() const;

    /// The number as that floating-point type: a double unchanged, a float rounded.
    template <std::floating_point T> operator T() const { return static_cast<T>(m_Value); }

    /// Any other integer: see the top of this file.
    template <KTRealRefusedInteger T> operator T() const = delete;

    // ---- arithmetic, as IEEE 754 defines it ----

    KTReal operator+() const { return *this; }
    KTReal operator-() const { return {-m_Value}; }

    friend KTReal operator+(KTReal const &a, KTReal const &b) { return {a.m_Value + b.m_Value}; }
    friend KTReal operator-(KTReal const &a, KTReal const &b) { return {a.m_Value - b.m_Value}; }
    friend KTReal operator*(KTReal const &a, KTReal const &b) { return {a.m_Value * b.m_Value}; }
    friend KTReal operator/(KTReal const &a, KTReal const &b) { return {a.m_Value / b.m_Value}; }

    // The plain number is a template parameter so that it matches exactly: with a double parameter, `real + 1` would be
    // torn between this operator and the built-in one after the conversion to KTInt32.
    template <KTRealOperand T> friend KTReal operator+(KTReal const &a, T b) { return a + FromNumber(b); }
    template <KTRealOperand T> friend KTReal operator-(KTReal const &a, T b) { return a - FromNumber(b); }
    template <KTRealOperand T> friend KTReal operator*(KTReal const &a, T b) { return a * FromNumber(b); }
    template <KTRealOperand T> friend KTReal operator/(KTReal const &a, T b) { return a / FromNumber(b); }
    template <KTRealOperand T> friend KTReal operator+(T a, KTReal const &b) { return FromNumber(a) + b; }
    template <KTRealOperand T> friend KTReal operator-(T a, KTReal const &b) { return FromNumber(a) - b; }
    template <KTRealOperand T> friend KTReal operator*(T a, KTReal const &b) { return FromNumber(a) * b; }
    template <KTRealOperand T> friend KTReal operator/(T a, KTReal const &b) { return FromNumber(a) / b; }

    /// A floating-point variable changed by a real; integer variables do not compile.
    template <std::floating_point T> friend T &operator+=(T &a, KTReal const &b) { return a = static_cast<T>(a + b); }
    template <std::floating_point T> friend T &operator-=(T &a, KTReal const &b) { return a = static_cast<T>(a - b); }
    template <std::floating_point T> friend T &operator*=(T &a, KTReal const &b) { return a = static_cast<T>(a * b); }
    template <std::floating_point T> friend T &operator/=(T &a, KTReal const &b) { return a = static_cast<T>(a / b); }

    // ---- comparison, as IEEE 754 defines it: NaN is unequal to everything and neither less nor greater ----

    friend bool operator==(KTReal const &a, KTReal const &b) { return a.m_Value == b.m_Value; }
    friend std::partial_ordering operator<=>(KTReal const &a, KTReal const &b) { return a.m_Value <=> b.m_Value; }
    template <KTRealOperand T> friend bool operator==(KTReal const &a, T b) { return a == FromNumber(b); }
    template <KTRealOperand T> friend std::partial_ordering operator<=>(KTReal const &a, T b) {
        return a <=> FromNumber(b);
    }

  private:
    template <KTRealOperand T> static KTReal FromNumber(T number) { return {static_cast<double>(number)}; }

    double m_Value = 0.0;
};

// ---- operators of integers ----
//
// Compilers disagree on whether the refused conversions above keep a real out of the built-in operators, so these are
// refused by name.

/// The other operand of an expression with a real: a real beside a number, either beside a real.
template <typename T, typename Other>
concept KTRealPartner = (std::is_same_v<T, KTReal> && (std::is_same_v<Other, KTReal> || KTRealOperand<Other>)) ||
                        (KTRealOperand<T> && std::is_same_v<Other, KTReal>);

template <typename A, KTRealPartner<A> B> void operator%(A const &a, B const &b) = delete;
template <typename A, KTRealPartner<A> B> void operator&(A const &a, B const &b) = delete;
template <typename A, KTRealPartner<A> B> void operator|(A const &a, B const &b) = delete;
template <typename A, KTRealPartner<A> B> void operator^(A const &a, B const &b) = delete;
template <typename A, KTRealPartner<A> B> void operator<<(A const &a, B const &b) = delete;
template <typename A, KTRealPartner<A> B> void operator>>(A const &a, B const &b) = delete;
template <std::integral T> void operator+=(T &a, KTReal const &b) = delete;
template <std::integral T> void operator-=(T &a, KTReal const &b) = delete;
template <std::integral T> void operator*=(T &a, KTReal const &b) = delete;
template <std::integral T> void operator/=(T &a, KTReal const &b) = delete;
template <typename A, KTRealPartner<A> B> void operator%=(A &a, B const &b) = delete;
template <typename A, KTRealPartner<A> B> void operator&=(A &a, B const &b) = delete;
template <typename A, KTRealPartner<A> B> void operator|=(A &a, B const &b) = delete;
template <typename A, KTRealPartner<A> B> void operator^=(A &a, B const &b) = delete;
template <typename A, KTRealPartner<A> B> void operator<<=(A &a, B const &b) = delete;
template <typename A, KTRealPartner<A> B> void operator>>=(A &a, B const &b) = delete;
void operator~(KTReal const &a) = delete;

#include "KTEndExports.h"
