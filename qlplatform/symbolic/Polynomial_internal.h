// Sparse polynomials with integer coefficients over atoms, which are nodes of an expression table.
//
// Terms stand in one order: higher degree first, and within a degree lexicographically, older atoms first. So two equal
// polynomials are the same list. Sums gather terms and put them in order when they are next read.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <utility>
#include <vector>

#include <boost/container/small_vector.hpp>

#include "qlplatform/symbolic/Integer_internal.h"
#include "qlplatform/symbolic/NodeStore_internal.h"

namespace QL {

/// Bounds beyond which a product is not expanded and a divisor is not looked for.
namespace limits {
/// Words (terms, factors and limbs of coefficients) of a product of sums before like terms meet.
inline constexpr std::size_t productWords = 1u << 14;
inline constexpr std::size_t coefficientBits = 1u << 16;
/// The largest exponent: every exponent is a double value exactly.
inline constexpr std::uint64_t exponent = std::uint64_t{1} << 53;
/// Of each of two polynomials whose greatest common divisor is asked for.
inline constexpr std::size_t gcdTerms = 1000;
inline constexpr std::uint64_t gcdExponent = 1000;
inline constexpr std::size_t gcdAtoms = 24;
} // namespace limits

/// A power of an atom.
struct Factor {
    NodeId atom;
    std::uint64_t exponent; // from 1 to limits::exponent
    friend bool operator==(const Factor&, const Factor&) = default;
};

class Polynomial {
  public:
    struct Term {
        Integer coefficient; // not 0
        std::uint32_t firstFactor;
        std::uint32_t numFactors; // atoms ascend
        std::uint64_t degree;     // stays at its largest value instead of overflowing
    };

    /// The polynomial 0.
    Polynomial() = default;
    Polynomial(const Polynomial&) = default;
    Polynomial(Polynomial&&) noexcept = default;
    Polynomial& operator=(const Polynomial&) = default;
    // Made anew: assigning short vectors by move may allocate, and ends the program when that fails.
    Polynomial& operator=(Polynomial&& other) noexcept {
        if (this == &other) return *this;
        std::destroy_at(this);
        return *std::construct_at(this, std::move(other));
    }
    /// A number.
    explicit Polynomial(Integer constant);
    /// An atom.
    explicit Polynomial(NodeId atom);
    /// One term; the coefficient is not 0 and atoms ascend.
    Polynomial(Integer coefficient, std::span<const Factor> factors);

    // What follows reads the terms in order: normalize() comes first.
    std::span<const Term> terms() const { return {terms_.data(), terms_.size()}; }
    std::span<const Factor> factors(const Term& t) const { return {factors_.data() + t.firstFactor, t.numFactors}; }
    bool isZero() const { return terms_.empty(); }
    bool isConstant() const { return terms_.empty() || (terms_.size() == 1 && terms_[0].numFactors == 0); }
    bool isOne() const { return isConstant() && !isZero() && terms_[0].coefficient.isOne(); }
    /// The value of a polynomial that isConstant().
    Integer constant() const { return isZero() ? Integer(0) : terms_[0].coefficient; }
    /// The sign of the first term; 0 for the polynomial 0.
    int leadingSign() const { return isZero() ? 0 : terms_[0].coefficient.sign(); }
    /// Bits of the largest coefficient.
    std::size_t maxBits() const;
    /// The greatest common divisor of the coefficients, 0 or above.
    Integer content() const;
    friend bool operator==(const Polynomial& a, const Polynomial& b);

    /// Number of terms gathered: an upper bound of the number of terms until normalize().
    std::size_t numGathered() const { return terms_.size(); }

    /// Changes the sign. Takes no time: the terms follow at the next normalize().
    void negate() { isNegated_ = !isNegated_; }
    /// Adds `other`, or subtracts it. Amortised logarithmic in the number of terms for each term of `other`.
    void add(const Polynomial& other, bool negated);
    /// Adds a term; its coefficient is not 0 and atoms ascend.
    void add(Integer coefficient, std::span<const Factor> factors);
    /// Puts the terms in order and unites like terms.
    void normalize();

    /// Appends a term that is the last in order; for building.
    void append(Integer coefficient, std::span<const Factor> factors);
    /// Divides every coefficient by a number that divides it.
    void divideExactly(const Integer& divisor);

    /// The product, or nothing when it is beyond the limits. Both are in order.
    static std::optional<Polynomial> product(const Polynomial& a, const Polynomial& b);
    /// The power, or nothing when it is beyond the limits.
    static std::optional<Polynomial> power(const Polynomial& base, std::uint64_t exponent);
    /// Whether both are single terms in order and every atom of this one is older than every atom of `younger`.
    bool isOlderThan(const Polynomial& younger) const;
    /// Multiplies by a term that this one isOlderThan, in time for that term alone. False, with nothing done, when the
    /// product is beyond the limits.
    bool multiplyAtEnd(const Polynomial& younger);

    /// Squares a single term in place. False, with nothing done, for any other polynomial in order and when the square
    /// is beyond the limits.
    bool squareTerm();

    /// Divides both by their greatest common divisor and returns it, with a positive leading sign. Beyond the limits
    /// the divisor is common but need not be the greatest. None is 0.
    static Polynomial removeCommonDivisor(Polynomial& a, Polynomial& b);

    /// Below 0 when the first stands before the second.
    static int compareMonomials(std::uint64_t degreeA, std::span<const Factor> a, std::uint64_t degreeB,
                                std::span<const Factor> b);
    static std::uint64_t degreeOf(std::span<const Factor> factors);

  private:
    void pushBack(Integer coefficient, std::span<const Factor> factors, std::uint64_t degree);
    void gather(Integer coefficient, std::span<const Factor> added, std::uint64_t degree);
    void normalizeWhatWaits();
    bool isOrdered() const { return numOrdered_ == terms_.size() && !isNegated_; }
    bool precedes(const Term& a, const Term& b) const;
    void compactFactors();
    std::size_t numWords() const;
    bool isProductWithinLimits(const Polynomial& other) const;
    // The product whatever its size; nothing when an exponent is beyond its limit.
    static std::optional<Polynomial> fullProduct(const Polynomial& a, const Polynomial& b);

    // The factors that all terms have in common.
    std::vector<Factor> commonFactors() const;
    void divideFactors(std::span<const Factor> divisor);

    boost::container::small_vector<Term, 2> terms_;
    boost::container::small_vector<Factor, 3> factors_;
    std::size_t numOrdered_ = 0; // the terms in front that are in order and unlike each other
    bool isNegated_ = false;     // the sign of every coefficient is yet to be changed
};

} // namespace QL
