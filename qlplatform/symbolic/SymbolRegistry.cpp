#include "qlplatform/symbolic/SymbolRegistry.h"

#include "qlplatform/symbolic/SymbolicExprSymbols.h"

namespace QL {

SymbolRegistry::SymbolRegistry(SymbolDomain domain) : domain_(domain) { makeExprTable(); }
SymbolRegistry::~SymbolRegistry() = default;

void SymbolRegistry::dropExprTable() { exprTable_.reset(); }
void SymbolRegistry::makeExprTable() { exprTable_ = std::make_unique<SymbolicExprTable>(domain_); }

SymbolRegistry::Registration SymbolRegistry::registerSymbolicTExpr(const std::string&, const QLBlock*, const QlDims&) {
    return {SymbolicExprTable::noExpr, nullptr};
}

SymbolRegistry::Registration SymbolRegistry::registerSymbolicTExpr(const std::u16string&, const QLRootBD*, QlWorkspace*,
                                                                   QlEvalClient*, std::vector<double>&) {
    return {SymbolicExprTable::noExpr, nullptr};
}

SymbolRegistry::Registration SymbolRegistry::registerSymbolicTExpr(const std::u16string&, SymbolValidator&,
                                                                   std::vector<double>&) {
    return {SymbolicExprTable::noExpr, nullptr};
}

void SymbolRegistry::getSymbolsFromExpressionId(unsigned long exprId, std::vector<std::string>& names) const {
    SymbolicExprSymbols(*exprTable_).getSymbols(exprId, names);
}

void SymbolRegistry::addSymbolDataTypeInformation(const std::string&, int) {}

std::optional<unsigned long> SymbolRegistry::convertExprId2ValidSymbolicId(unsigned long exprId) const {
    if (exprTable_ && exprId < exprTable_->getNumExprs()) return exprId;
    return std::nullopt;
}

} // namespace QL
