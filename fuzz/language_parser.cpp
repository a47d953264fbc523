// The parser of the host language: never crashes, gives a sound tree or one message with a position in the text, and
// reads a tree written with all its parentheses as the same tree.
#include <string>

#include "fuzz/Fuzz.h"
#include "qlplatform/language/ParseTree.h"
#include "qlplatform/services/Diagnostics.h"
#include "tests/platform/ParseTrees.h"

namespace {

using Node = _T_parse_tree_T<char>;

void checkRefusal(qlsvDiagnosticImpl* refusal, std::size_t size) {
    fuzz::claim(refusal && refusal->numItems() == 1, "one message says why a text is refused");
    const long* position = boost::get<long>(&refusal->item(0).arguments.front());
    fuzz::claim(position && *position >= 0 && static_cast<std::size_t>(*position) <= size, "it says where");
}

void checkTree(const Node& tree) {
    fuzz::claim(parsetrees::flaw(tree).empty(), "a tree is sound");
    qlsvDiagnosticImpl* refusal = nullptr;
    Node* again = generate_parse_tree(parsetrees::parenthesised(tree), &refusal);
    if (again) {
        fuzz::claim(parsetrees::shown(*again) == parsetrees::shown(tree), "with all parentheses it is the same tree");
    } else {
        fuzz::claim(refusal->item(0).leaf == "NestingTooDeep", "what parentheses may do is nest too deep");
    }
    qlsvDiscardDiagnostic(refusal);
    delete_parse_tree(again);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string text(reinterpret_cast<const char*>(data), size);
    qlsvDiagnosticImpl* refusal = nullptr;
    Node* tree = generate_parse_tree(text, &refusal);
    if (tree)
        checkTree(*tree);
    else
        checkRefusal(refusal, size);
    qlsvDiscardDiagnostic(refusal);
    delete_parse_tree(tree);
    return 0;
}
