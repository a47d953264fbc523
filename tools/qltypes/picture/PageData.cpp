#include "picture/PageData.h"

#include <cmath>
#include <map>

#include <fmt/format.h>

#include "output/ElementText.h"
#include "picture/KindStyle.h"

namespace inspector {
namespace {

using Json = nlohmann::ordered_json;

class Writer {
  public:
    explicit Writer(const Layout& all) : all_(all) {
        for (std::size_t i = 0; i < all.structures.size(); ++i)
            structures_.emplace(all.structures[i].name, i);
        for (const StructureLayout& structure : all.structures) {
            const std::size_t index = addType(structure.name, structure.label, TypeKind::Structure, structure.size);
            types_[index]["kind"] = "structure";
            types_[index]["structure"] = structures_.at(structure.name);
        }
        for (const OtherType& type : all.otherTypes)
            addOther(type);
    }

    Json structures() {
        Json json = Json::array();
        for (const StructureLayout& structure : all_.structures)
            json.push_back(structureJson(structure));
        return json;
    }

    std::size_t indexOf(const StructureLayout& structure) const { return structures_.at(structure.name); }

    /// Types that elements are of as well, after all structures were written.
    Json types() { return std::move(types_); }

  private:
    std::size_t addType(const std::string& name, const std::string& label, TypeKind kind, std::int64_t size) {
        const auto [at, isNew] = typeIndices_.emplace(name, types_.size());
        if (isNew) {
            const KindStyle& style = styleOf(kind);
            types_.push_back({{"label", label},
                              {"kind", style.name},
                              {"style", style.style},
                              {"styleName", style.name},
                              {"size", size}});
        }
        return at->second;
    }

    // A type of the description.
    void addOther(const OtherType& type) {
        Json& json = types_[addType(type.name, type.name, type.typeKind, type.size)];
        json["isDescribed"] = true;
        json["kind"] = type.target.empty() ? type.kind : "alias of " + type.target;
        if (!type.target.empty()) json["target"] = type.target;
        if (type.members.empty()) return;
        json["storage"] = type.storage;
        json["members"] = Json::array();
        for (const EnumerationMember& member : type.members)
            json["members"].push_back({{"name", member.name}, {"value", member.value}});
    }

    std::size_t typeOf(const ElementLayout& element) {
        const std::int64_t valueSize = element.size / numValues(element) / (element.isComplex ? 2 : 1);
        const std::size_t index = addType(element.typeName, element.typeLabel, element.typeKind, valueSize);
        if (element.typeKind == TypeKind::Structure) types_[index]["structure"] = structures_.at(element.cType.name);
        return index;
    }

    // Numbers of an element are those of its first node, leaf and value in the structure.
    Json structureJson(const StructureLayout& structure) {
        std::int64_t depthFirst = 1;
        std::int64_t flat = 0;
        std::int64_t raw = 0;
        Json elements = Json::array();
        for (const ElementLayout& element : structure.elements) {
            Json json = elementJson(element);
            json["depthFirst"] = depthFirst;
            json["flat"] = flat;
            json["raw"] = raw;
            elements.push_back(std::move(json));
            const std::int64_t width = numValues(element);
            if (element.typeKind == TypeKind::Structure) {
                const StructureLayout& nested = all_.structures[structures_.at(element.cType.name)];
                depthFirst += width * nested.numDFSElements + (width > 1 ? 1 : 0);
                flat += width * nested.numFlatElements;
                raw += width * nested.numRawElements;
            } else {
                depthFirst += 1;
                flat += 1;
                raw += width * (element.isComplex ? 2 : 1);
            }
        }
        return {{"label", structure.label},           {"size", structure.size},
                {"padding", structure.padding},       {"numFlat", structure.numFlatElements},
                {"numRaw", structure.numRawElements}, {"numDepthFirst", structure.numDFSElements},
                {"elements", std::move(elements)}};
    }

    Json elementJson(const ElementLayout& element) {
        Json json = {
            {"name", element.name}, {"type", typeOf(element)}, {"offset", element.offset}, {"size", element.size}};
        if (isArray(element)) json["dimensions"] = element.dimensions;
        if (element.padding > 0) json["padding"] = element.padding;
        if (element.isComplex) json["complex"] = true;
        if (element.isFrameBased) json["isFrameBased"] = true;
        if (element.hasVariableDimensions) json["hasVariableDimensions"] = true;
        if (std::isfinite(element.min)) json["min"] = element.min;
        if (std::isfinite(element.max)) json["max"] = element.max;
        if (!element.unit.empty()) json["unit"] = element.unit;
        if (element.move) json["moved"] = element.move->reason;
        return json;
    }

    const Layout& all_;
    std::map<std::string, std::size_t> structures_;  // by registered name
    std::map<std::string, std::size_t> typeIndices_; // by registered name
    Json types_ = Json::array();
};

std::string summaryOf(const Layout& shown) {
    std::string text = fmt::format("{} structure{}", shown.structures.size(), shown.structures.size() == 1 ? "" : "s");
    if (!shown.otherTypes.empty()) text += fmt::format(", {} other types", shown.otherTypes.size());
    if (!shown.refusals.empty()) text += fmt::format(", {} messages that cannot be expressed", shown.refusals.size());
    return text;
}

Json factsJson(const KnownFacts& known) {
    Json facts = Json::array();
    for (const KnownFacts::Fact& fact : known.facts)
        facts.push_back({{"expression", fact.expression}, {"blocks", fact.blocks}});
    Json nodes = Json::array();
    for (const FactGraph::Node& node : known.graph.nodes)
        nodes.push_back({{"name", node.name}, {"bounds", node.bounds}});
    Json greater = Json::array();
    for (const FactGraph::Greater& fact : known.graph.greater)
        greater.push_back({{"greater", fact.greater}, {"smaller", fact.smaller}, {"blocks", fact.blocks}});
    return {{"source", known.source},
            {"facts", facts},
            {"nodes", nodes},
            {"classes", known.graph.classes},
            {"greater", greater}};
}

} // namespace

nlohmann::ordered_json pageData(const std::string& title, const Layout& shown, const Layout& all) {
    Writer writer(all);
    Json json = {{"title", title}, {"summary", summaryOf(shown)}, {"shown", Json::array()}};
    for (const StructureLayout& structure : shown.structures)
        json["shown"].push_back(writer.indexOf(structure));
    json["structures"] = writer.structures();
    json["types"] = writer.types();
    json["refused"] = Json::array();
    for (const Refusal& refusal : shown.refusals)
        json["refused"].push_back(
            {{"name", refusal.label}, {"reason", refusal.reason}, {"place", toText(refusal.place)}});
    for (const KnownFacts& known : all.knownFacts)
        json["dimensions"].push_back(factsJson(known));
    return json;
}

} // namespace inspector
