// Flat functions over elements: each row equals its view or writes its field; checks, subtrees, offsets of hierarchies.
#include "qltypes/structures/ElementAccess.h"
#include "tests/structures/Builder.h"

namespace {

using namespace structures;
using namespace QLTypeSys;
using testsupport::expectedMessage;

constexpr int real = DATA_TYPE_ID_DOUBLE;

class Utils : public testing::Test, public Example {
  protected:
    Utils() {
        long n = 1;
        for (const int id : {inner, outer}) {
            for (StructElement* e : record(id)->getElements()) {
                e->setUnitId(static_cast<int>(n++));
                e->setSymbDimsId(static_cast<int>(n++));
                e->setVarDimsOffset(n++);
                e->setSamplingMode(static_cast<int>(n++));
                e->setDimensionsMode(static_cast<int>(n++));
                e->setMin(-static_cast<double>(n));
                e->setMax(static_cast<double>(n++));
            }
        }
        aliasOfOuter = alias("AliasOfOuter", outer);
    }

    int bus(const std::string& name, const std::vector<Element>& elements, bool isLaidOut = true) {
        const int id = table.getNumDataTypes() - 1;
        table.addDataType(new BusDataType(id, name, static_cast<DataTypeSource>(2)));
        record(id)->setNumElements(std::ssize(elements));
        for (std::size_t i = 0; i < elements.size(); ++i)
            fill(*element(id, static_cast<long>(i)), elements[i]);
        if (isLaidOut) {
            EXPECT_EQ(described(DtComputeDerivedStructAttributes(&table, id)), fine);
        }
        return id;
    }

