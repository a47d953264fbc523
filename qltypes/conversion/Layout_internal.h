// Real and complex layouts, broadcasts and the check, made of contiguous runs of one level.
#pragma once

#include <cstddef>
#include <cstdint>

#include "qltypes/conversion/Axes_internal.h"

namespace QLTypeSys::conversion {

/// What the layouts need to know of one slot of the matrix.
struct Cell {
    std::size_t slot;
    int srcId;
    int dstId;
    std::size_t srcSize; ///< bytes of one source element, a complex one having two of them
    std::size_t dstSize;
    bool joinsParts; ///< the destination is boolean and the source is not: a complex value becomes one truth
    bool copiesBytes;
    bool hasSignedZero; ///< the source is floating: a sign bit alone is a zero
};

template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
inline constexpr Cell cellOf = {
    .slot = slotOf(idOf<S>, idOf<D>, overflow, rounding),
    .srcId = idOf<S>,
    .dstId = idOf<D>,
    .srcSize = sizeof(S),
    .dstSize = sizeof(D),
    .joinsParts = isBoolean<D> && !isBoolean<S>,
    .copiesBytes = copiesBytes<S, D, overflow>,
    .hasSignedZero = isFloating<S>,
};

/// Source and destination of one call, as the caller describes them.
struct Vectors {
    const std::byte* src;
    std::byte* dst;
    std::size_t srcCount;
    std::size_t dstCount;
    bool srcComplex;
    bool dstComplex;
};

/// Converts in any layout. The result is false when `check` is set and an element was lost.
bool convertInLayout(const Cell& cell, const Vectors& vectors, bool check);

} // namespace QLTypeSys::conversion
