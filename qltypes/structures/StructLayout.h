// The layout of a structure: offsets, size, counts, ground value and derived flags, in one pass over its elements.
//
//   qlsvDiagnosticImpl* failed = DtComputeDerivedStructAttributes(&table, id); // nested structures first
//   DtGetDataTypeElementOffset(&table, id, 1);
#pragma once

#include "qlplatform/Export.h"

class qlsvDiagnosticImpl;

namespace QLTypeSys {
class DataTypeTable;
}

/// Lays the structure out. Elements lie in declared order. A built-in type is aligned to its size, 8 at most; every
/// other type by its size alone: to 8 from 8 bytes, to 4 from 4, to 2 from 2. The structure's size is a multiple of 8.
/// Structures nested in it must have been laid out before. A structure without elements keeps what it has.
/// Null on success. A diagnostic with `InvalidDataTypeSizeInDataTypeTable` when the structure would pass 2147483647
/// bytes, or with what an element without a valid type or the setting of the size raised; it belongs to the caller.
/// What was laid out up to there stays: the offsets of the elements in front, and the flags; where the size was refused
/// the counts too. Without memory for the ground nothing stays, and the offsets are -1.
/// Unchecked: `id` must be a structure or an alias of one.
QL_EXPORT qlsvDiagnosticImpl* DtComputeDerivedStructAttributes(QLTypeSys::DataTypeTable* table, int id);

/// The next offset, from `offset` on, that is a multiple of 8 or of `size`, whichever comes first; `offset` itself for
/// an odd or zero size. `overflow`, unless null, receives whether the result is beyond 2147483647.
QL_EXPORT unsigned long DtCorrectOffsetForProperAlignment(unsigned long offset, unsigned long size, bool* overflow);
