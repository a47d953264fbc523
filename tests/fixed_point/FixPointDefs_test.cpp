#include <cmath>
#include <cstddef>
#include <limits>
#include <type_traits>

#include <gtest/gtest.h>

#include "qltypes/fixed_point/FixPointDefs.h"

namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double notANumber = std::numeric_limits<double>::quiet_NaN();
constexpr double largest = std::numeric_limits<double>::max();

TEST(FixPointDefs, RecordIsAPlainValueInFieldOrder) {
    static_assert(std::is_trivially_copyable_v<fxpDataTypeProp> && std::is_aggregate_v<fxpDataTypeProp>);
    static_assert(std::is_standard_layout_v<fxpDataTypeProp>);
    static_assert(offsetof(fxpDataTypeProp, DataTypeMode) == 0);
    static_assert(offsetof(fxpDataTypeProp, Signedness) == 4);
    static_assert(offsetof(fxpDataTypeProp, WordLength) == 8);
    static_assert(offsetof(fxpDataTypeProp, ExponentLength) == 12);
    static_assert(offsetof(fxpDataTypeProp, FixedExponent) == 16);
    static_assert(offsetof(fxpDataTypeProp, SlopeAdjustmentFactor) == 24);
    static_assert(offsetof(fxpDataTypeProp, Bias) == 32);
    static_assert(offsetof(fxpDataTypeProp, DataTypeOverrideOff) == 40);
    static_assert(sizeof(fxpDataTypeProp) == 48);
    static_assert(sizeof(fxpModeDataType) == 4 && sizeof(fxpModeRounding_tag) == 4 && sizeof(fxpModeOverflow_tag) == 4);
}

TEST(FixPointDefs, WordLengthIsAboveZero) {
    for (const int good : {1, 2, 64, 65, 128, 1000000, 2147483647})
        EXPECT_TRUE(fxpDataTypeProp::preValidateWordLength(good)) << good;
    for (const int bad : {0, -1, -2147483647 - 1})
        EXPECT_FALSE(fxpDataTypeProp::preValidateWordLength(bad)) << bad;
    for (const unsigned int good : {1u, 1000000u, 2147483648u, 4294967295u})
        EXPECT_TRUE(fxpDataTypeProp::preValidateWordLength(good)) << good;
    EXPECT_FALSE(fxpDataTypeProp::preValidateWordLength(0u));
}

TEST(FixPointDefs, FactorIsFromOneToBelowTwo) {
    for (const double good : {1.0, std::nextafter(1.0, 2.0), 1.5, std::nextafter(2.0, 1.0)})
        EXPECT_TRUE(fxpDataTypeProp::preValidateSlopeAdjustmentFactor(good)) << good;
    for (const double bad : {std::nextafter(1.0, 0.0), 2.0, 0.0, -0.0, -1.0, -1.5, infinity, -infinity, notANumber})
        EXPECT_FALSE(fxpDataTypeProp::preValidateSlopeAdjustmentFactor(bad)) << bad;
}

TEST(FixPointDefs, TotalSlopeIsFiniteAndAboveZero) {
    for (const double good : {1e-300, 5e-324, 1.0, 2.0, largest})
        EXPECT_TRUE(fxpDataTypeProp::preValidateTotalSlope(good)) << good;
    for (const double bad : {0.0, -0.0, -1e-300, -1.0, infinity, -infinity, notANumber})
        EXPECT_FALSE(fxpDataTypeProp::preValidateTotalSlope(bad)) << bad;
}

TEST(FixPointDefs, BiasIsFinite) {
    for (const double good : {0.0, -0.0, 1.5, largest, -1.7976931348623157e+308})
        EXPECT_TRUE(fxpDataTypeProp::preValidateBias(good)) << good;
    for (const double bad : {infinity, -infinity, notANumber})
        EXPECT_FALSE(fxpDataTypeProp::preValidateBias(bad)) << bad;
}

constexpr fxpModeDataType unknownMode = static_cast<fxpModeDataType>(6);

struct ComboRow {
    const char* what;
    bool makesSense;
    fxpDataTypeProp prop;
};

