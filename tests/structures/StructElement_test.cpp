#include <cmath>
#include <limits>

#include <gtest/gtest.h>

#include "qltypes/structures/StructElement.h"

namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double largest = std::numeric_limits<double>::max();
constexpr long infiniteDim = std::numeric_limits<long>::max();

TEST(StructElement, StartsUnset) {
    const StructElement e;
    EXPECT_EQ(e.name, "");
    EXPECT_EQ(e.dataTypeId, -10);
    EXPECT_EQ(e.unitId, -1);
    EXPECT_EQ(e.symbDimsId, 0);
    EXPECT_EQ(e.numDims, 0u);
    EXPECT_EQ(e.dims, nullptr);
    EXPECT_EQ(e.intDims, nullptr);
    EXPECT_EQ(e.offset, -1);
    EXPECT_EQ(e.varDimsOffset, -1);
    EXPECT_EQ(e.signalType, -1);
    EXPECT_EQ(e.samplingMode, -1);
    EXPECT_EQ(e.dimensionsMode, -1);
    EXPECT_EQ(e.min, -infinity);
    EXPECT_EQ(e.max, infinity);
    EXPECT_EQ(e.getWidth(), 1);
    EXPECT_TRUE(e.isScalar());
}

TEST(StructElement, FieldsStandInTheirOrder) {
    const StructElement e;
    const void* const fields[] = {&e.name,       &e.dataTypeId,   &e.unitId,         &e.symbDimsId, &e.numDims,
                                  &e.dims,       &e.intDims,      &e.inlineDim,      &e.offset,     &e.varDimsOffset,
                                  &e.signalType, &e.samplingMode, &e.dimensionsMode, &e.min,        &e.max};
    for (std::size_t i = 1; i < std::size(fields); ++i)
        EXPECT_LT(fields[i - 1], fields[i]) << i;
}

TEST(StructElement, SettersWriteTheirField) {
    StructElement e;
    e.setName("x");
    EXPECT_EQ(e.name, "x");
    e.setName(nullptr);
    EXPECT_EQ(e.name, "");
    e.setDataTypeId(1);
    e.setUnitId(2);
    e.setSymbDimsId(3);
    e.setOffset(4);
    e.setVarDimsOffset(5);
    e.setSignalType(6);
    e.setSamplingMode(7);
    e.setDimensionsMode(8);
    e.setMin(9);
    e.setMax(10);
    EXPECT_EQ(e.dataTypeId, 1);
    EXPECT_EQ(e.unitId, 2);
    EXPECT_EQ(e.symbDimsId, 3);
    EXPECT_EQ(e.offset, 4);
    EXPECT_EQ(e.varDimsOffset, 5);
    EXPECT_EQ(e.signalType, 6);
    EXPECT_EQ(e.samplingMode, 7);
    EXPECT_EQ(e.dimensionsMode, 8);
    EXPECT_EQ(e.min, 9);
    EXPECT_EQ(e.max, 10);
}

TEST(StructElement, DimensionsThatRemainAreKept) {
    struct Row {
        long from, to;
        std::vector<long> expected;
    };
    const Row rows[] = {
        {0, 1, {0}},    {0, 3, {0, 0, 0}}, {1, 0, {}},           {1, 1, {2}}, {1, 2, {2, 0}}, {2, 1, {2}},
        {3, 2, {2, 3}}, {3, 3, {2, 3, 4}}, {2, 4, {2, 3, 0, 0}}, {3, 0, {}},  {3, -1, {}},    {0, -5, {}},
    };
    for (const bool withIntDims : {false, true}) {
        for (const Row& row : rows) {
            SCOPED_TRACE(testing::Message() << row.from << " to " << row.to << (withIntDims ? " narrowed" : ""));
            StructElement e;
            e.setNumDimensions(row.from);
            for (long i = 0; i < row.from; ++i)
                e.setDimension(i, i + 2);
            if (withIntDims) e.getDimensionsAsInt(ObsoleteIntDimsKey{});
            e.setNumDimensions(row.to);
            EXPECT_EQ(std::vector<long>(e.dims, e.dims + e.numDims), row.expected);
            EXPECT_EQ(e.dims == &e.inlineDim, e.numDims == 1);
            EXPECT_EQ(e.dims == nullptr, e.numDims == 0);
            EXPECT_EQ(e.intDims != nullptr, withIntDims && row.from > 0 && row.from == row.to);
        }
    }
}

