#include <climits>

#include <gtest/gtest.h>

#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/classes/DefinedClass.h"
#include "qlplatform/classes/Objects.h"
#include "qlplatform/services/HostFunctions.h"
#include "qltypes/fixed_point/FixPointDefs.h"
#include "qltypes/host/ClassIds.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "tests/support/FailingAllocations.h"

namespace {

int registerFixpt(QLTypeSys::DataTypeTable& table, const char* name, const fxpDataTypeProp* prop) {
    const int id = table.registerDataType(name, dtSourceFixpt, nullptr);
    if (prop) {
        EXPECT_EQ(DtSetDataTypePropertiesSize(&table, "", id, sizeof *prop), nullptr);
        EXPECT_EQ(DtSetDataTypeProperties(&table, "", id, prop), nullptr);
    }
    return id;
}

TEST(ClassIds, ClassesOfIdentifiers) {
    struct Row {
        int id;
        int classNumber;
    };
    constexpr Row rows[] = {{-10, 0}, {-2, 0}, {-1, 0}, {0, 6},  {1, 7},  {2, 8},       {3, 9},
                            {4, 10},  {5, 11}, {6, 12}, {7, 13}, {8, 3},  {9, 0},       {10, 12},
                            {11, 0},  {12, 0}, {13, 0}, {14, 0}, {15, 0}, {INT_MAX, 0}, {INT_MIN, 0}};
    const QLTypeSys::DataTypeTable table;
    for (const Row& row : rows) {
        EXPECT_EQ(utGetTxClassIdFromDTypeId(row.id, false), row.classNumber) << row.id;
        const int asUint8 = row.id == 8 ? 9 : row.classNumber;
        EXPECT_EQ(utGetTxClassIdFromDTypeId(row.id, true), asUint8) << row.id;
        EXPECT_EQ(utGetTxClassIdFromDTypeId_Builtin64BitHalf(&table, row.id, false), row.classNumber) << row.id;
        EXPECT_EQ(utGetTxClassIdFromDTypeId_Builtin64BitHalf(&table, row.id, true), asUint8) << row.id;
    }
}

TEST(ClassIds, IdentifiersOfClasses) {
    for (int number = -3000; number < 40; ++number) {
        const int expected = number == 3 ? 8 : number >= 6 && number <= 13 ? number - 6 : -10;
        EXPECT_EQ(utGetDTypeIdFromTxClassId(static_cast<txClassID>(number)), expected) << number;
    }
}

TEST(ClassIds, ArraysByTheirClass) {
    struct Row {
        txClassID classId;
        int id;
        const char* name;
    };
    constexpr Row rows[] = {
        {txClassLogical, 8, "boolean"}, {txClassChar, -10, nullptr},  {txClassDouble, 0, "double"},
        {txClassSingle, 1, "single"},   {txClassInt8, 2, "int8"},     {txClassUint8, 3, "uint8"},
        {txClassInt16, 4, "int16"},     {txClassUint16, 5, "uint16"}, {txClassInt32, 6, "int32"},
        {txClassUint32, 7, "uint32"},   {txClassInt64, -10, "int64"}, {txClassUint64, -10, "uint64"}};
    for (const Row& row : rows) {
        SCOPED_TRACE(static_cast<int>(row.classId));
        const txArrayPtr array(txCreateNumericMatrix(1, 1, row.classId, false));
        EXPECT_EQ(utGetDTypeIdFromTxArray_BuiltinNot64Bit(array.get()), row.id);
        EXPECT_STREQ(utGetDTypeNameFromTxArray(array.get()), row.name);
        EXPECT_EQ(utIs64BitIntegerTxArray(array.get()), row.classId == txClassInt64 || row.classId == txClassUint64);
    }
    const txArrayPtr others[] = {txArrayPtr(txCreateCellMatrix(1, 1)),
                                 txArrayPtr(txCreateStructMatrix(1, 1, 0, nullptr)),
                                 txArrayPtr(omCreateObjectArray("int8", txCreateRow<std::int8_t>({1}))), txArrayPtr()};
    for (const txArrayPtr& array : others) {
        EXPECT_EQ(utGetDTypeIdFromTxArray_BuiltinNot64Bit(array.get()), -10);
        EXPECT_EQ(utGetDTypeNameFromTxArray(array.get()), nullptr);
        EXPECT_FALSE(utIs64BitIntegerTxArray(array.get()));
    }
}

TEST(ClassIds, IntegersOf64BitsWithoutScaling) {
    struct Row {
        const char* what;
        fxpDataTypeProp prop;
        int classNumber;
    };
    constexpr Row rows[] = {
        {"signed", {FXP_DT_FIXPT, 1, 64, 0, 0, 1.0, 0.0, 0}, 14},
        {"unsigned", {FXP_DT_FIXPT, 0, 64, 0, 0, 1.0, 0.0, 0}, 15},
        {"sign left open", {FXP_DT_FIXPT, 2, 64, 0, 0, 1.0, 0.0, 0}, 15},
        {"override off", {FXP_DT_FIXPT, 1, 64, 0, 0, 1.0, 0.0, 1}, 14},
        {"exponent", {FXP_DT_FIXPT, 0, 64, 0, -3, 1.0, 0.0, 0}, 0},
        {"slope", {FXP_DT_FIXPT, 1, 64, 0, 0, 1.5, 0.0, 0}, 0},
        {"bias", {FXP_DT_FIXPT, 1, 64, 0, 0, 1.0, 1.0, 0}, 0},
        {"width", {FXP_DT_FIXPT, 1, 63, 0, 0, 1.0, 0.0, 0}, 0},
        {"mode", {FXP_DT_SCALED_DOUBLE, 1, 64, 0, 0, 1.0, 0.0, 0}, 0},
        {"half", {FXP_DT_CUSTOM_FLOAT, 1, 16, 5, 0, 1.0, 0.0, 0}, -2357},
        {"other float", {FXP_DT_CUSTOM_FLOAT, 1, 16, 8, 0, 1.0, 0.0, 0}, 0},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.what);
        QLTypeSys::DataTypeTable table;
        const int id = registerFixpt(table, "sfix64", &row.prop);
        EXPECT_EQ(utGetTxClassIdFromDTypeId_Builtin64BitHalf(&table, id, false), row.classNumber);
        const int alias = table.registerAliasDataType("Other", static_cast<DataTypeSource>(2), id, nullptr);
        EXPECT_EQ(utGetTxClassIdFromDTypeId_Builtin64BitHalf(&table, alias, false), row.classNumber);
    }
    QLTypeSys::DataTypeTable table;
    EXPECT_EQ(utGetTxClassIdFromDTypeId_Builtin64BitHalf(&table, registerFixpt(table, "sfix64", nullptr), false), 0);
    const int aliasOfDouble = table.registerAliasDataType("Real", static_cast<DataTypeSource>(2), 0, nullptr);
    EXPECT_EQ(utGetTxClassIdFromDTypeId_Builtin64BitHalf(&table, aliasOfDouble, false), 0);
}

