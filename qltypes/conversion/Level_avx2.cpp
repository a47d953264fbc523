// The level of processors with AVX2 and FMA: registers of 32 bytes. No conversion carries a rounding mode here and none
// gives unsigned or 64-bit integers, so values are made integral first, or halves are settled in integers.
#include <immintrin.h>

#include "qltypes/conversion/Kernels_internal.h"
#include "qltypes/conversion/Levels_internal.h"
#include "qltypes/conversion/VectorRuns_internal.h"

namespace QLTypeSys::conversion {

namespace {

// Elements travel in integer registers of 32 or 16 bytes; 8 and 4 bytes are the lowest of the latter.
//
// Where a conversion to 32-bit integers has no result (NaN, or beyond its range) the processor gives the lowest
// integer: sometimes that is the wanted end of the range, and its lower bytes are the zeros that are wanted for NaN.

inline __m256d floating(double, __m256i bits) { return _mm256_castsi256_pd(bits); }
inline __m256 floating(float, __m256i bits) { return _mm256_castsi256_ps(bits); }
inline __m256i bitsOf(__m256d v) { return _mm256_castpd_si256(v); }
inline __m256i bitsOf(__m256 v) { return _mm256_castps_si256(v); }
inline __m256d all(double v) { return _mm256_set1_pd(v); }
inline __m256 all(float v) { return _mm256_set1_ps(v); }

// The second operand where either is NaN, or where both are zeros.
inline __m256d least(__m256d a, __m256d b) { return _mm256_min_pd(a, b); }
inline __m256 least(__m256 a, __m256 b) { return _mm256_min_ps(a, b); }
inline __m256d most(__m256d a, __m256d b) { return _mm256_max_pd(a, b); }
inline __m256 most(__m256 a, __m256 b) { return _mm256_max_ps(a, b); }

inline __m256d both(__m256d a, __m256d b) { return _mm256_and_pd(a, b); }
inline __m256 both(__m256 a, __m256 b) { return _mm256_and_ps(a, b); }
inline __m256d either(__m256d a, __m256d b) { return _mm256_or_pd(a, b); }
inline __m256 either(__m256 a, __m256 b) { return _mm256_or_ps(a, b); }

template <int relation> __m256d lanesWhere(__m256d a, __m256d b) { return _mm256_cmp_pd(a, b, relation); }
template <int relation> __m256 lanesWhere(__m256 a, __m256 b) { return _mm256_cmp_ps(a, b, relation); }

template <int direction> __m256d integral(__m256d v) { return _mm256_round_pd(v, direction); }
template <int direction> __m256 integral(__m256 v) { return _mm256_round_ps(v, direction); }

// To 32-bit integers toward zero.
inline __m128i toInt32(__m256d v) { return _mm256_cvttpd_epi32(v); }
inline __m256i toInt32(__m256 v) { return _mm256_cvttps_epi32(v); }

// Registers of 32-bit integers of either width.
inline __m128i plusOne(__m128i v) { return _mm_add_epi32(v, _mm_set1_epi32(1)); }
inline __m256i plusOne(__m256i v) { return _mm256_add_epi32(v, _mm256_set1_epi32(1)); }
inline __m128i plusOneUnlessNegative(__m128i v) { return _mm_sub_epi32(v, _mm_cmpgt_epi32(v, _mm_set1_epi32(-1))); }
inline __m256i plusOneUnlessNegative(__m256i v) {
    return _mm256_sub_epi32(v, _mm256_cmpgt_epi32(v, _mm256_set1_epi32(-1)));
}
inline __m128i halved(__m128i v) { return _mm_srai_epi32(v, 1); }
inline __m256i halved(__m256i v) { return _mm256_srai_epi32(v, 1); }

constexpr int towardZero = _MM_FROUND_TO_ZERO | _MM_FROUND_NO_EXC;
constexpr int toNearest = _MM_FROUND_TO_NEAREST_INT | _MM_FROUND_NO_EXC;
constexpr int down = _MM_FROUND_TO_NEG_INF | _MM_FROUND_NO_EXC;
constexpr int up = _MM_FROUND_TO_POS_INF | _MM_FROUND_NO_EXC;

// r(v) as a floating number. What is left of v below or beyond the integer is exact where it can be one half.
template <class F, fxpModeRounding_tag rounding> auto rounded(auto v) {
    if constexpr (rounding == FXP_ROUND_CEILING) {
        return integral<up>(v);
    } else if constexpr (rounding == FXP_ROUND_FLOOR) {
        return integral<down>(v);
    } else if constexpr (rounding == FXP_ROUND_HALF_EVEN) {
        return integral<toNearest>(v);
    } else if constexpr (rounding == FXP_ROUND_HALF_UP) {
        const auto below = integral<down>(v);
        return below + both(lanesWhere<_CMP_GE_OQ>(v - below, all(F(0.5))), all(F(1)));
    } else if constexpr (rounding == FXP_ROUND_HALF_AWAY) {
        const auto sign = both(v, all(F(-0.0)));
        const auto inner = integral<towardZero>(v);
        const auto beyondHalf = lanesWhere<_CMP_GE_OQ>((v - inner) * either(sign, all(F(1))), all(F(0.5)));
        return inner + both(beyondHalf, either(sign, all(F(1))));
    } else {
        return integral<towardZero>(v);
    }
}

// r(v) as 32-bit integers, for values up to 2^30: halves are settled on twice the value.
template <class F, fxpModeRounding_tag rounding> auto smallInt32(auto v) {
    if constexpr (rounding == FXP_ROUND_HALF_UP)
        return halved(plusOne(toInt32(integral<down>(v + v))));
    else if constexpr (rounding == FXP_ROUND_HALF_AWAY)
        return halved(plusOneUnlessNegative(toInt32(v + v)));
    else if constexpr (rounding == FXP_ROUND_ZERO)
        return toInt32(v);
    else
        return toInt32(rounded<F, rounding>(v));
}

// v less a multiple of the modulus, exactly; NaN for infinities. Toward zero the result has the sign of v.
template <int direction> __m256d remainder(__m256d v, double modulus) {
    return _mm256_fnmadd_pd(integral<direction>(v * all(1 / modulus)), all(modulus), v);
}
template <int direction> __m256 remainder(__m256 v, float modulus) {
    return _mm256_fnmadd_ps(integral<direction>(v * all(1 / modulus)), all(modulus), v);
}

inline __m256d numbersOnly(__m256d v) { return both(v, lanesWhere<_CMP_ORD_Q>(v, v)); }
inline __m256 numbersOnly(__m256 v) { return both(v, lanesWhere<_CMP_ORD_Q>(v, v)); }

// The low 32 bits of integral values below 2^51: they stand in the lower half of the sum.
inline __m128i lowBits(__m256d v) {
    const __m256i evenFirst = _mm256_setr_epi32(0, 2, 4, 6, 0, 2, 4, 6);
    return _mm256_castsi256_si128(_mm256_permutevar8x32_epi32(bitsOf(v + all(0x1.8p52)), evenFirst));
}

// r(v) below 2^32, the half from 2^31 on by what is above that.
template <fxpModeRounding_tag rounding> __m256i uint32ByHalves(__m256 v) {
    const __m256 isUpper = lanesWhere<_CMP_GE_OQ>(v, all(0x1p31F));
    const __m256i withinHalf = toInt32(rounded<float, rounding>(v - both(isUpper, all(0x1p31F))));
    return withinHalf ^ _mm256_slli_epi32(bitsOf(isUpper), 31);
}

// The low bytes of integers of `from` bytes.
template <int from, int to> __m128i cut(__m128i v) {
    if constexpr (to == 4)
        return v;
    else if constexpr (to == 2)
        return _mm_shuffle_epi8(v, _mm_setr_epi8(0, 1, 4, 5, 8, 9, 12, 13, 0, 1, 4, 5, 8, 9, 12, 13));
    else
        return _mm_shuffle_epi8(v, _mm_setr_epi8(0, 4, 8, 12, 0, 4, 8, 12, 0, 4, 8, 12, 0, 4, 8, 12));
}
template <int from, int to> auto cut(__m256i v) {
    if constexpr (from == to) {
        return v;
    } else {
        __m256i inHalves; // the result of each half of the register, repeated over that half
        if constexpr (from == 2)
            inHalves = _mm256_shuffle_epi8(
                v, _mm256_broadcastsi128_si256(_mm_setr_epi8(0, 2, 4, 6, 8, 10, 12, 14, 0, 2, 4, 6, 8, 10, 12, 14)));
        else if constexpr (to == 2)
            inHalves = _mm256_shuffle_epi8(
                v, _mm256_broadcastsi128_si256(_mm_setr_epi8(0, 1, 4, 5, 8, 9, 12, 13, 0, 1, 4, 5, 8, 9, 12, 13)));
        else
            inHalves = _mm256_shuffle_epi8(
                v, _mm256_broadcastsi128_si256(_mm_setr_epi8(0, 4, 8, 12, 0, 4, 8, 12, 0, 4, 8, 12, 0, 4, 8, 12)));
        const __m128i lower = _mm256_castsi256_si128(inHalves), upper = _mm256_extracti128_si256(inHalves, 1);
        return from == 4 && to == 1 ? _mm_unpacklo_epi32(lower, upper) : _mm_unpacklo_epi64(lower, upper);
    }
}

// clang-format off
// Elements of an integer type to integers of `to` bytes, four of them or a full register.
template <class S, int to, int lanes> auto widened(auto v) {
    constexpr bool isSigned = std::is_signed_v<S>;
    if constexpr (sizeof(S) == to)                  return v;
    else if constexpr (to == 2)                       return isSigned ? _mm256_cvtepi8_epi16(v) : _mm256_cvtepu8_epi16(v);
    else if constexpr (lanes == 8 && sizeof(S) == 1)  return isSigned ? _mm256_cvtepi8_epi32(v) : _mm256_cvtepu8_epi32(v);
    else if constexpr (lanes == 8)                    return isSigned ? _mm256_cvtepi16_epi32(v) : _mm256_cvtepu16_epi32(v);
    else if constexpr (sizeof(S) == 1)                return isSigned ? _mm_cvtepi8_epi32(v) : _mm_cvtepu8_epi32(v);
    else                                            return isSigned ? _mm_cvtepi16_epi32(v) : _mm_cvtepu16_epi32(v);
}

// Lanes of `size` bytes.
template <int size> __m256i allLanes(std::uint32_t v) {
    if constexpr (size == 4)      return _mm256_set1_epi32(static_cast<int>(v));
    else if constexpr (size == 2) return _mm256_set1_epi16(static_cast<short>(v));
    else                          return _mm256_set1_epi8(static_cast<char>(v));
}
template <int size> __m256i mostSigned(__m256i a, __m256i b) {
    if constexpr (size == 4)      return _mm256_max_epi32(a, b);
    else if constexpr (size == 2) return _mm256_max_epi16(a, b);
    else                          return _mm256_max_epi8(a, b);
}
template <int size> __m256i leastSigned(__m256i a, __m256i b) {
    if constexpr (size == 4)      return _mm256_min_epi32(a, b);
    else                          return _mm256_min_epi16(a, b);
}
template <int size> __m256i leastUnsigned(__m256i a, __m256i b) {
    if constexpr (size == 4)      return _mm256_min_epu32(a, b);
    else if constexpr (size == 2) return _mm256_min_epu16(a, b);
    else                          return _mm256_min_epu8(a, b);
}
// clang-format on

template <class D, fxpModeRounding_tag rounding, class F> auto saturated(F, auto v) {
    constexpr F hi = static_cast<F>(highest<D>), lo = static_cast<F>(lowest<D>);
    if constexpr (sizeof(D) < 4) {
        // For unsigned types NaN becomes 0 with the negative values.
        const auto notLow = std::is_unsigned_v<D> ? most(v, all(F(0))) : most(all(lo), v);
        return cut<4, sizeof(D)>(smallInt32<F, rounding>(least(all(hi), notLow)));
    } else if constexpr (std::is_same_v<F, double>) {
        return lowBits(rounded<F, rounding>(least(all(hi), most(all(lo), numbersOnly(v)))));
    } else if constexpr (std::is_signed_v<D>) {
        // 2^31 and beyond come as the lowest; all bits turned make the highest of it.
        const auto tooHigh = lanesWhere<_CMP_GE_OQ>(v, all(hi));
        return toInt32(rounded<F, rounding>(numbersOnly(v))) ^ bitsOf(tooHigh);
    } else {
        const auto notLow = most(v, all(0.0F));
        return uint32ByHalves<rounding>(notLow) | bitsOf(lanesWhere<_CMP_GE_OQ>(notLow, all(hi)));
    }
}

template <class D, fxpModeRounding_tag rounding, class F> auto wrapped(F, auto v) {
    constexpr F modulusOfD = static_cast<F>(modulus<D>);
    if constexpr (sizeof(D) < 4)
        return cut<4, sizeof(D)>(smallInt32<F, rounding>(remainder<towardZero>(v, modulusOfD)));
    else if constexpr (std::is_same_v<F, double>)
        return lowBits(rounded<F, rounding>(numbersOnly(remainder<towardZero>(v, modulusOfD))));
    else // values with a fraction stay as they are; 2^31 gives the bits that it should
        return toInt32(rounded<F, rounding>(numbersOnly(remainder<toNearest>(v, modulusOfD))));
}

template <class S> auto toBoolean(__m256i v) {
    if constexpr (isFloating<S>) {
        // 0 or -1 by lane, which cut to a byte and one more is 1 or 0
        const auto zero = lanesWhere<_CMP_EQ_OQ>(floating(S{}, v), all(S(0)));
        __m128i bytes;
        if constexpr (std::is_same_v<S, float>)
            bytes = cut<4, 1>(bitsOf(zero));
        else
            bytes = cut<4, 1>(_mm256_castsi256_si128(
                _mm256_permutevar8x32_epi32(bitsOf(zero), _mm256_setr_epi32(0, 2, 4, 6, 0, 2, 4, 6))));
        return _mm_add_epi8(bytes, _mm_set1_epi8(1));
    } else {
        return cut<sizeof(S), 1>(leastUnsigned<sizeof(S)>(v, allLanes<sizeof(S)>(1)));
    }
}

template <class S, class D> auto toFloating(auto v) {
    if constexpr (std::is_same_v<S, double>)
        return _mm_castps_si128(_mm256_cvtpd_ps(_mm256_castsi256_pd(v)));
    else if constexpr (std::is_same_v<S, float>)
        return bitsOf(_mm256_cvtps_pd(_mm_castsi128_ps(v)));
    else if constexpr (std::is_same_v<S, std::uint32_t> && std::is_same_v<D, double>)
        return bitsOf(_mm256_fmadd_pd(_mm256_cvtepi32_pd(_mm_srli_epi32(v, 16)), all(65536.0),
                                      _mm256_cvtepi32_pd(v & _mm_set1_epi32(0xffff))));
    else if constexpr (std::is_same_v<S, std::uint32_t>)
        return bitsOf(_mm256_fmadd_ps(_mm256_cvtepi32_ps(_mm256_srli_epi32(v, 16)), all(65536.0F),
                                      _mm256_cvtepi32_ps(v & _mm256_set1_epi32(0xffff))));
    else if constexpr (std::is_same_v<D, double>)
        return bitsOf(_mm256_cvtepi32_pd(widened<S, 4, 4>(v)));
    else
        return bitsOf(_mm256_cvtepi32_ps(widened<S, 4, 8>(v)));
}

template <class S, class D, fxpModeOverflow_tag overflow> auto toInteger(auto v) {
    constexpr bool saturates = overflowMatters<S, D> && overflow == FXP_OVERFLOW_SATURATE;
    constexpr int from = sizeof(S), to = sizeof(D);
    if constexpr (to > from) {
        const __m256i wide = widened<S, to, 32 / to>(v);
        return saturates ? mostSigned<to>(wide, __m256i{}) : wide;
    } else if constexpr (!saturates) {
        return cut<from, to>(v);
    } else if constexpr (std::is_unsigned_v<S>) {
        return cut<from, to>(leastUnsigned<from>(v, allLanes<from>(highest<D>)));
    } else {
        v = mostSigned<from>(v, allLanes<from>(static_cast<std::uint32_t>(lowest<D>)));
        if constexpr (to < from) v = leastSigned<from>(v, allLanes<from>(highest<D>));
        return cut<from, to>(v);
    }
}

// Losses of floating elements: the result taken back differs. What is out of range never comes back as it was.
template <class F, class D> class LossesBackAndForth {
  public:
    auto convert(__m256i bits) {
        const auto v = floating(F{}, bits);
        const auto d = truncated(v);
        lost_ |= bitsOf(lanesWhere<_CMP_NEQ_UQ>(v, back(d)));
        return d;
    }
    bool anyLost() const { return !_mm256_testz_si256(lost_, lost_); }

  private:
    static auto truncated(auto v) {
        if constexpr (isBoolean<D>)
            return toBoolean<F>(bitsOf(v));
        else if constexpr (isFloating<D>)
            return toFloating<F, D>(bitsOf(v));
        else if constexpr (!std::is_same_v<D, std::uint32_t>)
            return cut<4, sizeof(D)>(toInt32(v));
        else if constexpr (std::is_same_v<F, double>)
            return lowBits(integral<towardZero>(v));
        else
            return uint32ByHalves<FXP_ROUND_ZERO>(v);
    }
    static auto back(auto d) {
        using Number = std::conditional_t<isBoolean<D>, std::uint8_t, D>;
        return floating(F{}, toFloating<Number, F>(d));
    }

    __m256i lost_{};
};

struct Avx2 {
    static constexpr std::size_t registerBytes = 32;
    using Bits = __m256i;

