#include "qlplatform/strings/DynamicStringPool.h"

#include <map>
#include <random>
#include <vector>

#include <gtest/gtest.h>

namespace {

using stringutil::DynamicStringPool;
using stringutil::voidPtrToUStrRef;

TEST(DynamicStringPool, ATextIsReachedByItsHandle) {
    DynamicStringPool pool;
    int key;
    void* const handle = pool.put(&key, u"first");
    EXPECT_EQ(voidPtrToUStrRef(handle), u"first");
    voidPtrToUStrRef(handle) += u" and more than fits into a short text";
    EXPECT_EQ(voidPtrToUStrRef(handle), u"first and more than fits into a short text");
    EXPECT_EQ(pool.size(), 1u);
    pool.remove(&key);
    EXPECT_EQ(pool.size(), 0u);
    pool.remove(&key);
    pool.remove(nullptr);
}

TEST(DynamicStringPool, AKeyThatHoldsATextKeepsItsHandle) {
    DynamicStringPool pool;
    int key;
    void* const handle = pool.put(&key, u"first");
    EXPECT_EQ(pool.put(&key, u"second"), handle);
    EXPECT_EQ(voidPtrToUStrRef(handle), u"second");
    EXPECT_EQ(pool.size(), 1u);
}

TEST(DynamicStringPool, PoolsAreTheOnesOfTheirNames) {
    DynamicStringPool& global = DynamicStringPool::GetPool(DynamicStringPool::GlobalPoolName);
    EXPECT_EQ(&DynamicStringPool::GetPool(DynamicStringPool::GlobalPoolName), &global);
    DynamicStringPool& other = DynamicStringPool::GetPool("other");
    EXPECT_NE(&other, &global);
    EXPECT_EQ(&DynamicStringPool::GetPool(std::string("other")), &other);
    int key;
    other.put(&key, u"x");
    EXPECT_EQ(other.size(), 1u);
    EXPECT_EQ(global.size(), 0u);
    other.remove(&key);
}

TEST(DynamicStringPool, HandlesStayAsTheyAreWhileOthersComeAndGo) {
    constexpr unsigned seed = 61;
    constexpr std::size_t numKeys = 3000;
    SCOPED_TRACE(testing::Message() << "seed " << seed);
    DynamicStringPool pool;
    std::vector<char> keys(numKeys);
    std::map<const void*, std::pair<void*, std::u16string>> model;
    std::mt19937 random(seed);
    for (int step = 0; step < 100000; ++step) {
        const void* key = &keys[random() % numKeys];
        const auto held = model.find(key);
        if (random() % 3 == 0) {
            pool.remove(key);
            model.erase(key);
        } else {
            const std::u16string text(random() % 30, static_cast<char16_t>(random()));
            void* const handle = pool.put(key, text);
            if (held != model.end()) {
                ASSERT_EQ(handle, held->second.first) << "step " << step;
            }
            model[key] = {handle, text};
        }
    }
    ASSERT_EQ(pool.size(), model.size());
    for (const auto& [key, held] : model)
        EXPECT_EQ(voidPtrToUStrRef(held.first), held.second);
}

} // namespace
