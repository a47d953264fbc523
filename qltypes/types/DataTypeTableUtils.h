// Flat functions over a table: the interface for callers that take no exceptions and for the engine's hot paths.
//
//   int id;
//   qlsvDiagnosticImpl* d = DtRegisterDataType(table, "model/Gain", "Torque", dtSourceBuiltIn, &id);
//   if (!d) d = DtSetDataTypeSize(table, "model/Gain", id, 8);
//
// Grouped by shape; each banner states arguments, checking and result once. Diagnostics that are returned belong to the
// caller. Functions over the elements of a structure: ../structures/StructDataTypeUtils.h.
#pragma once

#include <string>
#include <vector>

#include "qlplatform/Export.h"
#include "qltypes/types/FunctionTypes.h"
#include "qltypes/types/TypeIds.h"

class qlsvDiagnosticImpl;
struct txArray_tag;

namespace CG {
class Type;
}

namespace QLTypeSys {
class DataTypeTable;
}

// clang-format off

// --- Direct reads, and their setter twins: the record at `id`, no alias resolution.
//     Unchecked: `id` must be valid. A null name is stored as the empty one.

QL_EXPORT int DtGetDataTypeSize(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT int getDataTypeSize(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const void* DtGetDataTypeGround(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const void* BlockDtGetDataTypeGround(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const void* getDataTypeGround(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT int DtGetDataTypeStorageId(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT int BlockDtGetDataTypeStorageId(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const char* DtGetDataTypeName(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const char* DtGetDataTypeShortName(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT std::string DtGetDataTypeNameStripDTOPrefix(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtGetDataTypeNeedRegisterIdentifier(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT txArray_tag* DtGetDataTypeInterface(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT CG::Type* DtGetDataTypeCGType(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtGetIsPointerType(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT void DtSetDataTypeCGType(QLTypeSys::DataTypeTable* table, int id, CG::Type* type);
QL_EXPORT void DtSetDataTypeGroundHasNonZeroStoredValue(QLTypeSys::DataTypeTable* table, int id, bool hasNonZero);
QL_EXPORT void DtSetDataTypeShortName(QLTypeSys::DataTypeTable* table, int id, const char* name);

// --- Resolved reads: the record at the end of the alias chain. Raise `InvalidDataTypeId`.

QL_EXPORT QLTypeSys::ContainedDataFcn DtGetContainedDataFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const char* DtGetContainedDataFcnName(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT int DtGetContainedDataType(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT unsigned long DtGetContainedDataNumDims(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT QLTypeSys::ContainedDataDimsFcn DtGetContainedDataDimsFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const char* DtGetContainedDataDimsFcnName(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT QLTypeSys::UpdateContainedDataDimsFcn DtGetUpdateContainedDataDimsFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const char* DtGetUpdateContainedDataDimsFcnName(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT QLTypeSys::UpdateContainedDataDimFcn DtGetUpdateContainedDataDimFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT QLTypeSys::SerializeFcn DtGetSerializeFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const char* DtGetSerializeFcnName(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT QLTypeSys::DeserializeFcn DtGetDeserializeFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const char* DtGetDeserializeFcnName(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT QLTypeSys::SerializeSizeFcn DtGetSerializeSizeFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const char* DtGetSerializeSizeFcnName(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT QLTypeSys::SizeOfFcn DtGetSizeOfFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const char* DtGetSizeOfFcnName(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT QLTypeSys::CoderPropertiesFcn DtGetCoderPropertiesFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const char* DtGetCoderPropertiesFcnName(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT QLTypeSys::DataConstructFcn DtGetDataConstructFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const char* DtGetDataConstructFcnName(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT int DtGetDataTypePropertiesSize(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtGetDataTypeGroundHasNonZeroStoredValue(const QLTypeSys::DataTypeTable* table, int id);

// --- Caller reads: as resolved reads; the caller text is not used.

QL_EXPORT QLTypeSys::ConvertBetweenFcn DtGetConvertBetweenFcn(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT QLTypeSys::ConstructFcn DtGetConstructFcn(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT const char* DtGetConstructFcnName(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT QLTypeSys::DestructFcn DtGetDestructFcn(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT const char* DtGetDestructFcnName(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT QLTypeSys::DeepCopyFcn DtGetDeepCopyFcn(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT const char* DtGetDeepCopyFcnName(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT QLTypeSys::IsPositiveFcn DtGetIsPositiveFcn(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT QLTypeSys::IsNegativeFcn DtGetIsNegativeFcn(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT QLTypeSys::GreaterThanFcn DtGetGreaterThanFcn(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT QLTypeSys::GreaterEqualFcn DtGetGreaterEqualFcn(const QLTypeSys::DataTypeTable* table, const char* caller, int id);

// --- Whether the type at the end of the alias chain has the function, or a name for it. Raise `InvalidDataTypeId`.

QL_EXPORT bool DtHasConstructFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtHasDestructFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtHasDeepCopyFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtHasSerializeFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtHasDeserializeFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtHasSerializeSizeFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtHasSizeOfFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtHasContainedDataFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtHasContainedDataDimsFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtHasDataConstructFcn(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtHasCoderPropertiesFcn(const QLTypeSys::DataTypeTable* table, int id);

// --- Plain setters: null on success, else the diagnostic of what the setter raised. Unchecked: `id` must be valid. A
//     null name is stored as the empty one.

QL_EXPORT qlsvDiagnosticImpl* DtSetContainedDataType(QLTypeSys::DataTypeTable* table, int id, int containedId);
QL_EXPORT qlsvDiagnosticImpl* DtSetContainedDataNumDims(QLTypeSys::DataTypeTable* table, int id, unsigned long numDims);
QL_EXPORT qlsvDiagnosticImpl* DtSetIsPointerType(QLTypeSys::DataTypeTable* table, int id, bool isPointer);
QL_EXPORT qlsvDiagnosticImpl* DtSetSerializeFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::SerializeFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetSerializeFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetDeserializeFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::DeserializeFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetDeserializeFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetSerializeSizeFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::SerializeSizeFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetSerializeSizeFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetSizeOfFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::SizeOfFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetSizeOfFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetContainedDataFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::ContainedDataFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetContainedDataFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetContainedDataDimsFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::ContainedDataDimsFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetContainedDataDimsFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetUpdateContainedDataDimsFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::UpdateContainedDataDimsFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetUpdateContainedDataDimsFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetUpdateContainedDataDimFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::UpdateContainedDataDimFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetUpdateContainedDataDimFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetCoderPropertiesFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::CoderPropertiesFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetCoderPropertiesFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataConstructFcn(QLTypeSys::DataTypeTable* table, int id, QLTypeSys::DataConstructFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataConstructFcnName(QLTypeSys::DataTypeTable* table, int id, const char* name);

// --- Block setters: as plain setters; a failure names the block in a second message when the name is not empty.

QL_EXPORT qlsvDiagnosticImpl* DtSetIsPositiveFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::IsPositiveFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetIsNegativeFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::IsNegativeFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetGreaterThanFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::GreaterThanFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetGreaterEqualFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::GreaterEqualFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeStorageId(QLTypeSys::DataTypeTable* table, const char* blockName, int id, int storageId);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeSize(QLTypeSys::DataTypeTable* table, const char* blockName, int id, int size);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypePropertiesSize(QLTypeSys::DataTypeTable* table, const char* blockName, int id, int size);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeGround(QLTypeSys::DataTypeTable* table, const char* blockName, int id, const void* ground);
QL_EXPORT qlsvDiagnosticImpl* DtSetConvertBetweenFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::ConvertBetweenFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetConstructFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::ConstructFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetConstructFcnName(QLTypeSys::DataTypeTable* table, const char* blockName, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetDestructFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::DestructFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetDestructFcnName(QLTypeSys::DataTypeTable* table, const char* blockName, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetDeepCopyFcn(QLTypeSys::DataTypeTable* table, const char* blockName, int id, QLTypeSys::DeepCopyFcn f);
QL_EXPORT qlsvDiagnosticImpl* DtSetDeepCopyFcnName(QLTypeSys::DataTypeTable* table, const char* blockName, int id, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtSetDataTypeProperties(QLTypeSys::DataTypeTable* table, const char* blockName, int id, const void* properties);

// --- Forwards: the member of QLTypeSys::DataTypeTable that has the name, or the field that it reads or writes.
//     Checks and failures are those of the member.

QL_EXPORT int DtGetDataTypeId(const QLTypeSys::DataTypeTable* table, const char* name);
QL_EXPORT qlsvDiagnosticImpl* DtRegisterDataType(QLTypeSys::DataTypeTable* table, const char* blockName, const char* name, DataTypeSource source, int* id);
QL_EXPORT bool DtIsDataTypeIdValid(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT int DtGetDataTypeIdAliasedTo(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtIsEnumType(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtIsFixptDTNotScaledDouble(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DataTypeNumericNonBoolean(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DataTypeNumericOrBoolean(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT bool DtCheckIfNonZeroArray(const QLTypeSys::DataTypeTable* table, const void* data, int count, int id, bool isComplex);
QL_EXPORT bool DtIsImplementedAsDynamicMatrixType(const QLTypeSys::DataTypeTable* table, int id);
QL_EXPORT const void* DtGetDataTypeProperties(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT const void* BlockDtGetDataTypeProperties(const QLTypeSys::DataTypeTable* table, const char* caller, int id);
QL_EXPORT bool IsPredefinedDataType(int id);
QL_EXPORT bool IntrinsicFixptName(const char* name);
QL_EXPORT int GetBuiltInDataType(const char* name);
QL_EXPORT int GetBuiltInDataType(const std::u16string& name);
QL_EXPORT bool NameOfBuiltInDataType(const char* name);
QL_EXPORT bool NameOfBuiltInDataType(const std::u16string& name);
QL_EXPORT int qlGetBuiltInDataTypeSize(int id);
QL_EXPORT const char* DtGetEnumTypeStringFromValue(const QLTypeSys::DataTypeTable* table, int id, int value);
QL_EXPORT _qlDataTypeAccess_tag* DtGetDataTypeAccess(const QLTypeSys::DataTypeTable* table);
QL_EXPORT void DtSetDataTypeAccess(QLTypeSys::DataTypeTable* table, _qlDataTypeAccess_tag* access);
QL_EXPORT qlsvDiagnosticImpl* DtGetDTAErrorQueue(const QLTypeSys::DataTypeTable* table);
QL_EXPORT void DtSetDTAErrorQueue(QLTypeSys::DataTypeTable* table, qlsvDiagnosticImpl* queue);

// clang-format on

// --- Classifiers by identifier ---------------------------------------------------------------------------------------

/// Whether the id is -1 to 8.
QL_EXPORT bool DtCheckForBuiltInDataType(int id);
/// Whether the id is -1 to 8.
QL_EXPORT bool BlockCheckForBuiltInDataType(int id);
/// Whether the id is -1 to 8.
QL_EXPORT bool CheckForBuiltInDataType(int id);
/// Whether the id is valid and its record an alias.
QL_EXPORT bool DtIsAliasType(const QLTypeSys::DataTypeTable* table, int id);
/// Whether the type at the end of the alias chain is a structure; false for -1. Raises `InvalidDataTypeId`.
QL_EXPORT bool DtIsStructType(const QLTypeSys::DataTypeTable* table, int id);
/// Whether the record itself was registered as anonymous. Unchecked: `id` must be valid.
QL_EXPORT bool DtIsAnonymousStructType(const QLTypeSys::DataTypeTable* table, int id);
/// Whether the type at the end of the alias chain is of fixed point. Raises `InvalidDataTypeId`.
QL_EXPORT bool DtIsFixptDT(const QLTypeSys::DataTypeTable* table, int id);
/// False for an invalid id.
QL_EXPORT bool DtIsHalfPrecisionType(const QLTypeSys::DataTypeTable* table, int id);
/// False for an invalid id.
QL_EXPORT bool DtIsDynamicMatrixType(const QLTypeSys::DataTypeTable* table, int id);
/// False for an invalid id.
QL_EXPORT bool DtIsImageType(const QLTypeSys::DataTypeTable* table, int id);
/// Whether the type is int8 to uint32. Unchecked: `id` must be valid.
QL_EXPORT bool DtIsIntDtype(const QLTypeSys::DataTypeTable* table, int id);
/// Unchecked: `id` must be valid.
QL_EXPORT bool DtIsUnsignedIntDtype(const QLTypeSys::DataTypeTable* table, int id);
/// Unchecked: `id` must be valid.
QL_EXPORT bool DtIsSignedIntDtype(const QLTypeSys::DataTypeTable* table, int id);
/// Whether the type is double or single. Unchecked: `id` must be valid.
QL_EXPORT bool DtIsFloatDtype(const QLTypeSys::DataTypeTable* table, int id);
/// Whether what stores a value can hold negative numbers. Unchecked: `id` must be valid.
QL_EXPORT bool DtIsSignedFixptDT(const QLTypeSys::DataTypeTable* table, int id);
/// Unchecked: `id` must be valid.
QL_EXPORT bool DtCanContainNegativeNumbers(const QLTypeSys::DataTypeTable* table, int id);
/// Double, single or half. Unchecked: `id` must be valid.
QL_EXPORT bool DtIsBuiltInOrCustomFloat(const QLTypeSys::DataTypeTable* table, int id);
/// Whether a value is read and written in one step; false for -1. Raises `InvalidDataTypeId`.
QL_EXPORT bool DtIsAtomic(const QLTypeSys::DataTypeTable* table, int id);
/// Whether the type is one unsigned bit without scaling. Raises `InvalidDataTypeId`.
QL_EXPORT bool DtIsUFix1(const QLTypeSys::DataTypeTable* table, int id);
/// Raises `InvalidDataTypeId`.
QL_EXPORT bool DtIsBooleanOrUFix1(const QLTypeSys::DataTypeTable* table, int id);
/// Raises `InvalidDataTypeId`.
QL_EXPORT bool DtIsBuiltInOrUFix1(const QLTypeSys::DataTypeTable* table, int id);
/// Whether any type of a client is half.
QL_EXPORT bool DtHasHalfPrecisionDataType(const QLTypeSys::DataTypeTable* table);

// --- Derived questions -----------------------------------------------------------------------------------------------

/// The first identifier of a client's type, 14.
QL_EXPORT int DAGetNumQLDataTypes();
/// Whether the type has a construct function and no data-construct function. Raises `InvalidDataTypeId`.
QL_EXPORT bool DtHasDefaultConstructFcnOnly(const QLTypeSys::DataTypeTable* table, int id);
/// Whether a value must be constructed before use. Raises `InvalidDataTypeId`.
QL_EXPORT bool DtNeedCustomInitialization(const QLTypeSys::DataTypeTable* table, int id);
/// The id under which values of like layout share memory. Unchecked: `id` must be valid.
QL_EXPORT int DtGetDataTypeIdForPooling(const QLTypeSys::DataTypeTable* table, int id);
/// The id at the end of the alias chain; -10 for -10. Unchecked otherwise: `id` must be valid.
QL_EXPORT int DtGetDataTypeIdAliasedThruTo(const QLTypeSys::DataTypeTable* table, int id);
/// As DtGetDataTypeIdAliasedThruTo.
QL_EXPORT int getDataTypeIdAliasedThruTo(const QLTypeSys::DataTypeTable* table, int id);
/// The data inside the value `p`. Unchecked: the type must have the function.
QL_EXPORT void* DtGetContainedData(const QLTypeSys::DataTypeTable* table, int id, void* p);
/// Number of elements inside the value `p`: the product of its dimensions, 1 for none. Unchecked: the type must have
/// the function.
QL_EXPORT unsigned long DtGetContainedWidth(const QLTypeSys::DataTypeTable* table, int id, const void* p);
/// The id of a name; a custom type that is known by its callback alone is registered by it first.
QL_EXPORT int DtGetOrRegisterKnownCustomDataTypeId(const QLTypeSys::DataTypeTable* table, const char* name);
/// Replaces the contents of `ids` by the types that this one is made of. Unchecked: `id` must be valid.
QL_EXPORT void DtGetDataTypeDependenciesVector(const QLTypeSys::DataTypeTable* table, int id,
                                               std::vector<unsigned int>& ids);
/// The contained type where the feature EnableEffectiveDataType is on and there is one, else `id`. Raises
/// `InvalidDataTypeId`.
QL_EXPORT int DtGetEffectiveDataType(const QLTypeSys::DataTypeTable* table, int id);
/// The same, resolved through aliases.
QL_EXPORT int DtGetEffectiveAliasedThruDataType(const QLTypeSys::DataTypeTable* table, int id);
/// False where the feature EnableEffectiveDataType is off or the id invalid, else DtHasContainedDataFcn.
QL_EXPORT bool DtIsOpaqueMatrix(const QLTypeSys::DataTypeTable* table, int id);

// --- Checks. Null when all is well -----------------------------------------------------------------------------------

/// A diagnostic with `InvalidDataTypeId`, and the block's name behind it when it is not empty.
QL_EXPORT qlsvDiagnosticImpl* DtCheckDataTypeId(const QLTypeSys::DataTypeTable* table, const char* blockName, int id);
/// A diagnostic with `DataTypeSizeHasNotBeenSet` for the first type, aliases aside, that has no size.
QL_EXPORT qlsvDiagnosticImpl* DtCheckForInvalidDataTypeSize(const QLTypeSys::DataTypeTable* table);
/// Stores the record's size; -1 and a diagnostic with `DataTypeSizeHasNotBeenSet` when it has none.
QL_EXPORT qlsvDiagnosticImpl* DtGetDataTypeSizeWithCheck(const QLTypeSys::DataTypeTable* table, int id, int* size);
/// Whether the table holds an integer or fixed-point type wider than `maxBits`. Calls the eighth word of the access
/// block, which a client must have filled.
QL_EXPORT bool DtTableHasInvalidDataTypeSize(const QLTypeSys::DataTypeTable* table, unsigned int maxBits);

namespace QLTypeSys {

/// Number of types without auto, which is the first free identifier.
QL_EXPORT int GetNumDataTypes(const DataTypeTable* table);

/// Forwards to DataTypeTable::setDataTypeIdAliasedTo and raises as it does.
QL_EXPORT void SetDataTypeIdAliasedTo(DataTypeTable* table, int id, int target);

} // namespace QLTypeSys
