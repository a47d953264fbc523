// The C type that holds a value of a type of a table.
#pragma once

#include "output/Layout.h"
#include "qltypes/types/DataTypeTable.h"

namespace inspector {

/// Built-in types, enumerations and numbers of 1, 2, 4 and 8 bytes as numbers, structures as such, and all others as
/// bytes. Unchecked: `id` must be valid.
CType cTypeOf(const QLTypeSys::DataTypeTable& table, int id);

} // namespace inspector
