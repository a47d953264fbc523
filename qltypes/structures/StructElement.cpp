#include "qltypes/structures/StructElement.h"

#include <algorithm>
#include <vector>

#include "qltypes/structures/Arithmetic_internal.h"
#include "qltypes/structures/ElementIndex_internal.h"

using QLTypeSys::structures::narrowed;

namespace {

constexpr double largest = std::numeric_limits<double>::max();
constexpr double infinity = std::numeric_limits<double>::infinity();

} // namespace

StructElement::~StructElement() {
    if (numDims > 1) delete[] dims;
    delete[] intDims;
}

void StructElement::setName(const char* elementName) { name = elementName ? elementName : ""; }

// Each write of what the numbering of nodes depends on tells the views.

void StructElement::setDataTypeId(int id) {
    dataTypeId = id;
    if (isIndexed_) QLTypeSys::structures::noteEdit();
}

void StructElement::setSignalType(int type) {
    signalType = type;
    if (isIndexed_) QLTypeSys::structures::noteEdit();
}

void StructElement::setNumDimensions(long count) {
    const auto newCount = count < 1 ? 0ul : static_cast<unsigned long>(count);
    if (newCount == numDims) return;
    long* const newDims = newCount > 1 ? new long[newCount]() : nullptr;
    if (newDims) {
        std::copy_n(dims, std::min(numDims, newCount), newDims);
    } else if (newCount == 1) {
        inlineDim = numDims > 0 ? dims[0] : 0;
    }
    if (numDims > 1) delete[] dims;
    delete[] intDims;
    intDims = nullptr;
    numDims = newCount;
    dims = newCount == 1 ? &inlineDim : newDims;
    if (isIndexed_) QLTypeSys::structures::noteEdit();
}

void StructElement::setDimension(long index, long value) {
    dims[index] = value;
    if (intDims) intDims[index] = narrowed(value);
    if (isIndexed_) QLTypeSys::structures::noteEdit();
}

const int* StructElement::getDimensionsAsInt(const ObsoleteIntDimsKey&) {
    if (!intDims && numDims > 0) {
        intDims = new int[numDims];
        std::transform(dims, dims + numDims, intDims, narrowed);
    }
    return intDims;
}

bool StructElement::isScalar() const {
    return static_cast<int>(numDims) < 1 || std::all_of(dims, dims + numDims, [](long dim) { return dim == 1; });
}

// Written as the negation of a failed comparison: NaN passes both.
bool StructElement::getMinSpec() const { return !(-largest > min); }
bool StructElement::getMaxSpec() const { return !(max > largest); }
double StructElement::getMin() const { return getMinSpec() ? min : -infinity; }
double StructElement::getMax() const { return getMaxSpec() ? max : infinity; }
