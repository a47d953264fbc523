// The property record of a number type, its enumerations and its checks.
//
// The real-world value of a stored integer Q is SlopeAdjustmentFactor * 2^FixedExponent * Q + Bias.
// Texts of a record: IdentifierString.h and ConstructorString.h. Records of the built-in types: BuiltInProps.h.
//
//   fxpDataTypeProp prop{FXP_DT_FIXPT, 1, 16, 0, -7, 1.0, 0.0, 0}; // signed, 16 bits, 7 of them fraction
//   if (!prop.validateFxpDTProp()) displayFxpDTP(&prop);
#pragma once

#include "qlplatform/Export.h"

/// What kind of number a record describes.
enum fxpModeDataType : int {
    FXP_DT_FIXPT = 0,         ///< fixed point, and every plain integer
    FXP_DT_SCALED_DOUBLE = 1, ///< a double that carries the scaling of a fixed-point type
    FXP_DT_DOUBLE = 2,        ///< IEEE double
    FXP_DT_SINGLE = 3,        ///< IEEE single
    FXP_DT_BOOLEAN = 4,       ///< boolean
    FXP_DT_CUSTOM_FLOAT = 5,  ///< floating point of any other width; half is of this mode
};

/// How a value between two representable ones is rounded.
enum fxpModeRounding_tag : int {
    FXP_ROUND_ZERO = 0,      ///< toward zero
    FXP_ROUND_HALF_UP = 1,   ///< nearest, halves toward plus infinity
    FXP_ROUND_CEILING = 2,   ///< toward plus infinity
    FXP_ROUND_FLOOR = 3,     ///< toward minus infinity
    FXP_ROUND_AS_ZERO = 4,   ///< exactly as FXP_ROUND_ZERO
    FXP_ROUND_HALF_AWAY = 5, ///< nearest, halves away from zero
    FXP_ROUND_HALF_EVEN = 6, ///< nearest, halves to the even neighbour
};

/// What becomes of a value outside the range of the destination.
enum fxpModeOverflow_tag : int {
    FXP_OVERFLOW_WRAP = 0,     ///< reduced modulo 2 to the word length
    FXP_OVERFLOW_SATURATE = 1, ///< the nearest end of the range
};

/// What a number type is, independently of any table: mode, sign, width in bits, scaling. A plain copyable value; any
/// field values can be held, and the checks say whether they make sense.
struct QL_EXPORT fxpDataTypeProp {
    /// Fixed point, scaled double, one of the floating types, or boolean.
    fxpModeDataType DataTypeMode;
    unsigned int Signedness;      ///< 1 signed, 0 unsigned, 2 left open
    int WordLength;               ///< total bits
    unsigned int ExponentLength;  ///< bits of the exponent field of a floating mode; 0 in all others
    int FixedExponent;            ///< power of two of the scaling
    double SlopeAdjustmentFactor; ///< at least 1.0 and below 2.0; 1.0 where there is none
    double Bias;                  ///< 0.0 where there is none
    int DataTypeOverrideOff;      ///< 1 when the type's text carried 'DataTypeOverride','Off'

    /// Whether `wordLength` is above 0. There is no upper limit.
    static bool preValidateWordLength(int wordLength);
    static bool preValidateWordLength(unsigned int wordLength);

    /// Whether `slopeAdjustmentFactor` is at least 1.0 and below 2.0.
    static bool preValidateSlopeAdjustmentFactor(double slopeAdjustmentFactor);

    /// Whether `totalSlope`, the factor times 2^FixedExponent, is finite and above 0.0.
    static bool preValidateTotalSlope(double totalSlope);

    /// Whether `bias` is finite.
    static bool preValidateBias(double bias);

    /// Whether the values make sense together. Note the order: the factor comes before the two exponents.
    /// Fixed point and scaled double leave sign and `fixedExponent` open; the floating modes and boolean fix the widths
    /// and the sign and allow no scaling. A custom float needs enough exponent bits for its width and at least one
    /// other bit than sign and exponent.
    static bool preValidateCombo(fxpModeDataType mode, unsigned int signedness, int wordLength,
                                 double slopeAdjustmentFactor, unsigned int exponentLength, int fixedExponent,
                                 double bias);
    static bool preValidateCombo(fxpModeDataType mode, unsigned int signedness, unsigned int wordLength,
                                 double slopeAdjustmentFactor, unsigned int exponentLength, int fixedExponent,
                                 double bias);

    /// preValidateCombo of the record's own fields, the word length as a signed number.
    bool validateFxpDTProp() const;
};

/// Returns `ok`; when it is false, first prints "Data Type Assertion" and displayFxpDTP(prop) to standard output.
/// `prop` is not touched when `ok` is true and may then be null.
QL_EXPORT bool fxpDtpPreAssert(bool ok, const fxpDataTypeProp* prop);

/// Prints mode, sign, word length and scaling to standard output, one a line. ExponentLength and DataTypeOverrideOff
/// are not shown. Unchecked: `prop` must not be null.
QL_EXPORT void displayFxpDTP(const fxpDataTypeProp* prop);

/// The same in one line.
QL_EXPORT void displayFxpDTPFlat(const fxpDataTypeProp* prop);
