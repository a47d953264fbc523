// Preconditions of unchecked operations: asserted in debug builds, free in release builds.
#pragma once

#include <cassert>

#define QLTYPES_ASSERT(claim) assert(claim)
