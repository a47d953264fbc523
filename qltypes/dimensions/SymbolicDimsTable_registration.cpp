// Dimensions from text.
#include <cmath>
#include <cstdlib>

#include <boost/lexical_cast.hpp>

#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/strings/Strings.h"
#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprParser.h"
#include "qlplatform/symbolic/SymbolicExprPrinter.h"
#include "qlplatform/symbolic/SymbolicExprTranslate.h"
#include "qltypes/dimensions/DummyValidator.h"
#include "qltypes/dimensions/ExprIds_internal.h"
#include "qltypes/dimensions/SymbolicDimsFromTParseTree.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "qltypes/host/Failure_internal.h"

namespace QLTypeSys {
namespace {

constexpr unsigned long noExpr = QL::SymbolicExprTable::noExpr;
constexpr unsigned long noSymbolicExprId = 1;
constexpr int unresolved = -2;

// Owns a diagnostic until it is handed out: what is called meanwhile may throw.
class Pending {
  public:
    explicit Pending(qlsvDiagnosticImpl* diagnostic) : diagnostic_(diagnostic) {}
    ~Pending() { qlsvDiscardDiagnostic(diagnostic_); }
    Pending(const Pending&) = delete;
    Pending& operator=(const Pending&) = delete;

    qlsvDiagnosticImpl*& get() { return diagnostic_; }
    qlsvDiagnosticImpl* release() { return std::exchange(diagnostic_, nullptr); }

