// The casts as host functions: each element by the rules, each class to each other.

#include <cmath>
#include <limits>

#include <gtest/gtest.h>

#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/classes/Objects.h"
#include "qlplatform/services/HostFunctions.h"
#include "tests/support/FailingAllocations.h"

namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double nan = std::numeric_limits<double>::quiet_NaN();

txArrayPtr called(const char* function, const txArray_tag* argument) {
    txArray_tag* input = const_cast<txArray_tag*>(argument);
    txArray_tag* output = nullptr;
    if (qlsvDiagnosticImpl* d = qlsvFEVAL_NoThrow(1, &output, 1, &input, function, true, nullptr))
        qlsvThrowIExceptionFromDiagnostic(d, nullptr);
    return txArrayPtr(output);
}

template <class T> std::vector<T> elements(const txArray_tag* array) {
    const auto view = txGetElements<T>(array);
    return {view.begin(), view.end()};
}

template <class To, class From>
void expectCast(const char* function, std::vector<From> from, std::vector<To> expected) {
    SCOPED_TRACE(std::string("to ") + function);
    const txArrayPtr source(txCreateRow(std::span<const From>(from)));
    EXPECT_EQ(elements<To>(called(function, source.get()).get()), expected);
}

TEST(Casts, FloatingToIntegersRoundsAwayAndSaturates) {
    const std::vector<double> doubles = {0.5, -0.5, 1.49, 2.5, -2.5, 1e30, -1e30, infinity, -infinity, nan};
    using std::int16_t, std::int32_t, std::int64_t, std::int8_t, std::uint16_t, std::uint32_t, std::uint64_t,
        std::uint8_t;
    // clang-format off
    expectCast<int8_t>("int8", doubles, {1, -1, 1, 3, -3, 127, -128, 127, -128, 0});
    expectCast<uint8_t>("uint8", doubles, {1, 0, 1, 3, 0, 255, 0, 255, 0, 0});
    expectCast<int16_t>("int16", doubles, {1, -1, 1, 3, -3, 32767, -32768, 32767, -32768, 0});
    expectCast<uint16_t>("uint16", doubles, {1, 0, 1, 3, 0, 65535, 0, 65535, 0, 0});
    expectCast<int32_t>("int32", doubles, {1, -1, 1, 3, -3, INT32_MAX, INT32_MIN, INT32_MAX, INT32_MIN, 0});
    expectCast<uint32_t>("uint32", doubles, {1, 0, 1, 3, 0, UINT32_MAX, 0, UINT32_MAX, 0, 0});
    expectCast<int64_t>("int64", doubles, {1, -1, 1, 3, -3, INT64_MAX, INT64_MIN, INT64_MAX, INT64_MIN, 0});
    expectCast<uint64_t>("uint64", doubles, {1, 0, 1, 3, 0, UINT64_MAX, 0, UINT64_MAX, 0, 0});
    // clang-format on
    expectCast<int64_t>("int64", std::vector<double>{9223372036854775808.0, 9223372036854774784.0},
                        {INT64_MAX, 9223372036854774784});
    expectCast<int32_t>("int32", std::vector<float>{2147483648.0f, -2147483648.0f, 0.49999997f},
                        {INT32_MAX, INT32_MIN, 0});
}

TEST(Casts, IntegersSaturateExactly) {
    expectCast<std::uint64_t>("uint64", std::vector<std::int64_t>{-1, INT64_MAX}, {0, INT64_MAX});
    expectCast<std::int64_t>("int64", std::vector<std::uint64_t>{UINT64_MAX, (1ULL << 53) + 1},
                             {INT64_MAX, (1LL << 53) + 1});
    expectCast<std::int8_t>("int8", std::vector<std::int32_t>{-129, -128, 127, 128}, {-128, -128, 127, 127});
    expectCast<std::uint8_t>("uint8", std::vector<std::int16_t>{-1, 256}, {0, 255});
}

TEST(Casts, LogicalsAndCharactersAreNumbers) {
    expectCast<double>("double", std::vector<char16_t>{u'A', 0xFFFF}, {65, 65535});
    expectCast<std::uint8_t>("uint8", std::vector<char16_t>{u'A', 0xFFFF}, {65, 255});
    const txArrayPtr yes(txCreateLogicalScalar(true));
    EXPECT_EQ(elements<double>(called("double", yes.get()).get()), std::vector<double>{1});
    EXPECT_EQ(elements<std::int32_t>(called("int32", yes.get()).get()), std::vector<std::int32_t>{1});
}

