// Arithmetic on counts, offsets and dimensions that a client may have filled with anything: it wraps around and never
// traps.
#pragma once

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

/// A dimension or padding as a 32-bit integer: unknown (-1) stays, infinite (the largest value) becomes 0x7ffffffe,
/// anything else keeps its low 32 bits.
inline int narrowed(long value) {
    return value == std::numeric_limits<long>::max() ? 0x7ffffffe : static_cast<int>(value);
}

} // namespace QLTypeSys::structures
