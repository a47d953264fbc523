// The flat view and the raw view.
#include "qltypes/structures/Arithmetic_internal.h"
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/ElementIndex_internal.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace QLTypeSys {

using namespace structures;

// --- The flat view: each index is converted, each answer is that of the depth-first view -----------------------------

FlatElementAccess::FlatElementAccess(const DataTypeTable* table, int id)
    : StructElementAccess(table, id), dfs_(new DFSElementAccess(table, id)) {}

FlatElementAccess::~FlatElementAccess() { delete dfs_; }

long FlatElementAccess::getDFSIdx(long flatIdx) const {
    const StructDataType* const structure = DtGetStructDataTypeObject_AliasedThruIfNeeded(table_, dataTypeId_);
    if (structure->isFlatElementCacheEmpty()) dfs_->genFlatIdxToDFSIdxCache();
    return structure->getDFSIdxFromFlatIdx(flatIdx);
}

// clang-format off
long FlatElementAccess::getNumElements() const               { return DtGetStructDataTypeObject_AliasedThruIfNeeded(table_, dataTypeId_)->getNumFlatElements(); }
const char* FlatElementAccess::getName(long idx) const       { return dfs_->getName(getDFSIdx(idx)); }
int FlatElementAccess::getDataTypeId(long idx) const         { return dfs_->getDataTypeId(getDFSIdx(idx)); }
int FlatElementAccess::getUnitId(long idx) const             { return dfs_->getUnitId(getDFSIdx(idx)); }
int FlatElementAccess::getSymbDimsId(long idx) const         { return dfs_->getSymbDimsId(getDFSIdx(idx)); }
long FlatElementAccess::getNumDimensions(long idx) const     { return dfs_->getNumDimensions(getDFSIdx(idx)); }
const long* FlatElementAccess::getDimensions(long idx) const { return dfs_->getDimensions(getDFSIdx(idx)); }
long FlatElementAccess::getWidth(long idx) const             { return dfs_->getWidth(getDFSIdx(idx)); }
long FlatElementAccess::getOffset(long idx) const            { return dfs_->getOffset(getDFSIdx(idx)); }
long FlatElementAccess::getVarDimsOffset(long idx) const     { return dfs_->getVarDimsOffset(getDFSIdx(idx)); }
int FlatElementAccess::getSignalType(long idx) const         { return dfs_->getSignalType(getDFSIdx(idx)); }
int FlatElementAccess::getSamplingMode(long idx) const       { return dfs_->getSamplingMode(getDFSIdx(idx)); }
int FlatElementAccess::getDimensionsMode(long idx) const     { return dfs_->getDimensionsMode(getDFSIdx(idx)); }
double FlatElementAccess::getMin(long idx) const             { return dfs_->getMin(getDFSIdx(idx)); }
double FlatElementAccess::getMax(long idx) const             { return dfs_->getMax(getDFSIdx(idx)); }
bool FlatElementAccess::isIdxValid(long) const               { return true; }
std::u16string FlatElementAccess::getFullPathAsString(long idx, bool fromRoot) const { return dfs_->getFullPathAsString(getDFSIdx(idx), fromRoot); }
void FlatElementAccess::getFullPath(long idx, bool fromRoot, Path& path) const { dfs_->getFullPath(getDFSIdx(idx), fromRoot, path); }
// clang-format on

void FlatElementAccess::getImmediateParentDTypeIdAndOffset(long idx, int& parentId, long& elementIdx) const {
    dfs_->getImmediateParentDTypeIdAndOffset(getDFSIdx(idx), parentId, elementIdx);
}

// --- The raw view ----------------------------------------------------------------------------------------------------

namespace {

// An immediate element on the way to a scalar value.
struct RawPlace {
    const StructElement* element;
    const ElementIndex::Nested* nested;
    long before; // values of the structure in front of the element
};

RawPlace rawPlace(const ElementIndex& index, long rawIdx) {
    // kept: values that a nested structure counts twice, being said to be complex, lie behind the last element
    const long found = index.elementAtRaw(rawIdx);
    const long element = std::min(found, index.numImmediate() - 1);
    return {&index.immediate(element), index.nestedIn(element), index.rawSpansBefore(found)};
}

// Goes down to the leaf that holds a value; calls `step(place, instance)` on the way.
template <class Step> const StructElement& findLeaf(const DataTypeTable* table, int id, long rawIdx, Step step) {
    for (ElementIndex* index = &ElementIndex::of(table, id);;) {
        const RawPlace at = rawPlace(*index, rawIdx);
        rawIdx -= at.before;
        const long numRaw = at.nested ? at.nested->numRaw : 1;
        step(at, numRaw == 0 ? 0 : rawIdx / numRaw);
        if (!at.nested || numRaw == 0) return *at.element;
        rawIdx %= numRaw;
        index = &at.nested->index->current();
    }
}

const StructElement& findLeaf(const DataTypeTable* table, int id, long rawIdx) {
    return findLeaf(table, id, rawIdx, [](const RawPlace&, long) {});
}

} // namespace

long RawElementAccess::getNumElements() const {
    return DtGetStructDataTypeObject_AliasedThruIfNeeded(table_, dataTypeId_)->getNumRawElements();
}

bool RawElementAccess::isIdxValid(long idx) const { return idx >= 0 && idx < getNumElements(); }

void RawElementAccess::computeDataTypeIdAndIndex(long rawIdx, long& immediateIdx, int& dataTypeId,
                                                 long& rawBase) const {
    const ElementIndex& index = ElementIndex::of(table_, dataTypeId_);
    if (index.numImmediate() == 0) return;
    const long skipped = wrappingSubtract(index.rawSpansBefore(immediateIdx), rawBase);
    const long found = index.elementAtRaw(wrappingAdd(rawIdx, skipped), immediateIdx);
    immediateIdx = std::min(found, index.numImmediate() - 1);
    dataTypeId = index.immediate(immediateIdx).dataTypeId;
    rawBase = wrappingSubtract(index.rawSpansBefore(found), skipped);
}

int RawElementAccess::getDataTypeId(long rawIdx) const { return findLeaf(table_, dataTypeId_, rawIdx).dataTypeId; }
int RawElementAccess::getUnitId(long rawIdx) const { return findLeaf(table_, dataTypeId_, rawIdx).unitId; }
int RawElementAccess::getSymbDimsId(long rawIdx) const { return findLeaf(table_, dataTypeId_, rawIdx).symbDimsId; }

long RawElementAccess::getOffset(long rawIdx) const {
    long offset = 0;
    findLeaf(table_, dataTypeId_, rawIdx, [&](const RawPlace& at, long instance) {
        const long size = DtGetDataTypeSize(table_, at.element->dataTypeId);
        offset = wrappingAdd(offset, wrappingAdd(at.element->offset, wrappingMultiply(instance, size)));
    });
    return offset;
}

} // namespace QLTypeSys
