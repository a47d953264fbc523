#include "qlplatform/symbolic/Simplifier_internal.h"

#include <algorithm>

#include "qlplatform/symbolic/SymbolicExprSimplify.h"

namespace QL {
namespace {

// Room that the next walk may find; a larger one is given back.
constexpr std::size_t maxKeptEntries = 4096;

template <class T> void emptied(std::vector<T>& list) {
    if (list.capacity() > maxKeptEntries)
        list = {};
    else
        list.clear();
}

} // namespace

void Simplifier::remember(NodeId id, NodeId form) {
    if (store_.simplified(form) == noNode) store_.setSimplified(form, form);
    if (store_.simplified(id) == noNode) store_.setSimplified(id, store_.simplified(form));
}

NodeId Simplifier::written(NodeId id, Value& value) {
    remember(id, arithmetic_.write(value));
    return store_.simplified(id);
}

NodeId Simplifier::simplify(NodeId root) {
    if (store_.simplified(root) != noNode) return store_.simplified(root);
    if (const NodeId form = extended(root); form != noNode) {
        remember(root, form);
        return store_.simplified(root);
    }
    if (isArithmetic(store_.op(root))) {
        if (auto sum = reader_.plainSum(root)) {
            Value value = arithmetic_.polynomial(*std::move(sum));
            return written(root, value);
        }
    }
    forgetWalk(); // of a call that ended early
    listEntries(root);
    for (const std::uint32_t index : order_)
        if (!isInnerPart(entries_[index])) entries_[index].value = stored(evaluate(entries_[index]));
    const NodeId form = written(root, values_[entries_[order_.back()].value]);
    forgetWalk();
    return form;
}

// The simplified form of a part that is added, where that is at hand: an expression over operands that are simplified.
NodeId Simplifier::atHand(NodeId id) {
    if (store_.simplified(id) != noNode) return store_.simplified(id);
    for (std::size_t i = 0; i < store_.numOperands(id); ++i) {
        const NodeId operand = store_.operand(id, i);
        if (store_.simplified(operand) == noNode && store_.numOperands(operand) != 0) return noNode;
    }
    return store_.numOperands(id) == 0 ? id : simplify(id);
}

// A simplified sum or product that gets one more part is the commonest case of all. It costs as much as what stands
// behind the place of that part.
NodeId Simplifier::extended(NodeId root) {
    const SymbolicOp op = store_.op(root);
    if (!isSum(op) && op != SymbolicOp::Multiply) return noNode;
    const NodeId left = store_.simplified(store_.operand(root, 0));
    if (left == noNode || (isSum(op) ? !isSum(store_.op(left)) : store_.op(left) != SymbolicOp::Multiply))
        return noNode;
    const NodeId added = atHand(store_.operand(root, 1));
    if (added == noNode) return noNode;
    return isSum(op) ? withTerm(left, op, added) : withFactor(left, added);
}

// Only for what is put in without changing another term, and where the first two have not changed places.
NodeId Simplifier::withTerm(NodeId sum, SymbolicOp op, NodeId term) {
    const auto isPlain = [](const ExprReader::Product& p) {
        return p.coefficient.sign() > 0 && !p.hasDoubles && !p.hasQuotients;
    };
    const ExprReader::Product added = reader_.simplifiedTerm(term);
    if (isSum(store_.op(term)) || store_.op(term) == SymbolicOp::DoubleValue || !isPlain(added)) return noNode;
    const auto orderOf = [&](const ExprReader::Product& other) {
        return Polynomial::compareMonomials(Polynomial::degreeOf(other.atoms()), other.atoms(),
                                            Polynomial::degreeOf(added.atoms()), added.atoms());
    };
    behind_.clear();
    SymbolicOp behindFirst = SymbolicOp::Plus;
    while (isSum(store_.op(sum))) {
        behindFirst = store_.op(sum);
        const bool isPair = !isSum(store_.op(store_.operand(sum, 0)));
        if (isPair && behindFirst == SymbolicOp::Minus) return noNode;
        const ExprReader::Product last = reader_.simplifiedTerm(store_.operand(sum, 1));
        const int order = orderOf(last);
        if (!isPlain(last) || order == 0) return noNode;
        if (order < 0) break;
        behind_.emplace_back(behindFirst, store_.operand(sum, 1));
        sum = store_.operand(sum, 0);
    }
    if (isSum(store_.op(sum))) {
        sum = store_.binary(op, sum, term);
    } else {
        const ExprReader::Product first = reader_.simplifiedTerm(sum);
        const int order = orderOf(first);
        if (!isPlain(first) || first.factors.empty() || order == 0) return noNode; // also a number of several values
        const bool isInFront = order > 0 && op == SymbolicOp::Plus; // a negative one changes places again
        sum = isInFront ? store_.binary(op, term, sum) : store_.binary(op, sum, term);
    }
    for (std::size_t i = behind_.size(); i-- > 0;)
        sum = store_.binary(behind_[i].first, sum, behind_[i].second);
    return sum;
}

NodeId Simplifier::withFactor(NodeId product, NodeId factor) const {
    if (store_.op(factor) == SymbolicOp::Multiply || store_.op(store_.operand(product, 1)) == SymbolicOp::Multiply)
        return noNode;
    const auto soleFactor = [&](NodeId id) {
        const ExprReader::Product p = reader_.simplifiedTerm(id);
        const bool isSole = p.coefficient.isOne() && p.factors.size() == 1 && !p.hasDoubles;
        return isSole && !isArithmetic(store_.op(p.factors[0].atom)) ? p.factors[0].atom : noNode;
    };
    const NodeId last = soleFactor(store_.operand(product, 1));
    const NodeId added = soleFactor(factor);
    if (last == noNode || added == noNode || last >= added) return noNode;
    return store_.binary(SymbolicOp::Multiply, product, factor);
}

bool Simplifier::hasWork(NodeId id) const { return store_.numOperands(id) != 0 && store_.simplified(id) == noNode; }

// Read as it was written: what stands in it without having been multiplied out or added up is an atom.
Value Simplifier::simplifiedValue(NodeId id) {
    const SymbolicOp op = store_.op(id);
    if (!isArithmetic(op)) return arithmetic_.leaf(id);
    const bool isQuotient = op == SymbolicOp::Divide && !reader_.isZero(store_.operand(id, 1));
    ExprReader::Sum above = reader_.simplifiedSum(isQuotient ? store_.operand(id, 0) : id);
    Value value = arithmetic_.polynomial(std::move(above.polynomial));
    value.hasDoubles = above.hasDoubles;
    value.hasOpaqueQuotient = above.hasQuotients;
    if (!isQuotient) return value;
    ExprReader::Sum below = reader_.simplifiedSum(store_.operand(id, 1));
    value.denominator = std::move(below.polynomial);
    value.hasDoubles |= below.hasDoubles;
    value.hasOpaqueQuotient |= below.hasQuotients;
    return value;
}

void Simplifier::forgetWalk() {
    emptied(entries_);
    emptied(order_);
    emptied(values_);
    emptied(freeValues_);
}

void Simplifier::listEntries(NodeId root) {
    slots_.begin(store_.size());
    std::vector<std::pair<std::uint32_t, std::uint32_t>> open; // an entry and the index of its next operand
    const auto enter = [&](NodeId id) {
        std::uint32_t index = slots_.get(id);
        if (index != NodeSlots::none) return index;
        index = static_cast<std::uint32_t>(entries_.size());
        slots_.set(id, index);
        entries_.push_back({id});
        entries_.back().isEntered = hasWork(id);
        if (entries_.back().isEntered)
            open.push_back({index, 0});
        else
            order_.push_back(index);
        return index;
    };
    enter(root);
    while (!open.empty()) {
        auto& [index, next] = open.back();
        const NodeId id = entries_[index].id;
        if (next == store_.numOperands(id)) {
            order_.push_back(index);
            open.pop_back();
            continue;
        }
        Entry& used = entries_[enter(known(store_.operand(id, next++)))];
        ++used.numUses;
        used.isUsedByLikeOnly = used.isUsedByLikeOnly && store_.op(used.id) == store_.op(id);
    }
}

// The inside of min(min(a, b), c): the outermost minimum takes all its parts at once.
bool Simplifier::isInnerPart(const Entry& entry) const {
    return entry.isEntered && entry.numUses == 1 && entry.isUsedByLikeOnly &&
           SimplifyLaws::isLattice(store_.op(entry.id));
}

Simplifier::Entry& Simplifier::entryOf(NodeId operand) {
    const std::uint32_t index = slots_.get(operand);
    return entries_[index != NodeSlots::none ? index : slots_.get(store_.simplified(operand))];
}

std::uint32_t Simplifier::stored(Value value) {
    if (freeValues_.empty()) {
        values_.push_back(std::move(value));
        return static_cast<std::uint32_t>(values_.size() - 1);
    }
    const std::uint32_t index = freeValues_.back();
    freeValues_.pop_back();
    values_[index] = std::move(value);
    return index;
}

// The value of an operand; it is handed over at its last use.
Value Simplifier::take(NodeId operand) {
    Entry& entry = entryOf(operand);
    Value& value = values_[entry.value];
    if (--entry.numUses > 0) return value;
    freeValues_.push_back(entry.value);
    return std::move(value);
}

Value Simplifier::evaluate(const Entry& entry) {
    const NodeId id = entry.id;
    if (!entry.isEntered) {
        if (store_.simplified(id) == noNode) store_.setSimplified(id, id);
        return simplifiedValue(id);
    }
    const SymbolicOp op = store_.op(id);
    switch (op) {
    case SymbolicOp::UnaryMinus:
        return arithmetic_.negate(take(store_.operand(id, 0)));
    case SymbolicOp::Plus:
    case SymbolicOp::Minus: {
        Value left = take(store_.operand(id, 0));
        return arithmetic_.add(std::move(left), take(store_.operand(id, 1)), op == SymbolicOp::Minus);
    }
    case SymbolicOp::Multiply: {
        if (store_.operand(id, 0) == store_.operand(id, 1)) {
            --entryOf(store_.operand(id, 0)).numUses; // two at once
            return arithmetic_.square(take(store_.operand(id, 0)));
        }
        Value left = take(store_.operand(id, 0));
        return arithmetic_.multiply(std::move(left), take(store_.operand(id, 1)));
    }
    case SymbolicOp::Divide: {
        Value left = take(store_.operand(id, 0));
        return arithmetic_.divide(std::move(left), take(store_.operand(id, 1)));
    }
    case SymbolicOp::Power:
        return evaluatePower(id);
    default:
        return evaluateOther(id);
    }
}

Value Simplifier::evaluateOther(NodeId id) {
    const SymbolicOp op = store_.op(id);
    Value result;
    if (SimplifyLaws::isLattice(op)) {
        result = evaluateLattice(id);
    } else {
        std::vector<Value> operands;
        for (std::size_t i = 0; i < store_.numOperands(id); ++i) {
            operands.push_back(take(store_.operand(id, i)));
            if (store_.simplified(store_.operand(id, i)) == noNode) written(store_.operand(id, i), operands.back());
        }
        result = laws_.apply(op, operands);
    }
    remember(id, arithmetic_.write(result));
    return result;
}

Value Simplifier::evaluatePower(NodeId id) {
    Value base = take(store_.operand(id, 0));
    Value exponent = take(store_.operand(id, 1));
    arithmetic_.settle(exponent);
    if (!base.floating && exponent.isNumber() && arithmetic_.isInteger(exponent)) {
        arithmetic_.settleAsPolynomials(exponent);
        const Integer times = exponent.numerator.constant();
        if (times.numBits() <= 53) return arithmetic_.power(std::move(base), *times.get());
    }
    std::vector<Value> operands;
    operands.push_back(std::move(base));
    operands.push_back(std::move(exponent));
    return laws_.apply(SymbolicOp::Power, operands);
}

Value Simplifier::evaluateLattice(NodeId id) {
    std::vector<NodeId> operands;
    std::vector<NodeId> open = {id};
    while (!open.empty()) {
        const NodeId part = open.back();
        open.pop_back();
        for (std::size_t i = 0; i < store_.numOperands(part); ++i) {
            const NodeId operand = store_.operand(part, i);
            if (isInnerPart(entryOf(operand))) {
                open.push_back(entryOf(operand).id);
            } else {
                Value value = take(operand);
                operands.push_back(store_.simplified(operand) == noNode ? written(operand, value)
                                                                        : store_.simplified(operand));
            }
        }
    }
    return laws_.applyLattice(store_.op(id), std::move(operands));
}

std::size_t Simplifier::sizeInMemory() const {
    return slots_.sizeInMemory() + entries_.capacity() * sizeof(Entry) +
           (order_.capacity() + freeValues_.capacity()) * sizeof(std::uint32_t) + values_.capacity() * sizeof(Value) +
           behind_.capacity() * sizeof(behind_[0]);
}

SymbolicExprSimplify::SymbolicExprSimplify(SymbolicExprTable& table, int, bool) : table_(table) {}

unsigned long SymbolicExprSimplify::simplify(unsigned long exprId, unsigned long&) {
    return table_.simplifier().simplify(nodeIdOf(exprId));
}

} // namespace QL
