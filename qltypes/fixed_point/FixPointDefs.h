// The property record of a number type, its enumerations and its checks.
//
// The real-world value of a stored integer Q is SlopeAdjustmentFactor * 2^FixedExponent * Q + Bias.
// Texts of a record: IdentifierString.h and ConstructorString.h. Records of the built-in types: BuiltInProps.h.
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

/// What a number type is, independently of any table: mode, sign, width in bits, scaling. A plain copyable value.
struct fxpDataTypeProp {
    fxpModeDataType DataTypeMode;
    unsigned int Signedness;      ///< 1 signed, 0 unsigned, 2 left open
    int WordLength;               ///< total bits
    unsigned int ExponentLength;  ///< bits of the exponent field of a floating mode; 0 in all others
    int FixedExponent;            ///< power of two of the scaling
    double SlopeAdjustmentFactor; ///< at least 1.0 and below 2.0; 1.0 where there is none
    double Bias;                  ///< 0.0 where there is none
    int DataTypeOverrideOff;      ///< 1 when the type's text carried 'DataTypeOverride','Off'
};
