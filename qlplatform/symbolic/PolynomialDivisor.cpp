// The greatest common divisor of two polynomials: by coefficients and single factors first, by FLINT for the rest.
#include <algorithm>

#include <flint/fmpz_mpoly.h>

#include "qlplatform/symbolic/Polynomial_internal.h"

namespace QL {
namespace {

// A polynomial in FLINT's form, over a fixed list of atoms. Its order of terms is ours.
class FlintPolynomial {
  public:
    FlintPolynomial(const fmpz_mpoly_ctx_struct* context, const std::vector<NodeId>& atoms)
        : context_(context), atoms_(atoms) {
        fmpz_mpoly_init(value_, context_);
    }
    ~FlintPolynomial() { fmpz_mpoly_clear(value_, context_); }
    FlintPolynomial(const FlintPolynomial&) = delete;
    FlintPolynomial& operator=(const FlintPolynomial&) = delete;

    fmpz_mpoly_struct* get() { return value_; }

    void set(const Polynomial& polynomial) {
        std::vector<ulong> exponents(atoms_.size());
        for (const Polynomial::Term& t : polynomial.terms()) {
            std::fill(exponents.begin(), exponents.end(), 0);
            for (const Factor& f : polynomial.factors(t))
                exponents[static_cast<std::size_t>(std::lower_bound(atoms_.begin(), atoms_.end(), f.atom) -
                                                   atoms_.begin())] = f.exponent;
            fmpz_mpoly_push_term_fmpz_ui(value_, t.coefficient.get(), exponents.data(), context_);
        }
    }

    Polynomial polynomial() const {
        Polynomial result;
        std::vector<ulong> exponents(atoms_.size());
        std::vector<Factor> factors;
        for (slong i = 0; i < fmpz_mpoly_length(value_, context_); ++i) {
            fmpz_mpoly_get_term_exp_ui(exponents.data(), value_, i, context_);
            factors.clear();
            for (std::size_t k = 0; k < atoms_.size(); ++k)
                if (exponents[k] != 0) factors.push_back({atoms_[k], exponents[k]});
            Integer coefficient;
            fmpz_mpoly_get_term_coeff_fmpz(coefficient.get(), value_, i, context_);
            result.append(std::move(coefficient), factors);
        }
        return result;
    }

  private:
    const fmpz_mpoly_ctx_struct* context_;
    const std::vector<NodeId>& atoms_;
    fmpz_mpoly_t value_;
};

class FlintContext {
  public:
    explicit FlintContext(std::size_t numAtoms) {
        fmpz_mpoly_ctx_init(value_, static_cast<slong>(numAtoms), ORD_DEGLEX);
    }
    ~FlintContext() { fmpz_mpoly_ctx_clear(value_); }
    FlintContext(const FlintContext&) = delete;
    FlintContext& operator=(const FlintContext&) = delete;
    const fmpz_mpoly_ctx_struct* get() const { return value_; }

