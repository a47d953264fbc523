// Dimensions that are all numbers, as a caller hands them in.
//
//   class SignalDims : public QLTypeSys::NumericDims {
//     public:
//       std::size_t getNumDims() const override { return 2; }
//       long getDim(std::size_t i) const override { return i == 0 ? rows : columns; }
//   };
#pragma once

#include <cstddef>

#include "qlplatform/Export.h"

namespace QLTypeSys {

/// The dimensions of an array, all of them numbers. Callers derive from it.
class QL_EXPORT NumericDims {
  public:
    virtual ~NumericDims();

    /// Number of dimensions.
    virtual std::size_t getNumDims() const = 0;

    /// The dimension at `index`, which is below getNumDims().
    virtual long getDim(std::size_t index) const = 0;

    /// The product of all dimensions, 1 when there are none. A product beyond 64 bits keeps its low 64 bits.
    virtual long getWidth() const;
};

} // namespace QLTypeSys
