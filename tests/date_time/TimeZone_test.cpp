#include <cmath>
#include <cstddef>
#include <limits>
#include <set>
#include <utility>

#include <gtest/gtest.h>

#include "qltypes/date_time/TimeZone.h"
#include "tests/support/Raises.h"

namespace {

using QLDateTime::TimeZone;

// Every pair of whole numbers that is an offset; everything else is refused.
const std::set<std::pair<int, int>> offsets = {
    // clang-format off
    {-12, 0}, {-12, -30}, {-11, 0}, {-11, -30}, {-10, 0}, {-10, -30}, {-9, 0}, {-9, -30}, {-8, 0}, {-8, -30},
    {-7, 0},  {-7, -30},  {-6, 0},  {-6, -30},  {-5, 0},  {-5, -30},  {-4, 0}, {-4, -30}, {-3, 0}, {-3, -30},
    {-2, 0},  {-2, -30},  {-1, 0},  {-1, -30},
    {0, -30}, {0, 0},   {0, 30},  {0, 45},
    {1, 0},   {1, 30},  {1, 45},  {2, 0},   {2, 30},  {2, 45},  {3, 0},   {3, 30},  {3, 45},  {4, 0},   {4, 30},
    {4, 45},  {5, 0},   {5, 30},  {5, 45},  {6, 0},   {6, 30},  {6, 45},  {7, 0},   {7, 30},  {7, 45},  {8, 0},
    {8, 30},  {8, 45},  {9, 0},   {9, 30},  {9, 45},  {10, 0},  {10, 30}, {10, 45}, {11, 0},  {11, 30}, {11, 45},
    {12, 0},  {12, 30}, {12, 45}, {13, 0},  {13, 30}, {13, 45}, {14, 0},  {14, 30}, {14, 45},
    // clang-format on
};

TEST(TimeZone, ExactlyTheOffsetsOfTheTableAreAccepted) {
    std::size_t numAccepted = 0;
    for (int hours = -130; hours <= 130; ++hours)
        for (int minutes = -130; minutes <= 130; ++minutes) {
            const double v[] = {static_cast<double>(hours), static_cast<double>(minutes)};
            if (offsets.count({hours, minutes})) {
                ++numAccepted;
                EXPECT_EQ(TimeZone::validateAndConvertToVector(v), std::vector<double>({v[0], v[1]}));
            } else {
                ASSERT_EQ(testsupport::raisedBy([&] { TimeZone::validateAndConvertToVector(v); }),
                          "Quillane:DateTime:InvalidTimeZoneValue()")
                    << hours << ":" << minutes;
            }
        }
    EXPECT_EQ(numAccepted, offsets.size());
}

TEST(TimeZone, WhatIsNoWholeNumberIsRefused) {
    const double infinity = std::numeric_limits<double>::infinity();
    const double nan = std::numeric_limits<double>::quiet_NaN();
    const double rows[][2] = {{5.5, 0},       {5, 30.5},       {5, -0.5},      {nan, 0},
                              {0, nan},       {infinity, 0},   {0, infinity},  {-infinity, 0},
                              {0, -infinity}, {14.0000001, 0}, {5, 29.9999999}};
    for (const double(&v)[2] : rows) {
        SCOPED_TRACE(testing::Message() << v[0] << ":" << v[1]);
        EXPECT_RAISES(TimeZone::validateAndConvertToVector(v), "Quillane:DateTime:InvalidTimeZoneValue");
    }
    const double negativeZeros[] = {-0.0, -0.0};
    EXPECT_NO_THROW(TimeZone::validateAndConvertToVector(negativeZeros));
}

TEST(TimeZone, TextAndSecondsOfEveryFieldValue) {
    for (int hours = -128; hours <= 127; ++hours)
        for (int minutes = -128; minutes <= 127; ++minutes) {
            const TimeZone zone(static_cast<signed char>(hours), static_cast<signed char>(minutes));
            ASSERT_EQ(zone.getOffsetSecond(), hours * 3600 + minutes * 60);
            char text[32];
            std::snprintf(text, sizeof text, "%c%02d:%02d", hours < 0 || minutes < 0 ? '-' : '+', std::abs(hours),
                          std::abs(minutes));
            const std::string expected = text;
            ASSERT_EQ(zone.getTimeZoneStr(), std::u16string(expected.begin(), expected.end()));
        }
}

TEST(TimeZone, WrittenExamples) {
    EXPECT_EQ(TimeZone(-5, -30).getOffsetSecond(), -19800);
    EXPECT_EQ(TimeZone(5, 45).getOffsetSecond(), 20700);
    EXPECT_EQ(TimeZone(0, -30).getTimeZoneStr(), u"-00:30");
    EXPECT_EQ(TimeZone().getTimeZoneStr(), u"+00:00");
    EXPECT_EQ(TimeZone(-128, 100).getTimeZoneStr(), u"-128:100");
}

TEST(TimeZone, IsTwoBytesAndStoresUnchecked) {
    EXPECT_EQ(sizeof(TimeZone), 2u);
    EXPECT_EQ(offsetof(TimeZone, hours), 0u);
    EXPECT_EQ(offsetof(TimeZone, minutes), 1u);
    TimeZone zone(3, 30);
    zone.setTimeZone(99, -99);
    EXPECT_EQ(zone.hours, 99);
    EXPECT_EQ(zone.minutes, -99);
}

} // namespace
