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

// A number as the double that it is exactly.
std::optional<double> exactDouble(const Value& v) {
    if (v.floating) return v.floating;
    const auto above = exactDouble(v.numerator.constant());
    const auto below = exactDouble(v.denominator.polynomial().constant());
    if (!above || !below) return std::nullopt;
    int exponent = 0;
    if (std::frexp(*below, &exponent) != 0.5) return std::nullopt; // no power of two
    return std::ldexp(*above, 1 - exponent);
}

bool isMonomial(const Polynomial& p) { return p.terms().size() == 1 && p.terms()[0].coefficient.isOne(); }

// Multiplies quotients of single terms when all atoms of the second are younger than those of the first: nothing
// cancels then, and they go to the end. So a long product costs a step a factor.
bool multiplyAtEnd(Value& older, const Value& younger) {
    if (!older.numerator.isOlderThan(younger.numerator)) return false;
    if (older.denominator.isOne() && younger.denominator.isOne())
        return older.numerator.multiplyAtEnd(younger.numerator);
    const Polynomial& below = younger.denominator.polynomial();
    const Polynomial& own = older.denominator.polynomial();
    if (!older.isReduced || !younger.isReduced || !isMonomial(below) || !isMonomial(own) || !own.isOlderThan(below) ||
        !own.isOlderThan(younger.numerator) || !older.numerator.isOlderThan(below) ||
        !older.numerator.multiplyAtEnd(younger.numerator))
        return false;
    if (older.denominator.isOne())
        older.denominator = below;
    else
        older.denominator.get()->multiplyAtEnd(below); // of coefficients of 1, so within the limits
    return true;
}

} // namespace

const Polynomial& Denominator::polynomial() const {
    static const Polynomial one{Integer(1)};
    return value_ ? *value_ : one;
}

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
    if (value.floating) return;
    value.numerator.normalize();
    if (value.hasDoubles) uniteDoubles(value.numerator);
    if (value.isReduced) return;
    value.isReduced = true;
    if (value.numerator.isZero()) {
        value.denominator = {};
        return;
    }
    Polynomial below = value.denominator.taken();
    Polynomial::removeCommonDivisor(value.numerator, below);
    expandSoleSum(value.numerator);
    expandSoleSum(below);
    value.denominator = std::move(below);
}

void RationalArithmetic::settleAsPolynomials(Value& value) const {
    dropFloating(value);
    settle(value);
}

