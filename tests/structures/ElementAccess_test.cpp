// The four views on the worked example, row by row, and what the random comparison does not reach.
#include <algorithm>
#include <random>

#include <malloc.h>

#include "qltypes/structures/ElementAccess.h"
#include "tests/structures/Builder.h"

namespace {

using namespace structures;
using namespace QLTypeSys;

constexpr int real = DATA_TYPE_ID_DOUBLE;

// --- The worked example ----------------------------------------------------------------------------------------------

struct NodeRow {
    long node;
    const char* path;
    const char* pathFromRoot;
    long flat;
    long raw; // first value, or values in front
    long offset;
    long width;
    long parentElement;
};

constexpr NodeRow nodeRows[] = {
    // clang-format off
    {0,  "",           "(0)",       -1, 0,   0, 1, -1},
    {1,  "x",          "(0).x",      0, 0,   0, 1,  0},
    {2,  "y",          "(0).y",     -1, 1,   8, 2,  1},
    {3,  "y(0)",       "(0).y(0)",  -1, 1,   8, 1,  1},
    {4,  "y(0).a",     "(0).y(0).a", 1, 1,   8, 3,  0},
    {5,  "y(0).b",     "(0).y(0).b", 2, 4,  32, 1,  1},
    {6,  "y(1)",       "(0).y(1)",  -1, 6,  40, 1,  1},
    {7,  "y(1).a",     "(0).y(1).a", 3, 6,  40, 3,  0},
    {8,  "y(1).b",     "(0).y(1).b", 4, 9,  64, 1,  1},
    {9,  "z",          "(0).z",     -1, 11, 72, 1,  2},
    {10, "z.a",        "(0).z.a",    5, 11, 72, 3,  0},
    {11, "z.b",        "(0).z.b",    6, 14, 96, 1,  1},
    {12, "(1)",        "(1)",       -1, 16, 104, 1, -1},
    {13, "(1).x",      "(1).x",      7, 16, 104, 1,  0},
    {16, "(1).y(0).a", "(1).y(0).a", 8, 17, 112, 3,  0},
    {35, "(2).z.b",    "(2).z.b",   20, 46, 304, 1,  1},
    // clang-format on
};

std::u16string wide(const std::string& text) { return {text.begin(), text.end()}; }

TEST(WorkedExample, EachNode) {
    Example e;
    const DFSElementAccess dfs(&e.table, e.outer);
    EXPECT_EQ(dfs.getNumElements(), 12);
    for (const NodeRow& row : nodeRows) {
        SCOPED_TRACE(row.node);
        EXPECT_TRUE(dfs.isIdxValid(row.node));
        EXPECT_EQ(dfs.getFullPathAsString(row.node, false), wide(row.path));
        EXPECT_EQ(dfs.getFullPathAsString(row.node, true), wide(row.pathFromRoot));
        EXPECT_EQ(dfs.getFlatElementIdx(row.node), row.flat);
        EXPECT_EQ(dfs.getRawElementIdx(row.node), row.raw);
        EXPECT_EQ(dfs.getOffset(row.node), row.offset);
        EXPECT_EQ(dfs.getWidth(row.node), row.width);
        int parent;
        long element;
        dfs.getImmediateParentDTypeIdAndOffset(row.node, parent, element);
        EXPECT_EQ(element, row.parentElement);
        const bool isInInner = std::string(row.path).find('.') != std::string::npos && row.node != 13;
        EXPECT_EQ(parent, row.parentElement < 0 ? -10 : isInInner ? e.inner : e.outer);
    }
}

TEST(WorkedExample, EachLeaf) {
    Example e;
    const FlatElementAccess flat(&e.table, e.outer);
    EXPECT_EQ(flat.getNumElements(), 7);
    for (const NodeRow& row : nodeRows) {
        if (row.flat < 0) continue;
        SCOPED_TRACE(row.flat);
        EXPECT_TRUE(flat.isIdxValid(row.flat));
        EXPECT_EQ(flat.getDFSIdx(row.flat), row.node);
        EXPECT_EQ(flat.getOffset(row.flat), row.offset);
        EXPECT_EQ(flat.getFullPathAsString(row.flat, true), wide(row.pathFromRoot));
        StructElementAccess::Path path;
        flat.getFullPath(row.flat, false, path);
        EXPECT_EQ(StructElementAccess::convertFullPathToString(path, ""), row.path);
        int parent, expectedParent;
        long element, expectedElement;
        flat.getImmediateParentDTypeIdAndOffset(row.flat, parent, element);
        DFSElementAccess(&e.table, e.outer)
            .getImmediateParentDTypeIdAndOffset(row.node, expectedParent, expectedElement);
        EXPECT_EQ(parent, expectedParent);
        EXPECT_EQ(element, expectedElement);
    }
}

TEST(WorkedExample, EachValue) {
    Example e;
    const RawElementAccess raw(&e.table, e.outer);
    EXPECT_EQ(raw.getNumElements(), 16);
    constexpr long offsets[] = {0, 8, 16, 24, 32, 36, 40, 48, 56, 64, 68, 72, 80, 88, 96, 100};
    for (long i = 0; i < 16; ++i) {
        EXPECT_TRUE(raw.isIdxValid(i));
        EXPECT_EQ(raw.getOffset(i), offsets[i]) << i;
        const bool isA = i > 0 && (i - 1) % 5 < 3;
        EXPECT_EQ(raw.getDataTypeId(i), i == 0 ? DATA_TYPE_ID_INT8 : isA ? DATA_TYPE_ID_DOUBLE : DATA_TYPE_ID_SINGLE);
        EXPECT_EQ(raw.getUnitId(i), -1);
        EXPECT_EQ(raw.getSymbDimsId(i), 0);
    }
    EXPECT_FALSE(raw.isIdxValid(-1));
    EXPECT_FALSE(raw.isIdxValid(16));
}

TEST(WorkedExample, EachChild) {
    Example e;
    const ImmediateElementAccess outer(&e.table, e.outer);
    EXPECT_EQ(outer.getNumElements(), 3);
    EXPECT_TRUE(outer.isIdxValid(0));
    EXPECT_TRUE(outer.isIdxValid(2));
    EXPECT_FALSE(outer.isIdxValid(3));
    EXPECT_FALSE(outer.isIdxValid(-1));
    EXPECT_EQ(outer.getPadding(0), 7);
    EXPECT_EQ(outer.getPadding(1), 0);
    EXPECT_EQ(outer.getPadding(2), 0);
    constexpr long raw[] = {0, 0, 1, 11};
    for (long i = -1; i < 3; ++i)
        EXPECT_EQ(outer.getRawElementIdx(i), raw[i + 1]);
    const ImmediateElementAccess inner(&e.table, e.alias("AliasOfInner", e.inner));
    EXPECT_STREQ(inner.getName(1), "b");
    EXPECT_EQ(inner.getComplexWidth(0), 3);
    EXPECT_EQ(inner.getComplexWidth(1), 2);
}

// --- Elements that stand for nodes -----------------------------------------------------------------------------------

TEST(NodeElements, TheRoot) {
    Example e;
    const DFSElementAccess dfs(&e.table, e.outer);
    EXPECT_STREQ(dfs.getName(0), "");
    EXPECT_EQ(dfs.getDataTypeId(0), e.outer);
    EXPECT_EQ(dfs.getUnitId(0), 0);
    EXPECT_EQ(dfs.getSymbDimsId(0), 0);
    EXPECT_EQ(dfs.getNumDimensions(0), 1);
    EXPECT_EQ(dfs.getDimensions(0)[0], 1);
    EXPECT_EQ(dfs.getSignalType(0), 0);
    EXPECT_EQ(dfs.getSamplingMode(0), 0);
    EXPECT_EQ(dfs.getDimensionsMode(0), 0);
    EXPECT_EQ(dfs.getMin(0), -std::numeric_limits<double>::infinity());
    EXPECT_EQ(dfs.getMax(0), std::numeric_limits<double>::infinity());
    EXPECT_EQ(dfs.getVarDimsOffset(0), 0);
    EXPECT_EQ(dfs.getStructElement(12), dfs.getStructElement(0)) << "the next instance is the same element";
}

TEST(NodeElements, AnArrayIsItsMemberAndAnInstanceIsNot) {
    Example e;
    StructElement* const y = e.element(e.outer, 1);
    y->setUnitId(5);
    y->setMin(-3);
    y->setMax(3);
    y->setSymbDimsId(7);
    y->setSignalType(1);
    y->setSamplingMode(1);
    y->setDimensionsMode(1);
    const DFSElementAccess dfs(&e.table, e.outer);
    EXPECT_EQ(dfs.getStructElement(2), y);
    EXPECT_EQ(dfs.getUnitId(2), 5);
    EXPECT_EQ(dfs.getSignalType(2), 1);
    EXPECT_EQ(dfs.getComplexWidth(2), 4);
    EXPECT_EQ(dfs.getMin(2), -3);
    EXPECT_EQ(dfs.getMax(2), 3);
    for (const long head : {3, 6}) {
        EXPECT_STREQ(dfs.getName(head), "y");
        EXPECT_EQ(dfs.getDataTypeId(head), e.inner);
        EXPECT_EQ(dfs.getNumDimensions(head), 1);
        EXPECT_EQ(dfs.getDimensions(head)[0], 1);
        EXPECT_EQ(dfs.getUnitId(head), 0);
        EXPECT_EQ(dfs.getSymbDimsId(head), 0);
        EXPECT_EQ(dfs.getSignalType(head), 0);
        EXPECT_EQ(dfs.getSamplingMode(head), 0);
        EXPECT_EQ(dfs.getDimensionsMode(head), 0);
        EXPECT_EQ(dfs.getMin(head), -std::numeric_limits<double>::infinity());
        EXPECT_EQ(dfs.getMax(head), std::numeric_limits<double>::infinity());
    }
    EXPECT_EQ(dfs.getStructElement(4), e.element(e.inner, 0));
    EXPECT_EQ(dfs.getStructElement(7), e.element(e.inner, 0));
}

TEST(NodeElements, CarryTheIdOfTheView) {
    Example e;
    const int alias = e.alias("AliasOfOuter", e.outer);
    const int innerAlias = e.alias("AliasOfInner", e.inner);
    const int around = e.laidOut("Around", {{"i", innerAlias, {2}}, {"j", e.inner}});
    for (const int order : {0, 1}) {
        e.record(e.outer)->clearDFSCache();
        for (const int id : order ? std::vector{alias, e.outer} : std::vector{e.outer, alias})
            EXPECT_EQ(DFSElementAccess(&e.table, id).getDataTypeId(0), id);
    }
    const DFSElementAccess dfs(&e.table, around);
    EXPECT_EQ(dfs.getDataTypeId(2), innerAlias);
    EXPECT_EQ(dfs.getDataTypeId(5), innerAlias);
    EXPECT_EQ(dfs.getDataTypeId(8), e.inner);
    int parent;
    long element;
    dfs.getImmediateParentDTypeIdAndOffset(3, parent, element);
    EXPECT_EQ(parent, innerAlias);
    dfs.getImmediateParentDTypeIdAndOffset(9, parent, element);
    EXPECT_EQ(parent, e.inner);
}

TEST(NodeElements, LiveUntilTheyAreCleared) {
    Example e;
    const DFSElementAccess dfs(&e.table, e.outer);
    StructElement* const root = dfs.getStructElement(0);
    StructElement* const head = dfs.getStructElement(6);
    for (long idx = 0; idx < 1000; ++idx)
        dfs.getStructElement(idx);
    EXPECT_EQ(dfs.getStructElement(0), root);
    EXPECT_EQ(dfs.getStructElement(6), head);
    e.element(e.outer, 1)->setName("renamed");
    EXPECT_EQ(head->name, "y");
    EXPECT_STREQ(dfs.getName(6), "y") << "as it was answered";
    EXPECT_STREQ(dfs.getName(2), "renamed") << "the member itself";
    EXPECT_EQ(dfs.getFullPathAsString(6, false), u"renamed(1)") << "paths are read anew";
    e.record(e.outer)->clearDFSCache();
    EXPECT_STREQ(dfs.getName(6), "renamed");
}

// --- Freezing, in words ----------------------------------------------------------------------------------------------

TEST(Freezing, AnswersStayUntilTheyAreCleared) {
    Example e;
    const DFSElementAccess dfs(&e.table, e.outer);
    EXPECT_EQ(dfs.getOffset(8), 64);
    e.element(e.inner, 1)->setOffset(100);
    EXPECT_EQ(dfs.getOffset(8), 64);
    EXPECT_EQ(dfs.getOffset(5), 32) << "the nested structure answered for its element already";
    EXPECT_EQ(RawElementAccess(&e.table, e.outer).getOffset(9), 140) << "other views read anew";
    e.record(e.inner)->clearDFSCache();
    EXPECT_EQ(dfs.getOffset(8), 64) << "clearing the nested structure is not clearing this one";
    EXPECT_EQ(dfs.getOffset(11), 172);
    e.record(e.outer)->clearDFSCache();
    EXPECT_EQ(dfs.getOffset(8), 140);
}

TEST(Freezing, AnswersGoWithAStructureThatBecomesAnAlias) {
    Structures s;
    // Of 0 bytes, which are refused once the counts are stored: so it is not defined, and can become an alias.
    const int inner = s.define("In", {{"a", 9}});
    EXPECT_NE(described(DtComputeDerivedStructAttributes(&s.table, inner)), fine);
    const int outer = s.laidOut("Out", {{"x", DATA_TYPE_ID_DOUBLE}, {"i", inner}});
    const DFSElementAccess dfs(&s.table, outer);
    EXPECT_EQ(dfs.getStructElement(3), s.element(inner, 0));
    s.table.setDataTypeIdAliasedTo(inner, DATA_TYPE_ID_DOUBLE);
    EXPECT_EQ(dfs.getDataTypeId(3), outer) << "an index that no element has any more";
    EXPECT_EQ(dfs.getStructElement(2), s.element(outer, 1));
}

TEST(Freezing, WhatWasNotAskedIsReadAnew) {
    Example e;
    const DFSElementAccess dfs(&e.table, e.outer);
    EXPECT_EQ(dfs.getOffset(1), 0);
    e.element(e.outer, 2)->setOffset(80);
    e.element(e.outer, 0)->offset = 4; // without a setter
    EXPECT_EQ(dfs.getOffset(10), 80);
    EXPECT_EQ(dfs.getOffset(1), 0);
    EXPECT_EQ(dfs.getOffset(13), 104) << "the same element of a further instance";
}

TEST(Freezing, ChangedCountsAndDimensionsAreSeen) {
    Example e;
    const DFSElementAccess dfs(&e.table, e.outer);
    EXPECT_EQ(dfs.getFullPathAsString(9, false), u"z");
    const StructElement* const z = dfs.getStructElement(9);
    EXPECT_EQ(described(DtSetDataTypeElementDimension(&e.table, "", e.outer, 1, 0, 3)), fine);
    EXPECT_NE(described(DtComputeDerivedStructAttributes(&e.table, e.outer)), fine); // the size cannot change
    EXPECT_EQ(dfs.getNumElements(), 15);
    EXPECT_EQ(dfs.getFullPathAsString(9, false), u"y(2)");
    EXPECT_EQ(dfs.getFullPathAsString(14, false), u"z.b");
    EXPECT_EQ(dfs.getRawElementIdx(12), 16);
    EXPECT_EQ(dfs.getStructElement(9), z);
    EXPECT_STREQ(dfs.getName(9), "z");
    e.record(e.outer)->clearDFSCache();
    EXPECT_STREQ(dfs.getName(9), "y");
}

TEST(Freezing, ASizeThatIsSetLateCounts) {
    Structures s;
    const int inner = s.define("In", {{"a", real}});
    const int id = s.define("S", {{"n", inner, {3}}});
    for (const int each : {inner, id}) {
        s.element(each, 0)->setOffset(0);
        s.record(each)->setNumDFSElements(each == inner ? 2 : 8);
    }
    const DFSElementAccess dfs(&s.table, id);
    EXPECT_EQ(dfs.getOffset(6), -2) << "two instances of size -1";
    EXPECT_EQ(dfs.getOffset(8), -1) << "which is no answer to keep";
    s.record(inner)->setSize(8);
    s.record(id)->setSize(24);
    EXPECT_EQ(dfs.getOffset(4), 8);
    EXPECT_EQ(dfs.getOffset(6), -2) << "as it was answered";
    EXPECT_EQ(dfs.getOffset(8), 24);
    EXPECT_EQ(dfs.getOffset(16), 48);
}

TEST(Freezing, AnIdentifierThatIsHandedOutAgainIsAnotherType) {
    Structures s;
    const int id = s.define("S", {{"a", -10}, {"b", real}});
    s.record(id)->setNumDFSElements(5);
    const int leaf = s.plain("P", 8);
    s.element(id, 0)->setDataTypeId(leaf);
    const DFSElementAccess dfs(&s.table, id);
    EXPECT_EQ(dfs.getFullPathAsString(2, false), u"b");
    s.table.removeDataType(s.table.getDataTypeAliasedThruTo(leaf));
    ASSERT_EQ(s.laidOut("In", {{"x", real}, {"y", real}}), leaf);
    EXPECT_EQ(dfs.getFullPathAsString(2, false), u"a.x");
}

// --- Memory ----------------------------------------------------------------------------------------------------------

#ifndef __SANITIZE_ADDRESS__
std::size_t bytesInUse() {
    const struct mallinfo2 info = mallinfo2();
    return info.uordblks + info.hblkhd;
}

TEST(Memory, DoesNotGrowWithTheIndicesAsked) {
    if (bytesInUse() == 0) GTEST_SKIP() << "the allocator in place of the system's keeps no count";
    Structures s;
    const int inner = s.laidOut("In", {{"a", real}, {"b", real}, {"c", real}});
    const int middle = s.laidOut("Mid", {{"x", real}, {"i", inner, {9}}});
    const int id = s.laidOut("S", {{"m", middle, {2500}}});
    const DFSElementAccess dfs(&s.table, id);
    const long numNodes = dfs.getNumElements();
    ASSERT_GT(numNodes, 95000);
    std::vector<long> order;
    for (long idx = 0; idx < 3 * numNodes; ++idx) // also far past the end
        order.push_back(idx);
    std::shuffle(order.begin(), order.end(), std::mt19937(1));
    std::size_t before = 0;
    for (std::size_t i = 0; i < order.size(); ++i) {
        if (i == 1000) before = bytesInUse();
        dfs.getStructElement(order[i]);
        dfs.getOffset(order[i]);
    }
    // A cached element for each would be 300,000 times 64 bytes and more; this is bits, and words of them past the end.
    EXPECT_LT(bytesInUse(), before + 800000);
    before = bytesInUse();
    s.record(id)->clearDFSCache();
    for (long idx = 0; idx < numNodes; ++idx) {
        dfs.getStructElement(idx);
        dfs.getOffset(idx);
    }
    EXPECT_LT(bytesInUse(), before) << "a walk in order needs next to nothing";
}

// What each answered needs elements that the other made.
void askOfStructuresThatContainedEachOther(bool thenClearsAll) {
    Structures s;
    const int one = s.laidOut("One", {{"x", real}, {"y", real}});
    const int other = s.laidOut("Other", {{"x", one}, {"y", real}});
    const DFSElementAccess ofOne(&s.table, one), ofOther(&s.table, other);
    EXPECT_STREQ(ofOther.getName(1), "x");
    s.element(other, 0)->setDataTypeId(real);
    EXPECT_STREQ(ofOther.getName(2), "y");
    s.element(one, 0)->setDataTypeId(other);
    EXPECT_STREQ(ofOne.getName(1), "x");
    s.element(one, 0)->setDataTypeId(real);
    EXPECT_STREQ(ofOne.getName(2), "y");
    if (thenClearsAll) s.table.setDataTypeIdAliasedTo(s.define("Name", {}), real);
}

TEST(Memory, StructuresThatContainedEachOtherAreFreed) {
    for (const bool thenClearsAll : {false, true}) {
        askOfStructuresThatContainedEachOther(thenClearsAll);
        const std::size_t before = bytesInUse();
        for (int i = 0; i < 100; ++i)
            askOfStructuresThatContainedEachOther(thenClearsAll);
        EXPECT_LT(bytesInUse(), before + 10000) << thenClearsAll;
    }
}
#endif

// --- Wide structures -------------------------------------------------------------------------------------------------

TEST(WideStructures, LeavesAloneAndWithOneNestedAmongThem) {
    Structures s;
    const int inner = s.laidOut("In", {{"x", real}, {"y", real}});
    for (const bool hasNested : {false, true}) {
        constexpr long count = 150000;
        constexpr long nestedAt = 70000;
        std::vector<Element> elements;
        for (long i = 0; i < count; ++i)
            elements.push_back({"e" + std::to_string(i), hasNested && i == nestedAt ? inner : real});
        const int id = s.laidOut(hasNested ? "Mixed" : "Leaves", elements);
        const DFSElementAccess dfs(&s.table, id);
        const FlatElementAccess flat(&s.table, id);
        const RawElementAccess raw(&s.table, id);
        for (long leaf = count - 1; leaf >= 0; leaf -= 997) { // all of eight bytes
            const bool isBehind = hasNested && leaf > nestedAt + 1;
            const long node = leaf + 1 + (hasNested && leaf >= nestedAt ? 1 : 0);
            ASSERT_EQ(flat.getDFSIdx(leaf), node);
            ASSERT_EQ(dfs.getFlatElementIdx(node), leaf);
            ASSERT_EQ(flat.getOffset(leaf), 8 * leaf);
            ASSERT_EQ(raw.getOffset(leaf), 8 * leaf);
            ASSERT_EQ(flat.getFullPathAsString(leaf, false), wide("e" + std::to_string(leaf - isBehind)));
        }
        const long numLeaves = count + hasNested;
        const long numNodes = dfs.getNumElements();
        EXPECT_EQ(flat.getDFSIdx(2 * numLeaves), 2 * numNodes + 1);
        EXPECT_EQ(dfs.getFlatElementIdx(0), -1);
        EXPECT_EQ(dfs.getFlatElementIdx(2 * numNodes), -1);
        EXPECT_EQ(flat.getFullPathAsString(numLeaves + 7, false), u"(1).e7");
    }
}

// --- Odd structures --------------------------------------------------------------------------------------------------

TEST(OddStructures, ANestedStructureOfWidthZeroHidesWhatFollows) { // kept
    Structures s;
    const int inner = s.laidOut("In", {{"a", real}, {"b", real}});
    const int id = s.laidOut("S", {{"z", inner, {0}}, {"x", real}});
    const DFSElementAccess dfs(&s.table, id);
    EXPECT_EQ(dfs.getNumElements(), 2);
    EXPECT_EQ(dfs.getFullPathAsString(1, false), u"z(0)");
    EXPECT_EQ(dfs.getDataTypeId(1), inner);
    EXPECT_EQ(dfs.getFullPathAsString(2, false), u"(1)");
    EXPECT_EQ(RawElementAccess(&s.table, id).getOffset(0), 0) << "raw values of x alone";
    EXPECT_EQ(RawElementAccess(&s.table, id).getDataTypeId(0), real);
}

TEST(OddStructures, ANestedStructureThatSaysComplexCountsTwice) { // kept
    Structures s;
    const int inner = s.laidOut("In", {{"a", real}, {"b", DATA_TYPE_ID_SINGLE}});
    const int id = s.laidOut("S", {{"c", inner, {1}, true}});
    const DFSElementAccess dfs(&s.table, id);
    EXPECT_EQ(dfs.getNumElements(), 8); // root, an array node, twice three
    EXPECT_EQ(dfs.getFullPathAsString(1, false), u"c");
    EXPECT_EQ(dfs.getDataTypeId(1), inner);
    EXPECT_EQ(dfs.getFullPathAsString(3, false), u"c.b");
    EXPECT_EQ(dfs.getDataTypeId(5), id) << "behind the nodes there is only the structure itself";
    EXPECT_EQ(dfs.getFullPathAsString(5, false), u"");
    const RawElementAccess raw(&s.table, id);
    EXPECT_EQ(raw.getNumElements(), 4);
    EXPECT_EQ(raw.getDataTypeId(3), DATA_TYPE_ID_SINGLE);
    EXPECT_EQ(FlatElementAccess(&s.table, id).getDFSIdx(2), -1);
}

TEST(OddStructures, EmptyNames) {
    Structures s;
    const int inner = s.laidOut("In", {{"", real}, {"b", real}});
    const int id = s.laidOut("S", {{"", inner, {2}}, {"", real}, {"n", inner}});
    const DFSElementAccess dfs(&s.table, id);
    EXPECT_EQ(dfs.getFullPathAsString(1, false), u"") << "an array without a name is no step";
    EXPECT_EQ(dfs.getFullPathAsString(2, false), u"(0)");
    EXPECT_EQ(dfs.getFullPathAsString(3, false), u"(0).");
    EXPECT_EQ(dfs.getFullPathAsString(8, false), u"(-1)");
    EXPECT_EQ(dfs.getFullPathAsString(10, false), u"n.");
    EXPECT_EQ(dfs.getFullPathAsString(10, true), u"(0).n.");
}

TEST(OddStructures, WithoutALayoutThereIsTheRootAlone) {
    Structures s;
    const int id = s.define("S", {{"a", real}});
    const DFSElementAccess dfs(&s.table, id);
    for (const long idx : {0, 1, 5}) {
        EXPECT_EQ(dfs.getDataTypeId(idx), id);
        EXPECT_EQ(dfs.getOffset(idx), 0);
        EXPECT_EQ(dfs.getFullPathAsString(idx, true), u"");
        EXPECT_EQ(dfs.getRawElementIdx(idx), 0);
        EXPECT_EQ(dfs.getFlatElementIdx(idx), -1);
    }
    const DFSElementAccess none(&s.table, s.define("E", {}));
    EXPECT_EQ(none.getNumElements(), 0);
    EXPECT_EQ(none.getRawElementIdx(3), 0);
    EXPECT_EQ(none.getFlatElementIdx(0), -1);
}

TEST(OddStructures, ASizeThatIsSetAfterQuestionsIsSeen) {
    Structures s;
    const int inner = s.define("In", {{"a", 9}}); // of 0 bytes, which are refused once the counts are stored
    EXPECT_NE(described(DtComputeDerivedStructAttributes(&s.table, inner)), fine);
    const int outer = s.laidOut("Out", {{"x", DATA_TYPE_ID_DOUBLE}, {"i", inner, {3}}});
    const DFSElementAccess ofInner(&s.table, inner), ofOuter(&s.table, outer);
    EXPECT_STREQ(ofInner.getName(3), "a");
    EXPECT_STREQ(ofOuter.getName(6), "a");
    s.record(inner)->setSize(16);
    EXPECT_EQ(ofInner.getOffset(3), 16);
    EXPECT_EQ(ofOuter.getOffset(6), s.element(outer, 1)->offset + 16);
}

TEST(OddStructures, AnElementWithoutATypeIsMetWhenItStandsInTheWay) {
    Structures s;
    const int id = s.define("S", {{"a", real}, {"b", -10}, {"c", real}});
    s.record(id)->setNumDFSElements(4);
    s.record(id)->setNumRawElements(3);
    const DFSElementAccess dfs(&s.table, id);
    const RawElementAccess raw(&s.table, id);
    const ImmediateElementAccess immediate(&s.table, id);
    EXPECT_EQ(dfs.getDataTypeId(1), real);
    EXPECT_EQ(raw.getDataTypeId(0), real);
    EXPECT_EQ(immediate.getRawElementIdx(1), 1);
    EXPECT_RAISES(dfs.getDataTypeId(2), "QuillaneTypes:general:InvalidDataTypeId", -10);
    EXPECT_RAISES(dfs.getFlatElementIdx(1), "QuillaneTypes:general:InvalidDataTypeId", -10);
    EXPECT_RAISES(dfs.getRawElementIdx(3), "QuillaneTypes:general:InvalidDataTypeId", -10);
    EXPECT_RAISES(raw.getDataTypeId(1), "QuillaneTypes:general:InvalidDataTypeId", -10);
    EXPECT_RAISES(immediate.getRawElementIdx(2), "QuillaneTypes:general:InvalidDataTypeId", -10);
    s.element(id, 1)->setDataTypeId(real);
    EXPECT_EQ(dfs.getDataTypeId(3), real);
    EXPECT_EQ(dfs.getRawElementIdx(3), 2);
}

TEST(OddStructures, AStructureThatContainsItselfIsNoTrap) {
    Structures s;
    const int id = s.define("Self", {{"s", 14}, {"b", real}});
    s.element(id, 0)->setDataTypeId(id);
    EXPECT_NE(described(DtComputeDerivedStructAttributes(&s.table, id)), fine);
    s.record(id)->setNumDFSElements(5);
    s.record(id)->setNumFlatElements(3);
    const DFSElementAccess dfs(&s.table, id);
    for (long idx = 0; idx < 6; ++idx) {
        dfs.getStructElement(idx);
        dfs.getOffset(idx);
        dfs.getFullPathAsString(idx, true);
        dfs.getRawElementIdx(idx);
        dfs.getFlatElementIdx(idx);
    }
}

TEST(OddStructures, HugeIndicesAndCounts) {
    Structures s;
    const int inner = s.laidOut("In", {{"a", 9, {3}}, {"b", DATA_TYPE_ID_INT8}});
    const int id = s.laidOut("S", {{"n", inner, {100000000}}});
    const DFSElementAccess dfs(&s.table, id);
    const long numNodes = 2 + 300000000;
    EXPECT_EQ(dfs.getNumElements(), numNodes);
    EXPECT_EQ(dfs.getFullPathAsString(numNodes - 1, false), u"n(99999999).b");
    EXPECT_EQ(dfs.getOffset(numNodes - 1), 8L * 99999999);
    EXPECT_EQ(dfs.getOffset(1000 * numNodes + 5), 1000L * 800000000 + 8);
    EXPECT_EQ(dfs.getRawElementIdx(numNodes), 400000000);
    EXPECT_EQ(dfs.getFullPathAsString(numNodes * (1L << 30) + 1, false), u"(1073741824).n");
    EXPECT_STREQ(dfs.getName(numNodes * (1L << 30) + 1), "n");
}

// --- Paths as text ---------------------------------------------------------------------------------------------------

TEST(PathText, WithAPrefix) {
    struct Row {
        StructElementAccess::Path path;
        const char* prefix;
        const char* expected;
    };
    const Row rows[] = {
        {{}, "", ""},
        {{}, "p", "p"},
        {{{"", 0}, {"x", -1}}, "p", "p(0).x"},
        {{{"x", -1}}, "p", "p.x"},
        {{{"x", -1}}, "", "x"},
        {{{"y", 1}, {"b", -1}}, "", "y(1).b"},
        {{{"y", 1}, {"b", -1}}, "bus", "bus.y(1).b"},
        {{{"", 3}}, "", "(3)"},
        {{{"", -1}}, "p", "p(-1)"},
        {{{"a", -1}, {"", 2}}, "", "a.(2)"},
    };
    for (const Row& row : rows)
        EXPECT_EQ(StructElementAccess::convertFullPathToString(row.path, row.prefix), row.expected);
}

TEST(PathText, NamesAreUtf8) {
    Structures s;
    const int id = s.laidOut("S", {{"gr\xc3\xb6\xc3\x9f"
                                    "e",
                                    real}});
    EXPECT_EQ(DFSElementAccess(&s.table, id).getFullPathAsString(1, false), u"gr\u00f6\u00dfe");
}

TEST(PathText, IsAppended) {
    Example e;
    StructElementAccess::Path path{{"before", 4}};
    DFSElementAccess(&e.table, e.outer).getFullPath(7, true, path);
    EXPECT_EQ(path, (StructElementAccess::Path{{"before", 4}, {"", 0}, {"y", 1}, {"a", -1}}));
}

// --- The immediate view ----------------------------------------------------------------------------------------------

TEST(ImmediateView, ReadsTheFields) {
    Structures s;
    const int id = s.laidOut("S", {{"a", real, {2, 3}, true}});
    StructElement* const e = s.element(id, 0);
    e->setUnitId(4);
    e->setSymbDimsId(5);
    e->setVarDimsOffset(6);
    e->setSamplingMode(7);
    e->setDimensionsMode(8);
    e->setMin(-1);
    e->setMax(std::numeric_limits<double>::infinity());
    const ImmediateElementAccess view(&s.table, id);
    EXPECT_STREQ(view.getName(0), "a");
    EXPECT_EQ(view.getDataTypeId(0), real);
    EXPECT_EQ(view.getUnitId(0), 4);
    EXPECT_EQ(view.getSymbDimsId(0), 5);
    EXPECT_EQ(view.getNumDimensions(0), 2);
    EXPECT_EQ(view.getDimensions(0), e->dims);
    EXPECT_EQ(view.getDimensionsAsInt(0, ObsoleteIntDimsKey{})[1], 3);
    EXPECT_EQ(view.getWidth(0), 6);
    EXPECT_EQ(view.getComplexWidth(0), 12);
    EXPECT_EQ(view.getOffset(0), 0);
    EXPECT_EQ(view.getVarDimsOffset(0), 6);
    EXPECT_EQ(view.getSignalType(0), 1);
    EXPECT_EQ(view.getSamplingMode(0), 7);
    EXPECT_EQ(view.getDimensionsMode(0), 8);
    EXPECT_EQ(view.getMin(0), -1);
    EXPECT_EQ(view.getMax(0), std::numeric_limits<double>::infinity());
    EXPECT_TRUE(view.getMinSpec(0));
    EXPECT_FALSE(view.getMaxSpec(0));
    EXPECT_FALSE(view.isScalar(0));
}

TEST(ImmediateView, PaddingOfSpecialSizes) {
    Structures s;
    const int byte = DATA_TYPE_ID_INT8;
    const int unknown = s.define("Unknown", {{"a", byte}});
    s.element(unknown, 0)->setOffset(0);
    EXPECT_EQ(ImmediateElementAccess(&s.table, unknown).getPadding(0), -2); // -1 less one byte
    const int rounded = s.laidOut("Rounded", {{"a", byte}, {"b", byte}});
    EXPECT_EQ(ImmediateElementAccess(&s.table, rounded).getPadding(0), 0);
    EXPECT_EQ(ImmediateElementAccess(&s.table, rounded).getPadding(1), 6);
    s.element(rounded, 1)->setOffset(std::numeric_limits<long>::max());
    s.element(rounded, 0)->setNumDimensions(1); // a width of 0
    EXPECT_EQ(ImmediateElementAccess(&s.table, rounded).getPadding(0), 0x7ffffffe);
    s.element(rounded, 1)->setOffset(0x500000007);
    EXPECT_EQ(ImmediateElementAccess(&s.table, rounded).getPadding(0), 7);
}

class Buses : public testing::Test, public Structures {
  protected:
    int bus(const std::string& name, const std::vector<Element>& elements) {
        const int id = table.getNumDataTypes() - 1;
        table.addDataType(new BusDataType(id, name, static_cast<DataTypeSource>(2)));
        if (elements.empty()) return id;
        record(id)->setNumElements(std::ssize(elements));
        for (std::size_t i = 0; i < elements.size(); ++i)
            fill(*element(id, static_cast<long>(i)), elements[i]);
        return id;
    }

