#include "qltypes/dimensions/ParamSymbolicExprTable.h"

#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprPrinter.h"
#include "qltypes/host/Assert_internal.h"

namespace QLTypeSys {

ParamSymbolicExprTable::ParamSymbolicExprTable() : SymbolRegistry(QL::SymbolDomain::Numbers) {}
ParamSymbolicExprTable::~ParamSymbolicExprTable() = default;

void ParamSymbolicExprTable::addSymbolDataTypeInformation(const std::string& name, int dataTypeId) {
    dataTypeIds_.try_emplace(name, dataTypeId);
}

ParamSymbolicExprTable* ParamSymbolicExprTable::CreateParamSymbolicExprTable(QLRootBD*) const { return nullptr; }

int ParamSymbolicExprTable::findDataTypeId(const std::string& name) const {
    constexpr int unknown = -10;
    const auto found = dataTypeIds_.find(name);
    return found == dataTypeIds_.end() ? unknown : found->second;
}

QL::SymbolicExpr ParamSymbolicExprTable::get(unsigned long exprId) const {
    QLTYPES_ASSERT(exprId < getExprTable().getNumExprs());
    return getExprTable().get(exprId);
}

std::string ParamSymbolicExprTable::getDisplayString(unsigned long exprId) const {
    const QL::SymbolicExprAliasPrinterPredicate aliases(getExprTable());
    return QL::SymbolicExprPrinter(getExprTable(), aliases, false, true, false, {})(get(exprId));
}

unsigned long ParamSymbolicExprTable::convertExprId2ValidExprId(unsigned long exprId) {
    return convertExprId2ValidSymbolicId(exprId).value_or(QL::SymbolicExprTable::noExpr);
}

} // namespace QLTypeSys
