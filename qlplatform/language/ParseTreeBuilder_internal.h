// Storage of a tree while it is built and after: all nodes live as long as their root.
#pragma once

#include <deque>
#include <memory>
#include <span>
#include <string>

#include "qlplatform/language/ParseTree.h"
#include "qlplatform/language/Tokens_internal.h"

using ParseNode = _T_parse_tree_T<char>;

class ParseTreeBuilder {
  public:
    explicit ParseTreeBuilder(std::string_view text);

    /// The copy of the text that the tree keeps.
    std::string_view source() const;

    ParseNode* terminal(const language::Token& token);

    /// A node that takes in the bytes from `begin` to `end`. Raises `NestingTooDeep` when it would be too high.
    ParseNode* node(ParseOperator operatorCode, const language::Token& token, std::size_t begin, std::size_t end,
                    std::span<ParseNode* const> children);

    /// Adds a last child to a node that ends at `end`; the same failure.
    void append(ParseNode* parent, ParseNode* child, std::size_t end);

    /// The root over `expression`, which owns the tree from now on. To be called once, last.
    ParseNode* finish(ParseNode* expression);

    static void destroy(ParseNode* root);

  private:
    struct Root : ParseNode {
        Root() = default;
        std::string text;
        std::deque<ParseNode> nodes;
    };
    ParseNode* added();

    std::unique_ptr<Root> root_;
};
