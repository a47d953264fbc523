#include "qlplatform/language/Tokens_internal.h"

#include <algorithm>
#include <array>

#include "qlplatform/language/NumberLiterals_internal.h"
#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/services/Raise_internal.h"

namespace language {

namespace {

constexpr const char* category = "Quillane:Language";
constexpr MessageText texts[] = {
    {category, "UnexpectedToken", "at byte {0}: expected {1}, found {2}"},
    {category, "InvalidNumber", "at byte {0}: '{1}' is no number, {2}"},
    {category, "UnterminatedText", "at byte {0}: the text that begins here has no closing {1}"},
    {category, "UnterminatedComment", "at byte {0}: the comment that begins here has no closing %} on its own line"},
    {category, "NestingTooDeep", "at byte {0}: the expression is nested deeper than {1} levels"},
};
const MessageTextTable registeredTexts(texts, std::size(texts));

[[noreturn]] void raiseAt(const char* leaf, std::size_t position, auto... arguments) {
    hostservices::raise(category, leaf, static_cast<long>(position), std::move(arguments)...);
}

// Signs, longer ones before those that they begin with. Quotes and brackets are not here.
struct Sign {
    std::string_view text;
    ParseToken code;
};
constexpr Sign signs[] = {
    {".*", ParseToken::elementTimes},
    {"./", ParseToken::elementSlash},
    {".\\", ParseToken::elementBackslash},
    {".^", ParseToken::elementCaret},
    {".'", ParseToken::elementQuote},
    {"==", ParseToken::equalSign},
    {"~=", ParseToken::notEqualSign},
    {"<=", ParseToken::lessOrEqualSign},
    {">=", ParseToken::greaterOrEqualSign},
    {"&&", ParseToken::doubleAmpersand},
    {"||", ParseToken::doubleBar},
    {".", ParseToken::dot},
    {":", ParseToken::colon},
    {"+", ParseToken::plus},
    {"-", ParseToken::minus},
    {"~", ParseToken::tilde},
    {"*", ParseToken::times},
    {"/", ParseToken::slash},
    {"\\", ParseToken::backslash},
    {"^", ParseToken::caret},
    {"<", ParseToken::lessSign},
    {">", ParseToken::greaterSign},
    {"&", ParseToken::ampersand},
    {"|", ParseToken::bar},
    {"@", ParseToken::at},
    {",", ParseToken::comma},
    {";", ParseToken::semicolon},
    {"\n", ParseToken::endOfLine},
};

constexpr std::array<std::string_view, 19> keywords = {
    "break", "case",      "catch",  "classdef",   "continue", "else", "elseif", "for", "function", "global",
    "if",    "otherwise", "parfor", "persistent", "return",   "spmd", "switch", "try", "while"};

bool isBlank(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\f' || c == '\v'; }

std::size_t skipBlanksOfLine(std::string_view text, std::size_t i) {
    while (isBlank(byteAt(text, i)))
        ++i;
    return i;
}

std::size_t endOfLineFrom(std::string_view text, std::size_t i) { return std::min(text.find('\n', i), text.size()); }

// Whether the line that `begin` begins holds `mark` and nothing else.
bool isLineOf(std::string_view text, std::size_t begin, std::string_view mark) {
    const std::size_t i = skipBlanksOfLine(text, begin);
    if (text.substr(i, mark.size()) != mark) return false;
    return skipBlanksOfLine(text, i + mark.size()) == endOfLineFrom(text, i);
}

std::string hexadecimal(unsigned char byte) {
    constexpr const char* digits = "0123456789ABCDEF";
    return {'0', 'x', digits[byte / 16], digits[byte % 16]};
}

} // namespace

Tokens::Tokens(std::string_view text) : text_(text) {}

Token Tokens::take() {
    const Token taken = current_;
    const bool blank = skipBlanks();
    if (blank && isInLiteral() && isBehindOperand() && beginsElement()) {
        current_ = {ParseToken::separator, at_, at_};
        return taken;
    }
    closedParameters_ = false;
    current_ = read();
    return taken;
}

// Blanks, continuations and comments; not the end of a line.
bool Tokens::skipBlanks() {
    const std::size_t before = at_;
    for (;;) {
        at_ = skipBlanksOfLine(text_, at_);
        if (text_.substr(at_, 3) == "...") {
            at_ = std::min(endOfLineFrom(text_, at_) + 1, text_.size());
        } else if (byteAt(text_, at_) != '%') {
            return at_ != before;
        } else if (!skipBlockComment()) {
            at_ = endOfLineFrom(text_, at_);
        }
    }
}

bool Tokens::skipBlockComment() {
    const std::size_t opening = at_;
    const std::size_t lineBreak = text_.substr(0, opening).rfind('\n');
    std::size_t line = lineBreak == std::string_view::npos ? 0 : lineBreak + 1;
    if (!isLineOf(text_, line, "%{")) return false;
    std::size_t depth = 0;
    while (line < text_.size()) {
        const std::size_t end = endOfLineFrom(text_, line);
        if (isLineOf(text_, line, "%{")) ++depth;
        if (isLineOf(text_, line, "%}") && --depth == 0) {
            at_ = end;
            return true;
        }
        line = end + 1;
    }
    raiseAt("UnterminatedComment", opening);
}

// Whether what was read last can stand at the end of an operand.
bool Tokens::isBehindOperand() const {
    switch (current_.code) {
    case ParseToken::identifier:
    case ParseToken::number:
    case ParseToken::imaginaryNumber:
    case ParseToken::hexNumber:
    case ParseToken::binaryNumber:
    case ParseToken::charText:
    case ParseToken::stringText:
    case ParseToken::quote:
    case ParseToken::elementQuote:
    case ParseToken::endOfDimension:
    case ParseToken::closingBracket:
    case ParseToken::closingBrace:
        return true;
    case ParseToken::closingParenthesis:
        return !closedParameters_;
    default:
        return false;
    }
}

// Whether an element begins here, behind an operand and blanks: what cannot go on with the operand does.
bool Tokens::beginsElement() const {
    const char first = byteAt(text_, at_);
    const char second = byteAt(text_, at_ + 1);
    if (first == '+' || first == '-') {
        const bool isContinued = text_.substr(at_ + 1, 3) == "...";
        return !isBlank(second) && second != '\n' && !isContinued;
    }
    if (first == '~') return second != '=';
    if (first == '.') return isDigit(second);
    return isWordPart(first) || (first != '\0' && std::string_view("'\"([{@").find(first) != std::string_view::npos);
}

Token Tokens::read() {
    const char first = byteAt(text_, at_);
    if (at_ == text_.size()) return taking(ParseToken::endOfText, 0);
    if (isLetter(first)) return readWord();
    if (isDigit(first) || (first == '.' && isDigit(byteAt(text_, at_ + 1)))) {
        const NumberLiteral literal = readNumber(text_, at_);
        return taking(literal.code, literal.end - at_);
    }
    switch (first) {
    case '"':
        return readText(first, ParseToken::stringText);
    case '\'':
        return isBehindOperand() ? taking(ParseToken::quote, 1) : readText(first, ParseToken::charText);
    case '(':
        return opening(ParseToken::parenthesis, current_.code == ParseToken::at ? Bracket::parameters : Bracket::other);
    case '[':
        return opening(ParseToken::bracket, Bracket::literal);
    case '{':
        return opening(ParseToken::brace, isBehindOperand() ? Bracket::other : Bracket::literal);
    case ')':
        return closing(ParseToken::closingParenthesis);
    case ']':
        return closing(ParseToken::closingBracket);
    case '}':
        return closing(ParseToken::closingBrace);
    default:
        break;
    }
    for (const Sign& sign : signs)
        if (text_.substr(at_, sign.text.size()) == sign.text) return taking(sign.code, sign.text.size());
    return taking(ParseToken::invalid, 1);
}

Token Tokens::readWord() {
    std::size_t end = at_;
    while (isWordPart(byteAt(text_, end)))
        ++end;
    const std::string_view word = text_.substr(at_, end - at_);
    ParseToken code = ParseToken::identifier;
    if (current_.code != ParseToken::dot) { // fields may be named as they like
        if (word == "end")
            code = ParseToken::endOfDimension;
        else if (std::find(keywords.begin(), keywords.end(), word) != keywords.end())
            code = ParseToken::keyword;
    }
    return taking(code, word.size());
}

Token Tokens::readText(char quote, ParseToken code) {
    for (std::size_t i = at_ + 1; i < text_.size() && text_[i] != '\n'; ++i) {
        if (text_[i] != quote) continue;
        if (byteAt(text_, i + 1) != quote) return taking(code, i + 1 - at_);
        ++i;
    }
    raiseAt("UnterminatedText", at_, std::string(1, quote));
}

Token Tokens::opening(ParseToken code, Bracket bracket) {
    open_.push_back(bracket);
    return taking(code, 1);
}

Token Tokens::closing(ParseToken code) {
    if (!open_.empty()) {
        closedParameters_ = open_.back() == Bracket::parameters;
        open_.pop_back();
    }
    return taking(code, 1);
}

Token Tokens::taking(ParseToken code, std::size_t numBytes) {
    const std::size_t begin = at_;
    at_ += numBytes;
    return {code, begin, at_};
}

std::string Tokens::shown() const {
    const std::string_view bytes = text_.substr(current_.begin, current_.end - current_.begin);
    switch (current_.code) {
    case ParseToken::endOfText:
        return "the end of the text";
    case ParseToken::endOfLine:
        return "the end of the line";
    case ParseToken::separator:
        return "the next element";
    case ParseToken::keyword:
    case ParseToken::endOfDimension:
        return "the keyword '" + std::string(bytes) + "'";
    case ParseToken::charText:
    case ParseToken::stringText:
        return "a text";
    case ParseToken::invalid:
        if (bytes.front() <= ' ' || bytes.front() > '~')
            return "the byte " + hexadecimal(static_cast<unsigned char>(bytes.front()));
        [[fallthrough]];
    default:
        return "'" + std::string(bytes) + "'";
    }
}

void raiseUnexpectedToken(const Tokens& tokens, std::string expected) {
    raiseAt("UnexpectedToken", tokens.current().begin, std::move(expected), tokens.shown());
}

void raiseInvalidNumber(std::size_t position, std::string_view literal, std::string reason) {
    raiseAt("InvalidNumber", position, std::string(literal), std::move(reason));
}

void raiseNestingTooDeep(std::size_t position) {
    raiseAt("NestingTooDeep", position, static_cast<long>(parseTreeDepthLimit));
}

} // namespace language
