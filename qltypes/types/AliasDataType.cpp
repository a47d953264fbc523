#include "qltypes/types/AliasDataType.h"

#include "qltypes/host/Failure_internal.h"

namespace QLTypeSys {

AliasDataType::AliasDataType(int id, const std::string& name, DataTypeSource source, const DataType* aliasedTo,
                             const DataType* aliasedThruTo)
    : DataType(id, name, source), aliasedTo_(aliasedTo), aliasedThruTo_(aliasedThruTo) {
    size_ = aliasedThruTo->getSize();
    plainCopy_ = aliasedThruTo->getPlainCopy();
    plainConstruct_ = aliasedThruTo->getPlainConstruct();
    plainDestroy_ = aliasedThruTo->getPlainDestroy();
}

AliasDataType::AliasDataType(DataType* existing, const DataType* aliasedTo, const DataType* aliasedThruTo)
    : AliasDataType(existing->getId(), existing->getName(), existing->getDataTypeSource(), aliasedTo, aliasedThruTo) {}

AliasDataType::~AliasDataType() = default;

void AliasDataType::refuse(const char* property) const {
    failure::raise(QuillaneTypes::general::CannotSetPropertyOfAliasType(property, getName()));
}

// clang-format off

// --- Own answers -----------------------------------------------------------------------------------------------------

int AliasDataType::getIdAliasedTo() const { return aliasedTo_->getId(); }
int AliasDataType::getIdAliasedThruTo() const { return aliasedThruTo_->getId(); }
bool AliasDataType::getIsAliasToLocked() const { return true; }
std::vector<int> AliasDataType::dependsOn() const { return {aliasedTo_->getId()}; }
void AliasDataType::updateAliasedToType(DataType* type) { aliasedTo_ = type; }
void AliasDataType::updateAliasedThruToType(DataType* type) { aliasedThruTo_ = type; }

// --- Forwards --------------------------------------------------------------------------------------------------------

ConvertBetweenFcn AliasDataType::getConvertBetweenFcn() const { return aliasedThruTo_->getConvertBetweenFcn(); }
ConstructFcn AliasDataType::getConstructFcn() const { return aliasedThruTo_->getConstructFcn(); }
const std::string& AliasDataType::getConstructFcnName() const { return aliasedThruTo_->getConstructFcnName(); }
DestructFcn AliasDataType::getDestructFcn() const { return aliasedThruTo_->getDestructFcn(); }
const std::string& AliasDataType::getDestructFcnName() const { return aliasedThruTo_->getDestructFcnName(); }
DeepCopyFcn AliasDataType::getDeepCopyFcn() const { return aliasedThruTo_->getDeepCopyFcn(); }
const std::string& AliasDataType::getDeepCopyFcnName() const { return aliasedThruTo_->getDeepCopyFcnName(); }
SerializeFcn AliasDataType::getSerializeFcn() const { return aliasedThruTo_->getSerializeFcn(); }
const std::string& AliasDataType::getSerializeFcnName() const { return aliasedThruTo_->getSerializeFcnName(); }
DeserializeFcn AliasDataType::getDeserializeFcn() const { return aliasedThruTo_->getDeserializeFcn(); }
const std::string& AliasDataType::getDeserializeFcnName() const { return aliasedThruTo_->getDeserializeFcnName(); }
SerializeSizeFcn AliasDataType::getSerializeSizeFcn() const { return aliasedThruTo_->getSerializeSizeFcn(); }
const std::string& AliasDataType::getSerializeSizeFcnName() const { return aliasedThruTo_->getSerializeSizeFcnName(); }
SizeOfFcn AliasDataType::getSizeOfFcn() const { return aliasedThruTo_->getSizeOfFcn(); }
const std::string& AliasDataType::getSizeOfFcnName() const { return aliasedThruTo_->getSizeOfFcnName(); }
ContainedDataFcn AliasDataType::getContainedDataFcn() const { return aliasedThruTo_->getContainedDataFcn(); }
const std::string& AliasDataType::getContainedDataFcnName() const { return aliasedThruTo_->getContainedDataFcnName(); }
int AliasDataType::getContainedDataType() const { return aliasedThruTo_->getContainedDataType(); }
unsigned long AliasDataType::getContainedDataNumDims() const { return aliasedThruTo_->getContainedDataNumDims(); }
ContainedDataDimsFcn AliasDataType::getContainedDataDimsFcn() const { return aliasedThruTo_->getContainedDataDimsFcn(); }
const std::string& AliasDataType::getContainedDataDimsFcnName() const { return aliasedThruTo_->getContainedDataDimsFcnName(); }
CoderPropertiesFcn AliasDataType::getCoderPropertiesFcn() const { return aliasedThruTo_->getCoderPropertiesFcn(); }
const std::string& AliasDataType::getCoderPropertiesFcnName() const { return aliasedThruTo_->getCoderPropertiesFcnName(); }
DataConstructFcn AliasDataType::getDataConstructFcn() const { return aliasedThruTo_->getDataConstructFcn(); }
const std::string& AliasDataType::getDataConstructFcnName() const { return aliasedThruTo_->getDataConstructFcnName(); }
IsPositiveFcn AliasDataType::getIsPositiveFcn() const { return aliasedThruTo_->getIsPositiveFcn(); }
IsNegativeFcn AliasDataType::getIsNegativeFcn() const { return aliasedThruTo_->getIsNegativeFcn(); }
GreaterThanFcn AliasDataType::getGreaterThanFcn() const { return aliasedThruTo_->getGreaterThanFcn(); }
GreaterEqualFcn AliasDataType::getGreaterEqualFcn() const { return aliasedThruTo_->getGreaterEqualFcn(); }
bool AliasDataType::getIsPointerType() const { return aliasedThruTo_->getIsPointerType(); }
HostToTargetFcn AliasDataType::getHostToTargetFcn() const { return aliasedThruTo_->getHostToTargetFcn(); }
TargetToHostFcn AliasDataType::getTargetToHostFcn() const { return aliasedThruTo_->getTargetToHostFcn(); }
int AliasDataType::getTargetSize() const { return aliasedThruTo_->getTargetSize(); }
int AliasDataType::getStorageId() const { return aliasedThruTo_->getStorageId(); }
const void* AliasDataType::getGround() const { return aliasedThruTo_->getGround(); }
bool AliasDataType::getDefaultGround() const { return aliasedThruTo_->getDefaultGround(); }
bool AliasDataType::getConstructedGround() const { return aliasedThruTo_->getConstructedGround(); }
const void* AliasDataType::getProperties() const { return aliasedThruTo_->getProperties(); }
int AliasDataType::getPropertiesSize() const { return aliasedThruTo_->getPropertiesSize(); }
bool AliasDataType::hasFxpDataTypeProp() const { return aliasedThruTo_->hasFxpDataTypeProp(); }
bool AliasDataType::isBool() const { return aliasedThruTo_->isBool(); }
bool AliasDataType::isNumericOrBool() const { return aliasedThruTo_->isNumericOrBool(); }
bool AliasDataType::isNumericNotBool() const { return aliasedThruTo_->isNumericNotBool(); }
bool AliasDataType::isNumericNotBuiltInClassic9() const { return aliasedThruTo_->isNumericNotBuiltInClassic9(); }
bool AliasDataType::isEnum() const { return aliasedThruTo_->isEnum(); }
const fxpDataTypeProp* AliasDataType::getFxpDataTypeProp() const { return aliasedThruTo_->getFxpDataTypeProp(); }
bool AliasDataType::isHalf() const { return aliasedThruTo_->isHalf(); }
bool AliasDataType::isImage() const { return aliasedThruTo_->isImage(); }
bool AliasDataType::isDynamicMatrix() const { return aliasedThruTo_->isDynamicMatrix(); }
bool AliasDataType::isBuiltInClassic9() const { return aliasedThruTo_->isBuiltInClassic9(); }
bool AliasDataType::isBuiltInIntClassic6() const { return aliasedThruTo_->isBuiltInIntClassic6(); }
bool AliasDataType::isBuiltInIntUnsignedClassic3() const { return aliasedThruTo_->isBuiltInIntUnsignedClassic3(); }
bool AliasDataType::isBuiltInIntSignedClassic3() const { return aliasedThruTo_->isBuiltInIntSignedClassic3(); }
bool AliasDataType::isNumericOrBoolAndContainerCouldStoreNegatives() const { return aliasedThruTo_->isNumericOrBoolAndContainerCouldStoreNegatives(); }
bool AliasDataType::isFloatDataType() const { return aliasedThruTo_->isFloatDataType(); }
bool AliasDataType::isIntDataType() const { return aliasedThruTo_->isIntDataType(); }
bool AliasDataType::isUnsignedIntDataType() const { return aliasedThruTo_->isUnsignedIntDataType(); }
bool AliasDataType::isSignedIntDataType() const { return aliasedThruTo_->isSignedIntDataType(); }
bool AliasDataType::isSignedFixptDT() const { return aliasedThruTo_->isSignedFixptDT(); }
bool AliasDataType::canContainNegativeNumbers() const { return aliasedThruTo_->canContainNegativeNumbers(); }
bool AliasDataType::isAtomic() const { return aliasedThruTo_->isAtomic(); }
bool AliasDataType::groundHasNonZeroStoredValue() const { return aliasedThruTo_->groundHasNonZeroStoredValue(); }
void AliasDataType::deepCopyScalarElement(const void* src, void* dst) const { aliasedThruTo_->deepCopyScalarElement(src, dst); }
void AliasDataType::serializeScalarElement(const void* src, void* dst, unsigned long a, unsigned long b) const { aliasedThruTo_->serializeScalarElement(src, dst, a, b); }
void AliasDataType::deserializeScalarElement(const void* src, void* dst, unsigned long a, unsigned long b) const { aliasedThruTo_->deserializeScalarElement(src, dst, a, b); }
unsigned long AliasDataType::serializeSizeScalarElement(const void* src) const { return aliasedThruTo_->serializeSizeScalarElement(src); }
void AliasDataType::constructScalarElement(void* p) const { aliasedThruTo_->constructScalarElement(p); }
void AliasDataType::destroyScalarElement(void* p) const { aliasedThruTo_->destroyScalarElement(p); }

// --- Refuses ---------------------------------------------------------------------------------------------------------

void AliasDataType::setSize(int) { refuse("DataTypeSize"); }
void AliasDataType::setConvertBetweenFcn(ConvertBetweenFcn) { refuse("ConvertBetween"); }
void AliasDataType::setConstructFcn(ConstructFcn) { refuse("Construct"); }
void AliasDataType::setConstructFcnName(const std::string&) { refuse("ConstructName"); }
void AliasDataType::setDestructFcn(DestructFcn) { refuse("Destruct"); }
void AliasDataType::setDestructFcnName(const std::string&) { refuse("DestructName"); }
void AliasDataType::setDeepCopyFcn(DeepCopyFcn) { refuse("DeepCopy"); }
void AliasDataType::setDeepCopyFcnName(const std::string&) { refuse("DeepCopyName"); }
void AliasDataType::setSerializeFcn(SerializeFcn) { refuse("Serialize"); }
void AliasDataType::setSerializeFcnName(const std::string&) { refuse("SerializeName"); }
void AliasDataType::setDeserializeFcn(DeserializeFcn) { refuse("Deserialize"); }
void AliasDataType::setDeserializeFcnName(const std::string&) { refuse("DeserializeName"); }
void AliasDataType::setSerializeSizeFcn(SerializeSizeFcn) { refuse("SerializeSize"); }
void AliasDataType::setSerializeSizeFcnName(const std::string&) { refuse("SerializeSizeName"); }
void AliasDataType::setSizeOfFcn(SizeOfFcn) { refuse("SizeOf"); }
void AliasDataType::setSizeOfFcnName(const std::string&) { refuse("SizeOfName"); }
void AliasDataType::setContainedDataFcn(ContainedDataFcn) { refuse("ContainedData"); }
void AliasDataType::setContainedDataFcnName(const std::string&) { refuse("ContainedDataName"); }
void AliasDataType::setContainedDataType(int) { refuse("ContainedDataType"); }
void AliasDataType::setContainedDataNumDims(unsigned long) { refuse("ContainedDataNumDims"); }
void AliasDataType::setContainedDataDimsFcn(ContainedDataDimsFcn) { refuse("ContainedDataDims"); }
void AliasDataType::setContainedDataDimsFcnName(const std::string&) { refuse("ContainedDataDimsName"); }
void AliasDataType::setUpdateContainedDataDimsFcn(UpdateContainedDataDimsFcn) { refuse("UpdateContainedDataDims"); }
void AliasDataType::setUpdateContainedDataDimsFcnName(const std::string&) { refuse("UpdateContainedDataDimsName"); }
void AliasDataType::setUpdateContainedDataDimFcn(UpdateContainedDataDimFcn) { refuse("UpdateContainedDataDim"); }
void AliasDataType::setUpdateContainedDataDimFcnName(const std::string&) { refuse("UpdateContainedDataDimName"); }
void AliasDataType::setCoderPropertiesFcn(CoderPropertiesFcn) { refuse("ContainedDataDims"); } // kept: this literal
void AliasDataType::setCoderPropertiesFcnName(const std::string&) { refuse("ContainedDataDimsName"); } // kept: this literal
void AliasDataType::setDataConstructFcn(DataConstructFcn) { refuse("DataConstruct"); }
void AliasDataType::setDataConstructFcnName(const std::string&) { refuse("DataConstructName"); }
void AliasDataType::setGreaterThanFcn(GreaterThanFcn) { refuse("GreaterThan"); }
void AliasDataType::setGreaterEqualFcn(GreaterEqualFcn) { refuse("GreaterEqual"); }
void AliasDataType::setIsNegativeFcn(IsNegativeFcn) { refuse("IsNegative"); }
void AliasDataType::setIsPositiveFcn(IsPositiveFcn) { refuse("IsPositive"); }
void AliasDataType::setStorageId(int) { refuse("StorageId"); }
void AliasDataType::setGround(const void*) { refuse("Ground"); }
void AliasDataType::setProperties(const void*) { refuse("Properties"); }
void AliasDataType::setPropertiesSize(int) { refuse("PropertiesSize"); }
void AliasDataType::setIsAtomic(bool) { refuse("IsAtomic"); }
void AliasDataType::setGroundHasNonZeroStoredValue(bool) { refuse("GroundHasNonZero"); }

// --- Does nothing ----------------------------------------------------------------------------------------------------

void AliasDataType::setIsPointerType(bool) {}
void AliasDataType::setHostToTargetFcn(HostToTargetFcn) {}
void AliasDataType::setTargetToHostFcn(TargetToHostFcn) {}
void AliasDataType::setTargetSize(int) {}
void AliasDataType::setDefaultGround(bool) {}
void AliasDataType::setConstructedGround(bool) {}
void AliasDataType::setIdAliasedTo(int) {}
void AliasDataType::setIdAliasedThruTo(int) {}

// --- Inherited on purpose --------------------------------------------------------------------------------------------
//
// Identity and marks of the alias itself: getId, getName, getShortName, the fixed-point marker, getDataTypeSource, the
// alias lock, the word for tests, isRawNumericNotBuiltInClassic9, the client's data, getIsType, getType, setType, print,
// the visit flag. kept: so are getUpdateContainedDataDimsFcn, getUpdateContainedDataDimFcn and their names, which answer
// null and empty here; the flat functions go to the end of the chain first.

// clang-format on

} // namespace QLTypeSys
