#include "qltypes/fixed_point/ConstructorString.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <vector>

#include "qlplatform/services/NumberText.h"
#include "qltypes/fixed_point/BuiltInProps.h"
#include "qltypes/fixed_point/ReaderRules_internal.h"
#include "qltypes/fixed_point/TextCache_internal.h"
#include "qltypes/host/Assert_internal.h"
#include "qltypes/host/Failure_internal.h"

namespace {

// Reading.

[[noreturn]] void raiseInvalid(const std::string& text) {
    QLTypeSys::failure::raise("QuillaneTypes:general", "InvalidNumericTypeDirectConstructor", text);
}

/// The words of one text while it is read, in lower case. What a rule has understood is removed.
class ConstructorWords {
  public:
    /// Splits at each bracket and comma; empty words at the end are dropped, those between stay.
    /// kept: brackets only separate, so a missing or doubled one is not noticed.
    explicit ConstructorWords(const std::string& text) : text_(text), lowered_(text) {
        if (text.find('\0') != std::string::npos) raiseInvalid(text);
        for (char& c : lowered_) {
            if (c >= 'A' && c <= 'Z') c += 'a' - 'A';
            if (c == '(' || c == ',' || c == ')') c = '\0'; // so that each word ends as a text of its own
        }
        for (std::size_t begin = 0; begin <= lowered_.size(); begin += words_.back().size() + 1)
            words_.emplace_back(lowered_.c_str() + begin);
        while (!words_.empty() && words_.back().empty())
            words_.pop_back();
    }

    std::size_t count() const { return words_.size(); }
    std::string_view operator[](std::size_t index) const { return words_[index]; }

    void removeFirst() { words_.erase(words_.begin()); }

    /// Removes the first `name` with the word behind it, which must be `value`; false when there is no `name`.
    bool takePair(std::string_view name, std::string_view value) {
        const auto found = std::find(words_.begin(), words_.end(), name);
        if (found == words_.end()) return false;
        if (found + 1 == words_.end() || found[1] != value) raiseInvalid(text_);
        words_.erase(found, found + 2);
        return true;
    }

    /// The integer at `index`; a word that is not there is no integer.
    int intAt(std::size_t index) const {
        return FXP::lexicalInt(index < words_.size() ? words_[index] : std::string_view()); // kept: may throw
    }

    /// The number at `index`; 0.0 for a word that is none.
    double numberAt(std::size_t index) const {
        return ut_strtod(utGetFpcContext(), words_[index].data(), nullptr, nullptr);
    }

