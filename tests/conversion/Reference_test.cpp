// The reference itself, held against rational numbers of unlimited size.
#include "tests/conversion/Reference.h"

#include <boost/multiprecision/cpp_int.hpp>
#include <gtest/gtest.h>

#include "tests/conversion/Support.h"

namespace {

using boost::multiprecision::cpp_int;
using boost::multiprecision::cpp_rational;
using namespace conversiontest;

cpp_int floorOf(const cpp_rational& v) {
    const cpp_int above = numerator(v), below = denominator(v);
    cpp_int quotient = above / below;
    if (above < 0 && quotient * below != above) --quotient;
    return quotient;
}

cpp_int ceilingOf(const cpp_rational& v) { return -floorOf(-v); }

cpp_int roundedBy(fxpModeRounding_tag mode, const cpp_rational& v) {
    const cpp_rational half(1, 2);
    switch (mode) {
    case FXP_ROUND_ZERO:
    case FXP_ROUND_AS_ZERO:
        return v < 0 ? ceilingOf(v) : floorOf(v);
    case FXP_ROUND_HALF_UP:
        return floorOf(v + half);
    case FXP_ROUND_CEILING:
        return ceilingOf(v);
    case FXP_ROUND_FLOOR:
        return floorOf(v);
    case FXP_ROUND_HALF_AWAY:
        return v < 0 ? ceilingOf(v - half) : floorOf(v + half);
    case FXP_ROUND_HALF_EVEN: {
        const cpp_int down = floorOf(v);
        const cpp_rational part = v - cpp_rational(down);
        return part > half || (part == half && down % 2 != 0) ? down + 1 : down;
    }
    }
    return 0;
}

template <class D>
cpp_int intoRange(const cpp_rational& v, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow) {
    const cpp_int lo = std::numeric_limits<D>::min(), hi = std::numeric_limits<D>::max();
    if (overflow == FXP_OVERFLOW_SATURATE) {
        if (v >= cpp_rational(hi)) return hi;
        if (v <= cpp_rational(lo)) return lo;
        return roundedBy(rounding, v);
    }
    const cpp_int modulus = hi - lo + 1;
    cpp_int x = roundedBy(rounding, v);
    if (x >= lo && x <= hi) return x;
    x %= modulus; // with the sign of x
    if (x < lo) x += modulus;
    if (x > hi) x -= modulus;
    return x;
}

template <class S> cpp_rational rationalOf(S v) {
    const reference::Value taken = reference::valueOf(v);
    int exponent;
    const double fraction = std::frexp(static_cast<double>(v), &exponent);
    const cpp_rational scaled(static_cast<std::int64_t>(std::ldexp(fraction, 53)));
    exponent -= 53;
    const cpp_rational power(cpp_int(1) << std::abs(exponent));
    EXPECT_EQ(taken.kind, reference::Kind::finite);
    return exponent < 0 ? cpp_rational(scaled / power) : cpp_rational(scaled * power);
}

template <class S> std::vector<S> sample() {
    std::vector<S> values;
    const std::vector<S> special = specialValues<S>();
    for (std::size_t i = 0; i < special.size(); i += 5)
        values.push_back(special[i]);
    for (const S v : randomValues<S>(300, 1))
        values.push_back(v);
    for (const S v : randomNumbersInRange<S>(500, 2))
        values.push_back(v);
    std::erase_if(values, [](S v) { return !std::isfinite(v); });
    return values;
}

template <class S, class D> void expectIntegersAgree() {
    for (const S v : sample<S>()) {
        const cpp_rational exact = rationalOf(v);
        const reference::Analysed analysed = reference::analysed(v);
        for (const fxpModeRounding_tag rounding : allRoundings)
            for (const fxpModeOverflow_tag overflow : allOverflows)
                ASSERT_EQ(cpp_int(reference::toInteger<D>(analysed, rounding, overflow)),
                          intoRange<D>(exact, rounding, overflow))
                    << combinationName(idOf<S>, idOf<D>, rounding, overflow) << " of " << elementText(v);
    }
}

TEST(ConversionReference, IntegersAgreeWithRationalNumbers) {
    expectIntegersAgree<double, std::int8_t>();
    expectIntegersAgree<double, std::uint16_t>();
    expectIntegersAgree<double, std::int32_t>();
    expectIntegersAgree<double, std::uint32_t>();
    expectIntegersAgree<float, std::uint8_t>();
    expectIntegersAgree<float, std::int16_t>();
    expectIntegersAgree<float, std::int32_t>();
    expectIntegersAgree<float, std::uint32_t>();
}

TEST(ConversionReference, NearestSingleIsNearestByRationalNumbers) {
    for (const double v : sample<double>()) {
        const float found = std::bit_cast<float>(reference::nearestSingleBits(reference::valueOf(v)));
        const cpp_rational exact = rationalOf(v);
        const auto rational = [](float f) {
            const double limit = 0x1p128; // what comes after the largest single
            return rationalOf(std::isinf(f) ? std::copysign(limit, f) : static_cast<double>(f));
        };
        const cpp_rational distance = abs(rational(found) - exact);
        for (const float direction : {HUGE_VALF, -HUGE_VALF}) {
            const float neighbour = std::nextafterf(found, direction);
            if (neighbour == found) continue;
            const cpp_rational other = abs(rational(neighbour) - exact);
            if (std::fabs(v) > 0x1p128 && std::isinf(found)) continue;
            const bool foundIsEven = std::bit_cast<std::uint32_t>(found) % 2 == 0;
            EXPECT_TRUE(distance < other || (distance == other && foundIsEven)) << elementText(v);
        }
    }
}

TEST(ConversionReference, IntegersBecomeTheNearestFloatingNumbers) {
    for (const std::int32_t v : specialValues<std::int32_t>()) {
        EXPECT_EQ(std::bit_cast<double>(reference::nearestDoubleBits(reference::valueOf(v))), static_cast<double>(v));
        EXPECT_EQ(reference::nearestSingleBits(reference::valueOf(v)),
                  reference::nearestSingleBits(reference::valueOf(static_cast<double>(v))));
    }
}

TEST(ConversionReference, EqualityIsThatOfNumbers) {
    using reference::equal;
    using reference::valueOf;
    EXPECT_TRUE(equal(valueOf(0.0), valueOf(-0.0)));
    EXPECT_TRUE(equal(valueOf(2.0), valueOf(2.0F)));
    EXPECT_TRUE(equal(valueOf(-96.0), valueOf(std::int8_t{-96})));
    EXPECT_FALSE(equal(valueOf(2.0), valueOf(-2.0)));
    EXPECT_FALSE(equal(valueOf(2.0), valueOf(4.0)));
    EXPECT_FALSE(equal(valueOf(0.1), valueOf(0.1F)));
    EXPECT_FALSE(equal(valueOf(std::nan("")), valueOf(std::nan(""))));
    EXPECT_FALSE(equal(valueOf(HUGE_VAL), valueOf(-HUGE_VAL)));
}

} // namespace
