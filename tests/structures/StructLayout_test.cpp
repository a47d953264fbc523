#include <cstring>

#include "qlplatform/memory/Memory.h"
#include "qltypes/structures/ElementAccess.h"
#include "tests/structures/Builder.h"

namespace {

using namespace structures;

constexpr int double_ = DATA_TYPE_ID_DOUBLE, single = DATA_TYPE_ID_SINGLE, int8 = DATA_TYPE_ID_INT8,
              int16 = DATA_TYPE_ID_INT16, int32 = DATA_TYPE_ID_INT32;

TEST(Alignment, IsTheNearerOfTheSizeAndEight) {
    struct Row {
        unsigned long offset, size, expected;
        bool overflows;
    };
    constexpr Row rows[] = {
        {13, 4, 16, false},
        {13, 16, 16, false},
        {17, 16, 24, false},
        {13, 3, 13, false},
        {13, 0, 13, false},
        {0, 8, 0, false},
        {1, 2, 2, false},
        {7, 6, 8, false},
        {9, 6, 12, false},
        {9, 12, 12, false},
        {16, 12, 16, false},
        {2147483647, 8, 2147483648, true},
        {2147483647, 1, 2147483647, false},
        {0x100000001, 8, 0x100000008, true},
        {2147483640, 8, 2147483640, false},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(testing::Message() << row.offset << ", " << row.size);
        bool overflows = !row.overflows;
        EXPECT_EQ(DtCorrectOffsetForProperAlignment(row.offset, row.size, &overflows), row.expected);
        EXPECT_EQ(overflows, row.overflows);
        EXPECT_EQ(DtCorrectOffsetForProperAlignment(row.offset, row.size, nullptr), row.expected);
    }
}

struct Attributes {
    std::vector<long> offsets;
    int size;
    long flat, raw, dfs;
    bool operator==(const Attributes&) const = default;
};

std::ostream& operator<<(std::ostream& os, const Attributes& a) {
    return os << testing::PrintToString(a.offsets) << " size " << a.size << " flat " << a.flat << " raw " << a.raw
              << " dfs " << a.dfs;
}

Attributes attributes(Structures& s, int id) {
    Attributes made{{},
                    s.record(id)->getSize(),
                    s.record(id)->getNumFlatElements(),
                    s.record(id)->getNumRawElements(),
                    s.record(id)->getNumDFSElements()};
    for (const StructElement* e : s.record(id)->getElements())
        made.offsets.push_back(e->offset);
    return made;
}

TEST(StructLayout, WorkedExample) {
    Example e;
    EXPECT_EQ(attributes(e, e.inner), (Attributes{{0, 24}, 32, 2, 5, 3}));
    EXPECT_EQ(attributes(e, e.outer), (Attributes{{0, 8, 72}, 104, 7, 16, 12}));
}

TEST(StructLayout, OffsetsSizeAndCounts) {
    Structures s;
    const int p3 = s.plain("P3", 3), p5 = s.plain("P5", 5), p6 = s.plain("P6", 6), p1 = s.plain("P1", 1),
              p9 = s.plain("P9", 9);
    const int aliasOfDouble = s.alias("Real", double_), aliasOfP5 = s.alias("A5", p5);
    const int inner = s.laidOut("In", {{"a", double_, {3}}, {"b", int8}});
    const int aliasOfInner = s.alias("AIn", inner);
    struct Row {
        const char* what;
        std::vector<Element> elements;
        Attributes expected;
    };
    const Row rows[] = {
        {"one byte rounds up to eight", {{"a", int8}}, {{0}, 8, 1, 1, 2}},
        {"double after a byte", {{"a", int8}, {"b", double_}}, {{0, 8}, 16, 2, 2, 3}},
        {"int16 after a byte", {{"a", int8}, {"b", int16}}, {{0, 2}, 8, 2, 2, 3}},
        {"size 3 to two", {{"a", int8}, {"b", p3}}, {{0, 2}, 8, 2, 2, 3}},
        {"size 5 to four", {{"a", int8}, {"b", p5}}, {{0, 4}, 16, 2, 2, 3}},
        {"size 6 to four", {{"a", int8}, {"b", p6}}, {{0, 4}, 16, 2, 2, 3}},
        {"size 9 to eight", {{"a", int8}, {"b", p9}}, {{0, 8}, 24, 2, 2, 3}},
        {"size 1 nowhere", {{"a", int8}, {"b", p1}}, {{0, 1}, 8, 2, 2, 3}},
        {"alias of double as double", {{"a", int8}, {"b", aliasOfDouble}}, {{0, 8}, 16, 2, 2, 3}},
        {"alias of a client type", {{"a", int8}, {"b", aliasOfP5}}, {{0, 4}, 16, 2, 2, 3}},
        {"auto as a built-in of eight bytes", {{"a", int8}, {"b", -1}}, {{0, 8}, 16, 2, 2, 3}},
        {"fcn_call has no size", {{"a", int8}, {"b", 9, {7}}}, {{0, 1}, 8, 2, 8, 3}},
        {"nested aligns to eight", {{"a", int8}, {"b", inner}}, {{0, 8}, 40, 3, 5, 5}},
        {"nested through an alias", {{"a", int8}, {"b", aliasOfInner, {2}}}, {{0, 8}, 72, 5, 9, 9}},
        {"nested of width 0 counts nothing", {{"a", int8}, {"b", inner, {0}}}, {{0, 8}, 8, 1, 1, 2}},
        {"nested that says complex counts twice", {{"a", inner, {1}, true}}, {{0}, 64, 4, 8, 8}},
        {"leaf of width 100", {{"a", double_, {100}}}, {{0}, 800, 1, 100, 2}},
        {"complex leaf of width 100", {{"a", single, {10, 10}, true}}, {{0}, 800, 1, 200, 2}},
        {"no padding between equals", {{"a", int16}, {"b", int16}, {"c", int32}}, {{0, 2, 4}, 8, 3, 3, 4}},
    };
    int n = 0;
    for (const Row& row : rows) {
        SCOPED_TRACE(row.what);
        const int id = s.laidOut("S" + std::to_string(n++), row.elements);
        EXPECT_EQ(attributes(s, id), row.expected);
    }
}

TEST(StructLayout, AStructureWithoutElementsKeepsWhatItHas) {
    Structures s;
    const int id = s.laidOut("Empty", {});
    EXPECT_EQ(attributes(s, id), (Attributes{{}, -1, 0, 0, 0}));
    s.record(id)->setSize(24);
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&s.table, id)), fine);
    EXPECT_EQ(s.record(id)->getSize(), 24);
}

