#include "qltypes/date_time/DateTimeDataType.h"

#include <cstring>
#include <limits>

#include <gtest/gtest.h>

#include "qlplatform/memory/Memory.h"
#include "qltypes/host/FeatureFlags.h"
#include "tests/support/Raises.h"
#include "tests/types/ClientTable.h"

namespace {

using QLDateTime::AbsoluteTimeScale;
using QLDateTime::DateTimeType;
using QLDateTime::TimeSystem;
using QLTypeSys::DataType;
using testsupport::ClientTable;

DataType* recordOf(const QLTypeSys::DataTypeTable& table, int id) {
    return table.getDataTypeAt(static_cast<unsigned long>(id + 1));
}

DateTimeType stored(AbsoluteTimeScale scale, int wordLength, int exponent) {
    return {TimeSystem(scale), {FXP_DT_FIXPT, 1, wordLength, 0, exponent, 1.0, 0.0, 0}};
}

TEST(DateTimeDataType, EveryDefaultIsRegisteredUnderItsName) {
    struct Row {
        AbsoluteTimeScale scale;
        const char* name;
        int size; // in bits
    };
    const Row rows[] = {
        {AbsoluteTimeScale::TAI, "tai", 128},  {AbsoluteTimeScale::GPS, "gps", 128},
        {AbsoluteTimeScale::UTC, "utc", 128},  {AbsoluteTimeScale::Posix, "posix", 32},
        {AbsoluteTimeScale::JD_TAI, "jd", 64}, {AbsoluteTimeScale::MJD_TAI, "mjd", 64},
    };
    ClientTable table;
    int nextId = 14;
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        const DateTimeType type = DateTimeType::datetime_t(row.scale);
        const int id = table.registerDateTimeDataType(type, nullptr);
        EXPECT_EQ(id, nextId++);
        EXPECT_EQ(table.getDataTypeId(row.name), id);
        EXPECT_EQ(table.registerDateTimeDataType(type, "other"), id);
        const DataType* record = recordOf(table, id);
        EXPECT_STREQ(record->getName(), row.name);
        EXPECT_EQ(record->getDataTypeSource(), dtSourceDateTime);
        EXPECT_EQ(record->getType(), QLTypeSys::dtqDateTime);
        EXPECT_EQ(record->getSize(), row.size);
        EXPECT_TRUE(record->getIsAliasToLocked());
        EXPECT_FALSE(record->groundHasNonZeroStoredValue());
        EXPECT_TRUE(table.getDateTimeType(id).isEqual(type));
        EXPECT_EQ(record->getProperties(), &table.getDateTimeType(id).getStorage());
        EXPECT_EQ(table.getDTACompliantString(id), row.name);
    }
    EXPECT_EQ(QLFEAT_AbsoluteTime->state(), 0); // which guards the feature for clients only
}

TEST(DateTimeDataType, ThePropertiesAreTheStorageAndStayIt) {
    ClientTable table;
    const int id = table.registerDateTimeDataType(stored(AbsoluteTimeScale::TAI, 64, -32), nullptr);
    DataType* record = recordOf(table, id);
    const fxpDataTypeProp other = {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 0.0, 0};
    record->setProperties(&other);
    const auto* storage = static_cast<const fxpDataTypeProp*>(record->getProperties());
    EXPECT_EQ(storage->DataTypeMode, FXP_DT_FIXPT);
    EXPECT_EQ(storage->WordLength, 64);
    EXPECT_EQ(storage->FixedExponent, -32);
    EXPECT_STREQ(record->getName(), "tais64e32");
}

TEST(DateTimeDataType, TypesThatDifferOnlyInSlopeOrBiasShareTheFirst) {
    ClientTable table;
    DateTimeType plain = stored(AbsoluteTimeScale::UTC, 32, 0);
    fxpDataTypeProp scaled = plain.getStorage();
    scaled.SlopeAdjustmentFactor = 1.5;
    scaled.Bias = 4.0;
    const int id = table.registerDateTimeDataType(plain, nullptr);
    EXPECT_EQ(table.registerDateTimeDataType(DateTimeType(plain, scaled), nullptr), id);
    EXPECT_EQ(table.getDateTimeType(id).getStorage().Bias, 0.0);
}

