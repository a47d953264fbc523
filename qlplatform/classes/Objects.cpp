#include "qlplatform/classes/Objects.h"

#include <cstring>

#include "qlplatform/arrays/HostArray_internal.h"

txArray_tag* omCreateObjectArray(const char* className, txArray_tag* underlying) {
    txArrayPtr taken(underlying);
    const std::size_t rows = txGetNumRows(underlying);
    const std::size_t columns = txGetNumColumns(underlying);
    hostarray::Elements* elements = hostarray::makeElements(0, 0, 1, std::strlen(className) + 1);
    elements->children()[0] = taken.release();
    std::strcpy(elements->texts(), className);
    return hostarray::makeArray(txClassObject, 0, rows, columns, elements);
}

const txArray_tag* omGetUnderlyingArray(const txArray_tag* array) {
    return txGetClassID(array) == txClassObject ? array->elements->children()[0] : array;
}
