// Message classes: one for each identifier that is raised from more than one place.
//
// The namespace is the category, the class name is the leaf, and the constructor takes the arguments in order:
//   failure::raise(QuillaneTypes::general::DataTypeFcnUnknownError("Construct", record.getName()));
// An identifier with one raising place is built there with failure::message(). All identifiers with their texts stand
// in the catalogue, MessageCatalogue.h.
#pragma once

#include <string>
#include <type_traits>
#include <utility>

#include "qlplatform/services/BaseMsgID.h"

namespace QLTypeSys::failure {

/// A message argument from what a raising place has at hand: integers widen to long, character arrays become strings.
template <class T> resource_core::MsgArgument messageArgument(T&& value) {
    using Plain = std::remove_cvref_t<T>;
    if constexpr (std::is_integral_v<Plain>)
        return static_cast<long>(value);
    else if constexpr (std::is_same_v<Plain, std::u16string>)
        return std::u16string(std::forward<T>(value));
    else
        return std::string(std::forward<T>(value));
}

/// A message with its arguments by position.
template <class... Args> resource_core::BaseMsgID message(const char* category, const char* leaf, Args&&... args) {
    resource_core::BaseMsgID made(category, leaf, sizeof...(Args));
    [[maybe_unused]] std::size_t slot = 0;
    ((made.arguments[slot++] = messageArgument(std::forward<Args>(args))), ...);
    return made;
}

/// What the message classes have in common.
class Message : public resource_core::BaseMsgID {
  protected:
    template <class... Args>
    Message(const char* categoryName, const char* leafName, const Args&... args)
        : BaseMsgID(message(categoryName, leafName, args...)) {}
};

} // namespace QLTypeSys::failure

// clang-format off
namespace QuillaneTypes::general {

// Category QuillaneTypes:general: the identifier is the name, the arguments are those of the text in the catalogue.
struct InvalidBuiltinDataTypeId : QLTypeSys::failure::Message { explicit InvalidBuiltinDataTypeId(long id) : Message("QuillaneTypes:general", "InvalidBuiltinDataTypeId", id) {} };
struct CannotSetPropertyOfAliasType : QLTypeSys::failure::Message { CannotSetPropertyOfAliasType(const std::string& property, const std::string& name) : Message("QuillaneTypes:general", "CannotSetPropertyOfAliasType", property, name) {} };
struct InconsistentDataTypeFcn : QLTypeSys::failure::Message { InconsistentDataTypeFcn(const std::string& property, const std::string& name) : Message("QuillaneTypes:general", "InconsistentDataTypeFcn", property, name) {} };
struct DataTypeFcnUnknownError : QLTypeSys::failure::Message { DataTypeFcnUnknownError(const std::string& operation, const std::string& name) : Message("QuillaneTypes:general", "DataTypeFcnUnknownError", operation, name) {} };
struct DataTypeFcnDoesNotExist : QLTypeSys::failure::Message { DataTypeFcnDoesNotExist(const std::string& function, const std::string& name) : Message("QuillaneTypes:general", "DataTypeFcnDoesNotExist", function, name) {} };
struct DataTypeErrorFromBlock : QLTypeSys::failure::Message { explicit DataTypeErrorFromBlock(const std::string& block) : Message("QuillaneTypes:general", "DataTypeErrorFromBlock", block) {} };
struct UndefinedDataTypeToBeAliasedTo : QLTypeSys::failure::Message { UndefinedDataTypeToBeAliasedTo(const std::string& name, long id) : Message("QuillaneTypes:general", "UndefinedDataTypeToBeAliasedTo", name, id) {} };
struct InvalidNumericTypeIdentifier : QLTypeSys::failure::Message { explicit InvalidNumericTypeIdentifier(const std::string& text) : Message("QuillaneTypes:general", "InvalidNumericTypeIdentifier", text) {} };

} // namespace QuillaneTypes::general

