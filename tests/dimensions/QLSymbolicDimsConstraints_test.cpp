// What is proved, what is refused and what stays unknown; the listings.
#include <climits>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "qlplatform/services/QlFeature.h"
#include "qltypes/dimensions/QLSymbolicDimsConstraints.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "tests/support/FlagState.h"
#include "tests/support/Raises.h"

class QLBlock {};

namespace {

using namespace QLTypeSys;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::UnorderedElementsAre;

#define QLTYPES_DIMENSIONS "QuillaneTypes:Dimensions:"

class ConstraintsTest : public testing::Test {
  protected:
    int symbol(const char* name) { return SymbolicDimsString(table, name).getId(); }
    int number(long value) { return SymbolicDimsQLSizeValue(table, value).getId(); }
    int list(const std::vector<int>& ids) { return SymbolicDimsND(table, ids).getId(); }
    int raw(QL::SymbolicOp op, int left, int right) {
        return static_cast<int>(table.getExprTable().add(op, static_cast<unsigned long>(left + 1),
                                                         static_cast<unsigned long>(right + 1))) -
               1;
    }
    int over(int above, int below) { return raw(QL::SymbolicOp::Divide, above, below); }
    std::string text(int id) { return table.getSymbolicDims(id).toString(); }

    std::string rangeText(int id) {
        const SymbDimsRange range = store.getRange(id);
        return std::to_string(range.min) + " to " + std::to_string(range.max) + ", " + std::to_string(range.flags);
    }
    std::vector<std::string> facts() {
        std::vector<SymbolicDimsConstraint> constraints;
        store.getSymbolicDimsConstraints(constraints);
        std::vector<std::string> texts;
        for (const SymbolicDimsConstraint& constraint : constraints)
            texts.push_back(text(constraint.id) + blockText(constraint.blocks));
        return texts;
    }
    std::vector<std::string> factsWithoutBlocks() {
        return texts([&](auto& ids) { store.getSymbolicDimsConstraints(ids); });
    }
    std::vector<std::string> statedBy(const QLBlock& block) {
        return texts([&](auto& ids) { store.getSymbolicDimsConstraints(&block, ids); });
    }
    template <class List> std::vector<std::string> texts(const List& list) {
        std::vector<int> ids{7, 7};
        list(ids);
        std::vector<std::string> result;
        for (const int id : ids)
            result.push_back(text(id));
        return result;
    }
    using Listing = void (SymbolicDimsConstraints::*)(std::vector<SymbolicDimsCGConstraint>&) const;
    std::vector<std::string> pairs(Listing listing) {
        std::vector<SymbolicDimsCGConstraint> records(2);
        (store.*listing)(records);
        std::vector<std::string> result;
        for (const SymbolicDimsCGConstraint& record : records)
            result.push_back(text(record.first) + ", " + text(record.second) + blockText(record.blocks));
        return result;
    }
    std::vector<std::string> equalPairs() { return pairs(&SymbolicDimsConstraints::getEquivalentSymbolicDims); }
    std::vector<std::string> greaterPairs() { return pairs(&SymbolicDimsConstraints::getGreaterThanSymbolicDims); }
    std::vector<std::string> lessPairs() { return pairs(&SymbolicDimsConstraints::getLessThanSymbolicDims); }

    std::string blockText(const std::vector<const QLBlock*>& list) {
        std::string result;
        for (const QLBlock* block : list)
            result += (result.empty() ? " by " : "") + std::to_string(block - blocks);
        return result;
    }

