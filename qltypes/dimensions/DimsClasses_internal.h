// The classes of equal sizes: the links from a size to a smaller id, and the root that they lead to.
#pragma once

#include <unordered_map>

#include <boost/unordered/unordered_flat_map.hpp>

#include "qltypes/dimensions/SymbDimsRange.h"

namespace QLTypeSys {

/// Reads links and ranges that it does not own.
class DimsClasses {
  public:
    using Parents = boost::unordered_flat_map<int, int>;
    using Ranges = std::unordered_map<int, SymbDimsRange>;

    DimsClasses(const Parents& parents, const Ranges& ranges) : parents_(parents), ranges_(ranges) {}

    /// The end of the links from `size`, each of which leads to a smaller id. The root of a size without links is
    /// itself.
    int rootOf(int size) const;

    /// The lower bound filed under a root.
    int lowestOf(int root) const {
        const auto found = ranges_.find(root);
        return found == ranges_.end() ? SymbDimsRange().min : found->second.min;
    }

    /// To be told when links changed so that two sizes with one root no longer have one.
    void split() noexcept { ++generation_; }

  private:
    // A smaller id with the same root, as long as no class was split since. It spares the links between.
    struct Shortcut {
        int to;
        unsigned long generation;
    };
    int nextOf(int size) const;

    const Parents& parents_;
    const Ranges& ranges_;
    mutable boost::unordered_flat_map<int, Shortcut> shortcuts_;
    unsigned long generation_ = 0;
};

} // namespace QLTypeSys
