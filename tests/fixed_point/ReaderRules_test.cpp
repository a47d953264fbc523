#include <cmath>
#include <limits>
#include <locale>
#include <random>

#include <boost/lexical_cast.hpp>
#include <gtest/gtest.h>

#include "qltypes/fixed_point/ReaderRules_internal.h"
#include "tests/fixed_point/Props.h"
#include "tests/fixed_point/TextCases.h"

namespace {

constexpr int minInt = std::numeric_limits<int>::min();
constexpr int maxInt = std::numeric_limits<int>::max();

/// The integer, or nothing where boost::bad_lexical_cast is thrown.
template <class Read> std::optional<int> integerOf(Read read) {
    try {
        return read();
    } catch (const boost::bad_lexical_cast&) {
        return std::nullopt;
    }
}

void expectSameInteger(const std::string& text) {
    SCOPED_TRACE(shown(text));
    EXPECT_EQ(integerOf([&] { return FXP::lexicalInt(text); }),
              integerOf([&] { return boost::lexical_cast<int>(text); }));
}

TEST(ReaderRules, IntegersAreThoseOfLexicalCast) {
    using namespace std::literals;
    for (const std::string& text : {""s,
                                    "+"s,
                                    "-"s,
                                    "+-1"s,
                                    "-+1"s,
                                    "++1"s,
                                    "--1"s,
                                    "0"s,
                                    "-0"s,
                                    "+0"s,
                                    "7"s,
                                    "+7"s,
                                    "-7"s,
                                    "007"s,
                                    "-007"s,
                                    "2147483647"s,
                                    "2147483648"s,
                                    "-2147483648"s,
                                    "-2147483649"s,
                                    "+2147483647"s,
                                    "+2147483648"s,
                                    "00000000002147483647"s,
                                    "99999999999999999999"s,
                                    " 7"s,
                                    "7 "s,
                                    "7.0"s,
                                    "7e1"s,
                                    "0x7"s,
                                    "7\0"s,
                                    "\0"s,
                                    "1,000"s,
                                    "1'000"s})
        expectSameInteger(text);
}

TEST(ReaderRules, RandomIntegersAreThoseOfLexicalCast) {
    constexpr unsigned long long seed = 4711;
    SCOPED_TRACE(seed);
    std::mt19937_64 random(seed);
    constexpr std::string_view alphabet = "+-0123456789 .";
    for (int i = 0; i < 20000; ++i) {
        std::string text;
        for (std::size_t length = random() % 12; length > 0; --length)
            text += alphabet[random() % alphabet.size()];
        expectSameInteger(text);
    }
}

/// Groups digits by threes with points.
struct GroupingByPoints : std::numpunct<char> {
    char do_decimal_point() const override { return ','; }
    char do_thousands_sep() const override { return '.'; }
    std::string do_grouping() const override { return "\3"; }
};

TEST(ReaderRules, IntegersDoNotDependOnTheLocale) {
    const std::locale before = std::locale::global(std::locale(std::locale::classic(), new GroupingByPoints));
    EXPECT_EQ(FXP::lexicalInt("1000"), 1000);
    EXPECT_THROW(FXP::lexicalInt("1.000"), boost::bad_lexical_cast);
    std::locale::global(before);
}

struct FactorRow {
    double factor;
    int exponent;
    bool fits;
    double newFactor;
    int newExponent;
};

constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double notANumber = std::numeric_limits<double>::quiet_NaN();

// clang-format off
constexpr FactorRow factorRows[] = {
    {1.0,                   3,          true,  1.0,                3},
    {1.5,                   3,          true,  1.5,                3},
    {1.9999999999999998,    3,          true,  1.9999999999999998, 3},
    {2.0,                   3,          true,  1.0,                4},
    {3.0,                   3,          true,  1.5,                4},
    {0.5,                   3,          true,  1.0,                2},
    {0.75,                  3,          true,  1.5,                2},
    {0.99999999999999989,   3,          true,  1.9999999999999998, 2},
    {3.2,                   0,          true,  1.6,                1},
    {1000.0,                0,          true,  1.953125,           9},
    {0.1,                   0,          true,  1.6,                -4},
    {5e-324,                0,          true,  1.0,                -1074},
    {2.2250738585072014e-308, 0,        true,  1.0,                -1022},
    {1.7976931348623157e308, 0,         true,  1.9999999999999998, 1023},
    {0.0,                   3,          true,  0.0,                3},
    {-0.0,                  3,          true,  -0.0,               3},
    {-3.0,                  3,          true,  -3.0,               3},
    {infinity,              3,          true,  infinity,           3},
    {-infinity,             3,          true,  -infinity,          3},
    {notANumber,            3,          true,  notANumber,         3},
    {1.5,                   maxInt,     true,  1.5,                maxInt},
    {1.5,                   minInt,     true,  1.5,                minInt},
    {2.0,                   maxInt - 1, true,  1.0,                maxInt},
    {2.0,                   maxInt,     false, 2.0,                maxInt},
    {0.5,                   minInt + 1, true,  1.0,                minInt},
    {0.5,                   minInt,     false, 0.5,                minInt},
    {5e-324,                minInt + 9, false, 5e-324,             minInt + 9},
    {1e300,                 maxInt - 9, false, 1e300,              maxInt - 9},
};
// clang-format on

TEST(ReaderRules, FactorIsNormalizedWithinTheExponent) {
    for (const FactorRow& row : factorRows) {
        SCOPED_TRACE(testing::Message() << row.factor << " * 2^" << row.exponent);
        fxpDataTypeProp prop{FXP_DT_FIXPT, 1, 8, 0, row.exponent, row.factor, 0.0, 0};
        EXPECT_EQ(FXP::normalizeFactor(prop), row.fits);
        EXPECT_EQ(prop, (fxpDataTypeProp{FXP_DT_FIXPT, 1, 8, 0, row.newExponent, row.newFactor, 0.0, 0}));
    }
}

TEST(ReaderRules, RandomFactorsKeepTheirProduct) {
    constexpr unsigned long long seed = 99;
    SCOPED_TRACE(seed);
    std::mt19937_64 random(seed);
    for (int i = 0; i < 20000; ++i) {
        const double factor = std::fabs(randomDouble(random));
        if (!std::isfinite(factor) || factor == 0.0) continue;
        fxpDataTypeProp prop{FXP_DT_FIXPT, 1, 8, 0, 0, factor, 0.0, 0};
        ASSERT_TRUE(FXP::normalizeFactor(prop));
        ASSERT_TRUE(fxpDataTypeProp::preValidateSlopeAdjustmentFactor(prop.SlopeAdjustmentFactor)) << factor;
        ASSERT_EQ(std::ldexp(prop.SlopeAdjustmentFactor, prop.FixedExponent), factor);
    }
}

TEST(ReaderRules, AFailedReadingKeepsNothing) {
    FXP::ReadTexts<int> texts;
    EXPECT_THROW(FXP::readOnce(texts, "x", [](const std::string&) -> int { throw 1; }), int);
    EXPECT_TRUE(texts.empty());
    int numReadings = 0;
    const auto read = [&](const std::string& text) { return ++numReadings, static_cast<int>(text.size()); };
    const int& first = FXP::readOnce(texts, "abc", read);
    EXPECT_EQ(first, 3);
    EXPECT_EQ(&FXP::readOnce(texts, "abc", read), &first);
    EXPECT_EQ(numReadings, 1);
}

} // namespace
