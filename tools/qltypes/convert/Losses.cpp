#include "convert/Losses.h"

#include <algorithm>

#include "convert/Elements.h"
#include "qltypes/types/DataType.h"

namespace inspector {
namespace {

constexpr std::size_t maxFirst = 10;
constexpr std::size_t runElements = 256;

} // namespace

const char* lossKindName(LossKind kind) {
    return kind == LossKind::Overflow ? "overflow" : kind == LossKind::Precision ? "precision" : "nan";
}

LossCounter::LossCounter(const ConversionMode& mode)
    : mode_(mode), convert_(utGetQlBuiltinDtypeConvFcn(mode.fromId, mode.toId, mode.overflow, mode.rounding)),
      fromSize_(elementSize(mode.fromId)), toSize_(elementSize(mode.toId)) {}

bool LossCounter::wouldOverflow(const std::byte* src, std::size_t count) const {
    return QLTypeSys::DataType::CheckForOverflowDuringDataTypeConversion(src, static_cast<int>(count), mode_.fromId,
                                                                         false, mode_.toId, mode_.rounding);
}

bool LossCounter::convertRun(const std::byte* src, std::byte* dst, std::size_t count) const {
    return convert_(src, dst, count, count, false, false, true, mode_.fromId, mode_.toId, mode_.overflow,
                    mode_.rounding);
}

void LossCounter::note(LossKind kind, std::size_t position, const std::byte* src) {
    ++counts_[static_cast<std::size_t>(kind)];
    if (first_.size() == maxFirst) return;
    std::byte result[maxElementSize];
    convertRun(src, result, 1);
    first_.push_back({position, elementText(mode_.fromId, src), elementText(mode_.toId, result), kind});
}

// Runs without a loss, most of them, are passed at the speed of the library; only the others are looked at one by one.
void LossCounter::convert(const std::vector<std::byte>& src, std::vector<std::byte>& dst) {
    const std::size_t numElements = src.size() / fromSize_;
    dst.resize(numElements * toSize_);
    for (std::size_t at = 0; at < numElements; at += runElements) {
        const std::size_t count = std::min(runElements, numElements - at);
        const std::byte* const from = src.data() + at * fromSize_;
        std::byte* const to = dst.data() + at * toSize_;
        if (convertRun(from, to, count)) continue;
        for (std::size_t i = 0; i < count; ++i) {
            const std::byte* const element = from + i * fromSize_;
            if (convertRun(element, to + i * toSize_, 1)) continue;
            const LossKind kind = isNaN(mode_.fromId, element) ? LossKind::NaN
                                  : wouldOverflow(element, 1)  ? LossKind::Overflow
                                                               : LossKind::Precision;
            note(kind, numValues_ + at + i, element);
        }
    }
    numValues_ += numElements;
}

void LossCounter::predict(const std::vector<std::byte>& src) {
    const std::size_t numElements = src.size() / fromSize_;
    for (std::size_t at = 0; at < numElements; at += runElements) {
        const std::size_t count = std::min(runElements, numElements - at);
        const std::byte* const from = src.data() + at * fromSize_;
        if (!wouldOverflow(from, count)) continue;
        for (std::size_t i = 0; i < count; ++i) {
            const std::byte* const element = from + i * fromSize_;
            if (wouldOverflow(element, 1)) note(LossKind::Overflow, numValues_ + at + i, element);
        }
    }
    numValues_ += numElements;
}

} // namespace inspector
