#include <limits>
#include <sstream>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "tests/support/Raises.h"

class QLBlock {};

namespace {

using namespace QLTypeSys;
using testing::ElementsAre;
using testing::IsEmpty;

class SymbolicDimsTableTest : public testing::Test {
  protected:
    int symbol(const char* name) { return SymbolicDimsString(table, name).getId(); }
    int number(long value) { return SymbolicDimsQLSizeValue(table, value).getId(); }
    int list(const std::vector<int>& ids) { return SymbolicDimsND(table, ids).getId(); }
    int raw(QL::SymbolicOp op, int left, int right) {
        return static_cast<int>(table.getExprTable().add(op, exprId(left), exprId(right))) - 1;
    }
    int doubleNumber(double value) { return static_cast<int>(table.getExprTable().addDouble(value)) - 1; }
    static unsigned long exprId(int id) { return static_cast<unsigned long>(id + 1); }
    std::string text(int id) { return table.getSymbolicDims(id).toString(); }

    SymbolicDimsTable table;
    const int inherit = -1;
    const int noSymbolic = 0;
    const int firstNew = static_cast<int>(table.getNumSymbolicDimss()) - 1;
    const int one = number(1);
    const int k = symbol("K");
    const int l = symbol("L");
};

TEST_F(SymbolicDimsTableTest, ANewTable) {
    SymbolicDimsTable fresh;
    EXPECT_EQ(fresh.getNumSymbolicDimss(), 6u); // two symbols, two truth values, two values of one
    const char* texts[] = {"INHERIT", "NOSYMBOLIC", "false", "true", "1", "1.0"};
    for (std::size_t i = 0; i < fresh.getNumSymbolicDimss(); ++i)
        EXPECT_EQ(fresh.getSymbolicDimsAt(i).toString(), texts[i]);
    EXPECT_EQ(fresh.getSymbolicDimsAt(0).getId(), -1);
    EXPECT_EQ(fresh.registerSymbolicDims(1), 3);
    EXPECT_EQ(fresh.getNumSymbolicDimss(), 6u);
}

TEST_F(SymbolicDimsTableTest, ValidIds) {
    struct Row {
        int id;
        bool isValid;
        bool isDimension;
    };
    const int last = static_cast<int>(table.getNumSymbolicDimss()) - 2;
    const Row rows[] = {
        {-2, false, false},
        {-1, true, false},
        {0, true, false},
        {1, true, true},
        {one, true, true},
        {last, true, true},
        {last + 1, false, false},
        {std::numeric_limits<int>::max(), false, false},
        {std::numeric_limits<int>::min(), false, false},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.id);
        EXPECT_EQ(table.isSymbolicDimsIdValid(row.id), row.isValid);
        EXPECT_EQ(table.isaSymbolicDimension(row.id), row.isDimension);
        if (row.isValid) {
            EXPECT_TRUE(table.checkSymbolicDimsId(row.id));
        } else {
            EXPECT_RAISES(table.checkSymbolicDimsId(row.id), "QuillaneTypes:general:InvalidDataTypeId", row.id);
        }
    }
}

TEST_F(SymbolicDimsTableTest, RegisteringANumberAddsItOnce) {
    const std::size_t before = table.getNumSymbolicDimss();
    const int five = table.registerSymbolicDims(5);
    EXPECT_EQ(table.registerSymbolicDims(5), five);
    EXPECT_EQ(table.getNumSymbolicDimss(), before + 1);
    EXPECT_EQ(table.getValueOf(table.registerSymbolicDims(-5)), std::make_pair(true, -5)); // no range check
}

TEST_F(SymbolicDimsTableTest, ConvertingExpressionIds) {
    EXPECT_EQ(table.convertExprId2SymbDimsId(exprId(k)), k);
    EXPECT_EQ(table.convertExprId2SymbDimsId(0), -1);
    EXPECT_EQ(table.convertExprId2SymbDimsId(QL::SymbolicExprTable::noExpr), 0);
    EXPECT_EQ(table.convertExprId2SymbDimsId(table.getNumSymbolicDimss()), 0);
}