// clang-format off
constexpr ComboRow comboRows[] = {
    {"plain integer",                true,  {FXP_DT_FIXPT, 1, 16, 0, 0, 1.0, 0.0, 0}},
    {"fully scaled",                 true,  {FXP_DT_FIXPT, 0, 16, 0, -7, 1.5, -3.25, 0}},
    {"open sign",                    true,  {FXP_DT_FIXPT, 2, 16, 0, 0, 1.0, 0.0, 0}},
    {"kept: any sign",               true,  {FXP_DT_FIXPT, 7, 16, 0, 0, 1.0, 0.0, 0}},
    {"any exponent",                 true,  {FXP_DT_FIXPT, 1, 16, 0, 2147483647, 1.0, 0.0, 0}},
    {"a million bits",               true,  {FXP_DT_FIXPT, 1, 1000000, 0, 0, 1.0, 0.0, 0}},
    {"override off is not looked at",true,  {FXP_DT_FIXPT, 1, 16, 0, 0, 1.0, 0.0, 77}},
    {"no bits",                      false, {FXP_DT_FIXPT, 1, 0, 0, 0, 1.0, 0.0, 0}},
    {"factor two",                   false, {FXP_DT_FIXPT, 1, 16, 0, 0, 2.0, 0.0, 0}},
    {"exponent bits",                false, {FXP_DT_FIXPT, 1, 16, 1, 0, 1.0, 0.0, 0}},
    {"infinite bias",                false, {FXP_DT_FIXPT, 1, 16, 0, 0, 1.0, infinity, 0}},
    {"scaled double",                true,  {FXP_DT_SCALED_DOUBLE, 0, 8, 0, 3, 1.5, 2.0, 0}},
    {"scaled double, any sign",      true,  {FXP_DT_SCALED_DOUBLE, 7, 8, 0, 3, 1.5, 2.0, 0}},
    {"scaled double, factor",        false, {FXP_DT_SCALED_DOUBLE, 0, 8, 0, 3, 0.5, 2.0, 0}},
    {"scaled double, exponent bits", false, {FXP_DT_SCALED_DOUBLE, 0, 64, 11, 0, 1.0, 0.0, 0}},
    {"scaled double, no bits",       false, {FXP_DT_SCALED_DOUBLE, 1, 0, 0, 0, 1.0, 0.0, 0}},
    {"scaled double, NaN bias",      false, {FXP_DT_SCALED_DOUBLE, 1, 8, 0, 0, 1.0, notANumber, 0}},
    {"double",                       true,  {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 0.0, 0}},
    {"double, width",                false, {FXP_DT_DOUBLE, 1, 32, 11, 0, 1.0, 0.0, 0}},
    {"double, exponent bits",        false, {FXP_DT_DOUBLE, 1, 64, 8, 0, 1.0, 0.0, 0}},
    {"double, sign",                 false, {FXP_DT_DOUBLE, 0, 64, 11, 0, 1.0, 0.0, 0}},
    {"double, exponent",             false, {FXP_DT_DOUBLE, 1, 64, 11, 1, 1.0, 0.0, 0}},
    {"double, factor",               false, {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.5, 0.0, 0}},
    {"double, bias",                 false, {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 1.0, 0}},
    {"single",                       true,  {FXP_DT_SINGLE, 1, 32, 8, 0, 1.0, 0.0, 0}},
    {"single, width",                false, {FXP_DT_SINGLE, 1, 64, 8, 0, 1.0, 0.0, 0}},
    {"single, exponent bits",        false, {FXP_DT_SINGLE, 1, 32, 11, 0, 1.0, 0.0, 0}},
    {"single, sign",                 false, {FXP_DT_SINGLE, 0, 32, 8, 0, 1.0, 0.0, 0}},
    {"single, scaling",              false, {FXP_DT_SINGLE, 1, 32, 8, -1, 1.0, 0.0, 0}},
    {"boolean",                      true,  {FXP_DT_BOOLEAN, 0, 8, 0, 0, 1.0, 0.0, 0}},
    {"boolean, width",               false, {FXP_DT_BOOLEAN, 0, 1, 0, 0, 1.0, 0.0, 0}},
    {"boolean, sign",                false, {FXP_DT_BOOLEAN, 1, 8, 0, 0, 1.0, 0.0, 0}},
    {"boolean, exponent bits",       false, {FXP_DT_BOOLEAN, 0, 8, 1, 0, 1.0, 0.0, 0}},
    {"boolean, bias",                false, {FXP_DT_BOOLEAN, 0, 8, 0, 0, 1.0, 1.0, 0}},
    {"half",                         true,  {FXP_DT_CUSTOM_FLOAT, 1, 16, 5, 0, 1.0, 0.0, 0}},
    {"half unsigned",                false, {FXP_DT_CUSTOM_FLOAT, 0, 16, 5, 0, 1.0, 0.0, 0}},
    {"half scaled",                  false, {FXP_DT_CUSTOM_FLOAT, 1, 16, 5, 0, 1.5, 0.0, 0}},
    {"half, 4 exponent bits",        false, {FXP_DT_CUSTOM_FLOAT, 1, 16, 4, 0, 1.0, 0.0, 0}},
    {"8 bits, 5 exponent bits",      true,  {FXP_DT_CUSTOM_FLOAT, 1, 8, 5, 0, 1.0, 0.0, 0}},
    {"8 bits, 4: x is 7, bound 4",   true,  {FXP_DT_CUSTOM_FLOAT, 1, 8, 4, 0, 1.0, 0.0, 0}},
    {"8 bits, 3: x is 8, bound 4",   false, {FXP_DT_CUSTOM_FLOAT, 1, 8, 3, 0, 1.0, 0.0, 0}},
    {"8 bits, 6: one bit left",      true,  {FXP_DT_CUSTOM_FLOAT, 1, 8, 6, 0, 1.0, 0.0, 0}},
    {"8 bits, 7: none left",         false, {FXP_DT_CUSTOM_FLOAT, 1, 8, 7, 0, 1.0, 0.0, 0}},
    {"x is 16, a power of two",      true,  {FXP_DT_CUSTOM_FLOAT, 1, 18, 5, 0, 1.0, 0.0, 0}},
    {"x is 17",                      false, {FXP_DT_CUSTOM_FLOAT, 1, 19, 5, 0, 1.0, 0.0, 0}},
    {"x is 0: minus infinity",       false, {FXP_DT_CUSTOM_FLOAT, 1, 8, 11, 0, 1.0, 0.0, 0}},
    {"x is below 0: NaN",            false, {FXP_DT_CUSTOM_FLOAT, 1, 8, 12, 0, 1.0, 0.0, 0}},
    {"x is below 0, wraps to 0",     false, {FXP_DT_CUSTOM_FLOAT, 1, 8, 4294967295u, 0, 1.0, 0.0, 0}},
    {"custom float, no bits",        false, {FXP_DT_CUSTOM_FLOAT, 1, 0, 2, 0, 1.0, 0.0, 0}},
    {"quadruple",                    true,  {FXP_DT_CUSTOM_FLOAT, 1, 128, 15, 0, 1.0, 0.0, 0}},
    {"double as a custom float",     true,  {FXP_DT_CUSTOM_FLOAT, 1, 64, 11, 0, 1.0, 0.0, 0}},
    {"unknown mode",                 false, {unknownMode, 1, 16, 0, 0, 1.0, 0.0, 0}},
    {"negative mode",                false, {static_cast<fxpModeDataType>(-1), 1, 16, 0, 0, 1.0, 0.0, 0}},
};
// clang-format on

