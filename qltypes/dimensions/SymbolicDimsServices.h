// What blocks ask about symbolic dimensions, by kind of block.
#pragma once

#include <string>

#include "qlplatform/Export.h"

namespace QLTypeSys {

class SymbolicDimsTable;

namespace SymbolicDimsServices::Const {

/// The dimensions of the output of a constant whose value has the dimensions `id`. When `flag` is set, which says that
/// a vector is read as one dimension, a row or column gives its length; otherwise, and for what has one dimension,
/// `output` becomes `id`. What is no symbolic dimension leaves `output` alone. Raises `MatrixInterpretedAs1D` with
/// `first`, `second`, the dimensions and two proposals when there is neither a row nor a column.
QL_EXPORT void ComputeOutput(SymbolicDimsTable* table, const std::u16string& first, const std::u16string& second,
                             int id, int& output, bool flag);

} // namespace SymbolicDimsServices::Const

} // namespace QLTypeSys
