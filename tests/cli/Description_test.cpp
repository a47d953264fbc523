// Readers of descriptions that need no table: JSON texts that are no JSON, and the order of registration.
#include <string>
#include <vector>

#include <fmt/format.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "description/Description.h"
#include "description/JsonReader.h"
#include "description/Resolver.h"

namespace {

using namespace inspector;

std::string complaintOf(const std::string& text) {
    try {
        readJsonDescription("in.json", text);
    } catch (const InputError& e) {
        return e.what();
    }
    return "";
}

struct Malformed {
    const char* text;
    const char* complaint; // the beginning of it
};

// clang-format off
constexpr Malformed malformed[] = {
    {"",                       "in.json:1:1: no JSON: "},
    {" \n",                    "in.json:2:1: no JSON: "},
    {"{",                      "in.json:1:2: no JSON: "},
    {"{\"types\": [}",         "in.json:1:12: no JSON: "},
    {"{\n  \"types\": [\n  ],\n}", "in.json:4:1: no JSON: "},
    {"{\"types\": [1, 2] 3",   "in.json:1:18: no JSON: "},
    {"{} {}",                  "in.json:1:4: no JSON: "},
    {"{'types': []}",          "in.json:1:2: no JSON: "},
    {"{\"types\": [\"\xff\"]}", "in.json:1:13: no JSON: "},
    {"{\"types\": [1e999]}",   "in.json:1:16: no JSON: number overflow parsing '1e999'"},
    {"nan",                    "in.json:1:2: no JSON: "},
};
// clang-format on

TEST(JsonReader, TextsThatAreNoJson) {
    for (const Malformed& row : malformed) {
        SCOPED_TRACE(row.text);
        const std::string complaint = complaintOf(row.text);
        EXPECT_THAT(complaint, testing::StartsWith(row.complaint));
        EXPECT_EQ(complaint.find('\n'), std::string::npos) << complaint;
    }
}

TEST(JsonReader, KeyTwiceInOneObject) {
    EXPECT_EQ(complaintOf(R"({"types": [], "types": []})"), "in.json: the document has the key \"types\" twice");
    EXPECT_EQ(complaintOf(R"({"types": [{"size": 1}, {"elements": [{"name": "x", "type": "y", "name": "z"}]}]})"),
              "in.json: /types/1/elements/0: has the key \"name\" twice");
    EXPECT_EQ(complaintOf(R"({"a\nb": {"x": 1, "x": 2}})"), "in.json: /a\\nb: has the key \"x\" twice");
    EXPECT_EQ(complaintOf(R"({"types": [[], [[{}, {"a": [{"a": 1}], "a": 2}]]]})"),
              "in.json: /types/1/0/1: has the key \"a\" twice");
}

TEST(JsonReader, DeepNestingIsReadWithoutRecursion) {
    for (const std::size_t depth : {1000u, 1000000u}) {
        const std::string open(depth, '[');
        EXPECT_THAT(complaintOf(open), testing::StartsWith(fmt::format("in.json:1:{}: no JSON: ", depth + 1)));
        EXPECT_EQ(complaintOf("{\"types\": " + open + std::string(depth, ']') + "}"),
                  "in.json: /types/0: must be an object, not an array");
    }
}

TEST(JsonReader, ReadsEveryKey) {
    const Description description = readJsonDescription("in.json", R"({"types": [
        {"name": "A", "alias": "double"}, {"name": "B", "size": 7},
        {"name": "C", "elements": [{"name": "x", "type": "A"},
          {"name": "y", "type": "B", "dimensions": [2, 3], "complex": true, "min": -1.5, "max": 2, "unit": "m",
           "sampling": "frame", "dimensionsMode": "variable"}]}]})");
    ASSERT_EQ(description.types.size(), 3u);
    EXPECT_EQ(std::get<AliasDescription>(description.types[0].kind).target.name, "double");
    EXPECT_EQ(std::get<AliasDescription>(description.types[0].kind).target.place.within, "/types/0/alias");
    EXPECT_EQ(std::get<ClientTypeDescription>(description.types[1].kind).size, 7);
    EXPECT_EQ(description.types[2].label, "C");
    EXPECT_EQ(description.types[2].place.within, "/types/2");
    const auto& elements = std::get<StructureDescription>(description.types[2].kind).elements;
    ASSERT_EQ(elements.size(), 2u);
    EXPECT_EQ(elements[0].name, "x");
    EXPECT_EQ(elements[0].dimensions, std::vector<std::int64_t>{1});
    EXPECT_FALSE(elements[0].isComplex || elements[0].isFrameBased || elements[0].hasVariableDimensions);
    EXPECT_EQ(elements[0].min, -std::numeric_limits<double>::infinity());
    EXPECT_EQ(elements[0].max, std::numeric_limits<double>::infinity());
    EXPECT_EQ(elements[0].unit, "");
    EXPECT_EQ(elements[1].type.name, "B");
    EXPECT_EQ(elements[1].type.place.within, "/types/2/elements/1/type");
    EXPECT_EQ(elements[1].dimensions, (std::vector<std::int64_t>{2, 3}));
    EXPECT_TRUE(elements[1].isComplex && elements[1].isFrameBased && elements[1].hasVariableDimensions);
    EXPECT_EQ(elements[1].min, -1.5);
    EXPECT_EQ(elements[1].max, 2.0);
    EXPECT_EQ(elements[1].unit, "m");
}

