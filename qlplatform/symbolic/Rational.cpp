#include "qlplatform/symbolic/Rational_internal.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace QL {
namespace {

bool isWhole(double value) { return std::isfinite(value) && value == std::trunc(value); }

bool fitsIntValue(double whole) {
    return whole >= std::numeric_limits<int>::min() && whole <= std::numeric_limits<int>::max();
}

std::shared_ptr<const Polynomial> sharedDenominator(Polynomial p) {
    return p.isOne() ? nullptr : std::make_shared<const Polynomial>(std::move(p));
}

const Polynomial& one() {
    static const Polynomial value{Integer(1)};
    return value;
}

const Polynomial& denominatorOf(const Value& v) { return v.denominator ? *v.denominator : one(); }

// A number as the double that it is exactly.
std::optional<double> exactDouble(const Value& v) {
    if (v.floating) return v.floating;
    const auto above = exactDouble(v.numerator.constant());
    const auto below = v.denominator ? exactDouble(v.denominator->constant()) : 1.0;
    if (!above || !below || *below == 0.0) return std::nullopt;
    int exponent = 0;
    if (std::frexp(*below, &exponent) != 0.5) return std::nullopt; // no power of two
    return std::ldexp(*above, 1 - exponent);
}

} // namespace

Value RationalArithmetic::polynomial(Polynomial p) const {
    Value v;
    v.numerator = std::move(p);
    return v;
}

Value RationalArithmetic::number(double value) const {
    if (isWhole(value) && !fitsIntValue(value)) return number(integerOf(value));
    Value v;
    v.floating = value;
    return v;
}

Value RationalArithmetic::leaf(NodeId id) const {
    switch (store_.op(id)) {
    case SymbolicOp::IntValue:
        return number(Integer(store_.intValue(id)));
    case SymbolicOp::DoubleValue:
        return number(store_.doubleValue(id));
    default:
        return polynomial(Polynomial(id));
    }
}

// A double among polynomials: a whole one is a number like any other, another one is an atom.
void RationalArithmetic::dropFloating(Value& value) const {
    if (!value.floating) return;
    const double d = *value.floating;
    value.floating.reset();
    if (isWhole(d)) {
        value.numerator = Polynomial(integerOf(d));
        return;
    }
    value.numerator = Polynomial(store_.floating(std::fabs(d)));
    if (std::signbit(d)) value.numerator.negate();
    value.hasDoubles = true;
}

void RationalArithmetic::settle(Value& value) const {
    dropFloating(value);
    value.numerator.normalize();
    if (value.hasDoubles) uniteDoubles(value.numerator);
}

// Two numbers of which one is a double: C's arithmetic of doubles, but for results beyond their range.
std::optional<Value> RationalArithmetic::foldDoubles(SymbolicOp op, const Value& a, const Value& b) const {
    if ((!a.floating && !b.floating) || !a.isNumber() || !b.isNumber()) return std::nullopt;
    const auto x = exactDouble(a);
    const auto y = exactDouble(b);
    if (!x || !y) return std::nullopt;
    double result = 0;
    switch (op) {
    case SymbolicOp::Plus:
        result = *x + *y;
        break;
    case SymbolicOp::Minus:
        result = *x - *y;
        break;
    case SymbolicOp::Multiply:
        result = *x * *y;
        break;
    case SymbolicOp::Divide:
        if (*y == 0.0) return std::nullopt;
        result = *x / *y;
        break;
    default:
        return std::nullopt;
    }
    if (!std::isfinite(result) && std::isfinite(*x) && std::isfinite(*y)) return std::nullopt;
    return number(result);
}