TEST(TypeMemory, IsZeroedAndDoubledForComplex) {
    const QLTypeSys::DataTypeTable table;
    for (const bool isComplex : {false, true}) {
        auto* memory = static_cast<double*>(txDTypeCalloc(&table, 3, 0, isComplex));
        ASSERT_NE(memory, nullptr);
        const int numValues = isComplex ? 6 : 3;
        for (int i = 0; i < numValues; ++i) { // the address sanitizer guards the last one
            EXPECT_EQ(memory[i], 0.0);
            memory[i] = 1;
        }
        txFree(memory);
    }
}

TEST(TypeMemory, NothingForNothing) {
    QLTypeSys::DataTypeTable table;
    const int unsized = table.registerDataType("Unsized", static_cast<DataTypeSource>(2), nullptr);
    utFailAllocationAt(0);
    for (const long count : {0L, -1L, LONG_MIN})
        EXPECT_EQ(txDTypeCalloc(nullptr, count, 12345, true), nullptr) << count; // the table is not read
    EXPECT_EQ(txDTypeCalloc(&table, 5, 9, false), nullptr);                      // "fcn_call" has size 0
    EXPECT_EQ(txDTypeCalloc(&table, 5, unsized, false), nullptr);                // no size set
    EXPECT_EQ(utFailAllocationAt(0), 0u);
}

