// Values of the simplifier: rational functions over atoms, and numbers that came from doubles.
//
// A settled rational function is reduced: numerator and denominator have no common divisor, and the first term of the
// denominator is positive. Within limits (Polynomial_internal.h) that makes equal functions equal. Beyond them a sum is
// not multiplied out: it becomes an atom, which is as true but less telling.
#pragma once

#include <memory>
#include <optional>

#include "qlplatform/symbolic/ExprReader_internal.h"
#include "qlplatform/symbolic/ExprWriter_internal.h"
#include "qlplatform/symbolic/NodeStore_internal.h"
#include "qlplatform/symbolic/Polynomial_internal.h"

namespace QL {

/// A denominator: a polynomial that is not 0 and in order, or nothing for 1. Copies are deep.
class Denominator {
  public:
    Denominator() = default;
    Denominator(Polynomial p) : value_(p.isOne() ? nullptr : std::make_unique<Polynomial>(std::move(p))) {} // NOLINT
    Denominator(const Denominator& other)
        : value_(other.value_ ? std::make_unique<Polynomial>(*other.value_) : nullptr) {}
    Denominator(Denominator&&) = default;
    Denominator& operator=(Denominator other) noexcept {
        value_ = std::move(other.value_);
        return *this;
    }

    bool isOne() const { return !value_; }
    bool isConstant() const { return polynomial().isConstant(); }
    /// Null for 1.
    Polynomial* get() { return value_.get(); }
    const Polynomial* get() const { return value_.get(); }
    const Polynomial& polynomial() const;
    Polynomial taken() { return value_ ? std::move(*value_) : Polynomial(Integer(1)); }

  private:
    std::unique_ptr<Polynomial> value_;
};

struct Value {
    Polynomial numerator;
    Denominator denominator;
    /// Set for a number that is a double for the reader: a fraction, or a whole one that would fit an integer value.
    /// The polynomials are then empty.
    std::optional<double> floating;
    bool isReduced = true;          // false: a sum over one denominator that is yet to be reduced
    bool hasDoubles = false;        // some atom is a double value
    bool hasOpaqueQuotient = false; // some term is a quotient that was not brought to the common denominator

    bool isPolynomial() const { return denominator.isOne() && !floating; }
    // Of a settled value.
    bool isZero() const { return floating ? *floating == 0.0 : numerator.isZero(); }
    bool isNumber() const { return floating || (numerator.isConstant() && denominator.isConstant()); }
};

class RationalArithmetic {
  public:
    explicit RationalArithmetic(NodeStore& store) : store_(store), reader_(store), writer_(store) {}

    /// The value of a node that has no arithmetic inside: a number, or the node as atom.
    Value leaf(NodeId id) const;
    Value polynomial(Polynomial p) const;
    Value number(Integer value) const { return polynomial(Polynomial(std::move(value))); }
    /// A double as number; a whole one beyond the range of integer values is exact.
    Value number(double value) const;
    /// The quotient of two polynomials in order, of which the second is not 0.
    Value quotient(Polynomial numerator, Polynomial denominator) const;

    Value negate(Value a) const;
    Value add(Value a, Value b, bool subtracts);
    Value multiply(Value a, Value b);
    /// The product of a value with itself, which needs no common divisor.
    Value square(Value a);
    Value divide(Value a, Value b);
    /// The power with a whole exponent.
    Value power(Value base, std::int64_t exponent);

    /// Brings what sums left undone to its end, so that the polynomials can be read. Floating numbers stay.
    void settle(Value& value) const;
    /// The same, and a floating number becomes a polynomial.
    void settleAsPolynomials(Value& value) const;

    /// The expression of a value.
    NodeId write(Value& value);

    /// Whether a settled value is a whole number whatever whole numbers are put in.
    bool isInteger(const Value& value) const;

    NodeStore& store() const { return store_; }

  private:
    void dropFloating(Value& value) const;
    std::optional<Value> foldDoubles(SymbolicOp op, Value& a, Value& b) const;
    void uniteDoubles(Polynomial& p) const;
    Polynomial collapsed(const Polynomial& p);
    Polynomial times(const Polynomial& a, const Polynomial& b);
    void collapseIfFactor(Polynomial& p, const Polynomial& product);
    void expandSoleSum(Polynomial& p) const;
    Polynomial raised(const Polynomial& base, std::uint64_t exponent);
    bool gather(Value& a, Value& b, bool subtracts) const;
    std::optional<Value> sumOfQuotients(const Value& a, const Value& b, bool subtracts) const;
    Value asTerm(Value v);
    Value opaque(SymbolicOp op, Value& a, Value& b);

    NodeStore& store_;
    ExprReader reader_;
    ExprWriter writer_;
};

} // namespace QL
