#include "qltypes/image/ImageDataType.h"

#include <cstddef>
#include <cstring>

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
using QLTypeSys::ImageDataType;
using QLTypeSys::ImageProperties;
using testsupport::ClientTable;

constexpr SSImageDataLayout cRow = SSImageDataLayout_RowMajorInterleaved;
constexpr SSImageDataLayout cColumn = SSImageDataLayout_ColumnMajorPlanar;

DataType* recordOf(const QLTypeSys::DataTypeTable& table, int id) {
    return table.getDataTypeAt(static_cast<unsigned long>(id + 1));
}

struct StorageHook {
    explicit StorageHook(int state) { QLTH_ImageTypeImplementation->setState(state); }
    ~StorageHook() { QLTH_ImageTypeImplementation->setState(0); }
};

struct FormatRow {
    int value;
    const char* name;
    long channels; // -1: any
};

const FormatRow formatRows[] = {
    {0, "BGRA", 4},      {1, "RGB", 3}, {2, "RGBA", 4}, {3, "Grayscale", 1}, {4, "CMYK", 4},
    {5, "Spectral", -1}, {6, "Lab", 3}, {7, "HSV", 3},  {8, "YUV444", 3},    {9, "CFA", 1},
};

const char* const baseTypes[] = {"double", "single", "int8", "uint8", "int16", "uint16", "int32", "uint32", "boolean"};

TEST(ImageDataType, NamesAndValues) {
    for (const FormatRow& row : formatRows) {
        const auto format = static_cast<SSImageColorFormat>(row.value);
        EXPECT_STREQ(ImageDataType::ImageColorFormatIdToName(format), row.name);
        EXPECT_EQ(ImageDataType::ImageColorFormatNameToId(row.name), format);
        EXPECT_EQ(ImageDataType::expectedNumChannels(format), row.channels) << row.name;
    }
    EXPECT_STREQ(ImageDataType::ImageDataLayoutIdToName(cColumn), "ColumnMajorPlanar");
    EXPECT_STREQ(ImageDataType::ImageDataLayoutIdToName(cRow), "RowMajorInterleaved");
    EXPECT_EQ(ImageDataType::ImageDataLayoutNameToId("ColumnMajorPlanar"), 0);
    EXPECT_EQ(ImageDataType::ImageDataLayoutNameToId("RowMajorInterleaved"), 1);
    for (int id = 0; id < 9; ++id) {
        EXPECT_STREQ(ImageDataType::ImageBaseTypeIdToName(static_cast<BuiltInDTypeId>(id)), baseTypes[id]);
        EXPECT_EQ(ImageDataType::ImageBaseTypeNameToId(baseTypes[id]), id);
    }
    for (int unknown : {-1, 10, 1000}) {
        EXPECT_STREQ(ImageDataType::ImageColorFormatIdToName(static_cast<SSImageColorFormat>(unknown)), "");
        EXPECT_STREQ(ImageDataType::ImageDataLayoutIdToName(static_cast<SSImageDataLayout>(unknown)), "");
        EXPECT_STREQ(ImageDataType::ImageBaseTypeIdToName(static_cast<BuiltInDTypeId>(unknown)), "");
        EXPECT_EQ(ImageDataType::expectedNumChannels(static_cast<SSImageColorFormat>(unknown)), -1);
    }
    for (const char* unknown : {"rgb", "", static_cast<const char*>(nullptr)}) {
        EXPECT_EQ(ImageDataType::ImageColorFormatNameToId(unknown), -1);
        EXPECT_EQ(ImageDataType::ImageDataLayoutNameToId(unknown), -1);
        EXPECT_EQ(ImageDataType::ImageBaseTypeNameToId(unknown), -1);
    }
}

TEST(ImageDataType, TheNameTellsTheAttributes) {
    struct Row {
        int format, layout, base;
        unsigned long channels;
        const char* name;
    };
    const Row rows[] = {
        {1, 1, DATA_TYPE_ID_UINT8, 3, "Image_RGB_Row_uint8"},
        {1, 0, DATA_TYPE_ID_UINT8, 3, "Image_RGB_Col_uint8"},
        {1, 2, DATA_TYPE_ID_UINT8, 3, "Image_RGB_Col_uint8"},
        {1, -1, DATA_TYPE_ID_UINT8, 3, "Image_RGB_Col_uint8"},
        {5, 0, DATA_TYPE_ID_SINGLE, 31, "Image_Spectral_Col_single_31"},
        {5, 1, DATA_TYPE_ID_BOOLEAN, ~0ul, "Image_Spectral_Row_boolean_18446744073709551615"},
        {9, 1, DATA_TYPE_ID_DOUBLE, 77, "Image_CFA_Row_double"},
        {12, 1, DATA_TYPE_ID_DOUBLE, 77, "Image__Row_double"},
    };
    for (const Row& row : rows)
        EXPECT_EQ(ImageDataType::ComputeAnonymousName(static_cast<SSImageColorFormat>(row.format),
                                                      static_cast<SSImageDataLayout>(row.layout),
                                                      static_cast<BuiltInDTypeId>(row.base), row.channels),
                  row.name);
}

