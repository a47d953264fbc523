// The simplifier of one table: the walk over an expression, and what is kept from one call to the next. Values are in
// Rational_internal.h, the laws of the operators that are not arithmetic in SimplifyLaws_internal.h.
#pragma once

#include <vector>

#include "qlplatform/symbolic/ExprReader_internal.h"
#include "qlplatform/symbolic/Rational_internal.h"
#include "qlplatform/symbolic/SimplifyLaws_internal.h"

namespace QL {

class Simplifier {
  public:
    explicit Simplifier(NodeStore& store) : store_(store), reader_(store), arithmetic_(store), laws_(arithmetic_) {}

    NodeId simplify(NodeId root);

    std::size_t sizeInMemory() const;

  private:
    static constexpr std::uint32_t noValue = ~std::uint32_t{0};

    // A node of the walk.
    struct Entry {
        NodeId id;
        std::uint32_t value = noValue; // index in values_
        std::uint32_t numUses = 0;     // by entries that are still to be evaluated
        bool isEntered = false;        // its operands are walked
        bool isUsedByLikeOnly = true;  // every user has the same operator
    };

    // The form of a node that the walk goes on with: simplified where that is known.
    NodeId known(NodeId id) const { return store_.simplified(id) == noNode ? id : store_.simplified(id); }
    void remember(NodeId id, NodeId form);
    NodeId written(NodeId id, Value& value);

    NodeId atHand(NodeId id);
    NodeId extended(NodeId root);
    NodeId withTerm(NodeId sum, SymbolicOp op, NodeId term);
    NodeId withFactor(NodeId product, NodeId factor) const;

    bool hasWork(NodeId id) const;
    Value simplifiedValue(NodeId id);
    void listEntries(NodeId root);
    bool isInnerPart(const Entry& entry) const;
    Entry& entryOf(NodeId operand);
    std::uint32_t stored(Value value);
    Value take(NodeId operand);
    void forgetWalk();

    Value evaluate(const Entry& entry);
    Value evaluatePower(NodeId id);
    Value evaluateOther(NodeId id);
    Value evaluateLattice(NodeId id);

    NodeStore& store_;
    ExprReader reader_;
    RationalArithmetic arithmetic_;
    SimplifyLaws laws_;
    NodeSlots slots_; // of the walk: entries by node
    std::vector<Entry> entries_;
    std::vector<std::uint32_t> order_; // entries, operands before their users
    std::vector<Value> values_;
    std::vector<std::uint32_t> freeValues_;
    std::vector<std::pair<SymbolicOp, NodeId>> behind_; // what follows the place of a term in a sum, last first
};

} // namespace QL
