// The walker from texts of the host language to dimensions.
//
//   QLTypeSys::DummyValidator validator;
//   auto [exprId, diagnostic] = QL::SymbolicDimsFromTParseTree(table, validator)("[2*N 3]", signalDims);
//
// What is read is told in SymbolicExprFromTParseTree.h; here cells, matrices inside an expression and divisions are
// refused. Tables call it: SymbolicDimsTable::registerSymbolicTExpr.
#pragma once

#include <string>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolicExprFromTParseTree.h"
#include "qltypes/dimensions/NumericDims.h"
#include "qltypes/dimensions/QLSymbolicDimsErrorChecker.h"

namespace QL {

/// Reads texts of dimensions into an expression table.
class QL_EXPORT SymbolicDimsFromTParseTree : public SymbolicExprFromTParseTree {
  public:
    /// Keeps both addresses.
    SymbolicDimsFromTParseTree(SymbolicExprTable& table, SymbolValidator& validator);
    ~SymbolicDimsFromTParseTree() override;

    /// True.
    bool readsMatrixAsList() const override;
    /// False: one whole number is one dimension, whatever its class.
    bool shouldCreateIntValueNodeForIntegerValue() const override;
    /// True.
    bool supportLogicalValues() const override;
    /// Refuses matrices, cells and divisions, with a report.
    bool acceptsNode(Node* node, const char* text) override;
    /// Asks the validator.
    SymbolRecord resolveSymbol(const std::string& name, const char* text, unsigned long position) override;

    using SymbolicExprFromTParseTree::operator();

    /// Reads a text whose numeric dimensions are known; they stand in for what is not symbolic in it. No expression for
    /// a text without symbols. A matrix is a row of dimensions, or rows of which the first elements are the dimensions;
    /// the dimensions that it has beyond the numeric ones are told to the validator and left out.
    Registration operator()(const char* text, const QLTypeSys::NumericDims& dims);

    /// Where complaints are gathered.
    QLTypeSys::QLSymbolicDimsErrorChecker& getErrorChecker() { return checker_; }

  private:
    bool containsSymbol(Node* node, const char* text);
    bool hasSymbol(Node* node, const char* text);
    unsigned long visitMatrix(const Node& matrix, const char* text, const QLTypeSys::NumericDims& dims);

    QLTypeSys::QLSymbolicDimsErrorChecker checker_;
    SymbolValidator& validator_;
};

} // namespace QL
