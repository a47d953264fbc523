// What is stated and asked.
#include "qltypes/dimensions/QLSymbolicDimsConstraints.h"

#include <algorithm>
#include <initializer_list>
#include <limits>

#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qltypes/dimensions/ExprIds_internal.h"
#include "qltypes/dimensions/QLSymbolicDimsConstraintsImpl_internal.h"
#include "qltypes/host/Failure_internal.h"
#include "qltypes/host/FeatureFlags_internal.h"

namespace QLTypeSys {
namespace {

constexpr const char* category = "QuillaneTypes:Dimensions";

/// Members of the set of a key: made now, so that putting them in later cannot fail.
template <class Sets> class Staged {
  public:
    using Set = typename Sets::mapped_type;

    Staged() = default;
    Staged(const Staged&) = delete;
    Staged& operator=(const Staged&) = delete;
    ~Staged() {
        if (sets_ && set_->empty()) sets_->erase(key_);
    }

    void stage(Sets& sets, typename Sets::key_type key, std::initializer_list<typename Set::value_type> members) {
        set_ = &sets[key];
        sets_ = &sets;
        key_ = key;
        members_ = members;
    }
    void put() noexcept {
        if (sets_) set_->merge(members_);
    }

  private:
    Sets* sets_ = nullptr;
    typename Sets::key_type key_{};
    Set* set_ = nullptr;
    Set members_;
};

std::string decimal(long value) { return std::to_string(value); }

} // namespace

SymbolicDimsConstraints::Impl::Impl(SymbolicDimsTable* table) : table_(table), exprTable_(&table->getExprTable()) {}

int SymbolicDimsConstraints::Impl::createEqualExpr(int a, int b) const {
    return symbolicIdOf(QL::SymbolicEqualExpr(*exprTable_, exprIdOf(a), exprIdOf(b)).getId(*exprTable_));
}
int SymbolicDimsConstraints::Impl::createGreaterThanExpr(int a, int b) const {
    return symbolicIdOf(QL::SymbolicGreaterThanExpr(*exprTable_, exprIdOf(a), exprIdOf(b)).getId(*exprTable_));
}
int SymbolicDimsConstraints::Impl::createLessThanExpr(int a, int b) const {
    return symbolicIdOf(QL::SymbolicLessThanExpr(*exprTable_, exprIdOf(a), exprIdOf(b)).getId(*exprTable_));
}

// Equality.

void SymbolicDimsConstraints::Impl::addEqual(int a, int b, const QLBlock* block) {
    const int sa = sizeOf(a);
    const int sb = sizeOf(b);
    if (sa == sb) return;
    const auto [isNumberA, valueA] = table_->getValueOf(sa);
    const auto [isNumberB, valueB] = table_->getValueOf(sb);
    if (isNumberA && isNumberB)
        failure::raise(category, "InvalidSymbolicDimensionNotEqual", decimal(valueA), decimal(valueB));
    if (isSizeGreaterThan(sa, sb))
        failure::raise(category, "InconsistentSymbolicDimensionNotEqual", textOf(sa), textOf(sb), textOf(sb));
    if (isSizeGreaterThan(sb, sa))
        failure::raise(category, "InconsistentSymbolicDimensionNotEqual", textOf(sb), textOf(sa), textOf(sa));
    if (isNumberB) return addEqualValue(sa, valueB, block);
    if (isNumberA) return addEqualValue(sb, valueA, block);
    linkSizes(sa, sb, block);
}

// Legend: lo and hi are the two ids, where lo gives way to what it is linked to if that is smaller. Then either hi had
// no link and gets one to lo, or hi's own link, to `parent`, is moved to lo along with hi; or that one stays, because
// it leads no higher than lo.
void SymbolicDimsConstraints::Impl::linkSizes(int sa, int sb, const QLBlock* block) {
    Staged<BlockIds> statedByBlock;
    Staged<Blocks> blocksOfLo, blocksOfHi;
    Staged<Ids> children;
    if (block) statedByBlock.stage(blockConstraints_, block, {createEqualExpr(sa, sb)});

    int lo = std::min(sa, sb);
    const int hi = std::max(sa, sb);
    const auto ofLo = equalParents_.find(lo);
    const bool isLoNew = ofLo == equalParents_.end();
    if (isLoNew && block) blocksOfLo.stage(equalBlocks_, lo, {block});
    if (!isLoNew && ofLo->second < lo) lo = ofLo->second; // kept: one step, not the way to the root
    const auto ofHi = equalParents_.find(hi);
    const bool isHiNew = ofHi == equalParents_.end();
    const int parent = isHiNew ? hi : ofHi->second;
    const bool staysApart = !isHiNew && parent <= lo; // kept: the two classes are not joined
    if (isHiNew && block) blocksOfHi.stage(equalBlocks_, hi, {block});
    if (staysApart || isHiNew)
        children.stage(equalChildren_, lo, {hi});
    else
        children.stage(equalChildren_, lo, {hi, parent});

    const int rootOfLo = classes_.rootOf(lo);
    const int rootOfHi = classes_.rootOf(hi);
    const bool isWholeClass = parent == rootOfHi; // else only `parent`, hi and what is linked to them change over
    if (!staysApart && isWholeClass) graph_.prepareMerge(rootOfHi, rootOfLo);
    equalParents_.reserve(equalParents_.size() + 2);

    // Nothing fails from here on.
    statedByBlock.put();
    blocksOfLo.put();
    blocksOfHi.put();
    children.put();
    if (isLoNew) equalParents_.emplace(lo, lo);
    if (staysApart) return;
    equalParents_.insert_or_assign(parent, lo);
    equalParents_.insert_or_assign(hi, lo);
    ++numEqual_;
    if (isWholeClass) {
        graph_.rootWasMerged(rootOfHi, rootOfLo);
    } else if (rootOfHi != rootOfLo) {
        classes_.split();
        graph_.classWasSplit(rootOfHi);
    }
}

bool SymbolicDimsConstraints::Impl::isEqual(int a, int b) const { return isSizeEqual(sizeOf(a), sizeOf(b)); }

bool SymbolicDimsConstraints::Impl::isSizeEqual(int sa, int sb) const {
    if (classes_.rootOf(sa) == classes_.rootOf(sb)) return true;
    const auto [isNumberA, valueA] = table_->getValueOf(sa);
    const auto [isNumberB, valueB] = table_->getValueOf(sb);
    if (isNumberA == isNumberB) return isNumberA && valueA == valueB;
    const int value = isNumberA ? valueA : valueB;
    const SymbDimsRange range = rangeOfSize(isNumberA ? sb : sa);
    return range.min == value && range.max == value;
}

// Order.

void SymbolicDimsConstraints::Impl::addGreaterThan(int a, int b, const QLBlock* block) {
    const int sa = sizeOf(a);
    const int sb = sizeOf(b);
    if (sa == sb) return; // kept: accepted and forgotten
    const auto [isNumberA, valueA] = table_->getValueOf(sa);
    const auto [isNumberB, valueB] = table_->getValueOf(sb);
    if (isNumberA && isNumberB) {
        if (valueA > valueB) return;
        failure::raise(category, "InvalidSymbolicDimensionGreaterThan", decimal(valueA), decimal(valueB));
    }
    if (isNumberB) return addGreaterThanValue(sa, valueB, block);
    if (isNumberA) return addLessThanValue(sb, valueA, block);
    if (isSizeEqual(sa, sb))
        failure::raise(category, "InconsistentSymbolicDimensionEqual", textOf(sa), textOf(sb), textOf(sb));
    if (isSizeGreaterThan(sb, sa))
        failure::raise(category, "InconsistentSymbolicDimensionGreaterThan", textOf(sa), textOf(sb), textOf(sb));

    Staged<BlockIds> statedByBlock;
    Staged<Blocks> blocks;
    if (block) {
        statedByBlock.stage(blockConstraints_, block, {createGreaterThanExpr(sa, sb)});
        blocks.stage(greaterThanBlocks_, sa, {block});
    }
    const auto edges = greaterThanEdges_.find(sa);
    const bool isNew = edges == greaterThanEdges_.end() || !edges->second.contains(sb);
    Staged<Ids> edge;
    if (isNew) {
        edge.stage(greaterThanEdges_, sa, {sb});
        graph_.prepareEdge(sa, sb);
    }

    // Nothing fails from here on.
    statedByBlock.put();
    blocks.put();
    edge.put();
    if (isNew) graph_.addEdge(sa, sb);
    ++numGreaterThan_;
}

bool SymbolicDimsConstraints::Impl::isGreaterThan(int a, int b) const {
    return isSizeGreaterThan(sizeOf(a), sizeOf(b));
}

bool SymbolicDimsConstraints::Impl::isSizeGreaterThan(int sa, int sb) const {
    if (sa == sb) return false;
    const auto [isNumberA, valueA] = table_->getValueOf(sa);
    const auto [isNumberB, valueB] = table_->getValueOf(sb);
    if (isNumberA && isNumberB) return valueA > valueB;
    if (isNumberB) return rangeOfSize(sa).min > valueB;
    if (isNumberA) return heldRangeOf(sb).max < valueA;
    return graph_.hasChain(sa, sb); // kept: over exact ids, not over their equals
}

// Bounds.

void SymbolicDimsConstraints::Impl::checkRange(int root, const SymbDimsRange& held, int min, int max) const {
    if (max < held.min)
        failure::raise(category, "InconsistentSymbolicDimensionLessThan", textOf(root), decimal(max + 1L),
                       decimal(held.min - 1L));
    if (min > held.max)
        failure::raise(category, "InconsistentSymbolicDimensionGreaterThan", textOf(root), decimal(min - 1L),
                       decimal(held.max + 1L));
}

// kept: the upper bound is left out whatever the caller says, unless the feature flag lets the caller decide.
GenerateCodeFlags SymbolicDimsConstraints::Impl::keptFlags(GenerateCodeFlags flags) const {
    if (symbolicDimsMaxConstraintInCode->state() <= 0) return omitUpperBound;
    return static_cast<GenerateCodeFlags>(flags & omitBothBounds);
}

void SymbolicDimsConstraints::Impl::narrow(int root, SymbDimsRange& held, const SymbDimsRange& range) noexcept {
    const int before = held.min;
    held.min = std::max(held.min, range.min);
    held.max = std::min(held.max, range.max);
    held.flags = range.flags;
    if (held.min != before) graph_.rootWasRaised(root, before, held.min);
}

void SymbolicDimsConstraints::Impl::addRange(int a, int min, int max, const QLBlock* block, GenerateCodeFlags flags) {
    const int root = findRootKey(a);
    SymbDimsRange& held = ranges_[root]; // kept: stays behind when the range is refused
    checkRange(root, held, min, max);
    Staged<Blocks> blocks;
    if (block) blocks.stage(rangeBlocks_, root, {block}); // kept: the block is not said to have stated anything
    blocks.put();
    narrow(root, held, {min, max, keptFlags(flags)});
}

void SymbolicDimsConstraints::Impl::addEqualValue(int a, int value, const QLBlock* block) {
    const int size = sizeOf(a);
    const int root = classes_.rootOf(size);
    SymbDimsRange& held = ranges_[root];
    checkRange(root, held, value, value);
    Staged<BlockIds> statedByBlock;
    Staged<Blocks> blocks;
    if (block) {
        blocks.stage(rangeBlocks_, root, {block});
        statedByBlock.stage(blockConstraints_, block, {createEqualExpr(size, valueId(value))});
    }
    blocks.put();
    statedByBlock.put();
    narrow(root, held, {value, value, keptFlags(generateBothBounds)});
}

void SymbolicDimsConstraints::Impl::addGreaterThanValue(int a, int value, const QLBlock* block) {
    const int size = sizeOf(a);
    const int root = classes_.rootOf(size);
    SymbDimsRange& held = ranges_[root];
    if (value >= held.max)
        failure::raise(category, "InconsistentSymbolicDimensionGreaterThan", textOf(root), decimal(value),
                       decimal(held.max + 1L));
    Staged<BlockIds> statedByBlock;
    Staged<Blocks> blocks;
    if (block) {
        statedByBlock.stage(blockConstraints_, block, {createGreaterThanExpr(size, valueId(value))});
        blocks.stage(rangeBlocks_, root, {block});
    }
    statedByBlock.put();
    blocks.put();
    narrow(root, held, {value + 1, held.max, held.flags});
}

void SymbolicDimsConstraints::Impl::addLessThanValue(int a, int value, const QLBlock* block) {
    const int size = sizeOf(a);
    const int root = classes_.rootOf(size);
    SymbDimsRange& held = ranges_[root];
    if (value <= held.min)
        failure::raise(category, "InconsistentSymbolicDimensionLessThan", textOf(root), decimal(value),
                       decimal(held.min - 1L));
    Staged<BlockIds> statedByBlock;
    Staged<Blocks> blocks;
    if (block) {
        statedByBlock.stage(blockConstraints_, block, {createLessThanExpr(size, valueId(value))});
        blocks.stage(rangeBlocks_, root, {block});
    }
    statedByBlock.put();
    blocks.put();
    narrow(root, held, {held.min, value - 1, held.flags});
}

SymbDimsRange SymbolicDimsConstraints::Impl::getRange(int a) const { return rangeOfSize(sizeOf(a)); }

SymbDimsRange SymbolicDimsConstraints::Impl::heldRangeOf(int size) const {
    const auto found = ranges_.find(classes_.rootOf(size));
    return found == ranges_.end() ? SymbDimsRange() : found->second;
}

// kept: the lower bound of what is exceeded is taken as it is, not plus one, and upper bounds are not carried over.
SymbDimsRange SymbolicDimsConstraints::Impl::rangeOfSize(int size) const {
    SymbDimsRange range = heldRangeOf(size);
    range.min = graph_.lowerBoundOf(size);
    return range;
}

// The face.

SymbolicDimsConstraints::SymbolicDimsConstraints(SymbolicDimsTable* table) : impl_(std::make_unique<Impl>(table)) {}
SymbolicDimsConstraints::~SymbolicDimsConstraints() = default;

void SymbolicDimsConstraints::addEqual(int a, int b, const QLBlock* block) const {
    if (a == b) return;
    SymbolicDimsTable& table = impl_->table();
    const SymbolicDims shapeA = table.getSymbolicDims(table.removeTrailingOnes(table.removeLeadingOnes(a), 1));
    const SymbolicDims shapeB = table.getSymbolicDims(table.removeTrailingOnes(table.removeLeadingOnes(b), 1));
    const std::size_t numDimensions = shapeA.getNumDimensions();
    if (numDimensions == shapeB.getNumDimensions())
        for (std::size_t i = 0; i < numDimensions; ++i)
            impl_->addEqual(shapeA.getDimensionId(i), shapeB.getDimensionId(i), block);
    // kept: the sizes too, also of shapes with different numbers of dimensions, but only when the first has several
    if (numDimensions >= 2) impl_->addEqual(shapeA.getId(), shapeB.getId(), block);
}

// clang-format off
void SymbolicDimsConstraints::addEqualValue(int a, int value, const QLBlock* block) const  { impl_->addEqualValue(a, value, block); }
void SymbolicDimsConstraints::addGreaterThan(int a, int b, const QLBlock* block) const     { impl_->addGreaterThan(a, b, block); }
void SymbolicDimsConstraints::addGreaterThanValue(int a, int value, const QLBlock* block)  { impl_->addGreaterThanValue(a, value, block); }
void SymbolicDimsConstraints::addLessThanValue(int a, int value, const QLBlock* block)     { impl_->addLessThanValue(a, value, block); }
void SymbolicDimsConstraints::addRange(int a, int min, int max, const QLBlock* block, GenerateCodeFlags flags) { impl_->addRange(a, min, max, block, flags); }

bool SymbolicDimsConstraints::isEqual(int a, int b) const       { return impl_->isEqual(a, b); }
bool SymbolicDimsConstraints::isGreaterThan(int a, int b) const { return impl_->isGreaterThan(a, b); }
SymbDimsRange SymbolicDimsConstraints::getRange(int a) const    { return impl_->getRange(a); }

void SymbolicDimsConstraints::getSymbolicDimsConstraints(std::vector<SymbolicDimsConstraint>& list) const            { impl_->getSymbolicDimsConstraints(list); }
void SymbolicDimsConstraints::getSymbolicDimsConstraints(std::vector<int>& ids) const                                { impl_->getSymbolicDimsConstraints(ids); }
void SymbolicDimsConstraints::getSymbolicDimsConstraints(const QLBlock* block, std::vector<int>& ids) const          { impl_->getSymbolicDimsConstraints(block, ids); }
void SymbolicDimsConstraints::getSymbolicDimsConstraints(const QLBlock* block, const boost::function<const QLBlock*(const QLBlock*)>& mapper, std::vector<int>& ids) const { impl_->getSymbolicDimsConstraints(block, mapper, ids); }
void SymbolicDimsConstraints::getEquivalentSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const           { impl_->getEquivalentSymbolicDims(list); }
void SymbolicDimsConstraints::getGreaterThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const          { impl_->getGreaterThanSymbolicDims(list); }
void SymbolicDimsConstraints::getLessThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const             { impl_->getLessThanSymbolicDims(list); }
// clang-format on

} // namespace QLTypeSys
