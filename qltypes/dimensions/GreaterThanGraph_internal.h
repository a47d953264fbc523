// The greater-than edges between sizes, arranged so that questions are cheap: is there a chain from one size to
// another, and what is the highest lower bound at or below a size?
//
// Chains: sizes stand in an order in which the greater one comes first, mended when an edge goes against it. A chain is
// looked for only between the places of its two ends, and from both ends at once.
//
// Bounds: the bound of a size is the highest of the lower bound of its class and the bounds of all sizes that it
// exceeds. It is remembered, and forgotten when something that it may rest on changes. That is decided without
// computing anything: a bound that is above what changed is held by something else, and one that is not below what that
// became stays as it is.
#pragma once

#include <cstddef>
#include <cstdint>
#include <limits>
#include <utility>
#include <vector>

#include <boost/unordered/unordered_flat_map.hpp>

#include "qltypes/dimensions/DimsClasses_internal.h"

namespace QLTypeSys {

class GreaterThanGraph {
  public:
    explicit GreaterThanGraph(const DimsClasses& classes) : classes_(classes) {}

    /// Whether a chain of edges leads from `greater` to `less`.
    bool hasChain(int greater, int less) const;

    /// The lower bound of a size by its class and by all that it exceeds.
    int lowerBoundOf(int size) const;

    /// Adds an edge, in two steps: what can fail comes first. No chain may lead from `less` to `greater`.
    void prepareEdge(int greater, int less);
    void addEdge(int greater, int less) noexcept;

    /// To be told when the lower bound filed under a root was raised.
    void rootWasRaised(int root, int before, int after) noexcept;
    /// To be told when the class of a root became part of another class, and before that can be told, so that nothing
    /// fails then.
    void prepareMerge(int root, int into);
    void rootWasMerged(int root, int into) noexcept;
    /// To be told when part of the class of a root went to another class.
    void classWasSplit(int root) noexcept;

  private:
    static constexpr int none = -1;
    static constexpr int lowest = std::numeric_limits<int>::min();
    static constexpr int highest = std::numeric_limits<int>::max();

    struct Node {
        int size;
        std::vector<int> less;    // nodes that this one exceeds
        std::vector<int> greater; // nodes that exceed this one
        std::int64_t place = 0;   // 0: none yet
        std::uint64_t mark = 0;   // of the search that saw it

        bool isKnown = false;
        int bound = lowest;     // when known; otherwise what it was
        int ceiling = highest;  // when not known: the highest that it can be as far as `greater` was told
        bool isChanged = false; // `greater` has to be told
        int nextChanged = none;

        bool isMember = false; // in the list of its root
        int nextMember = none;
        int firstMember = none; // of a root: the nodes of its class that may be known
        int lastMember = none;
    };

    /// What happened to a bound that others rest on: it was `before` and is at most `after`.
    struct Change {
        int before;
        int after;
    };

    /// One end of a search: the nodes seen, in order, and the edge to follow next.
    struct SearchEnd {
        std::vector<int> Node::*edges;
        std::uint64_t mark;
        std::vector<int> seen{};
        std::size_t at = 0;
        std::size_t edge = 0;
    };
    enum class Step { Going, Met, Stuck };

    struct Frame {
        int node;
        std::size_t edge = 0;
        int highest = lowest;
    };

    int find(int size) const;
    int nodeOf(int size) const;

    Step advance(SearchEnd& end, std::int64_t first, std::int64_t last) const;
    std::vector<int> reached(int from, std::vector<int> Node::*edges, std::int64_t first, std::int64_t last);
    void prepareOrder(int greater, int less);

    int boundOf(int node) const;
    bool isChangedBy(Node& node, Change change) noexcept;
    void note(int node, Change change) noexcept;
    void tellGreater() noexcept;
    void moveMembers(int from, int to) noexcept;

    static void appendMember(std::vector<Node>& nodes, int root, int member) noexcept;

    const DimsClasses& classes_;
    mutable std::vector<Node> nodes_;
    mutable boost::unordered_flat_map<int, int> nodeOfSize_;
    mutable std::uint64_t lastMark_ = 0;
    mutable SearchEnd down_{&Node::less, 0};
    mutable SearchEnd up_{&Node::greater, 0};
    mutable std::vector<Frame> frames_;
    std::int64_t front_ = -1; // the next free places before and behind all others
    std::int64_t back_ = 1;
    std::vector<std::pair<int, std::int64_t>> newPlaces_; // that the edge being added asks for
    int firstChanged_ = none;
};

} // namespace QLTypeSys
