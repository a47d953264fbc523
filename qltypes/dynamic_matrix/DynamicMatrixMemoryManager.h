// The owner of all buffers of dynamic matrices, with a margin of growth so that small changes of size do not move one.
//
// A block is known by the pair of its owner's address and its own: a byte-wise copy of an owner finds nothing to free.
//   auto& manager = DynamicMatrixMemoryManager::GetMemoryManager();
//   auto key = manager.Allocate(&matrix, 100);   // serves requests from 66 to 150 bytes
//   key = manager.GetOrAllocate(key, 140);       // the same block
//   manager.Deallocate(key);
//
// Process-wide and unlocked: callers serialise.
#pragma once

#include <cstddef>
#include <cstdint>
#include <utility>
#include <vector>

#include "qlplatform/Export.h"

namespace QLTypeSys {

/// What a block was asked for and what it serves, in bytes.
struct MemoryBounds {
    unsigned long size;       ///< asked for when the block was made
    unsigned long upperBound; ///< its capacity: 1.5 times the size
    unsigned long lowerBound; ///< the smallest request it still serves: the size divided by 1.5
};

/// The process-wide owner of blocks. Frees what remains when the process ends.
class QL_EXPORT DynamicMatrixMemoryManager {
  public:
    /// The owner's address, which must stay the same as long as it has the block, and the block.
    using Key = std::pair<const void*, void*>;

    DynamicMatrixMemoryManager(const DynamicMatrixMemoryManager&) = delete;
    DynamicMatrixMemoryManager& operator=(const DynamicMatrixMemoryManager&) = delete;

    /// The manager of this process.
    static DynamicMatrixMemoryManager& GetMemoryManager();

    /// A new block of `size` bytes and the margin, with no set content. When memory runs out the block is null; such a
    /// key is managed like any other.
    Key Allocate(const void* owner, unsigned long size);

    /// Frees the block. A key that is not managed is ignored.
    void Deallocate(const Key& key);

    /// The key as it is when its block serves `size` bytes; the block's bounds stay. Otherwise a new block of the same
    /// owner, the old one being freed with its contents.
    Key GetOrAllocate(const Key& key, unsigned long size);

    /// Whether exactly this pair is managed.
    bool IsManaging(const Key& key) const;

    /// The number of keys managed.
    std::size_t numBlocks() const { return numBlocks_; }

  private:
    // A chained index that keeps owners of one page near each other, in entries that are used anew. A matrix is looked
    // up at each change of its dimensions, and a model steps through its signals in the order of their addresses: with
    // neighbours side by side a million matrices cost little more each than a thousand.
    using Index = std::uint32_t;
    static constexpr Index cNone = ~Index{0};
    struct Entry {
        Key key;
        MemoryBounds bounds;
        Index next; // in the chain, or among the free entries
    };

    DynamicMatrixMemoryManager() = default;
    ~DynamicMatrixMemoryManager();

    std::size_t chainOf(const void* owner) const;
    Index find(const Key& key) const;
    void makeRoom();
    void enter(const Key& key, const MemoryBounds& bounds);
    void release(Index entry);

    static DynamicMatrixMemoryManager MemMgr;

    std::vector<Index> chains_; // first entry of each chain; a power of two of them, at least two an entry
    std::vector<Entry> entries_;
    Index firstFree_ = cNone;
    std::size_t numBlocks_ = 0;
};

} // namespace QLTypeSys
