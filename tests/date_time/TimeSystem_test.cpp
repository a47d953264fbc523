#include <type_traits>

#include <gtest/gtest.h>

#include "qltypes/date_time/TimeSystem.h"
#include "tests/support/Raises.h"

namespace {

using QLDateTime::AbsoluteTimeScale;
using QLDateTime::DateTimeStruct;
using QLDateTime::TimeSystem;
using Range = std::pair<DateTimeStruct, DateTimeStruct>;

struct DefaultRow {
    unsigned int scale;
    TimeSystem (*make)();
    const char16_t* text;
    const char16_t* epoch;
    const char16_t* first;
    const char16_t* last;
};

const DefaultRow defaultRows[] = {
    {0, TimeSystem::getDefaultTAI, u"tai", u"1970-01-01T00:00:00", u"-145000000000-01-01T00:00:00",
     u"145000000000-01-01T00:00:00"},
    {1, TimeSystem::getDefaultGPS, u"gps", u"1980-01-06T00:00:19", u"1980-01-06T00:00:19",
     u"145000000000-01-01T00:00:00"},
    {2, TimeSystem::getDefaultUTC, u"utc", u"1972-01-01T00:00:00", u"1972-01-01T00:00:00", u"2016-12-31T00:00:00"},
    {3, TimeSystem::getDefaultPosix, u"posix", u"1972-01-01T00:00:00", u"1970-01-01T00:00:00", u"2016-12-31T00:00:00"},
    {4, TimeSystem::getDefaultJD_TAI, u"jd", u"1582-10-15T00:00:00", u"1582-10-15T00:00:00",
     u"145000000000-01-01T00:00:00"},
    {5, TimeSystem::getDefaultMJD_TAI, u"mjd", u"1858-11-17T00:00:00", u"1858-11-17T00:00:00",
     u"145000000000-01-01T00:00:00"},
};

AbsoluteTimeScale scaleOf(unsigned int value) { return static_cast<AbsoluteTimeScale>(value); }

DateTimeStruct day(long year, unsigned char month, unsigned char dayOfMonth, unsigned char second = 0,
                   double fraction = 0.0) {
    return {year, month, dayOfMonth, 0, 0, second, fraction};
}

TEST(TimeSystem, EveryDefaultOfEveryScale) {
    for (const DefaultRow& row : defaultRows) {
        SCOPED_TRACE(row.scale);
        for (const TimeSystem& system : {row.make(), TimeSystem(scaleOf(row.scale))}) {
            EXPECT_EQ(system.getTimeScale(), scaleOf(row.scale));
            EXPECT_EQ(system.getTimeScaleStr(), row.text);
            EXPECT_EQ(system.getTimeSystemStr(), row.text);
            EXPECT_EQ(system.getEpochStr(), row.epoch);
            EXPECT_EQ(system.getRangeStr(), std::make_pair(std::u16string(row.first), std::u16string(row.last)));
            EXPECT_TRUE(system.isEqual(row.make()));
            EXPECT_EQ(system.getEpoch().fraction, 0u);
            EXPECT_EQ(system.getRange().first.fraction, 0u);
            EXPECT_EQ(system.getRange().second.fraction, 0u);
        }
        for (const DefaultRow& other : defaultRows)
            EXPECT_EQ(row.make().isEqual(other.make()), row.scale == other.scale);
    }
}

TEST(TimeSystem, AScaleAboveTheLastBehavesAsTheLast) {
    for (unsigned int value : {6u, 7u, 0x80000000u, 0xFFFFFFFFu}) {
        SCOPED_TRACE(value);
        const TimeSystem system(scaleOf(value));
        EXPECT_TRUE(system.isEqual(TimeSystem::getDefaultMJD_TAI()));
        EXPECT_EQ(system.getTimeSystemStr(), u"mjd");
        // Stored unchecked, the scale stays what it is and is no default of any scale.
        const TimeSystem stored(scaleOf(value), system.getEpoch(), system.getRange());
        EXPECT_EQ(stored.getTimeScaleStr(), u"mjd");
        EXPECT_FALSE(stored.isEqual(system));
        EXPECT_EQ(stored.getTimeSystemStr(),
                  u"mjde1858-11-17T00:00:00L1858-11-17T00:00:00H145000000000-01-01T00:00:00");
    }
}

TEST(TimeSystem, AFreshObjectHasDefaultMoments) {
    const TimeSystem fresh;
    EXPECT_EQ(fresh.getEpochStr(), u"0-01-01T00:00:00");
    EXPECT_EQ(fresh.getRangeStr().first, u"0-01-01T00:00:00");
    EXPECT_EQ(fresh.getRangeStr().second, u"0-01-01T00:00:00");
    EXPECT_TRUE(std::has_virtual_destructor_v<TimeSystem>);
}

TEST(TimeSystem, TextsOfWhatIsNoDefault) {
    TimeSystem gps = TimeSystem::getDefaultGPS();
    gps.setEpoch(day(2000, 1, 1, 0, 0.5));
    EXPECT_EQ(gps.getTimeSystemStr(),
              u"gpse2000-01-01T00:00:00.500000000L1980-01-06T00:00:19H145000000000-01-01T00:00:00");
    TimeSystem utc = TimeSystem::getDefaultUTC();
    utc.setRange({day(1972, 1, 1), day(2000, 1, 1)});
    EXPECT_EQ(utc.getTimeSystemStr(), u"utce1972-01-01T00:00:00L1972-01-01T00:00:00H2000-01-01T00:00:00");
}

TEST(TimeSystem, EqualityLooksAtAllFour) {
    const TimeSystem base(AbsoluteTimeScale::TAI, day(2000, 1, 1), {day(1999, 1, 1), day(2001, 1, 1)});
    EXPECT_TRUE(base.isEqual(TimeSystem(AbsoluteTimeScale::TAI, day(2000, 1, 1), {day(1999, 1, 1), day(2001, 1, 1)})));
    const TimeSystem others[] = {
        {AbsoluteTimeScale::UTC, day(2000, 1, 1), {day(1999, 1, 1), day(2001, 1, 1)}},
        {AbsoluteTimeScale::TAI, day(2000, 1, 1, 0, 0.5), {day(1999, 1, 1), day(2001, 1, 1)}},
        {AbsoluteTimeScale::TAI, day(2000, 1, 1), {day(1999, 1, 2), day(2001, 1, 1)}},
        {AbsoluteTimeScale::TAI, day(2000, 1, 1), {day(1999, 1, 1), day(2001, 1, 2)}},
    };
    for (const TimeSystem& other : others)
        EXPECT_FALSE(base.isEqual(other));
}

TEST(TimeSystem, AnEpochIsJudgedByTheDefaultRangeOfItsScale) {
    for (const DefaultRow& row : defaultRows) {
        SCOPED_TRACE(row.scale);
        TimeSystem system = row.make();
        const auto [first, last] = system.getRange();
        EXPECT_NO_THROW(system.setEpoch(first));
        EXPECT_NO_THROW(system.setEpoch(last));

        DateTimeStruct before = first;
        before.year -= 1;
        EXPECT_RAISES(system.setEpoch(before), "Quillane:DateTime:InvalidTimeEpoch", std::u16string(row.text),
                      std::u16string(row.first), std::u16string(row.last), before.getDateTimeStr());
        DateTimeStruct after = last;
        after.fraction = 1;
        EXPECT_RAISES(system.setEpoch(after), "Quillane:DateTime:InvalidTimeEpoch", std::u16string(row.text),
                      std::u16string(row.first), std::u16string(row.last), after.getDateTimeStr());
        EXPECT_TRUE(system.getEpoch().isEqual(last)) << "a refused epoch left its trace";
    }
}

TEST(TimeSystem, TheHeldRangeAndTheEpochDoNotJudgeEachOther) {
    TimeSystem utc = TimeSystem::getDefaultUTC();
    utc.setRange({day(1990, 1, 1), day(1991, 1, 1)});
    EXPECT_NO_THROW(utc.setEpoch(day(2016, 12, 31)));
    EXPECT_NO_THROW(utc.setRange({day(1980, 1, 1), day(1981, 1, 1)}));
    EXPECT_RAISES(utc.setEpoch(day(2016, 12, 31, 1)), "Quillane:DateTime:InvalidTimeEpoch", std::u16string(u"utc"),
                  std::u16string(u"1972-01-01T00:00:00"), std::u16string(u"2016-12-31T00:00:00"),
                  std::u16string(u"2016-12-31T00:00:01"));
    TimeSystem posix = TimeSystem::getDefaultPosix();
    EXPECT_NO_THROW(posix.setEpoch(day(1970, 1, 1)));
}

TEST(TimeSystem, ARangeIsJudgedByItsOrderFirst) {
    for (const DefaultRow& row : defaultRows) {
        SCOPED_TRACE(row.scale);
        TimeSystem system = row.make();
        const DateTimeStruct first = system.getRange().first;
        const DateTimeStruct last = system.getRange().second;
        EXPECT_NO_THROW(system.setRange({first, first})); // a single point
        EXPECT_NO_THROW(system.setRange({last, last}));

        DateTimeStruct before = first;
        before.year -= 1;
        DateTimeStruct after = last;
        after.second += 1;
        EXPECT_RAISES(system.setRange({after, before}), "Quillane:DateTime:InvalidRange"); // though both lie outside
        EXPECT_RAISES(system.setRange({before, last}), "Quillane:DateTime:InvalidTimeRange", std::u16string(row.text),
                      std::u16string(row.first), std::u16string(row.last), before.getDateTimeStr(),
                      std::u16string(row.last));
        EXPECT_RAISES(system.setRange({first, after}), "Quillane:DateTime:InvalidTimeRange", std::u16string(row.text),
                      std::u16string(row.first), std::u16string(row.last), std::u16string(row.first),
                      after.getDateTimeStr());
        EXPECT_TRUE(system.getRange().first.isEqual(last)) << "a refused range left its trace";
    }
}

TEST(TimeSystem, TheCheckedMakerSetsTheEpochFirst) {
    const DateTimeStruct outside = day(1900, 1, 1);
    EXPECT_RAISES(TimeSystem::createTimeSystem(AbsoluteTimeScale::UTC, outside, {day(2000, 1, 1), day(1999, 1, 1)}),
                  "Quillane:DateTime:InvalidTimeEpoch", std::u16string(u"utc"), std::u16string(u"1972-01-01T00:00:00"),
                  std::u16string(u"2016-12-31T00:00:00"), std::u16string(u"1900-01-01T00:00:00"));
    EXPECT_RAISES(
        TimeSystem::createTimeSystem(AbsoluteTimeScale::UTC, day(1980, 1, 1), {day(2000, 1, 1), day(1999, 1, 1)}),
        "Quillane:DateTime:InvalidRange");
    const TimeSystem made =
        TimeSystem::createTimeSystem(scaleOf(9), day(1900, 1, 1), {day(1900, 1, 1), day(2000, 1, 1)});
    EXPECT_EQ(made.getTimeScale(), AbsoluteTimeScale::MJD_TAI);
    EXPECT_EQ(made.getTimeSystemStr(), u"mjde1900-01-01T00:00:00L1900-01-01T00:00:00H2000-01-01T00:00:00");
}

} // namespace
