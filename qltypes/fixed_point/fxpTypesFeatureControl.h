// The switch that decides which of two names 64-bit integers get in texts that the library writes: int64 and uint64, or
// sfix64 and ufix64. Reading accepts both at any setting. It is the feature QLFEAT_UseTorvexNameForInt64; process-wide
// and unlocked.
//
//   fxpTypesFeature::setUseTorvexNameForInt64(false);
#pragma once

#include "qlplatform/Export.h"

namespace fxpTypesFeature {

/// Whether 64-bit integers are written int64 and uint64.
QL_EXPORT bool getUseTorvexNameForInt64();

/// Stores the setting, then calls the feature's change callback when it has one.
QL_EXPORT void setUseTorvexNameForInt64(bool useTorvexName);

} // namespace fxpTypesFeature
