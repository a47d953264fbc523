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
// the caches are short, so that reading and writing overlap, and the source of the next is called for.
constexpr std::size_t blockBytes = 4096;
constexpr std::size_t passingBlockBytes = 1024;
constexpr std::size_t pageBytes = 4096;
constexpr std::size_t numPages = 4;
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
          pastCaches_(vectors.src != vectors.dst && readBytes() + writtenBytes() > cachedBytes) {}

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
    std::size_t readBytes() const {
        return vectors_.srcCount > 1 ? (vectors_.dstCount * cell_.srcSize) << vectors_.srcComplex : 0;
    }
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

    // Takes the elements in blocks, `srcBytes` and `dstBytes` of each: step(from, to, count).
    template <class Step> void inBlocks(std::size_t srcBytes, std::size_t dstBytes, Step step) {
        if (pastCaches_) return inPassingBlocks(srcBytes, dstBytes, step);
        const std::size_t perBlock = blockBytes / std::max(srcBytes, dstBytes);
        for (std::size_t done = 0; done < vectors_.dstCount; done += perBlock)
            step(vectors_.src + done * srcBytes, vectors_.dst + done * dstBytes,
                 std::min(perBlock, vectors_.dstCount - done));
    }

    // What goes past the caches is made in a block first and leaves in whole lines. Memory answers faster when several
    // pages are read at once: blocks of four pages in turn, as long as there are so many.
    template <class Step> void inPassingBlocks(std::size_t srcBytes, std::size_t dstBytes, Step step) {
        const std::size_t wider = std::max(srcBytes, dstBytes);
        const std::size_t perBlock = passingBlockBytes / wider, perPage = pageBytes / wider;
        const auto pass = [&](std::size_t first, std::size_t count, std::size_t next) {
            if (srcBytes >= dstBytes) callForSource(next * srcBytes, count * srcBytes);
            step(vectors_.src + first * srcBytes, outgoing_.bytes, count);
            levelInUse->copyToMemory(outgoing_.bytes, vectors_.dst + first * dstBytes, count * dstBytes);
        };
        const std::size_t all = vectors_.dstCount;
        const std::size_t toWholeLine = -reinterpret_cast<std::uintptr_t>(vectors_.dst) % lineBytes / dstBytes;
        std::size_t done = std::min(toWholeLine, all);
        if (done) pass(0, done, done);
        for (; done + numPages * perPage <= all; done += numPages * perPage)
            for (std::size_t block = 0; block < perPage; block += perBlock)
                for (std::size_t page = 0; page < numPages; ++page) {
                    const std::size_t first = done + page * perPage + block;
                    const bool isLast = block + perBlock == perPage;
                    pass(first, perBlock, first + perBlock + (isLast ? (numPages - 1) * perPage : 0));
                }
        for (; done < all; done += perBlock)
            pass(done, std::min(perBlock, all - done), done + perBlock);
    }

    void callForSource(std::size_t offset, std::size_t bytes) const {
        const auto from = reinterpret_cast<std::uintptr_t>(vectors_.src) + offset; // also beyond the end
        for (std::size_t line = 0; line < bytes; line += lineBytes)
            __builtin_prefetch(reinterpret_cast<const void*>(from + line));
    }

    void flat() {
        const int parts = vectors_.srcComplex && !cell_.joinsParts ? 2 : 1;
        if (!pastCaches_ || (cell_.copiesBytes && !convertWhileKept_))
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
