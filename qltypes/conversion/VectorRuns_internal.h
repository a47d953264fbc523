// The loops over whole registers and the notes they take, the same for every vector level.
//
// `Vectors` is the set of operations of one instruction set. It is a class of an unnamed namespace, so that what is
// compiled for one processor is never taken for another. It provides, F being double or float:
//
//   registerBytes, Bits                               the width of its registers, and one of them
//   load<bytes>(p), load<bytes>(p, used)              a register of `bytes`; the second reads `used`, the rest is zero
//   store<bytes>(p, v), store<bytes>(p, v, used)
//   converted<S, D, rounding, overflow>(v)            elements of S to as many elements of D
//   floating(F{}, bits), magnitude(v)                 a whole register as floating elements
//   lanesWhere<relation>(v, bound)                    a mask; masks combine with & and |, any(mask) asks
//   unlikeTruncated(v, lo, hi), unlikeSingle(v)       a mask: not an integer from lo to hi; not a single
//   unlikeSingle(S{}, bits)                           bits that differ once the integers have been singles
//   signs<size>(bits), anyBit<size>(bits, some)       lanes filled with their sign; whether a lane has one of some bits
//   copyToMemory(src, dst, bytes), finishCopies()     as in Level
//
// The bits of a register that stand for no element of a run are zero, which is lost nowhere and overflows nothing.
#pragma once

#include <concepts>
#include <cstddef>
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

/// Integers are outside a range when they have a bit that no number of the range has. Where both types are signed the
/// bits that count are those that differ from the sign.
template <class Vectors, class S, class D> class IntegersOutside {
  public:
    void note(typename Vectors::Bits v) {
        if constexpr (std::is_signed_v<S> && std::is_signed_v<D>)
            found_ |= v ^ Vectors::template signs<sizeof(S)>(v);
        else
            found_ |= v;
    }
    bool any() const {
        return Vectors::template anyBit<sizeof(S)>(found_, ~static_cast<std::uint32_t>(largestCommon<S, D>()));
    }

  private:
    typename Vectors::Bits found_{};
};

/// 32-bit integers that a single does not hold.
template <class Vectors, class S> class IntegersUnlikeSingles {
  public:
    void note(typename Vectors::Bits v) { differences_ |= Vectors::unlikeSingle(S{}, v); }
    bool any() const { return Vectors::template anyBit<4>(differences_, ~std::uint32_t{0}); }

  private:
    typename Vectors::Bits differences_{};
};

/// Floating elements for which a rule gives a mask.
template <class Vectors, class F, class Rule> class FloatingLanes {
  public:
    void note(typename Vectors::Bits v) { found_ |= Rule::lanes(Vectors::floating(F{}, v)); }
    bool any() const { return Vectors::any(found_); }

  private:
    decltype(Rule::lanes(Vectors::floating(F{}, typename Vectors::Bits{}))) found_{};
};

template <class Vectors, class F, class D> struct LossRule {
    static auto lanes(auto v) {
        if constexpr (isBoolean<D>)
            return Vectors::template lanesWhere<_CMP_NEQ_UQ>(v, F(0)) &
                   Vectors::template lanesWhere<_CMP_NEQ_UQ>(v, F(1));
        else if constexpr (isFloating<D>)
            return Vectors::unlikeSingle(v);
        else
            return Vectors::unlikeTruncated(v, static_cast<F>(lowest<D>), highestIn<F, D>);
    }
};

