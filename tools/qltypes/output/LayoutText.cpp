#include "output/LayoutText.h"

#include <algorithm>
#include <array>

#include <fmt/format.h>
#include <fmt/ranges.h>

#include "output/ElementText.h"

namespace inspector {
namespace {

std::string number(std::int64_t value) { return std::to_string(value); }
std::string number(const std::optional<std::int64_t>& value) { return value ? std::to_string(*value) : ""; }

std::string rawText(const NodeLayout& node) {
    if (!node.raw) return "";
    const auto [first, last] = *node.raw;
    return first == last ? number(first) : fmt::format("{}-{}", first, last);
}

std::string nodesText(const StructureLayout& structure, const Colours& colours) {
    TextTable table({{"depth-first", Align::Right},
                     {"flat", Align::Right},
                     {"raw", Align::Right},
                     {"immediate", Align::Right},
                     {"offset", Align::Right},
                     {"path", Align::Left}});
    for (const NodeLayout& node : structure.nodes) {
        table.addRow({number(node.depthFirst), number(node.flat), rawText(node), number(node.immediate),
                      number(node.offset), node.path.empty() ? "(the structure)" : node.path});
    }
    return table.text("  ", colours) + "\n";
}

std::string structureText(const StructureLayout& structure, const Colours& colours) {
    TextTable table({{"offset", Align::Right},
                     {"size", Align::Right},
                     {"element", Align::Left},
                     {"type", Align::Left},
                     {"notes", Align::Left}});
    for (const ElementLayout& element : structure.elements) {
        table.addRow({number(element.offset), number(element.size), nameWithDimensions(element),
                      typeText(element.isComplex, element.typeLabel), notesOf(element)});
        if (element.padding == 0) continue;
        const bool isLast = &element == &structure.elements.back();
        table.addRow({number(element.offset + element.size), number(element.padding), "(padding)", "",
                      isLast ? "size rounded up to a multiple of 8" : ""},
                     true);
    }
    const std::string padding = structure.padding == 0 ? "no" : number(structure.padding) + " of them";
    return fmt::format("{}\n{}  {} bytes, {} padding; elements: {} immediate, {} flat, {} raw, {} depth-first\n\n",
                       colours.bold(structure.label), table.text("  ", colours), structure.size, padding,
                       structure.elements.size(), structure.numFlatElements, structure.numRawElements,
                       structure.numDFSElements);
}

std::string checksumText(const StructureLayout& structure, const Colours& colours) {
    TextTable table({{"element", Align::Left}, {"enters the checksum as", Align::Left}});
    for (std::size_t i = 0; i < structure.elements.size(); ++i)
        table.addRow({structure.elements[i].name, structure.checksum->descriptions[i]});
    return fmt::format("{}  checksum {}\n\n", table.text("  ", colours), structure.checksum->digest);
}

std::string kindText(const OtherType& type) {
    if (!type.target.empty()) return "alias of " + type.target;
    if (type.members.empty()) return type.kind;
    std::vector<std::string> members;
    for (const EnumerationMember& member : type.members)
        members.push_back(fmt::format("{} {}", member.name, member.value));
    return fmt::format("{} of {}: {}", type.kind, type.storage, fmt::join(members, ", "));
}

std::string otherTypesText(const std::vector<OtherType>& types, const Colours& colours) {
    TextTable table({{"type", Align::Left}, {"size", Align::Right}, {"kind", Align::Left}});
    for (const OtherType& type : types)
        table.addRow({type.name, number(type.size), kindText(type)});
    return fmt::format("{}\n{}\n", colours.bold("Types that are no structures"), table.text("  ", colours));
}

std::string factsText(const KnownFacts& known, const Colours& colours) {
    TextTable table({{"fact", Align::Left}, {"stated by", Align::Left}});
    for (const KnownFacts::Fact& fact : known.facts)
        table.addRow({fact.expression, fmt::format("{}", fmt::join(fact.blocks, ", "))});
    return fmt::format("{}\n{}\n", colours.bold("Known of dimensions: " + known.source), table.text("  ", colours));
}

std::string refusalsText(const std::vector<Refusal>& refusals, const Colours& colours) {
    TextTable table({{"message", Align::Left}, {"why", Align::Left}});
    for (const Refusal& refusal : refusals)
        table.addRow({refusal.label, refusal.reason});
    return fmt::format("{}\n{}\n", colours.bold("Messages that cannot be expressed"), table.text("  ", colours));
}

std::string summaryText(const Layout& layout) {
    if (layout.numMessages == 0) {
        const std::size_t count = layout.structures.size();
        return fmt::format("{} structure{} laid out\n", count, count == 1 ? "" : "s");
    }
    std::string text = fmt::format("{} messages read, {} laid out, {} refused", layout.numMessages,
                                   layout.numMessages - layout.refusals.size(), layout.refusals.size());
    // clang-format off
    constexpr std::array<std::pair<RefusalKind, const char*>, 2> kinds = {{
        {RefusalKind::NoFields,    "without fields"},
        {RefusalKind::UsesRefused, "containing a refused one"},
    }};
    // clang-format on
    std::vector<std::string> counts;
    for (const auto& [kind, what] : kinds) {
        const auto isOfKind = [kind = kind](const Refusal& refusal) { return refusal.kind == kind; };
        const auto count = std::count_if(layout.refusals.begin(), layout.refusals.end(), isOfKind);
        if (count > 0) counts.push_back(fmt::format("{} {}", count, what));
    }
    if (!counts.empty()) text += fmt::format(": {}", fmt::join(counts, ", "));
    return text + "\n";
}

} // namespace

std::string layoutText(const Layout& layout, bool isSelection, const Colours& colours) {
    std::string text;
    if (!isSelection && !layout.otherTypes.empty()) text += otherTypesText(layout.otherTypes, colours);
    for (const StructureLayout& structure : layout.structures) {
        text += structureText(structure, colours);
        if (!structure.nodes.empty()) text += nodesText(structure, colours);
        if (structure.checksum) text += checksumText(structure, colours);
    }
    for (const KnownFacts& known : layout.knownFacts)
        text += factsText(known, colours);
    if (!isSelection && !layout.refusals.empty()) text += refusalsText(layout.refusals, colours);
    return text + summaryText(layout);
}

std::string nodeText(const std::string& structureLabel, const NodeLayout& node, const Colours& colours) {
    TextTable table({{"node", Align::Left}, {node.path.empty() ? "(the structure)" : node.path, Align::Left}});
    const auto addRow = [&](const char* property, const std::string& value) {
        table.addRow({property, value.empty() ? "none" : value});
    };
    addRow("depth-first", number(node.depthFirst));
    addRow("flat", number(node.flat));
    addRow("raw", rawText(node));
    addRow("immediate", number(node.immediate));
    addRow("type", typeText(node.isComplex, node.typeLabel));
    addRow("offset", number(node.offset));
    addRow("width", number(node.width));
    addRow("parent", node.parent ? fmt::format("{}, its element {}", node.parent->first, node.parent->second) : "");
    return colours.bold(structureLabel) + "\n" + table.text("  ", colours);
}

} // namespace inspector
