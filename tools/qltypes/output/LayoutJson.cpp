#include "output/LayoutJson.h"

#include <cmath>

#include <nlohmann/json.hpp>

namespace inspector {
namespace {

using Json = nlohmann::ordered_json;

const char* keyOf(RefusalKind kind) {
    switch (kind) {
    case RefusalKind::Text:
        return "text";
    case RefusalKind::VariableLength:
        return "variable-length";
    case RefusalKind::NoFields:
        return "no-fields";
    case RefusalKind::UsesRefused:
        break;
    }
    return "uses-refused";
}

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

Json structureJson(const StructureLayout& structure) {
    Json elements = Json::array();
    for (const ElementLayout& element : structure.elements)
        elements.push_back(elementJson(element));
    return {
        {"name", structure.name},
        {"label", structure.label},
        {"size", structure.size},
        {"padding", structure.padding},
        {"numElements", structure.elements.size()},
        {"numFlatElements", structure.numFlatElements},
        {"numRawElements", structure.numRawElements},
        {"numDFSElements", structure.numDFSElements},
        {"elements", std::move(elements)},
    };
}

Json otherTypeJson(const OtherType& type) {
    const Json target = type.target.empty() ? Json(nullptr) : Json(type.target);
    return {{"name", type.name}, {"kind", type.kind}, {"aliasOf", target}, {"size", type.size}};
}

Json refusalJson(const Refusal& refusal) {
    return {{"name", refusal.label},
            {"kind", keyOf(refusal.kind)},
            {"reason", refusal.reason},
            {"place", toText(refusal.place)}};
}

template <class Item, class Convert> Json arrayOf(const std::vector<Item>& items, Convert convert) {
    Json json = Json::array();
    for (const Item& item : items)
        json.push_back(convert(item));
    return json;
}

} // namespace

std::string layoutJson(const Layout& layout) {
    const Json json = {
        {"types", arrayOf(layout.otherTypes, otherTypeJson)},
        {"structures", arrayOf(layout.structures, structureJson)},
        {"refused", arrayOf(layout.refusals, refusalJson)},
        {"summary",
         {{"numMessages", layout.numMessages},
          {"numStructures", layout.structures.size()},
          {"numRefused", layout.refusals.size()}}},
    };
    return json.dump(2) + "\n";
}

} // namespace inspector
