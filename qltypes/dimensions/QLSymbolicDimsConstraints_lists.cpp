// What is known, listed: as expressions for the model, as pairs for the code generator.
#include <algorithm>
#include <limits>
#include <tuple>

#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprFactorDivision.h"
#include "qltypes/dimensions/ExprIds_internal.h"
#include "qltypes/dimensions/QLSymbolicDimsConstraintsImpl_internal.h"

namespace QLTypeSys {
namespace {

constexpr int lowest = std::numeric_limits<int>::min();
constexpr int highest = std::numeric_limits<int>::max();

using BlocksByKey = std::unordered_map<int, std::set<const QLBlock*>>;

template <class Record> void addBlocksToConstraint(int key, const BlocksByKey& blocks, Record& record) {
    const auto found = blocks.find(key);
    if (found != blocks.end()) record.blocks.insert(record.blocks.end(), found->second.begin(), found->second.end());
}

} // namespace

// As expressions.

void SymbolicDimsConstraints::Impl::addToConstraints(std::vector<SymbolicDimsConstraint>& list, std::size_t index,
                                                     int key, int exprId, const Blocks& blocks) const {
    list.resize(index + 1);
    list.back().id = exprId;
    addBlocksToConstraint(key, blocks, list.back());
}

void SymbolicDimsConstraints::Impl::getSymbolicDimsConstraints(std::vector<SymbolicDimsConstraint>& list) const {
    list.clear();
    list.reserve(numEqual_ + ranges_.size() + numGreaterThan_ + ranges_.size() + ranges_.size());
    const auto add = [&](int key, int exprId, const Blocks& blocks) {
        addToConstraints(list, list.size(), key, exprId, blocks);
    };
    for (const auto& [key, children] : equalChildren_)
        for (const int child : children)
            add(child, createEqualExpr(key, child), equalBlocks_);
    for (const auto& [root, range] : ranges_)
        if (range.min == range.max) add(root, createEqualExpr(root, valueId(range.min)), rangeBlocks_);
    for (const auto& [key, edges] : greaterThanEdges_)
        for (const int edge : edges)
            add(key, createGreaterThanExpr(key, edge), greaterThanBlocks_);
    for (const auto& [root, range] : ranges_) {
        if (SymbDimsRange::defaultMin() < range.min && range.min < range.max)
            add(root, createGreaterThanExpr(root, valueId(range.min - 1L)), rangeBlocks_);
        if (range.min < range.max && range.max != highest)
            add(root, createLessThanExpr(root, valueId(range.max + 1L)), rangeBlocks_);
    }
}

void SymbolicDimsConstraints::Impl::getSymbolicDimsConstraints(std::vector<int>& ids) const {
    ids.clear();
    ids.reserve(numEqual_ + ranges_.size() + numGreaterThan_ + ranges_.size());
    for (const auto& [key, children] : equalChildren_)
        for (const int child : children)
            ids.push_back(createEqualExpr(key, child));
    for (const auto& [root, range] : ranges_)
        if (range.min == range.max) ids.push_back(createEqualExpr(root, valueId(range.min)));
    for (const auto& [key, edges] : greaterThanEdges_)
        for (const int edge : edges)
            ids.push_back(createGreaterThanExpr(key, edge));
    for (const auto& [root, range] : ranges_) // kept: lower bounds only
        if (SymbDimsRange::defaultMin() < range.min && range.min < range.max)
            ids.push_back(createGreaterThanExpr(root, valueId(range.min - 1L)));
}

void SymbolicDimsConstraints::Impl::getSymbolicDimsConstraints(const QLBlock* block, std::vector<int>& ids) const {
    ids.clear();
    const auto found = blockConstraints_.find(block);
    if (found != blockConstraints_.end()) ids.assign(found->second.begin(), found->second.end());
}

void SymbolicDimsConstraints::Impl::getSymbolicDimsConstraints(
    const QLBlock* block, const boost::function<const QLBlock*(const QLBlock*)>& mapper, std::vector<int>& ids) const {
    ids.clear();
    std::set<int> stated;
    for (const auto& [key, exprIds] : blockConstraints_)
        if (mapper(key) == block) stated.insert(exprIds.begin(), exprIds.end());
    ids.assign(stated.begin(), stated.end());
}

// As pairs.

// kept: the blocks are those filed under the second member, which for greater-thans is not where they are filed
void SymbolicDimsConstraints::Impl::createConstraintsList(const Ids& map, const Blocks& blocks,
                                                          std::vector<SymbolicDimsCGConstraint>& list) const {
    for (const auto& [key, members] : map)
        for (const int member : members)
            addBlocksToConstraint(member, blocks, list.emplace_back(SymbolicDimsCGConstraint{key, member, {}}));
}

void SymbolicDimsConstraints::Impl::getEquivalentSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const {
    list.clear();
    list.reserve(numEqual_ + ranges_.size());
    createConstraintsList(equalChildren_, equalBlocks_, list);
    for (const auto& [root, range] : ranges_) {
        if (range.min != range.max) continue;
        list.push_back({root, valueId(range.min), {}});
        addBlocksToConstraint(root, rangeBlocks_, list.back());
    }
    sortAndRewrite(list);
}

void SymbolicDimsConstraints::Impl::getGreaterThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const {
    list.clear();
    list.reserve(numGreaterThan_ + ranges_.size());
    createConstraintsList(greaterThanEdges_, greaterThanBlocks_, list);
    for (const auto& [root, range] : ranges_) { // kept: also a range without a lower bound
        if (range.min >= range.max || (range.flags & omitLowerBound)) continue;
        list.push_back({root, valueId(range.min == lowest ? lowest : range.min - 1L), {}});
        addBlocksToConstraint(root, rangeBlocks_, list.back());
    }
    sortAndRewrite(list);
}

void SymbolicDimsConstraints::Impl::getLessThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const {
    list.clear();
    list.reserve(ranges_.size());
    for (const auto& [root, range] : ranges_) {
        if (range.min >= range.max || (range.flags & omitUpperBound)) continue;
        list.push_back({root, valueId(range.max == highest ? highest : range.max + 1L), {}});
        addBlocksToConstraint(root, rangeBlocks_, list.back());
    }
    sortAndRewrite(list);
}

void SymbolicDimsConstraints::Impl::sortAndRewrite(std::vector<SymbolicDimsCGConstraint>& list) const {
    std::sort(list.begin(), list.end(), [](const SymbolicDimsCGConstraint& a, const SymbolicDimsCGConstraint& b) {
        return std::tie(a.first, a.second) < std::tie(b.first, b.second);
    });
    eliminateDivisions(list); // kept: not sorted again
}

// Legend: a/b is the left side, c/d the right side. Both have a denominator, one of them a multiple of the other or
// not; or only the left side has one; or only the right side; or neither.
void SymbolicDimsConstraints::Impl::eliminateDivisions(std::vector<SymbolicDimsCGConstraint>& list) const {
    QL::SymbolicExprTable& exprs = *exprTable_;
    QL::SymbolicExprSimplify simplifier = simplifierOf(exprs);
    QL::SymbolicExprFactorDivision factoring(exprs);
    unsigned long scratch = 0;
    const auto simplify = [&](unsigned long exprId) { return simplifier.simplify(exprId, scratch); };
    const auto times = [&](unsigned long x, unsigned long y) {
        return simplify(QL::SymbolicMultiplyExpr(exprs, x, y).getId(exprs));
    };
    const auto isDivision = [&](unsigned long exprId) { return exprs.get(exprId).getOp() == QL::SymbolicOp::Divide; };
    // The id of number x over number y when that is whole, otherwise noExpr; 0 divides nothing.
    const auto quotient = [&](unsigned long x, unsigned long y) {
        const QL::SymbolicExpr above = exprs.get(x), below = exprs.get(y);
        if (above.getOp() != QL::SymbolicOp::IntValue || below.getOp() != QL::SymbolicOp::IntValue)
            return QL::SymbolicExprTable::noExpr;
        const long dividend = above.getIntValue(), divisor = below.getIntValue();
        if (divisor == 0 || dividend % divisor != 0) return QL::SymbolicExprTable::noExpr;
        const long whole = dividend / divisor;
        return whole > highest ? exprs.addDouble(static_cast<double>(whole)) : exprs.addInt(static_cast<int>(whole));
    };

    for (SymbolicDimsCGConstraint& pair : list) {
        unsigned long left = factoring.factorDivision(exprIdOf(pair.first));
        unsigned long right = factoring.factorDivision(exprIdOf(pair.second));
        if (isDivision(left)) {
            const unsigned long a = simplify(exprs.get(left).getLeft());
            const unsigned long b = simplify(exprs.get(left).getRight());
            if (isDivision(right)) {
                const unsigned long c = simplify(exprs.get(right).getLeft());
                const unsigned long d = simplify(exprs.get(right).getRight());
                if (const unsigned long q = quotient(d, b); q != QL::SymbolicExprTable::noExpr) {
                    left = times(a, q);
                    right = simplify(c);
                } else if (const unsigned long p = quotient(b, d); p != QL::SymbolicExprTable::noExpr) {
                    left = simplify(a);
                    right = times(c, p);
                } else {
                    left = times(a, d);
                    right = times(c, b);
                }
            } else {
                left = a;
                right = times(b, right);
            }
        } else if (isDivision(right)) {
            const QL::SymbolicExpr division = exprs.get(right);
            right = division.getLeft(); // kept: not simplified
            left = times(left, division.getRight());
        }
        pair.first = symbolicIdOf(left);
        pair.second = symbolicIdOf(right);
    }
}

} // namespace QLTypeSys
