// The way through the table to the constraint store: guards, blocks, resets; equality of expressions.
#include <climits>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "tests/support/Raises.h"

class QLBlock {};

namespace {

using namespace QLTypeSys;
using testing::ElementsAre;
using testing::IsEmpty;

QLBlock original, copy;

/// States everything for `original` in place of `copy`.
class TableOfCopies : public SymbolicDimsTable {
  public:
    const QLBlock* getOriginalBlock(const QLBlock* block) const override { return block == &copy ? &original : block; }
};

class TableConstraintsTest : public testing::Test {
  protected:
    int symbol(const char* name) { return SymbolicDimsString(table, name).getId(); }
    int raw(QL::SymbolicOp op, int left, int right) {
        return static_cast<int>(table.getExprTable().add(op, exprId(left), exprId(right))) - 1;
    }
    static unsigned long exprId(int id) { return static_cast<unsigned long>(id + 1); }
    std::vector<std::string> texts(const std::vector<int>& ids) {
        std::vector<std::string> result;
        for (const int id : ids)
            result.push_back(table.getSymbolicDims(id).toString());
        return result;
    }
    std::vector<std::string> statedBy(const QLBlock& block) {
        std::vector<int> ids;
        table.getSymbolicDimsConstraints(&block, ids);
        return texts(ids);
    }
    std::vector<std::string> facts() {
        std::vector<int> ids;
        table.getSymbolicDimsConstraints(ids);
        return texts(ids);
    }

