// Views over the elements of a structure: made on the stack for one question, they answer by index.
//
//   view                    an index counts
//   ImmediateElementAccess  the direct children, in declared order
//   DFSElementAccess        every node in depth-first order: the root, leaves, instances of nested structures, and each
//                           array of nested structures as a whole, in front of its instances
//   FlatElementAccess       the leaves, one for each leaf element of each structure instance
//   RawElementAccess        the scalar values; a complex one counts twice
//
// In a structure Outer of int8 x and two Inner y, where Inner has double a(3) and complex single b:
//
//   depth-first  0  1  2  3     4       5       6     7       8
//   node            x  y  y(0)  y(0).a  y(0).b  y(1)  y(1).a  y(1).b
//   flat            0           1       2             3       4
//   raw             0           1-3     4, 5          6-8     9, 10
//   offset       0  0  8  8     8       32      40    40      64
//
// Every view takes the structure at the end of the alias chain. No view reports an error: an index is checked before.
//   QLTypeSys::FlatElementAccess leaves(&table, id);
//   leaves.getOffset(3); leaves.getFullPathAsString(3, false);
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "qlplatform/Export.h"
#include "qltypes/structures/StructElement.h"

class StructDataType;

namespace QLTypeSys::structures {
class ElementIndex;
}

namespace QLTypeSys {

class DataTypeTable;

/// What every view answers. Virtual operations stand in slot order. Unchecked: an index must be valid.
class QL_EXPORT StructElementAccess {
  public:
    /// A way from a structure down to a node: the name of each step and its array index, -1 where none is shown.
    using Path = std::vector<std::pair<std::string, long>>;

    /// Keeps `table`, which must outlive the view. Unchecked: `id` must be a structure or an alias of one.
    StructElementAccess(const DataTypeTable* table, int id) : table_(table), dataTypeId_(id) {}
    virtual ~StructElementAccess();

    /// Number of elements that the view numbers.
    virtual long getNumElements() const = 0;
    /// The name of the element. Owned by the element.
    virtual const char* getName(long idx) const = 0;
    /// The type of the element, aliases not resolved.
    virtual int getDataTypeId(long idx) const = 0;
    /// The client's id of a unit; -1 for none.
    virtual int getUnitId(long idx) const = 0;
    /// Number of dimensions; 0 for a plain scalar.
    virtual long getNumDimensions(long idx) const = 0;
    /// Owned by the element; null without dimensions.
    virtual const long* getDimensions(long idx) const = 0;
    /// Product of the dimensions, 1 without any.
    virtual long getWidth(long idx) const = 0;
    /// The width, doubled where the signal type is complex.
    virtual long getComplexWidth(long idx) const;
    /// Bytes from the start of the structure.
    virtual long getOffset(long idx) const = 0;
    /// Where the run-time dimensions lie, as the client set it.
    virtual long getVarDimsOffset(long idx) const = 0;
    /// 1 is complex; -1 while not set.
    virtual int getSignalType(long idx) const = 0;
    /// 1 is frame based; -1 while not set.
    virtual int getSamplingMode(long idx) const = 0;
    /// 1 is variable dimensions; -1 while not set.
    virtual int getDimensionsMode(long idx) const = 0;
    /// Design minimum; -inf for none.
    virtual double getMin(long idx) const = 0;
    /// Design maximum; inf for none.
    virtual double getMax(long idx) const = 0;
    /// Whether the view answers for `idx`.
    virtual bool isIdxValid(long idx) const = 0;

    /// A path as text, such as "y(1).b", behind `prefix`.
    static std::string convertFullPathToString(const Path& path, const std::string& prefix);

  protected:
    const DataTypeTable* table_;
    int dataTypeId_;
};

/// The direct children of a structure.
class QL_EXPORT ImmediateElementAccess : public StructElementAccess {
  public:
    using StructElementAccess::StructElementAccess;
    ~ImmediateElementAccess() override;

    long getNumElements() const override;
    const char* getName(long idx) const override;
    int getDataTypeId(long idx) const override;
    int getUnitId(long idx) const override;
    long getNumDimensions(long idx) const override;
    const long* getDimensions(long idx) const override;
    long getWidth(long idx) const override;
    long getOffset(long idx) const override;
    long getVarDimsOffset(long idx) const override;
    int getSignalType(long idx) const override;
    int getSamplingMode(long idx) const override;
    int getDimensionsMode(long idx) const override;
    double getMin(long idx) const override;
    double getMax(long idx) const override;
    /// Whether `idx` is from 0 up to but not including the number of elements.
    bool isIdxValid(long idx) const override;

    /// The symbolic dimensions; 0 is numeric.
    int getSymbDimsId(long idx) const;
    /// The dimensions as 32-bit integers, as StructElement::getDimensionsAsInt.
    const int* getDimensionsAsInt(long idx, const ObsoleteIntDimsKey& key) const;
    /// Whether the element has a design minimum.
    bool getMinSpec(long idx) const;
    /// Whether the element has a design maximum.
    bool getMaxSpec(long idx) const;
    /// Whether the element has no dimensions or all of them are 1.
    bool isScalar(long idx) const;
    /// Unused bytes behind the element: those in front of its successor, or at the end of the structure.
    int getPadding(long idx) const;
    /// Sets the flags for which this structure or a bus in it has an array of buses, variable dimensions, or frames.
    /// Leaves the others as they are.
    void containsAoBOrVarDimsOrFrames(bool* arraysOfBuses, bool* varDims, bool* frames) const;
    /// Number of scalar values in front of the element.
    long getRawElementIdx(long idx) const;