TEST(TypeMemory, MemoryThatRunsOutIsRaised) {
    const QLTypeSys::DataTypeTable table;
    EXPECT_EQ(testsupport::failEachAllocation([&] { txFree(txDTypeCalloc(&table, 4, 2, true)); }), 1u);
    EXPECT_RAISES(txDTypeCalloc(&table, LONG_MAX, 0, true), "Quillane:Services:OutOfMemory");
}

std::string cast(const txArray_tag* array, const char* typeName, bool makeComplex, txArrayPtr& result) {
    txArray_tag* out = reinterpret_cast<txArray_tag*>(&result); // must be overwritten, also on failure
    qlsvDiagnosticImpl* d = CastTxArrayToBuiltinDataType(array, typeName, out, makeComplex);
    result.reset(out);
    const std::string text = testsupport::describe(d);
    qlsvDiscardDiagnostic(d);
    return text;
}

TEST(CastArray, ByTheNameOfTheType) {
    const QLTypeSys::DataTypeTable table;
    const txArrayPtr array(txCreateRow<double>({1.5, -300}));
    for (int id = 0; id <= 8; ++id) {
        const char* name = DtGetDataTypeName(&table, id);
        SCOPED_TRACE(name);
        txArrayPtr result;
        EXPECT_EQ(cast(array.get(), name, false, result), "no diagnostic");
        EXPECT_EQ(utGetDTypeIdFromTxArray_BuiltinNot64Bit(result.get()), id);
        EXPECT_EQ(txGetNumberOfElements(result.get()), 2u);
        EXPECT_FALSE(txIsComplex(result.get()));
    }
}

TEST(CastArray, MadeComplexWhereItIsNot) {
    using Pair = std::complex<std::int8_t>;
    txArrayPtr result;
    const txArrayPtr real(txCreateRow<double>({1.5, -300}));
    EXPECT_EQ(cast(real.get(), "int8", true, result), "no diagnostic");
    ASSERT_TRUE(txHasElements<Pair>(result.get()));
    EXPECT_EQ(txGetElements<Pair>(result.get())[1], Pair(-128, 0));

    int numCalls = 0;
    qlsvHostFunction original = qlsvSetHostFunction("complex", {});
    qlsvSetHostFunction("complex", [&](qlsvOutputs outputs, qlsvInputs inputs) {
        ++numCalls;
        original(outputs, inputs);
    });
    const txArrayPtr complex(txCreateRow<std::complex<double>>({{1.5, 2.5}}));
    EXPECT_EQ(cast(complex.get(), "int8", true, result), "no diagnostic");
    EXPECT_EQ(txGetElements<Pair>(result.get())[0], Pair(2, 3));
    EXPECT_EQ(numCalls, 0);
    EXPECT_EQ(cast(complex.get(), "int8", false, result), "no diagnostic");
    EXPECT_TRUE(txIsComplex(result.get()));
    qlsvSetHostFunction("complex", original);
}

