#include "qlplatform/symbolic/NodeStore_internal.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <limits>
#include <stdexcept>

namespace QL {
namespace {

// Multiplication folded onto itself: every bit of the product reaches the low and the high half.
std::uint64_t mixed(std::uint64_t a, std::uint64_t b) {
    __extension__ using Wide = unsigned __int128;
    const Wide product = static_cast<Wide>(a ^ 0x9e3779b97f4a7c15u) * (b ^ 0xd6e8feb86659fd93u);
    return static_cast<std::uint64_t>(product) ^ static_cast<std::uint64_t>(product >> 64);
}

} // namespace

std::size_t NodeStore::KeyHash::operator()(const Key& key) const {
    std::uint64_t hash = mixed((std::uint64_t{key.head} << 32) | key.first, key.second);
    for (const NodeId operand : key.pooled)
        hash = mixed(hash, operand);
    if (!key.name.empty()) hash = mixed(hash, std::hash<std::string_view>()(key.name));
    return hash;
}

NodeStore::Key NodeStore::keyOf(NodeId id) const {
    const Record& r = records_[id];
    const std::uint32_t head = r.head & ~integerBit;
    if (op(id) == SymbolicOp::StringSymbol) return {head, 0, 0, {}, names_[r.first]};
    const std::size_t count = numOperands(id);
    if (count > 2) return {head, 0, 0, {pool_.data() + r.first, count}, {}};
    return {head, r.first, r.second, {}, {}};
}

bool NodeStore::matches(const Key& key, NodeId id) const {
    const Record& r = records_[id];
    if ((r.head & ~integerBit) != key.head) return false;
    if (static_cast<SymbolicOp>(key.head & opMask) == SymbolicOp::StringSymbol) return names_[r.first] == key.name;
    if (!key.pooled.empty()) return std::equal(key.pooled.begin(), key.pooled.end(), pool_.begin() + r.first);
    return r.first == key.first && r.second == key.second;
}

NodeId NodeStore::intern(const Key& key) {
    const auto found = ids_.find(key);
    return found != ids_.end() ? *found : append(key);
}

NodeId NodeStore::append(const Key& key) {
    // A client keeps the id minus one in an int.
    if (records_.size() > static_cast<std::size_t>(std::numeric_limits<int>::max()))
        throw std::length_error("an expression table holds 2^31 expressions at most");
    const NodeId id = static_cast<NodeId>(records_.size());
    Record record{key.head, key.first, key.second, noNode};
    if (isIntegerNode(key)) record.head |= integerBit;
    const std::size_t numNames = names_.size();
    const std::size_t numPooled = pool_.size();
    try {
        if (static_cast<SymbolicOp>(key.head & opMask) == SymbolicOp::StringSymbol) {
            record.first = static_cast<std::uint32_t>(numNames);
            names_.emplace_back(key.name);
        } else if (!key.pooled.empty()) {
            record.first = static_cast<std::uint32_t>(numPooled);
            pool_.insert(pool_.end(), key.pooled.begin(), key.pooled.end());
        }
        if (ids_.size() == ids_.max_load()) growIds();
        records_.push_back(record);
        ids_.insert(id);
    } catch (...) { // a node that no key leads to would be listed, and made again
        if (records_.size() > id) records_.pop_back();
        pool_.resize(numPooled);
        names_.resize(numNames);
        throw;
    }
    return id;
}

// In the order of the records, which the set by itself would read at random.
void NodeStore::growIds() {
    decltype(ids_) larger(2 * ids_.size() + 1, KeyHash{this}, KeyEqual{this});
    for (NodeId id = 0; id < records_.size(); ++id)
        larger.insert(id);
    ids_.swap(larger);
}

bool NodeStore::isIntegerNode(const Key& key) const {
    const auto all = [&](std::size_t numOperands) {
        return isInteger(key.first) && (numOperands < 2 || isInteger(key.second));
    };
    switch (static_cast<SymbolicOp>(key.head & opMask)) {
    case SymbolicOp::StringSymbol:
        return domain_ == SymbolDomain::Integers;
    case SymbolicOp::IntValue:
    case SymbolicOp::BoolSymbol:
    case SymbolicOp::Equal:
    case SymbolicOp::NotEqual:
    case SymbolicOp::LessThan:
    case SymbolicOp::LessThanOrEqual:
    case SymbolicOp::GreaterThan:
    case SymbolicOp::GreaterThanOrEqual:
    case SymbolicOp::And:
    case SymbolicOp::Or:
    case SymbolicOp::Not:
    case SymbolicOp::Floor:
    case SymbolicOp::Ceil:
    case SymbolicOp::Round:
    case SymbolicOp::Fix:
        return true;
    case SymbolicOp::DoubleValue: {
        const double value = std::bit_cast<double>((std::uint64_t{key.second} << 32) | key.first);
        return std::isfinite(value) && value == std::trunc(value);
    }
    case SymbolicOp::UnaryMinus:
    case SymbolicOp::Abs:
        return all(1);
    case SymbolicOp::Plus:
    case SymbolicOp::Minus:
    case SymbolicOp::Multiply:
    case SymbolicOp::Modulo:
    case SymbolicOp::Min:
    case SymbolicOp::Max:
    case SymbolicOp::Mod:
    case SymbolicOp::Rem:
        return all(2);
    case SymbolicOp::Power:
        return all(1) && op(key.second) == SymbolicOp::IntValue && intValue(key.second) >= 0;
    case SymbolicOp::Divide:
    case SymbolicOp::ND:
        return false;
    }
    return false;
}

double NodeStore::doubleValue(NodeId id) const {
    const Record& r = records_[id];
    return std::bit_cast<double>((std::uint64_t{r.second} << 32) | r.first);
}

NodeId NodeStore::symbol(std::string_view name) {
    return intern({headOf(SymbolicOp::StringSymbol, 0), 0, 0, {}, name});
}

NodeId NodeStore::integer(int value) {
    return intern({headOf(SymbolicOp::IntValue, 0), static_cast<std::uint32_t>(value), 0, {}, {}});
}

NodeId NodeStore::floating(double value) {
    if (std::isnan(value)) value = std::numeric_limits<double>::quiet_NaN();
    if (value == 0.0) value = 0.0; // drops the sign of a negative zero
    const auto bits = std::bit_cast<std::uint64_t>(value);
    return intern({headOf(SymbolicOp::DoubleValue, 0),
                   static_cast<std::uint32_t>(bits),
                   static_cast<std::uint32_t>(bits >> 32),
                   {},
                   {}});
}

NodeId NodeStore::boolean(bool value) { return intern({headOf(SymbolicOp::BoolSymbol, 0), value, 0, {}, {}}); }

NodeId NodeStore::node(SymbolicOp op, std::span<const NodeId> operands) {
    if (operands.size() > (countMask >> countShift))
        throw std::length_error("an expression has 2^23 - 1 operands at most");
    const std::uint32_t head = headOf(op, operands.size());
    if (operands.size() > 2) return intern({head, 0, 0, operands, {}});
    return intern({head, operands.empty() ? 0 : operands[0], operands.size() < 2 ? 0 : operands[1], {}, {}});
}

std::size_t NodeStore::sizeInMemory() const {
    // A slot of the set costs its id and, in groups of 15, one word of 16 bytes.
    const std::size_t set = ids_.bucket_count() * sizeof(NodeId) + ids_.bucket_count() * 16 / 15;
    const std::size_t values = values_.bucket_count() * sizeof(void*) + values_.size() * 4 * sizeof(void*);
    return records_.capacity() * sizeof(Record) + pool_.capacity() * sizeof(NodeId) + set + values +
           slots_.sizeInMemory();
}

} // namespace QL