TEST(DateTimeDataType, TheNameArgumentIsOnlyPassedOn) {
    ClientTable table;
    const auto client = table.install();
    table.registerDateTimeDataType(DateTimeType::datetime_t(AbsoluteTimeScale::GPS), "model/Clock");
    table.registerDateTimeDataType(DateTimeType::datetime_t(AbsoluteTimeScale::UTC), nullptr);
    EXPECT_EQ(client->seen, (std::vector<std::string>{"gps from model/Clock", "utc from -"}));
    client->vetoed = "tai";
    EXPECT_RAISES(table.registerDateTimeDataType(DateTimeType::datetime_t(AbsoluteTimeScale::TAI), nullptr),
                  "QuillaneTypes:general:DataType_WithIntrinsicFixptName", "tai");
    EXPECT_EQ(table.getNumDataTypes(), 17u);
    EXPECT_EQ(table.getDataTypeId("tai"), DATA_TYPE_ID_INVALID);
}

TEST(DateTimeDataType, ANameThatIsNoIdentifierIsRefused) {
    const QLDateTime::DateTimeStruct epoch(2000, 1, 1, 0, 0, 0, 0.0);
    ClientTable table;
    TimeSystem system(AbsoluteTimeScale::TAI);
    system.setEpoch(epoch);
    EXPECT_RAISES(table.registerDateTimeDataType(DateTimeType(system), nullptr),
                  "QuillaneTypes:general:InvalidDataType",
                  "taie2000-01-01T00:00:00L-145000000000-01-01T00:00:00H145000000000-01-01T00:00:00");
    EXPECT_RAISES(table.registerDateTimeDataType(stored(AbsoluteTimeScale::TAI, 16, 3), nullptr),
                  "QuillaneTypes:general:InvalidDataType", "tais16e-3");
    EXPECT_EQ(table.getNumDataTypes(), 15u);
}

TEST(DateTimeDataType, AWordLengthThatIsNoSizeIsRefused) {
    ClientTable table;
    EXPECT_RAISES(table.registerDateTimeDataType(stored(AbsoluteTimeScale::TAI, 0, 0), nullptr),
                  "QuillaneTypes:general:InvalidDataTypeSize", "tais00e00", 0);
    const DateTimeType negative(TimeSystem(AbsoluteTimeScale::TAI), {FXP_DT_DOUBLE, 1, -3, 11, 0, 1.0, 0.0, 0});
    EXPECT_RAISES(table.registerDateTimeDataType(negative, nullptr), "QuillaneTypes:general:InvalidDataTypeSize",
                  "taidouble", -3);
    EXPECT_EQ(table.getNumDataTypes(), 15u);
    EXPECT_EQ(table.getDataTypeId("taidouble"), DATA_TYPE_ID_INVALID);
    utFailAllocationAt(1);
    EXPECT_RAISES(table.registerDateTimeDataType(DateTimeType(), nullptr), "Quillane:Services:OutOfMemory");
    utFailAllocationAt(0);
    EXPECT_EQ(table.getNumDataTypes(), 15u);
    EXPECT_EQ(table.registerDateTimeDataType(DateTimeType(), nullptr), 14);
}

TEST(DateTimeDataType, ANameOfAnotherSourceIsRefused) {
    ClientTable table;
    table.registerDataType("posix", dtSourceEnum, nullptr);
    EXPECT_RAISES(table.registerDateTimeDataType(DateTimeType::datetime_t(AbsoluteTimeScale::Posix), nullptr),
                  "QuillaneTypes:general:DataType_SameNameAsExistingType", "posix");
}

TEST(DateTimeDataType, ADecliningTableReplacesTheRecordUnderItsId) {
    ClientTable table;
    DateTimeType plain = stored(AbsoluteTimeScale::UTC, 32, 0);
    fxpDataTypeProp scaled = plain.getStorage();
    scaled.Bias = 4.0;
    const int id = table.registerDateTimeDataType(plain, nullptr);
    table.declines = true;
    EXPECT_EQ(table.registerDateTimeDataType(DateTimeType(plain, scaled), nullptr), id);
    EXPECT_EQ(table.getNumDataTypes(), 16u);
    EXPECT_EQ(table.getDateTimeType(id).getStorage().Bias, 4.0);
}

#ifndef NDEBUG
TEST(DateTimeDataTypeDeathTest, TheRecordMustBeADateTimeRecord) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    const ClientTable table;
    EXPECT_DEATH(table.getDateTimeType(0), "dtqDateTime");
}
#endif

} // namespace
