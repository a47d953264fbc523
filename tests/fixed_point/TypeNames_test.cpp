#include <string>

#include <boost/lexical_cast/bad_lexical_cast.hpp>
#include <gtest/gtest.h>

#include "qltypes/fixed_point/TypeNames.h"
#include "qltypes/fixed_point/fxpTypesFeatureControl.h"
#include "qltypes/host/FeatureFlags.h"
#include "tests/support/Raises.h"

namespace {

struct NameRow {
    const char* name;
    const char*
        families; // f half, d double/single/boolean, c classic six, 6 64-bit, i integer and x fixed-point pattern
};

constexpr NameRow nameRows[] = {
    {"double", "d"},         {"single", "d"},   {"boolean", "d"},    {"half", "f"},       {"int8", "ci"},
    {"uint8", "ci"},         {"int16", "ci"},   {"uint16", "ci"},    {"int32", "ci"},     {"uint32", "ci"},
    {"int64", "6i"},         {"uint64", "6i"},  {"sfix64", "6x"},    {"ufix64", "6x"},    {"int7", "i"},
    {"uint128", "i"},        {"int1", "i"},     {"uint", ""},        {"int", ""},         {"int0", ""},
    {"int007", ""},          {"uint01", ""},    {"Double", ""},      {"INT8", ""},        {"Half", ""},
    {"int8 ", ""},           {" int8", ""},     {"int8x", ""},       {"uuint8", ""},      {"", ""},
    {"sfix16", "x"},         {"sfix16_E0", ""}, {"sfix16_En7", "x"}, {"flts32_En8", "x"}, {"fltu8", "x"},
    {"sfix16_F1p5", ""},     {"sfix016", ""},   {"sfix0", ""},       {"ufix8_S3p2", "x"}, {"ufix8_S3p2_B2", "x"},
    {"sfix16_F1p5_E3", "x"}, {"foo", ""},       {"logical", ""},     {"sfix64_E1", "x"},  {"boolean1", ""},
};

TEST(TypeNames, EachNameIsOfItsFamilies) {
    for (const NameRow& row : nameRows) {
        SCOPED_TRACE(row.name);
        const std::string families = row.families;
        const auto is = [&](char family) { return families.find(family) != std::string::npos; };
        const bool hasProp = is('d') || is('i') || is('x') || is('f');
        EXPECT_EQ(FXP::doesQLTypeNameMatchFloatPatternNotBuiltinClassic9(row.name), is('f'));
        EXPECT_EQ(FXP::isQLTypeNameDoubleSingleBool(row.name), is('d'));
        EXPECT_EQ(FXP::isQLTypeNameBuiltInIntegerClassic6(row.name), is('c'));
        EXPECT_EQ(FXP::isQLTypeName64BitInteger(row.name), is('6'));
        EXPECT_EQ(FXP::isQLTypeNameBuiltInClassic9(row.name), is('d') || is('c'));
        EXPECT_EQ(FXP::doesQLTypeNameMatchIntegerPattern(row.name), is('i'));
        EXPECT_EQ(FXP::doesQLTypeNameMatchFixptPattern(row.name), is('x'));
        EXPECT_EQ(FXP::doesQLTypeNameMatchIntegerOrFixptPattern(row.name), is('i') || is('x'));
        EXPECT_EQ(FXP::isQLTypeNameWithFxpDataTypeProp(row.name), hasProp);
        EXPECT_EQ(FXP::isQLTypeNameNumericNotBuiltInClassic9(row.name), hasProp && !is('d') && !is('c'));
    }
}

TEST(TypeNames, ClassificationDoesNotDependOnTheFlag) {
    fxpTypesFeature::setUseTorvexNameForInt64(false);
    for (const char* name : {"int64", "uint64", "sfix64", "ufix64"})
        EXPECT_TRUE(FXP::isQLTypeName64BitInteger(name)) << name;
    fxpTypesFeature::setUseTorvexNameForInt64(true);
}

TEST(TypeNames, IntAtPosition) {
    EXPECT_EQ(FXP::getIntAtPosition3("int"), 0);
    EXPECT_EQ(FXP::getIntAtPosition3(""), 0);
    EXPECT_EQ(FXP::getIntAtPosition3("int8"), 8);
    EXPECT_EQ(FXP::getIntAtPosition3("int16_t"), 16);
    EXPECT_EQ(FXP::getIntAtPosition3("intx"), 0);
    EXPECT_EQ(FXP::getIntAtPosition3("int -5"), -5);
    EXPECT_EQ(FXP::getIntAtPosition4("uint"), 0);
    EXPECT_EQ(FXP::getIntAtPosition4("uint8x"), 8);
    EXPECT_EQ(FXP::getIntAtPosition4("sfix16_En7"), 16);
    EXPECT_EQ(FXP::getIntAtPosition4("sfixx"), 0);
}

TEST(TypeNames, IntAtPositionIsCutTo32Bits) { // kept
    EXPECT_EQ(FXP::getIntAtPosition3("int4294967297"), 1);
    EXPECT_EQ(FXP::getIntAtPosition3("int2147483648"), -2147483647 - 1);
    EXPECT_EQ(FXP::getIntAtPosition4("uint99999999999999999999"), -1);
}

TEST(TypeNames, WordLength) {
    EXPECT_EQ(FXP::getWordLengthFromTypeName("half"), 16);
    EXPECT_EQ(FXP::getWordLengthFromTypeName("int12"), 12);
    EXPECT_EQ(FXP::getWordLengthFromTypeName("double"), 64);
    EXPECT_EQ(FXP::getWordLengthFromTypeName("boolean"), 8);
    EXPECT_EQ(FXP::getWordLengthFromTypeName("ufix17_S3p2_B2"), 17);
    EXPECT_RAISES(FXP::getWordLengthFromTypeName("foo"), "QuillaneTypes:general:InvalidNumericTypeIdentifier", "foo");
    EXPECT_RAISES(FXP::getWordLengthFromTypeName(""), "QuillaneTypes:general:InvalidNumericTypeIdentifier", "");
}

TEST(TypeNames, ContainerStoresNegatives) {
    for (const char* name : {"int8", "int64", "sfix7_En2", "double", "single", "half", "flts8", "fltu8", "fltu8_B1"})
        EXPECT_TRUE(FXP::canQLTypeNameContainerStoreNegatives(name)) << name; // kept: fltu8
    for (const char* name : {"boolean", "uint8", "uint64", "ufix7_En2", "ufix8_Bn4", "foo", "", "sfix0", "Double"})
        EXPECT_FALSE(FXP::canQLTypeNameContainerStoreNegatives(name)) << name;
}

TEST(TypeNames, AnExponentBeyond32BitsPassesTheShapeAndNotTheReader) { // kept
    EXPECT_TRUE(FXP::isQLTypeNameWithFxpDataTypeProp("sfix8_E2147483648"));
    EXPECT_THROW(FXP::canQLTypeNameContainerStoreNegatives("sfix8_E2147483648"), boost::bad_lexical_cast);
    EXPECT_THROW(FXP::getWordLengthFromTypeName("sfix8_E2147483648"), boost::bad_lexical_cast);
}

TEST(TypeNames, FeatureIsTheFlagAndCallsBack) {
    EXPECT_TRUE(fxpTypesFeature::getUseTorvexNameForInt64());
    fxpTypesFeature::setUseTorvexNameForInt64(false);
    EXPECT_EQ(QLFEAT_UseTorvexNameForInt64->state(), 0);
    EXPECT_FALSE(fxpTypesFeature::getUseTorvexNameForInt64());
    QLFEAT_UseTorvexNameForInt64->setState(7);
    EXPECT_TRUE(fxpTypesFeature::getUseTorvexNameForInt64());

    int stateSeen = -1;
    QLFEAT_UseTorvexNameForInt64->setCallback([&](QlFeature& feature) {
        EXPECT_EQ(&feature, QLFEAT_UseTorvexNameForInt64);
        stateSeen = feature.state();
    });
    fxpTypesFeature::setUseTorvexNameForInt64(false);
    EXPECT_EQ(stateSeen, 0);
    fxpTypesFeature::setUseTorvexNameForInt64(true);
    EXPECT_EQ(stateSeen, 1);
    QLFEAT_UseTorvexNameForInt64->setCallback({});
    fxpTypesFeature::setUseTorvexNameForInt64(true);
    EXPECT_EQ(stateSeen, 1);
}

} // namespace
