#include "qlplatform/symbolic/Simplifier_internal.h"

#include <algorithm>

#include "qlplatform/symbolic/SymbolicExprSimplify.h"

namespace QL {
namespace {

bool isArithmetic(SymbolicOp op) {
    switch (op) {
    case SymbolicOp::UnaryMinus:
    case SymbolicOp::Plus:
    case SymbolicOp::Minus:
    case SymbolicOp::Multiply:
    case SymbolicOp::Divide:
    case SymbolicOp::Power:
        return true;
    default:
        return false;
    }
}

bool isSum(SymbolicOp op) { return op == SymbolicOp::Plus || op == SymbolicOp::Minus; }

bool isNumber(SymbolicOp op) { return op == SymbolicOp::IntValue || op == SymbolicOp::DoubleValue; }

// A simplified product of atoms with no number but a positive one in front, as factors.
bool readFactors(const NodeStore& store, NodeId product, std::vector<Factor>& factors) {
    std::vector<NodeId> parts;
    for (; store.op(product) == SymbolicOp::Multiply; product = store.operand(product, 0))
        parts.push_back(store.operand(product, 1));
    parts.push_back(product);
    for (std::size_t i = parts.size(); i-- > 0;) {
        NodeId atom = parts[i];
        std::uint64_t exponent = 1;
        if (i + 1 == parts.size() && parts.size() > 1 && store.op(atom) == SymbolicOp::IntValue) {
            if (store.intValue(atom) < 0) return false;
            continue;
        }
        if (store.op(atom) == SymbolicOp::Power && store.op(store.operand(atom, 1)) == SymbolicOp::IntValue) {
            exponent = static_cast<std::uint64_t>(store.intValue(store.operand(atom, 1)));
            atom = store.operand(atom, 0);
        }
        if (isArithmetic(store.op(atom)) || isNumber(store.op(atom))) return false;
        if (!factors.empty() && factors.back().atom == atom)
            factors.back().exponent += exponent;
        else
            factors.push_back({atom, exponent});
    }
    return true;
}

// Of the values that are kept from call to call.
constexpr std::size_t maxRecent = 1024;
constexpr std::size_t maxRecentTerms = 16;
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

const Value* Simplifier::recent(NodeId id) const {
    if (recent_.empty()) return nullptr;
    const Recent& slot = recent_[id & (recent_.size() - 1)];
    return slot.id == id ? &slot.value : nullptr;
}

// Keeps a settled value that reading its expression again would give: a small one without an expression among its
// atoms.
void Simplifier::keep(NodeId id, const Value& value) {
    if (value.floating || value.hasDoubles || !isArithmetic(store_.op(id))) return;
    for (const Polynomial* p : {&value.numerator, value.denominator.get()}) {
        if (!p) continue;
        if (p->terms().size() > maxRecentTerms) return;
        for (const auto& t : p->terms()) {
            if (t.numFactors > maxRecentTerms) return;
            for (const Factor& f : p->factors(t))
                if (isArithmetic(store_.op(f.atom))) return;
        }
    }
    if (recent_.size() < maxRecent && recent_.size() * 8 < store_.size())
        recent_ = std::vector<Recent>(std::max<std::size_t>(16, recent_.size() * 2));
    Recent& slot = recent_[id & (recent_.size() - 1)];
    slot.id = id;
    slot.value = value;
}

NodeId Simplifier::writeAndKeep(NodeId id, Value& value) {
    const NodeId form = arithmetic_.write(value);
    remember(id, form);
    keep(form, value);
    return store_.simplified(id);
}

NodeId Simplifier::simplify(NodeId root) {
    if (store_.simplified(root) != noNode) return store_.simplified(root);
    if (const NodeId form = appended(root); form != noNode) {
        remember(root, form);
        return store_.simplified(root);
    }
    forgetWalk(); // of a call that ended early
    listEntries(root);
    for (const std::uint32_t index : order_)
        if (!isInnerPart(entries_[index])) entries_[index].value = stored(evaluate(entries_[index]));
    const NodeId form = writeAndKeep(root, values_[entries_[order_.back()].value]);
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

// A sum or product that only grows at its end is the commonest case of all, and costs as much as its last part.
NodeId Simplifier::appended(NodeId root) {
    const SymbolicOp op = store_.op(root);
    if (!isSum(op) && op != SymbolicOp::Multiply) return noNode;
    const NodeId left = store_.simplified(store_.operand(root, 0));
    if (left == noNode || (isSum(op) ? !isSum(store_.op(left)) : store_.op(left) != SymbolicOp::Multiply))
        return noNode;
    const NodeId added = atHand(store_.operand(root, 1));
    if (added == noNode) return noNode;
    return isSum(op) ? appendedTerm(op, left, added) : appendedFactor(left, added);
}

// Three terms at least: the first two may have changed places. A number stays the last term.
NodeId Simplifier::appendedTerm(SymbolicOp op, NodeId sum, NodeId term) const {
    if (!isSum(store_.op(sum)) || !isSum(store_.op(store_.operand(sum, 0)))) return noNode;
    if (isNumber(store_.op(store_.operand(sum, 1))) && !isNumber(store_.op(term))) {
        const NodeId inner = appendedTerm(op, store_.operand(sum, 0), term);
        return inner == noNode ? noNode : store_.binary(store_.op(sum), inner, store_.operand(sum, 1));
    }
    std::vector<Factor> last;
    std::vector<Factor> added;
    if (!readFactors(store_, store_.operand(sum, 1), last) || !readFactors(store_, term, added)) return noNode;
    const int order =
        Polynomial::compareMonomials(Polynomial::degreeOf(last), last, Polynomial::degreeOf(added), added);
    return order < 0 ? store_.binary(op, sum, term) : noNode;
}

NodeId Simplifier::appendedFactor(NodeId product, NodeId factor) const {
    if (store_.op(product) != SymbolicOp::Multiply) return noNode;
    std::vector<Factor> added;
    std::vector<Factor> last;
    if (store_.op(factor) == SymbolicOp::Multiply || !readFactors(store_, factor, added)) return noNode;
    const NodeId end = store_.operand(product, 1);
    if (store_.op(end) == SymbolicOp::Multiply || !readFactors(store_, end, last)) return noNode;
    return last[0].atom < added[0].atom ? store_.binary(SymbolicOp::Multiply, product, factor) : noNode;
}

bool Simplifier::hasWork(NodeId id) const {
    if (store_.numOperands(id) == 0) return false;
    return store_.simplified(id) == noNode || (isArithmetic(store_.op(id)) && !recent(id));
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

// The value of a factor. A sum inside a product that is simplified has not been multiplied out, and is not now.
Value Simplifier::takeFactor(NodeId product, NodeId factor) {
    Value value = take(factor);
    if (store_.simplified(product) != product || !isSum(store_.op(factor))) return value;
    arithmetic_.settle(value);
    return value.isNumber() ? value : arithmetic_.polynomial(Polynomial(factor));
}

Value Simplifier::evaluate(const Entry& entry) {
    const NodeId id = entry.id;
    if (!entry.isEntered) {
        if (const Value* kept = recent(id)) return *kept;
        if (store_.simplified(id) == noNode) store_.setSimplified(id, id);
        return arithmetic_.leaf(id);
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
            return arithmetic_.square(takeFactor(id, store_.operand(id, 0)));
        }
        Value left = takeFactor(id, store_.operand(id, 0));
        return arithmetic_.multiply(std::move(left), takeFactor(id, store_.operand(id, 1)));
    }
    case SymbolicOp::Divide:
        return evaluateQuotient(id);
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
            if (store_.simplified(store_.operand(id, i)) == noNode)
                writeAndKeep(store_.operand(id, i), operands.back());
        }
        result = laws_.apply(op, operands);
    }
    remember(id, arithmetic_.write(result));
    return result;
}

Value Simplifier::evaluateQuotient(NodeId id) {
    Value left = take(store_.operand(id, 0));
    Value right = take(store_.operand(id, 1));
    if (store_.simplified(id) == id && left.isPolynomial() && right.isPolynomial()) {
        arithmetic_.settle(right);
        if (!right.isZero()) return arithmetic_.reducedQuotient(std::move(left), std::move(right));
    }
    return arithmetic_.divide(std::move(left), std::move(right));
}

Value Simplifier::evaluatePower(NodeId id) {
    Value base = takeFactor(id, store_.operand(id, 0));
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
                operands.push_back(store_.simplified(operand) == noNode ? writeAndKeep(operand, value)
                                                                        : store_.simplified(operand));
            }
        }
    }
    return laws_.applyLattice(store_.op(id), std::move(operands));
}

std::size_t Simplifier::sizeInMemory() const {
    return slots_.sizeInMemory() + entries_.capacity() * sizeof(Entry) +
           (order_.capacity() + freeValues_.capacity()) * sizeof(std::uint32_t) + values_.capacity() * sizeof(Value) +
           recent_.capacity() * sizeof(Recent);
}

SymbolicExprSimplify::SymbolicExprSimplify(SymbolicExprTable& table, int, bool) : table_(table) {}

unsigned long SymbolicExprSimplify::simplify(unsigned long exprId, unsigned long&) {
    return table_.simplifier().simplify(nodeIdOf(exprId));
}

} // namespace QL
