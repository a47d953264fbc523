// The expression table, and what walks over expressions: symbols, copies, translation, factoring of divisions,
// registry.
#include <cmath>
#include <limits>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "qlplatform/symbolic/SymbolRegistry.h"
#include "qlplatform/symbolic/SymbolicExprCopy.h"
#include "qlplatform/symbolic/SymbolicExprFactorDivision.h"
#include "qlplatform/symbolic/SymbolicExprSymbols.h"
#include "qlplatform/symbolic/SymbolicExprTranslate.h"
#include "tests/platform/symbolic_support.h"

namespace {

using namespace symbolic_test;
using testing::ElementsAre;

class SymbolicTable : public testing::Test {
  protected:
    QL::SymbolicExprTable table;
    E k = symbol(table, "K");
    E l = symbol(table, "L");
    E m = symbol(table, "M");
    E n(int value) { return number(table, value); }
    unsigned long factored(E e) { return QL::SymbolicExprFactorDivision(table).factorDivision(e.id); }
};

TEST_F(SymbolicTable, IdsAreDenseInOrderOfCreation) {
    QL::SymbolicExprTable fresh(QL::SymbolDomain::Integers);
    EXPECT_EQ(fresh.getDomain(), QL::SymbolDomain::Integers);
    EXPECT_EQ(table.getDomain(), QL::SymbolDomain::Numbers);
    EXPECT_EQ(fresh.getNumExprs(), 0u);
    EXPECT_EQ(fresh.addSymbol("a"), 0u);
    EXPECT_EQ(fresh.addInt(7), 1u);
    EXPECT_EQ(fresh.add(SymbolicOp::Plus, 0, 1), 2u);
    EXPECT_EQ(fresh.add(SymbolicOp::Plus, 1, 0), 3u);
    EXPECT_EQ(fresh.add(SymbolicOp::Plus, 0, 1), 2u);
    EXPECT_EQ(fresh.addSymbol("a"), 0u);
    fresh.addBoolSymbols();
    EXPECT_EQ(fresh.getNumExprs(), 6u);
    EXPECT_FALSE(fresh.get(4).getBoolValue());
    EXPECT_TRUE(fresh.get(5).getBoolValue());
    EXPECT_EQ(fresh.addBool(true), 5u);
}

TEST_F(SymbolicTable, ValuesThatAreAlikeAreToldApart) {
    EXPECT_NE(table.addInt(1), table.addDouble(1.0));
    EXPECT_NE(table.addInt(1), table.addBool(true));
    EXPECT_NE(table.addSymbol("1"), table.addInt(1));
    EXPECT_NE(table.addInt(-1), table.addDouble(-1.0));
    EXPECT_EQ(table.addDouble(0.0), table.addDouble(-0.0));
    EXPECT_EQ(table.addDouble(std::nan("1")), table.addDouble(-std::nan("2")));
    EXPECT_NE(table.addDouble(1.0), table.addDouble(std::nextafter(1.0, 2.0)));
    EXPECT_EQ(table.addSymbol(""), table.addSymbol(""));
    EXPECT_NE(table.addSymbol(""), table.addSymbol(std::string("\0", 1)));
    EXPECT_NE((k + l).id, (k - l).id);
    EXPECT_NE(list(table, {k, l}).id, list(table, {k, l, m}).id);
    EXPECT_NE(list(table, {}).id, list(table, {k}).id);
    EXPECT_EQ(list(table, {k, l, m}).id, list(table, {k, l, m}).id);
}

TEST_F(SymbolicTable, OperatorsHaveTheirValues) {
    EXPECT_EQ(static_cast<int>(SymbolicOp::StringSymbol), 0);
    EXPECT_EQ(static_cast<int>(SymbolicOp::Divide), 7);
    EXPECT_EQ(static_cast<int>(SymbolicOp::Modulo), 8);
    EXPECT_EQ(static_cast<int>(SymbolicOp::Rem), QL::numSymbolicOps - 1);
}

TEST_F(SymbolicTable, AnExpressionIsReadBack) {
    const QL::SymbolicExpr sum = table.get((k + n(-3)).id);
    EXPECT_EQ(sum.getOp(), SymbolicOp::Plus);
    EXPECT_FALSE(sum.isTerminal());
    EXPECT_EQ(sum.getNumOperands(), 2u);
    EXPECT_EQ(sum.getLeft(), k.id);
    EXPECT_EQ(table.get(sum.getRight()).getIntValue(), -3);
    EXPECT_EQ(sum.getNumDimensions(), 0u);
    EXPECT_EQ(table.get(k.id).getName(), "K");
    EXPECT_TRUE(table.get(k.id).isTerminal());
    EXPECT_EQ(table.get(table.addDouble(-2.5)).getDoubleValue(), -2.5);
    const QL::SymbolicExpr dims = table.get(list(table, {k, l, m, k}).id);
    EXPECT_EQ(dims.getNumDimensions(), 4u);
    EXPECT_EQ(dims.getDimension(2), m.id);
    EXPECT_EQ(table.get(list(table, {l}).id).getNumDimensions(), 1u);
    EXPECT_EQ(table.get(list(table, {}).id).getNumDimensions(), 0u);
}

TEST_F(SymbolicTable, NodesAreMadeByTheirClasses) {
    const QL::SymbolicString a(table, "a");
    const QL::SymbolicIntValue two(table, 2);
    EXPECT_EQ(QL::SymbolicPlusExpr(table, a, two).getId(table),
              table.add(SymbolicOp::Plus, a.getId(table), two.getId(table)));
    EXPECT_EQ(QL::SymbolicMultiplyExpr(table, a.getId(table), two.getId(table)).getId(table),
              QL::SymbolicMultiplyExpr(table, a, two).getId(table));
    EXPECT_EQ(QL::SymbolicUnaryMinusExpr(table, a).getOp(), SymbolicOp::UnaryMinus);
    EXPECT_EQ(QL::SymbolicNDExpr(table, {k.id, l.id}).getNumDimensions(), 2u);
    EXPECT_EQ(QL::SymbolicGreaterThanExpr(table, a, two).getOp(), SymbolicOp::GreaterThan);
    EXPECT_EQ(QL::SymbolicLessThanExpr(table, a, two).getOp(), SymbolicOp::LessThan);
    EXPECT_EQ(QL::SymbolicEqualExpr(table, a, two).getOp(), SymbolicOp::Equal);
    EXPECT_EQ(QL::SymbolicDoubleValue(table, 2.0).getDoubleValue(), 2.0);
    EXPECT_TRUE(QL::SymbolicBoolSymbol(table, true).getBoolValue());
}

TEST_F(SymbolicTable, Bindings) {
    EXPECT_TRUE(QL::SymbolicExprTable::isUnsetValue(table.getValueId(k.id)));
    EXPECT_EQ(table.registerValueId("K", n(3).id), k.id);
    EXPECT_EQ(table.getValueId(k.id), n(3).id);
    EXPECT_EQ(table.registerValueId("K", l.id), k.id);
    EXPECT_EQ(table.getValueId(k.id), l.id);
    EXPECT_EQ(table.registerValueId("new", k.id), table.addSymbol("new"));
}

TEST_F(SymbolicTable, Lookup) {
    std::vector<unsigned long> ids = {99};
    table.lookup(SymbolicOp::Divide, ids);
    EXPECT_TRUE(ids.empty());
    const E first = k / l;
    const E second = first / m;
    table.lookup(SymbolicOp::Divide, ids);
    EXPECT_THAT(ids, ElementsAre(first.id, second.id));
    table.lookup(SymbolicOp::StringSymbol, ids);
    EXPECT_THAT(ids, ElementsAre(k.id, l.id, m.id));
}

TEST_F(SymbolicTable, ANodeTakesLittleRoom) {
    QL::SymbolicExprTable large;
    std::vector<E> symbols;
    for (int i = 0; i < 600; ++i)
        symbols.push_back(symbol(large, "s" + std::to_string(i)));
    for (std::size_t count = 0; count < 360'000; ++count) { // doubling vectors are fullest and emptiest on the way
        symbols[count / 600] + symbols[count % 600];
        if (count > 1000 && (count & (count - 1)) <= 1) {
            EXPECT_LE(large.sizeInMemory(), 64 * large.getNumExprs()) << count;
        }
    }
    EXPECT_LE(large.sizeInMemory(), 64 * large.getNumExprs());
    simplified(symbols[0] + symbols[1] * symbols[2]); // the walks' marks count, too
    std::vector<std::string> names;
    QL::SymbolicExprSymbols(large).getSymbols(symbols[3].id, names);
    EXPECT_LE(large.sizeInMemory(), 64 * large.getNumExprs());
}

TEST_F(SymbolicTable, SymbolsInTheOrderOfTheText) {
    const E expr = make(SymbolicOp::Min, (m + k) * m, list(table, {l, k, number(table, 3)}));
    std::vector<std::string> names = {"kept"};
    QL::SymbolicExprSymbols(table).getSymbols(expr.id, names);
    EXPECT_THAT(names, ElementsAre("kept", "M", "K", "L"));
    std::vector<unsigned long> ids;
    QL::SymbolicExprSymbols(table).getSymbols(expr.id, ids);
    EXPECT_THAT(ids, ElementsAre(m.id, k.id, l.id));
    ids.clear();
    QL::SymbolicExprSymbols(table).getSymbols(n(4).id, ids);
    EXPECT_TRUE(ids.empty());
}

TEST_F(SymbolicTable, ACopyReadsTheSame) {
    QL::SymbolicExprTable other;
    other.addSymbol("L"); // other ids there
    const E shapes[] = {k,
                        n(-7),
                        number(table, 0.1),
                        E{&table, table.addBool(true)},
                        (k * l + n(2) * k) / n(2) % m,
                        list(table, {}),
                        list(table, {k, l, k + l, n(1)}),
                        make(SymbolicOp::Not, make(SymbolicOp::LessThan, k, l))};
    for (const E& shape : shapes) {
        const E copy{&other, QL::SymbolicExprCopy(table, other).copy(shape.id)};
        EXPECT_EQ(text(copy), text(shape));
        EXPECT_EQ(QL::SymbolicExprCopy(table, other).copy(shape.id), copy.id);
    }
    table.registerValueId("K", n(3).id);
    const unsigned long copied = QL::SymbolicExprCopy(table, other).copy(k.id);
    EXPECT_TRUE(QL::SymbolicExprTable::isUnsetValue(other.getValueId(copied))); // bindings stay behind
}

TEST_F(SymbolicTable, TheTwoFormsDifferInTheRemainder) {
    const E c = (k % l + n(1)) % m;
    const E t = make(SymbolicOp::Rem, make(SymbolicOp::Rem, k, l) + n(1), m);
    EXPECT_EQ(QL::SymbolicExprC2T(table)(c.id), t.id);
    EXPECT_EQ(QL::SymbolicExprT2C(table)(t.id), c.id);
    EXPECT_EQ(QL::SymbolicExprT2C(table)(c.id), c.id);
    const E both = make(SymbolicOp::Mod, k, l) * make(SymbolicOp::Fix, k / m);
    EXPECT_EQ(QL::SymbolicExprC2T(table)(both.id), both.id);
    EXPECT_EQ(QL::SymbolicExprT2C(table)(both.id), both.id);
    EXPECT_EQ(QL::SymbolicExprC2T(table)(list(table, {}).id), list(table, {}).id);
}

TEST_F(SymbolicTable, DivisionsComeToTheTop) {
    struct Row {
        E expr;
        const char* text;
    };
    const Row rows[] = {
        {k, "K"},
        {k + n(0), "K + 0"}, // nothing is simplified
        {k / n(2), "K/2"},
        {k / n(2) + l, "(K + L*2)/2"},
        {l + k / n(2), "(L*2 + K)/2"},
        {k / n(2) - l / n(2), "(K - L)/2"},
        {k / n(2) + l / n(3), "(K*3 + L*2)/(2*3)"},
        {k / n(2) * (l / n(3)), "K*L/(2*3)"},
        {k / (l / m), "K*M/L"},
        {k / l / m, "K/(L*M)"},
        {-(k / l), "-K/L"},
        {n(1) / (n(1) / k + n(1) / l), "1*(K*L)/(1*L + 1*K)"},
        {make(SymbolicOp::Power, k / l, n(3)), "pow(K, 3)/pow(L, 3)"},
        {make(SymbolicOp::Power, k / l, n(-3)), "pow(K/L, -3)"},
        {make(SymbolicOp::Floor, k / l) + m / n(2), "(floor(K/L)*2 + M)/2"},
        {k / l % m, "K/L % M"},
        {k / n(0) + l, "(K + L*0)/0"},
    };
    for (const Row& row : rows)
        EXPECT_EQ(text({&table, factored(row.expr)}), row.text);
}

TEST_F(SymbolicTable, FactoringKeepsTheValue) {
    const RandomKind kind{{SymbolicOp::UnaryMinus, SymbolicOp::Plus, SymbolicOp::Minus, SymbolicOp::Multiply,
                           SymbolicOp::Divide, SymbolicOp::Power, SymbolicOp::Floor}};
    for (unsigned seed = 7'000'000; seed < 7'003'000; ++seed) {
        std::mt19937 random(seed);
        const E raw = randomExpression(random, {k, l, m}, kind);
        const E whole{&table, factored(raw)};
        std::map<unsigned long, Rational> bindings;
        for (const E& s : {k, l, m})
            bindings[s.id] = Rational(static_cast<long>(random() % 13) - 6);
        const auto expected = exactValue(raw, bindings);
        if (expected) {
            ASSERT_EQ(exactValue(whole, bindings), expected) << "seed " << seed << ": " << text(raw);
            ASSERT_EQ(simplified(whole).id, simplified(raw).id) << "seed " << seed << ": " << text(raw);
        }
    }
}

TEST_F(SymbolicTable, ARegistryOwnsATable) {
    class Validating : public QL::SymbolRegistry {
      public:
        Validating() : SymbolRegistry(QL::SymbolDomain::Integers) {}
        using SymbolRegistry::dropExprTable;
        using SymbolRegistry::makeExprTable;
        using SymbolRegistry::swapExprTable;
    } registry;
    EXPECT_EQ(registry.getExprTable().getDomain(), QL::SymbolDomain::Integers);
    EXPECT_FALSE(registry.convertExprId2ValidSymbolicId(0).has_value());
    const unsigned long a = registry.getExprTable().addSymbol("a");
    EXPECT_EQ(registry.convertExprId2ValidSymbolicId(a), a);
    EXPECT_FALSE(registry.convertExprId2ValidSymbolicId(a + 1).has_value());
    EXPECT_FALSE(registry.convertExprId2ValidSymbolicId(QL::SymbolicExprTable::noExpr).has_value());
    std::vector<std::string> names;
    registry.getSymbolsFromExpressionId(a, names);
    EXPECT_THAT(names, ElementsAre("a"));
    const QL::SymbolRegistry::Registration nothing{QL::SymbolicExprTable::noExpr, nullptr};
    std::vector<double> values;
    EXPECT_EQ(registry.registerSymbolicTExpr(std::u16string(u"a"), nullptr, nullptr, nullptr, values), nothing);
    auto other = std::make_unique<QL::SymbolicExprTable>();
    registry.swapExprTable(other);
    EXPECT_EQ(registry.getExprTable().getNumExprs(), 0u);
    EXPECT_EQ(other->get(a).getName(), "a");
    registry.dropExprTable();
    EXPECT_FALSE(registry.hasExprTable());
    EXPECT_FALSE(registry.convertExprId2ValidSymbolicId(0).has_value());
    registry.makeExprTable();
    EXPECT_EQ(registry.getExprTable().getNumExprs(), 0u);
}

} // namespace
