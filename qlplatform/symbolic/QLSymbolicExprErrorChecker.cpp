#include "qlplatform/symbolic/QLSymbolicExprErrorChecker.h"

#include <utility>

#include "qlplatform/language/ParseTree.h"
#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/services/Raise_internal.h"
#include "qlplatform/symbolic/SymbolicExpr.h"

namespace QL {

namespace {

constexpr const char* category = "Quillane:SymbolicExpr";
// clang-format off
constexpr MessageText texts[] = {
    {category, "UnhandledExpression", "'{0}' has no meaning in a symbolic expression:\n  {1}\n {2}"},
    {category, "UnsupportedFunction", "'{0}' is no function that symbolic expressions have:\n  {1}\n {2}"},
    {category, "InvalidNumArguments", "number of arguments of '{0}' is {1} and must be {2}:\n  {3}\n {4}"},
    {category, "NonScalarValue", "'{0}' is no scalar:\n  {1}\n {2}"},
    {category, "ComplexValue", "'{0}' is complex:\n  {1}\n {2}"},
    {category, "UnsupportedDivision", "the division in '{0}' is not supported:\n  {1}\n {2}"},
    {category, "UnsupportedValue", "the value of '{0}' is no number that a symbol can have:\n  {1}\n {2}"},
    {category, "NonIntegerValue", "'{0}' is no whole number:\n  {1}\n {2}"},
    {category, "InvalidLiteral", "literal {0} is no whole number:\n  {1}\n {2}"},
    {category, "IntegerLiteralOverflow", "literal {0} does not fit 32 bits:\n  {1}\n {2}"},
    {category, "LogicalValue", "'{0}' is logical:\n  {1}\n {2}"},
    {category, "NonAsciiText", "'{0}' holds a character that is not ASCII"},
};
// clang-format on
const MessageTextTable registeredTexts(texts, std::size(texts));

std::string markerLine(unsigned long position) { return std::string(position + 1, ' ') + '^'; }

} // namespace

QLSymbolicExprErrorChecker::~QLSymbolicExprErrorChecker() { clearPending(); }

void QLSymbolicExprErrorChecker::report(const char* leaf, const std::string& name, const char* text,
                                        unsigned long position) {
    if (quiet_) return;
    reportDiagnostic(
        qlsvCreateDiagnostic(hostservices::message(category, leaf, name, std::string(text), markerLine(position)), ""));
}

void QLSymbolicExprErrorChecker::report(const char* leaf, const _T_parse_tree_T<char>& node, const char* text,
                                        unsigned long position) {
    if (!quiet_) report(leaf, std::string(node.text()), text, position);
}

void QLSymbolicExprErrorChecker::reportUnsupportedFcn(unsigned long functionId, _T_parse_tree_T<char>* node,
                                                      const char* text, const SymbolicExprTable& table) {
    report("UnsupportedFunction", table.get(functionId).getName(), text, node->begin());
}

void QLSymbolicExprErrorChecker::reportInvalidNumArgs(unsigned long functionId, unsigned long numGiven,
                                                      unsigned long numTaken, _T_parse_tree_T<char>* node,
                                                      const char* text, const SymbolicExprTable& table) {
    if (quiet_) return;
    reportDiagnostic(
        qlsvCreateDiagnostic(hostservices::message(category, "InvalidNumArguments", table.get(functionId).getName(),
                                                   static_cast<long>(numGiven), static_cast<long>(numTaken),
                                                   std::string(text), markerLine(node->begin())),
                             ""));
}

// clang-format off
void QLSymbolicExprErrorChecker::reportUnhandledExpr(_T_parse_tree_T<char>* node, const char* text) { report("UnhandledExpression", *node, text, node->begin()); }
void QLSymbolicExprErrorChecker::reportDivisionExpr(_T_parse_tree_T<char>* node, const char* text) { report("UnsupportedDivision", *node, text, node->position()); }
void QLSymbolicExprErrorChecker::reportNonScalarValue(const std::string& name, const char* text, unsigned long position) { report("NonScalarValue", name, text, position); }
void QLSymbolicExprErrorChecker::reportComplexValue(const std::string& name, const char* text, unsigned long position) { report("ComplexValue", name, text, position); }
void QLSymbolicExprErrorChecker::reportUnsupportedValue(const std::string& name, const char* text, unsigned long position) { report("UnsupportedValue", name, text, position); }
void QLSymbolicExprErrorChecker::reportNonIntegerValue(const std::string& name, const char* text, unsigned long position) { report("NonIntegerValue", name, text, position); }
void QLSymbolicExprErrorChecker::reportInvalidLiteralValue(const std::string& name, const char* text, unsigned long position) { report("InvalidLiteral", name, text, position); }
void QLSymbolicExprErrorChecker::reportIntegerLiteralOverflow(const std::string& name, const char* text, unsigned long position) { report("IntegerLiteralOverflow", name, text, position); }
void QLSymbolicExprErrorChecker::reportLogicalValue(const std::string& name, const char* text, unsigned long position) { report("LogicalValue", name, text, position); }
// clang-format on

void QLSymbolicExprErrorChecker::reportDiagnostic(qlsvDiagnosticImpl* diagnostic) {
    if (diagnostic == pending_ || (!quiet_ && qlsvGetNumItemsInDiagnostic(diagnostic) == 0)) return;
    struct Discarding { // when quiet, and when there is no memory to put it behind the others
        qlsvDiagnosticImpl*& diagnostic;
        ~Discarding() { qlsvDiscardDiagnostic(diagnostic); }
    } const discarding{diagnostic};
    if (!quiet_) qlsvConcatenateDiagnosticsNoCheck(pending_, diagnostic, false);
}

qlsvDiagnosticImpl* QLSymbolicExprErrorChecker::createNonASCIIStringDiagnostic(const std::u16string& text) {
    return qlsvCreateDiagnostic(hostservices::message(category, "NonAsciiText", text), "");
}

qlsvDiagnosticImpl* QLSymbolicExprErrorChecker::takePending() { return std::exchange(pending_, nullptr); }

void QLSymbolicExprErrorChecker::clearPending() { qlsvDiscardDiagnostic(pending_); }

} // namespace QL
