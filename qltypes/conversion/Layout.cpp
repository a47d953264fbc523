#include "qltypes/conversion/Layout_internal.h"

#include <algorithm>
#include <bit>
#include <cstring>
#include <limits>

#include "qltypes/conversion/Levels_internal.h"

namespace QLTypeSys::conversion {

namespace {

// A vector goes through the caches in blocks: long enough to amortise the calls, short enough that a block and what is
// made of it stay in the first-level cache.
constexpr std::size_t blockElements = 512;
constexpr std::size_t blockBytes = blockElements * sizeof(double);

struct alignas(64) Block {
    std::byte bytes[blockBytes];
};

// Complex pairs as numbers of twice the width: the real part is the low half.
struct PairOperations {
    void (*addZeroParts)(const std::byte* real, std::byte* pairs, std::size_t count);
    void (*takeRealParts)(const std::byte* pairs, std::byte* real, std::size_t count);
    bool (*anyImaginary)(const std::byte* pairs, std::size_t count, bool hasSignedZero);
};

template <class Part, class Pair> struct Pairs {
    static constexpr int width = std::numeric_limits<Part>::digits;

    static void addZeroParts(const std::byte* real, std::byte* pairs, std::size_t count) {
        for (std::size_t i = 0; i < count; ++i) {
            Part part;
            std::memcpy(&part, real + i * sizeof(Part), sizeof(Part));
            const Pair pair = part;
            std::memcpy(pairs + i * sizeof(Pair), &pair, sizeof(Pair));
        }
    }

    static void takeRealParts(const std::byte* pairs, std::byte* real, std::size_t count) {
        for (std::size_t i = 0; i < count; ++i)
            std::memcpy(real + i * sizeof(Part), pairs + i * sizeof(Pair), sizeof(Part));
    }

    static bool anyImaginary(const std::byte* pairs, std::size_t count, bool hasSignedZero) {
        const Part significant =
            hasSignedZero ? std::numeric_limits<Part>::max() >> 1 : std::numeric_limits<Part>::max();
        Part found = 0;
        for (std::size_t i = 0; i < count; ++i) {
            Part part;
            std::memcpy(&part, pairs + i * sizeof(Pair) + sizeof(Part), sizeof(Part));
            found |= part;
        }
        return (found & significant) != 0;
    }

    static constexpr PairOperations operations = {addZeroParts, takeRealParts, anyImaginary};
};

__extension__ using Unsigned128 = unsigned __int128;

constexpr PairOperations pairOperations[] = {
    Pairs<std::uint8_t, std::uint16_t>::operations, Pairs<std::uint16_t, std::uint32_t>::operations,
    Pairs<std::uint32_t, std::uint64_t>::operations, Pairs<std::uint64_t, Unsigned128>::operations};

const PairOperations& pairsOfSize(std::size_t size) { return pairOperations[std::countr_zero(size)]; }

class Conversion {
  public:
    Conversion(const Cell& cell, const Vectors& vectors, bool check)
        : cell_(cell), vectors_(vectors), run_(levelInUse->convert[cell.slot]),
          convertWhileKept_(check ? levelInUse->convertWhileKept[cell.srcId][cell.dstId] : nullptr),
          pastCaches_(vectors.src != vectors.dst && writtenBytes() > cachedBytes) {}

    bool run() {
        const bool single = cell_.joinsParts ? vectors_.srcCount == 1 : vectors_.srcCount <= 1;
        if (single)
            broadcast();
        else if (cell_.joinsParts && vectors_.srcComplex)
            joinParts();
        else if (vectors_.srcComplex == dstComplex())
            flat();
        else if (vectors_.srcComplex)
            realPartsOnly();
        else
            realToComplex();
        if (pastCaches_) levelInUse->finishCopies();
        return kept_;
    }

  private:
    bool dstComplex() const { return vectors_.dstComplex && !cell_.joinsParts; }
    std::size_t writtenBytes() const { return (vectors_.dstCount * cell_.dstSize) << dstComplex(); }

    // Converts a run and notes whether something was lost; the first loss settles it.
    void convertRun(const std::byte* src, std::byte* dst, std::size_t count) {
        if (convertWhileKept_ && kept_) {
            const std::size_t done = convertWhileKept_(src, dst, count);
            if (done == count) return;
            kept_ = false;
            src += done * cell_.srcSize;
            dst += done * cell_.dstSize;
            count -= done;
        }
        run_(src, dst, count);
    }

    // Dropping an imaginary part that is not zero is a loss.
    void testImaginary(const std::byte* pairs, std::size_t count) {
        if (convertWhileKept_ && kept_)
            kept_ = !pairsOfSize(cell_.srcSize).anyImaginary(pairs, count, cell_.hasSignedZero);
    }

