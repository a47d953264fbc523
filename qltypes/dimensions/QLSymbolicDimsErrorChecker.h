// The error checker of dimensions read from text.
#pragma once

#include <string>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/QLSymbolicExprErrorChecker.h"

namespace QLTypeSys {

/// Refuses values that are no scalars, complex or no whole numbers, with messages of its own: ComplexValue,
/// NonScalarValue, NonIntegerValue of "Quillane:SymbolicDims". Whole literals beyond 32 bits pass. Everything else is
/// refused as the base does.
class QL_EXPORT QLSymbolicDimsErrorChecker : public QL::QLSymbolicExprErrorChecker {
  public:
    void reportNonScalarValue(const std::string& name, const char* text, unsigned long position) override;
    void reportComplexValue(const std::string& name, const char* text, unsigned long position) override;
    void reportNonIntegerValue(const std::string& name, const char* text, unsigned long position) override;
    /// Does nothing.
    void reportIntegerLiteralOverflow(const std::string& name, const char* text, unsigned long position) override;
    void reportDiagnostic(qlsvDiagnosticImpl* diagnostic) override;
    /// A diagnostic `NonAsciiDimensionsString`, owned by the caller.
    qlsvDiagnosticImpl* createNonASCIIStringDiagnostic(const std::u16string& text) override;

  private:
    void report(const char* leaf, const std::string& name, const char* text, unsigned long position);
};

} // namespace QLTypeSys
