#include "dims/FactGraph.h"

#include <algorithm>
#include <utility>

#include "dims/Session.h"
#include "qlplatform/symbolic/SymbolicExpr.h"

namespace inspector {
namespace {

using QL::SymbolicExpr;
using QL::SymbolicOp;
using QLTypeSys::SymbolicDimsConstraint;

class GraphBuilder {
  public:
    explicit GraphBuilder(const Session& session) : session_(session), known_(session.facts().known()) {
        known_.getSymbolicDimsConstraints(listed_);
        std::sort(listed_.begin(), listed_.end(), [&](const auto& a, const auto& b) {
            return std::pair(expr(a.id).getLeft(), expr(a.id).getRight()) <
                   std::pair(expr(b.id).getLeft(), expr(b.id).getRight());
        });
    }

    FactGraph graph() {
        collectNodes();
        for (const int id : ids_)
            graph_.nodes.push_back(node(id));
        for (const SymbolicDimsConstraint& fact : listed_)
            addGreater(fact);
        return std::move(graph_);
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
        if (isNumber(id) || std::find(ids_.begin(), ids_.end(), id) != ids_.end()) return;
        const std::size_t index = ids_.size();
        ids_.push_back(id);
        const auto equal = std::find_if(graph_.classes.begin(), graph_.classes.end(),
                                        [&](const auto& members) { return known_.isEqual(ids_[members[0]], id); });
        if (equal == graph_.classes.end())
            graph_.classes.push_back({index});
        else
            equal->push_back(index);
    }

    std::size_t indexOf(int id) const {
        return static_cast<std::size_t>(std::find(ids_.begin(), ids_.end(), id) - ids_.begin());
    }

    FactGraph::Node node(int id) const {
        const std::string bounds = rangeText(known_.getRange(id));
        return {session_.table().getSymbolicDims(id).toString(), bounds == "anything" ? "" : bounds};
    }

    void addGreater(const SymbolicDimsConstraint& fact) {
        const SymbolicExpr relation = expr(fact.id);
        const int smaller = idOf(relation.getRight());
        if (relation.getOp() != SymbolicOp::GreaterThan || isNumber(smaller)) return;
        FactGraph::Greater greater{indexOf(idOf(relation.getLeft())), indexOf(smaller), {}};
        for (const QLBlock* block : fact.blocks)
            greater.blocks.push_back(block->name);
        graph_.greater.push_back(greater);
    }

    const Session& session_;
    const QLTypeSys::SymbolicDimsConstraints& known_;
    std::vector<SymbolicDimsConstraint> listed_;
    std::vector<int> ids_; // of the nodes, as they come: a graph does not depend on how many expressions there are
    FactGraph graph_;
};

} // namespace

FactGraph factGraph(const Session& session) { return GraphBuilder(session).graph(); }

} // namespace inspector
