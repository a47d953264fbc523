#include "qlplatform/symbolic/SymbolicExprFactorDivision.h"

#include "qlplatform/symbolic/NodeStore_internal.h"

namespace QL {
namespace {

struct Quotient {
    NodeId above;
    NodeId below = noNode; // none: no division
};

class Factoring {
  public:
    explicit Factoring(NodeStore& store) : store_(store) {}

    NodeId factored(NodeId root) {
        NodeSlots& slots = store_.slots();
        std::vector<Quotient> quotients;
        for (const NodeId id : postOrder(store_, root, slots, [this](NodeId n) { return isEntered(n); })) {
            Quotient q{id};
            if (isEntered(id)) {
                const Quotient left = quotients[slots.get(store_.operand(id, 0))];
                const Quotient right = store_.op(id) == SymbolicOp::UnaryMinus || store_.op(id) == SymbolicOp::Power
                                           ? Quotient{store_.operand(id, store_.numOperands(id) - 1)}
                                           : quotients[slots.get(store_.operand(id, 1))];
                q = combined(id, left, right);
            }
            slots.set(id, static_cast<std::uint32_t>(quotients.size()));
            quotients.push_back(q);
        }
        const Quotient whole = quotients.back();
        return whole.below == noNode ? whole.above : store_.binary(SymbolicOp::Divide, whole.above, whole.below);
    }

  private:
    bool isEntered(NodeId id) const {
        switch (store_.op(id)) {
        case SymbolicOp::UnaryMinus:
        case SymbolicOp::Plus:
        case SymbolicOp::Minus:
        case SymbolicOp::Multiply:
        case SymbolicOp::Divide:
            return true;
        case SymbolicOp::Power: {
            const NodeId exponent = store_.operand(id, 1);
            return store_.op(exponent) == SymbolicOp::IntValue && store_.intValue(exponent) > 0;
        }
        default:
            return false;
        }
    }

    NodeId product(NodeId a, NodeId b) {
        if (a == noNode) return b;
        return b == noNode ? a : store_.binary(SymbolicOp::Multiply, a, b);
    }

    Quotient combined(NodeId id, Quotient left, Quotient right) {
        const SymbolicOp op = store_.op(id);
        if (op == SymbolicOp::Divide) return {product(left.above, right.below), product(left.below, right.above)};
        if (left.below == noNode && right.below == noNode) return {id};
        switch (op) {
        case SymbolicOp::UnaryMinus:
            return {store_.unary(op, left.above), left.below};
        case SymbolicOp::Power:
            return {store_.binary(op, left.above, right.above), store_.binary(op, left.below, right.above)};
        case SymbolicOp::Multiply:
            return {product(left.above, right.above), product(left.below, right.below)};
        default: // a sum or a difference
            if (left.below == right.below) return {store_.binary(op, left.above, right.above), left.below};
            return {store_.binary(op, product(left.above, right.below), product(right.above, left.below)),
                    product(left.below, right.below)};
        }
    }

    NodeStore& store_;
};

} // namespace

unsigned long SymbolicExprFactorDivision::factorDivision(unsigned long exprId) {
    return Factoring(table_.nodes()).factored(nodeIdOf(exprId));
}

} // namespace QL
