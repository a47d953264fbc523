#include "tests/platform/ParseTrees.h"

#include <utility>

namespace parsetrees {

namespace {

using Node = _T_parse_tree_T<char>;

struct Sign {
    ParseToken token;
    const char* text;
};
constexpr Sign signs[] = {
    {ParseToken::colon, ":"},
    {ParseToken::plus, "+"},
    {ParseToken::minus, "-"},
    {ParseToken::times, "*"},
    {ParseToken::elementTimes, ".*"},
    {ParseToken::slash, "/"},
    {ParseToken::elementSlash, "./"},
    {ParseToken::backslash, "\\"},
    {ParseToken::elementBackslash, ".\\"},
    {ParseToken::caret, "^"},
    {ParseToken::elementCaret, ".^"},
    {ParseToken::quote, "'"},
    {ParseToken::elementQuote, ".'"},
    {ParseToken::equalSign, "=="},
    {ParseToken::notEqualSign, "~="},
    {ParseToken::lessSign, "<"},
    {ParseToken::lessOrEqualSign, "<="},
    {ParseToken::greaterSign, ">"},
    {ParseToken::greaterOrEqualSign, ">="},
    {ParseToken::ampersand, "&"},
    {ParseToken::bar, "|"},
    {ParseToken::doubleAmpersand, "&&"},
    {ParseToken::doubleBar, "||"},
};

std::string signOf(const Node& node) {
    for (const Sign& sign : signs)
        if (sign.token == node.tokenCode()) return sign.text;
    return "?";
}

std::string nameOf(const Node& node) {
    switch (node.operatorCode()) {
    case ParseOperator::matrix:
        return "matrix";
    case ParseOperator::cell:
        return "cell";
    case ParseOperator::row:
        return "row";
    case ParseOperator::index:
        return "call";
    case ParseOperator::braceIndex:
        return "brace";
    case ParseOperator::field:
        return "field";
    case ParseOperator::dynamicField:
        return "field()";
    case ParseOperator::unaryPlus:
        return "pos";
    case ParseOperator::unaryMinus:
        return "neg";
    case ParseOperator::logicalNot:
        return "not";
    case ParseOperator::functionHandle:
        return "@";
    case ParseOperator::anonymousFunction:
        return "@()";
    default:
        return signOf(node);
    }
}

std::string joined(const Node& parent, std::size_t first, std::size_t last, const char* between,
                   std::string (*write)(const Node&)) {
    std::string text;
    for (std::size_t i = first; i < last; ++i)
        text += (i == first ? "" : between) + write(*parent.child(i));
    return text;
}

// How many children a node has, at least and at most.
std::pair<std::size_t, std::size_t> numChildrenOf(ParseOperator code) {
    constexpr std::size_t any = static_cast<std::size_t>(-1);
    switch (code) {
    case ParseOperator::none:
        return {0, 0};
    case ParseOperator::expressionGoal:
    case ParseOperator::row:
    case ParseOperator::transpose:
    case ParseOperator::unaryPlus:
    case ParseOperator::unaryMinus:
    case ParseOperator::logicalNot:
    case ParseOperator::functionHandle:
        return {1, 1};
    case ParseOperator::range:
        return {2, 3};
    case ParseOperator::matrix:
    case ParseOperator::cell:
        return {0, any};
    case ParseOperator::list:
    case ParseOperator::index:
    case ParseOperator::braceIndex:
    case ParseOperator::anonymousFunction:
        return {1, any};
    default:
        return {2, 2};
    }
}

} // namespace

std::string shown(const Node& node) {
    if (node.operatorCode() == ParseOperator::expressionGoal) return shown(*node.child(0));
    if (node.isTerminal()) return std::string(node.text());
    const Node& holder = node.elements();
    const std::string children = joined(holder, 0, holder.numChildren(), " ", shown);
    return "(" + nameOf(node) + (children.empty() ? "" : " ") + children + ")";
}

std::string parenthesised(const Node& node) {
    const std::size_t numChildren = node.numChildren();
    const auto child = [&](std::size_t i) { return parenthesised(*node.child(i)); };
    switch (node.operatorCode()) {
    case ParseOperator::none:
        return std::string(node.text());
    case ParseOperator::expressionGoal:
        return child(0);
    case ParseOperator::matrix:
        return "[" + joined(node, 0, numChildren, ";", parenthesised) + "]";
    case ParseOperator::cell:
        return "{" + joined(node, 0, numChildren, ";", parenthesised) + "}";
    case ParseOperator::row:
        return child(0);
    case ParseOperator::list:
        return joined(node, 0, numChildren, ",", parenthesised);
    case ParseOperator::index:
        return child(0) + "(" + joined(node, 1, numChildren, ",", parenthesised) + ")";
    case ParseOperator::braceIndex:
        return child(0) + "{" + joined(node, 1, numChildren, ",", parenthesised) + "}";
    case ParseOperator::field:
        return child(0) + "." + child(1);
    case ParseOperator::dynamicField:
        return child(0) + ".(" + child(1) + ")";
    case ParseOperator::unaryPlus:
        return "(+" + child(0) + ")";
    case ParseOperator::unaryMinus:
        return "(-" + child(0) + ")";
    case ParseOperator::logicalNot:
        return "(~" + child(0) + ")";
    case ParseOperator::transpose:
        return "(" + child(0) + " " + signOf(node) + ")";
    case ParseOperator::functionHandle:
        return "(@" + child(0) + ")";
    case ParseOperator::anonymousFunction:
        return "(@(" + joined(node, 0, numChildren - 1, ",", parenthesised) + ") " + child(numChildren - 1) + ")";
    default:
        return "(" + joined(node, 0, numChildren, (" " + signOf(node) + " ").c_str(), parenthesised) + ")";
    }
}

std::string flaw(const Node& node) {
    const auto found = [&](const char* what) {
        return std::string(what) + " at " + std::to_string(node.position()) + ": " + std::string(node.text());
    };
    if (node.begin() > node.end() || node.end() - node.begin() != node.text().size()) return found("wrong extent");
    if (node.position() < node.begin() || node.position() > node.end()) return found("token outside the node");
    const auto [least, most] = numChildrenOf(node.operatorCode());
    if (node.numChildren() < least || node.numChildren() > most) return found("wrong number of children");
    std::size_t behind = node.begin();
    for (std::size_t i = 0; i < node.numChildren(); ++i) {
        const Node& child = *node.child(i);
        if (child.begin() < behind || child.end() > node.end()) return found("child outside its place");
        behind = child.end();
        if (std::string inner = flaw(child); !inner.empty()) return inner;
    }
    return "";
}

} // namespace parsetrees
