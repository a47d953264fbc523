// The nodes of one expression table: an arena of records, a pool of operands, a set of ids.
//
// A node with up to two operands stands wholly in its record; only longer operand lists are in the pool. Records move
// when the arena grows, so references to them do not outlive an addition.
#pragma once

#include <cstdint>
#include <deque>
#include <span>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

#include <boost/unordered/unordered_flat_set.hpp>

#include "qlplatform/symbolic/SymbolicExprTable.h"

namespace QL {

using NodeId = std::uint32_t;
inline constexpr NodeId noNode = ~NodeId{0};

/// Slots for the nodes of one walk: a map from id to a number that is emptied in constant time.
class NodeSlots {
  public:
    static constexpr std::uint32_t none = ~std::uint32_t{0};

    /// Forgets all slots; ids below `numNodes` can be used afterwards.
    void begin(std::size_t numNodes) {
        if (entries_.size() < numNodes) entries_.resize(numNodes);
        if (++walk_ == 0) { // the counter came round: old marks could be taken for new ones
            for (Entry& e : entries_)
                e.walk = 0;
            walk_ = 1;
        }
    }
    std::uint32_t get(NodeId id) const { return entries_[id].walk == walk_ ? entries_[id].slot : none; }
    void set(NodeId id, std::uint32_t slot) { entries_[id] = {walk_, slot}; }
    std::size_t sizeInMemory() const { return entries_.capacity() * sizeof(Entry); }

  private:
    struct Entry {
        std::uint32_t walk = 0;
        std::uint32_t slot = 0;
    };
    std::vector<Entry> entries_;
    std::uint32_t walk_ = 0;
};

class NodeStore {
  public:
    explicit NodeStore(SymbolDomain domain) : domain_(domain), ids_(0, KeyHash{this}, KeyEqual{this}) {}
    NodeStore(const NodeStore&) = delete;
    NodeStore& operator=(const NodeStore&) = delete;

    SymbolDomain domain() const { return domain_; }
    std::size_t size() const { return records_.size(); }

    SymbolicOp op(NodeId id) const { return static_cast<SymbolicOp>(records_[id].head & opMask); }
    std::size_t numOperands(NodeId id) const { return (records_[id].head & countMask) >> countShift; }

    /// Operand `index` of a node that has it.
    NodeId operand(NodeId id, std::size_t index) const {
        const Record& r = records_[id];
        if (((r.head & countMask) >> countShift) > 2) return pool_[r.first + index];
        return index == 0 ? r.first : r.second;
    }

    const std::string& name(NodeId id) const { return names_[records_[id].first]; }
    int intValue(NodeId id) const { return static_cast<int>(records_[id].first); }
    double doubleValue(NodeId id) const;
    bool boolValue(NodeId id) const { return records_[id].first != 0; }

    /// Whether the value is a whole number whatever whole numbers, and in a table of integers symbols, are put in.
    bool isInteger(NodeId id) const { return (records_[id].head & integerBit) != 0; }

    NodeId symbol(std::string_view name);
    NodeId integer(int value);
    NodeId floating(double value);
    NodeId boolean(bool value);
    NodeId unary(SymbolicOp op, NodeId operand) { return intern({headOf(op, 1), operand, 0, {}, {}}); }
    NodeId binary(SymbolicOp op, NodeId left, NodeId right) { return intern({headOf(op, 2), left, right, {}, {}}); }
    NodeId node(SymbolicOp op, std::span<const NodeId> operands);

    /// The simplified form of a node, or noNode while it is not known.
    NodeId simplified(NodeId id) const { return records_[id].simplified; }
    void setSimplified(NodeId id, NodeId form) { records_[id].simplified = form; }

    /// The expression that a symbol is bound to, or noNode.
    NodeId value(NodeId symbol) const {
        const auto found = values_.find(symbol);
        return found == values_.end() ? noNode : found->second;
    }
    void setValue(NodeId symbol, NodeId value) { values_[symbol] = value; }

    /// Slots for a walk that runs from begin to end without another one inside it.
    NodeSlots& slots() { return slots_; }

    std::size_t sizeInMemory() const;

  private:
    static constexpr std::uint32_t opMask = 0xff;
    static constexpr std::uint32_t integerBit = 0x8000'0000;
    static constexpr std::uint32_t countMask = 0x7fff'ff00;
    static constexpr std::uint32_t countShift = 8;

    struct Record {
        std::uint32_t head;   // operator, number of operands, integerBit
        std::uint32_t first;  // first operand; start in the pool; value; low half of a double; index of a name
        std::uint32_t second; // second operand; high half of a double
        std::uint32_t simplified;
    };

    // What a node is looked up by; integerBit is not part of it.
    struct Key {
        std::uint32_t head;
        std::uint32_t first;
        std::uint32_t second;
        std::span<const NodeId> pooled; // the operands when there are more than two
        std::string_view name;          // of a symbol
    };

    struct KeyHash {
        using is_transparent = void;
        using is_avalanching = void;
        const NodeStore* store;
        std::size_t operator()(const Key& key) const;
        std::size_t operator()(NodeId id) const { return (*this)(store->keyOf(id)); }
    };
    struct KeyEqual {
        using is_transparent = void;
        const NodeStore* store;
        bool operator()(NodeId a, NodeId b) const { return a == b; }
        bool operator()(const Key& key, NodeId id) const { return store->matches(key, id); }
        bool operator()(NodeId id, const Key& key) const { return store->matches(key, id); }
    };

    static std::uint32_t headOf(SymbolicOp op, std::size_t numOperands) {
        return static_cast<std::uint32_t>(op) | static_cast<std::uint32_t>(numOperands << countShift);
    }
    Key keyOf(NodeId id) const;
    bool matches(const Key& key, NodeId id) const;
    NodeId intern(const Key& key);
    NodeId append(const Key& key);
    void growIds();
    bool isIntegerNode(const Key& key) const;

    SymbolDomain domain_;
    std::vector<Record> records_;
    std::vector<NodeId> pool_;
    std::deque<std::string> names_;
    boost::unordered_flat_set<NodeId, KeyHash, KeyEqual> ids_;
    std::unordered_map<NodeId, NodeId> values_; // symbol to what it is bound to
    NodeSlots slots_;
};

inline NodeId nodeIdOf(unsigned long exprId) { return static_cast<NodeId>(exprId); }

/// Lists the nodes under `root`, itself included, each once and operands before what uses them.
/// `entered(id)` tells whether the operands of a node are walked, and is asked once a node.
template <class Entered>
std::vector<NodeId> postOrder(NodeStore& store, NodeId root, NodeSlots& slots, Entered&& entered) {
    std::vector<NodeId> order;
    std::vector<std::pair<NodeId, std::uint32_t>> open; // a node and the index of its next operand
    slots.begin(store.size());
    const auto enter = [&](NodeId id) {
        if (slots.get(id) != NodeSlots::none) return;
        slots.set(id, 0);
        if (store.numOperands(id) != 0 && entered(id))
            open.push_back({id, 0});
        else
            order.push_back(id);
    };
    enter(root);
    while (!open.empty()) {
        auto& [id, next] = open.back();
        if (next < store.numOperands(id)) {
            enter(store.operand(id, next++));
        } else {
            order.push_back(id);
            open.pop_back();
        }
    }
    return order;
}

/// The same over all nodes.
inline std::vector<NodeId> postOrder(NodeStore& store, NodeId root) {
    return postOrder(store, root, store.slots(), [](NodeId) { return true; });
}

} // namespace QL
