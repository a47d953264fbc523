#include "numbers/NumberType.h"

#include <cstdlib>
#include <iomanip>
#include <sstream>
#include <stdexcept>
#include <typeinfo>

#include <boost/algorithm/string/predicate.hpp>
#include <boost/multiprecision/cpp_bin_float.hpp>
#include <fmt/format.h>

#include "qlplatform/services/IException.h"
#include "qltypes/fixed_point/ConstructorString.h"
#include "qltypes/fixed_point/IdentifierString.h"

namespace inspector {
namespace {

// Wide enough for every stored integer whose digits are shown in full.
using Real =
    boost::multiprecision::number<boost::multiprecision::cpp_bin_float<1024, boost::multiprecision::digit_base_2>>;

constexpr int maxBits = 16384;

std::string decimal(const Real& value) {
    std::ostringstream text;
    text.imbue(std::locale::classic());
    text << std::setprecision(40) << value;
    return text.str();
}

Real powerOfTwo(int exponent) { return ldexp(Real(1), exponent); }

bool isFloating(const fxpDataTypeProp& prop) {
    return prop.DataTypeMode != FXP_DT_FIXPT && prop.DataTypeMode != FXP_DT_BOOLEAN;
}

struct FloatFormat {
    int exponentBits;
    int fractionBits;
};

FloatFormat floatFormatOf(const fxpDataTypeProp& prop) {
    if (prop.DataTypeMode == FXP_DT_SCALED_DOUBLE) return {11, 52};
    const int exponentBits = static_cast<int>(prop.ExponentLength);
    return {exponentBits, prop.WordLength - 1 - exponentBits};
}

bool canBeShown(const fxpDataTypeProp& prop) {
    return prop.validateFxpDTProp() && prop.WordLength <= maxBits && prop.ExponentLength <= 15 &&
           std::abs(static_cast<long>(prop.FixedExponent)) <= maxBits;
}

Real slopeOf(const fxpDataTypeProp& prop) { return Real(prop.SlopeAdjustmentFactor) * powerOfTwo(prop.FixedExponent); }

} // namespace

bool isConstructorText(const std::string& text) {
    return boost::istarts_with(text, "fixdt(") || boost::istarts_with(text, "numerictype(");
}

fxpDataTypeProp readNumberType(const std::string& text) {
    try {
        return isConstructorText(text) ? constructorStringToFxpDataType(text).prop
                                       : identifierStringToFxpDataType(text);
    } catch (const foundation::core::except::IException& e) {
        throw std::invalid_argument(e.what());
    } catch (const std::bad_cast&) { // the readers let the exception of their number casts through
        throw std::invalid_argument(fmt::format("a number in '{}' is no whole number of 32 bits", text));
    }
}

const char* modeName(fxpModeDataType mode) {
    static constexpr const char* names[] = {"fixed point", "scaled double", "double",
                                            "single",      "boolean",       "custom float"};
    return names[mode];
}

const char* signednessName(unsigned int signedness) {
    return signedness == 1 ? "signed" : signedness == 0 ? "unsigned" : "open";
}

std::optional<NumberRange> rangeOf(const fxpDataTypeProp& prop) {
    if (!canBeShown(prop)) return std::nullopt;
    if (prop.DataTypeMode == FXP_DT_BOOLEAN) return NumberRange{"0", "1"};
    if (isFloating(prop)) {
        const FloatFormat format = floatFormatOf(prop);
        const int maxExponent = (1 << (format.exponentBits - 1)) - 1;
        const Real max = (Real(2) - powerOfTwo(-format.fractionBits)) * powerOfTwo(maxExponent);
        return NumberRange{decimal(-max), decimal(max)};
    }
    if (prop.Signedness > 1) return std::nullopt;
    const bool isSigned = prop.Signedness == 1;
    const Real max = powerOfTwo(prop.WordLength - (isSigned ? 1 : 0)) - 1;
    const Real min = isSigned ? Real(-max - 1) : Real(0);
    const Real slope = slopeOf(prop);
    return NumberRange{decimal(min * slope + prop.Bias), decimal(max * slope + prop.Bias)};
}

std::optional<std::string> resolutionOf(const fxpDataTypeProp& prop) {
    if (!canBeShown(prop)) return std::nullopt;
    if (isFloating(prop)) return decimal(powerOfTwo(-floatFormatOf(prop).fractionBits));
    return decimal(slopeOf(prop));
}

} // namespace inspector
