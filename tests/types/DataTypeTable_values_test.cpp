#include <cmath>
#include <cstdint>
#include <limits>
#include <stdexcept>
#include <vector>

#include <gtest/gtest.h>

#include "qltypes/types/DataTypeTable.h"
#include "tests/support/Raises.h"

namespace {

using namespace QLTypeSys;

std::string id(const char* leaf) { return std::string("QuillaneTypes:general:") + leaf; }

struct Call {
    _qlDataTypeAccess_tag* access;
    const char* caller;
    int dstId, srcId, count;
    const void *src, *right, *aux;
    void* dst;
};
Call lastCall{};
int answer = 1;

int recordConversion(_qlDataTypeAccess_tag* access, const char* caller, int dstId, int srcId, int count,
                     const void* src, const void* aux, void* dst) {
    lastCall = {access, caller, dstId, srcId, count, src, nullptr, aux, dst};
    if (dstId == DATA_TYPE_ID_DOUBLE && dst) *static_cast<double*>(dst) = *static_cast<const int*>(src);
    return answer;
}
int recordTest(_qlDataTypeAccess_tag* access, const char* caller, int typeId, int count, const void* data,
               const void* aux, void* result) {
    lastCall = {access, caller, typeId, typeId, count, data, nullptr, aux, result};
    static_cast<unsigned char*>(result)[3] = 1; // more than one byte: an 8-byte answer of the client's own
    return answer;
}
int recordComparison(_qlDataTypeAccess_tag* access, const char* caller, int typeId, int count, const void* left,
                     const void* right, const void* aux, void* result) {
    lastCall = {access, caller, typeId, typeId, count, left, right, aux, result};
    return answer;
}

struct ValuesTest : testing::Test {
    ValuesTest() {
        end = table.registerDataType("Plain", dtSourceBuiltIn, nullptr);
        alias = table.registerAliasDataType("Second", dtSourceBuiltIn, end, nullptr);
        record = table.getDataTypeAliasedThruTo(end);
        answer = 1;
    }
    DataTypeTable table;
    int end, alias;
    DataType* record;
};

TEST_F(ValuesTest, ElementOperationsGoThroughTheRecordDestinationFirst) {
    record->setSize(4);
    const int src = 7;
    int dst = 0;
    table.deepCopy(end, &dst, &src);
    EXPECT_EQ(dst, 7);
    table.construct(end, &dst);
    EXPECT_EQ(dst, 7) << "no construct function: memory stays";
    record->setConstructFcn([](void* p, const void*) { return *static_cast<int*>(p) = 1; });
    record->setDestructFcn([](void* p) { return *static_cast<int*>(p) = 2; });
    record->setDeepCopyFcn(
        [](void* d, const void* s) { return *static_cast<int*>(d) = *static_cast<const int*>(s) + 1; });
    record->setSerializeFcn([](void* d, const void* s, unsigned long a, unsigned long b) {
        return *static_cast<int*>(d) = *static_cast<const int*>(s) + static_cast<int>(10 * a + b);
    });
    record->setDeserializeFcn([](void* d, const void* s, unsigned long a, unsigned long b) {
        return *static_cast<int*>(d) = *static_cast<const int*>(s) - static_cast<int>(10 * a + b);
    });
    record->setSerializeSizeFcn([](const void*) { return 5ul; });
    record->setSizeOfFcn([] { return 6ul; });
    record->setContainedDataFcn([](void* p) { return p; });
    record->setContainedDataDimsFcn([](const void*, unsigned long* dims) { *dims = 9; });
    record->setContainedDataType(3);
    record->setContainedDataNumDims(1);
    for (const int typeId : {end}) {
        table.construct(typeId, &dst);
        EXPECT_EQ(dst, 1);
        table.destruct(typeId, &dst);
        EXPECT_EQ(dst, 2);
        table.deepCopy(typeId, &dst, &src);
        EXPECT_EQ(dst, 8);
        table.serialize(typeId, &dst, &src, 3, 4);
        EXPECT_EQ(dst, 41);
        table.deserialize(typeId, &dst, &src, 3, 4);
        EXPECT_EQ(dst, -27);
        EXPECT_EQ(table.serializeSize(typeId, &src), 5u);
        EXPECT_EQ(table.sizeOf(typeId), 6u);
        EXPECT_EQ(table.containedData(typeId, &dst), &dst);
        unsigned long dims = 0;
        table.containedDataDims(typeId, &dst, &dims);
        EXPECT_EQ(dims, 9u);
    }
    EXPECT_EQ(table.containedDataType(end), 3);
    EXPECT_EQ(table.containedDataNumDims(end), 1u);
    table.construct(alias, &dst);
    EXPECT_EQ(dst, 1) << "an alias forwards";
    EXPECT_EQ(table.sizeOf(alias), 6u);
    EXPECT_EQ(table.containedDataType(alias), -10) << "the field of the alias's own record";
}

TEST_F(ValuesTest, DataConstructTellsWhether) {
    record->setDataConstructFcn(
        [](unsigned long n, const unsigned long*, unsigned long, const void*, void*) { return static_cast<int>(n); });
    EXPECT_TRUE(table.dataConstruct(end, 1, nullptr, 4, nullptr, nullptr));
    EXPECT_FALSE(table.dataConstruct(end, 0, nullptr, 4, nullptr, nullptr));
}

TEST_F(ValuesTest, StatusFormsSwallowFailures) {
    int v = 0;
    EXPECT_TRUE(table.constructWithStatus(end, &v));
    EXPECT_TRUE(table.destructWithStatus(end, &v));
    record->setConstructFcn([](void*, const void*) { return 0; });
    record->setDestructFcn([](void*) { return 0; });
    record->setDeepCopyFcn([](void*, const void*) { return 0; });
    record->setSerializeFcn([](void*, const void*, unsigned long, unsigned long) { return 0; });
    record->setDeserializeFcn([](void*, const void*, unsigned long, unsigned long) { return 0; });
    EXPECT_FALSE(table.constructWithStatus(end, &v));
    EXPECT_FALSE(table.destructWithStatus(end, &v));
    EXPECT_FALSE(table.deepCopyWithStatus(end, &v, &v));
    EXPECT_FALSE(table.serializeWithStatus(end, &v, &v, 0, 0));
    EXPECT_FALSE(table.deserializeWithStatus(end, &v, &v, 0, 0));
    EXPECT_FALSE(table.convertToUsingSrcIdWithStatus(end, end, 1, &v, nullptr, &v));
    EXPECT_FALSE(table.isPositiveWithStatus(end, 1, &v, nullptr, &v));
    record->setConvertBetweenFcn(recordConversion);
    EXPECT_TRUE(table.convertToUsingSrcIdWithStatus(end, end, 1, &v, nullptr, &v));
    double d = 1.0;
    EXPECT_TRUE(table.isPositiveWithStatus(0, 1, &d, nullptr, &v));
}

TEST_F(ValuesTest, OtherExceptionsPassThroughStatusForms) {
    record->setConstructFcn([](void*, const void*) -> int { throw std::runtime_error("foreign"); });
    int v = 0;
    EXPECT_THROW(table.constructWithStatus(end, &v), std::runtime_error);
}

// --- Conversion ------------------------------------------------------------------------------------------------------

TEST_F(ValuesTest, ConversionUsesTheChosenSidesFunctionWithResolvedIds) {
    int src = 0, dst = 0, aux = 0;
    EXPECT_RAISES(table.convertToUsingSrcId(0, alias, 1, &src, nullptr, &dst), id("DataTypeFcnDoesNotExist"),
                  "ConvertBetweenFcn", "Second");
    EXPECT_RAISES(table.convertToUsingDstId(end, 0, 1, &src, nullptr, &dst), id("DataTypeFcnDoesNotExist"),
                  "ConvertBetweenFcn", "Plain");
    record->setConvertBetweenFcn(recordConversion);
    const int int8Alias = table.registerAliasDataType("I8", dtSourceBuiltIn, 2, nullptr);
    table.convertToUsingSrcId(int8Alias, alias, 5, &src, &aux, &dst);
    EXPECT_EQ(lastCall.access, table.getDataTypeAccess());
    EXPECT_EQ(lastCall.caller, nullptr);
    EXPECT_EQ(lastCall.dstId, 2);
    EXPECT_EQ(lastCall.srcId, end);
    EXPECT_EQ(lastCall.count, 5);
    EXPECT_EQ(lastCall.src, &src);
    EXPECT_EQ(lastCall.aux, &aux);
    EXPECT_EQ(lastCall.dst, &dst);
    table.convertToUsingDstId(alias, int8Alias, 5, &src, &aux, &dst);
    EXPECT_EQ(lastCall.dstId, end);
    EXPECT_EQ(lastCall.srcId, 2);
    answer = 0;
    EXPECT_RAISES(table.convertToUsingSrcId(2, alias, 1, &src, nullptr, &dst), id("DataTypeFcnUnknownError"),
                  "ConvertBetween", "Second");
}

TEST_F(ValuesTest, BuiltInConversionSaturatesAndTruncates) {
    const double src[] = {-1.9, 1.9, 300.0, -300.0, std::nan("")};
    std::int8_t dst[5] = {9, 9, 9, 9, 9};
    table.convertToUsingSrcId(2, 0, 5, src, nullptr, dst);
    EXPECT_EQ(std::vector<int>(dst, dst + 5), (std::vector<int>{-1, 1, 127, -128, 0}));
}

TEST_F(ValuesTest, Sign) {
    const struct {
        double value;
        int sign;
    } rows[] = {{2.5, 1}, {0.0, 0}, {-0.0, 0}, {-0.1, -1}, {std::nan(""), -1}, {INFINITY, 1}, {-INFINITY, -1}};
    for (const auto& row : rows) {
        signed char result = 9;
        table.sign(0, &row.value, nullptr, &result);
        EXPECT_EQ(result, row.sign) << row.value;
    }
    record->setConvertBetweenFcn(recordConversion);
    const int value = -3;
    signed char result = 9;
    table.sign(alias, &value, nullptr, &result);
    EXPECT_EQ(lastCall.dstId, 0);
    EXPECT_EQ(lastCall.count, 1);
    EXPECT_EQ(result, -1);
}

// --- Comparison ------------------------------------------------------------------------------------------------------

TEST_F(ValuesTest, ComparisonNeedsTheTypesFunction) {
    int v = 0;
    unsigned char r[8] = {};
    const std::string missing = id("DataTypeFcnDoesNotExist");
    EXPECT_RAISES(table.isPositive(end, 1, &v, nullptr, r), missing, "IsPositiveFcn", "Plain");
    EXPECT_RAISES(table.isNegative(end, 1, &v, nullptr, r), missing, "IsNegativeFcn", "Plain");
    EXPECT_RAISES(table.greaterThan(end, 1, &v, &v, nullptr, r), missing, "GreaterThanFcn", "Plain");
    EXPECT_RAISES(table.greaterEqual(end, 1, &v, &v, nullptr, r), missing, "GreaterEqualFcn", "Plain");
    record->setIsPositiveFcn(recordTest);
    record->setIsNegativeFcn(recordTest);
    record->setGreaterThanFcn(recordComparison);
    record->setGreaterEqualFcn(recordComparison);
    int right = 0, aux = 0;
    table.isPositive(alias, 3, &v, &aux, r);
    EXPECT_EQ(lastCall.access, table.getDataTypeAccess());
    EXPECT_EQ(lastCall.caller, nullptr);
    EXPECT_EQ(lastCall.srcId, end);
    EXPECT_EQ(lastCall.count, 3);
    EXPECT_EQ(lastCall.aux, &aux);
    EXPECT_EQ(lastCall.dst, r);
    answer = 7;
    EXPECT_EQ(table.greaterThan(alias, 2, &v, &right, &aux, r), 7) << "the function's own answer";
    EXPECT_EQ(lastCall.right, &right);
    EXPECT_EQ(lastCall.srcId, end);
    EXPECT_EQ(table.greaterEqual(alias, 2, &v, &right, &aux, r), 7);
    answer = 0;
    const std::string failed = id("DataTypeFcnUnknownError");
    EXPECT_RAISES(table.isPositive(alias, 1, &v, nullptr, r), failed, "IsPositive", "Second");
    EXPECT_RAISES(table.isNegative(alias, 1, &v, nullptr, r), failed, "IsNegative", "Second");
    EXPECT_RAISES(table.greaterThan(alias, 1, &v, &v, nullptr, r), failed, "GreaterThan", "Second");
    EXPECT_RAISES(table.greaterEqual(alias, 1, &v, &v, nullptr, r), failed, "GreaterEqual", "Second");
}

TEST_F(ValuesTest, TheScalarFormLooksAtEightBytes) {
    record->setIsPositiveFcn(recordTest); // sets the fourth byte of its answer
    int v = 0;
    signed char result = 9;
    table.isPositive(end, &v, nullptr, &result);
    EXPECT_EQ(result, 1);
    EXPECT_EQ(lastCall.count, 1);
    const double minus = -1.0;
    table.isPositive(0, &minus, nullptr, &result);
    EXPECT_EQ(result, 0);
}

template <class T> struct BuiltInCase {
    int typeId;
    T low, zero, high;
};

template <class T> void expectComparisons(const DataTypeTable& table, const BuiltInCase<T>& c, bool lowIsNegative) {
    SCOPED_TRACE(c.typeId);
    const T data[3] = {c.low, c.zero, c.high};
    const T right[3] = {c.zero, c.zero, c.zero};
    using Bytes = std::vector<int>;
    const auto run = [&](auto&& operation) {
        unsigned char r[4] = {9, 9, 9, 9};
        operation(r);
        EXPECT_EQ(r[3], 9) << "one byte an element";
        return Bytes(r, r + 3);
    };
    EXPECT_EQ(run([&](void* r) { table.isPositive(c.typeId, 3, data, nullptr, r); }), (Bytes{!lowIsNegative, 0, 1}));
    EXPECT_EQ(run([&](void* r) { table.isNegative(c.typeId, 3, data, nullptr, r); }), (Bytes{lowIsNegative, 0, 0}));
    EXPECT_EQ(run([&](void* r) { table.greaterThan(c.typeId, 3, data, right, nullptr, r); }),
              (Bytes{!lowIsNegative, 0, 1}));
    EXPECT_EQ(run([&](void* r) { table.greaterEqual(c.typeId, 3, data, right, nullptr, r); }),
              (Bytes{!lowIsNegative, 1, 1}));
    unsigned char untouched = 9;
    table.isPositive(c.typeId, 0, data, nullptr, &untouched);
    table.isNegative(c.typeId, -1, data, nullptr, &untouched);
    table.greaterThan(c.typeId, 0, data, data, nullptr, &untouched);
    table.greaterEqual(c.typeId, -5, data, data, nullptr, &untouched);
    EXPECT_EQ(untouched, 9);
}

template <class T> BuiltInCase<T> limits(int typeId) {
    return {typeId, std::numeric_limits<T>::lowest(), T(), std::numeric_limits<T>::max()};
}

TEST_F(ValuesTest, BuiltInComparisons) {
    expectComparisons(table, limits<double>(-1), true);
    expectComparisons(table, limits<double>(0), true);
    expectComparisons(table, limits<float>(1), true);
    expectComparisons(table, limits<std::int8_t>(2), true);
    expectComparisons(table, BuiltInCase<std::uint8_t>{3, 1, 0, 255}, false);
    expectComparisons(table, limits<std::int16_t>(4), true);
    expectComparisons(table, BuiltInCase<std::uint16_t>{5, 1, 0, 65535}, false);
    expectComparisons(table, limits<std::int32_t>(6), true);
    expectComparisons(table, BuiltInCase<std::uint32_t>{7, 1, 0, 4294967295u}, false);
    expectComparisons(table, BuiltInCase<std::uint8_t>{8, 1, 0, 200}, false);
}

TEST_F(ValuesTest, WithNaNEveryComparisonIsFalse) {
    const double nan = std::nan(""), one = 1.0;
    unsigned char r = 9;
    table.isPositive(0, 1, &nan, nullptr, &r);
    EXPECT_EQ(r, 0);
    r = 9, table.isNegative(0, 1, &nan, nullptr, &r);
    EXPECT_EQ(r, 0);
    r = 9, table.greaterThan(0, 1, &one, &nan, nullptr, &r);
    EXPECT_EQ(r, 0);
    r = 9, table.greaterEqual(0, 1, &nan, &nan, nullptr, &r);
    EXPECT_EQ(r, 0);
}

// --- checkIfNonZeroArray ---------------------------------------------------------------------------------------------

TEST_F(ValuesTest, NonZeroArrays) {
    const double zeros[] = {0.0, -0.0, 0.0, 1.0};
    EXPECT_FALSE(table.checkIfNonZeroArray(zeros, 0, 0, false));
    EXPECT_FALSE(table.checkIfNonZeroArray(zeros, -1, 0, false));
    EXPECT_FALSE(table.checkIfNonZeroArray(zeros, 2, 0, false));
    EXPECT_TRUE(table.checkIfNonZeroArray(zeros, 2, 0, true)) << "two values an element";
    const double nan[] = {0.0, std::nan("")};
    EXPECT_TRUE(table.checkIfNonZeroArray(nan, 2, 0, false));
    const float singles[] = {-0.0f, 0.0f, 1.0f};
    EXPECT_FALSE(table.checkIfNonZeroArray(singles, 2, 1, false));
    EXPECT_TRUE(table.checkIfNonZeroArray(singles, 3, 1, false));
    const std::int16_t ints[] = {0, 0, 0, 5};
    EXPECT_FALSE(table.checkIfNonZeroArray(ints, 3, 4, false));
    EXPECT_TRUE(table.checkIfNonZeroArray(ints, 2, 4, true));
    // Auto and aliases are compared by bytes, with the ground of the record.
    EXPECT_TRUE(table.checkIfNonZeroArray(zeros, 2, -1, false)) << "-0.0 has a bit set";
}

TEST_F(ValuesTest, NonZeroArraysOfClientTypesAreComparedWithTheGround) {
    record->setSize(2);
    record->setGround("ab");
    EXPECT_FALSE(table.checkIfNonZeroArray("ababab", 3, end, false));
    EXPECT_TRUE(table.checkIfNonZeroArray("ababac", 3, end, false));
    EXPECT_FALSE(table.checkIfNonZeroArray("ababac", 1, end, true));
    EXPECT_TRUE(table.checkIfNonZeroArray("abac", 1, end, true));
}

} // namespace
