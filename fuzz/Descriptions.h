// What the two targets of type descriptions share: what a complaint looks like, and loading what was read into a table
// that then answers everything.
#pragma once

#include <algorithm>
#include <map>
#include <string>
#include <variant>

#include "description/Description.h"
#include "description/Resolver.h"
#include "fuzz/Fuzz.h"
#include "qltypes/fixed_point/TypeNames.h"
#include "table/ChecksumReader.h"
#include "table/NodeReader.h"
#include "table/TypeLoader.h"

namespace fuzz {

/// A complaint is one line that begins with the file, or with the folder that all files are in, and says what is wrong.
inline void checkComplaint(const std::string& complaint, const std::string& file) {
    const std::size_t endOfPlace = complaint.find(": ");
    claim(complaint.starts_with(file) && endOfPlace != std::string::npos, "a complaint says where");
    claim(complaint.size() > endOfPlace + 4, "a complaint says what");
    claim(std::all_of(complaint.begin(), complaint.end(), [](unsigned char c) { return c >= ' '; }),
          "a complaint is one line of text");
}

inline bool isNumberTypeName(const std::string& name) { return FXP::isQLTypeNameWithFxpDataTypeProp(name.c_str()); }

/// What loading the description costs: about the bytes of all its structures; 0 where it is inconsistent.
inline double weightOf(const inspector::Description& description) {
    using namespace inspector;
    std::map<std::string, double> weights;
    const auto weightOfType = [&](const std::string& name) {
        const auto known = weights.find(name);
        if (known != weights.end()) return known->second;
        try {
            return std::max(8.0, FXP::getWordLengthFromTypeName(name.c_str()) / 8.0);
        } catch (const std::exception&) { // the loader will say so
            return 8.0;
        }
    };
    double total = 0;
    try {
        for (const std::size_t index : registrationOrder(description, isNumberTypeName)) {
            const TypeDescription& type = description.types[index];
            double weight = 256;
            if (const auto* client = std::get_if<ClientTypeDescription>(&type.kind)) weight = client->size;
            if (const auto* alias = std::get_if<AliasDescription>(&type.kind))
                weight = weightOfType(alias->target.name);
            if (const auto* structure = std::get_if<StructureDescription>(&type.kind)) {
                for (const ElementDescription& element : structure->elements) {
                    double width = 2;
                    for (const std::int64_t dimension : element.dimensions)
                        width *= static_cast<double>(dimension);
                    weight += width * weightOfType(element.type.name);
                }
            }
            weights[type.name] = weight;
            total += weight;
        }
    } catch (const InputError&) {
        return 0;
    }
    return total;
}

/// Every identifier has a name that leads back to it.
inline void checkTable(const QLTypeSys::DataTypeTable& table) {
    for (int id = DATA_TYPE_ID_AUTO; table.isDataTypeIdValid(id); ++id) {
        const char* const name = table.getDataTypeAt(static_cast<unsigned long>(id + 1))->getName();
        claim(table.getDataTypeId(name) == id, "a name leads to its identifier");
    }
}

/// Elements lie one behind the other, with their padding, from the beginning to the end.
inline void checkElements(const inspector::StructureLayout& structure) {
    std::int64_t end = 0;
    std::int64_t padding = 0;
    for (std::size_t i = 0; i < structure.elements.size(); ++i) {
        const inspector::ElementLayout& element = structure.elements[i];
        const bool isLast = i + 1 == structure.elements.size();
        claim(element.offset >= end, "an element begins behind the one before it");
        claim(element.move.has_value() == (element.offset != end), "an element that moved says why");
        claim(element.size > 0 || element.typeName == "fcn_call", "an element has a size");
        claim(element.padding >= 0, "padding is not negative");
        end = element.offset + element.size;
        padding += element.padding;
        claim(end + element.padding == (isLast ? structure.size : structure.elements[i + 1].offset),
              "padding reaches to what follows");
    }
    claim(padding == structure.padding && structure.size % 8 == 0, "sizes are whole");
}

/// The four numberings count through. `isRegular`: no nested structure says complex, which is counted twice.
inline void checkNodes(const inspector::StructureLayout& structure, const inspector::NodeReader& reader,
                       bool isRegular) {
    std::int64_t numFlat = 0, numRaw = 0, numImmediate = 0;
    const std::vector<inspector::NodeLayout> nodes = reader.nodes();
    claim(static_cast<std::int64_t>(nodes.size()) == structure.numDFSElements, "all nodes are there");
    if (!isRegular) return;
    for (const inspector::NodeLayout& node : nodes) {
        claim(node.offset >= 0 && node.offset <= structure.size, "a node lies in the structure");
        if (node.flat) claim(*node.flat == numFlat++, "leaves are numbered through");
        if (node.raw) {
            claim(node.raw->first == numRaw && node.raw->second >= numRaw, "values are numbered through");
            numRaw = node.raw->second + 1;
        }
        if (node.immediate) claim(*node.immediate == numImmediate++, "children are numbered through");
    }
    claim(numFlat == structure.numFlatElements && numRaw == structure.numRawElements, "the counts are those numbers");
    claim(numImmediate == static_cast<std::int64_t>(structure.elements.size()), "every element is a node");
    const inspector::NodeLayout& last = nodes.back();
    claim(reader.find(last.path) == last.depthFirst, "a path leads to its node");
}

/// Loads a description: a complaint that begins with `file`, or a table that answers. Descriptions that would cost much
/// memory are left alone.
inline void checkLoading(const inspector::Description& description, const std::string& file) {
    constexpr double heaviest = 1 << 20;
    constexpr std::int64_t mostNodes = 1000;
    if (weightOf(description) > heaviest) return;
    QLTypeSys::DataTypeTable table;
    inspector::TypeLoader loader(table);
    try {
        loader.load(description);
    } catch (const inspector::InputError& e) {
        checkComplaint(e.what(), file);
        return checkTable(table);
    }
    checkTable(table);
    const inspector::Layout layout = loader.layout(description);
    claim(layout.structures.size() + layout.otherTypes.size() >= description.types.size(), "every type is laid out");
    bool isRegular = true;
    for (const inspector::StructureLayout& structure : layout.structures) {
        for (const inspector::ElementLayout& element : structure.elements)
            isRegular &= !element.isComplex || element.typeKind != inspector::TypeKind::Structure;
    }
    for (const inspector::StructureLayout& structure : layout.structures) {
        checkElements(structure);
        if (structure.numDFSElements <= mostNodes)
            checkNodes(structure, inspector::NodeReader(table, loader, structure.name), isRegular);
        const inspector::ChecksumLayout checksum = inspector::checksumOf(table, structure.name);
        claim(checksum.descriptions.size() == structure.elements.size() && checksum.digest.size() == 32,
              "a structure has a checksum");
    }
    table.resetToBuiltin();
    claim(table.getNumDataTypes() == 15, "nothing is left of what was loaded");
}

} // namespace fuzz
