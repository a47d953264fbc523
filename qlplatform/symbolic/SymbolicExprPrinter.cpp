#include "qlplatform/symbolic/SymbolicExprPrinter.h"

#include <charconv>
#include <cmath>
#include <string_view>
#include <vector>

#include "qlplatform/symbolic/ExprSpelling_internal.h"
#include "qlplatform/symbolic/NodeStore_internal.h"

namespace QL {
namespace {

class TextWriter {
  public:
    TextWriter(const SymbolicExprTable& table, const SymbolicExprPrinterPredicate& predicate, bool hostOperators,
               bool hostNumbers, bool hostFunctions)
        : table_(table), store_(table.nodes()), predicate_(predicate), hostOperators_(hostOperators),
          hostNumbers_(hostNumbers), hostFunctions_(hostFunctions) {}

    std::string write(NodeId root) {
        open_.push_back({root, orLevel, false, {}});
        while (!open_.empty() && text_.size() <= SymbolicExprPrinter::maxTextLength) {
            const Piece piece = open_.back();
            open_.pop_back();
            if (piece.node == noNode)
                text_ += piece.text;
            else
                writeNode(piece);
        }
        if (text_.size() > SymbolicExprPrinter::maxTextLength) {
            text_.resize(SymbolicExprPrinter::maxTextLength);
            text_ += "...";
        }
        return std::move(text_);
    }

  private:
    // What is still to be written: a node where `level` may stand, or a text.
    struct Piece {
        NodeId node;
        Level level;
        bool isBase; // of a power
        std::string_view text;
    };

    void later(std::string_view text) { open_.push_back({noNode, orLevel, false, text}); }
    void later(NodeId node, Level level, bool isBase = false) { open_.push_back({node, level, isBase, {}}); }

    void writeNode(const Piece& piece) {
        const NodeId id = piece.node;
        const Level allowed = piece.level;
        const std::size_t numOperands = store_.numOperands(id);
        const SymbolicOp op = store_.op(id);
        if (op == SymbolicOp::ND) return writeList(id, "[", " ", "]");
        if (numOperands == 0) return writeTerminal(id, allowed);
        const Spelling spelling = spellingOf(op, hostOperators_, hostFunctions_);
        if (spelling.level == atomLevel) {
            text_ += spelling.text;
            return writeList(id, "(", ", ", ")");
        }
        const bool isEnclosed = spelling.level < allowed;
        if (isEnclosed) {
            text_ += '(';
            later(")");
        }
        if (numOperands == 1) {
            text_ += spelling.text;
            writeSigned(op, store_.operand(id, 0));
            return;
        }
        const bool takesSign = op == SymbolicOp::Power && (isEnclosed || !piece.isBase);
        later(store_.operand(id, 1),
              takesSign && isSignedOperand(store_.operand(id, 1)) ? signLevel : static_cast<Level>(spelling.level + 1));
        later(spelling.text);
        later(store_.operand(id, 0), spelling.level, op == SymbolicOp::Power);
    }

    bool isNumber(NodeId id) const {
        return store_.op(id) == SymbolicOp::IntValue || store_.op(id) == SymbolicOp::DoubleValue;
    }
    bool isNegativeNumber(NodeId id) const {
        return isNumber(id) &&
               (store_.op(id) == SymbolicOp::IntValue ? store_.intValue(id) < 0 : store_.doubleValue(id) < 0);
    }
    // What can be an exponent without parentheses, where no power follows that its sign would take in. 2^(-a^b) keeps
    // them, for not everybody reads 2^-a^b the same.
    bool isSignedOperand(NodeId id) const {
        if (isNegativeNumber(id)) return true;
        const NodeId outermost = id;
        while (store_.op(id) == SymbolicOp::UnaryMinus || store_.op(id) == SymbolicOp::Not)
            id = store_.operand(id, 0);
        return id != outermost && store_.op(id) != SymbolicOp::Power;
    }