  private:
    const std::string& text_;
    std::string lowered_; // its separators replaced by NUL
    std::vector<std::string_view> words_;
};

unsigned int readSign(std::string_view word, const std::string& text) {
    if (word == "[]") return 2;
    if (word == "1") return 1;
    if (word == "0") return 0;
    raiseInvalid(text);
}

/// The record of a name in single quotes.
const fxpDataTypeProp& readQuotedName(std::string_view word, const std::string& text) {
    if (!word.ends_with('\'')) raiseInvalid(text);
    const std::string_view name = word.substr(1, word.size() - 2);
    if (name == "half") return FXP::halfProps;
    const fxpDataTypeProp* builtIn = FXP::findBuiltInProps(name);
    if (!builtIn) raiseInvalid(text);
    return *builtIn;
}

/// Reads the scaling behind sign and word length; false when there is none.
bool readScaling(const ConstructorWords& words, fxpDataTypeProp& prop, const std::string& text) {
    switch (words.count()) {
    case 2:
        return false;
    case 3: {
        const int fractionLength = words.intAt(2);
        if (fractionLength == std::numeric_limits<int>::min()) raiseInvalid(text);
        prop.FixedExponent = -fractionLength;
        return true;
    }
    case 4:
        prop.SlopeAdjustmentFactor = words.numberAt(2);
        prop.Bias = words.numberAt(3);
        return true;
    case 5:
        prop.SlopeAdjustmentFactor = words.numberAt(2);
        prop.FixedExponent = words.intAt(3);
        prop.Bias = words.numberAt(4);
        return true;
    default:
        raiseInvalid(text);
    }
}

fxpCtorParseResult readConstructor(const std::string& text) {
    ConstructorWords words(text);
    if (words.count() < 2) raiseInvalid(text);
    if (words[0] != "fixdt" && words[0] != "numerictype") raiseInvalid(text);
    words.removeFirst();
    const bool overrideOff = words.takePair("'datatypeoverride'", "'off'");
    if (words.count() == 0) raiseInvalid(text);

    fxpCtorParseResult result{{FXP_DT_FIXPT, 1, 16, 0, 0, 1.0, 0.0, 0}, true};
    if (words[0].size() > 2 && words[0].front() == '\'') {
        result.prop = readQuotedName(words[0], text); // kept: what stands behind the name is not looked at
    } else {
        if (words.takePair("'datatype'", "'scaleddouble'")) result.prop.DataTypeMode = FXP_DT_SCALED_DOUBLE;
        result.prop.Signedness = readSign(words[0], text);
        result.prop.WordLength = words.intAt(1);
        result.ScalingGiven = readScaling(words, result.prop, text);
        if (!FXP::normalizeFactor(result.prop)) raiseInvalid(text);
    }
    result.prop.DataTypeOverrideOff = overrideOff;
    return result;
}

// Writing.

std::string scalingArguments(const fxpDataTypeProp& prop, FxpDT::scalingRepPrefer rep) {
    if (rep == FxpDT::PreferNoScaling) return "";
    if (rep == FxpDT::PreferFractionLength && prop.SlopeAdjustmentFactor == 1.0 && prop.Bias == 0.0)
        return ',' + std::to_string(-std::int64_t{prop.FixedExponent});
    const std::string bias = ',' + qlsv_dtoa_fitools(prop.Bias);
    if (prop.FixedExponent >= -1022 && prop.FixedExponent <= 1023)
        return ',' + qlsv_dtoa_fitools(std::ldexp(prop.SlopeAdjustmentFactor, prop.FixedExponent)) + bias;
    return ',' + qlsv_dtoa_fitools(prop.SlopeAdjustmentFactor) + ',' + std::to_string(prop.FixedExponent) + bias;
}

std::string writeConstructor(const fxpDataTypeProp& prop, FxpDT::baseCtorPrefer base, FxpDT::scalingRepPrefer rep) {
    const bool isNumerictype = prop.DataTypeMode == FXP_DT_SCALED_DOUBLE || base == FxpDT::PreferNumerictype;
    std::string text = isNumerictype ? "numerictype(" : "fixdt(";
    switch (prop.DataTypeMode) {
    case FXP_DT_FIXPT:
    case FXP_DT_SCALED_DOUBLE:
        FxpDT::fxpDataTypeToConstructorString_FixptGuts(text, prop, rep);
        break;
    case FXP_DT_DOUBLE:
        text += "'double'";
        break;
    case FXP_DT_SINGLE:
        text += "'single'";
        break;
    case FXP_DT_BOOLEAN:
        text += "'boolean'";
        break;
    case FXP_DT_CUSTOM_FLOAT:
        text += "'half'"; // kept: whatever the widths
        break;
    }
    const bool showsOverride = prop.DataTypeMode != FXP_DT_BOOLEAN; // kept: though the reader takes it from a boolean
    if (showsOverride && prop.DataTypeOverrideOff == 1) text += ",'DataTypeOverride','Off'";
    return text + ')';
}

/// Where the text of a pair of preferences stands in its entry.
std::size_t indexOfText(FxpDT::baseCtorPrefer base, FxpDT::scalingRepPrefer rep) {
    const std::size_t scaling = rep == FxpDT::PreferFractionLength ? 0 : rep == FxpDT::PreferSlopeBias ? 2 : 4;
    return 1 + (base != FxpDT::PreferNumerictype) + scaling;
}

} // namespace

const fxpCtorParseResult& constructorStringToFxpDataType(std::string_view text) {
    static auto& texts = *new FXP::ReadTexts<fxpCtorParseResult>; // never destroyed: references to it stay good
    return FXP::readOnce(texts, text, readConstructor);
}

const fxpCtorParseResult& constructorStringToFxpDataType(const std::string& text) {
    return constructorStringToFxpDataType(std::string_view(text));
}

namespace FxpDT {

void fxpDataTypeToConstructorString_FixptGuts(std::string& out, const fxpDataTypeProp& prop, scalingRepPrefer rep) {
    out += prop.Signedness == 1 ? "1" : prop.Signedness == 0 ? "0" : "[]";
    out += ',' + std::to_string(static_cast<unsigned int>(prop.WordLength)); // kept: as an unsigned number
    out += scalingArguments(prop, rep);
    if (prop.DataTypeMode == FXP_DT_SCALED_DOUBLE) out += ",'DataType','ScaledDouble'";
}

} // namespace FxpDT

const std::string& fxpDataTypeToConstructorString(const fxpDataTypeProp& prop, FxpDT::baseCtorPrefer base,
                                                  FxpDT::scalingRepPrefer rep) {
    QLTYPES_ASSERT(prop.DataTypeMode >= FXP_DT_FIXPT && prop.DataTypeMode <= FXP_DT_CUSTOM_FLOAT);
    std::string& text = FXP::textCacheEntry(prop).texts[indexOfText(base, rep)];
    if (text.empty()) text = writeConstructor(prop, base, rep);
    return text;
}
