// What family a type is of, told from its name alone; nothing need be registered.
//
// The integer pattern is u?int[1-9][0-9]*; the fixed-point pattern is the grammar of IdentifierString.h. Names are
// compared case-sensitively. The nine built-in names are double, single, boolean and the six integers int8, uint8,
// int16, uint16, int32, uint32. All functions take a NUL-terminated text that must not be null (unchecked).
//
//   FXP::doesQLTypeNameMatchFixptPattern("sfix16_En7");      // true
//   FXP::getWordLengthFromTypeName("sfix16_En7");            // 16
//   FXP::canQLTypeNameContainerStoreNegatives("ufix16_En7"); // false
#pragma once

#include "qlplatform/Export.h"

namespace FXP {

/// "half" only.
QL_EXPORT bool doesQLTypeNameMatchFloatPatternNotBuiltinClassic9(const char* name);

/// "double", "single", "boolean".
QL_EXPORT bool isQLTypeNameDoubleSingleBool(const char* name);

/// The six built-in integers.
QL_EXPORT bool isQLTypeNameBuiltInIntegerClassic6(const char* name);

/// "int64", "uint64", "sfix64", "ufix64", whichever of the two forms is written at present.
QL_EXPORT bool isQLTypeName64BitInteger(const char* name);

/// The nine built-in names.
QL_EXPORT bool isQLTypeNameBuiltInClassic9(const char* name);

/// Whether the whole name matches the integer pattern.
QL_EXPORT bool doesQLTypeNameMatchIntegerPattern(const char* name);

/// Whether the whole name matches the fixed-point pattern.
QL_EXPORT bool doesQLTypeNameMatchFixptPattern(const char* name);

/// Whether the whole name matches one of the two patterns.
QL_EXPORT bool doesQLTypeNameMatchIntegerOrFixptPattern(const char* name);

/// Whether the name has the shape of a number type: one of the nine, either pattern, or half. The shape alone: a name
/// of the fixed-point pattern whose exponent needs more than 32 bits passes here and cannot be read.
QL_EXPORT bool isQLTypeNameWithFxpDataTypeProp(const char* name);

/// The same without the nine built-in names.
QL_EXPORT bool isQLTypeNameNumericNotBuiltInClassic9(const char* name);

/// The decimal number that begins at character 3, as strtol reads it, cut to 32 bits; 0 where there is none.
QL_EXPORT int getIntAtPosition3(const char* name);

/// The same at character 4.
QL_EXPORT int getIntAtPosition4(const char* name);

/// Word length in bits of a number type. Raises as identifierStringToFxpDataType does for a name that it cannot read.
QL_EXPORT int getWordLengthFromTypeName(const char* name);

/// Whether what stores a value of the type can hold negative numbers; false for a name that is no number type. True for
/// every floating container, also that of an unsigned scaled double. Lets boost::bad_lexical_cast pass for a name of
/// the fixed-point pattern whose exponent needs more than 32 bits.
QL_EXPORT bool canQLTypeNameContainerStoreNegatives(const char* name);

} // namespace FXP
