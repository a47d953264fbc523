// The level of processors with AVX-512 (F, BW, DQ, VL): registers of 64 bytes, masks for the ends of a run, and
// conversions that carry their rounding mode with them.
#include <immintrin.h>

#include "qltypes/conversion/Kernels_internal.h"
#include "qltypes/conversion/Levels_internal.h"
#include "qltypes/conversion/VectorRuns_internal.h"

namespace QLTypeSys::conversion {

namespace {

// Elements travel in integer registers of 64, 32 or 16 bytes; 8 bytes are the lower half of the last.
//
// Where a conversion from floating point to integers has no result (NaN, or beyond its range) the processor gives the
// lowest integer for signed results and the highest for unsigned ones. The steps below rely on it: either that is the
// wanted end of the range, or its low bytes are, which are all zero for signed results.

inline __m512d floating(double, __m512i bits) { return _mm512_castsi512_pd(bits); }
inline __m512 floating(float, __m512i bits) { return _mm512_castsi512_ps(bits); }
inline __m512d all(double v) { return _mm512_set1_pd(v); }
inline __m512 all(float v) { return _mm512_set1_ps(v); }

// The second operand where either is NaN, or where both are zeros.
inline __m512d least(__m512d a, __m512d b) { return _mm512_min_pd(a, b); }
inline __m512 least(__m512 a, __m512 b) { return _mm512_min_ps(a, b); }
inline __m512d most(__m512d a, __m512d b) { return _mm512_max_pd(a, b); }
inline __m512 most(__m512 a, __m512 b) { return _mm512_max_ps(a, b); }

template <int relation> __mmask8 lanesWhere(__m512d a, __m512d b) { return _mm512_cmp_pd_mask(a, b, relation); }
template <int relation> __mmask16 lanesWhere(__m512 a, __m512 b) { return _mm512_cmp_ps_mask(a, b, relation); }

// The direction in which a conversion to integers must round, once withHalf() has prepared the nearest modes.
template <fxpModeRounding_tag rounding>
constexpr int directionOf = (rounding == FXP_ROUND_CEILING                                  ? _MM_FROUND_TO_POS_INF
                             : rounding == FXP_ROUND_FLOOR || rounding == FXP_ROUND_HALF_UP ? _MM_FROUND_TO_NEG_INF
                             : rounding == FXP_ROUND_HALF_EVEN                              ? _MM_FROUND_TO_NEAREST_INT
                                                                                            : _MM_FROUND_TO_ZERO) |
                            _MM_FROUND_NO_EXC;
constexpr int towardZero = directionOf<FXP_ROUND_ZERO>;
constexpr int toNearest = directionOf<FXP_ROUND_HALF_EVEN>;

// (a & b) | c, and a | (b ^ c), of three registers.
constexpr int andOr = 0xea;
constexpr int orDifferent = 0xf6;

// Notes in which bits two registers differ.
inline __m512i withDifferences(__m512i found, __m512i a, __m512i b) {
    return _mm512_ternarylogic_epi64(found, a, b, orDifferent);
}

inline __m512d halfWithSignOf(__m512d v) {
    return _mm512_castsi512_pd(_mm512_ternarylogic_epi64(_mm512_castpd_si512(v), _mm512_castpd_si512(all(-0.0)),
                                                         _mm512_castpd_si512(all(0.5)), andOr));
}
inline __m512 halfWithSignOf(__m512 v) {
    return _mm512_castsi512_ps(_mm512_ternarylogic_epi32(_mm512_castps_si512(v), _mm512_castps_si512(all(-0.0F)),
                                                         _mm512_castps_si512(all(0.5F)), andOr));
}

template <int direction> __m512d sum(__m512d a, __m512d b) { return _mm512_add_round_pd(a, b, direction); }
template <int direction> __m512 sum(__m512 a, __m512 b) { return _mm512_add_round_ps(a, b, direction); }

// Adds what makes the nearest modes a rounding in one direction. The sum is rounded in that direction too, so it never
// reaches an integer that the exact sum does not.
template <class F, fxpModeRounding_tag rounding> auto withHalf(auto v) {
    if constexpr (rounding == FXP_ROUND_HALF_UP)
        return sum<directionOf<rounding>>(v, all(F(0.5)));
    else if constexpr (rounding == FXP_ROUND_HALF_AWAY)
        return sum<directionOf<rounding>>(v, halfWithSignOf(v));
    else
        return v;
}

// v less a multiple of the modulus, exactly; NaN for infinities. Toward zero the result has the sign of v.
template <int direction> __m512d remainder(__m512d v, double modulus) {
    return _mm512_fnmadd_pd(_mm512_roundscale_pd(_mm512_mul_pd(v, all(1 / modulus)), direction), all(modulus), v);
}
template <int direction> __m512 remainder(__m512 v, float modulus) {
    return _mm512_fnmadd_ps(_mm512_roundscale_ps(_mm512_mul_ps(v, all(1 / modulus)), direction), all(modulus), v);
}

template <int direction> __m512i toInt64(__m512d v) { return _mm512_cvt_roundpd_epi64(v, direction); }
template <int direction> __m512i toUint64(__m512d v) { return _mm512_cvt_roundpd_epu64(v, direction); }
template <int direction> __m512i toInt32(__m512 v) { return _mm512_cvt_roundps_epi32(v, direction); }
template <int direction> __m512i toUint32(__m512 v) { return _mm512_cvt_roundps_epu32(v, direction); }

// To integers of the element's own size. The last gives 0 where `from` is NaN.
template <int direction> __m512i toSigned(__m512d v) { return toInt64<direction>(v); }
template <int direction> __m512i toSigned(__m512 v) { return toInt32<direction>(v); }
template <int direction> __m512i toUnsigned(__m512d v) { return toUint64<direction>(v); }
template <int direction> __m512i toUnsigned(__m512 v) { return toUint32<direction>(v); }
template <int direction> __m512i maskedToSigned(__m512d from, __m512d v) {
    return _mm512_maskz_cvt_roundpd_epi64(lanesWhere<_CMP_ORD_Q>(from, from), v, direction);
}
template <int direction> __m512i maskedToSigned(__m512 from, __m512 v) {
    return _mm512_maskz_cvt_roundps_epi32(lanesWhere<_CMP_ORD_Q>(from, from), v, direction);
}

// clang-format off
// Integers of `from` bytes to narrower ones: cut off, or saturating in the signed or unsigned range.
template <int from, int to> auto cut(__m512i v) {
    if constexpr (from == to)                return v;
    else if constexpr (from == 8 && to == 4) return _mm512_cvtepi64_epi32(v);
    else if constexpr (from == 8 && to == 2) return _mm512_cvtepi64_epi16(v);
    else if constexpr (from == 8)            return _mm512_cvtepi64_epi8(v);
    else if constexpr (from == 4 && to == 2) return _mm512_cvtepi32_epi16(v);
    else if constexpr (from == 4)            return _mm512_cvtepi32_epi8(v);
    else                                     return _mm512_cvtepi16_epi8(v);
}
template <int from, int to> auto saturatedSigned(__m512i v) {
    if constexpr (from == to)                return v;
    else if constexpr (from == 8 && to == 4) return _mm512_cvtsepi64_epi32(v);
    else if constexpr (from == 8 && to == 2) return _mm512_cvtsepi64_epi16(v);
    else if constexpr (from == 8)            return _mm512_cvtsepi64_epi8(v);
    else if constexpr (from == 4 && to == 2) return _mm512_cvtsepi32_epi16(v);
    else if constexpr (from == 4)            return _mm512_cvtsepi32_epi8(v);
    else                                     return _mm512_cvtsepi16_epi8(v);
}
template <int from, int to> auto saturatedUnsigned(__m512i v) {
    if constexpr (from == to)                return v;
    else if constexpr (from == 8 && to == 4) return _mm512_cvtusepi64_epi32(v);
    else if constexpr (from == 8 && to == 2) return _mm512_cvtusepi64_epi16(v);
    else if constexpr (from == 8)            return _mm512_cvtusepi64_epi8(v);
    else if constexpr (from == 4 && to == 2) return _mm512_cvtusepi32_epi16(v);
    else if constexpr (from == 4)            return _mm512_cvtusepi32_epi8(v);
    else                                     return _mm512_cvtusepi16_epi8(v);
}

// Elements of an integer type to a full register of integers of `to` bytes.
template <class S, int to> __m512i widened(auto v) {
    constexpr bool isSigned = std::is_signed_v<S>;
    if constexpr (sizeof(S) == to)                  return v;
    else if constexpr (to == 2 && isSigned)         return _mm512_cvtepi8_epi16(v);
    else if constexpr (to == 2)                     return _mm512_cvtepu8_epi16(v);
    else if constexpr (to == 4 && sizeof(S) == 1)   return isSigned ? _mm512_cvtepi8_epi32(v) : _mm512_cvtepu8_epi32(v);
    else if constexpr (to == 4)                     return isSigned ? _mm512_cvtepi16_epi32(v) : _mm512_cvtepu16_epi32(v);
    else if constexpr (sizeof(S) == 1)              return isSigned ? _mm512_cvtepi8_epi64(v) : _mm512_cvtepu8_epi64(v);
    else                                            return isSigned ? _mm512_cvtepi16_epi64(v) : _mm512_cvtepu16_epi64(v);
}

// Lanes of `size` bytes.
template <int size> __m512i allLanes(std::uint32_t v) {
    if constexpr (size == 4)      return _mm512_set1_epi32(static_cast<int>(v));
    else if constexpr (size == 2) return _mm512_set1_epi16(static_cast<short>(v));
    else                          return _mm512_set1_epi8(static_cast<char>(v));
}
template <int size> __m512i mostSigned(__m512i a, __m512i b) {
    if constexpr (size == 4)      return _mm512_max_epi32(a, b);
    else if constexpr (size == 2) return _mm512_max_epi16(a, b);
    else                          return _mm512_max_epi8(a, b);
}
template <int size> __m512i leastUnsigned(__m512i a, __m512i b) {
    if constexpr (size == 4)      return _mm512_min_epu32(a, b);
    else if constexpr (size == 2) return _mm512_min_epu16(a, b);
    else                          return _mm512_min_epu8(a, b);
}
// clang-format on

// The lanes of a mask that are not the lowest integer.
inline __mmask8 unlikeLowest(__mmask8 lanes, __m512i v, double) {
    return _mm512_mask_cmpneq_epi64_mask(lanes, v, _mm512_set1_epi64(INT64_MIN));
}
inline __mmask16 unlikeLowest(__mmask16 lanes, __m512i v, float) {
    return _mm512_mask_cmpneq_epi32_mask(lanes, v, _mm512_set1_epi32(INT32_MIN));
}

template <class D, fxpModeRounding_tag rounding, class F> auto saturated(F, auto v) {
    constexpr int direction = directionOf<rounding>;
    if constexpr (std::is_unsigned_v<D>) {
        // NaN becomes 0 with the negative values.
        const auto atLeastZero = withHalf<F, rounding>(most(v, all(F(0))));
        return saturatedUnsigned<sizeof(F), sizeof(D)>(toUnsigned<direction>(atLeastZero));
    } else if constexpr (sizeof(D) < sizeof(F)) {
        // Far beyond the range, but not beyond what converts.
        constexpr F farAbove = static_cast<F>(std::uint64_t{1} << (sizeof(F) * 8 - 2));
        const auto atMostFar = withHalf<F, rounding>(least(v, all(farAbove)));
        return saturatedSigned<sizeof(F), sizeof(D)>(maskedToSigned<direction>(v, atMostFar));
    } else {
        constexpr F hi = static_cast<F>(highest<D>); // 2^31, beyond what converts
        const __m512i number = maskedToSigned<direction>(v, withHalf<F, rounding>(v));
        return _mm512_mask_mov_epi32(number, lanesWhere<_CMP_GE_OQ>(v, all(hi)), allLanes<4>(highest<D>));
    }
}

template <class D, fxpModeRounding_tag rounding, class F> auto wrapped(F, auto v) {
    constexpr int direction = directionOf<rounding>;
    constexpr F modulusOfD = static_cast<F>(modulus<D>);
    if constexpr (sizeof(D) == sizeof(F)) {
        // Values with a fraction stay as they are; 2^31 gives the bits that it should.
        const auto rest = remainder<toNearest>(v, modulusOfD);
        return maskedToSigned<direction>(rest, withHalf<F, rounding>(rest));
    } else if constexpr (sizeof(D) > 1) {
        const auto rest = remainder<towardZero>(v, modulusOfD);
        return cut<sizeof(F), sizeof(D)>(toSigned<direction>(withHalf<F, rounding>(rest)));
    } else {
        // What is beyond the conversion has a low byte of zero.
        return cut<sizeof(F), 1>(toSigned<direction>(withHalf<F, rounding>(v)));
    }
}

template <class S> auto toBoolean(__m512i v) {
    if constexpr (std::is_same_v<S, double>)
        return _mm_maskz_set1_epi8(_mm512_test_epi64_mask(v, _mm512_set1_epi64(INT64_MAX)), 1);
    else if constexpr (std::is_same_v<S, float>)
        return _mm_maskz_set1_epi8(_mm512_test_epi32_mask(v, _mm512_set1_epi32(INT32_MAX)), 1);
    else
        return cut<sizeof(S), 1>(leastUnsigned<sizeof(S)>(v, allLanes<sizeof(S)>(1)));
}

template <class S, class D> auto toFloating(auto v) {
    if constexpr (std::is_same_v<S, double>)
        return _mm256_castps_si256(_mm512_cvtpd_ps(_mm512_castsi512_pd(v)));
    else if constexpr (std::is_same_v<S, float>)
        return _mm512_castpd_si512(_mm512_cvtps_pd(_mm256_castsi256_ps(v)));
    else if constexpr (std::is_same_v<D, double> && sizeof(S) == 4)
        return _mm512_castpd_si512(std::is_unsigned_v<S> ? _mm512_cvtepu32_pd(v) : _mm512_cvtepi32_pd(v));
    else if constexpr (std::is_same_v<D, double>)
        return _mm512_castpd_si512(_mm512_cvtepi64_pd(widened<S, 8>(v)));
    else
        return _mm512_castps_si512(std::is_same_v<S, std::uint32_t> ? _mm512_cvtepu32_ps(widened<S, 4>(v))
                                                                    : _mm512_cvtepi32_ps(widened<S, 4>(v)));
}

template <class S, class D, fxpModeOverflow_tag overflow> auto toInteger(auto v) {
    constexpr bool saturates = overflowMatters<S, D> && overflow == FXP_OVERFLOW_SATURATE;
    constexpr int from = sizeof(S), to = sizeof(D);
    if constexpr (to > from) {
        const __m512i wide = widened<S, to>(v);
        if constexpr (saturates)
            return mostSigned<to>(wide, __m512i{});
        else
            return wide;
    } else if constexpr (!saturates) {
        return cut<from, to>(v);
    } else if constexpr (std::is_unsigned_v<S> && std::is_signed_v<D>) {
        return cut<from, to>(leastUnsigned<from>(v, allLanes<from>(highest<D>)));
    } else if constexpr (std::is_signed_v<D>) {
        return saturatedSigned<from, to>(v);
    } else if constexpr (std::is_signed_v<S>) {
        return saturatedUnsigned<from, to>(mostSigned<from>(v, __m512i{}));
    } else {
        return saturatedUnsigned<from, to>(v);
    }
}

// Narrowing one register takes two shuffles. Where several fill one together they share them: one a register.

// Whether registers of S are narrowed together to D.
template <class S, class D>
constexpr bool narrowsTogether = sizeof(D) < sizeof(S) && !isFloating<D> && !(isFloating<S> && isBoolean<D>);

// The numbers in the lanes either saturate when they are packed, to a signed or an unsigned range, or are cut off.
enum class Packing { toSigned, toUnsigned, cutOff };

inline __m512i lowerHalves(__m512i a, __m512i b) {
    return _mm512_permutex2var_epi32(a, _mm512_setr_epi32(0, 2, 4, 6, 8, 10, 12, 14, 16, 18, 20, 22, 24, 26, 28, 30),
                                     b);
}

// As many registers of lanes of `from` bytes as fill one of `to`. Numbers of 8 bytes are within 4, or are cut off. What
// packs two registers takes a quarter of each in turn: the quarters are put in order at the end.
template <int from, int to, Packing packing> __m512i packed(const __m512i* v) {
    if constexpr (from == 8) {
        __m512i halves[4 / to];
        for (int i = 0; i < 4 / to; ++i)
            halves[i] = lowerHalves(v[2 * i], v[2 * i + 1]);
        return packed<4, to, packing>(halves);
    } else if constexpr (from == to) {
        return v[0];
    } else {
        constexpr int parts = from / to;
        __m512i numbers[parts];
        for (int i = 0; i < parts; ++i)
            numbers[i] = packing == Packing::cutOff ? v[i] & allLanes<from>((1u << 8 * to) - 1) : v[i];
        constexpr bool isSigned = packing == Packing::toSigned;
        const auto pack16 = [](__m512i a, __m512i b) {
            return isSigned ? _mm512_packs_epi16(a, b) : _mm512_packus_epi16(a, b);
        };
        if constexpr (parts == 4) {
            const __m512i all =
                pack16(_mm512_packs_epi32(numbers[0], numbers[1]), _mm512_packs_epi32(numbers[2], numbers[3]));
            return _mm512_permutexvar_epi32(_mm512_setr_epi32(0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15),
                                            all);
        } else {
            const auto pack32 = [](__m512i a, __m512i b) {
                return isSigned ? _mm512_packs_epi32(a, b) : _mm512_packus_epi32(a, b);
            };
            const __m512i all = from == 2 ? pack16(numbers[0], numbers[1]) : pack32(numbers[0], numbers[1]);
            return _mm512_permutexvar_epi64(_mm512_setr_epi64(0, 2, 4, 6, 1, 3, 5, 7), all);
        }
    }
}

template <int from, int to, Packing packing, std::size_t times>
void storePacked(std::byte* dst, const __m512i (&v)[times]) {
    for (std::size_t k = 0; k < times; k += from / to, dst += sizeof(__m512i))
        _mm512_storeu_si512(dst, packed<from, to, packing>(v + k));
}

template <class D> constexpr Packing saturatingTo = std::is_signed_v<D> ? Packing::toSigned : Packing::toUnsigned;

// Whole numbers that saturate to D when they are packed.
template <class D, fxpModeRounding_tag rounding, class F> __m512i forPacking(F, auto v) {
    constexpr int direction = directionOf<rounding>;
    using Within = std::conditional_t<std::is_same_v<D, std::uint32_t>, std::uint32_t, std::int32_t>;
    if constexpr (std::is_same_v<F, float> && std::is_signed_v<D>) {
        // What is below 32 bits converts to the lowest number.
        return maskedToSigned<direction>(v, withHalf<F, rounding>(least(v, all(0x1p30F))));
    } else if constexpr (std::is_same_v<F, float>) {
        return toSigned<direction>(withHalf<F, rounding>(least(most(v, all(0.0F)), all(0x1p30F))));
    } else {
        const auto atLeast = std::is_signed_v<D> ? most(all(double{lowest<Within>}), v) : most(v, all(0.0));
        // NaN converts to the lowest number of 64 bits: its lower half is zero.
        return toSigned<direction>(withHalf<F, rounding>(least(all(double{highest<Within>}), atLeast)));
    }
}

// Losses of floating elements. convert() gives what D has of them, and something else where it has not; numbers that
// are narrowed later are as wide as before.

// To narrower integers and boolean: rounding down and rounding up differ, or, once the range begins at zero, a bit is
// set that no number of it has. What does not convert is the lowest integer in both directions, and outside.
template <class F, class D> class LossesToNarrower {
  public:
    auto convert(__m512i bits) {
        const auto v = floating(F{}, bits);
        const __m512i down = toSigned<directionOf<FXP_ROUND_FLOOR>>(v);
        const __m512i up = toSigned<directionOf<FXP_ROUND_CEILING>>(v);
        differences_ = withDifferences(differences_, down, up);
        bits_ |= plus(down, belowZero);
        return down;
    }
    bool anyLost() const {
        const __m512i lost = differences_ | _mm512_andnot_si512(plus(__m512i{}, belowZero + highestOf()), bits_);
        return _mm512_test_epi64_mask(lost, lost) != 0;
    }

  private:
    static constexpr std::int64_t highestOf() {
        if constexpr (isBoolean<D>)
            return 1;
        else
            return highest<D>;
    }
    static constexpr std::int64_t belowZero = std::is_signed_v<D> ? highestOf() + 1 : 0;
    static __m512i plus(__m512i v, std::int64_t amount) {
        if (amount == 0) return v;
        return sizeof(F) == 8 ? _mm512_add_epi64(v, _mm512_set1_epi64(amount))
                              : _mm512_add_epi32(v, _mm512_set1_epi32(static_cast<int>(amount)));
    }

    __m512i differences_{};
    __m512i bits_{};
};

// To single and back. NaN may come back as it was; it is looked for in pairs of results.
class LossesToSingle {
  public:
    __m256i convert(__m512i bits) {
        const __m256 d = _mm512_cvtpd_ps(floating(double{}, bits));
        differences_ = withDifferences(differences_, bits, _mm512_castpd_si512(_mm512_cvtps_pd(d)));
        if (isSecond_) nans_ = _kor_mask8(nans_, _mm256_cmp_ps_mask(first_, d, _CMP_UNORD_Q));
        first_ = d;
        isSecond_ = !isSecond_;
        return _mm256_castps_si256(d);
    }
    bool anyLost() const {
        const __mmask8 nans = _kor_mask8(nans_, _mm256_cmp_ps_mask(first_, first_, _CMP_UNORD_Q));
        return (_mm512_test_epi64_mask(differences_, differences_) | nans) != 0;
    }

