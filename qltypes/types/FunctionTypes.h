// The functions through which the values of a type are handled: one signature a property of the type's record.
//
// Every function that returns int returns non-zero for success and zero for failure. Counts named a and b, and the two
// integers of the target functions, are passed through for the client that provides the function.
#pragma once

#include "qltypes/fixed_point/FixPointDefs.h"

struct ExternalSim_tag;

namespace QLTypeSys {
class DataTypeTable;
}

/// The block that a table passes first to conversion and comparison functions. Its first word is the table; the other
/// words are entries that a client fills, of which the library calls the eighth (see DtTableHasInvalidDataTypeSize).
struct _qlDataTypeAccess_tag {
    /// The table.
    QLTypeSys::DataTypeTable* table;
    /// The client's.
    void* clientEntriesBefore[6];
    /// Properties of a type: the table, a caller text, the identifier, a number whose meaning is the client's.
    const fxpDataTypeProp* (*getFxpDataTypeProp)(QLTypeSys::DataTypeTable*, const char*, int, int);
    /// The client's.
    void* clientEntriesBehind[24];
};

namespace QLTypeSys {

// clang-format off

/// Value to build; property block of the type.
using ConstructFcn = int (*)(void*, const void*);
/// Value to take down.
using DestructFcn = int (*)(void*);
/// Destination, source.
using DeepCopyFcn = int (*)(void*, const void*);
/// Destination, source, a, b.
using SerializeFcn = int (*)(void*, const void*, unsigned long, unsigned long);
/// Destination, source, a, b.
using DeserializeFcn = int (*)(void*, const void*, unsigned long, unsigned long);
/// Value; returns its serialized size in bytes.
using SerializeSizeFcn = unsigned long (*)(const void*);
/// Returns the size of one value in bytes.
using SizeOfFcn = unsigned long (*)();
/// Value; returns the data inside.
using ContainedDataFcn = void* (*)(void*);
/// Value; array that receives as many dimensions as the type's contained data has.
using ContainedDataDimsFcn = void (*)(const void*, unsigned long*);
/// Number of dimensions, dimensions, element size in bytes, value.
using UpdateContainedDataDimsFcn = void (*)(unsigned long, const unsigned long*, unsigned long, void*);
/// Dimension index, new size, value.
using UpdateContainedDataDimFcn = void (*)(unsigned long, unsigned long, void*);
/// Value; returns text for the code generator.
using CoderPropertiesFcn = const char* (*)(const void*);
/// Number of dimensions, dimensions, element size in bytes, initial data or null, destination.
using DataConstructFcn = int (*)(unsigned long, const unsigned long*, unsigned long, const void*, void*);
/// Access block, caller (null from the table), destination id, source id, count, source, auxiliary data, destination.
using ConvertBetweenFcn = int (*)(_qlDataTypeAccess_tag*, const char*, int, int, int, const void*, const void*, void*);
/// Access block, caller, id, count, data, auxiliary data, result with one byte an element.
using IsPositiveFcn = int (*)(_qlDataTypeAccess_tag*, const char*, int, int, const void*, const void*, void*);
/// As IsPositiveFcn.
using IsNegativeFcn = IsPositiveFcn;
/// Access block, caller, id, count, left, right, auxiliary data, result with one byte an element.
using GreaterThanFcn = int (*)(_qlDataTypeAccess_tag*, const char*, int, int, const void*, const void*, const void*, void*);
/// As GreaterThanFcn.
using GreaterEqualFcn = GreaterThanFcn;
/// Handle, target buffer, host value, two integers.
using HostToTargetFcn = void (*)(ExternalSim_tag*, char*, const void*, int, int);
/// Handle, host value, target buffer, two integers.
using TargetToHostFcn = void (*)(ExternalSim_tag*, void*, const char*, int, int);

// clang-format on

} // namespace QLTypeSys
