// The one place where symbolic ids and expression ids meet, and simplification as this folder uses it.
#pragma once

#include "qlplatform/symbolic/SymbolicExprSimplify.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"

namespace QLTypeSys {

/// The expression id of a symbolic id, widened with its sign: -1 becomes 0.
inline unsigned long exprIdOf(int symbolicId) { return static_cast<unsigned long>(static_cast<long>(symbolicId) + 1); }

inline int symbolicIdOf(unsigned long exprId) { return static_cast<int>(static_cast<long>(exprId) - 1); }

/// A new simplifier over the table.
inline QL::SymbolicExprSimplify simplifierOf(QL::SymbolicExprTable& table) {
    return {table, 10, QL::SymbolicExprSimplify::isVariantKeywordsSimCodegenFeatureOn()};
}

inline unsigned long simplified(QL::SymbolicExprTable& table, unsigned long exprId) {
    unsigned long scratch = 0;
    return simplifierOf(table).simplify(exprId, scratch);
}

} // namespace QLTypeSys