  private:
    __m512i differences_{};
    __mmask8 nans_ = 0;
    __m256 first_{};
    bool isSecond_ = false;
};

// Singles to 32-bit integers and back, toward zero, so that no end of a range comes back as a power of two.
template <class D> class LossesOfSingle {
  public:
    __m512i convert(__m512i bits) {
        const __m512 v = floating(float{}, bits);
        const __m512i d = std::is_unsigned_v<D> ? toUnsigned<towardZero>(v) : toSigned<towardZero>(v);
        const __m512 back =
            std::is_unsigned_v<D> ? _mm512_cvt_roundepu32_ps(d, towardZero) : _mm512_cvt_roundepi32_ps(d, towardZero);
        lost_ = _kor_mask16(lost_, lanesWhere<_CMP_NEQ_UQ>(v, back));
        return d;
    }
    bool anyLost() const { return lost_ != 0; }

  private:
    __mmask16 lost_ = 0;
};

template <class F, class D> struct LossesOf { using type = LossesToNarrower<F, D>; };
template <> struct LossesOf<double, float> { using type = LossesToSingle; };
template <> struct LossesOf<float, std::int32_t> { using type = LossesOfSingle<std::int32_t>; };
template <> struct LossesOf<float, std::uint32_t> { using type = LossesOfSingle<std::uint32_t>; };

struct Avx512 {
    static constexpr std::size_t registerBytes = 64;
    using Bits = __m512i;

