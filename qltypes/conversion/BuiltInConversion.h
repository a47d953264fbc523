// Conversion of vectors among the nine built-in types under any rounding and overflow mode.
//
// The matrix is here; one call that also looks up is qlConvertBuiltInDTypeVectWithCheck in CheckedConversion.h. Types
// without a row, the 64-bit integers and half among them, convert through their own conversion functions.
//
//   const BuiltInConvFcn convert = utGetQlBuiltinDtypeConvFcn(0, 2, FXP_OVERFLOW_SATURATE, FXP_ROUND_FLOOR);
//   const bool kept = convert(doubles, int8s, n, n, false, false, true, 0, 2, FXP_OVERFLOW_SATURATE, FXP_ROUND_FLOOR);
#pragma once

#include <cstddef>

#include "qlplatform/Export.h"
#include "qltypes/fixed_point/FixPointDefs.h"

/// A conversion between two of the built-in types 0 to 8 (double, single, int8, uint8, int16, uint16, int32, uint32,
/// boolean). Stateless and re-entrant.
///
/// `src`, `dst`: elements, complex ones interleaved as real and imaginary part. No alignment is needed. They may be the
///     same address where elements of both have the same bytes; the check then speaks of the values as they were.
/// `srcCount`: elements of the source; at most 1 means that its first element is written to the whole destination.
///     Toward boolean (from another type) only 1 means that.
/// `dstCount`: elements to write; a complex pair counts once. 0 touches nothing.
/// `srcComplex`, `dstComplex`: real to complex writes imaginary parts of 0, complex to real ignores the imaginary
/// parts.
///     A boolean made of another type is always real, and true when either part is not 0.
/// `check`: asks whether anything was lost.
/// `srcId`, `dstId`, `overflow`, `rounding`: not read; the function was looked up for them.
///
/// Returns false when `check` is set and some element written differs from its source part, a source part is NaN, or an
/// imaginary part that is not 0 was dropped. Pairs of types where the destination has every value of the source always
/// return true, also when an imaginary part was dropped.
using BuiltInConvFcn = bool (*)(const void* src, void* dst, std::size_t srcCount, std::size_t dstCount, bool srcComplex,
                                bool dstComplex, bool check, int srcId, int dstId, fxpModeOverflow_tag overflow,
                                fxpModeRounding_tag rounding);

/// The conversion between two built-in types. Rounding counts only from double and single to the integers; overflow
/// counts there and between integers where the destination does not hold every value of the source.
/// Unchecked: the identifiers must be 0 to 8 and the modes of their enumerations.
QL_EXPORT BuiltInConvFcn utGetQlBuiltinDtypeConvFcn(int srcId, int dstId, fxpModeOverflow_tag overflow,
                                                    fxpModeRounding_tag rounding);
