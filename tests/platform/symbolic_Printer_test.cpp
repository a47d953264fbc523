#include <cmath>
#include <limits>

#include <gtest/gtest.h>

#include "tests/platform/symbolic_support.h"

namespace {

using namespace symbolic_test;

class SymbolicPrinter : public testing::Test {
  protected:
    QL::SymbolicExprTable table;
    E k = symbol(table, "K");
    E l = symbol(table, "L");
    E m = symbol(table, "M");
    E n(int value) { return number(table, value); }
    E d(double value) { return number(table, value); }
};

TEST_F(SymbolicPrinter, BothForms) {
    const double inf = std::numeric_limits<double>::infinity();
    struct Row {
        E expr;
        const char* c;
        const char* host; // null: the same
    };
    const Row rows[] = {
        {k, "K", nullptr},
        {n(-3), "-3", nullptr},
        {n(std::numeric_limits<int>::min()), "-2147483648", nullptr},
        {d(1.0), "1.0", "1"},
        {d(0.1), "0.1", nullptr},
        {d(1e22), "1e+22", nullptr},
        {d(-0.0), "0.0", "0"},
        {d(inf), "inf", "Inf"},
        {d(-inf), "-inf", "-Inf"},
        {d(std::nan("")), "nan", "NaN"},
        {E{&table, table.addBool(false)}, "false", nullptr},
        {(k * l + n(2) * k) / n(2) % m, "(K*L + 2*K)/2 % M", "rem((K*L + 2*K)/2, M)"},
        {k + l + m, "K + L + M", nullptr},
        {k + (l + m), "K + (L + M)", nullptr},
        {k - (l - m), "K - (L - M)", nullptr},
        {k - l - m, "K - L - M", nullptr},
        {k * (l * m), "K*(L*M)", nullptr},
        {k / l / m, "K/L/M", nullptr},
        {k / (l / m), "K/(L/M)", nullptr},
        {k / (l * m), "K/(L*M)", nullptr},
        {k * l / m, "K*L/M", nullptr},
        {(k + l) * m, "(K + L)*M", nullptr},
        {k % l % m, "K % L % M", "rem(rem(K, L), M)"},
        {k % (l % m), "K % (L % M)", "rem(K, rem(L, M))"},
        {k * (l % m), "K*(L % M)", "K*rem(L, M)"},
        {-k, "-K", nullptr},
        {-(-k), "-(-K)", nullptr},
        {-n(3), "-3", nullptr},
        {-n(-3), "-(-3)", nullptr},
        {-(k + l), "-(K + L)", nullptr},
        {-(k * l), "-(K*L)", nullptr},
        {-k * l, "-K*L", nullptr},
        {k - -l, "K - -L", nullptr},
        {k - n(-2), "K - -2", nullptr},
        {k * n(-2), "K*-2", nullptr},
        {make(SymbolicOp::Power, k, n(2)), "pow(K, 2)", "K^2"},
        {make(SymbolicOp::Power, k + l, n(2)), "pow(K + L, 2)", "(K + L)^2"},
        {make(SymbolicOp::Power, n(-2), k), "pow(-2, K)", "(-2)^K"},
        {make(SymbolicOp::Power, -k, n(2)), "pow(-K, 2)", "(-K)^2"},
        {-make(SymbolicOp::Power, k, n(2)), "-pow(K, 2)", "-K^2"},
        {make(SymbolicOp::Power, make(SymbolicOp::Power, k, l), m), "pow(pow(K, L), M)", "K^L^M"},
        {make(SymbolicOp::Power, k, make(SymbolicOp::Power, l, m)), "pow(K, pow(L, M))", "K^(L^M)"},
        {make(SymbolicOp::Power, k, n(-1)), "pow(K, -1)", "K^(-1)"},
        {make(SymbolicOp::Equal, k, l), "K == L", nullptr},
        {make(SymbolicOp::NotEqual, k, l), "K != L", "K ~= L"},
        {make(SymbolicOp::LessThanOrEqual, k + l, m), "K + L <= M", nullptr},
        {make(SymbolicOp::Equal, make(SymbolicOp::LessThan, k, l), m), "K < L == M", nullptr},
        {make(SymbolicOp::Equal, k, make(SymbolicOp::LessThan, l, m)), "K == L < M", "K == (L < M)"},
        {make(SymbolicOp::LessThan, make(SymbolicOp::Equal, k, l), m), "(K == L) < M", "K == L < M"},
        {make(SymbolicOp::Or, make(SymbolicOp::And, k, l), m), "K && L || M", nullptr},
        {make(SymbolicOp::And, make(SymbolicOp::Or, k, l), m), "(K || L) && M", nullptr},
        {make(SymbolicOp::Not, make(SymbolicOp::And, k, l)), "!(K && L)", "~(K && L)"},
        {make(SymbolicOp::Not, make(SymbolicOp::Not, k)), "!!K", "~~K"},
        {-make(SymbolicOp::Not, k), "-(!K)", "-(~K)"},
        {make(SymbolicOp::Min, k, make(SymbolicOp::Max, l, n(1))), "min(K, max(L, 1))", nullptr},
        {make(SymbolicOp::Abs, k - l), "abs(K - L)", nullptr},
        {make(SymbolicOp::Floor, k / l) * n(2), "floor(K/L)*2", nullptr},
        {make(SymbolicOp::Ceil, k), "ceil(K)", nullptr},
        {make(SymbolicOp::Round, k), "round(K)", nullptr},
        {make(SymbolicOp::Fix, k), "trunc(K)", "fix(K)"},
        {make(SymbolicOp::Mod, k, l), "mod(K, L)", nullptr},
        {make(SymbolicOp::Rem, k, l), "rem(K, L)", nullptr},
        {list(table, {k, l + n(1), n(3)}), "[K L + 1 3]", nullptr},
        {list(table, {k, -l}), "[K -L]", nullptr},
        {list(table, {}), "[]", nullptr},
        {list(table, {k}), "[K]", nullptr},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(text(row.expr), row.c);
        EXPECT_EQ(text(row.expr, true), row.host ? row.host : row.c);
    }
}

TEST_F(SymbolicPrinter, EachOptionByItself) {
    const E expr = list(table, {make(SymbolicOp::NotEqual, k, d(1.0)), make(SymbolicOp::Fix, k) % l,
                                make(SymbolicOp::Power, k, d(0.5))});
    const auto printed = [&](bool operators, bool numbers, bool functions) {
        return QL::SymbolicExprPrinter(table, QL::SymbolicExprPrinter::Predicate::instance(), operators, numbers,
                                       functions, {})(table.get(expr.id));
    };
    EXPECT_EQ(printed(false, false, false), "[K != 1.0 trunc(K) % L pow(K, 0.5)]");
    EXPECT_EQ(printed(true, false, false), "[K ~= 1.0 rem(trunc(K), L) K^0.5]");
    EXPECT_EQ(printed(false, true, false), "[K != 1 trunc(K) % L pow(K, 0.5)]");
    EXPECT_EQ(printed(false, false, true), "[K != 1.0 fix(K) % L pow(K, 0.5)]");
}

TEST_F(SymbolicPrinter, SymbolsPrintAsThePredicateSays) {
    table.registerValueId("K", l.id);
    table.registerValueId("L", n(3).id);
    const QL::SymbolicExprAliasPrinterPredicate alias(table);
    QL::SymbolicExprPrinter print(table, alias, false, true, false, {});
    EXPECT_EQ(print(table.get((k + m).id)), "L + M");
    table.registerValueId("L", m.id);
    EXPECT_EQ(print(table.get((k * l).id)), "M*M");
    EXPECT_EQ(print(table.get((k + m).id)), "L + M"); // printed before: from the cache
    table.registerValueId("M", k.id);                 // round in a circle: some symbol of it, and no hang
    EXPECT_FALSE(QL::SymbolicExprPrinter(table, alias, false, true, false, {})(table.get(k.id)).empty());
    EXPECT_EQ(QL::SymbolicExprPrinter(table, alias, false, false, false, {{k.id, "given"}})(table.get(k.id)), "given");
}

TEST_F(SymbolicPrinter, ATextThatWouldNotEndIsCut) {
    E power = k;
    for (int i = 0; i < 40; ++i)
        power = power * power;
    const std::string cut = text(power);
    EXPECT_EQ(cut.size(), QL::SymbolicExprPrinter::maxTextLength + 3);
    EXPECT_EQ(cut.substr(cut.size() - 3), "...");
    EXPECT_EQ(cut.substr(0, 4), "K*K*");
}

// A reader of C-like texts, just enough for the round trip.
class Reader {
  public:
    Reader(QL::SymbolicExprTable& table, std::string text) : table_(table), text_(std::move(text)) {}
    E read() {
        const E e = binary(0);
        EXPECT_EQ(at_, text_.size()) << text_;
        return e;
    }

