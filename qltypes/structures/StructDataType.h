// The type record of a structure: an ordered list of elements, what the layout derived from it, and the caches of
// views.
//
// A structure is registered, given its elements, and finished by one layout pass; structures that are nested in it must
// be finished before. The layout: StructLayout.h. Reading elements by any of four numberings: ElementAccess.h. By
// identifier: StructDataTypeUtils.h.
//
//   const int id = table.registerStructDataType("Pose", 2, nullptr);
//   DtSetDataTypeNumElements(&table, "", id, 2);
//   DtGetStructDataTypeObject(&table, id)->getElements()[0]->setName("x"); ...
//   qlsvDiagnosticImpl* failed = DtComputeDerivedStructAttributes(&table, id);
#pragma once

#include <memory>
#include <vector>

#include <boost/unordered_map.hpp>

#include "qlplatform/Export.h"
#include "qlplatform/checksum/Checksum.h"
#include "qltypes/structures/StructElement.h"
#include "qltypes/types/DataType.h"

namespace QLTypeSys {
class DataTypeTable;
}
namespace QLTypeSys::structures {
class ElementIndex;
struct ElementIndexes;
} // namespace QLTypeSys::structures

/// What a depth-first view answered for one index.
struct QL_EXPORT CachedElement {
    /// The element; null while not asked for.
    StructElement* element = nullptr;
    bool ownsElement = false; ///< the entry made the element and deletes it
    long offset = -1;         ///< -1 while not asked for
    long varDimsOffset = -1;  ///< -1 while not asked for

    CachedElement() = default;
    CachedElement(const CachedElement&) = delete;
    CachedElement& operator=(const CachedElement&) = delete;
    ~CachedElement();
};

/// What is asked of a structure again and again, derived from its elements and the structures nested in it.
struct FrequentlyAccessedProperties {
    /// An element, of nested structures too, is frame based.
    bool hasFrameBasedElements;
    /// An element, of nested structures too, has variable dimensions.
    bool hasVarDims;
    bool hasAOB; ///< an array of structures, or a nested structure of variable dimensions
    /// An element, of nested structures too, is complex.
    bool hasComplexData;
    /// An element, of nested structures too, is a string.
    bool hasStringData;
    bool hasConstructFcn; ///< always false, as the next two: see getPlainConstruct() and its like of the record
    /// Always false.
    bool hasDestructFcn;
    /// Always false.
    bool hasDeepCopyFcn;
    /// An element, of nested structures too, is half.
    bool hasHalfPrecisionData;
};

/// The record of a structure. Virtual operations stand in slot order, fields in their order.
class QL_EXPORT StructDataType : public QLTypeSys::DataType {
  public:
    StructDataType(int id, const std::string& name, DataTypeSource source);
    ~StructDataType() override;

    /// Immediate elements.
    virtual long getNumElements() const;
    /// Makes `count` default elements. Called once, on an empty record: a second call abandons the elements that were
    /// there, which are then the caller's to delete.
    virtual void setNumElements(long count);
    /// Leaves, one for each leaf element of each structure instance.
    virtual long getNumFlatElements() const;
    virtual void setNumFlatElements(long count);
    /// Scalar values; a complex one counts twice.
    virtual long getNumRawElements() const;
    virtual void setNumRawElements(long count);
    /// Nodes in depth-first order, the root included.
    virtual long getNumDFSElements() const;
    virtual void setNumDFSElements(long count);
    /// The immediate elements. Owned by the record.
    virtual const std::vector<StructElement*>& getElements() const;
    /// The depth-first index of a leaf, from the vector that setDFSIdxFromFlatIdx set. An index past the end lies in a
    /// further instance of the structure. -1 where the vector has no entry, as for a negative index.
    virtual long getDFSIdxFromFlatIdx(long flatIdx) const;
    /// The flat index of a node; -1 for a node that is no leaf.
    virtual long getFlatIdxFromDFSIdx(const long& dfsIdx) const;
    /// Replaces the vector that the two operations above read.
    virtual void setDFSIdxFromFlatIdx(const std::vector<long>& dfsIdxFromFlatIdx);
    /// A checksum that clients store and read.
    virtual const qlChecksumValue& getDtChecksumValue() const;
    virtual void setDtChecksumValue(const qlChecksumValue& value);
    /// Whether the structure is a bus of the engine.
    virtual bool isBusType() const;