// Multiplies the doubles of each term into one number where that is exact: 0.5*2*K is K.
void RationalArithmetic::uniteDoubles(Polynomial& p) const {
    bool changes = false;
    Polynomial united;
    std::vector<Factor> rest;
    for (const auto& t : p.terms()) {
        rest.clear();
        std::size_t numDoubles = 0;
        std::optional<double> product = exactDouble(t.coefficient);
        for (const Factor& f : p.factors(t)) {
            if (store_.op(f.atom) != SymbolicOp::DoubleValue) {
                rest.push_back(f);
                continue;
            }
            const double d = store_.doubleValue(f.atom);
            for (std::uint64_t i = 0; product && i < f.exponent; ++i, ++numDoubles) {
                const double next = *product * d;
                const bool isExact = std::isnormal(next) && std::fma(*product, d, -next) == 0.0 && numDoubles < 64;
                product = isExact ? std::optional(next) : std::nullopt;
            }
        }
        const bool isAlone = numDoubles == 1 && (t.coefficient.isOne() || t.coefficient.isMinusOne());
        if (!product || numDoubles == 0 || isAlone) {
            united.add(Polynomial(t.coefficient, p.factors(t)), false);
            continue;
        }
        changes = true;
        if (isWhole(*product)) {
            united.add(Polynomial(integerOf(*product), rest), false);
            continue;
        }
        const Factor atom{store_.floating(std::fabs(*product)), 1};
        rest.insert(std::lower_bound(rest.begin(), rest.end(), atom,
                                     [](const Factor& a, const Factor& b) { return a.atom < b.atom; }),
                    atom);
        united.add(Polynomial(Integer(*product < 0 ? -1 : 1), rest), false);
    }
    if (!changes) return;
    united.normalize();
    p = std::move(united);
}

Polynomial RationalArithmetic::collapsed(const Polynomial& p) {
    if (p.isConstant() && p.maxBits() <= limits::coefficientBits / 2) return p;
    Polynomial rest = p;
    Integer content(p.leadingSign());
    if (p.maxBits() <= limits::coefficientBits / 2) content = p.leadingSign() < 0 ? -p.content() : p.content();
    rest.divideExactly(content);
    const Factor atom{writer_.write(rest), 1};
    return Polynomial(content, {&atom, 1});
}

Polynomial RationalArithmetic::times(const Polynomial& a, const Polynomial& b) {
    if (auto expanded = Polynomial::product(a, b)) return *std::move(expanded);
    return *Polynomial::product(collapsed(a), collapsed(b));
}

Polynomial RationalArithmetic::raised(const Polynomial& base, std::uint64_t exponent) {
    if (auto expanded = Polynomial::power(base, exponent)) return *std::move(expanded);
    const Polynomial whole = collapsed(base);
    if (auto expanded = Polynomial::power(whole, exponent)) return *std::move(expanded);
    const Factor atom{writer_.write(base), exponent}; // a number whose power is too long to be written
    return Polynomial(Integer(1), {&atom, 1});
}

Value RationalArithmetic::negate(Value a) const {
    if (a.floating) return number(-*a.floating);
    a.numerator.negate();
    return a;
}

Value RationalArithmetic::quotient(Polynomial numerator, Polynomial denominator) const {
    Value v;
    if (!numerator.isZero()) {
        Polynomial::removeCommonDivisor(numerator, denominator);
        if (denominator.leadingSign() < 0) {
            numerator.negate();
            denominator.negate();
            numerator.normalize();
            denominator.normalize();
        }
        v.denominator = sharedDenominator(std::move(denominator));
    }
    v.numerator = std::move(numerator);
    return v;
}

Value RationalArithmetic::reduced(Value dividend, Value divisor) const {
    settle(dividend);
    settle(divisor);
    dividend.denominator = sharedDenominator(std::move(divisor.numerator));
    dividend.hasDoubles |= divisor.hasDoubles;
    return dividend;
}

// The sum over the least common denominator, reduced by what the two denominators have in common alone.
std::optional<Value> RationalArithmetic::sumOfQuotients(const Value& a, const Value& b, bool subtracts) const {
    Polynomial restA = denominatorOf(a);
    Polynomial restB = denominatorOf(b);
    Polynomial common = Polynomial::removeCommonDivisor(restA, restB);
    auto sum = Polynomial::product(a.numerator, restB);
    const auto second = Polynomial::product(b.numerator, restA);
    if (!sum || !second) return std::nullopt;
    sum->add(*second, subtracts);
    sum->normalize();
    if (sum->isZero()) return Value();
    Polynomial::removeCommonDivisor(*sum, common);
    const auto partial = Polynomial::product(restA, restB);
    const auto whole = partial ? Polynomial::product(*partial, common) : std::nullopt;
    if (!whole) return std::nullopt;
    Value v;
    v.numerator = *std::move(sum);
    v.denominator = sharedDenominator(*whole);
    return v;
}

