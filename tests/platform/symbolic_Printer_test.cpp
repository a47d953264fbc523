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
        {-(-k), "-(-K)", "--K"},  // C has an operator --
        {-n(3), "-(3)", nullptr}, // -3 is the number
        {-d(2.5), "-(2.5)", nullptr},
        {-n(-3), "-(-3)", "--3"},
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
        {make(SymbolicOp::Power, k, n(-1)), "pow(K, -1)", "K^-1"},
        {make(SymbolicOp::Power, k, -l), "pow(K, -L)", "K^-L"},
        {make(SymbolicOp::Power, k, -n(2)), "pow(K, -(2))", "K^-(2)"},
        {make(SymbolicOp::Power, k, n(-1)) * l, "pow(K, -1)*L", "K^-1*L"},
        {make(SymbolicOp::Power, k, -(l * m)), "pow(K, -(L*M))", "K^-(L*M)"},
        {make(SymbolicOp::Power, make(SymbolicOp::Power, k, n(-1)), l), "pow(pow(K, -1), L)", "K^(-1)^L"},
        {make(SymbolicOp::Power, -make(SymbolicOp::Power, k, n(-1)), l), "pow(-pow(K, -1), L)", "(-K^-1)^L"},
        {make(SymbolicOp::Power, k, make(SymbolicOp::Power, l, n(-1))), "pow(K, pow(L, -1))", "K^(L^-1)"},
        {make(SymbolicOp::Power, k, -make(SymbolicOp::Power, l, m)), "pow(K, -pow(L, M))", "K^(-L^M)"},
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
        {-make(SymbolicOp::Not, k), "-!K", "-~K"},
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

} // namespace