  private:
    bool skip(const std::string& token) {
        if (text_.compare(at_, token.size(), token) != 0) return false;
        at_ += token.size();
        return true;
    }
    E binary(int level) {
        struct Row {
            const char* text;
            SymbolicOp op;
        };
        static const std::vector<std::vector<Row>> levels = {
            {{" || ", SymbolicOp::Or}},
            {{" && ", SymbolicOp::And}},
            {{" == ", SymbolicOp::Equal}, {" != ", SymbolicOp::NotEqual}},
            {{" <= ", SymbolicOp::LessThanOrEqual},
             {" >= ", SymbolicOp::GreaterThanOrEqual},
             {" < ", SymbolicOp::LessThan},
             {" > ", SymbolicOp::GreaterThan}},
            {{" + ", SymbolicOp::Plus}, {" - ", SymbolicOp::Minus}},
            {{"*", SymbolicOp::Multiply}, {"/", SymbolicOp::Divide}, {" % ", SymbolicOp::Modulo}}};
        if (level == static_cast<int>(levels.size())) return unary();
        E left = binary(level + 1);
        for (bool found = true; found;) {
            found = false;
            for (const Row& row : levels[static_cast<std::size_t>(level)]) {
                if (!skip(row.text)) continue;
                left = make(row.op, left, binary(level + 1));
                found = true;
                break;
            }
        }
        return left;
    }
    E unary() {
        if (at_ < text_.size() && text_[at_] == '-' && !std::isdigit(text_[at_ + 1])) {
            ++at_;
            return -unary();
        }
        if (skip("!")) return make(SymbolicOp::Not, unary());
        return primary();
    }
    E primary() {
        if (skip("(")) {
            const E inner = binary(0);
            EXPECT_TRUE(skip(")")) << text_;
            return inner;
        }
        std::size_t end = at_;
        if (std::isdigit(text_[at_]) || text_[at_] == '-') {
            end = text_.find_first_not_of("0123456789", at_ + 1);
            const std::string digits = text_.substr(at_, end - at_);
            at_ = std::min(end, text_.size());
            return number(table_, std::stoi(digits));
        }
        while (end < text_.size() && std::isalnum(text_[end]))
            ++end;
        const std::string name = text_.substr(at_, end - at_);
        at_ = end;
        static const std::map<std::string, SymbolicOp> functions = {
            {"min", SymbolicOp::Min},     {"max", SymbolicOp::Max},   {"abs", SymbolicOp::Abs},
            {"floor", SymbolicOp::Floor}, {"ceil", SymbolicOp::Ceil}, {"round", SymbolicOp::Round},
            {"trunc", SymbolicOp::Fix},   {"mod", SymbolicOp::Mod},   {"rem", SymbolicOp::Rem},
            {"pow", SymbolicOp::Power}};
        if (!skip("(")) return symbol(table_, name);
        const SymbolicOp op = functions.at(name);
        E e = binary(0);
        e = skip(", ") ? make(op, e, binary(0)) : make(op, e);
        EXPECT_TRUE(skip(")")) << text_;
        return e;
    }