  private:
    qlsvDiagnosticImpl* diagnostic_;
};

// 1st, 2nd, 3rd, 4th, 11th ...
std::string ordinal(std::size_t number) {
    const bool isTeen = number % 100 >= 10 && number % 100 <= 20;
    const std::size_t last = isTeen ? 0 : number % 10;
    return std::to_string(number) + (last == 1 ? "st" : last == 2 ? "nd" : last == 3 ? "rd" : "th");
}

bool isIntegerBelow(const QL::SymbolicExpr& expr, int limit) {
    return expr.getOp() == QL::SymbolicOp::IntValue && expr.getIntValue() < limit;
}

qlsvDiagnosticImpl* lessThanOne(std::size_t dimension, const std::u16string& text) {
    return qlsvCreateDiagnostic(Quillane::SymbolicDims::DimensionLessThanOne(ordinal(dimension), text), "");
}

// Without the dimensions of at most 1 at the end, of which two are kept.
unsigned long withoutTrailingOnes(QL::SymbolicExprTable& table, unsigned long exprId) {
    const QL::SymbolicExpr expr = table.get(exprId);
    const std::size_t numDimensions = expr.getNumDimensions();
    std::size_t numKept = numDimensions;
    while (numKept > 2 && isIntegerBelow(table.get(expr.getDimension(numKept - 1)), 2))
        --numKept;
    if (numKept == numDimensions) return exprId;
    std::vector<unsigned long> kept(numKept);
    for (std::size_t i = 0; i < numKept; ++i)
        kept[i] = expr.getDimension(i);
    return QL::SymbolicNDExpr(table, kept).getId(table);
}

} // namespace

SymbolicDimsTable::DimsRegistration SymbolicDimsTable::registerSymbolicDims(const char* text,
                                                                            QL::SymbolValidator& validator) {
    char* end = nullptr;
    std::strtol(text, &end, 0);
    // kept: what only strtol takes as a number, hexadecimal or empty or behind blanks, leaves as bad_lexical_cast
    if (*end == '\0') return {registerSymbolicDims(boost::lexical_cast<int>(text)), nullptr};
    const int id = SymbolicDimsString(this, text).getId();
    symbolsRegistered_ = true;
    qlsvDiagnosticImpl* const diagnostic = registerSymbolicIdValues(id, validator);
    return {diagnostic ? unresolved : id, diagnostic};
}

SymbolicDimsTable::DimsRegistration SymbolicDimsTable::registerSymbolicDimsExpr(const char* text,
                                                                                QL::SymbolValidator& validator) {
    symbolsRegistered_ = true;
    const auto [exprId, refusal] = QL::SymbolicExprParser(getExprTable(), false, true)(text);
    if (refusal) return {unresolved, refusal};
    const int id = symbolicIdOf(exprId);
    qlsvDiagnosticImpl* const diagnostic = registerSymbolicIdValues(id, validator);
    return {diagnostic ? unresolved : id, diagnostic};
}

qlsvDiagnosticImpl* SymbolicDimsTable::registerSymbolicIdValues(int id, QL::SymbolValidator& validator) {
    std::vector<std::string> names;
    getSymbolicDimsSymbols(id, names);
    QL::SymbolicExprTable& exprs = getExprTable();
    QL::SymbolicDimsFromTParseTree walker(exprs, validator);
    for (const std::string& name : names) {
        if (!QL::SymbolicExprTable::isUnsetValue(exprs.getValueId(exprs.addSymbol(name)))) continue;
        walker.resolveIdentifier(name, name.c_str(), 0);
        if (qlsvDiagnosticImpl* diagnostic = walker.getErrorChecker().takePending()) return diagnostic;
    }
    return nullptr;
}

QL::SymbolRegistry::Registration SymbolicDimsTable::registerSymbolicTExpr(const std::string& text,
                                                                          const NumericDims& dims,
                                                                          QL::SymbolValidator& validator) {
    const bool isEmpty = dims.getWidth() == 0;
    if (isEmpty && !lossOfSymbolicDimsDiagEnabled()) return {noSymbolicExprId, nullptr};
    const Registration read = QL::SymbolicDimsFromTParseTree(getExprTable(), validator)(text.c_str(), dims);
    if (!isEmpty) return read;
    Pending pending(read.second);
    reportLossOfSymbolicDimensions(pending.get(), convertExprId2SymbDimsId(read.first));
    return {noSymbolicExprId, pending.release()};
}

QL::SymbolRegistry::Registration SymbolicDimsTable::registerSymbolicTExpr(const std::u16string& text,
                                                                          QL::SymbolValidator& validator,
                                                                          std::vector<double>& values) {
    QL::SymbolicDimsFromTParseTree walker(getExprTable(), validator);
    const Registration read = walker(text);
    Pending pending(read.second);
    const int id = convertExprId2SymbDimsId(read.first);
    if (read.first != noExpr) values = walker.eval(read.first);
    if (lossOfSymbolicDimsDiagEnabled() && values.size() >= 3) {
        // kept: the third dimension is never lost
        for (std::size_t i = values.size() - 1; i > 2 && std::round(values[i]) == 1.0; --i)
            reportLossOfSymbolicDimensions(pending.get(), getSymbolicDims(id).getDimensionId(i));
    }
    return {exprIdOf(id), pending.release()};
}

int SymbolicDimsTable::getNumberFromTxArray(const txArray_tag* array, const std::string& name, const char* text,
                                            unsigned long position) {
    DummyValidator validator;
    QL::SymbolicDimsFromTParseTree walker(getExprTable(), validator);
    return convertExprId2SymbDimsId(walker.getNumberFromTxArray(array, name, text, position));
}

SymbolicDimsTable::CheckedExpr SymbolicDimsTable::generateExprIdFromExpr(const std::u16string& text,
                                                                         QL::SymbolicExprTable& exprTable) const {
    DummyValidator validator;
    const Registration read = QL::SymbolicDimsFromTParseTree(exprTable, validator)(text);
    Pending pending(read.second);
    if (read.first == noExpr) return {noExpr, pending.release(), false};
    const unsigned long simple = simplified(exprTable, read.first);
    const QL::SymbolicExpr expr = exprTable.get(simple);
    if (isIntegerBelow(expr, 1)) return {simple, lessThanOne(1, text), false};
    for (std::size_t i = 0; i < expr.getNumDimensions(); ++i)
        if (isIntegerBelow(exprTable.get(expr.getDimension(i)), 1)) return {simple, lessThanOne(i + 1, text), false};
    return {withoutTrailingOnes(exprTable, simple), pending.release(), true};
}

void SymbolicDimsTable::getSymbolicDimensionsFromExpr(const std::u16string& text,
                                                      std::vector<std::string>& names) const {
    QL::SymbolicExprTable scratch(QL::SymbolDomain::Integers);
    const CheckedExpr checked = generateExprIdFromExpr(text, scratch);
    const Pending discarded(checked.diagnostic);
    getSymbolicDimsSymbols(symbolicIdOf(checked.exprId), names); // kept: an id of the scratch table, read in this one
}

SymbolicDimsTable::CheckedText SymbolicDimsTable::validateSymbolicDimsTExpr(const std::u16string& text,
                                                                            int minDims) const {
    QL::SymbolicExprTable scratch(QL::SymbolDomain::Integers);
    const CheckedExpr checked = generateExprIdFromExpr(text, scratch);
    Pending pending(checked.diagnostic);
    if (!checked.ok) return {u"", pending.release(), false};
    const std::size_t numDimensions = scratch.get(checked.exprId).getNumDimensions(); // kept: 0 for what is no list
    if (minDims > 1 && numDimensions < static_cast<std::size_t>(minDims))
        return {u"", qlsvCreateDiagnostic(Quillane::SymbolicDims::InsufficientNumDimensions(text, minDims), ""), false};
    const unsigned long translated = QL::SymbolicExprC2T(scratch)(checked.exprId);
    QL::SymbolicExprPrinter print(scratch, QL::SymbolicExprPrinter::Predicate::instance(), true, true, true, {});
    return {qlsvUtf16FromUtf8(print(scratch.get(translated))), pending.release(), true};
}

} // namespace QLTypeSys
