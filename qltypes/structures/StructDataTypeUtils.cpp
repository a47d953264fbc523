#include "qltypes/structures/StructDataTypeUtils.h"

#include <limits>
#include <stdexcept>

#include "qlplatform/strings/Strings.h"
#include "qltypes/host/Failure_internal.h"
#include "qltypes/structures/Arithmetic_internal.h"
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

using QLTypeSys::DataType;
using QLTypeSys::DataTypeTable;
using QLTypeSys::DFSElementAccess;
using QLTypeSys::ImmediateElementAccess;
using QLTypeSys::structures::wrappingAdd;
using QLTypeSys::structures::wrappingMultiply;
namespace failure = QLTypeSys::failure;

// --- The shapes ------------------------------------------------------------------------------------------------------

namespace {

constexpr const char* category = "Quillane:DataType";
constexpr double infinity = std::numeric_limits<double>::infinity();

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

DFSElementAccess dfs(const DataTypeTable* table, int id) { return DFSElementAccess(table, id); }

// The flat view without making one, which allocates: its answers are those of the depth-first view at this index.
long dfsIdx(const DataTypeTable* table, int id, long flatIdx) {
    const StructDataType* const structure = DtGetStructDataTypeObject_AliasedThruIfNeeded(table, id);
    if (structure->isFlatElementCacheEmpty()) dfs(table, id).genFlatIdxToDFSIdxCache();
    return structure->getDFSIdxFromFlatIdx(flatIdx);
}

std::string pathText(const DataTypeTable* table, int id, long dfsIdx) {
    return qlsvUtf8FromUtf16(dfs(table, id).getFullPathAsString(dfsIdx, false));
}

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

// --- Leaves ----------------------------------------------------------------------------------------------------------

const char* DtGetDataTypeFlatElementName(const QLTypeSys::DataTypeTable* table, int id, long flatIdx) { return dfs(table, id).getName(dfsIdx(table, id, flatIdx)); }
std::string DtGetDataTypeFlatElementFullPath(const QLTypeSys::DataTypeTable* table, int id, long flatIdx) { return pathText(table, id, dfsIdx(table, id, flatIdx)); }
int DtGetDataTypeFlatElementDataTypeId(const QLTypeSys::DataTypeTable* table, int id, long flatIdx) { return dfs(table, id).getDataTypeId(dfsIdx(table, id, flatIdx)); }
int DtGetDataTypeFlatElementDimensionsMode(const QLTypeSys::DataTypeTable* table, int id, long flatIdx) { return dfs(table, id).getDimensionsMode(dfsIdx(table, id, flatIdx)); }
long DtGetDataTypeFlatElementNumDimensions(const QLTypeSys::DataTypeTable* table, int id, long flatIdx) { return dfs(table, id).getNumDimensions(dfsIdx(table, id, flatIdx)); }
long DtGetDataTypeFlatElementDimension(const QLTypeSys::DataTypeTable* table, int id, long flatIdx, long dimIndex) { return dfs(table, id).getDimensions(dfsIdx(table, id, flatIdx))[dimIndex]; }
int DtGetDataTypeFlatElementSignalType(const QLTypeSys::DataTypeTable* table, int id, long flatIdx) { return dfs(table, id).getSignalType(dfsIdx(table, id, flatIdx)); }
long DtGetDataTypeFlatElementComplexWidth(const QLTypeSys::DataTypeTable* table, int id, long flatIdx) { return dfs(table, id).getComplexWidth(dfsIdx(table, id, flatIdx)); }
long DtGetDataTypeFlatElementOffset(const QLTypeSys::DataTypeTable* table, int id, long flatIdx) { return dfs(table, id).getOffset(dfsIdx(table, id, flatIdx)); }
double DtGetDataTypeFlatElementMax(const QLTypeSys::DataTypeTable* table, int id, long flatIdx) { return dfs(table, id).getMax(dfsIdx(table, id, flatIdx)); }

// --- Nodes -----------------------------------------------------------------------------------------------------------

int DtGetDataTypeDFSElementDataTypeId(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx) { return dfs(table, id).getDataTypeId(dfsIdx); }
long DtGetDataTypeDFSElementWidth(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx) { return dfs(table, id).getWidth(dfsIdx); }
int DtGetDataTypeDFSElementSignalType(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx) { return dfs(table, id).getSignalType(dfsIdx); }
int DtGetDataTypeDFSElementDimensionsMode(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx) { return dfs(table, id).getDimensionsMode(dfsIdx); }
long DtGetDataTypeDFSElementNumDimensions(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx) { return dfs(table, id).getNumDimensions(dfsIdx); }
long DtGetDataTypeDFSElementDimension(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx, long dimIndex) { return dfs(table, id).getDimensions(dfsIdx)[dimIndex]; }
std::string DtGetDataTypeDFSElementQRTPathFromIdx(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx) { return pathText(table, id, dfsIdx); }

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

// --- Subtrees and offsets --------------------------------------------------------------------------------------------

long DtIsDFSElementDescendant(const DataTypeTable* table, int id, long ancestorIdx, long dfsIdx) {
    if (ancestorIdx > dfsIdx) return -1;
    if (ancestorIdx == dfsIdx) return 0;
    long numNodes = DtGetDataTypeNumDFSElements(table, DtGetDataTypeDFSElementDataTypeId(table, id, ancestorIdx));
    if (numNodes == 0) return -1; // a leaf
    const long width = DtGetDataTypeDFSElementWidth(table, id, ancestorIdx);
    if (width > 1) numNodes = wrappingAdd(wrappingMultiply(numNodes, width), 1);
    return wrappingAdd(ancestorIdx, numNodes) <= dfsIdx ? -1 : dfsIdx - ancestorIdx;
}

static void appendLeafOffsets(const DataTypeTable* table, int id, long base, std::vector<unsigned long>& offsets) {
    for (const StructElement* element : DtGetStructDataTypeObject_AliasedThruIfNeeded(table, id)->getElements()) {
        long start = wrappingAdd(base, element->offset);
        if (!DtGetDataTypeIsBus(table, element->dataTypeId)) { // kept: a nested structure that is no bus is one leaf
            offsets.push_back(static_cast<unsigned long>(start));
            continue;
        }
        const long width = element->getWidth();
        for (long instance = 0; instance < width; ++instance) {
            appendLeafOffsets(table, element->dataTypeId, start, offsets);
            start = wrappingAdd(start, DtGetDataTypeSize(table, element->dataTypeId));
        }
    }
}

std::vector<unsigned long> DtGetDataTypeFullHierarchyOffset(const DataTypeTable* table, int id,
                                                            const std::vector<unsigned int>& dims) {
    unsigned long numInstances = 1;
    for (const unsigned int dim : dims)
        numInstances *= dim;
    std::vector<unsigned long> offsets;
    appendLeafOffsets(table, id, 0, offsets);
    const std::size_t numLeaves = offsets.size();
    if (numLeaves == 0) return offsets;
    std::size_t numOffsets;
    if (__builtin_mul_overflow(numInstances, numLeaves, &numOffsets) || numOffsets >= 1ul << 61)
        throw std::length_error("vector::reserve");
    offsets.reserve(numOffsets);
    const auto size = static_cast<unsigned long>(DtGetDataTypeSize(table, id));
    for (unsigned long instance = 1; instance < numInstances; ++instance)
        for (std::size_t i = 0; i < numLeaves; ++i)
            offsets.push_back(offsets[i] + instance * size);
    return offsets;
}

// --- Buses -----------------------------------------------------------------------------------------------------------

bool DtGetDataTypeIsBus(const DataTypeTable* table, int id) {
    return DtIsStructType(table, id) && DtGetStructDataTypeObject_AliasedThruIfNeeded(table, id)->isBusType();
}

bool DtGetDataTypeIsBusWithVarDimsElement(const DataTypeTable* table, int id) {
    return DtGetDataTypeIsBus(table, id) && DtGetStructDataTypeObject_AliasedThruIfNeeded(table, id)->hasVarDims();
}

bool DtDoesBusHaveElementWithMinMax(const DataTypeTable* table, int id) {
    const BusDataType* bus = DtGetBusDataTypeObject_AliasedThruIfNeeded(table, id);
    return bus->sameMinValForAllLeaf != -infinity || bus->sameMaxValForAllLeaf != infinity;
}

// The sentinels cross over: no shared minimum is +inf, no minimum anywhere -inf.
bool DtDoesBusHaveSameMinForAllLeaf(const DataTypeTable* table, int id) {
    return DtGetBusSameMinValForAllLeaf(table, id) != infinity;
}

double DtGetBusSameMinValForAllLeaf(const DataTypeTable* table, int id) {
    return DtGetBusDataTypeObject_AliasedThruIfNeeded(table, id)->sameMinValForAllLeaf;
}

bool DtDoesBusHaveSameMaxForAllLeaf(const DataTypeTable* table, int id) {
    return DtGetBusSameMaxValForAllLeaf(table, id) != -infinity;
}

double DtGetBusSameMaxValForAllLeaf(const DataTypeTable* table, int id) {
    return DtGetBusDataTypeObject_AliasedThruIfNeeded(table, id)->sameMaxValForAllLeaf;
}

bool DtDoesBusHaveLeafWithSymbolicDimensions(const DataTypeTable* table, int id) {
    return DtGetBusDataTypeObject_AliasedThruIfNeeded(table, id)->hasLeafWithSymbolicDimensions;
}
