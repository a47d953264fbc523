// qltypes messages: the catalogue of all that the library can complain about.
#include "Commands.h"

#include <boost/algorithm/string/predicate.hpp>
#include <fmt/format.h>

#include "output/Json.h"
#include "output/Output.h"
#include "qltypes/host/MessageCatalogue.h"

namespace inspector {
namespace {

const char* kindName(char kind) { return kind == 'L' ? "integer" : kind == 'S' ? "text" : "wide text"; }

std::string argumentText(const QLTypeSys::CatalogueRow& row) {
    std::string text;
    for (const char kind : row.argumentKinds)
        text += (text.empty() ? "" : ", ") + std::string(kindName(kind));
    return text;
}

bool matches(const QLTypeSys::CatalogueRow& row, const std::string& filter) {
    return boost::icontains(fmt::format("{}:{}", row.category, row.leaf), filter) || boost::icontains(row.text, filter);
}

std::vector<QLTypeSys::CatalogueRow> selected(const std::string& filter) {
    std::vector<QLTypeSys::CatalogueRow> rows;
    for (const QLTypeSys::CatalogueRow& row : QLTypeSys::messageCatalogue()) {
        if (matches(row, filter)) rows.push_back(row);
    }
    if (rows.empty()) throw UsageError(fmt::format("no message contains '{}'", filter));
    return rows;
}

std::string messagesText(const std::vector<QLTypeSys::CatalogueRow>& rows, const Colours& colours) {
    std::string text;
    for (std::size_t i = 0; i < rows.size();) {
        const std::string category = rows[i].category;
        TextTable table({{"message", Align::Left}, {"arguments", Align::Left}, {"text", Align::Left}});
        for (; i < rows.size() && rows[i].category == category; ++i)
            table.addRow({rows[i].leaf, argumentText(rows[i]), rows[i].text});
        text += colours.bold(category) + "\n" + table.text("  ", colours) + "\n";
    }
    return text + fmt::format("{} message{}\n", rows.size(), rows.size() == 1 ? "" : "s");
}

std::string messagesJson(const std::vector<QLTypeSys::CatalogueRow>& rows) {
    nlohmann::ordered_json messages = nlohmann::ordered_json::array();
    for (const QLTypeSys::CatalogueRow& row : rows) {
        nlohmann::ordered_json arguments = nlohmann::ordered_json::array();
        for (const char kind : row.argumentKinds)
            arguments.push_back(kindName(kind));
        messages.push_back(
            {{"category", row.category}, {"leaf", row.leaf}, {"arguments", arguments}, {"text", row.text}});
    }
    return jsonText({{"messages", messages}});
}

} // namespace

void addMessagesCommand(CommandLine& line) {
    struct Options {
        std::string filter;
        bool asJson = false;
    };
    const auto options = std::make_shared<Options>();
    Subcommand command = line.subcommand("messages", "Lists the messages that the library can raise");
    command.option("FILTER", options->filter, "Only messages with this in category:leaf or text, in either case");
    command.flag("--json", options->asJson, "Print JSON with stable keys");
    command.footer("Examples:\n"
                   "  qltypes messages\n"
                   "  qltypes messages DateTime\n"
                   "  qltypes messages --json | jq -r '.messages[].leaf'");
    command.run([options] {
        const auto rows = selected(options->filter);
        print(options->asJson ? messagesJson(rows) : messagesText(rows, coloursOfOutput()));
    });
}

} // namespace inspector