    /// As of every type. Views count instances by the size that stands.
    void setSize(int size) override;
    /// The type ids of the elements, in their order and with duplicates.
    std::vector<int> dependsOn() const override;
    // Work on the leaves of a value is the client's: these do nothing.
    void deepCopyScalarElement(const void* src, void* dst) const override;
    void constructScalarElement(void* p) const override;
    void destroyScalarElement(void* p) const override;

    // The memo: false until cacheForFrequentlyAccessedProperties ran.
    bool hasFrameBasedElements() const { return derived_.hasFrameBasedElements; }
    bool hasVarDims() const { return derived_.hasVarDims; }
    bool hasAOB() const { return derived_.hasAOB; }
    bool hasComplexData() const { return derived_.hasComplexData; }
    bool hasStringData() const { return derived_.hasStringData; }
    bool hasConstructFcn() const { return derived_.hasConstructFcn; }
    bool hasDestructFcn() const { return derived_.hasDestructFcn; }
    bool hasDeepCopyFcn() const { return derived_.hasDeepCopyFcn; }
    bool hasHalfPrecisionData() const { return derived_.hasHalfPrecisionData; }
    /// Derives the flags of the memo and the three plain flags of the record, once: the first answer stands for the
    /// life of the record. Raises `InvalidDataTypeId` for an element without a type.
    FrequentlyAccessedProperties cacheForFrequentlyAccessedProperties(const QLTypeSys::DataTypeTable* table);
    FrequentlyAccessedProperties createCacheForFrequentlyAccessedProperties(const QLTypeSys::DataTypeTable* table);

    /// Whether generated code is to declare padding; false while not decided.
    bool emitPaddingInCode() const { return emitPadding_ == 1; }
    void emitPaddingInCode(bool emit) { emitPadding_ = emit ? 1 : 0; }

    /// Whether the vector of setDFSIdxFromFlatIdx is empty.
    bool isFlatElementCacheEmpty() const { return dfsIdxFromFlatIdx_.empty(); }
    /// Forgets what depth-first views answered and deletes the elements that they made.
    void clearDFSCache();
    /// What a depth-first view answered for an index, all unset when it was not asked. Owned by the record; good until
    /// clearDFSCache.
    CachedElement* getCachedElement(long dfsIdx);

  protected:
    friend struct StructLayoutPass;
    friend class QLTypeSys::structures::ElementIndex;

    long numFlatElements_ = 0;
    long numRawElements_ = 0;
    long numDFSElements_ = 0;
    std::vector<long> dfsIdxFromFlatIdx_;  // filled on first need, or by a client; no change of the elements empties it
    std::vector<StructElement*> elements_; // owned
    qlChecksumValue dtChecksumValue_;
    int emitPadding_ = -1; // -1 not decided, 0 no, 1 yes
    bool propertiesCached_ = false;
    FrequentlyAccessedProperties derived_{};
    boost::unordered_map<long, CachedElement> cachedElements_;

  private:
    FrequentlyAccessedProperties derive(const QLTypeSys::DataTypeTable* table);
    void noteEdit() const;

    long leafNode(long flatIdx) const;
    std::size_t leafAt(long node) const;

    bool dfsIdxFromFlatIdxIsSorted_ = true;
    bool dfsIdxFromFlatIdxIsRun_ = true; // each entry is one more than the entry in front of it
    std::unique_ptr<QLTypeSys::structures::ElementIndexes> indexes_; // made by views, dropped by clearDFSCache
};

/// A structure that is a bus. Clients derive from it and maintain its fields; nothing here writes them.
class QL_EXPORT BusDataType : public StructDataType {
  public:
    using StructDataType::StructDataType;
    ~BusDataType() override;
    bool isBusType() const override;

    /// The minimum that all leaves share; -inf when no leaf has one, +inf when they differ.
    double sameMinValForAllLeaf = -std::numeric_limits<double>::infinity();
    /// The maximum that all leaves share; +inf when no leaf has one, -inf when they differ.
    double sameMaxValForAllLeaf = std::numeric_limits<double>::infinity();
    /// Whether a leaf has symbolic dimensions.
    bool hasLeafWithSymbolicDimensions = false;
};
