// The constructor text of a number type: the expression by which a user of the host language writes it.
//
//   "fixdt(1,16,7)"  "numerictype(0,8,1.5,2)"  "fixdt('double')"  "fixdt([],8)"
//   "fixdt(1,16,7,'DataType','ScaledDouble')"  "fixdt('single','DataTypeOverride','Off')"
//
// The arguments are sign (1, 0, or [] for left open) and word length; then nothing, or a fraction length, or slope and
// bias, or factor, fixed exponent and bias. The pairs in quotes may stand anywhere behind the first argument. Case does
// not matter, blanks do: nothing is trimmed. fixdt and numerictype mean the same.
//
//   const fxpCtorParseResult& result = constructorStringToFxpDataType("fixdt(1,16,7)"); // FixedExponent -7
//   const std::string& text = fxpDataTypeToConstructorString(result.prop, FxpDT::PreferFixdt,
//   FxpDT::PreferFractionLength);
//
// Both directions keep every answer for the life of the process: references stay good for ever and the caches never
// shrink. Process-wide and unlocked: callers serialise. Texts do not depend on the locale.
#pragma once

#include <string>
#include <string_view>

#include "qlplatform/Export.h"
#include "qltypes/fixed_point/FixPointDefs.h"

/// What a constructor text says.
struct fxpCtorParseResult {
    /// The number type.
    fxpDataTypeProp prop;
    bool ScalingGiven; ///< false when the text gave only sign and word length
};

/// Reads a constructor text. The factor is normalised to at least 1.0 and below 2.0; the record is not validated: a
/// slope that is no number reads as 0.0, and slopes of 0.0 or below and word lengths below 1 pass (validateFxpDTProp
/// tells). Raises `InvalidNumericTypeDirectConstructor` with the text when it is no constructor text, holds a NUL, or
/// gives a fixed exponent that does not fit 32 bits; throws boost::bad_lexical_cast when a word length, fraction length
/// or fixed exponent is no decimal number of 32 bits. A failure is not remembered.
QL_EXPORT const fxpCtorParseResult& constructorStringToFxpDataType(const std::string& text);
/// The same; a text that was read before is found without making a string.
QL_EXPORT const fxpCtorParseResult& constructorStringToFxpDataType(std::string_view text);
inline const fxpCtorParseResult& constructorStringToFxpDataType(const char* text) {
    return constructorStringToFxpDataType(std::string_view(text));
}

namespace FxpDT {

/// The preferred constructor word. A scaled double is always written with numerictype.
enum baseCtorPrefer : int { PreferNumerictype = 0, PreferFixdt = 1 };

/// The preferred form of the scaling.
enum scalingRepPrefer : int {
    PreferFractionLength = 0, ///< one argument, where factor and bias allow it; otherwise as PreferSlopeBias
    PreferSlopeBias = 1,      ///< slope and bias; factor, exponent and bias outside the exponents -1022 to 1023
    PreferNoScaling = 2,      ///< sign and word length alone; reads back without the scaling
};

/// Appends the arguments of a fixed-point or scaled-double record to `out`: sign, word length, scaling, and the pair
/// that says scaled double.
QL_EXPORT void fxpDataTypeToConstructorString_FixptGuts(std::string& out, const fxpDataTypeProp& prop,
                                                        scalingRepPrefer rep);

} // namespace FxpDT

/// Writes the constructor text. Reading it gives the record back, except that
/// - any custom float becomes half, and a boolean never carries the override pair;
/// - PreferNoScaling drops the scaling;
/// - a factor outside 1.0 to below 2.0 comes back normalised;
/// - a word length below 0, and a FixedExponent of -2^31 by fraction length, give texts that cannot be read.
/// Unchecked: the mode of `prop` must be one of the six.
QL_EXPORT const std::string& fxpDataTypeToConstructorString(const fxpDataTypeProp& prop, FxpDT::baseCtorPrefer base,
                                                            FxpDT::scalingRepPrefer rep);