    template <std::size_t bytes> static auto load(const std::byte* p) {
        if constexpr (bytes == 32) {
            return _mm256_loadu_si256(reinterpret_cast<const __m256i_u*>(p));
        } else if constexpr (bytes == 16) {
            return _mm_loadu_si128(reinterpret_cast<const __m128i_u*>(p));
        } else {
            __m128i v{};
            std::memcpy(&v, p, bytes);
            return v;
        }
    }
    template <std::size_t bytes> static auto load(const std::byte* p, std::size_t used) {
        alignas(bytes) std::byte whole[bytes] = {};
        std::memcpy(whole, p, used);
        return load<bytes>(whole);
    }
    template <std::size_t bytes> static void store(std::byte* p, auto v) { std::memcpy(p, &v, bytes); }
    template <std::size_t bytes> static void store(std::byte* p, auto v, std::size_t used) { std::memcpy(p, &v, used); }

    template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
    static auto converted(auto v) {
        if constexpr (isBoolean<D>)
            return toBoolean<S>(v);
        else if constexpr (isFloating<D>)
            return toFloating<S, D>(v);
        else if constexpr (isInteger<S>)
            return toInteger<S, D, overflow>(v);
        else if constexpr (overflow == FXP_OVERFLOW_SATURATE)
            return saturated<D, rounding>(S{}, conversion::floating(S{}, v));
        else
            return wrapped<D, rounding>(S{}, conversion::floating(S{}, v));
    }