template <class Vectors, class F, class D, fxpModeRounding_tag rounding> struct OverflowRule {
    static auto lanes(auto v) {
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
};

template <class Vectors> struct VectorRuns {
    /// Registers that are handled between two tests of the loop's end.
    static constexpr std::size_t unrolled = 4;

    template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
    static constexpr ConvertRun convertRun() {
        using Bits = SameBits<S, D, overflow>;
        if constexpr (copiesBytes<S, D, overflow>)
            return &copyRun<sizeof(D)>;
        else
            return &convertRegisters<typename Bits::Src, typename Bits::Dst, rounding, overflow>;
    }

    template <class S, class D> static constexpr TestRun surviveRun() {
        return [](const std::byte* src, std::size_t count) { return !anyNoted<Losses<S, D>, S>(src, count); };
    }

    template <class S, class D, fxpModeRounding_tag rounding> static constexpr TestRun overflowRun() {
        return &anyNoted<Overflows<S, D, rounding>, S>;
    }

    static void copyToMemory(const std::byte* src, std::byte* dst, std::size_t bytes) {
        Vectors::copyToMemory(src, dst, bytes);
    }
    static void finishCopies() { Vectors::finishCopies(); }

  private:
    template <class S, class D>
    using LossesOfIntegers =
        std::conditional_t<isFloating<D>, IntegersUnlikeSingles<Vectors, S>, IntegersOutside<Vectors, S, D>>;
    template <class S, class D>
    using Losses =
        std::conditional_t<isFloating<S>, FloatingLanes<Vectors, S, LossRule<Vectors, S, D>>, LossesOfIntegers<S, D>>;
    template <class S, class D, fxpModeRounding_tag rounding>
    using Overflows =
        std::conditional_t<isFloating<S>, FloatingLanes<Vectors, S, OverflowRule<Vectors, S, D, rounding>>,
                           IntegersOutside<Vectors, S, D>>;

    template <std::size_t size> static void copyRun(const std::byte* src, std::byte* dst, std::size_t count) {
        std::memmove(dst, src, count * size);
    }

    template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
    static void convertRegisters(const std::byte* src, std::byte* dst, std::size_t count) {
        constexpr std::size_t lanes = Vectors::registerBytes / (sizeof(S) > sizeof(D) ? sizeof(S) : sizeof(D));
        constexpr std::size_t srcBytes = lanes * sizeof(S), dstBytes = lanes * sizeof(D);
        const auto convertRegister = [&](std::size_t k) {
            const auto loaded = Vectors::template load<srcBytes>(src + k * srcBytes);
            Vectors::template store<dstBytes>(dst + k * dstBytes,
                                              Vectors::template converted<S, D, rounding, overflow>(loaded));
        };
        for (; count >= unrolled * lanes; count -= unrolled * lanes) {
            [&]<std::size_t... k>(std::index_sequence<k...>) { (convertRegister(k), ...); }
            (std::make_index_sequence<unrolled>());
            src += unrolled * srcBytes;
            dst += unrolled * dstBytes;
        }
        for (; count >= lanes; count -= lanes) {
            convertRegister(0);
            src += srcBytes;
            dst += dstBytes;
        }
        if (count) {
            const auto loaded = Vectors::template load<srcBytes>(src, count * sizeof(S));
            Vectors::template store<dstBytes>(dst, Vectors::template converted<S, D, rounding, overflow>(loaded),
                                              count * sizeof(D));
        }
    }

    // Notes whole registers and asks once for several; stops at the first yes.
    template <class Notes, class S> static bool anyNoted(const std::byte* src, std::size_t count) {
        constexpr std::size_t bytes = Vectors::registerBytes;
        std::size_t left = count * sizeof(S);
        for (; left >= unrolled * bytes; left -= unrolled * bytes) {
            Notes notes;
            [&]<std::size_t... k>(std::index_sequence<k...>) {
                (notes.note(Vectors::template load<bytes>(src + k * bytes)), ...);
            }
            (std::make_index_sequence<unrolled>());
            if (notes.any()) return true;
            src += unrolled * bytes;
        }
        Notes notes;
        for (; left >= bytes; left -= bytes) {
            notes.note(Vectors::template load<bytes>(src));
            src += bytes;
        }
        if (left) notes.note(Vectors::template load<bytes>(src, left));
        return notes.any();
    }
};

} // namespace QLTypeSys::conversion
