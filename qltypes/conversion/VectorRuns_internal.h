// The loops over whole registers and the notes they take, the same for every vector level.
//
// `Vectors` is the set of operations of one instruction set. It is a class of an unnamed namespace, so that what is
// compiled for one processor is never taken for another. It provides, F being double or float:
//
//   registerBytes, Bits                          the width of its registers, and a whole one of them
//   load<bytes>(p), load<bytes>(p, used)         a register of `bytes`; the second reads `used`, the rest is zero
//   store<bytes>(p, v), store<bytes>(p, v, used)
//   converted<S, D, rounding, overflow>(v)       elements of S to as many elements of D
//   together<S, D, overflow>                     how many registers convertTogether takes, or 0 where it is not there
//   convertTogether<S, D, rounding, overflow>(src, dst)      the same as converted for each of them
//   FloatingLosses<F, D>                         convert(v) does, right where D has the value; anyLost() of all so far
//   narrowsLater<S, D>                           storeKept takes integers as they were, not what they convert to
//   storeKept<S, D>(p, results)                  stores what FloatingLosses or integers without losses have become
//   withUnlikeSingle(found, S{}, v)              `found`, and the bits that differ once 32-bit integers have been
//   singles floating(F{}, v), magnitude(v)               a whole register as floating elements lanesWhere<relation>(v,
//   bound)               a mask; masks combine with & and |, any(mask) asks plus<size>(v, amount), anyBit<size>(v,
//   some) the sum by lanes; whether a lane has one of some bits doubled32(v), most32(v, w)                   of
//   unsigned 32-bit lanes: twice the lane cut off, the larger lanes anyFrom32(v, low, high) whether an even lane is at
//   least `low` or an odd one at least `high` copyToMemory(src, dst, bytes), finishCopies()     as in Level
//
// The bits of a register that stand for no element of a run are zero, which is lost nowhere and overflows nothing.
#pragma once

#include <algorithm>
#include <bit>
#include <concepts>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <type_traits>
#include <utility>

#include <immintrin.h>

#include "qltypes/conversion/Kernels_internal.h"
#include "qltypes/conversion/Levels_internal.h"