    std::string contained(int id, bool aob = false, bool varDims = false, bool frames = false) {
        ImmediateElementAccess(&table, id).containsAoBOrVarDimsOrFrames(&aob, &varDims, &frames);
        return std::string(aob ? "a" : "") + (varDims ? "v" : "") + (frames ? "f" : "");
    }
};

TEST_F(Buses, AreFollowedForArraysVariableDimensionsAndFrames) {
    const int inner = bus("In", {{"a", real}});
    const int plain = bus("Plain", {{"i", inner}, {"w", real, {5}}});
    EXPECT_EQ(contained(plain), "");
    EXPECT_EQ(contained(plain, true, true, true), "avf") << "flags are added, not reset";
    EXPECT_EQ(contained(plain, false, true), "v");
    EXPECT_EQ(contained(bus("Arr", {{"i", inner, {2}}})), "a");
    const int variable = bus("Var", {{"i", inner, {1}}});
    element(variable, 0)->setDimensionsMode(1);
    EXPECT_EQ(contained(variable), "av");
    const int frames = bus("Frames", {{"a", real}});
    element(frames, 0)->setSamplingMode(1);
    EXPECT_EQ(contained(frames), "f");
    EXPECT_EQ(contained(bus("Deep", {{"x", alias("AliasOfFrames", frames)}, {"y", variable}})), "avf");
    // A nested structure that is no bus is a leaf here.
    const int structure = laidOut("S", {{"a", real}});
    element(structure, 0)->setSamplingMode(1);
    EXPECT_EQ(contained(bus("OfStruct", {{"s", structure, {3}}})), "");
}

TEST_F(Buses, TheWalkEndsWhenAllThreeAreFound) {
    const int all = bus("All", {{"a", real}, {"never", -10}});
    element(all, 0)->setSamplingMode(1);
    element(all, 0)->setDimensionsMode(1);
    EXPECT_EQ(contained(all, true), "avf");
    EXPECT_RAISES(contained(all), "QuillaneTypes:general:InvalidDataTypeId", -10);
}

} // namespace
