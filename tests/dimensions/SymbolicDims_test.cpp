#include <limits>
#include <sstream>

#include <gtest/gtest.h>

#include "qlplatform/services/QlFeature.h"
#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprPrinter.h"
#include "qltypes/dimensions/NumericDims.h"
#include "qltypes/dimensions/SymbDimsRange.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

namespace {

using namespace QLTypeSys;

class SymbolicDimsTest : public testing::Test {
  protected:
    SymbolicDims symbol(const char* name) { return SymbolicDimsString(table, name); }
    SymbolicDims number(long value) { return SymbolicDimsQLSizeValue(table, value); }
    SymbolicDims list(const std::vector<int>& ids) { return SymbolicDimsND(table, ids); }

    SymbolicDimsTable table;
    SymbolicDims k = symbol("K");
    SymbolicDims l = symbol("L");
    SymbolicDims m = symbol("M");
};

TEST_F(SymbolicDimsTest, TheSameExpressionIsTheSameId) {
    EXPECT_EQ(symbol("K").getId(), k.getId());
    EXPECT_EQ(SymbolicDimsString(&table, "K").getId(), k.getId());
    EXPECT_EQ(SymbolicDimsQLSizeValue(&table, 3).getId(), number(3).getId());
    EXPECT_EQ(SymbolicDimsND(&table, {k.getId(), l.getId()}).getId(), list({k.getId(), l.getId()}).getId());
    const std::size_t count = table.getNumSymbolicDimss();
    EXPECT_EQ((k + l).getId(), (k + l).getId());
    EXPECT_EQ(table.getNumSymbolicDimss(), count + 1);
    EXPECT_NE(k.getId(), l.getId());
}

TEST_F(SymbolicDimsTest, ThePredefinedIdsAreOrdinarySymbols) {
    EXPECT_EQ(symbol("INHERIT").getId(), -1);
    EXPECT_EQ(symbol("NOSYMBOLIC").getId(), 0);
    for (const int id : {-1, 0}) {
        SCOPED_TRACE(id);
        const SymbolicDims dims = table.getSymbolicDims(id);
        EXPECT_EQ(dims.toString(), id == -1 ? "INHERIT" : "NOSYMBOLIC");
        EXPECT_EQ(dims.getExprWithEmptyInherit(), "");
        EXPECT_EQ(dims.getNumDimensions(), 1u);
        EXPECT_TRUE(dims.isTerminal());
    }
    EXPECT_EQ(k.getExprWithEmptyInherit(), "K");
}

TEST_F(SymbolicDimsTest, ANumberKeepsItsLow32Bits) {
    EXPECT_EQ(number((1L << 32) + 5).getId(), number(5).getId());
    EXPECT_EQ(number(std::numeric_limits<int>::max() + 1L).getId(), number(std::numeric_limits<int>::min()).getId());
}

TEST_F(SymbolicDimsTest, DimensionsOfWhatIsNoList) {
    for (const SymbolicDims& dims : {k, number(3), table.getSymbolicDims(-1), table.getSymbolicDims(0), k + l}) {
        SCOPED_TRACE(dims.toString());
        EXPECT_EQ(dims.getNumDimensions(), 1u);
        EXPECT_EQ(dims.getDimensionId(0), dims.getId());
        EXPECT_EQ(dims.getDimensionId(5), dims.getId());
        EXPECT_EQ(dims.getDimension(5).getId(), dims.getId());
        EXPECT_EQ(dims.getDimension(5).getTable(), &table);
    }
    EXPECT_TRUE(k.isTerminal());
    EXPECT_TRUE(number(3).isTerminal());
    EXPECT_FALSE((k + l).isTerminal());
}

TEST_F(SymbolicDimsTest, DimensionsOfAList) {
    const SymbolicDims dims = list({k.getId(), number(3).getId(), k.getId()});
    EXPECT_EQ(dims.getNumDimensions(), 3u);
    EXPECT_EQ(dims.getDimensionId(0), k.getId());
    EXPECT_EQ(dims.getDimensionId(1), number(3).getId());
    EXPECT_EQ(dims.getDimension(2).getId(), k.getId());
    EXPECT_FALSE(dims.isTerminal());
    EXPECT_EQ(dims.toString(), "[K 3 K]");
    EXPECT_NE(list({l.getId(), k.getId()}).getId(), list({k.getId(), l.getId()}).getId());
}

TEST_F(SymbolicDimsTest, AListOfOneIsNotItsElement) {
    const SymbolicDims one = list({k.getId()});
    EXPECT_NE(one.getId(), k.getId());
    EXPECT_EQ(one.getNumDimensions(), 1u);
    EXPECT_EQ(table.getSymbolicExpr(static_cast<unsigned long>(one.getId() + 1)).getNumDimensions(), 1u);
    EXPECT_EQ(one.getDimensionId(0), k.getId());
    EXPECT_EQ(one.getSize().getId(), one.getId()); // one dimension: itself
    EXPECT_EQ(one.getSize(1).getId(), k.getId());
    EXPECT_EQ(one.toString(), "[K]");
}

TEST_F(SymbolicDimsTest, ArithmeticIsSimplified) {
    struct Row {
        SymbolicDims result;
        const char* text;
    };
    const Row rows[] = {
        {k + l, "K + L"},
        {l + k, "K + L"},
        {k - l, "K - L"},
        {l - k, "L - K"},
        {k * l, "K*L"},
        {l * k, "K*L"},
        {k / l, "K/L"},
        {k % l, "K % L"},
        {number(2) * number(3), "6"},
        {number(7) / number(2), "7/2"},
        {number(6) / number(2), "3"},
        {number(7) % number(3), "1"},
        {k * number(1), "K"},
        {number(1) * k, "K"},
        {k + number(0), "K"},
        {number(0) + k, "K"},
        {k - number(0), "K"},
        {k / number(1), "K"},
        {k * number(0), "0"},
        {k - k, "0"},
        {k / k, "1"},
        {(k * l + number(2) * k) / number(2) % m, "(K*L + 2*K)/2 % M"},
        {number(2147483647) + number(1), "2147483648.0"},
        {k / number(0), "K/0"},
        {k % number(0), "K % 0"},
        {number(5) % number(0), "5 % 0"},
    };
    for (const Row& row : rows)
        EXPECT_EQ(row.result.toString(), row.text);
}

TEST_F(SymbolicDimsTest, TheNegativeIsNotSimplified) {
    EXPECT_EQ((-k).toString(), "-K");
    const SymbolicDims negative = -number(3);
    EXPECT_EQ(negative.toString(), "-(3)");
    EXPECT_NE(negative.getId(), number(-3).getId()); // kept
    EXPECT_FALSE(table.getValueOf(negative.getId()).first);
    EXPECT_EQ((-(-k)).toString(), "-(-K)");
    EXPECT_EQ((-number(3) + number(0)).getId(), number(-3).getId());
}

TEST_F(SymbolicDimsTest, TheRightSideComesFromTheTableOfTheLeftSide) {
#ifndef NDEBUG
    SymbolicDimsTable other;
    EXPECT_DEATH(k + SymbolicDimsString(other, "K"), "");
    EXPECT_DEATH(list({list({k.getId()}).getId()}), "");
#endif
}

TEST_F(SymbolicDimsTest, SizeOfASymbolIsItself) {
    const SymbolicDims raw = -number(3);
    const std::size_t count = table.getNumSymbolicDimss();
    EXPECT_EQ(k.getSize().getId(), k.getId());
    EXPECT_EQ(k.getSize(7).getId(), k.getId());
    EXPECT_EQ(raw.getSize().getId(), raw.getId()); // not simplified
    EXPECT_EQ(raw.getSize(3).getId(), raw.getId());
    EXPECT_EQ(table.getNumSymbolicDimss(), count);
}

TEST_F(SymbolicDimsTest, SizeOfAListIsTheProduct) {
    const SymbolicDims raw = -number(3);
    const SymbolicDims dims = list({raw.getId(), k.getId(), number(2).getId()});
    EXPECT_EQ(dims.getSize().toString(), "-6*K");
    EXPECT_EQ(dims.getSize(3).getId(), dims.getSize().getId());
    EXPECT_EQ(dims.getSize(2).toString(), "-3*K");
    EXPECT_EQ(dims.getSize(1).getId(), number(-3).getId()); // simplified
    EXPECT_EQ(dims.getSize(0).getId(), number(-3).getId());
}

TEST_F(SymbolicDimsTest, SizeSimplifiesOnceAndWidthAfterEachFactor) {
    const SymbolicDims dims = list({(k + l).getId(), (k - l).getId(), m.getId()});
    const std::size_t before = table.getNumSymbolicDimss();
    const SymbolicDims size = dims.getSize();
    EXPECT_EQ(size.toString(), "K*K*M - L*L*M");
    const int exprOfPartial = SymbolicDims(&table, (k * k - l * l).getId()).getId();
    EXPECT_GE(exprOfPartial, static_cast<int>(before)); // getSize(3) did not make the product of two
    EXPECT_EQ(table.getWidthSymbolicDimsId(dims.getId()), size.getId());
}

TEST_F(SymbolicDimsTest, Text) {
    class Upper : public QL::SymbolicExprPrinterPredicate {
      public:
        std::string identifier(const QL::SymbolicExprTable& exprs, unsigned long id) const override {
            return "p->" + exprs.get(id).getName();
        }
    };
    EXPECT_EQ((k * l).toString(Upper()), "p->K*p->L");
    std::ostringstream out;
    out << k << (k + l);
    EXPECT_EQ(out.str(), "SymbolicDims : 'K'\nSymbolicDims : 'K + L'\n");
}

TEST_F(SymbolicDimsTest, AHandleIsTwoWords) { EXPECT_EQ(sizeof(SymbolicDims), 2 * sizeof(void*)); }

class ListedDims : public NumericDims {
  public:
    explicit ListedDims(std::vector<long> dims) : dims_(std::move(dims)) {}
    std::size_t getNumDims() const override { return dims_.size(); }
    long getDim(std::size_t index) const override { return dims_[index]; }

