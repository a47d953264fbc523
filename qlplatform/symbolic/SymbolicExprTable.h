// The table that owns symbolic expressions.
//
// Expressions are interned: the same operator over the same operands is one entry, and its number, the expression id,
// is its identity. Ids run from 0 in the order of creation and are never reused. Node classes that make entries and the
// view of one entry are in SymbolicExpr.h; what is done with expressions has a header each: SymbolicExprSimplify.h,
// SymbolicExprPrinter.h, SymbolicExprEval.h, SymbolicExprSymbols.h, SymbolicExprCopy.h, SymbolicExprTranslate.h,
// SymbolicExprFactorDivision.h.
//
//   QL::SymbolicExprTable table;
//   const unsigned long k = table.addSymbol("K");
//   const unsigned long twice = table.add(QL::SymbolicOp::Multiply, table.addInt(2), k);
//
// A table belongs to one thread at a time: even reading operations may fill caches or add entries.
#pragma once

#include <cstddef>
#include <memory>
#include <span>
#include <string>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicOp.h"

namespace QL {

class NodeStore;
class Simplifier;
class SymbolicExpr;

/// What a symbol stands for. In a table of integers the simplifier uses that symbols are whole numbers:
/// (K*L) % K is 0 there, and floor(K) is K.
enum class SymbolDomain { Numbers, Integers };

/// An expression table. Neither copied nor moved: expressions keep its address.
class QL_EXPORT SymbolicExprTable {
  public:
    explicit SymbolicExprTable(SymbolDomain domain = SymbolDomain::Numbers);
    ~SymbolicExprTable();
    SymbolicExprTable(const SymbolicExprTable&) = delete;
    SymbolicExprTable& operator=(const SymbolicExprTable&) = delete;

    /// The id that stands for no expression: all bits set.
    static constexpr unsigned long noExpr = ~0UL;

    /// Number of expressions; their ids run from 0 to one below it.
    unsigned long getNumExprs() const;

    /// What symbols of this table stand for.
    SymbolDomain getDomain() const;

    /// The expression of an id. Unchecked: `exprId` must be below getNumExprs().
    SymbolicExpr get(unsigned long exprId) const;

    /// The id of a symbol, an integer, a double, a truth value. Adds the entry when it is new. All NaNs are one entry,
    /// and so are 0.0 and -0.0.
    unsigned long addSymbol(const std::string& name);
    /// The id of an integer value, which is added when it is new.
    unsigned long addInt(int value);
    /// The id of a double value, which is added when it is new.
    unsigned long addDouble(double value);
    /// The id of a truth value, which is added when it is new.
    unsigned long addBool(bool value);

    /// The id of an operator over operands, which are ids of this table. Adds the entry when it is new.
    /// Unchecked: the operator must take that number of operands, and every id must be below getNumExprs().
    /// Throws std::length_error when the table holds 2^31 expressions or a list has 2^23 operands.
    unsigned long add(SymbolicOp op, unsigned long operand);
    unsigned long add(SymbolicOp op, unsigned long left, unsigned long right);
    unsigned long add(SymbolicOp op, std::span<const unsigned long> operands);

    /// Adds the truth values: false first, then true.
    void addBoolSymbols();

    /// Binds the symbol of that name to the expression `valueId`, in place of what it was bound to, and makes the
    /// symbol when there is none. Returns the id of the symbol.
    unsigned long registerValueId(const std::string& name, unsigned long valueId);

    /// The expression that a symbol is bound to, or an id for which isUnsetValue holds.
    unsigned long getValueId(unsigned long symbolId) const;
    /// Whether getValueId() answered that the symbol is bound to nothing.
    static bool isUnsetValue(unsigned long valueId) { return valueId == noExpr; }

    /// Empties `ids` and lists all expressions of that operator, oldest first. Visits the whole table.
    void lookup(SymbolicOp op, std::vector<unsigned long>& ids) const;

    /// Bytes that the table holds on the heap, capacity included, names excluded.
    std::size_t sizeInMemory() const;

    /// For the operations of this folder.
    NodeStore& nodes() const { return *nodes_; }
    /// For the operations of this folder.
    Simplifier& simplifier() const { return *simplifier_; }

  private:
    std::unique_ptr<NodeStore> nodes_;
    std::unique_ptr<Simplifier> simplifier_;
};

} // namespace QL
