// One element of a structure: its name, type, dimensions, signal attributes and, after the layout, its offset.
//
// Elements are made by StructDataType::setNumElements and owned by their record. Views over elements: ElementAccess.h.
//   StructElement* e = structure->getElements()[0];
//   e->setName("pos");
//   e->setDataTypeId(DATA_TYPE_ID_DOUBLE);
#pragma once

#include <limits>
#include <string>

#include "qlplatform/Export.h"

namespace QLTypeSys::structures {
class ElementIndex;
}

/// Names a call of the obsolete interface that takes dimensions as 32-bit integers.
struct ObsoleteIntDimsKey {};

/// One element of a structure. A plain record, not copied: `dims` points into the element when there is one dimension.
/// Who writes type, dimensions or signal type without the setters after views were asked calls
/// StructDataType::clearDFSCache on the structure and on those that contain it.
struct QL_EXPORT StructElement {
    /// The name.
    std::string name;
    int dataTypeId = -10; ///< -10 while not set
    int unitId = -1;      ///< id of a unit, the client's
    int symbDimsId = 0;   ///< symbolic dimensions; 0 is numeric

  private:
    friend class QLTypeSys::structures::ElementIndex;
    bool isIndexed_ = false; // views have read type, dimensions or signal type

  public:
    unsigned long numDims = 0; ///< number of dimensions; an element without any is a scalar
    long* dims = nullptr;      ///< null, `&inlineDim` for one dimension, or an own array of `numDims`
    int* intDims = nullptr;    ///< narrowed copy of `dims`, made on first use; owned
    long inlineDim = 0;        ///< where `dims` points when there is one dimension
    long offset = -1;          ///< bytes from the start of the structure; -1 before the layout
    long varDimsOffset = -1;   ///< where the run-time dimensions lie; the client's
    int signalType = -1;       ///< 1 is complex
    int samplingMode = -1;     ///< 1 is frame based
    int dimensionsMode = -1;   ///< 1 is variable dimensions
    double min = -std::numeric_limits<double>::infinity(); ///< design minimum
    double max = std::numeric_limits<double>::infinity();  ///< design maximum

    StructElement() = default;
    StructElement(const StructElement&) = delete;
    StructElement& operator=(const StructElement&) = delete;
    ~StructElement();

    /// Null stores the empty name.
    void setName(const char* elementName);
    // Setters. Each writes the field of its name; type and signal type also tell the views.
    void setDataTypeId(int id);
    void setUnitId(int id) { unitId = id; }
    void setSymbDimsId(int id) { symbDimsId = id; }
    void setOffset(long bytes) { offset = bytes; }
    void setVarDimsOffset(long bytes) { varDimsOffset = bytes; }
    void setSignalType(int type);
    void setSamplingMode(int mode) { samplingMode = mode; }
    void setDimensionsMode(int mode) { dimensionsMode = mode; }
    void setMin(double value) { min = value; }
    void setMax(double value) { max = value; }

    /// Changes the number of dimensions and keeps those that remain; new ones are 0. None below 1.
    void setNumDimensions(long count);
    /// Writes one dimension. Unchecked: `index` must be below `numDims`.
    void setDimension(long index, long value);
    /// The dimensions as 32-bit integers: the largest 64-bit value becomes 0x7ffffffe, any other keeps its low 32 bits.
    /// Null without dimensions. Owned by the element; good until its number of dimensions changes.
    const int* getDimensionsAsInt(const ObsoleteIntDimsKey& key);
    /// Product of the dimensions; 1 without any. Wraps around beyond 64 bits.
    long getWidth() const {
        unsigned long width = 1;
        for (int i = 0; i < static_cast<int>(numDims); ++i)
            width *= static_cast<unsigned long>(dims[i]);
        return static_cast<long>(width);
    }
    /// Whether there are no dimensions or all of them are 1.
    bool isScalar() const;

    /// Whether a finite minimum is set; also true for NaN and +inf.
    bool getMinSpec() const;
    /// Whether a finite maximum is set; also true for NaN and -inf.
    bool getMaxSpec() const;
    /// The minimum, -inf while none is set.
    double getMin() const;
    /// The maximum, +inf while none is set.
    double getMax() const;
};
