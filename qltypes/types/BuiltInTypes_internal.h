// The fifteen fixed types as rows: what registration copies into their records.
#pragma once

#include <span>

#include "qltypes/types/FunctionTypes.h"
#include "qltypes/types/TypeIds.h"

namespace QLTypeSys {

/// One fixed type.
struct FixedType {
    const char* name;
    int id;
    int size; ///< bytes of one value
    /// Says what one step reads; it does not reach a table's record, where only setIsAtomic changes it (kept).
    bool isAtomic;
    bool groundHasNonZeroStoredValue;
    bool canContainNegativeNumbers;
    DataTypeSource source;
    int idAliasedTo; ///< the word for tests
    ConvertBetweenFcn convertBetween;
    IsPositiveFcn isPositive;
    IsNegativeFcn isNegative;
    GreaterThanFcn greaterThan;
    GreaterEqualFcn greaterEqual;
};

inline constexpr int numBuiltInTypes = 9;
inline constexpr int numPredefinedTypes = 5;
inline constexpr int numFixedTypes = 1 + numBuiltInTypes + numPredefinedTypes;

/// All fixed types in order of registration, auto first.
std::span<const FixedType> fixedTypes();

/// The row of `id`. Unchecked: `id` must be -1 to 13.
const FixedType& fixedType(int id);

} // namespace QLTypeSys