TEST_F(SymbolicDimsTableTest, EvalUnderRegisteredValues) {
    EXPECT_EQ(table.registerValue("K", 4), exprId(k));
    EXPECT_EQ(table.registerValue("L", 2.5), exprId(l));
    EXPECT_EQ(table.registerValue("fresh", 1), exprId(symbol("fresh")));
    EXPECT_THAT(table.eval(k), ElementsAre(4.0));
    EXPECT_THAT(table.eval(list({k, l, one})), ElementsAre(4.0, 2.5, 1.0));
    EXPECT_THAT(table.eval(raw(QL::SymbolicOp::Multiply, k, l)), ElementsAre(10.0));
    EXPECT_TRUE(std::isnan(table.eval(symbol("unbound"))[0]));
    EXPECT_THAT(table.getNumericDims(list({k, l})), ElementsAre(4u, 2u));
    table.registerValue("K", 5); // the last value counts
    EXPECT_THAT(table.eval(k), ElementsAre(5.0));
}

TEST_F(SymbolicDimsTableTest, NumericDimsOfWhatIsNoDimension) {
    constexpr unsigned long largest = std::numeric_limits<unsigned long>::max();
    const int zero = number(0);
    EXPECT_THAT(table.getNumericDims(symbol("unbound")), ElementsAre(0u));
    EXPECT_THAT(table.getNumericDims(number(-3)), ElementsAre(0u));
    EXPECT_THAT(table.getNumericDims(raw(QL::SymbolicOp::Divide, one, zero)), ElementsAre(largest));
    EXPECT_THAT(table.getNumericDims(doubleNumber(0.75)), ElementsAre(0u));
    EXPECT_THAT(table.getNumericDims(doubleNumber(1e300)), ElementsAre(largest));
    EXPECT_THAT(table.getNumericDims(doubleNumber(4294967296.75)), ElementsAre(4294967296u));
}

TEST_F(SymbolicDimsTableTest, IsOneKnowsTheTwoValuesOnly) {
    EXPECT_TRUE(table.isOne(one));
    EXPECT_TRUE(table.isOne(doubleNumber(1.0)));
    EXPECT_NE(one, doubleNumber(1.0));
    EXPECT_FALSE(table.isOne(number(2)));
    EXPECT_FALSE(table.isOne(inherit));
    EXPECT_FALSE(table.isOne(k));
    table.registerValue("K", 1);
    EXPECT_FALSE(table.isOne(k));
    EXPECT_TRUE(table.resolvesToOne(k));
}

TEST_F(SymbolicDimsTableTest, ResolvesToOne) {
    table.registerValue("K", 1);
    table.registerValue("L", 1.0000000001);
    EXPECT_TRUE(table.resolvesToOne(one));
    EXPECT_TRUE(table.resolvesToOne(list({k, one, k})));
    EXPECT_FALSE(table.resolvesToOne(l)); // exactly
    EXPECT_FALSE(table.resolvesToOne(list({k, l})));
    EXPECT_FALSE(table.resolvesToOne(symbol("unbound")));
    EXPECT_TRUE(table.resolvesToOne(list({}))); // nothing to be other than one
}

TEST_F(SymbolicDimsTableTest, IsVector) {
    EXPECT_TRUE(table.isVector(k));
    EXPECT_TRUE(table.isVector(list({k})));
    EXPECT_TRUE(table.isVector(list({one, k})));
    EXPECT_TRUE(table.isVector(list({k, doubleNumber(1.0)})));
    EXPECT_FALSE(table.isVector(list({k, l})));
    EXPECT_FALSE(table.isVector(list({one, one, k})));
    table.registerValue("L", 1);
    EXPECT_FALSE(table.isVector(list({k, l}))); // bound to one is not one
}

