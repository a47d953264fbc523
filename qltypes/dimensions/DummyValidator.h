// The validator of texts that are only read, and bound to nothing.
#pragma once

#include <string>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolValidator.h"

namespace QLTypeSys {

/// Every identifier stands for the symbol of its name, without a value.
class QL_EXPORT DummyValidator : public QL::SymbolValidator {
  public:
    using SymbolValidator::resolveSymbol;
    QL::SymbolRecord resolveSymbol(const std::string& name, const char* text, unsigned long position) override;
};

} // namespace QLTypeSys
