// Host arrays: reference-counted values of the host language.
//
// An array is a matrix of one class: numbers (real or complex), logicals, characters, cells, structures with fields, or
// objects of a class (made in qlplatform/classes/Objects.h). Typed views of the elements are in HostElements.h.
//
//   txArrayPtr menu(txCreateCellMatrix(1, 2));
//   txSetCell(menu.get(), 0, txCreateString("double")); // the cell takes the text over
//   txArrayPtr copy = TxArrayUtil::SafeCreateSharedCopy(menu.get());
//
// Two pointers to one array see each other's writes. A shared copy is an array of its own: both share one block of
// elements until either is written to. Elements lie in column order. Arrays are used by one thread at a time, copies
// that share a block included.
//
// Memory comes from txCallocEx. Functions that create or write raise OutOfMemory when it ran out; nothing is changed or
// left behind then.
#pragma once

#include <cstddef>
#include <memory>
#include <string>

#include "qlplatform/Export.h"

struct txArray_tag;

/// Class numbers of arrays.
enum txClassID : int {
    txClassNone = 0,
    txClassCell = 1,
    txClassStruct = 2,
    txClassLogical = 3,
    txClassChar = 4, ///< UTF-16 units
    txClassDouble = 6,
    txClassSingle = 7,
    txClassInt8 = 8,
    txClassUint8 = 9,
    txClassInt16 = 10,
    txClassUint16 = 11,
    txClassInt32 = 12,
    txClassUint32 = 13,
    txClassInt64 = 14,
    txClassUint64 = 15,
    txClassObject = 17,  ///< objects of every class
    txClassHalf = -2357, ///< a number that stands for half; no array has it
};

// ---- Memory and lifetime ----

/// Zero-filled host memory for `count` items of `size` bytes, or null when memory ran out. Freed with txFree.
QL_EXPORT void* txCallocEx(std::size_t count, std::size_t size);

/// Frees what txCallocEx gave; null is allowed.
QL_EXPORT void txFree(void* memory);

/// Gives up one reference; the array goes with its last one. Null is allowed.
QL_EXPORT void txDestroyArray(txArray_tag* array);

/// Takes one more reference and marks the array as no longer temporary, so that it outlives the present call.
QL_EXPORT void txKeepArray(txArray_tag* array);

/// Number of references that keep the array.
QL_EXPORT unsigned long txGetReferenceCount(const txArray_tag* array);

/// Whether nobody has kept the array yet: true from its creation to the first txKeepArray.
QL_EXPORT bool txIsTemporary(const txArray_tag* array);

/// Number of arrays that exist in the process. For leak tests; unlocked.
QL_EXPORT std::size_t txGetNumLiveArrays();

/// Gives up the reference that a txArrayPtr owns.
struct txArrayDeleter {
    /// Gives up one reference; null is allowed.
    void operator()(txArray_tag* array) const { txDestroyArray(array); }
};

/// Owns one reference to an array.
using txArrayPtr = std::unique_ptr<txArray_tag, txArrayDeleter>;

namespace TxArrayUtil {

/// A new array with the value of `array`, whose elements it shares until either is written to. Empty for null.
QL_EXPORT txArrayPtr SafeCreateSharedCopy(const txArray_tag* array);

} // namespace TxArrayUtil

// ---- Creation: the caller owns the result, which has one reference ----

/// A matrix of zeros. Null when `classId` is no numeric class and neither logical nor character, and for a complex
/// matrix of a class that is not numeric.
QL_EXPORT txArray_tag* txCreateNumericMatrix(std::size_t rows, std::size_t columns, txClassID classId, bool isComplex);

QL_EXPORT txArray_tag* txCreateDoubleScalar(double value);
QL_EXPORT txArray_tag* txCreateLogicalScalar(bool value);

/// A row of characters from UTF-8; null gives a row of none.
QL_EXPORT txArray_tag* txCreateString(const char* text);

/// A matrix of unset cells.
QL_EXPORT txArray_tag* txCreateCellMatrix(std::size_t rows, std::size_t columns);

/// A matrix of structures with `numFields` fields, all unset. The names are copied.
QL_EXPORT txArray_tag* txCreateStructMatrix(std::size_t rows, std::size_t columns, int numFields,
                                            const char* const* fieldNames);

// ---- What an array is ----

/// The class number; txClassObject for objects of every class, txClassNone for null.
QL_EXPORT txClassID txGetClassID(const txArray_tag* array);

/// The name of the class: "double", "cell", for an object that of its own class. Owned by the array; empty for null.
QL_EXPORT const char* txGetClassName(const txArray_tag* array);

// Sizes are 0 for null.
/// Number of rows; 0 for null.
QL_EXPORT std::size_t txGetNumRows(const txArray_tag* array);
/// Number of columns; 0 for null.
QL_EXPORT std::size_t txGetNumColumns(const txArray_tag* array);
/// Rows by columns; 0 for null.
QL_EXPORT std::size_t txGetNumberOfElements(const txArray_tag* array);

/// Whether the elements have imaginary parts; false for null and for what is not numeric.
QL_EXPORT bool txIsComplex(const txArray_tag* array);

// ---- Numbers, logicals and characters ----

/// Bytes of one element of a numeric, logical or character array, both parts of a complex one; 0 for other arrays.
QL_EXPORT std::size_t txGetElementSize(const txArray_tag* array);

/// The elements of a numeric, logical or character array, a complex one as pairs of real and imaginary part; null for
/// other arrays. Owned by the array; good until it is written to.
QL_EXPORT const void* txGetData(const txArray_tag* array);

/// The same for writing: ends the sharing with copies first. Good until the array is copied.
QL_EXPORT void* txGetWritableData(txArray_tag* array);

/// The characters of a character array as UTF-8, in element order; empty for null and for other arrays.
QL_EXPORT std::string txArrayToUTF8StdString(const txArray_tag* array);

// ---- Cells and fields: values are owned by the array that holds them ----

/// The value of a cell; null when it is unset, when there is no such cell and when `array` is no cell array.
QL_EXPORT const txArray_tag* txGetCell(const txArray_tag* array, std::size_t index);

/// Stores `value`, which the array takes over in any case, and destroys the value that was there; null unsets the cell.
/// Raises `NoSuchCell` when there is no such cell or `array` is no cell array.
QL_EXPORT void txSetCell(txArray_tag* array, std::size_t index, txArray_tag* value);

/// Number of fields; 0 when `array` is no structure.
QL_EXPORT int txGetNumberOfFields(const txArray_tag* array);

/// The name of a field, owned by the array; null when there is no such field.
QL_EXPORT const char* txGetFieldNameByNumber(const txArray_tag* array, int field);

/// The number of the first field with that name; -1 when there is none or `name` is null.
QL_EXPORT int txGetFieldNumber(const txArray_tag* array, const char* name);

/// The value of a field of the structure at `index`; null when it is unset or there is no such field or structure.
QL_EXPORT const txArray_tag* txGetFieldByNumber(const txArray_tag* array, std::size_t index, int field);

/// The same by name.
QL_EXPORT const txArray_tag* txGetField(const txArray_tag* array, std::size_t index, const char* name);

/// Stores `value`, which the array takes over in any case, and destroys the value that was there; null unsets the
/// field. Raises `NoSuchField` when there is no such field or structure.
QL_EXPORT void txSetFieldByNumber(txArray_tag* array, std::size_t index, int field, txArray_tag* value);

/// The same by name.
QL_EXPORT void txSetField(txArray_tag* array, std::size_t index, const char* name, txArray_tag* value);
