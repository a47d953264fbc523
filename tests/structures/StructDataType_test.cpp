// The record of a structure: elements, derived flags, index vector, cached answers, registration.
#include <algorithm>

#include <boost/make_shared.hpp>

#include "qltypes/structures/ElementAccess.h"
#include "tests/structures/Builder.h"
#include "tests/types/ClientTable.h"

namespace {

using namespace structures;
using namespace QLTypeSys;

constexpr int real = DATA_TYPE_ID_DOUBLE;
constexpr auto client = static_cast<DataTypeSource>(2);

// --- Registration ----------------------------------------------------------------------------------------------------

TEST(StructDataType, IsRegisteredEmpty) {
    Structures s;
    const int id = s.define("Pose", {});
    EXPECT_EQ(id, 14);
    const StructDataType* const record = s.record(id);
    EXPECT_STREQ(record->getName(), "Pose");
    EXPECT_EQ(record->getId(), id);
    EXPECT_EQ(record->getStorageId(), id);
    EXPECT_TRUE(record->getIsType(dtqStruct));
    EXPECT_EQ(record->getDataTypeSource(), client);
    EXPECT_EQ(record->getSize(), -1);
    EXPECT_EQ(record->getNumElements(), 0);
    EXPECT_EQ(record->getNumFlatElements(), 0);
    EXPECT_EQ(record->getNumRawElements(), 0);
    EXPECT_EQ(record->getNumDFSElements(), 0);
    EXPECT_TRUE(record->getElements().empty());
    EXPECT_TRUE(record->isFlatElementCacheEmpty());
    EXPECT_EQ(record->getDtChecksumValue(), qlChecksumValue{});
    EXPECT_FALSE(record->isBusType());
    EXPECT_FALSE(record->emitPaddingInCode());
    EXPECT_TRUE(record->dependsOn().empty());
}

TEST(StructDataType, RegistrationChecksNameAndSource) {
    Structures s;
    const int id = s.define("Pose", {});
    EXPECT_EQ(s.table.registerStructDataType("Pose", client, nullptr), id);
    EXPECT_EQ(s.table.registerStructDataType("Pose", dtSourceOpaque, nullptr), id);
    EXPECT_RAISES(s.table.registerStructDataType("Pose", dtSourceEnum, nullptr),
                  "QuillaneTypes:general:DataType_SameNameAsExistingType", "Pose");
    EXPECT_RAISES(s.table.registerStructDataType("not a name", client, nullptr),
                  "QuillaneTypes:general:InvalidDataType", "not a name");
    EXPECT_RAISES(s.table.registerStructDataType(nullptr, client, nullptr), "QuillaneTypes:general:InvalidDataType",
                  "");
    EXPECT_EQ(s.table.getNumDataTypes(), 16);
    const int anonymous = s.table.registerStructDataType("rtt_7", dtSourceAnonymous, nullptr);
    EXPECT_EQ(s.table.registerStructDataType("rtt_7", client, nullptr), anonymous);
}

TEST(StructDataType, ANameOfFixedPointShapeOrAnEnumSourceMakesNoDifference) { // kept
    Structures s;
    const int id = s.table.registerStructDataType("sfix16_En7", client, nullptr);
    EXPECT_TRUE(s.record(id)->getIsType(dtqStruct));
    EXPECT_TRUE(s.record(s.table.registerStructDataType("E", dtSourceEnum, nullptr))->getIsType(dtqStruct));
}

TEST(StructDataType, AClientMayVetoOrReplace) {
    testsupport::ClientTable table;
    const auto check = table.install();
    check->vetoed = "Bad";
    EXPECT_RAISES(table.registerStructDataType("Bad", client, "model/Bus"),
                  "QuillaneTypes:general:DataType_WithIntrinsicFixptName", "Bad");
    EXPECT_EQ(table.getNumDataTypes(), 15);
    const int id = table.registerStructDataType("Good", client, "model/Bus");
    EXPECT_EQ(check->seen, (std::vector<std::string>{"Bad from model/Bus", "Good from model/Bus"}));
    table.declines = true;
    DtGetStructDataTypeObject(&table, id)->setNumElements(3);
    EXPECT_EQ(table.registerStructDataType("Good", dtSourceEnum, nullptr), id);
    EXPECT_EQ(DtGetStructDataTypeObject(&table, id)->getNumElements(), 0);
    EXPECT_EQ(table.getNumDataTypes(), 16);
}

// --- Elements --------------------------------------------------------------------------------------------------------

TEST(StructDataType, SetNumElementsMakesDefaultElements) {
    Structures s;
    StructDataType* const record = s.record(s.define("S", {}));
    record->setNumElements(3);
    ASSERT_EQ(record->getNumElements(), 3);
    for (const StructElement* e : record->getElements())
        EXPECT_EQ(e->dataTypeId, -10);
}

TEST(StructDataType, ASecondCallAbandonsTheElements) { // kept: they are the caller's to delete
    Structures s;
    StructDataType* const record = s.record(s.define("S", {}));
    record->setNumElements(3);
    const std::vector<StructElement*> abandoned = record->getElements();
    abandoned[2]->setName("still here");
    record->setNumElements(2);
    ASSERT_EQ(record->getNumElements(), 2);
    EXPECT_EQ(abandoned[2]->name, "still here");
    for (StructElement* e : abandoned) {
        EXPECT_EQ(std::count(record->getElements().begin(), record->getElements().end(), e), 0);
        delete e;
    }
}

TEST(StructDataType, DependsOnTheTypesOfItsElements) {
    Structures s;
    const int inner = s.laidOut("In", {{"a", real}});
    const int alias = s.alias("A", inner);
    const int id = s.define("S", {{"x", alias}, {"y", real}, {"z", alias}, {"v", -10}});
    EXPECT_EQ(s.record(id)->dependsOn(), (std::vector<int>{alias, real, alias, -10}));
}

TEST(StructDataType, WorkOnAValueIsTheClients) {
    Structures s;
    const StructDataType* const record = s.record(s.laidOut("S", {{"a", real}}));
    double source = 1, destination = 2;
    record->deepCopyScalarElement(&source, &destination);
    record->constructScalarElement(&destination);
    record->destroyScalarElement(&destination);
    EXPECT_EQ(destination, 2);
}

TEST(StructDataType, PaddingInCodeIsDecidedOnce) {
    Structures s;
    StructDataType* const record = s.record(s.define("S", {}));
    record->emitPaddingInCode(true);
    EXPECT_TRUE(record->emitPaddingInCode());
    record->emitPaddingInCode(false);
    EXPECT_FALSE(record->emitPaddingInCode());
}

// --- Derived flags ---------------------------------------------------------------------------------------------------

struct Flags {
    bool frame = false, varDims = false, aob = false, complex = false, string = false, half = false;
    bool operator==(const Flags&) const = default;
};

std::ostream& operator<<(std::ostream& os, const Flags& f) {
    return os << (f.frame ? "frame " : "") << (f.varDims ? "varDims " : "") << (f.aob ? "aob " : "")
              << (f.complex ? "complex " : "") << (f.string ? "string " : "") << (f.half ? "half " : "");
}

Flags flagsOf(const FrequentlyAccessedProperties& p) {
    EXPECT_FALSE(p.hasConstructFcn || p.hasDestructFcn || p.hasDeepCopyFcn); // kept: never assigned
    return {p.hasFrameBasedElements, p.hasVarDims, p.hasAOB, p.hasComplexData, p.hasStringData, p.hasHalfPrecisionData};
}

class DerivedFlags : public testing::Test, public Structures {
  protected:
    DerivedFlags() {
        half = table.registerDataType("half", dtSourceFixpt, nullptr);
        DataType* const record = table.getDataTypeAt(static_cast<unsigned long>(half + 1));
        const fxpDataTypeProp prop{FXP_DT_CUSTOM_FLOAT, 1, 16, 5, 0, 1.0, 0.0, 0};
        record->setSize(2);
        record->setPropertiesSize(sizeof prop);
        record->setProperties(&prop);
        string = plain("Text", 256);
        table.getDataTypeAt(static_cast<unsigned long>(string + 1))->setType(dtqString);
    }