TEST(ImageDataType, EveryCombinationRegistersOnceAndAnswersItsAttributes) {
    ClientTable table;
    for (const FormatRow& row : formatRows)
        for (SSImageDataLayout layout : {cRow, cColumn})
            for (int base = 0; base < 9; ++base) {
                const auto format = static_cast<SSImageColorFormat>(row.value);
                const auto baseType = static_cast<BuiltInDTypeId>(base);
                const unsigned long channels = row.channels == -1 ? 31 : static_cast<unsigned long>(row.channels);
                const int id = table.registerImageDataType(channels, format, layout, baseType);
                SCOPED_TRACE(DtGetDataTypeName(&table, id));
                EXPECT_EQ(table.registerImageDataType(channels, format, layout, baseType), id);
                EXPECT_EQ(id + 2, static_cast<int>(table.getNumDataTypes()));
                const auto* image = static_cast<const ImageDataType*>(recordOf(table, id));
                EXPECT_EQ(image->getNumChannels(), channels);
                EXPECT_EQ(image->getColorFormat(), format);
                EXPECT_EQ(image->getDataLayout(), layout);
                EXPECT_EQ(image->getBaseType(), baseType);
                EXPECT_EQ(image->getContainedDataType(), base);
            }
    EXPECT_EQ(table.getNumDataTypes(), 15u + 10 * 2 * 9 + 9); // one matrix type for each base type
}

TEST(ImageDataType, SpectralTypesDifferInTheirChannels) {
    ClientTable table;
    const int a = table.registerImageDataType(31, SSImageColorFormat_Spectral, cColumn, DATA_TYPE_ID_SINGLE);
    const int b = table.registerImageDataType(32, SSImageColorFormat_Spectral, cColumn, DATA_TYPE_ID_SINGLE);
    EXPECT_NE(a, b);
    EXPECT_STREQ(DtGetDataTypeName(&table, a), "Image_Spectral_Col_single_31");
    EXPECT_STREQ(DtGetDataTypeName(&table, b), "Image_Spectral_Col_single_32");
}

TEST(ImageDataType, EveryOtherNumberOfChannelsIsRefused) {
    ClientTable table;
    for (const FormatRow& row : formatRows)
        for (unsigned long channels : {0ul, 1ul, 2ul, 3ul, 4ul, 5ul, 1ul << 63}) {
            SCOPED_TRACE(testing::Message() << channels << " of " << row.name);
            const auto make = [&] {
                ImageDataType(&table, 14, "x", channels, static_cast<SSImageColorFormat>(row.value), cRow,
                              DATA_TYPE_ID_UINT8);
            };
            if (row.channels == -1 && channels == 0)
                EXPECT_RAISES(make(), "Quillane:DataType:InvalidImageTypeNumChannels2", 0, row.name);
            else if (row.channels == -1 || channels == static_cast<unsigned long>(row.channels))
                EXPECT_NO_THROW(make());
            else
                EXPECT_RAISES(make(), "Quillane:DataType:InvalidImageTypeNumChannels", channels, row.name,
                              row.channels);
        }
    EXPECT_EQ(table.getNumDataTypes(), 15u);
}

TEST(ImageDataType, ARefusedImageLeavesItsStorageType) {
    ClientTable table;
    EXPECT_RAISES(table.registerImageDataType(4, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8),
                  "Quillane:DataType:InvalidImageTypeNumChannels", 4, "RGB", 3);
    EXPECT_EQ(table.getNumDataTypes(), 16u);
    EXPECT_EQ(table.getDataTypeId("dynmat_uint8_3d_t"), 14);
    EXPECT_RAISES(table.registerImageDataType(0, SSImageColorFormat_Spectral, cRow, DATA_TYPE_ID_UINT8),
                  "Quillane:DataType:InvalidImageTypeNumChannels2", 0, "Spectral");
    // A name that exists is found before the channels are looked at.
    const int id = table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8);
    EXPECT_EQ(table.registerImageDataType(4, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8), id);
    // A layout of any other value has the name of the columns.
    const int column = table.registerImageDataType(3, SSImageColorFormat_RGB, cColumn, DATA_TYPE_ID_UINT8);
    EXPECT_EQ(
        table.registerImageDataType(3, SSImageColorFormat_RGB, static_cast<SSImageDataLayout>(7), DATA_TYPE_ID_UINT8),
        column);
}