  private:
    std::vector<long> dims_;
};

TEST(NumericDims, WidthIsTheProduct) {
    EXPECT_EQ(ListedDims({}).getWidth(), 1);
    EXPECT_EQ(ListedDims({5}).getWidth(), 5);
    EXPECT_EQ(ListedDims({2, 3, 4}).getWidth(), 24);
    EXPECT_EQ(ListedDims({2, 0, 4}).getWidth(), 0);
    EXPECT_EQ(ListedDims({2, -3}).getWidth(), -6);
    EXPECT_EQ(ListedDims({1L << 40, 1L << 23, 2}).getWidth(), 0); // beyond 64 bits
}

TEST(SymbDimsRange, ANewRangeHoldsNoInformation) {
    const SymbDimsRange range;
    EXPECT_EQ(range.min, std::numeric_limits<int>::min());
    EXPECT_EQ(range.max, std::numeric_limits<int>::max());
    EXPECT_EQ(range.flags, 0u);
}

TEST(SymbDimsRange, TheDefaultMinimumIsReadAtEachCall) {
    QlFeature* flag = QlFeature::find("SymbolicDimensionDefaultMinimum");
    ASSERT_NE(flag, nullptr);
    EXPECT_EQ(SymbDimsRange::defaultMin(), 1);
    flag->setState(-7);
    EXPECT_EQ(SymbDimsRange::defaultMin(), -7);
    flag->setState(flag->defaultState());
}

} // namespace
