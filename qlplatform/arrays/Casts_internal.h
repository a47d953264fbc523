// Conversions of whole arrays: what the cast functions of the host language do.
#pragma once

#include "qlplatform/arrays/HostArray.h"

namespace hostarray {

/// The value in another numeric class or as logical. Complex stays complex; to integers, halves round away from zero,
/// values saturate and NaN becomes 0. Objects count as their underlying values. Raises `CannotCast` for null, for cells
/// and structures, and for complex values or NaN to logical.
txArrayPtr cast(const txArray_tag* array, txClassID to);

/// The value as complex array of its class, with zero imaginary parts unless it has some. Logicals and characters
/// become double first. Raises `CannotCast` as cast.
txArrayPtr withImaginaryPart(const txArray_tag* array);

/// The real parts in the same class. Raises `CannotCast` as cast.
txArrayPtr realPart(const txArray_tag* array);

} // namespace hostarray
