#include "dims/Dot.h"

#include <fmt/format.h>

#include "dims/FactGraph.h"

namespace inspector {
namespace {

// In a quoted text of the graph.
std::string quoted(const std::string& text) {
    std::string result;
    for (const char c : text) {
        if (c == '"' || c == '\\') result += '\\';
        result += c;
    }
    return result;
}

std::string node(const FactGraph& graph, std::size_t index, const char* indent) {
    const FactGraph::Node& node = graph.nodes[index];
    return fmt::format("{}n{} [label=\"{}{}\"];\n", indent, index, quoted(node.name),
                       node.bounds.empty() ? "" : "\\n" + node.bounds);
}

std::string cluster(const FactGraph& graph, const std::vector<std::size_t>& equal, int number) {
    std::string text = fmt::format("  subgraph cluster_{} {{\n    label=\"equal\"; style=\"rounded,filled\"; "
                                   "color=\"#c8d6e5\"; fillcolor=\"#eef3f8\"; fontname=\"Helvetica\"; fontsize=10;\n",
                                   number);
    for (const std::size_t index : equal)
        text += node(graph, index, "    ");
    return text + "  }\n";
}

std::string edge(const FactGraph::Greater& fact) {
    std::string names;
    for (const std::string& block : fact.blocks)
        names += (names.empty() ? " " : ", ") + quoted(block);
    const std::string label = names.empty() ? "" : fmt::format(" [label=\">{}\"]", names);
    return fmt::format("  n{} -> n{}{};\n", fact.greater, fact.smaller, label);
}

} // namespace

std::string dotText(const Session& session) {
    const FactGraph graph = factGraph(session);
    std::string text = "digraph facts {\n"
                       "  node [shape=box, style=\"rounded,filled\", fillcolor=white, fontname=\"Helvetica\"];\n"
                       "  edge [label=\">\", fontname=\"Helvetica\", fontsize=10];\n";
    int numClusters = 0;
    for (const std::vector<std::size_t>& equal : graph.classes)
        text += equal.size() == 1 ? node(graph, equal[0], "  ") : cluster(graph, equal, numClusters++);
    for (const FactGraph::Greater& fact : graph.greater)
        text += edge(fact);
    return text + "}\n";
}

} // namespace inspector
