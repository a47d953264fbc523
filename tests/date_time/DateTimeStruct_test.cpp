#include <cmath>
#include <cstddef>
#include <limits>
#include <type_traits>

#include <gtest/gtest.h>

#include "qltypes/date_time/DateTimeStruct.h"
#include "tests/support/Raises.h"

namespace {

using QLDateTime::DateTimeStruct;

constexpr double cInfinity = std::numeric_limits<double>::infinity();
constexpr double cNaN = std::numeric_limits<double>::quiet_NaN();

TEST(DateTimeStruct, FieldsStandInTheirOrder) {
    EXPECT_FALSE(std::is_polymorphic_v<DateTimeStruct>);
    EXPECT_TRUE(std::is_trivially_copyable_v<DateTimeStruct>);
    EXPECT_EQ(offsetof(DateTimeStruct, reserved), 0u);
    EXPECT_EQ(offsetof(DateTimeStruct, year), 8u);
    EXPECT_EQ(offsetof(DateTimeStruct, month), 16u);
    EXPECT_EQ(offsetof(DateTimeStruct, day), 20u);
    EXPECT_EQ(offsetof(DateTimeStruct, hour), 21u);
    EXPECT_EQ(offsetof(DateTimeStruct, minute), 22u);
    EXPECT_EQ(offsetof(DateTimeStruct, second), 23u);
    EXPECT_EQ(offsetof(DateTimeStruct, fraction), 24u);
}

TEST(DateTimeStruct, BothConstructorsFillAllFields) {
    const DateTimeStruct none;
    EXPECT_EQ(none.reserved, 0u);
    EXPECT_EQ(none.year, 0);
    EXPECT_EQ(none.month, 1u);
    EXPECT_EQ(none.day, 1);
    EXPECT_EQ(none.hour, 0);
    EXPECT_EQ(none.minute, 0);
    EXPECT_EQ(none.second, 0);
    EXPECT_EQ(none.fraction, 0u);

    const DateTimeStruct t(-4713, 200, 255, 99, 61, 250, 0.75);
    EXPECT_EQ(t.reserved, 0u);
    EXPECT_EQ(t.year, -4713);
    EXPECT_EQ(t.month, 200u);
    EXPECT_EQ(t.day, 255);
    EXPECT_EQ(t.hour, 99);
    EXPECT_EQ(t.minute, 61);
    EXPECT_EQ(t.second, 250);
    EXPECT_EQ(t.fraction, 0xC000000000000000u);
}

TEST(DateTimeStruct, AFractionIsCutOffToItsUnits) {
    struct Row {
        double seconds;
        unsigned long fraction;
    };
    const Row rows[] = {
        {0.0, 0},
        {0.5, 0x8000000000000000u},
        {0x1p-64, 1},
        {0x1.8p-64, 1},
        {0x1.fffffffffffffp-65, 0},
        {0x1.fffffffffffffp-1, 0xFFFFFFFFFFFFF800u},
        {0.1, 0x1999999999999A00u},
        {-0.5, 0},
        {cNaN, 0},
        {1.0, 0xFFFFFFFFFFFFFFFFu},
        {256.5, 0xFFFFFFFFFFFFFFFFu},
        {cInfinity, 0xFFFFFFFFFFFFFFFFu},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.seconds);
        EXPECT_EQ(DateTimeStruct(0, 1, 1, 0, 0, 0, row.seconds).fraction, row.fraction);
    }
}

