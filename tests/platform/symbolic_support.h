// What the tests of the expression engine share: terse construction, exact evaluation, random expressions.
#pragma once

#include <map>
#include <optional>
#include <random>
#include <string>
#include <vector>

#include <flint/fmpq.h>

#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprPrinter.h"
#include "qlplatform/symbolic/SymbolicExprSimplify.h"

namespace symbolic_test {

using QL::SymbolicOp;

/// An expression of a table, with the operators of C++.
struct E {
    QL::SymbolicExprTable* table;
    unsigned long id;
    friend bool operator==(const E& a, const E& b) { return a.id == b.id; }
};

inline E make(SymbolicOp op, E a) { return {a.table, a.table->add(op, a.id)}; }
inline E make(SymbolicOp op, E a, E b) { return {a.table, a.table->add(op, a.id, b.id)}; }
inline E symbol(QL::SymbolicExprTable& t, const std::string& name) { return {&t, t.addSymbol(name)}; }
inline E number(QL::SymbolicExprTable& t, int value) { return {&t, t.addInt(value)}; }
inline E number(QL::SymbolicExprTable& t, double value) { return {&t, t.addDouble(value)}; }
inline E list(QL::SymbolicExprTable& t, const std::vector<E>& parts) {
    std::vector<unsigned long> ids;
    for (const E& e : parts)
        ids.push_back(e.id);
    return {&t, t.add(SymbolicOp::ND, ids)};
}

// clang-format off
inline E operator+(E a, E b) { return make(SymbolicOp::Plus, a, b); }
inline E operator-(E a, E b) { return make(SymbolicOp::Minus, a, b); }
inline E operator*(E a, E b) { return make(SymbolicOp::Multiply, a, b); }
inline E operator/(E a, E b) { return make(SymbolicOp::Divide, a, b); }
inline E operator%(E a, E b) { return make(SymbolicOp::Modulo, a, b); }
inline E operator-(E a)      { return make(SymbolicOp::UnaryMinus, a); }
// clang-format on

inline E simplified(E e) {
    unsigned long scratch = 0;
    return {e.table, QL::SymbolicExprSimplify(*e.table, 10, false).simplify(e.id, scratch)};
}

inline std::string text(E e, bool host = false) {
    QL::SymbolicExprPrinter print(*e.table, QL::SymbolicExprPrinter::Predicate::instance(), host, host, host, {});
    return print(e.table->get(e.id));
}

/// A rational number.
class Rational {
  public:
    Rational(long above = 0, unsigned long below = 1) { // NOLINT: numbers are rationals
        fmpq_init(value_);
        fmpq_set_si(value_, above, below);
    }
    Rational(const Rational& other) : Rational() { fmpq_set(value_, other.value_); }
    Rational& operator=(const Rational& other) {
        fmpq_set(value_, other.value_);
        return *this;
    }
    ~Rational() { fmpq_clear(value_); }
    static Rational of(double value);

    bool isZero() const { return fmpq_is_zero(value_) != 0; }
    int sign() const { return fmpq_sgn(value_); }
    Rational floor() const;
    Rational truncated() const { return sign() < 0 ? -(-*this).floor() : floor(); }
    /// The number as a machine integer, when it is a small one.
    std::optional<long> toLong() const;
    std::string text() const;

    friend Rational operator+(const Rational& a, const Rational& b) { return made(fmpq_add, a, b); }
    friend Rational operator-(const Rational& a, const Rational& b) { return made(fmpq_sub, a, b); }
    friend Rational operator*(const Rational& a, const Rational& b) { return made(fmpq_mul, a, b); }
    friend Rational operator/(const Rational& a, const Rational& b) { return made(fmpq_div, a, b); }
    Rational operator-() const { return Rational() - *this; }
    friend bool operator==(const Rational& a, const Rational& b) { return fmpq_equal(a.value_, b.value_) != 0; }
    friend bool operator<(const Rational& a, const Rational& b) { return fmpq_cmp(a.value_, b.value_) < 0; }

  private:
    static Rational made(void (*operation)(fmpq*, const fmpq*, const fmpq*), const Rational& a, const Rational& b) {
        Rational result;
        operation(result.value_, a.value_, b.value_);
        return result;
    }
    fmpq_t value_;
};

/// The exact value of an expression; nothing where it is undefined: a divisor of 0, a power of 0 below 0.
std::optional<Rational> exactValue(E e, const std::map<unsigned long, Rational>& bindings);

/// The kinds of random expressions.
struct RandomKind {
    std::vector<SymbolicOp> operators;
    int maxDepth = 5;
    int maxNumber = 6;
    bool withDoubles = false; // multiples of 1/4
};

/// A random expression over the symbols.
E randomExpression(std::mt19937& random, const std::vector<E>& symbols, const RandomKind& kind);

/// The depth-first text of an expression with every operator spelled out; for failures.
inline std::string show(E e) { return text(e); }

} // namespace symbolic_test
