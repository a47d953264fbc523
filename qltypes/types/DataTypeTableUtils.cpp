#include "qltypes/types/DataTypeTableUtils.h"

#include "qltypes/host/Failure_internal.h"
#include "qltypes/types/DataTypeTable.h"

using QLTypeSys::DataType;
using QLTypeSys::DataTypeTable;
namespace failure = QLTypeSys::failure;

// --- The shapes ------------------------------------------------------------------------------------------------------

namespace {

DataType* record(const DataTypeTable* table, int id) {
    return table->getDataTypeAt(static_cast<unsigned long>(id + 1));
}

const DataType* resolved(const DataTypeTable* table, int id) { return table->getDataTypeAliasedThruTo(id); }

template <class F>
bool has(const DataTypeTable* table, int id, F (DataType::*function)() const,
         const std::string& (DataType::*name)() const) {
    const DataType* type = resolved(table, id);
    return (type->*function)() != nullptr || !(type->*name)().empty();
}

std::string textOf(const char* name) { return name ? name : ""; }

template <class Parameter, class Value>
qlsvDiagnosticImpl* set(DataTypeTable* table, int id, void (DataType::*setter)(Parameter), const Value& value) {
    return failure::diagnosticFrom([&] { (record(table, id)->*setter)(value); });
}

template <class Parameter, class Value>
qlsvDiagnosticImpl* set(DataTypeTable* table, const char* blockName, int id, void (DataType::*setter)(Parameter),
                        const Value& value) {
    return failure::diagnosticFrom(blockName, [&] { (record(table, id)->*setter)(value); });
}

} // namespace

// clang-format off

// --- Direct reads ----------------------------------------------------------------------------------------------------

int DtGetDataTypeSize(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getSize(); }
int getDataTypeSize(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getSize(); }
const void* DtGetDataTypeGround(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getGround(); }
const void* BlockDtGetDataTypeGround(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getGround(); }
const void* getDataTypeGround(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getGround(); }
int DtGetDataTypeStorageId(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getStorageId(); }
int BlockDtGetDataTypeStorageId(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getStorageId(); }
const char* DtGetDataTypeName(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getName(); }
const char* DtGetDataTypeShortName(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getShortName(); }
std::string DtGetDataTypeNameStripDTOPrefix(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getNameStripDTOPrefix(); }
bool DtGetDataTypeNeedRegisterIdentifier(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getNeedRegisterIdentifier(); }
txArray_tag* DtGetDataTypeInterface(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getInterface(); }
CG::Type* DtGetDataTypeCGType(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getCGType(); }
bool DtGetIsPointerType(const QLTypeSys::DataTypeTable* table, int id) { return record(table, id)->getIsPointerType(); }
void DtSetDataTypeCGType(QLTypeSys::DataTypeTable* table, int id, CG::Type* type) { record(table, id)->setCGType(type); }
void DtSetDataTypeGroundHasNonZeroStoredValue(QLTypeSys::DataTypeTable* table, int id, bool hasNonZero) { record(table, id)->setGroundHasNonZeroStoredValue(hasNonZero); }
void DtSetDataTypeShortName(QLTypeSys::DataTypeTable* table, int id, const char* name) { record(table, id)->setShortName(textOf(name)); }

// --- Resolved reads --------------------------------------------------------------------------------------------------

