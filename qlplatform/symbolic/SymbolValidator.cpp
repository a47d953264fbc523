#include "qlplatform/symbolic/SymbolValidator.h"

namespace QL {

SymbolValidator::~SymbolValidator() = default;

SymbolRecord SymbolValidator::resolveSymbol(const std::string&, const char*, unsigned long) { return {}; }
SymbolRecord SymbolValidator::resolveSymbol(const std::string&, const char*, unsigned long, SymbolRegistry*) {
    return {};
}
void SymbolValidator::reportLossOfSymbolicDimensions(qlsvDiagnosticImpl*&, unsigned long) {}
const SymbolRegistry* SymbolValidator::getParameterSymbolicExprTable() const { return nullptr; }
SymbolRegistry* SymbolValidator::getParameterSymbolicExprTable() { return nullptr; }

} // namespace QL
