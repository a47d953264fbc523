// Texts of dates and times, the fraction against exact integer arithmetic.
#include <cfenv>
#include <cmath>
#include <cstdlib>
#include <iterator>
#include <locale>
#include <random>

#include <boost/multiprecision/cpp_int.hpp>
#include <gtest/gtest.h>

#include "qlplatform/strings/Strings.h"
#include "qltypes/date_time/DateTimeStruct.h"

namespace {

using boost::multiprecision::cpp_int;
using QLDateTime::DateTimeStruct;

constexpr int cMostDigits = 25;

DateTimeStruct midnightAnd(unsigned long fraction) {
    DateTimeStruct t;
    t.fraction = fraction;
    return t;
}

std::string timeText(const DateTimeStruct& t, int digits) { return qlsvUtf8FromUtf16(t.getTimeStr(digits)); }

// The digits of the fraction as double, cut off exactly.
std::string exactText(unsigned long fraction, int digits) {
    const std::string clock = "00:00:00";
    if (digits <= 0) return clock;
    const double f = std::ldexp(static_cast<double>(fraction), -64);
    const double lastPlace = std::strtod(("1e-" + std::to_string(digits)).c_str(), nullptr);
    if (f < lastPlace) return clock;
    if (f > 1 - lastPlace) return clock + "." + std::string(static_cast<std::size_t>(digits), '9');
    const cpp_int units(std::ldexp(f, 64));
    const cpp_int scale = boost::multiprecision::pow(cpp_int(10), static_cast<unsigned>(digits));
    const std::string cut = cpp_int((units * scale >> 64) % scale).str();
    return clock + "." + std::string(static_cast<std::size_t>(digits) - cut.size(), '0') + cut;
}

TEST(TimeText, DatesAndClocksArePaddedToTwoDigits) {
    struct Row {
        DateTimeStruct t;
        const char16_t* text;
    };
    const Row rows[] = {
        {{}, u"0-01-01T00:00:00"},
        {{-4713, 1, 1, 12, 0, 0, 0.0}, u"-4713-01-01T12:00:00"},
        {{145000000000, 12, 31, 23, 59, 60, 0.0}, u"145000000000-12-31T23:59:60"},
        {{2016, 12, 31, 23, 59, 60, 0.25}, u"2016-12-31T23:59:60.250000000"},
        {{2016, 255, 255, 255, 255, 255, 0.0}, u"2016-255-255T255:255:255"},
    };
    for (const Row& row : rows)
        EXPECT_EQ(row.t.getDateTimeStr(), row.text);
}

TEST(TimeText, FractionsAreCutOffAndNeverCarry) {
    struct Row {
        double fraction;
        int digits;
        const char* text;
    };
    const Row rows[] = {
        {0.0004, 3, "00:00:00"},
        {0.5, 3, "00:00:00.500"},
        {0.9996, 3, "00:00:00.999"},
        {0.12345, 3, "00:00:00.123"},
        {0.001, 3, "00:00:00.001"},
        {0.999, 3, "00:00:00.998"}, // the double lies below 0.999
        {0.9, 1, "00:00:00.9"},
        {0.09, 1, "00:00:00"},
        {0.19, 1, "00:00:00.1"},
        {0.5, 0, "00:00:00"},
        {0.999, 0, "00:00:00"},
        {0.5, -1, "00:00:00"},
        {0.5, std::numeric_limits<int>::min(), "00:00:00"},
        {0.1, 20, "00:00:00.10000000000000000555"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(testing::Message() << row.fraction << " to " << row.digits);
        EXPECT_EQ(timeText(DateTimeStruct(0, 1, 1, 0, 0, 0, row.fraction), row.digits), row.text);
    }
}

TEST(TimeText, AFractionThatIsOneAsADouble) {
    const DateTimeStruct last = midnightAnd(~0ul);
    EXPECT_EQ(timeText(last, 0), "00:00:00");
    EXPECT_EQ(timeText(last, -5), "00:00:00");
    EXPECT_EQ(timeText(last, 16), "00:00:00.9999999999999999");
    EXPECT_EQ(timeText(last, 17), "00:00:00.00000000000000000"); // 1 - 10^-17 is 1 as a double
}

TEST(TimeText, EveryDigitCountAgreesWithExactArithmetic) {
    std::vector<unsigned long> fractions = {0, 1, 2, 1023, 1024, 2047, 2048, ~0ul, ~0ul - 1023, ~0ul - 1024, ~0ul >> 1};
    for (int digits = 1; digits <= cMostDigits; ++digits) {
        const double lastPlace = std::pow(10.0, -digits);
        for (double at : {lastPlace, 1 - lastPlace, 0.5 + lastPlace, 2 * lastPlace, 1 - 2 * lastPlace})
            for (double near : {at, std::nextafter(at, 0.0), std::nextafter(at, 1.0)})
                fractions.push_back(DateTimeStruct(0, 1, 1, 0, 0, 0, near).fraction);
    }
    constexpr unsigned seed = 20161231;
    std::mt19937_64 random(seed);
    for (int i = 0; i < 2000; ++i)
        fractions.push_back(random() >> (random() % 64));

    for (unsigned long fraction : fractions)
        for (int digits = 0; digits <= cMostDigits; ++digits)
            ASSERT_EQ(timeText(midnightAnd(fraction), digits), exactText(fraction, digits))
                << "fraction " << fraction << " to " << digits << " digits, seed " << seed;
}

TEST(TimeText, TheRoundingModeIsPutBack) {
    for (int mode : {FE_TONEAREST, FE_UPWARD, FE_DOWNWARD, FE_TOWARDZERO}) {
        std::fesetround(mode);
        DateTimeStruct(0, 1, 1, 0, 0, 0, 0.3).getTimeStr(9);
        const int after = std::fegetround();
        std::fesetround(FE_TONEAREST);
        EXPECT_EQ(after, mode);
    }
}

struct CommaPoint : std::numpunct<char> {
    char do_decimal_point() const override { return ','; }
};

TEST(TimeText, TheGlobalLocalePlaysNoPart) {
    const std::locale before = std::locale::global(std::locale(std::locale::classic(), new CommaPoint));
    const std::string text = timeText(DateTimeStruct(0, 1, 1, 0, 0, 0, 0.5), 3);
    std::locale::global(before);
    EXPECT_EQ(text, "00:00:00.500");
}

} // namespace