TEST(StructLayout, RunsThroughAnAlias) {
    Structures s;
    const int id = s.define("S", {{"a", double_}});
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&s.table, s.alias("A", id))), fine);
    EXPECT_EQ(s.record(id)->getSize(), 8);
}

TEST(StructLayout, TheLimit) {
    struct Row {
        std::vector<Element> elements;
        bool passes;
    };
    const Row rows[] = {
        {{{"a", int8, {0x7fffffff}}, {"b", 9}}, false}, // rounded up behind the last element
        {{{"a", int8, {0x7ffffff8}}, {"b", 9}}, true},  // the largest size
        {{{"a", int8, {0x7ffffff8}}, {"b", int8}}, false},
        {{{"a", int8, {0x80000000}}, {"b", int8}}, false},
        {{{"a", int8, {-9}}}, false},                                // negative
        {{{"a", double_, {0x2000000000000000}}, {"b", int8}}, true}, // kept: wraps around to 0
    };
    int n = 0;
    for (const Row& row : rows) {
        SCOPED_TRACE(n);
        utFailAllocationAt(0);
        Structures s;
        const int id = s.define("Big" + std::to_string(n++), row.elements);
        if (row.elements.front().dims[0] == 0x7ffffff8 && row.passes) utFailAllocationAt(1); // no 4 GiB for a ground
        const std::string said = described(DtComputeDerivedStructAttributes(&s.table, id));
        utFailAllocationAt(0);
        const std::string tooLarge = testsupport::expectedMessage("Quillane:General:InvalidDataTypeSizeInDataTypeTable",
                                                                  2147483647L, s.record(id)->getName());
        EXPECT_EQ(said == tooLarge, !row.passes) << said;
    }
}

