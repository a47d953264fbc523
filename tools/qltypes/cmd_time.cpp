// qltypes time: scales of time with their defaults, and whether an epoch, a range or an offset is one.
#include "Commands.h"

#include <array>
#include <regex>
#include <utility>

#include <fmt/format.h>

#include "numbers/NumberType.h"
#include "output/Json.h"
#include "output/Output.h"
#include "qlplatform/services/IException.h"
#include "qltypes/date_time/DateTimeType.h"
#include "qltypes/date_time/TimeZone.h"
#include "qltypes/fixed_point/IdentifierString.h"

namespace inspector {
namespace {

using QLDateTime::AbsoluteTimeScale;
using QLDateTime::DateTimeStruct;
using QLDateTime::DateTimeType;

constexpr AbsoluteTimeScale scales[] = {AbsoluteTimeScale::TAI,    AbsoluteTimeScale::GPS,
                                        AbsoluteTimeScale::UTC,    AbsoluteTimeScale::Posix,
                                        AbsoluteTimeScale::JD_TAI, AbsoluteTimeScale::MJD_TAI};

// The texts of times are ASCII.
std::string narrowed(const std::u16string& text) {
    std::string narrow;
    for (const char16_t c : text)
        narrow += static_cast<char>(c);
    return narrow;
}

std::string scaleName(AbsoluteTimeScale scale) { return narrowed(QLDateTime::TimeSystem(scale).getTimeScaleStr()); }

AbsoluteTimeScale scaleNamed(const std::string& name) {
    std::string names;
    for (const AbsoluteTimeScale scale : scales) {
        if (name == scaleName(scale)) return scale;
        names += (names.empty() ? "" : ", ") + scaleName(scale);
    }
    throw UsageError(fmt::format("--scale: '{}' is none of {}", name, names));
}

// Runs `work`, and complains with the text of what it raises.
template <class Work> auto checked(const std::string& place, Work work) {
    try {
        return work();
    } catch (const foundation::core::except::IException& e) {
        throw UsageError(place + ": " + e.what());
    }
}

DateTimeStruct timeIn(const std::string& option, const std::string& text) {
    static const std::regex grammar(
        R"(([+-]?\d{1,15})-(\d\d?)-(\d\d?)(?:[T ](\d\d?):(\d\d?)(?::(\d\d?(?:\.\d{1,20})?))?)?)");
    std::smatch parts;
    if (!std::regex_match(text, parts, grammar))
        throw UsageError(fmt::format("{}: '{}' is no time such as 1980-01-06T00:00:00", option, text));
    std::array<double, 6> fields{};
    for (std::size_t i = 0; i < fields.size(); ++i) {
        if (parts[i + 1].matched) fields[i] = std::stod(parts[i + 1]);
    }
    const std::vector<double> v = checked(fmt::format("{}: '{}'", option, text), [&] {
        return DateTimeStruct::validateAndConvertToTimeVector(fields.data());
    });
    const auto byte = [&](std::size_t i) { return static_cast<unsigned char>(v[i]); };
    return DateTimeStruct(static_cast<long>(v[0]), byte(1), byte(2), byte(3), byte(4), byte(5), v[6]);
}

std::string storageText(const DateTimeType& type) { return fxpDataTypeToIdentifierString(&type.getStorage()); }

struct Options {
    std::string scale;
    std::string epoch;
    std::vector<std::string> range;
    std::string storage;
    std::string zone;
    bool asJson = false;
};

// The type that the options describe.
DateTimeType typeOf(const Options& options) {
    QLDateTime::TimeSystem system(scaleNamed(options.scale));
    if (!options.epoch.empty()) {
        const DateTimeStruct epoch = timeIn("--epoch", options.epoch);
        checked("--epoch", [&] { system.setEpoch(epoch); });
    }
    if (!options.range.empty()) {
        const std::pair range(timeIn("--range", options.range[0]), timeIn("--range", options.range[1]));
        checked("--range", [&] { system.setRange(range); });
    }
    if (options.storage.empty()) return DateTimeType(system);
    try {
        return DateTimeType(system, readNumberType(options.storage));
    } catch (const std::invalid_argument& e) {
        throw UsageError(fmt::format("--storage: {}", e.what()));
    }
}

// The offset that the text gives, or nothing where no offset is asked for.
std::vector<QLDateTime::TimeZone> zonesOf(const Options& options) {
    if (options.zone.empty()) return {};
    static const std::regex grammar(R"(([+-]?)(\d\d?):(\d\d))");
    std::smatch parts;
    if (!std::regex_match(options.zone, parts, grammar))
        throw UsageError(fmt::format("--zone: '{}' is no offset such as +05:45", options.zone));
    const double sign = parts[1] == "-" ? -1.0 : 1.0;
    const double fields[] = {sign * std::stod(parts[2]), sign * std::stod(parts[3])};
    const std::vector<double> v = checked(fmt::format("--zone: '{}'", options.zone),
                                          [&] { return QLDateTime::TimeZone::validateAndConvertToVector(fields); });
    return {QLDateTime::TimeZone(static_cast<signed char>(v[0]), static_cast<signed char>(v[1]))};
}

std::vector<DateTimeType> typesOf(const Options& options) {
    if (!options.scale.empty()) return {typeOf(options)};
    if (!options.epoch.empty() || !options.range.empty() || !options.storage.empty())
        throw UsageError("--epoch, --range and --storage need a --scale");
    std::vector<DateTimeType> types;
    if (options.zone.empty()) {
        for (const AbsoluteTimeScale scale : scales)
            types.push_back(DateTimeType::datetime_t(scale));
    }
    return types;
}

std::string timeText(const std::vector<DateTimeType>& types, const std::vector<QLDateTime::TimeZone>& zones,
                     const Colours& colours) {
    std::string text;
    for (const DateTimeType& type : types) {
        const auto range = type.getRangeStr();
        text += (text.empty() ? "" : "\n") + colours.bold(narrowed(type.getDataTypeName())) + "\n";
        text += fmt::format("  scale    {}\n  epoch    {}\n  first    {}\n  last     {}\n  storage  {}\n",
                            narrowed(type.getTimeScaleStr()), narrowed(type.getEpochStr()), narrowed(range.first),
                            narrowed(range.second), storageText(type));
    }
    for (const QLDateTime::TimeZone& zone : zones)
        text += fmt::format("{}{}: {} seconds\n", text.empty() ? "" : "\n", narrowed(zone.getTimeZoneStr()),
                            zone.getOffsetSecond());
    return text;
}

std::string timeJson(const std::vector<DateTimeType>& types, const std::vector<QLDateTime::TimeZone>& zones) {
    nlohmann::ordered_json document;
    document["types"] = nlohmann::ordered_json::array();
    for (const DateTimeType& type : types) {
        const auto range = type.getRangeStr();
        document["types"].push_back({{"name", narrowed(type.getDataTypeName())},
                                     {"scale", narrowed(type.getTimeScaleStr())},
                                     {"epoch", narrowed(type.getEpochStr())},
                                     {"first", narrowed(range.first)},
                                     {"last", narrowed(range.second)},
                                     {"storage", storageText(type)}});
    }
    document["zones"] = nlohmann::ordered_json::array();
    for (const QLDateTime::TimeZone& zone : zones)
        document["zones"].push_back(
            {{"offset", narrowed(zone.getTimeZoneStr())}, {"offsetSeconds", zone.getOffsetSecond()}});
    return jsonText(document);
}

} // namespace

void addTimeCommand(CommandLine& line) {
    const auto options = std::make_shared<Options>();
    Subcommand command = line.subcommand("time", "Shows scales of time, and checks epochs, ranges and offsets");
    command.option("--scale", options->scale, "Only this scale: tai, gps, utc, posix, jd or mjd");
    command.option("--epoch", options->epoch, "Epoch in place of the default one");
    command.option("--range", options->range, "First and last moment in place of the default ones").numValues(2);
    command.option("--storage", options->storage, "Number type in place of the default one, in either text form");
    command.option("--zone", options->zone,
                   "Offset of a time zone: whole hours from -12 to 14, with 00, 30 or 45 minutes");
    command.flag("--json", options->asJson, "Print JSON with stable keys");
    command.footer("Times are written year-month-day, then T and hour:minute:second where wanted.\n"
                   "Examples:\n"
                   "  qltypes time\n"
                   "  qltypes time --scale gps --epoch 2000-01-01T12:00:00 --storage double\n"
                   "  qltypes time --scale utc --range 1990-01-01 2030-12-31T23:59:60\n"
                   "  qltypes time --zone +05:45");
    command.run([options] {
        const auto types = typesOf(*options);
        const auto zones = zonesOf(*options);
        print(options->asJson ? timeJson(types, zones) : timeText(types, zones, coloursOfOutput()));
    });
}

} // namespace inspector
