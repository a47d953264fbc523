// Arrays of objects: a class name over an underlying array of values.
#pragma once

#include "qlplatform/Export.h"
#include "qlplatform/arrays/HostArray.h"

/// An array of objects of a class, as many as `underlying` has elements. Takes `underlying` over in any case; the
/// caller owns the result. The class need not be defined. Raises OutOfMemory.
QL_EXPORT txArray_tag* omCreateObjectArray(const char* className, txArray_tag* underlying);

/// The array of values behind an array of objects; any other array is its own. Null for null. Owned by `array`.
QL_EXPORT const txArray_tag* omGetUnderlyingArray(const txArray_tag* array);
