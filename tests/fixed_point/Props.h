// Comparing and printing number records in tests.
#pragma once

#include <bit>
#include <cstdint>
#include <ostream>

#include "qltypes/fixed_point/FixPointDefs.h"

/// Every field equal; doubles by their bits, but all NaNs as one.
inline bool operator==(const fxpDataTypeProp& a, const fxpDataTypeProp& b) {
    const auto sameDouble = [](double x, double y) {
        return std::bit_cast<std::uint64_t>(x) == std::bit_cast<std::uint64_t>(y) || (x != x && y != y);
    };
    return a.DataTypeMode == b.DataTypeMode && a.Signedness == b.Signedness && a.WordLength == b.WordLength &&
           a.ExponentLength == b.ExponentLength && a.FixedExponent == b.FixedExponent &&
           sameDouble(a.SlopeAdjustmentFactor, b.SlopeAdjustmentFactor) && sameDouble(a.Bias, b.Bias) &&
           a.DataTypeOverrideOff == b.DataTypeOverrideOff;
}

inline std::ostream& operator<<(std::ostream& out, const fxpDataTypeProp& p) {
    const auto precision = out.precision(17);
    out << "{mode " << p.DataTypeMode << ", sign " << p.Signedness << ", bits " << p.WordLength << ", exponent bits "
        << p.ExponentLength << ", exponent " << p.FixedExponent << ", factor " << p.SlopeAdjustmentFactor << ", bias "
        << p.Bias << ", override off " << p.DataTypeOverrideOff << "}";
    out.precision(precision);
    return out;
}
