#include "qltypes/host/FeatureFlags_internal.h"

namespace {

// clang-format off
QlFeature enableEffectiveDataType("EnableEffectiveDataType", "Enable contained datatype to be the effective type", "DataTypeTableUtils", "Quillane Data Managment[Data Types]", 2187101, 0, {}); // kept: "Managment"
QlFeature halfPrecisionSupport("QLHalfPrecisionSupport", "For half precision data type support", "FixPointDefs", "[Quillane Block]", 1809915, 17, {});
QlFeature int64("QLInt64", "Supporting int64/uint64 as built-in data types", "IntegerDataType", "[Quillane Data Management]", 1803837, 4, {});
QlFeature stringSupportRapidAccel("QLStringSupportRapidAccel", "String data type support in rapid accelerator mode", "StringDataType", "[Quillane Block]", 1557752, 2, {});
QlFeature useTorvexNameForInt64("UseTorvexNameForInt64", "Change registered name for 64 bit integers from u/sfix64 to (u)int64.", "fxpTypesFeatureControl", "Quillane", 1205465, 1, {});
QlFeature preserveEnums("PreserveEnumsWithDuplicateValues", "Preserve original string for enums with duplicate underlying value", "ql_enum_utils", "Quillane Data Management", 1459096, 0, {});
QlFeature absoluteTime("AbsoluteTime", "Quillane Absolute Time", "date_time/DateTimeStruct", "Quillane Support Absolute Time", 906590, 0, {});
QlFeature maxConstraintInCode("SymbolicDimsMaxConstraintInCode", "Enable Symbolic Dimension Max constraint check", "dimensions/QLSymbolicDimsConstraints", "SymbolicDimensions[Constraints]", 1960647, 1, {});
QlFeature dimensionDefaultMinimum("SymbolicDimensionDefaultMinimum", "Default minimum for symbolic dimension", "dimensions/SymbolicDims", "Quillane[Dimensions]", 11111, 1, {});
QlFeature imageType("QLImageType", "Image type support: Enables specification and propagation of Image as a first-class concept in Quillane.", "image/ImageDataType", "Quillane Engine [Signal Dimensions]", 2075806, 0, {});

QlTestingHook imageTypeImplementation("ImageTypeImplementation", "Choose implementation for image type", "DataTypeTable", "Quillane Engine", 0, {});
QlTestingHook displayDynamicMatrixType("DisplayDynamicMatrixType", "Display the Dynamic Matrix type instead of the underlying type", "dynamic_matrix/DynamicMatrixDataType", "Quillane Engine", 0, {});
// clang-format on

} // namespace

QlFeature* QLFEAT_EnableEffectiveDataType = &enableEffectiveDataType;
QlFeature* QLFEAT_QLHalfPrecisionSupport = &halfPrecisionSupport;
QlFeature* QLFEAT_QLInt64 = &int64;
QlFeature* QLFEAT_QLStringSupportRapidAccel = &stringSupportRapidAccel;
QlFeature* QLFEAT_UseTorvexNameForInt64 = &useTorvexNameForInt64;
QlFeature* QLFEAT_AbsoluteTime = &absoluteTime;
QlFeature* QLFEAT_QLImageType = &imageType;

QlTestingHook* QLTH_ImageTypeImplementation = &imageTypeImplementation;
QlTestingHook* QLTH_DisplayDynamicMatrixType = &displayDynamicMatrixType;

namespace QLTypeSys {

QlFeature* const preserveEnumsWithDuplicateValues = &preserveEnums;
QlFeature* const symbolicDimsMaxConstraintInCode = &maxConstraintInCode;
QlFeature* const symbolicDimensionDefaultMinimum = &dimensionDefaultMinimum;

} // namespace QLTypeSys