QLTypeSys::ContainedDataFcn DtGetContainedDataFcn(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getContainedDataFcn(); }
const char* DtGetContainedDataFcnName(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getContainedDataFcnName().c_str(); }
int DtGetContainedDataType(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getContainedDataType(); }
unsigned long DtGetContainedDataNumDims(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getContainedDataNumDims(); }
QLTypeSys::ContainedDataDimsFcn DtGetContainedDataDimsFcn(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getContainedDataDimsFcn(); }
const char* DtGetContainedDataDimsFcnName(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getContainedDataDimsFcnName().c_str(); }
QLTypeSys::UpdateContainedDataDimsFcn DtGetUpdateContainedDataDimsFcn(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getUpdateContainedDataDimsFcn(); }
const char* DtGetUpdateContainedDataDimsFcnName(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getUpdateContainedDataDimsFcnName().c_str(); }
QLTypeSys::UpdateContainedDataDimFcn DtGetUpdateContainedDataDimFcn(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getUpdateContainedDataDimFcn(); }
QLTypeSys::SerializeFcn DtGetSerializeFcn(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getSerializeFcn(); }
const char* DtGetSerializeFcnName(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getSerializeFcnName().c_str(); }
QLTypeSys::DeserializeFcn DtGetDeserializeFcn(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getDeserializeFcn(); }
const char* DtGetDeserializeFcnName(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getDeserializeFcnName().c_str(); }
QLTypeSys::SerializeSizeFcn DtGetSerializeSizeFcn(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getSerializeSizeFcn(); }
const char* DtGetSerializeSizeFcnName(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getSerializeSizeFcnName().c_str(); }
QLTypeSys::SizeOfFcn DtGetSizeOfFcn(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getSizeOfFcn(); }
const char* DtGetSizeOfFcnName(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getSizeOfFcnName().c_str(); }
QLTypeSys::CoderPropertiesFcn DtGetCoderPropertiesFcn(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getCoderPropertiesFcn(); }
const char* DtGetCoderPropertiesFcnName(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getCoderPropertiesFcnName().c_str(); }
QLTypeSys::DataConstructFcn DtGetDataConstructFcn(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getDataConstructFcn(); }
const char* DtGetDataConstructFcnName(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getDataConstructFcnName().c_str(); }
int DtGetDataTypePropertiesSize(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->getPropertiesSize(); }
bool DtGetDataTypeGroundHasNonZeroStoredValue(const QLTypeSys::DataTypeTable* table, int id) { return resolved(table, id)->groundHasNonZeroStoredValue(); }

// --- Caller reads ----------------------------------------------------------------------------------------------------

QLTypeSys::ConvertBetweenFcn DtGetConvertBetweenFcn(const QLTypeSys::DataTypeTable* table, const char*, int id) { return resolved(table, id)->getConvertBetweenFcn(); }
QLTypeSys::ConstructFcn DtGetConstructFcn(const QLTypeSys::DataTypeTable* table, const char*, int id) { return resolved(table, id)->getConstructFcn(); }
const char* DtGetConstructFcnName(const QLTypeSys::DataTypeTable* table, const char*, int id) { return resolved(table, id)->getConstructFcnName().c_str(); }
QLTypeSys::DestructFcn DtGetDestructFcn(const QLTypeSys::DataTypeTable* table, const char*, int id) { return resolved(table, id)->getDestructFcn(); }
const char* DtGetDestructFcnName(const QLTypeSys::DataTypeTable* table, const char*, int id) { return resolved(table, id)->getDestructFcnName().c_str(); }
QLTypeSys::DeepCopyFcn DtGetDeepCopyFcn(const QLTypeSys::DataTypeTable* table, const char*, int id) { return resolved(table, id)->getDeepCopyFcn(); }
const char* DtGetDeepCopyFcnName(const QLTypeSys::DataTypeTable* table, const char*, int id) { return resolved(table, id)->getDeepCopyFcnName().c_str(); }
QLTypeSys::IsPositiveFcn DtGetIsPositiveFcn(const QLTypeSys::DataTypeTable* table, const char*, int id) { return resolved(table, id)->getIsPositiveFcn(); }
QLTypeSys::IsNegativeFcn DtGetIsNegativeFcn(const QLTypeSys::DataTypeTable* table, const char*, int id) { return resolved(table, id)->getIsNegativeFcn(); }
QLTypeSys::GreaterThanFcn DtGetGreaterThanFcn(const QLTypeSys::DataTypeTable* table, const char*, int id) { return resolved(table, id)->getGreaterThanFcn(); }
QLTypeSys::GreaterEqualFcn DtGetGreaterEqualFcn(const QLTypeSys::DataTypeTable* table, const char*, int id) { return resolved(table, id)->getGreaterEqualFcn(); }

// --- Whether the type at the end of the alias chain has the function -------------------------------------------------

