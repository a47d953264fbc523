// What a processor level provides: for each slot a function over a contiguous run of real elements.
//
// A level is a table of function pointers, filled at compile time from the same templates over another set of
// registers. The level in use is chosen once, when the library is loaded; how complex layouts, broadcasts and checks
// are made of these runs is in Layout_internal.h.
#pragma once

#include <cstddef>
#include <span>

#include "qltypes/conversion/Axes_internal.h"

namespace QLTypeSys::conversion {

/// Converts `count` elements. `src` and `dst` need no alignment; they may be equal where the element sizes are.
using ConvertRun = void (*)(const std::byte* src, std::byte* dst, std::size_t count);

/// A claim about a run of source elements.
using TestRun = bool (*)(const std::byte* src, std::size_t count);

struct Level {
    const char* name;
    SlotTable<ConvertRun> convert;
    PairTable<TestRun> survive;   ///< every element equals what is written for it; null where none can be lost
    SlotTable<TestRun> overflows; ///< some element leaves the range of the destination; null where none can
    /// Copies `bytes` past the caches, for what will not be read soon.
    void (*copyToMemory)(const std::byte* src, std::byte* dst, std::size_t bytes);
    /// Makes those copies visible in the order of all other writes. To be called once after the last of them.
    void (*finishCopies)();
};

/// The table of a class that makes these with static templates: convertRun<S, D, rounding, overflow>, surviveRun<S, D>,
/// overflowRun<S, D, rounding>; and copyToMemory, finishCopies.
template <class Runs> constexpr Level levelOf(const char* name) {
    return {
        .name = name,
        .convert = slotTable<ConvertRun>(
            []<class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>() -> ConvertRun {
                return Runs::template convertRun<S, D, rounding, overflow>();
            }),
        .survive = pairTable<TestRun>([]<class S, class D>() -> TestRun {
            if constexpr (holdsEveryValue<S, D>())
                return nullptr;
            else
                return Runs::template surviveRun<S, D>();
        }),
        .overflows =
            slotTable<TestRun>([]<class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag>() -> TestRun {
                if constexpr (canOverflow<S, D>)
                    return Runs::template overflowRun<S, D, rounding>();
                else
                    return nullptr;
            }),
        .copyToMemory = &Runs::copyToMemory,
        .finishCopies = &Runs::finishCopies,
    };
}

extern const Level portableLevel;
#ifdef __x86_64__
extern const Level avx2Level;
extern const Level avx512Level;
#endif

/// The levels that this processor runs, from the portable one to the widest.
std::span<const Level* const> availableLevels();

/// The widest of them; the portable one until the library's initialisers have run. Tests set it.
extern const Level* levelInUse;

/// Destinations of more bytes are written past the caches: the size of the last-level cache. Tests set it.
extern std::size_t cachedBytes;

} // namespace QLTypeSys::conversion