    // 1 to 64 of them.
    static __mmask64 firstBytes(std::size_t count) { return ~__mmask64{0} >> (64 - count); }

    // clang-format off
    template <std::size_t bytes> static auto load(const std::byte* p) {
        if constexpr (bytes == 64)      return _mm512_loadu_si512(p);
        else if constexpr (bytes == 32) return _mm256_loadu_si256(reinterpret_cast<const __m256i_u*>(p));
        else if constexpr (bytes == 16) return _mm_loadu_si128(reinterpret_cast<const __m128i_u*>(p));
        else                            return _mm_loadl_epi64(reinterpret_cast<const __m128i_u*>(p));
    }
    template <std::size_t bytes> static auto load(const std::byte* p, std::size_t used) {
        const __mmask64 mask = firstBytes(used);
        if constexpr (bytes == 64)      return _mm512_maskz_loadu_epi8(mask, p);
        else if constexpr (bytes == 32) return _mm256_maskz_loadu_epi8(static_cast<__mmask32>(mask), p);
        else                            return _mm_maskz_loadu_epi8(static_cast<__mmask16>(mask), p);
    }
    template <std::size_t bytes> static void store(std::byte* p, auto v) {
        if constexpr (bytes == 64)      _mm512_storeu_si512(p, v);
        else if constexpr (bytes == 32) _mm256_storeu_si256(reinterpret_cast<__m256i_u*>(p), v);
        else if constexpr (bytes == 16) _mm_storeu_si128(reinterpret_cast<__m128i_u*>(p), v);
        else                            _mm_storel_pi(reinterpret_cast<__m64*>(p), _mm_castsi128_ps(v));
    }
    template <std::size_t bytes> static void store(std::byte* p, auto v, std::size_t used) {
        const __mmask64 mask = firstBytes(used);
        if constexpr (bytes == 64)      _mm512_mask_storeu_epi8(p, mask, v);
        else if constexpr (bytes == 32) _mm256_mask_storeu_epi8(p, static_cast<__mmask32>(mask), v);
        else                            _mm_mask_storeu_epi8(p, static_cast<__mmask16>(mask), v);
    }
    // clang-format on

