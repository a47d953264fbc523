#include <cstring>

#include <gtest/gtest.h>

#include "qltypes/fixed_point/BuiltInProps.h"
#include "qltypes/fixed_point/IdentifierString.h"
#include "qltypes/host/FeatureFlags.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "tests/support/Raises.h"

namespace {

using namespace QLTypeSys;

const std::string invalidId = "QuillaneTypes:general:InvalidDataTypeId";

template <class F> F functionAt(std::uintptr_t address) { return reinterpret_cast<F>(address); }

// Expects a returned diagnostic with these lines, and frees it.
void expectDiagnostic(qlsvDiagnosticImpl* d, const std::string& lines) {
    EXPECT_EQ(testsupport::describe(d), lines);
    qlsvDiscardDiagnostic(d);
}

struct FlatTest : testing::Test {
    FlatTest() {
        EXPECT_EQ(DtRegisterDataType(&table, "block", "Plain", dtSourceBuiltIn, &plain), nullptr);
        alias = table.registerAliasDataType("Second", dtSourceBuiltIn, plain, nullptr);
        record = table.getDataTypeAliasedThruTo(plain);
        aliasRecord = table.getDataTypeAt(static_cast<unsigned long>(alias + 1));
    }
    int fixpt(const char* name) {
        const int typeId = table.registerDataType(name, dtSourceFixpt, nullptr);
        DataType* r = table.getDataTypeAliasedThruTo(typeId);
        r->setPropertiesSize(sizeof(fxpDataTypeProp));
        r->setProperties(&identifierStringToFxpDataType(name));
        return typeId;
    }
    DataTypeTable table;
    int plain = 0, alias = 0;
    DataType *record, *aliasRecord;
};

// --- Shapes ----------------------------------------------------------------------------------------------------------

TEST_F(FlatTest, DirectReadsSpeakOfTheRecordItself) {
    record->setSize(4);
    record->setStorageId(5);
    record->setIsPointerType(true);
    EXPECT_EQ(DtGetDataTypeSize(&table, plain), 4);
    EXPECT_EQ(getDataTypeSize(&table, plain), 4);
    EXPECT_EQ(DtGetDataTypeSize(&table, alias), -1) << "the alias's own field";
    EXPECT_EQ(DtGetDataTypeGround(&table, alias), record->getGround()) << "virtual: forwarded";
    EXPECT_EQ(BlockDtGetDataTypeGround(&table, plain), record->getGround());
    EXPECT_EQ(getDataTypeGround(&table, plain), record->getGround());
    EXPECT_EQ(DtGetDataTypeStorageId(&table, alias), 5);
    EXPECT_EQ(BlockDtGetDataTypeStorageId(&table, plain), 5);
    EXPECT_STREQ(DtGetDataTypeName(&table, alias), "Second");
    EXPECT_STREQ(DtGetDataTypeShortName(&table, plain), "Plain");
    DtSetDataTypeShortName(&table, plain, "P");
    EXPECT_STREQ(DtGetDataTypeShortName(&table, plain), "P");
    EXPECT_STREQ(DtGetDataTypeName(&table, plain), "Plain");
    EXPECT_EQ(DtGetDataTypeNameStripDTOPrefix(&table, plain), "Plain");
    EXPECT_TRUE(DtGetDataTypeNeedRegisterIdentifier(&table, plain));
    EXPECT_EQ(DtGetDataTypeInterface(&table, plain), nullptr);
    auto* const cgType = reinterpret_cast<CG::Type*>(8);
    DtSetDataTypeCGType(&table, plain, cgType);
    EXPECT_EQ(DtGetDataTypeCGType(&table, plain), cgType);
    EXPECT_EQ(DtGetDataTypeCGType(&table, alias), nullptr) << "not forwarded";
    EXPECT_TRUE(DtGetIsPointerType(&table, alias));
    DtSetDataTypeGroundHasNonZeroStoredValue(&table, plain, false);
    EXPECT_FALSE(DtGetDataTypeGroundHasNonZeroStoredValue(&table, alias));
}

TEST_F(FlatTest, SettersReadsAndHasByStem) {
#define READ(stem, ARGS)                                                                                               \
    EXPECT_EQ(DtGet##stem##Fcn ARGS(alias), functionAt<stem##Fcn>(8)) << #stem;                                        \
    EXPECT_RAISES(DtGet##stem##Fcn ARGS(99), invalidId, 99);
#define RESOLVED(typeId) (&table, typeId)
#define WITH_CALLER(typeId) (&table, "caller", typeId)
#define PLAIN(stem)                                                                                                    \
    EXPECT_EQ(DtSet##stem##Fcn(&table, plain, functionAt<stem##Fcn>(8)), nullptr);                                     \
    EXPECT_EQ(DtSet##stem##FcnName(&table, plain, #stem), nullptr);                                                    \
    EXPECT_EQ(record->get##stem##Fcn(), functionAt<stem##Fcn>(8));                                                     \
    EXPECT_EQ(record->get##stem##FcnName(), #stem);                                                                    \
    READ(stem, RESOLVED)                                                                                               \
    expectDiagnostic(DtSet##stem##Fcn(&table, alias, nullptr),                                                         \
                     testsupport::raisedBy([&] { aliasRecord->set##stem##Fcn(nullptr); }));                            \
    expectDiagnostic(DtSet##stem##FcnName(&table, alias, ""),                                                          \
                     testsupport::raisedBy([&] { aliasRecord->set##stem##FcnName(""); }));
#define NAME(stem) EXPECT_STREQ(DtGet##stem##FcnName(&table, alias), #stem);
    EXPECT_FALSE(DtHasSerializeFcn(&table, alias));
    PLAIN(Serialize) NAME(Serialize) EXPECT_TRUE(DtHasSerializeFcn(&table, alias));
    PLAIN(Deserialize)
    NAME(Deserialize)
    PLAIN(SerializeSize)
        NAME(SerializeSize) PLAIN(SizeOf) NAME(SizeOf) PLAIN(ContainedData) NAME(ContainedData) PLAIN(ContainedDataDims)
            NAME(ContainedDataDims) PLAIN(UpdateContainedDataDims) NAME(UpdateContainedDataDims)
                PLAIN(UpdateContainedDataDim) PLAIN(CoderProperties) NAME(CoderProperties) PLAIN(DataConstruct)
                    NAME(DataConstruct) EXPECT_EQ(aliasRecord->getUpdateContainedDataDimsFcn(), nullptr)
        << "which the flat function gets right";
#define BLOCK(stem)                                                                                                    \
    EXPECT_EQ(DtSet##stem##Fcn(&table, "block", plain, functionAt<stem##Fcn>(8)), nullptr);                            \
    READ(stem, WITH_CALLER)                                                                                            \
    expectDiagnostic(DtSet##stem##Fcn(&table, "", alias, nullptr),                                                     \
                     "QuillaneTypes:general:CannotSetPropertyOfAliasType('" #stem "', 'Second')");                     \
    expectDiagnostic(DtSet##stem##Fcn(&table, "model/Gain", alias, nullptr),                                           \
                     "QuillaneTypes:general:CannotSetPropertyOfAliasType('" #stem "', 'Second')\n"                     \
                     "Quillane:DataType:BlockDataTypeError('model/Gain')");
#define BLOCK_NAMED(stem)                                                                                              \
    BLOCK(stem)                                                                                                        \
    EXPECT_EQ(DtSet##stem##FcnName(&table, nullptr, plain, #stem), nullptr);                                           \
    EXPECT_STREQ(DtGet##stem##FcnName(&table, "caller", alias), #stem);
    BLOCK_NAMED(Construct)
    BLOCK_NAMED(Destruct)
    BLOCK_NAMED(DeepCopy)
    BLOCK(ConvertBetween)
    BLOCK(IsPositive)
    BLOCK(IsNegative)
    BLOCK(GreaterThan)
    BLOCK(GreaterEqual)
#undef READ
#undef RESOLVED
#undef WITH_CALLER
#undef PLAIN
#undef NAME
#undef BLOCK
#undef BLOCK_NAMED
}

TEST_F(FlatTest, HasIsFunctionOrName){
#define HAS(stem)                                                                                                      \
    {                                                                                                                  \
        SCOPED_TRACE(#stem);                                                                                           \
        const int other = table.registerDataType("For" #stem, dtSourceBuiltIn, nullptr);                               \
        const int named = table.registerDataType("Named" #stem, dtSourceBuiltIn, nullptr);                             \
        EXPECT_FALSE(DtHas##stem##Fcn(&table, other));                                                                 \
        table.getDataTypeAliasedThruTo(other)->set##stem##Fcn(functionAt<stem##Fcn>(8));                               \
        table.getDataTypeAliasedThruTo(named)->set##stem##FcnName("f");                                                \
        EXPECT_TRUE(DtHas##stem##Fcn(&table, other));                                                                  \
        EXPECT_TRUE(DtHas##stem##Fcn(&table, named));                                                                  \
        EXPECT_RAISES(DtHas##stem##Fcn(&table, -10), invalidId, -10);                                                  \
    }
    HAS(Construct) HAS(Destruct) HAS(DeepCopy) HAS(Serialize) HAS(Deserialize) HAS(SerializeSize) HAS(SizeOf)
        HAS(ContainedData) HAS(ContainedDataDims) HAS(DataConstruct) HAS(CoderProperties)
#undef HAS
}

TEST_F(FlatTest, RemainingSetters) {
    EXPECT_EQ(DtSetContainedDataType(&table, plain, 3), nullptr);
    EXPECT_EQ(DtSetContainedDataNumDims(&table, plain, 2), nullptr);
    EXPECT_EQ(DtSetIsPointerType(&table, plain, true), nullptr);
    EXPECT_EQ(DtGetContainedDataType(&table, alias), 3);
    EXPECT_EQ(DtGetContainedDataNumDims(&table, alias), 2u);
    EXPECT_RAISES(DtGetContainedDataType(&table, 99), invalidId, 99);
    EXPECT_EQ(DtSetDataTypeSize(&table, "block", plain, 4), nullptr);
    EXPECT_EQ(DtSetDataTypeGround(&table, "block", plain, "abcd"), nullptr);
    EXPECT_EQ(DtSetDataTypePropertiesSize(&table, "block", plain, 2), nullptr);
    EXPECT_EQ(DtSetDataTypeProperties(&table, "block", plain, "ef"), nullptr);
    EXPECT_EQ(DtGetDataTypePropertiesSize(&table, alias), 2);
    EXPECT_EQ(DtGetDataTypeProperties(&table, "caller", alias), record->getProperties());
    EXPECT_EQ(BlockDtGetDataTypeProperties(&table, "caller", alias), record->getProperties());
    EXPECT_EQ(DtSetDataTypeStorageId(&table, "block", plain, 6), nullptr);
    const std::string block = "\nQuillane:DataType:BlockDataTypeError('block')";
    expectDiagnostic(DtSetDataTypeStorageId(&table, "block", plain, 7),
                     "QuillaneTypes:general:InconsistentDataTypeStorageId('Plain', 'uint32', 'int32')" + block);
    expectDiagnostic(DtSetDataTypeGround(&table, "block", plain, "abcx"),
                     "QuillaneTypes:general:CannotModifyDataTypeGroundRepresentation('Plain')" + block);
    expectDiagnostic(DtSetDataTypeProperties(&table, "block", plain, "eg"),
                     "QuillaneTypes:general:CannotModifyDataTypeProperties('Plain')" + block);
    expectDiagnostic(DtSetDataTypePropertiesSize(&table, "block", plain, 3),
                     "QuillaneTypes:general:CannotModifyDataTypePropertiesSize('Plain', 2, 3)" + block);
}

TEST_F(FlatTest, AnIllegalSizeNamesTheBlockWhenThereIsOne) {
    expectDiagnostic(DtSetDataTypeSize(&table, "", plain, 0), "QuillaneTypes:general:InvalidDataTypeSize('Plain', 0)");
    expectDiagnostic(DtSetDataTypeSize(&table, nullptr, plain, 0),
                     "QuillaneTypes:general:InvalidDataTypeSize('Plain', 0)");
    expectDiagnostic(DtSetDataTypeSize(&table, "model/Gain", plain, 0),
                     "QuillaneTypes:general:InvalidDataTypeSize('Plain', 0)\n"
                     "Quillane:DataType:BlockDataTypeError('model/Gain')");
    expectDiagnostic(table.setDataTypeSize(plain, -1), "QuillaneTypes:general:InvalidDataTypeSize('Plain', -1)");
    EXPECT_EQ(table.setDataTypeSize(plain, 4), nullptr);
}

TEST_F(FlatTest, Forwards) {
    EXPECT_EQ(DtGetDataTypeId(&table, "Second"), alias);
    EXPECT_EQ(DtGetDataTypeId(&table, nullptr), -10);
    int other = 77;
    expectDiagnostic(DtRegisterDataType(&table, "model/Gain", "sfix8", dtSourceBuiltIn, &other),
                     "QuillaneTypes:general:DataType_WithIntrinsicFixptName('sfix8')\n"
                     "QuillaneTypes:general:DataTypeErrorFromBlock('model/Gain')");
    EXPECT_EQ(other, 77);
    EXPECT_TRUE(DtIsDataTypeIdValid(&table, alias));
    EXPECT_FALSE(DtIsDataTypeIdValid(&table, 99));
    EXPECT_EQ(DtGetDataTypeIdAliasedTo(&table, alias), plain);
    EXPECT_FALSE(DtIsEnumType(&table, alias));
    EXPECT_TRUE(DtIsFixptDTNotScaledDouble(&table, fixpt("sfix8_E1")));
    EXPECT_FALSE(DataTypeNumericNonBoolean(&table, 8));
    EXPECT_TRUE(DataTypeNumericOrBoolean(&table, 8));
    const double one = 1.0;
    EXPECT_TRUE(DtCheckIfNonZeroArray(&table, &one, 1, 0, false));
    EXPECT_FALSE(DtIsImplementedAsDynamicMatrixType(&table, plain));
    EXPECT_TRUE(IsPredefinedDataType(13));
    EXPECT_FALSE(IsPredefinedDataType(14));
    EXPECT_TRUE(IntrinsicFixptName("int64"));
    EXPECT_FALSE(IntrinsicFixptName("int8"));
    EXPECT_EQ(GetBuiltInDataType("int8"), 2);
    EXPECT_EQ(GetBuiltInDataType(u"int8"), 2);
    EXPECT_TRUE(NameOfBuiltInDataType("int8"));
    EXPECT_FALSE(NameOfBuiltInDataType(u"int9"));
    EXPECT_EQ(qlGetBuiltInDataTypeSize(4), 2);
    EXPECT_EQ(DtGetEnumTypeStringFromValue(&table, plain, 0), nullptr);
    EXPECT_EQ(GetNumDataTypes(&table), plain + 3);
    const int late = table.registerDataType("Late", dtSourceBuiltIn, nullptr);
    SetDataTypeIdAliasedTo(&table, late, plain);
    EXPECT_EQ(DtGetDataTypeIdAliasedThruTo(&table, late), plain);
    EXPECT_RAISES(SetDataTypeIdAliasedTo(&table, plain, late), "QuillaneTypes:general:DataTypeAliasLoop", "Plain",
                  "Late");
}

TEST_F(FlatTest, NoNameIsTheEmptyName) {
    record->setSerializeFcnName("serialize");
    EXPECT_EQ(DtSetSerializeFcnName(&table, plain, nullptr), nullptr);
    EXPECT_STREQ(DtGetSerializeFcnName(&table, plain), "");
    EXPECT_EQ(DtSetConstructFcnName(&table, "block", plain, nullptr), nullptr);
    EXPECT_STREQ(DtGetConstructFcnName(&table, "caller", plain), "");
    EXPECT_FALSE(DtHasConstructFcn(&table, plain));
    expectDiagnostic(DtSetConstructFcnName(&table, "", alias, nullptr),
                     "QuillaneTypes:general:CannotSetPropertyOfAliasType('ConstructName', 'Second')");
    DtSetDataTypeShortName(&table, plain, nullptr);
    EXPECT_STREQ(DtGetDataTypeShortName(&table, plain), "");
    EXPECT_EQ(DtGetOrRegisterKnownCustomDataTypeId(&table, nullptr), -10);
    EXPECT_FALSE(IntrinsicFixptName(nullptr));
    EXPECT_EQ(GetBuiltInDataType(static_cast<const char*>(nullptr)), -10);
    EXPECT_FALSE(NameOfBuiltInDataType(static_cast<const char*>(nullptr)));
}

TEST_F(FlatTest, FieldsOfTheTable) {
    _qlDataTypeAccess_tag own{};
    _qlDataTypeAccess_tag* const before = DtGetDataTypeAccess(&table);
    EXPECT_EQ(before->table, &table);
    DtSetDataTypeAccess(&table, &own);
    EXPECT_EQ(DtGetDataTypeAccess(&table), &own);
    DtSetDataTypeAccess(&table, before);
    auto* const queue = reinterpret_cast<qlsvDiagnosticImpl*>(8);
    EXPECT_EQ(DtGetDTAErrorQueue(&table), nullptr);
    DtSetDTAErrorQueue(&table, queue);
    EXPECT_EQ(DtGetDTAErrorQueue(&table), queue);
    DtSetDTAErrorQueue(&table, nullptr);
}

// --- Classifiers -----------------------------------------------------------------------------------------------------

TEST_F(FlatTest, BuiltInIdentifiers) {
    for (int typeId = -12; typeId <= 20; ++typeId) {
        const bool expected = typeId >= -1 && typeId <= 8;
        EXPECT_EQ(DtCheckForBuiltInDataType(typeId), expected) << typeId;
        EXPECT_EQ(BlockCheckForBuiltInDataType(typeId), expected) << typeId;
        EXPECT_EQ(CheckForBuiltInDataType(typeId), expected) << typeId;
    }
}

TEST_F(FlatTest, Classifiers) {
    const int bit = fixpt("ufix1");
    const int bitAlias = table.registerAliasDataType("Bit", dtSourceBuiltIn, bit, nullptr);
    const int boolAlias = table.registerAliasDataType("Bool", dtSourceBuiltIn, 8, nullptr);
    const int scaledBit = fixpt("ufix1_E1");
    EXPECT_FALSE(DtHasHalfPrecisionDataType(&table));
    const int half = fixpt("half");
    const int halfAlias = table.registerAliasDataType("Half", dtSourceBuiltIn, half, nullptr);
    const int anonymous = table.registerDataType("Anonymous", dtSourceAnonymous, nullptr);
    EXPECT_TRUE(DtHasHalfPrecisionDataType(&table));

    EXPECT_TRUE(DtIsAliasType(&table, alias));
    EXPECT_FALSE(DtIsAliasType(&table, plain));
    EXPECT_FALSE(DtIsAliasType(&table, 99));
    EXPECT_FALSE(DtIsStructType(&table, -1));
    EXPECT_FALSE(DtIsStructType(&table, plain));
    record->setType(dtqStruct);
    EXPECT_TRUE(DtIsStructType(&table, alias));
    EXPECT_RAISES(DtIsStructType(&table, 99), invalidId, 99);
    EXPECT_TRUE(DtIsAnonymousStructType(&table, anonymous));
    EXPECT_FALSE(DtIsAnonymousStructType(&table, plain));
    EXPECT_TRUE(DtIsFixptDT(&table, bitAlias));
    EXPECT_FALSE(DtIsFixptDT(&table, 0));
    EXPECT_RAISES(DtIsFixptDT(&table, 99), invalidId, 99);
    EXPECT_TRUE(DtIsHalfPrecisionType(&table, halfAlias));
    EXPECT_FALSE(DtIsHalfPrecisionType(&table, bit));
    EXPECT_FALSE(DtIsHalfPrecisionType(&table, 99));
    EXPECT_FALSE(DtIsDynamicMatrixType(&table, 99) || DtIsDynamicMatrixType(&table, plain));
    EXPECT_FALSE(DtIsImageType(&table, 99) || DtIsImageType(&table, plain));
    EXPECT_TRUE(DtIsIntDtype(&table, 2) && !DtIsIntDtype(&table, 8));
    EXPECT_TRUE(DtIsUnsignedIntDtype(&table, 3) && !DtIsUnsignedIntDtype(&table, 2));
    EXPECT_TRUE(DtIsSignedIntDtype(&table, 2) && !DtIsSignedIntDtype(&table, 3));
    EXPECT_TRUE(DtIsFloatDtype(&table, 1) && !DtIsFloatDtype(&table, half));
    EXPECT_TRUE(DtIsSignedFixptDT(&table, 2) && !DtIsSignedFixptDT(&table, bit));
    EXPECT_TRUE(DtCanContainNegativeNumbers(&table, 0) && !DtCanContainNegativeNumbers(&table, 3));
    EXPECT_TRUE(DtIsBuiltInOrCustomFloat(&table, 0) && DtIsBuiltInOrCustomFloat(&table, halfAlias));
    EXPECT_FALSE(DtIsBuiltInOrCustomFloat(&table, 2));
    EXPECT_FALSE(DtIsAtomic(&table, -1) || DtIsAtomic(&table, alias));
    record->setIsAtomic(true);
    EXPECT_TRUE(DtIsAtomic(&table, alias));
    EXPECT_RAISES(DtIsAtomic(&table, 99), invalidId, 99);

    EXPECT_TRUE(DtIsUFix1(&table, bitAlias));
    EXPECT_FALSE(DtIsUFix1(&table, scaledBit) || DtIsUFix1(&table, 8) || DtIsUFix1(&table, half));
    for (const char* name : {"ufix2", "sfix2", "ufix1_S1p5", "ufix1_B1"})
        EXPECT_FALSE(DtIsUFix1(&table, fixpt(name))) << name;
    EXPECT_FALSE(DtIsUFix1(&table, table.registerDataType("ufix1_B2", dtSourceFixpt, nullptr))) << "no properties yet";
    EXPECT_TRUE(DtIsBooleanOrUFix1(&table, bitAlias) && DtIsBooleanOrUFix1(&table, boolAlias));
    EXPECT_FALSE(DtIsBooleanOrUFix1(&table, scaledBit));
    EXPECT_TRUE(DtIsBuiltInOrUFix1(&table, bitAlias) && DtIsBuiltInOrUFix1(&table, boolAlias));
    EXPECT_FALSE(DtIsBuiltInOrUFix1(&table, scaledBit));
}

// --- Derived questions -----------------------------------------------------------------------------------------------

TEST_F(FlatTest, Construction) {
    EXPECT_FALSE(DtHasDefaultConstructFcnOnly(&table, plain));
    EXPECT_FALSE(DtNeedCustomInitialization(&table, plain));
    record->setConstructFcnName("construct");
    EXPECT_TRUE(DtHasDefaultConstructFcnOnly(&table, alias));
    EXPECT_TRUE(DtNeedCustomInitialization(&table, alias));
    record->setDataConstructFcnName("dataConstruct");
    EXPECT_FALSE(DtHasDefaultConstructFcnOnly(&table, alias));
}

TEST_F(FlatTest, Pooling) {
    const int color = table.registerDataType("Color", dtSourceEnum, nullptr);
    const int colour = table.registerAliasDataType("Colour", dtSourceEnum, color, nullptr);
    table.setDataTypeStorageId(color, 4);
    table.setDataTypeStorageId(plain, 6);
    EXPECT_EQ(DtGetDataTypeIdForPooling(&table, -1), -1);
    EXPECT_EQ(DtGetDataTypeIdForPooling(&table, 5), 5);
    EXPECT_EQ(DtGetDataTypeIdForPooling(&table, colour), color);
    EXPECT_EQ(DtGetDataTypeIdForPooling(&table, alias), 6);
}

TEST_F(FlatTest, AliasedThru) {
    for (const auto f : {DtGetDataTypeIdAliasedThruTo, getDataTypeIdAliasedThruTo}) {
        EXPECT_EQ(f(&table, -10), -10);
        EXPECT_EQ(f(&table, alias), plain);
        EXPECT_EQ(f(&table, 3), 3);
    }
}

TEST_F(FlatTest, ContainedData) {
    record->setContainedDataFcn([](void* p) { return static_cast<void*>(static_cast<char*>(p) + 1); });
    record->setContainedDataDimsFcn([](const void*, unsigned long* dims) { dims[0] = 3, dims[1] = 4; });
    char value[2];
    EXPECT_EQ(DtGetContainedData(&table, alias, value), value + 1);
    record->setContainedDataNumDims(2);
    EXPECT_EQ(DtGetContainedWidth(&table, alias, value), 12u);
    const int scalar = table.registerDataType("Scalar", dtSourceBuiltIn, nullptr);
    table.getDataTypeAliasedThruTo(scalar)->setContainedDataDimsFcn([](const void*, unsigned long*) {});
    EXPECT_EQ(DtGetContainedWidth(&table, scalar, value), 1u);
}

TEST_F(FlatTest, KnownCustomTypesRegisterThemselves) {
    EXPECT_EQ(DtGetOrRegisterKnownCustomDataTypeId(&table, "Custom"), -10);
    table.insertCustomDataTypeCallback("Custom", [](DataTypeTable* t, const char* name) {
        return t->registerDataType(name, dtSourceOpaque, nullptr);
    });
    const int custom = DtGetOrRegisterKnownCustomDataTypeId(&table, "Custom");
    EXPECT_EQ(DtGetDataTypeId(&table, "Custom"), custom);
    EXPECT_EQ(DtGetOrRegisterKnownCustomDataTypeId(&table, "Custom"), custom);
}

TEST_F(FlatTest, Dependencies) {
    std::vector<unsigned int> ids = {1, 2, 3};
    DtGetDataTypeDependenciesVector(&table, alias, ids);
    EXPECT_EQ(ids, std::vector<unsigned int>{static_cast<unsigned int>(plain)});
    DtGetDataTypeDependenciesVector(&table, plain, ids);
    EXPECT_TRUE(ids.empty());
}

TEST_F(FlatTest, EffectiveTypesFollowTheFeature) {
    record->setContainedDataType(3);
    record->setContainedDataFcnName("data");
    EXPECT_EQ(DtGetEffectiveDataType(&table, alias), alias);
    EXPECT_EQ(DtGetEffectiveAliasedThruDataType(&table, alias), plain);
    EXPECT_FALSE(DtIsOpaqueMatrix(&table, alias));
    QLFEAT_EnableEffectiveDataType->setState(1);
    EXPECT_EQ(DtGetEffectiveDataType(&table, alias), 3);
    EXPECT_EQ(DtGetEffectiveAliasedThruDataType(&table, alias), 3);
    EXPECT_TRUE(DtIsOpaqueMatrix(&table, alias));
    EXPECT_FALSE(DtIsOpaqueMatrix(&table, 99));
    EXPECT_FALSE(DtIsOpaqueMatrix(&table, 0));
    EXPECT_EQ(DtGetEffectiveDataType(&table, 0), 0) << "nothing contained";
    record->setContainedDataType(-1);
    EXPECT_EQ(DtGetEffectiveDataType(&table, alias), alias);
    QLFEAT_EnableEffectiveDataType->setState(0);
}

// --- Checks ----------------------------------------------------------------------------------------------------------

TEST_F(FlatTest, Checks) {
    EXPECT_EQ(DtCheckDataTypeId(&table, "block", plain), nullptr);
    expectDiagnostic(DtCheckDataTypeId(&table, "", 99), "QuillaneTypes:general:InvalidDataTypeId(99)");
    expectDiagnostic(DtCheckDataTypeId(&table, "block", 99),
                     "QuillaneTypes:general:InvalidDataTypeId(99)\nQuillane:DataType:BlockDataTypeError('block')");
    const DataTypeTable fresh;
    EXPECT_EQ(DtCheckForInvalidDataTypeSize(&fresh), nullptr);
    expectDiagnostic(DtCheckForInvalidDataTypeSize(&table), "Quillane:DataType:DataTypeSizeHasNotBeenSet('Plain')");
    int size = 77;
    expectDiagnostic(DtGetDataTypeSizeWithCheck(&table, plain, &size),
                     "Quillane:DataType:DataTypeSizeHasNotBeenSet('Plain')");
    EXPECT_EQ(size, -1);
    record->setSize(4);
    EXPECT_EQ(DtCheckForInvalidDataTypeSize(&table), nullptr) << "aliases are passed over";
    EXPECT_EQ(DtGetDataTypeSizeWithCheck(&table, plain, &size), nullptr);
    EXPECT_EQ(size, 4);
}

std::vector<int> asked;

TEST_F(FlatTest, TypesTooWideForATarget) {
    _qlDataTypeAccess_tag* access = DtGetDataTypeAccess(&table);
    access->getFxpDataTypeProp = [](DataTypeTable* t, const char* caller, int typeId, int number) {
        EXPECT_STREQ(caller, "");
        EXPECT_EQ(number, 2);
        asked.push_back(typeId);
        return static_cast<const fxpDataTypeProp*>(t->getDataTypeProperties(caller, typeId));
    };
    const int wide = fixpt("sfix40_E1");
    table.registerAliasDataType("Wide", dtSourceBuiltIn, wide, nullptr);
    asked.clear();
    EXPECT_FALSE(DtTableHasInvalidDataTypeSize(&table, 40));
    EXPECT_EQ(asked, (std::vector<int>{2, 3, 4, 5, 6, 7, wide, wide}))
        << "floats, boolean and plain types are not asked";
    EXPECT_TRUE(DtTableHasInvalidDataTypeSize(&table, 39));
    asked.clear();
    EXPECT_TRUE(DtTableHasInvalidDataTypeSize(&table, 15));
    EXPECT_EQ(asked, (std::vector<int>{2, 3, 4})) << "the first that is too wide ends the walk";
}

} // namespace