TEST(StructLayout, ExactlyTheLimitPassesBeforeTheLastElement) {
    Structures s;
    const int id = s.define("S", {{"a", int8, {0x7fffffff}}, {"b", int8, {-8}}}); // 0x7fffffff, then 0x7ffffff7
    utFailAllocationAt(1);
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&s.table, id)),
              testsupport::expectedMessage("Quillane:Services:OutOfMemory")); // no 4 GiB for a ground
    utFailAllocationAt(0);
}

TEST(StructLayout, WithoutMemoryForTheGroundNothingIsLaidOut) {
    Structures s;
    const int id = s.define("S", {{"a", int8}, {"b", double_, {1}, true}});
    utFailAllocationAt(1);
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&s.table, id)),
              testsupport::expectedMessage("Quillane:Services:OutOfMemory"));
    utFailAllocationAt(0);
    EXPECT_EQ(attributes(s, id), (Attributes{{-1, -1}, -1, 0, 0, 0}));
    EXPECT_FALSE(s.record(id)->hasComplexData());
    s.element(id, 0)->setDataTypeId(s.table.registerStringDataType(0, nullptr));
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&s.table, id)), fine);
    EXPECT_TRUE(s.record(id)->hasComplexData());
    EXPECT_TRUE(s.record(id)->hasStringData());
}

TEST(StructLayout, AFailureKeepsTheOffsetsAndStoresNothingElse) {
    Structures s;
    const int id = s.define("S", {{"a", int8}, {"b", int8, {0x7fffffff}}, {"c", double_}});
    const int alias = s.alias("A", id);
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&s.table, alias)),
              testsupport::expectedMessage("Quillane:General:InvalidDataTypeSizeInDataTypeTable", 2147483647L, "A"));
    EXPECT_EQ(attributes(s, id), (Attributes{{0, 1, -1}, -1, 0, 0, 0}));
}

TEST(StructLayout, WhatTheSizeRaisesIsReturned) {
    Structures s;
    const int nothing = s.define("Nothing", {{"a", double_, {0}}});
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&s.table, nothing)),
              testsupport::expectedMessage("QuillaneTypes:general:InvalidDataTypeSize", "Nothing", 0));
    EXPECT_EQ(s.record(nothing)->getNumDFSElements(), 2); // the counts come first

    const int grown = s.laidOut("Grown", {{"a", double_}});
    s.element(grown, 0)->setNumDimensions(1);
    s.element(grown, 0)->setDimension(0, 2);
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&s.table, grown)),
              testsupport::expectedMessage("QuillaneTypes:general:CannotModifyDataTypeSize", "Grown", 8));
    EXPECT_EQ(s.record(grown)->getNumRawElements(), 2);

    const int untyped = s.define("Untyped", {{"a", double_}, {"b", -10}});
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&s.table, untyped)),
              testsupport::expectedMessage("QuillaneTypes:general:InvalidDataTypeId", -10));
}

TEST(StructLayout, ASecondRunComputesAgainButNotTheFlags) {
    Structures s;
    const int id = s.laidOut("S", {{"a", int8}, {"b", double_}});
    s.element(id, 0)->setDataTypeId(int32);
    s.element(id, 1)->setSignalType(1);
    s.element(id, 1)->setDataTypeId(single);
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&s.table, id)), fine);
    EXPECT_EQ(attributes(s, id), (Attributes{{0, 4}, 16, 2, 3, 3}));
    EXPECT_FALSE(s.record(id)->hasComplexData());
}

