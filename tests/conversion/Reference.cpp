#include "tests/conversion/Reference.h"

#include <algorithm>

namespace reference {

namespace {

// A binary interchange format.
struct Format {
    int fractionBits;
    int exponentBits;

    constexpr std::uint64_t allOnes() const { return (1ULL << exponentBits) - 1; }
    constexpr int bias() const { return static_cast<int>(allOnes() >> 1); }
};

constexpr Format doubleFormat = {52, 11};
constexpr Format singleFormat = {23, 8};

Value decoded(std::uint64_t bits, const Format& format) {
    const bool negative = bits >> (format.fractionBits + format.exponentBits);
    const std::uint64_t field = bits >> format.fractionBits & format.allOnes();
    const std::uint64_t fraction = bits & ((1ULL << format.fractionBits) - 1);
    if (field == format.allOnes()) return {fraction ? Kind::nan : Kind::infinite, {negative, 0, 0}};
    const std::uint64_t implicit = field ? 1ULL << format.fractionBits : 0;
    const int exponent = static_cast<int>(std::max<std::uint64_t>(field, 1)) - format.bias() - format.fractionBits;
    return {Kind::finite, {negative, fraction | implicit, exponent}};
}

// magnitude / 2^shift with what was cut off: 0 nothing, 1 below one half, 2 one half, 3 above.
struct Shifted {
    std::uint64_t whole;
    int cut;
};

Shifted shiftedRight(std::uint64_t magnitude, int shift) {
    if (shift > 64) return {0, magnitude ? 1 : 0};
    __extension__ using Wide = unsigned __int128;
    const Wide wide = magnitude;
    const Wide rest = wide & ((Wide{1} << shift) - 1);
    const Wide half = Wide{1} << (shift - 1);
    return {static_cast<std::uint64_t>(wide >> shift), rest == 0 ? 0 : rest < half ? 1 : rest == half ? 2 : 3};
}

std::uint64_t encoded(const Value& v, const Format& format) {
    const std::uint64_t sign = static_cast<std::uint64_t>(v.exact.negative)
                               << (format.fractionBits + format.exponentBits);
    const std::uint64_t infinite = format.allOnes() << format.fractionBits;
    if (v.kind == Kind::nan) return sign | infinite | 1ULL << (format.fractionBits - 1);
    if (v.kind == Kind::infinite) return sign | infinite;
    if (v.exact.magnitude == 0) return sign;

    const int leading = v.exact.exponent + std::bit_width(v.exact.magnitude) - 1;
    const int exponent = std::max(leading, 1 - format.bias()); // subnormals share the smallest
    const int shift = exponent - format.fractionBits - v.exact.exponent;
    std::uint64_t units = v.exact.magnitude;
    if (shift > 0) {
        const auto [whole, cut] = shiftedRight(units, shift);
        units = whole + (cut == 3 || (cut == 2 && whole % 2 == 1));
    } else {
        units <<= -shift;
    }
    // The leading bit of a normal number, and a carry into the next binade, both add one to the exponent field.
    const int field = exponent + format.bias() - 1;
    if (field >= static_cast<int>(format.allOnes())) return sign | infinite;
    return sign | std::min((static_cast<std::uint64_t>(field) << format.fractionBits) + units, infinite);
}

} // namespace

Value valueOf(double v) { return decoded(std::bit_cast<std::uint64_t>(v), doubleFormat); }
Value valueOf(float v) { return decoded(std::bit_cast<std::uint32_t>(v), singleFormat); }

Roundings roundingsOf(const Exact& v) {
    Whole truncated{v.negative, false, v.magnitude};
    int cut = 0;
    if (v.exponent < 0) {
        const Shifted shifted = shiftedRight(v.magnitude, -v.exponent);
        truncated.magnitude = shifted.whole;
        cut = shifted.cut;
    } else {
        truncated.beyond64 = v.magnitude && std::bit_width(v.magnitude) + v.exponent > 64;
        truncated.magnitude = v.exponent < 64 ? v.magnitude << v.exponent : 0;
    }
    Whole away = truncated; // what was cut off leaves room for one more
    ++away.magnitude;

    Roundings r;
    r[FXP_ROUND_ZERO] = r[FXP_ROUND_AS_ZERO] = truncated;
    r[FXP_ROUND_CEILING] = cut && !v.negative ? away : truncated;
    r[FXP_ROUND_FLOOR] = cut && v.negative ? away : truncated;
    r[FXP_ROUND_HALF_UP] = cut == 3 || (cut == 2 && !v.negative) ? away : truncated;
    r[FXP_ROUND_HALF_AWAY] = cut >= 2 ? away : truncated;
    r[FXP_ROUND_HALF_EVEN] = cut == 3 || (cut == 2 && truncated.magnitude % 2 == 1) ? away : truncated;
    return r;
}

bool atLeast(const Whole& v, std::int64_t bound) {
    if (v.negative && v.magnitude) return bound < 0 && !v.beyond64 && v.magnitude <= -static_cast<std::uint64_t>(bound);
    if (v.beyond64) return !v.negative;
    return bound <= 0 || v.magnitude >= static_cast<std::uint64_t>(bound);
}

bool atMost(const Whole& v, std::int64_t bound) {
    if (v.negative) {
        if (v.beyond64) return true;
        return bound >= 0 || v.magnitude >= -static_cast<std::uint64_t>(bound);
    }
    return !v.beyond64 && bound >= 0 && v.magnitude <= static_cast<std::uint64_t>(bound);
}

std::uint64_t nearestDoubleBits(const Value& v) { return encoded(v, doubleFormat); }
std::uint32_t nearestSingleBits(const Value& v) { return static_cast<std::uint32_t>(encoded(v, singleFormat)); }

bool equal(const Value& a, const Value& b) {
    if (a.kind == Kind::nan || b.kind == Kind::nan) return false;
    if (a.kind != b.kind) return false;
    if (a.kind == Kind::infinite) return a.exact.negative == b.exact.negative;
    if (a.exact.magnitude == 0 || b.exact.magnitude == 0) return a.exact.magnitude == b.exact.magnitude;
    // The same odd magnitude and exponent.
    const int trailingA = std::countr_zero(a.exact.magnitude);
    const int trailingB = std::countr_zero(b.exact.magnitude);
    return a.exact.negative == b.exact.negative && a.exact.magnitude >> trailingA == b.exact.magnitude >> trailingB &&
           a.exact.exponent + trailingA == b.exact.exponent + trailingB;
}

} // namespace reference
