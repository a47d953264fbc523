// The base of the tables that register symbols: it owns the expression table.
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"

class QLBlock;
class QLRootBD;
class QlDims;
class QlEvalClient;
class QlWorkspace;
class qlsvDiagnosticImpl;

namespace QL {

class SymbolValidator;

/// Registers texts as expressions of a table that it owns. Engines derive their own.
class QL_EXPORT SymbolRegistry {
  public:
    /// An expression id, and a diagnostic that is null on success.
    using Registration = std::pair<unsigned long, qlsvDiagnosticImpl*>;

    explicit SymbolRegistry(SymbolDomain domain);
    virtual ~SymbolRegistry();
    SymbolRegistry(const SymbolRegistry&) = delete;
    SymbolRegistry& operator=(const SymbolRegistry&) = delete;

    /// For derived registries that can read the text; here nothing is registered, and the answer is
    /// SymbolicExprTable::noExpr without a diagnostic.
    virtual Registration registerSymbolicTExpr(const std::string& text, const QLBlock* block, const QlDims& dims);
    virtual Registration registerSymbolicTExpr(const std::u16string& text, const QLRootBD* model,
                                               QlWorkspace* workspace, QlEvalClient* client,
                                               std::vector<double>& values);

    /// Appends the names of the symbols of an expression, in the order of its text.
    virtual void getSymbolsFromExpressionId(unsigned long exprId, std::vector<std::string>& names) const;

    /// For derived registries that keep the data types of symbols; does nothing here.
    virtual void addSymbolDataTypeInformation(const std::string& name, int dataTypeId);

    /// As the first of its name.
    virtual Registration registerSymbolicTExpr(const std::u16string& text, SymbolValidator& validator,
                                               std::vector<double>& values);

    /// The expression id itself when the table has it, otherwise nothing.
    std::optional<unsigned long> convertExprId2ValidSymbolicId(unsigned long exprId) const;

    /// The expression table, owned by the registry. Unchecked: it exists at all times but inside a reset.
    SymbolicExprTable& getExprTable() const { return *exprTable_; }
    /// Whether there is an expression table: always but inside a reset.
    bool hasExprTable() const { return exprTable_ != nullptr; }

  protected:
    /// Deletes the expression table. makeExprTable() must follow before the registry is used.
    void dropExprTable();
    /// Makes an empty expression table.
    void makeExprTable();
    /// Exchanges the expression table for another, which takes the place of `other`. Either may be null.
    void swapExprTable(std::unique_ptr<SymbolicExprTable>& other) noexcept { exprTable_.swap(other); }

  private:
    SymbolDomain domain_;
    std::unique_ptr<SymbolicExprTable> exprTable_;
};

} // namespace QL
