#include <random>
#include <string>
#include <unordered_map>

#include <gtest/gtest.h>

#include "qltypes/types/NameIndex_internal.h"

namespace {

using QLTypeSys::NameIndex;

TEST(NameIndex, TheFirstEntryStaysUnlessAssigned) {
    NameIndex index;
    EXPECT_EQ(index.find("a", -10), -10);
    index.erase("a");
    index.insert("a", 1);
    index.insert("a", 2);
    EXPECT_EQ(index.find("a", -10), 1);
    index.assign("a", 3);
    EXPECT_EQ(index.find("a", -10), 3);
    index.erase("a");
    EXPECT_EQ(index.find("a", -10), -10);
}

TEST(NameIndex, NamesOfEveryLengthAreToldApart) {
    NameIndex index;
    for (std::size_t n = 0; n < 200; ++n) {
        index.insert(std::string(n, 'x'), static_cast<int>(n));
        index.insert(std::string(n, 'x') + "y", 1000 + static_cast<int>(n));
    }
    for (std::size_t n = 0; n < 200; ++n) {
        EXPECT_EQ(index.find(std::string(n, 'x'), -10), static_cast<int>(n));
        EXPECT_EQ(index.find(std::string(n, 'x') + "y", -10), 1000 + static_cast<int>(n));
    }
    index.clear();
    EXPECT_EQ(index.find("x", -10), -10);
    index.insert("x", 5);
    EXPECT_EQ(index.find("x", -10), 5);
}

TEST(NameIndex, AgreesWithAMapOverRandomOperations) {
    constexpr unsigned seed = 20240607;
    SCOPED_TRACE(seed);
    std::mt19937 random(seed);
    NameIndex index;
    std::unordered_map<std::string, int> model;
    for (int step = 0; step < 200000; ++step) {
        // Few names, so that operations meet; some longer than a slot holds.
        const unsigned pick = random() % 3000;
        const std::string name = (pick % 3 ? "Type" : "AVeryLongNameOfATypeThatHasNoPlace") + std::to_string(pick);
        const int value = static_cast<int>(random() % 1000);
        switch (random() % 4) {
        case 0:
            index.insert(name, value), model.emplace(name, value);
            break;
        case 1:
            index.assign(name, value), model[name] = value;
            break;
        case 2:
            index.erase(name), model.erase(name);
            break;
        default: {
            const auto found = model.find(name);
            ASSERT_EQ(index.find(name, -10), found == model.end() ? -10 : found->second) << "step " << step;
        }
        }
    }
    for (const auto& [name, value] : model)
        EXPECT_EQ(index.find(name, -10), value);
}

} // namespace
