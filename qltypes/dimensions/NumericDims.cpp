#include "qltypes/dimensions/NumericDims.h"

namespace QLTypeSys {

NumericDims::~NumericDims() = default;

long NumericDims::getWidth() const {
    unsigned long width = 1; // wraps where a long would be undefined
    for (std::size_t i = 0; i < getNumDims(); ++i)
        width *= static_cast<unsigned long>(getDim(i));
    return static_cast<long>(width);
}

} // namespace QLTypeSys
