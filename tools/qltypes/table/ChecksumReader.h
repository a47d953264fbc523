// The checksum of a structure: the text by which each element enters it, and the digest over them.
#pragma once

#include <string>

#include "output/Layout.h"
#include "qltypes/types/DataTypeTable.h"

namespace inspector {

/// Describes the elements of the structure of that registered name, stores the digest with the structure in the table,
/// and answers both. The text of an element's type is its registered name.
ChecksumLayout checksumOf(QLTypeSys::DataTypeTable& table, const std::string& structure);

} // namespace inspector
