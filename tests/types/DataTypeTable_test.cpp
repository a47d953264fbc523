#include <climits>
#include <cstring>
#include <sstream>

#include <boost/lexical_cast.hpp>
#include <gtest/gtest.h>

#include "qlplatform/memory/Memory.h"
#include "qltypes/fixed_point/BuiltInProps.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "tests/support/Raises.h"
#include "tests/types/ClientTable.h"

namespace {

using namespace QLTypeSys;
using testsupport::ClientTable;

std::string id(const char* leaf) { return std::string("QuillaneTypes:general:") + leaf; }

// --- A fresh table ---------------------------------------------------------------------------------------------------

TEST(DataTypeTable, HoldsItsFixedTypes) {
    const struct {
        int id;
        const char* name;
        int size;
        bool nonZeroGround, negative;
        int source, qualifier, testingWord;
        bool converts, compares;
    } rows[] = {
        {-1, "auto", 8, true, true, 0, 0, -1, true, true},
        {0, "double", 8, false, true, 0, 0, -10, true, true},
        {1, "single", 4, false, true, 0, 0, -10, true, true},
        {2, "int8", 1, false, true, 0, 0, -10, true, true},
        {3, "uint8", 1, false, false, 0, 0, -10, true, true},
        {4, "int16", 2, false, true, 0, 0, -10, true, true},
        {5, "uint16", 2, false, false, 0, 0, -10, true, true},
        {6, "int32", 4, false, true, 0, 0, -10, true, true},
        {7, "uint32", 4, false, false, 0, 0, -10, true, true},
        {8, "boolean", 1, false, false, 0, 0, -10, true, true},
        {9, "fcn_call", 0, true, true, 1, 1, 9, false, false},
        {10, "integer", 4, true, true, 1, 1, 10, false, false},
        {11, "pointer", 8, true, true, 1, 1, 11, false, false},
        {12, "action", 8, true, true, 1, 1, 12, false, false},
        {13, "timer_uint32_pair", 8, true, true, 1, 1, 13, false, false},
    };
    const DataTypeTable table;
    EXPECT_EQ(table.getNumDataTypes(), 15);
    EXPECT_EQ(GetNumDataTypes(&table), 14);
    EXPECT_EQ(DAGetNumQLDataTypes(), 14);
    EXPECT_EQ(DataTypeTable::getNumBuiltInDataTypes(), 9);
    for (const auto& row : rows) {
        SCOPED_TRACE(row.name);
        const DataType* t = table.getDataTypeAt(static_cast<unsigned long>(row.id + 1));
        EXPECT_EQ(t->getId(), row.id);
        EXPECT_STREQ(t->getName(), row.name);
        EXPECT_EQ(table.getDataTypeId(row.name), row.id);
        EXPECT_EQ(t->getSize(), row.size);
        EXPECT_EQ(t->groundHasNonZeroStoredValue(), row.nonZeroGround);
        EXPECT_EQ(t->canContainNegativeNumbers(), row.negative);
        EXPECT_EQ(t->getDataTypeSource(), row.source);
        EXPECT_EQ(t->getType(), row.qualifier);
        EXPECT_EQ(t->getStorageId(), row.id);
        EXPECT_EQ(t->getIdAliasedToForTesting(), row.testingWord);
        EXPECT_TRUE(t->getIsAliasToLocked());
        EXPECT_FALSE(t->isAtomic()); // kept: the fixed rows say that one-byte types are, and their records do not
        EXPECT_EQ(t->getConvertBetweenFcn() != nullptr, row.converts);
        EXPECT_EQ(t->getIsPositiveFcn() != nullptr, row.compares);
        EXPECT_EQ(t->getIsNegativeFcn() != nullptr, row.compares);
        EXPECT_EQ(t->getGreaterThanFcn() != nullptr, row.compares);
        EXPECT_EQ(t->getGreaterEqualFcn() != nullptr, row.compares);
        EXPECT_EQ(t->getConstructFcn(), nullptr);
        EXPECT_EQ(t->getDestructFcn(), nullptr);
        EXPECT_EQ(t->getDeepCopyFcn(), nullptr);
        EXPECT_EQ(t->getSerializeFcn(), nullptr);
        EXPECT_EQ(t->getDeserializeFcn(), nullptr);
        EXPECT_EQ(t->getSerializeSizeFcn(), nullptr);
        EXPECT_FALSE(t->getConstructedGround());
        EXPECT_EQ(t->getDefaultGround(), row.id != 0 && row.id != 1); // double and single get their ground set
        ASSERT_NE(t->getGround(), nullptr);
        for (int i = 0; i < 2 * row.size; ++i)
            EXPECT_EQ(static_cast<const char*>(t->getGround())[i], 0);
        if (row.id >= 0 && row.id <= 8) {
            ASSERT_EQ(t->getPropertiesSize(), static_cast<int>(sizeof(fxpDataTypeProp)));
            EXPECT_EQ(std::memcmp(t->getProperties(), &FXP::getBuiltInProps(row.id), sizeof(fxpDataTypeProp)), 0);
            EXPECT_EQ(&DataTypeTable::getBuiltinDataTypeProperties(row.id), &FXP::getBuiltInProps(row.id));
            EXPECT_STREQ(DataTypeTable::getNameOfBuiltInDataType(row.id), row.name);
            EXPECT_EQ(DataTypeTable::getBuiltInDataTypeSize(row.id), row.size);
        } else {
            EXPECT_EQ(t->getPropertiesSize(), 0);
            EXPECT_EQ(t->getProperties(), nullptr);
        }
        EXPECT_EQ(DataTypeTable::isPredefinedDataType(row.id), row.id >= 9);
    }
    EXPECT_FALSE(DataTypeTable::isPredefinedDataType(14));
    const DataType* autoType = table.getDataTypeAt(0);
    const DataType* doubleType = table.getDataTypeAt(1);
    EXPECT_EQ(autoType->getIsPositiveFcn(), doubleType->getIsPositiveFcn());
    EXPECT_EQ(autoType->getGreaterEqualFcn(), doubleType->getGreaterEqualFcn());
}

TEST(DataTypeTable, HooksHaveTheirBaseAnswers) {
    DataTypeTable table;
    EXPECT_EQ(table.CreateDTTable(nullptr), nullptr);
    EXPECT_EQ(table.registerBusDataType("Bus", dtSourceBuiltIn, nullptr), -1);
    EXPECT_TRUE(table.shortCircuitRegistration(dtSourceEnum));
    EXPECT_EQ(table.getParameterUnderflowDiagnostic(), 1);
    EXPECT_EQ(table.getParameterOverflowDiagnostic(), 1);
    EXPECT_EQ(table.getParameterPrecisionLossDiagnostic(), 1);
    EXPECT_EQ(table.getFixptConstUnderflowDiagnostic(), 0);
    EXPECT_EQ(table.getFixptConstOverflowDiagnostic(), 0);
    EXPECT_EQ(table.getFixptConstPrecisionLossDiagnostic(), 0);
    EXPECT_EQ(table.getDataOverflowDiagnostic(), 1);
    EXPECT_EQ(table.getDataSaturationDiagnostic(), 1);
    EXPECT_FALSE(table.getUseIntDivNetSlopeOpt());
    EXPECT_EQ(table.getOrdinalValuesFromEnumObject(nullptr), nullptr);
    EXPECT_FALSE(table.isOverriddenObjectName("x"));
    EXPECT_EQ(table.getEnumTypeStringFromValue(14, 0), nullptr);
    EXPECT_EQ(table.getEnumTypeStringFromIndex(14, 0), nullptr);
    table.setSkipForCodeGen(14);
    EXPECT_FALSE(table.getSkipForCodeGen(14));
    EXPECT_FALSE(table.getResolvingDataTypeForOverrideUtils());
    EXPECT_FALSE(table.getObjectOverrideUtils("x"));
    table.addObjectOverrideUtils("x", {});
    table.addOverriddenObject("x", {});
    EXPECT_EQ(table.getDataTypeAccess()->table, &table);
}

TEST(DataTypeTable, AllocationFailureDuringConstructionLeaksNothing) {
    utFailAllocationAt(0);
    { DataTypeTable table; }
    const unsigned long needed = utFailAllocationAt(0);
    ASSERT_GT(needed, 20u);
    unsigned long passed = 0;
    for (unsigned long n = 1; n <= needed; ++n) {
        utFailAllocationAt(n);
        const std::string raised = testsupport::raisedBy([] { DataTypeTable(); });
        EXPECT_TRUE(raised == "Quillane:Services:OutOfMemory()" || raised == "nothing thrown") << n;
        passed += raised == "nothing thrown";
    }
    utFailAllocationAt(0);
    EXPECT_EQ(passed, 1u) << "only the ground of fcn_call, which has no bytes, may be missing";
}

// --- Lookups ---------------------------------------------------------------------------------------------------------

TEST(DataTypeTable, ValidIdentifiers) {
    DataTypeTable table;
    EXPECT_EQ(table.registerDataType("First", dtSourceBuiltIn, nullptr), 14);
    const struct {
        int id;
        bool valid, validNotAuto;
    } rows[] = {{-1, true, false},       {0, true, true},         {14, true, true},
                {15, false, false},      {-2, false, false},      {-10, false, false},
                {INT_MAX, false, false}, {INT_MIN, false, false}, {INT_MAX - 1, false, false}};
    for (const auto& row : rows) {
        SCOPED_TRACE(row.id);
        EXPECT_EQ(table.isDataTypeIdValid(row.id), row.valid);
        EXPECT_EQ(table.isDataTypeIdValid_NotAuto(row.id), row.validNotAuto);
        if (row.valid) {
            EXPECT_TRUE(table.checkDataTypeId(row.id));
        } else {
            EXPECT_RAISES(table.checkDataTypeId(row.id), id("InvalidDataTypeId"), row.id);
            EXPECT_RAISES(table.getDataTypeAliasedThruTo(row.id), id("InvalidDataTypeId"), row.id);
        }
    }
    EXPECT_EQ(table.getDataTypeId(nullptr), -10);
    EXPECT_EQ(table.getDataTypeId("Nothing"), -10);
    EXPECT_EQ(table.getDataTypeIdAliasedTo(-10), -10);
    EXPECT_EQ(table.getDataTypeIdAliasedTo(14), -10);
}

TEST(DataTypeTable, BuiltInNames) {
    const char* const names[] = {"double", "single", "int8", "uint8", "int16", "uint16", "int32", "uint32", "boolean"};
    for (int i = 0; i < 9; ++i) {
        const std::u16string wide(names[i], names[i] + std::strlen(names[i]));
        EXPECT_EQ(DataTypeTable::getBuiltInDataType(names[i]), i);
        EXPECT_EQ(DataTypeTable::getBuiltInDataType(wide), i);
        EXPECT_TRUE(DataTypeTable::nameOfBuiltInDataType(names[i]));
        EXPECT_TRUE(DataTypeTable::nameOfBuiltInDataType(wide));
    }
    for (const char* name : {"auto", "", "Double", "fcn_call", "doubl", "double "})
        EXPECT_EQ(DataTypeTable::getBuiltInDataType(name), -10) << name;
    EXPECT_EQ(DataTypeTable::getBuiltInDataType(static_cast<const char*>(nullptr)), -10);
    EXPECT_FALSE(DataTypeTable::nameOfBuiltInDataType(u"auto"));
    for (const char* name : {"logical", "half", "int64", "uint64"})
        EXPECT_TRUE(DataTypeTable::nameOfPseudoBuiltInDataType(name)) << name;
    EXPECT_TRUE(DataTypeTable::nameOfPseudoBuiltInDataType(u"half"));
    for (const char* name : {"double", "sfix64", "", "Half"})
        EXPECT_FALSE(DataTypeTable::nameOfPseudoBuiltInDataType(name)) << name;
    EXPECT_TRUE(DataTypeTable::isContextSensitiveOrDouble(-1));
    EXPECT_TRUE(DataTypeTable::isContextSensitiveOrDouble(0));
    EXPECT_FALSE(DataTypeTable::isContextSensitiveOrDouble(1));
    for (const int bad : {-1, 9, -10, INT_MAX}) {
        EXPECT_RAISES(DataTypeTable::getNameOfBuiltInDataType(bad), id("InvalidBuiltinDataTypeId"), bad);
        EXPECT_RAISES(DataTypeTable::getBuiltinDataTypeProperties(bad), id("InvalidBuiltinDataTypeId"), bad);
    }
}

TEST(DataTypeTable, NumericQuestions) {
    DataTypeTable table;
    const int fix = table.registerDataType("sfix16_En7", dtSourceFixpt, nullptr);
    const int flt = table.registerDataType("flts16_En7", dtSourceFixpt, nullptr);
    const int plain = table.registerDataType("Plain", dtSourceBuiltIn, nullptr);
    const int fixAlias = table.registerAliasDataType("FixAlias", dtSourceBuiltIn, fix, nullptr);
    const int boolAlias = table.registerAliasDataType("BoolAlias", dtSourceBuiltIn, 8, nullptr);
    const struct {
        int id;
        bool nonBoolean, orBoolean;
    } rows[] = {{-1, true, true},       {0, true, true},         {7, true, true},   {8, false, true},
                {9, false, false},      {fix, true, true},       {flt, true, true}, {plain, false, false},
                {fixAlias, true, true}, {boolAlias, false, true}};
    for (const auto& row : rows) {
        SCOPED_TRACE(row.id);
        EXPECT_EQ(table.IsDataTypeNumericNonBoolean(row.id), row.nonBoolean);
        EXPECT_EQ(table.IsDataTypeNumericOrBoolean(row.id), row.orBoolean);
    }
    EXPECT_RAISES(table.IsDataTypeNumericNonBoolean(-10), id("InvalidDataTypeId"), -10);
    EXPECT_RAISES(table.IsDataTypeNumericOrBoolean(-10), id("InvalidDataTypeId"), -10);
    EXPECT_TRUE(table.IsFixptDTNotScaledDouble(fixAlias));
    EXPECT_FALSE(table.IsFixptDTNotScaledDouble(flt));
    EXPECT_FALSE(table.IsFixptDTNotScaledDouble(0));

    const int wide = table.registerDataType("int64", dtSourceFixpt, nullptr);
    EXPECT_FALSE(table.Is64BitType(wide)) << "no properties yet";
    DataType* record = table.getDataTypeAliasedThruTo(wide);
    fxpDataTypeProp prop = FXP::getBuiltInProps(6);
    prop.WordLength = 64;
    record->setPropertiesSize(sizeof prop);
    record->setProperties(&prop);
    EXPECT_TRUE(table.Is64BitType(wide));
    EXPECT_FALSE(table.Is64BitType(6));
    const std::pair<const char*, void (*)(fxpDataTypeProp&)> others[] = {
        {"Mode", [](fxpDataTypeProp& p) { p.DataTypeMode = FXP_DT_SCALED_DOUBLE; }},
        {"Exponent", [](fxpDataTypeProp& p) { p.FixedExponent = -1; }},
        {"Slope", [](fxpDataTypeProp& p) { p.SlopeAdjustmentFactor = 1.5; }},
        {"Bias", [](fxpDataTypeProp& p) { p.Bias = 1; }},
        {"Width", [](fxpDataTypeProp& p) { p.WordLength = 63; }},
    };
    for (const auto& [name, change] : others) {
        SCOPED_TRACE(name);
        fxpDataTypeProp other = prop;
        change(other);
        const int typeId = table.registerDataType(name, dtSourceFixpt, nullptr);
        DataType* otherRecord = table.getDataTypeAliasedThruTo(typeId);
        otherRecord->setPropertiesSize(sizeof other);
        otherRecord->setProperties(&other);
        EXPECT_FALSE(table.Is64BitType(typeId));
    }
    EXPECT_EQ(table.getDataTypeProperties("caller", wide), record->getProperties());
    EXPECT_RAISES(table.getDataTypeProperties("caller", 99), id("InvalidDataTypeId"), 99);
}

TEST(DataTypeTable, KindsAndLogging) {
    DataTypeTable table;
    const int color = table.registerDataType("Color", dtSourceEnum, nullptr);
    const int alias = table.registerAliasDataType("Colour", dtSourceEnum, color, nullptr);
    const int plain = table.registerDataType("Plain", dtSourceBuiltIn, nullptr);
    table.setDataTypeStorageId(color, 4);
    EXPECT_EQ(table.getDataTypeAt(static_cast<unsigned long>(color + 1))->getType(), dtqEnum);
    EXPECT_TRUE(table.isEnumType(color));
    EXPECT_TRUE(table.isEnumType(alias));
    EXPECT_FALSE(table.isEnumType(plain));
    EXPECT_FALSE(table.isEnumType(-10));
    EXPECT_FALSE(table.isEnumType(-1));
    EXPECT_FALSE(table.IsStringDataType(plain));
    EXPECT_FALSE(table.IsStringDataType(99));
    EXPECT_FALSE(table.IsImplementedAsDynamicMatrixDataType(99));
    EXPECT_FALSE(table.IsImplementedAsDynamicMatrixDataType(plain));
    for (int builtIn = -1; builtIn <= 8; ++builtIn)
        EXPECT_EQ(table.getDataTypeLoggingId(builtIn), builtIn);
    EXPECT_EQ(table.getDataTypeLoggingId(-10), -10);
    EXPECT_EQ(table.getDataTypeLoggingId(9), 0);
    EXPECT_EQ(table.getDataTypeLoggingId(plain), 0);
    EXPECT_EQ(table.getDataTypeLoggingId(color), 4);
    EXPECT_EQ(table.getDataTypeLoggingId(alias), 4);
}

// --- Registration ----------------------------------------------------------------------------------------------------

TEST(DataTypeTable, RegistersAnExistingNameOnce) {
    DataTypeTable table;
    const int first = table.registerDataType("Plain", dtSourceBuiltIn, nullptr);
    EXPECT_EQ(table.registerDataType("Plain", dtSourceBuiltIn, nullptr), first);
    EXPECT_EQ(table.registerDataType("Plain", dtSourceOpaque, nullptr), first);
    EXPECT_RAISES(table.registerDataType("Plain", dtSourceEnum, nullptr), id("DataType_SameNameAsExistingType"),
                  "Plain");
    EXPECT_EQ(table.getNumDataTypes(), 16);
    const int anonymous = table.registerDataType("Anonymous", dtSourceAnonymous, nullptr);
    EXPECT_EQ(table.registerDataType("Anonymous", dtSourceEnum, nullptr), anonymous);
    EXPECT_EQ(table.registerDataType("double", dtSourceBuiltIn, nullptr), 0);
}

TEST(DataTypeTable, RefusesNamesThatAreNoIdentifiers) {
    DataTypeTable table;
    for (const char* name : {"", "1a", "a b", "a.b", "a-b", "\xc3\xa4"})
        EXPECT_RAISES(table.registerDataType(name, dtSourceBuiltIn, nullptr), id("InvalidDataType"), name);
    EXPECT_RAISES(table.registerDataType(nullptr, dtSourceBuiltIn, nullptr), id("InvalidDataType"), "");
    EXPECT_EQ(table.getNumDataTypes(), 15);
    EXPECT_EQ(table.registerDataType("_a1", dtSourceBuiltIn, nullptr), 14);
    EXPECT_EQ(table.registerDataType("while", dtSourceBuiltIn, nullptr), 15) << "a keyword is an identifier too";
}

TEST(DataTypeTable, FixedPointNamesBelongToFixedPoint) {
    DataTypeTable table;
    for (const char* name : {"sfix16_En7", "int64", "half", "flts32", "int7"})
        EXPECT_RAISES(table.registerDataType(name, dtSourceBuiltIn, nullptr), id("DataType_WithIntrinsicFixptName"),
                      name);
    EXPECT_EQ(table.getNumDataTypes(), 15);
    EXPECT_EQ(table.getDataTypeId("sfix16_En7"), -10);
    const int fix = table.registerDataType("sfix16_En7", dtSourceFixpt, nullptr);
    const DataType* record = table.getDataTypeAliasedThruTo(fix);
    EXPECT_EQ(record->getType(), dtqFixpt);
    EXPECT_TRUE(record->getAliasedToLocked());
    EXPECT_THROW(table.registerDataType("sfix8_E99999999999", dtSourceFixpt, nullptr), boost::bad_lexical_cast);
    EXPECT_EQ(table.getNumDataTypes(), 16);
    // The source alone does not make a type fixed point.
    const int plain = table.registerDataType("Plain", dtSourceFixpt, nullptr);
    EXPECT_EQ(table.getDataTypeAliasedThruTo(plain)->getType(), dtqUnspecified);
    EXPECT_FALSE(table.getDataTypeAliasedThruTo(plain)->getAliasedToLocked());
}

TEST(DataTypeTable, AtomicityFollowsTheRecordOfTheWidth) {
    ClientTable table;
    table.fixptAtomicWordLengths_ = {24};
    const auto isAtomic = [&](const char* name) {
        return table.getDataTypeAliasedThruTo(table.registerDataType(name, dtSourceFixpt, nullptr))->isAtomic();
    };
    EXPECT_FALSE(isAtomic("sfix8_En1") || isAtomic("sfix16_En1") || isAtomic("sfix32_En1"));
    EXPECT_TRUE(isAtomic("sfix24_En1"));
    EXPECT_FALSE(isAtomic("sfix25_En1"));
    for (const int builtIn : {2, 4, 6})
        table.getDataTypeAliasedThruTo(builtIn)->setIsAtomic(true);
    EXPECT_TRUE(isAtomic("ufix8_En1") && isAtomic("ufix16_En1") && isAtomic("ufix32_En1"));
    EXPECT_TRUE(isAtomic("int24"));
    EXPECT_FALSE(isAtomic("half")) << "no integer and no fixed-point pattern, though 16 bits wide";
    EXPECT_EQ(DataTypeTable::getFixptDataTypeAtomicityBits("sfix24_En1"), 24);
    DataType notFixpt(99, "sfix8", dtSourceFixpt);
    notFixpt.setIsAtomic(true);
    table.initializeFixptDataTypeAtomicity(&notFixpt, 9);
    EXPECT_TRUE(notFixpt.isAtomic()) << "left alone";
}

TEST(DataTypeTable, TheClientSeesEachRegistrationAndMayVeto) {
    ClientTable table;
    const auto client = table.install();
    const int first = table.registerDataType("First", dtSourceBuiltIn, "model/Gain");
    EXPECT_EQ(client->seen, std::vector<std::string>{"First from model/Gain"});
    table.registerDataType("First", dtSourceBuiltIn, "model/Sum");
    EXPECT_EQ(client->seen.size(), 1u) << "an existing name is no registration";
    table.registerAliasDataType("Alias", dtSourceBuiltIn, first, nullptr);
    EXPECT_EQ(client->seen.back(), "Alias from -");
    client->vetoed = "Vetoed";
    EXPECT_RAISES(table.registerDataType("Vetoed", dtSourceBuiltIn, nullptr), id("DataType_WithIntrinsicFixptName"),
                  "Vetoed");
    EXPECT_RAISES(table.registerAliasDataType("Vetoed", dtSourceBuiltIn, 0, nullptr),
                  id("DataType_WithIntrinsicFixptName"), "Vetoed");
    EXPECT_EQ(table.getDataTypeId("Vetoed"), -10);
    EXPECT_EQ(table.getNumDataTypes(), 17);
    table.resetToBuiltin();
    EXPECT_EQ(client->resets, 1);
}

TEST(DataTypeTable, RegisterDataTypeTakesNoExceptions) {
    DataTypeTable table;
    int typeId = 77;
    EXPECT_EQ(DataTypeTable::RegisterDataType(&table, "block", "Plain", dtSourceBuiltIn, &typeId), nullptr);
    EXPECT_EQ(typeId, 14);
    for (const char* block : {static_cast<const char*>(nullptr), "", "model/Gain"}) {
        typeId = 77;
        qlsvDiagnosticImpl* d = DataTypeTable::RegisterDataType(&table, block, "1x", dtSourceBuiltIn, &typeId);
        EXPECT_EQ(testsupport::describe(d),
                  std::string("QuillaneTypes:general:InvalidDataType('1x')") +
                      (block && *block ? "\nQuillaneTypes:general:DataTypeErrorFromBlock('model/Gain')" : ""));
        EXPECT_EQ(typeId, 77);
        qlsvDiscardDiagnostic(d);
    }
}

TEST(DataTypeTable, AnonymousNamesAreCounted) {
    DataTypeTable table;
    EXPECT_STREQ(table.generateAnonymousTypeName(), "rtt_0");
    EXPECT_STREQ(table.generateAnonymousTypeName(), "rtt_1");
    table.resetToBuiltin();
    EXPECT_STREQ(table.generateAnonymousTypeName(), "rtt_0");
}

// --- Reset and printing ----------------------------------------------------------------------------------------------

TEST(DataTypeTable, ResetRemovesClientTypesAndKeepsMarksOfFixedOnes) {
    ClientTable table;
    table.registerDataType("Plain", dtSourceBuiltIn, nullptr);
    table.insertCustomDataTypeCallback("Custom", [](DataTypeTable*, const char*) { return 3; });
    table.insertCustomDataTypeHeaderFilePair("Custom", "custom.h");
    table.reservedIndex_ = 5;
    DataType* int8 = table.getDataTypeAliasedThruTo(2);
    int8->setCGType(reinterpret_cast<CG::Type*>(8));
    int8->setTargetToHostFcn([](ExternalSim_tag*, void*, const char*, int, int) {});
    int8->setHostToTargetFcn([](ExternalSim_tag*, char*, const void*, int, int) {});
    DtSetDataTypeShortName(&table, 2, "i8");
    const char one = 1;
    int8->setGround(&one);
    table.resetToBuiltin();
    EXPECT_EQ(table.getNumDataTypes(), 15);
    EXPECT_EQ(table.getDataTypeId("Plain"), -10);
    EXPECT_EQ(table.getDataTypeId("timer_uint32_pair"), 13);
    EXPECT_EQ(table.getDataTypeId("auto"), -1);
    EXPECT_FALSE(table.hasCustomDataTypeCallback("Custom"));
    EXPECT_EQ(table.getHeaderFileForCustomType("Custom"), "custom.h");
    EXPECT_EQ(table.reservedIndex_, -1);
    EXPECT_EQ(int8->getCGType(), nullptr);
    EXPECT_EQ(int8->getTargetToHostFcn(), nullptr);
    EXPECT_EQ(int8->getHostToTargetFcn(), nullptr);
    EXPECT_STREQ(int8->getShortName(), "i8");
    EXPECT_FALSE(int8->getDefaultGround());
    EXPECT_EQ(table.registerDataType("Plain", dtSourceEnum, nullptr), 14);
}

TEST(DataTypeTable, Prints) {
    const DataTypeTable table;
    std::ostringstream os;
    os << table;
    const std::string text = os.str();
    EXPECT_EQ(text.rfind("DataTypeTable\nNumber of DataTypes : 15\n\nDataType : 'auto'\nID : -1\nSize : 8\n"
                         "Storage ID : -1\nDataTypeQualifier : 0\n\nDataType : 'double'\n",
                         0),
              0u);
    const std::string end = "DataType : 'timer_uint32_pair'\nID : 13\nSize : 8\nStorage ID : 13\n"
                            "DataTypeQualifier : 1\n\n\n";
    EXPECT_EQ(text.substr(text.size() - end.size()), end);
}

} // namespace
