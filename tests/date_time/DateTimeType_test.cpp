#include <limits>

#include <gtest/gtest.h>

#include "qltypes/date_time/DateTimeType.h"
#include "tests/support/Raises.h"

namespace {

using QLDateTime::AbsoluteTimeScale;
using QLDateTime::DateTimeStruct;
using QLDateTime::DateTimeType;
using QLDateTime::TimeSystem;

struct StorageRow {
    unsigned int scale;
    fxpDataTypeProp storage;
    const char16_t* name;
};

const StorageRow storageRows[] = {
    {0, {FXP_DT_FIXPT, 1, 128, 0, -64, 1.0, 0.0, 0}, u"tai"}, {1, {FXP_DT_FIXPT, 1, 128, 0, -64, 1.0, 0.0, 0}, u"gps"},
    {2, {FXP_DT_FIXPT, 1, 128, 0, -64, 1.0, 0.0, 0}, u"utc"}, {3, {FXP_DT_FIXPT, 0, 32, 0, 0, 1.0, 0.0, 0}, u"posix"},
    {4, {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 0.0, 0}, u"jd"},   {5, {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 0.0, 0}, u"mjd"},
};

AbsoluteTimeScale scaleOf(unsigned int value) { return static_cast<AbsoluteTimeScale>(value); }

void expectSame(const fxpDataTypeProp& a, const fxpDataTypeProp& b) {
    EXPECT_EQ(a.DataTypeMode, b.DataTypeMode);
    EXPECT_EQ(a.Signedness, b.Signedness);
    EXPECT_EQ(a.WordLength, b.WordLength);
    EXPECT_EQ(a.ExponentLength, b.ExponentLength);
    EXPECT_EQ(a.FixedExponent, b.FixedExponent);
    EXPECT_EQ(a.SlopeAdjustmentFactor, b.SlopeAdjustmentFactor);
    EXPECT_EQ(a.Bias, b.Bias);
    EXPECT_EQ(a.DataTypeOverrideOff, b.DataTypeOverrideOff);
}

TEST(DateTimeType, EveryScaleHasItsDefaultStorage) {
    for (const StorageRow& row : storageRows) {
        SCOPED_TRACE(row.scale);
        const TimeSystem system(scaleOf(row.scale));
        for (const DateTimeType& type :
             {DateTimeType(system), DateTimeType::datetime_t(scaleOf(row.scale)),
              DateTimeType::datetime_t(scaleOf(row.scale), system.getEpoch(), system.getRange())}) {
            expectSame(type.getStorage(), row.storage);
            EXPECT_EQ(type.getDataTypeName(), row.name);
            EXPECT_TRUE(type.isEqual(DateTimeType(system, row.storage)));
        }
    }
}

TEST(DateTimeType, AnUnknownScaleThatWasStoredHasTheStorageOfTheRest) {
    const TimeSystem mjd = TimeSystem::getDefaultMJD_TAI();
    const DateTimeType type(TimeSystem(scaleOf(7), mjd.getEpoch(), mjd.getRange()));
    expectSame(type.getStorage(), storageRows[0].storage);
    EXPECT_TRUE(DateTimeType::datetime_t(scaleOf(7)).isEqual(DateTimeType::datetime_t(scaleOf(5))));
}

TEST(DateTimeType, ADefaultObjectIsUnsigned) {
    const DateTimeType type;
    expectSame(type.getStorage(), {FXP_DT_FIXPT, 0, 128, 0, -64, 1.0, 0.0, 0});
    EXPECT_TRUE(type.TimeSystem::isEqual(TimeSystem::getDefaultTAI()));
    EXPECT_FALSE(type.isEqual(DateTimeType(TimeSystem(AbsoluteTimeScale::TAI))));
    EXPECT_EQ(type.getDataTypeName(), u"tai128e64");
}

TEST(DateTimeType, NamesTellStorageThatIsNoDefault) {
    struct Row {
        unsigned int scale;
        fxpDataTypeProp storage;
        const char16_t* name;
    };
    constexpr int least = std::numeric_limits<int>::min();
    const Row rows[] = {
        {0, {FXP_DT_FIXPT, 1, 64, 0, -32, 1.0, 0.0, 0}, u"tais64e32"},
        {2, {FXP_DT_FIXPT, 0, 32, 0, 0, 1.0, 0.0, 0}, u"utc32e00"},
        {0, {FXP_DT_FIXPT, 1, 8, 0, 0, 1.0, 0.0, 0}, u"tais08e00"},
        {0, {FXP_DT_FIXPT, 2, 8, 0, 0, 1.0, 0.0, 0}, u"tais08e00"},
        {0, {FXP_DT_FIXPT, 1, 16, 0, 3, 1.0, 0.0, 0}, u"tais16e-3"},
        {0, {FXP_DT_FIXPT, 1, 16, 0, 12, 1.0, 0.0, 0}, u"tais16e-12"},
        {0, {FXP_DT_FIXPT, 0, -5, 0, least, 1.0, 0.0, 0}, u"tai-5e2147483648"},
        {0, {FXP_DT_FIXPT, 0, least, 0, std::numeric_limits<int>::max(), 1.0, 0.0, 0}, u"tai-2147483648e-2147483647"},
        {1, {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 0.0, 0}, u"gpsdouble"},
        {4, {FXP_DT_DOUBLE, 1, 64, 11, -1, 1.0, 0.0, 0}, u"jddouble"},
        {4, {FXP_DT_SINGLE, 1, 32, 8, 0, 1.0, 0.0, 0}, u"jdsingle"},
        {4, {FXP_DT_SCALED_DOUBLE, 1, 32, 8, 0, 1.0, 0.0, 0}, u"jdsingle"},
        {4, {FXP_DT_BOOLEAN, 0, 8, 0, 0, 1.0, 0.0, 0}, u"jdsingle"},
        {4, {FXP_DT_CUSTOM_FLOAT, 1, 16, 5, 0, 1.0, 0.0, 0}, u"jdsingle"},
        // Slope, bias and exponent length make a type other than the default, yet stand in no text.
        {3, {FXP_DT_FIXPT, 0, 32, 0, 0, 1.5, 0.0, 0}, u"posix32e00"},
        {3, {FXP_DT_FIXPT, 0, 32, 0, 0, 1.0, 7.0, 0}, u"posix32e00"},
        {3, {FXP_DT_FIXPT, 0, 32, 1, 0, 1.0, 0.0, 0}, u"posix32e00"},
        // The override marker does not count.
        {3, {FXP_DT_FIXPT, 0, 32, 0, 0, 1.0, 0.0, 1}, u"posix"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(testing::Message() << "row " << &row - rows);
        EXPECT_EQ(DateTimeType(TimeSystem(scaleOf(row.scale)), row.storage).getDataTypeName(), row.name);
    }
}

TEST(DateTimeType, EqualityLooksAtTheSystemAndSevenFields) {
    const fxpDataTypeProp base = {FXP_DT_FIXPT, 1, 64, 0, -32, 1.25, 3.0, 0};
    const TimeSystem tai(AbsoluteTimeScale::TAI);
    const DateTimeType type(tai, base);
    fxpDataTypeProp others[8];
    std::fill(std::begin(others), std::end(others), base);
    others[0].DataTypeMode = FXP_DT_DOUBLE;
    others[1].Signedness = 0;
    others[2].WordLength = 32;
    others[3].ExponentLength = 1;
    others[4].FixedExponent = 0;
    others[5].SlopeAdjustmentFactor = 1.5;
    others[6].Bias = 0.0;
    others[7].DataTypeOverrideOff = 1;
    for (int i = 0; i < 8; ++i)
        EXPECT_EQ(type.isEqual(DateTimeType(tai, others[i])), i == 7) << i;
    EXPECT_FALSE(type.isEqual(DateTimeType(TimeSystem(AbsoluteTimeScale::GPS), base)));

    fxpDataTypeProp notANumber = base;
    notANumber.Bias = std::numeric_limits<double>::quiet_NaN();
    const DateTimeType odd(tai, notANumber);
    EXPECT_FALSE(odd.isEqual(odd));
}

TEST(DateTimeType, MakersAreChecked) {
    const DateTimeStruct first(2000, 1, 1, 0, 0, 0, 0.0);
    const DateTimeStruct last(2001, 1, 1, 0, 0, 0, 0.0);
    const fxpDataTypeProp storage = {FXP_DT_FIXPT, 1, 64, 0, -32, 1.0, 0.0, 0};
    EXPECT_RAISES(DateTimeType::datetime_t(AbsoluteTimeScale::UTC, first, {last, first}),
                  "Quillane:DateTime:InvalidRange");
    EXPECT_RAISES(DateTimeType::datetime_t(AbsoluteTimeScale::UTC, first, {last, first}, storage),
                  "Quillane:DateTime:InvalidRange");
    const DateTimeType type = DateTimeType::datetime_t(AbsoluteTimeScale::UTC, first, {first, last}, storage);
    expectSame(type.getStorage(), storage);
    EXPECT_EQ(type.getDataTypeName(), u"utce2000-01-01T00:00:00L2000-01-01T00:00:00H2001-01-01T00:00:00s64e32");
    const DateTimeType copy = type;
    EXPECT_TRUE(copy.isEqual(type));
}

} // namespace
