// Registration of strings, date-time types, dynamic matrices and images, and what depends on the kind of a record.
#include <utility>

#include "qltypes/date_time/DateTimeDataType.h"
#include "qltypes/dynamic_matrix/DynamicMatrixDataType.h"
#include "qltypes/host/Assert_internal.h"
#include "qltypes/host/FeatureFlags.h"
#include "qltypes/image/ImageDataType.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "qltypes/types/StringDataType.h"

namespace QLTypeSys {

int DataTypeTable::registerStringDataType(unsigned long maxLength, const char* name) {
    if (!name) registerStringDataType(1, "character"); // kept: a generated name never comes without it
    const std::string typeName = name ? name : StringDataType::getDataTypeName(maxLength);
    validateDataTypeName(typeName.c_str());
    int existing;
    if (isRegisteredAlready(typeName.c_str(), dtSourceString, existing)) return existing;
    auto record = std::make_unique<StringDataType>(nextId(), typeName, maxLength);
    record->setupDataTypeProperties();
    return enter(std::move(record), existing, name);
}

int DataTypeTable::registerDateTimeDataType(const QLDateTime::DateTimeType& type, const char* name) {
    const std::u16string wideName = type.getDataTypeName();
    const std::string typeName(wideName.begin(), wideName.end()); // ASCII
    validateDataTypeName(typeName.c_str());
    int existing;
    if (isRegisteredAlready(typeName.c_str(), dtSourceDateTime, existing)) return existing;
    auto record = std::make_unique<DateTimeDataType>(type, nextId(), typeName);
    record->setType(dtqDateTime);
    record->setIsAliasToLocked(true);
    record->setSize(type.getStorage().WordLength); // kept: bits, where other types have bytes
    record->setGroundHasNonZeroStoredValue(false);
    return enter(std::move(record), existing, name);
}

const QLDateTime::DateTimeType& DataTypeTable::getDateTimeType(int id) const {
    QLTYPES_ASSERT(recordAt(id)->getIsType(dtqDateTime));
    return static_cast<const DateTimeDataType*>(recordAt(id))->getDateTimeType();
}

int DataTypeTable::registerDynamicMatrixDataType(int elementId, unsigned long numDims) {
    checkDataTypeId(elementId);
    if (recordAt(elementId)->isDynamicMatrix()) return elementId;
    const std::string name = DynamicMatrixDataType::ComputeName(this, elementId, numDims);
    validateDataTypeName(name.c_str());
    int existing;
    if (isRegisteredAlready(name.c_str(), dtSourceDynamicMatrix, existing)) return existing;
    auto made = std::make_unique<DynamicMatrixDataType>(this, nextId(), name);
    DynamicMatrixDataType& record = *made;
    return enter(std::move(made), existing, name.c_str(), [&] { record.RegisterCallbacks(this, elementId, numDims); });
}

int DataTypeTable::registerImageDataType(unsigned long numChannels, SSImageColorFormat colorFormat,
                                         SSImageDataLayout dataLayout, BuiltInDTypeId baseType) {
    const std::string name = ImageDataType::ComputeAnonymousName(colorFormat, dataLayout, baseType, numChannels);
    validateDataTypeName(name.c_str());
    int existing;
    if (isRegisteredAlready(name.c_str(), dtSourceImage, existing)) return existing; // kept: whatever numChannels is

    int storageId = DATA_TYPE_ID_INVALID;
    switch (QLTH_ImageTypeImplementation->state()) {
    case 0:
        storageId = registerDynamicMatrixDataType(baseType, 3); // kept: it stays when the image is refused
        break;
    case 1:
        storageId = DtGetOrRegisterKnownCustomDataTypeId(this, "cv_Mat");
        break;
    }
    auto made = std::make_unique<ImageDataType>(this, nextId(), name, numChannels, colorFormat, dataLayout, baseType);
    checkDataTypeId(storageId);
    ImageDataType& record = *made;
    return enter(std::move(made), existing, name.c_str(), [&] {
        setDataTypeStorageId(record.getId(), storageId);
        record.RegisterCallbacks(this);
        record.setShortName("image");
    });
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
    case dtqString: // kept: a dynamic one has length 0 here
        return "stringtype(" + std::to_string(static_cast<const StringDataType*>(record)->getMaxStringLength()) + ")";
    default:
        return name;
    }
}

} // namespace QLTypeSys
