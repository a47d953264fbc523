#include "qltypes/structures/StructDataType.h"

#include <algorithm>

#include "qltypes/structures/Arithmetic_internal.h"
#include "qltypes/structures/ElementIndex_internal.h"
#include "qltypes/structures/TypeMemo_internal.h"
#include "qltypes/types/DataTypeTable.h"

using QLTypeSys::DataType;
using QLTypeSys::DataTypeTable;
using QLTypeSys::structures::quotientInDouble;
using QLTypeSys::structures::wrappingAdd;
using QLTypeSys::structures::wrappingMultiply;
using QLTypeSys::structures::wrappingSubtract;

CachedElement::~CachedElement() {
    if (ownsElement) delete element;
}

StructDataType::StructDataType(int id, const std::string& name, DataTypeSource source)
    : DataType(id, name, source), cachedElements_(11) {
    storageId_ = id;
    qualifier_ = QLTypeSys::dtqStruct;
}

StructDataType::~StructDataType() {
    if (indexes_) indexes_->release(cachedElements_, true);
    for (StructElement* element : elements_)
        delete element;
}

// --- Counts and elements ---------------------------------------------------------------------------------------------

// clang-format off
long StructDataType::getNumElements() const                                     { return static_cast<long>(elements_.size()); }
long StructDataType::getNumFlatElements() const                                 { return numFlatElements_; }
long StructDataType::getNumRawElements() const                                  { return numRawElements_; }
long StructDataType::getNumDFSElements() const                                  { return numDFSElements_; }
void StructDataType::setNumFlatElements(long count)                             { numFlatElements_ = count; }
void StructDataType::setNumRawElements(long count)                             { numRawElements_ = count; noteEdit(); }
void StructDataType::setNumDFSElements(long count)                             { numDFSElements_ = count; noteEdit(); }
const std::vector<StructElement*>& StructDataType::getElements() const          { return elements_; }
const qlChecksumValue& StructDataType::getDtChecksumValue() const               { return dtChecksumValue_; }
void StructDataType::setDtChecksumValue(const qlChecksumValue& value)           { dtChecksumValue_ = value; }
bool StructDataType::isBusType() const                                          { return false; }
void StructDataType::deepCopyScalarElement(const void*, void*) const            {}
void StructDataType::constructScalarElement(void*) const                        {}
void StructDataType::destroyScalarElement(void*) const                          {}
// clang-format on

void StructDataType::setNumElements(long count) {
    std::vector<StructElement*> made(static_cast<std::size_t>(count));
    try {
        for (StructElement*& slot : made)
            slot = new StructElement;
    } catch (...) {
        for (StructElement* element : made)
            delete element;
        throw;
    }
    elements_.swap(made); // kept: over whatever was there
    noteEdit();
}

void StructDataType::setSize(int size) {
    DataType::setSize(size);
    noteEdit();
}

// Only what views have read can be out of date.
void StructDataType::noteEdit() const {
    if (indexes_) QLTypeSys::structures::noteEdit();
}

std::vector<int> StructDataType::dependsOn() const {
    std::vector<int> ids;
    ids.reserve(elements_.size());
    for (const StructElement* element : elements_)
        ids.push_back(element->dataTypeId);
    return ids;
}

// --- Derived flags ---------------------------------------------------------------------------------------------------

namespace {

// What the flags of a structure depend on in an element's type.
struct ElementFlags {
    bool isPlainCopy, isPlainConstruct, isPlainDestroy, isString, isHalf;
    StructDataType* nested; // null for a leaf

    ElementFlags(const DataTypeTable* table, int id) {
        DataType* const resolved = table->getDataTypeAliasedThruTo(id); // raises for an invalid id
        const DataType* const entry = table->getDataTypeAt(static_cast<unsigned long>(id + 1));
        isPlainCopy = entry->getPlainCopy();
        isPlainConstruct = entry->getPlainConstruct();
        isPlainDestroy = entry->getPlainDestroy();
        isString = resolved->getIsType(QLTypeSys::dtqString);
        isHalf = entry->isHalf();
        nested = id != DATA_TYPE_ID_AUTO && resolved->getIsType(QLTypeSys::dtqStruct)
                     ? static_cast<StructDataType*>(resolved)
                     : nullptr;
    }
};

} // namespace

FrequentlyAccessedProperties StructDataType::cacheForFrequentlyAccessedProperties(const DataTypeTable* table) {
    if (propertiesCached_) return derived_;
    propertiesCached_ = true; // before the walk: so it ends in a faulty structure that contains itself
    try {
        derived_ = derive(table);
    } catch (...) {
        propertiesCached_ = false;
        throw;
    }
    return derived_;
}

