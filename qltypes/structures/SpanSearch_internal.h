// The span that a number falls into, where spans lie one behind the other and the end of each is known.
#pragma once

#include <algorithm>
#include <bit>
#include <cstdint>
#include <vector>

namespace QLTypeSys::structures {

/// Searches the ends of spans, which `endOf(i)` gives; endOf(-1) is 0. The ends may go down where widths are below 0.
class SpanSearch {
  public:
    /// Prepares find(): many spans get a directory by the upper bits of their ends.
    template <class EndOf> void prepare(long numSpans, EndOf endOf) {
        directory_.clear();
        last_ = 0;
        spansByEnd_ = 0;
        numSpans_ = numSpans;
        isAscending_ = true;
        for (long i = 0; i < numSpans; ++i)
            isAscending_ &= endOf(i) >= endOf(i - 1);
        const long total = endOf(numSpans - 1);
        if (numSpans < fewSpans || !isAscending_ || total <= 0) return;
        spansByEnd_ = static_cast<double>(numSpans) / static_cast<double>(total);
        shift_ = std::max(0, static_cast<int>(std::bit_width(static_cast<unsigned long>(total / numSpans))) - 1);
        long span = 0;
        for (long start = 0; start <= total + (1L << shift_); start += 1L << shift_) {
            while (span < numSpans - 1 && endOf(span) < start)
                ++span;
            directory_.push_back(static_cast<std::uint32_t>(span));
        }
    }

    /// The first span, not before `from`, that ends at `value` or behind it; the number of spans when there is none.
    template <class EndOf> long find(long value, EndOf endOf, long from = 0) const {
        if (!isAscending_) {
            while (from < numSpans_ && endOf(from) < value)
                ++from;
            return from;
        }
        return std::max(from, findAscending(value, endOf));
    }

  private:
    static constexpr long fewSpans = 8;

    template <class EndOf> long findAscending(long value, EndOf endOf) const {
        if (numSpans_ == 0 || value > endOf(numSpans_ - 1)) return numSpans_;
        // Walks ask for neighbours, and spans of one length need no search.
        const auto even = std::min(static_cast<long>(static_cast<double>(value - 1) * spansByEnd_), numSpans_ - 1);
        for (const long near : {last_, last_ + 1, std::max(even, 0L)})
            if (near < numSpans_ && endOf(near - 1) < value && value <= endOf(near)) return last_ = near;
        long low = 0;
        long high = numSpans_ - 1; // it ends at `value` or behind it
        if (!directory_.empty() && value > 0) {
            const auto bucket = static_cast<std::size_t>(value >> shift_);
            low = directory_[bucket];
            high = directory_[bucket + 1];
        }
        while (high - low > fewSpans) {
            const long middle = low + (high - low) / 2;
            if (endOf(middle) < value)
                low = middle + 1;
            else
                high = middle;
        }
        while (low < high && endOf(low) < value)
            ++low;
        return last_ = low;
    }

    long numSpans_ = 0;
    bool isAscending_ = true;
    int shift_ = 0;
    double spansByEnd_ = 0;
    std::vector<std::uint32_t> directory_; // by number >> shift_: the first span that may end at or behind it
    mutable long last_ = 0;                // found last
};

} // namespace QLTypeSys::structures
