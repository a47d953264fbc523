// Dimensions are read from text as people write them; what cannot be read is pointed at.
#include <cstdio>
#include <map>

#include "qlplatform/arrays/HostArray.h"
#include "qlplatform/services/Diagnostics.h"
#include "qltypes/dimensions/NumericDims.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

// What the identifiers of a model's workspace stand for: a symbol with its value.
class Workspace : public QL::SymbolValidator {
  public:
    QL::SymbolRecord resolveSymbol(const std::string& name, const char*, unsigned long) override {
        const auto found = values.find(name);
        if (found == values.end()) return {}; // no symbol
        return {{txCreateDoubleScalar(found->second), txDestroyArray}, name};
    }
    using SymbolValidator::resolveSymbol;

    std::map<std::string, double> values{{"taps", 16}, {"frame", 256}, {"half", 0.5}};
};

// The dimensions of a signal, all of them numbers.
class SignalDims : public QLTypeSys::NumericDims {
  public:
    std::size_t getNumDims() const override { return 2; }
    long getDim(std::size_t index) const override { return index == 0 ? 271 : 2; }
};

int main() {
    QLTypeSys::SymbolicDimsTable table;
    Workspace workspace;
    for (const char* text : {"[frame+taps-1 2]", "[frame*half 2]", "[frame/taps, 2]", "[271 2]", "[frame 2"}) {
        auto [exprId, diagnostic] = table.registerSymbolicTExpr(text, SignalDims(), workspace);
        if (exprId == QL::SymbolicExprTable::noExpr)
            std::printf("%s gives no dimensions\n", text);
        else
            std::printf("%s is %s\n", text, table.getSymbolicDimsAt(exprId).toString().c_str());
        if (diagnostic) std::printf("%s\n", diagnostic->text().c_str());
        qlsvDiscardDiagnostic(diagnostic);
    }
    auto checked = table.validateSymbolicDimsTExpr(u"[2*frame - frame, 0]", 2);
    if (!checked.ok) std::printf("%s\n", checked.diagnostic->text().c_str());
    qlsvDiscardDiagnostic(checked.diagnostic);
}