TEST(DateTimeStruct, TheFirstFieldThatDiffersDecides) {
    // Each row is later than all rows before it.
    const DateTimeStruct ordered[] = {
        {std::numeric_limits<long>::min(), 12, 31, 23, 59, 60, 0.9},
        {-2, 12, 31, 23, 59, 60, 0.9},
        {-1, 1, 1, 0, 0, 0, 0.0},
        {0, 1, 1, 0, 0, 0, 0.0},
        {2000, 1, 31, 23, 59, 60, 0.9},
        {2000, 2, 1, 23, 59, 60, 0.9},
        {2000, 2, 2, 1, 59, 60, 0.9},
        {2000, 2, 2, 2, 1, 60, 0.9},
        {2000, 2, 2, 2, 2, 1, 0.9},
        {2000, 2, 2, 2, 2, 2, 0.1},
        {2000, 2, 2, 2, 2, 2, 0.6},
        {2000, 2, 2, 2, 2, 255, 0.0},
        {2000, 2, 200, 0, 0, 0, 0.0},
        {2000, 200, 0, 0, 0, 0, 0.0},
    };
    for (std::size_t i = 0; i < std::size(ordered); ++i)
        for (std::size_t k = 0; k < std::size(ordered); ++k) {
            SCOPED_TRACE(testing::Message() << i << " against " << k);
            const DateTimeStruct& a = ordered[i];
            const DateTimeStruct& b = ordered[k];
            EXPECT_EQ(a.isEarlierThan(b), i < k);
            EXPECT_EQ(a.isEarlierThanOrEqual(b), i <= k);
            EXPECT_EQ(a.isLaterThan(b), i > k);
            EXPECT_EQ(a.isLaterThanOrEqual(b), i >= k);
            EXPECT_EQ(a.isEqual(b), i == k);
        }
}

TEST(DateTimeStruct, SameDateAndSameTimeLookAtTheirFieldsOnly) {
    struct Row {
        DateTimeStruct other;
        bool sameDate, sameTime, equal;
    };
    const DateTimeStruct t(2024, 2, 29, 12, 30, 15, 0.5);
    const Row rows[] = {
        {{2024, 2, 29, 12, 30, 15, 0.5}, true, true, true},
        {{2024, 2, 29, 12, 30, 15, 0.25}, true, true, false},
        {{2024, 2, 29, 12, 30, 16, 0.5}, true, false, false},
        {{2024, 2, 29, 12, 31, 15, 0.5}, true, false, false},
        {{2024, 2, 29, 13, 30, 15, 0.5}, true, false, false},
        {{2024, 2, 28, 12, 30, 15, 0.5}, false, false, false}, // the same clock on another day
        {{2024, 3, 29, 12, 30, 15, 0.5}, false, false, false},
        {{2023, 2, 29, 12, 30, 15, 0.5}, false, false, false},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(testing::Message() << &row - rows);
        EXPECT_EQ(t.isSameDate(row.other), row.sameDate);
        EXPECT_EQ(t.isSameTime(row.other), row.sameTime);
        EXPECT_EQ(t.isEqual(row.other), row.equal);
    }
}

TEST(DateTimeStruct, ReservedAndTheHighBitsOfTheMonthDoNotCount) {
    DateTimeStruct a(2024, 2, 29, 12, 30, 15, 0.5);
    DateTimeStruct b = a;
    b.reserved = 7;
    b.month |= 0xABCDE00u;
    EXPECT_TRUE(a.isEqual(b));
    EXPECT_FALSE(a.isEarlierThan(b));
    EXPECT_FALSE(b.isEarlierThan(a));
    EXPECT_EQ(b.getDateStr(), u"2024-02-29");
}

struct VectorRow {
    const char* what;
    double v[6];
    bool passes;
    double second;
    double rest;
};