  private:
    fmpz_mpoly_ctx_t value_;
};

// The atoms of a polynomial, ascending; nothing when there are too many or a degree is too high.
std::optional<std::vector<NodeId>> atomsWithinLimits(const Polynomial& p) {
    std::vector<NodeId> atoms;
    for (const Polynomial::Term& t : p.terms()) {
        for (const Factor& f : p.factors(t)) {
            if (f.exponent > limits::gcdExponent) return std::nullopt;
            atoms.push_back(f.atom);
        }
    }
    std::sort(atoms.begin(), atoms.end());
    atoms.erase(std::unique(atoms.begin(), atoms.end()), atoms.end());
    if (atoms.size() > limits::gcdAtoms) return std::nullopt;
    return atoms;
}

Polynomial removeByFlint(Polynomial& a, Polynomial& b, const std::vector<NodeId>& atoms) {
    const FlintContext context(atoms.size());
    FlintPolynomial inA(context.get(), atoms);
    FlintPolynomial inB(context.get(), atoms);
    FlintPolynomial divisor(context.get(), atoms);
    FlintPolynomial restA(context.get(), atoms);
    FlintPolynomial restB(context.get(), atoms);
    inA.set(a);
    inB.set(b);
    const bool found =
        fmpz_mpoly_gcd_cofactors(divisor.get(), restA.get(), restB.get(), inA.get(), inB.get(), context.get()) != 0;
    if (!found || fmpz_mpoly_is_one(divisor.get(), context.get())) return Polynomial(Integer(1));
    a = restA.polynomial();
    b = restB.polynomial();
    return divisor.polynomial();
}

} // namespace

std::vector<Factor> Polynomial::commonFactors() const {
    std::vector<Factor> common(factors(terms_[0]).begin(), factors(terms_[0]).end());
    for (const Term& t : terms_) {
        const auto own = factors(t);
        auto kept = common.begin();
        auto at = own.begin();
        for (const Factor& f : common) {
            while (at != own.end() && at->atom < f.atom)
                ++at;
            if (at != own.end() && at->atom == f.atom) *kept++ = {f.atom, std::min(f.exponent, at->exponent)};
        }
        common.erase(kept, common.end());
        if (common.empty()) break;
    }
    return common;
}

// Every term has the factors of `divisor`.
void Polynomial::divideFactors(std::span<const Factor> divisor) {
    if (divisor.empty()) return;
    Polynomial result;
    std::vector<Factor> left;
    for (Term& t : terms_) {
        left.clear();
        auto taken = divisor.begin();
        for (const Factor& f : factors(t)) {
            const std::uint64_t gone = taken != divisor.end() && taken->atom == f.atom ? (taken++)->exponent : 0;
            if (f.exponent > gone) left.push_back({f.atom, f.exponent - gone});
        }
        result.append(std::move(t.coefficient), left);
    }
    *this = std::move(result);
}

Polynomial Polynomial::removeCommonDivisor(Polynomial& a, Polynomial& b) {
    if (a == b) {
        Polynomial divisor = a;
        if (a.leadingSign() < 0) divisor.negate();
        divisor.normalize();
        a = b = Polynomial(Integer(a.leadingSign()));
        return divisor;
    }
    const Integer content = Integer::gcd(a.content(), b.content());
    a.divideExactly(content);
    b.divideExactly(content);

    std::vector<Factor> single;
    const std::vector<Factor> inA = a.commonFactors();
    const std::vector<Factor> inB = b.commonFactors();
    for (std::size_t i = 0, k = 0; i < inA.size() && k < inB.size();) {
        if (inA[i].atom == inB[k].atom) single.push_back({inA[i].atom, std::min(inA[i].exponent, inB[k].exponent)});
        const bool advanceA = inA[i].atom <= inB[k].atom;
        const bool advanceB = inB[k].atom <= inA[i].atom;
        i += advanceA;
        k += advanceB;
    }
    a.divideFactors(single);
    b.divideFactors(single);
    Polynomial divisor(content, single);

    // A divisor of several terms is left to look for only where both have several, over atoms of both.
    if (a.terms_.size() < 2 || b.terms_.size() < 2 || a.terms_.size() > limits::gcdTerms ||
        b.terms_.size() > limits::gcdTerms)
        return divisor;
    const auto atomsA = atomsWithinLimits(a);
    const auto atomsB = atomsWithinLimits(b);
    if (!atomsA || !atomsB) return divisor;
    std::vector<NodeId> atoms;
    std::set_intersection(atomsA->begin(), atomsA->end(), atomsB->begin(), atomsB->end(), std::back_inserter(atoms));
    if (atoms.empty()) return divisor;
    atoms.clear();
    std::set_union(atomsA->begin(), atomsA->end(), atomsB->begin(), atomsB->end(), std::back_inserter(atoms));
    Polynomial found = removeByFlint(a, b, atoms);
    if (found.isOne()) return divisor;
    return *fullProduct(divisor, found); // it divides what was given, so no exponent is beyond its limit
}

} // namespace QL