TEST(ImageDataType, AnUnknownBaseTypeIsRefused) {
    ClientTable table;
    EXPECT_RAISES(table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, static_cast<BuiltInDTypeId>(99)),
                  "QuillaneTypes:general:InvalidDataTypeId", 99);
    EXPECT_EQ(table.getNumDataTypes(), 15u);
}

TEST(ImageDataType, ThePropertyBlockHoldsTheAttributesInOrder) {
    EXPECT_EQ(offsetof(ImageProperties, numChannels), 0u);
    EXPECT_EQ(offsetof(ImageProperties, colorFormat), 8u);
    EXPECT_EQ(offsetof(ImageProperties, dataLayout), 12u);
    EXPECT_EQ(offsetof(ImageProperties, baseType), 16u);
    const ImageDataType image(nullptr, 14, "x", 3, SSImageColorFormat_HSV, cRow, DATA_TYPE_ID_INT16);
    EXPECT_EQ(image.getPropertiesSize(), static_cast<int>(sizeof(ImageProperties)));
    ImageProperties expected = {};
    expected.numChannels = 3;
    expected.colorFormat = SSImageColorFormat_HSV;
    expected.dataLayout = cRow;
    expected.baseType = DATA_TYPE_ID_INT16;
    EXPECT_EQ(std::memcmp(image.getProperties(), &expected, sizeof expected), 0);
    EXPECT_TRUE(image.isImage());
    EXPECT_EQ(image.getType(), QLTypeSys::dtqImage);
    EXPECT_EQ(image.getDataTypeSource(), dtSourceImage);
}

TEST(ImageDataType, AMatrixBackedImageBorrowsFromItsStorage) {
    ClientTable table;
    const auto client = table.install();
    const int id = table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8);
    const int storage = table.getDataTypeId("dynmat_uint8_3d_t");
    EXPECT_EQ(storage, 14);
    EXPECT_EQ(id, 15);
    EXPECT_EQ(DtGetDataTypeStorageId(&table, id), storage);
    EXPECT_STREQ(DtGetDataTypeShortName(&table, id), "image");
    EXPECT_TRUE(DtIsImageType(&table, id));
    EXPECT_FALSE(DtIsDynamicMatrixType(&table, id));
    EXPECT_TRUE(DtIsImplementedAsDynamicMatrixType(&table, id));
    EXPECT_EQ(client->seen, (std::vector<std::string>{"dynmat_uint8_3d_t from dynmat_uint8_3d_t",
                                                      "Image_RGB_Row_uint8 from Image_RGB_Row_uint8"}));

    const DataType* record = recordOf(table, id);
    EXPECT_EQ(record->getSize(), static_cast<int>(sizeof(DynamicMatrix)));
    EXPECT_EQ(record->getContainedDataType(), DATA_TYPE_ID_UINT8);
    EXPECT_EQ(record->getContainedDataNumDims(), 3u);
    testsupport::expectMatrixFunctions(*record);
    EXPECT_EQ(record->getUpdateContainedDataDimFcn(), nullptr); // an image is resized as a whole
    EXPECT_EQ(record->getUpdateContainedDataDimFcnName(), "");
}

// The opaque type of a client, with names of its own.
int construct(void*, const void*) { return 1; }
int destruct(void*) { return 1; }
int copy(void*, const void*) { return 1; }
unsigned long sizeOf() { return 96; }
void* containedData(void* p) { return p; }
void containedDims(const void*, unsigned long*) {}
void updateDims(unsigned long, const unsigned long*, unsigned long, void*) {}
int dataConstruct(unsigned long, const unsigned long*, unsigned long, const void*, void*) { return 1; }

int registerPlainMat(QLTypeSys::DataTypeTable* table, const char* name) {
    return table->registerDataType(name, dtSourceEnum, nullptr);
}

int registerSizedMat(QLTypeSys::DataTypeTable* table, const char* name) {
    const int id = registerPlainMat(table, name);
    DataType* record = recordOf(*table, id);
    record->setSize(96);
    record->setConstructFcn(construct);
    record->setConstructFcnName("newMat");
    record->setDestructFcn(destruct);
    record->setDestructFcnName("deleteMat");
    record->setDeepCopyFcn(copy);
    record->setDeepCopyFcnName("copyMat");
    return id;
}

