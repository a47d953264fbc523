// Views over the elements of a structure: made on the stack for one question, they answer by index.
//
//   view                    an index counts                                        size
//   ImmediateElementAccess  the direct children, in declared order                 getNumElements()
//
// Every view takes the structure at the end of the alias chain. No view reports an error: an index is checked before.
//   QLTypeSys::ImmediateElementAccess elements(&table, id);
//   elements.getOffset(2);
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "qlplatform/Export.h"
#include "qltypes/structures/StructElement.h"

class StructDataType;

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

    virtual long getNumElements() const = 0;
    virtual const char* getName(long idx) const = 0;
    virtual int getDataTypeId(long idx) const = 0;
    virtual int getUnitId(long idx) const = 0;
    virtual long getNumDimensions(long idx) const = 0;
    /// Owned by the element; null without dimensions.
    virtual const long* getDimensions(long idx) const = 0;
    /// Product of the dimensions, 1 without any.
    virtual long getWidth(long idx) const = 0;
    /// The width, doubled where the signal type is complex.
    virtual long getComplexWidth(long idx) const;
    /// Bytes from the start of the structure.
    virtual long getOffset(long idx) const = 0;
    virtual long getVarDimsOffset(long idx) const = 0;
    virtual int getSignalType(long idx) const = 0;
    virtual int getSamplingMode(long idx) const = 0;
    virtual int getDimensionsMode(long idx) const = 0;
    virtual double getMin(long idx) const = 0;
    virtual double getMax(long idx) const = 0;
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

    int getSymbDimsId(long idx) const;
    const int* getDimensionsAsInt(long idx, const ObsoleteIntDimsKey& key) const;
    bool getMinSpec(long idx) const;
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

} // namespace QLTypeSys
