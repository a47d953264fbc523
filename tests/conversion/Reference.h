// What the conversions must give, by exact integer arithmetic: slow, obvious, and independent of floating-point
// instructions. Reference_test.cpp holds it against rational numbers of unlimited size.
#pragma once

#include <array>
#include <bit>
#include <cstdint>
#include <limits>
#include <type_traits>

#include "qltypes/conversion/Axes_internal.h"

namespace reference {

using QLTypeSys::conversion::Boolean;

/// A finite number: sign, magnitude * 2^exponent.
struct Exact {
    bool negative = false;
    std::uint64_t magnitude = 0;
    int exponent = 0;
};

enum class Kind { finite, infinite, nan };

/// A source element taken apart.
struct Value {
    Kind kind = Kind::finite;
    Exact exact; // the sign also of infinities
};

Value valueOf(double v);
Value valueOf(float v);
inline Value valueOf(std::int64_t v) {
    return {Kind::finite, {v < 0, v < 0 ? -static_cast<std::uint64_t>(v) : static_cast<std::uint64_t>(v), 0}};
}
inline Value valueOf(Boolean v) { return valueOf(std::int64_t{static_cast<std::uint8_t>(v)}); }
template <class T>
requires std::is_integral_v<T> Value valueOf(T v) { return valueOf(std::int64_t{v}); }

/// An integer of any size, as far as conversions to 32 bits need it: beyond 64 bits only its low bits are kept.
struct Whole {
    bool negative = false;
    bool beyond64 = false;
    std::uint64_t magnitude = 0;

    bool operator==(const Whole&) const = default;
};

/// The integers next to a finite number that the seven rounding modes choose.
using Roundings = std::array<Whole, 7>;
Roundings roundingsOf(const Exact& v);

/// True when the integer is at least, or at most, the bound.
bool atLeast(const Whole& v, std::int64_t bound);
bool atMost(const Whole& v, std::int64_t bound);

/// A value with what follows from it, so that many cells can be derived from one.
struct Analysed {
    Value value;
    Roundings roundings; // of finite values only
};
template <class S> Analysed analysed(S s) {
    Analysed made{valueOf(s), {}};
    if (made.value.kind == Kind::finite) made.roundings = roundingsOf(made.value.exact);
    return made;
}

/// One element into an integer type.
template <class D> D toInteger(const Analysed& v, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow) {
    constexpr std::int64_t lo = std::numeric_limits<D>::min();
    constexpr std::int64_t hi = std::numeric_limits<D>::max();
    const bool negative = v.value.exact.negative;
    if (v.value.kind == Kind::nan) return 0;
    if (v.value.kind == Kind::infinite) return static_cast<D>(overflow == FXP_OVERFLOW_WRAP ? 0 : negative ? lo : hi);

    const Whole& whole = v.roundings[rounding];
    if (overflow == FXP_OVERFLOW_SATURATE) {
        if (atLeast(v.roundings[FXP_ROUND_FLOOR], hi)) return static_cast<D>(hi);
        if (atMost(v.roundings[FXP_ROUND_CEILING], lo)) return static_cast<D>(lo);
    }
    return static_cast<D>(whole.negative ? -whole.magnitude : whole.magnitude); // modulo 2^N, as defined for integers
}

/// The nearest double or single, halves to even; its bits. NaN gives some NaN.
std::uint64_t nearestDoubleBits(const Value& v);
std::uint32_t nearestSingleBits(const Value& v);

/// One element of any cell.
template <class S, class D> D convert(S s, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow) {
    if constexpr (std::is_same_v<D, double>)
        return std::bit_cast<double>(nearestDoubleBits(valueOf(s)));
    else if constexpr (std::is_same_v<D, float>)
        return std::bit_cast<float>(nearestSingleBits(valueOf(s)));
    else if constexpr (std::is_same_v<S, Boolean>)
        return static_cast<D>(static_cast<std::uint8_t>(s));
    else if constexpr (std::is_same_v<D, Boolean>)
        return Boolean{valueOf(s).kind != Kind::finite || valueOf(s).exact.magnitude != 0};
    else
        return toInteger<D>(analysed(s), rounding, overflow);
}

/// True when two elements stand for the same number. NaN equals nothing.
bool equal(const Value& a, const Value& b);

} // namespace reference