TEST(StructLayout, GroundIsBuiltOfTheGroundsOfTheElements) {
    Structures s;
    const int p3 = s.plain("P3", 3);
    const unsigned char bytes[] = {1, 2, 3};
    QLTypeSys::DataType* const type = s.table.getDataTypeAt(static_cast<unsigned long>(p3 + 1));
    type->setGround(bytes);
    type->setGroundHasNonZeroStoredValue(true);
    for (const int id : {double_, int8})
        s.table.getDataTypeAt(static_cast<unsigned long>(id + 1))->setGroundHasNonZeroStoredValue(false);
    const int inner = s.laidOut("In", {{"a", int8}, {"b", p3, {2}}});
    const int outer = s.laidOut("Out", {{"i", inner, {2}}, {"c", p3, {1}, true}});
    const int zero = s.laidOut("Zero", {{"a", int8}, {"b", double_}});

    const unsigned char expectedInner[] = {0, 0, 1, 2, 3, 1, 2, 3};
    const unsigned char expectedOuter[] = {0, 0, 1, 2, 3, 1, 2, 3, 0, 0, 1, 2, 3, 1, 2, 3, 1, 2, 3, 1, 2, 3, 0, 0};
    EXPECT_EQ(std::memcmp(s.record(inner)->getGround(), expectedInner, sizeof expectedInner), 0);
    EXPECT_EQ(s.record(outer)->getSize(), 24);
    EXPECT_EQ(std::memcmp(s.record(outer)->getGround(), expectedOuter, sizeof expectedOuter), 0);
    EXPECT_TRUE(s.record(inner)->groundHasNonZeroStoredValue());
    EXPECT_TRUE(s.record(outer)->groundHasNonZeroStoredValue());
    EXPECT_FALSE(s.record(zero)->groundHasNonZeroStoredValue());
}

TEST(StructLayout, ASecondRunWritesTheGroundAnew) {
    Structures s;
    const int p3 = s.plain("P3", 3);
    const unsigned char bytes[] = {1, 2, 3};
    s.table.getDataTypeAt(static_cast<unsigned long>(p3 + 1))->setGround(bytes);
    const int id = s.laidOut("S", {{"a", p3}, {"b", p3}});
    s.element(id, 0)->setDataTypeId(int8);
    s.element(id, 1)->setDataTypeId(int32);
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&s.table, id)), fine);
    const unsigned char expected[] = {0, 2, 3, 0, 0, 0, 0, 0}; // padding stays as it was
    EXPECT_EQ(std::memcmp(s.record(id)->getGround(), expected, sizeof expected), 0);
}

TEST(StructLayout, AGroundOfManyElements) {
    Structures s;
    const int p3 = s.plain("P3", 3);
    const unsigned char bytes[] = {7, 8, 9};
    s.table.getDataTypeAt(static_cast<unsigned long>(p3 + 1))->setGround(bytes);
    for (long width : {1, 2, 3, 4, 5, 7, 8, 9, 63, 64, 65, 1000}) {
        const int id = s.laidOut("W" + std::to_string(width), {{"a", p3, {width}}});
        const auto* ground = static_cast<const unsigned char*>(s.record(id)->getGround());
        for (long i = 0; i < s.record(id)->getSize(); ++i)
            ASSERT_EQ(ground[i], i < 3 * width ? bytes[i % 3] : 0) << width << " " << i;
    }
}

TEST(StructLayout, AGroundWithFewerBytesThanAnAliasSaysIsNotWritten) {
    Structures s;
    QLTypeSys::DataType* const boolean = s.table.getDataTypeAt(DATA_TYPE_ID_BOOLEAN + 1);
    boolean->setSize(8);
    const int alias = s.alias("A", DATA_TYPE_ID_BOOLEAN); // has 8 bytes for good
    boolean->setSize(1);
    const unsigned char one[] = {1};
    boolean->setGround(one);
    const int id = s.laidOut("S", {{"a", alias, {2}}, {"b", DATA_TYPE_ID_BOOLEAN}});
    const unsigned char expected[24] = {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 1};
    ASSERT_EQ(s.record(id)->getSize(), 24);
    EXPECT_EQ(std::memcmp(s.record(id)->getGround(), expected, sizeof expected), 0);
}

TEST(StructLayout, WidthsBelowZeroNeverWriteOutsideTheGround) {
    Structures s;
    const int id = s.laidOut("S", {{"a", double_, {100}}, {"b", double_, {-99}}});
    EXPECT_EQ(s.record(id)->getSize(), 8);
}

TEST(StructLayout, AtomicityAndRunTimeDimensionsAreLeftAlone) {
    Structures s;
    const int id = s.laidOut("S", {{"a", int8}});
    EXPECT_FALSE(s.record(id)->isAtomic());
    EXPECT_EQ(s.element(id, 0)->varDimsOffset, -1);
}

} // namespace
