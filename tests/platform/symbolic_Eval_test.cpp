#include <cmath>
#include <limits>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "qlplatform/symbolic/SymbolicExprEval.h"
#include "tests/platform/symbolic_support.h"

namespace {

using namespace symbolic_test;
using testing::ElementsAre;
using testing::IsEmpty;

class SymbolicEval : public testing::Test {
  protected:
    QL::SymbolicExprTable table;
    E k = symbol(table, "K");
    E l = symbol(table, "L");
    E n(double value) { return number(table, value); }
    std::vector<double> eval(E e) { return QL::SymbolicExprEval(table).eval(e.id); }
    double value(E e) { return eval(e).at(0); }
};

TEST_F(SymbolicEval, EachOperator) {
    using enum SymbolicOp;
    const double inf = std::numeric_limits<double>::infinity();
    struct Row {
        SymbolicOp op;
        double a;
        double b; // not used by operators with one operand
        double expected;
    };
    const Row rows[] = {
        {UnaryMinus, 3, 0, -3},
        {Plus, 3, 4, 7},
        {Minus, 3, 4, -1},
        {Multiply, 3, 4, 12},
        {Divide, 3, 4, 0.75},
        {Divide, 1, 0, inf},
        {Modulo, 7, 3, 1},
        {Modulo, -7, 3, -1},
        {Modulo, 7, -3, 1},
        {Rem, -7, 3, -1},
        {Mod, -7, 3, 2},
        {Mod, 7, -3, -2},
        {Mod, 6, 3, 0},
        {Mod, 5, 0, 5},
        {Power, 2, 10, 1024},
        {Power, 2, -1, 0.5},
        {Equal, 3, 3, 1},
        {Equal, 3, 4, 0},
        {NotEqual, 3, 4, 1},
        {LessThan, 3, 4, 1},
        {LessThanOrEqual, 4, 4, 1},
        {GreaterThan, 3, 4, 0},
        {GreaterThanOrEqual, 4, 4, 1},
        {And, 2, 0, 0},
        {And, 2, 3, 1},
        {Or, 0, 0, 0},
        {Or, 0, 3, 1},
        {Not, 0, 0, 1},
        {Not, 5, 0, 0},
        {Min, 3, 4, 3},
        {Max, 3, 4, 4},
        {Abs, -3, 0, 3},
        {Floor, -2.5, 0, -3},
        {Ceil, -2.5, 0, -2},
        {Round, -2.5, 0, -3},
        {Round, 2.5, 0, 3},
        {Fix, -2.5, 0, -2},
    };
    for (const Row& row : rows) {
        const bool isUnary = row.op == UnaryMinus || row.op == Not || row.op == Abs || row.op == Floor ||
                             row.op == Ceil || row.op == Round || row.op == Fix;
        const E e = isUnary ? make(row.op, n(row.a)) : make(row.op, n(row.a), n(row.b));
        EXPECT_EQ(value(e), row.expected) << text(e);
    }
    EXPECT_TRUE(std::isnan(value(n(5) % n(0))));
    EXPECT_TRUE(std::isnan(value(n(0) / n(0))));
}

TEST_F(SymbolicEval, OneValueADimension) {
    table.registerValueId("K", table.addInt(4));
    EXPECT_THAT(eval(list(table, {k, k * n(2), n(7)})), ElementsAre(4, 8, 7));
    EXPECT_THAT(eval(list(table, {})), IsEmpty());
    EXPECT_THAT(eval(list(table, {k})), ElementsAre(4));
    EXPECT_THAT(eval(E{&table, table.addBool(true)}), ElementsAre(1));
    EXPECT_TRUE(std::isnan(value(list(table, {k, k}) + n(1)))); // a list inside an expression
}

TEST_F(SymbolicEval, BindingsAreFollowed) {
    EXPECT_TRUE(std::isnan(value(k)));
    EXPECT_TRUE(std::isnan(value(make(SymbolicOp::Min, n(1), k))));
    EXPECT_TRUE(std::isnan(value(make(SymbolicOp::Max, k, n(1)))));
    table.registerValueId("K", (l + n(1)).id);
    EXPECT_TRUE(std::isnan(value(k)));
    table.registerValueId("L", table.addInt(2));
    EXPECT_EQ(value(k * k), 9);
    table.registerValueId("L", k.id); // leads back to itself
    EXPECT_TRUE(std::isnan(value(k)));
    EXPECT_TRUE(std::isnan(value(l)));
}

TEST_F(SymbolicEval, SharedAndDeep) {
    table.registerValueId("K", table.addDouble(1.0));
    E power = k;
    for (int i = 0; i < 60; ++i)
        power = power * power;
    EXPECT_EQ(value(power), 1.0);
    E chain = k;
    for (int i = 0; i < 100'000; ++i)
        chain = n(1) - chain;
    EXPECT_EQ(value(chain), 1.0);
    E bound = k;
    for (int i = 0; i < 100'000; ++i) { // a chain of bindings
        const std::string name = "b" + std::to_string(i);
        table.registerValueId(name, bound.id);
        bound = symbol(table, name);
    }
    EXPECT_EQ(value(bound), 1.0);
}

} // namespace
