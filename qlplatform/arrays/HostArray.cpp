#include "qlplatform/arrays/HostArray_internal.h"

#include <algorithm>
#include <cstring>

#include "qlplatform/memory/Memory.h"
#include "qlplatform/services/Raise_internal.h"
#include "qlplatform/strings/Strings.h"

using hostarray::Elements;

namespace {

std::size_t numLiveArrays = 0;

std::size_t sizeOfClass(txClassID classId) {
    switch (classId) {
    case txClassDouble:
    case txClassInt64:
    case txClassUint64:
        return 8;
    case txClassSingle:
    case txClassInt32:
    case txClassUint32:
        return 4;
    case txClassInt16:
    case txClassUint16:
    case txClassChar:
        return 2;
    case txClassInt8:
    case txClassUint8:
    case txClassLogical:
        return 1;
    default:
        return 0;
    }
}

bool isNumericClass(int classNumber) { return classNumber >= txClassDouble && classNumber <= txClassUint64; }

// Gives up one reference; an array without any left goes to the list of the dying.
void drop(txArray_tag* array, txArray_tag*& dying) {
    if (!array || --array->references) return;
    array->nextDying = dying;
    dying = array;
}

void drop(Elements* elements, txArray_tag*& dying) {
    if (--elements->references) return;
    for (txArray_tag* child : elements->children())
        drop(child, dying);
    txFree(elements);
}

// Works off a list instead of recursing: cells may be nested without bound.
void destroyAll(txArray_tag* dying) {
    while (dying) {
        txArray_tag* const array = dying;
        dying = array->nextDying;
        drop(array->elements, dying);
        txFree(array);
        --numLiveArrays;
    }
}

} // namespace

Elements* hostarray::makeElements(std::size_t count, std::size_t elementSize, std::size_t numChildren,
                                  std::size_t sizeOfTexts) {
    std::size_t numBytes = 0;
    std::size_t sizeOfChildren = 0;
    std::size_t total = 0;
    const bool overflows = __builtin_mul_overflow(count, elementSize, &numBytes) ||
                           __builtin_mul_overflow(numChildren, sizeof(txArray_tag*), &sizeOfChildren) ||
                           __builtin_add_overflow(numBytes, sizeOfChildren, &numBytes) ||
                           __builtin_add_overflow(numBytes, sizeOfTexts, &numBytes) ||
                           __builtin_add_overflow(numBytes, sizeof(Elements), &total);
    auto* elements = overflows ? nullptr : static_cast<Elements*>(txCallocEx(1, total));
    if (!elements) hostservices::raiseOutOfMemory();
    elements->references = 1;
    elements->numBytes = numBytes;
    elements->numChildren = numChildren;
    return elements;
}

txArray_tag* hostarray::makeArray(int classNumber, std::uint32_t flags, std::size_t rows, std::size_t columns,
                                  Elements* elements) {
    auto* array = static_cast<txArray_tag*>(txCallocEx(1, sizeof(txArray_tag)));
    if (!array) {
        release(elements);
        hostservices::raiseOutOfMemory();
    }
    array->references = 1;
    array->flags = flags | temporary;
    array->classNumber = classNumber;
    array->rows = rows;
    array->columns = columns;
    array->elements = elements;
    ++numLiveArrays;
    return array;
}

void hostarray::release(Elements* elements) {
    txArray_tag* dying = nullptr;
    drop(elements, dying);
    destroyAll(dying);
}

Elements& hostarray::writable(txArray_tag& array) {
    Elements* const shared = array.elements;
    if (shared->references == 1) return *shared;
    Elements* const own = makeElements(shared->numBytes, 1);
    std::memcpy(own->bytes(), shared->bytes(), shared->numBytes);
    own->numChildren = shared->numChildren;
    own->numFields = shared->numFields;
    for (txArray_tag* child : own->children())
        if (child) ++child->references;
    --shared->references;
    array.elements = own;
    return *own;
}

const char* hostarray::nameOfClass(txClassID classId) {
    static constexpr const char* names[lastTrivialClassNumber + 1] = {
        "",      "cell",  "struct", "logical", "char",   "",      "double", "single", "int8",
        "uint8", "int16", "uint16", "int32",   "uint32", "int64", "uint64", "",
    };
    return names[classId];
}

