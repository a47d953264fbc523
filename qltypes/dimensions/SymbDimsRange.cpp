#include "qltypes/dimensions/SymbDimsRange.h"

#include "qltypes/host/FeatureFlags_internal.h"

namespace QLTypeSys {

int SymbDimsRange::defaultMin() { return symbolicDimensionDefaultMinimum->state(); }

} // namespace QLTypeSys