TEST(CastArray, TheLastCallReports) {
    const std::size_t before = txGetNumLiveArrays();
    {
        txArrayPtr result;
        const txArrayPtr cells(txCreateCellMatrix(1, 1));
        const txArrayPtr number(txCreateDoubleScalar(1));
        EXPECT_EQ(cast(cells.get(), "int8", false, result), "Quillane:Arrays:CannotCast('cell', 'int8')");
        EXPECT_EQ(result, nullptr);
        EXPECT_EQ(cast(number.get(), "NoSuchType", false, result),
                  "Quillane:HostFunctions:UnknownHostFunction('NoSuchType')");
        EXPECT_EQ(cast(number.get(), "NoSuchType", true, result), "Quillane:Arrays:CannotCast('nothing', 'complex')");
        EXPECT_EQ(result, nullptr);

        // A function "complex" that makes something of nothing hides the failed cast.
        qlsvHostFunction original = qlsvSetHostFunction(
            "complex", [](qlsvOutputs outputs, qlsvInputs) { outputs[0].reset(txCreateString("made up")); });
        EXPECT_EQ(cast(number.get(), "NoSuchType", true, result), "no diagnostic");
        EXPECT_EQ(txArrayToUTF8StdString(result.get()), "made up");
        qlsvSetHostFunction("complex", original);
    }
    EXPECT_EQ(txGetNumLiveArrays(), before);
}

TEST(CastArray, MemoryThatRunsOutIsReportedAndLeavesNothing) {
    const txArrayPtr number(txCreateDoubleScalar(1.5));
    std::vector<std::string> reports;
    EXPECT_EQ(testsupport::failEachAllocation(
                  [&] {
                      txArrayPtr result;
                      reports.push_back(cast(number.get(), "int8", true, result));
                  },
                  true),
              4u);
    const std::string failedCast = "Quillane:Arrays:CannotCast('nothing', 'complex')";
    const std::string outOfMemory = "Quillane:Services:OutOfMemory()";
    EXPECT_EQ(reports, (std::vector<std::string>{failedCast, failedCast, outOfMemory, outOfMemory, "no diagnostic"}));
}

class EnumObjects : public testing::Test {
  protected:
    EnumObjects() {
        auto gear = std::make_shared<tcos::DefinedClass>("Gear", tcos::ClassKind::enumeration);
        gear->derivesFrom("Quillane.IntEnumType").addMember("Park", 0).addMember("Drive", 1);
        tcos::defineClass(gear);
    }
    ~EnumObjects() override { tcos::removeClass("Gear"); }
};

TEST_F(EnumObjects, ReplaceTheNumbers) {
    txArray_tag* array = txCreateRow<double>({1, 0});
    const std::size_t before = txGetNumLiveArrays();
    QLTypeConv::qlConvertMatrixToEnumObjects(array, "Gear");
    const txArrayPtr owner(array);
    EXPECT_STREQ(txGetClassName(array), "Gear");
    EXPECT_EQ(txGetElements<std::int32_t>(omGetUnderlyingArray(array))[0], 1);
    EXPECT_EQ(txGetNumLiveArrays(), before + 1); // an object array is two; the numbers are gone
}

TEST_F(EnumObjects, AFailureLeavesTheNumbers) {
    const txArrayPtr owner(txCreateRow<double>({1, 2}));
    txArray_tag* array = owner.get();
    EXPECT_RAISES(QLTypeConv::qlConvertMatrixToEnumObjects(array, "Gear"), "Quillane:Classes:NoSuchMember", "Gear",
                  "2");
    EXPECT_EQ(array, owner.get());
    EXPECT_RAISES(QLTypeConv::qlConvertMatrixToEnumObjects(array, "Colour"),
                  "Quillane:HostFunctions:UnknownHostFunction", "Colour");
    EXPECT_EQ(array, owner.get());
    EXPECT_EQ(txGetElements<double>(array)[1], 2);
}

TEST_F(EnumObjects, MemoryThatRunsOutIsRaisedAndLeavesNothing) {
    EXPECT_GT(testsupport::failEachAllocation([] {
                  txArrayPtr owner(txCreateRow<double>({1, 0}));
                  txArray_tag* array = owner.get();
                  QLTypeConv::qlConvertMatrixToEnumObjects(array, "Gear");
                  (void)owner.release();
                  txDestroyArray(array);
              }),
              10u);
}

} // namespace
