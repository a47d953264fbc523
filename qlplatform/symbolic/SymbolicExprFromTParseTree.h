// The walker: texts of the host language become symbolic expressions.
//
//   class Walker : public QL::SymbolicExprFromTParseTree { ... };    // says what identifiers stand for
//   const auto [exprId, diagnostic] = Walker(table)(u"2*N + 1");
//
// What is read, as doubles or whole numbers of a table:
//   identifiers                        what resolveSymbol says of them; true, false, Inf, inf, NaN, nan are values
//   12  0x1F  0b101  1e3  -5           integer values when whole and of 32 bits, double values otherwise; -(5) is an
//                                      operator over a number
//   + -  * .*  ^ .^  ' .'  / ./ \ .\   elementwise and matrix operators are one, for all is scalar; ' changes nothing
//   < <= > >= == ~=  & && | ||  ~      comparisons and logic
//   abs ceil fix floor not round       calls with one argument
//   and eq ge gt le lt max min mod     calls with two
//   ne or power rem                    calls with two
//   [a b c]  [a, b, c]  [a; b; c]      a list, as the whole text only; [a] is a
//
// Everything else, and what the checker is told of besides, is in QLSymbolicExprErrorChecker.h. What cannot be read
// gives no expression; the rest of the text is still visited, so that all complaints come at once.
//
// A walker is made for one text or a few, on the stack, and used by one thread. It recurses on the height of the tree,
// which the parser bounds (parseTreeDepthLimit).
#pragma once

#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/language/ParseTree.h"
#include "qlplatform/symbolic/QLSymbolicExprErrorChecker.h"
#include "qlplatform/symbolic/SymbolValidator.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"

namespace QL {

/// Reads texts of the host language into an expression table: walks the tree of a text and makes its expressions.
class QL_EXPORT SymbolicExprFromTParseTree {
  public:
    /// A node of the tree of a text.
    using Node = _T_parse_tree_T<char>;

    /// An expression id or SymbolicExprTable::noExpr, and the diagnostic of all complaints, null when there are none;
    /// the caller owns it. A valid id can come with a diagnostic; no expression can come without one.
    using Registration = std::pair<unsigned long, qlsvDiagnosticImpl*>;

    /// When so many messages are pending, nothing more is visited: a text of errors does not fill the memory with
    /// copies of itself.
    static constexpr int maxMessages = 64;

    virtual ~SymbolicExprFromTParseTree();
    SymbolicExprFromTParseTree(const SymbolicExprFromTParseTree&) = delete;
    SymbolicExprFromTParseTree& operator=(const SymbolicExprFromTParseTree&) = delete;

    /// Whether a text that is a matrix as a whole is read as a list.
    virtual bool readsMatrixAsList() const = 0;

    /// Whether a value keeps the kind of its class: only one of an integer class makes an integer value then. Otherwise
    /// every whole number of 32 bits does. Literals always do.
    virtual bool shouldCreateIntValueNodeForIntegerValue() const = 0;

    /// Whether logical values are read, as truth values; otherwise they are reported.
    virtual bool supportLogicalValues() const = 0;

    /// Called for every node before it is read. One that is not accepted gives no expression, and reporting it is up to
    /// the filter.
    virtual bool acceptsNode(Node* node, const char* text) = 0;

    /// What an identifier stands for, which begins at byte `position` of the whole expression `text`.
    virtual SymbolRecord resolveSymbol(const std::string& name, const char* text, unsigned long position) = 0;

    /// Ends what setQuiet(true) of the checker began.
    virtual void enableDiagnostics();

    /// Hands a diagnostic to the checker, which takes it over.
    virtual void reportDiagnostic(qlsvDiagnosticImpl* diagnostic);

    /// Reads a whole text; the expression is in C's form (SymbolicExprTranslate.h).
    Registration operator()(const std::u16string& text);

    /// The value of each dimension under what is bound to the symbols, as SymbolicExprEval.
    std::vector<double> eval(unsigned long exprId) const;

    // These give an expression id or noExpr, and leave complaints pending at the checker. `text` is the whole text.

    /// The expression of a node, in the host language's form.
    unsigned long visitNode(Node* node, const char* text);

    /// The expression of an identifier. Unchecked: the node must be one.
    unsigned long visitId(Node* node, const char* text);

    /// Asks resolveSymbol and binds the value that it gives to the symbol. A symbol of another name is also bound to
    /// `name`, as long as that has no value.
    unsigned long resolveIdentifier(const std::string& name, const char* text, unsigned long position);

    /// The number that a host array holds, or a truth value. `array` may be null.
    unsigned long getNumberFromTxArray(const txArray_tag* array, const std::string& name, const char* text,
                                       unsigned long position);

    /// The expression under the root of a tree; a node that is no root is given back.
    static Node* skipExprGoal(Node* node);

    /// Reports a text that the parser refuses, `InvalidExpression` with the expression and a marker line, and behind it
    /// the parser's own message `refusal`, which is taken over.
    void reportInvalidExpr(const char* text, qlsvDiagnosticImpl* refusal);

  protected:
    /// Deletes the tree that a Tree owns.
    struct TreeDeleter {
        /// Deletes the tree; null is allowed.
        void operator()(Node* tree) const { delete_parse_tree(tree); }
    };
    /// Owns the tree of a text.
    using Tree = std::unique_ptr<Node, TreeDeleter>;

    /// Keeps the address of the table.
    explicit SymbolicExprFromTParseTree(SymbolicExprTable& table) : table_(table) {}

    /// To be called once, before anything is read. Keeps the address, which is no longer used when this is destroyed.
    void setErrorChecker(QLSymbolicExprErrorChecker& checker) { checker_ = &checker; }

    /// The table that expressions are made in.
    SymbolicExprTable& getTable() const { return table_; }

    /// The tree of a text, or null with a report.
    Tree parse(std::string_view text);

    /// What a call of an operator() answers: in C's form, with what is pending.
    Registration finish(unsigned long exprId);

    /// Whether a node is a call of a function that is read.
    static bool isKnownCall(const Node& node);

  private:
    unsigned long visitOperator(Node* node, const char* text);
    unsigned long visitMinus(Node* node, const char* text);
    unsigned long visitOperands(SymbolicOp op, std::span<Node* const> operands, const char* text);
    unsigned long visitCall(Node* node, const char* text);
    unsigned long visitTerminal(Node* node, const char* text);
    unsigned long visitNumber(const Node& literal, double value, const char* text);
    unsigned long visitList(Node* matrix, const char* text);
    unsigned long truthValue(bool value, const std::string& name, const char* text, unsigned long position);

    SymbolicExprTable& table_;
    QLSymbolicExprErrorChecker* checker_ = nullptr; // owned by the derived class
};

} // namespace QL