void* txCallocEx(std::size_t count, std::size_t size) { return utCalloc(count, size); }
void txFree(void* memory) { utFree(memory); }

void txDestroyArray(txArray_tag* array) {
    txArray_tag* dying = nullptr;
    drop(array, dying);
    destroyAll(dying);
}

void txKeepArray(txArray_tag* array) {
    array->flags &= ~hostarray::temporary;
    ++array->references;
}

unsigned long txGetReferenceCount(const txArray_tag* array) { return array->references; }
bool txIsTemporary(const txArray_tag* array) { return array->flags & hostarray::temporary; }
std::size_t txGetNumLiveArrays() { return numLiveArrays; }

txArrayPtr TxArrayUtil::SafeCreateSharedCopy(const txArray_tag* array) {
    if (!array) return nullptr;
    ++array->elements->references;
    return txArrayPtr(
        hostarray::makeArray(array->classNumber, array->flags, array->rows, array->columns, array->elements));
}

txArray_tag* txCreateNumericMatrix(std::size_t rows, std::size_t columns, txClassID classId, bool isComplex) {
    const std::size_t size = sizeOfClass(classId);
    const bool isNumeric = isNumericClass(classId);
    if (size == 0 || (isComplex && !isNumeric)) return nullptr;
    std::size_t count = 0;
    if (__builtin_mul_overflow(rows, columns, &count)) hostservices::raiseOutOfMemory();
    const std::uint32_t flags = isComplex ? hostarray::complex : isNumeric ? hostarray::numeric : 0;
    return hostarray::makeArray(classId, flags, rows, columns,
                                hostarray::makeElements(count, isComplex ? 2 * size : size));
}

txArray_tag* txCreateDoubleScalar(double value) {
    txArray_tag* array = txCreateNumericMatrix(1, 1, txClassDouble, false);
    std::memcpy(array->elements->bytes(), &value, sizeof value);
    return array;
}

txArray_tag* txCreateLogicalScalar(bool value) {
    txArray_tag* array = txCreateNumericMatrix(1, 1, txClassLogical, false);
    *array->elements->bytes() = value;
    return array;
}

txArray_tag* txCreateString(const char* text) {
    const std::u16string units = qlsvUtf16FromUtf8(text ? text : "");
    txArray_tag* array = txCreateNumericMatrix(1, units.size(), txClassChar, false);
    std::memcpy(array->elements->bytes(), units.data(), units.size() * sizeof(char16_t));
    return array;
}

txClassID txGetClassID(const txArray_tag* array) { return array ? array->classId() : txClassNone; }

const char* txGetClassName(const txArray_tag* array) {
    const txClassID classId = txGetClassID(array);
    return classId == txClassObject ? array->elements->texts() : hostarray::nameOfClass(classId);
}

std::size_t txGetNumRows(const txArray_tag* array) { return array ? array->rows : 0; }
std::size_t txGetNumColumns(const txArray_tag* array) { return array ? array->columns : 0; }
std::size_t txGetNumberOfElements(const txArray_tag* array) { return array ? array->rows * array->columns : 0; }

bool txIsComplex(const txArray_tag* array) {
    return array && (array->flags & hostarray::complex) == hostarray::complex;
}

std::size_t txGetElementSize(const txArray_tag* array) {
    return sizeOfClass(txGetClassID(array)) * (txIsComplex(array) ? 2 : 1);
}

const void* txGetData(const txArray_tag* array) {
    return txGetElementSize(array) == 0 ? nullptr : array->elements->bytes();
}

void* txGetWritableData(txArray_tag* array) {
    return txGetElementSize(array) == 0 ? nullptr : hostarray::writable(*array).bytes();
}

std::string txArrayToUTF8StdString(const txArray_tag* array) {
    if (txGetClassID(array) != txClassChar) return {};
    return qlsvUtf8FromUtf16({static_cast<const char16_t*>(txGetData(array)), txGetNumberOfElements(array)});
}
