// Copies expressions from one table to another, as they stand.
#pragma once

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"

namespace QL {

/// Copies expressions from one table to another. Keeps the addresses of both tables.
class QL_EXPORT SymbolicExprCopy {
  public:
    SymbolicExprCopy(const SymbolicExprTable& from, SymbolicExprTable& to) : from_(from), to_(to) {}

    /// The id in the other table of the expression with the same operators, names and values. What symbols are bound to
    /// is not copied.
    unsigned long copy(unsigned long exprId) const;

  private:
    const SymbolicExprTable& from_;
    SymbolicExprTable& to_;
};

} // namespace QL