    Flags derived(int id) { return flagsOf(record(id)->cacheForFrequentlyAccessedProperties(&table)); }

    int half, string;
};

TEST_F(DerivedFlags, OfLeaves) {
    const int id = define("Plain", {{"a", real}, {"b", -1}});
    EXPECT_EQ(derived(id), Flags{});
    EXPECT_EQ(derived(define("C", {{"a", real}, {"b", real, {}, true}})), (Flags{.complex = true}));
    EXPECT_EQ(derived(define("T", {{"a", string}})), (Flags{.string = true}));
    EXPECT_EQ(derived(define("TA", {{"a", alias("AliasOfText", string)}})), (Flags{.string = true}));
    EXPECT_EQ(derived(define("H", {{"a", half}})), (Flags{.half = true}));
    EXPECT_EQ(derived(define("HA", {{"a", alias("AliasOfHalf", half)}})), (Flags{.half = true}));
    EXPECT_EQ(derived(define("W", {{"a", real, {7}}})), Flags{}); // an array of leaves is no array of structures
    const int f = define("F", {{"a", real}});
    element(f, 0)->setSamplingMode(1);
    EXPECT_EQ(derived(f), (Flags{.frame = true}));
    const int v = define("V", {{"a", real}});
    element(v, 0)->setDimensionsMode(1);
    EXPECT_EQ(derived(v), (Flags{.varDims = true}));
}

TEST_F(DerivedFlags, PassThroughNestedStructures) {
    const int all = define("All", {{"c", real, {}, true}, {"t", string}, {"h", half}});
    element(all, 0)->setSamplingMode(1);
    element(all, 1)->setDimensionsMode(1);
    const Flags everything{.frame = true, .varDims = true, .complex = true, .string = true, .half = true};
    EXPECT_EQ(derived(define("N", {{"n", alias("AAll", all)}})), everything); // derives the nested ones first
    EXPECT_EQ(flagsOf(record(all)->createCacheForFrequentlyAccessedProperties(&table)), everything);
}

TEST_F(DerivedFlags, ArraysOfStructures) {
    const int inner = define("In", {{"a", real}});
    EXPECT_EQ(derived(define("One", {{"n", inner, {1, 1}}})), Flags{});
    EXPECT_EQ(derived(define("None", {{"n", inner}})), Flags{});
    const int many = define("Many", {{"n", inner, {2}}});
    EXPECT_EQ(derived(many), (Flags{.aob = true}));
    EXPECT_EQ(derived(define("Zero", {{"n", inner, {0}}})), (Flags{.aob = true}));
    EXPECT_EQ(derived(define("Around", {{"n", many}})), (Flags{.aob = true}));
    const int variable = define("Var", {{"n", inner, {1}}});
    element(variable, 0)->setDimensionsMode(1);
    EXPECT_EQ(derived(variable), (Flags{.varDims = true, .aob = true}));
    // What the element says of itself is not complex data.
    EXPECT_EQ(derived(define("Cplx", {{"n", inner, {1}, true}})), Flags{});
}

TEST_F(DerivedFlags, StandForLife) {
    const int id = define("S", {{"a", real}});
    EXPECT_EQ(derived(id), Flags{});
    element(id, 0)->setSignalType(1);
    EXPECT_EQ(derived(id), Flags{});
    EXPECT_FALSE(record(id)->hasComplexData());
}

TEST_F(DerivedFlags, PlainFlagsStopAtANestedStructure) { // kept
    const int custom = plain("Custom", 8);
    DataType* const type = table.getDataTypeAt(static_cast<unsigned long>(custom + 1));
    type->setConstructFcn([](void*, const void*) { return 1; });
    const int inner = define("In", {{"a", custom}});
    const int outer = define("Out", {{"n", inner}});
    derived(outer);
    EXPECT_FALSE(record(inner)->getPlainConstruct());
    EXPECT_TRUE(record(inner)->getPlainCopy());
    EXPECT_TRUE(record(inner)->getPlainDestroy());
    EXPECT_TRUE(record(outer)->getPlainConstruct());
    type->setDestructFcn([](void*) { return 1; });
    type->setDeepCopyFcn([](void*, const void*) { return 1; });
    const int later = define("Later", {{"a", real}, {"b", custom}});
    derived(later);
    EXPECT_FALSE(record(later)->getPlainCopy() || record(later)->getPlainDestroy() ||
                 record(later)->getPlainConstruct());
    EXPECT_FALSE(record(later)->hasConstructFcn());
}

TEST_F(DerivedFlags, AnInvalidTypeLeavesThemOpen) {
    const int id = define("S", {{"a", real, {}, true}, {"b", -10}});
    EXPECT_RAISES(record(id)->cacheForFrequentlyAccessedProperties(&table), "QuillaneTypes:general:InvalidDataTypeId",
                  -10);
    element(id, 1)->setDataTypeId(real);
    EXPECT_EQ(derived(id), (Flags{.complex = true}));
}

TEST_F(DerivedFlags, AFaultyStructureThatContainsItselfEnds) {
    const int id = define("Self", {{"a", real}, {"b", 14}});
    element(id, 1)->setDataTypeId(id);
    EXPECT_EQ(derived(id), Flags{});
}

TEST_F(DerivedFlags, TheTableReadsThem) {
    const int all = define("All", {{"c", real, {}, true}, {"t", string}, {"h", half}});
    element(all, 0)->setSamplingMode(1);
    element(all, 1)->setDimensionsMode(1);
    EXPECT_FALSE(table.doesBusDTHaveComplexData(all)); // not derived yet
    derived(all);
    EXPECT_TRUE(table.doesBusDTHaveComplexData(all));
    EXPECT_TRUE(table.doesBusDTHaveFrameBasedElements(all));
    EXPECT_TRUE(table.doesBusDTHaveVarDims(all));
    EXPECT_FALSE(table.doesBusDTHaveAoB(all));
    EXPECT_TRUE(table.doesBusDTHaveStringData(all));
    EXPECT_TRUE(table.doesBusDTHaveHalfPrecisionData(all));
    EXPECT_FALSE(table.doesBusDTHaveConstructFcn(all));
    EXPECT_FALSE(table.doesBusDTHaveDestructFcn(all));
    EXPECT_FALSE(table.doesBusDTHaveDeepCopyFcn(all));
    bool aob = true, varDims = false, frames = false;
    table.doesBusDTContainArraysOfBusesOrVarDimsOrFrames(all, &aob, &varDims, &frames);
    EXPECT_EQ(std::vector({aob, varDims, frames}), std::vector({false, true, true}));
    const int many = define("Many", {{"n", define("In", {{"a", real}}), {2}}});
    derived(many);
    table.doesBusDTContainArraysOfBusesOrVarDimsOrFrames(many, &aob, &varDims, &frames);
    EXPECT_EQ(std::vector({aob, varDims, frames}), std::vector({true, false, false}));
}

// --- The index vector ------------------------------------------------------------------------------------------------

TEST(StructDataType, FlatAndDepthFirstIndices) {
    Example e;
    StructDataType* const record = e.record(e.outer);
    DFSElementAccess(&e.table, e.outer).genFlatIdxToDFSIdxCache();
    const std::vector<long> leaves{1, 4, 5, 7, 8, 10, 11};
    for (long flat = 0; flat < 30; ++flat) {
        const long expected = flat / 7 * 12 + leaves[static_cast<std::size_t>(flat % 7)];
        EXPECT_EQ(record->getDFSIdxFromFlatIdx(flat), expected);
        EXPECT_EQ(record->getFlatIdxFromDFSIdx(expected), flat);
    }
    for (const long node : {0, 2, 3, 6, 9, 12, 14, 24})
        EXPECT_EQ(record->getFlatIdxFromDFSIdx(node), -1) << node;
    EXPECT_EQ(record->getDFSIdxFromFlatIdx(record->getNumFlatElements()), record->getNumDFSElements() + 1);
}

TEST(StructDataType, TheVectorOfAClientCounts) {
    Example e;
    StructDataType* const record = e.record(e.outer);
    for (const std::vector<long>& set : {std::vector<long>{11, 10, 8, 7, 5, 4, 1},
                                         {1, 1, 4, 4, 7, 7, 7},
                                         {2, 4, 6, 8, 9, 10, 11},
                                         {4, 5, 6, 7, 8, 9, 10}}) {
        record->setDFSIdxFromFlatIdx(set);
        EXPECT_FALSE(record->isFlatElementCacheEmpty());
        const FlatElementAccess flat(&e.table, e.outer);
        const DFSElementAccess dfs(&e.table, e.outer);
        for (long idx = 0; idx < 14; ++idx) {
            const long node = idx / 7 * 12 + set[static_cast<std::size_t>(idx % 7)];
            EXPECT_EQ(flat.getDFSIdx(idx), node);
            EXPECT_EQ(flat.getOffset(idx), dfs.getOffset(node));
        }
        for (long node = 0; node < 12; ++node) {
            const long first = std::find(set.begin(), set.end(), node) - set.begin();
            EXPECT_EQ(dfs.getFlatElementIdx(node), first == 7 ? -1 : first);
        }
        record->clearDFSCache();
        EXPECT_FALSE(record->isFlatElementCacheEmpty()) << "outlives the answers of views";
    }
    record->setDFSIdxFromFlatIdx({});
    EXPECT_TRUE(record->isFlatElementCacheEmpty());
    EXPECT_EQ(FlatElementAccess(&e.table, e.outer).getDFSIdx(6), 11) << "made anew";
}

TEST(StructDataType, NoIndexWithoutALayout) {
    Structures s;
    const StructDataType* const record = s.record(s.define("S", {{"a", real}}));
    EXPECT_EQ(record->getDFSIdxFromFlatIdx(0), -1);
    EXPECT_EQ(record->getFlatIdxFromDFSIdx(0), -1);
}

TEST(StructDataType, IndicesBeyondAllBounds) {
    constexpr long largest = std::numeric_limits<long>::max();
    Structures s;
    const int id = s.laidOut("S", {{"a", real}});
    const FlatElementAccess flat(&s.table, id);
    EXPECT_EQ(flat.getDFSIdx(0), 1);
    EXPECT_EQ(flat.getDFSIdx(largest), -1) << "largest times two, and one";
    for (const long below : {-1L, -2L, -largest - 1}) {
        EXPECT_EQ(flat.getDFSIdx(below), -1);
        EXPECT_EQ(flat.getOffset(below), 0) << "as the root";
    }
    const int nothing = s.define("Nothing", {{"n", s.define("Empty", {}), {0}}});
    s.record(nothing)->setNumDFSElements(1);
    long immediate, instance, base;
    int type;
    DFSElementAccess(&s.table, nothing).computeDataTypeIdAndIndex(largest, &immediate, &instance, &type, &base);
    EXPECT_EQ(immediate, -1);
    EXPECT_EQ(instance, largest);
    EXPECT_EQ(base, largest);
    EXPECT_EQ(type, nothing);
}

// --- Cached answers --------------------------------------------------------------------------------------------------

TEST(StructDataType, CachedElementsStayWhereTheyAre) {
    Structures s;
    StructDataType* const record = s.record(s.define("S", {{"a", real}}));
    CachedElement* const first = record->getCachedElement(7);
    EXPECT_EQ(first->element, nullptr);
    EXPECT_FALSE(first->ownsElement);
    EXPECT_EQ(first->offset, -1);
    EXPECT_EQ(first->varDimsOffset, -1);
    first->offset = 99;
    for (long idx = 100; idx < 10000; ++idx)
        record->getCachedElement(idx);
    EXPECT_EQ(record->getCachedElement(7), first);
    EXPECT_EQ(first->offset, 99);
    record->clearDFSCache();
    EXPECT_EQ(record->getCachedElement(7)->offset, -1);
}

TEST(StructDataType, CachedElementsHoldWhatWasAnswered) {
    Example e;
    StructDataType* const record = e.record(e.outer);
    const DFSElementAccess dfs(&e.table, e.outer);
    for (const bool isAskedFirst : {true, false}) {
        for (const long idx : {0, 1, 2, 3, 6, 8, 15}) {
            SCOPED_TRACE(idx);
            record->clearDFSCache();
            CachedElement* const early = isAskedFirst ? nullptr : record->getCachedElement(idx);
            const StructElement* const element = dfs.getStructElement(idx);
            const long offset = dfs.getOffset(idx);
            CachedElement* const entry = record->getCachedElement(idx);
            if (early) {
                EXPECT_EQ(entry, early);
            }
            EXPECT_EQ(entry->element, element);
            EXPECT_EQ(entry->offset, offset);
            EXPECT_EQ(entry->ownsElement, idx == 0 || idx == 3 || idx == 6);
            EXPECT_EQ(entry->varDimsOffset, -1);
            const long varDims = dfs.getVarDimsOffset(idx);
            EXPECT_EQ(entry->varDimsOffset, varDims);
            EXPECT_EQ(dfs.getStructElement(idx), element);
        }
    }
}

TEST(StructDataType, AnAnswerThatAClientWroteCounts) {
    Example e;
    const DFSElementAccess dfs(&e.table, e.outer);
    EXPECT_EQ(dfs.getOffset(8), 64);
    e.record(e.outer)->getCachedElement(8)->offset = 1000;
    EXPECT_EQ(dfs.getOffset(8), 1000);
    e.record(e.outer)->clearDFSCache();
    EXPECT_EQ(dfs.getOffset(8), 64);
}

TEST(StructDataType, ReplacementClearsAllStructures) {
    testsupport::ClientTable table;
    const int inner = table.registerStructDataType("In", client, nullptr);
    const int outer = table.registerStructDataType("Out", client, nullptr);
    const auto define = [&](int id, int type, long width) {
        StructDataType* const record = DtGetStructDataTypeObject(&table, id);
        record->setNumElements(1);
        record->getElements()[0]->setName("e");
        record->getElements()[0]->setDataTypeId(type);
        record->getElements()[0]->setNumDimensions(1);
        record->getElements()[0]->setDimension(0, width);
        EXPECT_EQ(described(DtComputeDerivedStructAttributes(&table, id)), fine);
    };
    define(inner, real, 1);
    define(outer, inner, 1);
    const DFSElementAccess dfs(&table, outer);
    EXPECT_EQ(dfs.getDataTypeId(2), real);
    table.declines = true;
    EXPECT_EQ(table.registerStructDataType("In", client, nullptr), inner);
    define(inner, DATA_TYPE_ID_SINGLE, 2);
    EXPECT_EQ(dfs.getDataTypeId(2), DATA_TYPE_ID_SINGLE);
    EXPECT_EQ(dfs.getDataTypeId(1), inner);
}

TEST(StructDataType, ATypeThatBecomesAnAliasOfAStructureIsNested) {
    Structures s;
    const int inner = s.laidOut("In", {{"a", real}, {"b", real}});
    const int open = s.table.registerDataType("Open", client, nullptr);
    const int outer = s.define("Out", {{"x", open}, {"y", real}});
    s.record(outer)->setNumDFSElements(5);
    const DFSElementAccess dfs(&s.table, outer);
    std::u16string path = dfs.getFullPathAsString(2, false);
    EXPECT_EQ(path, u"y");
    s.table.setDataTypeIdAliasedTo(open, inner);
    EXPECT_EQ(dfs.getFullPathAsString(2, false), u"x.a");
    EXPECT_EQ(dfs.getDataTypeId(1), open);
}

// --- Buses -----------------------------------------------------------------------------------------------------------

TEST(StructDataType, ABusSaysSo) {
    Structures s;
    const int bus = s.table.getNumDataTypes() - 1;
    auto* const record = new BusDataType(bus, "Bus", client);
    s.table.addDataType(record);
    EXPECT_TRUE(record->isBusType());
    EXPECT_EQ(record->sameMinValForAllLeaf, -std::numeric_limits<double>::infinity());
    EXPECT_EQ(record->sameMaxValForAllLeaf, std::numeric_limits<double>::infinity());
    EXPECT_FALSE(record->hasLeafWithSymbolicDimensions);
    const int structure = s.define("S", {});
    EXPECT_TRUE(DtGetDataTypeIsBus(&s.table, bus));
    EXPECT_TRUE(DtGetDataTypeIsBus(&s.table, s.alias("AliasOfBus", bus)));
    EXPECT_FALSE(DtGetDataTypeIsBus(&s.table, structure));
    EXPECT_FALSE(DtGetDataTypeIsBus(&s.table, real));
    EXPECT_FALSE(DtGetDataTypeIsBus(&s.table, -1));
    EXPECT_EQ(s.table.registerBusDataType("B2", client, nullptr), -1);
}

} // namespace
