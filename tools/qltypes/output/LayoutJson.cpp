#include "output/LayoutJson.h"

#include <cmath>

#include <nlohmann/json.hpp>

namespace inspector {
namespace {

using Json = nlohmann::ordered_json;

const char* keyOf(RefusalKind kind) { return kind == RefusalKind::NoFields ? "no-fields" : "uses-refused"; }

Json bound(double value) { return std::isfinite(value) ? Json(value) : Json(nullptr); }

Json elementJson(const ElementLayout& element) {
    Json json = {
        {"name", element.name},
        {"type", element.typeName},
        {"dimensions", element.dimensions},
        {"complex", element.isComplex},
        {"sampling", element.isFrameBased ? "frame" : "sample"},
        {"dimensionsMode", element.hasVariableDimensions ? "variable" : "fixed"},
        {"min", bound(element.min)},
        {"max", bound(element.max)},
        {"unit", element.unit.empty() ? Json(nullptr) : Json(element.unit)},
        {"offset", element.offset},
        {"size", element.size},
        {"padding", element.padding},
        {"moved", nullptr},
    };
    if (element.move) {
        json["moved"] = {
            {"from", element.move->from}, {"alignment", element.move->alignment}, {"reason", element.move->reason}};
    }
    return json;
}

template <class Item, class Convert> Json arrayOf(const std::vector<Item>& items, Convert convert) {
    Json json = Json::array();
    for (const Item& item : items)
        json.push_back(convert(item));
    return json;
}

Json orNull(const std::optional<std::int64_t>& number) { return number ? Json(*number) : Json(nullptr); }

Json toJson(const NodeLayout& node) {
    Json json = {
        {"path", node.path},
        {"depthFirst", node.depthFirst},
        {"flat", orNull(node.flat)},
        {"raw", nullptr},
        {"immediate", orNull(node.immediate)},
        {"type", node.typeName},
        {"complex", node.isComplex},
        {"offset", node.offset},
        {"width", node.width},
        {"parent", nullptr},
    };
    if (node.raw) json["raw"] = {{"first", node.raw->first}, {"last", node.raw->second}};
    if (node.parent) json["parent"] = {{"structure", node.parent->first}, {"element", node.parent->second}};
    return json;
}

Json structureJson(const StructureLayout& structure) {
    Json json = {
        {"name", structure.name},
        {"label", structure.label},
        {"size", structure.size},
        {"padding", structure.padding},
        {"numElements", structure.elements.size()},
        {"numFlatElements", structure.numFlatElements},
        {"numRawElements", structure.numRawElements},
        {"numDFSElements", structure.numDFSElements},
        {"elements", arrayOf(structure.elements, elementJson)},
    };
    if (!structure.nodes.empty()) json["nodes"] = arrayOf(structure.nodes, toJson);
    if (structure.checksum)
        json["checksum"] = {{"descriptions", structure.checksum->descriptions}, {"digest", structure.checksum->digest}};
    return json;
}

Json otherTypeJson(const OtherType& type) {
    const Json target = type.target.empty() ? Json(nullptr) : Json(type.target);
    Json json = {{"name", type.name}, {"kind", type.kind},  {"aliasOf", target},
                 {"size", type.size}, {"storage", nullptr}, {"members", nullptr}};
    if (!type.members.empty()) {
        json["storage"] = type.storage;
        json["members"] = arrayOf(type.members, [](const EnumerationMember& member) {
            return Json{{"name", member.name}, {"value", member.value}};
        });
    }
    return json;
}

Json refusalJson(const Refusal& refusal) {
    return {{"name", refusal.label},
            {"kind", keyOf(refusal.kind)},
            {"reason", refusal.reason},
            {"place", toText(refusal.place)}};
}

Json factsJson(const KnownFacts& known) {
    return {{"source", known.source}, {"facts", arrayOf(known.facts, [](const KnownFacts::Fact& fact) {
                                           return Json{{"expression", fact.expression}, {"blocks", fact.blocks}};
                                       })}};
}

} // namespace

std::string layoutJson(const Layout& layout) {
    Json json = {
        {"types", arrayOf(layout.otherTypes, otherTypeJson)},
        {"structures", arrayOf(layout.structures, structureJson)},
        {"refused", arrayOf(layout.refusals, refusalJson)},
        {"summary",
         {{"numMessages", layout.numMessages},
          {"numStructures", layout.structures.size()},
          {"numRefused", layout.refusals.size()}}},
    };
    if (!layout.knownFacts.empty()) json["dimensions"] = arrayOf(layout.knownFacts, factsJson);
    return json.dump(2) + "\n";
}

std::string nodeJson(const std::string& structureLabel, const NodeLayout& node) {
    const Json json = {{"structure", structureLabel}, {"node", toJson(node)}};
    return json.dump(2) + "\n";
}

} // namespace inspector
