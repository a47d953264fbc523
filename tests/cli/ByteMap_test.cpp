// Byte maps of structures, held against a walk over every byte.
#include <map>
#include <random>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include "description/Description.h"
#include "picture/ByteMap.h"
#include "picture/Escape.h"
#include "picture/Svg.h"
#include "qltypes/types/DataTypeTable.h"
#include "table/TypeLoader.h"

namespace {

using namespace inspector;

ElementDescription element(const std::string& name, const std::string& type,
                           std::vector<std::int64_t> dimensions = {1}) {
    ElementDescription description;
    description.name = name;
    description.type = {type, {}};
    description.dimensions = std::move(dimensions);
    return description;
}

Layout layoutOf(const Description& description) {
    QLTypeSys::DataTypeTable table;
    TypeLoader loader(table);
    loader.load(description);
    return loader.layout(description);
}

// Structures of which each may contain the earlier ones; the last one is the largest.
Description randomDescription(std::mt19937& random) {
    const std::vector<std::string> leaves = {"boolean", "int8", "uint16", "single", "double", "sfix24_En3"};
    const auto below = [&](std::size_t count) {
        return std::uniform_int_distribution<std::size_t>(0, count - 1)(random);
    };
    Description description;
    const std::size_t numStructures = 1 + below(5);
    for (std::size_t i = 0; i < numStructures; ++i) {
        StructureDescription structure;
        const std::size_t numElements = 1 + below(6);
        for (std::size_t j = 0; j < numElements; ++j) {
            const std::size_t type = below(leaves.size() + i);
            const bool isNested = type >= leaves.size();
            const std::string name = isNested ? "S" + std::to_string(type - leaves.size()) : leaves[type];
            structure.elements.push_back(element("e" + std::to_string(j), name));
            const std::size_t most = isNested ? 4 : 90;
            if (below(2) == 0)
                structure.elements.back().dimensions = {1 + std::int64_t(below(most)), 1 + std::int64_t(below(2))};
            if (!isNested) structure.elements.back().isComplex = below(5) == 0;
        }
        const std::string name = "S" + std::to_string(i);
        description.types.push_back({name, name, {}, structure});
    }
    return description;
}

// What owns each byte: the path of a leaf with the dimensions of the leaf itself, empty for padding.
void own(std::vector<std::string>& owners, const StructureLayout& structure, const StructuresByName& all,
         std::int64_t base, const std::string& path) {
    for (const ElementLayout& element : structure.elements) {
        const bool isArray = element.dimensions != std::vector<std::int64_t>{1};
        std::string text = path + element.name;
        if (element.typeKind == TypeKind::Structure) {
            const StructureLayout& nested = *all.at(element.cType.name);
            for (std::int64_t i = 0; i < element.size / nested.size; ++i) {
                own(owners, nested, all, base + element.offset + i * nested.size,
                    text + (element.size > nested.size ? "(" + std::to_string(i) + ")." : "."));
            }
            continue;
        }
        if (isArray) {
            for (const std::int64_t dimension : element.dimensions)
                text += "[" + std::to_string(dimension) + "]";
        }
        for (std::int64_t i = 0; i < element.size; ++i)
            owners[std::size_t(base + element.offset + i)] = text;
    }
}

void checkMap(const StructureLayout& structure, const StructuresByName& all) {
    SCOPED_TRACE(structure.name);
    const ByteMap map = byteMap(structure, all);
    std::vector<std::string> owners(std::size_t(structure.size));
    own(owners, structure, all, 0, "");

    std::int64_t end = 0; // rows follow one another
    for (const MapRow& row : map.rows) {
        ASSERT_EQ(row.offset, end);
        ASSERT_GT(row.end, row.offset);
        ASSERT_TRUE(!row.gap.empty() || row.end == row.offset + 8);
        end = row.end;
    }
    ASSERT_EQ(end, structure.size);

    std::vector<int> numBlocks(std::size_t(structure.size), 0);
    for (const MapBlock& block : map.blocks) {
        SCOPED_TRACE(block.path);
        ASSERT_EQ(block.offset, map.rows[block.span.firstRow].offset + block.span.firstByte);
        const MapRow& lastRow = map.rows[block.span.lastRow];
        ASSERT_EQ(block.offset + block.size, lastRow.gap.empty() ? lastRow.offset + block.span.endByte : lastRow.end);
        for (std::int64_t byte = block.offset; byte < block.offset + block.size; ++byte) {
            ++numBlocks[std::size_t(byte)];
            const std::string& owner = owners[std::size_t(byte)];
            const bool isOwner = block.isPadding ? owner.empty()
                                 : block.kind == TypeKind::Structure
                                     ? owner.empty() || owner.starts_with(block.path.substr(0, block.path.find('[')))
                                     : owner == block.path;
            ASSERT_TRUE(isOwner) << owner;
        }
    }
    for (const MapRow& row : map.rows) {
        for (std::int64_t byte = row.offset; byte < row.end; ++byte)
            ASSERT_EQ(numBlocks[std::size_t(byte)], row.isOfMany ? 0 : 1) << byte;
    }
    for (const MapNest& nest : map.nests) {
        EXPECT_EQ(map.rows[nest.span.firstRow].offset, nest.offset) << nest.path;
        EXPECT_EQ(map.rows[nest.span.lastRow].end, nest.offset + nest.size) << nest.path;
    }
}

TEST(ByteMap, RandomStructures) {
    for (unsigned seed = 1; seed <= 300; ++seed) {
        SCOPED_TRACE(seed);
        std::mt19937 random(seed);
        const Layout layout = layoutOf(randomDescription(random));
        const StructuresByName all = structuresByName(layout);
        for (const StructureLayout& structure : layout.structures)
            checkMap(structure, all);
        if (HasFailure()) return;
    }
}

std::vector<std::string> gapsOf(const ByteMap& map) {
    std::vector<std::string> gaps;
    for (const MapRow& row : map.rows) {
        if (!row.gap.empty()) gaps.push_back(row.gap);
    }
    return gaps;
}

TEST(ByteMap, LongArraysAreCutInTheMiddle) {
    const Layout layout =
        layoutOf({{{"Inner", "Inner", {}, StructureDescription{{element("a", "double", {3})}}},
                   {"Outer",
                    "Outer",
                    {},
                    StructureDescription{{element("six", "double", {6}), element("seven", "double", {7}),
                                          element("four", "Inner", {4}), element("five", "Inner", {5}),
                                          element("grid", "uint8", {640, 480})}}}},
                  {},
                  0});
    const ByteMap map = byteMap(layout.structures[1], structuresByName(layout));
    EXPECT_EQ(gapsOf(map),
              (std::vector<std::string>{"32 more bytes of seven", "4 more of 24 bytes", "307176 more bytes of grid"}));
    EXPECT_EQ(map.rows.size(), 6u + 4u + 12u + 4u + 4u);
    ASSERT_EQ(map.nests.size(), 6u);
    EXPECT_EQ(map.nests[3].path, "four(3)");
    EXPECT_EQ(map.nests[5].name, "five(1) \u2013 (4)");
}

TEST(ByteMap, ManyLevelsAndManyElementsStayDrawable) {
    Description chain;
    for (int i = 0; i < 60; ++i) {
        const std::string name = "T" + std::to_string(i);
        const std::string inner = i == 59 ? "int8" : "T" + std::to_string(i + 1);
        chain.types.push_back({name, name, {}, StructureDescription{{element("x", inner)}}});
    }
    Layout layout = layoutOf(chain);
    ByteMap map = byteMap(layout.structures[0], structuresByName(layout));
    EXPECT_EQ(map.depth, 6);
    ASSERT_EQ(map.blocks.size(), 1u);
    EXPECT_EQ(map.blocks[0].path, "x.x.x.x.x.x.x");
    EXPECT_EQ(map.blocks[0].kind, TypeKind::Structure);

    Description wide;
    StructureDescription structure;
    for (int i = 0; i < 20'000; ++i)
        structure.elements.push_back(element("e" + std::to_string(i), "double"));
    wide.types.push_back({"Wide", "Wide", {}, structure});
    layout = layoutOf(wide);
    map = byteMap(layout.structures[0], structuresByName(layout));
    EXPECT_EQ(map.rows.size(), 2001u);
    EXPECT_EQ(map.rows.back().gap, "18000 more elements");
    EXPECT_EQ(map.rows.back().end, 160'000);
}

TEST(Escape, MarkupControlsAndBadBytes) {
    EXPECT_EQ(escapedForXml("</script><a b=\"'&\">"), "&lt;/script&gt;&lt;a b=&quot;'&amp;&quot;&gt;");
    EXPECT_EQ(escapedForXml(std::string("a\0\x1b\tb\xff", 6)), "a\ufffd\ufffd\tb\ufffd");
    EXPECT_EQ(escapedForXml("\u00b5m \U0001f697"), "\u00b5m \U0001f697");
}

TEST(Escape, JsonInsideAScript) {
    const nlohmann::ordered_json json = {{"</script>", "<!--<script>\xff\u2028\u00b5"}};
    const std::string text = jsonForScript(json);
    EXPECT_EQ(text, "{\"\\u003c/script>\":\"\\u003c!--\\u003cscript>\\ufffd\\u2028\\u00b5\"}");
    EXPECT_EQ(nlohmann::json::parse(text).begin().key(), "</script>");
}

// Readers let identifiers through only; a picture does not count on it.
TEST(LayoutSvg, NamesCannotBecomeMarkup) {
    const std::string evil = "</text></svg><script>alert(1)</script>\"'&";
    StructureLayout structure;
    structure.name = structure.label = evil;
    structure.size = 8;
    ElementLayout leaf;
    leaf.name = leaf.typeName = leaf.typeLabel = leaf.unit = evil;
    leaf.dimensions = {1};
    leaf.size = 8;
    structure.elements = {leaf};
    Layout layout;
    layout.structures = {structure};
    const std::string svg = layoutSvg(layout, layout);
    EXPECT_EQ(svg.find("<script"), std::string::npos);
    EXPECT_EQ(svg.find("</svg>"), svg.size() - 7);
    EXPECT_NE(svg.find("&lt;script&gt;"), std::string::npos);
}

} // namespace
