// Conversions of vectors, on every level of this processor: any cell and modes, layout, count, alignment and bytes,
// held against the plain loop of the tests.
//
// Eight bytes say what is converted, and how; the rest are the elements, from the beginning again when they run out.
#include <cmath>
#include <cstring>

#include "fuzz/Decoder.h"
#include "fuzz/Fuzz.h"
#include "qltypes/conversion/OverflowPrediction_internal.h"
#include "tests/conversion/PlainLoop.h"

namespace {

using namespace conversiontest;

// Numbers near the ranges of the integers, often with halves, which plain bytes seldom are.
template <class F> Bytes numbersOf(fuzz::Decoder& in) {
    Bytes parts;
    do {
        const int units = static_cast<std::int16_t>(in.twoBytes());
        const F number = static_cast<F>(std::ldexp(units, in.below(32) - 8));
        const auto* const bytes = reinterpret_cast<const std::byte*>(&number);
        parts.insert(parts.end(), bytes, bytes + sizeof number);
    } while (!in.isAtEnd());
    return parts;
}

Bytes bytesOf(fuzz::Decoder& in, std::size_t size) {
    Bytes parts;
    do {
        for (std::size_t i = 0; i < size; ++i)
            parts.push_back(static_cast<std::byte>(in.byte()));
    } while (!in.isAtEnd());
    return parts;
}

Bytes repeated(const Bytes& pool, std::size_t size) {
    Bytes parts(size);
    for (std::size_t i = 0; i < size; ++i)
        parts[i] = pool[i % pool.size()];
    return parts;
}

void checkInPlace(const SlotReference& slot, const Bytes& parts, Call call) {
    Bytes expected = parts, found = parts;
    call.src = parts.data();
    call.dst = expected.data();
    const bool expectedResult = loopOver(slot, call);
    call.src = call.dst = found.data();
    fuzz::claim(convertAsAsked(slot, call) == expectedResult, "the check in place says the same");
    for (std::size_t i = 0; i < found.size(); i += slot.dstSize)
        fuzz::claim(slot.same(&found[i], &expected[i]), "in place it writes the same");
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    fuzz::Decoder in(data, size);
    const int srcId = in.below(numTypes);
    const int dstId = in.below(numTypes);
    const int modes = in.byte();
    const int layout = in.byte();
    const int alignment = in.byte();
    const int how = in.byte();
    const int count = in.byte();
    const auto dstCount = static_cast<std::size_t>(in.byte() < 250 ? count : 8 * count);

    const fxpModeRounding_tag rounding = allRoundings[modes % 7];
    const fxpModeOverflow_tag overflow = allOverflows[modes / 7 % 2];
    const SlotReference& slot = slotReferences[slotOf(srcId, dstId, overflow, rounding)];
    const std::size_t srcCounts[] = {dstCount, dstCount, 0, 1};
    const Call call = {.src = nullptr,
                       .dst = nullptr,
                       .srcCount = srcCounts[layout / 8 % 4],
                       .dstCount = dstCount,
                       .srcComplex = layout % 2 == 1,
                       .dstComplex = layout / 2 % 2 == 1,
                       .check = layout / 4 % 2 == 1};

    const bool steps = slot.dstBoolean && !slot.srcBoolean ? call.srcCount != 1 : call.srcCount > 1;
    const std::size_t numElements = steps ? dstCount : 1; // no more: reading on is seen by the sanitizer
    const Bytes pool = how % 2 == 1 && srcId == idOf<double>  ? numbersOf<double>(in)
                       : how % 2 == 1 && srcId == idOf<float> ? numbersOf<float>(in)
                                                              : bytesOf(in, slot.srcSize);
    const Bytes parts = repeated(pool, (numElements * slot.srcSize) << call.srcComplex);

    const std::size_t cachedBytesBefore = cachedBytes;
    if (how / 2 % 2 == 1) cachedBytes = 100;
    const bool canBeInPlace =
        slot.srcSize == slot.dstSize && call.srcCount == dstCount && steps && (call.srcComplex || !call.dstComplex);
    onEachLevel([&](const Level& level) {
        const std::string difference = unlikeLoop(slot, parts, call, static_cast<std::size_t>(alignment % 16),
                                                  static_cast<std::size_t>(alignment / 16));
        if (!difference.empty()) std::fprintf(stderr, "level %s: %s\n", level.name, difference.c_str());
        fuzz::claim(difference.empty(), "every level does what the plain loop does");
        if (canBeInPlace) checkInPlace(slot, parts, call);
    });
    cachedBytes = cachedBytesBefore;
    return 0;
}
