// Number types as their texts describe them: read from either text form, with range and resolution.
#pragma once

#include <optional>
#include <string>

#include "qltypes/fixed_point/FixPointDefs.h"

namespace inspector {

/// Whether the text is of the constructor form rather than an identifier.
bool isConstructorText(const std::string& text);

/// Reads either text form. Throws std::invalid_argument with one line that names the text when it is no number type.
fxpDataTypeProp readNumberType(const std::string& text);

/// "fixed point", "scaled double", "double", "single", "boolean" or "custom float".
const char* modeName(fxpModeDataType mode);

/// "signed", "unsigned" or "open".
const char* signednessName(unsigned int signedness);

/// Lowest and highest real-world value, in decimal.
struct NumberRange {
    std::string min;
    std::string max;
};

/// The range: of a scaled double, that of the doubles that it is stored in. Up to 40 significant digits are given.
/// Nothing where the type says too little (an open sign), does not make sense, or has numbers of more than 16,384 bits.
std::optional<NumberRange> rangeOf(const fxpDataTypeProp& prop);

/// The distance of neighbouring values; of floating types, that of 1 and the next value. Nothing as for rangeOf, but
/// for an open sign.
std::optional<std::string> resolutionOf(const fxpDataTypeProp& prop);

} // namespace inspector
