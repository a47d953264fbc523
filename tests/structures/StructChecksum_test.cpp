// Descriptions of elements and the checksums that they make.
#include "qltypes/dimensions/SymbolicDims.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "qltypes/structures/StructChecksum.h"
#include "tests/structures/Builder.h"

namespace {

using namespace structures;

struct TypeText : StructElemTypeDesc {
    explicit TypeText(const char* typeText) : text(typeText) {}
    const char* getText() const override { return text; }
    const char* text;
};

StructElemDesc describe(const TypeText& type, const std::string& name, const std::vector<unsigned long>& dims,
                        bool isComplex = false) {
    StructElemDesc desc;
    desc.name = name;
    desc.type = &type;
    desc.dims = dims;
    desc.isComplex = isComplex;
    return desc;
}

TEST(StructChecksum, Descriptions) {
    struct Row {
        const char* type;
        const char* name;
        std::vector<unsigned long> dims;
        bool isComplex;
        const char* expected;
    };
    const Row rows[] = {
        {"double", "pos", {3}, false, "double:pos:[ 3 ];"},
        {"single", "iq", {1}, true, "single:iq:[ 1 ]:complex;"},
        {"int16", "m", {2, 3}, false, "int16:m:[ 2 3 ];"},
        {"int8", "s", {1, 1}, false, "int8:s:[ 1 ];"},
        {"int8", "s", {1, 1, 1}, true, "int8:s:[ 1 ]:complex;"},
        {"int8", "s", {1, 2, 1}, false, "int8:s:[ 1 2 1 ];"},
        {"int8", "s", {}, false, "int8:s:[ ];"},
        {"int8", "s", {0}, false, "int8:s:[ 0 ];"},
        {"int8", "s", {18446744073709551615ul}, false, "int8:s:[ 18446744073709551615 ];"},
        {"", "", {1}, false, "::[ 1 ];"},
        {nullptr, "lost", {1}, true, ""},
    };
    for (const Row& row : rows) {
        const TypeText type(row.type);
        EXPECT_EQ(describe(type, row.name, row.dims, row.isComplex).genDescription(), row.expected);
    }
}

TEST(StructChecksum, SymbolicDimensionsAreWrittenAsText) {
    using namespace QLTypeSys;
    SymbolicDimsTable table;
    const SymbolicDimsString n(table, "N");
    const SymbolicDimsString k(table, "K");
    const TypeText type("double");
    StructElemDesc desc = describe(type, "v", {4, 5});
    desc.symbDimsId = n.getId();
    EXPECT_EQ(desc.genDescription(), "double:v:[ 4 5 ];") << "no table, no symbols";
    desc.symbolicDimsTable = &table;
    EXPECT_EQ(desc.genDescription(), "double:v:[N];");
    const SymbolicDimsND list(table, {n.getId(), k.getId()});
    desc.symbDimsId = list.getId();
    desc.isComplex = true;
    EXPECT_EQ(desc.genDescription(), "double:v:" + list.toString() + ":complex;");
    const SymbolicDimsND listOfOne(table, {n.getId()});
    desc.symbDimsId = listOfOne.getId();
    EXPECT_EQ(desc.genDescription(), "double:v:[" + listOfOne.toString() + "]:complex;");
    for (const int none : {-1, 0, 100000}) {
        desc.symbDimsId = none;
        EXPECT_EQ(desc.genDescription(), "double:v:[ 4 5 ]:complex;") << none;
    }
}

qlChecksumValue checksum(const std::vector<StructElemDesc>& elements) {
    qlChecksumRec rec;
    for (const StructElemDesc& element : elements)
        addStructElementToChecksum(rec, element);
    return rec.value();
}

TEST(StructChecksum, WhatCountsAndWhatDoesNot) {
    const TypeText real("double"), single("single");
    const StructElemDesc a = describe(real, "a", {3});
    const StructElemDesc b = describe(real, "b", {1});
    const qlChecksumValue value = checksum({a, b});
    EXPECT_EQ(checksum({a, b}), value);
    EXPECT_NE(checksum({b, a}), value);
    EXPECT_NE(checksum({a}), value);
    EXPECT_NE(checksum({a, describe(single, "b", {1})}), value);
    EXPECT_NE(checksum({a, describe(real, "b", {2})}), value);
    EXPECT_NE(checksum({a, describe(real, "b", {1}, true)}), value);
    EXPECT_NE(checksum({a, describe(real, "c", {1})}), value);
    EXPECT_EQ(checksum({a, describe(real, "b", {1, 1})}), value);
}

TEST(StructChecksum, TheLongFormBeginsBehind65534Bytes) {
    const TypeText type("double");
    const std::size_t others = describe(type, "", {1}).genDescription().size();
    for (const std::size_t length : {0xfffeu, 0xffffu}) {
        const StructElemDesc desc = describe(type, std::string(length - others, 'n'), {1});
        const std::string text = desc.genDescription();
        ASSERT_EQ(text.size(), length);
        qlChecksumRec asShort, asLong;
        asShort.addn(text.data(), length);
        asLong.addLongItemToCheckSum(text.data(), length);
        EXPECT_NE(asShort.value(), asLong.value());
        EXPECT_EQ(checksum({desc}), length == 0xfffe ? asShort.value() : asLong.value());
    }
}

TEST(StructChecksum, IsKeptWithTheStructure) {
    Structures s;
    const int id = s.define("S", {});
    const int alias = s.alias("A", id);
    EXPECT_EQ(DtGetStructDataTypeChecksum(&s.table, id), qlChecksumValue{});
    const qlChecksumValue value{{1, 2, 3, 0xffffffff}};
    DtSetStructDataTypeChecksum(&s.table, alias, value);
    EXPECT_EQ(DtGetStructDataTypeChecksum(&s.table, id), value);
    EXPECT_EQ(DtGetStructDataTypeChecksum(&s.table, alias), value);
    EXPECT_RAISES(DtGetStructDataTypeChecksum(&s.table, -10), "QuillaneTypes:general:InvalidDataTypeId", -10);
}

} // namespace