    QL::SymbolicExprTable& table_;
    std::string text_;
    std::size_t at_ = 0;
};

// The negative of a number reads back as a negative number.
bool hasNegatedNumber(E e) {
    const QL::SymbolicExpr expr = e.table->get(e.id);
    for (std::size_t i = 0; i < expr.getNumOperands(); ++i) {
        const E operand{e.table, expr.getOperand(i)};
        if (hasNegatedNumber(operand)) return true;
        const bool isNumber = e.table->get(operand.id).getOp() == SymbolicOp::IntValue;
        if (expr.getOp() == SymbolicOp::UnaryMinus && isNumber) return true;
    }
    return false;
}

TEST_F(SymbolicPrinter, ATextReadsBackAsTheSameExpression) {
    RandomKind kind;
    for (int op = static_cast<int>(SymbolicOp::UnaryMinus); op < QL::numSymbolicOps; ++op)
        if (op != static_cast<int>(SymbolicOp::BoolSymbol) && op != static_cast<int>(SymbolicOp::ND))
            kind.operators.push_back(static_cast<SymbolicOp>(op));
    for (unsigned seed = 8'000'000; seed < 8'005'000; ++seed) {
        std::mt19937 random(seed);
        const E expr = randomExpression(random, {k, l, m}, kind);
        const std::string printed = text(expr);
        const E back = Reader(table, printed).read();
        if (!hasNegatedNumber(expr)) {
            ASSERT_EQ(back.id, expr.id) << "seed " << seed << ": " << printed;
        }
    }
}

} // namespace
