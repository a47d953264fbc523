// The error checker of parameters read from text.
#pragma once

#include <string>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/QLSymbolicExprErrorChecker.h"

namespace QLTypeSys {

/// Refuses values that are no scalars, complex or logical, and divisions, with messages of its own in "Quillane:Data".
/// Unknown functions and wrong numbers of arguments are refused as the base does. Everything else passes: what is no
/// symbolic expression then is a plain value.
class QL_EXPORT QLParamExprErrorChecker : public QL::QLSymbolicExprErrorChecker {
  public:
    /// `Param_NonScalarValueInExpression`
    void reportNonScalarValue(const std::string& name, const char* text, unsigned long position) override;
    /// `Param_ComplexValueInExpression`
    void reportComplexValue(const std::string& name, const char* text, unsigned long position) override;
    /// `Param_UnsupportedDivision`
    void reportDivisionExpr(_T_parse_tree_T<char>* node, const char* text) override;
    /// `Param_UnsupportedLogicalValue`
    void reportLogicalValue(const std::string& name, const char* text, unsigned long position) override;
    void reportDiagnostic(qlsvDiagnosticImpl* diagnostic) override;

    // These do nothing.
    void reportUnhandledExpr(_T_parse_tree_T<char>* node, const char* text) override;
    void reportUnsupportedValue(const std::string& name, const char* text, unsigned long position) override;
    void reportNonIntegerValue(const std::string& name, const char* text, unsigned long position) override;
    void reportInvalidLiteralValue(const std::string& name, const char* text, unsigned long position) override;
    void reportIntegerLiteralOverflow(const std::string& name, const char* text, unsigned long position) override;
    /// Null: texts that are not ASCII are read.
    qlsvDiagnosticImpl* createNonASCIIStringDiagnostic(const std::u16string& text) override;

  private:
    template <class... Args> void report(const char* leaf, const Args&... args);
};

} // namespace QLTypeSys
