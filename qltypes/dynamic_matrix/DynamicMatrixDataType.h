// The type record of a dynamic matrix, named after its element type and its rank.
//
//   const int id = table.registerDynamicMatrixDataType(DATA_TYPE_ID_DOUBLE, 2); // "dynmat_double_2d_t"
//
// Values and the functions that handle them: DynamicMatrix.h.
#pragma once

#include <string>

#include "qlplatform/Export.h"
#include "qltypes/types/DataType.h"

namespace QLTypeSys {

class DataTypeTable;

/// The record of a dynamic matrix type.
class QL_EXPORT DynamicMatrixDataType : public DataType {
  public:
    DynamicMatrixDataType(DataTypeTable* table, int id, const std::string& name);
    ~DynamicMatrixDataType() override;

    /// The registered name; while the hook "DisplayDynamicMatrixType" is 1, the name computed from element type and
    /// rank.
    const char* getName() const override;
    bool isDynamicMatrix() const override;
    /// The new value has as many dimensions as the type, all 0, and knows the size of its elements.
    void constructScalarElement(void* p) const override;

    /// Bytes of one element.
    long getElementSize() const { return elementSize_; }

    /// "dynmat_", the name of the element type, "_", the rank and "d_t". Throws std::logic_error when the element type
    /// answers no name. Unchecked: `elementId` must be valid.
    static std::string ComputeName(const DataTypeTable* table, int elementId, unsigned long numDims);

    /// Sets size, contained type and rank of this record, which must stand in the table, and installs the functions of
    /// DynamicMatrix with their names.
    void RegisterCallbacks(DataTypeTable* table, int elementId, unsigned long numDims);

  private:
    std::string displayName_;
    long elementSize_ = 0;
};

} // namespace QLTypeSys
