#include "qltypes/host/ClassIds.h"

#include <array>

#include "qlplatform/services/HostFunctions.h"
#include "qltypes/fixed_point/FixPointDefs.h"
#include "qltypes/host/Failure_internal.h"
#include "qltypes/types/DataTypeTableUtils.h"

using QLTypeSys::DataTypeTable;

namespace {

constexpr int integerId = 10; // "integer" among the predefined types

struct BuiltInClass {
    txClassID classId;
    const char* name;
};

// By identifier; the two classes behind them have a name, but no built-in type.
constexpr std::array<BuiltInClass, 11> builtInClasses = {{
    {txClassDouble, "double"},
    {txClassSingle, "single"},
    {txClassInt8, "int8"},
    {txClassUint8, "uint8"},
    {txClassInt16, "int16"},
    {txClassUint16, "uint16"},
    {txClassInt32, "int32"},
    {txClassUint32, "uint32"},
    {txClassLogical, "boolean"},
    {txClassInt64, "int64"},
    {txClassUint64, "uint64"},
}};

// The row of a class, or the number of rows.
int rowOf(txClassID classId) {
    int row = 0;
    for (const BuiltInClass& builtIn : builtInClasses) {
        if (builtIn.classId == classId) break;
        ++row;
    }
    return row;
}

bool isPlain64BitInteger(const fxpDataTypeProp* prop) {
    return prop && prop->DataTypeMode == FXP_DT_FIXPT && prop->FixedExponent == 0 &&
           prop->SlopeAdjustmentFactor == 1.0 && prop->Bias == 0.0 && prop->WordLength == 64;
}

qlsvDiagnosticImpl* callHost(const char* function, const txArray_tag* argument, txArray_tag*& result) {
    txArray_tag* input = const_cast<txArray_tag*>(argument); // host functions do not write to their inputs
    return qlsvFEVAL_NoThrow(1, &result, 1, &input, function, true, txDestroyArray);
}

} // namespace

txClassID utGetTxClassIdFromDTypeId(int id, bool booleanAsUint8) {
    if (id == integerId) return txClassInt32;
    if (id < DATA_TYPE_ID_DOUBLE || id > DATA_TYPE_ID_BOOLEAN) return txClassNone;
    if (id == DATA_TYPE_ID_BOOLEAN && booleanAsUint8) return txClassUint8;
    return builtInClasses[static_cast<std::size_t>(id)].classId;
}

int utGetDTypeIdFromTxClassId(txClassID classId) {
    const int row = rowOf(classId);
    return row <= DATA_TYPE_ID_BOOLEAN ? row : DATA_TYPE_ID_INVALID;
}

txClassID utGetTxClassIdFromDTypeId_Builtin64BitHalf(const DataTypeTable* table, int id, bool booleanAsUint8) {
    if (DtIsHalfPrecisionType(table, id)) return txClassHalf;
    if (DtIsDataTypeIdValid(table, id) && DtIsFixptDT(table, id)) {
        const auto* prop = static_cast<const fxpDataTypeProp*>(DtGetDataTypeProperties(table, "", id));
        if (isPlain64BitInteger(prop)) return prop->Signedness == 1 ? txClassInt64 : txClassUint64;
    }
    return utGetTxClassIdFromDTypeId(id, booleanAsUint8);
}

int utGetDTypeIdFromTxArray_BuiltinNot64Bit(const txArray_tag* array) {
    return utGetDTypeIdFromTxClassId(txGetClassID(array));
}

const char* utGetDTypeNameFromTxArray(const txArray_tag* array) {
    const auto row = static_cast<std::size_t>(rowOf(txGetClassID(array)));
    return row < builtInClasses.size() ? builtInClasses[row].name : nullptr;
}

bool utIs64BitIntegerTxArray(const txArray_tag* array) {
    const txClassID classId = txGetClassID(array);
    return classId == txClassInt64 || classId == txClassUint64;
}

void* txDTypeCalloc(const DataTypeTable* table, long count, int id, bool isComplex) {
    if (count <= 0) return nullptr;
    const int size = DtGetDataTypeSize(table, id);
    if (size <= 0) return nullptr;
    const std::size_t numValues = static_cast<std::size_t>(count) * (isComplex ? 2 : 1);
    void* memory = txCallocEx(numValues, static_cast<std::size_t>(size));
    if (!memory) QLTypeSys::failure::raiseOutOfMemory();
    return memory;
}

qlsvDiagnosticImpl* CastTxArrayToBuiltinDataType(const txArray_tag* array, const char* typeName, txArray_tag*& out,
                                                 bool makeComplex) {
    out = nullptr;
    qlsvDiagnosticImpl* diagnostic = callHost(typeName, array, out);
    if (makeComplex && !txIsComplex(out)) { // kept: also after a failed cast
        qlsvDiscardDiagnostic(diagnostic);
        const txArrayPtr intermediate(out);
        diagnostic = callHost("complex", intermediate.get(), out);
    }
    return diagnostic;
}

void QLTypeConv::qlConvertMatrixToEnumObjects(txArray_tag*& array, const char* className) {
    txArray_tag* objects = nullptr;
    if (qlsvDiagnosticImpl* diagnostic = callHost(className, array, objects))
        qlsvThrowIExceptionFromDiagnostic(diagnostic, nullptr);
    txDestroyArray(array);
    array = objects;
}
