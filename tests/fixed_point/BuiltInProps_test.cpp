#include <gtest/gtest.h>

#include "qltypes/fixed_point/BuiltInProps.h"
#include "tests/fixed_point/Props.h"
#include "tests/support/Raises.h"

namespace {

struct BuiltInRow {
    int id;
    const char* name;
    fxpDataTypeProp props;
};

// clang-format off
constexpr BuiltInRow builtInRows[] = {
    {0, "double",  {FXP_DT_DOUBLE,  1, 64, 11, 0, 1.0, 0.0, 0}},
    {1, "single",  {FXP_DT_SINGLE,  1, 32,  8, 0, 1.0, 0.0, 0}},
    {2, "int8",    {FXP_DT_FIXPT,   1,  8,  0, 0, 1.0, 0.0, 0}},
    {3, "uint8",   {FXP_DT_FIXPT,   0,  8,  0, 0, 1.0, 0.0, 0}},
    {4, "int16",   {FXP_DT_FIXPT,   1, 16,  0, 0, 1.0, 0.0, 0}},
    {5, "uint16",  {FXP_DT_FIXPT,   0, 16,  0, 0, 1.0, 0.0, 0}},
    {6, "int32",   {FXP_DT_FIXPT,   1, 32,  0, 0, 1.0, 0.0, 0}},
    {7, "uint32",  {FXP_DT_FIXPT,   0, 32,  0, 0, 1.0, 0.0, 0}},
    {8, "boolean", {FXP_DT_BOOLEAN, 0,  8,  0, 0, 1.0, 0.0, 0}},
};
// clang-format on

TEST(BuiltInProps, EachHasItsNameAndRecord) {
    ASSERT_EQ(std::size(builtInRows), std::size_t{FXP::numBuiltInProps});
    for (const BuiltInRow& row : builtInRows) {
        SCOPED_TRACE(row.name);
        EXPECT_STREQ(FXP::getBuiltInName(row.id), row.name);
        EXPECT_EQ(FXP::getBuiltInProps(row.id), row.props);
        EXPECT_EQ(FXP::findBuiltInProps(row.name), &FXP::getBuiltInProps(row.id));
        EXPECT_TRUE(row.props.validateFxpDTProp());
    }
}

TEST(BuiltInProps, OtherIdentifiersRaise) {
    for (const int id : {-10, -1, 9, 14, 2147483647, -2147483647 - 1}) {
        SCOPED_TRACE(id);
        EXPECT_RAISES(FXP::getBuiltInProps(id), "QuillaneTypes:general:InvalidBuiltinDataTypeId", id);
        EXPECT_RAISES(FXP::getBuiltInName(id), "QuillaneTypes:general:InvalidBuiltinDataTypeId", id);
    }
}

TEST(BuiltInProps, OtherNamesAreNull) {
    using namespace std::literals;
    for (const std::string_view name : {""sv, "half"sv, "Double"sv, "int64"sv, "int8 "sv, "int8\0"sv, "int"sv}) {
        SCOPED_TRACE(name);
        EXPECT_EQ(FXP::findBuiltInProps(name), nullptr);
    }
}

TEST(BuiltInProps, HalfIsACustomFloat) {
    EXPECT_EQ(FXP::halfProps, (fxpDataTypeProp{FXP_DT_CUSTOM_FLOAT, 1, 16, 5, 0, 1.0, 0.0, 0}));
    EXPECT_TRUE(FXP::halfProps.validateFxpDTProp());
}

} // namespace
