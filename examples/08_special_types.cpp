// Strings, dynamic matrices, images and times: registered, their values handled by identifier.
#include <cstdio>
#include <string>

#include "qlplatform/strings/Strings.h"
#include "qltypes/date_time/DateTimeType.h"
#include "qltypes/image/ImageDataType.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "qltypes/types/StringDataType.h"

using QLDateTime::AbsoluteTimeScale;
using QLDateTime::DateTimeStruct;
using QLDateTime::DateTimeType;
using QLTypeSys::StringDataType;

namespace {

void strings(QLTypeSys::DataTypeTable& table) {
    const int label = table.registerStringDataType(32, nullptr);
    const int text = table.registerStringDataType(0, nullptr);
    std::printf("%s is %s, %s is %s\n", DtGetDataTypeName(&table, label),
                DtGetStringDataTypeExpression(&table, label).c_str(), DtGetDataTypeName(&table, text),
                DtGetStringDataTypeExpression(&table, text).c_str());
    std::printf("the safer of the two is %s\n",
                DtGetDataTypeName(&table, DtGetSaferStringDataType(&table, label, text)));

    void* slot = nullptr; // the signal: one pointer, which stays where it is
    void* copy = nullptr;
    table.construct(label, &slot);
    StringDataType::writeUStringScalarToVoidPtrOutput(u"valve open", &slot, 0);
    table.deepCopy(label, &copy, &slot);
    StringDataType::writeUStringScalarToVoidPtrOutput(u"valve closed", &slot, 0);
    std::printf("signal '%s', copy '%s'\n", GetStdStringFromQLStringPointer(&slot).c_str(),
                GetStdStringFromQLStringPointer(&copy).c_str());
    table.destruct(label, &slot);
    table.destruct(label, &copy);
}

void matrices(QLTypeSys::DataTypeTable& table) {
    const int id = table.registerDynamicMatrixDataType(DATA_TYPE_ID_DOUBLE, 2);
    std::printf("\n%s holds %lu-dimensional data of %s\n", DtGetDataTypeName(&table, id),
                DtGetContainedDataNumDims(&table, id), DtGetDataTypeName(&table, DtGetContainedDataType(&table, id)));

    alignas(8) unsigned char value[256];
    if (table.sizeOf(id) > sizeof value) return;
    table.construct(id, value);
    const unsigned long dims[] = {2, 3};
    const double data[] = {1, 2, 3, 4, 5, 6};
    table.dataConstruct(id, 2, dims, sizeof(double), data, value);
    const auto* held = static_cast<const double*>(table.containedData(id, value));
    std::printf("%lu elements, the last is %g\n", DtGetContainedWidth(&table, id, value), held[5]);

    const unsigned long narrower[] = {2, 2}; // within the margin: the buffer stays where it is
    DtGetUpdateContainedDataDimsFcn(&table, id)(2, narrower, sizeof(double), value);
    std::printf("%lu elements, %s\n", DtGetContainedWidth(&table, id, value),
                table.containedData(id, value) == held ? "in the same buffer" : "in another buffer");
    table.destruct(id, value);
}

void images(QLTypeSys::DataTypeTable& table) {
    const int id = table.registerImageDataType(3, SSImageColorFormat_RGB, SSImageDataLayout_RowMajorInterleaved,
                                               DATA_TYPE_ID_UINT8);
    std::printf("\n%s is stored as %s\n", DtGetDataTypeName(&table, id),
                DtGetDataTypeName(&table, DtGetDataTypeStorageId(&table, id)));
    try {
        table.registerImageDataType(2, SSImageColorFormat_HSV, SSImageDataLayout_RowMajorInterleaved,
                                    DATA_TYPE_ID_UINT8);
    } catch (const std::exception& e) {
        std::printf("refused: %s\n", e.what());
    }
}

void times(QLTypeSys::DataTypeTable& table) {
    const int tai = table.registerDateTimeDataType(DateTimeType::datetime_t(AbsoluteTimeScale::TAI), nullptr);
    const fxpDataTypeProp compact = {FXP_DT_FIXPT, 1, 64, 0, -32, 1.0, 0.0, 0};
    const int gps =
        table.registerDateTimeDataType(DateTimeType(QLDateTime::TimeSystem::getDefaultGPS(), compact), nullptr);
    for (const int id : {tai, gps})
        std::printf("%s%s: %d bits, counted from %s\n", id == tai ? "\n" : "", DtGetDataTypeName(&table, id),
                    DtGetDataTypeSize(&table, id), qlsvUtf8FromUtf16(table.getDateTimeType(id).getEpochStr()).c_str());

    const DateTimeStruct leap(2016, 12, 31, 23, 59, 60, 0.9996);
    std::printf("a leap second, to milliseconds: %s\n", qlsvUtf8FromUtf16(leap.getTimeStr(3)).c_str());
}

} // namespace

int main() {
    QLTypeSys::DataTypeTable table;
    strings(table);
    matrices(table);
    images(table);
    times(table);
}
