// The host language's expressions as trees.
//
//   qlsvDiagnosticImpl* refusal = nullptr;
//   _T_parse_tree_T<char>* tree = generate_parse_tree("[N+1, 4]", &refusal);
//   if (tree) { visit(tree->child(0)); delete_parse_tree(tree); } else { puts(refusal->text().c_str()); ... }
//
// Precedence, strongest first; operators of one line group from the left:
//   parentheses; indexing, calls, fields
//   '  .'  ^  .^        what follows a power may have prefix signs, which then take in all that this line would: 2^-a^b
//                       is 2^(-(a^b)), and 2^-a' is 2^(-(a'))
//   prefix + - ~
//   * .* / ./ \ .\      + -      : (start:stop, start:step:stop)      < <= > >= == ~=      &      |      &&      ||
// Parentheses leave no node. Inside [] and {} blanks separate elements: a blank before + or - with none behind it makes
// the sign a prefix, and a quote behind a blank begins a text. A newline or ; ends a row. Everywhere % begins a comment
// up to the end of the line, %{ and %} alone on their lines enclose one, and ... goes on with the next line.
//
// All positions are byte offsets into the text, from 0.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "qlplatform/Export.h"

class qlsvDiagnosticImpl;

/// What a node is made of. Children stand in the order of the text.
enum class ParseOperator : int {
    none = 0,                ///< a terminal; see ParseToken
    expressionGoal = 1,      ///< the root; one child, the expression
    shortCircuitOr = 11,     ///< ||
    shortCircuitAnd = 12,    ///< &&
    elementOr = 13,          ///< |
    elementAnd = 14,         ///< &
    equal = 15,              ///< ==
    notEqual = 16,           ///< ~=
    less = 17,               ///< <
    lessOrEqual = 18,        ///< <=
    greater = 19,            ///< >
    greaterOrEqual = 20,     ///< >=
    range = 21,              ///< two children, start and stop, or three: start, step, stop
    matrix = 27,             ///< []; the children are its rows, those without an element left out
    cell = 83,               ///< {}; as matrix
    list = 84,               ///< what a row keeps its elements in
    row = 85,                ///< one child, the list; see elements()
    index = 86,              ///< a call or a paren index: what is called or indexed, then the arguments
    braceIndex = 87,         ///< a brace index: what is indexed, then the arguments
    field = 88,              ///< s.x: s, then the name
    dynamicField = 89,       ///< s.(expression): s, then the expression
    add = 90,                ///< binary +
    subtract = 91,           ///< binary -
    division = 92,           ///< / and ./, and \ and .\, which divide the second child by the first
    multiply = 93,           ///< * and .*
    power = 94,              ///< ^ and .^
    transpose = 95,          ///< ' and .'
    unaryPlus = 96,          ///< prefix +
    unaryMinus = 97,         ///< prefix -
    logicalNot = 98,         ///< ~
    functionHandle = 99,     ///< \@name: one child, the name, or the fields of a package
    anonymousFunction = 100, ///< \@(a, b) body: the names of the parameters, then the body
};

/// A terminal's kind, or the sign that an operator was written with.
enum class ParseToken : int {
    none = 0, ///< goals, rows and lists
    identifier = 40,
    number = 41,          ///< 12, 1.5, .5, 1e3, 1d-3
    imaginaryNumber = 42, ///< the same with i or j behind it
    hexNumber = 43,       ///< 0x1F, 0xFFs8
    binaryNumber = 44,    ///< 0b101, 0b1u16
    charText = 45,        ///< 'text'
    stringText = 46,      ///< "text"
    wholeDimension = 47,  ///< an index that is a colon and no more
    endOfDimension = 48,  ///< end inside an index
    name = 49, ///< a name of no variable: a field, a function behind \@, a parameter of an anonymous function

    parenthesis = 50, ///< (
    bracket = 51,     ///< [
    brace = 52,       ///< {
    at = 53,          ///< @
    dot = 54,         ///< .
    colon = 55,       ///< :
    plus = 56,
    minus = 57,
    tilde = 58,
    times = 59,              ///< *
    elementTimes = 60,       ///< .*
    slash = 61,              ///< /
    elementSlash = 62,       ///< ./
    backslash = 63,          ///< \ (backslash)
    elementBackslash = 64,   ///< .\ (point, backslash)
    caret = 65,              ///< ^
    elementCaret = 66,       ///< .^
    quote = 67,              ///< '
    elementQuote = 68,       ///< .'
    equalSign = 69,          ///< ==
    notEqualSign = 70,       ///< ~=
    lessSign = 71,           ///< <
    lessOrEqualSign = 72,    ///< <=
    greaterSign = 73,        ///< >
    greaterOrEqualSign = 74, ///< >=
    ampersand = 75,          ///< &
    bar = 76,                ///< |
    doubleAmpersand = 77,    ///< &&
    doubleBar = 78,          ///< ||

