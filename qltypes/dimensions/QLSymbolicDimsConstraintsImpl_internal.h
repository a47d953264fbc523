// The state behind SymbolicDimsConstraints.
//
// A size is the id of the product of an id's dimensions; everything here is filed under sizes. The maps up to
// blockConstraints_ are the record of what was stated, and every answer follows from them alone. What stands behind
// numGreaterThan_ is derived from them, to answer quickly.
//
// Statements: the sources QLSymbolicDimsConstraints.cpp, listings: QLSymbolicDimsConstraints_lists.cpp. A statement
// first does all that can fail, and then changes the maps without failing.
#pragma once

#include <set>
#include <string>
#include <unordered_map>
#include <vector>

#include "qltypes/dimensions/DimsClasses_internal.h"
#include "qltypes/dimensions/GreaterThanGraph_internal.h"
#include "qltypes/dimensions/QLSymbolicDimsConstraints.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

namespace QLTypeSys {

class SymbolicDimsConstraints::Impl {
  public:
    explicit Impl(SymbolicDimsTable* table);

    void addEqual(int a, int b, const QLBlock* block);
    void addEqualValue(int a, int value, const QLBlock* block);
    void addGreaterThan(int a, int b, const QLBlock* block);
    void addGreaterThanValue(int a, int value, const QLBlock* block);
    void addLessThanValue(int a, int value, const QLBlock* block);
    void addRange(int a, int min, int max, const QLBlock* block, GenerateCodeFlags flags);

    bool isEqual(int a, int b) const;
    bool isGreaterThan(int a, int b) const;
    SymbDimsRange getRange(int a) const;

    void getSymbolicDimsConstraints(std::vector<SymbolicDimsConstraint>& list) const;
    void getSymbolicDimsConstraints(std::vector<int>& ids) const;
    void getSymbolicDimsConstraints(const QLBlock* block, std::vector<int>& ids) const;
    void getSymbolicDimsConstraints(const QLBlock* block, const boost::function<const QLBlock*(const QLBlock*)>& mapper,
                                    std::vector<int>& ids) const;
    void getEquivalentSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const;
    void getGreaterThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const;
    void getLessThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const;

    SymbolicDimsTable& table() const { return *table_; }

  private:
    using Ids = std::unordered_map<int, std::set<int>>;
    using Blocks = std::unordered_map<int, std::set<const QLBlock*>>;
    using BlockIds = std::unordered_map<const QLBlock*, std::set<int>>;

    int sizeOf(int id) const { return table_->getSymbolicDims(id).getSize().getId(); }
    int findRootKey(int id) const { return classes_.rootOf(sizeOf(id)); }
    std::string textOf(int id) const { return table_->getSymbolicDims(id).toString(); }
    int valueId(long value) const { return SymbolicDimsQLSizeValue(*table_, value).getId(); }
    int createEqualExpr(int a, int b) const;
    int createGreaterThanExpr(int a, int b) const;
    int createLessThanExpr(int a, int b) const;

    bool isSizeEqual(int a, int b) const;
    bool isSizeGreaterThan(int a, int b) const;
    SymbDimsRange heldRangeOf(int size) const;
    SymbDimsRange rangeOfSize(int size) const;
    void linkSizes(int sa, int sb, const QLBlock* block);
    void checkRange(int root, const SymbDimsRange& held, int min, int max) const;
    GenerateCodeFlags keptFlags(GenerateCodeFlags flags) const;
    void narrow(int root, SymbDimsRange& held, const SymbDimsRange& range) noexcept;

    void addToConstraints(std::vector<SymbolicDimsConstraint>& list, std::size_t index, int key, int exprId,
                          const Blocks& blocks) const;
    void createConstraintsList(const Ids& map, const Blocks& blocks, std::vector<SymbolicDimsCGConstraint>& list) const;
    void sortAndRewrite(std::vector<SymbolicDimsCGConstraint>& list) const;
    void eliminateDivisions(std::vector<SymbolicDimsCGConstraint>& list) const;

    Ids equalChildren_;
    DimsClasses::Parents equalParents_;
    Blocks equalBlocks_;
    Ids greaterThanEdges_;
    Blocks greaterThanBlocks_;
    DimsClasses::Ranges ranges_;
    Blocks rangeBlocks_;
    BlockIds blockConstraints_;
    SymbolicDimsTable* const table_;
    QL::SymbolicExprTable* const exprTable_;
    std::size_t numEqual_ = 0;
    std::size_t numGreaterThan_ = 0;

    DimsClasses classes_{equalParents_, ranges_};
    GreaterThanGraph graph_{classes_};
};

} // namespace QLTypeSys
