// qltypes layout: where each element of a structure lies, and why.
#include "Commands.h"

#include <algorithm>
#include <filesystem>
#include <iterator>
#include <map>
#include <memory>
#include <optional>
#include <set>

#include <fmt/format.h>
#include <fmt/ranges.h>

#include "description/Files.h"
#include "description/JsonReader.h"
#include "description/MsgReader.h"
#include "output/CHeader.h"
#include "output/LayoutJson.h"
#include "output/LayoutText.h"
#include "output/Output.h"
#include "picture/Page.h"
#include "picture/Svg.h"
#include "table/ChecksumReader.h"
#include "table/NodeReader.h"
#include "table/TypeLoader.h"

namespace inspector {
namespace {

void append(Description& description, Description&& more) {
    std::move(more.types.begin(), more.types.end(), std::back_inserter(description.types));
    std::move(more.refusals.begin(), more.refusals.end(), std::back_inserter(description.refusals));
    description.numMessages += more.numMessages;
}

struct Inputs {
    Description description;
    std::vector<KnownFacts> knownFacts;
};

// Reads all inputs: JSON descriptions, standard input as one, message definitions and folders of these, scripts of
// dims.
Inputs readInputs(const std::vector<std::string>& inputs) {
    std::vector<KnownFacts> knownFacts;
    Description description;
    MsgReader messages;
    bool hasMessages = false;
    for (const std::string& input : inputs) {
        const std::filesystem::path path = input;
        std::error_code error;
        if (input == "-") {
            append(description, readJsonDescription("(standard input)", readStandardInput()));
        } else if (std::filesystem::is_directory(path, error)) {
            messages.addFolder(path);
            hasMessages = true;
        } else if (path.extension() == ".dims") {
            knownFacts.push_back(readKnownFacts(input, readFileText(path)));
        } else if (path.extension() == ".msg") {
            messages.addFile(path);
            hasMessages = true;
        } else {
            append(description, readJsonDescription(input, readFileText(path)));
        }
    }
    if (hasMessages) append(description, messages.read());
    return {std::move(description), std::move(knownFacts)};
}

std::string whyAbsent(const Layout& layout, const std::string& name) {
    for (const Refusal& refusal : layout.refusals) {
        if (refusal.label == name) return fmt::format("{} cannot be expressed: {}", name, refusal.reason);
    }
    return fmt::format("no structure '{}' was laid out", name);
}

// Keeps the structures of the given names, in that order.
void select(Layout& layout, const std::vector<std::string>& names) {
    std::vector<StructureLayout> selected;
    for (const std::string& name : names) {
        const auto at = std::find_if(layout.structures.begin(), layout.structures.end(), [&](auto& structure) {
            return structure.label == name || structure.name == name;
        });
        if (at == layout.structures.end()) throw UsageError(fmt::format("--only: {}", whyAbsent(layout, name)));
        selected.push_back(*at);
    }
    layout.structures = std::move(selected);
}

// Puts each structure behind those that it contains, and adds those that the selected ones contain.
void orderForC(Layout& layout, const Layout& all, const QLTypeSys::DataTypeTable& table) {
    const auto idOf = [&](const StructureLayout& structure) { return table.getDataTypeId(structure.name.c_str()); };
    std::map<std::string, const StructureLayout*> byName;
    for (const StructureLayout& structure : all.structures)
        byName.emplace(structure.name, &structure);
    std::set<std::string> names;
    for (const StructureLayout& structure : layout.structures)
        names.insert(structure.name);
    for (std::size_t i = 0; i < layout.structures.size(); ++i) { // grows while it is walked
        const std::vector<ElementLayout> elements = layout.structures[i].elements;
        for (const ElementLayout& element : elements) {
            const bool isNew = element.cType.kind == CType::Kind::Structure && names.insert(element.cType.name).second;
            if (isNew) layout.structures.push_back(*byName.at(element.cType.name));
        }
    }
    std::sort(layout.structures.begin(), layout.structures.end(),
              [&](auto& one, auto& other) { return idOf(one) < idOf(other); }); // registered in that order
}

const StructureLayout& onlyStructure(const Layout& layout) {
    if (layout.structures.size() != 1) {
        throw UsageError(
            fmt::format("--node: {} structures were laid out: name one with --only", layout.structures.size()));
    }
    return layout.structures.front();
}

long indexOf(const NodeReader& reader, const std::string& node, const std::string& structureLabel) {
    const std::optional<long> index = reader.find(node);
    if (!index) throw UsageError(fmt::format("--node: {} has no node '{}'", structureLabel, node));
    return *index;
}

// What was read, for people: files by their names, folders of messages by those of their packages.
std::string titleOf(const std::vector<std::string>& inputs) {
    std::vector<std::string> names;
    for (const std::string& input : inputs) {
        std::filesystem::path path = std::filesystem::absolute(input).lexically_normal();
        if (!path.has_filename()) path = path.parent_path(); // a slash stood at the end
        if (path.filename() == "msg") path = path.parent_path();
        names.push_back(input == "-" ? "standard input" : path.filename().string());
    }
    return fmt::format("{}", fmt::join(names, ", "));
}

} // namespace

void addLayoutCommand(CommandLine& line) {
    struct Options {
        std::vector<std::string> inputs;
        std::vector<std::string> only;
        std::optional<std::string> node;
        std::string format;
        bool withPadding = false;
        bool withNumberings = false;
        bool withChecksum = false;
        bool asJson = false;
    };
    const auto options = std::make_shared<Options>();
    Subcommand command = line.subcommand("layout", "Lays structures out and shows where each element lies, and why");
    command
        .option("INPUT", options->inputs,
                "JSON type descriptions (- is standard input), .msg files, folders of .msg files, and .dims scripts of "
                "what is known of symbolic dimensions")
        .required();
    command.option("--only", options->only, "Show only these structures, names divided by commas").delimiter(',');
    const Option numberings =
        command.flag("--numberings", options->withNumberings,
                     "Number each node too: depth-first, flat, raw and immediate, with its full path");
    const Option checksum = command.flag("--checksum", options->withChecksum,
                                         "Show the text by which each element enters the checksum, and the digest");
    const Option node =
        command
            .option("--node", options->node,
                    "Show one node of the one structure: its depth-first number, or its full path such as y(1).b")
            .excludes(numberings)
            .excludes(checksum);
    const Option json = command.flag("--json", options->asJson, "Print JSON with stable keys");
    const Option format =
        command
            .option("--format", options->format,
                    "c: print a C header that asserts every size and offset; svg: draw the bytes as a map; html: "
                    "write a page with tree, byte maps, numberings and types")
            .oneOf({"c", "svg", "html"})
            .excludes(json)
            .excludes(node)
            .excludes(numberings)
            .excludes(checksum);
    command.flag("--padding", options->withPadding, "Declare padding as members of the C structures").needs(format);
    command.footer(
        "Examples:\n"
        "  qltypes layout types.json\n"
        "  qltypes layout --json types.json | jq '.structures[].size'\n"
        "  qltypes layout types.json --only Outer --node 'y(1).b'\n"
        "  qltypes layout types.json --format c --padding > types.h\n"
        "  qltypes layout types.json --only Outer --format svg > outer.svg\n"
        "  qltypes layout types.json facts.dims --format html > types.html\n"
        "  qltypes layout /usr/share/geometry_msgs/msg --only geometry_msgs/Pose\n"
        "  echo '{\"types\": [{\"name\": \"P\", \"elements\": [{\"name\": \"x\", \"type\": \"double\"}]}]}' |"
        " qltypes layout -");
    command.run([options] {
        const auto [description, knownFacts] = readInputs(options->inputs);
        QLTypeSys::DataTypeTable table;
        TypeLoader loader(table);
        loader.load(description);
        Layout all = loader.layout(description);
        all.knownFacts = knownFacts;
        Layout layout = all;
        if (!options->only.empty()) select(layout, options->only);
        if (options->node) {
            const NodeReader reader(table, loader, onlyStructure(layout).name);
            const std::string& label = layout.structures.front().label;
            const NodeLayout found = reader.node(indexOf(reader, *options->node, label));
            return print(options->asJson ? nodeJson(label, found) : nodeText(label, found, coloursOfOutput()));
        }
        if (options->withPadding && options->format != "c") throw UsageError("--padding: only with --format c");
        if (options->format == "svg") return print(layoutSvg(layout, all));
        if (options->format == "html") return print(layoutPage(titleOf(options->inputs), layout, all));
        if (options->format == "c") {
            orderForC(layout, all, table);
            return print(cHeader(layout, options->withPadding));
        }
        if (options->withNumberings) {
            for (StructureLayout& structure : layout.structures)
                structure.nodes = NodeReader(table, loader, structure.name).nodes();
        }
        if (options->withChecksum) {
            for (StructureLayout& structure : layout.structures)
                structure.checksum = checksumOf(table, structure.name);
        }
        print(options->asJson ? layoutJson(layout) : layoutText(layout, !options->only.empty(), coloursOfOutput()));
    });
}

} // namespace inspector