    template <class S, class D, fxpModeOverflow_tag overflow> static constexpr std::size_t together = 0;

    template <class F, class D> using FloatingLosses = LossesBackAndForth<F, D>;
    template <class S, class D> static constexpr bool narrowsLater = false;
    template <class S, class D, std::size_t times> static void storeKept(std::byte* dst, const auto(&kept)[times]) {
        constexpr std::size_t bytes = registerBytes * sizeof(D) / std::max(sizeof(S), sizeof(D));
        for (std::size_t k = 0; k < times; ++k)
            store<bytes>(dst + k * bytes, kept[k]);
    }
    template <class S> static __m256i withUnlikeSingle(__m256i found, S, __m256i v) {
        // 2^31, next to the highest, comes back as the lowest. From 2^31 on a single has all bits but the lowest eight.
        const __m256i differences = v ^ _mm256_cvttps_epi32(_mm256_cvtepi32_ps(v));
        if constexpr (std::is_signed_v<S>)
            return found | differences;
        else
            return found | _mm256_castps_si256(_mm256_blendv_ps(_mm256_castsi256_ps(differences),
                                                                _mm256_castsi256_ps(v & _mm256_set1_epi32(0xff)),
                                                                _mm256_castsi256_ps(v)));
    }

    static auto floating(auto f, __m256i bits) { return conversion::floating(f, bits); }
    static __m256d magnitude(__m256d v) { return _mm256_andnot_pd(all(-0.0), v); }
    template <int relation> static __m256i lanesWhere(auto v, auto bound) {
        return bitsOf(conversion::lanesWhere<relation>(v, all(bound)));
    }
    static bool any(__m256i mask) { return !_mm256_testz_si256(mask, mask); }
    template <int size> static __m256i plus(__m256i v, std::uint32_t amount) {
        return size == 4 ? _mm256_add_epi32(v, allLanes<4>(amount)) : _mm256_add_epi16(v, allLanes<2>(amount));
    }
    template <int size> static bool anyBit(__m256i v, std::uint32_t bits) {
        return !_mm256_testz_si256(v, allLanes<size>(bits));
    }
    static __m256i doubled32(__m256i v) { return _mm256_add_epi32(v, v); }
    static __m256i most32(__m256i v, __m256i w) { return _mm256_max_epu32(v, w); }
    static bool anyFrom32(__m256i v, std::uint32_t low, std::uint32_t high) {
        const __m256i bounds = _mm256_set1_epi64x(static_cast<long long>(std::uint64_t{high} << 32 | low));
        return any(_mm256_cmpeq_epi32(most32(v, bounds), v));
    }

    // Whole registers past the caches; what is left at either end as usual.
    static void copyToMemory(const std::byte* src, std::byte* dst, std::size_t bytes) {
        const std::size_t unaligned = -reinterpret_cast<std::uintptr_t>(dst) % registerBytes;
        const std::size_t head = unaligned < bytes ? unaligned : bytes;
        std::memcpy(dst, src, head);
        src += head;
        dst += head;
        bytes -= head;
        for (; bytes >= registerBytes; bytes -= registerBytes) {
            _mm256_stream_si256(reinterpret_cast<__m256i*>(dst), load<registerBytes>(src));
            src += registerBytes;
            dst += registerBytes;
        }
        std::memcpy(dst, src, bytes);
    }
    static void finishCopies() { _mm_sfence(); }
};

} // namespace

constinit const Level avx2Level = levelOf<VectorRuns<Avx2>>("avx2");

} // namespace QLTypeSys::conversion
