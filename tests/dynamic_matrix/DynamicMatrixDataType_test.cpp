#include "qltypes/dynamic_matrix/DynamicMatrixDataType.h"

#include <cstring>
#include <stdexcept>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "qlplatform/memory/Memory.h"
#include "qltypes/dynamic_matrix/DynamicMatrix.h"
#include "qltypes/dynamic_matrix/DynamicMatrixMemoryManager.h"
#include "qltypes/host/FeatureFlags.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "tests/dynamic_matrix/MatrixFunctions.h"
#include "tests/support/Raises.h"
#include "tests/types/ClientTable.h"

namespace {

using QLTypeSys::DataType;
using QLTypeSys::DynamicMatrix;
using QLTypeSys::DynamicMatrixDataType;
using testing::ElementsAre;
using testsupport::ClientTable;

DataType* recordOf(const QLTypeSys::DataTypeTable& table, int id) {
    return table.getDataTypeAt(static_cast<unsigned long>(id + 1));
}

struct DisplayHook {
    explicit DisplayHook(int state) { QLTH_DisplayDynamicMatrixType->setState(state); }
    ~DisplayHook() { QLTH_DisplayDynamicMatrixType->setState(0); }
};

TEST(DynamicMatrixDataType, TheNameTellsElementTypeAndRank) {
    struct Row {
        int elementId;
        unsigned long numDims;
        const char* name;
    };
    const Row rows[] = {
        {DATA_TYPE_ID_DOUBLE, 2, "dynmat_double_2d_t"},
        {DATA_TYPE_ID_BOOLEAN, 0, "dynmat_boolean_0d_t"},
        {DATA_TYPE_ID_AUTO, 1, "dynmat_auto_1d_t"},
        {DATA_TYPE_ID_UINT8, ~0ul, "dynmat_uint8_18446744073709551615d_t"},
    };
    ClientTable table;
    int nextId = 14;
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        EXPECT_EQ(DynamicMatrixDataType::ComputeName(&table, row.elementId, row.numDims), row.name);
        const int id = table.registerDynamicMatrixDataType(row.elementId, row.numDims);
        EXPECT_EQ(id, nextId++);
        EXPECT_EQ(table.getDataTypeId(row.name), id);
        EXPECT_STREQ(DtGetDataTypeName(&table, id), row.name);
        EXPECT_EQ(table.registerDynamicMatrixDataType(row.elementId, row.numDims), id);
        EXPECT_EQ(DtGetContainedDataType(&table, id), row.elementId);
        EXPECT_EQ(DtGetContainedDataNumDims(&table, id), row.numDims);
    }
}

TEST(DynamicMatrixDataType, ARecordHasTheFunctionsOfTheMatrixWithTheirNames) {
    ClientTable table;
    const int element = table.registerDataType("Sample", dtSourceEnum, nullptr);
    EXPECT_EQ(DtSetDataTypeSize(&table, "", element, 12), nullptr);
    const int id = table.registerDynamicMatrixDataType(element, 2);
    const DataType* record = recordOf(table, id);
    EXPECT_EQ(record->getDataTypeSource(), dtSourceDynamicMatrix);
    EXPECT_EQ(record->getType(), QLTypeSys::dtqDynamicMatrix);
    EXPECT_EQ(record->getSize(), static_cast<int>(sizeof(DynamicMatrix)));
    EXPECT_EQ(static_cast<const DynamicMatrixDataType*>(record)->getElementSize(), 12);
    EXPECT_TRUE(record->isDynamicMatrix());
    EXPECT_TRUE(DtIsDynamicMatrixType(&table, id));
    EXPECT_TRUE(DtIsImplementedAsDynamicMatrixType(&table, id));
    EXPECT_FALSE(DtIsDynamicMatrixType(&table, element));
    EXPECT_FALSE(record->getPlainCopy());
    EXPECT_FALSE(record->getPlainConstruct());
    EXPECT_FALSE(record->getPlainDestroy());

    testsupport::expectMatrixFunctions(*record);
    EXPECT_EQ(record->getUpdateContainedDataDimFcn(), DynamicMatrix::updateDataDimFcn);
    EXPECT_EQ(record->getUpdateContainedDataDimFcnName(), "updateDataDimFcn");
    EXPECT_EQ(record->getSerializeFcn(), nullptr);
    EXPECT_EQ(record->getCoderPropertiesFcn(), nullptr);
}

