// Reads expressions in the engine's own syntax: the texts that the printer writes.
//
//   QL::SymbolicExprParser parse(table, false, true);
//   auto [id, refusal] = parse("[(K*L + 2*K)/2 % M  N]");
//   if (refusal) { puts(refusal->text().c_str()); qlsvDiscardDiagnostic(refusal); }
//
// A printed text reads back as the same expression, given that its symbols have names as below, that lists stand
// alone, and that the text was not cut. In the form of the host language the printer writes the double 1.0 as 1, which
// reads as the integer.
//
// Symbols   letters, digits, _ and bytes above 127, not beginning with a digit; names joined by points are one symbol.
//           Not true, false, inf and nan (host: Inf and NaN), which are values.
// Numbers   12 is an integer value when it fits 32 bits, otherwise a double, which must have that value exactly (host:
// it
//           is rounded); 1.0, .5 and 1e3 are doubles. A sign before a number is part of it: -3 is a number, -(3) an
//           operator over one.
// Functions min max pow power mod rem of two arguments, abs floor ceil round trunc fix of one.
// Operators as the printer writes them, with or without blanks around them; a + may stand before an operand.
// Lists     [K L+1 -3], the elements separated by blanks or commas. There a blank before - and none behind it makes it
//           the sign of the next element: [K -L] has two, [K - L] one.
#pragma once

#include <utility>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"

class qlsvDiagnosticImpl;

namespace QL {

/// Reads texts of expressions into a table.
class QL_EXPORT SymbolicExprParser {
  public:
    /// The expression id, and a diagnostic that is null on success.
    using Result = std::pair<unsigned long, qlsvDiagnosticImpl*>;

    /// Parentheses, calls and lists open at one place of a text.
    static constexpr int nestingLimit = 1'000'000;

    /// - `hostLanguage`: the text has the operators of the host language, as printed with `hostOperators`: ~= ~ ^ and
    ///   all comparisons of one rank, in place of != ! %;
    /// - `lists`: the whole text may be a list of dimensions. A list never stands among operators or in a list.
    /// Keeps the address of the table.
    SymbolicExprParser(SymbolicExprTable& table, bool hostLanguage, bool lists)
        : table_(table), hostLanguage_(hostLanguage), lists_(lists) {}

    /// Reads a text and adds its expressions to the table. For ill-formed text the id is SymbolicExprTable::noExpr, the
    /// table is as it was, and the caller owns the diagnostic: one message of category "Quillane:SymbolicExpr" whose
    /// first argument is the position, a byte offset as long:
    ///   UnexpectedToken(position, what was expected, what was found)
    ///   InvalidNumber(position, the number, what is wrong with it)
    ///   UnknownFunction(position, name)
    ///   WrongNumberOfArguments(position, name, number it takes, number found)
    ///   NestingTooDeep(position, nestingLimit)
    ///   ListTooLong(position)
    Result operator()(const char* text) const;

  private:
    SymbolicExprTable& table_;
    bool hostLanguage_;
    bool lists_;
};

} // namespace QL
