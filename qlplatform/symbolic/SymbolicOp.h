// The operators of symbolic expressions.
//
// The values are part of the interface: clients keep them in lists and compare with them.
#pragma once

#include <cstdint>

namespace QL {

/// What an expression is: a symbol, a value, or an operator over operands. The arithmetic meaning of each is told in
/// docs/guide/symbolic-dimensions.md.
enum class SymbolicOp : std::uint8_t {
    StringSymbol = 0,        ///< a named symbol
    IntValue = 1,            ///< an integer of 32 bits
    DoubleValue = 2,         ///< a double
    UnaryMinus = 3,          ///< -a
    Plus = 4,                ///< a + b
    Minus = 5,               ///< a - b
    Multiply = 6,            ///< a*b
    Divide = 7,              ///< a/b, the exact quotient of numbers
    Modulo = 8,              ///< a % b, with the sign of a, as in C
    Power = 9,               ///< a raised to b
    BoolSymbol = 10,         ///< true or false
    ND = 11,                 ///< the list of dimensions of an array, any number of operands
    Equal = 12,              ///< a == b
    NotEqual = 13,           ///< a != b
    LessThan = 14,           ///< a < b
    LessThanOrEqual = 15,    ///< a <= b
    GreaterThan = 16,        ///< a > b
    GreaterThanOrEqual = 17, ///< a >= b
    And = 18,                ///< a && b
    Or = 19,                 ///< a || b
    Not = 20,                ///< !a
    Min = 21,                ///< the smaller of a and b
    Max = 22,                ///< the larger of a and b
    Abs = 23,                ///< the absolute value
    Floor = 24,              ///< rounded towards minus infinity
    Ceil = 25,               ///< rounded towards infinity
    Round = 26,              ///< rounded to the nearest integer, halves away from zero
    Fix = 27,                ///< rounded towards zero
    Mod = 28,                ///< modulo of the host language: with the sign of b, and mod(a, 0) is a
    Rem = 29,                ///< remainder of the host language: with the sign of a, the same as Modulo
};

/// Number of operators; their values run from 0 to one below it.
inline constexpr int numSymbolicOps = 30;

} // namespace QL
