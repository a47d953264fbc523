#include "qltypes/conversion/Layout_internal.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <cstring>
#include <limits>

#include "qltypes/conversion/Levels_internal.h"

namespace QLTypeSys::conversion {

namespace {

// Where a vector takes two steps it takes them in blocks that stay in the first-level cache. Blocks on their way past
// the caches are short, so that reading and writing overlap, and the source is called for a page ahead.
constexpr std::size_t blockBytes = 4096;
constexpr std::size_t passingBlockBytes = 1024;
constexpr std::size_t bytesAhead = 4096;
constexpr std::size_t lineBytes = 64;

struct alignas(lineBytes) Block {
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
        const bool hasOneSource = cell_.joinsParts ? vectors_.srcCount == 1 : vectors_.srcCount <= 1;
        if (hasOneSource && vectors_.dstCount > 1)
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

    // Takes the elements in blocks, `srcBytes` and `dstBytes` of each: step(from, to, count). What goes past the caches
    // is made in a block first and leaves in whole lines.
    template <class Step> void inBlocks(std::size_t srcBytes, std::size_t dstBytes, Step step) {
        const std::byte* src = vectors_.src;
        std::byte* dst = vectors_.dst;
        const std::size_t wider = std::max(srcBytes, dstBytes);
        const std::size_t perBlock = (pastCaches_ ? passingBlockBytes : blockBytes) / wider;
        const std::size_t toWholeLine = -reinterpret_cast<std::uintptr_t>(dst) % lineBytes / dstBytes;
        std::size_t count = pastCaches_ && toWholeLine ? std::min(toWholeLine, perBlock) : perBlock;
        for (std::size_t left = vectors_.dstCount; left; left -= count, count = perBlock) {
            count = std::min(count, left);
            if (pastCaches_) {
                callForSource(src, count * srcBytes);
                step(src, outgoing_.bytes, count);
                levelInUse->copyToMemory(outgoing_.bytes, dst, count * dstBytes);
            } else {
                step(src, dst, count);
            }
            src += count * srcBytes;
            dst += count * dstBytes;
        }
    }

    static void callForSource(const std::byte* src, std::size_t bytes) {
        const std::uintptr_t ahead = reinterpret_cast<std::uintptr_t>(src) + bytesAhead; // also beyond the end
        for (std::size_t line = 0; line < bytes; line += lineBytes)
            __builtin_prefetch(reinterpret_cast<const void*>(ahead + line), 0, 0);
    }

    void flat() {
        const int parts = vectors_.srcComplex && !cell_.joinsParts ? 2 : 1;
        if (!pastCaches_ || cell_.copiesBytes)
            convertRun(vectors_.src, vectors_.dst, vectors_.dstCount * parts);
        else
            inBlocks(
                cell_.srcSize * parts, cell_.dstSize * parts,
                [&](const std::byte* from, std::byte* to, std::size_t count) { convertRun(from, to, count * parts); });
    }

    void realToComplex() {
        inBlocks(cell_.srcSize, 2 * cell_.dstSize, [&](const std::byte* from, std::byte* to, std::size_t count) {
            convertRun(from, parts_.bytes, count);
            pairsOfSize(cell_.dstSize).addZeroParts(parts_.bytes, to, count);
        });
    }

    void realPartsOnly() {
        inBlocks(2 * cell_.srcSize, cell_.dstSize, [&](const std::byte* from, std::byte* to, std::size_t count) {
            testImaginary(from, count);
            pairsOfSize(cell_.srcSize).takeRealParts(from, parts_.bytes, count);
            convertRun(parts_.bytes, to, count);
        });
    }

    // Complex to boolean: true when either part is. A survivor has no imaginary part, so the check asks as above.
    void joinParts() {
        inBlocks(2 * cell_.srcSize, cell_.dstSize, [&](const std::byte* from, std::byte* to, std::size_t count) {
            testImaginary(from, count);
            if (convertWhileKept_ && kept_) {
                pairsOfSize(cell_.srcSize).takeRealParts(from, parts_.bytes, count);
                kept_ = convertWhileKept_(parts_.bytes, outgoing_.bytes, count) == count;
            }
            run_(from, parts_.bytes, 2 * count);
            for (std::size_t i = 0; i < count; ++i)
                to[i] = parts_.bytes[2 * i] | parts_.bytes[2 * i + 1];
        });
    }

    // One source element for all: converted once, repeated over a block, and the block over the destination.
    void broadcast() {
        Vectors one = vectors_;
        one.dst = parts_.bytes;
        one.dstCount = 1;
        kept_ = convertInLayout(cell_, one, convertWhileKept_ != nullptr);

        const std::size_t element = cell_.dstSize << dstComplex();
        const std::size_t all = vectors_.dstCount * element;
        const std::size_t repeated = std::min(all, blockBytes);
        for (std::size_t filled = element; filled < repeated; filled *= 2)
            std::memcpy(parts_.bytes + filled, parts_.bytes, std::min(filled, repeated - filled));

        const auto copy = [&](const std::byte* from, std::byte* to, std::size_t bytes) {
            if (pastCaches_)
                levelInUse->copyToMemory(from, to, bytes);
            else
                std::memcpy(to, from, bytes);
        };
        std::size_t done = 0;
        for (; done + repeated < all; done += repeated)
            copy(parts_.bytes, vectors_.dst + done, repeated);
        copy(parts_.bytes, vectors_.dst + done, all - done);
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
