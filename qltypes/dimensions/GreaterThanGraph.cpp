#include "qltypes/dimensions/GreaterThanGraph_internal.h"

#include <algorithm>
#include <iterator>

#include "qltypes/host/Assert_internal.h"

namespace QLTypeSys {
namespace {

void makeRoomForOne(std::vector<int>& list) {
    if (list.size() == list.capacity()) list.reserve(std::max<std::size_t>(2, 2 * list.size()));
}

} // namespace

int GreaterThanGraph::find(int size) const {
    const auto found = nodeOfSize_.find(size);
    return found == nodeOfSize_.end() ? none : found->second;
}

int GreaterThanGraph::nodeOf(int size) const {
    const int found = find(size);
    if (found != none) return found;
    nodeOfSize_.reserve(nodeOfSize_.size() + 1);
    const int node = static_cast<int>(nodes_.size());
    nodes_.push_back({size, {}, {}});
    nodeOfSize_.emplace(size, node);
    return node;
}

// Chains.

GreaterThanGraph::Step GreaterThanGraph::advance(SearchEnd& end, std::int64_t first, std::int64_t last) const {
    const std::uint64_t otherMark = end.mark ^ 1;
    for (; end.at < end.seen.size(); ++end.at, end.edge = 0) {
        const std::vector<int>& edges = nodes_[static_cast<std::size_t>(end.seen[end.at])].*end.edges;
        if (end.edge == edges.size()) continue;
        const int next = edges[end.edge++];
        Node& node = nodes_[static_cast<std::size_t>(next)];
        if (node.mark == otherMark) return Step::Met;
        if (node.mark != end.mark && node.place >= first && node.place <= last) {
            node.mark = end.mark;
            end.seen.push_back(next);
        }
        return Step::Going;
    }
    return Step::Stuck;
}

bool GreaterThanGraph::hasChain(int greater, int less) const {
    const int top = find(greater);
    const int bottom = find(less);
    if (top == none || bottom == none) return false;
    const std::int64_t first = nodes_[top].place;
    const std::int64_t last = nodes_[bottom].place;
    if (first == 0 || last == 0 || first >= last) return false;

    lastMark_ += 2; // even and the odd one above it
    const auto begin = [this](SearchEnd& end, std::uint64_t mark, int node) {
        end.mark = nodes_[node].mark = mark;
        end.seen.assign(1, node);
        end.at = end.edge = 0;
    };
    begin(down_, lastMark_, top);
    begin(up_, lastMark_ + 1, bottom);
    for (;;) { // a step from each end, so that the smaller side decides
        for (SearchEnd* end : {&down_, &up_}) {
            const Step step = advance(*end, first, last);
            if (step != Step::Going) return step == Step::Met;
        }
    }
}

// Edges.

std::vector<int> GreaterThanGraph::reached(int from, std::vector<int> Node::*edges, std::int64_t first,
                                           std::int64_t last) {
    lastMark_ += 2;
    SearchEnd end{edges, lastMark_, {from}};
    nodes_[from].mark = end.mark;
    while (advance(end, first, last) == Step::Going) {
    }
    std::sort(end.seen.begin(), end.seen.end(), [this](int a, int b) { return nodes_[a].place < nodes_[b].place; });
    return std::move(end.seen);
}

// The places of all that must come before and all that must come behind the edge are dealt out anew among them.
void GreaterThanGraph::prepareOrder(int greater, int less) {
    newPlaces_.clear();
    const std::int64_t first = nodes_[less].place;
    const std::int64_t last = nodes_[greater].place;
    if (first == 0 || last == 0 || last < first) return;
    const std::vector<int> before = reached(greater, &Node::greater, first, last);
    const std::vector<int> behind = reached(less, &Node::less, first, last);
    QLTYPES_ASSERT(std::find(behind.begin(), behind.end(), greater) == behind.end());
    for (const auto* nodes : {&before, &behind})
        for (const int node : *nodes)
            newPlaces_.emplace_back(node, nodes_[node].place);
    std::vector<std::int64_t> places;
    places.reserve(newPlaces_.size());
    for (const auto& [node, place] : newPlaces_)
        places.push_back(place);
    std::sort(places.begin(), places.end());
    for (std::size_t i = 0; i < places.size(); ++i)
        newPlaces_[i].second = places[i];
}

void GreaterThanGraph::prepareEdge(int greater, int less) {
    const int top = nodeOf(greater);
    const int bottom = nodeOf(less);
    makeRoomForOne(nodes_[top].less);
    makeRoomForOne(nodes_[bottom].greater);
    prepareOrder(top, bottom);
    if (nodes_[top].isKnown) boundOf(bottom); // so that a bound which it does not change stays known
}

void GreaterThanGraph::addEdge(int greater, int less) noexcept {
    const int topNode = find(greater);
    const int bottomNode = find(less);
    Node& top = nodes_[topNode];
    Node& bottom = nodes_[bottomNode];
    top.less.push_back(bottomNode);
    bottom.greater.push_back(topNode);
    if (bottom.place == 0) {
        if (top.place == 0) top.place = back_++;
        bottom.place = back_++;
    } else if (top.place == 0) {
        top.place = front_--;
    }
    for (const auto& [node, place] : newPlaces_)
        nodes_[node].place = place;
    newPlaces_.clear();

    const int reachedBound = bottom.isKnown ? bottom.bound : highest;
    if (top.isKnown && top.bound >= reachedBound) return;
    note(topNode, {lowest, reachedBound});
    tellGreater();
}

// Bounds.

int GreaterThanGraph::lowerBoundOf(int size) const {
    const int node = find(size);
    if (node == none || nodes_[node].less.empty()) return classes_.lowestOf(classes_.rootOf(size));
    return boundOf(node);
}

int GreaterThanGraph::boundOf(int node) const {
    if (nodes_[node].isKnown) return nodes_[node].bound;
    frames_.assign(1, {node});
    while (!frames_.empty()) {
        Frame& frame = frames_.back();
        const std::vector<int>& less = nodes_[frame.node].less;
        for (; frame.edge < less.size() && nodes_[less[frame.edge]].isKnown; ++frame.edge)
            frame.highest = std::max(frame.highest, nodes_[less[frame.edge]].bound);
        if (frame.edge < less.size()) {
            frames_.push_back({less[frame.edge]});
            continue;
        }
        const int root = classes_.rootOf(nodes_[frame.node].size);
        if (!nodes_[frame.node].isMember) appendMember(nodes_, nodeOf(root), frame.node);
        nodes_[frame.node].bound = std::max(frame.highest, classes_.lowestOf(root));
        nodes_[frame.node].isKnown = true;
        frames_.pop_back();
    }
    return nodes_[node].bound;
}

void GreaterThanGraph::appendMember(std::vector<Node>& nodes, int root, int member) noexcept {
    nodes[member].isMember = true;
    nodes[member].nextMember = none;
    (nodes[root].firstMember == none ? nodes[root].firstMember : nodes[nodes[root].lastMember].nextMember) = member;
    nodes[root].lastMember = member;
}

// What is not known was told on with its ceiling. When that is broken the highest takes its place, so that a node is
// told at most twice until it is known again.
bool GreaterThanGraph::isChangedBy(Node& node, Change change) noexcept {
    if (node.isKnown) {
        if (node.bound > change.before && node.bound >= change.after) return false;
        node.isKnown = false;
        node.ceiling = std::max(node.bound, change.after);
        return true;
    }
    if (change.after <= node.ceiling) return false;
    node.ceiling = highest;
    return true;
}

void GreaterThanGraph::note(int node, Change change) noexcept {
    Node& n = nodes_[node];
    if (!isChangedBy(n, change) || n.isChanged) return;
    n.isChanged = true;
    n.nextChanged = firstChanged_;
    firstChanged_ = node;
}

void GreaterThanGraph::tellGreater() noexcept {
    while (firstChanged_ != none) {
        Node& changed = nodes_[firstChanged_];
        firstChanged_ = changed.nextChanged;
        changed.isChanged = false;
        for (const int greater : changed.greater)
            note(greater, {changed.bound, changed.ceiling});
    }
}

void GreaterThanGraph::moveMembers(int from, int to) noexcept {
    int member = nodes_[from].firstMember;
    nodes_[from].firstMember = nodes_[from].lastMember = none;
    while (member != none) {
        const int next = nodes_[member].nextMember;
        nodes_[member].isMember = false;
        // Nothing more can happen to a node that is not known and has no ceiling: it need not be told.
        if (nodes_[member].isKnown || nodes_[member].ceiling != highest) appendMember(nodes_, to, member);
        member = next;
    }
}

void GreaterThanGraph::rootWasRaised(int root, int before, int after) noexcept {
    const int node = find(root);
    if (node == none) return;
    for (int member = nodes_[node].firstMember; member != none; member = nodes_[member].nextMember)
        note(member, {before, after});
    moveMembers(node, node);
    tellGreater();
}

void GreaterThanGraph::prepareMerge(int root, int into) {
    const int node = find(root);
    if (node != none && nodes_[node].firstMember != none) nodeOf(into);
}

void GreaterThanGraph::rootWasMerged(int root, int into) noexcept {
    const int from = find(root);
    if (from == none || nodes_[from].firstMember == none) return;
    const int to = find(into);
    const Change change{classes_.lowestOf(root), classes_.lowestOf(into)};
    if (change.before == change.after) {
        Node& target = nodes_[to];
        (target.firstMember == none ? target.firstMember : nodes_[target.lastMember].nextMember) =
            nodes_[from].firstMember;
        target.lastMember = nodes_[from].lastMember;
        nodes_[from].firstMember = nodes_[from].lastMember = none;
        return;
    }
    for (int member = nodes_[from].firstMember; member != none; member = nodes_[member].nextMember)
        note(member, change);
    moveMembers(from, to);
    tellGreater();
}

void GreaterThanGraph::classWasSplit(int root) noexcept {
    const int node = find(root);
    if (node == none) return;
    for (int member = nodes_[node].firstMember; member != none; member = nodes_[member].nextMember)
        note(member, {highest, highest}); // it may be in either part
    moveMembers(node, node);
    tellGreater();
}

} // namespace QLTypeSys
