// The matrix itself: which combinations differ, which share a function, and the cells' showpieces.
#include "qltypes/conversion/BuiltInConversion.h"

#include <set>

#include <gtest/gtest.h>

#include "qltypes/conversion/CheckedConversion.h"
#include "tests/conversion/Support.h"

namespace {

using namespace conversiontest;

constexpr int none = 0; // the id of double, where an argument is not read

// clang-format off
constexpr int roundingFlagTable[9][9] = {
    {0, 0, 1, 1, 1, 1, 1, 1, 0}, // double
    {0, 0, 1, 1, 1, 1, 1, 1, 0}, // single
    {0, 0, 0, 0, 0, 0, 0, 0, 0},
    {0, 0, 0, 0, 0, 0, 0, 0, 0},
    {0, 0, 0, 0, 0, 0, 0, 0, 0},
    {0, 0, 0, 0, 0, 0, 0, 0, 0},
    {0, 0, 0, 0, 0, 0, 0, 0, 0},
    {0, 0, 0, 0, 0, 0, 0, 0, 0},
    {0, 0, 0, 0, 0, 0, 0, 0, 0},
};

constexpr int overflowFlagTable[9][9] = {
    // double single int8 uint8 int16 uint16 int32 uint32 boolean
    {0, 0, 1, 1, 1, 1, 1, 1, 0}, // double
    {0, 0, 1, 1, 1, 1, 1, 1, 0}, // single
    {0, 0, 0, 1, 0, 1, 0, 1, 0}, // int8
    {0, 0, 1, 0, 0, 0, 0, 0, 0}, // uint8
    {0, 0, 1, 1, 0, 1, 0, 1, 0}, // int16
    {0, 0, 1, 1, 1, 0, 0, 0, 0}, // uint16
    {0, 0, 1, 1, 1, 1, 0, 1, 0}, // int32
    {0, 0, 1, 1, 1, 1, 1, 0, 0}, // uint32
    {0, 0, 0, 0, 0, 0, 0, 0, 0}, // boolean
};

// Where the check is asked but nothing can be lost.
constexpr int neverLosesTable[9][9] = {
    {1, 0, 0, 0, 0, 0, 0, 0, 0}, // double
    {1, 1, 0, 0, 0, 0, 0, 0, 0}, // single
    {1, 1, 1, 0, 1, 0, 1, 0, 0}, // int8
    {1, 1, 0, 1, 1, 1, 1, 1, 0}, // uint8
    {1, 1, 0, 0, 1, 0, 1, 0, 0}, // int16
    {1, 1, 0, 0, 0, 1, 1, 1, 0}, // uint16
    {1, 0, 0, 0, 0, 0, 1, 0, 0}, // int32
    {1, 0, 0, 0, 0, 0, 0, 1, 0}, // uint32
    {1, 1, 1, 1, 1, 1, 1, 1, 1}, // boolean
};
// clang-format on

TEST(ConversionMatrix, FlagsAreThePrintedOnes) {
    for (int src = 0; src < 9; ++src)
        for (int dst = 0; dst < 9; ++dst) {
            SCOPED_TRACE(std::string(typeNames[src]) + " to " + typeNames[dst]);
            EXPECT_EQ(roundingFlags[src][dst], roundingFlagTable[src][dst]);
            EXPECT_EQ(overflowFlags[src][dst], overflowFlagTable[src][dst]);
        }
}

TEST(ConversionMatrix, CellsThatNeverLoseAreThePrintedOnes) {
    forEachType([]<class S> {
        forEachType([]<class D> {
            EXPECT_EQ((holdsEveryValue<S, D>()), neverLosesTable[idOf<S>][idOf<D>])
                << typeNames[idOf<S>] << " to " << typeNames[idOf<D>];
        });
    });
}

TEST(ConversionMatrix, OneFunctionACombinationThatDiffers) {
    for (int src = 0; src < 9; ++src)
        for (int dst = 0; dst < 9; ++dst) {
            SCOPED_TRACE(std::string(typeNames[src]) + " to " + typeNames[dst]);
            std::set<BuiltInConvFcn> functions;
            for (const fxpModeRounding_tag rounding : allRoundings)
                for (const fxpModeOverflow_tag overflow : allOverflows)
                    functions.insert(utGetQlBuiltinDtypeConvFcn(src, dst, overflow, rounding));
            const std::size_t roundings = roundingFlagTable[src][dst] ? 6 : 1;
            const std::size_t overflows = overflowFlagTable[src][dst] ? 2 : 1;
            EXPECT_EQ(functions.size(), roundings * overflows);
            EXPECT_FALSE(functions.contains(nullptr));
            for (const fxpModeOverflow_tag overflow : allOverflows)
                EXPECT_EQ(utGetQlBuiltinDtypeConvFcn(src, dst, overflow, FXP_ROUND_AS_ZERO),
                          utGetQlBuiltinDtypeConvFcn(src, dst, overflow, FXP_ROUND_ZERO));
        }
}

TEST(ConversionMatrix, BooleansAreReadByTheFunctionsOfUint8) {
    for (const int dst : {0, 1, 3, 4, 5, 6, 7})
        EXPECT_EQ(utGetQlBuiltinDtypeConvFcn(8, dst, FXP_OVERFLOW_WRAP, FXP_ROUND_ZERO),
                  utGetQlBuiltinDtypeConvFcn(3, dst, FXP_OVERFLOW_WRAP, FXP_ROUND_ZERO));
    EXPECT_EQ(utGetQlBuiltinDtypeConvFcn(8, 8, FXP_OVERFLOW_WRAP, FXP_ROUND_ZERO),
              utGetQlBuiltinDtypeConvFcn(3, 3, FXP_OVERFLOW_WRAP, FXP_ROUND_ZERO));
}

template <class D> struct Result {
    D value;
    bool kept;
};

template <class S, class D> Result<D> convertOne(S v, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow) {
    Result<D> result{};
    result.kept = qlConvertBuiltInDTypeVectWithCheck(&v, 1, idOf<S>, false, &result.value, 1, idOf<D>, false, overflow,
                                                     rounding, true);
    return result;
}

constexpr auto saturate = FXP_OVERFLOW_SATURATE;
constexpr auto wrap = FXP_OVERFLOW_WRAP;
const double infinity = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();

struct NumberRow {
    int srcId;
    int dstId;
    fxpModeRounding_tag rounding;
    fxpModeOverflow_tag overflow;
    double from;
    double to;
    bool kept;
};

// clang-format off
const NumberRow numberRows[] = {
    {0, 2, FXP_ROUND_ZERO, saturate, 127.9, 127, false},
    {0, 2, FXP_ROUND_ZERO, saturate, -128.9, -128, false},
    {0, 2, FXP_ROUND_ZERO, saturate, nan, 0, false},
    {0, 2, FXP_ROUND_ZERO, saturate, infinity, 127, false},
    {0, 2, FXP_ROUND_ZERO, saturate, -infinity, -128, false},
    {0, 2, FXP_ROUND_ZERO, wrap, 128.5, -128, false},
    {0, 2, FXP_ROUND_ZERO, wrap, -128.5, -128, false},
    {0, 2, FXP_ROUND_ZERO, wrap, 255.9, -1, false},
    {0, 2, FXP_ROUND_ZERO, wrap, 256.0, 0, false},
    {0, 2, FXP_ROUND_ZERO, wrap, infinity, 0, false},
    {0, 3, FXP_ROUND_ZERO, saturate, -0.4, 0, false},
    {0, 3, FXP_ROUND_FLOOR, saturate, -0.4, 0, false},
    {0, 3, FXP_ROUND_HALF_EVEN, saturate, -0.4, 0, false},
    {0, 3, FXP_ROUND_HALF_UP, saturate, 254.6, 255, false},
    {0, 3, FXP_ROUND_CEILING, saturate, 254.6, 255, false},
    {0, 3, FXP_ROUND_HALF_AWAY, saturate, 254.6, 255, false},
    {0, 3, FXP_ROUND_FLOOR, saturate, 254.6, 254, false},
    {0, 3, FXP_ROUND_ZERO, saturate, 254.6, 254, false},
    {0, 3, FXP_ROUND_FLOOR, wrap, -0.5, 255, false},
    {0, 3, FXP_ROUND_CEILING, wrap, -0.5, 0, false},
    {0, 6, FXP_ROUND_HALF_UP, wrap, 2147483647.5, -2147483648.0, false},
    {0, 7, FXP_ROUND_ZERO, saturate, 4294967295.0, 4294967295.0, true},
    {0, 7, FXP_ROUND_ZERO, saturate, 4294967296.0, 4294967295.0, false},
    {1, 6, FXP_ROUND_ZERO, saturate, 2147483648.0, 2147483647.0, false},
    {1, 7, FXP_ROUND_ZERO, saturate, 4294967296.0, 4294967295.0, false},
    {0, 6, FXP_ROUND_HALF_UP, saturate, 0.49999999999999994, 0, false},
    {0, 6, FXP_ROUND_HALF_AWAY, saturate, 0.49999999999999994, 0, false},
    {0, 6, FXP_ROUND_HALF_UP, wrap, -2.5, -2, false},
    {0, 6, FXP_ROUND_HALF_UP, wrap, 2.5, 3, false},
    {0, 6, FXP_ROUND_HALF_EVEN, wrap, 0.5, 0, false},
    {0, 6, FXP_ROUND_HALF_EVEN, wrap, 1.5, 2, false},
    {0, 6, FXP_ROUND_HALF_EVEN, wrap, 2.5, 2, false},
    {0, 6, FXP_ROUND_HALF_EVEN, wrap, -1.5, -2, false},
    {0, 6, FXP_ROUND_HALF_EVEN, wrap, -2.5, -2, false},
    {0, 2, FXP_ROUND_FLOOR, wrap, -0.0, 0, true},
    {0, 1, FXP_ROUND_ZERO, wrap, 1e39, infinity, false},
    {0, 1, FXP_ROUND_ZERO, wrap, infinity, infinity, true},
    {0, 1, FXP_ROUND_ZERO, wrap, 0.5, 0.5, true},
    {6, 1, FXP_ROUND_ZERO, wrap, 16777217, 16777216, false},
    {6, 1, FXP_ROUND_ZERO, wrap, 2147483647, 2147483648.0, false},
    {7, 1, FXP_ROUND_ZERO, wrap, 4294967295.0, 4294967296.0, false},
    {7, 1, FXP_ROUND_ZERO, wrap, 4294967040.0, 4294967040.0, true},
    {4, 1, FXP_ROUND_ZERO, wrap, 32767, 32767, true},
    {6, 2, FXP_ROUND_ZERO, saturate, 127, 127, true},
    {6, 2, FXP_ROUND_ZERO, saturate, -128, -128, true},
    {6, 2, FXP_ROUND_ZERO, saturate, 1000, 127, false},
    {6, 2, FXP_ROUND_ZERO, saturate, -1000, -128, false},
    {6, 2, FXP_ROUND_ZERO, wrap, 1000, -24, false},
    {7, 6, FXP_ROUND_ZERO, wrap, 4000000000.0, -294967296.0, false},
    {7, 6, FXP_ROUND_ZERO, saturate, 4000000000.0, 2147483647.0, false},
    {0, 8, FXP_ROUND_ZERO, wrap, 0.0, 0, true},
    {0, 8, FXP_ROUND_ZERO, wrap, -0.0, 0, true},
    {0, 8, FXP_ROUND_ZERO, wrap, nan, 1, false},
    {0, 8, FXP_ROUND_ZERO, wrap, 1.0, 1, true},
    {0, 8, FXP_ROUND_ZERO, wrap, 2.0, 1, false},
    {3, 8, FXP_ROUND_ZERO, wrap, 2, 1, false},
    {8, 0, FXP_ROUND_ZERO, wrap, 2, 2, true}, // kept: a byte is not normalised
    {8, 2, FXP_ROUND_ZERO, wrap, 200, -56, true},
    {8, 3, FXP_ROUND_ZERO, wrap, 200, 200, true},
    {8, 8, FXP_ROUND_ZERO, wrap, 2, 2, true},
};
// clang-format on

TEST(ConversionMatrix, ShowpiecesOfTheCells) {
    onEachLevel([](const Level& level) {
        for (const NumberRow& row : numberRows) {
            SCOPED_TRACE(combinationName(row.srcId, row.dstId, row.rounding, row.overflow) + " of " +
                         std::to_string(row.from) + ", level " + level.name);
            forEachType([&]<class S> {
                forEachType([&]<class D> {
                    if (idOf<S> != row.srcId || idOf<D> != row.dstId) return;
                    S from{};
                    if constexpr (isBoolean<S>)
                        from = static_cast<S>(static_cast<std::uint8_t>(row.from));
                    else
                        from = static_cast<S>(row.from);
                    const Result<D> result = convertOne<S, D>(from, row.rounding, row.overflow);
                    double found;
                    if constexpr (isBoolean<D>)
                        found = static_cast<std::uint8_t>(result.value);
                    else
                        found = static_cast<double>(result.value);
                    EXPECT_EQ(found, row.to);
                    EXPECT_EQ(result.kept, row.kept);
                });
            });
        }
    });
}

TEST(ConversionMatrix, CellsThatNeverLoseDoNotReportADroppedImaginaryPart) {
    const double source[] = {1.0, 5.0};
    double real = 0;
    std::int8_t narrow = 0;
    EXPECT_TRUE(utGetQlBuiltinDtypeConvFcn(0, 0, wrap, FXP_ROUND_ZERO)(source, &real, 1, 1, true, false, true, none,
                                                                       none, wrap, FXP_ROUND_ZERO)); // kept
    EXPECT_EQ(real, 1.0);
    EXPECT_FALSE(utGetQlBuiltinDtypeConvFcn(0, 2, wrap, FXP_ROUND_ZERO)(source, &narrow, 1, 1, true, false, true, none,
                                                                        none, wrap, FXP_ROUND_ZERO));
    EXPECT_EQ(narrow, 1);
}

TEST(ConversionMatrix, NullWithACountOfZeroIsHarmless) {
    for (int src = 0; src < 9; ++src)
        for (int dst = 0; dst < 9; ++dst)
            for (const bool check : {false, true})
                EXPECT_TRUE(qlConvertBuiltInDTypeVectWithCheck(nullptr, 0, src, false, nullptr, 0, dst, false, saturate,
                                                               FXP_ROUND_FLOOR, check));
}

} // namespace
