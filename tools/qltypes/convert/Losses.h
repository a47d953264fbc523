// What a conversion loses: counts, and the first few values with their positions.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "qltypes/conversion/BuiltInConversion.h"

namespace inspector {

/// A conversion as the call asks for it.
struct ConversionMode {
    int fromId;
    int toId;
    fxpModeRounding_tag rounding;
    fxpModeOverflow_tag overflow;
};

/// How a value was lost.
enum class LossKind { Overflow, Precision, NaN };

/// "overflow", "precision" or "nan".
const char* lossKindName(LossKind kind);

struct Loss {
    std::size_t position;
    std::string from;
    std::string to;
    LossKind kind;
};

/// Converts block by block and keeps count.
class LossCounter {
  public:
    explicit LossCounter(const ConversionMode& mode);

    /// Converts a block. `dst` is resized to hold the results.
    void convert(const std::vector<std::byte>& src, std::vector<std::byte>& dst);

    /// Counts only the values that would overflow; converts nothing.
    void predict(const std::vector<std::byte>& src);

    std::size_t numValues() const { return numValues_; }
    std::size_t count(LossKind kind) const { return counts_[static_cast<std::size_t>(kind)]; }
    std::size_t numLost() const { return counts_[0] + counts_[1] + counts_[2]; }
    /// The first losses, ten at most.
    const std::vector<Loss>& first() const { return first_; }

  private:
    bool wouldOverflow(const std::byte* src, std::size_t count) const;
    bool convertRun(const std::byte* src, std::byte* dst, std::size_t count) const;
    void note(LossKind kind, std::size_t position, const std::byte* src);

    ConversionMode mode_;
    BuiltInConvFcn convert_;
    std::size_t fromSize_;
    std::size_t toSize_;
    std::size_t numValues_ = 0;
    std::size_t counts_[3] = {};
    std::vector<Loss> first_;
};

} // namespace inspector
