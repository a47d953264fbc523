// The predictive overflow test among the built-in types; QLTypeSys::DataType offers it to clients.
#pragma once

#include "qltypes/fixed_point/FixPointDefs.h"

namespace QLTypeSys::conversion {

/// True when some value of `data` would leave the range of the destination type. `count` elements, twice as many values
/// when `isComplex`. False for NaN, for a count of 0 or less, and for identifiers and modes outside the table.
bool overflowExpected(const void* data, int count, int srcId, bool isComplex, int dstId, fxpModeRounding_tag rounding);

} // namespace QLTypeSys::conversion
