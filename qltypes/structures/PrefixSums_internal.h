// Prefix sums of the spans of elements, and the element that an index falls into.
#pragma once

#include <algorithm>
#include <bit>
#include <cstdint>
#include <vector>

#include "qltypes/structures/Arithmetic_internal.h"

namespace QLTypeSys::structures {

class PrefixSums {
  public:
    void reserve(std::size_t numSpans) { sums_.reserve(numSpans + 1); }

    void append(long span) {
        const long sum = wrappingAdd(sums_.back(), span);
        isAscending_ &= sum >= sums_.back();
        sums_.push_back(sum);
    }

    /// Number of spans.
    long size() const { return static_cast<long>(sums_.size()) - 1; }
    /// Sum of the first `count` spans.
    long operator[](long count) const { return sums_[static_cast<std::size_t>(count)]; }
    long total() const { return sums_.back(); }

    /// Prepares find(). Sums of more spans than a few get a directory: the sum's upper bits lead to its first span.
    void finish() {
        if (size() < fewSpans || !isAscending_ || total() <= 0) return;
        shift_ = std::max(0, static_cast<int>(std::bit_width(static_cast<unsigned long>(total() / size()))) - 1);
        const auto numBuckets = static_cast<std::size_t>(total() >> shift_) + 2;
        directory_.resize(numBuckets);
        long span = 0;
        for (std::size_t bucket = 0; bucket < numBuckets; ++bucket) {
            while (span < size() && (*this)[span + 1] < static_cast<long>(bucket << shift_))
                ++span;
            directory_[bucket] = static_cast<std::uint32_t>(span);
        }
    }

    /// The first span, not before `from`, behind which the sum reaches `value`; size() when there is none.
    long find(long value, long from = 0) const {
        const auto reaches = [value](long sum) { return sum >= value; };
        if (!isAscending_) return std::find_if(sums_.begin() + 1 + from, sums_.end(), reaches) - sums_.begin() - 1;
        return std::max(from, findAscending(value));
    }

    bool operator==(const PrefixSums& other) const { return sums_ == other.sums_; }

  private:
    static constexpr long fewSpans = 8;

    long findAscending(long value) const {
        if (value > total()) return size();
        for (const long near : {last_, last_ + 1}) // walks ask for neighbours
            if (near < size() && (*this)[near] < value && value <= (*this)[near + 1]) return last_ = near;
        auto first = sums_.begin() + 1;
        auto end = sums_.end();
        if (!directory_.empty() && value > 0) {
            const auto bucket = static_cast<std::size_t>(value >> shift_);
            end = first + std::min<long>(directory_[bucket + 1] + 1L, size());
            first += directory_[bucket];
        }
        return last_ = std::lower_bound(first, end, value) - sums_.begin() - 1;
    }

    std::vector<long> sums_{0};
    bool isAscending_ = true;              // else widths below 0 make the sums go up and down
    std::vector<std::uint32_t> directory_; // by sum >> shift_: the first span that may reach it
    int shift_ = 0;
    mutable long last_ = 0; // found last
};

} // namespace QLTypeSys::structures