TEST(DynamicMatrixDataType, AMatrixOfMatricesIsTheMatrixItself) {
    ClientTable table;
    const int matrix = table.registerDynamicMatrixDataType(DATA_TYPE_ID_INT8, 2);
    const int alias = table.registerAliasDataType("Grid", dtSourceEnum, matrix, nullptr);
    EXPECT_EQ(table.registerDynamicMatrixDataType(matrix, 3), matrix);
    EXPECT_EQ(table.registerDynamicMatrixDataType(alias, 3), alias);
    EXPECT_EQ(table.getNumDataTypes(), 17u);
}

TEST(DynamicMatrixDataType, RegistrationIsRefusedAsAnyOther) {
    ClientTable table;
    for (int id : {-10, -2, 14, 2147483647})
        EXPECT_RAISES(table.registerDynamicMatrixDataType(id, 2), "QuillaneTypes:general:InvalidDataTypeId", id);
    table.registerDataType("dynmat_int8_1d_t", dtSourceEnum, nullptr);
    EXPECT_RAISES(table.registerDynamicMatrixDataType(DATA_TYPE_ID_INT8, 1),
                  "QuillaneTypes:general:DataType_SameNameAsExistingType", "dynmat_int8_1d_t");
    const auto client = table.install();
    client->vetoed = "dynmat_int8_2d_t";
    EXPECT_RAISES(table.registerDynamicMatrixDataType(DATA_TYPE_ID_INT8, 2),
                  "QuillaneTypes:general:DataType_WithIntrinsicFixptName", "dynmat_int8_2d_t");
    EXPECT_EQ(table.getNumDataTypes(), 16u);
    EXPECT_EQ(table.getDataTypeId("dynmat_int8_2d_t"), DATA_TYPE_ID_INVALID);
    EXPECT_EQ(client->seen, (std::vector<std::string>{"dynmat_int8_2d_t from dynmat_int8_2d_t"}));
}

TEST(DynamicMatrixDataType, ADecliningTableReplacesTheRecordUnderItsId) {
    ClientTable table;
    const int element = table.registerDataType("Sample", dtSourceEnum, nullptr);
    const int id = table.registerDynamicMatrixDataType(element, 2);
    const auto elementSize = [&] { return static_cast<DynamicMatrixDataType*>(recordOf(table, id))->getElementSize(); };
    EXPECT_EQ(elementSize(), -1); // as the size of the element type was
    EXPECT_EQ(DtSetDataTypeSize(&table, "", element, 12), nullptr);
    EXPECT_EQ(table.registerDynamicMatrixDataType(element, 2), id);
    EXPECT_EQ(elementSize(), -1);
    table.declines = true;
    EXPECT_EQ(table.registerDynamicMatrixDataType(element, 2), id);
    EXPECT_EQ(elementSize(), 12);
    EXPECT_EQ(table.getNumDataTypes(), 17u);
}

TEST(DynamicMatrixDataType, WithoutMemoryForTheRecordTheTableStaysAsItWas) {
    ClientTable table;
    utFailAllocationAt(1);
    EXPECT_RAISES(table.registerDynamicMatrixDataType(DATA_TYPE_ID_INT8, 2), "Quillane:Services:OutOfMemory");
    EXPECT_EQ(table.getNumDataTypes(), 15u);
    EXPECT_EQ(table.getDataTypeId("dynmat_int8_2d_t"), DATA_TYPE_ID_INVALID);
    utFailAllocationAt(0);
    const int id = table.registerDynamicMatrixDataType(DATA_TYPE_ID_INT8, 2);
    EXPECT_EQ(id, 14);
    table.declines = true; // on the way to a replacement the old record stays
    const DataType* before = recordOf(table, id);
    utFailAllocationAt(1);
    EXPECT_RAISES(table.registerDynamicMatrixDataType(DATA_TYPE_ID_INT8, 2), "Quillane:Services:OutOfMemory");
    utFailAllocationAt(0);
    EXPECT_EQ(recordOf(table, id), before);
    EXPECT_EQ(table.getNumDataTypes(), 16u);
    EXPECT_EQ(table.getDataTypeId("dynmat_int8_2d_t"), id);
}