// Two numbers of which one is a double: C's arithmetic of doubles, but for results beyond their range.
std::optional<Value> RationalArithmetic::foldDoubles(SymbolicOp op, Value& a, Value& b) const {
    if (!a.floating && !b.floating) return std::nullopt;
    if (a.numerator.numGathered() > 1 || b.numerator.numGathered() > 1) return std::nullopt; // no number at sight
    settle(a);
    settle(b);
    if (!a.isNumber() || !b.isNumber()) return std::nullopt;
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
    default: // Divide
        if (*y == 0.0) return std::nullopt;
        result = *x / *y;
        break;
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

// A polynomial of one term over an atom that stands for `p`, but for a number in front.
Polynomial RationalArithmetic::collapsed(const Polynomial& p) {
    const bool isShort = p.maxBits() <= limits::coefficientBits / 2;
    if (p.isConstant() && isShort) return p;
    Integer content(p.leadingSign());
    if (isShort) content = p.leadingSign() < 0 ? -p.content() : p.content();
    Polynomial rest = p;
    rest.divideExactly(content);
    const Factor atom{writer_.write(rest), 1};
    return Polynomial(content, {&atom, 1});
}

// A sum becomes the atom that stands for it where a product that was not multiplied out has that atom, so that it can
// be cancelled.
void RationalArithmetic::collapseIfFactor(Polynomial& p, const Polynomial& product) {
    if (p.terms().size() < 2 || product.terms().size() != 1) return;
    const auto factors = product.factors(product.terms()[0]);
    if (std::ranges::none_of(factors, [&](const Factor& f) { return isSum(store_.op(f.atom)); })) return;
    Polynomial atom = collapsed(p);
    const NodeId sum = atom.factors(atom.terms()[0])[0].atom;
    if (std::ranges::any_of(factors, [&](const Factor& f) { return f.atom == sum; })) p = std::move(atom);
}

// Of a product that was not multiplied out because of its length, one sum can be left by a division.
void RationalArithmetic::expandSoleSum(Polynomial& p) const {
    if (p.terms().size() != 1) return;
    const auto& term = p.terms()[0];
    std::vector<Factor> others;
    NodeId sum = noNode;
    for (const Factor& f : p.factors(term)) {
        if (!isSum(store_.op(f.atom)))
            others.push_back(f);
        else if (sum == noNode && f.exponent == 1)
            sum = f.atom;
        else
            return;
    }
    if (sum == noNode) return;
    if (auto expanded =
            Polynomial::product(Polynomial(term.coefficient, others), reader_.simplifiedSum(sum).polynomial))
        p = *std::move(expanded);
}

Polynomial RationalArithmetic::times(const Polynomial& a, const Polynomial& b) {
    if (auto expanded = Polynomial::product(a, b)) return *std::move(expanded);
    return *Polynomial::product(collapsed(a), collapsed(b));
}

Polynomial RationalArithmetic::raised(const Polynomial& base, std::uint64_t exponent) {
    if (auto expanded = Polynomial::power(base, exponent)) return *std::move(expanded);
    if (auto expanded = Polynomial::power(collapsed(base), exponent)) return *std::move(expanded);
    const Factor atom{writer_.write(base), exponent}; // a number whose power is too long to be written
    return Polynomial(Integer(1), {&atom, 1});
}

Value RationalArithmetic::quotient(Polynomial numerator, Polynomial denominator) const {
    if (denominator.leadingSign() < 0) {
        numerator.negate();
        denominator.negate();
        denominator.normalize();
    }
    Value v;
    v.numerator = std::move(numerator);
    v.denominator = std::move(denominator);
    v.isReduced = v.denominator.isOne();
    settle(v);
    return v;
}

Value RationalArithmetic::negate(Value a) const {
    if (a.floating) return number(-*a.floating);
    a.numerator.negate();
    return a;
}

// Adds `b` where its denominator is at sight a divisor of that of `a`. The sum is gathered over the denominator of `a`
// and reduced when it is settled, so that a long sum costs a step a term.
bool RationalArithmetic::gather(Value& a, Value& b, bool subtracts) const {
    if (a.denominator.polynomial() == b.denominator.polynomial()) {
        if (a.numerator.numGathered() < b.numerator.numGathered()) {
            if (subtracts) b.numerator.negate();
            std::swap(a.numerator, b.numerator);
            subtracts = false;
        }
        a.numerator.add(b.numerator, subtracts);
        a.isReduced = a.denominator.isOne();
        return true;
    }
    Polynomial factor = a.denominator.polynomial(); // what the second numerator is multiplied by
    if (!b.denominator.isOne()) {
        if (!a.denominator.isConstant() || !b.denominator.isConstant()) return false;
        Integer missing = b.denominator.polynomial().constant();
        Integer times = a.denominator.polynomial().constant();
        const Integer common = Integer::gcd(missing, times);
        missing.divideExactly(common);
        times.divideExactly(common);
        factor = Polynomial(times);
        if (!missing.isOne()) {
            a.numerator.normalize();
            auto above = Polynomial::product(a.numerator, Polynomial(missing));
            auto below = Polynomial::product(a.denominator.polynomial(), Polynomial(missing));
            if (!above || !below) return false;
            a.numerator = *std::move(above);
            a.denominator = *std::move(below);
        }
        a.isReduced = false;
    }
    b.numerator.normalize();
    const auto added = Polynomial::product(b.numerator, factor);
    if (added) a.numerator.add(*added, subtracts);
    return added.has_value();
}

// The sum over the least common denominator, reduced by what the two denominators have in common alone.
std::optional<Value> RationalArithmetic::sumOfQuotients(const Value& a, const Value& b, bool subtracts) const {
    Polynomial restA = a.denominator.polynomial();
    Polynomial restB = b.denominator.polynomial();
    Polynomial common = Polynomial::removeCommonDivisor(restA, restB);
    auto sum = Polynomial::product(a.numerator, restB);
    const auto second = Polynomial::product(b.numerator, restA);
    if (!sum || !second) return std::nullopt;
    sum->add(*second, subtracts);
    sum->normalize();
    if (sum->isZero()) return Value();
    Polynomial::removeCommonDivisor(*sum, common);
    const auto partial = Polynomial::product(restA, restB);
    auto whole = partial ? Polynomial::product(*partial, common) : std::nullopt;
    if (!whole) return std::nullopt;
    Value v;
    v.numerator = *std::move(sum);
    v.denominator = *std::move(whole);
    return v;
}

// A quotient as an atom, for a sum that is not brought to one denominator.
Value RationalArithmetic::asTerm(Value v) { return v.isPolynomial() ? v : polynomial(Polynomial(write(v))); }

Value RationalArithmetic::add(Value a, Value b, bool subtracts) {
    if (auto folded = foldDoubles(subtracts ? SymbolicOp::Minus : SymbolicOp::Plus, a, b)) return *std::move(folded);
    dropFloating(a);
    dropFloating(b);
    if (a.denominator.isOne() && !b.denominator.isOne()) { // the one with a denominator comes first
        if (subtracts) b.numerator.negate();
        std::swap(a, b);
        subtracts = false;
    }
    const bool hasDoubles = a.hasDoubles || b.hasDoubles;
    const bool hasOpaqueQuotient = a.hasOpaqueQuotient || b.hasOpaqueQuotient;
    const auto flagged = [&](Value v, bool isOpaque) {
        v.hasDoubles = hasDoubles;
        v.hasOpaqueQuotient = isOpaque;
        return v;
    };
    // Where quotients have been given up, the next ones are not tried.
    if (a.isPolynomial() || !hasOpaqueQuotient) {
        if (gather(a, b, subtracts)) return flagged(std::move(a), hasOpaqueQuotient);
        settle(a);
        settle(b);
        if (auto sum = sumOfQuotients(a, b, subtracts)) return flagged(*std::move(sum), false);
    }
    Value sum = asTerm(std::move(a));
    Value added = asTerm(std::move(b));
    gather(sum, added, subtracts);
    return flagged(std::move(sum), true);
}

Value RationalArithmetic::multiply(Value a, Value b) {
    if (auto folded = foldDoubles(SymbolicOp::Multiply, a, b)) return *std::move(folded);
    dropFloating(a);
    dropFloating(b);
    const bool hasDoubles = a.hasDoubles || b.hasDoubles;
    const bool hasOpaqueQuotient = a.hasOpaqueQuotient || b.hasOpaqueQuotient;
    if (multiplyAtEnd(b, a)) {
        std::swap(a, b);
    } else if (!multiplyAtEnd(a, b)) {
        settle(a);
        settle(b);
        if (a.isZero() || b.isZero()) return number(Integer(0));
        if (!a.denominator.isOne() || !b.denominator.isOne()) {
            Polynomial belowA = a.denominator.taken();
            Polynomial belowB = b.denominator.taken();
            for (const auto& [above, below] : {std::pair(&a.numerator, &belowB), std::pair(&b.numerator, &belowA)}) {
                collapseIfFactor(*above, *below);
                collapseIfFactor(*below, *above);
                Polynomial::removeCommonDivisor(*above, *below);
            }
            Polynomial below = times(belowA, belowB);
            expandSoleSum(below);
            a.denominator = std::move(below);
            a.numerator = times(a.numerator, b.numerator);
            expandSoleSum(a.numerator);
        } else {
            a.numerator = times(a.numerator, b.numerator);
        }
    }
    a.hasDoubles = hasDoubles;
    a.hasOpaqueQuotient = hasOpaqueQuotient;
    return a;
}

Value RationalArithmetic::square(Value a) {
    if (a.floating) return multiply(a, a);
    settle(a);
    if (!a.denominator.isOne() && !a.denominator.get()->squareTerm())
        a.denominator = times(a.denominator.polynomial(), a.denominator.polynomial());
    if (!a.numerator.squareTerm()) a.numerator = times(a.numerator, a.numerator);
    return a;
}

// An operator that is not carried out: the expression is an atom.
Value RationalArithmetic::opaque(SymbolicOp op, Value& a, Value& b) {
    const NodeId left = write(a);
    return polynomial(Polynomial(store_.binary(op, left, write(b))));
}

Value RationalArithmetic::divide(Value a, Value b) {
    if (auto folded = foldDoubles(SymbolicOp::Divide, a, b)) return *std::move(folded);
    settleAsPolynomials(b);
    if (b.isZero()) return opaque(SymbolicOp::Divide, a, b);
    Polynomial above = b.denominator.taken();
    if (b.numerator.leadingSign() < 0) {
        above.negate();
        above.normalize();
        b.numerator.negate();
        b.numerator.normalize();
    }
    b.denominator = std::move(b.numerator);
    b.numerator = std::move(above);
    return multiply(std::move(a), std::move(b));
}

Value RationalArithmetic::power(Value base, std::int64_t exponent) {
    settleAsPolynomials(base);
    if (exponent < 0) {
        if (base.isZero()) {
            Value by = number(Integer(exponent));
            return opaque(SymbolicOp::Power, base, by);
        }
        return divide(number(Integer(1)), power(std::move(base), -exponent));
    }
    const auto magnitude = static_cast<std::uint64_t>(exponent);
    if (!base.denominator.isOne()) base.denominator = raised(*base.denominator.get(), magnitude);
    base.numerator = raised(base.numerator, magnitude);
    return base;
}

NodeId RationalArithmetic::write(Value& value) {
    if (value.floating) return store_.floating(*value.floating);
    settle(value);
    return writer_.write(value.numerator, value.denominator.get());
}

bool RationalArithmetic::isInteger(const Value& value) const {
    if (value.floating) return isWhole(*value.floating);
    if (!value.denominator.isOne()) return false;
    for (const auto& t : value.numerator.terms())
        for (const Factor& f : value.numerator.factors(t))
            if (!store_.isInteger(f.atom)) return false;
    return true;
}

} // namespace QL
