// The bounds between which a dimension is known to lie.
#pragma once

#include <limits>

#include "qlplatform/Export.h"

namespace QLTypeSys {

/// Which bounds of a range are left out of generated code; a set of two bits.
enum GenerateCodeFlags : unsigned {
    generateBothBounds = 0,
    omitLowerBound = 1,
    omitUpperBound = 2,
    omitBothBounds = 3,
};

/// Bounds, both inclusive. A new range holds no information.
struct QL_EXPORT SymbDimsRange {
    /// Lower bound; the smallest integer when it is not known.
    int min = std::numeric_limits<int>::min();
    /// Upper bound; the largest integer when it is not known.
    int max = std::numeric_limits<int>::max();
    /// Which bounds are left out of generated code.
    GenerateCodeFlags flags = generateBothBounds;

    /// The bound that every symbolic dimension is taken to satisfy without being told: the present state of the feature
    /// flag SymbolicDimensionDefaultMinimum.
    static int defaultMin();
};

} // namespace QLTypeSys
