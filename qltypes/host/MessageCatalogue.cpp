#include "qltypes/host/MessageCatalogue.h"

#include <algorithm>
#include <array>
#include <iterator>

#include "qlplatform/services/MessageTexts.h"

namespace QLTypeSys {

namespace {

// clang-format off
constexpr CatalogueRow catalogue[] = {
    {"QuillaneTypes:general", "InvalidBuiltinDataTypeId", "L", "{0} is no identifier of a built-in type"},
    {"QuillaneTypes:general", "InvalidDataTypeId", "L", "{0} is no data type identifier of this table"},
    {"QuillaneTypes:general", "CannotSetPropertyOfAliasType", "SS", "property {0} of alias '{1}' cannot be set: set it on the type that it stands for"},
    {"QuillaneTypes:general", "CannotModifyDataTypeSize", "SL", "size of '{0}' is {1} and cannot be changed"},
    {"QuillaneTypes:general", "InvalidDataTypeSize", "SL", "size of '{0}' cannot be {1}: it must be above 0"},
    {"QuillaneTypes:general", "CannotSetGroundRepBeforeSettingSize", "S", "ground of '{0}' cannot be set before its size"},
    {"QuillaneTypes:general", "CannotModifyDataTypeGroundRepresentation", "S", "ground of '{0}' is set and cannot become another one"},
    {"QuillaneTypes:general", "CannotSetPropertiesBeforeSettingSize", "S", "properties of '{0}' cannot be set before their size"},
    {"QuillaneTypes:general", "CannotModifyDataTypeProperties", "S", "properties of '{0}' are set and cannot become other ones"},
    {"QuillaneTypes:general", "CannotModifyDataTypePropertiesSize", "SLL", "properties size of '{0}' is {1} and cannot become {2}"},
    {"QuillaneTypes:general", "InvalidDataTypePropertiesSize", "SL", "properties size of '{0}' cannot be {1}: it must not be negative"},
    {"QuillaneTypes:general", "InconsistentDataTypeFcn", "SS", "function {0} of '{1}' is set and cannot become another one"},
    {"QuillaneTypes:general", "InConsistentTargetToHostFcn", "", "the conversion between target and host is set and cannot become another one"},
    {"QuillaneTypes:general", "DataTypeFcnUnknownError", "SS", "function {0} of '{1}' reported a failure"},
    {"QuillaneTypes:general", "DataTypeFcnDoesNotExist", "SS", "{0} of '{1}' is not set"},
    {"QuillaneTypes:general", "InvalidDataType", "S", "'{0}' is no valid type name"},
    {"QuillaneTypes:general", "DataType_WithIntrinsicFixptName", "S", "'{0}' is the name of a fixed-point type and cannot name another kind of type"},
    {"QuillaneTypes:general", "DataType_SameNameAsExistingType", "S", "a type '{0}' exists already, registered by another source"},
    {"QuillaneTypes:general", "UndefinedDataTypeToBeAliasedTo", "SL", "alias '{0}' stands for identifier {1}, which is no type of this table"},
    {"QuillaneTypes:general", "InconsistentDataTypeIdAliasedTo", "SSS", "alias '{0}' cannot stand for '{1}': it stands for '{2}'"},
    {"QuillaneTypes:general", "CannotSetAliasForDefinedType", "S", "'{0}' is defined and cannot become an alias"},
    {"QuillaneTypes:general", "DataTypeAliasLoop", "SS", "alias '{0}' cannot stand for '{1}', which stands for it"},
    {"QuillaneTypes:general", "IllegalDataTypeToBeStorageId", "SS", "'{0}' cannot be stored as '{1}', which is not built-in"},
    {"QuillaneTypes:general", "InconsistentDataTypeStorageId", "SSS", "'{0}' cannot be stored as '{1}': it is stored as '{2}'"},
    {"QuillaneTypes:general", "DataTypeErrorFromBlock", "S", "the type was registered by block '{0}'"},
    {"QuillaneTypes:general", "InvalidNumericTypeDirectConstructor", "S", "'{0}' is no constructor text of a number type"},
    {"QuillaneTypes:general", "InvalidNumericTypeIdentifier", "S", "'{0}' is no identifier of a number type"},

    {"Quillane:DataType", "InvalidDataTypeId", "SL", "block '{0}' asks for identifier {1}, which is no type of this table"},
    {"Quillane:DataType", "InvalidDataTypeElementIndex", "SLL", "block '{0}' asks for element {1} of type {2}, which it does not have"},
    {"Quillane:DataType", "InvalidDataTypeNumElements", "SS", "structure '{0}' cannot have 0 elements, asked for by block '{1}'"},
    {"Quillane:DataType", "DataTypeSizeHasNotBeenSet", "S", "size of '{0}' is not set"},
    {"Quillane:DataType", "BlockDataTypeError", "S", "the failure concerns block '{0}'"},
    {"Quillane:DataType", "EnumTypeNotAClass", "", "an enumeration must be defined by a class"},
    {"Quillane:DataType", "EnumTypeNotAnEnumerationClass", "S", "class '{0}' is no enumeration"},
    {"Quillane:DataType", "EnumTypeWithMultipleInheritance", "S", "enumeration '{0}' has more than one superclass"},
    {"Quillane:DataType", "EnumTypeInsidePackage", "S", "enumeration '{0}' stands in a package"},
    {"Quillane:DataType", "EnumTypeWithNoEnumStrings", "S", "enumeration '{0}' has no members"},
    {"Quillane:DataType", "EnumTypeWithInvalidSuperclass", "S", "enumeration '{0}' does not derive from an integer class that is allowed"},
    {"Quillane:DataType", "EnumTypeWithComplexValues", "S", "enumeration '{0}' has a member with a complex value"},
    {"Quillane:DataType", "InvalidImageTypeNumChannels", "LSL", "an image cannot have {0} channels: format {1} has {2}"},
    {"Quillane:DataType", "InvalidImageTypeNumChannels2", "LS", "an image of format {1} cannot have {0} channels"},

    {"Quillane:General", "InvalidDataTypeSizeInDataTypeTable", "LS", "size of '{1}' passes the limit of {0} bytes"},

    {"Quillane:Data", "Param_NonScalarValueInExpression", "SS", "parameter '{0}' in '{1}' is no scalar"},
    {"Quillane:Data", "Param_UnsupportedDivision", "S", "the division in '{0}' is not supported"},
    {"Quillane:Data", "Param_UnsupportedLogicalValue", "SS", "parameter '{0}' in '{1}' is logical, which is not supported"},
    {"Quillane:Data", "Param_ComplexValueInExpression", "SS", "parameter '{0}' in '{1}' is complex"},

    {"Quillane:SymbolicDims", "ComplexValue", "SSS", "'{0}' in a dimension is complex:\n  {1}\n {2}"},
    {"Quillane:SymbolicDims", "NonScalarValue", "SSS", "'{0}' in a dimension is no scalar:\n  {1}\n {2}"},
    {"Quillane:SymbolicDims", "NonIntegerValue", "SSS", "'{0}' in a dimension is no integer:\n  {1}\n {2}"},
    {"Quillane:SymbolicDims", "NonAsciiDimensionsString", "W", "dimensions '{0}' hold a character that is not ASCII"},
    {"Quillane:SymbolicDims", "DimensionLessThanOne", "SW", "the {0} dimension of '{1}' is below 1"},
    {"Quillane:SymbolicDims", "InsufficientNumDimensions", "WL", "dimensions '{0}' are too few: {1} are needed"},
    {"Quillane:SymbolicDims", "MatrixInterpretedAs1D", "WWSSS", "'{0}' of '{1}' has the dimensions {2}, which are not one: make them {3} or {4}"},

    {"QuillaneTypes:Dimensions", "InconsistentSymbolicDimensionEqual", "SSS", "{0} cannot be greater than {1}: it is known to equal {2}"},
    {"QuillaneTypes:Dimensions", "InconsistentSymbolicDimensionGreaterThan", "SSS", "{0} cannot be greater than {1}: it is known to be less than {2}"},
    {"QuillaneTypes:Dimensions", "InconsistentSymbolicDimensionLessThan", "SSS", "{0} cannot be less than {1}: it is known to be greater than {2}"},
    {"QuillaneTypes:Dimensions", "InconsistentSymbolicDimensionNotEqual", "SSS", "{0} cannot equal {1}: it is known to be greater than {2}"},
    {"QuillaneTypes:Dimensions", "InvalidSymbolicDimensionGreaterThan", "SS", "{0} is not greater than {1}"},
    {"QuillaneTypes:Dimensions", "InvalidSymbolicDimensionNotEqual", "SS", "{0} does not equal {1}"},

    {"Quillane:DateTime", "InvalidTimeValue", "", "a field of the time is out of its range or is no whole number"},
    {"Quillane:DateTime", "InvalidTimeZoneValue", "", "hours and minutes are no time zone"},
    {"Quillane:DateTime", "InvalidRange", "", "the range ends before it starts"},
    {"Quillane:DateTime", "InvalidTimeEpoch", "WWWW", "epoch {3} of scale {0} lies outside {1} to {2}"},
    {"Quillane:DateTime", "InvalidTimeRange", "WWWWW", "range {3} to {4} of scale {0} lies outside {1} to {2}"},
};
// clang-format on

constexpr auto texts = [] {
    std::array<MessageText, std::size(catalogue)> rows{};
    for (std::size_t i = 0; i < rows.size(); ++i)
        rows[i] = {catalogue[i].category, catalogue[i].leaf, catalogue[i].text};
    return rows;
}();

const MessageTextTable registeredTexts(texts.data(), texts.size());

} // namespace

std::span<const CatalogueRow> messageCatalogue() { return catalogue; }

bool isInCatalogue(const resource_core::BaseMsgID& message) {
    return std::any_of(std::begin(catalogue), std::end(catalogue), [&](const CatalogueRow& row) {
        return message.category == row.category && message.leaf == row.leaf &&
               std::equal(message.arguments.begin(), message.arguments.end(), row.argumentKinds.begin(),
                          row.argumentKinds.end(), [](const resource_core::MsgArgument& argument, char kind) {
                              return "LSW"[argument.which()] == kind;
                          });
    });
}

} // namespace QLTypeSys
