// qltypes flags: feature flags and testing hooks with their states.
#include "Commands.h"

#include <fmt/format.h>

#include "output/Json.h"
#include "output/Output.h"
#include "qltypes/host/FeatureFlags.h"

namespace inspector {
namespace {

std::string flagsText(const Colours& colours) {
    TextTable features({{"feature", Align::Left},
                        {"id", Align::Right},
                        {"state", Align::Right},
                        {"default", Align::Right},
                        {"description", Align::Left}});
    for (const QlFeature* feature : QlFeature::all())
        features.addRow({feature->name(), std::to_string(feature->numericId()), std::to_string(feature->state()),
                         std::to_string(feature->defaultState()), feature->description()});
    TextTable hooks(
        {{"hook", Align::Left}, {"state", Align::Right}, {"default", Align::Right}, {"description", Align::Left}});
    for (const QlTestingHook* hook : QlTestingHook::all())
        hooks.addRow(
            {hook->name(), std::to_string(hook->state()), std::to_string(hook->defaultState()), hook->description()});
    return colours.bold("Features") + "\n" + features.text("  ", colours) + "\n" + colours.bold("Testing hooks") +
           "\n" + hooks.text("  ", colours);
}

template <class Flag> nlohmann::ordered_json flagJson(const Flag& flag) {
    return {{"name", flag.name()},
            {"description", flag.description()},
            {"group", flag.group()},
            {"state", flag.state()},
            {"defaultState", flag.defaultState()}};
}

std::string flagsJson() {
    nlohmann::ordered_json features = nlohmann::ordered_json::array();
    for (const QlFeature* feature : QlFeature::all()) {
        nlohmann::ordered_json json = flagJson(*feature);
        json["numericId"] = feature->numericId();
        features.push_back(json);
    }
    nlohmann::ordered_json hooks = nlohmann::ordered_json::array();
    for (const QlTestingHook* hook : QlTestingHook::all())
        hooks.push_back(flagJson(*hook));
    return jsonText({{"features", features}, {"hooks", hooks}});
}

} // namespace

void addFlagsCommand(CommandLine& line) {
    const auto asJson = std::make_shared<bool>(false);
    Subcommand command = line.subcommand("flags", "Lists feature flags and testing hooks with their states");
    command.flag("--json", *asJson, "Print JSON with stable keys");
    command.footer("Examples:\n"
                   "  qltypes flags\n"
                   "  qltypes flags --json | jq '.features[] | select(.state != 0).name'");
    command.run([asJson] { print(*asJson ? flagsJson() : flagsText(coloursOfOutput())); });
}

} // namespace inspector