    // The operand behind a prefix: -3 would read as a negative number, and two signs in a row as another operator of C.
    void writeSigned(SymbolicOp op, NodeId operand) {
        const bool mayFollow = op == SymbolicOp::Not || store_.op(operand) == SymbolicOp::Not || hostOperators_;
        if (op == SymbolicOp::UnaryMinus && isNumber(operand) && !(mayFollow && isNegativeNumber(operand))) {
            later(")");
            later(operand, orLevel);
            later("(");
        } else {
            later(operand, mayFollow ? signLevel : powerLevel);
        }
    }

    void writeList(NodeId id, std::string_view before, std::string_view between, std::string_view after) {
        text_ += before;
        later(after);
        for (std::size_t i = store_.numOperands(id); i-- > 0;) {
            later(store_.operand(id, i), orLevel);
            if (i > 0) later(between);
        }
    }

    void writeTerminal(NodeId id, Level allowed) {
        if (store_.op(id) == SymbolicOp::StringSymbol) {
            text_ += predicate_.identifier(table_, id);
            return;
        }
        if (store_.op(id) == SymbolicOp::BoolSymbol) {
            text_ += store_.boolValue(id) ? "true" : "false";
            return;
        }
        const std::string number = store_.op(id) == SymbolicOp::IntValue ? std::to_string(store_.intValue(id))
                                                                         : doubleText(store_.doubleValue(id));
        const bool isEnclosed = number.front() == '-' && allowed > signLevel;
        text_ += isEnclosed ? "(" + number + ")" : number;
    }

    std::string doubleText(double value) const {
        if (std::isnan(value)) return hostNumbers_ ? "NaN" : "nan";
        if (std::isinf(value)) return std::string(value < 0 ? "-" : "") + (hostNumbers_ ? "Inf" : "inf");
        char digits[32];
        const auto end = std::to_chars(std::begin(digits), std::end(digits), value).ptr;
        std::string text(digits, end);
        if (!hostNumbers_ && text.find_first_of(".e") == std::string::npos) text += ".0";
        return text;
    }

    const SymbolicExprTable& table_;
    const NodeStore& store_;
    const SymbolicExprPrinterPredicate& predicate_;
    bool hostOperators_;
    bool hostNumbers_;
    bool hostFunctions_;
    std::vector<Piece> open_;
    std::string text_;
};

} // namespace

SymbolicExprPrinterPredicate::~SymbolicExprPrinterPredicate() = default;

std::string SymbolicExprAliasPrinterPredicate::identifier(const SymbolicExprTable&, unsigned long symbolId) const {
    // A chain of bindings that comes round ends after as many steps as there are expressions.
    for (unsigned long steps = 0; steps < table_.getNumExprs(); ++steps) {
        const unsigned long value = table_.getValueId(symbolId);
        if (SymbolicExprTable::isUnsetValue(value) || table_.get(value).getOp() != SymbolicOp::StringSymbol) break;
        symbolId = value;
    }
    return table_.get(symbolId).getName();
}

const SymbolicExprPrinter::Predicate& SymbolicExprPrinter::Predicate::instance() {
    static const Predicate shared;
    return shared;
}

std::string SymbolicExprPrinter::Predicate::identifier(const SymbolicExprTable& table, unsigned long symbolId) const {
    return table.get(symbolId).getName();
}

SymbolicExprPrinter::SymbolicExprPrinter(const SymbolicExprTable& table, const SymbolicExprPrinterPredicate& predicate,
                                         bool hostOperators, bool hostNumbers, bool hostFunctions, Cache cache)
    : table_(table), predicate_(predicate), hostOperators_(hostOperators), hostNumbers_(hostNumbers),
      hostFunctions_(hostFunctions), cache_(std::move(cache)) {}

std::string SymbolicExprPrinter::operator()(const SymbolicExpr& expr) {
    const unsigned long id = expr.getId(table_);
    const auto [at, isNew] = cache_.try_emplace(id);
    if (isNew)
        at->second = TextWriter(table_, predicate_, hostOperators_, hostNumbers_, hostFunctions_).write(nodeIdOf(id));
    return at->second;
}

} // namespace QL
