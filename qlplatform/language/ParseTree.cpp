#include "qlplatform/language/ParseTree.h"

#include <algorithm>

#include "qlplatform/language/NumberLiterals_internal.h"
#include "qlplatform/language/ParseTreeBuilder_internal.h"

double ParseNode::numberValue() const { return language::numberValue(tokenCode_, text()); }

std::string ParseNode::stringValue() const {
    const std::string_view quoted = text();
    std::string value;
    for (std::size_t i = 1; i + 1 < quoted.size(); ++i) {
        value += quoted[i];
        if (quoted[i] == quoted.front()) ++i;
    }
    return value;
}

void delete_parse_tree(ParseNode* tree) { ParseTreeBuilder::destroy(tree); }

ParseTreeBuilder::ParseTreeBuilder(std::string_view text) : root_(new Root) {
    root_->text = text;
    root_->source_ = root_->text;
    root_->operatorCode_ = ParseOperator::expressionGoal;
    root_->end_ = text.size();
}

std::string_view ParseTreeBuilder::source() const { return root_->source_; }

ParseNode* ParseTreeBuilder::added() {
    ParseNode& node = root_->nodes.emplace_back(ParseNode());
    node.source_ = root_->source_;
    return &node;
}

ParseNode* ParseTreeBuilder::terminal(const language::Token& token) {
    ParseNode* made = added();
    made->tokenCode_ = token.code;
    made->position_ = made->begin_ = token.begin;
    made->end_ = token.end;
    return made;
}

ParseNode* ParseTreeBuilder::node(ParseOperator operatorCode, const language::Token& token, std::size_t begin,
                                  std::size_t end, std::span<ParseNode* const> children) {
    ParseNode* made = added();
    made->operatorCode_ = operatorCode;
    made->tokenCode_ = token.code;
    made->position_ = token.begin;
    made->begin_ = begin;
    made->children_.reserve(children.size());
    for (ParseNode* child : children)
        append(made, child, end);
    made->end_ = end;
    return made;
}

void ParseTreeBuilder::append(ParseNode* parent, ParseNode* child, std::size_t end) {
    parent->children_.push_back(child);
    parent->height_ = std::max(parent->height_, child->height_ + 1);
    parent->end_ = end;
    if (parent->height_ > parseTreeDepthLimit) language::raiseNestingTooDeep(parent->position_);
}

ParseNode* ParseTreeBuilder::finish(ParseNode* expression) {
    root_->children_.push_back(expression);
    return root_.release();
}

void ParseTreeBuilder::destroy(ParseNode* root) { delete static_cast<Root*>(root); }