TEST(FixPointDefs, ComboAsTheRowsSay) {
    for (const ComboRow& row : comboRows) {
        SCOPED_TRACE(row.what);
        const fxpDataTypeProp& p = row.prop;
        EXPECT_EQ(p.validateFxpDTProp(), row.makesSense);
        EXPECT_EQ(fxpDataTypeProp::preValidateCombo(p.DataTypeMode, p.Signedness, p.WordLength, p.SlopeAdjustmentFactor,
                                                    p.ExponentLength, p.FixedExponent, p.Bias),
                  row.makesSense);
        EXPECT_EQ(fxpDataTypeProp::preValidateCombo(p.DataTypeMode, p.Signedness, unsigned(p.WordLength),
                                                    p.SlopeAdjustmentFactor, p.ExponentLength, p.FixedExponent, p.Bias),
                  row.makesSense);
    }
}

TEST(FixPointDefs, OverloadsDifferAboveTheSignedRange) {
    const auto combo = [](auto wordLength, fxpModeDataType mode, unsigned int exponentLength) {
        return fxpDataTypeProp::preValidateCombo(mode, 1, wordLength, 1.0, exponentLength, 0, 0.0);
    };
    EXPECT_FALSE(combo(-1, FXP_DT_FIXPT, 0));
    EXPECT_TRUE(combo(4294967295u, FXP_DT_FIXPT, 0));
    // Widened as unsigned, 2^32 - 1 + 3 - 33 is just below 2^32, so 33 exponent bits are enough.
    EXPECT_FALSE(combo(-1, FXP_DT_CUSTOM_FLOAT, 33));
    EXPECT_TRUE(combo(4294967295u, FXP_DT_CUSTOM_FLOAT, 33));
    EXPECT_FALSE(combo(4294967295u, FXP_DT_CUSTOM_FLOAT, 32));
}

