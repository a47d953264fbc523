// The text of an expression as tokens. Everything that depends on blanks is settled here: what separates the elements
// of a matrix, whether a quote transposes or begins a text, what is a comment.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "qlplatform/language/ParseTree.h"

namespace language {

struct Token {
    ParseToken code;
    std::size_t begin;
    std::size_t end;
};

/// Reads one token at a time, so that the leftmost fault of a text is the one that is reported.
class Tokens {
  public:
    /// Stands before the first token. The bytes of `text` must outlive this.
    explicit Tokens(std::string_view text);

    const Token& current() const { return current_; }
    ParseToken code() const { return current_.code; }

    /// Moves to the next token and returns the one before; at the end of the text it stays. Raises what is wrong inside
    /// a token: `InvalidNumber`, `UnterminatedText`, `UnterminatedComment`.
    Token take();

    /// The current token for a message: 'x', the keyword 'end', the end of the text ...
    std::string shown() const;

  private:
    // Blanks separate elements directly inside a literal, a matrix or a cell, and nowhere else.
    enum class Bracket { literal, parameters, other };

    bool skipBlanks();
    bool skipBlockComment();
    bool isInLiteral() const { return !open_.empty() && open_.back() == Bracket::literal; }
    bool isBehindOperand() const;
    bool beginsElement() const;
    Token read();
    Token readWord();
    Token readText(char quote, ParseToken code);
    Token opening(ParseToken code, Bracket bracket);
    Token closing(ParseToken code);
    Token taking(ParseToken code, std::size_t numBytes);

    std::string_view text_;
    std::size_t at_ = 0; // behind the current token
    std::vector<Bracket> open_;
    bool closedParameters_ = false; // the current token closed the parameters of an anonymous function
    Token current_{ParseToken::none, 0, 0};
};

[[noreturn]] void raiseUnexpectedToken(const Tokens& tokens, std::string expected);
[[noreturn]] void raiseInvalidNumber(std::size_t position, std::string_view literal, std::string reason);
[[noreturn]] void raiseNestingTooDeep(std::size_t position);

} // namespace language