namespace QuillaneTypes::Dimensions {

// Category QuillaneTypes:Dimensions: the identifier is the name, the arguments are those of the text in the catalogue.
struct InconsistentSymbolicDimensionGreaterThan : QLTypeSys::failure::Message { InconsistentSymbolicDimensionGreaterThan(const std::string& dimension, const std::string& bound, const std::string& known) : Message("QuillaneTypes:Dimensions", "InconsistentSymbolicDimensionGreaterThan", dimension, bound, known) {} };
struct InconsistentSymbolicDimensionLessThan : QLTypeSys::failure::Message { InconsistentSymbolicDimensionLessThan(const std::string& dimension, const std::string& bound, const std::string& known) : Message("QuillaneTypes:Dimensions", "InconsistentSymbolicDimensionLessThan", dimension, bound, known) {} };
struct InconsistentSymbolicDimensionNotEqual : QLTypeSys::failure::Message { InconsistentSymbolicDimensionNotEqual(const std::string& dimension, const std::string& bound, const std::string& known) : Message("QuillaneTypes:Dimensions", "InconsistentSymbolicDimensionNotEqual", dimension, bound, known) {} };

} // namespace QuillaneTypes::Dimensions

namespace Quillane::DataType {

// Category Quillane:DataType: the identifier is the name, the arguments are those of the text in the catalogue.
struct DataTypeSizeHasNotBeenSet : QLTypeSys::failure::Message { explicit DataTypeSizeHasNotBeenSet(const std::string& name) : Message("Quillane:DataType", "DataTypeSizeHasNotBeenSet", name) {} };
struct BlockDataTypeError : QLTypeSys::failure::Message { explicit BlockDataTypeError(const std::string& block) : Message("Quillane:DataType", "BlockDataTypeError", block) {} };
struct EnumTypeNotAClass : QLTypeSys::failure::Message { EnumTypeNotAClass() : Message("Quillane:DataType", "EnumTypeNotAClass") {} };
struct EnumTypeWithNoEnumStrings : QLTypeSys::failure::Message { explicit EnumTypeWithNoEnumStrings(const std::string& className) : Message("Quillane:DataType", "EnumTypeWithNoEnumStrings", className) {} };
struct EnumTypeWithInvalidSuperclass : QLTypeSys::failure::Message { explicit EnumTypeWithInvalidSuperclass(const std::string& className) : Message("Quillane:DataType", "EnumTypeWithInvalidSuperclass", className) {} };
struct EnumTypeWithComplexValues : QLTypeSys::failure::Message { explicit EnumTypeWithComplexValues(const std::string& className) : Message("Quillane:DataType", "EnumTypeWithComplexValues", className) {} };
struct InvalidImageTypeNumChannels2 : QLTypeSys::failure::Message { InvalidImageTypeNumChannels2(long numChannels, const std::string& format) : Message("Quillane:DataType", "InvalidImageTypeNumChannels2", numChannels, format) {} };

} // namespace Quillane::DataType

namespace Quillane::SymbolicDims {

struct DimensionLessThanOne : QLTypeSys::failure::Message { DimensionLessThanOne(const std::string& dimension, const std::u16string& text) : Message("Quillane:SymbolicDims", "DimensionLessThanOne", dimension, text) {} };
struct InsufficientNumDimensions : QLTypeSys::failure::Message { InsufficientNumDimensions(const std::u16string& text, long numDims) : Message("Quillane:SymbolicDims", "InsufficientNumDimensions", text, numDims) {} };
struct MatrixInterpretedAs1D : QLTypeSys::failure::Message { MatrixInterpretedAs1D(const std::u16string& first, const std::u16string& second, const std::string& dims, const std::string& column, const std::string& row) : Message("Quillane:SymbolicDims", "MatrixInterpretedAs1D", first, second, dims, column, row) {} };

} // namespace Quillane::SymbolicDims
// clang-format on
