// qltypes convert: values among the built-in types, and what is lost on the way.
#include "Commands.h"

#include <array>
#include <cstdio>
#include <utility>

#include <fmt/format.h>

#include "convert/Elements.h"
#include "convert/Losses.h"
#include "convert/Progress.h"
#include "convert/Sources.h"
#include "output/Json.h"
#include "output/Output.h"

namespace inspector {
namespace {

template <class Mode> struct ModeRow {
    const char* name;
    Mode mode;
};

// clang-format off
constexpr ModeRow<fxpModeRounding_tag> roundings[] = {
    {"zero",      FXP_ROUND_ZERO},
    {"half-up",   FXP_ROUND_HALF_UP},
    {"ceiling",   FXP_ROUND_CEILING},
    {"floor",     FXP_ROUND_FLOOR},
    {"as-zero",   FXP_ROUND_AS_ZERO},
    {"half-away", FXP_ROUND_HALF_AWAY},
    {"half-even", FXP_ROUND_HALF_EVEN},
};
constexpr ModeRow<fxpModeOverflow_tag> overflows[] = {
    {"wrap",     FXP_OVERFLOW_WRAP},
    {"saturate", FXP_OVERFLOW_SATURATE},
};
// clang-format on

template <class Rows> auto modeOf(const char* option, const Rows& rows, const std::string& name) {
    std::string names;
    for (const auto& row : rows) {
        if (name == row.name) return row.mode;
        names += (names.empty() ? "" : ", ") + std::string(row.name);
    }
    throw UsageError(fmt::format("{}: '{}' is none of {}", option, name, names));
}

int typeOf(const char* option, const std::string& name) {
    const int id = builtInIdOf(name);
    if (id < 0) throw UsageError(fmt::format("{}: '{}' is no built-in type", option, name));
    return id;
}

struct Options {
    std::string from;
    std::string to;
    std::string rounding = "zero";
    std::string overflow = "saturate";
    std::vector<std::string> values;
    bool isRaw = false;
    bool isPrediction = false;
    bool asJson = false;
};

ConversionMode modeOf(const Options& options) {
    return {typeOf("--from", options.from), typeOf("--to", options.to),
            modeOf("--rounding", roundings, options.rounding), modeOf("--overflow", overflows, options.overflow)};
}

std::unique_ptr<ElementSource> sourceOf(const Options& options, int id) {
    const bool isStandardInput =
        options.values.empty() || (options.values.size() == 1 && options.values.front() == "-");
    if (!isStandardInput && options.isRaw) throw UsageError("--raw reads standard input and takes no values");
    if (options.isRaw) return std::make_unique<RawSource>(id);
    if (isStandardInput) return std::make_unique<TextSource>(id);
    return std::make_unique<ArgumentSource>(id, options.values);
}

// The results of a block as they are printed.
std::string textOf(const std::vector<std::byte>& results, int id, bool asJson, bool isFirst) {
    std::string text;
    for (std::size_t at = 0; at < results.size(); at += elementSize(id)) {
        const std::byte* const element = &results[at];
        if (!asJson) {
            text += elementText(id, element) + "\n";
            continue;
        }
        text += isFirst ? "" : ", ";
        isFirst = false;
        // JSON has no number for these
        text += isFinite(id, element) ? elementText(id, element) : "\"" + elementText(id, element) + "\"";
    }
    return text;
}

std::string bytesOf(const std::vector<std::byte>& results) {
    return std::string(reinterpret_cast<const char*>(results.data()), results.size());
}

nlohmann::ordered_json reportJson(const Options& options, const LossCounter& counter) {
    nlohmann::ordered_json json;
    json["from"] = options.from;
    json["to"] = options.to;
    json["rounding"] = options.rounding;
    json["overflow"] = options.overflow;
    json["numValues"] = counter.numValues();
    json["numOverflowed"] = counter.count(LossKind::Overflow);
    if (!options.isPrediction) {
        json["numLostPrecision"] = counter.count(LossKind::Precision);
        json["numNaN"] = counter.count(LossKind::NaN);
    }
    json["first"] = nlohmann::ordered_json::array();
    for (const Loss& loss : counter.first())
        json["first"].push_back(
            {{"position", loss.position}, {"from", loss.from}, {"to", loss.to}, {"loss", lossKindName(loss.kind)}});
    return json;
}

std::string lossText(const LossCounter& counter, bool isPrediction) {
    std::string text;
    for (const Loss& loss : counter.first())
        text += isPrediction ? fmt::format("  [{}] {} would become {}\n", loss.position, loss.from, loss.to)
                             : fmt::format("  [{}] {} became {}: {}\n", loss.position, loss.from, loss.to,
                                           lossKindName(loss.kind));
    if (counter.numLost() > counter.first().size())
        text += fmt::format("  and {} more\n", counter.numLost() - counter.first().size());
    return text;
}

void predict(const Options& options, LossCounter& counter, ElementSource& source) {
    Progress progress;
    std::vector<std::byte> block;
    for (source.next(block); !block.empty(); source.next(block)) {
        counter.predict(block);
        progress.show(source.numBytesRead());
    }
    if (options.asJson)
        print(jsonText(reportJson(options, counter)));
    else
        print(fmt::format("{} of {} values would overflow\n{}", counter.numLost(), counter.numValues(),
                          lossText(counter, true)));
}

// Prints each block as it comes: the input may be larger than memory.
void convert(const Options& options, const ConversionMode& mode, LossCounter& counter, ElementSource& source) {
    const bool printsJson = options.asJson && !options.isRaw;
    {
        Progress progress;
        std::vector<std::byte> block;
        std::vector<std::byte> results;
        for (source.next(block); !block.empty(); source.next(block)) {
            const bool isFirst = counter.numValues() == 0;
            counter.convert(block, results);
            const std::string opening = printsJson && isFirst ? "{\n  \"values\": [" : "";
            print(opening + (options.isRaw ? bytesOf(results) : textOf(results, mode.toId, printsJson, isFirst)));
            progress.show(source.numBytesRead());
        }
    }
    if (printsJson) {
        const std::string opening = counter.numValues() == 0 ? "{\n  \"values\": [" : "";
        print(opening + "]," + jsonText(reportJson(options, counter)).substr(1)); // continues the object
        return;
    }
    if (options.asJson) {
        std::fputs(jsonText(reportJson(options, counter)).c_str(), stderr);
    } else if (counter.numLost() > 0) {
        fmt::print(stderr, "qltypes: {} of {} values were lost: {} by overflow, {} by precision, {} no numbers\n{}",
                   counter.numLost(), counter.numValues(), counter.count(LossKind::Overflow),
                   counter.count(LossKind::Precision), counter.count(LossKind::NaN), lossText(counter, false));
    }
}

} // namespace

void addConvertCommand(CommandLine& line) {
    const auto options = std::make_shared<Options>();
    Subcommand command = line.subcommand("convert", "Converts values among the built-in types and tells what is lost");
    command.option("--from", options->from, "Type of the values: double, single, int8 ... uint32, boolean").required();
    command.option("--to", options->to, "Type of the results").required();
    command.option("--rounding", options->rounding,
                   "zero (default), half-up, ceiling, floor, as-zero, half-away or half-even");
    command.option("--overflow", options->overflow, "saturate (default) or wrap");
    command.option("VALUE", options->values,
                   "Values; without any, or with - alone, they are read from standard input. Put -- in front of"
                   " them where one is negative");
    command.flag("--raw", options->isRaw, "Little-endian binary from standard input to standard output, of any length");
    command.flag("--predict", options->isPrediction, "Only tell which values would overflow");
    command.flag("--json", options->asJson,
                 "Print JSON with stable keys; with --raw the report goes to standard error");
    command.footer(
        "Results go to standard output, losses with the first positions (from 0) to standard error. Ends with 1 when\n"
        "something was lost: by overflow, by precision, or because the value was no number.\n"
        "Examples:\n"
        "  qltypes convert --from double --to int8 --rounding floor --overflow saturate -- -128.9 127.9 nan inf\n"
        "  seq 1000 | qltypes convert --from int32 --to uint8 --overflow wrap\n"
        "  qltypes convert --raw --from double --to single <doubles.bin >singles.bin\n"
        "  qltypes convert --predict --from double --to int16 40000 3");
    command.run([options] {
        const ConversionMode mode = modeOf(*options);
        const auto source = sourceOf(*options, mode.fromId);
        LossCounter counter(mode);
        if (options->isPrediction)
            predict(*options, counter, *source);
        else
            convert(*options, mode, counter, *source);
        if (counter.numLost() > 0) throw DifferenceFound();
    });
}

} // namespace inspector
