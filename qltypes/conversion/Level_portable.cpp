// The level that every processor runs: the rules for one element in plain loops.
#include <cstring>

#include "qltypes/conversion/Kernels_internal.h"
#include "qltypes/conversion/Levels_internal.h"

namespace QLTypeSys::conversion {

namespace {

template <class T> T loadElement(const std::byte* from, std::size_t i) {
    T v;
    std::memcpy(&v, from + i * sizeof(T), sizeof(T));
    return v;
}

template <class T> void storeElement(std::byte* to, std::size_t i, T v) {
    std::memcpy(to + i * sizeof(T), &v, sizeof(T));
}

struct PortableRuns {
    template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
    static constexpr ConvertRun convertRun() {
        return [](const std::byte* src, std::byte* dst, std::size_t count) {
            if constexpr (copiesBytes<S, D, overflow>) {
                std::memmove(dst, src, count * sizeof(D));
            } else {
                for (std::size_t i = 0; i < count; ++i)
                    storeElement(dst, i, converted<S, D, rounding, overflow>(loadElement<S>(src, i)));
            }
            return true;
        };
    }

    template <class S, class D> static constexpr KeepingRun keepingRun() {
        return [](const std::byte* src, std::byte* dst, std::size_t count) {
            for (std::size_t i = 0; i < count; ++i) {
                const S s = loadElement<S>(src, i);
                if (!survives<S, D>(s)) return i;
                storeElement(dst, i, converted<S, D, FXP_ROUND_ZERO, FXP_OVERFLOW_WRAP>(s));
            }
            return count;
        };
    }

    template <class S, class D, fxpModeRounding_tag rounding> static constexpr OverflowRun overflowRun() {
        return [](const std::byte* src, std::size_t count) {
            for (std::size_t i = 0; i < count; ++i)
                if (overflows<S, D, rounding>(loadElement<S>(src, i))) return true;
            return false;
        };
    }

    static void copyToMemory(const std::byte* src, std::byte* dst, std::size_t bytes) { std::memcpy(dst, src, bytes); }
    static void finishCopies() {}
};

} // namespace

constinit const Level portableLevel = levelOf<PortableRuns>("portable");

} // namespace QLTypeSys::conversion
