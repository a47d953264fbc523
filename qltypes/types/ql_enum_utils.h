// Enumerations: which classes may stand as a data type, and how values of such a type are read.
//
// An accepted enumeration is registered with dtSourceEnum and gets a plain record of qualifier dtqEnum; names of its
// members come from a client's table through getEnumTypeStringFromValue.
//
//   if (qlsvDiagnosticImpl* d = qlCheckForValidEnumDataType(tcos::COSClass::getClassInterface(name))) ...
//   int value = DtGetEnumTypeValueFromVoidPtr(table, id, data, 3);
#pragma once

#include <string>

#include "qlplatform/Export.h"
#include "qlplatform/arrays/HostArray.h"
#include "qlplatform/classes/ClassModel.h"

class qlsvDiagnosticImpl;

namespace QLTypeSys {
class DataTypeTable;
}

// --- Classes and objects ---------------------------------------------------------------------------------------------

/// Checks whether a class may stand as a data type: an enumeration with one superclass, which is Quillane.IntEnumType
/// (or a storage type, when QLFEAT_ControlStorageTypeForEnums is on), outside packages, with members, all of them real.
/// Null when it may; else a diagnostic with the first thing wrong, which the caller owns. Throws nothing: an IException
/// of the class system becomes the diagnostic, anything else and a null class become `EnumTypeNotAClass`.
QL_EXPORT qlsvDiagnosticImpl* qlCheckForValidEnumDataType(tcos::COSInterfacePtr interface) noexcept;

/// Whether qlCheckForValidEnumDataType finds nothing wrong; false for null. Throws nothing.
QL_EXPORT bool qlIsValidEnumDataType(tcos::COSInterfacePtr interface) noexcept;

/// Whether the array holds objects of a class that may stand as a data type; false for null. Throws nothing: a class
/// that cannot be looked up is no such class.
QL_EXPORT bool qlIsValidEnumObject(const txArray_tag* object) noexcept;

/// The same under the name of the host array interface.
QL_EXPORT bool txIsValidEnumObject(const txArray_tag* object) noexcept;

/// Whether values of an enumeration may be stored as "int8", "int16", "int32", "uint8" or "uint16": integers that fit a
/// signed one of 32 bits.
QL_EXPORT bool qlIsValidEnumStorageType(const std::string& name);

/// The integers behind enumeration objects, their real parts where they are complex. Raises what the host function
/// "real" reports, and OutOfMemory. Empty for null.
QL_EXPORT txArrayPtr qlGetStoredIntTxArrayFromEnumObject(const txArray_tag* object);

// --- Values and identifiers ------------------------------------------------------------------------------------------

/// Element `index` of `data`, read by the storage type of the enumeration; 0 when that is no built-in integer. Values
/// of uint32 keep their bits. Unchecked: `id` must be valid.
QL_EXPORT int DtGetEnumTypeValueFromVoidPtr(const QLTypeSys::DataTypeTable* table, int id, const void* data,
                                            unsigned long index);

/// Whether a request for the enumeration `name` makes sense: false only when `name` is null or empty. Stores `id` when
/// it is a valid id of an enumeration with that name, else DATA_TYPE_ID_INVALID: look at what is stored also after
/// true.
QL_EXPORT bool DtIsValidEnumType(const QLTypeSys::DataTypeTable* table, int id, const char* name, int* resultId);
