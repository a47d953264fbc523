#include <cstring>

#include "qlplatform/arrays/HostArray_internal.h"
#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/services/Raise_internal.h"

using hostarray::Elements;

namespace {

constexpr const char* category = "Quillane:Arrays";
constexpr MessageText texts[] = {
    {category, "NoSuchCell", "an array of class '{1}' has no cell {0}"},
    {category, "NoSuchField", "an array of class '{2}' has no field {1} in element {0}"},
};
const MessageTextTable registeredTexts(texts, std::size(texts));

bool hasCell(const txArray_tag* array, std::size_t index) {
    return txGetClassID(array) == txClassCell && index < txGetNumberOfElements(array);
}

bool hasField(const txArray_tag* array, std::size_t index, int field) {
    return field >= 0 && field < txGetNumberOfFields(array) && index < txGetNumberOfElements(array);
}

std::size_t fieldSlot(const txArray_tag* array, std::size_t index, int field) {
    return index * array->elements->numFields + static_cast<std::size_t>(field);
}

void storeChild(txArray_tag* array, std::size_t slot, txArrayPtr value) {
    txArray_tag*& place = hostarray::writable(*array).children()[slot];
    txArrayPtr replaced(place);
    place = value.release();
}

std::size_t product(std::size_t a, std::size_t b) {
    std::size_t result = 0;
    if (__builtin_mul_overflow(a, b, &result)) hostservices::raiseOutOfMemory();
    return result;
}

} // namespace

txArray_tag* txCreateCellMatrix(std::size_t rows, std::size_t columns) {
    return hostarray::makeArray(txClassCell, 0, rows, columns, hostarray::makeElements(0, 0, product(rows, columns)));
}

txArray_tag* txCreateStructMatrix(std::size_t rows, std::size_t columns, int numFields, const char* const* fieldNames) {
    const std::size_t count = numFields > 0 ? static_cast<std::size_t>(numFields) : 0;
    std::size_t sizeOfNames = 0;
    for (std::size_t i = 0; i < count; ++i)
        sizeOfNames += std::strlen(fieldNames[i]) + 1;
    Elements* elements = hostarray::makeElements(0, 0, product(product(rows, columns), count), sizeOfNames);
    elements->numFields = count;
    char* at = elements->texts();
    for (std::size_t i = 0; i < count; ++i)
        at = stpcpy(at, fieldNames[i]) + 1;
    return hostarray::makeArray(txClassStruct, 0, rows, columns, elements);
}

const txArray_tag* txGetCell(const txArray_tag* array, std::size_t index) {
    return hasCell(array, index) ? array->elements->children()[index] : nullptr;
}

void txSetCell(txArray_tag* array, std::size_t index, txArray_tag* value) {
    txArrayPtr taken(value);
    if (!hasCell(array, index))
        hostservices::raise(category, "NoSuchCell", static_cast<long>(index), std::string(txGetClassName(array)));
    storeChild(array, index, std::move(taken));
}

int txGetNumberOfFields(const txArray_tag* array) {
    return txGetClassID(array) == txClassStruct ? static_cast<int>(array->elements->numFields) : 0;
}

const char* txGetFieldNameByNumber(const txArray_tag* array, int field) {
    if (field < 0 || field >= txGetNumberOfFields(array)) return nullptr;
    const char* name = array->elements->texts();
    for (int i = 0; i < field; ++i)
        name += std::strlen(name) + 1;
    return name;
}

int txGetFieldNumber(const txArray_tag* array, const char* name) {
    const int numFields = txGetNumberOfFields(array);
    const char* at = numFields > 0 ? array->elements->texts() : nullptr;
    for (int i = 0; name && i < numFields; ++i, at += std::strlen(at) + 1)
        if (std::strcmp(at, name) == 0) return i;
    return -1;
}

const txArray_tag* txGetFieldByNumber(const txArray_tag* array, std::size_t index, int field) {
    return hasField(array, index, field) ? array->elements->children()[fieldSlot(array, index, field)] : nullptr;
}

const txArray_tag* txGetField(const txArray_tag* array, std::size_t index, const char* name) {
    return txGetFieldByNumber(array, index, txGetFieldNumber(array, name));
}

void txSetFieldByNumber(txArray_tag* array, std::size_t index, int field, txArray_tag* value) {
    txArrayPtr taken(value);
    if (!hasField(array, index, field))
        hostservices::raise(category, "NoSuchField", static_cast<long>(index), std::to_string(field),
                            std::string(txGetClassName(array)));
    storeChild(array, fieldSlot(array, index, field), std::move(taken));
}

void txSetField(txArray_tag* array, std::size_t index, const char* name, txArray_tag* value) {
    txArrayPtr taken(value);
    const int field = txGetFieldNumber(array, name);
    if (!hasField(array, index, field))
        hostservices::raise(category, "NoSuchField", static_cast<long>(index),
                            "'" + std::string(name ? name : "") + "'", std::string(txGetClassName(array)));
    storeChild(array, fieldSlot(array, index, field), std::move(taken));
}
