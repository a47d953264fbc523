// The set of indices that a view answered. It costs nothing for indices asked in order, a bit for those asked at
// random, and more only for indices far past the end of a structure.
#pragma once

#include <bit>
#include <cstdint>
#include <unordered_map>
#include <vector>

namespace QLTypeSys::structures {

class AskedSet {
  public:
    /// Empties the set; indices below `numNodes` are to be asked often.
    void reset(long numNodes) {
        below_ = 0;
        numDense_ = numNodes <= mostDense ? numNodes : 0;
        dense_.clear();
        sparse_.clear();
    }

    bool isEmpty() const { return below_ == 0 && dense_.empty() && sparse_.empty(); }

    bool contains(long idx) const {
        if (idx < below_) return idx >= 0;
        if (idx < numDense_) return !dense_.empty() && (dense_[wordOf(idx)] & bitOf(idx));
        const auto found = sparse_.find(idx / 64);
        return found != sparse_.end() && (found->second & bitOf(idx));
    }

    void add(long idx) {
        if (idx < below_) return;
        if (idx == below_)
            ++below_;
        else if (idx < numDense_) {
            if (dense_.empty()) dense_.resize(wordOf(numDense_ - 1) + 1);
            dense_[wordOf(idx)] |= bitOf(idx);
        } else {
            sparse_[idx / 64] |= bitOf(idx);
        }
    }

    /// All indices from 0 up to `numAsked` are in the set; others may be too.
    long below() const { return below_; }

    /// Adds all indices from 0 up to but not including `limit`.
    void addBelow(long limit) {
        if (limit > below_) below_ = limit;
    }

    template <class Visit> void forEach(Visit visit) const {
        for (long idx = 0; idx < below_; ++idx)
            visit(idx);
        for (std::size_t word = 0; word < dense_.size(); ++word)
            forEachBit(static_cast<long>(word), dense_[word], visit);
        for (const auto& [word, bits] : sparse_)
            forEachBit(word, bits, visit);
    }

  private:
    static constexpr long mostDense = 1L << 26; // 8 MiB of bits

    static std::size_t wordOf(long idx) { return static_cast<std::size_t>(idx) / 64; }
    static std::uint64_t bitOf(long idx) { return std::uint64_t{1} << (idx % 64); }

    template <class Visit> void forEachBit(long word, std::uint64_t bits, Visit visit) const {
        for (; bits; bits &= bits - 1)
            if (const long idx = word * 64 + std::countr_zero(bits); idx >= below_) visit(idx);
    }

    long below_ = 0;
    long numDense_ = 0;
    std::vector<std::uint64_t> dense_;
    std::unordered_map<long, std::uint64_t> sparse_;
};

} // namespace QLTypeSys::structures
