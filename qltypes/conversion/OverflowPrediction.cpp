#include "qltypes/conversion/OverflowPrediction_internal.h"

#include "qltypes/conversion/Levels_internal.h"

namespace QLTypeSys::conversion {

bool overflowExpected(const void* data, int count, int srcId, bool isComplex, int dstId, fxpModeRounding_tag rounding) {
    const auto isNumber = [](int id) { return id >= 0 && id < booleanId; };
    if (!isNumber(srcId) || !isNumber(dstId) || count <= 0) return false;
    // kept: an unknown mode is no overflow only where rounding counts
    if (roundingFlags[srcId][dstId] && (rounding < FXP_ROUND_ZERO || rounding > FXP_ROUND_HALF_EVEN)) return false;
    const OverflowRun overflows = levelInUse->overflows[slotOf(srcId, dstId, FXP_OVERFLOW_WRAP, rounding)];
    return overflows && overflows(static_cast<const std::byte*>(data), static_cast<std::size_t>(count) << isComplex);
}

} // namespace QLTypeSys::conversion
