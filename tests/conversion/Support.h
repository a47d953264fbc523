// What the tests of the conversions share: every combination of the axes, the levels of this processor, test values.
#pragma once

#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>
#include <ostream>
#include <random>
#include <string>
#include <type_traits>
#include <vector>

#include "qltypes/conversion/Axes_internal.h"
#include "qltypes/conversion/Levels_internal.h"

namespace conversiontest {

using namespace QLTypeSys::conversion;

inline constexpr fxpModeRounding_tag allRoundings[] = {FXP_ROUND_ZERO,     FXP_ROUND_HALF_UP, FXP_ROUND_CEILING,
                                                       FXP_ROUND_FLOOR,    FXP_ROUND_AS_ZERO, FXP_ROUND_HALF_AWAY,
                                                       FXP_ROUND_HALF_EVEN};
inline constexpr fxpModeOverflow_tag allOverflows[] = {FXP_OVERFLOW_WRAP, FXP_OVERFLOW_SATURATE};
inline constexpr const char* typeNames[] = {"double", "single", "int8",   "uint8",  "int16",
                                            "uint16", "int32",  "uint32", "boolean"};
inline constexpr const char* roundingNames[] = {"zero",    "half up",   "ceiling",  "floor",
                                                "as zero", "half away", "half even"};
inline constexpr const char* overflowNames[] = {"wrap", "saturate"};

/// Calls `work.operator()<T>()` for each of the nine types, or for some of them.
template <class Work> void forEachType(Work work) {
    [&]<int... id>(std::integer_sequence<int, id...>) { (work.template operator()<BuiltIn<id>>(), ...); }
    (std::make_integer_sequence<int, numTypes>());
}

/// Runs the rest of the scope on each level of this processor in turn.
template <class Work> void onEachLevel(Work work) {
    const Level* const before = levelInUse;
    for (const Level* level : availableLevels()) {
        levelInUse = level;
        work(*level);
    }
    levelInUse = before;
}

inline std::string combinationName(int srcId, int dstId, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow) {
    return std::string(typeNames[srcId]) + " to " + typeNames[dstId] + ", " + roundingNames[rounding] + ", " +
           overflowNames[overflow];
}

template <class T> using BitsOf = std::conditional_t<sizeof(T) == 8, std::uint64_t, std::uint32_t>;

/// An element as text, floating ones with their bits.
template <class T> std::string elementText(T v) {
    if constexpr (std::is_floating_point_v<T>) {
        char text[64];
        std::snprintf(text, sizeof text, "%.17g (%a, bits %llx)", double{v}, double{v},
                      static_cast<unsigned long long>(std::bit_cast<BitsOf<T>>(v)));
        return text;
    } else {
        return std::to_string(static_cast<long long>(v));
    }
}

/// The values at which something happens: boundaries of every range, halves, powers of two, each with its neighbours
/// one unit in the last place away, denormals, signed zeros, NaN with payloads, infinities; all values of 8 and 16
/// bits.
template <class S> std::vector<S> specialValues() {
    std::vector<S> values;
    if constexpr (std::is_floating_point_v<S>) {
        using Limits = std::numeric_limits<S>;
        const auto add = [&](double v) {
            const S s = static_cast<S>(v);
            for (const S signedValue : {s, -s}) {
                values.push_back(signedValue);
                values.push_back(std::nextafter(signedValue, Limits::infinity()));
                values.push_back(std::nextafter(signedValue, -Limits::infinity()));
            }
        };
        add(0);
        add(Limits::denorm_min());
        add(Limits::min());
        add(Limits::min() / 2);
        add(static_cast<double>(Limits::max()));
        for (int halves = 1; halves <= 1100; ++halves)
            add(halves / 2.0);
        for (int power = -30; power <= 127; ++power)
            for (const double offset : {0.0, 0.25, 0.5, 1.0, 1.5})
                for (const double sign : {1.0, -1.0})
                    add(std::ldexp(1.0, power) + sign * offset);
        // Beyond the reach of 64-bit integers the low bits still count for the reduction.
        for (int power = 24; power <= 120; ++power)
            add(std::ldexp(static_cast<double>(0x15a3c96b7d2e1fULL), power - 24));
        if constexpr (std::is_same_v<S, double>) {
            for (const double large : {1e39, 3.4028235e38, 0x1.ffffffp+127, 0x1.fffffep+127, 0x1.fffffefp+127, 1e300,
                                       0x1p-126, 0x1p-149, 0x1p-150, 0x1.8p-150})
                add(large);
        }
        const BitsOf<S> infinity = std::bit_cast<BitsOf<S>>(Limits::infinity());
        const BitsOf<S> sign = BitsOf<S>{1} << (sizeof(S) * 8 - 1);
        const BitsOf<S> quiet = std::bit_cast<BitsOf<S>>(Limits::quiet_NaN()) & ~infinity;
        for (const BitsOf<S> payload :
             {BitsOf<S>{0}, BitsOf<S>{1}, BitsOf<S>{0x7b}, quiet, quiet | 1, quiet | 0xff81, 2 * quiet - 1})
            for (const BitsOf<S> signBit : {BitsOf<S>{0}, sign})
                values.push_back(std::bit_cast<S>(signBit | infinity | payload));
    } else {
        using Number = std::conditional_t<isBoolean<S>, std::uint8_t, std::conditional_t<isInteger<S>, S, int>>;
        if constexpr (sizeof(S) <= 2) {
            for (int v = std::numeric_limits<Number>::min(); v <= std::numeric_limits<Number>::max(); ++v)
                values.push_back(static_cast<S>(v));
        } else {
            for (int power = 0; power < 32; ++power)
                for (int offset = -3; offset <= 3; ++offset)
                    for (const std::int64_t sign : {1, -1})
                        values.push_back(static_cast<S>(sign * (std::int64_t{1} << power) + offset));
            for (int bits = 20; bits < 32; ++bits) // as many bits as a single has, one less, one more
                for (int offset = -300; offset <= 300; ++offset)
                    values.push_back(static_cast<S>((std::int64_t{1} << bits) + offset));
        }
    }
    return values;
}

/// `count` elements of random bits. The seed is fixed and part of what a failure prints.
template <class S> std::vector<S> randomValues(std::size_t count, std::uint64_t seed) {
    std::mt19937_64 random(seed);
    std::vector<S> values(count);
    for (S& v : values) {
        if constexpr (std::is_floating_point_v<S>)
            v = std::bit_cast<S>(static_cast<BitsOf<S>>(random()));
        else
            v = static_cast<S>(random());
    }
    return values;
}

/// Random values near the ranges of the integers, with fractions that are often halves: what random bits rarely hit.
template <class S>
requires std::is_floating_point_v<S> std::vector<S> randomNumbersInRange(std::size_t count, std::uint64_t seed) {
    std::mt19937_64 random(seed);
    std::vector<S> values(count);
    for (S& v : values) {
        const int bits = static_cast<int>(random() % 36);
        const double whole = static_cast<double>(static_cast<std::int64_t>(random() >> (63 - bits)));
        const double part = static_cast<double>(random() % 8) / 8;
        v = static_cast<S>(random() % 2 ? whole + part : -(whole + part));
    }
    return values;
}

} // namespace conversiontest
