// One simplification: the walk over the expression. Values are in Rational_internal.h, the laws of the operators that
// are not arithmetic in SimplifyLaws_internal.h.
#pragma once

#include <vector>

#include "qlplatform/symbolic/Rational_internal.h"
#include "qlplatform/symbolic/SimplifyLaws_internal.h"

namespace QL {

class Simplifier {
  public:
    explicit Simplifier(NodeStore& store)
        : store_(store), slots_(store.simplifierSlots()), arithmetic_(store), laws_(arithmetic_) {}

    /// The simplified form of a node whose form is not known yet.
    NodeId simplify(NodeId root);

  private:
    static constexpr std::uint32_t noValue = ~std::uint32_t{0};
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

    NodeId appended(NodeId root) const;
    NodeId appendedTerm(SymbolicOp op, NodeId sum, NodeId term) const;
    NodeId appendedFactor(NodeId product, NodeId factor) const;

    bool hasWork(NodeId id) const;
    void listEntries(NodeId root);
    bool isInnerPart(const Entry& entry) const;
    Entry& entryOf(NodeId operand);
    Value take(NodeId operand);

    Value evaluate(const Entry& entry);
    Value evaluateOther(NodeId id);
    Value evaluatePower(NodeId id);
    Value evaluateQuotient(NodeId id);
    Value evaluateLattice(NodeId id);

    NodeStore& store_;
    NodeSlots& slots_;
    RationalArithmetic arithmetic_;
    SimplifyLaws laws_;
    std::vector<Entry> entries_;
    std::vector<std::uint32_t> order_; // entries, operands before their users
    std::vector<Value> values_;
    std::vector<std::uint32_t> freeValues_;
};

} // namespace QL
