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

/// Converts `count` elements. `src` and `dst` need no alignment; they may be equal where the element sizes are. The
/// answer is always true: so that a conversion without a check can end with its run.
using ConvertRun = bool (*)(const std::byte* src, std::byte* dst, std::size_t count);

/// Converts elements as long as each equals what is written for it. Returns how many were converted: all, or the first
/// ones up to somewhere before the first that is lost. No mode counts for an element that is kept.
using KeepingRun = std::size_t (*)(const std::byte* src, std::byte* dst, std::size_t count);

/// True when some element leaves the range of the destination.
using OverflowRun = bool (*)(const std::byte* src, std::size_t count);

struct Level {
    const char* name;
    SlotTable<ConvertRun> convert;
    PairTable<KeepingRun> convertWhileKept; ///< null where nothing can be lost
    SlotTable<OverflowRun> overflows;       ///< null where nothing can overflow
    /// Copies `bytes` past the caches, for what will not be read soon.
    void (*copyToMemory)(const std::byte* src, std::byte* dst, std::size_t bytes);
    /// Makes those copies visible in the order of all other writes. To be called once after the last of them.
    void (*finishCopies)();
};

/// The table of a class that makes these with static templates: convertRun<S, D, rounding, overflow>, keepingRun<S, D>,
/// overflowRun<S, D, rounding>; and copyToMemory, finishCopies.
template <class Runs> constexpr Level levelOf(const char* name) {
    return {
        .name = name,
        .convert = slotTable<ConvertRun>(
            []<class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>() -> ConvertRun {
                return Runs::template convertRun<S, D, rounding, overflow>();
            }),
        .convertWhileKept = pairTable<KeepingRun>([]<class S, class D>() -> KeepingRun {
            if constexpr (holdsEveryValue<S, D>())
                return nullptr;
            else
                return Runs::template keepingRun<S, D>();
        }),
        .overflows = slotTable<OverflowRun>(
            []<class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag>() -> OverflowRun {
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

/// Where source and destination have more bytes together, the destination is written past the caches: half of the
/// last-level cache, which is shared with others. Tests set it.
extern std::size_t cachedBytes;

} // namespace QLTypeSys::conversion
