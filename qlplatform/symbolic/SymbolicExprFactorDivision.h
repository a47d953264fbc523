// Brings the divisions of an expression to its top: K/2 + L becomes (K + L*2)/2.
#pragma once

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"

namespace QL {

/// Brings divisions to the top of expressions of a table. Keeps the address of the table.
class QL_EXPORT SymbolicExprFactorDivision {
  public:
    explicit SymbolicExprFactorDivision(SymbolicExprTable& table) : table_(table) {}

    /// The id of an equal expression that is one quotient without a division in its sums, products and whole powers
    /// below; the given id when there is no division there. Divisions inside other operators stay. Simplifies nothing.
    unsigned long factorDivision(unsigned long exprId);

  private:
    SymbolicExprTable& table_;
};

} // namespace QL
