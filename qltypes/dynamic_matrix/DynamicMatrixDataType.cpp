#include "qltypes/dynamic_matrix/DynamicMatrixDataType.h"

#include <stdexcept>

#include "qltypes/dynamic_matrix/DynamicMatrix.h"
#include "qltypes/host/Failure_internal.h"
#include "qltypes/host/FeatureFlags.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace QLTypeSys {

DynamicMatrixDataType::DynamicMatrixDataType(DataTypeTable*, int id, const std::string& name)
    : DataType(id, name, dtSourceDynamicMatrix), displayName_(name) {
    qualifier_ = dtqDynamicMatrix;
}

DynamicMatrixDataType::~DynamicMatrixDataType() = default;

const char* DynamicMatrixDataType::getName() const {
    return QLTH_DisplayDynamicMatrixType->state() == 1 ? displayName_.c_str() : DataType::getName();
}

bool DynamicMatrixDataType::isDynamicMatrix() const { return true; }

void DynamicMatrixDataType::constructScalarElement(void* p) const {
    DataType::constructScalarElement(p);
    if (plainConstruct_) return;
    auto& matrix = *static_cast<DynamicMatrix*>(p);
    matrix.setDims(std::vector<long>(containedDataNumDims_));
    matrix.elementSize = static_cast<unsigned long>(elementSize_);
}

std::string DynamicMatrixDataType::ComputeName(const DataTypeTable* table, int elementId, unsigned long numDims) {
    const char* elementName = DtGetDataTypeName(table, elementId);
    if (!elementName) throw std::logic_error("basic_string::_M_construct null not valid");
    return "dynmat_" + std::string(elementName) + "_" + std::to_string(numDims) + "d_t";
}

void DynamicMatrixDataType::RegisterCallbacks(DataTypeTable* table, int elementId, unsigned long numDims) {
    displayName_ = ComputeName(table, elementId, numDims);
    elementSize_ = DtGetDataTypeSize(table, elementId);
    setSize(static_cast<int>(DynamicMatrix::getSizeFcn()));
    setContainedDataType(elementId);
    setContainedDataNumDims(numDims);

    const int id = getId();
    using failure::passOn;
    // clang-format off
    passOn(DtSetConstructFcn(table, "", id, DynamicMatrix::constructFcn));
    passOn(DtSetConstructFcnName(table, "", id, "constructFcn"));
    passOn(DtSetDestructFcn(table, "", id, DynamicMatrix::destructFcn));
    passOn(DtSetDestructFcnName(table, "", id, "destructFcn"));
    passOn(DtSetDeepCopyFcn(table, "", id, DynamicMatrix::copyFcn));
    passOn(DtSetDeepCopyFcnName(table, "", id, "copyFcn"));
    passOn(DtSetSizeOfFcn(table, id, DynamicMatrix::getSizeFcn));
    passOn(DtSetSizeOfFcnName(table, id, "getSizeFcn"));
    passOn(DtSetContainedDataFcn(table, id, DynamicMatrix::getDataFcn));
    passOn(DtSetContainedDataFcnName(table, id, "getDataFcn"));
    passOn(DtSetContainedDataDimsFcn(table, id, DynamicMatrix::getDataDimsFcn));
    passOn(DtSetContainedDataDimsFcnName(table, id, "getDataDimsFcn"));
    passOn(DtSetUpdateContainedDataDimsFcn(table, id, DynamicMatrix::updateDataDimsFcn));
    passOn(DtSetUpdateContainedDataDimsFcnName(table, id, "updateDataDimsFcn"));
    passOn(DtSetUpdateContainedDataDimFcn(table, id, DynamicMatrix::updateDataDimFcn));
    passOn(DtSetUpdateContainedDataDimFcnName(table, id, "updateDataDimFcn"));
    passOn(DtSetDataConstructFcn(table, id, DynamicMatrix::dataConstructFcn));
    passOn(DtSetDataConstructFcnName(table, id, "dataConstructFcn"));
    // clang-format on
}

} // namespace QLTypeSys
