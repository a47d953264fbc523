// Records of what is known about symbolic dimensions.
#pragma once

#include <vector>

class QLBlock;

namespace QLTypeSys {

/// A fact as an expression, with the blocks that stated it.
struct SymbolicDimsConstraint {
    int id = 0; ///< symbolic id of the constraint expression
    std::vector<const QLBlock*> blocks;
};

/// A fact as a pair, for the code generator; the relation is that of the list which holds the record.
struct SymbolicDimsCGConstraint {
    int first = 0;  ///< symbolic id of the left side
    int second = 0; ///< symbolic id of the right side
    std::vector<const QLBlock*> blocks;
};

} // namespace QLTypeSys
