#include <limits>
#include <random>
#include <vector>

#include <boost/lexical_cast/bad_lexical_cast.hpp>
#include <gtest/gtest.h>

#include "qltypes/fixed_point/BuiltInProps.h"
#include "qltypes/fixed_point/IdentifierString.h"
#include "qltypes/fixed_point/fxpTypesFeatureControl.h"
#include "tests/fixed_point/Props.h"
#include "tests/fixed_point/TextCases.h"
#include "tests/support/Raises.h"

namespace {

using reference::Ending;

constexpr const char* invalidIdentifier = "QuillaneTypes:general:InvalidNumericTypeIdentifier";
constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double notANumber = std::numeric_limits<double>::quiet_NaN();
constexpr int minInt = std::numeric_limits<int>::min();
constexpr int maxInt = std::numeric_limits<int>::max();

std::string written(const fxpDataTypeProp& prop) { return fxpDataTypeToIdentifierString(&prop); }

void expectReading(const std::string& text, const reference::Reading& expected) {
    SCOPED_TRACE(shown(text));
    switch (expected.ending) {
    case Ending::read:
        EXPECT_EQ(identifierStringToFxpDataType(text), expected.prop);
        break;
    case Ending::invalid:
        EXPECT_RAISES(identifierStringToFxpDataType(text), invalidIdentifier, text);
        break;
    case Ending::badCast:
        EXPECT_THROW(identifierStringToFxpDataType(text), boost::bad_lexical_cast); // kept
        break;
    }
}

TEST(IdentifierString, CasesReadAsTheTableSays) {
    for (const TextCase& one : textCases("identifier_strings.tsv")) {
        SCOPED_TRACE(one.line);
        expectReading(one.text, one.reading);
        if (one.reading.ending == Ending::read) {
            EXPECT_EQ(written(one.reading.prop), one.lastColumn);
        }
    }
}

TEST(IdentifierString, CasesReadAsTheReferenceDoes) {
    for (const TextCase& one : textCases("identifier_strings.tsv")) {
        SCOPED_TRACE(one.line);
        expectReading(one.text, reference::readIdentifier(one.text));
    }
}

TEST(IdentifierString, RandomTextsReadAsTheReferenceDoes) {
    constexpr unsigned long long seed = 20240612;
    SCOPED_TRACE(seed);
    std::mt19937_64 random(seed);
    int numRead = 0;
    for (int i = 0; i < 40000 && !testing::Test::HasFailure(); ++i) {
        const std::string text = randomIdentifier(random);
        const reference::Reading expected = reference::readIdentifier(text);
        numRead += expected.ending == Ending::read;
        expectReading(text, expected);
    }
    EXPECT_GT(numRead, 4000);
}

TEST(IdentifierString, BuiltInNamesAndHalfGiveTheirConstantRecords) {
    for (int id = 0; id < FXP::numBuiltInProps; ++id)
        EXPECT_EQ(identifierStringToFxpDataType(FXP::getBuiltInName(id)), FXP::getBuiltInProps(id));
    EXPECT_EQ(identifierStringToFxpDataType("half"), FXP::halfProps);
}

TEST(IdentifierString, ATextIsReadOnceAndItsRecordStays) {
    const std::string text = "sfix29_En11";
    const fxpDataTypeProp& first = identifierStringToFxpDataType(text);
    const fxpDataTypeProp copy = first;
    for (int bits = 1; bits < 20000; ++bits)
        identifierStringToFxpDataType("ufix" + std::to_string(bits) + "_E9");
    EXPECT_EQ(&identifierStringToFxpDataType(text), &first);
    EXPECT_EQ(&identifierStringToFxpDataType("sfix29_En11"), &first);
    EXPECT_EQ(&identifierStringToFxpDataType(std::string_view("sfix29_En11_B1").substr(0, 11)), &first);
    EXPECT_EQ(first, copy);
    // Texts are told apart, not records.
    EXPECT_NE(&identifierStringToFxpDataType("int29"), &identifierStringToFxpDataType("sfix29"));
    EXPECT_EQ(identifierStringToFxpDataType("int29"), identifierStringToFxpDataType("sfix29"));
}

const fxpDataTypeProp& readWhileLoading = identifierStringToFxpDataType("sfix21_En4_B1");
const std::string& writtenWhileLoading = fxpDataTypeToIdentifierString(&readWhileLoading);

TEST(IdentifierString, WorksWhileProgramsLoad) {
    EXPECT_EQ(&identifierStringToFxpDataType("sfix21_En4_B1"), &readWhileLoading);
    EXPECT_EQ(writtenWhileLoading, "sfix21_En4_B1");
}

TEST(IdentifierString, AFailureIsNotRemembered) {
    for (int i = 0; i < 3; ++i) {
        EXPECT_RAISES(identifierStringToFxpDataType("sfix16_E0"), invalidIdentifier, "sfix16_E0");
        EXPECT_THROW(identifierStringToFxpDataType("sfix16_E2147483648"), boost::bad_lexical_cast);
    }
}

TEST(IdentifierString, AnExponentThatLeaves32BitsRaises) {
    const char* text = "sfix16_F1p99999999999999999999_E2147483647"; // its factor rounds to 2.0
    EXPECT_RAISES(identifierStringToFxpDataType(text), invalidIdentifier, text);
}

TEST(IdentifierString, LongTexts) {
    const std::string digits(1000000, '7');
    EXPECT_EQ(identifierStringToFxpDataType("int" + digits).WordLength, -1); // kept: cut to 32 bits
    EXPECT_EQ(identifierStringToFxpDataType("sfix8_Sp" + digits),
              identifierStringToFxpDataType("sfix8_Sp77777777777777777777777"));
    EXPECT_EQ(identifierStringToFxpDataType("sfix8_B" + digits).Bias, infinity);
    EXPECT_THROW(identifierStringToFxpDataType("sfix8_E" + digits), boost::bad_lexical_cast);
    for (const std::string& text :
         {"int" + digits + "x", std::string(1000000, '_'), "sfix8_E0" + digits, "sfix8_Sp" + digits + "0",
          std::string(1000000, '\0'), std::string(1000000, '\xff')})
        EXPECT_RAISES(identifierStringToFxpDataType(text), invalidIdentifier, text);
}

struct WriterRow {
    const char* what;
    fxpDataTypeProp prop;
    const char* text;
};

// clang-format off
constexpr WriterRow writerRows[] = {
    {"plain integer",                    {FXP_DT_FIXPT, 1, 8, 0, 0, 1.0, 0.0, 0},         "int8"},
    {"plain unsigned",                   {FXP_DT_FIXPT, 0, 32, 0, 0, 1.0, 0.0, 0},        "uint32"},
    {"other width",                      {FXP_DT_FIXPT, 1, 7, 0, 0, 1.0, 0.0, 0},         "sfix7"},
    {"kept: open sign",                  {FXP_DT_FIXPT, 2, 16, 0, 0, 1.0, 0.0, 0},        "uint16"},
    {"kept: open sign, scaled",          {FXP_DT_FIXPT, 2, 16, 0, 1, 1.0, 0.0, 0},        "ufix16_E1"},
    {"kept: open sign, 64 bits",         {FXP_DT_FIXPT, 2, 64, 0, 0, 1.0, 0.0, 0},        "uint64"},
    {"kept: override is not written",    {FXP_DT_FIXPT, 1, 16, 0, 3, 1.0, 0.0, 1},        "sfix16_E3"},
    {"exponent bits are not written",    {FXP_DT_FIXPT, 1, 16, 9, 3, 1.0, 0.0, 0},        "sfix16_E3"},
    {"kept: no bits",                    {FXP_DT_FIXPT, 1, 0, 0, 0, 1.0, 0.0, 0},         "sfix0"},
    {"kept: negative bits",              {FXP_DT_FIXPT, 1, -4, 0, 0, 1.0, 0.0, 0},        "sfix-4"},
    {"smallest exponent",                {FXP_DT_FIXPT, 1, 16, 0, minInt, 1.0, 0.0, 0},   "sfix16_En2147483648"},
    {"largest exponent",                 {FXP_DT_FIXPT, 1, 16, 0, maxInt, 1.0, 0.0, 0},   "sfix16_E2147483647"},
    {"slope",                            {FXP_DT_FIXPT, 0, 8, 0, 1, 1.6, 2.0, 0},         "ufix8_S3p2_B2"},
    {"slope that needs an exponent",     {FXP_DT_FIXPT, 0, 8, 0, -33, 1.2884901888, 0.0, 0}, "ufix8_S1p5en10"},
    {"negative bias below one",          {FXP_DT_FIXPT, 0, 8, 0, 0, 1.0, -0.25, 0},       "ufix8_Bnp25"},
    {"negative zero is no bias",         {FXP_DT_FIXPT, 0, 8, 0, 0, 1.0, -0.0, 0},        "uint8"},
    {"last exponent with a slope",       {FXP_DT_FIXPT, 1, 16, 0, 1023, 1.5, 0.0, 0},     "sfix16_S1p348269851146737e308"},
    {"first exponent with a factor",     {FXP_DT_FIXPT, 1, 16, 0, 1024, 1.5, 0.0, 0},     "sfix16_F1p5_E1024"},
    {"lowest exponent with a slope",     {FXP_DT_FIXPT, 1, 16, 0, -1022, 1.5, 0.0, 0},    "sfix16_S3p337610787760802en308"},
    {"first exponent below",             {FXP_DT_FIXPT, 1, 16, 0, -1023, 1.5, 0.0, 0},    "sfix16_F1p5_En1023"},
    {"kept: slope 1 of two halves",      {FXP_DT_FIXPT, 1, 16, 0, 1, 0.5, 0.0, 0},        "sfix16"},
    {"kept: the same with a bias",       {FXP_DT_FIXPT, 1, 16, 0, -1, 2.0, 3.0, 0},       "sfix16_B3"},
    {"not normalised",                   {FXP_DT_FIXPT, 1, 16, 0, 0, 0.25, 0.0, 0},       "sfix16_Sp25"},
    {"kept: negative factor",            {FXP_DT_FIXPT, 1, 16, 0, 0, -1.5, 0.0, 0},       "sfix16_Sn1p5"},
    {"kept: negative factor outside",    {FXP_DT_FIXPT, 1, 16, 0, 2000, -1.5, 0.0, 0},    "sfix16_Fn1p5_E2000"},
    {"zero factor",                      {FXP_DT_FIXPT, 1, 16, 0, 0, 0.0, 0.0, 0},        "sfix16_S0"},
    {"infinite factor",                  {FXP_DT_FIXPT, 1, 16, 0, 0, infinity, 0.0, 0},   "sfix16_Sinf"},
    {"NaN factor",                       {FXP_DT_FIXPT, 1, 16, 0, 0, notANumber, 0.0, 0}, "sfix16_Snan"},
    {"infinite bias",                    {FXP_DT_FIXPT, 1, 16, 0, 0, 1.0, -infinity, 0},  "sfix16_Bninf"},
    {"a width of eight with a bias",     {FXP_DT_FIXPT, 1, 8, 0, 0, 1.0, 1.0, 0},         "sfix8_B1"},
    {"64 bits with an exponent",         {FXP_DT_FIXPT, 1, 64, 0, 1, 1.0, 0.0, 0},        "sfix64_E1"},
    {"scaled double",                    {FXP_DT_SCALED_DOUBLE, 1, 16, 0, -7, 1.0, 0.0, 0}, "flts16_En7"},
    {"scaled double, plain 8 bits",      {FXP_DT_SCALED_DOUBLE, 0, 8, 0, 0, 1.0, 0.0, 0}, "fltu8"},
    {"scaled double, plain 64 bits",     {FXP_DT_SCALED_DOUBLE, 1, 64, 0, 0, 1.0, 0.0, 0}, "flts64"},
    {"scaled double, open sign",         {FXP_DT_SCALED_DOUBLE, 2, 64, 0, 0, 1.0, 0.0, 0}, "fltu64"},
    {"double",                           {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 0.0, 0},      "double"},
    {"kept: double with anything",       {FXP_DT_DOUBLE, 0, 8, 3, 7, 1.5, 9.0, 1},        "double"},
    {"kept: single with anything",       {FXP_DT_SINGLE, 0, 8, 3, 7, 1.0, 0.0, 1},        "single"},
    {"kept: boolean with anything",      {FXP_DT_BOOLEAN, 1, 8, 3, 7, 1.5, 9.0, 1},       "boolean"},
    {"half",                             {FXP_DT_CUSTOM_FLOAT, 1, 16, 5, 0, 1.0, 0.0, 0}, "half"},
    {"kept: any custom float",           {FXP_DT_CUSTOM_FLOAT, 1, 128, 15, 0, 1.0, 0.0, 0}, "half"},
    {"kept: any scaled custom float",    {FXP_DT_CUSTOM_FLOAT, 1, 8, 4, 3, 1.5, 1.0, 0},  "half"},
};
// clang-format on

TEST(IdentifierString, RecordsAreWrittenAsTheRowsSay) {
    for (const WriterRow& row : writerRows) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(written(row.prop), row.text);
        EXPECT_EQ(reference::writeIdentifier(row.prop, true), row.text);
    }
}