    TableOfCopies table;
    const int k = symbol("K"), l = symbol("L"), m = symbol("M"), n = symbol("N");
};

TEST_F(TableConstraintsTest, StatementsAndQuestions) {
    table.addEqualRelation(k, l, nullptr);
    table.addEqualConstraint(m, 4, nullptr);
    table.addGreaterThanRelation(n, m, nullptr);
    table.addGreaterThanConstraint(k, 2, nullptr);
    table.addLessThanConstraint(k, 9, nullptr);
    table.addRange(n, 1, 7, nullptr, omitLowerBound);

    EXPECT_TRUE(table.hasEqualRelation(l, k));
    EXPECT_FALSE(table.hasEqualRelation(l, m));
    EXPECT_TRUE(table.hasGreaterThanRelation(n, m));
    EXPECT_FALSE(table.hasGreaterThanRelation(m, n));
    EXPECT_TRUE(table.hasEqualConstraint(m, 4));
    EXPECT_FALSE(table.hasEqualConstraint(m, 5));
    EXPECT_FALSE(table.hasEqualConstraint(k, 3));
    EXPECT_TRUE(table.hasGreaterThanConstraint(l, 2));
    EXPECT_FALSE(table.hasGreaterThanConstraint(l, 3));
    EXPECT_TRUE(table.hasLessThanConstraint(l, 9));
    EXPECT_FALSE(table.hasLessThanConstraint(l, 8));
    const SymbDimsRange range = table.getRange(n);
    EXPECT_EQ(range.min, 4);
    EXPECT_EQ(range.max, 7);
    EXPECT_EQ(range.flags, omitLowerBound);
}

TEST_F(TableConstraintsTest, NothingIsKnownOfWhatNobodyStated) {
    for (const int value : {INT_MIN, -1, 0, 1, INT_MAX}) {
        EXPECT_FALSE(table.hasGreaterThanConstraint(k, value));
        EXPECT_FALSE(table.hasLessThanConstraint(k, value));
        EXPECT_FALSE(table.hasEqualConstraint(k, value));
    }
}

TEST_F(TableConstraintsTest, WhatIsNoDimensionIsIgnored) {
    const int beyond = static_cast<int>(table.getNumSymbolicDimss()) - 1;
    for (const int id : {-2, -1, 0, beyond, INT_MAX, INT_MIN}) {
        SCOPED_TRACE(id);
        table.addEqualRelation(id, k, &original);
        table.addEqualRelation(k, id, &original);
        table.addEqualConstraint(id, 4, &original);
        table.addGreaterThanRelation(id, k, &original);
        table.addGreaterThanRelation(k, id, &original);
        table.addGreaterThanConstraint(id, 4, &original);
        table.addLessThanConstraint(id, 4, &original);
        table.addRange(id, 4, 5, &original, generateBothBounds);
        std::vector<SymbolicDimsCGConstraint> pairs(1);
        table.getGreaterThanSymbolicDims(pairs); // a range, though empty, would show
        EXPECT_THAT(pairs, IsEmpty());
        EXPECT_THAT(facts(), IsEmpty());
        EXPECT_THAT(statedBy(original), IsEmpty());
    }
}

TEST_F(TableConstraintsTest, StatementsAreThoseOfTheOriginalBlock) {
    table.addEqualRelation(k, l, &copy);
    EXPECT_THAT(statedBy(original), ElementsAre("K == L"));
    table.addEqualConstraint(m, 4, &copy);
    table.addGreaterThanRelation(n, m, &copy);
    table.addGreaterThanConstraint(k, 2, &copy);
    table.addLessThanConstraint(k, 9, &copy);
    EXPECT_EQ(statedBy(original).size(), 5u);
    EXPECT_THAT(statedBy(copy), IsEmpty()); // a listing takes its block as it is
    table.addRange(n, 5, 7, &copy, generateBothBounds);
    std::vector<SymbolicDimsCGConstraint> pairs;
    table.getLessThanSymbolicDims(pairs);
    ASSERT_EQ(pairs.size(), 2u);
    for (const SymbolicDimsCGConstraint& pair : pairs)
        EXPECT_THAT(pair.blocks, ElementsAre(&original));
}

TEST_F(TableConstraintsTest, Listings) {
    table.addEqualRelation(k, l, &copy);
    table.addGreaterThanRelation(m, n, &original);
    table.addRange(n, 2, 4, &original, generateBothBounds);
    std::vector<SymbolicDimsConstraint> constraints(1);
    table.getSymbolicDimsConstraints(constraints);
    EXPECT_EQ(constraints.size(), 4u);
    EXPECT_THAT(facts(), ElementsAre("K == L", "M > N", "N > 1"));
    std::vector<int> ids;
    table.getSymbolicDimsConstraints(
        &copy, [](const QLBlock*) -> const QLBlock* { return &copy; }, ids);
    EXPECT_THAT(texts(ids), ElementsAre("K == L", "M > N"));
    std::vector<SymbolicDimsCGConstraint> pairs(1);
    table.getEquivalentSymbolicDims(pairs);
    ASSERT_EQ(pairs.size(), 1u);
    EXPECT_EQ(pairs[0].second, l);
    table.getGreaterThanSymbolicDims(pairs);
    EXPECT_EQ(pairs.size(), 2u);
    table.getLessThanSymbolicDims(pairs);
    EXPECT_EQ(pairs.size(), 1u);
}

TEST_F(TableConstraintsTest, RefusalsPassTheTable) {
    table.addGreaterThanRelation(k, l, nullptr);
    EXPECT_RAISES(table.addGreaterThanRelation(l, k, nullptr),
                  "QuillaneTypes:Dimensions:InconsistentSymbolicDimensionGreaterThan", "L", "K", "K");
    EXPECT_TRUE(table.hasGreaterThanRelation(k, l));
}

TEST_F(TableConstraintsTest, AResetForgetsAllFacts) {
    table.addEqualRelation(k, l, &original);
    table.addEqualConstraint(m, 4, &original);
    table.addGreaterThanRelation(n, m, &original);
    table.resetToBuiltin();
    EXPECT_THAT(facts(), IsEmpty());
    EXPECT_THAT(statedBy(original), IsEmpty());
    const int newK = symbol("K"), newL = symbol("L");
    EXPECT_FALSE(table.hasEqualRelation(newK, newL));
    table.addGreaterThanRelation(newK, newL, nullptr);
    EXPECT_TRUE(table.hasGreaterThanRelation(newK, newL));
}

TEST_F(TableConstraintsTest, EqualExpressions) {
    const int sum = raw(QL::SymbolicOp::Plus, k, l), mirrored = raw(QL::SymbolicOp::Plus, l, k);
    EXPECT_EQ(table.equalSymbolicDims(exprId(sum), exprId(mirrored)), std::make_pair(true, true));
    EXPECT_EQ(table.equalSymbolicDims(exprId(sum), exprId(k)), std::make_pair(false, false));
    EXPECT_EQ(table.equalSymbolicDims(exprId(k), exprId(k)), std::make_pair(true, true));
    table.addEqualRelation(k, sum, nullptr);
    EXPECT_EQ(table.equalSymbolicDims(exprId(mirrored), exprId(k)), std::make_pair(true, true));
}

TEST_F(TableConstraintsTest, ComparingTeachesWhatAnExpressionSimplifiesTo) {
    const int twice = raw(QL::SymbolicOp::Plus, k, k);
    const int product = raw(QL::SymbolicOp::Multiply, SymbolicDimsQLSizeValue(table, 2).getId(), k);
    EXPECT_EQ(table.equalSymbolicDims(exprId(k), exprId(twice)), std::make_pair(false, false));
    EXPECT_TRUE(table.hasEqualRelation(twice, product));
    EXPECT_THAT(facts(), ElementsAre("K + K == 2*K"));
    std::vector<SymbolicDimsConstraint> constraints;
    table.getSymbolicDimsConstraints(constraints);
    EXPECT_THAT(constraints.at(0).blocks, IsEmpty()); // by nobody
}

} // namespace
