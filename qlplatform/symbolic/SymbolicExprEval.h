// The numeric value of an expression under the values bound to its symbols.
//
//   table.registerValueId("K", table.addInt(4));
//   QL::SymbolicExprEval(table).eval(twiceK); // {8.0}
#pragma once

#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"

namespace QL {

/// Evaluates expressions of a table. Keeps the address of the table.
class QL_EXPORT SymbolicExprEval {
  public:
    explicit SymbolicExprEval(const SymbolicExprTable& table) : table_(table) {}

    /// One value for each dimension of a list, which may be none, and one value for any other expression. Arithmetic is
    /// that of doubles: a quotient by 0 is infinite or no number (NaN), a modulo by 0 no number. What rests on a symbol
    /// without a value is no number, and so is a symbol whose value leads back to itself.
    std::vector<double> eval(unsigned long exprId) const;

  private:
    const SymbolicExprTable& table_;
};

} // namespace QL
