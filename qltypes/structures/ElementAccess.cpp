// What all views share, and the immediate view.
#include "qltypes/structures/ElementAccess.h"

#include <climits>

#include "qltypes/structures/Arithmetic_internal.h"
#include "qltypes/structures/ElementIndex_internal.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace QLTypeSys {

using namespace structures;

StructElementAccess::~StructElementAccess() = default;
ImmediateElementAccess::~ImmediateElementAccess() = default;

long StructElementAccess::getComplexWidth(long idx) const {
    const long width = getWidth(idx);
    return getSignalType(idx) == 1 ? wrappingMultiply(width, 2) : width;
}

std::string StructElementAccess::convertFullPathToString(const Path& path, const std::string& prefix) {
    std::string text = prefix;
    for (std::size_t i = 0; i < path.size(); ++i) {
        const auto& [name, index] = path[i];
        const bool isInstance = i == 0 && name.empty(); // of the whole structure
        if (!isInstance) {
            if (i > 0 || !prefix.empty()) text += '.';
            text += name;
        }
        if (isInstance || index != -1) text += "(" + std::to_string(index) + ")";
    }
    return text;
}

StructDataType* ImmediateElementAccess::structure() const {
    return DtGetStructDataTypeObject_AliasedThruIfNeeded(table_, dataTypeId_);
}

StructElement* ImmediateElementAccess::element(long idx) const {
    return structure()->getElements()[static_cast<std::size_t>(idx)];
}

// clang-format off
long ImmediateElementAccess::getNumElements() const                   { return structure()->getNumElements(); }
const char* ImmediateElementAccess::getName(long idx) const           { return element(idx)->name.c_str(); }
int ImmediateElementAccess::getDataTypeId(long idx) const             { return element(idx)->dataTypeId; }
int ImmediateElementAccess::getUnitId(long idx) const                 { return element(idx)->unitId; }
int ImmediateElementAccess::getSymbDimsId(long idx) const             { return element(idx)->symbDimsId; }
long ImmediateElementAccess::getNumDimensions(long idx) const         { return static_cast<long>(element(idx)->numDims); }
const long* ImmediateElementAccess::getDimensions(long idx) const     { return element(idx)->dims; }
long ImmediateElementAccess::getWidth(long idx) const                 { return element(idx)->getWidth(); }
long ImmediateElementAccess::getOffset(long idx) const                { return element(idx)->offset; }
long ImmediateElementAccess::getVarDimsOffset(long idx) const         { return element(idx)->varDimsOffset; }
int ImmediateElementAccess::getSignalType(long idx) const             { return element(idx)->signalType; }
int ImmediateElementAccess::getSamplingMode(long idx) const           { return element(idx)->samplingMode; }
int ImmediateElementAccess::getDimensionsMode(long idx) const         { return element(idx)->dimensionsMode; }
double ImmediateElementAccess::getMin(long idx) const                 { return element(idx)->getMin(); }
double ImmediateElementAccess::getMax(long idx) const                 { return element(idx)->getMax(); }
bool ImmediateElementAccess::getMinSpec(long idx) const               { return element(idx)->getMinSpec(); }
bool ImmediateElementAccess::getMaxSpec(long idx) const               { return element(idx)->getMaxSpec(); }
bool ImmediateElementAccess::isScalar(long idx) const                 { return element(idx)->isScalar(); }
bool ImmediateElementAccess::isIdxValid(long idx) const               { return idx >= 0 && idx < getNumElements(); }
// clang-format on

const int* ImmediateElementAccess::getDimensionsAsInt(long idx, const ObsoleteIntDimsKey& key) const {
    return element(idx)->getDimensionsAsInt(key);
}

int ImmediateElementAccess::getPadding(long idx) const {
    long next;
    if (idx < getNumElements() - 1) {
        next = getOffset(idx + 1);
    } else {
        const int size = structure()->getSize();
        next = size == 0x7ffffffe ? LONG_MAX : size;
    }
    const long bytes = wrappingMultiply(getComplexWidth(idx), DtGetDataTypeSize(table_, getDataTypeId(idx)));
    return narrowed(wrappingSubtract(wrappingSubtract(next, getOffset(idx)), bytes));
}

void ImmediateElementAccess::containsAoBOrVarDimsOrFrames(bool* arraysOfBuses, bool* varDims, bool* frames) const {
    for (const StructElement* element : structure()->getElements()) {
        if (element->samplingMode == 1) *frames = true;
        if (element->dimensionsMode == 1) *varDims = true;
        const bool isBus = DtGetDataTypeIsBus(table_, element->dataTypeId);
        if (isBus && (!element->isScalar() || element->dimensionsMode == 1)) *arraysOfBuses = true;
        if (*arraysOfBuses && *varDims && *frames) return;
        if (isBus)
            ImmediateElementAccess(table_, element->dataTypeId)
                .containsAoBOrVarDimsOrFrames(arraysOfBuses, varDims, frames);
    }
}

long ImmediateElementAccess::getRawElementIdx(long idx) const {
    return ElementIndex::of(table_, dataTypeId_).rawSpansBefore(idx);
}

} // namespace QLTypeSys
