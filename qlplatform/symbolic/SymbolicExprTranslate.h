// Translation between the two forms of an expression: as C has it and as the host language (T) has it.
//
// The forms differ in one operator: the remainder with the sign of the dividend is Modulo in C, a % b, and Rem in the
// host language, rem(a, b). Everything else is the same node in both.
#pragma once

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"

namespace QL {

/// From the host language's form to C's.
class QL_EXPORT SymbolicExprT2C {
  public:
    explicit SymbolicExprT2C(SymbolicExprTable& table) : table_(table) {}
    /// The id of the translation, which is the given one when there is nothing to translate.
    unsigned long operator()(unsigned long exprId) const;

  private:
    SymbolicExprTable& table_;
};

/// From C's form to the host language's.
class QL_EXPORT SymbolicExprC2T {
  public:
    explicit SymbolicExprC2T(SymbolicExprTable& table) : table_(table) {}
    /// The id of the translation, which is the given one when there is nothing to translate.
    unsigned long operator()(unsigned long exprId) const;

  private:
    SymbolicExprTable& table_;
};

} // namespace QL