std::string printedBy(void (*print)(const fxpDataTypeProp*), const fxpDataTypeProp& prop) {
    testing::internal::CaptureStdout();
    print(&prop);
    std::fflush(stdout);
    return testing::internal::GetCapturedStdout();
}

TEST(FixPointDefs, DumpInLines) {
    EXPECT_EQ(printedBy(displayFxpDTP, {FXP_DT_FIXPT, 2, -16, 99, -7, 1.5, -0.1, 1}),
              "\nDataTypeMode        0   FXP_DT_FIXPT\n"
              "Signedness            2\n"
              "WordLength            -16\n"
              "SlopeAdjustmentFactor        1.5000000000000000\n"
              "FixedExponent         -7\n"
              "Bias                       -0.10000000000000001\n"
              "\n");
}

TEST(FixPointDefs, DumpInOneLine) {
    EXPECT_EQ(printedBy(displayFxpDTPFlat, {FXP_DT_SCALED_DOUBLE, 1, 8, 99, 3, 1.25, 1e300, 1}),
              "\nMode=1(FXP_DT_SCALED_DOUBLE)  Signed=1  WL=8  SAF=       1.2500000000000000  FE=3  "
              "B=  1.0000000000000001e+300\n");
}

TEST(FixPointDefs, DumpNamesEachMode) {
    const char* const names[] = {"0   FXP_DT_FIXPT",  "1   FXP_DT_SCALED_DOUBLE", "2   FXP_DT_DOUBLE",
                                 "3   FXP_DT_SINGLE", "4   FXP_DT_BOOLEAN",       "5   FXP_DT_CUSTOM_FLOAT",
                                 "6   UNKNOWN"};
    for (int mode = 0; mode < 7; ++mode) {
        const fxpDataTypeProp prop{static_cast<fxpModeDataType>(mode), 1, 16, 0, 0, 1.0, 0.0, 0};
        const std::string text = printedBy(displayFxpDTP, prop);
        EXPECT_TRUE(text.starts_with(std::string("\nDataTypeMode        ") + names[mode] + "\n")) << text;
    }
}

TEST(FixPointDefs, PreAssertPrintsOnlyOnFailure) {
    testing::internal::CaptureStdout();
    EXPECT_TRUE(fxpDtpPreAssert(true, nullptr));
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");

    const fxpDataTypeProp prop{FXP_DT_BOOLEAN, 0, 8, 0, 0, 1.0, 0.0, 0};
    const std::string dump = printedBy(displayFxpDTP, prop);
    const std::string text = printedBy([](const fxpDataTypeProp* p) { EXPECT_FALSE(fxpDtpPreAssert(false, p)); }, prop);
    EXPECT_EQ(text, "Data Type Assertion\n" + dump);
}

} // namespace
