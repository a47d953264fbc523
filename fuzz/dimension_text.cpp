// Dimensions from text: never crashes, gives an expression of the table or none, points into the text with whatever it
// complains about, and gives the same the second time.
//
// The first byte says how many numeric dimensions there are; the rest is the text.
#include <algorithm>
#include <string>

#include "fuzz/Fuzz.h"
#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/strings/Strings.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"
#include "qltypes/dimensions/NumericDims.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

namespace {

class Dims : public QLTypeSys::NumericDims {
  public:
    explicit Dims(std::size_t numDims) : numDims_(numDims) {}
    std::size_t getNumDims() const override { return numDims_; }
    long getDim(std::size_t index) const override { return static_cast<long>(index) + 2; }

  private:
    std::size_t numDims_;
};

// Most names are symbols, some have a value, good or bad, and some are nothing.
class Validator : public QL::SymbolValidator {
  public:
    QL::SymbolRecord resolveSymbol(const std::string& name, const char*, unsigned long) override {
        const auto with = [&](txArray_tag* made) { return QL::SymbolRecord{{made, txDestroyArray}, name}; };
        switch (name.front()) {
        case 'b':
            return with(txCreateDoubleScalar(4));
        case 'c':
            return with(txCreateDoubleScalar(2.5));
        case 'd':
            return with(txCreateRow({1.0, 2.0}));
        case 'e':
            return with(txCreateString("text"));
        case 'f':
            return with(txCreateLogicalScalar(true));
        case 'g':
            return {nullptr, "b"};
        case 'h':
            return {};
        default:
            return {nullptr, name};
        }
    }
    using SymbolValidator::resolveSymbol;
};

// Every message has a text, and those with a marker line point to a byte of the text or to its end.
void checkDiagnostic(qlsvDiagnosticImpl* diagnostic, std::size_t size) {
    for (std::size_t i = 0; diagnostic && i < diagnostic->numItems(); ++i) {
        const resource_core::BaseMsgID& message = diagnostic->item(i);
        fuzz::claim(qlsvFindMessageText(message) != nullptr, "a message has a text");
        if (message.category == "Quillane:Language" || message.arguments.size() < 2) continue;
        const auto* marker = boost::get<std::string>(&message.arguments.back());
        if (!marker) continue; // the text and a number
        fuzz::claim(marker->ends_with('^') && marker->size() >= 2 && marker->size() <= size + 2,
                    "a marker is in the text");
    }
    qlsvDiscardDiagnostic(diagnostic);
}

template <class Register> void checkTwice(QLTypeSys::SymbolicDimsTable& table, std::size_t size, Register&& read) {
    const auto [first, diagnostic] = read();
    const std::size_t numExprs = table.getNumSymbolicDimss();
    fuzz::claim(first == QL::SymbolicExprTable::noExpr || first < numExprs, "an expression is one of the table");
    checkDiagnostic(diagnostic, size);
    const auto [second, repeated] = read();
    fuzz::claim(first == second && table.getNumSymbolicDimss() == numExprs, "a text gives the same the second time");
    checkDiagnostic(repeated, size);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) return 0;
    const Dims dims(data[0] % 5);
    std::string text(reinterpret_cast<const char*>(data) + 1, size - 1);
    QLTypeSys::SymbolicDimsTable table;
    Validator validator;
    checkTwice(table, text.size(), [&] { return table.registerSymbolicTExpr(text, dims, validator); });
    const std::u16string wide = qlsvUtf16FromUtf8(text);
    std::vector<double> values;
    checkTwice(table, text.size(), [&] { return table.registerSymbolicTExpr(wide, validator, values); });
    const auto checked = table.validateSymbolicDimsTExpr(wide, 1);
    fuzz::claim(checked.ok ? !checked.text.empty() : checked.diagnostic != nullptr, "a check answers or says why not");
    checkDiagnostic(checked.diagnostic, text.size());
    return 0;
}
