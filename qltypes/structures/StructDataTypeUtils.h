// Flat functions over the elements of structures, by type id and element index.
//
//   qlsvDiagnosticImpl* failed = DtSetDataTypeNumElements(table, "model/Bus", id, 2);
//   if (!failed) failed = DtCheckDataTypeElementIndex(table, "model/Bus", id, index);
//   if (!failed) DtSetDataTypeElementSignalType(table, "model/Bus", id, index, 1);
//
// Grouped by shape; each banner states arguments, checking and result once. Functions over types: ../types/
// DataTypeTableUtils.h. The layout: StructLayout.h. The views that these functions ask: ElementAccess.h.
#pragma once

#include <string>
#include <vector>

#include "qlplatform/Export.h"

class BusDataType;
class StructDataType;
class qlsvDiagnosticImpl;

namespace QLTypeSys {
class DataTypeTable;
}

// clang-format off

// --- The record: as the table has it (unchecked: `id` must be a structure and no alias), or at the end of the alias
//     chain (raises `InvalidDataTypeId`; unchecked: it must be a structure there). Owned by the table; good until the
//     record is replaced.

QL_EXPORT StructDataType* DtGetStructDataTypeObject(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT StructDataType* DtGetStructDataTypeObject_AliasedThruIfNeeded(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT BusDataType* DtGetBusDataTypeObject(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT BusDataType* DtGetBusDataTypeObject_AliasedThruIfNeeded(const QLTypeSys::DataTypeTable* table, int id);

// --- Counts of a structure or an alias of one; 0 for every other type. Raise `InvalidDataTypeId`.

QL_EXPORT long DtGetDataTypeNumElements(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT long DtGetDataTypeNumFlatElements(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT long DtGetDataTypeNumRawElements(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT long DtGetDataTypeNumDFSElements(const QLTypeSys::DataTypeTable* table, int id);

// --- Immediate elements, in declared order. Unchecked: `id` must be a structure or an alias of one, `index` one of its
//     elements, `dimIndex` one of the element's dimensions.

QL_EXPORT const char* DtGetDataTypeElementName(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT int DtGetDataTypeElementDataTypeId(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT int DtGetDataTypeElementUnitId(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT int DtGetDataTypeElementSamplingMode(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT int DtGetDataTypeElementSignalType(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT int DtGetDataTypeElementDimensionsMode(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT long DtGetDataTypeElementNumDimensions(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT const long* DtGetDataTypeElementDimensions(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT const int* DtGetDataTypeElementDimensionsAsInt(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT long DtGetDataTypeElementDimension(const QLTypeSys::DataTypeTable* table, int id, long index, long dimIndex);
QL_EXPORT int DtGetDataTypeElementSymbDimsId(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT long DtGetDataTypeElementOffset(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT long DtGetDataTypeElementWidth(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT int DtGetDataTypeElementPadding(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT long DtGetDataTypeElementVarDimsOffset(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT long DtGetDataTypeElementComplexWidth(const QLTypeSys::DataTypeTable* table, int id, long index);
QL_EXPORT bool DtGetDataTypeElementIsScalar(const QLTypeSys::DataTypeTable* table, int id, long index);

// --- Leaves, by flat index; an index past the end lies in a further instance of the structure. The same unchecked.

QL_EXPORT const char* DtGetDataTypeFlatElementName(const QLTypeSys::DataTypeTable* table, int id, long flatIdx);
QL_EXPORT std::string DtGetDataTypeFlatElementFullPath(const QLTypeSys::DataTypeTable* table, int id, long flatIdx);
QL_EXPORT int DtGetDataTypeFlatElementDataTypeId(const QLTypeSys::DataTypeTable* table, int id, long flatIdx);
QL_EXPORT int DtGetDataTypeFlatElementDimensionsMode(const QLTypeSys::DataTypeTable* table, int id, long flatIdx);
QL_EXPORT long DtGetDataTypeFlatElementNumDimensions(const QLTypeSys::DataTypeTable* table, int id, long flatIdx);
QL_EXPORT long DtGetDataTypeFlatElementDimension(const QLTypeSys::DataTypeTable* table, int id, long flatIdx, long dimIndex);
QL_EXPORT int DtGetDataTypeFlatElementSignalType(const QLTypeSys::DataTypeTable* table, int id, long flatIdx);
QL_EXPORT long DtGetDataTypeFlatElementComplexWidth(const QLTypeSys::DataTypeTable* table, int id, long flatIdx);
QL_EXPORT long DtGetDataTypeFlatElementOffset(const QLTypeSys::DataTypeTable* table, int id, long flatIdx);
QL_EXPORT double DtGetDataTypeFlatElementMax(const QLTypeSys::DataTypeTable* table, int id, long flatIdx);

// --- Nodes, by depth-first index; an index past the end lies in a further instance of the structure. The same unchecked.

QL_EXPORT int DtGetDataTypeDFSElementDataTypeId(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx);
QL_EXPORT long DtGetDataTypeDFSElementWidth(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx);
QL_EXPORT int DtGetDataTypeDFSElementSignalType(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx);
QL_EXPORT int DtGetDataTypeDFSElementDimensionsMode(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx);
QL_EXPORT long DtGetDataTypeDFSElementNumDimensions(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx);
QL_EXPORT long DtGetDataTypeDFSElementDimension(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx, long dimIndex);
QL_EXPORT std::string DtGetDataTypeDFSElementQRTPathFromIdx(const QLTypeSys::DataTypeTable* table, int id, long dfsIdx);

// --- Element setters. Write without further check and return null; `blockName` is not used. Unchecked as above.

QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeElementUnitId(QLTypeSys::DataTypeTable* table, const char* blockName, int id, long index, int unitId);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeElementSignalType(QLTypeSys::DataTypeTable* table, const char* blockName, int id, long index, int signalType);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeElementSymbDimsId(QLTypeSys::DataTypeTable* table, const char* blockName, int id, long index, int symbDimsId);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeElementSamplingMode(QLTypeSys::DataTypeTable* table, const char* blockName, int id, long index, int samplingMode);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeElementDimensionsMode(QLTypeSys::DataTypeTable* table, const char* blockName, int id, long index, int dimensionsMode);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeElementDimension(QLTypeSys::DataTypeTable* table, const char* blockName, int id, long index, long dimIndex, long value);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeElementMin(QLTypeSys::DataTypeTable* table, const char* blockName, int id, long index, double value);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeElementMax(QLTypeSys::DataTypeTable* table, const char* blockName, int id, long index, double value);

// clang-format on

/// Changes the number of dimensions of an element and keeps those that remain; new ones are 0. None below 1. Returns
/// null; `blockName` is not used. Unchecked as the setters above.
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeElementNumDimensions(QLTypeSys::DataTypeTable* table, const char* blockName,
                                                                int id, long index, long numDims);

/// Makes the elements of a structure, once. Null on success; a diagnostic with `InvalidDataTypeNumElements` for a count
/// of 0. Unchecked: `id` must be a structure and no alias, `count` must not be negative.
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeNumElements(QLTypeSys::DataTypeTable* table, const char* blockName, int id,
                                                       long count);

/// Null when `index` is an element of the type `id`; else a diagnostic with `InvalidDataTypeId` or
/// `InvalidDataTypeElementIndex`. A type that is no structure has no elements.
QL_EXPORT qlsvDiagnosticImpl* DtCheckDataTypeElementIndex(const QLTypeSys::DataTypeTable* table, const char* blockName,
                                                          int id, long index);

/// How far node `dfsIdx` lies behind node `ancestorIdx` inside the latter's subtree, 0 for the same node; -1 when it is
/// not in the subtree. The subtree of an array as a whole has all of its instances. Unchecked as above.
QL_EXPORT long DtIsDFSElementDescendant(const QLTypeSys::DataTypeTable* table, int id, long ancestorIdx, long dfsIdx);

/// Byte offsets of the leaves of an array of structures with the given dimensions, none for a single structure. Buses
/// are followed down; a nested structure that is no bus counts as one leaf. Throws std::length_error("vector::reserve")
/// when there would be 2^61 offsets or more. Unchecked: `id` must be a structure or an alias of one.
QL_EXPORT std::vector<unsigned long> DtGetDataTypeFullHierarchyOffset(const QLTypeSys::DataTypeTable* table, int id,
                                                                      const std::vector<unsigned int>& dims);

// --- Buses -----------------------------------------------------------------------------------------------------------

/// Whether the type at the end of the alias chain is a structure that says to be a bus; false for -1. Raises
/// `InvalidDataTypeId`.
QL_EXPORT bool DtGetDataTypeIsBus(const QLTypeSys::DataTypeTable* table, int id);
/// Whether the type is a bus with variable dimensions somewhere in it. Raises `InvalidDataTypeId`.
QL_EXPORT bool DtGetDataTypeIsBusWithVarDimsElement(const QLTypeSys::DataTypeTable* table, int id);

// What the bus at the end of the alias chain says of itself. Raise `InvalidDataTypeId`. Unchecked: it must be a bus.

/// Whether any leaf has a minimum or a maximum: the shared minimum is not -inf, or the shared maximum not +inf.
QL_EXPORT bool DtDoesBusHaveElementWithMinMax(const QLTypeSys::DataTypeTable* table, int id);
/// Whether the leaves agree in their minimum: the shared one is not +inf.
QL_EXPORT bool DtDoesBusHaveSameMinForAllLeaf(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT double DtGetBusSameMinValForAllLeaf(const QLTypeSys::DataTypeTable* table, int id);
/// Whether the leaves agree in their maximum: the shared one is not -inf.
QL_EXPORT bool DtDoesBusHaveSameMaxForAllLeaf(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT double DtGetBusSameMaxValForAllLeaf(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtDoesBusHaveLeafWithSymbolicDimensions(const QLTypeSys::DataTypeTable* table, int id);
