// The nodes of a structure by the library's four numberings: depth-first, flat, raw and immediate.
//
//   const NodeReader reader(table, loader, "Outer");
//   const NodeLayout node = reader.node(reader.find("y(1).b").value());
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "output/Layout.h"
#include "qltypes/structures/ElementAccess.h"
#include "table/TypeLoader.h"

namespace inspector {

/// Numbers one structure. Takes up to `mostNodes`: each costs a line of output and some memory of the library.
class NodeReader {
  public:
    static constexpr long mostNodes = 1'000'000;

    /// Keeps `table` and `loader`, which loaded the structure of that registered name. Throws std::runtime_error where
    /// the structure has more than `mostNodes` nodes.
    NodeReader(const QLTypeSys::DataTypeTable& table, const TypeLoader& loader, const std::string& structure);

    /// All nodes in depth-first order.
    std::vector<NodeLayout> nodes() const;

    /// Unchecked: the depth-first index must be valid.
    NodeLayout node(long depthFirst) const;

    /// The depth-first index of a node by that index as text or by its full path; nothing where there is no such node.
    std::optional<long> find(const std::string& pathOrIndex) const;

  private:
    const QLTypeSys::DataTypeTable& table_;
    const TypeLoader& loader_;
    QLTypeSys::DFSElementAccess view_;
};

} // namespace inspector