    template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
    static auto converted(auto v) {
        if constexpr (isBoolean<D>)
            return toBoolean<S>(v);
        else if constexpr (isFloating<D>)
            return toFloating<S, D>(v);
        else if constexpr (isInteger<S>)
            return toInteger<S, D, overflow>(v);
        else if constexpr (overflow == FXP_OVERFLOW_SATURATE)
            return saturated<D, rounding>(S{}, floating(S{}, v));
        else
            return wrapped<D, rounding>(S{}, floating(S{}, v));
    }

    // Wrapping numbers of the element's own size are taken together for another reason: most convert without the
    // division that they may need, and four are looked at at once.
    template <class S, class D, fxpModeOverflow_tag overflow>
    static constexpr std::size_t together = narrowsTogether<S, D> ? std::max<std::size_t>(4, sizeof(S) / sizeof(D))
                                            : roundingMatters<S, D>&& overflow == FXP_OVERFLOW_WRAP ? 4
                                                                                                    : 0;

    template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
    static void convertTogether(const std::byte* src, std::byte* dst) {
        constexpr std::size_t times = together<S, D, overflow>;
        constexpr bool wraps = overflow == FXP_OVERFLOW_WRAP;
        __m512i numbers[times];
        for (std::size_t k = 0; k < times; ++k)
            numbers[k] = load<registerBytes>(src + k * registerBytes);
        if constexpr (isBoolean<D>) {
            for (__m512i& each : numbers)
                each = leastUnsigned<sizeof(S)>(each, allLanes<sizeof(S)>(1));
            storePacked<sizeof(S), sizeof(D), Packing::toUnsigned>(dst, numbers);
        } else if constexpr (isInteger<S>) {
            constexpr bool saturates = overflowMatters<S, D> && !wraps;
            if constexpr (saturates && std::is_unsigned_v<S>)
                for (__m512i& each : numbers)
                    each = leastUnsigned<sizeof(S)>(each, allLanes<sizeof(S)>(highest<D>));
            storePacked<sizeof(S), sizeof(D), saturates ? saturatingTo<D> : Packing::cutOff>(dst, numbers);
        } else if constexpr (wraps) {
            // What converts to the lowest integer may not have converted at all. Its lowest byte is right even so.
            constexpr int direction = directionOf<rounding>;
            using Lanes = decltype(lanesWhere<_CMP_EQ_OQ>(floating(S{}, numbers[0]), S{}));
            constexpr auto everyLane = static_cast<Lanes>(-1);
            Lanes didConvert = everyLane;
            for (__m512i& each : numbers) {
                each = toSigned<direction>(withHalf<S, rounding>(floating(S{}, each)));
                if constexpr (sizeof(D) > 1) didConvert = unlikeLowest(didConvert, each, S{});
            }
            if (didConvert != everyLane) [[unlikely]] {
                constexpr std::size_t bytes = registerBytes * sizeof(D) / sizeof(S);
                for (std::size_t k = 0; k < times; ++k)
                    store<bytes>(dst + k * bytes,
                                 converted<S, D, rounding, overflow>(load<registerBytes>(src + k * registerBytes)));
                return;
            }
            storePacked<sizeof(S), sizeof(D), Packing::cutOff>(dst, numbers);
        } else {
            for (__m512i& each : numbers)
                each = forPacking<D, rounding>(S{}, floating(S{}, each));
            storePacked<sizeof(S), sizeof(D), saturatingTo<D>>(dst, numbers);
        }
    }

