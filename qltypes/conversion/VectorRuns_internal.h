// The loops over whole registers, the same for every vector level.
//
// `Vectors` is the set of operations of one instruction set. It is a class of an unnamed namespace, so that what is
// compiled for one processor is never taken for another. It provides:
//
//   registerBytes                                     the width of its registers
//   load<bytes>(p), load<bytes>(p, used)              a register of `bytes`; the second reads `used` and fills with
//   zeros store<bytes>(p, register), ...(p, register, used) converted<S, D, rounding, overflow>(register)     elements
//   of S to as many elements of D Losses<S, D>, Overflows<S, D, rounding>           note a register; any() tells
//   whether one of its elements is so copyToMemory(src, dst, bytes), finishCopies()
//
// The bits of a register that stand for no element of a run are zero, which is lost nowhere and overflows nothing.
#pragma once

#include <concepts>
#include <cstddef>
#include <cstring>
#include <type_traits>
#include <utility>

#include "qltypes/conversion/Axes_internal.h"
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
        return [](const std::byte* src, std::size_t count) {
            return !anyNoted<typename Vectors::template Losses<S, D>, S>(src, count);
        };
    }

    template <class S, class D, fxpModeRounding_tag rounding> static constexpr TestRun overflowRun() {
        return &anyNoted<typename Vectors::template Overflows<S, D, rounding>, S>;
    }

    static void copyToMemory(const std::byte* src, std::byte* dst, std::size_t bytes) {
        Vectors::copyToMemory(src, dst, bytes);
    }
    static void finishCopies() { Vectors::finishCopies(); }

  private:
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
