#include <cstring>
#include <limits>
#include <map>
#include <random>
#include <vector>

#include <gtest/gtest.h>

#include "qltypes/dynamic_matrix/DynamicMatrixMemoryManager.h"
#include "tests/support/FailingNew.h"

namespace {

using Manager = QLTypeSys::DynamicMatrixMemoryManager;
using Key = Manager::Key;

Manager& manager() { return Manager::GetMemoryManager(); }

constexpr unsigned long cMost = std::numeric_limits<unsigned long>::max();

TEST(MemoryManager, ThereIsOne) { EXPECT_EQ(&manager(), &Manager::GetMemoryManager()); }

TEST(MemoryManager, ABlockServesTwoThirdsToOneAndAHalfOfItsSize) {
    struct Row {
        unsigned long size, least, most;
    };
    const Row rows[] = {
        {0, 0, 0},
        {1, 0, 1},
        {2, 1, 3},
        {3, 2, 4},
        {100, 66, 150},
        {101, 67, 151},
        {1000, 666, 1500},
        {99999, 66666, 149998},
        {999999, 666666, 1499998},
    };
    int owner;
    for (const Row& row : rows) {
        SCOPED_TRACE(row.size);
        for (unsigned long request = row.least; request <= row.most;
             request += request < row.most ? row.most - request : 1) {
            const Key key = manager().Allocate(&owner, row.size);
            EXPECT_EQ(manager().GetOrAllocate(key, request), key);
            manager().Deallocate(key);
        }
        const Key key = manager().Allocate(&owner, row.size);
        EXPECT_EQ(key.first, &owner);
        ASSERT_NE(key.second, nullptr);
        std::memset(key.second, 1, row.most);

        // Outside, the old block goes; the new one has bounds of its own.
        Key moved = manager().GetOrAllocate(key, row.most + 1);
        EXPECT_EQ(moved.first, &owner);
        EXPECT_TRUE(manager().IsManaging(moved));
        std::memset(moved.second, 1, row.most + 1);
        EXPECT_EQ(manager().GetOrAllocate(moved, static_cast<unsigned long>(1.5 * static_cast<double>(row.most + 1))),
                  moved);
        manager().Deallocate(moved);
        if (row.least > 0) {
            const Key again = manager().Allocate(&owner, row.size);
            moved = manager().GetOrAllocate(again, row.least - 1);
            EXPECT_EQ(manager().GetOrAllocate(moved, row.least - 1), moved);
            manager().Deallocate(moved);
        }
        EXPECT_EQ(manager().numBlocks(), 0u);
    }
}

// A freed block can come back at the same address, so moving is seen by a second block that is held meanwhile.
TEST(MemoryManager, ABlockMovesExactlyOutsideItsBounds) {
    int owner;
    const auto movesAt = [&](unsigned long request) {
        const Key key = manager().Allocate(&owner, 100);
        testsupport::failNothrowNewAt(1);
        const Key got = manager().GetOrAllocate(key, request);
        testsupport::failNothrowNewAt(0);
        manager().Deallocate(got);
        return got.second == nullptr;
    };
    EXPECT_TRUE(movesAt(65));
    EXPECT_FALSE(movesAt(66));
    EXPECT_FALSE(movesAt(100));
    EXPECT_FALSE(movesAt(150));
    EXPECT_TRUE(movesAt(151));
    EXPECT_TRUE(movesAt(0));
}

TEST(MemoryManager, BoundsStayThoseOfTheFirstRequest) {
    int owner;
    const Key key = manager().Allocate(&owner, 100);
    EXPECT_EQ(manager().GetOrAllocate(key, 150), key);
    EXPECT_EQ(manager().GetOrAllocate(key, 66), key); // would be too small for a block of 150
    EXPECT_EQ(manager().GetOrAllocate(key, 150), key);
    manager().Deallocate(key);
}

TEST(MemoryManager, OnlyTheExactPairIsManaged) {
    int owner, copy;
    const Key key = manager().Allocate(&owner, 8);
    std::memcpy(key.second, "content", 8);
    EXPECT_TRUE(manager().IsManaging(key));
    EXPECT_FALSE(manager().IsManaging({&copy, key.second}));
    EXPECT_FALSE(manager().IsManaging({&owner, nullptr}));
    EXPECT_FALSE(manager().IsManaging({nullptr, key.second}));

    manager().Deallocate({&copy, key.second}); // nothing to free
    EXPECT_TRUE(manager().IsManaging(key));
    const Key own = manager().GetOrAllocate({&copy, key.second}, 8); // a block of its own
    EXPECT_EQ(own.first, &copy);
    EXPECT_NE(own.second, key.second);
    EXPECT_STREQ(static_cast<const char*>(key.second), "content");

    const Key second = manager().Allocate(&owner, 8); // one owner may have several
    EXPECT_TRUE(manager().IsManaging(key));
    EXPECT_TRUE(manager().IsManaging(second));
    EXPECT_EQ(manager().numBlocks(), 3u);
    for (const Key& each : {key, own, second})
        manager().Deallocate(each);
    EXPECT_FALSE(manager().IsManaging(key));
    manager().Deallocate(key);
    EXPECT_EQ(manager().numBlocks(), 0u);
}

TEST(MemoryManager, AFailedAllocationIsManagedLikeAnyOther) {
    int owner, other;
    const Key kept = manager().Allocate(&other, 16);
    std::memcpy(kept.second, "still here", 11);

    testsupport::failNothrowNewAt(1);
    const Key none = manager().Allocate(&owner, 100);
    EXPECT_EQ(none, Key(&owner, nullptr));
    EXPECT_TRUE(manager().IsManaging(none));
    EXPECT_EQ(manager().GetOrAllocate(none, 150), none); // within the bounds it stays what it is
    const Key block = manager().GetOrAllocate(none, 151);
    EXPECT_NE(block.second, nullptr);
    EXPECT_FALSE(manager().IsManaging(none));

    testsupport::failNothrowNewAt(1);
    EXPECT_EQ(manager().GetOrAllocate(block, 1000), none); // the old block goes first
    EXPECT_FALSE(manager().IsManaging(block));
    testsupport::failNothrowNewAt(1);
    EXPECT_EQ(manager().Allocate(&owner, 10), none);
    EXPECT_EQ(manager().GetOrAllocate(none, 15), none); // by the bounds of the last request
    EXPECT_STREQ(static_cast<const char*>(kept.second), "still here");
    manager().Deallocate(none);
    manager().Deallocate(kept);
    EXPECT_EQ(manager().numBlocks(), 0u);
}

TEST(MemoryManager, SizesThatNoMemoryHasAreRefusedByNull) {
    int owner;
    for (unsigned long size : {cMost, cMost - 1, cMost / 3 * 2, cMost / 2, 1ul << 62}) {
        SCOPED_TRACE(size);
        const Key key = manager().Allocate(&owner, size);
        EXPECT_EQ(key.second, nullptr);
        EXPECT_EQ(manager().GetOrAllocate(key, size), key);
        manager().Deallocate(key);
    }
}

// Against a plain map and the rule written out, on owners close together, far apart and unaligned.
TEST(MemoryManager, AgreesWithAPlainModelOverARandomSequence) {
    constexpr unsigned seed = 62;
    SCOPED_TRACE(testing::Message() << "seed " << seed);
    struct Held {
        unsigned long size;
        unsigned char fill;
    };
    std::mt19937 random(seed);
    std::vector<const void*> owners;
    for (std::uintptr_t i = 0; i < 1000; ++i)
        for (std::uintptr_t at : {0x10000 + i, 0x7f0000000000 + i * 104, 0x500000000000 + i * 4096})
            owners.push_back(reinterpret_cast<const void*>(at));
    std::map<Key, Held> model;
    std::vector<Key> keys(owners.size());
    for (std::size_t i = 0; i < owners.size(); ++i)
        keys[i] = {owners[i], nullptr};

    for (int step = 0; step < 100000; ++step) {
        Key& key = keys[random() % keys.size()];
        const auto held = model.find(key);
        ASSERT_EQ(manager().IsManaging(key), held != model.end()) << "step " << step;
        if (held != model.end()) {
            const auto* bytes = static_cast<const unsigned char*>(key.second);
            for (unsigned long i = 0; i < held->second.size; ++i)
                ASSERT_EQ(bytes[i], held->second.fill) << "step " << step;
        }
        if (random() % 4 == 0) {
            manager().Deallocate(key);
            model.erase(key);
            ASSERT_FALSE(manager().IsManaging(key)) << "step " << step;
            continue;
        }
        const unsigned long request = random() % 200;
        const bool stays = held != model.end() &&
                           request >= static_cast<unsigned long>(static_cast<double>(held->second.size) / 1.5) &&
                           request <= static_cast<unsigned long>(static_cast<double>(held->second.size) * 1.5);
        const Key got = manager().GetOrAllocate(key, request);
        ASSERT_EQ(got.first, key.first) << "step " << step;
        if (stays) {
            ASSERT_EQ(got, key) << "step " << step;
            continue;
        }
        model.erase(key);
        const auto fill = static_cast<unsigned char>(random());
        std::memset(got.second, fill, request);
        model[got] = {request, fill};
        key = got;
    }
    ASSERT_EQ(manager().numBlocks(), model.size());
    for (const auto& each : model)
        manager().Deallocate(each.first);
    EXPECT_EQ(manager().numBlocks(), 0u);
}

} // namespace
