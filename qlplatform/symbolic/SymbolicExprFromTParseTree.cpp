#include "qlplatform/symbolic/SymbolicExprFromTParseTree.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <limits>
#include <optional>

#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/services/Raise_internal.h"
#include "qlplatform/strings/Strings.h"
#include "qlplatform/symbolic/SymbolicExprEval.h"
#include "qlplatform/symbolic/SymbolicExprTranslate.h"

namespace QL {

namespace {

constexpr unsigned long noExpr = SymbolicExprTable::noExpr;

constexpr MessageText texts[] = {
    {"Quillane:SymbolicExpr", "InvalidExpression", "this is no expression:\n  {0}\n {1}"},
};
const MessageTextTable registeredTexts(texts, std::size(texts));

struct Function {
    std::string_view name;
    SymbolicOp op;
    std::size_t numArguments;
};
constexpr Function functions[] = {
    {"abs", SymbolicOp::Abs, 1},
    {"and", SymbolicOp::And, 2},
    {"ceil", SymbolicOp::Ceil, 1},
    {"eq", SymbolicOp::Equal, 2},
    {"fix", SymbolicOp::Fix, 1},
    {"floor", SymbolicOp::Floor, 1},
    {"ge", SymbolicOp::GreaterThanOrEqual, 2},
    {"gt", SymbolicOp::GreaterThan, 2},
    {"le", SymbolicOp::LessThanOrEqual, 2},
    {"lt", SymbolicOp::LessThan, 2},
    {"max", SymbolicOp::Max, 2},
    {"min", SymbolicOp::Min, 2},
    {"mod", SymbolicOp::Mod, 2},
    {"ne", SymbolicOp::NotEqual, 2},
    {"not", SymbolicOp::Not, 1},
    {"or", SymbolicOp::Or, 2},
    {"power", SymbolicOp::Power, 2},
    {"rem", SymbolicOp::Rem, 2},
    {"round", SymbolicOp::Round, 1},
};

bool isIdentifier(const _T_parse_tree_T<char>& node) {
    return node.isTerminal() && node.tokenCode() == ParseToken::identifier;
}

bool isNumber(const _T_parse_tree_T<char>& node) {
    const ParseToken code = node.tokenCode();
    return node.isTerminal() &&
           (code == ParseToken::number || code == ParseToken::hexNumber || code == ParseToken::binaryNumber);
}

// The function that a call calls; null for any other node.
const Function* calledFunction(const _T_parse_tree_T<char>& node) {
    if (node.operatorCode() != ParseOperator::index || !isIdentifier(*node.child(0))) return nullptr;
    const auto* found = std::ranges::find(functions, node.child(0)->text(), &Function::name);
    return found == std::end(functions) ? nullptr : found;
}

// The operator over two operands, in the order of the text.
std::optional<SymbolicOp> binaryOp(ParseOperator code) {
    switch (code) {
    case ParseOperator::shortCircuitOr:
    case ParseOperator::elementOr:
        return SymbolicOp::Or;
    case ParseOperator::shortCircuitAnd:
    case ParseOperator::elementAnd:
        return SymbolicOp::And;
    case ParseOperator::equal:
        return SymbolicOp::Equal;
    case ParseOperator::notEqual:
        return SymbolicOp::NotEqual;
    case ParseOperator::less:
        return SymbolicOp::LessThan;
    case ParseOperator::lessOrEqual:
        return SymbolicOp::LessThanOrEqual;
    case ParseOperator::greater:
        return SymbolicOp::GreaterThan;
    case ParseOperator::greaterOrEqual:
        return SymbolicOp::GreaterThanOrEqual;
    case ParseOperator::add:
        return SymbolicOp::Plus;
    case ParseOperator::subtract:
        return SymbolicOp::Minus;
    case ParseOperator::multiply:
        return SymbolicOp::Multiply;
    case ParseOperator::power:
        return SymbolicOp::Power;
    default:
        return std::nullopt;
    }
}

bool isWhole(double value) { return std::isfinite(value) && std::trunc(value) == value; }

bool fitsInt(double value) {
    return value >= std::numeric_limits<int>::min() && value <= std::numeric_limits<int>::max();
}

// The real number that an array of one element holds; nothing when its class has none or no double is that number.
std::optional<double> numberIn(const txArray_tag* array) {
    std::optional<double> number;
    const auto take = [&]<class T>(T) {
        if (!txHasElements<T>(array)) return;
        const T value = txGetElements<T>(array).front();
        const double rounded = static_cast<double>(value);
        // 2^63 and 2^64, to which only what no double holds is rounded, are not cast back.
        const bool isBeyond = std::is_integral_v<T> && rounded >= 0x1p63 && (std::is_signed_v<T> || rounded >= 0x1p64);
        if (!std::is_integral_v<T> || (!isBeyond && static_cast<T>(rounded) == value)) number = rounded;
    };
    take(double());
    take(float());
    take(std::int8_t());
    take(std::uint8_t());
    take(std::int16_t());
    take(std::uint16_t());
    take(std::int32_t());
    take(std::uint32_t());
    take(std::int64_t());
    take(std::uint64_t());
    return number;
}

bool isFloatingClass(const txArray_tag* array) {
    return txGetClassID(array) == txClassDouble || txGetClassID(array) == txClassSingle;
}

bool isNumericClass(const txArray_tag* array) {
    const txClassID classId = txGetClassID(array);
    return classId >= txClassDouble && classId <= txClassUint64;
}

} // namespace

SymbolicExprFromTParseTree::~SymbolicExprFromTParseTree() = default;

void SymbolicExprFromTParseTree::enableDiagnostics() { checker_->setQuiet(false); }

void SymbolicExprFromTParseTree::reportDiagnostic(qlsvDiagnosticImpl* diagnostic) {
    checker_->reportDiagnostic(diagnostic);
}

SymbolicExprFromTParseTree::Registration SymbolicExprFromTParseTree::operator()(const std::u16string& text) {
    checker_->clearPending();
    if (std::ranges::any_of(text, [](char16_t unit) { return unit > 127; })) {
        if (qlsvDiagnosticImpl* diagnostic = checker_->createNonASCIIStringDiagnostic(text)) {
            reportDiagnostic(diagnostic);
            return finish(noExpr);
        }
    }
    const std::string narrow = qlsvUtf8FromUtf16(text);
    const Tree tree = parse(narrow);
    if (!tree) return finish(noExpr);
    Node* const node = skipExprGoal(tree.get());
    const bool isList = node->operatorCode() == ParseOperator::matrix && readsMatrixAsList();
    return finish(isList ? visitList(node, narrow.c_str()) : visitNode(node, narrow.c_str()));
}

std::vector<double> SymbolicExprFromTParseTree::eval(unsigned long exprId) const {
    return SymbolicExprEval(table_).eval(exprId);
}

SymbolicExprFromTParseTree::Node* SymbolicExprFromTParseTree::skipExprGoal(Node* node) {
    return node->operatorCode() == ParseOperator::expressionGoal ? node->child(0) : node;
}

SymbolicExprFromTParseTree::Tree SymbolicExprFromTParseTree::parse(std::string_view text) {
    qlsvDiagnosticImpl* refusal = nullptr;
    Tree tree(generate_parse_tree(text, &refusal));
    if (!tree) reportInvalidExpr(std::string(text).c_str(), refusal);
    return tree;
}

SymbolicExprFromTParseTree::Registration SymbolicExprFromTParseTree::finish(unsigned long exprId) {
    if (exprId != noExpr) exprId = SymbolicExprT2C(table_)(exprId);
    return {exprId, checker_->takePending()};
}

void SymbolicExprFromTParseTree::reportInvalidExpr(const char* text, qlsvDiagnosticImpl* refusal) {
    struct Discarding {
        qlsvDiagnosticImpl*& diagnostic;
        ~Discarding() { qlsvDiscardDiagnostic(diagnostic); }
    } const discarding{refusal};
    if (checker_->isQuiet()) return;
    if (refusal && !refusal->isOutOfMemory()) {
        const long position = boost::get<long>(refusal->item(0).arguments.front());
        reportDiagnostic(
            qlsvCreateDiagnostic(hostservices::message("Quillane:SymbolicExpr", "InvalidExpression", std::string(text),
                                                       std::string(static_cast<std::size_t>(position) + 1, ' ') + '^'),
                                 ""));
    }
    reportDiagnostic(std::exchange(refusal, nullptr));
}

unsigned long SymbolicExprFromTParseTree::visitNode(Node* node, const char* text) {
    if (qlsvGetNumItemsInDiagnostic(checker_->pending()) >= maxMessages) return noExpr;
    if (!acceptsNode(node, text)) return noExpr;
    return node->isTerminal() ? visitTerminal(node, text) : visitOperator(node, text);
}

unsigned long SymbolicExprFromTParseTree::visitOperator(Node* node, const char* text) {
    const ParseOperator code = node->operatorCode();
    if (const std::optional<SymbolicOp> op = binaryOp(code))
        return visitOperands(*op, std::array{node->child(0), node->child(1)}, text);
    switch (code) {
    case ParseOperator::division: {
        const bool isLeft =
            node->tokenCode() == ParseToken::backslash || node->tokenCode() == ParseToken::elementBackslash;
        return visitOperands(SymbolicOp::Divide, std::array{node->child(isLeft ? 1 : 0), node->child(isLeft ? 0 : 1)},
                             text);
    }
    case ParseOperator::unaryPlus:
    case ParseOperator::transpose: // of a scalar that is not complex
        return visitNode(node->child(0), text);
    case ParseOperator::unaryMinus:
        return visitMinus(node, text);
    case ParseOperator::logicalNot:
        return visitOperands(SymbolicOp::Not, std::array{node->child(0)}, text);
    case ParseOperator::index:
        return visitCall(node, text);
    default:
        checker_->reportUnhandledExpr(node, text);
        return noExpr;
    }
}

unsigned long SymbolicExprFromTParseTree::visitOperands(SymbolicOp op, std::span<Node* const> operands,
                                                        const char* text) {
    std::array<unsigned long, 2> ids{};
    bool areValid = true;
    for (std::size_t i = 0; i < operands.size(); ++i) {
        ids[i] = visitNode(operands[i], text);
        areValid = areValid && ids[i] != noExpr;
    }
    return areValid ? table_.add(op, std::span(ids).first(operands.size())) : noExpr;
}

// The minus before a literal belongs to its value: -3 is a number, -(3) an operator over one.
unsigned long SymbolicExprFromTParseTree::visitMinus(Node* node, const char* text) {
    Node* const operand = node->child(0);
    if (!isNumber(*operand) || operand->end() != node->end())
        return visitOperands(SymbolicOp::UnaryMinus, std::array{operand}, text);
    return acceptsNode(operand, text) ? visitNumber(*node, -operand->numberValue(), text) : noExpr;
}

unsigned long SymbolicExprFromTParseTree::visitCall(Node* node, const char* text) {
    const std::size_t numArguments = node->numChildren() - 1;
    const Function* const function = calledFunction(*node);
    if (function && numArguments == function->numArguments) {
        std::array<Node*, 2> arguments{};
        for (std::size_t i = 0; i < numArguments; ++i)
            arguments[i] = node->child(i + 1);
        return visitOperands(function->op, std::span(arguments).first(numArguments), text);
    }
    if (!isIdentifier(*node->child(0))) {
        checker_->reportUnhandledExpr(node, text);
    } else if (!checker_->isQuiet()) {
        const unsigned long functionId = table_.addSymbol(std::string(node->child(0)->text()));
        if (function)
            checker_->reportInvalidNumArgs(functionId, numArguments, function->numArguments, node, text, table_);
        else
            checker_->reportUnsupportedFcn(functionId, node, text, table_);
    }
    return noExpr;
}

bool SymbolicExprFromTParseTree::isKnownCall(const Node& node) { return calledFunction(node) != nullptr; }

unsigned long SymbolicExprFromTParseTree::visitTerminal(Node* node, const char* text) {
    switch (node->tokenCode()) {
    case ParseToken::identifier:
        return visitId(node, text);
    case ParseToken::number:
    case ParseToken::hexNumber:
    case ParseToken::binaryNumber:
        return visitNumber(*node, node->numberValue(), text);
    case ParseToken::imaginaryNumber:
        checker_->reportComplexValue(std::string(node->text()), text, node->position());
        return noExpr;
    case ParseToken::charText:
    case ParseToken::stringText:
        checker_->reportInvalidLiteralValue(std::string(node->text()), text, node->position());
        return noExpr;
    default:
        checker_->reportUnhandledExpr(node, text);
        return noExpr;
    }
}

unsigned long SymbolicExprFromTParseTree::visitNumber(const Node& literal, double value, const char* text) {
    if (isWhole(value) && fitsInt(value)) return table_.addInt(static_cast<int>(value));
    const std::string name(literal.text());
    if (isWhole(value))
        checker_->reportIntegerLiteralOverflow(name, text, literal.position());
    else
        checker_->reportInvalidLiteralValue(name, text, literal.position());
    return table_.addDouble(value);
}

unsigned long SymbolicExprFromTParseTree::visitId(Node* node, const char* text) {
    const std::string name(node->text());
    if (name == "true" || name == "false") return truthValue(name == "true", name, text, node->position());
    if (name == "Inf" || name == "inf") return visitNumber(*node, std::numeric_limits<double>::infinity(), text);
    if (name == "NaN" || name == "nan") return visitNumber(*node, std::numeric_limits<double>::quiet_NaN(), text);
    return resolveIdentifier(name, text, node->position());
}

unsigned long SymbolicExprFromTParseTree::resolveIdentifier(const std::string& name, const char* text,
                                                            unsigned long position) {
    const SymbolRecord record = resolveSymbol(name, text, position);
    unsigned long value = noExpr;
    if (record.value) {
        value = getNumberFromTxArray(record.value.get(), name, text, position);
        if (value == noExpr) return noExpr;
    }
    if (record.name.empty()) return value;
    const unsigned long symbol =
        value == noExpr ? table_.addSymbol(record.name) : table_.registerValueId(record.name, value);
    if (record.name != name && SymbolicExprTable::isUnsetValue(table_.getValueId(table_.addSymbol(name))))
        table_.registerValueId(name, symbol);
    return symbol;
}

unsigned long SymbolicExprFromTParseTree::getNumberFromTxArray(const txArray_tag* array, const std::string& name,
                                                               const char* text, unsigned long position) {
    const bool isLogical = txGetClassID(array) == txClassLogical;
    if (!isLogical && !isNumericClass(array)) {
        checker_->reportUnsupportedValue(name, text, position);
    } else if (txGetNumberOfElements(array) != 1) {
        checker_->reportNonScalarValue(name, text, position);
    } else if (txIsComplex(array)) {
        checker_->reportComplexValue(name, text, position);
    } else if (isLogical) {
        return truthValue(txGetElements<bool>(array).front(), name, text, position);
    } else if (const std::optional<double> number = numberIn(array)) {
        if (!isWhole(*number)) checker_->reportNonIntegerValue(name, text, position);
        const bool staysDouble = shouldCreateIntValueNodeForIntegerValue() && isFloatingClass(array);
        return !staysDouble && isWhole(*number) && fitsInt(*number) ? table_.addInt(static_cast<int>(*number))
                                                                    : table_.addDouble(*number);
    } else {
        checker_->reportUnsupportedValue(name, text, position);
    }
    return noExpr;
}

unsigned long SymbolicExprFromTParseTree::truthValue(bool value, const std::string& name, const char* text,
                                                     unsigned long position) {
    if (supportLogicalValues()) return table_.addBool(value);
    checker_->reportLogicalValue(name, text, position);
    return noExpr;
}

// A row of elements, or rows of one element each.
unsigned long SymbolicExprFromTParseTree::visitList(Node* matrix, const char* text) {
    const std::size_t numRows = matrix->numChildren();
    std::vector<Node*> elements;
    for (std::size_t i = 0; i < numRows; ++i) {
        const Node& row = matrix->child(i)->elements();
        if (numRows > 1 && row.numChildren() > 1) {
            elements.clear();
            break;
        }
        for (std::size_t j = 0; j < row.numChildren(); ++j)
            elements.push_back(row.child(j));
    }
    if (elements.empty()) {
        checker_->reportUnhandledExpr(matrix, text);
        return noExpr;
    }
    std::vector<unsigned long> ids;
    ids.reserve(elements.size());
    for (Node* const element : elements)
        ids.push_back(visitNode(element, text));
    if (std::ranges::find(ids, noExpr) != ids.end()) return noExpr;
    return ids.size() == 1 ? ids.front() : table_.add(SymbolicOp::ND, ids);
}

} // namespace QL
