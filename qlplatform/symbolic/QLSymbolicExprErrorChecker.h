// The base of the error checkers that the tree walker reports to.
//
// The walker tells a checker everything that it meets and cannot take as it is. A checker decides which of it is an
// error; its messages gather in one pending diagnostic. This base refuses everything:
//
//   Message, category "Quillane:SymbolicExpr"       Arguments
//   UnhandledExpression, UnsupportedDivision        the part of the expression, the expression, marker line
//   UnsupportedFunction                             name of the function, the expression, marker line
//   InvalidNumArguments                             name, number given, number taken, the expression, marker line
//   NonScalarValue, ComplexValue, NonIntegerValue,
//   UnsupportedValue, LogicalValue                  name of the symbol, the expression, marker line
//   InvalidLiteral, IntegerLiteralOverflow          the literal, the expression, marker line
//   NonAsciiText                                    the expression, wide
//
// A marker line is a caret behind one blank more than there are bytes before the one in question. With another blank in
// front, as the texts have it, the caret stands under that byte of an expression that is printed behind two.
//
// Nothing is thrown: the walker goes on, and one expression can give several messages, in the order found.
#pragma once

#include <string>

#include "qlplatform/Export.h"

template <class Char> class _T_parse_tree_T;
class qlsvDiagnosticImpl;

namespace QL {

class SymbolicExprTable;

/// Neither copied nor moved: it owns the pending diagnostic.
class QL_EXPORT QLSymbolicExprErrorChecker {
  public:
    QLSymbolicExprErrorChecker() = default;
    virtual ~QLSymbolicExprErrorChecker();
    QLSymbolicExprErrorChecker(const QLSymbolicExprErrorChecker&) = delete;
    QLSymbolicExprErrorChecker& operator=(const QLSymbolicExprErrorChecker&) = delete;

    // In all of these `text` is the whole expression.

    /// A node that no symbolic expression has: a field, a range, a matrix inside an expression.
    virtual void reportUnhandledExpr(_T_parse_tree_T<char>* node, const char* text);
    /// A call, or an index, of a name that is no known function. `functionId` is the expression id of that name.
    virtual void reportUnsupportedFcn(unsigned long functionId, _T_parse_tree_T<char>* node, const char* text,
                                      const SymbolicExprTable& table);
    /// `position` is the byte of `text` at which `name` stands, in all reports that have one.
    virtual void reportNonScalarValue(const std::string& name, const char* text, unsigned long position);
    /// A call with another number of arguments than the function takes.
    virtual void reportInvalidNumArgs(unsigned long functionId, unsigned long numGiven, unsigned long numTaken,
                                      _T_parse_tree_T<char>* node, const char* text, const SymbolicExprTable& table);
    /// Also an imaginary literal, which is its own name.
    virtual void reportComplexValue(const std::string& name, const char* text, unsigned long position);
    /// A division, where there must be none.
    virtual void reportDivisionExpr(_T_parse_tree_T<char>* node, const char* text);
    /// A value that is no number: a cell, a structure, a text, an object; or one that no double holds exactly.
    virtual void reportUnsupportedValue(const std::string& name, const char* text, unsigned long position);
    /// A number that is not whole, where it must be.
    virtual void reportNonIntegerValue(const std::string& name, const char* text, unsigned long position);
    /// A literal that is no whole number: 0.5, Inf, a text.
    virtual void reportInvalidLiteralValue(const std::string& name, const char* text, unsigned long position);
    /// A whole literal that does not fit an int.
    virtual void reportIntegerLiteralOverflow(const std::string& name, const char* text, unsigned long position);
    /// A logical value or literal, where they are not supported.
    virtual void reportLogicalValue(const std::string& name, const char* text, unsigned long position);

    /// Takes `diagnostic` over and puts it behind the pending one; discards it when quiet. The pending one itself, and
    /// one that is null or has no messages when not quiet, is left as it is.
    virtual void reportDiagnostic(qlsvDiagnosticImpl* diagnostic);

    /// A diagnostic about a text that is not ASCII, for the caller to report and owned by it; null when such a text is
    /// to be read all the same.
    virtual qlsvDiagnosticImpl* createNonASCIIStringDiagnostic(const std::u16string& text);

    /// The diagnostic gathered so far, null when there is none. Owned by the checker; who changes it sees to that.
    qlsvDiagnosticImpl*& pending() { return pending_; }
    /// The same, which the caller owns from now on; none is pending then.
    qlsvDiagnosticImpl* takePending();
    /// Discards what is pending.
    void clearPending();

    /// When quiet, all reports are dropped before any text is built.
    bool isQuiet() const { return quiet_; }
    void setQuiet(bool isQuiet) { quiet_ = isQuiet; }

  private:
    void report(const char* leaf, const std::string& name, const char* text, unsigned long position);
    void report(const char* leaf, const _T_parse_tree_T<char>& node, const char* text, unsigned long position);

    qlsvDiagnosticImpl* pending_ = nullptr;
    bool quiet_ = false;
};

} // namespace QL
