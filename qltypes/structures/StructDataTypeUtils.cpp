#include "qltypes/structures/StructDataTypeUtils.h"

#include "qltypes/host/Failure_internal.h"
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

using QLTypeSys::DataType;
using QLTypeSys::DataTypeTable;
using QLTypeSys::ImmediateElementAccess;
namespace failure = QLTypeSys::failure;

// --- The shapes ------------------------------------------------------------------------------------------------------

namespace {

constexpr const char* category = "Quillane:DataType";

DataType* record(const DataTypeTable* table, int id) {
    return table->getDataTypeAt(static_cast<unsigned long>(id + 1));
}

long count(const DataTypeTable* table, int id, long (StructDataType::*getter)() const) {
    return DtIsStructType(table, id) ? (DtGetStructDataTypeObject_AliasedThruIfNeeded(table, id)->*getter)() : 0;
}

StructElement* element(const DataTypeTable* table, int id, long index) {
    return DtGetStructDataTypeObject_AliasedThruIfNeeded(table, id)->getElements()[static_cast<std::size_t>(index)];
}

ImmediateElementAccess immediate(const DataTypeTable* table, int id) { return ImmediateElementAccess(table, id); }

template <class Value>
qlsvDiagnosticImpl* set(DataTypeTable* table, int id, long index, void (StructElement::*setter)(Value), Value value) {
    (element(table, id, index)->*setter)(value);
    return nullptr;
}

const char* textOf(const char* blockName) { return blockName ? blockName : ""; }

} // namespace

// clang-format off

// --- The record ------------------------------------------------------------------------------------------------------

StructDataType* DtGetStructDataTypeObject(const QLTypeSys::DataTypeTable* table, int id) { return static_cast<StructDataType*>(record(table, id)); }
StructDataType* DtGetStructDataTypeObject_AliasedThruIfNeeded(const QLTypeSys::DataTypeTable* table, int id) { return static_cast<StructDataType*>(table->getDataTypeAliasedThruTo(id)); }
BusDataType* DtGetBusDataTypeObject(const QLTypeSys::DataTypeTable* table, int id) { return static_cast<BusDataType*>(record(table, id)); }
BusDataType* DtGetBusDataTypeObject_AliasedThruIfNeeded(const QLTypeSys::DataTypeTable* table, int id) { return static_cast<BusDataType*>(table->getDataTypeAliasedThruTo(id)); }

// --- Counts ----------------------------------------------------------------------------------------------------------

long DtGetDataTypeNumElements(const QLTypeSys::DataTypeTable* table, int id) { return count(table, id, &StructDataType::getNumElements); }
long DtGetDataTypeNumFlatElements(const QLTypeSys::DataTypeTable* table, int id) { return count(table, id, &StructDataType::getNumFlatElements); }
long DtGetDataTypeNumRawElements(const QLTypeSys::DataTypeTable* table, int id) { return count(table, id, &StructDataType::getNumRawElements); }
long DtGetDataTypeNumDFSElements(const QLTypeSys::DataTypeTable* table, int id) { return count(table, id, &StructDataType::getNumDFSElements); }

// --- Immediate elements ----------------------------------------------------------------------------------------------

const char* DtGetDataTypeElementName(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getName(index); }
int DtGetDataTypeElementDataTypeId(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getDataTypeId(index); }
int DtGetDataTypeElementUnitId(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getUnitId(index); }
int DtGetDataTypeElementSamplingMode(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getSamplingMode(index); }
int DtGetDataTypeElementSignalType(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getSignalType(index); }
int DtGetDataTypeElementDimensionsMode(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getDimensionsMode(index); }
long DtGetDataTypeElementNumDimensions(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getNumDimensions(index); }
const long* DtGetDataTypeElementDimensions(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getDimensions(index); }
const int* DtGetDataTypeElementDimensionsAsInt(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getDimensionsAsInt(index, ObsoleteIntDimsKey{}); }
long DtGetDataTypeElementDimension(const QLTypeSys::DataTypeTable* table, int id, long index, long dimIndex) { return immediate(table, id).getDimensions(index)[dimIndex]; }
int DtGetDataTypeElementSymbDimsId(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getSymbDimsId(index); }
long DtGetDataTypeElementOffset(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getOffset(index); }
long DtGetDataTypeElementWidth(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getWidth(index); }
int DtGetDataTypeElementPadding(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getPadding(index); }
long DtGetDataTypeElementVarDimsOffset(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getVarDimsOffset(index); }
long DtGetDataTypeElementComplexWidth(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).getComplexWidth(index); }
bool DtGetDataTypeElementIsScalar(const QLTypeSys::DataTypeTable* table, int id, long index) { return immediate(table, id).isScalar(index); }

