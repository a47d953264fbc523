// The laws of the operators that are not arithmetic: modulo, rounding, minimum and maximum, comparisons, logic.
#pragma once

#include <vector>

#include "qlplatform/symbolic/Rational_internal.h"

namespace QL {

class SimplifyLaws {
  public:
    explicit SimplifyLaws(RationalArithmetic& arithmetic) : arithmetic_(arithmetic), store_(arithmetic.store()) {}

    /// The value of an operator over the values of its operands.
    Value apply(SymbolicOp op, std::vector<Value>& operands);

    /// The value of Min, Max, And or Or over any number of simplified operands.
    Value applyLattice(SymbolicOp op, std::vector<NodeId> operands);

    static bool isLattice(SymbolicOp op) {
        return op == SymbolicOp::Min || op == SymbolicOp::Max || op == SymbolicOp::And || op == SymbolicOp::Or;
    }

  private:
    Value list(std::vector<Value>& dimensions);
    Value power(Value& base, Value& exponent);
    Value remainder(SymbolicOp op, Value a, Value b);
    Value remainderOfNumbers(SymbolicOp op, Value& a, Value& b);
    void dropMultiples(Value& a, const Value& b) const;
    Polynomial takeWholeMultiples(Polynomial& numerator, const Polynomial& divisor) const;
    Value rounded(SymbolicOp op, Value a);
    Value wholePartsOut(SymbolicOp op, Value a);
    Value absolute(Value a);
    Value compared(SymbolicOp op, Value& a, Value& b);
    Value negation(Value& a);

    void keepExtremes(SymbolicOp op, std::vector<NodeId>& operands) const;
    void absorb(SymbolicOp op, std::vector<NodeId>& operands) const;
    void flatten(SymbolicOp op, NodeId operand, std::vector<NodeId>& parts) const;
    Value logical(SymbolicOp op, std::vector<NodeId>& operands);

    Value atom(NodeId simplified) const;
    Value unaryAtom(SymbolicOp op, Value& a);
    Value binaryAtom(SymbolicOp op, Value& a, Value& b);
    Value truth(bool value) const { return atom(store_.boolean(value)); }
    bool isTruth(NodeId id) const;
    bool areIntegers(std::span<const Factor> factors) const;
    // The atom that a value is, or noNode.
    NodeId soleAtom(const Value& a) const;

    RationalArithmetic& arithmetic_;
    NodeStore& store_;
};

} // namespace QL
