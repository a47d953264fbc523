#include "qltypes/types/StringDataType.h"

#include <cstring>
#include <stdexcept>

#include <gtest/gtest.h>

#include "qlplatform/memory/Memory.h"
#include "qlplatform/strings/DynamicStringPool.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "tests/support/Raises.h"
#include "tests/types/ClientTable.h"

namespace {

using QLTypeSys::DataType;
using QLTypeSys::StringDataType;
using testsupport::ClientTable;

const DataType* recordOf(const QLTypeSys::DataTypeTable& table, int id) {
    return table.getDataTypeAt(static_cast<unsigned long>(id + 1));
}

std::size_t numTexts() {
    using stringutil::DynamicStringPool;
    return DynamicStringPool::GetPool(DynamicStringPool::GlobalPoolName).size();
}

const std::u16string& textIn(void* const& slot) { return StringDataType::getUStringScalarFromVoidPtrInput(&slot); }

void write(void*& slot, std::u16string text) {
    StringDataType::writeUStringScalarToVoidPtrOutput(std::move(text), &slot, 0);
}

TEST(StringDataType, NamesAndExpressionsFollowTheLength) {
    struct Row {
        unsigned long length;
        const char* name;
        const char* expression;
        const char* compliant;
    };
    const Row rows[] = {
        {0, "string", "string", "stringtype(0)"},
        {1, "str1", "stringtype(1)", "stringtype(1)"},
        {7, "str7", "stringtype(7)", "stringtype(7)"},
        {32, "str32", "stringtype(32)", "stringtype(32)"},
        {~0ul, "str18446744073709551615", "stringtype(18446744073709551615)", "stringtype(18446744073709551615)"},
    };
    ClientTable table;
    for (const Row& row : rows) {
        SCOPED_TRACE(row.length);
        EXPECT_EQ(StringDataType::getDataTypeName(row.length), row.name);
        const int id = table.registerStringDataType(row.length, nullptr);
        EXPECT_EQ(table.getDataTypeId(row.name), id);
        EXPECT_EQ(StringDataType::getDataTypeExpression(&table, id), row.expression);
        EXPECT_EQ(DtGetStringDataTypeExpression(&table, id), row.expression);
        EXPECT_EQ(table.getDTACompliantString(id), row.compliant);
        EXPECT_EQ(DtIsDynamicStringType(&table, id), row.length == 0);
        const auto* record = static_cast<const StringDataType*>(recordOf(table, id));
        EXPECT_EQ(record->isDynamic(), row.length == 0);
        EXPECT_EQ(record->getMaxStringLength(), row.length);
    }
}

TEST(StringDataType, ARecordIsDefinedFromTheStart) {
    ClientTable table;
    const int id = table.registerStringDataType(5, "Label");
    const DataType* record = recordOf(table, id);
    EXPECT_STREQ(record->getName(), "Label");
    EXPECT_EQ(record->getDataTypeSource(), dtSourceString);
    EXPECT_TRUE(record->getIsType(QLTypeSys::dtqString));
    EXPECT_EQ(record->getSize(), 8);
    EXPECT_EQ(StringDataType::getStorageSize(), 8u);
    EXPECT_TRUE(record->getIsAliasToLocked());
    EXPECT_FALSE(record->getPlainCopy());
    EXPECT_FALSE(record->getPlainConstruct());
    EXPECT_FALSE(record->getPlainDestroy());
    EXPECT_TRUE(table.IsStringDataType(id));
    EXPECT_TRUE(DtNeedCustomInitialization(&table, id));
    EXPECT_EQ(table.getDataTypeId("character"), DATA_TYPE_ID_INVALID); // only a generated name brings it
}

TEST(StringDataType, AGeneratedNameBringsTheCharacterType) {
    ClientTable table;
    const auto client = table.install();
    EXPECT_EQ(table.registerStringDataType(7, nullptr), 15);
    EXPECT_EQ(table.getDataTypeId("character"), 14);
    EXPECT_EQ(StringDataType::getDataTypeExpression(&table, 14), "stringtype(1)");
    EXPECT_EQ(table.registerStringDataType(7, nullptr), 15);
    EXPECT_EQ(table.registerStringDataType(0, nullptr), 16);
    EXPECT_EQ(table.getNumDataTypes(), 18u);
    // The client is shown the name as it was passed.
    EXPECT_EQ(client->seen, (std::vector<std::string>{"character from character", "str7 from -", "string from -"}));
}

TEST(StringDataType, RegistrationIsRefusedAsAnyOther) {
    ClientTable table;
    EXPECT_RAISES(table.registerStringDataType(3, "no name"), "QuillaneTypes:general:InvalidDataType", "no name");
    EXPECT_RAISES(table.registerStringDataType(3, ""), "QuillaneTypes:general:InvalidDataType", "");
    table.registerDataType("Taken", dtSourceEnum, nullptr);
    EXPECT_RAISES(table.registerStringDataType(3, "Taken"), "QuillaneTypes:general:DataType_SameNameAsExistingType",
                  "Taken");
    EXPECT_EQ(table.getNumDataTypes(), 16u);
    const auto client = table.install();
    client->vetoed = "str9";
    EXPECT_RAISES(table.registerStringDataType(9, nullptr), "QuillaneTypes:general:DataType_WithIntrinsicFixptName",
                  "str9");
    EXPECT_EQ(table.getDataTypeId("str9"), DATA_TYPE_ID_INVALID);
    EXPECT_EQ(table.getNumDataTypes(), 17u); // the character type stays
}

TEST(StringDataType, ADecliningTableReplacesTheRecordUnderItsId) {
    ClientTable table;
    const int id = table.registerStringDataType(3, "Text");
    table.declines = true;
    EXPECT_EQ(table.registerStringDataType(8, "Text"), id);
    EXPECT_EQ(table.getNumDataTypes(), 16u);
    EXPECT_EQ(static_cast<const StringDataType*>(recordOf(table, id))->getMaxStringLength(), 8u);
    EXPECT_EQ(table.getDataTypeId("Text"), id);
}

TEST(StringDataType, WithoutMemoryForTheRecordTheTableStaysAsItWas) {
    ClientTable table;
    utFailAllocationAt(1);
    EXPECT_RAISES(table.registerStringDataType(7, nullptr), "Quillane:Services:OutOfMemory");
    EXPECT_EQ(table.getNumDataTypes(), 15u);
    utFailAllocationAt(2); // the second record's
    EXPECT_RAISES(table.registerStringDataType(7, nullptr), "Quillane:Services:OutOfMemory");
    EXPECT_EQ(table.getNumDataTypes(), 16u);
    EXPECT_EQ(table.getDataTypeId("character"), 14);
    EXPECT_EQ(table.getDataTypeId("str7"), DATA_TYPE_ID_INVALID);
    utFailAllocationAt(0);
    EXPECT_EQ(table.registerStringDataType(7, nullptr), 15);
}

TEST(StringDataType, SignsAndPropertiesAreIgnored) {
    ClientTable table;
    const int id = table.registerStringDataType(0, nullptr);
    DataType* record = table.getDataTypeAt(static_cast<unsigned long>(id + 1));
    record->setIsNegativeFcn([](auto...) { return 1; });
    record->setIsPositiveFcn([](auto...) { return 1; });
    EXPECT_EQ(record->getIsNegativeFcn(), nullptr);
    EXPECT_EQ(record->getIsPositiveFcn(), nullptr);
    record->setProperties("x");
    EXPECT_EQ(record->getProperties(), nullptr);
    record->setPropertiesSize(1);
    record->setProperties("x");
    EXPECT_EQ(record->getProperties(), nullptr);
}

TEST(StringDataType, ASlotLivesFromConstructionToDestruction) {
    ClientTable table;
    const int id = table.registerStringDataType(2, nullptr);
    void* slot = nullptr;
    table.construct(id, &slot);
    ASSERT_NE(slot, nullptr);
    EXPECT_EQ(textIn(slot), u"");
    EXPECT_EQ(numTexts(), 1u);
    void* const handle = slot;
    write(slot, u"longer than the type's length"); // which no operation holds it to
    EXPECT_EQ(slot, handle);
    EXPECT_EQ(textIn(slot), u"longer than the type's length");
    table.construct(id, &slot); // anew, under the same handle
    EXPECT_EQ(slot, handle);
    EXPECT_EQ(textIn(slot), u"");
    table.destruct(id, &slot);
    EXPECT_EQ(slot, nullptr);
    EXPECT_EQ(numTexts(), 0u);
    table.destruct(id, &slot);
    EXPECT_EQ(slot, nullptr);
}

TEST(StringDataType, WritingAndCopyingConstructANullSlot) {
    ClientTable table;
    const int id = table.registerStringDataType(0, nullptr);
    void* from = nullptr;
    write(from, u"text");
    ASSERT_NE(from, nullptr);
    void* to = nullptr;
    table.deepCopy(id, &to, &from);
    ASSERT_NE(to, nullptr);
    EXPECT_NE(to, from);
    EXPECT_EQ(textIn(to), u"text");

    void* const handle = to;
    write(from, u"other");
    EXPECT_EQ(textIn(to), u"text");
    table.deepCopy(id, &to, &from);
    EXPECT_EQ(to, handle); // a live slot keeps its handle
    EXPECT_EQ(textIn(to), u"other");
    table.deepCopy(id, &to, &to);
    EXPECT_EQ(textIn(to), u"other");
    EXPECT_EQ(numTexts(), 2u);
    table.destruct(id, &from);
    table.destruct(id, &to);
}

TEST(StringDataType, ASlotNeedsNoAlignment) {
    ClientTable table;
    const int id = table.registerStringDataType(0, nullptr);
    unsigned char memory[32] = {};
    table.construct(id, memory + 1);
    StringDataType::writeUStringScalarToVoidPtrOutput(u"odd", memory + 1, 0);
    table.deepCopy(id, memory + 19, memory + 1);
    EXPECT_EQ(StringDataType::getUStringScalarFromVoidPtrInput(memory + 19), u"odd");
    table.destruct(id, memory + 1);
    table.destruct(id, memory + 19);
    EXPECT_EQ(numTexts(), 0u);
}

TEST(StringDataType, ASourceWithLengthAndNoBufferThrows) {
    ClientTable table;
    const int id = table.registerStringDataType(0, nullptr);
    std::u16string broken;
    unsigned char bytes[sizeof broken];
    std::memcpy(bytes, static_cast<void*>(&broken), sizeof broken);
    const struct {
        const void* buffer;
        std::size_t length;
    } noBuffer = {nullptr, 3};
    std::memcpy(static_cast<void*>(&broken), &noBuffer, sizeof noBuffer);
    void* from = &broken;
    void* to = nullptr;
    try {
        table.deepCopy(id, &to, &from);
        ADD_FAILURE();
    } catch (const std::logic_error& e) {
        EXPECT_STREQ(e.what(), "basic_string::_M_construct null not valid");
    }
    EXPECT_EQ(to, nullptr);
    std::memcpy(static_cast<void*>(&broken), bytes, sizeof broken);
}

TEST(StringDataType, NarrowTextKeepsTheLowBytes) {
    void* slot = nullptr;
    write(slot, u"A\u00e4\u4e2d\u0100z");
    EXPECT_EQ(GetStdStringFromQLStringPointer(&slot), std::string("A\xe4\x2d\0z", 5));
    write(slot, u"");
    EXPECT_EQ(GetStdStringFromQLStringPointer(&slot), "");
    StringDataType(0, "x", 0).destroyScalarElement(&slot);
}

TEST(StringDataType, TheSaferOfTwoHoldsTheOther) {
    ClientTable table;
    const int dynamic = table.registerStringDataType(0, "D");
    const int otherDynamic = table.registerStringDataType(0, "D2");
    const int five = table.registerStringDataType(5, "F");
    const int alsoFive = table.registerStringDataType(5, "F2");
    const int nine = table.registerStringDataType(9, "N");
    struct Row {
        int a, b, safer;
    };
    const Row rows[] = {
        {five, five, five},     {dynamic, five, dynamic},   {five, dynamic, dynamic}, {dynamic, otherDynamic, dynamic},
        {five, alsoFive, five}, {alsoFive, five, alsoFive}, {five, nine, nine},       {nine, five, nine},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(testing::Message() << row.a << " and " << row.b);
        EXPECT_EQ(DtGetSaferStringDataType(&table, row.a, row.b), row.safer);
    }
    EXPECT_EQ(DtGetSaferStringDataType(&table, 3, 3), 3); // equal ids are not looked at
}

TEST(StringDataType, AliasesAreResolvedWhereTypesAreAsked) {
    ClientTable table;
    EXPECT_FALSE(DtHasStringDataType(&table));
    const int plain = table.registerDataType("Plain", dtSourceEnum, nullptr);
    EXPECT_FALSE(DtHasStringDataType(&table));
    const int text = table.registerStringDataType(4, "Text");
    const int alias = table.registerAliasDataType("Alias", dtSourceEnum, text, nullptr);
    EXPECT_TRUE(DtHasStringDataType(&table));
    EXPECT_TRUE(table.IsStringDataType(alias));
    EXPECT_FALSE(table.IsStringDataType(plain));
    EXPECT_FALSE(table.IsStringDataType(99));
    EXPECT_TRUE(DataTypeIsOrContainsString(&table, alias));

    void* slot = nullptr; // values of an alias are values of its type
    table.construct(alias, &slot);
    write(slot, u"x");
    void* copy = nullptr;
    table.deepCopy(alias, &copy, &slot);
    EXPECT_EQ(textIn(copy), u"x");
    table.destruct(alias, &slot);
    table.destruct(alias, &copy);
    EXPECT_EQ(numTexts(), 0u);
}

#ifndef NDEBUG
TEST(StringDataTypeDeathTest, TheEntryAsItStandsMustBeAString) {
    ClientTable table;
    const int text = table.registerStringDataType(4, "Text");
    const int alias = table.registerAliasDataType("Alias", dtSourceEnum, text, nullptr);
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH(StringDataType::getDataTypeExpression(&table, alias), "dtqString");
    EXPECT_DEATH(DtGetStringDataTypeExpression(&table, alias), "dtqString");
    EXPECT_DEATH(DtIsDynamicStringType(&table, alias), "dtqString");
    EXPECT_DEATH(DtGetSaferStringDataType(&table, alias, text), "dtqString");
}
#endif

struct BusTable : ClientTable {
    int addBus(const char* name) {
        const int id = static_cast<int>(getNumDataTypes()) - 1;
        addDataType(new BusDataType(id, name, static_cast<DataTypeSource>(2)));
        return id;
    }

