#include "dims/Dot.h"

#include <algorithm>
#include <utility>
#include <vector>

#include <fmt/format.h>

#include "qlplatform/symbolic/SymbolicExpr.h"

namespace inspector {
namespace {

using QL::SymbolicExpr;
using QL::SymbolicOp;
using QLTypeSys::SymbolicDimsConstraint;

// In a quoted text of the graph.
std::string quoted(const std::string& text) {
    std::string result;
    for (const char c : text) {
        if (c == '"' || c == '\\') result += '\\';
        result += c;
    }
    return result;
}

class GraphWriter {
  public:
    explicit GraphWriter(const Session& session) : session_(session), known_(session.facts().known()) {
        known_.getSymbolicDimsConstraints(listed_);
        // The same graph for the same facts, whatever order they are listed in.
        std::sort(listed_.begin(), listed_.end(), [&](const auto& a, const auto& b) {
            return std::pair(expr(a.id).getLeft(), expr(a.id).getRight()) <
                   std::pair(expr(b.id).getLeft(), expr(b.id).getRight());
        });
    }

    std::string text() {
        collectNodes();
        std::string graph = "digraph facts {\n"
                            "  node [shape=box, style=\"rounded,filled\", fillcolor=white, fontname=\"Helvetica\"];\n"
                            "  edge [label=\">\", fontname=\"Helvetica\", fontsize=10];\n";
        int numClusters = 0;
        for (const std::vector<int>& equal : classes_)
            graph += equal.size() == 1 ? node(equal[0], "  ") : cluster(equal, numClusters++);
        for (const SymbolicDimsConstraint& fact : listed_)
            graph += edge(fact);
        return graph + "}\n";
    }

  private:
    SymbolicExpr expr(int id) const { return session_.table().getSymbolicExpr(static_cast<unsigned long>(id + 1)); }
    static int idOf(unsigned long exprId) { return static_cast<int>(exprId) - 1; }
    bool isNumber(int id) const { return expr(id).getOp() == SymbolicOp::IntValue; }

    // What facts are about: sizes of what was stated, and both sides of what is listed.
    void collectNodes() {
        const auto addSize = [&](int id) { addNode(session_.table().getSymbolicDims(id).getSize().getId()); };
        for (const Fact& fact : session_.facts().stated()) {
            addSize(fact.first);
            addSize(fact.second);
        }
        for (const SymbolicDimsConstraint& fact : listed_) {
            addNode(idOf(expr(fact.id).getLeft()));
            addNode(idOf(expr(fact.id).getRight()));
        }
    }

    void addNode(int id) {
        if (isNumber(id) || std::find(nodes_.begin(), nodes_.end(), id) != nodes_.end()) return;
        nodes_.push_back(id);
        const auto equal = std::find_if(classes_.begin(), classes_.end(),
                                        [&](const std::vector<int>& c) { return known_.isEqual(c[0], id); });
        if (equal == classes_.end())
            classes_.push_back({id});
        else
            equal->push_back(id);
    }

    // Nodes are numbered as they come, so that a graph does not depend on how many expressions there are.
    std::string nodeName(int id) const {
        return fmt::format("n{}", std::find(nodes_.begin(), nodes_.end(), id) - nodes_.begin());
    }

    std::string node(int id, const char* indent) const {
        const QLTypeSys::SymbDimsRange range = known_.getRange(id);
        const std::string bounds = rangeText(range);
        const std::string name = quoted(session_.table().getSymbolicDims(id).toString());
        return fmt::format("{}{} [label=\"{}{}\"];\n", indent, nodeName(id), name,
                           bounds == "anything" ? "" : "\\n" + bounds);
    }

    std::string cluster(const std::vector<int>& equal, int number) const {
        std::string text =
            fmt::format("  subgraph cluster_{} {{\n    label=\"equal\"; style=\"rounded,filled\"; "
                        "color=\"#c8d6e5\"; fillcolor=\"#eef3f8\"; fontname=\"Helvetica\"; fontsize=10;\n",
                        number);
        for (const int id : equal)
            text += node(id, "    ");
        return text + "  }\n";
    }

    std::string edge(const SymbolicDimsConstraint& fact) const {
        const SymbolicExpr relation = expr(fact.id);
        const int smaller = idOf(relation.getRight());
        if (relation.getOp() != SymbolicOp::GreaterThan || isNumber(smaller)) return "";
        std::string names;
        for (const QLBlock* block : fact.blocks)
            names += (names.empty() ? " " : ", ") + quoted(block->name);
        const std::string label = names.empty() ? "" : fmt::format(" [label=\">{}\"]", names);
        return fmt::format("  {} -> {}{};\n", nodeName(idOf(relation.getLeft())), nodeName(smaller), label);
    }

    const Session& session_;
    const QLTypeSys::SymbolicDimsConstraints& known_;
    std::vector<SymbolicDimsConstraint> listed_;
    std::vector<int> nodes_;
    std::vector<std::vector<int>> classes_; // of equal dimensions
};

} // namespace

std::string dotText(const Session& session) { return GraphWriter(session).text(); }

} // namespace inspector
