#include <cmath>
#include <cstring>
#include <sstream>

#include <gtest/gtest.h>

#include "qlplatform/memory/Memory.h"
#include "qltypes/fixed_point/BuiltInProps.h"
#include "qltypes/types/BuiltInDataType.h"
#include "qltypes/types/DataType.h"
#include "tests/support/Raises.h"

namespace {

using namespace QLTypeSys;

constexpr const char* general = "QuillaneTypes:general:";
std::string id(const char* leaf) { return std::string(general) + leaf; }

// A pointer of the function's type that no code calls.
template <class F> F functionAt(std::uintptr_t address) { return reinterpret_cast<F>(address); }

// A record that says that it is an alias without overriding the setters: the base class refuses by itself.
struct SaysItIsAnAlias : DataType {
    SaysItIsAnAlias() : DataType(20, "Second", dtSourceBuiltIn) {}
    int getIdAliasedTo() const override { return 14; }
};

TEST(DataType, IsBornUnset) {
    const DataType t(14, "Plain", dtSourceOpaque);
    EXPECT_EQ(t.getId(), 14);
    EXPECT_STREQ(t.getName(), "Plain");
    EXPECT_STREQ(t.getShortName(), "Plain");
    EXPECT_EQ(t.getDataTypeSource(), dtSourceOpaque);
    EXPECT_EQ(t.getSize(), -1);
    EXPECT_EQ(t.getStorageId(), 14);
    EXPECT_EQ(t.getIdAliasedToForTesting(), -10);
    EXPECT_EQ(t.getIdAliasedTo(), -10);
    EXPECT_EQ(t.getIdAliasedThruTo(), 14);
    EXPECT_EQ(t.getGround(), nullptr);
    EXPECT_FALSE(t.getDefaultGround());
    EXPECT_FALSE(t.getConstructedGround());
    EXPECT_EQ(t.getProperties(), nullptr);
    EXPECT_EQ(t.getPropertiesSize(), 0);
    EXPECT_EQ(t.getCGType(), nullptr);
    EXPECT_EQ(t.getInterface(), nullptr);
    EXPECT_EQ(t.getContainedDataType(), -10);
    EXPECT_EQ(t.getContainedDataNumDims(), 0u);
    EXPECT_EQ(t.getType(), dtqUnspecified);
    EXPECT_FALSE(t.getAliasedToLocked());
    EXPECT_FALSE(t.getIsAliasToLocked());
    EXPECT_FALSE(t.getIsPointerType());
    EXPECT_EQ(t.getTargetSize(), 0);
    EXPECT_FALSE(t.isAtomic());
    EXPECT_TRUE(t.groundHasNonZeroStoredValue());
    EXPECT_TRUE(t.getNeedRegisterIdentifier());
    EXPECT_FALSE(t.getIsValidFixptType());
    EXPECT_TRUE(t.canContainNegativeNumbers());
    EXPECT_TRUE(t.getPlainCopy() && t.getPlainConstruct() && t.getPlainDestroy());
    EXPECT_FALSE(t.getVisitFlag());
    EXPECT_TRUE(t.dependsOn().empty());
    EXPECT_FALSE(t.isImage() || t.isDynamicMatrix());
    for (int i = 0; i < 4; ++i)
        EXPECT_EQ(t.getChecksumElements()[i], 0u);
}

// --- Setter families -------------------------------------------------------------------------------------------------

TEST(DataType, FunctionSettersStoreAndLock){
#define NAMED_STEM(stem, literal, nameLiteral, forwards)                                                               \
    {                                                                                                                  \
        SCOPED_TRACE(#stem);                                                                                           \
        DataType t(14, "Plain", dtSourceBuiltIn);                                                                      \
        EXPECT_EQ(t.get##stem##Fcn(), nullptr);                                                                        \
        EXPECT_EQ(t.get##stem##FcnName(), "");                                                                         \
        t.set##stem##Fcn(functionAt<stem##Fcn>(8));                                                                    \
        EXPECT_EQ(t.get##stem##Fcn(), functionAt<stem##Fcn>(8));                                                       \
        EXPECT_TRUE(t.getAliasedToLocked());                                                                           \
        t.set##stem##Fcn(functionAt<stem##Fcn>(16));                                                                   \
        EXPECT_EQ(t.get##stem##Fcn(), functionAt<stem##Fcn>(16)) << "replaceable";                                     \
        t.setAliasedToLocked(false);                                                                                   \
        t.set##stem##FcnName("f");                                                                                     \
        t.set##stem##FcnName("g");                                                                                     \
        EXPECT_EQ(t.get##stem##FcnName(), "g");                                                                        \
        EXPECT_TRUE(t.getAliasedToLocked());                                                                           \
    }
#define STEM(stem, literal)                                                                                            \
    {                                                                                                                  \
        SCOPED_TRACE(#stem);                                                                                           \
        DataType t(14, "Plain", dtSourceBuiltIn);                                                                      \
        EXPECT_EQ(t.get##stem##Fcn(), nullptr);                                                                        \
        t.set##stem##Fcn(functionAt<stem##Fcn>(8));                                                                    \
        EXPECT_EQ(t.get##stem##Fcn(), functionAt<stem##Fcn>(8));                                                       \
        EXPECT_TRUE(t.getAliasedToLocked());                                                                           \
        t.setAliasedToLocked(false);                                                                                   \
        t.set##stem##Fcn(functionAt<stem##Fcn>(8));                                                                    \
        EXPECT_FALSE(t.getAliasedToLocked()) << "the same function is no write";                                       \
        EXPECT_RAISES(t.set##stem##Fcn(functionAt<stem##Fcn>(16)), id("InconsistentDataTypeFcn"), literal, "Plain");   \
        EXPECT_RAISES(t.set##stem##Fcn(nullptr), id("InconsistentDataTypeFcn"), literal, "Plain");                     \
        EXPECT_EQ(t.get##stem##Fcn(), functionAt<stem##Fcn>(8));                                                       \
    }
#include "tests/types/PropertyStems.def"
}

TEST(DataType, ARecordThatSaysItIsAnAliasRefuses) {
    SaysItIsAnAlias t;
    const std::string refused = id("CannotSetPropertyOfAliasType");
#define NAMED_STEM(stem, literal, nameLiteral, forwards)                                                               \
    EXPECT_RAISES(t.set##stem##Fcn(functionAt<stem##Fcn>(8)), refused, literal, "Second");                             \
    EXPECT_RAISES(t.set##stem##FcnName("f"), refused, nameLiteral, "Second");
#define STEM(stem, literal) EXPECT_RAISES(t.set##stem##Fcn(functionAt<stem##Fcn>(8)), refused, literal, "Second");
#include "tests/types/PropertyStems.def"
    EXPECT_RAISES(t.setContainedDataType(3), refused, "ContainedDataTypeName", "Second"); // not the alias's own literal
    EXPECT_RAISES(t.setContainedDataNumDims(3), refused, "ContainedDataNumDims", "Second");
    EXPECT_RAISES(t.setGround(""), refused, "Ground", "Second");
    EXPECT_RAISES(t.setProperties(""), refused, "Properties", "Second");
    EXPECT_RAISES(t.setPropertiesSize(-3), refused, "PropertiesSize", "Second");
    // These have no such test.
    t.setSize(4);
    t.setStorageId(3);
    t.setIsAtomic(true);
    t.setGroundHasNonZeroStoredValue(false);
    t.setTargetToHostFcn(functionAt<TargetToHostFcn>(8));
    EXPECT_EQ(t.getSize(), 4);
    EXPECT_EQ(t.getStorageId(), 3);
}

TEST(DataType, PlainFlagsFollowTheFunctions) {
    const auto flagsAfter = [](auto set) {
        DataType t(14, "Plain", dtSourceBuiltIn);
        set(t);
        return std::string(t.getPlainCopy() ? "c" : "-") + (t.getPlainConstruct() ? "n" : "-") +
               (t.getPlainDestroy() ? "d" : "-");
    };
#define CUSTOM(stem) EXPECT_EQ(flagsAfter([](DataType& t) { t.set##stem##Fcn(nullptr); }), "-nd") << #stem;
    CUSTOM(DeepCopy)
    CUSTOM(Serialize)
    CUSTOM(Deserialize)
    CUSTOM(SerializeSize)
    CUSTOM(SizeOf)
    CUSTOM(ContainedData)
    CUSTOM(ContainedDataDims)
    CUSTOM(UpdateContainedDataDims)
    CUSTOM(UpdateContainedDataDim)
    CUSTOM(DataConstruct)
#undef CUSTOM
    EXPECT_EQ(flagsAfter([](DataType& t) { t.setConstructFcn(nullptr); }), "c-d");
    EXPECT_EQ(flagsAfter([](DataType& t) { t.setDestructFcn(nullptr); }), "cn-");
    EXPECT_EQ(flagsAfter([](DataType& t) { t.setCoderPropertiesFcn(nullptr); }), "cnd");
    EXPECT_EQ(flagsAfter([](DataType& t) { t.setDeepCopyFcnName("f"); }), "cnd");
    EXPECT_EQ(flagsAfter([](DataType& t) { t.setIsPositiveFcn(functionAt<IsPositiveFcn>(8)); }), "cnd");
}

TEST(DataType, ContainedDataIsReplaceable) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    t.setContainedDataType(3);
    EXPECT_TRUE(t.getAliasedToLocked());
    t.setContainedDataType(4);
    EXPECT_EQ(t.containedDataType(), 4);
    t.setAliasedToLocked(false);
    t.setContainedDataNumDims(2);
    EXPECT_TRUE(t.getAliasedToLocked());
    EXPECT_EQ(t.containedDataNumDims(), 2u);
}

TEST(DataType, TheTargetPairRaisesOneIdentifierAndDoesNotLock) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    t.setTargetToHostFcn(nullptr);
    t.setTargetToHostFcn(functionAt<TargetToHostFcn>(8));
    t.setTargetToHostFcn(functionAt<TargetToHostFcn>(8));
    EXPECT_RAISES(t.setTargetToHostFcn(functionAt<TargetToHostFcn>(16)), id("InConsistentTargetToHostFcn"));
    EXPECT_EQ(t.getTargetToHostFcn(), functionAt<TargetToHostFcn>(8));
    t.setHostToTargetFcn(functionAt<HostToTargetFcn>(8));
    t.setHostToTargetFcn(functionAt<HostToTargetFcn>(8));
    // There is no identifier for the other direction.
    EXPECT_RAISES(t.setHostToTargetFcn(functionAt<HostToTargetFcn>(16)), id("InConsistentTargetToHostFcn"));
    EXPECT_EQ(t.getHostToTargetFcn(), functionAt<HostToTargetFcn>(8));
    EXPECT_FALSE(t.getAliasedToLocked());
}

TEST(DataType, UncheckedSettersStore) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    t.setIsValidFixptType(true);
    t.setTargetSize(3);
    t.setStorageId(5);
    t.setIdAliasedToForTesting(3);
    t.setDefaultGround(true);
    t.setIsAtomic(true);
    t.setGroundHasNonZeroStoredValue(false);
    t.setCanContainNegativeNumbers(false);
    auto* const cgType = reinterpret_cast<CG::Type*>(8);
    t.setCGType(cgType);
    t.setIsPointerType(true);
    t.setType(dtqImage);
    static_cast<const DataType&>(t).setVisitFlag(true);
    EXPECT_TRUE(t.getIsValidFixptType());
    EXPECT_EQ(t.getTargetSize(), 3);
    EXPECT_EQ(t.getStorageId(), 5);
    EXPECT_EQ(t.getIdAliasedToForTesting(), 3);
    EXPECT_EQ(t.getIdAliasedTo(), -10) << "the word for tests says nothing about aliasing";
    EXPECT_TRUE(t.getDefaultGround());
    EXPECT_TRUE(t.isAtomic());
    EXPECT_FALSE(t.groundHasNonZeroStoredValue());
    EXPECT_FALSE(t.canContainNegativeNumbers());
    EXPECT_EQ(t.getCGType(), cgType);
    EXPECT_TRUE(t.getIsPointerType());
    EXPECT_TRUE(t.getIsType(dtqImage));
    EXPECT_TRUE(t.getVisitFlag());
    EXPECT_FALSE(t.getAliasedToLocked());
    t.setIsAliasToLocked(true); // a second name for the same field
    EXPECT_TRUE(t.getAliasedToLocked());
    const unsigned int words[4] = {1, 2, 3, 4};
    t.setChecksumElements(words);
    EXPECT_EQ(std::memcmp(t.getChecksumElements(), words, sizeof words), 0);
}

// --- Size ------------------------------------------------------------------------------------------------------------

TEST(DataType, SizeIsSetOnce) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    t.setSize(8);
    EXPECT_EQ(t.getSize(), 8);
    EXPECT_TRUE(t.getAliasedToLocked());
    EXPECT_TRUE(t.getDefaultGround());
    const unsigned char zeros[16] = {};
    EXPECT_EQ(std::memcmp(t.getGround(), zeros, 16), 0);
    EXPECT_RAISES(t.setSize(4), id("CannotModifyDataTypeSize"), "Plain", 8);
    EXPECT_RAISES(t.setSize(0), id("CannotModifyDataTypeSize"), "Plain", 8);
    EXPECT_EQ(t.getSize(), 8);
}

TEST(DataType, TheSameSizeMarksTheGroundAsDefaultAgain) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    t.setSize(8);
    const double ground = 1.5;
    t.setGround(&ground);
    EXPECT_FALSE(t.getDefaultGround());
    const void* before = t.getGround();
    t.setSize(8);
    EXPECT_TRUE(t.getDefaultGround()); // although the bytes stay
    EXPECT_EQ(t.getGround(), before);
    EXPECT_EQ(std::memcmp(t.getGround(), &ground, 8), 0);
}

TEST(DataType, SizeMustBePositive) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    EXPECT_RAISES(t.setSize(0), id("InvalidDataTypeSize"), "Plain", 0);
    EXPECT_RAISES(t.setSize(-1), id("InvalidDataTypeSize"), "Plain", -1);
    EXPECT_EQ(t.getSize(), -1);
    EXPECT_FALSE(t.getAliasedToLocked());
}

TEST(DataType, BooleanAloneChangesItsSize) {
    DataType t(8, "boolean", dtSourceBuiltIn);
    t.setSize(1);
    const unsigned char one = 1;
    t.setGround(&one);
    t.setSize(8);
    EXPECT_EQ(t.getSize(), 8);
    EXPECT_TRUE(t.getDefaultGround());
    const unsigned char zeros[16] = {};
    EXPECT_EQ(std::memcmp(t.getGround(), zeros, 16), 0);
    EXPECT_RAISES(t.setSize(0), id("InvalidDataTypeSize"), "boolean", 0);
}

TEST(DataType, RunningOutOfMemoryLeavesTheRecordAsItWas) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    utFailAllocationAt(1);
    EXPECT_RAISES(t.setSize(8), "Quillane:Services:OutOfMemory");
    EXPECT_EQ(t.getSize(), -1);
    EXPECT_EQ(t.getGround(), nullptr);
    EXPECT_FALSE(t.getAliasedToLocked());
    utFailAllocationAt(0);
    t.setSize(8);
    t.setPropertiesSize(4);
    utFailAllocationAt(1);
    EXPECT_RAISES(t.setProperties("abcd"), "Quillane:Services:OutOfMemory");
    EXPECT_EQ(t.getProperties(), nullptr);
    utFailAllocationAt(0);
}

TEST(DataType, BooleanWithoutMemoryKeepsTheNewSizeAndNoGround) {
    DataType t(8, "boolean", dtSourceBuiltIn);
    t.setSize(1);
    utFailAllocationAt(1);
    EXPECT_RAISES(t.setSize(4), "Quillane:Services:OutOfMemory");
    EXPECT_EQ(t.getSize(), 4);
    EXPECT_EQ(t.getGround(), nullptr);
    utFailAllocationAt(0);
}

// --- Ground and properties -------------------------------------------------------------------------------------------

TEST(DataType, GroundIsSetOnceAndStandsTwice) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    EXPECT_RAISES(t.setGround("abcd"), id("CannotSetGroundRepBeforeSettingSize"), "Plain");
    t.setSize(4);
    t.setAliasedToLocked(false);
    t.setGround("abcd");
    EXPECT_TRUE(t.getAliasedToLocked());
    EXPECT_FALSE(t.getDefaultGround());
    EXPECT_EQ(std::memcmp(t.getGround(), "abcdabcd", 8), 0);
    t.setGround("abcd");
    EXPECT_RAISES(t.setGround("abce"), id("CannotModifyDataTypeGroundRepresentation"), "Plain");
    EXPECT_EQ(std::memcmp(t.getGround(), "abcdabcd", 8), 0);
}

TEST(DataType, PropertiesAreSetOnce) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    EXPECT_RAISES(t.setProperties("abcd"), id("CannotSetPropertiesBeforeSettingSize"), "Plain");
    EXPECT_RAISES(t.setPropertiesSize(-2), id("InvalidDataTypePropertiesSize"), "Plain", -2);
    EXPECT_FALSE(t.getAliasedToLocked());
    t.setPropertiesSize(4);
    EXPECT_TRUE(t.getAliasedToLocked());
    t.setPropertiesSize(4);
    EXPECT_RAISES(t.setPropertiesSize(5), id("CannotModifyDataTypePropertiesSize"), "Plain", 4, 5);
    EXPECT_RAISES(t.setPropertiesSize(-5), id("CannotModifyDataTypePropertiesSize"), "Plain", 4, -5);
    t.setAliasedToLocked(false);
    t.setProperties("abcd");
    EXPECT_TRUE(t.getAliasedToLocked());
    t.setProperties("abcd");
    EXPECT_RAISES(t.setProperties("abce"), id("CannotModifyDataTypeProperties"), "Plain");
    EXPECT_EQ(std::memcmp(t.getProperties(), "abcd", 4), 0);
}

TEST(DataType, NoPropertiesAreABlockOfZeroBytes) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    t.setPropertiesSize(0);
    EXPECT_TRUE(t.getAliasedToLocked());
    t.setProperties(nullptr);
    EXPECT_NE(t.getProperties(), nullptr);
    t.setProperties(nullptr);
    t.setPropertiesSize(4); // no size was stored yet; the empty block goes
    EXPECT_EQ(t.getProperties(), nullptr);
    t.setProperties("abcd");
    EXPECT_EQ(std::memcmp(t.getProperties(), "abcd", 4), 0);
}

// --- Names and printing ----------------------------------------------------------------------------------------------

TEST(DataType, OverridePrefixesGoFromStructuresOnly) {
    const struct {
        const char* name;
        const char* stripped;
    } rows[] = {{"dtoDblFlt_Bus", "Bus"},
                {"dtoSgl_Bus", "Bus"},
                {"dtoSclFxp_Bus", "Bus"},
                {"dtoDbl_", ""},
                {"dtoInt_Bus", "dtoInt_Bus"},
                {"XdtoDbl_Bus", "XdtoDbl_Bus"},
                {"dtoDbl_dtoSgl_Bus", "dtoSgl_Bus"},
                {"dtoDblFltBus", "dtoDblFltBus"},
                {"dtoFlt_Bus", "dtoFlt_Bus"},
                {"dtoDbl", "dtoDbl"}};
    for (const auto& row : rows) {
        SCOPED_TRACE(row.name);
        DataType t(14, row.name, dtSourceBuiltIn);
        EXPECT_EQ(t.getNameStripDTOPrefix(), row.name);
        t.setType(dtqStruct);
        EXPECT_EQ(t.getNameStripDTOPrefix(), row.stripped);
    }
}

TEST(DataType, Prints) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    t.setSize(4);
    std::ostringstream os;
    os << t;
    EXPECT_EQ(os.str(), "DataType : 'Plain'\nID : 14\nSize : 4\nStorage ID : 14\nDataTypeQualifier : 9\n\n");
}

TEST(DataType, ANullNameSetsTheBadBit) {
    struct Nameless : DataType {
        Nameless() : DataType(14, "", dtSourceBuiltIn) {}
        const char* getName() const override { return nullptr; }
    } t;
    std::ostringstream os;
    os << t;
    EXPECT_TRUE(os.bad());
    EXPECT_EQ(os.str(), "DataType : '");
}

// --- Classifiers -----------------------------------------------------------------------------------------------------

TEST(DataType, ClassifiersOfTheFixedIds) {
    for (int typeId = -1; typeId <= 14; ++typeId) {
        SCOPED_TRACE(typeId);
        const DataType t(typeId, "Name", dtSourceBuiltIn);
        const bool classic9 = typeId >= 0 && typeId <= 8;
        const bool isInt = typeId >= 2 && typeId <= 7;
        EXPECT_EQ(t.isBool(), typeId == 8);
        EXPECT_EQ(t.isBuiltInClassic9(), classic9);
        EXPECT_EQ(t.isBuiltInIntClassic6(), isInt);
        EXPECT_EQ(t.isIntDataType(), isInt);
        EXPECT_EQ(t.isBuiltInIntUnsignedClassic3(), isInt && typeId % 2);
        EXPECT_EQ(t.isUnsignedIntDataType(), isInt && typeId % 2);
        EXPECT_EQ(t.isBuiltInIntSignedClassic3(), isInt && typeId % 2 == 0);
        EXPECT_EQ(t.isSignedIntDataType(), isInt && typeId % 2 == 0);
        EXPECT_EQ(t.isFloatDataType(), typeId == 0 || typeId == 1);
        EXPECT_EQ(t.isNumericOrBool(), classic9);
        EXPECT_EQ(t.isNumericNotBool(), classic9 && typeId != 8);
        EXPECT_EQ(t.hasFxpDataTypeProp(), classic9);
        EXPECT_FALSE(t.isNumericNotBuiltInClassic9() || t.isRawNumericNotBuiltInClassic9() || t.isEnum() || t.isHalf());
        const bool negatives = typeId == 0 || typeId == 1 || typeId == 2 || typeId == 4 || typeId == 6;
        EXPECT_EQ(DataType::isRawDTypeIdBuiltInClassic9AndContainerCouldStoreNegatives(typeId), negatives);
        EXPECT_EQ(DataType::isRawDTypeIdNumericAndContainerCouldStoreNegatives("Name", typeId), negatives);
        EXPECT_EQ(t.isNumericOrBoolAndContainerCouldStoreNegatives(), negatives);
        EXPECT_EQ(t.isSignedFixptDT(), negatives);
    }
}

TEST(DataType, ClassifiersOfFixedPointRecords) {
    DataType t(14, "sfix16_En7", dtSourceFixpt);
    EXPECT_TRUE(t.isSignedFixptDT()) << "by the name alone";
    EXPECT_FALSE(t.isNumericOrBoolAndContainerCouldStoreNegatives());
    t.setType(dtqFixpt);
    EXPECT_TRUE(t.isNumericNotBuiltInClassic9() && t.isRawNumericNotBuiltInClassic9());
    EXPECT_TRUE(t.isNumericOrBool() && t.isNumericNotBool() && t.hasFxpDataTypeProp());
    EXPECT_TRUE(t.isNumericOrBoolAndContainerCouldStoreNegatives());
    DataType u(15, "ufix16_En7", dtSourceFixpt);
    u.setType(dtqFixpt);
    EXPECT_FALSE(u.isNumericOrBoolAndContainerCouldStoreNegatives());
    EXPECT_FALSE(u.isSignedFixptDT());
    DataType e(16, "Color", dtSourceEnum);
    e.setType(dtqEnum);
    EXPECT_TRUE(e.isEnum() && e.hasFxpDataTypeProp());
    EXPECT_FALSE(e.isNumericOrBool());
}

TEST(DataType, HalfIsACustomFloatOfSixteenBits) {
    DataType t(14, "half", dtSourceFixpt);
    t.setPropertiesSize(sizeof(fxpDataTypeProp));
    t.setProperties(&FXP::halfProps);
    EXPECT_FALSE(t.isHalf()) << "not of fixed-point kind";
    t.setType(dtqFixpt);
    EXPECT_TRUE(t.isHalf());
    EXPECT_EQ(t.getFxpDataTypeProp(), t.getProperties());
    for (const int field : {0, 1, 2}) {
        fxpDataTypeProp prop = FXP::halfProps;
        (field == 0   ? reinterpret_cast<int&>(prop.DataTypeMode)
         : field == 1 ? prop.WordLength
                      : prop.FixedExponent) += 1;
        prop.ExponentLength += field == 2;
        DataType other(15, "half", dtSourceFixpt);
        other.setType(dtqFixpt);
        other.setPropertiesSize(sizeof prop);
        other.setProperties(&prop);
        EXPECT_FALSE(other.isHalf()) << field;
    }
}

// --- One value -------------------------------------------------------------------------------------------------------

int calls = 0;
const void* propertiesSeen = nullptr;

TEST(DataType, ScalarOperationsCallTheFunctions) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    t.setSize(4);
    int src = 7, dst = 0;
    t.deepCopyScalarElement(&src, &dst);
    EXPECT_EQ(dst, 7) << "plain bytes";
    t.constructScalarElement(&dst);
    t.destroyScalarElement(&dst);
    EXPECT_EQ(dst, 7) << "left as it is";

    t.setPropertiesSize(4);
    t.setProperties("abcd");
    t.setConstructFcn([](void* p, const void* properties) {
        *static_cast<int*>(p) = 1;
        propertiesSeen = properties;
        return ++calls;
    });
    t.setDestructFcn([](void* p) {
        *static_cast<int*>(p) = 2;
        return 1;
    });
    t.setDeepCopyFcn([](void* d, const void* s) {
        *static_cast<int*>(d) = *static_cast<const int*>(s) + 100;
        return 1;
    });
    t.setSerializeFcn([](void* d, const void* s, unsigned long a, unsigned long b) {
        *static_cast<int*>(d) = *static_cast<const int*>(s) + static_cast<int>(10 * a + b);
        return 1;
    });
    t.setDeserializeFcn([](void* d, const void* s, unsigned long a, unsigned long b) {
        *static_cast<int*>(d) = *static_cast<const int*>(s) - static_cast<int>(10 * a + b);
        return 1;
    });
    t.setSerializeSizeFcn([](const void* s) { return static_cast<unsigned long>(*static_cast<const int*>(s)); });
    t.constructScalarElement(&dst);
    EXPECT_EQ(dst, 1);
    EXPECT_EQ(propertiesSeen, t.getProperties());
    t.destroyScalarElement(&dst);
    EXPECT_EQ(dst, 2);
    t.deepCopyScalarElement(&src, &dst);
    EXPECT_EQ(dst, 107);
    t.serializeScalarElement(&src, &dst, 3, 4);
    EXPECT_EQ(dst, 41);
    t.deserializeScalarElement(&src, &dst, 3, 4);
    EXPECT_EQ(dst, -27);
    EXPECT_EQ(t.serializeSizeScalarElement(&src), 7u);
}

// Functions of its own, without ever setting one.
struct AnsweringType : DataType {
    AnsweringType() : DataType(14, "Answering", dtSourceBuiltIn) {
        plainConstruct_ = plainDestroy_ = plainCopy_ = false;
    }
    ConstructFcn getConstructFcn() const override { return succeeds ? writeConstructed : failToConstruct; }
    DestructFcn getDestructFcn() const override {
        return succeeds ? [](void* p) { return *static_cast<int*>(p) = 2; } : [](void*) { return 0; };
    }
    DeepCopyFcn getDeepCopyFcn() const override {
        return succeeds ? [](void* p, const void*) { return *static_cast<int*>(p) = 3; }
                        : [](void*, const void*) { return 0; };
    }
    const void* getProperties() const override { return "answered"; }
    static int writeConstructed(void* p, const void* properties) {
        propertiesSeen = properties;
        return *static_cast<int*>(p) = 1;
    }
    static int failToConstruct(void*, const void*) { return 0; }
    bool succeeds = true;
};

TEST(DataType, ARecordWithoutFunctionsIsAskedThroughItsGetters) {
    AnsweringType t;
    int v = 0;
    t.constructScalarElement(&v);
    EXPECT_EQ(v, 1);
    EXPECT_STREQ(static_cast<const char*>(propertiesSeen), "answered");
    t.destroyScalarElement(&v);
    EXPECT_EQ(v, 2);
    t.deepCopyScalarElement(&v, &v);
    EXPECT_EQ(v, 3);
    t.succeeds = false;
    const std::string failed = id("DataTypeFcnUnknownError");
    EXPECT_RAISES(t.constructScalarElement(&v), failed, "Construct", "Answering");
    EXPECT_RAISES(t.destroyScalarElement(&v), failed, "Destruct", "Answering");
    EXPECT_RAISES(t.deepCopyScalarElement(&v, &v), failed, "DeepCopy", "Answering");
}

TEST(DataType, AFailedFunctionIsReportedByOperation) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    t.setConstructFcn([](void*, const void*) { return 0; });
    t.setDestructFcn([](void*) { return 0; });
    t.setDeepCopyFcn([](void*, const void*) { return 0; });
    t.setSerializeFcn([](void*, const void*, unsigned long, unsigned long) { return 0; });
    t.setDeserializeFcn([](void*, const void*, unsigned long, unsigned long) { return 0; });
    t.setDataConstructFcn([](unsigned long, const unsigned long*, unsigned long, const void*, void*) { return 0; });
    const std::string failed = id("DataTypeFcnUnknownError");
    int v = 0;
    EXPECT_RAISES(t.constructScalarElement(&v), failed, "Construct", "Plain");
    EXPECT_RAISES(t.destroyScalarElement(&v), failed, "Destruct", "Plain");
    EXPECT_RAISES(t.deepCopyScalarElement(&v, &v), failed, "DeepCopy", "Plain");
    EXPECT_RAISES(t.serializeScalarElement(&v, &v, 0, 0), failed, "Serialize", "Plain");
    EXPECT_RAISES(t.deserializeScalarElement(&v, &v, 0, 0), failed, "Deserialize", "Plain");
    EXPECT_RAISES(t.dataConstruct(0, nullptr, 4, nullptr, &v), failed, "DataConstruct", "Plain");
}

TEST(DataType, FunctionPropertiesCanBeCalled) {
    DataType t(14, "Plain", dtSourceBuiltIn);
    t.setSizeOfFcn([] { return 12ul; });
    t.setContainedDataFcn([](void* p) { return static_cast<void*>(static_cast<char*>(p) + 1); });
    t.setContainedDataDimsFcn([](const void*, unsigned long* dims) { dims[0] = 5; });
    t.setDataConstructFcn(
        [](unsigned long n, const unsigned long* dims, unsigned long size, const void* data, void* dst) {
            *static_cast<unsigned long*>(dst) =
                n * 1000 + dims[0] * 100 + size * 10 + *static_cast<const unsigned char*>(data);
            return 1;
        });
    char bytes[2];
    unsigned long dims[1] = {};
    unsigned long built = 0;
    const unsigned char data = 4;
    EXPECT_EQ(t.sizeOf(), 12u);
    EXPECT_EQ(t.containedData(bytes), bytes + 1);
    t.containedDataDims(bytes, dims);
    EXPECT_EQ(dims[0], 5u);
    t.dataConstruct(1, dims, 2, &data, &built);
    EXPECT_EQ(built, 1524u);
}

// --- Destruction -----------------------------------------------------------------------------------------------------

int groundsDestroyed = 0;

TEST(DataType, AConstructedGroundIsDestroyedWithTheRecord) {
    groundsDestroyed = 0;
    for (const bool isConstructed : {false, true}) {
        DataType t(14, "Plain", dtSourceBuiltIn);
        t.setSize(4);
        t.setDestructFcn([](void*) { return ++groundsDestroyed; });
        t.setConstructedGround(isConstructed);
    }
    EXPECT_EQ(groundsDestroyed, 1);
}

// --- Auto ------------------------------------------------------------------------------------------------------------

TEST(AutoDataType, CannotBeDefined) {
    AutoDataType t;
    EXPECT_EQ(t.getId(), -1);
    EXPECT_STREQ(t.getName(), "auto");
    EXPECT_EQ(t.getType(), dtqBuiltIn);
    EXPECT_EQ(t.getSize(), 8);
    EXPECT_EQ(t.getStorageId(), -1);
    EXPECT_EQ(t.getIdAliasedToForTesting(), -1);
    EXPECT_TRUE(t.canContainNegativeNumbers() && t.groundHasNonZeroStoredValue());
    EXPECT_FALSE(t.isAtomic());
    t.setSize(4);
    t.setGround("abcdefgh");
    t.setDefaultGround(true);
    t.setConstructedGround(true);
    t.setProperties("abcd");
    t.setPropertiesSize(4);
    t.setStorageId(4);
    t.setContainedDataType(4);
    t.setContainedDataNumDims(4);
    t.setIsPointerType(true);
    t.setCGType(reinterpret_cast<CG::Type*>(8));
    EXPECT_EQ(t.getSize(), 8);
    EXPECT_FALSE(t.getDefaultGround());
    EXPECT_FALSE(t.getConstructedGround());
    EXPECT_EQ(t.getProperties(), nullptr);
    EXPECT_EQ(t.getPropertiesSize(), 0);
    EXPECT_EQ(t.getStorageId(), -1);
    EXPECT_EQ(t.getContainedDataType(), -10);
    EXPECT_EQ(t.getContainedDataNumDims(), 0u);
    EXPECT_FALSE(t.getIsPointerType());
    EXPECT_EQ(t.getCGType(), nullptr);
    EXPECT_FALSE(t.getAliasedToLocked());
    // The four setters of the update functions, and a few more, stay those of a plain record.
    t.setUpdateContainedDataDimsFcn(functionAt<UpdateContainedDataDimsFcn>(8));
    t.setUpdateContainedDataDimFcnName("f");
    t.setIsAtomic(true);
    t.setTargetSize(3);
    t.setHostToTargetFcn(functionAt<HostToTargetFcn>(8));
    EXPECT_EQ(t.getUpdateContainedDataDimsFcn(), functionAt<UpdateContainedDataDimsFcn>(8));
    EXPECT_EQ(t.getUpdateContainedDataDimFcnName(), "f");
    EXPECT_TRUE(t.isAtomic());
    EXPECT_EQ(t.getTargetSize(), 3);
    EXPECT_EQ(t.getHostToTargetFcn(), functionAt<HostToTargetFcn>(8));
}

TEST(AutoDataType, FunctionSettersHaveNoEffect) {
    const AutoDataType fresh;
    AutoDataType t;
#define AUTO(stem)                                                                                                     \
    t.set##stem##Fcn(functionAt<stem##Fcn>(8));                                                                        \
    EXPECT_EQ(t.get##stem##Fcn(), fresh.get##stem##Fcn()) << #stem;
#define AUTO_NAMED(stem)                                                                                               \
    AUTO(stem)                                                                                                         \
    t.set##stem##FcnName("f");                                                                                         \
    EXPECT_EQ(t.get##stem##FcnName(), "") << #stem;
    AUTO_NAMED(Construct)
    AUTO_NAMED(Destruct)
    AUTO_NAMED(DeepCopy)
    AUTO_NAMED(Serialize)
    AUTO_NAMED(Deserialize)
    AUTO_NAMED(SerializeSize)
    AUTO_NAMED(SizeOf)
    AUTO_NAMED(ContainedData)
    AUTO_NAMED(ContainedDataDims)
    AUTO_NAMED(CoderProperties)
    AUTO_NAMED(DataConstruct)
    AUTO(ConvertBetween)
    AUTO(IsPositive)
    AUTO(IsNegative)
    AUTO(GreaterThan)
    AUTO(GreaterEqual)
#undef AUTO
#undef AUTO_NAMED
    EXPECT_FALSE(t.getAliasedToLocked());
}

} // namespace
