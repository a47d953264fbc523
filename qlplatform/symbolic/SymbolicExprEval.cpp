#include "qlplatform/symbolic/SymbolicExprEval.h"

#include <cmath>
#include <limits>

#include "qlplatform/symbolic/NodeStore_internal.h"

namespace QL {
namespace {

constexpr double notANumber = std::numeric_limits<double>::quiet_NaN();

// The modulo of the host language: with the sign of the divisor, and the dividend itself for a divisor of 0.
double modOf(double a, double b) {
    if (b == 0) return a;
    const double remainder = std::fmod(a, b);
    return remainder != 0 && (remainder < 0) != (b < 0) ? remainder + b : remainder;
}

// A NaN wins, unlike in std::fmin.
double smaller(double a, double b) { return std::isnan(a) || a < b ? a : b; }
double larger(double a, double b) { return std::isnan(a) || a > b ? a : b; }

double valueOf(SymbolicOp op, double a, double b) {
    switch (op) {
    case SymbolicOp::UnaryMinus:
        return -a;
    case SymbolicOp::Plus:
        return a + b;
    case SymbolicOp::Minus:
        return a - b;
    case SymbolicOp::Multiply:
        return a * b;
    case SymbolicOp::Divide:
        return a / b;
    case SymbolicOp::Modulo:
    case SymbolicOp::Rem:
        return std::fmod(a, b);
    case SymbolicOp::Mod:
        return modOf(a, b);
    case SymbolicOp::Power:
        return std::pow(a, b);
    case SymbolicOp::Equal:
        return a == b;
    case SymbolicOp::NotEqual:
        return a != b;
    case SymbolicOp::LessThan:
        return a < b;
    case SymbolicOp::LessThanOrEqual:
        return a <= b;
    case SymbolicOp::GreaterThan:
        return a > b;
    case SymbolicOp::GreaterThanOrEqual:
        return a >= b;
    case SymbolicOp::And:
        return a != 0 && b != 0;
    case SymbolicOp::Or:
        return a != 0 || b != 0;
    case SymbolicOp::Not:
        return a == 0;
    case SymbolicOp::Min:
        return smaller(a, b);
    case SymbolicOp::Max:
        return larger(a, b);
    case SymbolicOp::Abs:
        return std::fabs(a);
    case SymbolicOp::Floor:
        return std::floor(a);
    case SymbolicOp::Ceil:
        return std::ceil(a);
    case SymbolicOp::Round:
        return std::round(a);
    case SymbolicOp::Fix:
        return std::trunc(a);
    case SymbolicOp::StringSymbol:
    case SymbolicOp::IntValue:
    case SymbolicOp::DoubleValue:
    case SymbolicOp::BoolSymbol:
    case SymbolicOp::ND: // a list inside an expression has no value
        break;
    }
    return notANumber;
}

class Evaluation {
  public:
    explicit Evaluation(NodeStore& store) : store_(store) { store_.slots().begin(store_.size()); }

    double valueOfNode(NodeId root) {
        enter(root);
        while (!open_.empty()) {
            auto& [id, next] = open_.back();
            const std::size_t numParts = numPartsOf(id);
            if (next < numParts) {
                enter(part(id, next++));
                continue;
            }
            values_[store_.slots().get(id)] =
                store_.op(id) == SymbolicOp::StringSymbol
                    ? value(part(id, 0))
                    : valueOf(store_.op(id), value(part(id, 0)), numParts > 1 ? value(part(id, 1)) : 0.0);
            open_.pop_back();
        }
        return value(root);
    }

  private:
    // What the value of a node is made of: its operands, or what a symbol is bound to.
    std::size_t numPartsOf(NodeId id) const {
        if (store_.op(id) == SymbolicOp::StringSymbol) return store_.value(id) == noNode ? 0 : 1;
        return store_.op(id) == SymbolicOp::ND ? 0 : store_.numOperands(id);
    }
    NodeId part(NodeId id, std::size_t index) const {
        return store_.op(id) == SymbolicOp::StringSymbol ? store_.value(id) : store_.operand(id, index);
    }
    double value(NodeId id) const { return values_[store_.slots().get(id)]; }

    void enter(NodeId id) {
        if (store_.slots().get(id) != NodeSlots::none) return;
        store_.slots().set(id, static_cast<std::uint32_t>(values_.size()));
        // Stays no number while it is open: what a binding leads back to has no value.
        values_.push_back(terminalValue(id));
        if (numPartsOf(id) > 0) open_.push_back({id, 0});
    }

    double terminalValue(NodeId id) const {
        switch (store_.op(id)) {
        case SymbolicOp::IntValue:
            return store_.intValue(id);
        case SymbolicOp::DoubleValue:
            return store_.doubleValue(id);
        case SymbolicOp::BoolSymbol:
            return store_.boolValue(id);
        default:
            return notANumber;
        }
    }

    NodeStore& store_;
    std::vector<double> values_; // by slot
    std::vector<std::pair<NodeId, std::size_t>> open_;
};

} // namespace

std::vector<double> SymbolicExprEval::eval(unsigned long exprId) const {
    NodeStore& store = table_.nodes();
    const NodeId root = nodeIdOf(exprId);
    Evaluation evaluation(store);
    if (store.op(root) != SymbolicOp::ND) return {evaluation.valueOfNode(root)};
    std::vector<double> values;
    values.reserve(store.numOperands(root));
    for (std::size_t i = 0; i < store.numOperands(root); ++i)
        values.push_back(evaluation.valueOfNode(store.operand(root, i)));
    return values;
}

} // namespace QL
