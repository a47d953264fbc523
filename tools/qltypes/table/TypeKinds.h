// What sort of value a type of the table holds, for pictures.
#pragma once

#include "output/Layout.h"
#include "qltypes/types/DataTypeTable.h"

namespace inspector {

/// Looks through aliases. Unchecked: `id` must be valid.
TypeKind kindOf(const QLTypeSys::DataTypeTable& table, int id);

} // namespace inspector
