// The message definitions that Debian's robot packages install: all that can be expressed are laid out in one table,
// whatever the order in which they are registered.
#include <algorithm>
#include <map>
#include <random>
#include <string>
#include <vector>

#include <fmt/format.h>
#include <gtest/gtest.h>

#include "description/MsgReader.h"
#include "output/LayoutJson.h"
#include "table/TypeLoader.h"

namespace {

using namespace inspector;

Description realMessages() {
    MsgReader reader;
    for (const char* package : {"std_msgs", "geometry_msgs", "sensor_msgs", "nav_msgs"})
        reader.addFolder(fmt::format("/usr/share/{}/msg", package));
    return reader.read();
}

// Each structure of the description by name, as text.
std::map<std::string, std::string> laidOut(const Description& description) {
    QLTypeSys::DataTypeTable table;
    TypeLoader loader(table);
    loader.load(description);
    Layout layout = loader.layout(description);
    std::map<std::string, std::string> texts;
    for (StructureLayout& structure : layout.structures) {
        Layout single;
        const std::string name = structure.name;
        single.structures.push_back(std::move(structure));
        texts[name] = layoutJson(single);
    }
    return texts;
}

TEST(RealMessages, AreLaidOutTheSameInEveryOrder) {
    Description description = realMessages();
    ASSERT_GT(description.types.size(), 30u);
    const auto expected = laidOut(description);
    const auto isStructure = [](const TypeDescription& type) {
        return std::holds_alternative<StructureDescription>(type.kind);
    };
    const auto numStructures = std::count_if(description.types.begin(), description.types.end(), isStructure);
    EXPECT_EQ(static_cast<std::ptrdiff_t>(expected.size()), numStructures);

    std::reverse(description.types.begin(), description.types.end());
    EXPECT_EQ(laidOut(description), expected);

    const unsigned seed = 20240229;
    SCOPED_TRACE(fmt::format("seed {}", seed));
    std::mt19937 random(seed);
    for (int i = 0; i < 20; ++i) {
        std::shuffle(description.types.begin(), description.types.end(), random);
        ASSERT_EQ(laidOut(description), expected);
    }
}

} // namespace
