#include "qlplatform/symbolic/ExprWriter_internal.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace QL {
namespace {

constexpr std::size_t doubleBits = std::numeric_limits<double>::digits;
// Digits in which numbers beyond the range of a double are written: base 2^900.
constexpr ulong digitBits = 900;

// Whether a node with this operator is an atom wherever it stands; any other is one only where it was not expanded.
bool isAtomByItself(SymbolicOp op) {
    return op != SymbolicOp::UnaryMinus && op != SymbolicOp::Plus && op != SymbolicOp::Minus &&
           op != SymbolicOp::Multiply && op != SymbolicOp::Divide;
}

Integer lowBits(const Integer& number, ulong numBits) {
    Integer low;
    fmpz_fdiv_r_2exp(low.get(), number.get(), numBits);
    return low;
}

Integer shifted(const Integer& number, ulong numBits) {
    Integer high;
    fmpz_fdiv_q_2exp(high.get(), number.get(), numBits);
    return high;
}

} // namespace

std::optional<double> exactDouble(const Integer& number) {
    const std::size_t bits = number.numBits();
    if (bits > std::numeric_limits<double>::max_exponent) return std::nullopt;
    if (bits > doubleBits && fmpz_val2(number.get()) < bits - doubleBits) return std::nullopt;
    return fmpz_get_d(number.get());
}

Integer integerOf(double whole) {
    Integer number;
    fmpz_set_d(number.get(), whole);
    return number;
}

NodeId ExprWriter::write(const Integer& number) {
    if (number.fitsInt()) return store_.integer(number.toInt());
    if (const auto exact = exactDouble(number)) return store_.floating(*exact);
    if (number.sign() > 0) return writeMagnitude(number);
    return store_.unary(SymbolicOp::UnaryMinus, writeMagnitude(-number));
}

NodeId ExprWriter::writeMagnitude(const Integer& magnitude) {
    // The first value is the whole number or its highest bits; then what is left is added, part by part.
    const auto addParts = [&](NodeId sum, Integer rest) {
        while (!rest.isZero()) {
            Integer part = rest;
            if (!part.fitsInt() && !exactDouble(part)) {
                const std::size_t below = rest.numBits() - doubleBits;
                part = rest - lowBits(rest, below);
            }
            rest = rest - part;
            const NodeId value = write(part);
            sum = sum == noNode ? value : store_.binary(SymbolicOp::Plus, sum, value);
        }
        return sum;
    };
    if (magnitude.numBits() <= std::numeric_limits<double>::max_exponent) return addParts(noNode, magnitude);
    std::vector<Integer> digits;
    for (Integer rest = magnitude; !rest.isZero(); rest = shifted(rest, digitBits))
        digits.push_back(lowBits(rest, digitBits));
    const NodeId base = store_.floating(std::ldexp(1.0, digitBits));
    NodeId sum = addParts(noNode, digits.back());
    for (std::size_t i = digits.size() - 1; i-- > 0;)
        sum = addParts(store_.binary(SymbolicOp::Multiply, sum, base), digits[i]);
    return sum;
}

NodeId ExprWriter::writePower(NodeId base, std::uint64_t exponent) {
    return store_.binary(SymbolicOp::Power, base, write(Integer(static_cast<std::int64_t>(exponent))));
}

NodeId ExprWriter::writeTerm(const Integer& coefficient, std::span<const Factor> factors) {
    if (factors.empty()) return write(coefficient);
    const bool hasSums = std::any_of(factors.begin(), factors.end(),
                                     [&](const Factor& f) { return !isAtomByItself(store_.op(f.atom)); });
    NodeId product = coefficient.isOne() || (coefficient.isMinusOne() && !hasSums) ? noNode : write(coefficient);
    bool isNegated = coefficient.isMinusOne() && !hasSums;
    const auto multiply = [&](NodeId factor) {
        if (isNegated) factor = store_.unary(SymbolicOp::UnaryMinus, factor);
        isNegated = false;
        product = product == noNode ? factor : store_.binary(SymbolicOp::Multiply, product, factor);
    };
    const auto multiplyAll = [&](bool doubles) {
        for (const Factor& f : factors) {
            if ((store_.op(f.atom) == SymbolicOp::DoubleValue) != doubles) continue;
            if (f.exponent > maxRepeatedFactor)
                multiply(writePower(f.atom, f.exponent));
            else
                for (std::uint64_t i = 0; i < f.exponent; ++i)
                    multiply(f.atom);
        }
    };
    multiplyAll(true); // numbers come first
    multiplyAll(false);
    return product;
}

NodeId ExprWriter::write(const Polynomial& polynomial) {
    const auto terms = polynomial.terms();
    if (terms.empty()) return store_.integer(0);
    const bool swapsFirst = terms.size() > 1 && terms[0].coefficient.sign() < 0 && terms[1].coefficient.sign() > 0;
    const auto& first = terms[swapsFirst ? 1 : 0];
    NodeId sum = writeTerm(first.coefficient, polynomial.factors(first));
    for (const auto& t : terms) {
        if (&t == &first) continue;
        const bool isNegative = t.coefficient.sign() < 0;
        const NodeId term = writeTerm(isNegative ? -t.coefficient : t.coefficient, polynomial.factors(t));
        sum = store_.binary(isNegative ? SymbolicOp::Minus : SymbolicOp::Plus, sum, term);
    }
    return sum;
}

NodeId ExprWriter::write(const Polynomial& numerator, const Polynomial* denominator) {
    const NodeId dividend = write(numerator);
    return denominator ? store_.binary(SymbolicOp::Divide, dividend, write(*denominator)) : dividend;
}

} // namespace QL
