// Shapes that make following every chain of edges, or following chains by calls, impossible.
#include <algorithm>
#include <random>
#include <string>

#include <gtest/gtest.h>

#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "tests/support/Raises.h"

namespace {

using namespace QLTypeSys;

class ConstraintsSizeTest : public testing::Test {
  protected:
    static constexpr int length = 100'000;

    std::vector<int> symbols(int count) {
        std::vector<int> ids;
        for (int i = 0; i < count; ++i)
            ids.push_back(SymbolicDimsString(table, "x" + std::to_string(i)).getId());
        return ids;
    }
    // The links of a chain: downwards, upwards, in any order.
    static std::vector<std::vector<std::size_t>> orders() {
        std::vector<std::size_t> down(length);
        for (std::size_t i = 0; i < length; ++i)
            down[i] = i;
        std::vector<std::size_t> up(down.rbegin(), down.rend()), any = down;
        std::shuffle(any.begin(), any.end(), std::mt19937(5));
        return {down, up, any};
    }

    SymbolicDimsTable table;
};

TEST_F(ConstraintsSizeTest, ALadderOfDiamonds) {
    constexpr std::size_t numDiamonds = 60; // 2^60 chains
    SymbolicDimsConstraints store(&table);
    const std::vector<int> x = symbols(3 * numDiamonds + 2);
    const int top = x[0], bottom = x[3 * numDiamonds], apart = x.back();
    for (std::size_t i = 0; i < numDiamonds; ++i) {
        const std::size_t rung = 3 * i;
        store.addGreaterThan(x[rung], x[rung + 1], nullptr);
        store.addGreaterThan(x[rung], x[rung + 2], nullptr);
        store.addGreaterThan(x[rung + 1], x[rung + 3], nullptr);
        store.addGreaterThan(x[rung + 2], x[rung + 3], nullptr);
    }
    EXPECT_TRUE(store.isGreaterThan(top, bottom));
    EXPECT_FALSE(store.isGreaterThan(bottom, top));
    EXPECT_FALSE(store.isGreaterThan(top, apart));
    for (const int bound : {3, 4, 9}) {
        store.addGreaterThanValue(bottom, bound, nullptr);
        EXPECT_EQ(store.getRange(top).min, bound + 1);
        EXPECT_EQ(store.getRange(x[100]).min, bound + 1);
        EXPECT_FALSE(store.isEqual(top, bottom));
    }
    EXPECT_RAISES(store.addGreaterThan(bottom, top, nullptr),
                  "QuillaneTypes:Dimensions:InconsistentSymbolicDimensionGreaterThan", "x180", "x0", "x0");
}

TEST_F(ConstraintsSizeTest, LongChains) {
    const std::vector<int> x = symbols(length + 1);
    for (const std::vector<std::size_t>& order : orders()) {
        SymbolicDimsConstraints store(&table);
        for (const std::size_t i : order)
            store.addGreaterThan(x[i], x[i + 1], nullptr);
        store.addGreaterThanValue(x[length], 6, nullptr);
        EXPECT_EQ(store.getRange(x[0]).min, 7);
        store.addGreaterThanValue(x[length], 8, nullptr);
        EXPECT_EQ(store.getRange(x[0]).min, 9);
        EXPECT_TRUE(store.isGreaterThan(x[0], x[length]));
        EXPECT_FALSE(store.isGreaterThan(x[length], x[0]));
        EXPECT_TRUE(store.isGreaterThan(x[length / 3], x[length / 2]));
        EXPECT_NE(testsupport::raisedBy([&] { store.addGreaterThan(x[length], x[0], nullptr); }), "nothing thrown");
    }
}

TEST_F(ConstraintsSizeTest, LongChainsOfEqualities) {
    const std::vector<int> x = symbols(length + 1);
    const std::vector<std::vector<std::size_t>> all = orders();
    for (std::size_t which = 0; which < 2; ++which) { // in any order, some classes stay apart
        SymbolicDimsConstraints store(&table);
        for (const std::size_t i : all[which])
            store.addEqual(x[i], x[i + 1], nullptr);
        EXPECT_TRUE(store.isEqual(x[0], x[length]));
        EXPECT_TRUE(store.isEqual(x[length / 3], x[length / 2]));
        store.addGreaterThanValue(x[length], 6, nullptr);
        EXPECT_EQ(store.getRange(x[0]).min, 7);
    }
}

} // namespace
