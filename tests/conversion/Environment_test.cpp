// The caller's floating-point rounding mode changes nothing but the plain conversions to single.
#include <cfenv>
#include <cstring>

#include <gtest/gtest.h>

#include "qltypes/conversion/BuiltInConversion.h"
#include "qltypes/conversion/OverflowPrediction_internal.h"
#include "tests/conversion/Support.h"

namespace {

using namespace conversiontest;

struct Direction {
    int mode;
    const char* name;
};
constexpr Direction directions[] = {{FE_UPWARD, "upward"}, {FE_DOWNWARD, "downward"}, {FE_TOWARDZERO, "toward zero"}};

class RoundingDirection {
  public:
    explicit RoundingDirection(int mode) : before_(std::fegetround()) { std::fesetround(mode); }
    ~RoundingDirection() { std::fesetround(before_); }

  private:
    int before_;
};

template <class S> std::vector<S> values() {
    std::vector<S> all = specialValues<S>();
    for (const S v : randomValues<S>(2000, 11))
        all.push_back(v);
    if constexpr (isFloating<S>)
        for (const S v : randomNumbersInRange<S>(2000, 12))
            all.push_back(v);
    return all;
}

template <class S, class D>
constexpr bool followsTheEnvironment = std::is_same_v<D, float> &&
                                       (std::is_same_v<S, double> || (isInteger<S> && sizeof(S) == 4));

template <class S, class D> struct Answers {
    std::vector<D> converted;
    std::vector<bool> kept; // element by element
    bool overflows;

    bool operator==(const Answers& other) const {
        return std::memcmp(converted.data(), other.converted.data(), converted.size() * sizeof(D)) == 0 &&
               kept == other.kept && overflows == other.overflows;
    }
};

template <class S, class D>
Answers<S, D> answersOf(const std::vector<S>& values, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow) {
    const BuiltInConvFcn convert = utGetQlBuiltinDtypeConvFcn(idOf<S>, idOf<D>, overflow, rounding);
    const auto run = [&](const S* src, D* dst, std::size_t count, bool check) {
        return convert(src, dst, count, count, false, false, check, idOf<S>, idOf<D>, overflow, rounding);
    };
    Answers<S, D> answers{std::vector<D>(values.size()), {}, false};
    run(values.data(), answers.converted.data(), values.size(), false);
    D one;
    if (rounding == FXP_ROUND_ZERO && overflow == FXP_OVERFLOW_WRAP)
        for (const S& v : values)
            answers.kept.push_back(run(&v, &one, 1, true));
    answers.overflows =
        overflowExpected(values.data(), static_cast<int>(values.size()), idOf<S>, false, idOf<D>, rounding);
    return answers;
}

TEST(ConversionEnvironment, EveryCellGivesTheSameInEveryRoundingMode) {
    onEachLevel([](const Level& level) {
        forEachType([&]<class S> {
            const std::vector<S> all = values<S>();
            forEachType([&]<class D> {
                for (const fxpModeRounding_tag rounding : allRoundings)
                    for (const fxpModeOverflow_tag overflow : allOverflows) {
                        if (!roundingMatters<S, D> && rounding != FXP_ROUND_ZERO) continue;
                        if (!overflowMatters<S, D> && overflow != FXP_OVERFLOW_WRAP) continue;
                        const Answers<S, D> expected = answersOf<S, D>(all, rounding, overflow);
                        for (const Direction& direction : directions) {
                            const RoundingDirection set(direction.mode);
                            Answers<S, D> found = answersOf<S, D>(all, rounding, overflow);
                            if (followsTheEnvironment<S, D>) found.converted = expected.converted;
                            EXPECT_TRUE(found == expected) << combinationName(idOf<S>, idOf<D>, rounding, overflow)
                                                           << ", level " << level.name << ", " << direction.name;
                        }
                    }
            });
        });
    });
}

TEST(ConversionEnvironment, PlainConversionsToSingleFollowIt) {
    onEachLevel([](const Level& level) {
        for (const std::size_t count : {1, 100}) {
            SCOPED_TRACE(std::string(level.name) + ", " + std::to_string(count));
            const std::vector<double> doubles(count, 0.1);
            const std::vector<std::int32_t> ints(count, 16777217);
            const std::vector<std::uint32_t> unsignedInts(count, 0xfffffff1U);
            const auto last = [&](const void* src, int srcId) {
                std::vector<float> singles(count);
                utGetQlBuiltinDtypeConvFcn(srcId, 1, FXP_OVERFLOW_WRAP,
                                           FXP_ROUND_ZERO)(src, singles.data(), count, count, false, false, false,
                                                           srcId, 1, FXP_OVERFLOW_WRAP, FXP_ROUND_ZERO);
                return singles.back();
            };
            for (const bool upward : {false, true}) {
                const RoundingDirection set(upward ? FE_UPWARD : FE_DOWNWARD);
                EXPECT_EQ(last(doubles.data(), 0), upward ? 0x1.99999ap-4F : 0x1.999998p-4F);
                EXPECT_EQ(last(ints.data(), 6), upward ? 16777218.0F : 16777216.0F);
                EXPECT_EQ(last(unsignedInts.data(), 7), upward ? 4294967296.0F : 4294967040.0F);
            }
        }
    });
}

} // namespace
