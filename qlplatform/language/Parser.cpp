#include <array>
#include <optional>
#include <vector>

#include "qlplatform/language/ParseTreeBuilder_internal.h"
#include "qlplatform/language/Tokens_internal.h"
#include "qlplatform/services/Diagnostics.h"

namespace {

using language::Token;
using language::Tokens;

// How strongly binary operators bind, from the weakest. Prefix signs, powers and transposes bind more strongly.
enum Level : int { anything, orElse, andAlso, elementOr, elementAnd, comparison, range, sum, product };

struct BinarySign {
    ParseToken sign;
    ParseOperator code;
    Level level;
};
constexpr BinarySign binarySigns[] = {
    {ParseToken::doubleBar, ParseOperator::shortCircuitOr, orElse},
    {ParseToken::doubleAmpersand, ParseOperator::shortCircuitAnd, andAlso},
    {ParseToken::bar, ParseOperator::elementOr, elementOr},
    {ParseToken::ampersand, ParseOperator::elementAnd, elementAnd},
    {ParseToken::equalSign, ParseOperator::equal, comparison},
    {ParseToken::notEqualSign, ParseOperator::notEqual, comparison},
    {ParseToken::lessSign, ParseOperator::less, comparison},
    {ParseToken::lessOrEqualSign, ParseOperator::lessOrEqual, comparison},
    {ParseToken::greaterSign, ParseOperator::greater, comparison},
    {ParseToken::greaterOrEqualSign, ParseOperator::greaterOrEqual, comparison},
    {ParseToken::colon, ParseOperator::range, range},
    {ParseToken::plus, ParseOperator::add, sum},
    {ParseToken::minus, ParseOperator::subtract, sum},
    {ParseToken::times, ParseOperator::multiply, product},
    {ParseToken::elementTimes, ParseOperator::multiply, product},
    {ParseToken::slash, ParseOperator::division, product},
    {ParseToken::elementSlash, ParseOperator::division, product},
    {ParseToken::backslash, ParseOperator::division, product},
    {ParseToken::elementBackslash, ParseOperator::division, product},
};

const BinarySign* binarySign(ParseToken sign) {
    for (const BinarySign& row : binarySigns)
        if (row.sign == sign) return &row;
    return nullptr;
}

std::optional<ParseOperator> prefixOperator(ParseToken sign) {
    switch (sign) {
    case ParseToken::plus:
        return ParseOperator::unaryPlus;
    case ParseToken::minus:
        return ParseOperator::unaryMinus;
    case ParseToken::tilde:
        return ParseOperator::logicalNot;
    default:
        return std::nullopt;
    }
}

// An operand and the bytes that it takes in with the parentheses around it, which leave no node.
struct Operand {
    ParseNode* node;
    std::size_t begin;
    std::size_t end;
};

class Parser {
  public:
    explicit Parser(std::string_view text) : builder_(text), tokens_(builder_.source()) {}

    ParseNode* parse() {
        tokens_.take();
        skipLineEnds();
        const Operand whole = expression();
        skipLineEnds();
        if (tokens_.code() != ParseToken::endOfText) fail("an operator or the end of the text");
        return builder_.finish(whole.node);
    }

  private:
    // Counts what is open above the current token: each level is a level of recursion here and of the tree later.
    class Nesting {
      public:
        explicit Nesting(Parser& parser, int levels = 1) : depth_(parser.depth_), levels_(levels) {
            if (levels > parseTreeDepthLimit - depth_) language::raiseNestingTooDeep(parser.tokens_.current().begin);
            depth_ += levels;
        }
        ~Nesting() { depth_ -= levels_; }
        Nesting(const Nesting&) = delete;
        Nesting& operator=(const Nesting&) = delete;

      private:
        int& depth_;
        int levels_;
    };

    Operand expression() { return binary(anything); }
    Operand binary(int weakest);
    Operand prefixed();
    Operand power();
    Operand accessed();
    Operand primary();
    Operand grouped();
    Operand rows(ParseOperator code, ParseToken closer, std::string_view closerText);
    Operand row(std::string_view openerText, std::size_t opener, ParseToken closer, std::string_view closerText);
    Operand indexed(const Operand& base);
    Operand fieldOf(const Operand& base);
    Operand handle();
    Operand anonymousFunction(const Token& at);
    ParseNode* argument(ParseToken closer);

    Operand terminal(const Token& token) { return {builder_.terminal(token), token.begin, token.end}; }
    Operand node(ParseOperator code, const Token& token, std::size_t begin, std::size_t end,
                 std::span<ParseNode* const> children) {
        return {builder_.node(code, token, begin, end, children), begin, end};
    }
    Operand binaryNode(ParseOperator code, const Token& sign, const Operand& left, const Operand& right) {
        return node(code, sign, left.begin, right.end, std::array{left.node, right.node});
    }

