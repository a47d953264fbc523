// What a caller says about the symbols of a text that is read.
//
//   class Workspace : public QL::SymbolValidator {
//     public:
//       QL::SymbolRecord resolveSymbol(const std::string& name, const char*, unsigned long) override {
//           return {valueOf(name), name};
//       }
//       using QL::SymbolValidator::resolveSymbol;
//   };
#pragma once

#include <memory>
#include <string>

#include "qlplatform/Export.h"

struct txArray_tag;
class qlsvDiagnosticImpl;

namespace QL {

class SymbolRegistry;

/// What an identifier stands for.
///   value  name
///   null   given  the symbol of that name, which may be another name than the identifier's
///   given  given  the same, and the value is bound to it
///   given  empty  the number itself
///   null   empty  nothing: the text around it is not symbolic
struct SymbolRecord {
    std::shared_ptr<const txArray_tag> value; ///< shared with whoever else keeps the array
    /// The name of the symbol; empty for none.
    std::string name;
};

/// Says what the identifiers of a text stand for. Engines derive their own.
class QL_EXPORT SymbolValidator {
  public:
    virtual ~SymbolValidator();

    /// What the identifier `name` stands for, which begins at byte `position` of the whole expression `text`. Here
    /// nothing. May be asked more than once for one text.
    virtual SymbolRecord resolveSymbol(const std::string& name, const char* text, unsigned long position);
    /// The same for the text of a registry, which may be null.
    virtual SymbolRecord resolveSymbol(const std::string& name, const char* text, unsigned long position,
                                       SymbolRegistry* registry);

    /// Is told that the dimension `exprId` of a text has no place in the numeric dimensions; the id is
    /// SymbolicExprTable::noExpr for one that is not symbolic. Does nothing here; an override may make or extend the
    /// diagnostic.
    virtual void reportLossOfSymbolicDimensions(qlsvDiagnosticImpl*& diagnostic, unsigned long exprId);

    /// The table of the symbols of parameters, owned by whoever made the validator; null here.
    virtual const SymbolRegistry* getParameterSymbolicExprTable() const;
    virtual SymbolRegistry* getParameterSymbolicExprTable();
};

} // namespace QL
