#include "qltypes/dimensions/SymbolicDimsFromTParseTree.h"

#include <algorithm>

#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qltypes/dimensions/DummyValidator.h"

namespace QLTypeSys {

QL::SymbolRecord DummyValidator::resolveSymbol(const std::string& name, const char*, unsigned long) {
    return {nullptr, name};
}

} // namespace QLTypeSys

namespace QL {

using QLTypeSys::NumericDims;

namespace {

constexpr unsigned long noExpr = SymbolicExprTable::noExpr;

class Quietly {
  public:
    explicit Quietly(QLSymbolicExprErrorChecker& checker) : checker_(checker), wasQuiet_(checker.isQuiet()) {
        checker.setQuiet(true);
    }
    ~Quietly() { checker_.setQuiet(wasQuiet_); }
    Quietly(const Quietly&) = delete;
    Quietly& operator=(const Quietly&) = delete;

  private:
    QLSymbolicExprErrorChecker& checker_;
    bool wasQuiet_;
};

} // namespace

SymbolicDimsFromTParseTree::SymbolicDimsFromTParseTree(SymbolicExprTable& table, SymbolValidator& validator)
    : SymbolicExprFromTParseTree(table), validator_(validator) {
    setErrorChecker(checker_);
}
SymbolicDimsFromTParseTree::~SymbolicDimsFromTParseTree() = default;

bool SymbolicDimsFromTParseTree::readsMatrixAsList() const { return true; }
bool SymbolicDimsFromTParseTree::shouldCreateIntValueNodeForIntegerValue() const { return false; }
bool SymbolicDimsFromTParseTree::supportLogicalValues() const { return true; }

bool SymbolicDimsFromTParseTree::acceptsNode(Node* node, const char* text) {
    switch (node->operatorCode()) {
    case ParseOperator::cell:
    case ParseOperator::matrix:
        checker_.reportUnhandledExpr(node, text);
        return false;
    case ParseOperator::division:
        checker_.reportDivisionExpr(node, text);
        return false;
    default:
        return true;
    }
}

SymbolRecord SymbolicDimsFromTParseTree::resolveSymbol(const std::string& name, const char* text,
                                                       unsigned long position) {
    return validator_.resolveSymbol(name, text, position);
}

SymbolicDimsFromTParseTree::Registration SymbolicDimsFromTParseTree::operator()(const char* text,
                                                                                const NumericDims& dims) {
    checker_.clearPending();
    const Tree tree = parse(text);
    if (!tree) return finish(noExpr);
    Node* const node = skipExprGoal(tree.get());
    if (node->operatorCode() == ParseOperator::matrix) return finish(visitMatrix(*node, text, dims));
    return finish(containsSymbol(node, text) ? visitNode(node, text) : noExpr);
}

bool SymbolicDimsFromTParseTree::containsSymbol(Node* node, const char* text) {
    const Quietly quietly(checker_);
    return hasSymbol(node, text);
}

bool SymbolicDimsFromTParseTree::hasSymbol(Node* node, const char* text) {
    if (!node->isTerminal()) {
        const Node& parent = node->elements();
        // The name of a function is no identifier of a symbol.
        for (std::size_t i = isKnownCall(parent) ? 1 : 0; i < parent.numChildren(); ++i)
            if (hasSymbol(parent.child(i), text)) return true;
        return false;
    }
    if (node->tokenCode() != ParseToken::identifier) return false;
    const unsigned long exprId = visitId(node, text);
    return exprId != noExpr && getTable().get(exprId).getOp() == SymbolicOp::StringSymbol;
}

unsigned long SymbolicDimsFromTParseTree::visitMatrix(const Node& matrix, const char* text, const NumericDims& dims) {
    const std::size_t numRows = matrix.numChildren();
    const std::size_t numDims = dims.getNumDims();
    if (numRows == 0) return noExpr;
    std::vector<Node*> elements;
    for (std::size_t row = 0; row < numRows; ++row) {
        const Node& inRow = matrix.child(row)->elements();
        const std::size_t numTaken = numRows == 1 ? inRow.numChildren() : 1;
        for (std::size_t i = 0; i < numTaken; ++i)
            elements.push_back(inRow.child(i));
    }
    if (numRows == 1 && numDims > elements.size()) return noExpr;
    std::vector<char> areSymbolic(elements.size());
    std::ranges::transform(elements, areSymbolic.begin(), [&](Node* element) { return containsSymbol(element, text); });
    if (elements.size() == 1) return areSymbolic[0] ? visitNode(elements[0], text) : noExpr;
    if (std::ranges::find(areSymbolic, true) == areSymbolic.end()) return noExpr;

    std::vector<unsigned long> entries(elements.size(), noExpr);
    bool isSymbolic = false;
    for (std::size_t i = 0; i < entries.size(); ++i) {
        entries[i] = visitNode(elements[i], text);
        if (areSymbolic[i] && entries[i] != noExpr)
            isSymbolic = true;
        else if (i < numDims)
            entries[i] = getTable().addInt(static_cast<int>(dims.getDim(i)));
    }
    for (std::size_t i = numDims; i < entries.size(); ++i)
        validator_.reportLossOfSymbolicDimensions(checker_.pending(), entries[i]);
    if (numDims == 1) return entries[0];
    entries.resize(numDims, 0); // kept: rows fewer than the dimensions leave INHERIT behind them
    return isSymbolic ? getTable().add(SymbolicOp::ND, entries) : noExpr;
}

} // namespace QL
