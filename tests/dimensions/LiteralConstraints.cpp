#include "tests/dimensions/LiteralConstraints.h"

#include <algorithm>
#include <climits>

#include "qlplatform/services/QlFeature.h"
#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprFactorDivision.h"
#include "qlplatform/symbolic/SymbolicExprSimplify.h"

namespace dimensionstest {

using namespace QLTypeSys;
using QL::SymbolicOp;

namespace {

std::string decimal(long value) { return std::to_string(value); }
unsigned long exprIdOf(int id) { return static_cast<unsigned long>(static_cast<long>(id) + 1); }

} // namespace

int LiteralConstraints::expr(SymbolicOp op, int a, int b) {
    return static_cast<int>(table.getExprTable().add(op, exprIdOf(a), exprIdOf(b))) - 1;
}

int LiteralConstraints::findRootKey(int id) {
    int k = size(id);
    for (;;) {
        if (!equalParents.contains(k)) return k;
        const int p = equalParents[k];
        if (k <= p) return k;
        k = p;
    }
}

void LiteralConstraints::addEqual(int a, int b, const QLBlock* block) {
    if (a == b) return;
    a = table.removeTrailingOnes(table.removeLeadingOnes(a), 1);
    b = table.removeTrailingOnes(table.removeLeadingOnes(b), 1);
    const SymbolicDims shapeA(&table, a), shapeB(&table, b);
    const std::size_t na = shapeA.getNumDimensions(), nb = shapeB.getNumDimensions();
    if (na == nb)
        for (std::size_t i = 0; i < na; ++i)
            link(shapeA.getDimensionId(i), shapeB.getDimensionId(i), block);
    if (na >= 2) link(size(a), size(b), block);
}

void LiteralConstraints::link(int a, int b, const QLBlock* block) {
    const int sa = size(a), sb = size(b);
    if (sa == sb) return;
    if (isInt(sa) && isInt(sb)) {
        if (valueOf(sa) == valueOf(sb)) return;
        throw Refusal{"InvalidSymbolicDimensionNotEqual", {decimal(valueOf(sa)), decimal(valueOf(sb))}};
    }
    if (isGreaterThan(sa, sb)) throw Refusal{"InconsistentSymbolicDimensionNotEqual", {text(sa), text(sb), text(sb)}};
    if (isGreaterThan(sb, sa)) throw Refusal{"InconsistentSymbolicDimensionNotEqual", {text(sb), text(sa), text(sa)}};
    if (isInt(sb)) return addEqualValue(sa, valueOf(sb), block);
    if (isInt(sa)) return addEqualValue(sb, valueOf(sa), block);
    if (block) blockConstraints[block].insert(expr(SymbolicOp::Equal, sa, sb));
    int lo = std::min(sa, sb);
    const int hi = std::max(sa, sb);
    if (equalParents.contains(lo)) {
        if (equalParents[lo] < lo) lo = equalParents[lo];
    } else {
        equalParents[lo] = lo;
        if (block) equalBlocks[lo].insert(block);
    }
    equalChildren[lo].insert(hi);
    if (equalParents.contains(hi)) {
        const int p = equalParents[hi];
        if (p <= lo) return;
        equalChildren[lo].insert(p);
        equalParents[p] = lo;
        equalParents[hi] = lo;
    } else {
        equalParents[hi] = lo;
        if (block) equalBlocks[hi].insert(block);
    }
}

void LiteralConstraints::addEqualValue(int a, int value, const QLBlock* block) {
    addRange(a, value, value, block, 0);
    if (block) blockConstraints[block].insert(expr(SymbolicOp::Equal, size(a), idOfValue(value)));
}

void LiteralConstraints::addRange(int a, int min, int max, const QLBlock* block, unsigned flags) {
    const int r = findRootKey(a);
    SymbDimsRange& entry = ranges[r];
    if (max < entry.min)
        throw Refusal{"InconsistentSymbolicDimensionLessThan", {text(r), decimal(max + 1L), decimal(entry.min - 1L)}};
    if (min > entry.max)
        throw Refusal{"InconsistentSymbolicDimensionGreaterThan",
                      {text(r), decimal(min - 1L), decimal(entry.max + 1L)}};
    if (min > entry.min) entry.min = min;
    if (max < entry.max) entry.max = max;
    const bool callersFlags = QlFeature::find("SymbolicDimsMaxConstraintInCode")->state() > 0;
    entry.flags = static_cast<GenerateCodeFlags>(callersFlags ? flags & 3 : 2);
    if (block) rangeBlocks[r].insert(block);
}

void LiteralConstraints::addGreaterThanValue(int a, int value, const QLBlock* block) {
    const int r = findRootKey(a);
    SymbDimsRange& entry = ranges[r];
    if (value < entry.max) {
        if (entry.min < value + 1) entry.min = value + 1;
    } else {
        throw Refusal{"InconsistentSymbolicDimensionGreaterThan", {text(r), decimal(value), decimal(entry.max + 1L)}};
    }
    if (!block) return;
    blockConstraints[block].insert(expr(SymbolicOp::GreaterThan, size(a), idOfValue(value)));
    rangeBlocks[r].insert(block);
}

void LiteralConstraints::addLessThanValue(int a, int value, const QLBlock* block) {
    const int r = findRootKey(a);
    SymbDimsRange& entry = ranges[r];
    if (entry.min < value) {
        if (entry.max > value - 1) entry.max = value - 1;
    } else {
        throw Refusal{"InconsistentSymbolicDimensionLessThan", {text(r), decimal(value), decimal(entry.min - 1L)}};
    }
    if (!block) return;
    blockConstraints[block].insert(expr(SymbolicOp::LessThan, size(a), idOfValue(value)));
    rangeBlocks[r].insert(block);
}

void LiteralConstraints::addGreaterThan(int a, int b, const QLBlock* block) {
    const int sa = size(a), sb = size(b);
    if (sa == sb) return;
    if (isInt(sa) && isInt(sb)) {
        if (valueOf(sa) > valueOf(sb)) return;
        throw Refusal{"InvalidSymbolicDimensionGreaterThan", {decimal(valueOf(sa)), decimal(valueOf(sb))}};
    }
    if (isInt(sb)) return addGreaterThanValue(sa, valueOf(sb), block);
    if (isInt(sa)) return addLessThanValue(sb, valueOf(sa), block);
    if (isEqual(sa, sb)) throw Refusal{"InconsistentSymbolicDimensionEqual", {text(sa), text(sb), text(sb)}};
    if (isGreaterThan(sb, sa))
        throw Refusal{"InconsistentSymbolicDimensionGreaterThan", {text(sa), text(sb), text(sb)}};
    if (block) {
        blockConstraints[block].insert(expr(SymbolicOp::GreaterThan, sa, sb));
        greaterThanBlocks[sa].insert(block);
    }
    greaterThanEdges[sa].insert(sb);
}

SymbDimsRange LiteralConstraints::getRange(int a) {
    const int r = findRootKey(a);
    SymbDimsRange result;
    if (ranges.contains(r)) result = ranges[r];
    narrowRange(a, result);
    return result;
}

void LiteralConstraints::narrowRange(int a, SymbDimsRange& range) {
    const int s = size(a);
    if (!greaterThanEdges.contains(s)) return;
    for (const int e : greaterThanEdges[s]) {
        const int r = findRootKey(e);
        if (ranges.contains(r) && ranges[r].min > range.min) range.min = ranges[r].min;
        narrowRange(e, range);
    }
}

bool LiteralConstraints::isEqual(int a, int b) {
    if (findRootKey(a) == findRootKey(b)) return true;
    const int sa = size(a), sb = size(b);
    if (isInt(sa) && isInt(sb)) return valueOf(sa) == valueOf(sb);
    if (isInt(sb)) return getRange(sa).min == valueOf(sb) && getRange(sa).max == valueOf(sb);
    if (isInt(sa)) return getRange(sb).min == valueOf(sa) && getRange(sb).max == valueOf(sa);
    return false;
}

bool LiteralConstraints::isGreaterThan(int a, int b) {
    const int sa = size(a), sb = size(b);
    if (sa == sb) return false;
    if (isInt(sa) && isInt(sb)) return valueOf(sa) > valueOf(sb);
    if (isInt(sb)) return getRange(sa).min > valueOf(sb);
    if (isInt(sa)) return getRange(sb).max < valueOf(sa);
    if (!greaterThanEdges.contains(sa)) return false;
    if (greaterThanEdges[sa].contains(sb)) return true;
    for (const int e : greaterThanEdges[sa])
        if (isGreaterThan(e, sb)) return true;
    return false;
}

std::vector<const QLBlock*> LiteralConstraints::blocksOf(const Sets<const QLBlock*>& blocks, int key) {
    const auto found = blocks.find(key);
    if (found == blocks.end()) return {};
    return {found->second.begin(), found->second.end()};
}

std::vector<LiteralConstraints::Facts> LiteralConstraints::facts(bool lowerBoundsOnly) {
    Facts equalities, values, greaterThans, bounds;
    for (const auto& [k, set] : equalChildren)
        for (const int c : set)
            equalities.push_back({expr(SymbolicOp::Equal, k, c), blocksOf(equalBlocks, c)});
    for (const auto& [r, range] : ranges)
        if (range.min == range.max)
            values.push_back({expr(SymbolicOp::Equal, r, idOfValue(range.min)), blocksOf(rangeBlocks, r)});
    for (const auto& [k, set] : greaterThanEdges)
        for (const int e : set)
            greaterThans.push_back({expr(SymbolicOp::GreaterThan, k, e), blocksOf(greaterThanBlocks, k)});
    for (const auto& [r, range] : ranges) {
        if (SymbDimsRange::defaultMin() < range.min && range.min < range.max)
            bounds.push_back({expr(SymbolicOp::GreaterThan, r, idOfValue(range.min - 1L)), blocksOf(rangeBlocks, r)});
        if (!lowerBoundsOnly && range.min < range.max && range.max != INT_MAX)
            bounds.push_back({expr(SymbolicOp::LessThan, r, idOfValue(range.max + 1L)), blocksOf(rangeBlocks, r)});
    }
    return {equalities, values, greaterThans, bounds};
}

std::vector<int> LiteralConstraints::statedBy(const std::function<bool(const QLBlock*)>& isMeant) {
    std::set<int> ids;
    for (const auto& [block, set] : blockConstraints)
        if (isMeant(block)) ids.insert(set.begin(), set.end());
    return {ids.begin(), ids.end()};
}

LiteralConstraints::Pairs LiteralConstraints::equivalent() {
    Pairs pairs;
    for (const auto& [k, set] : equalChildren)
        for (const int c : set)
            pairs.push_back({k, c, blocksOf(equalBlocks, c)});
    for (const auto& [r, range] : ranges)
        if (range.min == range.max) pairs.push_back({r, idOfValue(range.min), blocksOf(rangeBlocks, r)});
    sortAndRewrite(pairs);
    return pairs;
}

LiteralConstraints::Pairs LiteralConstraints::greaterThan() {
    Pairs pairs;
    for (const auto& [k, set] : greaterThanEdges)
        for (const int e : set)
            pairs.push_back({k, e, blocksOf(greaterThanBlocks, e)});
    for (const auto& [r, range] : ranges)
        if (range.min < range.max && (range.flags & 1) == 0)
            pairs.push_back({r, idOfValue(range.min == INT_MIN ? INT_MIN : range.min - 1L), blocksOf(rangeBlocks, r)});
    sortAndRewrite(pairs);
    return pairs;
}

LiteralConstraints::Pairs LiteralConstraints::lessThan() {
    Pairs pairs;
    for (const auto& [r, range] : ranges)
        if (range.min < range.max && (range.flags & 2) == 0)
            pairs.push_back({r, idOfValue(range.max == INT_MAX ? INT_MAX : range.max + 1L), blocksOf(rangeBlocks, r)});
    sortAndRewrite(pairs);
    return pairs;
}

void LiteralConstraints::sortAndRewrite(Pairs& pairs) {
    std::sort(pairs.begin(), pairs.end(), [](const auto& x, const auto& y) {
        return x.first != y.first ? x.first < y.first : x.second < y.second;
    });
    QL::SymbolicExprTable& exprs = table.getExprTable();
    unsigned long scratch = 0;
    const auto simplify = [&](unsigned long e) {
        return QL::SymbolicExprSimplify(exprs, 10, false).simplify(e, scratch);
    };
    const auto times = [&](unsigned long x, unsigned long y) { return exprs.add(SymbolicOp::Multiply, x, y); };
    const auto isInteger = [&](unsigned long e) { return exprs.get(e).getOp() == SymbolicOp::IntValue; };
    const auto isMultiple = [&](unsigned long e, unsigned long of) {
        return exprs.get(of).getIntValue() != 0 && exprs.get(e).getIntValue() % exprs.get(of).getIntValue() == 0;
    };
    for (SymbolicDimsCGConstraint& pair : pairs) {
        unsigned long L = QL::SymbolicExprFactorDivision(exprs).factorDivision(exprIdOf(pair.first));
        unsigned long R = QL::SymbolicExprFactorDivision(exprs).factorDivision(exprIdOf(pair.second));
        const bool divisionL = exprs.get(L).getOp() == SymbolicOp::Divide;
        const bool divisionR = exprs.get(R).getOp() == SymbolicOp::Divide;
        if (divisionL) {
            const unsigned long a = simplify(exprs.get(L).getLeft()), b = simplify(exprs.get(L).getRight());
            if (divisionR) {
                const unsigned long c = simplify(exprs.get(R).getLeft()), d = simplify(exprs.get(R).getRight());
                if (isInteger(b) && isInteger(d) && isMultiple(d, b)) {
                    const int q = exprs.get(d).getIntValue() / exprs.get(b).getIntValue();
                    L = simplify(times(a, exprs.addInt(q)));
                    R = simplify(c);
                } else if (isInteger(b) && isInteger(d) && isMultiple(b, d)) {
                    const int q = exprs.get(b).getIntValue() / exprs.get(d).getIntValue();
                    L = simplify(a);
                    R = simplify(times(c, exprs.addInt(q)));
                } else {
                    L = simplify(times(a, d));
                    R = simplify(times(c, b));
                }
            } else {
                L = a;
                R = simplify(times(b, R));
            }
        } else if (divisionR) {
            const unsigned long c = exprs.get(R).getLeft(), d = exprs.get(R).getRight();
            R = c;
            L = simplify(times(L, d));
        }
        pair.first = static_cast<int>(L) - 1;
        pair.second = static_cast<int>(R) - 1;
    }
}

} // namespace dimensionstest
