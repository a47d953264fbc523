// Values of the simplifier: rational functions over atoms, and numbers that came from doubles.
//
// A rational function is kept reduced: numerator and denominator have no common divisor, and the first term of the
// denominator is positive. Within limits (Polynomial_internal.h) that makes equal functions equal. Beyond them a sum is
// not multiplied out: it becomes an atom, which is as true but less telling.
#pragma once

#include <memory>
#include <optional>

#include "qlplatform/symbolic/ExprWriter_internal.h"
#include "qlplatform/symbolic/NodeStore_internal.h"
#include "qlplatform/symbolic/Polynomial_internal.h"

namespace QL {

struct Value {
    Polynomial numerator;                          // in order but for sums that are still gathered
    std::shared_ptr<const Polynomial> denominator; // null for 1
    /// Set for a number that is a double for the reader: a fraction, or a whole one that would fit an integer value.
    /// The polynomials are then empty.
    std::optional<double> floating;
    bool hasDoubles = false;        // some atom is a double value
    bool hasOpaqueQuotient = false; // some term is a quotient that was not brought to the common denominator

    bool isPolynomial() const { return !denominator && !floating; }
    bool isZero() const { return floating ? *floating == 0.0 : numerator.isZero(); }
    /// A number: exact when not `floating`.
    bool isNumber() const {
        return floating || (numerator.isConstant() && (!denominator || denominator->isConstant()));
    }
};

class RationalArithmetic {
  public:
    explicit RationalArithmetic(NodeStore& store) : store_(store), writer_(store) {}

    /// The value of a node that has no arithmetic inside: a number, or the node as atom.
    Value leaf(NodeId id) const;
    Value number(Integer value) const { return polynomial(Polynomial(std::move(value))); }
    Value polynomial(Polynomial p) const;
    /// A double as number; a whole one beyond the range of integer values is exact.
    Value number(double value) const;
    /// The reduced quotient of two polynomials.
    Value quotient(Polynomial numerator, Polynomial denominator) const;

    Value negate(Value a) const;
    Value add(Value a, Value b, bool subtracts);
    Value multiply(Value a, Value b);
    Value divide(Value a, Value b);
    /// The power with a whole exponent.
    Value power(Value base, std::int64_t exponent);
    /// The value of `dividend / divisor` where both are polynomials that are known to be reduced.
    Value reduced(Value dividend, Value divisor) const;

    /// The expression of a value.
    NodeId write(Value& value);

    /// Whether the value is a whole number whatever whole numbers are put in.
    bool isInteger(const Value& value) const;

    /// Puts gathered sums in order and writes doubles out as atoms, so that the polynomials can be read.
    void settle(Value& value) const;

    NodeStore& store() const { return store_; }
    ExprWriter& writer() { return writer_; }

  private:
    void dropFloating(Value& value) const;
    std::optional<Value> foldDoubles(SymbolicOp op, const Value& a, const Value& b) const;
    void uniteDoubles(Polynomial& p) const;
    // A polynomial of one term over an atom that stands for `p`.
    Polynomial collapsed(const Polynomial& p);
    Polynomial times(const Polynomial& a, const Polynomial& b);
    Polynomial raised(const Polynomial& base, std::uint64_t exponent);
    std::optional<Value> sumOfQuotients(const Value& a, const Value& b, bool subtracts) const;
    Value opaque(SymbolicOp op, Value& a, Value& b);

    NodeStore& store_;
    ExprWriter writer_;
};

} // namespace QL
