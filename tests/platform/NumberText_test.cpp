#include <bit>
#include <cfenv>
#include <charconv>
#include <clocale>
#include <cmath>
#include <cstdint>
#include <limits>
#include <random>
#include <string>

#include <gtest/gtest.h>

#include "qlplatform/services/NumberText.h"

namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double notANumber = std::numeric_limits<double>::quiet_NaN();
constexpr double largest = std::numeric_limits<double>::max();

struct WriterRow {
    double value;
    const char* text;
    const char* textWithPoint;
};

// clang-format off
constexpr WriterRow writerRows[] = {
    {0.0,                     "0",                       "0.0"},
    {-0.0,                    "-0",                      "-0.0"},
    {1.0,                     "1",                       "1.0"},
    {-2.0,                    "-2",                      "-2.0"},
    {1.5,                     "1.5",                     "1.5"},
    {0.25,                    "0.25",                    "0.25"},
    {-0.25,                   "-0.25",                   "-0.25"},
    {0.1,                     "0.1",                     "0.1"},
    {100.0,                   "100",                     "100.0"},
    {1000000.0,               "1000000",                 "1000000.0"},
    {0.0001,                  "0.0001",                  "0.0001"},
    {0.00012345,              "0.00012345",              "0.00012345"},
    {0.00009999,              "9.999e-5",                "9.999e-5"},
    {0.00001,                 "1e-5",                    "1e-5"},
    {1e-10,                   "1e-10",                   "1e-10"},
    {1234567890123456.0,      "1234567890123456",        "1234567890123456.0"},
    {9999999999999998.0,      "9999999999999998",        "9999999999999998.0"},
    {1e16,                    "1e+16",                   "1e+16"},
    {1.5e300,                 "1.5e+300",                "1.5e+300"},
    {-1.5e-300,               "-1.5e-300",               "-1.5e-300"},
    {largest,                 "1.7976931348623157e+308", "1.7976931348623157e+308"},
    {2.2250738585072014e-308, "2.2250738585072014e-308", "2.2250738585072014e-308"},
    {5e-324,                  "5e-324",                  "5e-324"},
    {1.0 / 3,                 "0.3333333333333333",      "0.3333333333333333"},
    {infinity,                "inf",                     "inf"},
    {-infinity,               "-inf",                    "-inf"},
    {notANumber,              "nan",                     "nan"},
    {-notANumber,             "nan",                     "nan"},
};
// clang-format on

TEST(NumberText, WrittenAsTheRowsSay) {
    for (const WriterRow& row : writerRows) {
        SCOPED_TRACE(row.text);
        EXPECT_EQ(qlsv_dtoa(row.value, false), row.text);
        EXPECT_EQ(qlsv_dtoa(row.value, true), row.textWithPoint);
        EXPECT_EQ(qlsv_dtoa_fitools(row.value), row.text);
    }
}

double read(const std::string& text) { return ut_strtod(utGetFpcContext(), text.c_str(), nullptr, nullptr); }

TEST(NumberText, RandomDoublesReadBackAndAreShort) {
    constexpr unsigned long long seed = 17;
    SCOPED_TRACE(seed);
    std::mt19937_64 random(seed);
    for (int i = 0; i < 100000; ++i) {
        const double value =
            i % 2 ? std::bit_cast<double>(random())
                  : std::ldexp(static_cast<double>(random() >> 11), static_cast<int>(random() % 120) - 90);
        if (!std::isfinite(value)) continue;
        const std::string text = qlsv_dtoa(value, false);
        ASSERT_EQ(std::bit_cast<std::uint64_t>(read(text)), std::bit_cast<std::uint64_t>(value)) << text;
        ASSERT_EQ(read(qlsv_dtoa(value, true)), value) << text;
        ASSERT_LE(text.size(), 24u) << text;
        if (const std::size_t exponent = text.find('e'); exponent != std::string::npos) {
            ASSERT_NE(text[exponent + 2], '0') << text;
        }
    }
}

struct ReaderRow {
    const char* text;
    double value;
    int numRead;
    int error;
};

// clang-format off
constexpr ReaderRow readerRows[] = {
    {"1.5",        1.5,      3,  utStrtodOk},
    {"-.25",       -0.25,    4,  utStrtodOk},
    {"+5.",        5.0,      3,  utStrtodOk},
    {" \t\n7x",    7.0,      4,  utStrtodOk},
    {"1e3,4",      1000.0,   3,  utStrtodOk},
    {"1e+",        1.0,      1,  utStrtodOk},
    {"1,5",        1.0,      1,  utStrtodOk},
    {"0x1p-3",     0.125,    6,  utStrtodOk},
    {"inf",        infinity, 3,  utStrtodOk},
    {"-Infinity",  -infinity, 9, utStrtodOk},
    {"",           0.0,      0,  utStrtodNoNumber},
    {"x1",         0.0,      0,  utStrtodNoNumber},
    {" ",          0.0,      0,  utStrtodNoNumber},
    {"-",          0.0,      0,  utStrtodNoNumber},
    {".",          0.0,      0,  utStrtodNoNumber},
    {"1e309",      infinity, 5,  utStrtodOutOfRange},
    {"-1e309",     -infinity, 6, utStrtodOutOfRange},
    {"1e-400",     0.0,      6,  utStrtodOutOfRange},
    {"1e-320",     1e-320,   6,  utStrtodOutOfRange},
};
// clang-format on

TEST(NumberText, ReadAsTheRowsSay) {
    for (const ReaderRow& row : readerRows) {
        SCOPED_TRACE(row.text);
        char* end = nullptr;
        int error = -1;
        EXPECT_EQ(ut_strtod(utGetFpcContext(), row.text, &end, &error), row.value);
        EXPECT_EQ(end, row.text + row.numRead);
        EXPECT_EQ(error, row.error);
        EXPECT_EQ(read(row.text), row.value);
    }
    EXPECT_TRUE(std::isnan(read("nan")));
    EXPECT_TRUE(std::isnan(read("-NaN")));
}

TEST(NumberText, ErrnoIsLeftAlone) {
    errno = 42;
    read("1e999");
    EXPECT_EQ(errno, 42);
    errno = 0;
}

TEST(NumberText, RoundingModeDoesNotMatter) {
    const std::string text = "0.1000000000000000055511151231257827021181583404541015625000001";
    for (const int mode : {FE_TONEAREST, FE_UPWARD, FE_DOWNWARD, FE_TOWARDZERO}) {
        std::fesetround(mode);
        const double value = read(text);
        const std::string again = qlsv_dtoa(value, false);
        const int modeAfter = std::fegetround();
        std::fesetround(FE_TONEAREST);
        EXPECT_EQ(modeAfter, mode);
        EXPECT_EQ(value, 0.1);
        EXPECT_EQ(again, "0.1");
    }
}

TEST(NumberText, LocaleDoesNotMatter) {
    const std::string before = std::setlocale(LC_ALL, nullptr);
    for (const char* name : {"de_DE.UTF-8", "de_DE.utf8", "fr_FR.UTF-8", "C"}) {
        if (!std::setlocale(LC_ALL, name)) continue; // not every machine has them
        SCOPED_TRACE(name);
        EXPECT_EQ(read("1.5"), 1.5);
        EXPECT_EQ(read("1,5"), 1.0);
        EXPECT_EQ(qlsv_dtoa(1.5, false), "1.5");
    }
    std::setlocale(LC_ALL, before.c_str());
}

TEST(NumberText, ContextIsOneAndStays) { EXPECT_EQ(utGetFpcContext(), utGetFpcContext()); }

} // namespace