TEST(IdentifierString, AWrittenTextStays) {
    const fxpDataTypeProp plain{FXP_DT_FIXPT, 1, 23, 0, -7, 1.0, 0.0, 0};
    const fxpDataTypeProp scaled{FXP_DT_FIXPT, 1, 23, 0, -7, 1.5, 2.0, 0};
    const std::string& plainText = fxpDataTypeToIdentifierString(&plain);
    const std::string& scaledText = fxpDataTypeToIdentifierString(&scaled);
    for (int bits = 1; bits < 5000; ++bits) {
        fxpDataTypeProp other = bits % 2 ? plain : scaled;
        other.WordLength = 1000 + bits;
        fxpDataTypeToIdentifierString(&other);
    }
    EXPECT_EQ(&fxpDataTypeToIdentifierString(&plain), &plainText);
    EXPECT_EQ(&fxpDataTypeToIdentifierString(&scaled), &scaledText);
    EXPECT_EQ(plainText, "sfix23_En7");
    EXPECT_EQ(scaledText, "sfix23_Sp01171875_B2");
}

TEST(IdentifierString, NameOf64BitIntegersFollowsTheFlagAtOnce) { // kept: outside the cache
    const fxpDataTypeProp int64{FXP_DT_FIXPT, 1, 64, 0, 0, 1.0, 0.0, 0};
    const fxpDataTypeProp uint64{FXP_DT_FIXPT, 0, 64, 0, 0, 1.0, 0.0, 1};
    EXPECT_EQ(written(int64), "int64");
    EXPECT_EQ(written(uint64), "uint64");
    fxpTypesFeature::setUseTorvexNameForInt64(false);
    EXPECT_EQ(written(int64), "sfix64");
    EXPECT_EQ(written(uint64), "ufix64");
    EXPECT_EQ(&fxpDataTypeToIdentifierString(&int64), &fxpDataTypeToIdentifierString(&int64));
    for (const char* name : {"int64", "uint64", "sfix64", "ufix64"})
        EXPECT_EQ(identifierStringToFxpDataType(name).WordLength, 64) << name; // read whatever the flag says
    fxpTypesFeature::setUseTorvexNameForInt64(true);
    EXPECT_EQ(written(int64), "int64");
    EXPECT_EQ(written(uint64), "uint64");
}

