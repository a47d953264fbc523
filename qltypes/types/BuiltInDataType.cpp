#include "qltypes/types/BuiltInDataType.h"

#include "qltypes/types/BuiltInTypes_internal.h"

namespace QLTypeSys {

BuiltInDataType::BuiltInDataType(int id, const std::string& name, DataTypeSource source) : DataType(id, name, source) {
    setType(dtqBuiltIn);
}
BuiltInDataType::~BuiltInDataType() = default;

AutoDataType::AutoDataType() : BuiltInDataType(DATA_TYPE_ID_AUTO, "auto", dtSourceBuiltIn) {
    const FixedType& row = fixedType(DATA_TYPE_ID_AUTO);
    size_ = row.size;
    canContainNegativeNumbers_ = row.canContainNegativeNumbers;
    storageId_ = row.id;
    idAliasedTo_ = row.idAliasedTo;
    isAtomic_ = row.isAtomic;
    groundHasNonZeroStoredValue_ = row.groundHasNonZeroStoredValue;
    convertBetweenFcn_ = row.convertBetween;
    isPositiveFcn_ = row.isPositive;
    isNegativeFcn_ = row.isNegative;
    greaterThanFcn_ = row.greaterThan;
    greaterEqualFcn_ = row.greaterEqual;
}
AutoDataType::~AutoDataType() = default;

bool AutoDataType::getIsPointerType() const { return false; }

// clang-format off
void AutoDataType::setSize(int) {}
void AutoDataType::setConvertBetweenFcn(ConvertBetweenFcn) {}
void AutoDataType::setConstructFcn(ConstructFcn) {}
void AutoDataType::setConstructFcnName(const std::string&) {}
void AutoDataType::setDestructFcn(DestructFcn) {}
void AutoDataType::setDestructFcnName(const std::string&) {}
void AutoDataType::setDeepCopyFcn(DeepCopyFcn) {}
void AutoDataType::setDeepCopyFcnName(const std::string&) {}
void AutoDataType::setSerializeFcn(SerializeFcn) {}
void AutoDataType::setSerializeFcnName(const std::string&) {}
void AutoDataType::setDeserializeFcn(DeserializeFcn) {}
void AutoDataType::setDeserializeFcnName(const std::string&) {}
void AutoDataType::setSerializeSizeFcn(SerializeSizeFcn) {}
void AutoDataType::setSerializeSizeFcnName(const std::string&) {}
void AutoDataType::setSizeOfFcn(SizeOfFcn) {}
void AutoDataType::setSizeOfFcnName(const std::string&) {}
void AutoDataType::setContainedDataFcn(ContainedDataFcn) {}
void AutoDataType::setContainedDataFcnName(const std::string&) {}
void AutoDataType::setContainedDataType(int) {}
void AutoDataType::setContainedDataNumDims(unsigned long) {}
void AutoDataType::setContainedDataDimsFcn(ContainedDataDimsFcn) {}
void AutoDataType::setContainedDataDimsFcnName(const std::string&) {}
void AutoDataType::setCoderPropertiesFcn(CoderPropertiesFcn) {}
void AutoDataType::setCoderPropertiesFcnName(const std::string&) {}
void AutoDataType::setDataConstructFcn(DataConstructFcn) {}
void AutoDataType::setDataConstructFcnName(const std::string&) {}
void AutoDataType::setGreaterThanFcn(GreaterThanFcn) {}
void AutoDataType::setGreaterEqualFcn(GreaterEqualFcn) {}
void AutoDataType::setIsNegativeFcn(IsNegativeFcn) {}
void AutoDataType::setIsPositiveFcn(IsPositiveFcn) {}
void AutoDataType::setIsPointerType(bool) {}
void AutoDataType::setStorageId(int) {}
void AutoDataType::setGround(const void*) {}
void AutoDataType::setDefaultGround(bool) {}
void AutoDataType::setConstructedGround(bool) {}
void AutoDataType::setProperties(const void*) {}
void AutoDataType::setPropertiesSize(int) {}
void AutoDataType::setCGType(CG::Type*) {}
// clang-format on

} // namespace QLTypeSys