TEST(Width, ProductOfDimensionsStaysWithin31Bits) {
    EXPECT_TRUE(isWidthInRange({1}));
    EXPECT_TRUE(isWidthInRange({2147483647}));
    EXPECT_TRUE(isWidthInRange({1, 2147483647, 1}));
    EXPECT_TRUE(isWidthInRange({46340, 46340}));
    EXPECT_FALSE(isWidthInRange({46341, 46341}));
    EXPECT_FALSE(isWidthInRange({2147483647, 2147483647, 2147483647}));
}

// A description of structures; each is given with the types of its elements.
Description structures(const std::vector<std::pair<std::string, std::vector<std::string>>>& rows) {
    Description description;
    for (const auto& [name, types] : rows) {
        StructureDescription structure;
        for (const std::string& type : types) {
            ElementDescription element;
            element.name = "e" + std::to_string(structure.elements.size());
            element.type = {type, {"in.json", "/" + name + "/" + element.name}};
            structure.elements.push_back(element);
        }
        description.types.push_back({name, name, {"in.json", "/" + name}, structure});
    }
    return description;
}

bool isNumber(const std::string& name) { return name == "double"; }

using Order = std::vector<std::size_t>;

TEST(RegistrationOrder, KeepsTheOrderWhereItMay) {
    EXPECT_EQ(registrationOrder(structures({{"A", {"double"}}, {"B", {"double"}}, {"C", {"A"}}}), isNumber),
              (Order{0, 1, 2}));
}

TEST(RegistrationOrder, PutsWhatIsNeededFirst) {
    EXPECT_EQ(registrationOrder(structures({{"A", {"B", "double", "C"}}, {"B", {"C"}}, {"C", {"double"}}}), isNumber),
              (Order{2, 1, 0}));
}

TEST(RegistrationOrder, SameTypeTwiceIsNoCycle) {
    EXPECT_EQ(registrationOrder(structures({{"A", {"B", "B"}}, {"B", {"double"}}, {"C", {"A", "B"}}}), isNumber),
              (Order{1, 0, 2}));
}

std::string orderComplaint(const Description& description) {
    try {
        registrationOrder(description, isNumber);
    } catch (const InputError& e) {
        return e.what();
    }
    return "";
}

TEST(RegistrationOrder, CycleIsTracedFromWhereItBegins) {
    EXPECT_EQ(orderComplaint(structures({{"A", {"B"}}, {"B", {"double", "C"}}, {"C", {"B"}}})),
              "in.json: /C/e0: cycle: B -> C -> B");
}

TEST(RegistrationOrder, DeepChainsNeedNoStack) {
    constexpr int depth = 200000;
    std::vector<std::pair<std::string, std::vector<std::string>>> rows;
    for (int i = 0; i < depth; ++i)
        rows.push_back({"T" + std::to_string(i), {"T" + std::to_string(i + 1)}});
    EXPECT_EQ(orderComplaint(structures(rows)),
              fmt::format("in.json: /T{0}/e0: unknown type 'T{1}'", depth - 1, depth));
    rows.back().second = {"T0"};
    EXPECT_EQ(orderComplaint(structures(rows)),
              fmt::format("in.json: /T{}/e0: cycle: T0 -> T1 -> T2 -> T3 -> T4 -> T5 -> T6 -> T7 -> ({} more) -> T0",
                          depth - 1, depth - 8));
    rows.back().second = {"double"};
    EXPECT_EQ(registrationOrder(structures(rows), isNumber).front(), std::size_t(depth - 1));
}

} // namespace
