#include "qltypes/dynamic_matrix/DynamicMatrixMemoryManager.h"

#include <limits>
#include <new>

#include "qltypes/host/Assert_internal.h"

namespace QLTypeSys {

namespace {

constexpr double cMargin = 1.5;
constexpr std::size_t cFewestChains = 64;

// Truncated; the greatest count for what no count reaches.
unsigned long countOf(double bytes) {
    constexpr double tooMany = 18446744073709551616.0;
    return bytes < tooMany ? static_cast<unsigned long>(bytes) : std::numeric_limits<unsigned long>::max();
}

MemoryBounds boundsFor(unsigned long size) {
    const double bytes = static_cast<double>(size);
    return {size, countOf(bytes * cMargin), countOf(bytes / cMargin)};
}

void freeBlock(void* block) { delete[] static_cast<char*>(block); }

} // namespace

constinit DynamicMatrixMemoryManager DynamicMatrixMemoryManager::MemMgr;

DynamicMatrixMemoryManager& DynamicMatrixMemoryManager::GetMemoryManager() { return MemMgr; }

DynamicMatrixMemoryManager::~DynamicMatrixMemoryManager() {
    for (const Index first : chains_)
        for (Index at = first; at != cNone; at = entries_[at].next)
            freeBlock(entries_[at].key.second);
}

DynamicMatrixMemoryManager::Key DynamicMatrixMemoryManager::Allocate(const void* owner, unsigned long size) {
    const MemoryBounds bounds = boundsFor(size);
    makeRoom(); // first, since it can throw
    const Key key(owner, new (std::nothrow) char[bounds.upperBound]);
    enter(key, bounds);
    return key;
}

void DynamicMatrixMemoryManager::Deallocate(const Key& key) {
    const Index entry = find(key);
    if (entry != cNone) release(entry);
}

DynamicMatrixMemoryManager::Key DynamicMatrixMemoryManager::GetOrAllocate(const Key& key, unsigned long size) {
    const Index entry = find(key);
    if (entry != cNone) {
        const MemoryBounds& bounds = entries_[entry].bounds;
        if (bounds.lowerBound <= size && size <= bounds.upperBound) return key;
        release(entry);
    }
    return Allocate(key.first, size);
}

bool DynamicMatrixMemoryManager::IsManaging(const Key& key) const { return find(key) != cNone; }

// Owners of one page of memory have chains near each other, pages stand anywhere.
std::size_t DynamicMatrixMemoryManager::chainOf(const void* owner) const {
    const auto address = reinterpret_cast<std::uintptr_t>(owner);
    const std::size_t page = (address >> 12) * 0x9E3779B97F4A7C15u >> 32;
    return (page + (address >> 4 & 0xFFu)) & (chains_.size() - 1);
}

DynamicMatrixMemoryManager::Index DynamicMatrixMemoryManager::find(const Key& key) const {
    if (chains_.empty()) return cNone;
    Index at = chains_[chainOf(key.first)];
    while (at != cNone && entries_[at].key != key)
        at = entries_[at].next;
    return at;
}

// Makes sure that there is a free entry, and twice as many chains as entries.
void DynamicMatrixMemoryManager::makeRoom() {
    if (firstFree_ != cNone) return;
    QLTYPES_ASSERT(entries_.size() < cNone);
    if (2 * (entries_.size() + 1) > chains_.size()) {
        std::vector<Index> wider(chains_.empty() ? cFewestChains : 2 * chains_.size(), cNone);
        chains_.swap(wider);
        for (Index i = 0; i < entries_.size(); ++i) { // none of them is free
            Index& first = chains_[chainOf(entries_[i].key.first)];
            entries_[i].next = first;
            first = i;
        }
    }
    entries_.push_back({{}, {}, firstFree_});
    firstFree_ = static_cast<Index>(entries_.size() - 1);
}

void DynamicMatrixMemoryManager::enter(const Key& key, const MemoryBounds& bounds) {
    if (const Index known = find(key); known != cNone) { // a null block for the second time
        entries_[known].bounds = bounds;
        return;
    }
    const Index entry = firstFree_;
    firstFree_ = entries_[entry].next;
    Index& first = chains_[chainOf(key.first)];
    entries_[entry] = {key, bounds, first};
    first = entry;
    ++numBlocks_;
}

void DynamicMatrixMemoryManager::release(Index entry) {
    freeBlock(entries_[entry].key.second);
    Index* link = &chains_[chainOf(entries_[entry].key.first)];
    while (*link != entry)
        link = &entries_[*link].next;
    *link = entries_[entry].next;
    entries_[entry].next = firstFree_;
    firstFree_ = entry;
    --numBlocks_;
}

} // namespace QLTypeSys
