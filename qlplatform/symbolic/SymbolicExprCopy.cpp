// Rebuilding of expressions, operands first: copies into another table, translations inside one.
#include "qlplatform/symbolic/SymbolicExprCopy.h"

#include "qlplatform/symbolic/NodeStore_internal.h"
#include "qlplatform/symbolic/SymbolicExprTranslate.h"

namespace QL {
namespace {

NodeId copyTerminal(const NodeStore& from, NodeId id, NodeStore& to) {
    switch (from.op(id)) {
    case SymbolicOp::StringSymbol:
        return to.symbol(from.name(id));
    case SymbolicOp::IntValue:
        return to.integer(from.intValue(id));
    case SymbolicOp::DoubleValue:
        return to.floating(from.doubleValue(id));
    case SymbolicOp::BoolSymbol:
        return to.boolean(from.boolValue(id));
    default:
        return to.node(from.op(id), {}); // an empty list
    }
}

// Makes `root` of one store anew in another, which may be the same, with each operator put through `renamed`.
template <class Renamed> NodeId rebuilt(NodeStore& from, NodeId root, NodeStore& to, Renamed&& renamed) {
    const std::vector<NodeId> order = postOrder(from, root);
    std::vector<NodeId> copies;
    std::vector<NodeId> operands;
    copies.reserve(order.size());
    for (const NodeId id : order) {
        operands.clear();
        for (std::size_t i = 0; i < from.numOperands(id); ++i)
            operands.push_back(copies[from.slots().get(from.operand(id, i))]);
        from.slots().set(id, static_cast<std::uint32_t>(copies.size()));
        copies.push_back(operands.empty() ? copyTerminal(from, id, to) : to.node(renamed(from.op(id)), operands));
    }
    return copies.back();
}

unsigned long translated(const SymbolicExprTable& table, unsigned long exprId, SymbolicOp before, SymbolicOp after) {
    NodeStore& store = table.nodes();
    return rebuilt(store, nodeIdOf(exprId), store, [&](SymbolicOp op) { return op == before ? after : op; });
}

} // namespace

unsigned long SymbolicExprCopy::copy(unsigned long exprId) const {
    return rebuilt(from_.nodes(), nodeIdOf(exprId), to_.nodes(), [](SymbolicOp op) { return op; });
}

unsigned long SymbolicExprT2C::operator()(unsigned long exprId) const {
    return translated(table_, exprId, SymbolicOp::Rem, SymbolicOp::Modulo);
}

unsigned long SymbolicExprC2T::operator()(unsigned long exprId) const {
    return translated(table_, exprId, SymbolicOp::Modulo, SymbolicOp::Rem);
}

} // namespace QL
