// The two tools of the views' index, against the obvious.
#include <random>
#include <set>

#include <gtest/gtest.h>

#include "qltypes/structures/AskedSet_internal.h"
#include "qltypes/structures/SpanSearch_internal.h"

namespace {

using QLTypeSys::structures::AskedSet;
using QLTypeSys::structures::SpanSearch;

TEST(SpanSearch, FindsWhatALinearSearchFinds) {
    for (unsigned seed = 1; seed <= 600; ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        std::mt19937 random(seed);
        const auto pick = [&](long low, long high) { return std::uniform_int_distribution<long>(low, high)(random); };
        // Even spans, uneven ones, a few enormous ones, empty ones, and widths below 0.
        const long numSpans = pick(0, seed % 3 ? 40 : 400);
        const long longest = std::vector<long>{1, 3, 1000}[static_cast<std::size_t>(pick(0, 2))];
        const long shortest = std::vector<long>{1, 0, -2}[static_cast<std::size_t>(pick(0, 2))];
        std::vector<long> ends;
        for (long i = 0; i < numSpans; ++i)
            ends.push_back((ends.empty() ? 0 : ends.back()) + (pick(0, 30) ? pick(shortest, longest) : 100000));
        const auto endOf = [&](long i) { return i < 0 ? 0 : ends[static_cast<std::size_t>(i)]; };
        SpanSearch search;
        search.prepare(numSpans, endOf);
        const long total = numSpans ? ends.back() : 0;
        for (int question = 0; question < 300; ++question) {
            const long value = pick(-1, total + 2);
            const long from = pick(0, 3) ? 0 : pick(0, numSpans);
            long expected = from;
            while (expected < numSpans && endOf(expected) < value)
                ++expected;
            ASSERT_EQ(search.find(value, endOf, from), expected) << "value " << value << " from " << from;
        }
    }
}

TEST(AskedSet, HoldsWhatASetHolds) {
    for (unsigned seed = 1; seed <= 200; ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        std::mt19937 random(seed);
        const auto pick = [&](long low, long high) { return std::uniform_int_distribution<long>(low, high)(random); };
        const long numNodes = pick(0, 300);
        AskedSet set;
        std::set<long> expected;
        set.reset(numNodes);
        EXPECT_TRUE(set.isEmpty());
        for (int step = 0; step < 200; ++step) {
            if (pick(0, 9)) {
                const long idx = pick(0, 3) ? set.below() + pick(-1, 1) : pick(0, 1000);
                set.add(idx);
                if (idx >= 0) expected.insert(idx);
            } else {
                const long limit = pick(0, 40);
                set.addBelow(limit);
                for (long idx = 0; idx < limit; ++idx)
                    expected.insert(idx);
            }
        }
        for (long idx = -5; idx < 1100; ++idx)
            ASSERT_EQ(set.contains(idx), expected.count(idx) > 0) << idx;
        std::vector<long> visited;
        set.forEach([&](long idx) { visited.push_back(idx); });
        EXPECT_EQ(visited.size(), expected.size()) << "each once";
        EXPECT_EQ(std::set<long>(visited.begin(), visited.end()), expected);
        set.reset(numNodes);
        EXPECT_TRUE(set.isEmpty());
        EXPECT_FALSE(set.contains(0));
    }
}

} // namespace
