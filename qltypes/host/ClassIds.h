// Data types and the classes of host arrays: which stands for which, memory for values, casts through the host.
//
//   txClassID classId = utGetTxClassIdFromDTypeId(DATA_TYPE_ID_INT16, false); // txClassInt16
//   int id = utGetDTypeIdFromTxClassId(classId);                               // DATA_TYPE_ID_INT16
#pragma once

#include "qlplatform/Export.h"
#include "qlplatform/arrays/HostArray.h"

class qlsvDiagnosticImpl;

namespace QLTypeSys {
class DataTypeTable;
}

// --- Mappings: they raise nothing ------------------------------------------------------------------------------------

/// The class of arrays that hold values of a built-in type, or of "integer" as int32; txClassNone for any other id.
/// Boolean is logical, or uint8 when `booleanAsUint8` is set.
QL_EXPORT txClassID utGetTxClassIdFromDTypeId(int id, bool booleanAsUint8);

/// The built-in type of a class; DATA_TYPE_ID_INVALID for classes without one, int64 and uint64 among them.
QL_EXPORT int utGetDTypeIdFromTxClassId(txClassID classId);

/// As utGetTxClassIdFromDTypeId, and also txClassHalf for half, and txClassInt64 or txClassUint64 for fixed-point types
/// of 64 bits without any scaling. No alias resolution of other types; an id that is not valid has no class.
QL_EXPORT txClassID utGetTxClassIdFromDTypeId_Builtin64BitHalf(const QLTypeSys::DataTypeTable* table, int id,
                                                               bool booleanAsUint8);

/// utGetDTypeIdFromTxClassId of the array's class.
QL_EXPORT int utGetDTypeIdFromTxArray_BuiltinNot64Bit(const txArray_tag* array);

/// The name of the type whose values the array holds, "int64" and "uint64" among them; null for other classes.
QL_EXPORT const char* utGetDTypeNameFromTxArray(const txArray_tag* array);

/// Whether the array is of class int64 or uint64.
QL_EXPORT bool utIs64BitIntegerTxArray(const txArray_tag* array);

// --- Values ----------------------------------------------------------------------------------------------------------

/// Zero-filled host memory for `count` values, twice as much when `isComplex`; freed with txFree. Null, and nothing
/// allocated, when `count` or the size of the type is 0 or below. Raises OutOfMemory.
/// Unchecked: `id` must be valid when `count` is above 0.
QL_EXPORT void* txDTypeCalloc(const QLTypeSys::DataTypeTable* table, long count, int id, bool isComplex);

/// Casts an array by the host function that is named as the type, and makes the result complex where that is asked for
/// and needed. Stores the result, which the caller owns, or null. Null on success, else the diagnostic of the last call
/// to the host, which the caller owns: a failed cast that is to become complex is reported by what "complex" says of
/// it.
QL_EXPORT qlsvDiagnosticImpl* CastTxArrayToBuiltinDataType(const txArray_tag* array, const char* typeName,
                                                           txArray_tag*& out, bool makeComplex);

namespace QLTypeConv {

/// Replaces an array of numbers by objects of an enumeration, made by the host function that is named as the class. The
/// old array is destroyed. Raises what the host function reports; `array` is untouched then.
QL_EXPORT void qlConvertMatrixToEnumObjects(txArray_tag*& array, const char* className);

} // namespace QLTypeConv
