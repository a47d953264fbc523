#include <random>

#include <gtest/gtest.h>

#include "qlplatform/arrays/HostElements.h"
#include "tests/support/FailingAllocations.h"

namespace {

using TxArrayUtil::SafeCreateSharedCopy;

struct ClassRow {
    txClassID classId;
    const char* name;
    std::size_t size;
    bool isNumeric;
};
constexpr ClassRow classRows[] = {
    {txClassLogical, "logical", 1, false}, {txClassChar, "char", 2, false},    {txClassDouble, "double", 8, true},
    {txClassSingle, "single", 4, true},    {txClassInt8, "int8", 1, true},     {txClassUint8, "uint8", 1, true},
    {txClassInt16, "int16", 2, true},      {txClassUint16, "uint16", 2, true}, {txClassInt32, "int32", 4, true},
    {txClassUint32, "uint32", 4, true},    {txClassInt64, "int64", 8, true},   {txClassUint64, "uint64", 8, true},
};

template <class T> std::vector<T> elements(const txArray_tag* array) {
    const auto view = txGetElements<T>(array);
    return {view.begin(), view.end()};
}

TEST(HostArray, MatricesOfEveryClassAreZeros) {
    for (const ClassRow& row : classRows) {
        SCOPED_TRACE(row.name);
        for (const bool isComplex : {false, true}) {
            const txArrayPtr array(txCreateNumericMatrix(2, 3, row.classId, isComplex));
            if (isComplex && !row.isNumeric) {
                EXPECT_EQ(array, nullptr);
                continue;
            }
            EXPECT_EQ(txGetClassID(array.get()), row.classId);
            EXPECT_STREQ(txGetClassName(array.get()), row.name);
            EXPECT_EQ(txGetNumRows(array.get()), 2u);
            EXPECT_EQ(txGetNumColumns(array.get()), 3u);
            EXPECT_EQ(txGetNumberOfElements(array.get()), 6u);
            EXPECT_EQ(txIsComplex(array.get()), isComplex);
            EXPECT_EQ(txGetElementSize(array.get()), row.size * (isComplex ? 2 : 1));
            const auto* bytes = static_cast<const char*>(txGetData(array.get()));
            EXPECT_EQ(std::string(bytes, 6 * txGetElementSize(array.get())),
                      std::string(6 * txGetElementSize(array.get()), '\0'));
            EXPECT_TRUE(txIsTemporary(array.get()));
            EXPECT_EQ(txGetReferenceCount(array.get()), 1u);
        }
    }
}

TEST(HostArray, OtherClassNumbersMakeNoMatrix) {
    for (const int number : {0, 1, 2, 5, 16, 17, 99, -2357})
        EXPECT_EQ(txCreateNumericMatrix(1, 1, static_cast<txClassID>(number), false), nullptr) << number;
}

TEST(HostArray, NullIsNoArray) {
    EXPECT_EQ(txGetClassID(nullptr), txClassNone);
    EXPECT_STREQ(txGetClassName(nullptr), "");
    EXPECT_FALSE(txIsComplex(nullptr));
    EXPECT_EQ(txGetElementSize(nullptr), 0u);
    EXPECT_EQ(txGetNumRows(nullptr), 0u);
    EXPECT_EQ(txGetNumColumns(nullptr), 0u);
    EXPECT_EQ(txGetNumberOfElements(nullptr), 0u);
    EXPECT_EQ(txGetData(nullptr), nullptr);
    EXPECT_EQ(txArrayToUTF8StdString(nullptr), "");
    EXPECT_EQ(txGetCell(nullptr, 0), nullptr);
    EXPECT_EQ(txGetNumberOfFields(nullptr), 0);
    EXPECT_EQ(SafeCreateSharedCopy(nullptr), nullptr);
    txDestroyArray(nullptr);
}

TEST(HostArray, TypedElements) {
    const txArrayPtr row(txCreateRow<std::int16_t>({10, -20, 30}));
    EXPECT_EQ(elements<std::int16_t>(row.get()), (std::vector<std::int16_t>{10, -20, 30}));
    EXPECT_TRUE(txGetElements<std::uint16_t>(row.get()).empty());
    EXPECT_TRUE(txGetElements<std::complex<std::int16_t>>(row.get()).empty());
    EXPECT_TRUE(txGetWritableElements<double>(row.get()).empty());
    EXPECT_TRUE(txGetElements<double>(nullptr).empty());
    const txArrayPtr pairs(txCreateRow<std::complex<float>>({{1, 2}, {3, 4}}));
    EXPECT_TRUE(txIsComplex(pairs.get()));
    EXPECT_EQ(txGetElements<std::complex<float>>(pairs.get())[1], (std::complex<float>(3, 4)));
    const txArrayPtr number(txCreateDoubleScalar(2.5));
    EXPECT_EQ(elements<double>(number.get()), std::vector<double>{2.5});
    const txArrayPtr yes(txCreateLogicalScalar(true));
    EXPECT_TRUE(txGetElements<bool>(yes.get())[0]);
    const txArrayPtr no(txCreateLogicalScalar(false));
    EXPECT_FALSE(txGetElements<bool>(no.get())[0]);
}

TEST(HostArray, TextsGoThroughUtf16AndBack) {
    for (const char* text : {"", "double", "Größe", "\xf0\x9f\x98\x80!"}) {
        const txArrayPtr array(txCreateString(text));
        EXPECT_EQ(txArrayToUTF8StdString(array.get()), text);
        EXPECT_EQ(txGetNumRows(array.get()), 1u);
    }
    const txArrayPtr none(txCreateString(nullptr));
    EXPECT_EQ(txGetNumberOfElements(none.get()), 0u);
    const txArrayPtr smiley(txCreateString("\xf0\x9f\x98\x80"));
    EXPECT_EQ(txGetNumberOfElements(smiley.get()), 2u);
    const txArrayPtr number(txCreateDoubleScalar(65));
    EXPECT_EQ(txArrayToUTF8StdString(number.get()), "");
}

TEST(HostArray, ReferencesKeepAnArray) {
    const std::size_t before = txGetNumLiveArrays();
    txArray_tag* array = txCreateDoubleScalar(1);
    EXPECT_EQ(txGetNumLiveArrays(), before + 1);
    txKeepArray(array);
    EXPECT_FALSE(txIsTemporary(array));
    EXPECT_EQ(txGetReferenceCount(array), 2u);
    txDestroyArray(array);
    EXPECT_EQ(txGetReferenceCount(array), 1u);
    EXPECT_FALSE(txIsTemporary(array));
    EXPECT_EQ(elements<double>(array), std::vector<double>{1});
    txDestroyArray(array);
    EXPECT_EQ(txGetNumLiveArrays(), before);
}

TEST(HostArray, CopiesShareElementsUntilOneIsWritten) {
    const txArrayPtr original(txCreateRow<std::int32_t>({1, 2, 3}));
    txKeepArray(original.get());
    const txArrayPtr second = SafeCreateSharedCopy(original.get());
    txArrayPtr third = SafeCreateSharedCopy(second.get());
    EXPECT_TRUE(txIsTemporary(second.get()));
    EXPECT_EQ(txGetReferenceCount(second.get()), 1u);
    EXPECT_EQ(txGetData(second.get()), txGetData(original.get()));
    EXPECT_EQ(txGetData(third.get()), txGetData(original.get()));

    txGetWritableElements<std::int32_t>(second.get())[0] = 9;
    EXPECT_EQ(elements<std::int32_t>(second.get()), (std::vector<std::int32_t>{9, 2, 3}));
    EXPECT_EQ(elements<std::int32_t>(original.get()), (std::vector<std::int32_t>{1, 2, 3}));
    EXPECT_EQ(txGetData(third.get()), txGetData(original.get()));

    third.reset();
    const void* alone = txGetData(original.get());
    EXPECT_EQ(txGetWritableData(original.get()), alone);
    txDestroyArray(original.get());
}

TEST(HostArray, CellsOwnTheirValues) {
    const std::size_t before = txGetNumLiveArrays();
    {
        const txArrayPtr cells(txCreateCellMatrix(1, 2));
        EXPECT_EQ(txGetClassID(cells.get()), txClassCell);
        EXPECT_STREQ(txGetClassName(cells.get()), "cell");
        EXPECT_EQ(txGetElementSize(cells.get()), 0u);
        EXPECT_EQ(txGetWritableData(cells.get()), nullptr);
        EXPECT_EQ(txGetCell(cells.get(), 0), nullptr);
        txArray_tag* text = txCreateString("first");
        txSetCell(cells.get(), 0, text);
        EXPECT_EQ(txGetCell(cells.get(), 0), text);
        txSetCell(cells.get(), 1, txCreateDoubleScalar(2));
        txSetCell(cells.get(), 1, txCreateString("second"));
        EXPECT_EQ(txArrayToUTF8StdString(txGetCell(cells.get(), 1)), "second");
        txSetCell(cells.get(), 1, nullptr);
        EXPECT_EQ(txGetCell(cells.get(), 1), nullptr);
        EXPECT_EQ(txGetCell(cells.get(), 2), nullptr);
        EXPECT_EQ(txGetCell(text, 0), nullptr);
        EXPECT_EQ(txGetNumLiveArrays(), before + 2);
        EXPECT_RAISES(txSetCell(cells.get(), 2, txCreateString("lost")), "Quillane:Arrays:NoSuchCell", 2, "cell");
        EXPECT_RAISES(txSetCell(text, 0, txCreateString("lost")), "Quillane:Arrays:NoSuchCell", 0, "char");
    }
    EXPECT_EQ(txGetNumLiveArrays(), before);
}

TEST(HostArray, ACopyOfCellsIsItsOwn) {
    const txArrayPtr cells(txCreateCellMatrix(2, 1));
    txSetCell(cells.get(), 0, txCreateString("shared"));
    txSetCell(cells.get(), 1, txCreateString("old"));
    const txArrayPtr copy = SafeCreateSharedCopy(cells.get());
    EXPECT_EQ(txGetReferenceCount(txGetCell(cells.get(), 0)), 1u);
    txSetCell(copy.get(), 1, txCreateString("new"));
    EXPECT_EQ(txGetCell(copy.get(), 0), txGetCell(cells.get(), 0));
    EXPECT_EQ(txGetReferenceCount(txGetCell(cells.get(), 0)), 2u);
    EXPECT_EQ(txArrayToUTF8StdString(txGetCell(cells.get(), 1)), "old");
    EXPECT_EQ(txArrayToUTF8StdString(txGetCell(copy.get(), 1)), "new");
}

TEST(HostArray, FieldsByNumberAndName) {
    constexpr const char* names[] = {"inherit", "min", "min"};
    const txArrayPtr structs(txCreateStructMatrix(1, 2, 3, names));
    EXPECT_EQ(txGetClassID(structs.get()), txClassStruct);
    EXPECT_EQ(txGetNumberOfFields(structs.get()), 3);
    EXPECT_STREQ(txGetFieldNameByNumber(structs.get(), 0), "inherit");
    EXPECT_STREQ(txGetFieldNameByNumber(structs.get(), 2), "min");
    EXPECT_EQ(txGetFieldNameByNumber(structs.get(), 3), nullptr);
    EXPECT_EQ(txGetFieldNameByNumber(structs.get(), -1), nullptr);
    EXPECT_EQ(txGetFieldNumber(structs.get(), "min"), 1);
    EXPECT_EQ(txGetFieldNumber(structs.get(), "Min"), -1);
    EXPECT_EQ(txGetFieldNumber(structs.get(), nullptr), -1);

    for (std::size_t element = 0; element < 2; ++element)
        for (int field = 0; field < 3; ++field) {
            EXPECT_EQ(txGetFieldByNumber(structs.get(), element, field), nullptr);
            txSetFieldByNumber(structs.get(), element, field,
                               txCreateDoubleScalar(static_cast<double>(element) * 10 + field));
        }
    for (std::size_t element = 0; element < 2; ++element)
        for (int field = 0; field < 3; ++field)
            EXPECT_EQ(elements<double>(txGetFieldByNumber(structs.get(), element, field))[0],
                      static_cast<double>(element) * 10 + field);

    txSetField(structs.get(), 1, "min", txCreateString("low"));
    EXPECT_EQ(txArrayToUTF8StdString(txGetField(structs.get(), 1, "min")), "low");
    EXPECT_EQ(txGetField(structs.get(), 1, "max"), nullptr);
    EXPECT_EQ(txGetField(structs.get(), 2, "min"), nullptr);
    EXPECT_EQ(txGetFieldByNumber(structs.get(), 0, 3), nullptr);
    EXPECT_EQ(txGetFieldByNumber(structs.get(), 0, -1), nullptr);
    EXPECT_RAISES(txSetFieldByNumber(structs.get(), 0, 3, txCreateString("lost")), "Quillane:Arrays:NoSuchField", 0,
                  "3", "struct");
    EXPECT_RAISES(txSetField(structs.get(), 0, "max", txCreateString("lost")), "Quillane:Arrays:NoSuchField", 0,
                  "'max'", "struct");
    EXPECT_RAISES(txSetField(structs.get(), 2, "min", txCreateString("lost")), "Quillane:Arrays:NoSuchField", 2,
                  "'min'", "struct");

    const txArrayPtr copy = SafeCreateSharedCopy(structs.get());
    txSetField(copy.get(), 0, "inherit", nullptr);
    EXPECT_EQ(txGetField(copy.get(), 0, "inherit"), nullptr);
    EXPECT_NE(txGetField(structs.get(), 0, "inherit"), nullptr);
    EXPECT_STREQ(txGetFieldNameByNumber(copy.get(), 1), "min");
}

TEST(HostArray, AStructureMayHaveNoFields) {
    const txArrayPtr structs(txCreateStructMatrix(1, 1, 0, nullptr));
    EXPECT_EQ(txGetNumberOfFields(structs.get()), 0);
    EXPECT_EQ(txGetFieldNumber(structs.get(), "any"), -1);
}

TEST(HostArray, NestingHasNoLimit) {
    const std::size_t before = txGetNumLiveArrays();
    txArrayPtr outermost(txCreateDoubleScalar(0));
    for (int i = 0; i < 300'000; ++i) {
        txArrayPtr outer(txCreateCellMatrix(1, 1));
        txSetCell(outer.get(), 0, outermost.release());
        outermost = std::move(outer);
    }
    outermost.reset();
    EXPECT_EQ(txGetNumLiveArrays(), before);
}

TEST(HostArray, ImpossibleSizesRunOutOfMemory) {
    constexpr std::size_t huge = std::size_t(1) << 62;
    constexpr const char* names[] = {"a", "b", "c", "d"};
    EXPECT_RAISES(txCreateNumericMatrix(huge, 1, txClassDouble, false), "Quillane:Services:OutOfMemory");
    EXPECT_RAISES(txCreateNumericMatrix(huge, huge, txClassInt8, false), "Quillane:Services:OutOfMemory");
    EXPECT_RAISES(txCreateCellMatrix(huge, 1), "Quillane:Services:OutOfMemory");
    EXPECT_RAISES(txCreateCellMatrix(huge, huge), "Quillane:Services:OutOfMemory");
    EXPECT_RAISES(txCreateStructMatrix(huge, 1, 4, names), "Quillane:Services:OutOfMemory");
    EXPECT_EQ(txCallocEx(huge, 8), nullptr);
}

TEST(HostArray, MemoryThatRunsOutLeavesNothingBehind) {
    constexpr const char* names[] = {"list", "flag"};
    const auto numAllocations = testsupport::failEachAllocation([&] {
        const txArrayPtr structure(txCreateStructMatrix(1, 1, 2, names));
        const txArrayPtr cells(txCreateCellMatrix(1, 2));
        txSetCell(cells.get(), 0, txCreateString("a"));
        txSetCell(cells.get(), 1, txCreateRow<double>({1, 2, 3}));
        txSetFieldByNumber(structure.get(), 0, 0, SafeCreateSharedCopy(cells.get()).release());
        txSetCell(cells.get(), 0, txCreateLogicalScalar(true)); // ends the sharing
        txSetField(structure.get(), 0, "flag", txCreateDoubleScalar(1));
    });
    EXPECT_EQ(numAllocations, 14u);
}

TEST(HostArray, AFailedWriteChangesNothing) {
    const txArrayPtr cells(txCreateCellMatrix(1, 1));
    txSetCell(cells.get(), 0, txCreateString("kept"));
    const txArrayPtr copy = SafeCreateSharedCopy(cells.get());
    txArray_tag* value = txCreateString("lost");
    utFailAllocationAt(1);
    EXPECT_RAISES(txSetCell(cells.get(), 0, value), "Quillane:Services:OutOfMemory");
    utFailAllocationAt(1);
    EXPECT_RAISES(txCreateString("never"), "Quillane:Services:OutOfMemory");
    utFailAllocationAt(0);
    EXPECT_EQ(txArrayToUTF8StdString(txGetCell(cells.get(), 0)), "kept");
    EXPECT_EQ(txGetCell(copy.get(), 0), txGetCell(cells.get(), 0));
}

// Random writes to a family of copies, held against plain vectors.
TEST(HostArray, RandomCopiesAndWritesBehaveAsValues) {
    constexpr unsigned seed = 20240611;
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    const auto below = [&random](std::size_t limit) { return random() % limit; };
    std::vector<txArrayPtr> arrays;
    std::vector<std::vector<std::int32_t>> models;
    arrays.emplace_back(txCreateRow<std::int32_t>({0, 0, 0, 0}));
    models.push_back({0, 0, 0, 0});
    for (int step = 0; step < 20'000; ++step) {
        const std::size_t i = below(arrays.size());
        switch (below(4)) {
        case 0:
            if (arrays.size() < 12) {
                arrays.push_back(SafeCreateSharedCopy(arrays[i].get()));
                models.push_back(std::vector<std::int32_t>(models[i]));
            }
            break;
        case 1:
            if (arrays.size() > 1) {
                arrays.erase(arrays.begin() + static_cast<std::ptrdiff_t>(i));
                models.erase(models.begin() + static_cast<std::ptrdiff_t>(i));
            }
            break;
        default: {
            const std::size_t element = below(4);
            txGetWritableElements<std::int32_t>(arrays[i].get())[element] = step;
            models[i][element] = step;
        }
        }
        for (std::size_t k = 0; k < arrays.size(); ++k)
            ASSERT_EQ(elements<std::int32_t>(arrays[k].get()), models[k]) << "step " << step << ", array " << k;
    }
}

} // namespace
