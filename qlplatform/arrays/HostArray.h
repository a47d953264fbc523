// Host arrays: reference-counted values of the host language.
#pragma once

#include <memory>

#include "qlplatform/Export.h"

struct txArray_tag;

/// Gives up one reference; the array goes with its last one. Null is allowed.
QL_EXPORT void txDestroyArray(txArray_tag* array);

/// Takes one more reference and marks the array as no longer temporary, so that it outlives the present call.
QL_EXPORT void txKeepArray(txArray_tag* array);

struct txArrayDeleter {
    void operator()(txArray_tag* array) const { txDestroyArray(array); }
};

/// Owns one reference to an array.
using txArrayPtr = std::unique_ptr<txArray_tag, txArrayDeleter>;