FrequentlyAccessedProperties StructDataType::derive(const DataTypeTable* table) {
    FrequentlyAccessedProperties found{};
    bool isPlainCopy = true;
    bool isPlainConstruct = true;
    bool isPlainDestroy = true;
    QLTypeSys::structures::TypeMemo<ElementFlags, const DataTypeTable*> types(table);
    for (const StructElement* element : elements_) {
        const ElementFlags& type = types.of(element->dataTypeId);
        bool frame = element->samplingMode == 1;
        bool varDims = element->dimensionsMode == 1;
        if (!type.nested) {
            isPlainCopy &= type.isPlainCopy;
            isPlainConstruct &= type.isPlainConstruct;
            isPlainDestroy &= type.isPlainDestroy;
            found.hasComplexData |= element->signalType == 1;
            found.hasStringData |= type.isString;
            found.hasHalfPrecisionData |= type.isHalf;
        } else { // kept: the plain flags do not pass through a nested structure
            const FrequentlyAccessedProperties nested = type.nested->cacheForFrequentlyAccessedProperties(table);
            found.hasAOB |= !element->isScalar() || varDims || nested.hasAOB;
            frame |= nested.hasFrameBasedElements;
            varDims |= nested.hasVarDims;
            found.hasComplexData |= nested.hasComplexData;
            found.hasStringData |= nested.hasStringData;
            found.hasHalfPrecisionData |= nested.hasHalfPrecisionData;
        }
        found.hasFrameBasedElements |= frame;
        found.hasVarDims |= varDims;
    }
    plainCopy_ = isPlainCopy;
    plainConstruct_ = isPlainConstruct;
    plainDestroy_ = isPlainDestroy;
    return found;
}

FrequentlyAccessedProperties StructDataType::createCacheForFrequentlyAccessedProperties(const DataTypeTable* table) {
    return cacheForFrequentlyAccessedProperties(table);
}

// --- Flat and depth-first indices ------------------------------------------------------------------------------------

// An entry of the vector. In a run, which a structure of leaves alone has, it is not read: that would be memory.
long StructDataType::leafNode(long flatIdx) const {
    return dfsIdxFromFlatIdxIsRun_ ? wrappingAdd(dfsIdxFromFlatIdx_.front(), flatIdx)
                                   : dfsIdxFromFlatIdx_[static_cast<std::size_t>(flatIdx)];
}

// Position of the first entry that is `node`; the size of the vector when there is none.
std::size_t StructDataType::leafAt(long node) const {
    const std::size_t numKnown = dfsIdxFromFlatIdx_.size();
    const auto begin = dfsIdxFromFlatIdx_.begin();
    const auto end = dfsIdxFromFlatIdx_.end();
    if (numKnown == 0) return 0;
    if (dfsIdxFromFlatIdxIsRun_)
        return std::min(numKnown, static_cast<std::size_t>(wrappingSubtract(node, dfsIdxFromFlatIdx_.front())));
    auto found = dfsIdxFromFlatIdxIsSorted_ ? std::lower_bound(begin, end, node) : std::find(begin, end, node);
    if (found != end && *found != node) found = end;
    return static_cast<std::size_t>(found - begin);
}

long StructDataType::getDFSIdxFromFlatIdx(long flatIdx) const {
    if (flatIdx < 0) return -1;
    const auto numKnown = static_cast<long>(dfsIdxFromFlatIdx_.size());
    if (flatIdx < numKnown) return leafNode(flatIdx);
    const long within = numFlatElements_ > 0 ? flatIdx % numFlatElements_ : numKnown;
    if (within >= numKnown) return -1; // counted, but no leaf: of a nested structure that is said to be complex
    return wrappingAdd(wrappingMultiply(quotientInDouble(flatIdx, numFlatElements_), numDFSElements_),
                       leafNode(within));
}

long StructDataType::getFlatIdxFromDFSIdx(const long& dfsIdx) const {
    if (numDFSElements_ <= 0) return -1;
    const bool isFurther = dfsIdx >= numDFSElements_;
    const long instance = isFurther ? dfsIdx / numDFSElements_ : 0;
    const auto position = static_cast<long>(leafAt(isFurther ? dfsIdx % numDFSElements_ : dfsIdx));
    return position == numFlatElements_ ? -1 : wrappingAdd(wrappingMultiply(instance, numFlatElements_), position);
}

void StructDataType::setDFSIdxFromFlatIdx(const std::vector<long>& dfsIdxFromFlatIdx) {
    dfsIdxFromFlatIdx_ = dfsIdxFromFlatIdx;
    const auto begin = dfsIdxFromFlatIdx_.begin();
    const auto end = dfsIdxFromFlatIdx_.end();
    const auto isNoStep = [](long a, long b) { return wrappingAdd(a, 1) != b; };
    dfsIdxFromFlatIdxIsRun_ = std::adjacent_find(begin, end, isNoStep) == end;
    dfsIdxFromFlatIdxIsSorted_ = std::is_sorted(begin, end);
}

// --- What views answered ---------------------------------------------------------------------------------------------

void StructDataType::clearDFSCache() {
    if (indexes_) indexes_->release(cachedElements_, false);
    indexes_.reset();
    cachedElements_.clear();
}

CachedElement* StructDataType::getCachedElement(long dfsIdx) {
    return indexes_ && indexes_->own ? &indexes_->own->written(dfsIdx, true) : &cachedElements_[dfsIdx];
}

BusDataType::~BusDataType() = default;
bool BusDataType::isBusType() const { return true; }
