// What the table knows of structures.
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/ElementIndex_internal.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/types/DataTypeTable.h"

namespace QLTypeSys {

int DataTypeTable::registerStructDataType(const char* name, DataTypeSource source, const char* blockName) {
    validateDataTypeName(name);
    int existing;
    if (isRegisteredAlready(name, source, existing)) return existing;
    return enter(std::make_unique<StructDataType>(nextId(), name, source), existing, blockName);
}

void DataTypeTable::clearStructureCaches(DataType* record) {
    if (record->getIsType(dtqStruct)) structures::ElementIndex::forget(static_cast<StructDataType&>(*record));
}

void DataTypeTable::noteStructureEdit() { structures::noteEdit(); }

namespace {

const StructDataType* structure(const DataType* record) { return static_cast<const StructDataType*>(record); }

} // namespace

// clang-format off
bool DataTypeTable::doesBusDTHaveComplexData(int id) const          { return structure(recordAt(id))->hasComplexData(); }
bool DataTypeTable::doesBusDTHaveFrameBasedElements(int id) const   { return structure(recordAt(id))->hasFrameBasedElements(); }
bool DataTypeTable::doesBusDTHaveVarDims(int id) const              { return structure(recordAt(id))->hasVarDims(); }
bool DataTypeTable::doesBusDTHaveAoB(int id) const                  { return structure(recordAt(id))->hasAOB(); }
bool DataTypeTable::doesBusDTHaveStringData(int id) const           { return structure(recordAt(id))->hasStringData(); }
bool DataTypeTable::doesBusDTHaveConstructFcn(int id) const         { return structure(recordAt(id))->hasConstructFcn(); }
bool DataTypeTable::doesBusDTHaveDestructFcn(int id) const          { return structure(recordAt(id))->hasDestructFcn(); }
bool DataTypeTable::doesBusDTHaveDeepCopyFcn(int id) const          { return structure(recordAt(id))->hasDeepCopyFcn(); }
bool DataTypeTable::doesBusDTHaveHalfPrecisionData(int id) const    { return structure(recordAt(id))->hasHalfPrecisionData(); }
// clang-format on

void DataTypeTable::doesBusDTContainArraysOfBusesOrVarDimsOrFrames(int id, bool* arraysOfBuses, bool* varDims,
                                                                   bool* frames) const {
    *arraysOfBuses = doesBusDTHaveAoB(id);
    *varDims = doesBusDTHaveVarDims(id);
    *frames = doesBusDTHaveFrameBasedElements(id);
}

// clang-format off
long DataTypeTable::getDataTypeRawElementIdxFromImmediateElementIdx(int id, long index) const   { return ImmediateElementAccess(this, id).getRawElementIdx(index); }
double DataTypeTable::getDataTypeFlatElementMin(int id, long index) const                       { return FlatElementAccess(this, id).getMin(index); }
double DataTypeTable::getDataTypeDFSElementMax(int id, long index) const                        { return DFSElementAccess(this, id).getMax(index); }
double DataTypeTable::getDataTypeDFSElementMin(int id, long index) const                        { return DFSElementAccess(this, id).getMin(index); }
double DataTypeTable::getDataTypeElementMax(int id, long index) const                           { return ImmediateElementAccess(this, id).getMax(index); }
double DataTypeTable::getDataTypeElementMin(int id, long index) const                           { return ImmediateElementAccess(this, id).getMin(index); }
// clang-format on

} // namespace QLTypeSys
