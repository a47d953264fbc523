// Prints what every cell makes of the same values, one line a level and slot: a digest of the results, of what the
// check says of each block, and of the overflow test. builds_test.py compares the lines of differently made builds.
#include <cstdio>
#include <cstring>

#include "qltypes/conversion/BuiltInConversion.h"
#include "qltypes/conversion/OverflowPrediction_internal.h"
#include "tests/conversion/Support.h"

namespace {

using namespace conversiontest;

// FNV-1a, 64 bits.
struct Digest {
    std::uint64_t value = 14695981039346656037u;
    void add(const void* bytes, std::size_t count) {
        for (std::size_t i = 0; i < count; ++i)
            value = (value ^ static_cast<const unsigned char*>(bytes)[i]) * 1099511628211u;
    }
};

template <class S> std::vector<S> values() {
    std::vector<S> all = specialValues<S>();
    for (const S v : randomValues<S>(5000, 7))
        all.push_back(v);
    if constexpr (std::is_floating_point_v<S>)
        for (const S v : randomNumbersInRange<S>(5000, 8))
            all.push_back(v);
    return all;
}

template <class S> void printCellsOf(const Level& level, const std::vector<S>& source) {
    const std::size_t count = source.size();
    std::vector<std::byte> result(count * sizeof(double));
    for (std::size_t slot = 0; slot < numSlots; ++slot) {
        const Combination c = combinationAt(slot);
        if (c.srcId != idOf<S>) continue;
        const BuiltInConvFcn convert = utGetQlBuiltinDtypeConvFcn(c.srcId, c.dstId, c.overflow, c.rounding);
        const auto run = [&](std::size_t first, std::size_t n, bool check) {
            return convert(source.data() + first, result.data(), n, n, false, false, check, c.srcId, c.dstId,
                           c.overflow, c.rounding);
        };
        const std::size_t sizes[] = {8, 4, 1, 1, 2, 2, 4, 4, 1};
        Digest digest;
        run(0, count, false);
        digest.add(result.data(), count * sizes[c.dstId]);
        constexpr std::size_t block = 37; // odd, so that every tail is met
        for (std::size_t first = 0; first < count; first += block) {
            const std::size_t n = std::min(block, count - first);
            const bool answers[] = {run(first, n, true), overflowExpected(source.data() + first, static_cast<int>(n),
                                                                          c.srcId, false, c.dstId, c.rounding)};
            digest.add(answers, sizeof answers);
        }
        std::printf("%s, %s: %016llx\n", level.name, combinationName(c.srcId, c.dstId, c.rounding, c.overflow).c_str(),
                    static_cast<unsigned long long>(digest.value));
    }
}

} // namespace

int main() {
    forEachType([]<class S> {
        const std::vector<S> source = values<S>();
        onEachLevel([&](const Level& level) { printCellsOf(level, source); });
    });
}
