// Menus of data-type parameters: which types a parameter in a dialog may hold.
//
//   StringVector items;
//   GetDataTypeAllowedItems(&inheritRules, &builtinTypes, nullptr, nullptr,
//                           {QLTypeSys::AdditionalType::supportsEnum}, items, dialog);
//
// The content of a menu is decided by the host function "Quillane.DataTypePrmWidget.getDataTypeAllowedItems". It gets a
// structure with the fields inheritRules, builtinTypes, scalingModes, signModes (rows of texts, unset where the list is
// null), supportsEnumType, supportsBusType, supportsStringType (logical scalars), in one form aliasObjectName, and a
// context, which may be null. It gives a cell array of texts.
#pragma once

#include <string>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/arrays/HostArray.h"
#include "qlplatform/classes/ClassModel.h"
#include "qlplatform/dialogs/UDInterface.h"
#include "qlplatform/strings/EnumStrings.h"

namespace QLTypeSys {

/// What a parameter may hold beside the listed types.
enum class AdditionalType : int {
    supportsEnum = 0,
    supportsBus = 1,
    supportsString = 2,
};

} // namespace QLTypeSys

// All forms: lists may be null, and hidden entries of EnumStrs are left out. The texts of the menu are appended to
// `items`, except "Enum: <class name>", "Bus: <object name>" and "<data type expression>", through which a user types
// freely, and cells that hold no text. A host function that fails or gives no cell array adds nothing; its report is
// dropped. Raise OutOfMemory when there is no host memory for the question.

/// The context is the dialog's object as a host array.
QL_EXPORT void GetDataTypeAllowedItems(const EnumStrs* inheritRules, const EnumStrs* builtinTypes,
                                       const EnumStrs* scalingModes, const EnumStrs* signModes,
                                       const std::vector<QLTypeSys::AdditionalType>& additionalTypes,
                                       StringVector& items, UDInterface* context);

/// The same from lists of texts.
QL_EXPORT void GetDataTypeAllowedItems(const StringVector* inheritRules, const StringVector* builtinTypes,
                                       const StringVector* scalingModes, const StringVector* signModes,
                                       const std::vector<QLTypeSys::AdditionalType>& additionalTypes,
                                       StringVector& items, UDInterface* context);

/// Names the alias object that the menu is for.
QL_EXPORT void GetDataTypeAllowedItems(const StringVector* inheritRules, const StringVector* builtinTypes,
                                       const StringVector* scalingModes, const StringVector* signModes,
                                       const std::vector<QLTypeSys::AdditionalType>& additionalTypes,
                                       StringVector& items, const std::string& aliasObjectName,
                                       const tcos::COSValue& context);

/// The context is a host array, which stays the caller's.
QL_EXPORT void GetDataTypeAllowedItems(const EnumStrs* inheritRules, const EnumStrs* builtinTypes,
                                       const EnumStrs* scalingModes, const EnumStrs* signModes,
                                       const std::vector<QLTypeSys::AdditionalType>& additionalTypes,
                                       std::vector<std::string>& items, txArray_tag* context);