TEST_F(SymbolicDimsTableTest, WidthIsTheProductStepByStep) {
    EXPECT_EQ(table.getWidthSymbolicDimsId(k), k);
    const int unsimplified = raw(QL::SymbolicOp::Plus, number(1), number(2));
    EXPECT_EQ(table.getWidthSymbolicDimsId(unsimplified), unsimplified); // one dimension: as it is
    EXPECT_EQ(table.getWidthSymbolicDimsId(list({unsimplified})), unsimplified);
    EXPECT_EQ(text(table.getWidthSymbolicDimsId(list({k, number(2), l, number(3)}))), "6*K*L");
    EXPECT_EQ(text(table.getWidthSymbolicDimsId(list({k, raw(QL::SymbolicOp::Plus, l, one)}))), "K*L + K");
    // Doubles are multiplied in order, as by the operator.
    EXPECT_EQ(text(table.getWidthSymbolicDimsId(list({doubleNumber(0.1), number(10), number(3)}))), "3.0");
}

TEST_F(SymbolicDimsTableTest, WidthOfAnyShapeIsThatOfTheOperator) {
    const int pool[] = {k,
                        l,
                        one,
                        number(2),
                        number(-3),
                        number(0),
                        symbol("M"),
                        number(2147483647),
                        raw(QL::SymbolicOp::Plus, k, l),
                        doubleNumber(0.5),
                        raw(QL::SymbolicOp::Divide, k, number(2))};
    unsigned state = 12345; // a fixed sequence
    for (int round = 0; round < 300; ++round) {
        std::vector<int> ids;
        for (unsigned i = 0; i < 1 + state % 5; ++i) {
            state = state * 1664525 + 1013904223;
            ids.push_back(pool[(state >> 16) % std::size(pool)]);
        }
        state = state * 1664525 + 1013904223;
        SymbolicDims product = table.getSymbolicDims(ids[0]);
        for (std::size_t i = 1; i < ids.size(); ++i)
            product = product * table.getSymbolicDims(ids[i]);
        EXPECT_EQ(table.getWidthSymbolicDimsId(list(ids)), product.getId()) << text(list(ids));
    }
}

TEST_F(SymbolicDimsTableTest, WidthOfAThousandDimensions) {
    std::vector<int> ids;
    for (int i = 0; i < 1000; ++i)
        ids.push_back(symbol(("d" + std::to_string(i * 7919 % 1000)).c_str()));
    SymbolicDims product = table.getSymbolicDims(ids[0]);
    for (std::size_t i = 1; i < ids.size(); ++i)
        product = product * table.getSymbolicDims(ids[i]);
    EXPECT_EQ(table.getWidthSymbolicDimsId(list(ids)), product.getId());
}

TEST_F(SymbolicDimsTableTest, ValueOfAnIntegerOnly) {
    const int product = raw(QL::SymbolicOp::Multiply, number(2), number(3));
    EXPECT_EQ(table.getValueOf(number(7)), std::make_pair(true, 7));
    EXPECT_EQ(table.getValueOf(product), std::make_pair(false, 0)); // no simplification
    EXPECT_EQ(table.getValueOf((table.getSymbolicDims(number(2)) * table.getSymbolicDims(number(3))).getId()),
              std::make_pair(true, 6));
    EXPECT_EQ(table.getValueOf(k), std::make_pair(false, 0));
    EXPECT_EQ(table.getValueOf(doubleNumber(1.0)), std::make_pair(false, 0));
    EXPECT_TRUE(table.isNumericalDimension(product));
    EXPECT_TRUE(table.isNumericalDimension(number(7)));
    EXPECT_FALSE(table.isNumericalDimension(k));
    EXPECT_FALSE(table.isNumericalDimension(doubleNumber(1.0)));
    EXPECT_FALSE(table.isNumericalDimension(inherit));
}

TEST_F(SymbolicDimsTableTest, SymbolsOfADimension) {
    std::vector<std::string> names = {"old"};
    const int expr =
        raw(QL::SymbolicOp::Plus, raw(QL::SymbolicOp::Multiply, l, k), raw(QL::SymbolicOp::Modulo, l, one));
    table.getSymbolicDimsSymbols(expr, names);
    EXPECT_THAT(names, ElementsAre("L", "K"));
    table.getSymbolicDimsSymbols(list({k, number(3), symbol("Z"), k}), names);
    EXPECT_THAT(names, ElementsAre("K", "Z"));
    for (const int id : {inherit, noSymbolic, -2, static_cast<int>(table.getNumSymbolicDimss())}) {
        names = {"old"};
        table.getSymbolicDimsSymbols(id, names);
        EXPECT_THAT(names, IsEmpty());
    }
}