bool DtHasConstructFcn(const QLTypeSys::DataTypeTable* table, int id) { return has(table, id, &DataType::getConstructFcn, &DataType::getConstructFcnName); }
bool DtHasDestructFcn(const QLTypeSys::DataTypeTable* table, int id) { return has(table, id, &DataType::getDestructFcn, &DataType::getDestructFcnName); }
bool DtHasDeepCopyFcn(const QLTypeSys::DataTypeTable* table, int id) { return has(table, id, &DataType::getDeepCopyFcn, &DataType::getDeepCopyFcnName); }
bool DtHasSerializeFcn(const QLTypeSys::DataTypeTable* table, int id) { return has(table, id, &DataType::getSerializeFcn, &DataType::getSerializeFcnName); }
bool DtHasDeserializeFcn(const QLTypeSys::DataTypeTable* table, int id) { return has(table, id, &DataType::getDeserializeFcn, &DataType::getDeserializeFcnName); }
bool DtHasSerializeSizeFcn(const QLTypeSys::DataTypeTable* table, int id) { return has(table, id, &DataType::getSerializeSizeFcn, &DataType::getSerializeSizeFcnName); }
bool DtHasSizeOfFcn(const QLTypeSys::DataTypeTable* table, int id) { return has(table, id, &DataType::getSizeOfFcn, &DataType::getSizeOfFcnName); }
bool DtHasContainedDataFcn(const QLTypeSys::DataTypeTable* table, int id) { return has(table, id, &DataType::getContainedDataFcn, &DataType::getContainedDataFcnName); }
bool DtHasContainedDataDimsFcn(const QLTypeSys::DataTypeTable* table, int id) { return has(table, id, &DataType::getContainedDataDimsFcn, &DataType::getContainedDataDimsFcnName); }
bool DtHasDataConstructFcn(const QLTypeSys::DataTypeTable* table, int id) { return has(table, id, &DataType::getDataConstructFcn, &DataType::getDataConstructFcnName); }
bool DtHasCoderPropertiesFcn(const QLTypeSys::DataTypeTable* table, int id) { return has(table, id, &DataType::getCoderPropertiesFcn, &DataType::getCoderPropertiesFcnName); }

// --- Plain setters ---------------------------------------------------------------------------------------------------

qlsvDiagnosticImpl* DtSetContainedDataType(QLTypeSys::DataTypeTable* table, int id, int containedId) { return set(table, id, &DataType::setContainedDataType, containedId); }
qlsvDiagnosticImpl* DtSetContainedDataNumDims(QLTypeSys::DataTypeTable* table, int id, unsigned long numDims) { return set(table, id, &DataType::setContainedDataNumDims, numDims); }
qlsvDiagnosticImpl* DtSetIsPointerType(QLTypeSys::DataTypeTable* table, int id, bool isPointer) { return set(table, id, &DataType::setIsPointerType, isPointer); }
qlsvDiagnosticImpl* DtSetSerializeFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::SerializeFcn f) { return set(table, id, &DataType::setSerializeFcn, f); }
qlsvDiagnosticImpl* DtSetSerializeFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name) { return set(table, id, &DataType::setSerializeFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetDeserializeFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::DeserializeFcn f) { return set(table, id, &DataType::setDeserializeFcn, f); }
qlsvDiagnosticImpl* DtSetDeserializeFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name) { return set(table, id, &DataType::setDeserializeFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetSerializeSizeFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::SerializeSizeFcn f) { return set(table, id, &DataType::setSerializeSizeFcn, f); }
qlsvDiagnosticImpl* DtSetSerializeSizeFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name) { return set(table, id, &DataType::setSerializeSizeFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetSizeOfFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::SizeOfFcn f) { return set(table, id, &DataType::setSizeOfFcn, f); }
qlsvDiagnosticImpl* DtSetSizeOfFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name) { return set(table, id, &DataType::setSizeOfFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetContainedDataFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::ContainedDataFcn f) { return set(table, id, &DataType::setContainedDataFcn, f); }
qlsvDiagnosticImpl* DtSetContainedDataFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name) { return set(table, id, &DataType::setContainedDataFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetContainedDataDimsFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::ContainedDataDimsFcn f) { return set(table, id, &DataType::setContainedDataDimsFcn, f); }
qlsvDiagnosticImpl* DtSetContainedDataDimsFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name) { return set(table, id, &DataType::setContainedDataDimsFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetUpdateContainedDataDimsFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::UpdateContainedDataDimsFcn f) { return set(table, id, &DataType::setUpdateContainedDataDimsFcn, f); }
qlsvDiagnosticImpl* DtSetUpdateContainedDataDimsFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name) { return set(table, id, &DataType::setUpdateContainedDataDimsFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetUpdateContainedDataDimFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::UpdateContainedDataDimFcn f) { return set(table, id, &DataType::setUpdateContainedDataDimFcn, f); }
qlsvDiagnosticImpl* DtSetUpdateContainedDataDimFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name) { return set(table, id, &DataType::setUpdateContainedDataDimFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetCoderPropertiesFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::CoderPropertiesFcn f) { return set(table, id, &DataType::setCoderPropertiesFcn, f); }
qlsvDiagnosticImpl* DtSetCoderPropertiesFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name) { return set(table, id, &DataType::setCoderPropertiesFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetDataConstructFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::DataConstructFcn f) { return set(table, id, &DataType::setDataConstructFcn, f); }
qlsvDiagnosticImpl* DtSetDataConstructFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name) { return set(table, id, &DataType::setDataConstructFcnName, textOf(name)); }