namespace QLTypeSys::conversion {

template <class T> struct UnsignedOf { using type = T; };
template <std::integral T> struct UnsignedOf<T> { using type = std::make_unsigned_t<T>; };
template <> struct UnsignedOf<Boolean> { using type = std::uint8_t; };

/// A pair of types that a conversion may be taken for because the bits are the same. It keeps the sign of a source that
/// is widened or saturates, and of a destination that saturates.
template <class S, class D, fxpModeOverflow_tag overflow> struct SameBits {
    static constexpr bool saturates = overflowMatters<S, D> && overflow == FXP_OVERFLOW_SATURATE;
    static constexpr bool cutsOff = isBoolean<S> || isBoolean<D> || (isInteger<D> && sizeof(S) >= sizeof(D));
    using Src = typename std::conditional_t<!saturates && cutsOff, UnsignedOf<S>, std::type_identity<S>>::type;
    using Dst = typename std::conditional_t<!saturates && isInteger<D>, UnsignedOf<D>, std::type_identity<D>>::type;
};

// Notes of losses and overflows: note() takes a register of source elements, any() speaks of all that were noted.

/// Integers are outside a range when they have a bit that no number of the range has. Where both types are signed that
/// is told once the range begins at zero.
template <class Vectors, class S, class D> class IntegersOutside {
  public:
    void note(typename Vectors::Bits v) {
        if constexpr (bothSigned)
            found_ |= Vectors::template plus<sizeof(S)>(v, std::uint32_t{1} << (8 * sizeof(D) - 1));
        else
            found_ |= v;
    }
    bool any() const {
        constexpr std::uint32_t within =
            bothSigned ? (std::uint32_t{1} << 8 * sizeof(D) % 32) - 1 : largestCommon<S, D>();
        return Vectors::template anyBit<sizeof(S)>(found_, ~within);
    }

  private:
    static constexpr bool bothSigned = std::is_signed_v<S> && std::is_signed_v<D>;
    typename Vectors::Bits found_{};
};

/// 32-bit integers that a single does not hold.
template <class Vectors, class S> class IntegersUnlikeSingles {
  public:
    void note(typename Vectors::Bits v) { differences_ = Vectors::withUnlikeSingle(differences_, S{}, v); }
    bool any() const { return Vectors::template anyBit<4>(differences_, ~std::uint32_t{0}); }

  private:
    typename Vectors::Bits differences_{};
};

/// A quick look before: what needs no more bits than a single has is held. What any() affirms may be held too.
template <class Vectors, class S> class PerhapsUnlikeSingles {
  public:
    void note(typename Vectors::Bits v) {
        if constexpr (std::is_signed_v<S>)
            found_ |= Vectors::template plus<4>(v, held);
        else
            found_ |= v;
    }
    bool any() const { return Vectors::template anyBit<4>(found_, ~((held << std::is_signed_v<S>)-1)); }

  private:
    static constexpr std::uint32_t held = std::uint32_t{1} << std::numeric_limits<float>::digits;
    typename Vectors::Bits found_{};
};

/// Floating elements beyond the bounds of the overflow test.
template <class Vectors, class F, class D, fxpModeRounding_tag rounding> class FloatingOutside {
  public:
    void note(typename Vectors::Bits v) { found_ |= outside(Vectors::floating(F{}, v)); }
    bool any() const { return Vectors::any(found_); }

  private:
    static auto outside(auto v) {
        if constexpr (isFloating<D>) {
            const auto magnitude = Vectors::magnitude(v);
            return Vectors::template lanesWhere<_CMP_GE_OQ>(magnitude, infiniteAsSingleFrom) &
                   Vectors::template lanesWhere<_CMP_LE_OQ>(magnitude, largestDouble);
        } else {
            constexpr OverflowBounds<F> bounds = overflowBounds<F, D, rounding>();
            constexpr int aboveRelation = bounds.aboveIsOutside ? _CMP_GE_OQ : _CMP_GT_OQ;
            constexpr int belowRelation = bounds.belowIsOutside ? _CMP_LE_OQ : _CMP_LT_OQ;
            return Vectors::template lanesWhere<aboveRelation>(v, bounds.above) |
                   Vectors::template lanesWhere<belowRelation>(v, bounds.below);
        }
    }

    decltype(outside(Vectors::floating(F{}, typename Vectors::Bits{}))) found_{};
};

/// A quick look before FloatingOutside, on the bits as unsigned numbers: toward an unsigned type everything is inside
/// that is not negative and below the upper bound, toward a signed one everything whose magnitude is below both. Of a
/// double the upper half is looked at. What any() denies is inside; what it affirms, NaN among it, may be so too.
template <class Vectors, class F, class D, fxpModeRounding_tag rounding> class PerhapsOutside {
  public:
    void note(typename Vectors::Bits v) {
        if constexpr (isSigned)
            most_ = Vectors::most32(most_, Vectors::doubled32(v));
        else
            most_ = Vectors::most32(most_, v);
    }
    bool any() const {
        return Vectors::anyFrom32(most_, std::is_same_v<F, double> ? ~std::uint32_t{0} : threshold, threshold);
    }

  private:
    static constexpr bool isSigned = !std::is_unsigned_v<D>;
    static constexpr F bound() {
        if constexpr (isFloating<D>) {
            return infiniteAsSingleFrom;
        } else {
            constexpr OverflowBounds<F> bounds = overflowBounds<F, D, rounding>();
            return isSigned && -bounds.below < bounds.above ? -bounds.below : bounds.above;
        }
    }
    static constexpr std::uint32_t upperHalf(double v) {
        return static_cast<std::uint32_t>(std::bit_cast<std::uint64_t>(v) >> 32);
    }
    static constexpr std::uint32_t upperHalf(float v) { return std::bit_cast<std::uint32_t>(v); }
    static constexpr std::uint32_t threshold = upperHalf(bound()) << isSigned;

    typename Vectors::Bits most_{};
};

/// Converts registers of integers and notes whether an element is lost; toward single, whether one may be.
template <class Vectors, class S, class D> class IntegerLosses {
  public:
    auto convert(auto v) {
        using Bits = SameBits<S, D, FXP_OVERFLOW_WRAP>;
        if constexpr (Vectors::template narrowsLater<S, D>) {
            notes_.note(v);
            return v;
        } else {
            const auto result =
                Vectors::template converted<typename Bits::Src, typename Bits::Dst, FXP_ROUND_ZERO, FXP_OVERFLOW_WRAP>(
                    v);
            if constexpr (sizeof(D) > sizeof(S))
                notes_.note(result);
            else
                notes_.note(v);
            return result;
        }
    }
    bool anyLost() const { return notes_.any(); }

  private:
    // Where integers are widened, what is looked at is the result: only negative numbers are lost there.
    using LookedAt =
        typename std::conditional_t<(sizeof(D) > sizeof(S)), std::make_signed<D>, std::type_identity<S>>::type;
    std::conditional_t<isFloating<D>, PerhapsUnlikeSingles<Vectors, S>, IntegersOutside<Vectors, LookedAt, D>> notes_;
};

template <class Vectors> struct VectorRuns {
    template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
    static constexpr ConvertRun convertRun() {
        using Bits = SameBits<S, D, overflow>;
        if constexpr (copiesBytes<S, D, overflow>)
            return &copyRun<sizeof(D)>;
        else
            return &convertRegisters<typename Bits::Src, typename Bits::Dst, rounding, overflow>;
    }

    template <class S, class D> static constexpr KeepingRun keepingRun() { return &convertWhileKept<S, D>; }

    template <class S, class D, fxpModeRounding_tag rounding> static constexpr OverflowRun overflowRun() {
        if constexpr (isFloating<S>)
            return &anyOutside<FloatingOutside<Vectors, S, D, rounding>, PerhapsOutside<Vectors, S, D, rounding>, S>;
        else
            return &anyOutside<IntegersOutside<Vectors, S, D>, IntegersOutside<Vectors, S, D>, S>;
    }

    static void copyToMemory(const std::byte* src, std::byte* dst, std::size_t bytes) {
        Vectors::copyToMemory(src, dst, bytes);
    }
    static void finishCopies() { Vectors::finishCopies(); }

  private:
    template <class S, class D>
    using Losses = typename std::conditional_t<isFloating<S>, typename Vectors::template FloatingLosses<S, D>,
                                               IntegerLosses<Vectors, S, D>>;

    template <std::size_t size> static bool copyRun(const std::byte* src, std::byte* dst, std::size_t count) {
        std::memmove(dst, src, count * size);
        return true;
    }

    // The registers of a pair: as many elements as fill one on the wider side.
    template <class S, class D>
    static constexpr std::size_t lanes = Vectors::registerBytes / std::max(sizeof(S), sizeof(D));

    // Calls step(k) for k from 0 to `times` - 1, written one after the other.
    template <std::size_t times> static void repeat(auto step) {
        [&]<std::size_t... k>(std::index_sequence<k...>) { (step(k), ...); }
        (std::make_index_sequence<times>());
    }

    template <class S, class D> struct RegisterBytes {
        static constexpr std::size_t src = lanes<S, D> * sizeof(S), dst = lanes<S, D> * sizeof(D);
    };

    template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
    static void convertRegister(const std::byte* src, std::byte* dst) {
        using Bytes = RegisterBytes<S, D>;
        Vectors::template store<Bytes::dst>(
            dst, Vectors::template converted<S, D, rounding, overflow>(Vectors::template load<Bytes::src>(src)));
    }

    // Lines that are written whole are called for so many bytes before: beyond the first-level cache it saves a tenth.
    static constexpr std::size_t lineBytes = 64, storesAhead = 1024;

    template <class S, class D, fxpModeOverflow_tag overflow>
    static constexpr std::size_t registersPerStep =
        Vectors::template together<S, D, overflow> ? Vectors::template together<S, D, overflow> : 4;

    // What a short vector does not need stands in another function: this one does without a frame.
    template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
    static bool convertRegisters(const std::byte* src, std::byte* dst, std::size_t count) {
        constexpr std::size_t perRegister = lanes<S, D>;
        using Bytes = RegisterBytes<S, D>;
        if (count >= registersPerStep<S, D, overflow> * perRegister)
            return convertInSteps<S, D, rounding, overflow>(src, dst, count);
        const std::byte* const end = src + count * sizeof(S);
        // Taken apart for the few times that it can run, the loop would be longer.
#pragma GCC unroll 1
        for (; src + Bytes::src <= end; src += Bytes::src, dst += Bytes::dst)
            convertRegister<S, D, rounding, overflow>(src, dst);
        if (const auto left = static_cast<std::size_t>(end - src)) {
            const auto loaded = Vectors::template load<Bytes::src>(src, left);
            Vectors::template store<Bytes::dst>(dst, Vectors::template converted<S, D, rounding, overflow>(loaded),
                                                left / sizeof(S) * sizeof(D));
        }
        return true;
    }

    template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
    [[gnu::noinline]] static bool convertInSteps(const std::byte* src, std::byte* dst, std::size_t count) {
        constexpr std::size_t registers = registersPerStep<S, D, overflow>, elements = registers * lanes<S, D>;
        using Bytes = RegisterBytes<S, D>;
        for (; count >= elements; count -= elements) {
            if constexpr (Vectors::template together<S, D, overflow>)
                Vectors::template convertTogether<S, D, rounding, overflow>(src, dst);
            else
                repeat<registers>([&](std::size_t k) {
                    if constexpr (Bytes::dst == lineBytes) __builtin_prefetch(dst + k * lineBytes + storesAhead, 1);
                    convertRegister<S, D, rounding, overflow>(src + k * Bytes::src, dst + k * Bytes::dst);
                });
            src += registers * Bytes::src;
            dst += registers * Bytes::dst;
        }
        return count == 0 || convertRegisters<S, D, rounding, overflow>(src, dst, count);
    }

    // Nothing is written before all that is read is known to be kept: the source may be the destination.
    template <std::size_t times, class S, class D>
    [[gnu::always_inline]] static bool keptRegisters(const std::byte* src, std::byte* dst) {
        constexpr std::size_t srcBytes = RegisterBytes<S, D>::src;
        Losses<S, D> losses;
        decltype(losses.convert(Vectors::template load<srcBytes>(src))) results[times];
        repeat<times>(
            [&](std::size_t k) { results[k] = losses.convert(Vectors::template load<srcBytes>(src + k * srcBytes)); });
        if (losses.anyLost()) {
            if constexpr (isInteger<S> && isFloating<D>) {
                if (!likeSingles<times, S>(src)) return false;
            } else {
                return false;
            }
        }
        Vectors::template storeKept<S, D>(dst, results);
        return true;
    }

    template <std::size_t times, class S> static bool likeSingles(const std::byte* src) {
        constexpr std::size_t bytes = Vectors::registerBytes;
        IntegersUnlikeSingles<Vectors, S> notes;
        repeat<times>([&](std::size_t k) { notes.note(Vectors::template load<bytes>(src + k * bytes)); });
        return !notes.any();
    }

    template <class S, class D>
    static std::size_t convertWhileKept(const std::byte* src, std::byte* dst, std::size_t count) {
        constexpr std::size_t perRegister = lanes<S, D>, unrolled = 8;
        std::size_t done = 0;
        for (; done + unrolled * perRegister <= count; done += unrolled * perRegister)
            if (!keptRegisters<unrolled, S, D>(src + done * sizeof(S), dst + done * sizeof(D))) return done;
        for (; done + perRegister <= count; done += perRegister)
            if (!keptRegisters<1, S, D>(src + done * sizeof(S), dst + done * sizeof(D))) return done;
        if (done < count) {
            // What is left, filled up with zeros.
            std::byte last[perRegister * sizeof(S)], converted[perRegister * sizeof(D)];
            const std::size_t left = count - done;
            Vectors::template store<sizeof last>(
                last, Vectors::template load<sizeof last>(src + done * sizeof(S), left * sizeof(S)));
            if (!keptRegisters<1, S, D>(last, converted)) return done;
            std::memcpy(dst + done * sizeof(D), converted, left * sizeof(D));
        }
        return count;
    }

    // Looks quickly at several registers at once, and thoroughly where that finds something.
    template <class Outside, class Perhaps, class S> static bool anyOutside(const std::byte* src, std::size_t count) {
        constexpr std::size_t bytes = Vectors::registerBytes, unrolled = 8;
        const auto noted = [&]<std::size_t times>(auto notes, std::integral_constant<std::size_t, times>) {
            repeat<times>([&](std::size_t k) { notes.note(Vectors::template load<bytes>(src + k * bytes)); });
            return notes.any();
        };
        constexpr std::integral_constant<std::size_t, unrolled> several;
        std::size_t left = count * sizeof(S);
        for (; left >= unrolled * bytes; left -= unrolled * bytes) {
            if (noted(Perhaps(), several) && noted(Outside(), several)) return true;
            src += unrolled * bytes;
        }
        Outside notes;
        for (; left >= bytes; left -= bytes) {
            notes.note(Vectors::template load<bytes>(src));
            src += bytes;
        }
        if (left) notes.note(Vectors::template load<bytes>(src, left));
        return notes.any();
    }
};

} // namespace QLTypeSys::conversion
