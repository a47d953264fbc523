// qltypes type: what a text says about a number type.
#include "Commands.h"

#include <algorithm>
#include <sstream>

#include <fmt/format.h>

#include "description/Files.h"
#include "numbers/NumberType.h"
#include "output/Json.h"
#include "output/Output.h"
#include "qltypes/fixed_point/ConstructorString.h"
#include "qltypes/fixed_point/IdentifierString.h"

namespace inspector {
namespace {

struct NumberText {
    std::string text;
    std::string place; ///< in front of a complaint; empty for an argument
};

void appendLines(const std::string& input, std::vector<NumberText>& texts) {
    std::istringstream lines(input);
    std::string line;
    for (int number = 1; std::getline(lines, line); ++number) {
        if (!line.empty()) texts.push_back({line, fmt::format("(standard input):{}: ", number)});
    }
}

std::vector<NumberText> textsOf(const std::vector<std::string>& arguments) {
    std::vector<NumberText> texts;
    for (const std::string& argument : arguments) {
        if (argument == "-")
            appendLines(readStandardInput(), texts);
        else
            texts.push_back({argument, ""});
    }
    return texts;
}

// One line whatever the text held.
std::string oneLine(std::string text) {
    std::replace_if(
        text.begin(), text.end(), [](unsigned char c) { return c < 0x20 || c == 0x7F; }, '?');
    return text;
}

struct ReadType {
    std::string text;
    fxpDataTypeProp prop;
};

ReadType read(const NumberText& from) {
    try {
        return {from.text, readNumberType(from.text)};
    } catch (const std::invalid_argument& e) {
        throw UsageError(from.place + oneLine(e.what()));
    }
}

std::string constructorOf(const fxpDataTypeProp& prop, FxpDT::scalingRepPrefer scaling) {
    return fxpDataTypeToConstructorString(prop, FxpDT::PreferFixdt, scaling);
}

bool isScaled(const fxpDataTypeProp& prop) {
    return prop.DataTypeMode == FXP_DT_FIXPT || prop.DataTypeMode == FXP_DT_SCALED_DOUBLE;
}

bool isFloating(const fxpDataTypeProp& prop) {
    return prop.DataTypeMode != FXP_DT_FIXPT && prop.DataTypeMode != FXP_DT_BOOLEAN;
}

nlohmann::ordered_json typeJson(const ReadType& type) {
    const fxpDataTypeProp& prop = type.prop;
    const auto range = rangeOf(prop);
    const auto resolution = resolutionOf(prop);
    nlohmann::ordered_json json;
    json["text"] = type.text;
    json["mode"] = modeName(prop.DataTypeMode);
    json["signedness"] = signednessName(prop.Signedness);
    json["wordLength"] = prop.WordLength;
    json["exponentLength"] = prop.ExponentLength;
    json["slopeAdjustmentFactor"] = prop.SlopeAdjustmentFactor;
    json["fixedExponent"] = prop.FixedExponent;
    json["bias"] = prop.Bias;
    json["overrideOff"] = prop.DataTypeOverrideOff != 0;
    json["valid"] = prop.validateFxpDTProp();
    json["min"] = range ? nlohmann::ordered_json(range->min) : nlohmann::ordered_json();
    json["max"] = range ? nlohmann::ordered_json(range->max) : nlohmann::ordered_json();
    json["resolution"] = resolution ? nlohmann::ordered_json(*resolution) : nlohmann::ordered_json();
    json["identifier"] = fxpDataTypeToIdentifierString(&prop);
    json["constructor"] = constructorOf(prop, FxpDT::PreferFractionLength);
    json["constructorSlopeBias"] = constructorOf(prop, FxpDT::PreferSlopeBias);
    return json;
}

std::string typeText(const ReadType& type, const Colours& colours) {
    const fxpDataTypeProp& prop = type.prop;
    std::string text = colours.bold(oneLine(type.text)) + "\n";
    const auto line = [&](const char* title, const std::string& value) {
        text += fmt::format("  {:<12} {}\n", title, value);
    };
    line("mode", modeName(prop.DataTypeMode));
    line("signedness", signednessName(prop.Signedness));
    line("word length", fmt::format("{} bits", prop.WordLength));
    if (prop.ExponentLength > 0) line("exponent", fmt::format("{} bits", prop.ExponentLength));
    if (isScaled(prop)) {
        const bool isPowerOfTwo = prop.SlopeAdjustmentFactor == 1.0;
        if (isPowerOfTwo) line("fraction", fmt::format("{} bits", -static_cast<long>(prop.FixedExponent)));
        line("slope", isPowerOfTwo ? fmt::format("2^{}", prop.FixedExponent)
                                   : fmt::format("{} * 2^{}", prop.SlopeAdjustmentFactor, prop.FixedExponent));
        line("bias", fmt::format("{}", prop.Bias));
    }
    if (prop.DataTypeOverrideOff != 0) line("override", "off");
    if (!prop.validateFxpDTProp()) line("valid", "no: the values do not make sense together");
    if (const auto range = rangeOf(prop)) line("range", fmt::format("{} to {}", range->min, range->max));
    if (const auto resolution = resolutionOf(prop)) line("resolution", *resolution + (isFloating(prop) ? " at 1" : ""));
    line("identifier", fxpDataTypeToIdentifierString(&prop));
    const std::string constructor = constructorOf(prop, FxpDT::PreferFractionLength);
    const std::string slopeBias = constructorOf(prop, FxpDT::PreferSlopeBias);
    line("constructor", constructor);
    if (slopeBias != constructor) line("", slopeBias);
    return text;
}

} // namespace

void addTypeCommand(CommandLine& line) {
    struct Options {
        std::vector<std::string> texts;
        bool asJson = false;
    };
    const auto options = std::make_shared<Options>();
    Subcommand command =
        line.subcommand("type", "Reads number types and shows record, range, resolution and both text forms");
    command
        .option("TEXT", options->texts,
                "Identifiers (sfix16_En7) or constructor texts (fixdt(1,16,7)); - reads a text a line from standard"
                " input")
        .required();
    command.flag("--json", options->asJson, "Print JSON with stable keys");
    command.footer("Values are given exactly up to 40 digits; in JSON they are texts.\n"
                   "Examples:\n"
                   "  qltypes type sfix16_En7\n"
                   "  qltypes type 'fixdt(0,8,1.5,2)' half\n"
                   "  echo uint64 | qltypes type --json - | jq '.types[].max'");
    command.run([options] {
        std::string text;
        nlohmann::ordered_json types = nlohmann::ordered_json::array();
        for (const NumberText& from : textsOf(options->texts)) {
            const ReadType type = read(from);
            if (options->asJson) {
                types.push_back(typeJson(type));
            } else {
                if (!text.empty()) text += "\n";
                text += typeText(type, coloursOfOutput());
            }
        }
        print(options->asJson ? jsonText({{"types", types}}) : text);
    });
}

} // namespace inspector
