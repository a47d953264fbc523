// The constraint store as its rules are written down, step by step and without a thought for cost: what the real one is
// held against.
#pragma once

#include <functional>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "qltypes/dimensions/QLSymbolicDimsConstraints.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

namespace dimensionstest {

class LiteralConstraints {
  public:
    /// What a statement raises: the leaf of the message and its arguments.
    struct Refusal {
        std::string leaf;
        std::vector<std::string> arguments;
    };

    explicit LiteralConstraints(QLTypeSys::SymbolicDimsTable& of) : table(of) {}

    void addEqual(int a, int b, const QLBlock* block);
    void addEqualValue(int a, int value, const QLBlock* block);
    void addGreaterThan(int a, int b, const QLBlock* block);
    void addGreaterThanValue(int a, int value, const QLBlock* block);
    void addLessThanValue(int a, int value, const QLBlock* block);
    void addRange(int a, int min, int max, const QLBlock* block, unsigned flags);

    bool isEqual(int a, int b);
    bool isGreaterThan(int a, int b);
    QLTypeSys::SymbDimsRange getRange(int a);

    using Facts = std::vector<QLTypeSys::SymbolicDimsConstraint>;
    using Pairs = std::vector<QLTypeSys::SymbolicDimsCGConstraint>;

    /// The four groups, each with its keys ascending. Without upper bounds when `lowerBoundsOnly`.
    std::vector<Facts> facts(bool lowerBoundsOnly);
    std::vector<int> statedBy(const std::function<bool(const QLBlock*)>& isMeant);
    Pairs equivalent();
    Pairs greaterThan();
    Pairs lessThan();

  private:
    template <class T> using Sets = std::map<int, std::set<T>>;

    int size(int id) { return QLTypeSys::SymbolicDims(&table, id).getSize().getId(); }
    std::string text(int id) { return QLTypeSys::SymbolicDims(&table, id).toString(); }
    bool isInt(int id) { return table.getValueOf(id).first; }
    int valueOf(int id) { return table.getValueOf(id).second; }
    int idOfValue(long value) { return QLTypeSys::SymbolicDimsQLSizeValue(table, value).getId(); }
    int expr(QL::SymbolicOp op, int a, int b);
    int findRootKey(int id);
    void link(int a, int b, const QLBlock* block);
    void narrowRange(int a, QLTypeSys::SymbDimsRange& range);
    std::vector<const QLBlock*> blocksOf(const Sets<const QLBlock*>& blocks, int key);
    void sortAndRewrite(Pairs& pairs);

    QLTypeSys::SymbolicDimsTable& table;
    Sets<int> equalChildren;
    std::map<int, int> equalParents;
    Sets<const QLBlock*> equalBlocks;
    Sets<int> greaterThanEdges;
    Sets<const QLBlock*> greaterThanBlocks;
    std::map<int, QLTypeSys::SymbDimsRange> ranges;
    Sets<const QLBlock*> rangeBlocks;
    std::map<const QLBlock*, std::set<int>> blockConstraints;
};

} // namespace dimensionstest