    int aliasOfOuter;
};

TEST_F(Utils, Records) {
    const DataType* const record = table.getDataTypeAt(static_cast<unsigned long>(outer + 1));
    EXPECT_EQ(DtGetStructDataTypeObject(&table, outer), record);
    EXPECT_EQ(DtGetStructDataTypeObject_AliasedThruIfNeeded(&table, outer), record);
    EXPECT_EQ(DtGetStructDataTypeObject_AliasedThruIfNeeded(&table, aliasOfOuter), record);
    EXPECT_RAISES(DtGetStructDataTypeObject_AliasedThruIfNeeded(&table, -10), "QuillaneTypes:general:InvalidDataTypeId",
                  -10);
    const int id = bus("Bus", {{"a", real}});
    EXPECT_EQ(DtGetBusDataTypeObject(&table, id), this->record(id));
    EXPECT_EQ(DtGetBusDataTypeObject_AliasedThruIfNeeded(&table, alias("AliasOfBus", id)), this->record(id));
}

TEST_F(Utils, Counts) {
    for (const int id : {outer, aliasOfOuter}) {
        EXPECT_EQ(DtGetDataTypeNumElements(&table, id), 3);
        EXPECT_EQ(DtGetDataTypeNumFlatElements(&table, id), 7);
        EXPECT_EQ(DtGetDataTypeNumRawElements(&table, id), 16);
        EXPECT_EQ(DtGetDataTypeNumDFSElements(&table, id), 12);
    }
    for (const int id : {-1, 0, 13, plain("P", 4)}) {
        EXPECT_EQ(DtGetDataTypeNumElements(&table, id), 0);
        EXPECT_EQ(DtGetDataTypeNumFlatElements(&table, id), 0);
        EXPECT_EQ(DtGetDataTypeNumRawElements(&table, id), 0);
        EXPECT_EQ(DtGetDataTypeNumDFSElements(&table, id), 0);
    }
    EXPECT_RAISES(DtGetDataTypeNumElements(&table, 999), "QuillaneTypes:general:InvalidDataTypeId", 999);
}

TEST_F(Utils, ImmediateElements) {
    for (const int id : {inner, outer, aliasOfOuter}) {
        const ImmediateElementAccess view(&table, id);
        for (long i = 0; i < view.getNumElements(); ++i) {
            SCOPED_TRACE(testing::Message() << id << " " << i);
            EXPECT_EQ(DtGetDataTypeElementName(&table, id, i), view.getName(i));
            EXPECT_EQ(DtGetDataTypeElementDataTypeId(&table, id, i), view.getDataTypeId(i));
            EXPECT_EQ(DtGetDataTypeElementUnitId(&table, id, i), view.getUnitId(i));
            EXPECT_EQ(DtGetDataTypeElementSamplingMode(&table, id, i), view.getSamplingMode(i));
            EXPECT_EQ(DtGetDataTypeElementSignalType(&table, id, i), view.getSignalType(i));
            EXPECT_EQ(DtGetDataTypeElementDimensionsMode(&table, id, i), view.getDimensionsMode(i));
            EXPECT_EQ(DtGetDataTypeElementNumDimensions(&table, id, i), view.getNumDimensions(i));
            EXPECT_EQ(DtGetDataTypeElementDimensions(&table, id, i), view.getDimensions(i));
            EXPECT_EQ(DtGetDataTypeElementDimensionsAsInt(&table, id, i)[0], view.getDimensions(i)[0]);
            EXPECT_EQ(DtGetDataTypeElementDimension(&table, id, i, 0), view.getDimensions(i)[0]);
            EXPECT_EQ(DtGetDataTypeElementSymbDimsId(&table, id, i), view.getSymbDimsId(i));
            EXPECT_EQ(DtGetDataTypeElementOffset(&table, id, i), view.getOffset(i));
            EXPECT_EQ(DtGetDataTypeElementWidth(&table, id, i), view.getWidth(i));
            EXPECT_EQ(DtGetDataTypeElementPadding(&table, id, i), view.getPadding(i));
            EXPECT_EQ(DtGetDataTypeElementVarDimsOffset(&table, id, i), view.getVarDimsOffset(i));
            EXPECT_EQ(DtGetDataTypeElementComplexWidth(&table, id, i), view.getComplexWidth(i));
            EXPECT_EQ(DtGetDataTypeElementIsScalar(&table, id, i), view.isScalar(i));
            EXPECT_EQ(table.getDataTypeElementMin(id, i), view.getMin(i));
            EXPECT_EQ(table.getDataTypeElementMax(id, i), view.getMax(i));
            EXPECT_EQ(table.getDataTypeRawElementIdxFromImmediateElementIdx(id, i), view.getRawElementIdx(i));
        }
    }
}

TEST_F(Utils, LeavesAndNodes) {
    for (const int id : {inner, outer, aliasOfOuter}) {
        const FlatElementAccess flat(&table, id);
        for (long i = 0; i < 3 * flat.getNumElements(); ++i) {
            SCOPED_TRACE(testing::Message() << id << " leaf " << i);
            const std::u16string path = flat.getFullPathAsString(i, false);
            EXPECT_EQ(DtGetDataTypeFlatElementName(&table, id, i), flat.getName(i));
            EXPECT_EQ(DtGetDataTypeFlatElementFullPath(&table, id, i), std::string(path.begin(), path.end()));
            EXPECT_EQ(DtGetDataTypeFlatElementDataTypeId(&table, id, i), flat.getDataTypeId(i));
            EXPECT_EQ(DtGetDataTypeFlatElementDimensionsMode(&table, id, i), flat.getDimensionsMode(i));
            EXPECT_EQ(DtGetDataTypeFlatElementNumDimensions(&table, id, i), flat.getNumDimensions(i));
            EXPECT_EQ(DtGetDataTypeFlatElementDimension(&table, id, i, 0), flat.getDimensions(i)[0]);
            EXPECT_EQ(DtGetDataTypeFlatElementSignalType(&table, id, i), flat.getSignalType(i));
            EXPECT_EQ(DtGetDataTypeFlatElementComplexWidth(&table, id, i), flat.getComplexWidth(i));
            EXPECT_EQ(DtGetDataTypeFlatElementOffset(&table, id, i), flat.getOffset(i));
            EXPECT_EQ(DtGetDataTypeFlatElementMax(&table, id, i), flat.getMax(i));
            EXPECT_EQ(table.getDataTypeFlatElementMin(id, i), flat.getMin(i));
            const DFSElementAccess dfs(&table, id);
            const long node = flat.getDFSIdx(i);
            EXPECT_EQ(flat.getUnitId(i), dfs.getUnitId(node));
            EXPECT_EQ(flat.getSymbDimsId(i), dfs.getSymbDimsId(node));
            EXPECT_EQ(flat.getSamplingMode(i), dfs.getSamplingMode(node));
            EXPECT_EQ(flat.getWidth(i), dfs.getWidth(node));
            EXPECT_EQ(flat.getVarDimsOffset(i), dfs.getVarDimsOffset(node));
            EXPECT_EQ(flat.getMax(i), dfs.getMax(node));
        }
        const DFSElementAccess dfs(&table, id);
        for (long i = 0; i < 3 * dfs.getNumElements(); ++i) {
            SCOPED_TRACE(testing::Message() << id << " node " << i);
            const std::u16string path = dfs.getFullPathAsString(i, false);
            EXPECT_EQ(DtGetDataTypeDFSElementDataTypeId(&table, id, i), dfs.getDataTypeId(i));
            EXPECT_EQ(DtGetDataTypeDFSElementWidth(&table, id, i), dfs.getWidth(i));
            EXPECT_EQ(DtGetDataTypeDFSElementSignalType(&table, id, i), dfs.getSignalType(i));
            EXPECT_EQ(DtGetDataTypeDFSElementDimensionsMode(&table, id, i), dfs.getDimensionsMode(i));
            EXPECT_EQ(DtGetDataTypeDFSElementNumDimensions(&table, id, i), dfs.getNumDimensions(i));
            EXPECT_EQ(DtGetDataTypeDFSElementDimension(&table, id, i, 0), dfs.getDimensions(i)[0]);
            EXPECT_EQ(DtGetDataTypeDFSElementQRTPathFromIdx(&table, id, i), std::string(path.begin(), path.end()));
            EXPECT_EQ(table.getDataTypeDFSElementMin(id, i), dfs.getMin(i));
            EXPECT_EQ(table.getDataTypeDFSElementMax(id, i), dfs.getMax(i));
        }
    }
}

TEST_F(Utils, ElementSetters) {
    for (const int id : {outer, aliasOfOuter}) {
        const int v = 100 * id;
        EXPECT_EQ(DtSetDataTypeElementUnitId(&table, "b", id, 1, v + 1), nullptr);
        EXPECT_EQ(DtSetDataTypeElementSignalType(&table, "b", id, 1, v + 2), nullptr);
        EXPECT_EQ(DtSetDataTypeElementSymbDimsId(&table, "b", id, 1, v + 3), nullptr);
        EXPECT_EQ(DtSetDataTypeElementSamplingMode(&table, "b", id, 1, v + 4), nullptr);
        EXPECT_EQ(DtSetDataTypeElementDimensionsMode(&table, nullptr, id, 1, v + 5), nullptr);
        EXPECT_EQ(DtSetDataTypeElementMin(&table, nullptr, id, 1, v + 6), nullptr);
        EXPECT_EQ(DtSetDataTypeElementMax(&table, nullptr, id, 1, v + 7), nullptr);
        const StructElement* const e = element(outer, 1);
        EXPECT_EQ(e->unitId, v + 1);
        EXPECT_EQ(e->signalType, v + 2);
        EXPECT_EQ(e->symbDimsId, v + 3);
        EXPECT_EQ(e->samplingMode, v + 4);
        EXPECT_EQ(e->dimensionsMode, v + 5);
        EXPECT_EQ(e->min, v + 6);
        EXPECT_EQ(e->max, v + 7);
    }
    const StructElement* const e = element(inner, 0);
    const int* const narrow = DtGetDataTypeElementDimensionsAsInt(&table, inner, 0);
    EXPECT_EQ(DtSetDataTypeElementDimension(&table, "b", inner, 0, 0, std::numeric_limits<long>::max()), nullptr);
    EXPECT_EQ(narrow[0], 2147483646);
    EXPECT_EQ(DtSetDataTypeElementNumDimensions(&table, "b", inner, 0, 3), nullptr);
    EXPECT_EQ(e->numDims, 3u);
    EXPECT_EQ(e->dims[0], std::numeric_limits<long>::max());
    EXPECT_EQ(e->dims[2], 0);
    EXPECT_EQ(e->intDims, nullptr);
    EXPECT_EQ(DtSetDataTypeElementNumDimensions(&table, "b", inner, 0, -4), nullptr);
    EXPECT_EQ(e->numDims, 0u);
    EXPECT_EQ(e->dims, nullptr);
}

TEST_F(Utils, NumElements) {
    const int id = define("Fresh", {});
    EXPECT_EQ(described(DtSetDataTypeNumElements(&table, "model/Bus", id, 0)),
              expectedMessage("Quillane:DataType:InvalidDataTypeNumElements", "Fresh", "model/Bus"));
    EXPECT_EQ(described(DtSetDataTypeNumElements(&table, nullptr, id, 0)),
              expectedMessage("Quillane:DataType:InvalidDataTypeNumElements", "Fresh", ""));
    EXPECT_EQ(DtGetDataTypeNumElements(&table, id), 0);
    EXPECT_EQ(described(DtSetDataTypeNumElements(&table, "model/Bus", id, 4)), fine);
    EXPECT_EQ(DtGetDataTypeNumElements(&table, id), 4);
    EXPECT_THROW(DtSetDataTypeNumElements(&table, "", define("Other", {}), -1), std::length_error);
}

TEST_F(Utils, ElementIndexCheck) {
    const auto check = [&](int id, long index, const char* block = "model/Bus") {
        return described(DtCheckDataTypeElementIndex(&table, block, id, index));
    };
    const std::string wrongIndex = "Quillane:DataType:InvalidDataTypeElementIndex";
    for (const int id : {outer, aliasOfOuter}) {
        EXPECT_EQ(check(id, 0), fine);
        EXPECT_EQ(check(id, 2), fine);
        EXPECT_EQ(check(id, 3), expectedMessage(wrongIndex, "model/Bus", 3, id));
        EXPECT_EQ(check(id, -1), expectedMessage(wrongIndex, "model/Bus", -1, id));
    }
    EXPECT_EQ(check(real, 0), expectedMessage(wrongIndex, "model/Bus", 0, real));
    EXPECT_EQ(check(-1, 0, nullptr), expectedMessage(wrongIndex, "", 0, -1));
    EXPECT_EQ(check(999, 0), expectedMessage("Quillane:DataType:InvalidDataTypeId", "model/Bus", 999));
    EXPECT_EQ(check(-10, 0, nullptr), expectedMessage("Quillane:DataType:InvalidDataTypeId", "", -10));
}

TEST_F(Utils, Descendants) {
    struct Row {
        long ancestor, node, expected;
    };
    constexpr Row rows[] = {
        {0, 0, 0},  {0, 11, 11}, {0, 12, -1}, {2, 2, 0},    {2, 8, 6},    {2, 9, -1},
        {3, 5, 2},  {3, 6, -1},  {6, 8, 2},   {9, 11, 2},   {9, 12, -1},  {1, 2, -1},
        {4, 5, -1}, {5, 4, -1},  {8, 2, -1},  {12, 23, 11}, {12, 24, -1}, {14, 20, 6},
    };
    for (const Row& row : rows)
        EXPECT_EQ(DtIsDFSElementDescendant(&table, outer, row.ancestor, row.node), row.expected)
            << row.ancestor << " " << row.node;
}

TEST_F(Utils, FullHierarchyOffsets) {
    using Offsets = std::vector<unsigned long>;
    const auto offsets = [&](int id, const std::vector<unsigned>& dims = {}) {
        return DtGetDataTypeFullHierarchyOffset(&table, id, dims);
    };
    EXPECT_EQ(offsets(outer), (Offsets{0, 8, 72})); // kept: structures that are no buses are leaves
    EXPECT_EQ(offsets(aliasOfOuter), (Offsets{0, 8, 72}));
    const int in = bus("InBus", {{"a", real, {3}}, {"b", DATA_TYPE_ID_SINGLE, {1}, true}});
    const int out = bus("OutBus", {{"x", DATA_TYPE_ID_INT8}, {"y", in, {2}}, {"z", alias("AliasOfIn", in)}});
    const Offsets once{0, 8, 32, 40, 64, 72, 96};
    EXPECT_EQ(offsets(out), once);
    EXPECT_EQ(offsets(out, {1}), once);
    EXPECT_EQ(offsets(out, {0, 5}), once); // kept: nothing is still once
    Offsets thrice = once;
    for (const unsigned long base : {104, 208})
        for (const unsigned long offset : once)
            thrice.push_back(base + offset);
    EXPECT_EQ(offsets(out, {3}), thrice);
    EXPECT_EQ(offsets(out, {3, 1}), thrice);
    const std::vector<unsigned> enormous{1u << 31, 1u << 30};
    for (const int id : {out, in}) {
        try {
            offsets(id, enormous);
            ADD_FAILURE();
        } catch (const std::length_error& e) {
            EXPECT_STREQ(e.what(), "vector::reserve");
        }
    }
    EXPECT_TRUE(offsets(define("Nothing", {}), enormous).empty());
}

TEST_F(Utils, BusBounds) {
    constexpr double infinity = std::numeric_limits<double>::infinity();
    const double nan = std::numeric_limits<double>::quiet_NaN();
    const int id = bus("Bus", {{"a", real}});
    const int aliasOfBus = alias("AliasOfBus", id);
    BusDataType* const record = DtGetBusDataTypeObject(&table, id);
    struct Row {
        double min, max;
        bool hasAny, hasSameMin, hasSameMax;
    };
    const Row rows[] = {
        {-infinity, infinity, false, true, true}, // no bounds anywhere
        {0.0, infinity, true, true, true},
        {-infinity, 0.0, true, true, true},
        {infinity, -infinity, true, false, false}, // none in common
        {infinity, infinity, true, false, true},
        {-infinity, -infinity, true, true, false},
        {nan, nan, true, true, true},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(testing::Message() << row.min << " " << row.max);
        record->sameMinValForAllLeaf = row.min;
        record->sameMaxValForAllLeaf = row.max;
        for (const int bus : {id, aliasOfBus}) {
            EXPECT_EQ(DtDoesBusHaveElementWithMinMax(&table, bus), row.hasAny);
            EXPECT_EQ(DtDoesBusHaveSameMinForAllLeaf(&table, bus), row.hasSameMin);
            EXPECT_EQ(DtDoesBusHaveSameMaxForAllLeaf(&table, bus), row.hasSameMax);
            if (row.min == row.min) {
                EXPECT_EQ(DtGetBusSameMinValForAllLeaf(&table, bus), row.min);
                EXPECT_EQ(DtGetBusSameMaxValForAllLeaf(&table, bus), row.max);
            }
        }
    }
    EXPECT_FALSE(DtDoesBusHaveLeafWithSymbolicDimensions(&table, aliasOfBus));
    record->hasLeafWithSymbolicDimensions = true;
    EXPECT_TRUE(DtDoesBusHaveLeafWithSymbolicDimensions(&table, aliasOfBus));
}

TEST_F(Utils, BusesWithVariableDimensions) {
    const int fixed = bus("Fixed", {{"a", real}});
    const int variable = bus("Variable", {{"a", real}}, false);
    element(variable, 0)->setDimensionsMode(1);
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&table, variable)), fine);
    const int structure = define("S", {{"a", real}});
    element(structure, 0)->setDimensionsMode(1);
    EXPECT_EQ(described(DtComputeDerivedStructAttributes(&table, structure)), fine);
    EXPECT_TRUE(DtGetDataTypeIsBusWithVarDimsElement(&table, variable));
    EXPECT_TRUE(DtGetDataTypeIsBusWithVarDimsElement(&table, alias("AliasOfVariable", variable)));
    EXPECT_FALSE(DtGetDataTypeIsBusWithVarDimsElement(&table, fixed));
    EXPECT_FALSE(DtGetDataTypeIsBusWithVarDimsElement(&table, structure));
    EXPECT_FALSE(DtGetDataTypeIsBusWithVarDimsElement(&table, real));
}

} // namespace
