#include "table/NodeReader.h"

#include <charconv>
#include <stdexcept>

#include <fmt/format.h>

#include "qltypes/types/DataTypeTableUtils.h"

namespace inspector {
namespace {

std::optional<long> numberIn(const std::string& text) {
    long number = 0;
    const char* const end = text.data() + text.size();
    const auto [after, error] = std::from_chars(text.data(), end, number);
    return error == std::errc() && after == end ? std::optional(number) : std::nullopt;
}

} // namespace

NodeReader::NodeReader(const QLTypeSys::DataTypeTable& table, const TypeLoader& loader, const std::string& structure)
    : table_(table), loader_(loader), view_(&table, table.getDataTypeId(structure.c_str())) {
    const long numNodes = view_.getNumElements();
    if (numNodes > mostNodes) {
        throw std::runtime_error(fmt::format("qltypes: {} has {} nodes, more than the {} that are numbered",
                                             loader.labelOf(structure), numNodes, mostNodes));
    }
}

NodeLayout NodeReader::node(long depthFirst) const {
    QLTypeSys::StructElementAccess::Path path;
    view_.getFullPath(depthFirst, false, path);
    int parentId = DATA_TYPE_ID_INVALID;
    long indexInParent = -1;
    view_.getImmediateParentDTypeIdAndOffset(depthFirst, parentId, indexInParent);
    const long flat = view_.getFlatElementIdx(depthFirst);

    NodeLayout node;
    node.path = QLTypeSys::StructElementAccess::convertFullPathToString(path, "");
    node.depthFirst = depthFirst;
    if (flat != -1) {
        const long first = view_.getRawElementIdx(depthFirst);
        node.flat = flat;
        node.raw = {first, first + view_.getComplexWidth(depthFirst) - 1};
    }
    if (path.size() == 1 && path.front().second == -1) node.immediate = indexInParent;
    node.typeName = DtGetDataTypeName(&table_, view_.getDataTypeId(depthFirst));
    node.typeLabel = loader_.labelOf(node.typeName);
    node.isComplex = view_.getSignalType(depthFirst) == 1;
    node.offset = view_.getOffset(depthFirst);
    node.width = view_.getWidth(depthFirst);
    if (parentId != DATA_TYPE_ID_INVALID)
        node.parent = {loader_.labelOf(DtGetDataTypeName(&table_, parentId)), indexInParent};
    return node;
}

std::vector<NodeLayout> NodeReader::nodes() const {
    std::vector<NodeLayout> nodes;
    for (long i = 0; i < view_.getNumElements(); ++i)
        nodes.push_back(node(i));
    return nodes;
}

std::optional<long> NodeReader::find(const std::string& pathOrIndex) const {
    const long numNodes = view_.getNumElements();
    if (const std::optional<long> index = numberIn(pathOrIndex))
        return *index >= 0 && *index < numNodes ? index : std::nullopt;
    for (long i = 1; i < numNodes; ++i) { // the root has no path
        QLTypeSys::StructElementAccess::Path path;
        view_.getFullPath(i, false, path);
        if (QLTypeSys::StructElementAccess::convertFullPathToString(path, "") == pathOrIndex) return i;
    }
    return std::nullopt;
}

} // namespace inspector
