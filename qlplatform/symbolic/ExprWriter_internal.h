// Writes numbers, polynomials and quotients as expressions, always the same expression for the same value.
#pragma once

#include "qlplatform/symbolic/NodeStore_internal.h"
#include "qlplatform/symbolic/Polynomial_internal.h"

namespace QL {

class ExprWriter {
  public:
    explicit ExprWriter(NodeStore& store) : store_(store) {}

    /// An integer value when it fits, a double value when that is exact, otherwise a sum of such values, largest first.
    NodeId write(const Integer& number);

    /// A sum of products, in order; only a negative first term gives way to a positive second one.
    NodeId write(const Polynomial& polynomial);

    /// The quotient; a `denominator` of null is 1.
    NodeId write(const Polynomial& numerator, const Polynomial* denominator);

    /// A power of an expression with a whole exponent.
    NodeId writePower(NodeId base, std::uint64_t exponent);

  private:
    // Powers up to this one are written as products.
    static constexpr std::uint64_t maxRepeatedFactor = 3;

    NodeId writeMagnitude(const Integer& magnitude);
    // The product of a number and factors.
    NodeId writeTerm(const Integer& coefficient, std::span<const Factor> factors);

    NodeStore& store_;
};

/// The number as a double, when that is exact.
std::optional<double> exactDouble(const Integer& number);

/// The whole number that a double is.
Integer integerOf(double whole);

} // namespace QL