    int withElement(int id, int elementType) {
        EXPECT_EQ(DtSetDataTypeNumElements(this, "", id, 1), nullptr);
        StructElement* element = DtGetStructDataTypeObject(this, id)->getElements()[0];
        element->setName("e");
        element->dataTypeId = elementType;
        EXPECT_EQ(DtComputeDerivedStructAttributes(this, id), nullptr);
        return id;
    }
};

TEST(StringDataType, OnlyBusesContainStrings) {
    BusTable table;
    const int text = table.registerStringDataType(0, nullptr);
    const int busOfText = table.withElement(table.addBus("BusOfText"), text);
    const int busOfDouble = table.withElement(table.addBus("BusOfDouble"), DATA_TYPE_ID_DOUBLE);
    const int structOfText =
        table.withElement(table.registerStructDataType("S", static_cast<DataTypeSource>(2), nullptr), text);
    const int aliasOfBus = table.registerAliasDataType("AliasOfBus", dtSourceEnum, busOfText, nullptr);
    EXPECT_TRUE(DataTypeIsOrContainsString(&table, text));
    EXPECT_TRUE(DataTypeIsOrContainsString(&table, busOfText));
    EXPECT_TRUE(DataTypeIsOrContainsString(&table, aliasOfBus));
    EXPECT_FALSE(DataTypeIsOrContainsString(&table, busOfDouble));
    EXPECT_FALSE(DataTypeIsOrContainsString(&table, structOfText)); // kept: a plain structure is no bus
    for (int id : {-10, -2, -1, 0, 8, 13, 1000, 2147483647})
        EXPECT_FALSE(DataTypeIsOrContainsString(&table, id)) << id;
}

} // namespace
