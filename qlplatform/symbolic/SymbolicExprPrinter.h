// Texts of expressions.
//
//   QL::SymbolicExprPrinter print(table, QL::SymbolicExprPrinter::Predicate::instance(), false, false, false, {});
//   std::string text = print(table.get(exprId)); // (K*L + 2*K)/2 % M
//
// A text has as few parentheses as it takes to read the same expression back. Lists of dimensions read [K L 3].
#pragma once

#include <string>
#include <unordered_map>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"

namespace QL {

/// Decides how symbols print.
class QL_EXPORT SymbolicExprPrinterPredicate {
  public:
    virtual ~SymbolicExprPrinterPredicate();
    /// The text of a symbol, given by its expression id.
    virtual std::string identifier(const SymbolicExprTable& table, unsigned long symbolId) const = 0;
};

/// Prints a symbol that is bound to another symbol as that one, and so on to the last of the chain.
class QL_EXPORT SymbolicExprAliasPrinterPredicate : public SymbolicExprPrinterPredicate {
  public:
    /// Keeps the address of the table, whose bindings are read.
    explicit SymbolicExprAliasPrinterPredicate(const SymbolicExprTable& table) : table_(table) {}
    std::string identifier(const SymbolicExprTable& table, unsigned long symbolId) const override;

  private:
    const SymbolicExprTable& table_;
};

/// Prints expressions of a table.
class QL_EXPORT SymbolicExprPrinter {
  public:
    /// Prints symbols by their names.
    class QL_EXPORT Predicate : public SymbolicExprPrinterPredicate {
      public:
        /// The one object of this class.
        static const Predicate& instance();
        std::string identifier(const SymbolicExprTable& table, unsigned long symbolId) const override;
    };

    /// Texts of whole expressions that were printed already, by expression id.
    using Cache = std::unordered_map<unsigned long, std::string>;

    /// A longer text is cut off here and ends in "...".
    static constexpr std::size_t maxTextLength = std::size_t{1} << 24;

    /// With all options off the text is C-like, with all on it is of the host language:
    /// - `hostOperators`: ~= ~ and ^ in place of != ! and pow(a, b), rem(a, b) in place of a % b;
    /// - `hostNumbers`: a whole double is 1, not 1.0, and the doubles without a value are Inf and NaN, not inf and nan;
    /// - `hostFunctions`: fix in place of trunc.
    /// Keeps the addresses of the table and of the predicate.
    SymbolicExprPrinter(const SymbolicExprTable& table, const SymbolicExprPrinterPredicate& predicate,
                        bool hostOperators, bool hostNumbers, bool hostFunctions, Cache cache);

    /// The text of an expression of the table.
    std::string operator()(const SymbolicExpr& expr);

  private:
    const SymbolicExprTable& table_;
    const SymbolicExprPrinterPredicate& predicate_;
    bool hostOperators_;
    bool hostNumbers_;
    bool hostFunctions_;
    Cache cache_;
};

} // namespace QL
