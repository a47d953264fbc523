#include "tests/platform/symbolic_support.h"

#include <cmath>

namespace symbolic_test {

Rational Rational::of(double value) {
    int exponent = 0;
    const double fraction = std::frexp(value, &exponent);
    Rational result(static_cast<long>(std::ldexp(fraction, 53)));
    exponent -= 53;
    if (exponent >= 0)
        fmpq_mul_2exp(result.value_, result.value_, static_cast<ulong>(exponent));
    else
        fmpq_div_2exp(result.value_, result.value_, static_cast<ulong>(-exponent));
    return result;
}

Rational Rational::floor() const {
    Rational result;
    fmpz_fdiv_q(fmpq_numref(result.value_), fmpq_numref(value_), fmpq_denref(value_));
    return result;
}

std::optional<long> Rational::toLong() const {
    if (!fmpz_is_one(fmpq_denref(value_)) || !fmpz_fits_si(fmpq_numref(value_))) return std::nullopt;
    return fmpz_get_si(fmpq_numref(value_));
}

std::string Rational::text() const {
    char* digits = fmpq_get_str(nullptr, 10, value_);
    std::string result = digits;
    flint_free(digits);
    return result;
}

namespace {

std::optional<Rational> power(const Rational& base, const Rational& exponent) {
    const auto times = exponent.toLong();
    if (!times || *times > 100000 || *times < -100000 || (*times < 0 && base.isZero())) return std::nullopt;
    Rational result(1);
    for (long i = 0; i < std::abs(*times); ++i)
        result = result * base;
    return *times < 0 ? Rational(1) / result : result;
}

std::optional<Rational> applied(SymbolicOp op, const Rational& a, const Rational& b) {
    switch (op) {
    case SymbolicOp::UnaryMinus:
        return -a;
    case SymbolicOp::Plus:
        return a + b;
    case SymbolicOp::Minus:
        return a - b;
    case SymbolicOp::Multiply:
        return a * b;
    case SymbolicOp::Divide:
        if (b.isZero()) return std::nullopt;
        return a / b;
    case SymbolicOp::Modulo:
    case SymbolicOp::Rem:
        if (b.isZero()) return std::nullopt;
        return a - b * (a / b).truncated();
    case SymbolicOp::Mod:
        if (b.isZero()) return a;
        return a - b * (a / b).floor();
    case SymbolicOp::Power:
        return power(a, b);
    case SymbolicOp::Min:
        return a < b ? a : b;
    case SymbolicOp::Max:
        return a < b ? b : a;
    case SymbolicOp::Abs:
        return a.sign() < 0 ? -a : a;
    case SymbolicOp::Floor:
        return a.floor();
    case SymbolicOp::Ceil:
        return -(-a).floor();
    case SymbolicOp::Round: {
        const Rational magnitude = a.sign() < 0 ? -a : a;
        const Rational rounded = (magnitude + Rational(1, 2)).floor();
        return a.sign() < 0 ? -rounded : rounded;
    }
    case SymbolicOp::Fix:
        return a.truncated();
    case SymbolicOp::Equal:
        return Rational(a == b);
    case SymbolicOp::NotEqual:
        return Rational(!(a == b));
    case SymbolicOp::LessThan:
        return Rational(a < b);
    case SymbolicOp::LessThanOrEqual:
        return Rational(!(b < a));
    case SymbolicOp::GreaterThan:
        return Rational(b < a);
    case SymbolicOp::GreaterThanOrEqual:
        return Rational(!(a < b));
    case SymbolicOp::And:
        return Rational(!a.isZero() && !b.isZero());
    case SymbolicOp::Or:
        return Rational(!a.isZero() || !b.isZero());
    case SymbolicOp::Not:
        return Rational(a.isZero());
    default:
        return std::nullopt;
    }
}

} // namespace

std::optional<Rational> exactValue(E e, const std::map<unsigned long, Rational>& bindings) {
    const QL::SymbolicExpr expr = e.table->get(e.id);
    switch (expr.getOp()) {
    case SymbolicOp::StringSymbol:
        return bindings.at(e.id);
    case SymbolicOp::IntValue:
        return Rational(expr.getIntValue());
    case SymbolicOp::DoubleValue:
        if (!std::isfinite(expr.getDoubleValue())) return std::nullopt;
        return Rational::of(expr.getDoubleValue());
    case SymbolicOp::BoolSymbol:
        return Rational(expr.getBoolValue());
    default:
        break;
    }
    const auto a = exactValue({e.table, expr.getOperand(0)}, bindings);
    const auto b = expr.getNumOperands() > 1 ? exactValue({e.table, expr.getOperand(1)}, bindings) : Rational();
    if (!a || !b) return std::nullopt;
    return applied(expr.getOp(), *a, *b);
}

E randomExpression(std::mt19937& random, const std::vector<E>& symbols, const RandomKind& kind) {
    const auto below = [&](std::size_t bound) { return static_cast<std::size_t>(random() % bound); };
    QL::SymbolicExprTable& table = *symbols[0].table;
    if (kind.maxDepth == 0 || below(8) == 0) {
        if (below(3) != 0) return symbols[below(symbols.size())];
        const long span = 2L * kind.maxNumber + 1;
        const int value = static_cast<int>(static_cast<long>(below(static_cast<std::size_t>(span))) - kind.maxNumber);
        return kind.withDoubles && below(3) == 0 ? number(table, value / 4.0) : number(table, value);
    }
    RandomKind inner = kind;
    --inner.maxDepth;
    const SymbolicOp op = kind.operators[below(kind.operators.size())];
    const E a = randomExpression(random, symbols, inner);
    switch (op) {
    case SymbolicOp::UnaryMinus:
    case SymbolicOp::Not:
    case SymbolicOp::Abs:
    case SymbolicOp::Floor:
    case SymbolicOp::Ceil:
    case SymbolicOp::Round:
    case SymbolicOp::Fix:
        return make(op, a);
    case SymbolicOp::Power:
        return make(op, a, number(table, static_cast<int>(below(6)) - 2));
    default:
        return make(op, a, randomExpression(random, symbols, inner));
    }
}

} // namespace symbolic_test
