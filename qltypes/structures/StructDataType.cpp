#include "qltypes/structures/StructDataType.h"

#include <algorithm>
#include <cmath>

#include "qltypes/structures/Arithmetic_internal.h"
#include "qltypes/structures/ElementIndex_internal.h"
#include "qltypes/types/DataTypeTable.h"

using QLTypeSys::DataType;
using QLTypeSys::DataTypeTable;
using QLTypeSys::structures::wrappingAdd;
using QLTypeSys::structures::wrappingMultiply;

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
    elements_.resize(static_cast<std::size_t>(count));
    for (StructElement*& slot : elements_)
        slot = new StructElement; // kept: over whatever was there
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

FrequentlyAccessedProperties StructDataType::cacheForFrequentlyAccessedProperties(const DataTypeTable* table) {
    if (propertiesCached_) return derived_;
    derived_ = {};
    plainCopy_ = plainConstruct_ = plainDestroy_ = true;
    for (const StructElement* element : elements_) {
        const int typeId = element->dataTypeId;
        bool frame = element->samplingMode == 1;
        bool varDims = element->dimensionsMode == 1;
        DataType* const resolved = table->getDataTypeAliasedThruTo(typeId);
        if (typeId == DATA_TYPE_ID_AUTO || !resolved->getIsType(QLTypeSys::dtqStruct)) {
            const DataType* const entry = table->getDataTypeAt(static_cast<unsigned long>(typeId + 1));
            plainCopy_ &= entry->getPlainCopy();
            plainConstruct_ &= entry->getPlainConstruct();
            plainDestroy_ &= entry->getPlainDestroy();
            derived_.hasComplexData |= element->signalType == 1;
            derived_.hasStringData |= resolved->getIsType(QLTypeSys::dtqString);
            derived_.hasHalfPrecisionData |= entry->isHalf();
        } else { // kept: the plain flags do not pass through a nested structure
            const FrequentlyAccessedProperties nested =
                static_cast<StructDataType*>(resolved)->cacheForFrequentlyAccessedProperties(table);
            derived_.hasAOB |= !element->isScalar() || varDims || nested.hasAOB;
            frame |= nested.hasFrameBasedElements;
            varDims |= nested.hasVarDims;
            derived_.hasComplexData |= nested.hasComplexData;
            derived_.hasStringData |= nested.hasStringData;
            derived_.hasHalfPrecisionData |= nested.hasHalfPrecisionData;
        }
        derived_.hasFrameBasedElements |= frame;
        derived_.hasVarDims |= varDims;
    }
    propertiesCached_ = true;
    return derived_;
}

FrequentlyAccessedProperties StructDataType::createCacheForFrequentlyAccessedProperties(const DataTypeTable* table) {
    return cacheForFrequentlyAccessedProperties(table);
}

// --- Flat and depth-first indices ------------------------------------------------------------------------------------

long StructDataType::getDFSIdxFromFlatIdx(long flatIdx) const {
    const auto numKnown = static_cast<long>(dfsIdxFromFlatIdx_.size());
    if (flatIdx < numKnown) return dfsIdxFromFlatIdx_[static_cast<std::size_t>(flatIdx)];
    const long within = numFlatElements_ > 0 ? flatIdx % numFlatElements_ : numKnown;
    if (within >= numKnown) return -1; // counted, but no leaf: of a nested structure that is said to be complex
    const double quotient = std::floor(static_cast<double>(flatIdx) / static_cast<double>(numFlatElements_));
    return wrappingAdd(wrappingMultiply(static_cast<long>(quotient), numDFSElements_),
                       dfsIdxFromFlatIdx_[static_cast<std::size_t>(within)]);
}

long StructDataType::getFlatIdxFromDFSIdx(const long& dfsIdx) const {
    if (numDFSElements_ <= 0) return -1;
    const bool isFurther = dfsIdx >= numDFSElements_;
    const long instance = isFurther ? dfsIdx / numDFSElements_ : 0;
    const long within = isFurther ? dfsIdx % numDFSElements_ : dfsIdx;
    const auto begin = dfsIdxFromFlatIdx_.begin();
    const auto end = dfsIdxFromFlatIdx_.end();
    auto found = dfsIdxFromFlatIdxIsSorted_ ? std::lower_bound(begin, end, within) : std::find(begin, end, within);
    if (found != end && *found != within) found = end;
    const long position = found - begin;
    return position == numFlatElements_ ? -1 : wrappingAdd(wrappingMultiply(instance, numFlatElements_), position);
}

void StructDataType::setDFSIdxFromFlatIdx(const std::vector<long>& dfsIdxFromFlatIdx) {
    dfsIdxFromFlatIdx_ = dfsIdxFromFlatIdx;
    dfsIdxFromFlatIdxIsSorted_ = std::is_sorted(dfsIdxFromFlatIdx_.begin(), dfsIdxFromFlatIdx_.end());
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