TEST_F(SymbolicDimsTableTest, TextsOfTheDimensions) {
    std::vector<std::string> texts = {"old"};
    table.getSymbolicDimensions(list({k, raw(QL::SymbolicOp::Plus, k, one), number(3)}), texts);
    EXPECT_THAT(texts, ElementsAre("K", "K + 1", "3"));
    table.getSymbolicDimensions(k, texts);
    EXPECT_THAT(texts, ElementsAre("K"));
    table.getSymbolicDimensions(noSymbolic, texts);
    EXPECT_THAT(texts, IsEmpty());
}

TEST_F(SymbolicDimsTableTest, TrailingOnes) {
    const int fourDims = list({one, one, k, one});
    EXPECT_EQ(text(table.removeTrailingOnes(fourDims, 1)), "[1 1 K]");
    EXPECT_EQ(table.removeTrailingOnes(fourDims, 4), fourDims);
    EXPECT_EQ(table.removeTrailingOnes(fourDims, 9), fourDims);
    const int ones = list({one, one});
    EXPECT_EQ(table.removeTrailingOnes(ones, 1), one);
    EXPECT_EQ(table.removeTrailingOnes(ones, 2), ones);
    EXPECT_EQ(table.removeTrailingOnes(list({k, one, doubleNumber(1.0)}), 1), k);
    EXPECT_EQ(table.removeTrailingOnes(list({k, l}), 1), list({k, l}));
    EXPECT_EQ(table.removeTrailingOnes(k, 1), k);
    EXPECT_EQ(table.removeTrailingOnes(list({one}), 0), list({one})); // one dimension stays
    EXPECT_EQ(table.removeTrailingOnes(list({k, one}), 0), k);
#ifndef NDEBUG
    EXPECT_DEATH(table.removeTrailingOnes(ones, 0), ""); // no dimension would be left
#endif
}

TEST_F(SymbolicDimsTableTest, LeadingOnes) {
    EXPECT_EQ(text(table.removeLeadingOnes(list({one, one, k, one}))), "[K 1]");
    EXPECT_EQ(table.removeLeadingOnes(list({one, one})), one);
    EXPECT_EQ(table.removeLeadingOnes(list({doubleNumber(1.0), one})), doubleNumber(1.0)); // the first one
    EXPECT_EQ(table.removeLeadingOnes(list({one, k})), k);
    EXPECT_EQ(table.removeLeadingOnes(list({k, one})), list({k, one}));
    EXPECT_EQ(table.removeLeadingOnes(list({one})), list({one}));
    EXPECT_EQ(table.removeLeadingOnes(k), k);
}

TEST_F(SymbolicDimsTableTest, Collapse) {
    EXPECT_EQ(table.collapseDimensions(list({k, l}), 1), list({k, one}));
    EXPECT_EQ(table.collapseDimensions(list({k, l, k}), 0), list({one, l, k}));
    EXPECT_EQ(table.collapseDimensions(k, 0), one);
    EXPECT_EQ(table.collapseDimensions(list({k}), 7), one); // whatever the index
}

TEST_F(SymbolicDimsTableTest, AListOfNoDimensionsCountsAsOne) {
    const int none = list({});
    EXPECT_EQ(table.getSymbolicDims(none).getNumDimensions(), 1u);
    EXPECT_EQ(table.getSymbolicDims(none).getDimensionId(0), none);
    EXPECT_EQ(table.removeTrailingOnes(none, 1), none);
    EXPECT_EQ(table.removeLeadingOnes(none), none);
    EXPECT_EQ(table.collapseDimensions(none, 0), one);
    EXPECT_EQ(table.amendSymbolicDims(none, {4, 1}), list({one, one}));
    EXPECT_EQ(table.getWidthSymbolicDimsId(none), none);
    std::vector<std::string> texts;
    table.getSymbolicDimensions(none, texts);
    EXPECT_EQ(texts, std::vector<std::string>{"[]"});
    table.addEqualRelation(none, k, nullptr);
    EXPECT_TRUE(table.hasEqualRelation(none, k));
}

