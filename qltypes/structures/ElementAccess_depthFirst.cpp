// The depth-first view.
#include <charconv>
#include <string_view>

#include "qlplatform/strings/Strings.h"
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/ElementIndex_internal.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/types/DataTypeTable.h"

namespace QLTypeSys {

using structures::ElementIndex;

namespace {

// Calls `step(name, shown index or -1)` for each step of the way to a node.
template <class Step> void followPath(ElementIndex* index, long idx, bool fromRoot, Step step) {
    if (fromRoot && idx < index->numDFS()) step(std::string_view(), 0L);
    for (;;) {
        const ElementIndex::Place at = index->place(idx);
        std::string_view name;
        long shown = at.instance >= 0 ? at.instance : -1;
        if (at.element >= 0) {
            name = index->immediate(at.element).name;
            if (at.isLeaf() || at.nested->width == 1) shown = -1;
        }
        if (at.base >= 0 || !name.empty()) step(name, shown);
        if (at.base < 0 || at.isLeaf()) return;
        idx -= at.base;
        if (at.nested) index = &at.nested->index->current();
    }
}

// What convertFullPathToString makes of the path without a prefix.
std::string pathAsText(ElementIndex* index, long idx, bool fromRoot) {
    std::string text;
    bool isFirst = true;
    followPath(index, idx, fromRoot, [&](std::string_view name, long shown) {
        const bool isInstance = isFirst && name.empty();
        if (!isFirst) text += '.';
        text += name;
        if (isInstance || shown != -1) {
            char digits[24];
            text += '(';
            text.append(digits, std::to_chars(digits, std::end(digits), shown).ptr);
            text += ')';
        }
        isFirst = false;
    });
    return text;
}

} // namespace

DFSElementAccess::~DFSElementAccess() = default;

StructElement& DFSElementAccess::element(long idx) const { return *getStructElement(idx); }

StructElement* DFSElementAccess::getStructElement(long idx) const {
    return ElementIndex::of(table_, dataTypeId_).element(idx);
}

// clang-format off
long DFSElementAccess::getNumElements() const               { return DtGetStructDataTypeObject_AliasedThruIfNeeded(table_, dataTypeId_)->getNumDFSElements(); }
const char* DFSElementAccess::getName(long idx) const       { return element(idx).name.c_str(); }
int DFSElementAccess::getDataTypeId(long idx) const         { return element(idx).dataTypeId; }
int DFSElementAccess::getUnitId(long idx) const             { return element(idx).unitId; }
int DFSElementAccess::getSymbDimsId(long idx) const         { return element(idx).symbDimsId; }
long DFSElementAccess::getNumDimensions(long idx) const     { return static_cast<long>(element(idx).numDims); }
const long* DFSElementAccess::getDimensions(long idx) const { return element(idx).dims; }
long DFSElementAccess::getWidth(long idx) const             { return element(idx).getWidth(); }
int DFSElementAccess::getSignalType(long idx) const         { return element(idx).signalType; }
int DFSElementAccess::getSamplingMode(long idx) const       { return element(idx).samplingMode; }
int DFSElementAccess::getDimensionsMode(long idx) const     { return element(idx).dimensionsMode; }
double DFSElementAccess::getMin(long idx) const             { return element(idx).getMin(); }
double DFSElementAccess::getMax(long idx) const             { return element(idx).getMax(); }
bool DFSElementAccess::isIdxValid(long) const               { return true; }
long DFSElementAccess::getOffset(long idx) const            { return ElementIndex::of(table_, dataTypeId_).offset(idx); }
long DFSElementAccess::getVarDimsOffset(long idx) const     { return ElementIndex::of(table_, dataTypeId_).varDimsOffset(idx); }
long DFSElementAccess::getRawElementIdx(long idx) const     { return ElementIndex::of(table_, dataTypeId_).rawBefore(idx); }
// clang-format on

void DFSElementAccess::computeDataTypeIdAndIndex(long idx, long* immediateIdx, long* arrayIdx, int* dataTypeId,
                                                 long* baseIdx) const {
    const ElementIndex& index = ElementIndex::of(table_, dataTypeId_);
    const ElementIndex::Place at = index.place(idx);
    *immediateIdx = at.element;
    *arrayIdx = at.instance;
    *dataTypeId = at.element >= 0 ? index.immediate(at.element).dataTypeId : dataTypeId_;
    *baseIdx = at.base;
}

void DFSElementAccess::getImmediateParentDTypeIdAndOffset(long idx, int& parentId, long& elementIdx) const {
    ElementIndex* index = &ElementIndex::of(table_, dataTypeId_);
    for (;;) {
        const ElementIndex::Place at = index->place(idx);
        if (at.isRoot() || at.isArrayNode() || at.isLeaf() || at.isHead(idx)) {
            parentId = at.isRoot() ? DATA_TYPE_ID_INVALID : index->viewId();
            elementIdx = at.element;
            return;
        }
        idx -= at.base;
        if (at.nested) index = &at.nested->index->current();
    }
}

void DFSElementAccess::genFlatIdxToDFSIdxCache() const {
    StructDataType* const structure = DtGetStructDataTypeObject_AliasedThruIfNeeded(table_, dataTypeId_);
    if (structure->isFlatElementCacheEmpty())
        structure->setDFSIdxFromFlatIdx(ElementIndex::of(table_, dataTypeId_).leaves());
}

long DFSElementAccess::getFlatElementIdx(long idx) const {
    genFlatIdxToDFSIdxCache();
    return DtGetStructDataTypeObject_AliasedThruIfNeeded(table_, dataTypeId_)->getFlatIdxFromDFSIdx(idx);
}

void DFSElementAccess::getFullPath(long idx, bool fromRoot, Path& path) const {
    const auto numBefore = static_cast<Path::difference_type>(path.size());
    try {
        followPath(&ElementIndex::of(table_, dataTypeId_), idx, fromRoot,
                   [&](std::string_view name, long shown) { path.emplace_back(name, shown); });
    } catch (...) {
        path.erase(path.begin() + numBefore, path.end());
        throw;
    }
}

std::u16string DFSElementAccess::getFullPathAsString(long idx, bool fromRoot) const {
    return scl::string::cvt_string(pathAsText(&ElementIndex::of(table_, dataTypeId_), idx, fromRoot));
}

} // namespace QLTypeSys
