// Simplification of expressions.
//
//   QL::SymbolicExprSimplify simplifier(table, 10, QL::SymbolicExprSimplify::isVariantKeywordsSimCodegenFeatureOn());
//   unsigned long scratch = 0;
//   const unsigned long simple = simplifier.simplify(exprId, scratch);
//
// Two expressions over + - * /, unary minus and powers with whole exponents that are equal as rational functions with
// integer coefficients have the same simplified form, as long as multiplying out stays within bounds; the bounds, the
// laws of the other operators and what is done with doubles are told in docs/guide/symbolic-dimensions.md.
#pragma once

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"

namespace QL {

/// Simplifies expressions of a table. Keeps the address of the table.
class QL_EXPORT SymbolicExprSimplify {
  public:
    /// `numPasses` and `variantKeywords` are accepted for engines that rewrite in passes and know such keywords; this
    /// one is done after one pass and knows none. Costs nothing.
    SymbolicExprSimplify(SymbolicExprTable& table, int numPasses, bool variantKeywords);

    /// Always false.
    static bool isVariantKeywordsSimCodegenFeatureOn() { return false; }

    /// The id of the simplified form, which may be new. Simplifying that gives the same id again, and a form that is
    /// known is found at once. `scratch` is accepted for engines that need working storage and stays as it is.
    unsigned long simplify(unsigned long exprId, unsigned long& scratch);

  private:
    SymbolicExprTable& table_;
};

} // namespace QL
