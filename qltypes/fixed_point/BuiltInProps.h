// The constant records of the nine built-in types and of half.
//
// The identifiers are those of the table of types: 0 double, 1 single, 2 int8, 3 uint8, 4 int16, 5 uint16, 6 int32,
// 7 uint32, 8 boolean. The records are constants of the library: references to them are good for ever, also while other
// libraries load.
//
//   const fxpDataTypeProp& prop = FXP::getBuiltInProps(4);          // int16
//   const fxpDataTypeProp* found = FXP::findBuiltInProps("uint32"); // null for a name that is none of the nine
#pragma once

#include <string_view>

#include "qlplatform/Export.h"
#include "qltypes/fixed_point/FixPointDefs.h"

namespace FXP {

/// Number of built-in types; their identifiers are 0 to numBuiltInProps - 1.
inline constexpr int numBuiltInProps = 9;

/// The record of half, which is no built-in type.
inline constexpr fxpDataTypeProp halfProps{FXP_DT_CUSTOM_FLOAT, 1, 16, 5, 0, 1.0, 0.0, 0};

/// The record of a built-in type. Raises `InvalidBuiltinDataTypeId` with the identifier when `id` is outside 0 to 8.
QL_EXPORT const fxpDataTypeProp& getBuiltInProps(int id);

/// The name of a built-in type. Raises `InvalidBuiltinDataTypeId` with the identifier when `id` is outside 0 to 8.
QL_EXPORT const char* getBuiltInName(int id);

/// The record of the built-in type of that exact name, or null.
QL_EXPORT const fxpDataTypeProp* findBuiltInProps(std::string_view name);

} // namespace FXP