    template <class F, class D> using FloatingLosses = typename LossesOf<F, D>::type;
    template <class S, class D> static constexpr bool narrowsLater = narrowsTogether<S, D>;
    template <class S, class D, std::size_t times> static void storeKept(std::byte* dst, const auto(&kept)[times]) {
        if constexpr (sizeof(D) >= sizeof(S) || isFloating<D>) {
            for (std::size_t k = 0; k < times; ++k)
                store<sizeof kept[k]>(dst + k * sizeof kept[k], kept[k]);
        } else if constexpr (times >= sizeof(S) / sizeof(D)) {
            storePacked<sizeof(S), sizeof(D), saturatingTo<D>>(dst, kept);
        } else {
            constexpr std::size_t bytes = registerBytes * sizeof(D) / sizeof(S);
            for (std::size_t k = 0; k < times; ++k)
                store<bytes>(dst + k * bytes, cut<sizeof(S), sizeof(D)>(kept[k]));
        }
    }
    template <class S> static __m512i withUnlikeSingle(__m512i found, S, __m512i v) {
        if constexpr (std::is_signed_v<S>) // 2^31, next to the highest, comes back as the lowest
            return withDifferences(found, v, _mm512_cvttps_epi32(_mm512_cvtepi32_ps(v)));
        else // rounded toward zero, or 2^32 would come back as the highest
            return withDifferences(found, v, _mm512_cvttps_epu32(_mm512_cvt_roundepu32_ps(v, towardZero)));
    }

