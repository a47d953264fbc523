// Arithmetic on counts, offsets and dimensions that a client may have filled with anything: it wraps around and never
// traps.
#pragma once

#include <cmath>
#include <limits>

namespace QLTypeSys::structures {

inline long wrappingAdd(long a, long b) {
    return static_cast<long>(static_cast<unsigned long>(a) + static_cast<unsigned long>(b));
}

inline long wrappingSubtract(long a, long b) {
    return static_cast<long>(static_cast<unsigned long>(a) - static_cast<unsigned long>(b));
}

inline long wrappingMultiply(long a, long b) {
    return static_cast<long>(static_cast<unsigned long>(a) * static_cast<unsigned long>(b));
}

/// How many times `b` goes into `a`, computed in double; the largest value for what is beyond it. `b` is above 0.
inline long quotientInDouble(long a, long b) {
    const double quotient = std::floor(static_cast<double>(a) / static_cast<double>(b));
    return quotient < 0x1p63 ? static_cast<long>(quotient) : std::numeric_limits<long>::max();
}

/// A dimension or padding as a 32-bit integer: unknown (-1) stays, infinite (the largest value) becomes 0x7ffffffe,
/// anything else keeps its low 32 bits.
inline int narrowed(long value) {
    return value == std::numeric_limits<long>::max() ? 0x7ffffffe : static_cast<int>(value);
}

} // namespace QLTypeSys::structures
