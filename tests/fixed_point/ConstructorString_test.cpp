#include <limits>
#include <random>

#include <boost/lexical_cast/bad_lexical_cast.hpp>
#include <gtest/gtest.h>

#include "qltypes/fixed_point/BuiltInProps.h"
#include "qltypes/fixed_point/ConstructorString.h"
#include "tests/fixed_point/Props.h"
#include "tests/fixed_point/TextCases.h"
#include "tests/support/Raises.h"

namespace {

using namespace FxpDT;
using reference::Ending;

constexpr const char* invalidConstructor = "QuillaneTypes:general:InvalidNumericTypeDirectConstructor";
constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double notANumber = std::numeric_limits<double>::quiet_NaN();
constexpr int minInt = std::numeric_limits<int>::min();

void expectReading(const std::string& text, const reference::Reading& expected) {
    SCOPED_TRACE(shown(text));
    switch (expected.ending) {
    case Ending::read:
        EXPECT_EQ(constructorStringToFxpDataType(text).prop, expected.prop);
        EXPECT_EQ(constructorStringToFxpDataType(text).ScalingGiven, expected.scalingGiven);
        break;
    case Ending::invalid:
        EXPECT_RAISES(constructorStringToFxpDataType(text), invalidConstructor, text);
        break;
    case Ending::badCast:
        EXPECT_THROW(constructorStringToFxpDataType(text), boost::bad_lexical_cast); // kept
        break;
    }
}

TEST(ConstructorString, CasesReadAsTheTableSays) {
    for (TextCase& one : textCases("constructor_strings.tsv")) {
        SCOPED_TRACE(one.line);
        one.reading.scalingGiven = one.lastColumn != "0";
        expectReading(one.text, one.reading);
    }
}

TEST(ConstructorString, CasesReadAsTheReferenceDoes) {
    for (const TextCase& one : textCases("constructor_strings.tsv")) {
        SCOPED_TRACE(one.line);
        expectReading(one.text, reference::readConstructor(one.text));
    }
}

TEST(ConstructorString, RandomTextsReadAsTheReferenceDoes) {
    constexpr unsigned long long seed = 20240613;
    SCOPED_TRACE(seed);
    std::mt19937_64 random(seed);
    int numRead = 0;
    for (int i = 0; i < 60000 && !testing::Test::HasFailure(); ++i) {
        const std::string text = randomConstructor(random);
        const reference::Reading expected = reference::readConstructor(text);
        numRead += expected.ending == Ending::read;
        expectReading(text, expected);
    }
    EXPECT_GT(numRead, 6000);
}

TEST(ConstructorString, ATextIsReadOnceAndItsResultStays) {
    const fxpCtorParseResult& first = constructorStringToFxpDataType("fixdt(1,29,11)");
    for (int bits = 1; bits < 20000; ++bits)
        constructorStringToFxpDataType("fixdt(0," + std::to_string(bits) + ",3)");
    EXPECT_EQ(&constructorStringToFxpDataType(std::string("fixdt(1,29,11)")), &first);
    EXPECT_EQ(&constructorStringToFxpDataType(std::string_view("fixdt(1,29,11) ").substr(0, 14)), &first);
    EXPECT_EQ(first.prop, (fxpDataTypeProp{FXP_DT_FIXPT, 1, 29, 0, -11, 1.0, 0.0, 0}));
    // kept: the same result under another text is another entry.
    EXPECT_NE(&constructorStringToFxpDataType("FIXDT(1,29,11)"), &first);
    EXPECT_EQ(constructorStringToFxpDataType("FIXDT(1,29,11)").prop, first.prop);
}

TEST(ConstructorString, AFailureIsNotRemembered) {
    for (int i = 0; i < 3; ++i) {
        EXPECT_RAISES(constructorStringToFxpDataType("Foo(1,16)"), invalidConstructor, "Foo(1,16)"); // as passed in
        EXPECT_THROW(constructorStringToFxpDataType("fixdt(1)"), boost::bad_lexical_cast);
    }
}

TEST(ConstructorString, LongTexts) {
    const std::size_t million = 1000000;
    EXPECT_EQ(constructorStringToFxpDataType("fixdt(1,16" + std::string(million, ')')).prop.WordLength, 16);
    EXPECT_EQ(constructorStringToFxpDataType("fixdt(1," + std::string(million, '0') + "16)").prop.WordLength, 16);
    EXPECT_EQ(constructorStringToFxpDataType("fixdt(1,16,." + std::string(million, '7') + ",0)").prop.FixedExponent,
              -1);
    EXPECT_THROW(constructorStringToFxpDataType("fixdt(1," + std::string(million, '7') + ")"), boost::bad_lexical_cast);
    for (const std::string& text :
         {std::string(million, ','), std::string(million, '('), std::string(million, '\''), std::string(million, '\0'),
          std::string(million, '\xff'), "fixdt(" + std::string(million, ',') + "1,16)",
          "fixdt(1,16," + std::string(million, ',') + "1)", "fixdt('" + std::string(million, 'x') + "')"})
        EXPECT_RAISES(constructorStringToFxpDataType(text), invalidConstructor, text);
}

struct WriterRow {
    const char* what;
    fxpDataTypeProp prop;
    const char* texts[6]; // numerictype and fixdt by fraction length, by slope and bias, without scaling
};

// clang-format off
constexpr WriterRow writerRows[] = {
    {"plain integer", {FXP_DT_FIXPT, 1, 16, 0, 0, 1.0, 0.0, 0},
     {"numerictype(1,16,0)", "fixdt(1,16,0)", "numerictype(1,16,1,0)", "fixdt(1,16,1,0)", "numerictype(1,16)", "fixdt(1,16)"}},
    {"fraction", {FXP_DT_FIXPT, 1, 16, 0, -7, 1.0, 0.0, 0},
     {"numerictype(1,16,7)", "fixdt(1,16,7)", "numerictype(1,16,0.0078125,0)", "fixdt(1,16,0.0078125,0)", "numerictype(1,16)", "fixdt(1,16)"}},
    {"negative fraction", {FXP_DT_FIXPT, 0, 8, 0, 3, 1.0, 0.0, 0},
     {"numerictype(0,8,-3)", "fixdt(0,8,-3)", "numerictype(0,8,8,0)", "fixdt(0,8,8,0)", "numerictype(0,8)", "fixdt(0,8)"}},
    {"open sign", {FXP_DT_FIXPT, 2, 8, 0, -4, 1.0, 0.0, 0},
     {"numerictype([],8,4)", "fixdt([],8,4)", "numerictype([],8,0.0625,0)", "fixdt([],8,0.0625,0)", "numerictype([],8)", "fixdt([],8)"}},
    {"any other sign", {FXP_DT_FIXPT, 7, 8, 0, 0, 1.0, 0.0, 0},
     {"numerictype([],8,0)", "fixdt([],8,0)", "numerictype([],8,1,0)", "fixdt([],8,1,0)", "numerictype([],8)", "fixdt([],8)"}},
    {"factor", {FXP_DT_FIXPT, 0, 8, 0, 1, 1.6, 0.0, 0},
     {"numerictype(0,8,3.2,0)", "fixdt(0,8,3.2,0)", "numerictype(0,8,3.2,0)", "fixdt(0,8,3.2,0)", "numerictype(0,8)", "fixdt(0,8)"}},
    {"bias alone", {FXP_DT_FIXPT, 0, 8, 0, -1, 1.0, -2.5, 0},
     {"numerictype(0,8,0.5,-2.5)", "fixdt(0,8,0.5,-2.5)", "numerictype(0,8,0.5,-2.5)", "fixdt(0,8,0.5,-2.5)", "numerictype(0,8)", "fixdt(0,8)"}},
    {"large exponent", {FXP_DT_FIXPT, 1, 8, 0, 1024, 1.5, 2.0, 0},
     {"numerictype(1,8,1.5,1024,2)", "fixdt(1,8,1.5,1024,2)", "numerictype(1,8,1.5,1024,2)", "fixdt(1,8,1.5,1024,2)", "numerictype(1,8)", "fixdt(1,8)"}},
    {"largest exponent with a slope", {FXP_DT_FIXPT, 1, 8, 0, 1023, 1.0, 0.0, 0},
     {"numerictype(1,8,-1023)", "fixdt(1,8,-1023)", "numerictype(1,8,8.98846567431158e+307,0)", "fixdt(1,8,8.98846567431158e+307,0)", "numerictype(1,8)", "fixdt(1,8)"}},
    {"smallest exponent with a slope", {FXP_DT_FIXPT, 1, 8, 0, -1022, 1.0, 0.0, 0},
     {"numerictype(1,8,1022)", "fixdt(1,8,1022)", "numerictype(1,8,2.2250738585072014e-308,0)", "fixdt(1,8,2.2250738585072014e-308,0)", "numerictype(1,8)", "fixdt(1,8)"}},
    {"first exponent below", {FXP_DT_FIXPT, 1, 8, 0, -1023, 1.0, 0.0, 0},
     {"numerictype(1,8,1023)", "fixdt(1,8,1023)", "numerictype(1,8,1,-1023,0)", "fixdt(1,8,1,-1023,0)", "numerictype(1,8)", "fixdt(1,8)"}},
    {"smallest exponent", {FXP_DT_FIXPT, 1, 8, 0, minInt, 1.0, 0.0, 0},
     {"numerictype(1,8,2147483648)", "fixdt(1,8,2147483648)", "numerictype(1,8,1,-2147483648,0)", "fixdt(1,8,1,-2147483648,0)", "numerictype(1,8)", "fixdt(1,8)"}},
    {"kept: word length as unsigned", {FXP_DT_FIXPT, 1, -1, 0, 0, 1.0, 0.0, 0},
     {"numerictype(1,4294967295,0)", "fixdt(1,4294967295,0)", "numerictype(1,4294967295,1,0)", "fixdt(1,4294967295,1,0)", "numerictype(1,4294967295)", "fixdt(1,4294967295)"}},
    {"override off", {FXP_DT_FIXPT, 1, 16, 0, -7, 1.0, 0.0, 1},
     {"numerictype(1,16,7,'DataTypeOverride','Off')", "fixdt(1,16,7,'DataTypeOverride','Off')", "numerictype(1,16,0.0078125,0,'DataTypeOverride','Off')",
      "fixdt(1,16,0.0078125,0,'DataTypeOverride','Off')", "numerictype(1,16,'DataTypeOverride','Off')", "fixdt(1,16,'DataTypeOverride','Off')"}},
    {"override other than 1", {FXP_DT_FIXPT, 1, 15, 0, 0, 1.0, 0.0, 2},
     {"numerictype(1,15,0)", "fixdt(1,15,0)", "numerictype(1,15,1,0)", "fixdt(1,15,1,0)", "numerictype(1,15)", "fixdt(1,15)"}},
    {"scaled double: never fixdt", {FXP_DT_SCALED_DOUBLE, 1, 16, 0, -7, 1.0, 0.0, 0},
     {"numerictype(1,16,7,'DataType','ScaledDouble')", "numerictype(1,16,7,'DataType','ScaledDouble')", "numerictype(1,16,0.0078125,0,'DataType','ScaledDouble')",
      "numerictype(1,16,0.0078125,0,'DataType','ScaledDouble')", "numerictype(1,16,'DataType','ScaledDouble')", "numerictype(1,16,'DataType','ScaledDouble')"}},
    {"scaled double, override off", {FXP_DT_SCALED_DOUBLE, 0, 9, 0, 0, 1.5, 0.0, 1},
     {"numerictype(0,9,1.5,0,'DataType','ScaledDouble','DataTypeOverride','Off')", "numerictype(0,9,1.5,0,'DataType','ScaledDouble','DataTypeOverride','Off')",
      "numerictype(0,9,1.5,0,'DataType','ScaledDouble','DataTypeOverride','Off')", "numerictype(0,9,1.5,0,'DataType','ScaledDouble','DataTypeOverride','Off')",
      "numerictype(0,9,'DataType','ScaledDouble','DataTypeOverride','Off')", "numerictype(0,9,'DataType','ScaledDouble','DataTypeOverride','Off')"}},
    {"double", {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 0.0, 0},
     {"numerictype('double')", "fixdt('double')", "numerictype('double')", "fixdt('double')", "numerictype('double')", "fixdt('double')"}},
    {"single, override off", {FXP_DT_SINGLE, 1, 32, 8, 0, 1.0, 0.0, 1},
     {"numerictype('single','DataTypeOverride','Off')", "fixdt('single','DataTypeOverride','Off')", "numerictype('single','DataTypeOverride','Off')",
      "fixdt('single','DataTypeOverride','Off')", "numerictype('single','DataTypeOverride','Off')", "fixdt('single','DataTypeOverride','Off')"}},
    {"boolean", {FXP_DT_BOOLEAN, 0, 8, 0, 0, 1.0, 0.0, 0},
     {"numerictype('boolean')", "fixdt('boolean')", "numerictype('boolean')", "fixdt('boolean')", "numerictype('boolean')", "fixdt('boolean')"}},
    {"kept: boolean, override off", {FXP_DT_BOOLEAN, 0, 8, 0, 0, 1.0, 0.0, 1},
     {"numerictype('boolean')", "fixdt('boolean')", "numerictype('boolean')", "fixdt('boolean')", "numerictype('boolean')", "fixdt('boolean')"}},
    {"half", {FXP_DT_CUSTOM_FLOAT, 1, 16, 5, 0, 1.0, 0.0, 0},
     {"numerictype('half')", "fixdt('half')", "numerictype('half')", "fixdt('half')", "numerictype('half')", "fixdt('half')"}},
    {"kept: any custom float, override off", {FXP_DT_CUSTOM_FLOAT, 1, 128, 15, 0, 1.0, 0.0, 1},
     {"numerictype('half','DataTypeOverride','Off')", "fixdt('half','DataTypeOverride','Off')", "numerictype('half','DataTypeOverride','Off')",
      "fixdt('half','DataTypeOverride','Off')", "numerictype('half','DataTypeOverride','Off')", "fixdt('half','DataTypeOverride','Off')"}},
    {"numbers that are not finite", {FXP_DT_FIXPT, 1, 16, 0, 0, infinity, notANumber, 0},
     {"numerictype(1,16,inf,nan)", "fixdt(1,16,inf,nan)", "numerictype(1,16,inf,nan)", "fixdt(1,16,inf,nan)", "numerictype(1,16)", "fixdt(1,16)"}},
};
// clang-format on

constexpr baseCtorPrefer bases[] = {PreferNumerictype, PreferFixdt};
constexpr scalingRepPrefer reps[] = {PreferFractionLength, PreferSlopeBias, PreferNoScaling};

TEST(ConstructorString, RecordsAreWrittenAsTheRowsSay) {
    for (const WriterRow& row : writerRows) {
        SCOPED_TRACE(row.what);
        for (int index = 0; index < 6; ++index)
            EXPECT_EQ(fxpDataTypeToConstructorString(row.prop, bases[index % 2], reps[index / 2]), row.texts[index]);
    }
}

TEST(ConstructorString, AWrittenTextStays) {
    const fxpDataTypeProp prop{FXP_DT_FIXPT, 1, 31, 0, -9, 1.25, 2.0, 0};
    const std::string* texts[6];
    for (int index = 0; index < 6; ++index)
        texts[index] = &fxpDataTypeToConstructorString(prop, bases[index % 2], reps[index / 2]);
    for (int bits = 1; bits < 5000; ++bits)
        fxpDataTypeToConstructorString({FXP_DT_FIXPT, 1, 1000 + bits, 0, -9, 1.25, 2.0, 0}, PreferFixdt,
                                       PreferSlopeBias);
    for (int index = 0; index < 6; ++index) {
        EXPECT_EQ(&fxpDataTypeToConstructorString(prop, bases[index % 2], reps[index / 2]), texts[index]);
        for (int other = 0; other < index; ++other)
            EXPECT_NE(texts[index], texts[other]);
    }
}

TEST(ConstructorString, GutsAppend) {
    std::string text = "before:";
    fxpDataTypeToConstructorString_FixptGuts(text, {FXP_DT_FIXPT, 1, 16, 0, -7, 1.0, 0.0, 1}, PreferFractionLength);
    EXPECT_EQ(text, "before:1,16,7");
    fxpDataTypeToConstructorString_FixptGuts(text, {FXP_DT_SCALED_DOUBLE, 0, 9, 0, 0, 1.0, 0.0, 0}, PreferNoScaling);
    EXPECT_EQ(text, "before:1,16,70,9,'DataType','ScaledDouble'");
    text.clear();
    fxpDataTypeToConstructorString_FixptGuts(text, {FXP_DT_FIXPT, 1, 16, 0, 1, 1.0, 0.0, 0}, scalingRepPrefer(3));
    EXPECT_EQ(text, "1,16,2,0"); // any other preference is slope and bias
}

TEST(ConstructorString, RandomRecordsRoundTrip) {
    constexpr unsigned long long seed = 7;
    SCOPED_TRACE(seed);
    std::mt19937_64 random(seed);
    for (int i = 0; i < 40000; ++i) {
        fxpDataTypeProp prop = randomProp(random);
        prop.Signedness = random() % 3;
        prop.DataTypeOverrideOff = random() % 2;
        const baseCtorPrefer base = bases[random() % 2];
        const bool noScaling = prop.SlopeAdjustmentFactor == 1.0 && prop.FixedExponent == 0 && prop.Bias == 0.0;
        for (const scalingRepPrefer rep : reps) {
            const std::string& text = fxpDataTypeToConstructorString(prop, base, rep);
            SCOPED_TRACE(text);
            const fxpCtorParseResult& result = constructorStringToFxpDataType(text);
            ASSERT_EQ(result.ScalingGiven, rep != PreferNoScaling);
            if (rep != PreferNoScaling || noScaling) {
                ASSERT_EQ(result.prop, prop);
            }
        }
    }
}

TEST(ConstructorString, FloatsAndBooleansRoundTrip) {
    for (const int id : {0, 1, 8})
        for (const baseCtorPrefer base : bases)
            EXPECT_EQ(constructorStringToFxpDataType(
                          fxpDataTypeToConstructorString(FXP::getBuiltInProps(id), base, PreferSlopeBias))
                          .prop,
                      FXP::getBuiltInProps(id));
    EXPECT_EQ(
        constructorStringToFxpDataType(fxpDataTypeToConstructorString(FXP::halfProps, PreferFixdt, PreferNoScaling))
            .prop,
        FXP::halfProps);
}

} // namespace
