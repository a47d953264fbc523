// Numbers as the host language writes them.
#pragma once

#include <cstddef>
#include <string_view>

#include "qlplatform/language/ParseTree.h"

namespace language {

struct NumberLiteral {
    ParseToken code;
    std::size_t end; ///< behind its last byte
};

/// Reads the number at `begin`, where a digit, or a point and a digit, stands. Raises `InvalidNumber`.
NumberLiteral readNumber(std::string_view text, std::size_t begin);

/// The value of a number that readNumber took; see _T_parse_tree_T::numberValue.
double numberValue(ParseToken code, std::string_view literal);

inline bool isDigit(char c) { return c >= '0' && c <= '9'; }
inline bool isLetter(char c) { return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z'); }
inline bool isWordPart(char c) { return isLetter(c) || isDigit(c) || c == '_'; }

/// The byte at `i`, a NUL behind the end.
inline char byteAt(std::string_view text, std::size_t i) { return i < text.size() ? text[i] : '\0'; }

} // namespace language