TEST(Casts, LogicalIsNotZero) {
    for (const char* name : {"logical", "boolean"}) {
        expectCast<bool>(name, std::vector<double>{0, -0.0, 0.1, -3, infinity}, {false, false, true, true, true});
        expectCast<bool>(name, std::vector<std::uint8_t>{0, 7}, {false, true});
    }
    const txArrayPtr notANumber(txCreateDoubleScalar(nan));
    EXPECT_RAISES(called("logical", notANumber.get()), "Quillane:Arrays:CannotCast", "NaN", "logical");
    const txArrayPtr pair(txCreateRow<std::complex<double>>({{1, 0}}));
    EXPECT_RAISES(called("logical", pair.get()), "Quillane:Arrays:CannotCast", "complex double", "logical");
}

TEST(Casts, FloatingTypes) {
    expectCast<float>("single", std::vector<double>{0.1, 1e300}, {0.1f, std::numeric_limits<float>::infinity()});
    expectCast<double>("double", std::vector<float>{0.1f}, {static_cast<double>(0.1f)});
}

TEST(Casts, ComplexStaysComplexAndShapeIsKept) {
    txArrayPtr source(txCreateNumericMatrix(2, 1, txClassDouble, true));
    txGetWritableElements<std::complex<double>>(source.get())[1] = {1.5, -300};
    const txArrayPtr result = called("int8", source.get());
    EXPECT_EQ(txGetNumRows(result.get()), 2u);
    EXPECT_EQ(txGetNumColumns(result.get()), 1u);
    EXPECT_EQ(txGetElements<std::complex<std::int8_t>>(result.get())[1], (std::complex<std::int8_t>(2, -128)));
}

TEST(Casts, TheSameClassIsASharedCopy) {
    const txArrayPtr source(txCreateDoubleScalar(1));
    const txArrayPtr result = called("double", source.get());
    EXPECT_NE(result.get(), source.get());
    EXPECT_EQ(txGetData(result.get()), txGetData(source.get()));
}

TEST(Casts, ComplexAndReal) {
    const txArrayPtr row(txCreateRow<std::int16_t>({3, 4}));
    const txArrayPtr widened = called("complex", row.get());
    using Pair = std::complex<std::int16_t>;
    EXPECT_EQ(elements<Pair>(widened.get()), (std::vector<Pair>{{3, 0}, {4, 0}}));
    EXPECT_EQ(txGetData(called("complex", widened.get()).get()), txGetData(widened.get()));
    const txArrayPtr pairs(txCreateRow<Pair>({{1, 2}, {3, 4}}));
    EXPECT_EQ(elements<std::int16_t>(called("real", pairs.get()).get()), (std::vector<std::int16_t>{1, 3}));
    EXPECT_EQ(txGetData(called("real", row.get()).get()), txGetData(row.get()));
    const txArrayPtr yes(txCreateLogicalScalar(true));
    using Wide = std::complex<double>;
    EXPECT_EQ(elements<Wide>(called("complex", yes.get()).get()), std::vector<Wide>{1});
    EXPECT_EQ(txGetClassID(called("real", yes.get()).get()), txClassLogical);
}

TEST(Casts, ObjectsCountAsTheirValues) {
    const txArrayPtr objects(omCreateObjectArray("Gear", txCreateRow<std::int32_t>({1, 2})));
    EXPECT_EQ(elements<double>(called("double", objects.get()).get()), (std::vector<double>{1, 2}));
    EXPECT_EQ(elements<std::int32_t>(called("int32", objects.get()).get()), (std::vector<std::int32_t>{1, 2}));
}

TEST(Casts, WhatHoldsNoNumbersCannotBeCast) {
    const txArrayPtr cells(txCreateCellMatrix(1, 1));
    for (const char* function : {"double", "logical", "complex", "real"}) {
        EXPECT_RAISES(called(function, cells.get()), "Quillane:Arrays:CannotCast", "cell", function);
        EXPECT_RAISES(called(function, nullptr), "Quillane:Arrays:CannotCast", "nothing", function);
    }
}

TEST(Casts, MemoryThatRunsOutLeavesNothingBehind) {
    const txArrayPtr pairs(txCreateRow<std::complex<double>>({{1, 2}}));
    const txArrayPtr yes(txCreateLogicalScalar(true));
    EXPECT_EQ(testsupport::failEachAllocation([&] { called("int8", pairs.get()); }), 2u);
    EXPECT_EQ(testsupport::failEachAllocation([&] { called("real", pairs.get()); }), 2u);
    EXPECT_EQ(testsupport::failEachAllocation([&] { called("complex", yes.get()); }), 4u);
}

} // namespace