    // An identifier that stands for no variable; `what` says what it names.
    Operand nameOf(std::string_view what) {
        if (tokens_.code() != ParseToken::identifier) fail("the name of " + std::string(what));
        Token name = tokens_.take();
        name.code = ParseToken::name;
        return terminal(name);
    }

    bool accept(ParseToken code) {
        if (tokens_.code() != code) return false;
        tokens_.take();
        return true;
    }
    void skipLineEnds() {
        while (accept(ParseToken::endOfLine)) {
        }
    }
    // These take views and stand apart, so that what recurses keeps no room for texts on the stack.
    [[noreturn]] void fail(std::string_view expected) const;
    [[noreturn]] void failInside(std::string_view others, std::string_view closerText, std::string_view openerText,
                                 std::size_t opener) const;

    ParseTreeBuilder builder_;
    Tokens tokens_;
    int depth_ = 0;
    int numOpenIndexes_ = 0; // end means something inside an index only
};

void Parser::fail(std::string_view expected) const { language::raiseUnexpectedToken(tokens_, std::string(expected)); }

// "an operator, ',' or ')' for the '(' at byte 3"
void Parser::failInside(std::string_view others, std::string_view closerText, std::string_view openerText,
                        std::size_t opener) const {
    fail(std::string(others) + " or '" + std::string(closerText) + "' for the '" + std::string(openerText) +
         "' at byte " + std::to_string(opener));
}

Operand Parser::binary(int weakest) {
    const Nesting nesting(*this);
    Operand left = prefixed();
    const ParseNode* openRange = nullptr; // start:stop, which a further colon makes start:step:stop
    for (;;) {
        const BinarySign* row = binarySign(tokens_.code());
        if (!row || row->level < weakest) return left;
        const Token sign = tokens_.take();
        const Operand right = binary(row->level + 1);
        if (row->code == ParseOperator::range && left.node == openRange) {
            builder_.append(left.node, right.node, right.end);
            left.end = right.end;
            openRange = nullptr;
        } else {
            left = binaryNode(row->code, sign, left, right);
            if (row->code == ParseOperator::range) openRange = left.node;
        }
    }
}

Operand Parser::prefixed() {
    const std::optional<ParseOperator> code = prefixOperator(tokens_.code());
    if (!code) return power();
    const Nesting nesting(*this);
    const Token sign = tokens_.take();
    const Operand operand = prefixed();
    return node(*code, sign, sign.begin, operand.end, {&operand.node, 1});
}

Operand Parser::power() {
    Operand base = accessed();
    for (;;) {
        const ParseToken code = tokens_.code();
        if (code == ParseToken::quote || code == ParseToken::elementQuote) {
            const Token sign = tokens_.take();
            base = node(ParseOperator::transpose, sign, base.begin, sign.end, {&base.node, 1});
        } else if (code == ParseToken::caret || code == ParseToken::elementCaret) {
            const Token sign = tokens_.take();
            const Operand exponent = prefixOperator(tokens_.code()) ? prefixed() : accessed();
            base = binaryNode(ParseOperator::power, sign, base, exponent);
        } else {
            return base;
        }
    }
}

// An operand with its indexes and fields, which names and what is reached from them can have.
Operand Parser::accessed() {
    const bool isName = tokens_.code() == ParseToken::identifier;
    Operand base = primary();
    while (isName) {
        if (tokens_.code() == ParseToken::parenthesis || tokens_.code() == ParseToken::brace)
            base = indexed(base);
        else if (tokens_.code() == ParseToken::dot)
            base = fieldOf(base);
        else
            break;
    }
    return base;
}

Operand Parser::primary() {
    switch (tokens_.code()) {
    case ParseToken::identifier:
    case ParseToken::number:
    case ParseToken::imaginaryNumber:
    case ParseToken::hexNumber:
    case ParseToken::binaryNumber:
    case ParseToken::charText:
    case ParseToken::stringText:
        return terminal(tokens_.take());
    case ParseToken::parenthesis:
        return grouped();
    case ParseToken::bracket:
        return rows(ParseOperator::matrix, ParseToken::closingBracket, "]");
    case ParseToken::brace:
        return rows(ParseOperator::cell, ParseToken::closingBrace, "}");
    case ParseToken::at:
        return handle();
    case ParseToken::endOfDimension:
        if (numOpenIndexes_ > 0) return terminal(tokens_.take());
        [[fallthrough]];
    default:
        fail("an operand");
    }
}

Operand Parser::grouped() {
    const Token opener = tokens_.take();
    const Operand inner = expression();
    if (tokens_.code() != ParseToken::closingParenthesis) failInside("an operator", ")", "(", opener.begin);
    return {inner.node, opener.begin, tokens_.take().end};
}

Operand Parser::rows(ParseOperator code, ParseToken closer, std::string_view closerText) {
    const std::string_view openerText = code == ParseOperator::matrix ? "[" : "{";
    const Token opener = tokens_.take();
    std::vector<ParseNode*> children;
    for (;;) {
        while (tokens_.code() == ParseToken::semicolon || tokens_.code() == ParseToken::endOfLine)
            tokens_.take();
        if (tokens_.code() == closer) break;
        children.push_back(row(openerText, opener.begin, closer, closerText).node);
    }
    return node(code, opener, opener.begin, tokens_.take().end, children);
}

// One row, up to what ends it. A comma may stand behind its last element.
Operand Parser::row(std::string_view openerText, std::size_t opener, ParseToken closer, std::string_view closerText) {
    const Nesting rowAndList(*this, 2);
    std::vector<ParseNode*> elements;
    const auto isAtEnd = [&] {
        const ParseToken code = tokens_.code();
        return code == closer || code == ParseToken::semicolon || code == ParseToken::endOfLine;
    };
    std::size_t begin = tokens_.current().begin;
    std::size_t end = begin;
    do {
        const Operand element = expression();
        elements.push_back(element.node);
        end = element.end;
    } while ((accept(ParseToken::separator) || accept(ParseToken::comma)) && !isAtEnd());
    if (!isAtEnd()) failInside("an operator, ',', ';'", closerText, openerText, opener);
    const Token none{ParseToken::none, begin, begin};
    const Operand list = node(ParseOperator::list, none, begin, end, elements);
    return node(ParseOperator::row, none, begin, end, {&list.node, 1});
}

Operand Parser::indexed(const Operand& base) {
    const Token opener = tokens_.take();
    const bool isBrace = opener.code == ParseToken::brace;
    const ParseToken closer = isBrace ? ParseToken::closingBrace : ParseToken::closingParenthesis;
    std::vector<ParseNode*> children{base.node};
    ++numOpenIndexes_;
    if (tokens_.code() != closer) {
        do
            children.push_back(argument(closer));
        while (accept(ParseToken::comma));
    }
    --numOpenIndexes_;
    if (tokens_.code() != closer)
        failInside("an operator, ','", isBrace ? "}" : ")", isBrace ? "{" : "(", opener.begin);
    return node(isBrace ? ParseOperator::braceIndex : ParseOperator::index, opener, base.begin, tokens_.take().end,
                children);
}

ParseNode* Parser::argument(ParseToken closer) {
    if (tokens_.code() != ParseToken::colon) return expression().node;
    Token colon = tokens_.take();
    if (tokens_.code() != ParseToken::comma && tokens_.code() != closer)
        fail("',' or the end of the index behind a colon that stands for a whole dimension");
    colon.code = ParseToken::wholeDimension;
    return terminal(colon).node;
}

Operand Parser::fieldOf(const Operand& base) {
    const Token dot = tokens_.take();
    if (tokens_.code() == ParseToken::parenthesis) return binaryNode(ParseOperator::dynamicField, dot, base, grouped());
    return binaryNode(ParseOperator::field, dot, base, nameOf("a field, or '('"));
}

Operand Parser::handle() {
    const Token at = tokens_.take();
    if (tokens_.code() == ParseToken::parenthesis) return anonymousFunction(at);
    Operand name = nameOf("a function, or '('");
    while (tokens_.code() == ParseToken::dot) {
        const Token dot = tokens_.take();
        name = binaryNode(ParseOperator::field, dot, name, nameOf("a function"));
    }
    return node(ParseOperator::functionHandle, at, at.begin, name.end, {&name.node, 1});
}

Operand Parser::anonymousFunction(const Token& at) {
    const Token opener = tokens_.take();
    std::vector<ParseNode*> children;
    if (tokens_.code() != ParseToken::closingParenthesis) {
        do {
            children.push_back(nameOf("a parameter").node);
        } while (accept(ParseToken::comma));
    }
    if (tokens_.code() != ParseToken::closingParenthesis) failInside("','", ")", "(", opener.begin);
    tokens_.take();
    const Operand body = expression();
    children.push_back(body.node);
    return node(ParseOperator::anonymousFunction, at, at.begin, body.end, children);
}

} // namespace

ParseNode* generate_parse_tree(std::string_view text, qlsvDiagnosticImpl** diagnostic) {
    if (diagnostic) *diagnostic = nullptr;
    try {
        return Parser(text).parse();
    } catch (const foundation::core::except::IException& refusal) {
        if (diagnostic) *diagnostic = qlsvCreateDiagnosticFromIException(refusal, false);
        return nullptr;
    }
}
