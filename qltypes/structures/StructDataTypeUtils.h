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

// --- Buses -----------------------------------------------------------------------------------------------------------

/// Whether the type at the end of the alias chain is a structure that says to be a bus. Raises `InvalidDataTypeId`.
QL_EXPORT bool DtGetDataTypeIsBus(const QLTypeSys::DataTypeTable* table, int id);
