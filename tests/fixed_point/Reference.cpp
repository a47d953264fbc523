#include "tests/fixed_point/Reference.h"

#include <cmath>
#include <cstdlib>
#include <limits>
#include <map>
#include <vector>

#include <boost/algorithm/string.hpp>
#include <boost/lexical_cast.hpp>
#include <boost/regex.hpp>

#include "qlplatform/services/NumberText.h"

namespace reference {

namespace {

const std::map<std::string, fxpDataTypeProp> builtIns = {
    {"double", {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 0.0, 0}}, {"single", {FXP_DT_SINGLE, 1, 32, 8, 0, 1.0, 0.0, 0}},
    {"int8", {FXP_DT_FIXPT, 1, 8, 0, 0, 1.0, 0.0, 0}},      {"uint8", {FXP_DT_FIXPT, 0, 8, 0, 0, 1.0, 0.0, 0}},
    {"int16", {FXP_DT_FIXPT, 1, 16, 0, 0, 1.0, 0.0, 0}},    {"uint16", {FXP_DT_FIXPT, 0, 16, 0, 0, 1.0, 0.0, 0}},
    {"int32", {FXP_DT_FIXPT, 1, 32, 0, 0, 1.0, 0.0, 0}},    {"uint32", {FXP_DT_FIXPT, 0, 32, 0, 0, 1.0, 0.0, 0}},
    {"boolean", {FXP_DT_BOOLEAN, 0, 8, 0, 0, 1.0, 0.0, 0}},
};
const fxpDataTypeProp half{FXP_DT_CUSTOM_FLOAT, 1, 16, 5, 0, 1.0, 0.0, 0};

struct Invalid {};

double numberOf(const std::string& text) { return std::strtod(text.c_str(), nullptr); }

void normalize(fxpDataTypeProp& prop) {
    double factor = prop.SlopeAdjustmentFactor;
    long exponent = prop.FixedExponent;
    if (factor == 1.0 || !(factor > 0.0) || std::isinf(factor)) return;
    if (factor < 1.0) {
        factor *= 2;
        exponent -= 1;
    } else if (factor >= 2.0) {
        factor /= 2;
        exponent += 1;
    }
    if (factor < 1.0 || factor >= 2.0) {
        int e;
        const double m = std::frexp(factor, &e);
        exponent += e - 1;
        factor = 2 * m;
    }
    if (exponent < std::numeric_limits<int>::min() || exponent > std::numeric_limits<int>::max()) throw Invalid();
    prop.SlopeAdjustmentFactor = factor;
    prop.FixedExponent = static_cast<int>(exponent);
}

fxpDataTypeProp identifier(const std::string& text) {
    if (const auto found = builtIns.find(text); found != builtIns.end()) return found->second;
    if (text == "half") return half;
    fxpDataTypeProp prop{FXP_DT_FIXPT, 1, 0, 0, 0, 1.0, 0.0, 0};
    if (matchesIntegerPattern(text)) {
        prop.Signedness = text[0] == 'u' ? 0 : 1;
        prop.WordLength = static_cast<int>(std::strtol(text.c_str() + (text[0] == 'u' ? 4 : 3), nullptr, 10));
        return prop;
    }
    if (!matchesFixptPattern(text)) throw Invalid();
    std::vector<std::string> tokens;
    boost::split(tokens, text, boost::is_any_of("_"));
    const bool isFixpt = tokens[0].substr(1, 3) == "fix";
    prop.DataTypeMode = isFixpt ? FXP_DT_FIXPT : FXP_DT_SCALED_DOUBLE;
    prop.Signedness = tokens[0][isFixpt ? 0 : 3] == 's' ? 1 : 0;
    prop.WordLength = static_cast<int>(std::strtol(text.c_str() + 4, nullptr, 10));
    for (std::size_t i = 1; i < tokens.size(); ++i) {
        const char kind = tokens[i][0];
        std::string rest = tokens[i].substr(1);
        boost::replace_all(rest, "p", ".");
        boost::replace_all(rest, "n", "-");
        if (kind == 'F' || kind == 'S')
            prop.SlopeAdjustmentFactor = numberOf(rest);
        else if (kind == 'B')
            prop.Bias = numberOf(rest);
        else
            prop.FixedExponent = boost::lexical_cast<int>(rest);
    }
    normalize(prop);
    return prop;
}

/// Removes the first `name` and the token behind it, which must be `value`.
bool takePair(std::vector<std::string>& tokens, const std::string& name, const std::string& value) {
    for (std::size_t i = 0; i < tokens.size(); ++i) {
        if (tokens[i] != name) continue;
        if (i + 1 == tokens.size() || tokens[i + 1] != value) throw Invalid();
        tokens.erase(tokens.begin() + i, tokens.begin() + i + 2);
        return true;
    }
    return false;
}

Reading constructor(const std::string& text) {
    if (text.find('\0') != std::string::npos) throw Invalid();
    std::vector<std::string> tokens;
    boost::split(tokens, text, boost::is_any_of("(,)"), boost::token_compress_off);
    while (!tokens.empty() && tokens.back().empty())
        tokens.pop_back();
    if (tokens.size() < 2) throw Invalid();
    for (std::string& token : tokens)
        boost::to_lower(token, std::locale::classic());
    if (tokens[0] != "fixdt" && tokens[0] != "numerictype") throw Invalid();
    tokens.erase(tokens.begin());

    Reading result{Ending::read, {FXP_DT_FIXPT, 1, 16, 0, 0, 1.0, 0.0, 0}, true};
    const int overrideOff = takePair(tokens, "'datatypeoverride'", "'off'");
    if (tokens.empty()) throw Invalid();
    fxpDataTypeProp& prop = result.prop;
    if (tokens[0].size() > 2 && tokens[0][0] == '\'') {
        if (tokens[0].back() != '\'') throw Invalid();
        const std::string name = tokens[0].substr(1, tokens[0].size() - 2);
        if (name != "half" && !builtIns.contains(name)) throw Invalid();
        prop = name == "half" ? half : builtIns.at(name);
        prop.DataTypeOverrideOff = overrideOff;
        return result;
    }
    prop.DataTypeOverrideOff = overrideOff;
    if (takePair(tokens, "'datatype'", "'scaleddouble'")) prop.DataTypeMode = FXP_DT_SCALED_DOUBLE;
    if (tokens[0] == "[]")
        prop.Signedness = 2;
    else if (tokens[0] == "1" || tokens[0] == "0")
        prop.Signedness = tokens[0] == "1";
    else
        throw Invalid();
    prop.WordLength = boost::lexical_cast<int>(tokens.size() > 1 ? tokens[1] : std::string());
    if (tokens.size() == 2) {
        result.scalingGiven = false;
    } else if (tokens.size() == 3) {
        const long exponent = -long{boost::lexical_cast<int>(tokens[2])};
        if (exponent > std::numeric_limits<int>::max()) throw Invalid();
        prop.FixedExponent = static_cast<int>(exponent);
    } else if (tokens.size() == 4) {
        prop.SlopeAdjustmentFactor = numberOf(tokens[2]);
        prop.Bias = numberOf(tokens[3]);
    } else if (tokens.size() == 5) {
        prop.SlopeAdjustmentFactor = numberOf(tokens[2]);
        prop.FixedExponent = boost::lexical_cast<int>(tokens[3]);
        prop.Bias = numberOf(tokens[4]);
    } else {
        throw Invalid();
    }
    normalize(prop);
    return result;
}

template <class Read> Reading readingOf(Read read) {
    try {
        return read();
    } catch (const Invalid&) {
        return {Ending::invalid, {}, true};
    } catch (const boost::bad_lexical_cast&) {
        return {Ending::badCast, {}, true};
    }
}

std::string encoded(double value) {
    std::string text = qlsv_dtoa(value, false);
    boost::replace_all(text, ".", "p");
    boost::erase_all(text, "+");
    boost::replace_all(text, "-", "n");
    boost::replace_all(text, "E", "e");
    text = boost::regex_replace(text, boost::regex("p0e"), "e");
    text = boost::regex_replace(text, boost::regex("p0$"), "");
    text = boost::regex_replace(text, boost::regex("^0p"), "p");
    return boost::regex_replace(text, boost::regex("^n0p"), "np");
}

std::string exponentPiece(long exponent) {
    if (exponent == 0) return "";
    return exponent > 0 ? "_E" + std::to_string(exponent) : "_En" + std::to_string(-exponent);
}

} // namespace

bool matchesIntegerPattern(const std::string& text) {
    static const boost::regex pattern("u?int[1-9][0-9]*");
    return boost::regex_match(text, pattern);
}

bool matchesFixptPattern(const std::string& text) {
    static const boost::regex pattern(
        "([su]fix|flt[su])[1-9][0-9]*((_F1p[0-9]*[1-9])?(_En?[1-9][0-9]*)|(_S([1-9][0-9]*(p[0-9]*[1-9])?|p[0-9]*[1-9])"
        "(en?[1-9][0-9]*)?))?(_Bn?([1-9][0-9]*(p[0-9]*[1-9])?|p[0-9]*[1-9])(en?[1-9][0-9]*)?)?");
    return boost::regex_match(text, pattern);
}

Reading readIdentifier(const std::string& text) {
    return readingOf([&] { return Reading{Ending::read, identifier(text), true}; });
}

Reading readConstructor(const std::string& text) {
    return readingOf([&] { return constructor(text); });
}

std::string writeIdentifier(const fxpDataTypeProp& prop, bool torvexNames) {
    const bool isPlain = prop.FixedExponent == 0 && prop.SlopeAdjustmentFactor == 1.0 && prop.Bias == 0.0;
    const bool isSigned = prop.Signedness == 1;
    if (prop.DataTypeMode == FXP_DT_DOUBLE) return "double";
    if (prop.DataTypeMode == FXP_DT_SINGLE) return "single";
    if (prop.DataTypeMode == FXP_DT_BOOLEAN) return "boolean";
    if (prop.DataTypeMode == FXP_DT_CUSTOM_FLOAT) return "half";
    std::string text = isSigned ? "sfix" : "ufix";
    if (prop.DataTypeMode == FXP_DT_SCALED_DOUBLE) {
        text = isSigned ? "flts" : "fltu";
    } else if (isPlain) {
        const int bits = prop.WordLength;
        if (bits == 8 || bits == 16 || bits == 32 || (bits == 64 && torvexNames)) text = isSigned ? "int" : "uint";
    }
    text += std::to_string(prop.WordLength);
    if (prop.SlopeAdjustmentFactor == 1.0) {
        text += exponentPiece(prop.FixedExponent);
    } else if (prop.FixedExponent >= -1022 && prop.FixedExponent <= 1023) {
        const double slope = std::ldexp(prop.SlopeAdjustmentFactor, prop.FixedExponent);
        if (slope != 1.0) text += "_S" + encoded(slope);
    } else {
        text += "_F" + encoded(prop.SlopeAdjustmentFactor) + exponentPiece(prop.FixedExponent);
    }
    if (prop.Bias != 0.0) text += "_B" + encoded(prop.Bias);
    return text;
}

} // namespace reference
