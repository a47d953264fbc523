// Handles of symbolic dimensions: a table and an id.
//
// An id is the number of an expression of the table, minus one. -1 is INHERIT, 0 is NOSYMBOLIC; expressions are unique,
// so two dimensions are the same exactly when their ids are equal. The table is in SymbolicDimsTable.h.
//
//   QLTypeSys::SymbolicDimsString k(table, "K");
//   QLTypeSys::SymbolicDims size = k * QLTypeSys::SymbolicDimsQLSizeValue(table, 2) + k;
//   std::cout << size.toString(); // 3*K
//
// A handle must not outlive its table or a reset of it. Making a handle, arithmetic and printing may add expressions.
#pragma once

#include <cstddef>
#include <iosfwd>
#include <string>
#include <vector>

#include "qlplatform/Export.h"

namespace QL {
class SymbolicExpr;
class SymbolicExprPrinterPredicate;
} // namespace QL

namespace QLTypeSys {

class SymbolicDimsTable;

/// A symbolic dimension, or a list of them. A value of two words that owns nothing. No operation checks the id.
class QL_EXPORT SymbolicDims {
  public:
    SymbolicDims(SymbolicDimsTable* table, int id) : table_(table), id_(id) {}

    /// The table; not owned.
    SymbolicDimsTable* getTable() const { return table_; }
    /// The symbolic id in the table.
    int getId() const { return id_; }

    /// Whether it has no operands: a symbol or a number.
    bool isTerminal() const;

    /// Number of dimensions; 1 for what is no list, and for a list of none.
    std::size_t getNumDimensions() const;

    /// The id of a dimension of a list. For what is no list or a list of none, its own id whatever the index.
    /// Unchecked: `index` must be below getNumDimensions() of a list.
    int getDimensionId(std::size_t index) const;
    /// The handle of getDimensionId(index).
    SymbolicDims getDimension(std::size_t index) const;

    /// The product of all dimensions, simplified; what has one dimension is its own size, as it is.
    SymbolicDims getSize() const;
    /// The product of the first `numDimensions` dimensions of a list, simplified once; for 0, of the first one. What is
    /// no list is its own size.
    SymbolicDims getSize(std::size_t numDimensions) const;

    /// Simplified results. The right side is taken from the table of the left side; handles of two tables are not
    /// combined (asserted in debug builds).
    SymbolicDims operator+(const SymbolicDims& right) const;
    SymbolicDims operator-(const SymbolicDims& right) const;
    SymbolicDims operator*(const SymbolicDims& right) const;
    SymbolicDims operator/(const SymbolicDims& right) const;
    SymbolicDims operator%(const SymbolicDims& right) const;

    /// The negative, not simplified.
    SymbolicDims operator-() const;

    /// The C-like text.
    std::string toString() const;
    /// The same with the caller's way to print symbols.
    std::string toString(const QL::SymbolicExprPrinterPredicate& predicate) const;
    /// The C-like text, empty for INHERIT and NOSYMBOLIC.
    std::string getExprWithEmptyInherit() const;

    /// Writes one line: SymbolicDims : 'text'.
    void print(std::ostream& out) const;

  private:
    QL::SymbolicExpr expr() const;
    template <class Expr> SymbolicDims combined(const SymbolicDims& right) const;

    SymbolicDimsTable* table_;
    int id_;
};

/// Calls print.
QL_EXPORT std::ostream& operator<<(std::ostream& out, const SymbolicDims& dims);

/// The symbol of a name.
class QL_EXPORT SymbolicDimsString : public SymbolicDims {
  public:
    SymbolicDimsString(SymbolicDimsTable& table, const std::string& name);
    SymbolicDimsString(SymbolicDimsTable* table, const std::string& name) : SymbolicDimsString(*table, name) {}
};

/// A number, of which the low 32 bits are kept.
class QL_EXPORT SymbolicDimsQLSizeValue : public SymbolicDims {
  public:
    SymbolicDimsQLSizeValue(SymbolicDimsTable& table, long value);
    SymbolicDimsQLSizeValue(SymbolicDimsTable* table, long value) : SymbolicDimsQLSizeValue(*table, value) {}
};

/// The list of the given dimensions, in order. Lists in lists are not made (asserted in debug builds).
class QL_EXPORT SymbolicDimsND : public SymbolicDims {
  public:
    SymbolicDimsND(SymbolicDimsTable& table, const std::vector<int>& ids);
    SymbolicDimsND(SymbolicDimsTable* table, const std::vector<int>& ids) : SymbolicDimsND(*table, ids) {}
};

} // namespace QLTypeSys
