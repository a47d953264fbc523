// Flat functions that are no row of a shape: classifiers, derived questions, checks.
#include "qltypes/types/DataTypeTableUtils.h"

#include "qltypes/host/Failure_internal.h"
#include "qltypes/host/FeatureFlags.h"
#include "qltypes/types/DataTypeTable.h"

using QLTypeSys::DataType;
using QLTypeSys::DataTypeTable;
namespace failure = QLTypeSys::failure;

namespace {

const DataType* record(const DataTypeTable* table, int id) {
    return table->getDataTypeAt(static_cast<unsigned long>(id + 1));
}

bool isOneUnsignedBit(const fxpDataTypeProp* prop) {
    return prop && prop->FixedExponent == 0 && prop->SlopeAdjustmentFactor == 1.0 && prop->Bias == 0.0 &&
           prop->Signedness == 0 && prop->WordLength == 1;
}

bool effectiveTypesAreOn() { return QLFEAT_EnableEffectiveDataType->state() != 0; }

qlsvDiagnosticImpl* sizeNotSet(const DataType* type) {
    return failure::diagnosticOf(Quillane::DataType::DataTypeSizeHasNotBeenSet(type->getName()));
}

} // namespace

// --- Classifiers -----------------------------------------------------------------------------------------------------

bool CheckForBuiltInDataType(int id) { return id >= DATA_TYPE_ID_AUTO && id <= DATA_TYPE_ID_BOOLEAN; }
bool DtCheckForBuiltInDataType(int id) { return CheckForBuiltInDataType(id); }
bool BlockCheckForBuiltInDataType(int id) { return CheckForBuiltInDataType(id); }

bool DtIsAliasType(const DataTypeTable* table, int id) {
    return table->isDataTypeIdValid(id) && record(table, id)->getIdAliasedTo() != DATA_TYPE_ID_INVALID;
}

bool DtIsStructType(const DataTypeTable* table, int id) {
    return id != DATA_TYPE_ID_AUTO && table->getDataTypeAliasedThruTo(id)->getIsType(QLTypeSys::dtqStruct);
}

bool DtIsAnonymousStructType(const DataTypeTable* table, int id) {
    return record(table, id)->getDataTypeSource() == dtSourceAnonymous;
}

bool DtIsFixptDT(const DataTypeTable* table, int id) {
    return table->getDataTypeAliasedThruTo(id)->getIsType(QLTypeSys::dtqFixpt);
}

bool DtIsHalfPrecisionType(const DataTypeTable* table, int id) {
    return table->isDataTypeIdValid(id) && record(table, id)->isHalf();
}

bool DtIsDynamicMatrixType(const DataTypeTable* table, int id) {
    return table->isDataTypeIdValid(id) && record(table, id)->isDynamicMatrix();
}

bool DtIsImageType(const DataTypeTable* table, int id) {
    return table->isDataTypeIdValid(id) && record(table, id)->isImage();
}

bool DtIsIntDtype(const DataTypeTable* table, int id) { return record(table, id)->isIntDataType(); }
bool DtIsUnsignedIntDtype(const DataTypeTable* table, int id) { return record(table, id)->isUnsignedIntDataType(); }
bool DtIsSignedIntDtype(const DataTypeTable* table, int id) { return record(table, id)->isSignedIntDataType(); }
bool DtIsFloatDtype(const DataTypeTable* table, int id) { return record(table, id)->isFloatDataType(); }
bool DtIsSignedFixptDT(const DataTypeTable* table, int id) { return record(table, id)->isSignedFixptDT(); }

bool DtCanContainNegativeNumbers(const DataTypeTable* table, int id) {
    return record(table, id)->canContainNegativeNumbers();
}

bool DtIsBuiltInOrCustomFloat(const DataTypeTable* table, int id) {
    return DtIsFloatDtype(table, id) || DtIsHalfPrecisionType(table, id);
}

bool DtIsAtomic(const DataTypeTable* table, int id) {
    return id != DATA_TYPE_ID_AUTO && table->getDataTypeAliasedThruTo(id)->isAtomic();
}

bool DtIsUFix1(const DataTypeTable* table, int id) {
    const DataType* type = table->getDataTypeAliasedThruTo(id);
    return type->getIsType(QLTypeSys::dtqFixpt) && isOneUnsignedBit(type->getFxpDataTypeProp());
}

bool DtIsBooleanOrUFix1(const DataTypeTable* table, int id) {
    return table->getDataTypeAliasedThruTo(id)->isBool() || DtIsUFix1(table, id);
}

bool DtIsBuiltInOrUFix1(const DataTypeTable* table, int id) {
    return CheckForBuiltInDataType(table->getDataTypeAliasedThruTo(id)->getId()) || DtIsUFix1(table, id);
}

bool DtHasHalfPrecisionDataType(const DataTypeTable* table) {
    for (int id = DAGetNumQLDataTypes(); table->isDataTypeIdValid(id); ++id)
        if (record(table, id)->isHalf()) return true;
    return false;
}

