// The value of a dynamic matrix: a record in a signal's memory that points to a buffer whose dimensions change while
// the simulation runs.
//
// The static members are the functions of the type (types/FunctionTypes.h); a simulation calls them by the type's
// identifier. Buffers are owned by DynamicMatrixMemoryManager.h, the type's record is DynamicMatrixDataType.h.
//   DynamicMatrix m;
//   const unsigned long dims[] = {2, 3};
//   DynamicMatrix::updateDataDimsFcn(2, dims, sizeof(double), &m); // m.rawData has room for six
//
// Dimensions inside the record are signed: -1 is unknown, the largest value infinite. The functions take and give them
// unsigned: 0xfffffffffffffffe is unknown, 0xffffffffffffffff infinite.
#pragma once

#include <vector>

#include "qlplatform/Export.h"

namespace QLTypeSys {

/// A matrix. It must stay at one address as long as it has a buffer. Byte-wise copies can exist: they have no right to
/// the buffer, but they share the arrays of dimensions, so exactly one of them is to be destroyed as the last.
struct QL_EXPORT DynamicMatrix {
    void* rawData = nullptr;       ///< the buffer; null until allocated, and while the width is 0
    std::vector<long> dims;        ///< present dimensions; empty until shaped
    int* intDims = nullptr;        ///< narrow copy of the dimensions, owned; zero until they change after the shaping
    unsigned long elementSize = 0; ///< bytes of one element
    unsigned long width = 0;       ///< product of the dimensions
    std::vector<long> reserved1;   ///< stays empty
    std::vector<long> reserved2;   ///< stays empty

    DynamicMatrix() = default;
    DynamicMatrix(const DynamicMatrix&) = delete;
    DynamicMatrix& operator=(const DynamicMatrix&) = delete;
    ~DynamicMatrix();

    /// Stores the product of the dimensions, modulo 2^64, in `width`; 1 when there are none.
    void computeWidth();

    /// Computes the width and gets a buffer for it; a width of 0 gives the buffer back. When the buffer changes, the
    /// old contents are not carried over. A failed allocation leaves `rawData` null.
    void reallocateRawData();

    /// Sets one dimension and gets a buffer for it, unless it has that value already. Throws std::out_of_range.
    void setDim(unsigned long i, long value);

    /// The first time, shapes the record: stores the dimensions without a buffer and leaves `intDims` zero. Later
    /// stores them and gets a buffer, unless they are what they were. The rank is fixed by the type and must not grow.
    void setDims(const std::vector<long>& values);
    void setDims(unsigned long n, const long* values);

    // The functions of the type. Those with a result answer 1, always.

    /// Makes an empty record at `matrix`.
    static int constructFcn(void* matrix, const void* properties);
    /// Takes the record down and frees its buffer.
    static int destructFcn(void* matrix);
    /// Copies dimensions, element size and contents. A source without a buffer leaves the contents unset.
    static int copyFcn(void* dst, const void* src);
    /// The size of the record in bytes.
    static unsigned long getSizeFcn();
    /// The buffer, or null.
    static void* getDataFcn(void* matrix);
    /// Writes each dimension.
    static void getDataDimsFcn(const void* matrix, unsigned long* dims);
    /// Sets all dimensions. On a record without a buffer or without dimensions as dataConstructFcn without initial data;
    /// otherwise `elementSize` is not used.
    static void updateDataDimsFcn(unsigned long numDims, const unsigned long* dims, unsigned long elementSize,
                                  void* matrix);
    /// Sets one dimension. Throws std::out_of_range.
    static void updateDataDimFcn(unsigned long index, unsigned long value, void* matrix);
    /// Sets all dimensions and the element size, gets a buffer, and fills it from `data` unless that is null. Throws
    /// std::bad_array_new_length when `numDims` is above 0xfffffffffffffff.
    static int dataConstructFcn(unsigned long numDims, const unsigned long* dims, unsigned long elementSize,
                                const void* data, void* matrix);
};

} // namespace QLTypeSys