TEST(StructElement, NarrowDimensionsFollowTheWideOnes) {
    StructElement e;
    e.setNumDimensions(5);
    const long dims[] = {-1, infiniteDim, 7, 0x100000005, std::numeric_limits<long>::min()};
    for (long i = 0; i < 5; ++i)
        e.setDimension(i, dims[i]);
    const int* narrow = e.getDimensionsAsInt(ObsoleteIntDimsKey{});
    EXPECT_EQ(std::vector<int>(narrow, narrow + 5), (std::vector<int>{-1, 0x7ffffffe, 7, 5, 0}));
    EXPECT_EQ(e.getDimensionsAsInt(ObsoleteIntDimsKey{}), narrow);
    e.setDimension(2, infiniteDim);
    e.setDimension(1, 0xffffffff);
    EXPECT_EQ(std::vector<int>(narrow, narrow + 5), (std::vector<int>{-1, -1, 0x7ffffffe, 5, 0}));
    EXPECT_EQ(StructElement().getDimensionsAsInt(ObsoleteIntDimsKey{}), nullptr);
}

TEST(StructElement, WidthIsTheProductAndScalarMeansAllOnes) {
    struct Row {
        std::vector<long> dims;
        long width;
        bool isScalar;
    };
    const Row rows[] = {
        {{}, 1, true},   {{1}, 1, true},     {{1, 1, 1}, 1, true}, {{3}, 3, false},      {{2, 3}, 6, false},
        {{0}, 0, false}, {{4, 0}, 0, false}, {{-1}, -1, false},    {{-1, -1}, 1, false}, {{infiniteDim, 2}, -2, false},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(testing::PrintToString(row.dims));
        StructElement e;
        e.setNumDimensions(static_cast<long>(row.dims.size()));
        for (std::size_t i = 0; i < row.dims.size(); ++i)
            e.setDimension(static_cast<long>(i), row.dims[i]);
        EXPECT_EQ(e.getWidth(), row.width);
        EXPECT_EQ(e.isScalar(), row.isScalar);
    }
}

TEST(StructElement, BoundsAreSpecifiedWhenFinite) {
    struct Row {
        double value;
        bool isMin, isMax;
    };
    const Row rows[] = {
        {0.0, true, true},       {largest, true, true},    {-largest, true, true},
        {infinity, true, false}, {-infinity, false, true}, {std::nan(""), true, true},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.value);
        StructElement e;
        e.setMin(row.value);
        e.setMax(row.value);
        EXPECT_EQ(e.getMinSpec(), row.isMin); // kept: +inf counts as a minimum
        EXPECT_EQ(e.getMaxSpec(), row.isMax); // kept: -inf counts as a maximum
        if (std::isnan(row.value)) {
            EXPECT_TRUE(std::isnan(e.getMin()));
            EXPECT_TRUE(std::isnan(e.getMax()));
        } else {
            EXPECT_EQ(e.getMin(), row.isMin ? row.value : -infinity);
            EXPECT_EQ(e.getMax(), row.isMax ? row.value : infinity);
        }
    }
    const StructElement unset;
    EXPECT_FALSE(unset.getMinSpec());
    EXPECT_FALSE(unset.getMaxSpec());
    EXPECT_EQ(unset.getMin(), -infinity);
    EXPECT_EQ(unset.getMax(), infinity);
}

} // namespace
