// The two axes of the conversion matrix: the nine built-in types in identifier order, and what follows from a pair.
//
// Everything that depends on a pair of types only is a rule here: which flags its cell has, whether it can lose a
// value, and which slot its functions have in the flat tables (one slot a combination that behaves differently).
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <tuple>
#include <type_traits>
#include <utility>

#include "qltypes/fixed_point/FixPointDefs.h"

namespace QLTypeSys::conversion {

/// A stored boolean: one byte, read as an unsigned number and never normalised.
enum class Boolean : std::uint8_t {};

using BuiltInTypes = std::tuple<double, float, std::int8_t, std::uint8_t, std::int16_t, std::uint16_t, std::int32_t,
                                std::uint32_t, Boolean>;

inline constexpr int numTypes = std::tuple_size_v<BuiltInTypes>;
inline constexpr int booleanId = 8;

template <int id> using BuiltIn = std::tuple_element_t<id, BuiltInTypes>;

/// The identifier of a built-in type.
template <class T> inline constexpr int idOf = []<int... id>(std::integer_sequence<int, id...>) {
    return ((std::is_same_v<T, BuiltIn<id>> ? id : 0) + ...);
}
(std::make_integer_sequence<int, numTypes>());

template <class T> inline constexpr bool isFloating = std::is_floating_point_v<T>;
template <class T> inline constexpr bool isInteger = std::is_integral_v<T>;
template <class T> inline constexpr bool isBoolean = std::is_same_v<T, Boolean>;

/// True when no value of S is lost in D, whatever the modes. Such cells have nothing to check.
template <class S, class D> consteval bool holdsEveryValue() {
    if constexpr (std::is_same_v<S, D> || isBoolean<S>)
        return true; // kept: a boolean byte above 127 becomes a negative int8, and that is not reported
    else if constexpr (isBoolean<D> || (isFloating<S> && isInteger<D>))
        return false;
    else if constexpr (isFloating<D>)
        return std::numeric_limits<S>::digits <= std::numeric_limits<D>::digits;
    else
        return std::in_range<D>(std::numeric_limits<S>::min()) && std::in_range<D>(std::numeric_limits<S>::max());
}

/// The rounding flag of a cell.
template <class S, class D> inline constexpr bool roundingMatters = isFloating<S>&& isInteger<D>;

/// The overflow flag of a cell.
template <class S, class D>
inline constexpr bool overflowMatters = isInteger<D> && !isBoolean<S> && !holdsEveryValue<S, D>();

/// True when the predictive test examines the pair.
template <class S, class D>
inline constexpr bool canOverflow = overflowMatters<S, D> || (std::is_same_v<S, double> && std::is_same_v<D, float>);

/// True when converting copies the bytes: wrapping between integers of one width, and whatever holds a boolean's byte.
template <class S, class D, fxpModeOverflow_tag overflow>
inline constexpr bool copiesBytes = std::is_same_v<S, D> ||
                                    (sizeof(S) == sizeof(D) && !isFloating<S> && !isFloating<D> &&
                                     (isBoolean<S> || (isInteger<D> && overflow == FXP_OVERFLOW_WRAP)));

/// How many entries a cell has.
template <class S, class D>
inline constexpr int numVariants = roundingMatters<S, D>   ? 14
                                   : overflowMatters<S, D> ? 2
                                                           : 1;

/// A table of one value for each pair, filled from a rule: pairTable<int>([]<class S, class D> { return ...; }).
template <class Value> using PairTable = std::array<std::array<Value, numTypes>, numTypes>;

template <class Value, class Rule> constexpr PairTable<Value> pairTable(Rule rule) {
    PairTable<Value> table{};
    [&]<int... pair>(std::integer_sequence<int, pair...>) {
        ((table[pair / numTypes][pair % numTypes] =
              rule.template operator()<BuiltIn<pair / numTypes>, BuiltIn<pair % numTypes>>()),
         ...);
    }
    (std::make_integer_sequence<int, numTypes * numTypes>());
    return table;
}

inline constexpr PairTable<std::uint8_t> roundingFlags =
    pairTable<std::uint8_t>([]<class S, class D>() -> std::uint8_t { return roundingMatters<S, D>; });
inline constexpr PairTable<std::uint8_t> overflowFlags =
    pairTable<std::uint8_t>([]<class S, class D>() -> std::uint8_t { return overflowMatters<S, D>; });

/// The first slot of each cell: cells follow each other row by row.
inline constexpr PairTable<std::uint16_t> firstSlots = [] {
    PairTable<std::uint16_t> table = pairTable<std::uint16_t>([]<class S, class D> { return numVariants<S, D>; });
    std::uint16_t next = 0;
    for (auto& row : table)
        for (std::uint16_t& entry : row)
            next = static_cast<std::uint16_t>(next + std::exchange(entry, next));
    return table;
}();
inline constexpr std::size_t numSlots = firstSlots[booleanId][booleanId] + numVariants<Boolean, Boolean>;

/// What slotOf() needs of a pair, in one word and without a branch.
struct CellAxes {
    std::uint16_t firstSlot;
    std::uint8_t roundingMask;
    std::uint8_t overflowMask;
};

inline constexpr PairTable<CellAxes> cellAxes = pairTable<CellAxes>([]<class S, class D> {
    return CellAxes{firstSlots[idOf<S>][idOf<D>], roundingMatters<S, D> ? std::uint8_t{0xff} : std::uint8_t{0},
                    overflowMatters<S, D>};
});

/// The slot of a conversion: the flags decide which of the two modes count.
constexpr std::size_t slotOf(int srcId, int dstId, fxpModeOverflow_tag overflow, fxpModeRounding_tag rounding) {
    const CellAxes axes = cellAxes[srcId][dstId];
    const unsigned direction = rounding == FXP_ROUND_AS_ZERO ? 0u : 2u * static_cast<unsigned>(rounding);
    return axes.firstSlot + (direction & axes.roundingMask) + (static_cast<unsigned>(overflow) & axes.overflowMask);
}

/// What stands in a slot. Modes that do not count are FXP_ROUND_ZERO and FXP_OVERFLOW_WRAP; FXP_ROUND_AS_ZERO is
/// FXP_ROUND_ZERO here, so that both name the same function.
struct Combination {
    int srcId;
    int dstId;
    fxpModeRounding_tag rounding;
    fxpModeOverflow_tag overflow;
};

constexpr Combination combinationAt(std::size_t slot) {
    int pair = numTypes * numTypes - 1;
    while (firstSlots[pair / numTypes][pair % numTypes] > slot)
        --pair;
    Combination found{pair / numTypes, pair % numTypes, FXP_ROUND_ZERO, FXP_OVERFLOW_WRAP};
    const std::size_t variant = slot - firstSlots[found.srcId][found.dstId];
    if (roundingFlags[found.srcId][found.dstId]) found.rounding = static_cast<fxpModeRounding_tag>(variant / 2);
    if (overflowFlags[found.srcId][found.dstId]) found.overflow = static_cast<fxpModeOverflow_tag>(variant % 2);
    if (found.rounding == FXP_ROUND_AS_ZERO) found.rounding = FXP_ROUND_ZERO;
    return found;
}

/// A table of one value for each slot, filled from a rule:
/// slotTable<Fn>([]<class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow> { return ...; }).
template <class Value> using SlotTable = std::array<Value, numSlots>;

template <class Value, class Rule> constexpr SlotTable<Value> slotTable(Rule rule) {
    return [&]<std::size_t... slot>(std::index_sequence<slot...>) {
        return SlotTable<Value>{
            rule.template operator()<BuiltIn<combinationAt(slot).srcId>, BuiltIn<combinationAt(slot).dstId>,
                                     combinationAt(slot).rounding, combinationAt(slot).overflow>()...};
    }
    (std::make_index_sequence<numSlots>());
}

} // namespace QLTypeSys::conversion
