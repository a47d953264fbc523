#include "qlplatform/symbolic/ExprSpelling_internal.h"

namespace QL {

Spelling spellingOf(SymbolicOp op, bool hostOperators, bool hostFunctions) {
    switch (op) {
    case SymbolicOp::UnaryMinus:
        return {"-", signLevel};
    case SymbolicOp::Plus:
        return {" + ", sumLevel};
    case SymbolicOp::Minus:
        return {" - ", sumLevel};
    case SymbolicOp::Multiply:
        return {"*", productLevel};
    case SymbolicOp::Divide:
        return {"/", productLevel};
    case SymbolicOp::Modulo:
        return hostOperators ? Spelling{"rem", atomLevel} : Spelling{" % ", productLevel};
    case SymbolicOp::Power:
        return hostOperators ? Spelling{"^", powerLevel} : Spelling{"pow", atomLevel};
    case SymbolicOp::Equal: // the host language ranks all comparisons alike
        return {" == ", hostOperators ? orderLevel : equalLevel};
    case SymbolicOp::NotEqual:
        return hostOperators ? Spelling{" ~= ", orderLevel} : Spelling{" != ", equalLevel};
    case SymbolicOp::LessThan:
        return {" < ", orderLevel};
    case SymbolicOp::LessThanOrEqual:
        return {" <= ", orderLevel};
    case SymbolicOp::GreaterThan:
        return {" > ", orderLevel};
    case SymbolicOp::GreaterThanOrEqual:
        return {" >= ", orderLevel};
    case SymbolicOp::And:
        return {" && ", andLevel};
    case SymbolicOp::Or:
        return {" || ", orLevel};
    case SymbolicOp::Not:
        return {hostOperators ? "~" : "!", signLevel};
    case SymbolicOp::Min:
        return {"min", atomLevel};
    case SymbolicOp::Max:
        return {"max", atomLevel};
    case SymbolicOp::Abs:
        return {"abs", atomLevel};
    case SymbolicOp::Floor:
        return {"floor", atomLevel};
    case SymbolicOp::Ceil:
        return {"ceil", atomLevel};
    case SymbolicOp::Round:
        return {"round", atomLevel};
    case SymbolicOp::Fix:
        return {hostFunctions ? "fix" : "trunc", atomLevel};
    case SymbolicOp::Mod:
        return {"mod", atomLevel};
    case SymbolicOp::Rem:
        return {"rem", atomLevel};
    case SymbolicOp::StringSymbol:
    case SymbolicOp::IntValue:
    case SymbolicOp::DoubleValue:
    case SymbolicOp::BoolSymbol:
    case SymbolicOp::ND:
        break;
    }
    return {"", atomLevel};
}

unsigned numOperandsOf(SymbolicOp op) {
    switch (op) {
    case SymbolicOp::UnaryMinus:
    case SymbolicOp::Not:
    case SymbolicOp::Abs:
    case SymbolicOp::Floor:
    case SymbolicOp::Ceil:
    case SymbolicOp::Round:
    case SymbolicOp::Fix:
        return 1;
    default:
        return 2;
    }
}

} // namespace QL
