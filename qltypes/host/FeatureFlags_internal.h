// Flags without an exported pointer; clients reach them by name.
#pragma once

#include "qltypes/host/FeatureFlags.h"

namespace QLTypeSys {

extern QlFeature* const preserveEnumsWithDuplicateValues;
extern QlFeature* const symbolicDimsMaxConstraintInCode;
extern QlFeature* const symbolicDimensionDefaultMinimum;

} // namespace QLTypeSys
