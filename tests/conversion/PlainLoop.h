// The conversions again as one plain loop over elements, slot by slot, made of Reference.h: what the library writes for
// any layout is held against it, byte by byte.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "tests/conversion/Support.h"

namespace conversiontest {

using Bytes = std::vector<std::byte>;

/// The reference for one slot, on elements as bytes.
struct SlotReference {
    Combination combination;
    std::size_t srcSize;
    std::size_t dstSize;
    bool srcBoolean;
    bool dstBoolean;
    bool neverLoses;
    void (*convert)(const std::byte* s, std::byte* d);
    bool (*keeps)(const std::byte* s, const std::byte* d);
    bool (*isZero)(const std::byte* s);
    bool (*same)(const std::byte* a, const std::byte* b);
    Bytes (*mixedValues)();
    Bytes (*zeroAndOne)(); // lost nowhere
    Bytes (*losers)();     // each value is lost in this cell
};

/// Of every slot.
extern const SlotTable<SlotReference> slotReferences;

/// What a conversion is called with.
struct Call {
    const std::byte* src;
    std::byte* dst;
    std::size_t srcCount;
    std::size_t dstCount;
    bool srcComplex;
    bool dstComplex;
    bool check;
};

/// The loop over elements as it is told, and the second one that compares.
bool loopOver(const SlotReference& slot, const Call& call);

/// The same by the library's function for the slot.
bool convertAsAsked(const SlotReference& slot, const Call& call);

/// Runs one call by both, on copies of the source `parts` and on memory with guards, that far from aligned addresses.
/// Says what the library's function does otherwise than the loop; empty where all is the same. `src` and `dst` of the
/// call are not read.
std::string unlikeLoop(const SlotReference& slot, const Bytes& parts, Call call, std::size_t srcMisalignment,
                       std::size_t dstMisalignment);

} // namespace conversiontest
