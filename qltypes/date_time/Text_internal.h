// What the values of this folder share: their texts are ASCII, and their numbers are checked for wholeness alike.
#pragma once

#include <cmath>
#include <string>
#include <string_view>

namespace QLDateTime {

/// Each character widened by itself.
inline std::u16string widened(std::string_view ascii) { return {ascii.begin(), ascii.end()}; }

/// `value` in decimal with at least two digits.
inline std::string twoDigits(unsigned int value) { return (value < 10 ? "0" : "") + std::to_string(value); }

/// True for the infinities and false for NaN.
inline bool isWholeNumber(double value) { return value == std::floor(value); }

} // namespace QLDateTime
