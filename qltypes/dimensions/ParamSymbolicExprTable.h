// The table of the symbols of parameters: expressions without a meaning as dimensions, and the data type of each
// symbol.
//
//   QLTypeSys::ParamSymbolicExprTable table;
//   table.addSymbolDataTypeInformation("gain", DATA_TYPE_ID_SINGLE);
//   table.findDataTypeId("gain"); // DATA_TYPE_ID_SINGLE
//
// A table belongs to one thread at a time.
#pragma once

#include <string>
#include <unordered_map>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolRegistry.h"

namespace QLTypeSys {

/// The expressions of the parameters of one model, with the data types of their symbols. Engines derive their own.
class QL_EXPORT ParamSymbolicExprTable : public QL::SymbolRegistry {
  public:
    ParamSymbolicExprTable();
    ~ParamSymbolicExprTable() override;

    /// Records the data type of a symbol. The first one of a name stays; a later one is ignored without a word.
    void addSymbolDataTypeInformation(const std::string& name, int dataTypeId) override;

    /// A new table for a model, or null as here.
    virtual ParamSymbolicExprTable* CreateParamSymbolicExprTable(QLRootBD* model) const;

    /// The data type recorded for a name; -10 when there is none.
    int findDataTypeId(const std::string& name) const;

    /// The expression of an expression id. Unchecked: it must be one of this table.
    QL::SymbolicExpr get(unsigned long exprId) const;

    /// The text of an expression, in which a symbol that is bound to another one reads as that one. Unchecked: `exprId`
    /// must be one of this table.
    std::string getDisplayString(unsigned long exprId) const;

    /// The expression id itself when the table has it, otherwise all ones.
    unsigned long convertExprId2ValidExprId(unsigned long exprId);

  private:
    std::unordered_map<std::string, int> dataTypeIds_; // by name of the symbol
};

} // namespace QLTypeSys