    SymbolicDimsTable table;
    SymbolicDimsConstraints store{&table};
    QLBlock blocks[3];
    const int k = symbol("K"), l = symbol("L"), m = symbol("M"), n = symbol("N");
};

// Equality.

TEST_F(ConstraintsTest, NothingIsKnownAtFirst) {
    EXPECT_FALSE(store.isEqual(k, l));
    EXPECT_FALSE(store.isGreaterThan(k, l));
    EXPECT_EQ(rangeText(k), "-2147483648 to 2147483647, 0");
    EXPECT_THAT(facts(), IsEmpty());
    EXPECT_THAT(equalPairs(), IsEmpty());
}

TEST_F(ConstraintsTest, ASizeEqualsItself) {
    EXPECT_TRUE(store.isEqual(k, k));
    EXPECT_TRUE(store.isEqual(list({k, l}), raw(QL::SymbolicOp::Multiply, k, l)));
    EXPECT_FALSE(store.isGreaterThan(k, k));
    EXPECT_TRUE(store.isEqual(number(3), number(3)));
    EXPECT_FALSE(store.isEqual(number(3), number(4)));
    EXPECT_TRUE(store.isGreaterThan(number(4), number(3)));
    EXPECT_FALSE(store.isGreaterThan(number(3), number(4)));
}

TEST_F(ConstraintsTest, EqualityIsSymmetricAndTransitive) {
    store.addEqual(l, m, nullptr);
    store.addEqual(k, l, nullptr);
    EXPECT_TRUE(store.isEqual(m, k));
    EXPECT_TRUE(store.isEqual(k, m));
    EXPECT_FALSE(store.isEqual(k, n));
}

TEST_F(ConstraintsTest, StatingWhatIsTheSameDoesNothing) {
    store.addEqual(k, k, &blocks[0]);
    store.addEqual(raw(QL::SymbolicOp::Multiply, k, l), list({k, l}),
                   &blocks[0]); // as lists: other numbers of dimensions
    store.addEqual(list({k}), k, &blocks[0]);
    store.addEqual(number(3), number(3), &blocks[0]);
    store.addGreaterThan(k, k, &blocks[0]); // kept: without a word
    store.addGreaterThan(list({k, l}), raw(QL::SymbolicOp::Multiply, k, l), &blocks[0]);
    store.addGreaterThan(number(4), number(3), &blocks[0]);
    EXPECT_THAT(facts(), IsEmpty());
    EXPECT_THAT(statedBy(blocks[0]), IsEmpty());
}

TEST_F(ConstraintsTest, AValue) {
    store.addEqual(k, number(3), &blocks[0]);
    EXPECT_EQ(rangeText(k), "3 to 3, 0");
    EXPECT_TRUE(store.isEqual(k, number(3)));
    EXPECT_TRUE(store.isEqual(number(3), k));
    EXPECT_FALSE(store.isEqual(k, number(4)));
    EXPECT_TRUE(store.isGreaterThan(k, number(2)));
    EXPECT_TRUE(store.isGreaterThan(number(4), k));
    EXPECT_FALSE(store.isGreaterThan(k, number(3)));
    store.addEqual(number(5), l, nullptr); // the number may be on either side
    EXPECT_EQ(rangeText(l), "5 to 5, 0");
    EXPECT_FALSE(store.isEqual(k, l)); // by their numbers they are not, but that is not asked
    EXPECT_THAT(statedBy(blocks[0]), ElementsAre("K == 3"));
}

TEST_F(ConstraintsTest, TwoOfOneValueAreNotKnownToBeEqual) {
    store.addEqualValue(k, 3, nullptr);
    store.addEqualValue(l, 3, nullptr);
    EXPECT_FALSE(store.isEqual(k, l));
}

TEST_F(ConstraintsTest, EqualShapes) {
    const int one = number(1);
    store.addEqual(list({one, k, l, one}), list({m, n}), &blocks[0]); // dimensions of 1 at either end are no shape
    EXPECT_TRUE(store.isEqual(k, m));
    EXPECT_TRUE(store.isEqual(l, n));
    EXPECT_TRUE(store.isEqual(list({k, l}), list({m, n})));
    EXPECT_THAT(statedBy(blocks[0]), UnorderedElementsAre("K == M", "L == N", "K*L == M*N"));
}

TEST_F(ConstraintsTest, ShapesWithOtherNumbersOfDimensions) {
    store.addEqual(list({k, l}), m, nullptr); // only the sizes
    EXPECT_TRUE(store.isEqual(list({k, l}), m));
    EXPECT_FALSE(store.isEqual(k, m));
    SymbolicDimsConstraints other(&table);
    other.addEqual(m, list({k, l}), &blocks[0]); // kept: the other way round nothing is stated
    EXPECT_FALSE(other.isEqual(list({k, l}), m));
    std::vector<int> ids;
    other.getSymbolicDimsConstraints(ids);
    EXPECT_THAT(ids, IsEmpty());
}

TEST_F(ConstraintsTest, DimensionsBeforeARefusedOneStayLinked) {
    EXPECT_RAISES(store.addEqual(list({k, number(3), l}), list({m, number(4), n}), &blocks[0]),
                  QLTYPES_DIMENSIONS "InvalidSymbolicDimensionNotEqual", "3", "4");
    EXPECT_TRUE(store.isEqual(k, m));
    EXPECT_FALSE(store.isEqual(l, n));
    EXPECT_THAT(facts(), ElementsAre("K == M by 0"));
}

TEST_F(ConstraintsTest, SomeClassesStayApart) {
    store.addEqual(k, m, nullptr);
    store.addEqual(l, m, &blocks[0]); // kept: M is linked to K, which is older than L, and L does not join them
    EXPECT_FALSE(store.isEqual(l, m));
    EXPECT_TRUE(store.isEqual(k, m));
    EXPECT_THAT(facts(), UnorderedElementsAre("K == M", "L == M")); // but it is listed
    store.addEqual(m, l, nullptr);
    EXPECT_FALSE(store.isEqual(l, m));
}

TEST_F(ConstraintsTest, ALinkCanLeaveItsClass) {
    store.addEqual(m, n, nullptr);
    const int o = symbol("O");
    store.addEqual(n, o, nullptr); // O to M
    store.addEqual(k, m, nullptr); // M to K, and O with it
    EXPECT_TRUE(store.isEqual(k, o));
    store.addRange(k, 5, 9, nullptr, generateBothBounds);
    EXPECT_EQ(rangeText(o), "5 to 9, 0");
    store.addEqual(l, o, nullptr); // kept: M and O go over to L
    EXPECT_TRUE(store.isEqual(l, o));
    EXPECT_FALSE(store.isEqual(k, o));
    EXPECT_EQ(rangeText(o), "-2147483648 to 2147483647, 0");
}

TEST_F(ConstraintsTest, TheRangeOfAMergedClassIsThatOfTheOlderRoot) {
    store.addRange(k, 1, 2, &blocks[0], generateBothBounds);
    store.addRange(l, 5, 6, &blocks[1], generateBothBounds);
    store.addEqual(k, l, nullptr); // kept: although no number is in both
    EXPECT_EQ(rangeText(k), "1 to 2, 0");
    EXPECT_EQ(rangeText(l), "1 to 2, 0");
    EXPECT_THAT(facts(), UnorderedElementsAre("K == L", "K < 3 by 0", "L > 4 by 1", "L < 7 by 1")); // both are listed
}

// Order.

TEST_F(ConstraintsTest, Chains) {
    store.addGreaterThan(k, l, nullptr);
    store.addGreaterThan(l, m, nullptr);
    EXPECT_TRUE(store.isGreaterThan(k, m));
    EXPECT_FALSE(store.isGreaterThan(m, k));
    EXPECT_RAISES(store.addGreaterThan(m, k, nullptr), QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionGreaterThan",
                  "M", "K", "K");
    EXPECT_RAISES(store.addEqual(m, k, nullptr), QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionNotEqual", "K", "M",
                  "M");
    EXPECT_RAISES(store.addEqual(k, m, nullptr), QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionNotEqual", "K", "M",
                  "M");
}

TEST_F(ConstraintsTest, EdgesDoNotCrossClasses) {
    store.addEqual(k, l, nullptr);
    store.addGreaterThan(l, m, nullptr);
    EXPECT_FALSE(store.isGreaterThan(k, m));
    EXPECT_RAISES(store.addGreaterThan(k, l, nullptr), QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionEqual", "K",
                  "L", "L");
    store.addEqual(k, m, nullptr); // kept
    EXPECT_TRUE(store.isEqual(l, m));
    EXPECT_TRUE(store.isGreaterThan(l, m));
}

TEST_F(ConstraintsTest, NumbersInTheWrongOrder) {
    EXPECT_RAISES(store.addGreaterThan(number(3), number(4), nullptr),
                  QLTYPES_DIMENSIONS "InvalidSymbolicDimensionGreaterThan", "3", "4");
    EXPECT_RAISES(store.addGreaterThan(number(-1), list({number(2), number(2)}), nullptr),
                  QLTYPES_DIMENSIONS "InvalidSymbolicDimensionGreaterThan", "-1", "4");
    EXPECT_RAISES(store.addEqual(number(4), number(3), nullptr), QLTYPES_DIMENSIONS "InvalidSymbolicDimensionNotEqual",
                  "4", "3");
    EXPECT_RAISES(store.addEqual(number(3), number(4), nullptr), QLTYPES_DIMENSIONS "InvalidSymbolicDimensionNotEqual",
                  "3", "4");
}

TEST_F(ConstraintsTest, ANumberOnOneSideIsABound) {
    store.addGreaterThan(k, number(3), &blocks[0]);
    store.addGreaterThan(number(9), k, &blocks[1]);
    EXPECT_EQ(rangeText(k), "4 to 8, 0");
    EXPECT_TRUE(store.isGreaterThan(k, number(3)));
    EXPECT_FALSE(store.isGreaterThan(k, number(4)));
    EXPECT_TRUE(store.isGreaterThan(number(9), k));
    EXPECT_FALSE(store.isGreaterThan(number(8), k));
    EXPECT_THAT(statedBy(blocks[0]), ElementsAre("K > 3"));
    EXPECT_THAT(statedBy(blocks[1]), ElementsAre("K < 9"));
    EXPECT_RAISES(store.addEqual(k, number(3), nullptr), QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionNotEqual",
                  "K", "3", "3");
    EXPECT_RAISES(store.addEqual(k, number(9), nullptr), QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionNotEqual",
                  "9", "K", "K");
}

TEST_F(ConstraintsTest, DisjointRangesAreNoOrder) {
    store.addLessThanValue(k, 3, nullptr);
    store.addGreaterThanValue(l, 5, nullptr);
    EXPECT_FALSE(store.isGreaterThan(l, k));
}

// Bounds.

TEST_F(ConstraintsTest, LowerBoundsAreCarriedUpAsTheyAre) {
    store.addRange(k, 5, 9, nullptr, omitLowerBound);
    store.addGreaterThan(l, k, nullptr);
    store.addGreaterThan(m, l, nullptr);
    EXPECT_EQ(rangeText(l), "5 to 2147483647, 0"); // kept: 5, not 6
    EXPECT_EQ(rangeText(m), "5 to 2147483647, 0");
    store.addGreaterThanValue(k, 7, nullptr); // and again when the answer is remembered
    EXPECT_EQ(rangeText(m), "8 to 2147483647, 0");
    store.addLessThanValue(m, 4, nullptr); // kept: the bound that is carried up refuses nothing
    EXPECT_EQ(rangeText(m), "8 to 3, 0");
    EXPECT_EQ(rangeText(k), "8 to 9, 1"); // and upper bounds are not carried down
}

TEST_F(ConstraintsTest, CarriedBoundsFollowTheClass) {
    store.addGreaterThan(m, n, nullptr);
    store.addRange(n, 7, 9, nullptr, generateBothBounds);
    EXPECT_EQ(rangeText(m), "7 to 2147483647, 0");
    store.addEqual(n, l, nullptr); // the range of N is that of L now
    EXPECT_EQ(rangeText(m), "-2147483648 to 2147483647, 0");
    store.addGreaterThanValue(l, 2, nullptr);
    EXPECT_EQ(rangeText(m), "3 to 2147483647, 0");
}

TEST_F(ConstraintsTest, RefusedBounds) {
    store.addRange(k, 4, 8, nullptr, generateBothBounds);
    const char* const greater = QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionGreaterThan";
    const char* const less = QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionLessThan";
    EXPECT_RAISES(store.addRange(k, 0, 3, nullptr, generateBothBounds), less, "K", "4", "3");
    EXPECT_RAISES(store.addRange(k, 9, 12, nullptr, generateBothBounds), greater, "K", "8", "9");
    EXPECT_RAISES(store.addRange(k, 9, 3, nullptr, generateBothBounds), less, "K", "4", "3"); // the upper bound first
    EXPECT_RAISES(store.addEqualValue(k, 3, nullptr), less, "K", "4", "3");
    EXPECT_RAISES(store.addEqualValue(k, 9, nullptr), greater, "K", "8", "9");
    EXPECT_RAISES(store.addGreaterThanValue(k, 8, nullptr), greater, "K", "8", "9"); // at the bound already
    EXPECT_RAISES(store.addLessThanValue(k, 4, nullptr), less, "K", "4", "3");
    EXPECT_EQ(rangeText(k), "4 to 8, 0");
    store.addGreaterThanValue(k, 7, nullptr); // to a point, without complaint
    EXPECT_TRUE(store.isEqual(k, number(8)));
}

TEST_F(ConstraintsTest, GreaterThanAndBelowTheNext) {
    store.addGreaterThan(k, number(3), nullptr);
    EXPECT_RAISES(store.addLessThanValue(k, 4, nullptr), QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionLessThan",
                  "K", "4", "3");
}

TEST_F(ConstraintsTest, ARefusedBoundNamesTheRoot) {
    store.addEqual(k, l, nullptr);
    store.addRange(l, 4, 8, nullptr, generateBothBounds);
    EXPECT_RAISES(store.addEqualValue(l, 9, nullptr), QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionGreaterThan",
                  "K", "8", "9");
}

TEST_F(ConstraintsTest, BoundsAtTheEndsOfTheNumbers) {
    const char* const greater = QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionGreaterThan";
    const char* const less = QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionLessThan";
    EXPECT_RAISES(store.addGreaterThanValue(k, INT_MAX, nullptr), greater, "K", "2147483647", "2147483648");
    EXPECT_RAISES(store.addLessThanValue(k, INT_MIN, nullptr), less, "K", "-2147483648", "-2147483649");
    store.addGreaterThanValue(k, INT_MAX - 1, nullptr);
    store.addLessThanValue(l, INT_MIN + 1, nullptr);
    EXPECT_EQ(rangeText(k), "2147483647 to 2147483647, 0");
    EXPECT_EQ(rangeText(l), "-2147483648 to -2147483648, 0");
    EXPECT_RAISES(store.addRange(k, INT_MIN, INT_MIN, nullptr, generateBothBounds), less, "K", "-2147483647",
                  "2147483646");
    EXPECT_RAISES(store.addRange(l, INT_MAX, INT_MAX, nullptr, generateBothBounds), greater, "L", "2147483646",
                  "-2147483647");
    EXPECT_RAISES(store.addRange(l, INT_MIN + 1, INT_MAX, nullptr, generateBothBounds), greater, "L", "-2147483648",
                  "-2147483647");
}

TEST_F(ConstraintsTest, AnEmptyRangeStatedAtOnceIsHeld) {
    store.addRange(k, 6, 4, nullptr, generateBothBounds); // kept: it misses nothing that is held
    EXPECT_EQ(rangeText(k), "6 to 4, 0");
    EXPECT_THAT(facts(), IsEmpty());
    EXPECT_THAT(greaterPairs(), IsEmpty());
    EXPECT_THAT(lessPairs(), IsEmpty());
}

TEST_F(ConstraintsTest, ARefusedBoundLeavesAnEmptyRange) {
    EXPECT_RAISES(store.addGreaterThanValue(k, INT_MAX, &blocks[0]),
                  QLTYPES_DIMENSIONS "InconsistentSymbolicDimensionGreaterThan", "K", "2147483647", "2147483648");
    EXPECT_THAT(facts(), IsEmpty());
    EXPECT_THAT(greaterPairs(), ElementsAre("K, -2147483648")); // kept: it shows here
    EXPECT_THAT(lessPairs(), ElementsAre("K, 2147483647"));
    EXPECT_THAT(statedBy(blocks[0]), IsEmpty());
}

TEST_F(ConstraintsTest, ANumberCanHaveARangeOfItsOwn) {
    store.addRange(number(3), 1, 7, nullptr, generateBothBounds);
    EXPECT_EQ(rangeText(number(3)), "1 to 7, 0");
    EXPECT_FALSE(store.isGreaterThan(number(3), k));
}

// Flags.

TEST_F(ConstraintsTest, TheLastFlagsCount) {
    store.addRange(k, 2, 9, nullptr, omitBothBounds);
    EXPECT_EQ(rangeText(k), "2 to 9, 3");
    EXPECT_THAT(greaterPairs(), IsEmpty());
    EXPECT_THAT(lessPairs(), IsEmpty());
    EXPECT_THAT(facts(), ElementsAre("K > 1", "K < 10"));
    store.addGreaterThanValue(k, 2, nullptr); // leaves them
    store.addLessThanValue(k, 9, nullptr);
    EXPECT_EQ(rangeText(k), "3 to 8, 3");
    store.addRange(k, 1, 9, nullptr, static_cast<GenerateCodeFlags>(omitLowerBound + 4)); // of two bits
    EXPECT_EQ(rangeText(k), "3 to 8, 1");
    EXPECT_THAT(lessPairs(), ElementsAre("K, 9"));
    EXPECT_THAT(greaterPairs(), IsEmpty());
    store.addEqualValue(k, 5, nullptr);
    EXPECT_EQ(rangeText(k), "5 to 5, 0");
}

TEST_F(ConstraintsTest, WithoutUpperBoundsInCode) {
    testsupport::FlagState off(QlFeature::find("SymbolicDimsMaxConstraintInCode"), 0);
    store.addRange(k, 2, 9, nullptr, generateBothBounds);
    store.addRange(l, 2, 9, nullptr, omitBothBounds); // kept: whatever the caller says
    EXPECT_EQ(rangeText(k), "2 to 9, 2");
    EXPECT_EQ(rangeText(l), "2 to 9, 2");
    EXPECT_THAT(lessPairs(), IsEmpty());
    EXPECT_THAT(greaterPairs(), ElementsAre("K, 1", "L, 1"));
}

// Listings.

TEST_F(ConstraintsTest, Facts) {
    store.addRange(n, 2, 9, &blocks[1], generateBothBounds);
    store.addGreaterThan(l, m, &blocks[2]);
    store.addGreaterThan(l, m, &blocks[1]); // stated twice, by two
    store.addEqualValue(m, 4, &blocks[0]);
    store.addEqual(k, l, &blocks[0]);
    EXPECT_THAT(facts(), ElementsAre("K == L by 0", "M == 4 by 0", "L > M by 12", "N > 1 by 1", "N < 10 by 1"));
    EXPECT_THAT(factsWithoutBlocks(), ElementsAre("K == L", "M == 4", "L > M", "N > 1")); // kept: no upper bounds
}

TEST_F(ConstraintsTest, AnImpliedLowerBoundIsNotListed) {
    testsupport::FlagState minimum(QlFeature::find("SymbolicDimensionDefaultMinimum"), 3);
    store.addGreaterThanValue(k, 2, nullptr); // at least the default minimum
    EXPECT_THAT(facts(), IsEmpty());
    EXPECT_THAT(factsWithoutBlocks(), IsEmpty());
    EXPECT_THAT(greaterPairs(), ElementsAre("K, 2")); // but here it is
    QlFeature::find("SymbolicDimensionDefaultMinimum")->setState(2);
    EXPECT_THAT(facts(), ElementsAre("K > 2"));
    EXPECT_THAT(factsWithoutBlocks(), ElementsAre("K > 2"));
}

TEST_F(ConstraintsTest, WhatABlockStated) {
    store.addEqual(l, k, &blocks[0]);
    store.addGreaterThan(m, n, &blocks[0]);
    store.addLessThanValue(n, 7, &blocks[0]);
    store.addGreaterThanValue(n, 3, &blocks[1]);
    store.addRange(m, 3, 4, &blocks[1], generateBothBounds); // kept: not said to be stated
    store.addGreaterThan(m, n, nullptr);
    EXPECT_THAT(statedBy(blocks[0]), ElementsAre("L == K", "M > N", "N < 7")); // ids ascend
    EXPECT_THAT(statedBy(blocks[1]), ElementsAre("N > 3"));
    EXPECT_THAT(statedBy(blocks[2]), IsEmpty());
}

TEST_F(ConstraintsTest, WhatTheBlocksBehindAnotherStated) {
    store.addEqual(k, l, &blocks[0]);
    store.addGreaterThan(m, n, &blocks[1]);
    store.addEqual(k, l, &blocks[1]);
    store.addLessThanValue(n, 7, &blocks[2]);
    const auto mapper = [this](const QLBlock* b) { return b == &blocks[1] ? &blocks[0] : b; };
    const auto list = [&](const QLBlock* block) {
        return texts([&](auto& ids) { store.getSymbolicDimsConstraints(block, mapper, ids); });
    };
    EXPECT_THAT(list(&blocks[0]), ElementsAre("K == L", "M > N"));
    EXPECT_THAT(list(&blocks[1]), IsEmpty());
    EXPECT_THAT(list(&blocks[2]), ElementsAre("N < 7"));
}

TEST_F(ConstraintsTest, AnEmptyMapper) {
    std::vector<int> ids{7};
    store.getSymbolicDimsConstraints(&blocks[0], {}, ids); // nothing is asked of it
    EXPECT_THAT(ids, IsEmpty());
    store.addEqual(k, l, nullptr);
    store.getSymbolicDimsConstraints(&blocks[0], {}, ids);
    store.addEqual(k, l, &blocks[1]);
    EXPECT_THROW(store.getSymbolicDimsConstraints(&blocks[0], {}, ids), boost::bad_function_call);
}

TEST_F(ConstraintsTest, PairsForCode) {
    store.addEqual(l, m, &blocks[1]);
    store.addEqual(k, m, &blocks[2]); // L and M go over to K
    store.addEqualValue(n, 4, &blocks[0]);
    EXPECT_THAT(equalPairs(), ElementsAre("K, L by 1", "K, M by 1", "L, M by 1", "N, 4 by 0"));
    store.addGreaterThan(l, n, &blocks[0]);
    EXPECT_THAT(greaterPairs(), ElementsAre("L, N")); // kept: the blocks are those of edges from the second
    store.addGreaterThan(n, symbol("O"), &blocks[1]);
    EXPECT_THAT(greaterPairs(), ElementsAre("L, N by 1", "N, O"));
    store.addRange(m, 2, INT_MAX, &blocks[2], generateBothBounds);
    EXPECT_THAT(greaterPairs(), ElementsAre("K, 1 by 2", "L, N by 1", "N, O"));
    EXPECT_THAT(lessPairs(), ElementsAre("K, 2147483647 by 2"));
}

TEST_F(ConstraintsTest, PairsAreFreeOfDivisions) {
    const int two = number(2), four = number(4), three = number(3);
    struct Row {
        int first, second;
        const char* pair;
    };
    const Row rows[] = {
        {over(k, two), over(l, two), "K, L"},       // equal denominators: the numerators
        {over(k, two), over(l, four), "2*K, L"},    // the right one is a multiple
        {over(k, four), over(l, two), "K, 2*L"},    // the left one is
        {over(k, two), over(l, three), "3*K, 2*L"}, // neither is
        {over(k, m), over(l, n), "K*N, L*M"},
        {over(k, two), l, "K, 2*L"},
        {k, over(l, two), "2*K, L"},
        {k, over(raw(QL::SymbolicOp::Plus, l, l), two), "2*K, L + L"}, // kept: this numerator is not simplified
        {over(raw(QL::SymbolicOp::Plus, k, k), two), l, "2*K, 2*L"},
        {raw(QL::SymbolicOp::Plus, k, over(l, two)), m, "2*K + L, 2*M"}, // a division inside a sum comes to the top
        {over(k, number(0)), over(l, two), "K, 0"}, // 0 is no multiple of itself, and does not end the program
        {over(k, two), over(l, number(0)), "0, L"},
        {over(k, number(0)), over(l, number(0)), "0, 0"},
        {over(k, number(0)), l, "K, 0"},
        {k, over(l, number(0)), "0, L"},
        {over(k, number(-1)), over(l, number(INT_MIN)), "2147483648.0*K, L"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(text(row.first) + " > " + text(row.second));
        SymbolicDimsConstraints constraints(&table);
        constraints.addGreaterThan(row.first, row.second, nullptr);
        std::vector<SymbolicDimsCGConstraint> records;
        constraints.getGreaterThanSymbolicDims(records);
        ASSERT_EQ(records.size(), 1u);
        EXPECT_EQ(text(records[0].first) + ", " + text(records[0].second), row.pair);
    }
}

TEST_F(ConstraintsTest, PairsStayInTheOrderBeforeRewriting) {
    store.addGreaterThan(n, k, nullptr);
    store.addGreaterThan(over(k, number(2)), l, nullptr); // becomes K, 2*L, but was made after N
    EXPECT_THAT(greaterPairs(), ElementsAre("N, K", "K, 2*L"));
}

TEST_F(ConstraintsTest, ARefusalAddsNoExpression) {
    store.addGreaterThan(k, l, &blocks[0]);
    store.addRange(k, 2, 5, &blocks[0], generateBothBounds);
    const std::size_t before = table.getNumSymbolicDimss();
    for (const auto& statement : std::vector<std::function<void()>>{
             [&] { store.addGreaterThan(l, k, &blocks[1]); }, [&] { store.addEqual(k, l, &blocks[1]); },
             [&] { store.addEqualValue(k, 77, &blocks[1]); }, [&] { store.addGreaterThanValue(k, 88, &blocks[1]); },
             [&] { store.addLessThanValue(k, -99, &blocks[1]); }})
        EXPECT_NE(testsupport::raisedBy(statement), "nothing thrown");
    EXPECT_EQ(table.getNumSymbolicDimss(), before);
    EXPECT_THAT(statedBy(blocks[1]), IsEmpty());
}

} // namespace