    static auto floating(auto f, __m512i bits) { return conversion::floating(f, bits); }
    static __m512d magnitude(__m512d v) { return _mm512_abs_pd(v); }
    template <int relation> static auto lanesWhere(auto v, auto bound) {
        return conversion::lanesWhere<relation>(v, all(bound));
    }
    static bool any(auto mask) { return mask != 0; }
    template <int size> static __m512i plus(__m512i v, std::uint32_t amount) {
        return size == 4 ? _mm512_add_epi32(v, allLanes<4>(amount)) : _mm512_add_epi16(v, allLanes<2>(amount));
    }
    template <int size> static bool anyBit(__m512i v, std::uint32_t bits) {
        return _mm512_test_epi32_mask(v, allLanes<size>(bits)) != 0;
    }
    static __m512i doubled32(__m512i v) { return _mm512_add_epi32(v, v); }
    static __m512i most32(__m512i v, __m512i w) { return _mm512_max_epu32(v, w); }
    static bool anyFrom32(__m512i v, std::uint32_t low, std::uint32_t high) {
        const auto both = static_cast<long long>(std::uint64_t{high} << 32 | low);
        return _mm512_cmpge_epu32_mask(v, _mm512_set1_epi64(both)) != 0;
    }

    // Whole lines past the caches; what is left of a line at either end as usual.
    static void copyToMemory(const std::byte* src, std::byte* dst, std::size_t bytes) {
        const std::size_t unaligned = -reinterpret_cast<std::uintptr_t>(dst) % registerBytes;
        const std::size_t head = unaligned < bytes ? unaligned : bytes;
        if (head) store<registerBytes>(dst, load<registerBytes>(src, head), head);
        src += head;
        dst += head;
        bytes -= head;
        for (; bytes >= registerBytes; bytes -= registerBytes) {
            _mm512_stream_si512(reinterpret_cast<__m512i*>(dst), load<registerBytes>(src));
            src += registerBytes;
            dst += registerBytes;
        }
        if (bytes) store<registerBytes>(dst, load<registerBytes>(src, bytes), bytes);
    }
    static void finishCopies() { _mm_sfence(); }
};

} // namespace

constinit const Level avx512Level = levelOf<VectorRuns<Avx512>>("avx512");

} // namespace QLTypeSys::conversion