int registerFullMat(QLTypeSys::DataTypeTable* table, const char* name) {
    const int id = registerSizedMat(table, name);
    DataType* record = recordOf(*table, id);
    record->setSizeOfFcn(sizeOf);
    record->setSizeOfFcnName("sizeOfMat");
    record->setContainedDataFcn(containedData);
    record->setContainedDataFcnName("dataOfMat");
    record->setContainedDataType(DATA_TYPE_ID_DOUBLE);
    record->setContainedDataNumDims(2);
    record->setContainedDataDimsFcn(containedDims);
    record->setUpdateContainedDataDimsFcn(updateDims);
    record->setDataConstructFcn(dataConstruct);
    return id;
}

TEST(ImageDataType, AnOpaqueStorageLendsWhatItHas) {
    const StorageHook opaque(1);
    ClientTable table;
    table.insertCustomDataTypeCallback("cv_Mat", registerFullMat);
    const int id = table.registerImageDataType(3, SSImageColorFormat_Lab, cColumn, DATA_TYPE_ID_INT16);
    EXPECT_EQ(DtGetDataTypeStorageId(&table, id), table.getDataTypeId("cv_Mat"));
    const DataType* record = recordOf(table, id);
    EXPECT_EQ(record->getSize(), 96);
    EXPECT_EQ(record->getConstructFcn(), construct);
    EXPECT_EQ(record->getConstructFcnName(), "newMat");
    EXPECT_EQ(record->getDestructFcn(), destruct);
    EXPECT_EQ(record->getDestructFcnName(), "deleteMat");
    EXPECT_EQ(record->getDeepCopyFcn(), copy);
    EXPECT_EQ(record->getDeepCopyFcnName(), "copyMat");
    // From here on the names are not those of the storage type, nor is what it contains.
    EXPECT_EQ(record->getSizeOfFcn(), sizeOf);
    EXPECT_EQ(record->getSizeOfFcnName(), "getSizeFcn");
    EXPECT_EQ(record->getContainedDataFcn(), containedData);
    EXPECT_EQ(record->getContainedDataFcnName(), "getDataFcn");
    EXPECT_EQ(record->getContainedDataType(), DATA_TYPE_ID_INT16);
    EXPECT_EQ(record->getContainedDataNumDims(), 3u);
    EXPECT_EQ(record->getContainedDataDimsFcn(), containedDims);
    EXPECT_EQ(record->getContainedDataDimsFcnName(), "getDataDimsFcn");
    EXPECT_EQ(record->getUpdateContainedDataDimsFcn(), updateDims);
    EXPECT_EQ(record->getUpdateContainedDataDimsFcnName(), "updateDataDimsFcn");
    EXPECT_EQ(record->getDataConstructFcn(), dataConstruct);
    EXPECT_EQ(record->getDataConstructFcnName(), "dataConstructFcn");
}

TEST(ImageDataType, WhatAnOpaqueStorageLacksStaysUnset) {
    const StorageHook opaque(1);
    for (bool isSized : {true, false}) {
        ClientTable table;
        table.insertCustomDataTypeCallback("cv_Mat", isSized ? registerSizedMat : registerPlainMat);
        const int id = table.registerImageDataType(3, SSImageColorFormat_Lab, cColumn, DATA_TYPE_ID_INT16);
        const DataType* record = recordOf(table, id);
        EXPECT_EQ(record->getSize(), isSized ? 96 : -1);
        EXPECT_EQ(record->getConstructFcn(), isSized ? construct : nullptr);
        EXPECT_EQ(record->getSizeOfFcn(), nullptr);
        EXPECT_EQ(record->getSizeOfFcnName(), "");
        EXPECT_EQ(record->getContainedDataFcn(), nullptr);
        EXPECT_EQ(record->getContainedDataType(), DATA_TYPE_ID_INVALID);
        EXPECT_EQ(record->getContainedDataNumDims(), 0u);
        EXPECT_EQ(record->getDataConstructFcnName(), "");
        EXPECT_STREQ(record->getShortName(), "image");
    }
}