// --- Element setters -------------------------------------------------------------------------------------------------

qlsvDiagnosticImpl* DtSetDataTypeElementUnitId(QLTypeSys::DataTypeTable* table, const char*, int id, long index, int unitId) { return set(table, id, index, &StructElement::setUnitId, unitId); }
qlsvDiagnosticImpl* DtSetDataTypeElementSignalType(QLTypeSys::DataTypeTable* table, const char*, int id, long index, int signalType) { return set(table, id, index, &StructElement::setSignalType, signalType); }
qlsvDiagnosticImpl* DtSetDataTypeElementSymbDimsId(QLTypeSys::DataTypeTable* table, const char*, int id, long index, int symbDimsId) { return set(table, id, index, &StructElement::setSymbDimsId, symbDimsId); }
qlsvDiagnosticImpl* DtSetDataTypeElementSamplingMode(QLTypeSys::DataTypeTable* table, const char*, int id, long index, int samplingMode) { return set(table, id, index, &StructElement::setSamplingMode, samplingMode); }
qlsvDiagnosticImpl* DtSetDataTypeElementDimensionsMode(QLTypeSys::DataTypeTable* table, const char*, int id, long index, int dimensionsMode) { return set(table, id, index, &StructElement::setDimensionsMode, dimensionsMode); }
qlsvDiagnosticImpl* DtSetDataTypeElementMin(QLTypeSys::DataTypeTable* table, const char*, int id, long index, double value) { return set(table, id, index, &StructElement::setMin, value); }
qlsvDiagnosticImpl* DtSetDataTypeElementMax(QLTypeSys::DataTypeTable* table, const char*, int id, long index, double value) { return set(table, id, index, &StructElement::setMax, value); }
qlsvDiagnosticImpl* DtSetDataTypeElementNumDimensions(QLTypeSys::DataTypeTable* table, const char*, int id, long index, long numDims) { return set(table, id, index, &StructElement::setNumDimensions, numDims); }

// clang-format on

qlsvDiagnosticImpl* DtSetDataTypeElementDimension(DataTypeTable* table, const char*, int id, long index, long dimIndex,
                                                  long value) {
    element(table, id, index)->setDimension(dimIndex, value);
    return nullptr;
}

qlsvDiagnosticImpl* DtSetDataTypeNumElements(DataTypeTable* table, const char* blockName, int id, long count) {
    StructDataType* const structure = DtGetStructDataTypeObject(table, id);
    if (count == 0) // kept: the block comes second here and first in the index check
        return failure::diagnosticOf(
            failure::message(category, "InvalidDataTypeNumElements", structure->getName(), textOf(blockName)));
    structure->setNumElements(count);
    return nullptr;
}

qlsvDiagnosticImpl* DtCheckDataTypeElementIndex(const DataTypeTable* table, const char* blockName, int id, long index) {
    if (!DtIsDataTypeIdValid(table, id))
        return failure::diagnosticOf(failure::message(category, "InvalidDataTypeId", textOf(blockName), id));
    if (index < 0 || index >= DtGetDataTypeNumElements(table, id))
        return failure::diagnosticOf(
            failure::message(category, "InvalidDataTypeElementIndex", textOf(blockName), index, id));
    return nullptr;
}

// --- Buses -----------------------------------------------------------------------------------------------------------

bool DtGetDataTypeIsBus(const DataTypeTable* table, int id) {
    return DtIsStructType(table, id) && DtGetStructDataTypeObject_AliasedThruIfNeeded(table, id)->isBusType();
}
