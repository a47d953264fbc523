#include "qltypes/fixed_point/IdentifierString.h"

#include <array>
#include <cmath>
#include <cstdint>
#include <cstdlib>

#include "qlplatform/services/NumberText.h"
#include "qltypes/fixed_point/BuiltInProps.h"
#include "qltypes/fixed_point/IdentifierGrammar_internal.h"
#include "qltypes/fixed_point/ReaderRules_internal.h"
#include "qltypes/fixed_point/TextCache_internal.h"
#include "qltypes/fixed_point/TypeNames.h"
#include "qltypes/fixed_point/fxpTypesFeatureControl.h"
#include "qltypes/host/Assert_internal.h"
#include "qltypes/host/Failure_internal.h"

namespace {

// Reading.

[[noreturn]] void raiseInvalid(const std::string& text) {
    QLTypeSys::failure::raise(QuillaneTypes::general::InvalidNumericTypeIdentifier(text));
}

double numberOf(std::string_view piece) {
    return ut_strtod(utGetFpcContext(), FXP::decodedNumber(piece).c_str(), nullptr, nullptr);
}

fxpDataTypeProp readIdentifier(const std::string& text) {
    if (const fxpDataTypeProp* builtIn = FXP::findBuiltInProps(text)) return *builtIn;
    if (text == "half") return FXP::halfProps;

    fxpDataTypeProp prop{FXP_DT_FIXPT, 1, 0, 0, 0, 1.0, 0.0, 0};
    if (FXP::matchesIntegerPattern(text)) {
        prop.Signedness = text[0] != 'u';
        prop.WordLength = prop.Signedness ? FXP::getIntAtPosition3(text.c_str()) : FXP::getIntAtPosition4(text.c_str());
        return prop;
    }
    FXP::IdentifierPieces pieces;
    if (!FXP::splitIdentifier(text, pieces)) raiseInvalid(text);
    if (pieces.isScaledDouble) prop.DataTypeMode = FXP_DT_SCALED_DOUBLE;
    prop.Signedness = pieces.isSigned;
    prop.WordLength = FXP::getIntAtPosition4(text.c_str());
    if (!pieces.factor.empty()) prop.SlopeAdjustmentFactor = numberOf(pieces.factor);
    if (!pieces.slope.empty()) prop.SlopeAdjustmentFactor = numberOf(pieces.slope);
    if (!pieces.exponent.empty())
        prop.FixedExponent = FXP::lexicalInt(FXP::decodedNumber(pieces.exponent)); // kept: may throw
    if (!pieces.bias.empty()) prop.Bias = numberOf(pieces.bias);
    if (!FXP::normalizeFactor(prop)) raiseInvalid(text);
    return prop;
}

// Writing.

std::string encoded(double value) { return FXP::encodedNumber(qlsv_dtoa(value, false)); }

std::string exponentPiece(int exponent) {
    if (exponent == 0) return "";
    return (exponent < 0 ? "_En" : "_E") + std::to_string(std::abs(std::int64_t{exponent}));
}

std::string scalingPieces(double factor, int exponent) {
    if (factor == 1.0) return exponentPiece(exponent);
    if (exponent < -1022 || exponent > 1023) return "_F" + encoded(factor) + exponentPiece(exponent);
    const double slope = std::ldexp(factor, exponent);
    return slope == 1.0 ? "" : "_S" + encoded(slope);
}

std::string generalForm(const fxpDataTypeProp& prop) {
    const bool isSigned = prop.Signedness == 1; // kept: an open sign is written unsigned
    std::string text =
        prop.DataTypeMode == FXP_DT_SCALED_DOUBLE ? (isSigned ? "flts" : "fltu") : (isSigned ? "sfix" : "ufix");
    text += std::to_string(prop.WordLength);
    text += scalingPieces(prop.SlopeAdjustmentFactor, prop.FixedExponent);
    if (prop.Bias != 0.0) text += "_B" + encoded(prop.Bias);
    return text;
}

bool isPlainInteger(const fxpDataTypeProp& prop) {
    return prop.DataTypeMode == FXP_DT_FIXPT && prop.FixedExponent == 0 && prop.SlopeAdjustmentFactor == 1.0 &&
           prop.Bias == 0.0;
}

std::string writeIdentifier(const fxpDataTypeProp& prop) {
    switch (prop.DataTypeMode) {
    case FXP_DT_DOUBLE:
        return "double";
    case FXP_DT_SINGLE:
        return "single";
    case FXP_DT_BOOLEAN:
        return "boolean";
    case FXP_DT_CUSTOM_FLOAT:
        return "half"; // kept: whatever the widths
    case FXP_DT_SCALED_DOUBLE:
        return generalForm(prop);
    case FXP_DT_FIXPT:
        if (isPlainInteger(prop) && (prop.WordLength == 8 || prop.WordLength == 16 || prop.WordLength == 32))
            return (prop.Signedness == 1 ? "int" : "uint") + std::to_string(prop.WordLength);
        return generalForm(prop);
    }
    return "";
}

/// The name of a 64-bit integer. Outside the cache, so that a change of the setting takes effect at once.
const std::string& nameOf64BitInteger(bool isSigned) {
    using Names = std::array<std::array<std::string, 2>, 2>;
    static const Names& names = *new Names{{{"ufix64", "sfix64"}, {"uint64", "int64"}}};
    return names[fxpTypesFeature::getUseTorvexNameForInt64()][isSigned];
}

} // namespace

const fxpDataTypeProp& identifierStringToFxpDataType(std::string_view text) {
    static auto& texts = *new FXP::ReadTexts<fxpDataTypeProp>; // never destroyed: references to it stay good
    return FXP::readOnce(texts, text, readIdentifier);
}

const fxpDataTypeProp& identifierStringToFxpDataType(const std::string& text) {
    return identifierStringToFxpDataType(std::string_view(text));
}

const std::string& fxpDataTypeToIdentifierString(const fxpDataTypeProp* prop) {
    QLTYPES_ASSERT(prop->DataTypeMode >= FXP_DT_FIXPT && prop->DataTypeMode <= FXP_DT_CUSTOM_FLOAT);
    if (isPlainInteger(*prop) && prop->WordLength == 64) return nameOf64BitInteger(prop->Signedness == 1);
    std::string& text = FXP::textCacheEntry(*prop).texts[0];
    if (text.empty()) text = writeIdentifier(*prop);
    return text;
}