Value RationalArithmetic::add(Value a, Value b, bool subtracts) {
    if (auto folded = foldDoubles(subtracts ? SymbolicOp::Minus : SymbolicOp::Plus, a, b)) return *std::move(folded);
    dropFloating(a);
    dropFloating(b);
    const bool hasDoubles = a.hasDoubles || b.hasDoubles;
    const bool hasOpaqueQuotient = a.hasOpaqueQuotient || b.hasOpaqueQuotient;
    const auto flagged = [&](Value v) {
        v.hasDoubles = hasDoubles;
        v.hasOpaqueQuotient |= hasOpaqueQuotient;
        return v;
    };
    if (a.isPolynomial() && b.isPolynomial()) {
        if (a.numerator.numGathered() < b.numerator.numGathered()) {
            if (subtracts) b.numerator.negate();
            std::swap(a, b);
            subtracts = false;
        }
        a.numerator.add(b.numerator, subtracts);
        return flagged(std::move(a));
    }
    settle(a);
    settle(b);
    if (!hasOpaqueQuotient)
        if (auto sum = sumOfQuotients(a, b, subtracts)) return flagged(*std::move(sum));
    const auto asTerm = [&](Value& v) {
        if (v.isPolynomial()) return std::move(v);
        const Factor atom{write(v), 1};
        Value term = polynomial(Polynomial(Integer(1), {&atom, 1}));
        term.hasOpaqueQuotient = true;
        return term;
    };
    Value sum = asTerm(a);
    const Value added = asTerm(b);
    sum.numerator.add(added.numerator, subtracts);
    sum.hasOpaqueQuotient = true;
    return flagged(std::move(sum));
}

Value RationalArithmetic::multiply(Value a, Value b) {
    if (auto folded = foldDoubles(SymbolicOp::Multiply, a, b)) return *std::move(folded);
    dropFloating(a);
    dropFloating(b);
    if (a.isPolynomial() && b.isPolynomial() && a.numerator.multiplyInPlace(b.numerator)) {
        a.hasDoubles |= b.hasDoubles;
        return a;
    }
    settle(a);
    settle(b);
    if (a.isZero() || b.isZero()) return number(Integer(0));
    Value v;
    if (a.denominator || b.denominator) {
        Polynomial belowA = denominatorOf(a);
        Polynomial belowB = denominatorOf(b);
        Polynomial::removeCommonDivisor(a.numerator, belowB);
        Polynomial::removeCommonDivisor(b.numerator, belowA);
        v.denominator = sharedDenominator(times(belowA, belowB));
    }
    v.numerator = times(a.numerator, b.numerator);
    v.hasDoubles = a.hasDoubles || b.hasDoubles;
    v.hasOpaqueQuotient = a.hasOpaqueQuotient || b.hasOpaqueQuotient;
    return v;
}

Value RationalArithmetic::opaque(SymbolicOp op, Value& a, Value& b) {
    const NodeId left = write(a);
    return polynomial(Polynomial(store_.binary(op, left, write(b))));
}

Value RationalArithmetic::divide(Value a, Value b) {
    if (auto folded = foldDoubles(SymbolicOp::Divide, a, b)) return *std::move(folded);
    settle(b);
    if (b.isZero()) return opaque(SymbolicOp::Divide, a, b);
    Value inverse;
    inverse.numerator = denominatorOf(b);
    if (b.numerator.leadingSign() < 0) {
        inverse.numerator.negate();
        inverse.numerator.normalize();
        b.numerator.negate();
        b.numerator.normalize();
    }
    inverse.denominator = sharedDenominator(std::move(b.numerator));
    inverse.hasDoubles = b.hasDoubles;
    return multiply(std::move(a), std::move(inverse));
}

Value RationalArithmetic::power(Value base, std::int64_t exponent) {
    settle(base);
    if (exponent < 0) {
        if (base.isZero()) {
            Value by = number(Integer(exponent));
            return opaque(SymbolicOp::Power, base, by);
        }
        return divide(number(Integer(1)), power(std::move(base), -exponent));
    }
    const auto times = static_cast<std::uint64_t>(exponent);
    Value v;
    v.numerator = raised(base.numerator, times);
    if (base.denominator) v.denominator = sharedDenominator(raised(*base.denominator, times));
    v.hasDoubles = base.hasDoubles;
    return v;
}

NodeId RationalArithmetic::write(Value& value) {
    if (value.floating) return store_.floating(*value.floating);
    settle(value);
    return writer_.write(value.numerator, value.denominator.get());
}

bool RationalArithmetic::isInteger(const Value& value) const {
    if (value.floating) return isWhole(*value.floating);
    if (value.denominator) return false;
    for (const auto& t : value.numerator.terms())
        for (const Factor& f : value.numerator.factors(t))
            if (!store_.isInteger(f.atom)) return false;
    return true;
}

} // namespace QL
