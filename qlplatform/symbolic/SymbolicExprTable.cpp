#include "qlplatform/symbolic/SymbolicExprTable.h"

#include "qlplatform/symbolic/NodeStore_internal.h"
#include "qlplatform/symbolic/Simplifier_internal.h"
#include "qlplatform/symbolic/SymbolicExpr.h"

namespace QL {

SymbolicExprTable::SymbolicExprTable(SymbolDomain domain)
    : nodes_(std::make_unique<NodeStore>(domain)), simplifier_(std::make_unique<Simplifier>(*nodes_)) {}
SymbolicExprTable::~SymbolicExprTable() = default;

unsigned long SymbolicExprTable::getNumExprs() const { return nodes_->size(); }
SymbolDomain SymbolicExprTable::getDomain() const { return nodes_->domain(); }
SymbolicExpr SymbolicExprTable::get(unsigned long exprId) const { return {*this, exprId}; }

unsigned long SymbolicExprTable::addSymbol(const std::string& name) { return nodes_->symbol(name); }
unsigned long SymbolicExprTable::addInt(int value) { return nodes_->integer(value); }
unsigned long SymbolicExprTable::addDouble(double value) { return nodes_->floating(value); }
unsigned long SymbolicExprTable::addBool(bool value) { return nodes_->boolean(value); }

unsigned long SymbolicExprTable::add(SymbolicOp op, unsigned long operand) {
    return nodes_->unary(op, nodeIdOf(operand));
}

unsigned long SymbolicExprTable::add(SymbolicOp op, unsigned long left, unsigned long right) {
    return nodes_->binary(op, nodeIdOf(left), nodeIdOf(right));
}

unsigned long SymbolicExprTable::add(SymbolicOp op, std::span<const unsigned long> operands) {
    return nodes_->node(op, std::vector<NodeId>(operands.begin(), operands.end()));
}

void SymbolicExprTable::addBoolSymbols() {
    addBool(false);
    addBool(true);
}

unsigned long SymbolicExprTable::registerValueId(const std::string& name, unsigned long valueId) {
    const NodeId symbol = nodes_->symbol(name);
    nodes_->setValue(symbol, nodeIdOf(valueId));
    return symbol;
}

unsigned long SymbolicExprTable::getValueId(unsigned long symbolId) const {
    const NodeId value = nodes_->value(nodeIdOf(symbolId));
    return value == noNode ? noExpr : value;
}

void SymbolicExprTable::lookup(SymbolicOp op, std::vector<unsigned long>& ids) const {
    ids.clear();
    for (NodeId id = 0; id < nodes_->size(); ++id)
        if (nodes_->op(id) == op) ids.push_back(id);
}

std::size_t SymbolicExprTable::sizeInMemory() const { return nodes_->sizeInMemory() + simplifier_->sizeInMemory(); }

SymbolicOp SymbolicExpr::getOp() const { return table_->nodes().op(nodeIdOf(id_)); }
std::size_t SymbolicExpr::getNumOperands() const { return table_->nodes().numOperands(nodeIdOf(id_)); }
unsigned long SymbolicExpr::getOperand(std::size_t index) const {
    return table_->nodes().operand(nodeIdOf(id_), index);
}
const std::string& SymbolicExpr::getName() const { return table_->nodes().name(nodeIdOf(id_)); }
int SymbolicExpr::getIntValue() const { return table_->nodes().intValue(nodeIdOf(id_)); }
double SymbolicExpr::getDoubleValue() const { return table_->nodes().doubleValue(nodeIdOf(id_)); }
bool SymbolicExpr::getBoolValue() const { return table_->nodes().boolValue(nodeIdOf(id_)); }

} // namespace QL
