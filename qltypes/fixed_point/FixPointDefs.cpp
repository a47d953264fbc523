#include "qltypes/fixed_point/FixPointDefs.h"

#include <cmath>
#include <cstdio>

namespace {

constexpr double ln2 = 0.6931471805599453;

/// log2 that gives exact integers for exact powers of two; minus infinity for 0, NaN below 0.
double exactLog2(double x) {
    int exponent;
    const double fraction = std::frexp(x, &exponent);
    if (fraction == 0.5) return exponent - 1;
    if (exponent == 1 && fraction < 0.75) return std::log(2 * fraction) / ln2;
    return std::log(fraction) / ln2 + exponent;
}

/// Whether a float of `wordLength` bits has exponent bits enough, and a bit left beside sign and exponent.
template <class Width> bool exponentFitsWidth(Width wordLength, unsigned int exponentLength) {
    const double bound = std::ceil(exactLog2(double(wordLength) - double(exponentLength) + 3.0)) + 1;
    return exponentLength >= bound && // false where the bound is NaN
           exponentLength + 1 < static_cast<unsigned int>(wordLength);
}

template <class Width>
bool makesSense(fxpModeDataType mode, unsigned int signedness, Width wordLength, double slopeAdjustmentFactor,
                unsigned int exponentLength, int fixedExponent, double bias) {
    const bool isUnitScaled = fixedExponent == 0 && bias == 0.0 && slopeAdjustmentFactor == 1.0;
    switch (mode) {
    case FXP_DT_FIXPT:
    case FXP_DT_SCALED_DOUBLE: // kept: sign and fixed exponent may hold anything
        return fxpDataTypeProp::preValidateWordLength(wordLength) &&
               fxpDataTypeProp::preValidateSlopeAdjustmentFactor(slopeAdjustmentFactor) && exponentLength == 0 &&
               fxpDataTypeProp::preValidateBias(bias);
    case FXP_DT_DOUBLE:
        return wordLength == 64 && exponentLength == 11 && signedness == 1 && isUnitScaled;
    case FXP_DT_SINGLE:
        return wordLength == 32 && exponentLength == 8 && signedness == 1 && isUnitScaled;
    case FXP_DT_BOOLEAN:
        return wordLength == 8 && exponentLength == 0 && signedness == 0 && isUnitScaled;
    case FXP_DT_CUSTOM_FLOAT:
        return signedness == 1 && fxpDataTypeProp::preValidateWordLength(wordLength) &&
               exponentFitsWidth(wordLength, exponentLength) && isUnitScaled;
    }
    return false;
}

const char* nameOfMode(fxpModeDataType mode) {
    switch (mode) {
    case FXP_DT_FIXPT:
        return "FXP_DT_FIXPT";
    case FXP_DT_SCALED_DOUBLE:
        return "FXP_DT_SCALED_DOUBLE";
    case FXP_DT_DOUBLE:
        return "FXP_DT_DOUBLE";
    case FXP_DT_SINGLE:
        return "FXP_DT_SINGLE";
    case FXP_DT_BOOLEAN:
        return "FXP_DT_BOOLEAN";
    case FXP_DT_CUSTOM_FLOAT:
        return "FXP_DT_CUSTOM_FLOAT";
    }
    return "UNKNOWN";
}

} // namespace

bool fxpDataTypeProp::preValidateWordLength(int wordLength) { return wordLength > 0; }
bool fxpDataTypeProp::preValidateWordLength(unsigned int wordLength) { return wordLength != 0; }

bool fxpDataTypeProp::preValidateSlopeAdjustmentFactor(double slopeAdjustmentFactor) {
    return slopeAdjustmentFactor >= 1.0 && slopeAdjustmentFactor < 2.0;
}

bool fxpDataTypeProp::preValidateTotalSlope(double totalSlope) { return std::isfinite(totalSlope) && totalSlope > 0.0; }

bool fxpDataTypeProp::preValidateBias(double bias) { return std::isfinite(bias); }

bool fxpDataTypeProp::preValidateCombo(fxpModeDataType mode, unsigned int signedness, int wordLength,
                                       double slopeAdjustmentFactor, unsigned int exponentLength, int fixedExponent,
                                       double bias) {
    return makesSense(mode, signedness, wordLength, slopeAdjustmentFactor, exponentLength, fixedExponent, bias);
}

bool fxpDataTypeProp::preValidateCombo(fxpModeDataType mode, unsigned int signedness, unsigned int wordLength,
                                       double slopeAdjustmentFactor, unsigned int exponentLength, int fixedExponent,
                                       double bias) {
    return makesSense(mode, signedness, wordLength, slopeAdjustmentFactor, exponentLength, fixedExponent, bias);
}

bool fxpDataTypeProp::validateFxpDTProp() const {
    return preValidateCombo(DataTypeMode, Signedness, WordLength, SlopeAdjustmentFactor, ExponentLength, FixedExponent,
                            Bias);
}

bool fxpDtpPreAssert(bool ok, const fxpDataTypeProp* prop) {
    if (!ok) {
        std::puts("Data Type Assertion");
        displayFxpDTP(prop);
    }
    return ok;
}

void displayFxpDTP(const fxpDataTypeProp* prop) {
    std::printf("\nDataTypeMode        %d   %s\n", prop->DataTypeMode, nameOfMode(prop->DataTypeMode));
    std::printf("Signedness            %u\n", prop->Signedness);
    std::printf("WordLength            %d\n", prop->WordLength);
    std::printf("SlopeAdjustmentFactor %#25.17g\n", prop->SlopeAdjustmentFactor);
    std::printf("FixedExponent         %d\n", prop->FixedExponent);
    std::printf("Bias                  %#25.17g\n", prop->Bias);
    std::printf("\n");
}

void displayFxpDTPFlat(const fxpDataTypeProp* prop) {
    std::printf("\nMode=%d(%s)  Signed=%u  WL=%d  SAF=%#25.17g  FE=%d  B=%#25.17g\n", prop->DataTypeMode,
                nameOfMode(prop->DataTypeMode), prop->Signedness, prop->WordLength, prop->SlopeAdjustmentFactor,
                prop->FixedExponent, prop->Bias);
}