const VectorRow vectorRows[] = {
    {"plain", {2024, 2, 29, 12, 30, 15.5}, true, 15, 0.5},
    {"31st of February", {2023, 2, 31, 0, 0, 0}, true, 0, 0},
    {"least of all", {-145000000000, 1, 1, 0, 0, 0}, true, 0, 0},
    {"greatest of all", {145000000000, 12, 31, 23, 59, 60}, true, 60, 0},
    {"negative zeros", {-0.0, 1, 1, -0.0, -0.0, -0.0}, true, 0, 0},
    {"year below", {-145000000001, 1, 1, 0, 0, 0}, false, 0, 0},
    {"year above", {145000000001, 1, 1, 0, 0, 0}, false, 0, 0},
    {"month 0", {0, 0, 1, 0, 0, 0}, false, 0, 0},
    {"month 13", {0, 13, 1, 0, 0, 0}, false, 0, 0},
    {"day 0", {0, 1, 0, 0, 0, 0}, false, 0, 0},
    {"day 32", {0, 1, 32, 0, 0, 0}, false, 0, 0},
    {"hour -1", {0, 1, 1, -1, 0, 0}, false, 0, 0},
    {"hour 24", {0, 1, 1, 24, 0, 0}, false, 0, 0},
    {"minute -1", {0, 1, 1, 0, -1, 0}, false, 0, 0},
    {"minute 60", {0, 1, 1, 0, 60, 0}, false, 0, 0},
    {"year 0.5", {0.5, 1, 1, 0, 0, 0}, false, 0, 0},
    {"month 1.5", {0, 1.5, 1, 0, 0, 0}, false, 0, 0},
    {"day 1.5", {0, 1, 1.5, 0, 0, 0}, false, 0, 0},
    {"hour 1.5", {0, 1, 1, 1.5, 0, 0}, false, 0, 0},
    {"minute 1.5", {0, 1, 1, 0, 1.5, 0}, false, 0, 0},
    {"year NaN", {cNaN, 1, 1, 0, 0, 0}, false, 0, 0},
    {"minute NaN", {0, 1, 1, 0, cNaN, 0}, false, 0, 0},
    {"year infinite", {cInfinity, 1, 1, 0, 0, 0}, false, 0, 0},
    {"minute minus infinite", {0, 1, 1, 0, -cInfinity, 0}, false, 0, 0},
    {"second 1.5", {0, 1, 1, 0, 0, 1.5}, true, 1, 0.5},
    {"second 60.999", {0, 1, 1, 0, 0, 60.999}, true, 60, 60.999 - 60},
    {"second 61", {0, 1, 1, 0, 0, 61}, false, 0, 0},
    {"second 255", {0, 1, 1, 0, 0, 255}, false, 0, 0},
    {"second 256.5", {0, 1, 1, 0, 0, 256.5}, true, 0, 256.5}, // only the byte is tested
    {"second 316", {0, 1, 1, 0, 0, 316}, true, 60, 256},
    {"second 317", {0, 1, 1, 0, 0, 317}, false, 0, 0},
    {"second -0.5", {0, 1, 1, 0, 0, -0.5}, true, 0, -0.5},
    {"second -1", {0, 1, 1, 0, 0, -1}, false, 0, 0},
    {"second -196", {0, 1, 1, 0, 0, -196}, true, 60, -256},
    {"second of the least int", {0, 1, 1, 0, 0, -2147483648.5}, true, 0, -2147483648.5},
    {"second of the greatest int", {0, 1, 1, 0, 0, 2147483647}, false, 0, 0},
    {"second above every int", {0, 1, 1, 0, 0, 2147483648}, false, 0, 0},
    {"second below every int", {0, 1, 1, 0, 0, -2147483649.0}, false, 0, 0},
    {"second infinite", {0, 1, 1, 0, 0, cInfinity}, false, 0, 0},
    {"second NaN", {0, 1, 1, 0, 0, cNaN}, false, 0, 0},
};

TEST(DateTimeStruct, ATimeVectorIsCheckedFieldByField) {
    for (const VectorRow& row : vectorRows) {
        SCOPED_TRACE(row.what);
        if (!row.passes) {
            EXPECT_RAISES(DateTimeStruct::validateAndConvertToTimeVector(row.v), "Quillane:DateTime:InvalidTimeValue");
            continue;
        }
        const std::vector<double> expected = {row.v[0], row.v[1], row.v[2], row.v[3], row.v[4], row.second, row.rest};
        EXPECT_EQ(DateTimeStruct::validateAndConvertToTimeVector(row.v), expected);
    }
}

} // namespace