// --- Derived questions -----------------------------------------------------------------------------------------------

int DAGetNumQLDataTypes() { return 14; }

bool DtHasDefaultConstructFcnOnly(const DataTypeTable* table, int id) {
    return DtHasConstructFcn(table, id) && !DtHasDataConstructFcn(table, id);
}

bool DtNeedCustomInitialization(const DataTypeTable* table, int id) {
    return DtHasConstructFcn(table, id) || table->IsStringDataType(id);
}

int DtGetDataTypeIdForPooling(const DataTypeTable* table, int id) {
    if (CheckForBuiltInDataType(id)) return id;
    return DtIsEnumType(table, id) ? DtGetDataTypeIdAliasedThruTo(table, id) : DtGetDataTypeStorageId(table, id);
}

int DtGetDataTypeIdAliasedThruTo(const DataTypeTable* table, int id) {
    return id == DATA_TYPE_ID_INVALID ? id : record(table, id)->getIdAliasedThruTo();
}

int getDataTypeIdAliasedThruTo(const DataTypeTable* table, int id) { return DtGetDataTypeIdAliasedThruTo(table, id); }

void* DtGetContainedData(const DataTypeTable* table, int id, void* p) { return DtGetContainedDataFcn(table, id)(p); }

unsigned long DtGetContainedWidth(const DataTypeTable* table, int id, const void* p) {
    std::vector<unsigned long> dims(DtGetContainedDataNumDims(table, id));
    DtGetContainedDataDimsFcn(table, id)(p, dims.data());
    unsigned long width = 1;
    for (const unsigned long dim : dims)
        width *= dim;
    return width;
}

int DtGetOrRegisterKnownCustomDataTypeId(const DataTypeTable* table, const char* name) {
    const int id = table->getDataTypeId(name);
    if (id != DATA_TYPE_ID_INVALID || !table->hasCustomDataTypeCallback(name)) return id;
    return const_cast<DataTypeTable*>(table)->executeCustomDataTypeCallback(name); // kept: a const table registers
}

void DtGetDataTypeDependenciesVector(const DataTypeTable* table, int id, std::vector<unsigned int>& ids) {
    const std::vector<int> dependencies = record(table, id)->dependsOn();
    ids.assign(dependencies.begin(), dependencies.end());
}

int DtGetEffectiveDataType(const DataTypeTable* table, int id) {
    const int contained = DtGetContainedDataType(table, id);
    return effectiveTypesAreOn() && contained >= 0 ? contained : id;
}

int DtGetEffectiveAliasedThruDataType(const DataTypeTable* table, int id) {
    return DtGetDataTypeIdAliasedThruTo(table, DtGetEffectiveDataType(table, id));
}

bool DtIsOpaqueMatrix(const DataTypeTable* table, int id) {
    return effectiveTypesAreOn() && table->isDataTypeIdValid(id) && DtHasContainedDataFcn(table, id);
}

// --- Checks ----------------------------------------------------------------------------------------------------------

qlsvDiagnosticImpl* DtCheckDataTypeId(const DataTypeTable* table, const char* blockName, int id) {
    return failure::diagnosticFrom(blockName, [&] { table->checkDataTypeId(id); });
}

qlsvDiagnosticImpl* DtCheckForInvalidDataTypeSize(const DataTypeTable* table) {
    for (int id = DATA_TYPE_ID_AUTO; table->isDataTypeIdValid(id); ++id) {
        const DataType* type = record(table, id);
        if (type->getIdAliasedTo() == DATA_TYPE_ID_INVALID && type->getSize() == -1) return sizeNotSet(type);
    }
    return nullptr;
}

qlsvDiagnosticImpl* DtGetDataTypeSizeWithCheck(const DataTypeTable* table, int id, int* size) {
    const DataType* type = record(table, id);
    *size = type->getSize();
    return *size == -1 ? sizeNotSet(type) : nullptr;
}

bool DtTableHasInvalidDataTypeSize(const DataTypeTable* table, unsigned int maxBits) {
    const _qlDataTypeAccess_tag* access = table->getDataTypeAccess();
    for (int position = 0; table->isDataTypeIdValid(position); ++position) {
        const int id = DtGetDataTypeIdAliasedThruTo(table, position);
        if (!DtIsFixptDT(table, id) && !(CheckForBuiltInDataType(id) && DtIsIntDtype(table, id))) continue;
        const fxpDataTypeProp* prop = access->getFxpDataTypeProp(access->table, "", id, 2);
        if (maxBits < static_cast<unsigned int>(prop->WordLength)) return true;
    }
    return false;
}

namespace QLTypeSys {

int GetNumDataTypes(const DataTypeTable* table) { return table->getNumDataTypes() - 1; }

void SetDataTypeIdAliasedTo(DataTypeTable* table, int id, int target) { table->setDataTypeIdAliasedTo(id, target); }

} // namespace QLTypeSys
