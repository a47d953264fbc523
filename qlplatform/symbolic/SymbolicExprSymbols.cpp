#include "qlplatform/symbolic/SymbolicExprSymbols.h"

#include "qlplatform/symbolic/NodeStore_internal.h"

namespace QL {

void SymbolicExprSymbols::getSymbols(unsigned long exprId, std::vector<unsigned long>& ids) const {
    NodeStore& store = table_.nodes();
    NodeSlots& seen = store.slots();
    seen.begin(store.size());
    std::vector<NodeId> open = {nodeIdOf(exprId)};
    while (!open.empty()) {
        const NodeId id = open.back();
        open.pop_back();
        if (seen.get(id) != NodeSlots::none) continue;
        seen.set(id, 0);
        if (store.op(id) == SymbolicOp::StringSymbol) ids.push_back(id);
        for (std::size_t i = store.numOperands(id); i-- > 0;)
            open.push_back(store.operand(id, i));
    }
}

void SymbolicExprSymbols::getSymbols(unsigned long exprId, std::vector<std::string>& names) const {
    std::vector<unsigned long> ids;
    getSymbols(exprId, ids);
    for (const unsigned long id : ids)
        names.push_back(table_.nodes().name(nodeIdOf(id)));
}

} // namespace QL