    // Tokens that no node carries.
    endOfText = 101,
    endOfLine = 102,
    comma = 103,
    semicolon = 104,
    separator = 105, ///< the blanks between two elements of a matrix or cell
    closingParenthesis = 106,
    closingBracket = 107,
    closingBrace = 108,
    keyword = 109, ///< any but end
    invalid = 110, ///< a byte that means nothing where it stands
};

/// The greatest depth of nesting, and the greatest height of a tree below its goal. A chain a + a + ... grows by one
/// level an operator; so what visits a tree may recurse on its height.
inline constexpr int parseTreeDepthLimit = 500;

template <class Char> class _T_parse_tree_T;

/// A node of the tree of an expression. Nodes, and the views that they return, are good until the tree is deleted.
template <> class QL_EXPORT _T_parse_tree_T<char> {
  public:
    /// Whether the node is a token: it has no operator and no children.
    bool isTerminal() const { return operatorCode_ == ParseOperator::none; }
    /// What the node does; `none` for a terminal.
    ParseOperator operatorCode() const { return operatorCode_; }
    /// The token of a terminal, or the sign of an operator.
    ParseToken tokenCode() const { return tokenCode_; }

    /// Where the node's own token begins: a terminal's first byte, an operator's sign, the opening bracket of an index,
    /// matrix or cell. A row and its list: where the first element begins. The goal: 0.
    std::size_t position() const { return position_; }

    /// The bytes that the node takes in, begin() to before end(): without parentheses around it, with those around its
    /// children. The goal: the whole text.
    std::size_t begin() const { return begin_; }
    /// Behind the last byte that the node takes in.
    std::size_t end() const { return end_; }

    /// The bytes from begin() to end().
    std::string_view text() const { return source_.substr(begin_, end_ - begin_); }

    /// Number of children; 0 for a terminal.
    std::size_t numChildren() const { return children_.size(); }

    /// Unchecked: `i` must be below numChildren().
    _T_parse_tree_T* child(std::size_t i) const { return children_[i]; }

    /// The node whose children are this node's elements: for a row its list, for any other the node itself.
    const _T_parse_tree_T& elements() const { return operatorCode_ == ParseOperator::row ? *children_.front() : *this; }

    /// The value of a number: the factor of i for an imaginary one, the two's complement for a hexadecimal or binary
    /// one with a signed suffix; an infinity for a decimal one out of range. Unchecked: the node must be a number.
    double numberValue() const;

    /// What a char or string text says: without its outer quotes, doubled ones single. Unchecked: the node must be one.
    std::string stringValue() const;

  private:
    friend class ParseTreeBuilder;
    _T_parse_tree_T() = default;

    ParseOperator operatorCode_ = ParseOperator::none;
    ParseToken tokenCode_ = ParseToken::none;
    int height_ = 1;
    std::size_t position_ = 0;
    std::size_t begin_ = 0;
    std::size_t end_ = 0;
    std::string_view source_;                // the whole text, owned by the tree
    std::vector<_T_parse_tree_T*> children_; // owned by the tree
};

/// The tree of one expression; its root is an expressionGoal. Free it with delete_parse_tree. Null for ill-formed
/// text; then `diagnostic`, when not null, receives one message that the caller owns, and null otherwise. The
/// message's first argument is the position, a long; category "Quillane:Language":
///   UnexpectedToken(position, what was expected, what was found)
///   InvalidNumber(position, the number, what is wrong with it)
///   UnterminatedText(position of the opening quote, the quote)
///   UnterminatedComment(position of the opening %{)
///   NestingTooDeep(position, parseTreeDepthLimit)
/// Bytes above 127 may stand in texts and comments only.
QL_EXPORT _T_parse_tree_T<char>* generate_parse_tree(std::string_view text, qlsvDiagnosticImpl** diagnostic = nullptr);

/// Frees a whole tree by its root; null is allowed.
QL_EXPORT void delete_parse_tree(_T_parse_tree_T<char>* tree);
