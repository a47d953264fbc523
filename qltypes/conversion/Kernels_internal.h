// The rules for one element: how it is converted, whether it would be lost, whether it would overflow.
//
// These are the definition that every vector level must reproduce bit for bit. No value is cast to an integer type
// before it is known to lie in its range.
#pragma once

#include <algorithm>
#include <cstdint>
#include <limits>
#include <type_traits>
#include <utility>

#include "qltypes/conversion/Axes_internal.h"
#include "qltypes/conversion/Rounding_internal.h"

namespace QLTypeSys::conversion {

template <class D> inline constexpr D lowest = std::numeric_limits<D>::min();
template <class D> inline constexpr D highest = std::numeric_limits<D>::max();

/// The highest value of the floating type F that is in the range of D.
template <class F, class D>
inline constexpr F highestIn = std::numeric_limits<F>::digits >= std::numeric_limits<D>::digits
                                   ? static_cast<F>(highest<D>)
                                   : static_cast<F>(highest<D> - (highest<D> >> std::numeric_limits<F>::digits));

/// The highest value that both types have; of a boolean, 1.
template <class S, class D> consteval auto largestCommon() {
    if constexpr (isBoolean<D>)
        return S{1};
    else
        return std::cmp_less(highest<S>, highest<D>) ? highest<S> : static_cast<S>(highest<D>);
}

/// 2 to the width of the integer type, in double.
template <class D> inline constexpr double modulus = 4.0 * (1ULL << (8 * sizeof(D) - 2));

/// The value that a type's bits stand for: itself, or the byte of a boolean.
template <class T> constexpr auto numberOf(T v) {
    if constexpr (isBoolean<T>)
        return static_cast<std::uint8_t>(v);
    else
        return v;
}

template <class D, fxpModeRounding_tag rounding, class F> D saturatedFromFloating(F v) {
    constexpr F above = static_cast<F>(highest<D>); // the next power of two for a single and 32 bits
    constexpr F below = static_cast<F>(lowest<D>);
    if (v >= above) return highest<D>;
    if (v <= below) return lowest<D>;
    if (v != v) return 0;
    return static_cast<D>(rounded<rounding>(v));
}

template <class D, fxpModeRounding_tag rounding, class F> D wrappedFromFloating(F v) {
    const double whole = rounded<rounding>(v);
    if (!(std::fabs(whole) <= std::numeric_limits<double>::max())) return 0;
    if (whole >= lowest<D> && whole <= highest<D>) return static_cast<D>(whole);
    double rest = std::fmod(whole, modulus<D>);
    if (rest < lowest<D>) rest += modulus<D>;
    if (rest > highest<D>) rest -= modulus<D>;
    return static_cast<D>(rest);
}

/// f(s): one element under a rounding and overflow mode.
template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow> D converted(S s) {
    if constexpr (isBoolean<S> || isBoolean<D>) {
        if constexpr (isBoolean<S>)
            return static_cast<D>(numberOf(s)); // kept: the byte as it is, also above 1
        else
            return Boolean{s != 0};
    } else if constexpr (!overflowMatters<S, D>) {
        return static_cast<D>(s);
    } else if constexpr (isFloating<S>) {
        if constexpr (overflow == FXP_OVERFLOW_SATURATE)
            return saturatedFromFloating<D, rounding>(s);
        else
            return wrappedFromFloating<D, rounding>(s);
    } else {
        if constexpr (overflow == FXP_OVERFLOW_SATURATE)
            return static_cast<D>(std::clamp<std::int64_t>(s, lowest<D>, highest<D>));
        else
            return static_cast<D>(s);
    }
}

/// True when the element that `converted` writes equals s. No mode can change that: a value survives exactly when the
/// destination has it.
template <class S, class D> bool survives(S s) {
    if constexpr (holdsEveryValue<S, D>())
        return true;
    else if constexpr (isBoolean<D>)
        return s == 0 || s == 1;
    else if constexpr (isFloating<D>)
        return static_cast<double>(static_cast<D>(s)) == static_cast<double>(s);
    else if constexpr (isFloating<S>)
        return static_cast<double>(s) >= lowest<D> && static_cast<double>(s) <= highest<D> && std::trunc(s) == s;
    else
        return std::in_range<D>(s);
}

/// The points at which a rounded value leaves the range of D, in the precision of the source, and whether the points
/// themselves are outside.
template <class F> struct OverflowBounds {
    F above;
    F below;
    bool aboveIsOutside;
    bool belowIsOutside;
};

template <class S, class D, fxpModeRounding_tag rounding> consteval OverflowBounds<S> overflowBounds() {
    // kept: in single precision the bounds of 32-bit types are themselves rounded, which moves the inclusive ones
    constexpr auto bounds = [](double above, double below, bool aboveIsOutside, bool belowIsOutside) {
        return OverflowBounds<S>{static_cast<S>(highest<D> + above), static_cast<S>(lowest<D> - below), aboveIsOutside,
                                 belowIsOutside};
    };
    if constexpr (rounding == FXP_ROUND_ZERO) return bounds(1, 1, true, true);
    if constexpr (rounding == FXP_ROUND_HALF_UP) return bounds(0.5, 0.5, true, false);
    if constexpr (rounding == FXP_ROUND_CEILING) return bounds(0, 1, false, true);
    if constexpr (rounding == FXP_ROUND_FLOOR) return bounds(1, 0, true, false);
    if constexpr (rounding == FXP_ROUND_HALF_AWAY) return bounds(0.5, 0.5, true, true);
    if constexpr (rounding == FXP_ROUND_HALF_EVEN) return bounds(0.5, 0.5, true, false);
}

/// The smallest double whose conversion to single is infinite under the default rounding: half a unit above the
/// largest single, where the tie goes to the even neighbour.
inline constexpr double infiniteAsSingleFrom = 0x1.ffffffp+127;
inline constexpr double largestDouble = std::numeric_limits<double>::max();

/// True when s does not fit into D under the rounding mode. NaN always fits.
template <class S, class D, fxpModeRounding_tag rounding> bool overflows(S s) {
    if constexpr (!canOverflow<S, D>) {
        return false;
    } else if constexpr (isFloating<D>) {
        const double magnitude = std::fabs(s);
        return magnitude >= infiniteAsSingleFrom && magnitude <= largestDouble;
    } else if constexpr (isFloating<S>) {
        constexpr OverflowBounds<S> bounds = overflowBounds<S, D, rounding>();
        return (bounds.aboveIsOutside ? s >= bounds.above : s > bounds.above) ||
               (bounds.belowIsOutside ? s <= bounds.below : s < bounds.below);
    } else {
        return !std::in_range<D>(s);
    }
}

} // namespace QLTypeSys::conversion