    // Has `write` make the next `bytes` of the destination, there or in a block that then goes past the caches.
    template <class Write> void emit(std::byte*& dst, std::size_t bytes, Write write) {
        if (pastCaches_) {
            write(outgoing_.bytes);
            levelInUse->copyToMemory(outgoing_.bytes, dst, bytes);
        } else {
            write(dst);
        }
        dst += bytes;
    }

    // Calls `step` with the number of elements of each block of the destination in turn.
    template <class Step> void inBlocks(std::size_t count, std::size_t perBlock, Step step) {
        for (; count > perBlock; count -= perBlock)
            step(perBlock);
        step(count);
    }

    void flat() {
        const std::byte* src = vectors_.src;
        std::byte* dst = vectors_.dst;
        const std::size_t all = vectors_.dstCount << vectors_.srcComplex * !cell_.joinsParts;
        if (!pastCaches_ || cell_.copiesBytes) return convertRun(src, dst, all);
        inBlocks(all, blockElements, [&](std::size_t count) {
            emit(dst, count * cell_.dstSize, [&](std::byte* to) { convertRun(src, to, count); });
            src += count * cell_.srcSize;
        });
    }

    void realToComplex() {
        const std::byte* src = vectors_.src;
        std::byte* dst = vectors_.dst;
        inBlocks(vectors_.dstCount, blockElements / 2, [&](std::size_t count) {
            convertRun(src, parts_.bytes, count);
            emit(dst, 2 * count * cell_.dstSize,
                 [&](std::byte* to) { pairsOfSize(cell_.dstSize).addZeroParts(parts_.bytes, to, count); });
            src += count * cell_.srcSize;
        });
    }

    void realPartsOnly() {
        const std::byte* src = vectors_.src;
        std::byte* dst = vectors_.dst;
        inBlocks(vectors_.dstCount, blockElements / 2, [&](std::size_t count) {
            testImaginary(src, count);
            pairsOfSize(cell_.srcSize).takeRealParts(src, parts_.bytes, count);
            emit(dst, count * cell_.dstSize, [&](std::byte* to) { convertRun(parts_.bytes, to, count); });
            src += 2 * count * cell_.srcSize;
        });
    }

    // Complex to boolean: true when either part is. A survivor has no imaginary part, so the check asks as above.
    void joinParts() {
        const std::byte* src = vectors_.src;
        std::byte* dst = vectors_.dst;
        inBlocks(vectors_.dstCount, blockElements / 2, [&](std::size_t count) {
            testImaginary(src, count);
            if (convertWhileKept_ && kept_) {
                pairsOfSize(cell_.srcSize).takeRealParts(src, parts_.bytes, count);
                kept_ = convertWhileKept_(parts_.bytes, outgoing_.bytes, count) == count;
            }
            run_(src, parts_.bytes, 2 * count);
            emit(dst, count, [&](std::byte* to) {
                for (std::size_t i = 0; i < count; ++i)
                    to[i] = parts_.bytes[2 * i] | parts_.bytes[2 * i + 1];
            });
            src += 2 * count * cell_.srcSize;
        });
    }

    // One source element for all: converted once, repeated over a block, and the block over the destination.
    void broadcast() {
        Vectors one = vectors_;
        one.dst = parts_.bytes;
        one.srcCount = 2; // steps, for the one element there is
        one.dstCount = 1;
        kept_ = convertInLayout(cell_, one, convertWhileKept_ != nullptr);

        const std::size_t element = cell_.dstSize << dstComplex();
        const std::size_t all = vectors_.dstCount * element;
        const std::size_t repeated = std::min(all, blockBytes);
        for (std::size_t filled = element; filled < repeated; filled *= 2)
            std::memcpy(parts_.bytes + filled, parts_.bytes, std::min(filled, repeated - filled));

        std::byte* dst = vectors_.dst;
        inBlocks(all, blockBytes, [&](std::size_t bytes) {
            if (pastCaches_)
                levelInUse->copyToMemory(parts_.bytes, dst, bytes);
            else
                std::memcpy(dst, parts_.bytes, bytes);
            dst += bytes;
        });
    }

    const Cell& cell_;
    const Vectors& vectors_;
    ConvertRun run_;
    KeepingRun convertWhileKept_; // null: nothing to check
    bool pastCaches_;
    bool kept_ = true;
    Block parts_;
    Block outgoing_;
};

} // namespace

bool convertInLayout(const Cell& cell, const Vectors& vectors, bool check) {
    return vectors.dstCount == 0 || Conversion(cell, vectors, check).run();
}

} // namespace QLTypeSys::conversion
