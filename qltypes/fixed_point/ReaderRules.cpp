#include "qltypes/fixed_point/ReaderRules_internal.h"

#include <charconv>
#include <cmath>
#include <cstdint>

#include <boost/lexical_cast/bad_lexical_cast.hpp>
#include <boost/throw_exception.hpp>

namespace FXP {

int lexicalInt(std::string_view text) {
    if (text.starts_with('+') && !text.starts_with("+-")) text.remove_prefix(1);
    int value = 0;
    const auto [behind, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (error != std::errc() || behind != text.data() + text.size())
        boost::throw_exception(boost::bad_lexical_cast(typeid(std::string), typeid(int)));
    return value;
}

bool normalizeFactor(fxpDataTypeProp& prop) {
    const double factor = prop.SlopeAdjustmentFactor;
    if (!std::isfinite(factor) || factor <= 0.0 || (factor >= 1.0 && factor < 2.0)) return true;
    int exponent;
    const double fraction = std::frexp(factor, &exponent); // in [0.5, 1)
    const std::int64_t fixedExponent = std::int64_t{prop.FixedExponent} + exponent - 1;
    if (fixedExponent != static_cast<int>(fixedExponent)) return false;
    prop.SlopeAdjustmentFactor = 2 * fraction;
    prop.FixedExponent = static_cast<int>(fixedExponent);
    return true;
}

} // namespace FXP