// A record whose base name was changed after registration.
struct Renamed : DynamicMatrixDataType {
    using DynamicMatrixDataType::DynamicMatrixDataType;
    void rename(const char* name) { name_ = name; }
};

TEST(DynamicMatrixDataType, TheHookChoosesTheNameThatIsShown) {
    ClientTable table;
    auto* record = new Renamed(&table, 14, "dynmat_double_2d_t");
    table.addDataType(record);
    record->RegisterCallbacks(&table, DATA_TYPE_ID_DOUBLE, 2);
    record->rename("Grid");
    EXPECT_STREQ(record->getName(), "Grid");
    {
        const DisplayHook shown(1);
        EXPECT_STREQ(record->getName(), "dynmat_double_2d_t");
    }
    {
        const DisplayHook other(2);
        EXPECT_STREQ(record->getName(), "Grid");
    }
}

TEST(DynamicMatrixDataType, ATypeRegisteredUnderTheHookIsFoundByItsName) {
    const DisplayHook shown(1);
    ClientTable table;
    const int id = table.registerDynamicMatrixDataType(DATA_TYPE_ID_DOUBLE, 2);
    EXPECT_EQ(table.getDataTypeId("dynmat_double_2d_t"), id);
    EXPECT_STREQ(recordOf(table, id)->getName(), "dynmat_double_2d_t");
    EXPECT_EQ(table.registerDynamicMatrixDataType(DATA_TYPE_ID_DOUBLE, 2), id);
}

TEST(DynamicMatrixDataType, AnElementTypeWithoutANameThrows) {
    struct Nameless : DataType {
        using DataType::DataType;
        const char* getName() const override { return isNameless ? nullptr : DataType::getName(); }
        bool isNameless = false;
    };
    ClientTable table;
    auto* record = new Nameless(14, "Element", dtSourceEnum);
    table.addDataType(record);
    record->isNameless = true;
    try {
        table.registerDynamicMatrixDataType(14, 2);
        ADD_FAILURE();
    } catch (const std::logic_error& e) {
        EXPECT_STREQ(e.what(), "basic_string::_M_construct null not valid");
    }
    EXPECT_EQ(table.getNumDataTypes(), 16u);
    record->isNameless = false;
}

TEST(DynamicMatrixDataType, AValueOfTheTypeIsShapedAtItsConstruction) {
    ClientTable table;
    const int id = table.registerDynamicMatrixDataType(DATA_TYPE_ID_INT16, 3);
    const int alias = table.registerAliasDataType("Cube", dtSourceEnum, id, nullptr);
    for (int type : {id, alias}) {
        alignas(DynamicMatrix) unsigned char memory[sizeof(DynamicMatrix)];
        table.construct(type, memory);
        const auto& m = *reinterpret_cast<const DynamicMatrix*>(memory);
        EXPECT_THAT(m.dims, ElementsAre(0, 0, 0));
        EXPECT_EQ(m.elementSize, 2u);
        EXPECT_EQ(m.width, 0u);
        EXPECT_EQ(m.rawData, nullptr);
        EXPECT_EQ(table.sizeOf(type), sizeof(DynamicMatrix));

        const unsigned long dims[] = {2, 3, 4};
        DtGetUpdateContainedDataDimsFcn(&table, type)(3, dims, 2, memory);
        EXPECT_THAT(std::vector<int>(m.intDims, m.intDims + 3), ElementsAre(2, 3, 4));
        unsigned long now[3];
        table.containedDataDims(type, memory, now);
        EXPECT_THAT(now, ElementsAre(2u, 3u, 4u));
        EXPECT_EQ(DtGetContainedWidth(&table, type, memory), 24u);
        EXPECT_EQ(table.containedData(type, memory), m.rawData);
        std::memset(m.rawData, 1, 48);
        table.destruct(type, memory);
    }
    EXPECT_EQ(QLTypeSys::DynamicMatrixMemoryManager::GetMemoryManager().numBlocks(), 0u);
}

} // namespace
