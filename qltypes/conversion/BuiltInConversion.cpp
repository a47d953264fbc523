#include "qltypes/conversion/BuiltInConversion.h"

#include <array>
#include <cstddef>

#include "qltypes/conversion/Layout_internal.h"
#include "qltypes/conversion/Levels_internal.h"
#include "qltypes/host/Assert_internal.h"

namespace QLTypeSys::conversion {

namespace {

// Runs up to this many elements go straight to the level: they are far from leaving the caches.
constexpr std::size_t shortRun = 1 << 16;

// What takes more than one run; kept out of the way of what does not.
[[gnu::noinline]] bool convertOtherwise(const Cell& cell, const void* src, void* dst, std::size_t srcCount,
                                        std::size_t dstCount, bool srcComplex, bool dstComplex, bool check) {
    const Vectors vectors = {
        static_cast<const std::byte*>(src), static_cast<std::byte*>(dst), srcCount, dstCount, srcComplex, dstComplex};
    return convertInLayout(cell, vectors, check);
}

// One function of the matrix.
template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
bool convertVector(const void* src, void* dst, std::size_t srcCount, std::size_t dstCount, bool srcComplex,
                   bool dstComplex, bool check, int, int, fxpModeOverflow_tag, fxpModeRounding_tag) {
    constexpr const Cell& cell = cellOf<S, D, rounding, overflow>;
    const bool checked = check && !holdsEveryValue<S, D>();
    if (checked | srcComplex | dstComplex || dstCount - 1 >= shortRun) [[unlikely]]
        return convertOtherwise(cell, src, dst, srcCount, dstCount, srcComplex, dstComplex, checked);
    if (srcCount <= 1 && __builtin_expect(dstCount > 1, false)) [[unlikely]]
        return convertOtherwise(cell, src, dst, srcCount, dstCount, srcComplex, dstComplex, checked);
    return levelInUse->convert[cell.slot](static_cast<const std::byte*>(src), static_cast<std::byte*>(dst), dstCount);
}

// Booleans are read as uint8 and share its functions, but for the copy to int8.
template <class S, class D>
using SourceOf = std::conditional_t<isBoolean<S> && !std::is_same_v<D, std::int8_t>, std::uint8_t, S>;
template <class S, class D> using DestinationOf = std::conditional_t<isBoolean<S> && isBoolean<D>, std::uint8_t, D>;

constexpr SlotTable<BuiltInConvFcn> functionsOfSlots = slotTable<BuiltInConvFcn>(
    []<class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>() -> BuiltInConvFcn {
        return &convertVector<SourceOf<S, D>, DestinationOf<S, D>, rounding, overflow>;
    });

// Every combination of the arguments of the lookup, so that it is one load. A row has eight places, of which seven are
// rounding modes.
constexpr int numRoundingPlaces = 8;
constexpr std::size_t placeOf(int srcId, int dstId, fxpModeOverflow_tag overflow, fxpModeRounding_tag rounding) {
    const auto pair = static_cast<std::size_t>(srcId * numTypes + dstId);
    return (pair * 2 + static_cast<unsigned>(overflow)) * numRoundingPlaces + static_cast<unsigned>(rounding);
}

constexpr auto functions = [] {
    std::array<BuiltInConvFcn, std::size_t{numTypes} * numTypes * 2 * numRoundingPlaces> all{};
    for (int src = 0; src < numTypes; ++src)
        for (int dst = 0; dst < numTypes; ++dst)
            for (const auto overflow : {FXP_OVERFLOW_WRAP, FXP_OVERFLOW_SATURATE})
                for (int mode = FXP_ROUND_ZERO; mode <= FXP_ROUND_HALF_EVEN; ++mode) {
                    const auto rounding = static_cast<fxpModeRounding_tag>(mode);
                    all[placeOf(src, dst, overflow, rounding)] = functionsOfSlots[slotOf(src, dst, overflow, rounding)];
                }
    return all;
}();

} // namespace

} // namespace QLTypeSys::conversion

BuiltInConvFcn utGetQlBuiltinDtypeConvFcn(int srcId, int dstId, fxpModeOverflow_tag overflow,
                                          fxpModeRounding_tag rounding) {
    using namespace QLTypeSys::conversion;
    QLTYPES_ASSERT(srcId >= 0 && srcId < numTypes && dstId >= 0 && dstId < numTypes);
    QLTYPES_ASSERT(overflow == FXP_OVERFLOW_WRAP || overflow == FXP_OVERFLOW_SATURATE);
    QLTYPES_ASSERT(rounding >= FXP_ROUND_ZERO && rounding <= FXP_ROUND_HALF_EVEN);
    return functions[placeOf(srcId, dstId, overflow, rounding)];
}