TEST_F(SymbolicDimsTableTest, Amend) {
    table.registerValue("K", 4);
    table.registerValue("L", 5);
    const int both = list({k, l});
    struct Row {
        const char* what;
        int id;
        std::vector<int> numeric;
        std::string result;
    };
    const Row rows[] = {
        {"a one in front", k, {1, 4}, "[1 K]"},
        {"a one behind", k, {4, 1}, "[K 1]"},
        {"nothing to add", k, {4}, "K"},
        {"no shape", k, {}, "K"},
        {"an entry that fits nothing is dropped", k, {3, 4}, "[K]"},
        {"past the end each entry is a one", k, {4, 7, 8}, "[K 1 1]"},
        {"two dimensions", both, {4, 1, 5}, "[K 1 L]"},
        {"ones all round", both, {1, 4, 5, 1}, "[1 K L 1]"},
        {"as many entries", both, {4, 1}, "[K L]"},
        {"the second part never comes", both, {4, 1, 6}, "[K 1]"},
        {"a number", number(4), {1, 4}, "[1 4]"},
        {"NOSYMBOLIC", noSymbolic, {1, 4}, "NOSYMBOLIC"},
        {"INHERIT", inherit, {1, 4}, "INHERIT"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(text(table.amendSymbolicDims(row.id, row.numeric)), row.result);
    }
    EXPECT_EQ(table.amendSymbolicDims(-7, {1, 2}), -7);
    table.registerValue("L", 1);
    EXPECT_EQ(text(table.amendSymbolicDims(l, {1, 1})), "[L 1]"); // a part that is one comes first
}

TEST_F(SymbolicDimsTableTest, DisplayStringsAreKept) {
    const char* shown = table.getDisplayString(k);
    EXPECT_STREQ(shown, "K");
    EXPECT_STREQ(table.getDisplayString(inherit), "INHERIT");
    EXPECT_STREQ(table.getDisplayString(raw(QL::SymbolicOp::Modulo, k, l)), "K % L");
    EXPECT_STREQ(table.getDisplayString(k), "K");
    table.resetToBuiltin();
    EXPECT_STREQ(table.getDisplayString(SymbolicDimsString(table, "other").getId()), "other");
}

TEST_F(SymbolicDimsTableTest, TextsOfTheHostLanguage) {
    EXPECT_EQ(table.getTorvexExpr(raw(QL::SymbolicOp::Modulo, k, l)), "rem(K, L)");
    EXPECT_EQ(table.getTorvexExpr(raw(QL::SymbolicOp::Modulo, k, l)), "rem(K, L)"); // from the cache
    EXPECT_EQ(table.getTorvexExpr(doubleNumber(1.0)), "1");
    EXPECT_EQ(table.getTorvexExpr(raw(QL::SymbolicOp::NotEqual, k, l)), "K ~= L");
    EXPECT_EQ(table.getTorvexExpr(list({k, raw(QL::SymbolicOp::Power, k, number(2))})), "[K K^2]");
    EXPECT_EQ(table.getTorvexExpr(noSymbolic), "NOSYMBOLIC");
}

TEST_F(SymbolicDimsTableTest, Print) {
    SymbolicDimsTable fresh;
    std::ostringstream out;
    fresh.print(out);
    EXPECT_EQ(out.str(), "SymbolicDimsTable\n"
                         "Number of SymbolicDimss : 6\n"
                         "\n"
                         "SymbolicDims : 'INHERIT'\n"
                         "SymbolicDims : 'NOSYMBOLIC'\n"
                         "SymbolicDims : 'false'\n"
                         "SymbolicDims : 'true'\n"
                         "SymbolicDims : '1'\n"
                         "SymbolicDims : '1.0'\n"
                         "\n");
}

TEST_F(SymbolicDimsTableTest, HeaderFiles) {
    table.registerHeaderFile(k, "k.h");
    table.registerHeaderFile(k, "later.h"); // the first one stays
    table.registerHeaderFile(l, "");
    table.registerHeaderFile(-2, "never.h");
    table.registerHeaderFile(inherit, "inherit.h");
    const int sum = raw(QL::SymbolicOp::Plus, k, l);
    table.registerHeaderFile(sum, "sum.h");
    std::set<std::string> files = {"mine.h"};
    table.getHeaderFiles(sum, files);
    EXPECT_THAT(files, ElementsAre("k.h", "mine.h")); // gathered; that of an expression does not count
    table.getHeaderFiles(-2, files);
    table.getHeaderFiles(number(3), files);
    EXPECT_EQ(files.size(), 2u);
    table.getHeaderFiles(inherit, files);
    EXPECT_THAT(files, ElementsAre("inherit.h", "k.h", "mine.h"));
}

TEST_F(SymbolicDimsTableTest, OperatorsInUse) {
    const int half = raw(QL::SymbolicOp::Divide, k, number(2));
    raw(QL::SymbolicOp::Modulo, l, number(3));
    raw(QL::SymbolicOp::Divide, half, l);
    std::vector<SymbolicDimsCGConstraint> list(1);
    table.getDivisionConstraints(list);
    ASSERT_EQ(list.size(), 3u); // not cleared
    EXPECT_EQ(list[1].first, k);
    EXPECT_EQ(list[1].second, number(2));
    EXPECT_EQ(list[2].first, half);
    EXPECT_EQ(list[2].second, l);
    EXPECT_THAT(list[2].blocks, IsEmpty());
    list.clear();
    table.getModuloConstraints(list);
    ASSERT_EQ(list.size(), 1u);
    EXPECT_EQ(list[0].first, l);
    EXPECT_EQ(list[0].second, number(3));
}

// A table that overrides its hooks and notes what it is asked.
class WatchedTable : public SymbolicDimsTable {
  public:
    using SymbolicDimsTable::registerSymbolicDims;
    DimsRegistration registerSymbolicDims(const char* text, const QLBlock* block) override {
        asked.push_back(text);
        blocks.push_back(block);
        return text == refused ? DimsRegistration{-2, diagnostic} : DimsRegistration{0, nullptr};
    }
    bool isLossOfSymbolicDimsDiagEnabled() const override {
        ++numLossQuestions;
        return lossEnabled;
    }
    using SymbolicDimsTable::symbolsRegistered;

    std::vector<std::string> asked;
    std::vector<const QLBlock*> blocks;
    std::string refused;
    qlsvDiagnosticImpl* diagnostic = nullptr;
    bool lossEnabled = true;
    mutable int numLossQuestions = 0;
};

TEST_F(SymbolicDimsTableTest, ImportingADimension) {
    WatchedTable target;
    const QLBlock block;
    const int expr = raw(QL::SymbolicOp::Plus, raw(QL::SymbolicOp::Rem, l, k), number(0));
    EXPECT_FALSE(target.symbolsRegistered());
    const auto [id, diagnostic] = target.importSymbolicDims(table, expr, &block);
    EXPECT_EQ(diagnostic, nullptr);
    EXPECT_EQ(target.getSymbolicDims(id).toString(), "L % K + 0"); // in the form of C, not simplified
    EXPECT_THAT(target.asked, ElementsAre("L", "K"));
    EXPECT_THAT(target.blocks, ElementsAre(&block, &block));
    EXPECT_TRUE(target.symbolsRegistered());
}

TEST_F(SymbolicDimsTableTest, ImportingWhatIsNoDimension) {
    WatchedTable target;
    for (const int id : {inherit, noSymbolic, -2, 1000000}) {
        const auto [imported, diagnostic] = target.importSymbolicDims(table, id, nullptr);
        EXPECT_EQ(imported, id);
        EXPECT_EQ(diagnostic, nullptr);
    }
    EXPECT_FALSE(target.symbolsRegistered());
    EXPECT_THAT(target.asked, IsEmpty());
}

TEST_F(SymbolicDimsTableTest, ImportingStopsAtARefusedSymbol) {
    WatchedTable target;
    target.refused = "L";
    target.diagnostic = qlsvCreateDiagnosticFromMessageID(resource_core::BaseMsgID("own", "refused", 0));
    const int shape = list({k, l, symbol("M")});
    const auto registration = target.importSymbolicDims(table, shape, nullptr);
    EXPECT_EQ(registration.first, -2);
    EXPECT_EQ(registration.second, target.diagnostic);
    EXPECT_THAT(target.asked, ElementsAre("K", "L"));
    qlsvDiscardDiagnostic(target.diagnostic);
}

TEST_F(SymbolicDimsTableTest, WhetherLossIsReportedIsAskedOnce) {
    WatchedTable watched;
    watched.lossEnabled = false;
    EXPECT_FALSE(watched.lossOfSymbolicDimsDiagEnabled());
    watched.lossEnabled = true;
    EXPECT_FALSE(watched.lossOfSymbolicDimsDiagEnabled());
    EXPECT_EQ(watched.numLossQuestions, 1);
    watched.resetToBuiltin();
    EXPECT_TRUE(watched.lossOfSymbolicDimsDiagEnabled());
    EXPECT_EQ(watched.numLossQuestions, 2);
}

TEST_F(SymbolicDimsTableTest, ConvertingCountsAsRegistering) {
    WatchedTable watched;
    watched.convertExprId2SymbDimsId(QL::SymbolicExprTable::noExpr);
    EXPECT_FALSE(watched.symbolsRegistered());
    watched.convertExprId2SymbDimsId(1);
    EXPECT_TRUE(watched.symbolsRegistered());
    watched.resetToBuiltin();
    EXPECT_FALSE(watched.symbolsRegistered());
}

TEST_F(SymbolicDimsTableTest, AResetTableIsAsNew) {
    table.registerHeaderFile(k, "k.h");
    table.registerValue("K", 4);
    table.getTorvexExpr(k);
    table.resetToBuiltin();
    EXPECT_EQ(table.getNumSymbolicDimss(), 6u);
    EXPECT_FALSE(table.isSymbolicDimsIdValid(k));
    EXPECT_EQ(SymbolicDimsString(table, "L").getId(), k); // the number is used again for another expression
    EXPECT_EQ(table.getTorvexExpr(k), "L");
    EXPECT_TRUE(std::isnan(table.eval(SymbolicDimsString(table, "K").getId())[0]));
    std::set<std::string> files;
    table.getHeaderFiles(k, files);
    EXPECT_THAT(files, IsEmpty());
    EXPECT_TRUE(table.isOne(table.registerSymbolicDims(1)));
}

TEST_F(SymbolicDimsTableTest, HooksOfTheBase) {
    const QLBlock block;
    EXPECT_EQ(table.getOriginalBlock(&block), &block);
    EXPECT_EQ(table.CreateSymbolicDimsTable(nullptr), nullptr);
    const SymbolicDimsTable::DimsRegistration nothing{0, nullptr};
    EXPECT_EQ(table.registerSymbolicDims("K", &block), nothing);
    EXPECT_EQ(table.registerSymbolicDimsExpr("K", &block), nothing);
    qlsvDiagnosticImpl* diagnostic = nullptr;
    table.reportLossOfSymbolicDimensions(diagnostic, k);
    EXPECT_EQ(diagnostic, nullptr);
    EXPECT_TRUE(table.isLossOfSymbolicDimsDiagEnabled());
    table.registerReferencedSymbolInParamTable(k, &block);
    table.addSymbolDataTypeInformation("K", 3);
    std::vector<std::string> names;
    table.getSymbolsFromExpressionId(exprId(raw(QL::SymbolicOp::Plus, l, k)), names);
    EXPECT_THAT(names, ElementsAre("L", "K"));
}

} // namespace
