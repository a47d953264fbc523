#include "qlplatform/symbolic/ExprReader_internal.h"

#include <algorithm>
#include <cmath>

#include "qlplatform/symbolic/ExprWriter_internal.h"

namespace QL {
namespace {

// Puts the factors in order and unites those of one atom. False when an exponent is beyond its limit.
bool putInOrder(boost::container::small_vector<Factor, 8>& factors) {
    const auto isBefore = [](const Factor& a, const Factor& b) { return a.atom < b.atom; };
    std::reverse(factors.begin(), factors.end()); // they were read from the end
    if (!std::is_sorted(factors.begin(), factors.end(), isBefore)) std::sort(factors.begin(), factors.end(), isBefore);
    auto last = factors.begin();
    for (auto f = factors.begin(); f != factors.end(); ++f) {
        if (f == last) continue;
        if (f->atom != last->atom) {
            *++last = *f;
            continue;
        }
        last->exponent += f->exponent;
        if (last->exponent > limits::exponent) return false;
    }
    if (!factors.empty()) factors.erase(last + 1, factors.end());
    return true;
}

} // namespace

std::optional<Integer> ExprReader::wholeNumber(NodeId leaf) const {
    if (store_.op(leaf) == SymbolicOp::IntValue) return Integer(store_.intValue(leaf));
    if (store_.op(leaf) != SymbolicOp::DoubleValue) return std::nullopt;
    const double value = store_.doubleValue(leaf);
    if (!std::isfinite(value) || value != std::trunc(value)) return std::nullopt;
    return integerOf(value);
}

bool ExprReader::isZero(NodeId id) const {
    const std::optional<Integer> number = wholeNumber(id);
    return number && number->isZero();
}

// A number that is written as a sum of values, or as digits times a base.
std::optional<Integer> ExprReader::numberIn(NodeId id) const {
    const bool isNegative = store_.op(id) == SymbolicOp::UnaryMinus;
    NodeId first = isNegative ? store_.operand(id, 0) : id;
    std::vector<NodeId> steps;
    for (; store_.op(first) == SymbolicOp::Plus || store_.op(first) == SymbolicOp::Multiply;
         first = store_.operand(first, 0)) {
        if (!wholeNumber(store_.operand(first, 1))) return std::nullopt;
        steps.push_back(first);
    }
    std::optional<Integer> number = wholeNumber(first);
    if (!number) return std::nullopt;
    for (std::size_t i = steps.size(); i-- > 0;) {
        const Integer part = *wholeNumber(store_.operand(steps[i], 1));
        if (store_.op(steps[i]) == SymbolicOp::Plus)
            *number += part;
        else
            *number *= part;
    }
    if (isNegative) number->negate();
    return number;
}

std::optional<std::uint64_t> ExprReader::wholeExponent(NodeId exponent, Form form) const {
    if (form == Form::Plain && store_.op(exponent) != SymbolicOp::IntValue) return std::nullopt;
    const std::optional<Integer> times = wholeNumber(exponent);
    if (!times || times->sign() <= 0 || times->numBits() > 53) return std::nullopt;
    return static_cast<std::uint64_t>(*times->get());
}

bool ExprReader::addFactor(NodeId atom, std::uint64_t exponent, Form form, Product& product) const {
    const SymbolicOp op = store_.op(atom);
    if (form == Form::Plain) {
        const bool isAtom = op == SymbolicOp::StringSymbol || op == SymbolicOp::BoolSymbol;
        if (!isAtom && (isArithmetic(op) || store_.numOperands(atom) == 0 || store_.simplified(atom) != atom))
            return false;
    }
    product.hasDoubles |= op == SymbolicOp::DoubleValue;
    product.hasQuotients |= op == SymbolicOp::Divide && !isZero(store_.operand(atom, 1));
    product.factors.push_back({atom, exponent});
    return true;
}

bool ExprReader::readPower(NodeId power, Form form, Product& product) const {
    const NodeId base = store_.operand(power, 0);
    const std::optional<std::uint64_t> exponent = wholeExponent(store_.operand(power, 1), form);
    const bool isOfDouble = store_.op(base) == SymbolicOp::DoubleValue && !wholeNumber(base);
    if (exponent && !isOfDouble) return addFactor(base, *exponent, form, product);
    return form == Form::Simplified && addFactor(power, 1, form, product);
}

bool ExprReader::readFactor(NodeId factor, Form form, Product& product) const {
    switch (store_.op(factor)) {
    case SymbolicOp::IntValue:
        product.coefficient *= Integer(store_.intValue(factor));
        return form == Form::Simplified || product.coefficient.numBits() <= limits::coefficientBits;
    case SymbolicOp::Power:
        return readPower(factor, form, product);
    case SymbolicOp::DoubleValue:
    case SymbolicOp::UnaryMinus:
    case SymbolicOp::Plus:
    case SymbolicOp::Multiply:
        if (form == Form::Plain) return false;
        if (const std::optional<Integer> number = numberIn(factor)) {
            product.coefficient *= *number;
            return true;
        }
        break;
    default:
        break;
    }
    return addFactor(factor, 1, form, product);
}

bool ExprReader::readTerm(NodeId term, Form form, Product& product) const {
    for (;;) {
        if (store_.op(term) == SymbolicOp::Multiply) {
            if (!readFactor(store_.operand(term, 1), form, product)) return false;
        } else if (store_.op(term) == SymbolicOp::UnaryMinus) {
            product.coefficient.negate();
        } else {
            return readFactor(term, form, product) && putInOrder(product.factors);
        }
        term = store_.operand(term, 0);
    }
}

ExprReader::Product ExprReader::simplifiedTerm(NodeId term) const {
    Product product;
    if (readTerm(term, Form::Simplified, product)) return product;
    Product atom; // an exponent in it is beyond its limit
    addFactor(term, 1, Form::Simplified, atom);
    return atom;
}

void ExprReader::listTerms(NodeId sum) const {
    terms_.clear();
    for (; isSum(store_.op(sum)); sum = store_.operand(sum, 0))
        terms_.emplace_back(store_.operand(sum, 1), store_.op(sum) == SymbolicOp::Minus);
    terms_.emplace_back(sum, false);
}

ExprReader::Sum ExprReader::simplifiedSum(NodeId sum) const {
    Sum read;
    listTerms(sum);
    for (std::size_t i = terms_.size(); i-- > 0;) {
        const auto [term, isSubtracted] = terms_[i];
        Product product = simplifiedTerm(term);
        if (isSubtracted) product.coefficient.negate();
        read.polynomial.add(std::move(product.coefficient), product.atoms());
        read.hasDoubles |= product.hasDoubles;
        read.hasQuotients |= product.hasQuotients;
        if (i + 2 == terms_.size()) read.polynomial.normalize(); // the first two may have changed places
    }
    read.polynomial.normalize();
    return read;
}

std::optional<Polynomial> ExprReader::plainSum(NodeId sum) const {
    Polynomial read;
    listTerms(sum);
    for (std::size_t i = terms_.size(); i-- > 0;) {
        const auto [term, isSubtracted] = terms_[i];
        Product product;
        if (!readTerm(term, Form::Plain, product)) return std::nullopt;
        if (product.coefficient.isZero()) continue;
        if (isSubtracted) product.coefficient.negate();
        read.add(std::move(product.coefficient), product.atoms());
    }
    read.normalize();
    return read;
}

} // namespace QL
