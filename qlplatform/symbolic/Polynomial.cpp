#include "qlplatform/symbolic/Polynomial_internal.h"

#include <algorithm>
#include <limits>

namespace QL {
namespace {

using FactorList = boost::container::small_vector<Factor, 8>;

// The factors of a product of two monomials. False when an exponent is beyond its limit.
bool multiplyFactors(std::span<const Factor> a, std::span<const Factor> b, FactorList& product) {
    product.clear();
    auto inA = a.begin();
    auto inB = b.begin();
    while (inA != a.end() && inB != b.end()) {
        if (inA->atom < inB->atom) {
            product.push_back(*inA++);
        } else if (inB->atom < inA->atom) {
            product.push_back(*inB++);
        } else {
            const std::uint64_t exponent = inA->exponent + inB->exponent;
            if (exponent > limits::exponent) return false;
            product.push_back({inA->atom, exponent});
            ++inA;
            ++inB;
        }
    }
    product.insert(product.end(), inA, a.end());
    product.insert(product.end(), inB, b.end());
    return true;
}

} // namespace

std::uint64_t Polynomial::degreeOf(std::span<const Factor> factors) {
    std::uint64_t degree = 0;
    for (const Factor& f : factors)
        if (__builtin_add_overflow(degree, f.exponent, &degree)) return std::numeric_limits<std::uint64_t>::max();
    return degree;
}

int Polynomial::compareMonomials(std::uint64_t degreeA, std::span<const Factor> a, std::uint64_t degreeB,
                                 std::span<const Factor> b) {
    if (degreeA != degreeB) return degreeA > degreeB ? -1 : 1;
    const std::size_t common = std::min(a.size(), b.size());
    for (std::size_t i = 0; i < common; ++i) {
        if (a[i].atom != b[i].atom) return a[i].atom < b[i].atom ? -1 : 1;
        if (a[i].exponent != b[i].exponent) return a[i].exponent > b[i].exponent ? -1 : 1;
    }
    return a.size() == b.size() ? 0 : (a.size() > b.size() ? -1 : 1);
}

Polynomial::Polynomial(Integer constant) {
    if (!constant.isZero()) append(std::move(constant), {});
}

Polynomial::Polynomial(NodeId atom) {
    const Factor factor{atom, 1};
    append(Integer(1), {&factor, 1});
}

Polynomial::Polynomial(Integer coefficient, std::span<const Factor> factors) {
    append(std::move(coefficient), factors);
}

void Polynomial::append(Integer coefficient, std::span<const Factor> factors) {
    pushBack(std::move(coefficient), factors, degreeOf(factors));
    ++numOrdered_;
}

void Polynomial::pushBack(Integer coefficient, std::span<const Factor> factors, std::uint64_t degree) {
    const auto first = static_cast<std::uint32_t>(factors_.size());
    factors_.insert(factors_.end(), factors.begin(), factors.end());
    terms_.push_back({std::move(coefficient), first, static_cast<std::uint32_t>(factors.size()), degree});
}

bool Polynomial::precedes(const Term& a, const Term& b) const {
    return compareMonomials(a.degree, factors(a), b.degree, factors(b)) < 0;
}

bool operator==(const Polynomial& a, const Polynomial& b) {
    return std::equal(a.terms_.begin(), a.terms_.end(), b.terms_.begin(), b.terms_.end(),
                      [&](const Polynomial::Term& s, const Polynomial::Term& t) {
                          const auto f = a.factors(s);
                          const auto g = b.factors(t);
                          return s.coefficient == t.coefficient && std::equal(f.begin(), f.end(), g.begin(), g.end());
                      });
}

Integer Polynomial::content() const {
    Integer divisor;
    for (const Term& t : terms_) {
        divisor = Integer::gcd(divisor, t.coefficient);
        if (divisor.isOne()) break;
    }
    return divisor;
}

void Polynomial::divideExactly(const Integer& divisor) {
    if (divisor.isOne()) return;
    for (Term& t : terms_)
        t.coefficient.divideExactly(divisor);
}

void Polynomial::add(const Polynomial& other, bool negated) {
    const bool changesSign = negated != (other.isNegated_ != isNegated_);
    for (const Term& t : other.terms_)
        gather(changesSign ? -t.coefficient : t.coefficient, other.factors(t), t.degree);
    normalizeWhatWaits();
}

void Polynomial::add(Integer coefficient, std::span<const Factor> factors) {
    if (isNegated_) coefficient.negate();
    gather(std::move(coefficient), factors, degreeOf(factors));
    normalizeWhatWaits();
}

void Polynomial::gather(Integer coefficient, std::span<const Factor> added, std::uint64_t degree) {
    if (numOrdered_ == terms_.size()) { // everything so far is in order: perhaps this one is, too
        const int order =
            terms_.empty() ? -1 : compareMonomials(terms_.back().degree, factors(terms_.back()), degree, added);
        if (order == 0) {
            terms_.back().coefficient += coefficient;
            if (terms_.back().coefficient.isZero()) {
                terms_.pop_back();
                --numOrdered_;
            }
            return;
        }
        pushBack(std::move(coefficient), added, degree);
        if (order < 0) ++numOrdered_;
        return;
    }
    pushBack(std::move(coefficient), added, degree);
}

// What waits is put in order when it outgrows what is: each term is then moved a logarithmic number of times.
void Polynomial::normalizeWhatWaits() {
    if (terms_.size() - numOrdered_ > numOrdered_ + 32) normalize();
}

void Polynomial::normalize() {
    if (isNegated_) {
        for (Term& t : terms_)
            t.coefficient.negate();
        isNegated_ = false;
    }
    if (numOrdered_ == terms_.size()) return;
    const auto before = [this](const Term& a, const Term& b) { return precedes(a, b); };
    const auto middle = terms_.begin() + static_cast<std::ptrdiff_t>(numOrdered_);
    std::sort(middle, terms_.end(), before);
    std::inplace_merge(terms_.begin(), middle, terms_.end(), before);
    auto kept = terms_.begin();
    for (auto t = terms_.begin(); t != terms_.end();) {
        auto like = t + 1;
        for (; like != terms_.end() && !before(*t, *like); ++like)
            t->coefficient += like->coefficient;
        if (!t->coefficient.isZero()) {
            if (kept != t) *kept = std::move(*t);
            ++kept;
        }
        t = like;
    }
    terms_.erase(kept, terms_.end());
    numOrdered_ = terms_.size();
    compactFactors();
}

// Drops the factors of terms that are gone, once they are the larger part.
void Polynomial::compactFactors() {
    std::size_t used = 0;
    for (const Term& t : terms_)
        used += t.numFactors;
    if (factors_.size() <= 2 * used + 16) return;
    boost::container::small_vector<Factor, 3> kept;
    kept.reserve(used);
    for (Term& t : terms_) {
        const auto own = factors(t);
        const auto first = static_cast<std::uint32_t>(kept.size());
        kept.insert(kept.end(), own.begin(), own.end());
        t.firstFactor = first;
    }
    factors_ = std::move(kept);
}

std::size_t Polynomial::numWords() const {
    std::size_t words = terms_.size();
    for (const Term& t : terms_)
        words += t.numFactors;
    return words;
}

std::size_t Polynomial::maxBits() const {
    std::size_t bits = 0;
    for (const Term& t : terms_)
        bits = std::max(bits, t.coefficient.numBits());
    return bits;
}

bool Polynomial::isProductWithinLimits(const Polynomial& other) const {
    const std::size_t bits = maxBits() + other.maxBits();
    if (bits > limits::coefficientBits) return false;
    const std::size_t numProducts = terms_.size() * other.terms_.size();
    if (numProducts == 1 || isConstant() || other.isConstant()) return true;
    const std::size_t words =
        numWords() * other.terms_.size() + other.numWords() * terms_.size() - numProducts + numProducts * (bits / 64);
    return words <= limits::productWords;
}

std::optional<Polynomial> Polynomial::product(const Polynomial& a, const Polynomial& b) {
    if (a.isZero() || b.isZero()) return Polynomial();
    if (!a.isProductWithinLimits(b)) return std::nullopt;
    return fullProduct(a, b);
}

std::optional<Polynomial> Polynomial::fullProduct(const Polynomial& a, const Polynomial& b) {
    Polynomial result;
    result.terms_.reserve(a.terms_.size() * b.terms_.size());
    FactorList factors;
    for (const Term& s : a.terms_) {
        for (const Term& t : b.terms_) {
            if (!multiplyFactors(a.factors(s), b.factors(t), factors)) return std::nullopt;
            result.append(s.coefficient * t.coefficient, {factors.data(), factors.size()});
        }
    }
    // One term times an ordered polynomial is in order; rows of several are not.
    if (a.terms_.size() > 1 && b.terms_.size() > 1) {
        result.numOrdered_ = b.terms_.size();
        result.normalize();
    }
    return result;
}

std::optional<Polynomial> Polynomial::power(const Polynomial& base, std::uint64_t exponent) {
    if (exponent == 0) return Polynomial(Integer(1));
    if (base.terms_.size() > 1) { // one factor a step: a product of two large powers makes many like terms
        std::optional<Polynomial> result = base;
        for (std::uint64_t i = 1; result && i < exponent; ++i)
            result = product(*result, base);
        return result;
    }
    if (base.isZero()) return Polynomial();
    const Term& t = base.terms_[0];
    std::vector<Factor> factors(base.factors(t).begin(), base.factors(t).end());
    for (Factor& f : factors)
        if (__builtin_mul_overflow(f.exponent, exponent, &f.exponent) || f.exponent > limits::exponent)
            return std::nullopt;
    const std::size_t bits = t.coefficient.numBits();
    if (bits > 1 && exponent > limits::coefficientBits / bits) return std::nullopt;
    Integer coefficient(bits == 1 && exponent % 2 == 0 ? 1 : t.coefficient.sign());
    if (bits > 1) fmpz_pow_ui(coefficient.get(), t.coefficient.get(), exponent);
    return Polynomial(std::move(coefficient), factors);
}

bool Polynomial::isOlderThan(const Polynomial& younger) const {
    if (terms_.size() != 1 || younger.terms_.size() != 1 || isNegated_ || younger.isNegated_) return false;
    const auto own = factors(terms_[0]);
    const auto added = younger.factors(younger.terms_[0]);
    return own.empty() || added.empty() || own.back().atom < added.front().atom;
}

bool Polynomial::multiplyAtEnd(const Polynomial& younger) {
    Term& own = terms_[0];
    const Term& other = younger.terms_[0];
    if (own.coefficient.numBits() + other.coefficient.numBits() > limits::coefficientBits) return false;
    const auto added = younger.factors(other);
    own.coefficient *= other.coefficient;
    if (own.firstFactor + own.numFactors != factors_.size()) factors_.resize(own.firstFactor + own.numFactors);
    factors_.insert(factors_.end(), added.begin(), added.end());
    own.numFactors += other.numFactors;
    if (__builtin_add_overflow(own.degree, other.degree, &own.degree))
        own.degree = std::numeric_limits<std::uint64_t>::max();
    return true;
}

bool Polynomial::squareTerm() {
    if (terms_.size() != 1) return false;
    Term& own = terms_[0];
    const std::span<Factor> factors{factors_.data() + own.firstFactor, own.numFactors};
    const bool isShort = own.coefficient.numBits() <= limits::coefficientBits / 2;
    if (!isShort ||
        std::any_of(factors.begin(), factors.end(), [](const Factor& f) { return f.exponent > limits::exponent / 2; }))
        return false;
    if (!own.coefficient.isOne()) own.coefficient *= own.coefficient;
    for (Factor& f : factors)
        f.exponent *= 2;
    if (__builtin_add_overflow(own.degree, own.degree, &own.degree))
        own.degree = std::numeric_limits<std::uint64_t>::max();
    return true;
}

} // namespace QL
