// The feature flags and testing hooks of the type service.
//
// Each is read at its use and may be changed at run time: QLFEAT_EnableEffectiveDataType->setState(1). All flags of a
// process can be listed with QlFeature::all() and QlTestingHook::all(). Process-wide and unlocked.
#pragma once

#include "qlplatform/services/QlFeature.h"

extern QL_EXPORT QlFeature* QLFEAT_EnableEffectiveDataType;   ///< a contained type is the effective type
extern QL_EXPORT QlFeature* QLFEAT_QLHalfPrecisionSupport;    ///< read by clients only
extern QL_EXPORT QlFeature* QLFEAT_QLInt64;                   ///< read by clients only
extern QL_EXPORT QlFeature* QLFEAT_QLStringSupportRapidAccel; ///< read by clients only
extern QL_EXPORT QlFeature* QLFEAT_UseTorvexNameForInt64;     ///< 64-bit integers are written int64 and uint64
extern QL_EXPORT QlFeature* QLFEAT_AbsoluteTime;              ///< read by clients only
extern QL_EXPORT QlFeature* QLFEAT_QLImageType;               ///< read by clients only

extern QL_EXPORT QlTestingHook* QLTH_ImageTypeImplementation;  ///< chooses the storage of image types
extern QL_EXPORT QlTestingHook* QLTH_DisplayDynamicMatrixType; ///< dynamic matrices show their own name
