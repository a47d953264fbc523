#include "qltypes/dynamic_matrix/DynamicMatrix.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <memory>
#include <new>

#include "qltypes/dynamic_matrix/DynamicMatrixMemoryManager.h"
#include "qltypes/host/Assert_internal.h"

namespace QLTypeSys {

namespace {

constexpr long cUnknown = -1;
constexpr long cInfinite = std::numeric_limits<long>::max();
constexpr unsigned long cUnknownUnsigned = 0xfffffffffffffffe;
constexpr unsigned long cInfiniteUnsigned = 0xffffffffffffffff;
constexpr int cInfiniteNarrow = 0x7ffffffe;

unsigned long encoded(long dim) {
    if (dim == cUnknown) return cUnknownUnsigned;
    if (dim == cInfinite) return cInfiniteUnsigned;
    return static_cast<unsigned long>(dim);
}

long decoded(unsigned long dim) {
    if (dim == cUnknownUnsigned) return cUnknown;
    if (dim == cInfiniteUnsigned) return cInfinite;
    return static_cast<long>(dim);
}

// An unknown dimension, -1, keeps its value among the low 32 bits.
int narrow(long dim) { return dim == cInfinite ? cInfiniteNarrow : static_cast<int>(dim); }

std::vector<long> decoded(unsigned long numDims, const unsigned long* dims) {
    if (numDims > 0xfffffffffffffff) throw std::bad_array_new_length();
    std::vector<long> values(numDims);
    std::transform(dims, dims + numDims, values.begin(), [](unsigned long dim) { return decoded(dim); });
    return values;
}

bool hasDims(const DynamicMatrix& m, unsigned long numDims, const unsigned long* dims) {
    return numDims == m.dims.size() && std::equal(m.dims.begin(), m.dims.end(), dims,
                                                  [](long own, unsigned long other) { return own == decoded(other); });
}

unsigned long byteCount(const DynamicMatrix& m) { return m.elementSize * encoded(static_cast<long>(m.width)); }

void getBuffer(DynamicMatrix& m) {
    m.rawData = DynamicMatrixMemoryManager::GetMemoryManager().GetOrAllocate({&m, m.rawData}, byteCount(m)).second;
}

// A width of 0 gets a buffer of 0 bytes here, unlike in reallocateRawData.
void allocateAndFill(DynamicMatrix& m, const void* source) {
    getBuffer(m);
    if (source && m.rawData) std::memcpy(m.rawData, source, byteCount(m));
}

DynamicMatrix& matrixAt(void* p) { return *static_cast<DynamicMatrix*>(p); }
const DynamicMatrix& matrixAt(const void* p) { return *static_cast<const DynamicMatrix*>(p); }

} // namespace

DynamicMatrix::~DynamicMatrix() {
    if (rawData) DynamicMatrixMemoryManager::GetMemoryManager().Deallocate({this, rawData});
    delete[] intDims;
}

void DynamicMatrix::computeWidth() {
    width = 1;
    for (const long dim : dims)
        width *= static_cast<unsigned long>(dim);
}

void DynamicMatrix::reallocateRawData() {
    computeWidth();
    if (width != 0) {
        getBuffer(*this);
    } else if (rawData) {
        DynamicMatrixMemoryManager::GetMemoryManager().Deallocate({this, rawData});
        rawData = nullptr;
    }
}

void DynamicMatrix::setDim(unsigned long i, long value) {
    long& dim = dims.at(i);
    if (dim == value) return;
    dim = value;
    intDims[i] = narrow(value);
    reallocateRawData();
}

void DynamicMatrix::setDims(const std::vector<long>& values) {
    if (dims.empty()) {
        auto zeros = std::make_unique<int[]>(values.size());
        dims = values;
        delete[] intDims;
        intDims = zeros.release(); // kept: zero and no buffer after the first shaping
        computeWidth();
        return;
    }
    if (dims == values) return;
    QLTYPES_ASSERT(values.size() <= dims.size());
    dims = values;
    std::transform(dims.begin(), dims.end(), intDims, narrow);
    reallocateRawData();
}

void DynamicMatrix::setDims(unsigned long n, const long* values) { setDims(std::vector<long>(values, values + n)); }

int DynamicMatrix::constructFcn(void* matrix, const void*) {
    new (matrix) DynamicMatrix;
    return 1;
}

int DynamicMatrix::destructFcn(void* matrix) {
    matrixAt(matrix).~DynamicMatrix();
    return 1;
}

int DynamicMatrix::copyFcn(void* dst, const void* src) {
    if (dst == src) return 1;
    DynamicMatrix& to = matrixAt(dst);
    const DynamicMatrix& from = matrixAt(src);
    to.setDims(from.dims);
    to.elementSize = from.elementSize;
    allocateAndFill(to, from.rawData);
    return 1;
}

unsigned long DynamicMatrix::getSizeFcn() { return sizeof(DynamicMatrix); }

void* DynamicMatrix::getDataFcn(void* matrix) { return matrixAt(matrix).rawData; }

void DynamicMatrix::getDataDimsFcn(const void* matrix, unsigned long* dims) {
    const DynamicMatrix& m = matrixAt(matrix);
    std::transform(m.dims.begin(), m.dims.end(), dims, encoded);
}

void DynamicMatrix::updateDataDimsFcn(unsigned long numDims, const unsigned long* dims, unsigned long elementSize,
                                      void* matrix) {
    DynamicMatrix& m = matrixAt(matrix);
    // A copy of a source that was never shaped has a buffer, of no bytes, and no dimensions: setDims would only shape it.
    const bool isUnshaped = m.dims.empty() && numDims > 0;
    if (!m.rawData || isUnshaped)
        dataConstructFcn(numDims, dims, elementSize, nullptr, matrix);
    else if (!hasDims(m, numDims, dims)) // the answer of setDims, without the vector
        m.setDims(decoded(numDims, dims));
}

void DynamicMatrix::updateDataDimFcn(unsigned long index, unsigned long value, void* matrix) {
    matrixAt(matrix).setDim(index, decoded(value));
}

int DynamicMatrix::dataConstructFcn(unsigned long numDims, const unsigned long* dims, unsigned long elementSize,
                                    const void* data, void* matrix) {
    DynamicMatrix& m = matrixAt(matrix);
    m.setDims(decoded(numDims, dims));
    m.elementSize = elementSize;
    allocateAndFill(m, data);
    return 1;
}

} // namespace QLTypeSys
