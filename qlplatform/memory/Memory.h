// Raw memory of type records and values, with a switch that makes a chosen allocation fail.
#pragma once

#include <cstddef>

#include "qlplatform/Export.h"

/// Zero-filled memory for `count` items of `size` bytes, or null when memory ran out. Freed with utFree.
QL_EXPORT void* utCalloc(std::size_t count, std::size_t size);

/// Memory of `size` bytes with no set content, or null when memory ran out. Freed with utFree.
QL_EXPORT void* utMalloc(std::size_t size);

/// Frees what utCalloc or utMalloc gave; null is allowed.
QL_EXPORT void utFree(void* memory);

/// Makes the `n`-th utCalloc or utMalloc from now on (1 is the next) fail once; 0 lets all of them pass again.
/// Returns the number of calls seen since the last call of this function. For tests; process-wide and unlocked.
QL_EXPORT unsigned long utFailAllocationAt(unsigned long n);
