// The symbols of an expression, in the order in which they first appear in its text, each once.
#pragma once

#include <string>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"

namespace QL {

/// Lists the symbols of expressions of a table. Keeps the address of the table.
class QL_EXPORT SymbolicExprSymbols {
  public:
    explicit SymbolicExprSymbols(const SymbolicExprTable& table) : table_(table) {}

    /// Appends the names of the symbols.
    void getSymbols(unsigned long exprId, std::vector<std::string>& names) const;
    /// Appends the expression ids of the symbols.
    void getSymbols(unsigned long exprId, std::vector<unsigned long>& ids) const;

  private:
    const SymbolicExprTable& table_;
};

} // namespace QL
