// The identifier text of a number type: a compact name that is legal as a symbol.
//
//   "int8"  "sfix16_En7"  "ufix8_S3p2_B2"  "flts32_En8"  "half"  "boolean"
//
// The grammar of fixed-point and scaled-double names, to be matched by the whole text:
//
//   ([su]fix|flt[su])[1-9][0-9]*((_F1p[0-9]*[1-9])?(_En?[1-9][0-9]*)|(_S([1-9][0-9]*(p[0-9]*[1-9])?|p[0-9]*[1-9])
//   (en?[1-9][0-9]*)?))?(_Bn?([1-9][0-9]*(p[0-9]*[1-9])?|p[0-9]*[1-9])(en?[1-9][0-9]*)?)?
//
// The digits after sfix, ufix (fixed point) and flts, fltu (scaled double) are the word length, _E and _En the power of
// two, _F the factor beside it, _S a total slope, _B and _Bn the bias. In numbers p stands for the point and n for
// minus.
//
//   const fxpDataTypeProp& prop = identifierStringToFxpDataType("sfix16_En7"); // FixedExponent -7
//   const std::string& text = fxpDataTypeToIdentifierString(&prop);            // "sfix16_En7"
//
// Both directions keep every answer for the life of the process: references stay good for ever and the caches never
// shrink. Process-wide and unlocked: callers serialise. Texts do not depend on the locale.
#pragma once

#include <string>
#include <string_view>

#include "qlplatform/Export.h"
#include "qltypes/fixed_point/FixPointDefs.h"

/// Reads an identifier text. The nine built-in names and "half" give their constant records, int<N> and uint<N> plain
/// integers of N bits. The factor is normalised to at least 1.0 and below 2.0. A word length is cut to 32 bits.
/// Raises `InvalidNumericTypeIdentifier` with the text when it is no number type or its normalised exponent does not
/// fit 32 bits; throws boost::bad_lexical_cast when an _E number does not fit 32 bits. A failure is not remembered.
QL_EXPORT const fxpDataTypeProp& identifierStringToFxpDataType(const std::string& text);
/// The same; a text that was read before is found without making a string.
QL_EXPORT const fxpDataTypeProp& identifierStringToFxpDataType(std::string_view text);
inline const fxpDataTypeProp& identifierStringToFxpDataType(const char* text) {
    return identifierStringToFxpDataType(std::string_view(text));
}

/// Writes the identifier text. Reading it gives the record back, except that
/// - an open sign becomes unsigned, any custom float becomes half, DataTypeOverrideOff becomes 0;
/// - a factor outside 1.0 to below 2.0 comes back normalised while FixedExponent lies in -1022 to 1023;
/// - such a factor at other exponents, a factor of 0.0 or below, a slope or bias that is not finite and a word length
///   below 1 give texts that cannot be read.
/// 64-bit integers get the name that fxpTypesFeatureControl.h chooses.
/// Unchecked: `prop` must not be null and its mode must be one of the six.
QL_EXPORT const std::string& fxpDataTypeToIdentifierString(const fxpDataTypeProp* prop);