  private:
    StructDataType* structure() const;
    StructElement* element(long idx) const;
};

/// All nodes of a structure in depth-first order. An index past the end lies in a further instance of the structure.
/// The offsets and elements that were answered once stay the same until StructDataType::clearDFSCache.
class QL_EXPORT DFSElementAccess : public StructElementAccess {
  public:
    using StructElementAccess::StructElementAccess;
    ~DFSElementAccess() override;

    long getNumElements() const override;
    const char* getName(long idx) const override;
    int getDataTypeId(long idx) const override;
    int getUnitId(long idx) const override;
    long getNumDimensions(long idx) const override;
    const long* getDimensions(long idx) const override;
    long getWidth(long idx) const override;
    long getOffset(long idx) const override;
    /// All instances of an array share the offset of the first.
    long getVarDimsOffset(long idx) const override;
    int getSignalType(long idx) const override;
    int getSamplingMode(long idx) const override;
    int getDimensionsMode(long idx) const override;
    double getMin(long idx) const override;
    double getMax(long idx) const override;
    /// Always true.
    bool isIdxValid(long idx) const override;

    /// The symbolic dimensions; 0 is numeric.
    int getSymbDimsId(long idx) const;
    /// The element that stands for a node: the declared one for a leaf and for an array as a whole; one made for the
    /// purpose, with a single dimension of 1, for the root and for an instance of a nested structure. Not to be
    /// changed. Owned by a structure; one made for the purpose is good until StructDataType::clearDFSCache.
    StructElement* getStructElement(long idx) const;
    /// On the way to a node: the immediate element (-1 for the root and past the end), its instance (-1 for an array as
    /// a whole; past the end that of the structure), its type, and the index at which the numbering of that instance
    /// starts (-1 for the root and for an array as a whole).
    void computeDataTypeIdAndIndex(long idx, long* immediateIdx, long* arrayIdx, int* dataTypeId, long* baseIdx) const;
    /// The structure that directly contains a node, and the node's element in it; -10 and -1 for the root.
    void getImmediateParentDTypeIdAndOffset(long idx, int& parentId, long& elementIdx) const;
    /// Number of scalar values in front of the node.
    long getRawElementIdx(long idx) const;
    /// Fills the structure's vector of depth-first indices of leaves, if it is empty.
    void genFlatIdxToDFSIdxCache() const;
    /// The flat index of a leaf; -1 for any other node.
    long getFlatElementIdx(long idx) const;
    /// Appends the way to a node. `fromRoot` puts the structure itself in front, unless the index is past the end.
    void getFullPath(long idx, bool fromRoot, Path& path) const;
    /// The way to a node as UTF-16 text, such as u"y(1).b".
    std::u16string getFullPathAsString(long idx, bool fromRoot) const;

  private:
    StructElement& element(long idx) const;
};

/// The leaves of a structure. An index past the end lies in a further instance of the structure.
class QL_EXPORT FlatElementAccess : public StructElementAccess {
  public:
    FlatElementAccess(const DataTypeTable* table, int id);
    FlatElementAccess(const FlatElementAccess&) = delete;
    FlatElementAccess& operator=(const FlatElementAccess&) = delete;
    ~FlatElementAccess() override;

    long getNumElements() const override;
    const char* getName(long idx) const override;
    int getDataTypeId(long idx) const override;
    int getUnitId(long idx) const override;
    long getNumDimensions(long idx) const override;
    const long* getDimensions(long idx) const override;
    long getWidth(long idx) const override;
    long getOffset(long idx) const override;
    long getVarDimsOffset(long idx) const override;
    int getSignalType(long idx) const override;
    int getSamplingMode(long idx) const override;
    int getDimensionsMode(long idx) const override;
    double getMin(long idx) const override;
    double getMax(long idx) const override;
    /// Always true.
    bool isIdxValid(long idx) const override;

    /// The depth-first index of a leaf.
    long getDFSIdx(long flatIdx) const;
    /// The symbolic dimensions; 0 is numeric.
    int getSymbDimsId(long idx) const;
    /// As in the depth-first view.
    void getImmediateParentDTypeIdAndOffset(long idx, int& parentId, long& elementIdx) const;
    /// Appends the way to a leaf, as in the depth-first view.
    void getFullPath(long idx, bool fromRoot, Path& path) const;
    /// The way to a leaf as UTF-16 text.
    std::u16string getFullPathAsString(long idx, bool fromRoot) const;

  private:
    DFSElementAccess* dfs_; // owned
};

/// The scalar values of a structure. Unchecked: an index must be valid.
class QL_EXPORT RawElementAccess {
  public:
    /// Keeps `table`, which must outlive the view. Unchecked: `id` must be a structure or an alias of one.
    RawElementAccess(const DataTypeTable* table, int id) : table_(table), dataTypeId_(id) {}

    /// Number of scalar values; a complex one counts twice.
    long getNumElements() const;
    /// Whether `idx` is from 0 up to but not including the number of values.
    bool isIdxValid(long idx) const;
    /// Goes on from the immediate element `immediateIdx`, whose first value is `rawBase`, to the one that holds
    /// `rawIdx`, and leaves its index, type and first value in the three. Start with 0 and 0.
    void computeDataTypeIdAndIndex(long rawIdx, long& immediateIdx, int& dataTypeId, long& rawBase) const;
    /// The type of the element that holds the value, aliases not resolved.
    int getDataTypeId(long rawIdx) const;
    /// The client's id of that element's unit; -1 for none.
    int getUnitId(long rawIdx) const;
    /// That element's symbolic dimensions; 0 is numeric.
    int getSymbDimsId(long rawIdx) const;
    /// Bytes from the start of the structure; the imaginary part of a complex value lies behind its real part.
    long getOffset(long rawIdx) const;

  private:
    const DataTypeTable* table_;
    int dataTypeId_;
};

} // namespace QLTypeSys
