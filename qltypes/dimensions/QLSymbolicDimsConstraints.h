// What is known about the symbolic dimensions of one table: which are equal, which is greater than which, and between
// which bounds each lies, with the blocks that stated it.
//
//   QLTypeSys::SymbolicDimsConstraints& known = ...; // a table owns one and forwards to it
//   known.addGreaterThan(k, l, block);               // raises when that contradicts what is known
//   known.addGreaterThan(l, m, block);
//   known.isGreaterThan(k, m);                       // true
//
// Every operation takes symbolic ids and works on their sizes: the product of the dimensions of a list, anything else
// as it is. Unchecked: ids must be valid in the table. It is no solver: false means not known. What is proved, what is
// refused and what stays unknown is told in docs/guide/symbolic-dimensions.md.
#pragma once

#include <memory>
#include <vector>

#include <boost/function.hpp>

#include "qlplatform/Export.h"
#include "qltypes/dimensions/SymbDimsRange.h"

class QLBlock;

namespace QLTypeSys {

class SymbolicDimsTable;

/// A fact as an expression, with the blocks that stated it.
struct SymbolicDimsConstraint {
    int id = 0; ///< symbolic id of the constraint expression
    /// Blocks that stated it; not owned.
    std::vector<const QLBlock*> blocks;
};

/// A fact as a pair, for the code generator; the relation is that of the list which holds the record.
struct SymbolicDimsCGConstraint {
    int first = 0;  ///< symbolic id of the left side
    int second = 0; ///< symbolic id of the right side
    /// Blocks that stated it; not owned.
    std::vector<const QLBlock*> blocks;
};

/// The facts of one table. They only grow: nothing is taken back, and bounds only narrow.
///
/// A fact is stated by a block, which is kept with it; null is nobody. A fact that contradicts what is known is refused
/// and leaves what was known before it as it was. What does not fit in memory throws std::bad_alloc, and then too the
/// fact is not stated and everything known before stays.
class QL_EXPORT SymbolicDimsConstraints {
  public:
    /// The table is not owned and must outlive the facts; its expression table must exist.
    explicit SymbolicDimsConstraints(SymbolicDimsTable* table);
    ~SymbolicDimsConstraints();
    SymbolicDimsConstraints(const SymbolicDimsConstraints&) = delete;
    SymbolicDimsConstraints& operator=(const SymbolicDimsConstraints&) = delete;

    // Stating facts.

    /// The shapes are equal, dimensions of 1 in front and at the end aside: dimension by dimension when they have as
    /// many, and their sizes when `a` has several. So nothing is stated when `a` has one dimension and `b` several, and
    /// only the sizes the other way round. Dimensions that were linked before one is refused stay linked.
    /// Raises `InvalidSymbolicDimensionNotEqual` for two different numbers, `InconsistentSymbolicDimensionNotEqual`
    /// when one is known to be greater, and what addEqualValue raises.
    void addEqual(int a, int b, const QLBlock* block) const;
    /// The size is the number. Raises as addRange.
    void addEqualValue(int a, int value, const QLBlock* block) const;
    /// The size of `a` exceeds that of `b`. A size that is to exceed itself is ignored.
    /// Raises `InvalidSymbolicDimensionGreaterThan` for two numbers, `InconsistentSymbolicDimensionEqual` when they are
    /// known to be equal, `InconsistentSymbolicDimensionGreaterThan` when `b` is known to be greater, and for one
    /// number what the next two raise.
    void addGreaterThan(int a, int b, const QLBlock* block) const;
    /// The size exceeds the number. Raises `InconsistentSymbolicDimensionGreaterThan` when the number is at or above
    /// the upper bound.
    void addGreaterThanValue(int a, int value, const QLBlock* block);
    /// The size is below the number. Raises `InconsistentSymbolicDimensionLessThan` when the number is at or below the
    /// lower bound.
    void addLessThanValue(int a, int value, const QLBlock* block);
    /// The size lies between the bounds, both inclusive. The flags replace those stated before; the upper bound is left
    /// out of generated code whatever they say while the feature flag SymbolicDimsMaxConstraintInCode is not above 0.
    /// Raises `InconsistentSymbolicDimensionLessThan` when `max` is below the lower bound, otherwise
    /// `InconsistentSymbolicDimensionGreaterThan` when `min` is above the upper bound.
    void addRange(int a, int min, int max, const QLBlock* block, GenerateCodeFlags flags);

    // Asking.

    /// Whether the sizes are known to be equal.
    bool isEqual(int a, int b) const;
    /// Whether the size of `a` is known to exceed that of `b`.
    bool isGreaterThan(int a, int b) const;
    /// The bounds of the size; its lower bound is at least that of everything that it is known to exceed.
    SymbDimsRange getRange(int a) const;

    // Listing. Every operation empties its output first, and may add expressions to the table. Blocks come in the order
    // of their addresses.

    /// All facts: equalities, values, greater-thans, bounds. A lower bound at or below SymbDimsRange::defaultMin() is
    /// left out.
    void getSymbolicDimsConstraints(std::vector<SymbolicDimsConstraint>& list) const;
    /// The ids of the same without the upper bounds.
    void getSymbolicDimsConstraints(std::vector<int>& ids) const;
    /// The ids of what a block stated, ascending, without what it stated by addRange.
    void getSymbolicDimsConstraints(const QLBlock* block, std::vector<int>& ids) const;
    /// The ids of what all blocks stated that `mapper` maps to `block`, ascending, each once. An empty mapper throws
    /// boost::bad_function_call as soon as any block stated anything.
    void getSymbolicDimsConstraints(const QLBlock* block, const boost::function<const QLBlock*(const QLBlock*)>& mapper,
                                    std::vector<int>& ids) const;

    /// For the code generator: pairs of equal sizes, of a greater and a smaller one, of a smaller and a greater one.
    /// The flags of a range leave its lower bound out of the second list and its upper bound out of the third. Pairs
    /// are sorted, and then multiplied by the denominators of their sides, so that no side is a division at its top.
    void getEquivalentSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const;
    void getGreaterThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const;
    void getLessThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const;

    class [[gnu::visibility("hidden")]] Impl;

  private:
    const std::unique_ptr<Impl> impl_;
};

} // namespace QLTypeSys