// --- Block setters ---------------------------------------------------------------------------------------------------

qlsvDiagnosticImpl* DtSetIsPositiveFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::IsPositiveFcn f) { return set(table, blockName, id, &DataType::setIsPositiveFcn, f); }
qlsvDiagnosticImpl* DtSetIsNegativeFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::IsNegativeFcn f) { return set(table, blockName, id, &DataType::setIsNegativeFcn, f); }
qlsvDiagnosticImpl* DtSetGreaterThanFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::GreaterThanFcn f) { return set(table, blockName, id, &DataType::setGreaterThanFcn, f); }
qlsvDiagnosticImpl* DtSetGreaterEqualFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::GreaterEqualFcn f) { return set(table, blockName, id, &DataType::setGreaterEqualFcn, f); }
qlsvDiagnosticImpl* DtSetDataTypeStorageId(QLTypeSys::DataTypeTable* table, const char* blockName, int id, int storageId) { return failure::diagnosticFrom(blockName, [&] { table->setDataTypeStorageId(id, storageId); }); }
qlsvDiagnosticImpl* DtSetDataTypeSize(QLTypeSys::DataTypeTable* table, const char* blockName, int id, int size) { return set(table, blockName, id, &DataType::setSize, size); }
qlsvDiagnosticImpl* DtSetDataTypePropertiesSize(QLTypeSys::DataTypeTable* table, const char* blockName, int id, int size) { return set(table, blockName, id, &DataType::setPropertiesSize, size); }
qlsvDiagnosticImpl* DtSetDataTypeGround(QLTypeSys::DataTypeTable* table, const char* blockName, int id, const void* ground) { return set(table, blockName, id, &DataType::setGround, ground); }
qlsvDiagnosticImpl* DtSetConvertBetweenFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::ConvertBetweenFcn f) { return set(table, blockName, id, &DataType::setConvertBetweenFcn, f); }
qlsvDiagnosticImpl* DtSetConstructFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::ConstructFcn f) { return set(table, blockName, id, &DataType::setConstructFcn, f); }
qlsvDiagnosticImpl* DtSetConstructFcnName(QLTypeSys::DataTypeTable* table, const char* blockName, int id, const char* name) { return set(table, blockName, id, &DataType::setConstructFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetDestructFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::DestructFcn f) { return set(table, blockName, id, &DataType::setDestructFcn, f); }
qlsvDiagnosticImpl* DtSetDestructFcnName(QLTypeSys::DataTypeTable* table, const char* blockName, int id, const char* name) { return set(table, blockName, id, &DataType::setDestructFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetDeepCopyFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::DeepCopyFcn f) { return set(table, blockName, id, &DataType::setDeepCopyFcn, f); }
qlsvDiagnosticImpl* DtSetDeepCopyFcnName(QLTypeSys::DataTypeTable* table, const char* blockName, int id, const char* name) { return set(table, blockName, id, &DataType::setDeepCopyFcnName, textOf(name)); }
qlsvDiagnosticImpl* DtSetDataTypeProperties(QLTypeSys::DataTypeTable* table, const char* blockName, int id, const void* properties) { return set(table, blockName, id, &DataType::setProperties, properties); }

// --- Forwards to the member of the table -----------------------------------------------------------------------------

int DtGetDataTypeId(const QLTypeSys::DataTypeTable* table, const char* name) { return table->getDataTypeId(name); }
qlsvDiagnosticImpl* DtRegisterDataType(QLTypeSys::DataTypeTable* table, const char* blockName, const char* name, DataTypeSource source, int* id) { return DataTypeTable::RegisterDataType(table, blockName, name, source, id); }
bool DtIsDataTypeIdValid(const QLTypeSys::DataTypeTable* table, int id) { return table->isDataTypeIdValid(id); }
int DtGetDataTypeIdAliasedTo(const QLTypeSys::DataTypeTable* table, int id) { return table->getDataTypeIdAliasedTo(id); }
bool DtIsEnumType(const QLTypeSys::DataTypeTable* table, int id) { return table->isEnumType(id); }
bool DtIsFixptDTNotScaledDouble(const QLTypeSys::DataTypeTable* table, int id) { return table->IsFixptDTNotScaledDouble(id); }
bool DataTypeNumericNonBoolean(const QLTypeSys::DataTypeTable* table, int id) { return table->IsDataTypeNumericNonBoolean(id); }
bool DataTypeNumericOrBoolean(const QLTypeSys::DataTypeTable* table, int id) { return table->IsDataTypeNumericOrBoolean(id); }
bool DtCheckIfNonZeroArray(const QLTypeSys::DataTypeTable* table, const void* data, int count, int id, bool isComplex) { return table->checkIfNonZeroArray(data, count, id, isComplex); }
bool DtIsImplementedAsDynamicMatrixType(const QLTypeSys::DataTypeTable* table, int id) { return table->IsImplementedAsDynamicMatrixDataType(id); }
const void* DtGetDataTypeProperties(const QLTypeSys::DataTypeTable* table, const char* caller, int id) { return table->getDataTypeProperties(caller, id); }
const void* BlockDtGetDataTypeProperties(const QLTypeSys::DataTypeTable* table, const char* caller, int id) { return table->getDataTypeProperties(caller, id); }
bool IsPredefinedDataType(int id) { return DataTypeTable::isPredefinedDataType(id); }
bool IntrinsicFixptName(const char* name) { return DataTypeTable::isInstrinsicFixptName(name, nullptr); }
int GetBuiltInDataType(const char* name) { return DataTypeTable::getBuiltInDataType(name); }
int GetBuiltInDataType(const std::u16string& name) { return DataTypeTable::getBuiltInDataType(name); }
bool NameOfBuiltInDataType(const char* name) { return DataTypeTable::nameOfBuiltInDataType(name); }
bool NameOfBuiltInDataType(const std::u16string& name) { return DataTypeTable::nameOfBuiltInDataType(name); }
int qlGetBuiltInDataTypeSize(int id) { return DataTypeTable::getBuiltInDataTypeSize(id); }
const char* DtGetEnumTypeStringFromValue(const QLTypeSys::DataTypeTable* table, int id, int value) { return table->getEnumTypeStringFromValue(id, value); }
_qlDataTypeAccess_tag* DtGetDataTypeAccess(const QLTypeSys::DataTypeTable* table) { return table->getDataTypeAccess(); }
void DtSetDataTypeAccess(QLTypeSys::DataTypeTable* table, _qlDataTypeAccess_tag* access) { table->setDataTypeAccess(access); }
qlsvDiagnosticImpl* DtGetDTAErrorQueue(const QLTypeSys::DataTypeTable* table) { return table->getDtaErrorQueue(); }
void DtSetDTAErrorQueue(QLTypeSys::DataTypeTable* table, qlsvDiagnosticImpl* queue) { table->setDtaErrorQueue(queue); }
// clang-format on
