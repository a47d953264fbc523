// Trees of the host language as texts, for tests and fuzzers.
#pragma once

#include <string>

#include "qlplatform/language/ParseTree.h"

namespace parsetrees {

/// The tree in prefix form: (+ a (* b c)), (call f x), (matrix (row a b)), (neg a). Goals and lists leave no trace.
std::string shown(const _T_parse_tree_T<char>& node);

/// An expression that reads as the same tree whatever the precedence of operators.
std::string parenthesised(const _T_parse_tree_T<char>& node);

/// What is wrong with the positions in a tree or with the number of its children; empty when nothing is.
std::string flaw(const _T_parse_tree_T<char>& node);

} // namespace parsetrees
