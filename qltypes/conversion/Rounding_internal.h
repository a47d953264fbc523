// r(v): a floating value to the integral value that a rounding mode chooses, in the precision of v.
//
// Each mode gives the mathematically exact choice for every finite v and passes NaN and infinities through; no step
// depends on the rounding mode of the floating-point environment, because every sum below is either exact or so far
// from the next integer that floor gives the same.
#pragma once

#include <cmath>
#include <limits>

#include "qltypes/fixed_point/FixPointDefs.h"

namespace QLTypeSys::conversion {

/// From here on every value is integral: 2^52 for double, 2^23 for single.
template <class F> inline constexpr F allIntegralFrom = 1 / std::numeric_limits<F>::epsilon();

template <fxpModeRounding_tag mode, class F> F rounded(F v) {
    if constexpr (mode == FXP_ROUND_ZERO || mode == FXP_ROUND_AS_ZERO) return std::trunc(v);
    if constexpr (mode == FXP_ROUND_CEILING) return std::ceil(v);
    if constexpr (mode == FXP_ROUND_FLOOR) return std::floor(v);
    if constexpr (mode == FXP_ROUND_HALF_AWAY) return std::round(v);

    const F magnitude = std::fabs(v);
    if (!(magnitude < allIntegralFrom<F>)) return v; // NaN included
    if constexpr (mode == FXP_ROUND_HALF_UP) {
        if (magnitude < F(0.5)) return 0;
        return std::floor(v + F(0.5));
    }
    if constexpr (mode == FXP_ROUND_HALF_EVEN) {
        if (magnitude <= F(0.5)) return std::copysign(F(0), v);
        const F below = std::floor(v);
        const F part = v - below; // exact: v is beyond one half
        const bool up = part > F(0.5) || (part == F(0.5) && std::fmod(below, F(2)) != 0);
        return up ? below + 1 : below;
    }
}

} // namespace QLTypeSys::conversion
