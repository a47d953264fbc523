// The predictive overflow test against its printed bounds and, where the two must agree, against the conversions.
#include "qltypes/conversion/OverflowPrediction_internal.h"

#include <gtest/gtest.h>

#include "tests/conversion/Reference.h"
#include "tests/conversion/Support.h"

namespace {

using namespace conversiontest;

template <class S>
bool expected(const std::vector<S>& values, int dstId, fxpModeRounding_tag rounding, bool complex = false) {
    return overflowExpected(values.data(), static_cast<int>(values.size() >> complex), idOf<S>, complex, dstId,
                            rounding);
}

struct BoundRow {
    fxpModeRounding_tag rounding;
    double aboveHighest; // added to the highest value
    bool aboveIsHit;     // the bound itself overflows
    double belowLowest;
    bool belowIsHit;
};

const BoundRow boundRows[] = {{FXP_ROUND_ZERO, 1, true, 1, true},          {FXP_ROUND_AS_ZERO, 1, true, 1, true},
                              {FXP_ROUND_HALF_UP, 0.5, true, 0.5, false},  {FXP_ROUND_CEILING, 0, false, 1, true},
                              {FXP_ROUND_FLOOR, 1, true, 0, false},        {FXP_ROUND_HALF_AWAY, 0.5, true, 0.5, true},
                              {FXP_ROUND_HALF_EVEN, 0.5, true, 0.5, false}};

template <class S, class D> void expectBounds(const BoundRow& row) {
    using Limits = std::numeric_limits<D>;
    const S above = static_cast<S>(Limits::max() + row.aboveHighest);
    const S below = static_cast<S>(Limits::min() - row.belowLowest);
    const auto hit = [&](S v) { return expected(std::vector<S>{v}, idOf<D>, row.rounding); };
    EXPECT_EQ(hit(above), row.aboveIsHit);
    EXPECT_TRUE(hit(std::nextafter(above, HUGE_VALF)));
    EXPECT_FALSE(hit(std::nextafter(above, -HUGE_VALF)));
    EXPECT_EQ(hit(below), row.belowIsHit);
    EXPECT_TRUE(hit(std::nextafter(below, -HUGE_VALF)));
    EXPECT_FALSE(hit(std::nextafter(below, HUGE_VALF)));
    EXPECT_TRUE(hit(HUGE_VALF));
    EXPECT_TRUE(hit(-HUGE_VALF));
    EXPECT_FALSE(hit(std::nanf("")));
    EXPECT_FALSE(hit(-std::nanf("")));
    EXPECT_FALSE(hit(std::numeric_limits<S>::signaling_NaN()));
    EXPECT_FALSE(hit(0));
    EXPECT_FALSE(hit(S(-0.0)));
}

TEST(OverflowPrediction, BoundsOfFloatingSourcesAreThePrintedOnes) {
    onEachLevel([](const Level& level) {
        for (const BoundRow& row : boundRows)
            forEachType([&]<class D> {
                SCOPED_TRACE(std::string(level.name) + ", " + roundingNames[row.rounding] + " to " +
                             typeNames[idOf<D>]);
                if constexpr (isInteger<D>) {
                    expectBounds<double, D>(row);
                    expectBounds<float, D>(row);
                }
            });
    });
}

// With bounds that the source holds exactly, a hit is a value whose rounding leaves the range.
TEST(OverflowPrediction, AHitIsAValueWhoseRoundingLeavesTheRange) {
    onEachLevel([](const Level& level) {
        SCOPED_TRACE(level.name);
        const auto compare = [&]<class S, class D>(const std::vector<S>& values) {
            for (const S v : values) {
                const reference::Analysed analysed = reference::analysed(v);
                for (const fxpModeRounding_tag rounding : allRoundings) {
                    const reference::Whole& whole = analysed.roundings[rounding];
                    const bool inRange = analysed.value.kind == reference::Kind::nan ||
                                         (analysed.value.kind == reference::Kind::finite &&
                                          reference::atLeast(whole, std::numeric_limits<D>::min()) &&
                                          reference::atMost(whole, std::numeric_limits<D>::max()));
                    ASSERT_EQ(expected(std::vector<S>{v}, idOf<D>, rounding), !inRange)
                        << typeNames[idOf<D>] << ", " << roundingNames[rounding] << ": " << elementText(v);
                }
            }
        };
        forEachType([&]<class D> {
            if constexpr (isInteger<D>) {
                compare.operator()<double, D>(specialValues<double>());
                if constexpr (sizeof(D) < 4) compare.operator()<float, D>(specialValues<float>());
            }
        });
    });
}

// Kept: in single precision the bounds of 32-bit destinations are rounded.
TEST(OverflowPrediction, SinglesInto32BitsFollowTheRoundedBounds) {
    onEachLevel([](const Level&) {
        for (const fxpModeRounding_tag rounding : allRoundings) {
            SCOPED_TRACE(roundingNames[rounding]);
            const bool lowestHits = rounding == FXP_ROUND_ZERO || rounding == FXP_ROUND_AS_ZERO ||
                                    rounding == FXP_ROUND_CEILING || rounding == FXP_ROUND_HALF_AWAY;
            EXPECT_EQ(expected(std::vector{-2147483648.0F}, 6, rounding), lowestHits);
            EXPECT_TRUE(expected(std::vector{std::nextafterf(-2147483648.0F, -HUGE_VALF)}, 6, rounding));
            EXPECT_EQ(expected(std::vector{2147483648.0F}, 6, rounding), rounding != FXP_ROUND_CEILING);
            EXPECT_EQ(expected(std::vector{4294967296.0F}, 7, rounding), rounding != FXP_ROUND_CEILING);
            EXPECT_FALSE(expected(std::vector{std::nextafterf(4294967296.0F, 0)}, 7, rounding));
        }
    });
}

template <class S, class D> void integersOverflowOutsideTheRange(const Level& level) {
    if constexpr (isInteger<S> && isInteger<D>) {
        constexpr bool examined = overflowMatters<S, D>;
        for (const S v : specialValues<S>())
            ASSERT_EQ(expected(std::vector<S>{v}, idOf<D>, FXP_ROUND_ZERO), examined && !std::in_range<D>(v))
                << level.name << ": " << typeNames[idOf<S>] << " to " << typeNames[idOf<D>] << " of "
                << std::int64_t{v};
    }
}

TEST(OverflowPrediction, IntegersOverflowOutsideTheRange) {
    onEachLevel([](const Level& level) {
        forEachType([&]<class S> { forEachType([&]<class D> { integersOverflowOutsideTheRange<S, D>(level); }); });
    });
}

TEST(OverflowPrediction, DoubleIntoSingleOverflowsWhereItBecomesInfinite) {
    onEachLevel([](const Level&) {
        for (const double v : specialValues<double>()) {
            const reference::Value value = reference::valueOf(v);
            const bool becomesInfinite = value.kind == reference::Kind::finite &&
                                         (reference::nearestSingleBits(value) & 0x7fffffff) == 0x7f800000;
            ASSERT_EQ(expected(std::vector{v}, 1, FXP_ROUND_ZERO), becomesInfinite) << elementText(v);
        }
    });
}

// Each type has room for the values 0 and 1; one value outside at each place of a long vector is found.
TEST(OverflowPrediction, AHitIsFoundAtEveryPlace) {
    onEachLevel([](const Level& level) {
        forEachType([&]<class S> {
            forEachType([&]<class D> {
                if constexpr (canOverflow<S, D>) {
                    std::vector<S> hits;
                    for (const S v : specialValues<S>())
                        if (expected(std::vector<S>{v}, idOf<D>, FXP_ROUND_FLOOR)) hits.push_back(v);
                    ASSERT_FALSE(hits.empty());
                    std::vector<S> values(300);
                    for (std::size_t i = 0; i < values.size(); ++i)
                        values[i] = static_cast<S>(i % 2);
                    EXPECT_FALSE(expected(values, idOf<D>, FXP_ROUND_FLOOR));
                    for (std::size_t place = 0; place < values.size(); ++place) {
                        const S before = std::exchange(values[place], hits[place * 31 % hits.size()]);
                        ASSERT_TRUE(expected(values, idOf<D>, FXP_ROUND_FLOOR))
                            << level.name << ": " << typeNames[idOf<S>] << " to " << typeNames[idOf<D>] << " at "
                            << place;
                        ASSERT_EQ(expected(values, idOf<D>, FXP_ROUND_FLOOR, true), true);
                        values[place] = before;
                    }
                    for (std::size_t size = 0; size < 70; ++size) {
                        std::vector<S> few(values.begin(), values.begin() + static_cast<std::ptrdiff_t>(size));
                        ASSERT_FALSE(expected(few, idOf<D>, FXP_ROUND_FLOOR));
                        few.push_back(hits.front());
                        ASSERT_TRUE(expected(few, idOf<D>, FXP_ROUND_FLOOR));
                    }
                }
            });
        });
    });
}

TEST(OverflowPrediction, PairsWithoutARowNeverOverflow) {
    const std::vector<std::uint64_t> bits(8, ~std::uint64_t{0} << 62 >> 1);
    for (int src = -2; src < 12; ++src)
        for (int dst = -2; dst < 12; ++dst) {
            const bool numbers = src >= 0 && src < 8 && dst >= 0 && dst < 8;
            if (numbers && (overflowFlags[src][dst] || (src == 0 && dst == 1))) continue;
            EXPECT_FALSE(overflowExpected(bits.data(), 4, src, false, dst, FXP_ROUND_ZERO)) << src << " to " << dst;
        }
}

TEST(OverflowPrediction, CountsOfZeroAndBelowTouchNothing) {
    for (const int count : {0, -1, std::numeric_limits<int>::min()})
        EXPECT_FALSE(overflowExpected(nullptr, count, 0, true, 2, FXP_ROUND_ZERO));
}

TEST(OverflowPrediction, BothPartsOfComplexValuesCount) {
    const std::vector values = {1.0, 2.0, 3.0, 4.0, 5.0, 1000.0};
    EXPECT_TRUE(overflowExpected(values.data(), 3, 0, true, 2, FXP_ROUND_ZERO));
    EXPECT_FALSE(overflowExpected(values.data(), 3, 0, false, 2, FXP_ROUND_ZERO));
}

TEST(OverflowPrediction, UnknownRoundingModesNeverOverflow) {
    for (const int mode : {-1, 7, 100})
        EXPECT_FALSE(expected(std::vector{1e30}, 2, static_cast<fxpModeRounding_tag>(mode)));
}

} // namespace
