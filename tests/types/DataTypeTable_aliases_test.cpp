#include <cstdint>

#include <gtest/gtest.h>

#include "qltypes/types/AliasDataType.h"
#include "tests/support/Raises.h"
#include "tests/types/ClientTable.h"

namespace {

using namespace QLTypeSys;
using testsupport::ClientTable;

std::string id(const char* leaf) { return std::string("QuillaneTypes:general:") + leaf; }

struct AliasesTest : testing::Test {
    ClientTable table;
    int plain(const char* name) { return table.registerDataType(name, dtSourceBuiltIn, nullptr); }
    int alias(const char* name, int target) {
        return table.registerAliasDataType(name, dtSourceBuiltIn, target, nullptr);
    }
    DataType* record(int typeId) { return table.getDataTypeAt(static_cast<unsigned long>(typeId + 1)); }
};

// --- Registration ----------------------------------------------------------------------------------------------------

TEST_F(AliasesTest, RegistersAliasesOfAliases) {
    const int end = plain("End");
    const int middle = alias("Middle", end);
    const int second = alias("Second", middle);
    EXPECT_EQ(table.getDataTypeIdAliasedTo(second), middle);
    EXPECT_EQ(record(second)->getIdAliasedThruTo(), end);
    EXPECT_EQ(table.getDataTypeAliasedThruTo(second), record(end));
    EXPECT_EQ(alias("Second", end), second) << "an existing name is answered, whatever the target";
    EXPECT_EQ(table.getDataTypeIdAliasedTo(second), middle);
}

TEST_F(AliasesTest, RefusesBadNamesAndTargets) {
    EXPECT_RAISES(alias("1x", 99), id("InvalidDataType"), "1x");
    EXPECT_RAISES(alias("Second", 99), id("UndefinedDataTypeToBeAliasedTo"), "Second", 99);
    EXPECT_RAISES(alias("Second", -10), id("UndefinedDataTypeToBeAliasedTo"), "Second", -10);
    EXPECT_EQ(alias("OfAuto", -1), 14);
    // A fixed-point name may name an alias: that test is plain registration's alone.
    EXPECT_EQ(alias("sfix16", 4), 15);
    EXPECT_EQ(record(15)->getType(), dtqUnspecified);
    EXPECT_RAISES(table.registerAliasDataType("sfix16", dtSourceEnum, 4, nullptr),
                  id("DataType_SameNameAsExistingType"), "sfix16");
}

TEST_F(AliasesTest, OpaqueCopiesTakeSizeFunctionsAndNames) {
    DataTypeTable other;
    DataType* source = other.getDataTypeAliasedThruTo(other.registerDataType("Opaque", dtSourceBuiltIn, nullptr));
    source->setSize(4);
    source->setConstructFcn([](void*, const void*) { return 1; });
    source->setSerializeFcn([](void*, const void*, unsigned long, unsigned long) { return 1; });
    source->setConstructFcnName("construct");
    source->setSerializeSizeFcnName("serializeSize");
    const auto client = table.install();
    const int copy = table.registerOpaqueDataType(source, "block");
    EXPECT_TRUE(client->seen.empty());
    const DataType* r = record(copy);
    EXPECT_EQ(r->getDataTypeSource(), dtSourceOpaque);
    EXPECT_EQ(r->getSize(), 4);
    EXPECT_EQ(r->getConstructFcn(), source->getConstructFcn());
    EXPECT_EQ(r->getDestructFcn(), nullptr);
    EXPECT_FALSE(r->getPlainDestroy()) << "destruct and deep copy are set in any case";
    EXPECT_FALSE(r->getPlainCopy());
    EXPECT_EQ(r->getSerializeFcn(), source->getSerializeFcn());
    EXPECT_EQ(r->getDeserializeFcn(), nullptr);
    EXPECT_EQ(r->getConstructFcnName(), "construct");
    EXPECT_EQ(r->getSerializeSizeFcnName(), "serializeSize");
    EXPECT_EQ(table.registerOpaqueDataType(source, nullptr), copy);
}

TEST_F(AliasesTest, OpaqueCopiesTakeWhatIsSerializedOnlyWhereTheSourceHasIt) {
    DataType source(14, "Opaque", dtSourceBuiltIn);
    source.setSize(4);
    source.setDeserializeFcn([](void*, const void*, unsigned long, unsigned long) { return 1; });
    source.setSerializeSizeFcn([](const void*) { return 8ul; });
    source.setSerializeFcnName("serialize");
    source.setDeserializeFcnName("deserialize");
    const DataType* r = record(table.registerOpaqueDataType(&source, nullptr));
    EXPECT_EQ(r->getSerializeFcn(), nullptr);
    EXPECT_EQ(r->getDeserializeFcn(), source.getDeserializeFcn());
    EXPECT_EQ(r->getSerializeSizeFcn(), source.getSerializeSizeFcn());
    EXPECT_EQ(r->getSerializeFcnName(), "serialize");
    EXPECT_EQ(r->getDeserializeFcnName(), "deserialize");
    EXPECT_EQ(r->getSerializeSizeFcnName(), "");
}

TEST_F(AliasesTest, AnOpaqueCopyWithoutASizeIsRefused) {
    const DataType source(14, "Opaque", dtSourceBuiltIn);
    EXPECT_RAISES(table.registerOpaqueDataType(&source, nullptr), id("InvalidDataTypeSize"), "Opaque", -1);
    EXPECT_EQ(table.getDataTypeId("Opaque"), -10);
}

TEST_F(AliasesTest, AnOpaqueCopyUnderAnExistingNameAddsASecondRecordWhenTheTableDeclines) {
    const int first = plain("Opaque");
    DataType source(14, "Opaque", dtSourceBuiltIn);
    source.setSize(4);
    table.declines = true;
    const int second = table.registerOpaqueDataType(&source, nullptr);
    EXPECT_NE(second, first);
    EXPECT_EQ(table.getDataTypeId("Opaque"), first) << "the name keeps its first record";
}

// --- Replacement -----------------------------------------------------------------------------------------------------

TEST_F(AliasesTest, ADecliningTableReplacesUnderTheSameIdentifier) {
    const int end = plain("End");
    const int middle = alias("Middle", end);
    const int second = alias("Second", middle);
    table.setDataTypeStorageId(end, 4);
    table.declines = true;
    const int again = table.registerDataType("End", dtSourceEnum, nullptr); // no check of the source on this way
    EXPECT_EQ(again, end);
    EXPECT_EQ(table.getNumDataTypes(), 18);
    EXPECT_EQ(record(end)->getId(), end);
    EXPECT_EQ(record(end)->getType(), dtqEnum);
    EXPECT_EQ(record(end)->getStorageId(), 4) << "taken over from the old record";
    EXPECT_EQ(table.getDataTypeId("End"), end);
    record(end)->setSize(2);
    EXPECT_EQ(record(middle)->getGround(), record(end)->getGround());
    EXPECT_EQ(record(second)->getGround(), record(end)->getGround());
    EXPECT_EQ(record(second)->getIdAliasedTo(), middle);
}

TEST_F(AliasesTest, ReplacingTheMiddleOfAChainUpdatesItsNeighbour) {
    const int end = plain("End");
    const int middle = alias("Middle", end);
    const int second = alias("Second", middle);
    table.declines = true;
    EXPECT_EQ(plain("Middle"), middle);
    EXPECT_EQ(record(second)->getIdAliasedTo(), middle);
    EXPECT_EQ(record(second)->getIdAliasedThruTo(), end) << "the end of the chain was another record and stays";
    EXPECT_EQ(record(middle)->getIdAliasedTo(), -10);
    // The chains of the two no longer meet, though their ends are one: the walk ends all the same.
    const int other = alias("Other", end);
    EXPECT_EQ(table.getDataTypeIdCommonAncestor(other, second), -10);
    EXPECT_EQ(table.getDataTypeIdCommonAncestor(second, other), -10);
    EXPECT_FALSE(record(middle)->getVisitFlag() || record(second)->getVisitFlag() || record(other)->getVisitFlag());
}

TEST_F(AliasesTest, AVetoDuringAReplacementTakesTheNameAlong) {
    const int first = plain("Plain");
    const auto client = table.install();
    client->vetoed = "Plain";
    table.declines = true;
    EXPECT_RAISES(plain("Plain"), id("DataType_WithIntrinsicFixptName"), "Plain");
    EXPECT_EQ(table.getNumDataTypes(), 16);
    EXPECT_STREQ(record(first)->getName(), "Plain") << "the old record stands";
    EXPECT_EQ(table.getDataTypeId("Plain"), -10); // kept: its name went with the new one
}

TEST_F(AliasesTest, AnAliasThatWouldReplaceItsOwnTargetIsALoop) {
    const int end = plain("End");
    const int middle = alias("Middle", end);
    table.declines = true;
    EXPECT_RAISES(alias("End", end), id("DataTypeAliasLoop"), "End", "End");
    EXPECT_RAISES(alias("End", middle), id("DataTypeAliasLoop"), "End", "Middle");
    EXPECT_EQ(table.getNumDataTypes(), 17);
    EXPECT_EQ(table.getDataTypeId("End"), end);
    EXPECT_EQ(record(end)->getIdAliasedTo(), -10);
    EXPECT_EQ(alias("Middle", 0), middle) << "another target is a plain replacement";
    EXPECT_EQ(record(middle)->getIdAliasedThruTo(), 0);
}

TEST_F(AliasesTest, AnAliasMustNotComeBackByWhereItEndsEither) {
    const int end = plain("End");
    const int middle = alias("Middle", end);
    const int first = alias("First", middle);
    table.declines = true;
    EXPECT_EQ(alias("Middle", 0), middle);
    EXPECT_EQ(record(first)->getIdAliasedThruTo(), end) << "what it names leads to double, and still it ends here";
    EXPECT_RAISES(alias("End", first), id("DataTypeAliasLoop"), "End", "First");
    EXPECT_RAISES(table.setDataTypeIdAliasedTo(end, first), id("DataTypeAliasLoop"), "End", "First");
    EXPECT_EQ(table.getDataTypeAliasedThruTo(first), record(end));
    EXPECT_EQ(table.getNumDataTypes(), 18);
}

// --- setDataTypeIdAliasedTo ------------------------------------------------------------------------------------------

TEST_F(AliasesTest, APlainRecordBecomesAnAlias) {
    const int a = plain("A");
    const int b = plain("B");
    table.setDataTypeIdAliasedTo(a, b);
    EXPECT_EQ(record(a)->getIdAliasedTo(), b);
    EXPECT_EQ(table.getDataTypeId("A"), a);
    EXPECT_STREQ(record(a)->getName(), "A");
    table.setDataTypeIdAliasedTo(a, b); // the same again is nothing
    EXPECT_RAISES(table.setDataTypeIdAliasedTo(a, 0), id("InconsistentDataTypeIdAliasedTo"), "A", "double", "B");
    EXPECT_RAISES(table.setDataTypeIdAliasedTo(b, a), id("DataTypeAliasLoop"), "B", "A");
    EXPECT_RAISES(table.setDataTypeIdAliasedTo(b, b), id("DataTypeAliasLoop"), "B", "B");
    EXPECT_RAISES(table.setDataTypeIdAliasedTo(b, 99), id("UndefinedDataTypeToBeAliasedTo"), "B", 99);
    record(b)->setSize(4);
    EXPECT_RAISES(table.setDataTypeIdAliasedTo(b, 0), id("CannotSetAliasForDefinedType"), "B");
    EXPECT_EQ(record(b)->getIdAliasedTo(), -10);
}

TEST_F(AliasesTest, AnAliasWhoseEndBecomesAnAliasForwardsInTwoHops) {
    const int b = plain("B");
    const int a = alias("A", b);
    const int c = plain("C");
    record(c)->setSize(4);
    table.setDataTypeIdAliasedTo(b, c);
    EXPECT_EQ(record(a)->getIdAliasedTo(), b);
    EXPECT_EQ(record(a)->getIdAliasedThruTo(), b); // kept: the new alias, not the end behind it
    EXPECT_EQ(record(b)->getIdAliasedThruTo(), c);
    EXPECT_EQ(record(a)->getGround(), record(c)->getGround()) << "each getter forwards in turn";
    EXPECT_EQ(table.getDataTypeAliasedThruTo(a), record(c)) << "the record that is no alias";
    const int d = alias("D", a);
    EXPECT_EQ(record(d)->getIdAliasedThruTo(), b);
    EXPECT_EQ(table.getDataTypeAliasedThruTo(d), record(c));
}

TEST_F(AliasesTest, AlreadyAliased) {
    const int end = plain("End");
    const int middle = alias("Middle", end);
    const int second = alias("Second", middle);
    EXPECT_TRUE(table.alreadyAliasedToDirectlyOrIndirectly(second, middle));
    EXPECT_TRUE(table.alreadyAliasedToDirectlyOrIndirectly(second, end));
    EXPECT_FALSE(table.alreadyAliasedToDirectlyOrIndirectly(second, second));
    EXPECT_FALSE(table.alreadyAliasedToDirectlyOrIndirectly(end, second));
    EXPECT_FALSE(table.alreadyAliasedToDirectlyOrIndirectly(-10, end));
}

TEST_F(AliasesTest, CommonAncestors) {
    const int end = plain("End");
    const int middle = alias("Middle", end);
    const int left = alias("Left", middle);
    const int right = alias("Right", middle);
    const int far = alias("Far", end);
    const int foreign = alias("Foreign", 0);
    const struct {
        int a, b, ancestor;
    } rows[] = {{left, left, left}, {left, right, middle}, {left, middle, middle}, {left, end, end},
                {far, left, end},   {left, foreign, -10},  {left, 0, -10},         {0, 0, 0},
                {middle, far, end}};
    for (const auto& row : rows) {
        EXPECT_EQ(table.getDataTypeIdCommonAncestor(row.a, row.b), row.ancestor) << row.a << ' ' << row.b;
        EXPECT_EQ(table.getDataTypeIdCommonAncestor(row.b, row.a), row.ancestor) << row.b << ' ' << row.a;
    }
    for (int i = 0; i < table.getNumDataTypes(); ++i)
        EXPECT_FALSE(table.getDataTypeAt(static_cast<unsigned long>(i))->getVisitFlag());
}

// --- Storage ---------------------------------------------------------------------------------------------------------

TEST_F(AliasesTest, StorageIsSetOnceAndBuiltIn) {
    const int a = plain("A");
    const int b = plain("B");
    const int second = alias("Second", a);
    EXPECT_RAISES(table.setDataTypeStorageId(second, 3), id("CannotSetPropertyOfAliasType"), "StorageId", "Second");
    EXPECT_RAISES(table.setDataTypeStorageId(a, b), id("IllegalDataTypeToBeStorageId"), "A", "B");
    EXPECT_RAISES(table.setDataTypeStorageId(a, 9), id("IllegalDataTypeToBeStorageId"), "A", "fcn_call");
    EXPECT_FALSE(record(a)->getAliasedToLocked());
    table.setDataTypeStorageId(a, 3);
    EXPECT_TRUE(record(a)->getAliasedToLocked());
    table.setDataTypeStorageId(a, 3);
    EXPECT_RAISES(table.setDataTypeStorageId(a, 4), id("InconsistentDataTypeStorageId"), "A", "int16", "uint8");
    table.setDataTypeStorageId(b, -1); // negative ids pass
    EXPECT_EQ(record(b)->getStorageId(), -1);
}

// --- Texts and custom types ------------------------------------------------------------------------------------------

TEST_F(AliasesTest, HostLanguageTexts) {
    const int fix = table.registerDataType("sfix16_En7", dtSourceFixpt, nullptr);
    const int color = table.registerDataType("Color", dtSourceEnum, nullptr);
    const int a = plain("A");
    const int colorAlias = alias("Colour", color);
    EXPECT_EQ(table.getDTACompliantString(0), "double");
    EXPECT_EQ(table.getDTACompliantString(-1), "auto");
    EXPECT_EQ(table.getDTACompliantString(fix), "fixdt('sfix16_En7')");
    EXPECT_EQ(table.getDTACompliantString(color), "Enum: Color");
    EXPECT_EQ(table.getDTACompliantString(a), "A");
    EXPECT_EQ(table.getDTACompliantString(9), "fcn_call");
    EXPECT_EQ(table.getDTACompliantString(colorAlias), "Colour") << "the record itself";
    record(a)->setType(dtqStruct);
    EXPECT_EQ(table.getDTACompliantString(a), "Bus: A");
}

TEST_F(AliasesTest, CustomTypes) {
    EXPECT_FALSE(table.hasCustomDataTypeCallback("Custom"));
    table.insertCustomDataTypeCallback("Custom", [](DataTypeTable* t, const char* name) {
        return t->registerDataType(name, dtSourceOpaque, nullptr);
    });
    table.insertCustomDataTypeCallback("Custom", [](DataTypeTable*, const char*) { return 3; }); // the first stays
    EXPECT_TRUE(table.hasCustomDataTypeCallback("Custom"));
    EXPECT_EQ(table.executeCustomDataTypeCallback("Custom"), 14);
    EXPECT_EQ(table.getAllCustomDataTypeName(), std::vector<std::string>{"Custom"});
    EXPECT_EQ(table.getHeaderFileForCustomType("Custom"), "\"\"");
    table.insertCustomDataTypeHeaderFilePair("Custom", "first.h");
    table.insertCustomDataTypeHeaderFilePair("Custom", "second.h");
    EXPECT_EQ(table.getHeaderFileForCustomType("Custom"), "first.h");
}

} // namespace
