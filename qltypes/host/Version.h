// The version of the library: as these headers know it, and as the loaded library answers.
//
//   if (std::string_view(QLTypeSys::libraryVersion()) != QLTYPES_VERSION_STRING) puts("built against another version");
//
// The build reads the three numbers from here; they stand nowhere else.
#pragma once

#include "qlplatform/Export.h"

/// The interface breaks when this changes; below 1.0, when the minor version does.
#define QLTYPES_VERSION_MAJOR 0
/// Operations were added.
#define QLTYPES_VERSION_MINOR 1
/// Nothing but repairs.
#define QLTYPES_VERSION_PATCH 0
/// The three numbers as "major.minor.patch".
#define QLTYPES_VERSION_STRING "0.1.0"

namespace QLTypeSys {

/// The version of the library that runs, as "major.minor.patch". A constant of the library; never null.
QL_EXPORT const char* libraryVersion() noexcept;

} // namespace QLTypeSys
