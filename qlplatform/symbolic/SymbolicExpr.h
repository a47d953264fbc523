// A symbolic expression: a view of one entry of a table, and the node classes that make entries.
//
// Constructing a node makes its entry when it is new, so equal nodes have equal ids:
//   QL::SymbolicString k(table, "K");
//   QL::SymbolicPlusExpr sum(table, k, QL::SymbolicIntValue(table, 1));
//   assert(sum.getId(table) == QL::SymbolicPlusExpr(table, k, QL::SymbolicIntValue(table, 1)).getId(table));
#pragma once

#include <cassert>
#include <cstddef>
#include <string>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"
#include "qlplatform/symbolic/SymbolicOp.h"

namespace QL {

/// A view of one expression: its table and its id. Copied freely; must not outlive the table.
class QL_EXPORT SymbolicExpr {
  public:
    SymbolicExpr(const SymbolicExprTable& table, unsigned long id) : table_(&table), id_(id) {}

    /// The expression id. `table` is the table of the expression; expressions do not cross tables (asserted).
    unsigned long getId([[maybe_unused]] const SymbolicExprTable& table) const {
        assert(&table == table_);
        return id_;
    }

    /// The operator, or what kind of terminal it is.
    SymbolicOp getOp() const;

    /// Whether it has no operands: a symbol or a value, or a list of no dimensions.
    bool isTerminal() const { return getNumOperands() == 0; }

    /// Number of operands; 0 for a terminal.
    std::size_t getNumOperands() const;

    /// The id of an operand. Unchecked: `index` must be below getNumOperands().
    unsigned long getOperand(std::size_t index) const;
    /// The id of the first operand. Unchecked: there must be one.
    unsigned long getLeft() const { return getOperand(0); }
    /// The id of the second operand. Unchecked: there must be one.
    unsigned long getRight() const { return getOperand(1); }

    /// Number of dimensions of a list; 0 for every other expression.
    std::size_t getNumDimensions() const { return getOp() == SymbolicOp::ND ? getNumOperands() : 0; }

    /// The id of a dimension. Unchecked: the expression must be a list and `index` below getNumDimensions().
    unsigned long getDimension(std::size_t index) const { return getOperand(index); }

    /// Unchecked: the expression must be a symbol. Owned by the table; good for its life.
    const std::string& getName() const;
    /// Unchecked: the expression must be an integer value.
    int getIntValue() const;
    /// Unchecked: the expression must be a double value.
    double getDoubleValue() const;
    /// Unchecked: the expression must be a truth value.
    bool getBoolValue() const;

  private:
    const SymbolicExprTable* table_;
    unsigned long id_;
};

/// A symbol.
class SymbolicString : public SymbolicExpr {
  public:
    SymbolicString(SymbolicExprTable& table, const std::string& name) : SymbolicExpr(table, table.addSymbol(name)) {}
};

/// An integer value.
class SymbolicIntValue : public SymbolicExpr {
  public:
    SymbolicIntValue(SymbolicExprTable& table, int value) : SymbolicExpr(table, table.addInt(value)) {}
};

/// A double value.
class SymbolicDoubleValue : public SymbolicExpr {
  public:
    SymbolicDoubleValue(SymbolicExprTable& table, double value) : SymbolicExpr(table, table.addDouble(value)) {}
};

/// A truth value.
class SymbolicBoolSymbol : public SymbolicExpr {
  public:
    SymbolicBoolSymbol(SymbolicExprTable& table, bool value) : SymbolicExpr(table, table.addBool(value)) {}
};

/// A list of dimensions, given by their expression ids.
class SymbolicNDExpr : public SymbolicExpr {
  public:
    SymbolicNDExpr(SymbolicExprTable& table, const std::vector<unsigned long>& dimensions)
        : SymbolicExpr(table, table.add(SymbolicOp::ND, dimensions)) {}
};

/// An operator over one operand.
template <SymbolicOp op> class SymbolicUnaryExpr : public SymbolicExpr {
  public:
    SymbolicUnaryExpr(SymbolicExprTable& table, const SymbolicExpr& operand)
        : SymbolicUnaryExpr(table, operand.getId(table)) {}
    SymbolicUnaryExpr(SymbolicExprTable& table, unsigned long operand) : SymbolicExpr(table, table.add(op, operand)) {}
};

/// An operator over two operands.
template <SymbolicOp op> class SymbolicBinaryExpr : public SymbolicExpr {
  public:
    SymbolicBinaryExpr(SymbolicExprTable& table, const SymbolicExpr& left, const SymbolicExpr& right)
        : SymbolicBinaryExpr(table, left.getId(table), right.getId(table)) {}
    SymbolicBinaryExpr(SymbolicExprTable& table, unsigned long left, unsigned long right)
        : SymbolicExpr(table, table.add(op, left, right)) {}
};

// Operators by name: each makes the expression of one operator over the operands that it is given.
using SymbolicUnaryMinusExpr = SymbolicUnaryExpr<SymbolicOp::UnaryMinus>;
using SymbolicPlusExpr = SymbolicBinaryExpr<SymbolicOp::Plus>;
using SymbolicMinusExpr = SymbolicBinaryExpr<SymbolicOp::Minus>;
using SymbolicMultiplyExpr = SymbolicBinaryExpr<SymbolicOp::Multiply>;
using SymbolicDivideExpr = SymbolicBinaryExpr<SymbolicOp::Divide>;
using SymbolicModuloExpr = SymbolicBinaryExpr<SymbolicOp::Modulo>;
using SymbolicPowerExpr = SymbolicBinaryExpr<SymbolicOp::Power>;
using SymbolicEqualExpr = SymbolicBinaryExpr<SymbolicOp::Equal>;
using SymbolicNotEqualExpr = SymbolicBinaryExpr<SymbolicOp::NotEqual>;
using SymbolicLessThanExpr = SymbolicBinaryExpr<SymbolicOp::LessThan>;
using SymbolicLessThanOrEqualExpr = SymbolicBinaryExpr<SymbolicOp::LessThanOrEqual>;
using SymbolicGreaterThanExpr = SymbolicBinaryExpr<SymbolicOp::GreaterThan>;
using SymbolicGreaterThanOrEqualExpr = SymbolicBinaryExpr<SymbolicOp::GreaterThanOrEqual>;
using SymbolicAndExpr = SymbolicBinaryExpr<SymbolicOp::And>;
using SymbolicOrExpr = SymbolicBinaryExpr<SymbolicOp::Or>;
using SymbolicNotExpr = SymbolicUnaryExpr<SymbolicOp::Not>;
using SymbolicMinExpr = SymbolicBinaryExpr<SymbolicOp::Min>;
using SymbolicMaxExpr = SymbolicBinaryExpr<SymbolicOp::Max>;
using SymbolicAbsExpr = SymbolicUnaryExpr<SymbolicOp::Abs>;
using SymbolicFloorExpr = SymbolicUnaryExpr<SymbolicOp::Floor>;
using SymbolicCeilExpr = SymbolicUnaryExpr<SymbolicOp::Ceil>;
using SymbolicRoundExpr = SymbolicUnaryExpr<SymbolicOp::Round>;
using SymbolicFixExpr = SymbolicUnaryExpr<SymbolicOp::Fix>;
using SymbolicModExpr = SymbolicBinaryExpr<SymbolicOp::Mod>;
using SymbolicRemExpr = SymbolicBinaryExpr<SymbolicOp::Rem>;

} // namespace QL
