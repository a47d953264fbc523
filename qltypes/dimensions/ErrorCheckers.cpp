// The checkers of dimensions and of parameters, side by side.
#include "qltypes/dimensions/ErrorCheckers_internal.h"
#include "qltypes/dimensions/QLParamExprErrorChecker.h"
#include "qltypes/dimensions/QLSymbolicDimsErrorChecker.h"

namespace QLTypeSys {

// ---- Dimensions ----

void QLSymbolicDimsErrorChecker::report(const char* leaf, const std::string& name, const char* text,
                                        unsigned long position) {
    if (isQuiet()) return;
    const std::string markerLine = std::string(position + 1, ' ') + '^';
    reportDiagnostic(dimsDiagnostic("Quillane:SymbolicDims", leaf, name, text, markerLine));
}

// clang-format off
void QLSymbolicDimsErrorChecker::reportNonScalarValue(const std::string& name, const char* text, unsigned long position) { report("NonScalarValue", name, text, position); }
void QLSymbolicDimsErrorChecker::reportComplexValue(const std::string& name, const char* text, unsigned long position) { report("ComplexValue", name, text, position); }
void QLSymbolicDimsErrorChecker::reportNonIntegerValue(const std::string& name, const char* text, unsigned long position) { report("NonIntegerValue", name, text, position); }
void QLSymbolicDimsErrorChecker::reportIntegerLiteralOverflow(const std::string&, const char*, unsigned long) {}
void QLSymbolicDimsErrorChecker::reportDiagnostic(qlsvDiagnosticImpl* diagnostic) { gatherDiagnostic(*this, diagnostic); }
// clang-format on

qlsvDiagnosticImpl* QLSymbolicDimsErrorChecker::createNonASCIIStringDiagnostic(const std::u16string& text) {
    return dimsDiagnostic("Quillane:SymbolicDims", "NonAsciiDimensionsString", text);
}

// ---- Parameters ----

template <class... Args> void QLParamExprErrorChecker::report(const char* leaf, const Args&... args) {
    if (!isQuiet()) reportDiagnostic(dimsDiagnostic("Quillane:Data", leaf, args...));
}

// clang-format off
void QLParamExprErrorChecker::reportUnhandledExpr(_T_parse_tree_T<char>*, const char*) {}
void QLParamExprErrorChecker::reportNonScalarValue(const std::string& name, const char* text, unsigned long) { report("Param_NonScalarValueInExpression", name, text); }
void QLParamExprErrorChecker::reportComplexValue(const std::string& name, const char* text, unsigned long) { report("Param_ComplexValueInExpression", name, text); }
void QLParamExprErrorChecker::reportDivisionExpr(_T_parse_tree_T<char>*, const char* text) { report("Param_UnsupportedDivision", text); }
void QLParamExprErrorChecker::reportUnsupportedValue(const std::string&, const char*, unsigned long) {}
void QLParamExprErrorChecker::reportNonIntegerValue(const std::string&, const char*, unsigned long) {}
void QLParamExprErrorChecker::reportInvalidLiteralValue(const std::string&, const char*, unsigned long) {}
void QLParamExprErrorChecker::reportIntegerLiteralOverflow(const std::string&, const char*, unsigned long) {}
void QLParamExprErrorChecker::reportLogicalValue(const std::string& name, const char* text, unsigned long) { report("Param_UnsupportedLogicalValue", name, text); }
void QLParamExprErrorChecker::reportDiagnostic(qlsvDiagnosticImpl* diagnostic) { gatherDiagnostic(*this, diagnostic); }
qlsvDiagnosticImpl* QLParamExprErrorChecker::createNonASCIIStringDiagnostic(const std::u16string&) { return nullptr; }
// clang-format on

} // namespace QLTypeSys
