#include "qlplatform/symbolic/SimplifyLaws_internal.h"

#include <algorithm>
#include <cmath>
#include <map>

namespace QL {
namespace {

// A number as a double, rounded; for decisions between doubles only.
double doubleOf(const Value& number) {
    if (number.floating) return *number.floating;
    const double above = fmpz_get_d(number.numerator.constant().get());
    return above / fmpz_get_d(number.denominator.polynomial().constant().get());
}

Integer denominatorOf(const Value& exactNumber) { return exactNumber.denominator.polynomial().constant(); }

int leadingSign(const Value& a) { return a.numerator.leadingSign(); }

double roundedDouble(SymbolicOp op, double value) {
    switch (op) {
    case SymbolicOp::Floor:
        return std::floor(value);
    case SymbolicOp::Ceil:
        return std::ceil(value);
    case SymbolicOp::Round:
        return std::round(value);
    default:
        return std::trunc(value);
    }
}

Integer roundedQuotient(SymbolicOp op, const Integer& above, const Integer& below) {
    switch (op) {
    case SymbolicOp::Floor:
        return Integer::floorQuotient(above, below);
    case SymbolicOp::Ceil:
        return -Integer::floorQuotient(-above, below);
    case SymbolicOp::Round: { // halves away from zero: round the magnitude down after adding a half
        const Integer magnitude = above.sign() < 0 ? -above : above;
        const Integer result = Integer::floorQuotient(magnitude + magnitude + below, below + below);
        return above.sign() < 0 ? -result : result;
    }
    default:
        return Integer::truncatedQuotient(above, below);
    }
}

bool holds(SymbolicOp op, int order) {
    switch (op) {
    case SymbolicOp::Equal:
        return order == 0;
    case SymbolicOp::NotEqual:
        return order != 0;
    case SymbolicOp::LessThan:
        return order < 0;
    case SymbolicOp::LessThanOrEqual:
        return order <= 0;
    case SymbolicOp::GreaterThan:
        return order > 0;
    default:
        return order >= 0;
    }
}

// The comparison that holds when `op` does not; Not when `op` is none.
SymbolicOp opposite(SymbolicOp op) {
    switch (op) {
    case SymbolicOp::Equal:
        return SymbolicOp::NotEqual;
    case SymbolicOp::NotEqual:
        return SymbolicOp::Equal;
    case SymbolicOp::LessThan:
        return SymbolicOp::GreaterThanOrEqual;
    case SymbolicOp::LessThanOrEqual:
        return SymbolicOp::GreaterThan;
    case SymbolicOp::GreaterThan:
        return SymbolicOp::LessThanOrEqual;
    case SymbolicOp::GreaterThanOrEqual:
        return SymbolicOp::LessThan;
    default:
        return SymbolicOp::Not;
    }
}

} // namespace

Value SimplifyLaws::apply(SymbolicOp op, std::vector<Value>& operands) {
    for (Value& operand : operands)
        arithmetic_.settle(operand);
    switch (op) {
    case SymbolicOp::ND:
        return list(operands);
    case SymbolicOp::Power:
        return power(operands[0], operands[1]);
    case SymbolicOp::Modulo:
    case SymbolicOp::Rem: // the same under another name
        return remainder(SymbolicOp::Modulo, std::move(operands[0]), std::move(operands[1]));
    case SymbolicOp::Mod:
        return remainder(op, std::move(operands[0]), std::move(operands[1]));
    case SymbolicOp::Floor:
    case SymbolicOp::Ceil:
    case SymbolicOp::Round:
    case SymbolicOp::Fix:
        return rounded(op, std::move(operands[0]));
    case SymbolicOp::Abs:
        return absolute(std::move(operands[0]));
    case SymbolicOp::Not:
        return negation(operands[0]);
    default:
        return compared(op, operands[0], operands[1]);
    }
}

Value SimplifyLaws::atom(NodeId simplified) const {
    if (store_.simplified(simplified) == noNode) store_.setSimplified(simplified, simplified);
    return arithmetic_.leaf(simplified);
}

Value SimplifyLaws::unaryAtom(SymbolicOp op, Value& a) { return atom(store_.unary(op, arithmetic_.write(a))); }

Value SimplifyLaws::binaryAtom(SymbolicOp op, Value& a, Value& b) {
    const NodeId left = arithmetic_.write(a);
    return atom(store_.binary(op, left, arithmetic_.write(b)));
}

NodeId SimplifyLaws::soleAtom(const Value& a) const {
    if (!a.isPolynomial() || a.numerator.terms().size() != 1) return noNode;
    const auto& t = a.numerator.terms()[0];
    if (!t.coefficient.isOne() || t.numFactors != 1) return noNode;
    const Factor& f = a.numerator.factors(t)[0];
    return f.exponent == 1 ? f.atom : noNode;
}

bool SimplifyLaws::areIntegers(std::span<const Factor> factors) const {
    return std::all_of(factors.begin(), factors.end(), [&](const Factor& f) { return store_.isInteger(f.atom); });
}

Value SimplifyLaws::list(std::vector<Value>& dimensions) {
    std::vector<NodeId> ids;
    ids.reserve(dimensions.size());
    for (Value& d : dimensions)
        ids.push_back(arithmetic_.write(d));
    return atom(store_.node(SymbolicOp::ND, ids));
}

// What is left of powers when the exponent is no whole number that can be multiplied out.
Value SimplifyLaws::power(Value& base, Value& exponent) {
    if (base.isNumber() && exponent.isNumber() && (base.floating || exponent.floating)) {
        const double result = std::pow(doubleOf(base), doubleOf(exponent));
        if (std::isfinite(result)) return arithmetic_.number(result);
    }
    if (!base.floating && base.numerator.isOne() && base.denominator.isOne()) return base;
    return binaryAtom(SymbolicOp::Power, base, exponent);
}

Value SimplifyLaws::remainderOfNumbers(SymbolicOp op, Value& a, Value& b) {
    if (a.floating || b.floating) {
        const double y = doubleOf(b);
        double result = std::fmod(doubleOf(a), y);
        if (op == SymbolicOp::Mod && result != 0 && (result < 0) != (y < 0)) result += y;
        return std::isfinite(result) ? arithmetic_.number(result) : binaryAtom(op, a, b);
    }
    const Integer below = denominatorOf(a) * denominatorOf(b);
    const Integer x = a.numerator.constant() * denominatorOf(b);
    const Integer y = b.numerator.constant() * denominatorOf(a);
    const Integer times = op == SymbolicOp::Mod ? Integer::floorQuotient(x, y) : Integer::truncatedQuotient(x, y);
    return arithmetic_.quotient(Polynomial(x - y * times), Polynomial(below));
}

Value SimplifyLaws::remainder(SymbolicOp op, Value a, Value b) {
    if (b.isZero()) return binaryAtom(op, a, b);
    if (a.isNumber() && b.isNumber()) return remainderOfNumbers(op, a, b);
    arithmetic_.settleAsPolynomials(a);
    arithmetic_.settleAsPolynomials(b);
    if (a.isZero()) return a;
    if (leadingSign(b) < 0) {
        b = arithmetic_.negate(std::move(b));
        if (op == SymbolicOp::Mod)
            return arithmetic_.negate(remainder(op, arithmetic_.negate(std::move(a)), std::move(b)));
        arithmetic_.settle(b);
    }
    if (op == SymbolicOp::Modulo && leadingSign(a) < 0)
        return arithmetic_.negate(remainder(op, arithmetic_.negate(std::move(a)), std::move(b)));
    const bool mayDivide = a.denominator.isOne() || !b.denominator.isOne(); // a denominator does not go away
    if (mayDivide && arithmetic_.isInteger(arithmetic_.divide(a, b))) return arithmetic_.number(Integer(0));

    if (op == SymbolicOp::Mod) dropMultiples(a, b);

    // A remainder is its own remainder by the same divisor, and by a number that is not smaller.
    const NodeId inner = soleAtom(a);
    if (inner != noNode && store_.op(inner) == op) {
        const NodeId divisor = store_.operand(inner, 1);
        if (divisor == arithmetic_.write(b)) return a;
        const bool areInts =
            store_.op(divisor) == SymbolicOp::IntValue && b.denominator.isOne() && b.numerator.isConstant();
        const Integer first = areInts ? Integer(store_.intValue(divisor)) : Integer(0);
        if (first.sign() > 0 && first < b.numerator.constant()) return a;
    }
    return binaryAtom(op, a, b);
}

// mod(K + 3*L, L) is mod(K, L), and mod(K + 5, 4) is mod(K + 1, 4): whole multiples of the divisor do not count.
void SimplifyLaws::dropMultiples(Value& a, const Value& b) const {
    if (!b.denominator.isOne() || b.numerator.terms().size() != 1) return;
    const auto divisor = Polynomial::product(b.numerator, a.denominator.polynomial());
    if (!divisor || divisor->terms().size() != 1) return;
    takeWholeMultiples(a.numerator, *divisor);
    const bool hasDoubles = a.hasDoubles;
    a = arithmetic_.quotient(std::move(a.numerator), a.denominator.taken());
    a.hasDoubles = hasDoubles;
}

Value SimplifyLaws::rounded(SymbolicOp op, Value a) {
    if (a.floating) return arithmetic_.number(roundedDouble(op, *a.floating));
    if (a.isNumber()) return arithmetic_.number(roundedQuotient(op, a.numerator.constant(), denominatorOf(a)));
    arithmetic_.settle(a);
    if (arithmetic_.isInteger(a)) return a;
    if (op == SymbolicOp::Floor || op == SymbolicOp::Ceil) return wholePartsOut(op, std::move(a));
    if (leadingSign(a) < 0) return arithmetic_.negate(rounded(op, arithmetic_.negate(std::move(a))));
    return unaryAtom(op, a);
}

// Takes out of the numerator the terms, or the part of their coefficients rounded towards zero, that are whole
// multiples of a single term, and returns the multiples.
Polynomial SimplifyLaws::takeWholeMultiples(Polynomial& numerator, const Polynomial& divisor) const {
    const Integer& times = divisor.terms()[0].coefficient;
    const auto divided = divisor.factors(divisor.terms()[0]);
    Polynomial whole;
    Polynomial rest;
    std::vector<Factor> left;
    for (const auto& t : numerator.terms()) {
        const auto factors = numerator.factors(t);
        left.assign(factors.begin(), factors.end());
        bool isDivisible = true;
        for (const Factor& d : divided) {
            const auto at = std::find_if(left.begin(), left.end(), [&](const Factor& f) { return f.atom == d.atom; });
            isDivisible = isDivisible && at != left.end() && at->exponent >= d.exponent;
            if (isDivisible) at->exponent -= d.exponent;
        }
        std::erase_if(left, [](const Factor& f) { return f.exponent == 0; });
        Integer multiple;
        if (isDivisible && areIntegers(left)) multiple = Integer::truncatedQuotient(t.coefficient, times);
        const Integer remaining = t.coefficient - multiple * times;
        if (!multiple.isZero()) whole.add(std::move(multiple), left);
        if (!remaining.isZero()) rest.add(remaining, factors);
    }
    whole.normalize();
    rest.normalize();
    numerator = std::move(rest);
    return whole;
}

// floor(K + x) is K + floor(x), and floor((5*K + L)/2) is 2*K + floor((K + L)/2), for whole K.
Value SimplifyLaws::wholePartsOut(SymbolicOp op, Value a) {
    const Polynomial below = a.denominator.polynomial();
    Value whole = arithmetic_.number(Integer(0));
    if (below.terms().size() == 1) {
        whole.numerator = takeWholeMultiples(a.numerator, below);
        const bool hasDoubles = a.hasDoubles;
        a = arithmetic_.quotient(std::move(a.numerator), below);
        a.hasDoubles = hasDoubles;
    }
    if (a.isNumber()) return arithmetic_.add(std::move(whole), rounded(op, std::move(a)), false);
    const bool isNegative = leadingSign(a) < 0;
    if (isNegative) {
        a = arithmetic_.negate(std::move(a));
        op = op == SymbolicOp::Floor ? SymbolicOp::Ceil : SymbolicOp::Floor;
    }
    return arithmetic_.add(std::move(whole), unaryAtom(op, a), isNegative);
}

Value SimplifyLaws::absolute(Value a) {
    if (a.floating) return arithmetic_.number(std::fabs(*a.floating));
    arithmetic_.settle(a);
    if (leadingSign(a) < 0) {
        a = arithmetic_.negate(std::move(a));
        arithmetic_.settle(a);
    }
    const NodeId inner = soleAtom(a);
    if (a.isNumber() || (inner != noNode && store_.op(inner) == SymbolicOp::Abs)) return a;
    return unaryAtom(SymbolicOp::Abs, a);
}

Value SimplifyLaws::compared(SymbolicOp op, Value& a, Value& b) {
    if (a.isNumber() && b.isNumber() && (a.floating || b.floating)) {
        const double x = doubleOf(a);
        const double y = doubleOf(b);
        if (std::isnan(x) || std::isnan(y)) return truth(op == SymbolicOp::NotEqual);
        return truth(holds(op, x < y ? -1 : (x > y ? 1 : 0)));
    }
    Value difference = arithmetic_.add(a, b, true);
    arithmetic_.settle(difference);
    if (difference.isNumber()) return truth(holds(op, leadingSign(difference)));
    return binaryAtom(op, a, b);
}

Value SimplifyLaws::negation(Value& a) {
    if (a.isNumber()) return truth(a.isZero());
    arithmetic_.settle(a);
    const NodeId inner = soleAtom(a);
    if (inner != noNode) {
        const SymbolicOp op = store_.op(inner);
        if (op == SymbolicOp::BoolSymbol) return truth(!store_.boolValue(inner));
        if (op == SymbolicOp::Not && isTruth(store_.operand(inner, 0))) return atom(store_.operand(inner, 0));
        if (opposite(op) != SymbolicOp::Not)
            return atom(store_.binary(opposite(op), store_.operand(inner, 0), store_.operand(inner, 1)));
    }
    return unaryAtom(SymbolicOp::Not, a);
}

bool SimplifyLaws::isTruth(NodeId id) const {
    const SymbolicOp op = store_.op(id);
    return op == SymbolicOp::BoolSymbol || op == SymbolicOp::And || op == SymbolicOp::Or || op == SymbolicOp::Not ||
           opposite(op) != SymbolicOp::Not;
}

void SimplifyLaws::flatten(SymbolicOp op, NodeId operand, std::vector<NodeId>& parts) const {
    // A simplified chain leans to the left.
    while (store_.op(operand) == op) {
        parts.push_back(store_.operand(operand, 1));
        operand = store_.operand(operand, 0);
    }
    parts.push_back(operand);
}

// Of numbers, and of K - 1, K, K + 2 and the like, only the smallest or the largest is kept.
void SimplifyLaws::keepExtremes(SymbolicOp op, std::vector<NodeId>& operands) const {
    struct Kept {
        NodeId operand;
        double constant;
    };
    std::map<NodeId, Kept> byRest; // noNode for plain numbers
    const auto isNumber = [&](NodeId id) {
        return store_.op(id) == SymbolicOp::IntValue ||
               (store_.op(id) == SymbolicOp::DoubleValue && std::isfinite(store_.doubleValue(id)));
    };
    const auto numberOf = [&](NodeId id) {
        return store_.op(id) == SymbolicOp::IntValue ? store_.intValue(id) : store_.doubleValue(id);
    };
    for (const NodeId operand : operands) {
        NodeId rest = operand;
        double constant = 0;
        if (isNumber(operand)) {
            rest = noNode;
            constant = numberOf(operand);
        } else if (const SymbolicOp sum = store_.op(operand);
                   (sum == SymbolicOp::Plus || sum == SymbolicOp::Minus) && isNumber(store_.operand(operand, 1))) {
            rest = store_.operand(operand, 0);
            constant = numberOf(store_.operand(operand, 1)) * (sum == SymbolicOp::Plus ? 1 : -1);
        }
        const auto [at, isNew] = byRest.try_emplace(rest, Kept{operand, constant});
        if (!isNew && (op == SymbolicOp::Min ? constant < at->second.constant : constant > at->second.constant))
            at->second = {operand, constant};
    }
    operands.clear();
    for (const auto& [rest, kept] : byRest)
        operands.push_back(kept.operand);
}

// min(a, max(a, b)) is a, and max(a, min(a, b)) too.
void SimplifyLaws::absorb(SymbolicOp op, std::vector<NodeId>& operands) const {
    const SymbolicOp other = op == SymbolicOp::Min ? SymbolicOp::Max : SymbolicOp::Min;
    const std::vector<NodeId> all = operands; // ascending
    std::erase_if(operands, [&](NodeId operand) {
        if (store_.op(operand) != other) return false;
        std::vector<NodeId> parts;
        flatten(other, operand, parts);
        return std::any_of(parts.begin(), parts.end(),
                           [&](NodeId part) { return std::binary_search(all.begin(), all.end(), part); });
    });
}

Value SimplifyLaws::applyLattice(SymbolicOp op, std::vector<NodeId> operands) {
    std::vector<NodeId> parts;
    for (const NodeId operand : operands)
        flatten(op, operand, parts);
    const auto makeUnique = [&] {
        std::sort(parts.begin(), parts.end());
        parts.erase(std::unique(parts.begin(), parts.end()), parts.end());
    };
    makeUnique();
    if (op == SymbolicOp::And || op == SymbolicOp::Or) return logical(op, parts);
    keepExtremes(op, parts);
    makeUnique();
    absorb(op, parts);
    NodeId chain = parts[0];
    for (std::size_t i = 1; i < parts.size(); ++i)
        chain = store_.binary(op, chain, parts[i]);
    return parts.size() == 1 ? arithmetic_.leaf(chain) : atom(chain);
}

Value SimplifyLaws::logical(SymbolicOp op, std::vector<NodeId>& operands) {
    const bool deciding = op == SymbolicOp::Or; // the value that decides whatever the other operands are
    std::vector<NodeId> kept;
    for (const NodeId operand : operands) {
        std::optional<bool> value;
        if (store_.op(operand) == SymbolicOp::BoolSymbol) value = store_.boolValue(operand);
        if (store_.op(operand) == SymbolicOp::IntValue) value = store_.intValue(operand) != 0;
        if (store_.op(operand) == SymbolicOp::DoubleValue) value = store_.doubleValue(operand) != 0;
        if (value == deciding) return truth(deciding);
        if (!value) kept.push_back(operand);
    }
    if (kept.empty()) return truth(!deciding);
    if (kept.size() == 1)
        return isTruth(kept[0]) ? atom(kept[0]) : atom(store_.binary(SymbolicOp::NotEqual, kept[0], store_.integer(0)));
    NodeId chain = kept[0];
    for (std::size_t i = 1; i < kept.size(); ++i)
        chain = store_.binary(op, chain, kept[i]);
    return atom(chain);
}

} // namespace QL
