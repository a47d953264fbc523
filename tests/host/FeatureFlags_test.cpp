#include <gtest/gtest.h>

#include "qltypes/host/FeatureFlags.h"

namespace {

struct FlagRow {
    const char* name;
    const char* description;
    const char* sourceFile;
    const char* group;
    int numericId;
    int defaultState;
    QlFeature* const* exported; // null: no exported pointer
};

const FlagRow flagRows[] = {
    {"EnableEffectiveDataType", "Enable contained datatype to be the effective type", "DataTypeTableUtils",
     "Quillane Data Managment[Data Types]", 2187101, 0, &QLFEAT_EnableEffectiveDataType},
    {"QLHalfPrecisionSupport", "For half precision data type support", "FixPointDefs", "[Quillane Block]", 1809915, 17,
     &QLFEAT_QLHalfPrecisionSupport},
    {"QLInt64", "Supporting int64/uint64 as built-in data types", "IntegerDataType", "[Quillane Data Management]",
     1803837, 4, &QLFEAT_QLInt64},
    {"QLStringSupportRapidAccel", "String data type support in rapid accelerator mode", "StringDataType",
     "[Quillane Block]", 1557752, 2, &QLFEAT_QLStringSupportRapidAccel},
    {"UseTorvexNameForInt64", "Change registered name for 64 bit integers from u/sfix64 to (u)int64.",
     "fxpTypesFeatureControl", "Quillane", 1205465, 1, &QLFEAT_UseTorvexNameForInt64},
    {"PreserveEnumsWithDuplicateValues", "Preserve original string for enums with duplicate underlying value",
     "ql_enum_utils", "Quillane Data Management", 1459096, 0, nullptr},
    {"AbsoluteTime", "Quillane Absolute Time", "date_time/DateTimeStruct", "Quillane Support Absolute Time", 906590, 0,
     &QLFEAT_AbsoluteTime},
    {"SymbolicDimsMaxConstraintInCode", "Enable Symbolic Dimension Max constraint check",
     "dimensions/QLSymbolicDimsConstraints", "SymbolicDimensions[Constraints]", 1960647, 1, nullptr},
    {"SymbolicDimensionDefaultMinimum", "Default minimum for symbolic dimension", "dimensions/SymbolicDims",
     "Quillane[Dimensions]", 11111, 1, nullptr},
    {"QLImageType",
     "Image type support: Enables specification and propagation of Image as a first-class concept in Quillane.",
     "image/ImageDataType", "Quillane Engine [Signal Dimensions]", 2075806, 0, &QLFEAT_QLImageType},
};

TEST(FeatureFlags, EachHasItsRow) {
    for (const FlagRow& row : flagRows) {
        SCOPED_TRACE(row.name);
        const QlFeature* flag = QlFeature::find(row.name);
        ASSERT_NE(flag, nullptr);
        EXPECT_STREQ(flag->description(), row.description);
        EXPECT_STREQ(flag->sourceFile(), row.sourceFile);
        EXPECT_STREQ(flag->group(), row.group);
        EXPECT_EQ(flag->numericId(), row.numericId);
        EXPECT_EQ(flag->defaultState(), row.defaultState);
        EXPECT_EQ(flag->state(), row.defaultState);
        EXPECT_FALSE(flag->callback());
        if (row.exported) {
            EXPECT_EQ(flag, *row.exported);
        }
    }
}

TEST(FeatureFlags, HooksHaveTheirRows) {
    EXPECT_EQ(QlTestingHook::find("ImageTypeImplementation"), QLTH_ImageTypeImplementation);
    EXPECT_STREQ(QLTH_ImageTypeImplementation->description(), "Choose implementation for image type");
    EXPECT_STREQ(QLTH_ImageTypeImplementation->sourceFile(), "DataTypeTable");
    EXPECT_STREQ(QLTH_ImageTypeImplementation->group(), "Quillane Engine");
    EXPECT_EQ(QLTH_ImageTypeImplementation->state(), 0);
    EXPECT_EQ(QlTestingHook::find("DisplayDynamicMatrixType"), QLTH_DisplayDynamicMatrixType);
    EXPECT_STREQ(QLTH_DisplayDynamicMatrixType->description(),
                 "Display the Dynamic Matrix type instead of the underlying type");
    EXPECT_STREQ(QLTH_DisplayDynamicMatrixType->sourceFile(), "dynamic_matrix/DynamicMatrixDataType");
    EXPECT_STREQ(QLTH_DisplayDynamicMatrixType->group(), "Quillane Engine");
    EXPECT_EQ(QLTH_DisplayDynamicMatrixType->state(), 0);
    EXPECT_EQ(QlTestingHook::all().size(), 2u);
}

TEST(FeatureFlags, StateIsReadAtEachUseAndUnknownNamesAreNull) {
    QLFEAT_QLImageType->setState(3);
    EXPECT_EQ(QlFeature::find("QLImageType")->state(), 3);
    EXPECT_EQ(QLFEAT_QLImageType->defaultState(), 0);
    QLFEAT_QLImageType->setState(0);
    EXPECT_EQ(QlFeature::find("NoSuchFlag"), nullptr);
    EXPECT_EQ(QlTestingHook::find("NoSuchHook"), nullptr);
}

TEST(FeatureFlags, AFlagGoesWithItsObject) {
    const std::size_t before = QlFeature::all().size();
    {
        QlFeature own("AOwnFlag", "d", "s", "g", 1, 2, {});
        EXPECT_EQ(QlFeature::find("AOwnFlag"), &own);
        EXPECT_EQ(QlFeature::all().front()->name(), std::string("AOwnFlag"));
    }
    EXPECT_EQ(QlFeature::find("AOwnFlag"), nullptr);
    EXPECT_EQ(QlFeature::all().size(), before);
}

} // namespace
