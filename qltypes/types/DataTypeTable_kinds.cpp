// Registration of strings, date-time types, dynamic matrices and images, and what depends on the kind of a record.
#include "qltypes/types/DataTypeTable.h"

namespace QLTypeSys {

int DataTypeTable::registerStringDataType(unsigned long, const char*) { return DATA_TYPE_ID_INVALID; }

int DataTypeTable::registerDateTimeDataType(const QLDateTime::DateTimeType&, const char*) {
    return DATA_TYPE_ID_INVALID;
}

int DataTypeTable::registerDynamicMatrixDataType(int, unsigned long) { return DATA_TYPE_ID_INVALID; }

int DataTypeTable::registerImageDataType(unsigned long, SSImageColorFormat, SSImageDataLayout, BuiltInDTypeId) {
    return DATA_TYPE_ID_INVALID;
}

std::string DataTypeTable::getDTACompliantString(int id) const {
    const DataType* record = recordAt(id);
    const std::string name = record->getName();
    switch (record->getType()) {
    case dtqFixpt:
        return "fixdt('" + name + "')";
    case dtqEnum:
        return "Enum: " + name;
    case dtqStruct:
        return "Bus: " + name;
    default:
        return name;
    }
}

} // namespace QLTypeSys