TEST(ImageDataType, WithoutAStorageTypeTheTableStaysAsItWas) {
    for (int state : {1, 2, -1, 100}) { // 1: without a callback for cv_Mat
        SCOPED_TRACE(state);
        const StorageHook hook(state);
        ClientTable table;
        EXPECT_RAISES(table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8),
                      "QuillaneTypes:general:InvalidDataTypeId", -10);
        EXPECT_EQ(table.getNumDataTypes(), 15u);
        EXPECT_EQ(table.getDataTypeId("Image_RGB_Row_uint8"), DATA_TYPE_ID_INVALID);
    }
    const StorageHook opaque(1);
    ClientTable table;
    table.insertCustomDataTypeCallback("cv_Mat", [](QLTypeSys::DataTypeTable*, const char*) { return 500; });
    EXPECT_RAISES(table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8),
                  "QuillaneTypes:general:InvalidDataTypeId", 500);
    EXPECT_EQ(table.getNumDataTypes(), 15u);
}

TEST(ImageDataType, AVetoTakesTheImageBackAndLeavesTheStorage) {
    ClientTable table;
    const auto client = table.install();
    client->vetoed = "Image_RGB_Row_uint8";
    EXPECT_RAISES(table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8),
                  "QuillaneTypes:general:DataType_WithIntrinsicFixptName", "Image_RGB_Row_uint8");
    EXPECT_EQ(table.getNumDataTypes(), 16u);
    EXPECT_EQ(table.getDataTypeId("Image_RGB_Row_uint8"), DATA_TYPE_ID_INVALID);
}

TEST(ImageDataType, ANameOfAnotherSourceIsRefused) {
    ClientTable table;
    table.registerDataType("Image_RGB_Row_uint8", dtSourceEnum, nullptr);
    EXPECT_RAISES(table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8),
                  "QuillaneTypes:general:DataType_SameNameAsExistingType", "Image_RGB_Row_uint8");
    EXPECT_EQ(table.getNumDataTypes(), 16u);
}

TEST(ImageDataType, ADecliningTableReplacesTheRecordUnderItsId) {
    ClientTable table;
    const int id = table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8);
    table.declines = true;
    EXPECT_EQ(table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8), id);
    EXPECT_EQ(table.getNumDataTypes(), 17u);
    EXPECT_EQ(DtGetDataTypeStorageId(&table, id), 14);
    EXPECT_STREQ(DtGetDataTypeShortName(&table, id), "image");
}

TEST(ImageDataType, WhereverAllocationFailsWhatIsThereStays) {
    for (unsigned long n = 1;; ++n) {
        SCOPED_TRACE(testing::Message() << "allocation " << n);
        ClientTable table;
        const int before = table.registerImageDataType(1, SSImageColorFormat_CFA, cRow, DATA_TYPE_ID_INT8);
        utFailAllocationAt(n);
        const std::string raised = testsupport::raisedBy(
            [&] { table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8); });
        const bool failed = utFailAllocationAt(0) >= n;
        EXPECT_EQ(raised, failed ? "Quillane:Services:OutOfMemory()" : "nothing thrown");
        for (int id = -1; id + 1 < static_cast<int>(table.getNumDataTypes()); ++id)
            EXPECT_EQ(table.getDataTypeId(DtGetDataTypeName(&table, id)), id);
        EXPECT_EQ(DtGetDataTypeSize(&table, before), static_cast<int>(sizeof(DynamicMatrix)));
        EXPECT_EQ(table.getDataTypeId("Image_RGB_Row_uint8") == DATA_TYPE_ID_INVALID, failed);
        const int id = table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8);
        EXPECT_EQ(DtGetDataTypeName(&table, id), std::string("Image_RGB_Row_uint8"));
        if (!failed) {
            EXPECT_EQ(n, 4u); // grounds of matrix and image, the image's properties
            break;
        }
    }
}

TEST(ImageDataType, AValueIsAMatrixThatIsShapedByItsFirstUpdate) {
    ClientTable table;
    const int id = table.registerImageDataType(3, SSImageColorFormat_RGB, cRow, DATA_TYPE_ID_UINT8);
    alignas(DynamicMatrix) unsigned char memory[sizeof(DynamicMatrix)];
    table.construct(id, memory);
    const auto& m = *reinterpret_cast<const DynamicMatrix*>(memory);
    EXPECT_TRUE(m.dims.empty()); // an image is no matrix type, so its values are not shaped by construction
    const unsigned long dims[] = {480, 640, 3};
    DtGetUpdateContainedDataDimsFcn(&table, id)(3, dims, 1, memory);
    EXPECT_EQ(DtGetContainedWidth(&table, id, memory), 480u * 640 * 3);
    std::memset(table.containedData(id, memory), 7, 480 * 640 * 3);
    table.destruct(id, memory);
    EXPECT_EQ(QLTypeSys::DynamicMatrixMemoryManager::GetMemoryManager().numBlocks(), 0u);
}

} // namespace
