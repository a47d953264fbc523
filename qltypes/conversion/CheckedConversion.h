// Conversion of a whole vector among the built-in types in one call.
//
// The functions behind it are in BuiltInConversion.h; whether a vector would overflow is asked beforehand with
// QLTypeSys::DataType::CheckForOverflowDuringDataTypeConversion in DataType.h.
//
//   qlConvertBuiltInDTypeVectWithCheck(doubles, n, 0, false, int8s, n, 2, false,
//                                      FXP_OVERFLOW_SATURATE, FXP_ROUND_HALF_EVEN, true);
#pragma once

#include "qlplatform/Export.h"
#include "qltypes/fixed_point/FixPointDefs.h"
#include "qltypes/types/FunctionTypes.h"

/// Looks up the conversion and runs it. Layouts, broadcast and result are those of BuiltInConvFcn: false when `check`
/// is set and something was lost.
/// Unchecked: the identifiers must be 0 to 8 and the modes of their enumerations.
QL_EXPORT bool qlConvertBuiltInDTypeVectWithCheck(const void* src, unsigned long srcCount, int srcId, bool srcComplex,
                                                  void* dst, unsigned long dstCount, int dstId, bool dstComplex,
                                                  fxpModeOverflow_tag overflow, fxpModeRounding_tag rounding,
                                                  bool check);

/// The conversion function of auto, which counts as double, and of the built-in types: saturates and truncates toward
/// zero. Always returns 1; caller and auxiliary data are ignored.
/// Unchecked: both identifiers must lead to a built-in type or auto.
QL_EXPORT int qlBuiltInConvertBetween(_qlDataTypeAccess_tag* access, const char* caller, int dstId, int srcId,
                                      int count, const void* src, const void* aux, void* dst);