TEST(IdentifierString, RandomRecordsRoundTrip) {
    constexpr unsigned long long seed = 5;
    SCOPED_TRACE(seed);
    std::mt19937_64 random(seed);
    for (int i = 0; i < 40000; ++i) {
        const fxpDataTypeProp prop = randomProp(random);
        const std::string text = written(prop);
        SCOPED_TRACE(text);
        ASSERT_EQ(text, reference::writeIdentifier(prop, true));
        ASSERT_EQ(identifierStringToFxpDataType(text), prop);
    }
}

TEST(IdentifierString, RandomRecordsOfAnyKindAreWrittenAsTheReferenceDoes) {
    constexpr unsigned long long seed = 6;
    SCOPED_TRACE(seed);
    std::mt19937_64 random(seed);
    for (int i = 0; i < 20000; ++i) {
        fxpDataTypeProp prop = randomProp(random);
        prop.DataTypeMode = static_cast<fxpModeDataType>(random() % 6);
        prop.Signedness = random() % 3;
        prop.ExponentLength = random() % 12;
        prop.DataTypeOverrideOff = random() % 2;
        if (random() % 2) prop.SlopeAdjustmentFactor = randomDouble(random);
        if (prop.SlopeAdjustmentFactor == 0.0) continue; // the two zeros share a text, that of the first asked for
        ASSERT_EQ(written(prop), reference::writeIdentifier(prop, true)) << prop;
    }
}

} // namespace
