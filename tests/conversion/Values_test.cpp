// Every cell on every level against the reference: all values of 8 and 16 bits, boundaries with their neighbours, and a
// million random bit patterns for each cell with a floating source.
#include <cstring>

#include <gtest/gtest.h>

#include "qltypes/conversion/BuiltInConversion.h"
#include "tests/conversion/Reference.h"
#include "tests/conversion/Support.h"
#include "tests/support/Rounds.h"

namespace {

using namespace conversiontest;

template <class T> bool sameElement(T a, T b) {
    if constexpr (std::is_floating_point_v<T>)
        if (std::isnan(a) && std::isnan(b)) return true; // which NaN is not told
    return std::memcmp(&a, &b, sizeof(T)) == 0;
}

template <class S, class D>
void expectOnEachLevel(const std::vector<S>& values, const std::vector<D>& expected, fxpModeRounding_tag rounding,
                       fxpModeOverflow_tag overflow, std::vector<D>& found) {
    const BuiltInConvFcn convert = utGetQlBuiltinDtypeConvFcn(idOf<S>, idOf<D>, overflow, rounding);
    onEachLevel([&](const Level& level) {
        std::memset(found.data(), 0xa5, found.size() * sizeof(D));
        ASSERT_TRUE(convert(values.data(), found.data(), values.size(), values.size(), false, false, false, idOf<S>,
                            idOf<D>, overflow, rounding));
        if (std::memcmp(found.data(), expected.data(), values.size() * sizeof(D)) == 0) return;
        for (std::size_t i = 0; i < values.size(); ++i)
            ASSERT_TRUE(sameElement(found[i], expected[i]))
                << combinationName(idOf<S>, idOf<D>, rounding, overflow) << ", level " << level.name << ", element "
                << i << ": " << elementText(values[i]) << " gave " << elementText(found[i]) << " and not "
                << elementText(expected[i]);
    });
}

template <class S, class D>
void expectEveryMode(const std::vector<S>& values, const std::vector<reference::Analysed>& analysed) {
    std::vector<D> expected(values.size()), found(values.size());
    for (const fxpModeRounding_tag rounding : allRoundings) {
        if (rounding != FXP_ROUND_ZERO && !roundingMatters<S, D>) continue;
        for (const fxpModeOverflow_tag overflow : allOverflows) {
            if (overflow != FXP_OVERFLOW_WRAP && !overflowMatters<S, D>) continue;
            for (std::size_t i = 0; i < values.size(); ++i) {
                if constexpr (roundingMatters<S, D>)
                    expected[i] = reference::toInteger<D>(analysed[i], rounding, overflow);
                else
                    expected[i] = reference::convert<S, D>(values[i], rounding, overflow);
            }
            expectOnEachLevel(values, expected, rounding, overflow, found);
            if (testing::Test::HasFatalFailure()) return;
        }
    }
}

template <class S> void expectEveryCell(const std::vector<S>& values) {
    std::vector<reference::Analysed> analysed;
    if constexpr (isFloating<S>)
        for (const S v : values)
            analysed.push_back(reference::analysed(v));
    forEachType([&]<class D> {
        if (!testing::Test::HasFatalFailure()) expectEveryMode<S, D>(values, analysed);
    });
}

TEST(ConversionValues, SpecialValuesOfEveryCell) {
    forEachType([]<class S> {
        SCOPED_TRACE(typeNames[idOf<S>]);
        expectEveryCell(specialValues<S>());
    });
}

template <class S> void expectRandomPatterns() {
    constexpr std::size_t all = 1 << 20, block = 1 << 14;
    for (std::uint64_t seed = 1; seed <= testsupport::rounds(all / block) && !testing::Test::HasFatalFailure();
         ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        expectEveryCell(randomValues<S>(block, seed));
    }
}

TEST(ConversionValues, AMillionRandomPatternsOfDouble) { expectRandomPatterns<double>(); }
TEST(ConversionValues, AMillionRandomPatternsOfSingle) { expectRandomPatterns<float>(); }

TEST(ConversionValues, RandomNumbersNearTheRanges) {
    for (std::uint64_t seed = 1; seed <= testsupport::rounds(8u); ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        expectEveryCell(randomNumbersInRange<double>(1 << 13, seed));
        expectEveryCell(randomNumbersInRange<float>(1 << 13, seed));
        expectEveryCell(randomValues<std::int32_t>(1 << 13, seed));
        expectEveryCell(randomValues<std::uint32_t>(1 << 13, seed));
    }
}

} // namespace
