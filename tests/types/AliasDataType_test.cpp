#include <cstring>

#include <gtest/gtest.h>

#include "qltypes/types/AliasDataType.h"
#include "tests/support/Raises.h"

namespace {

using namespace QLTypeSys;

template <class F> F functionAt(std::uintptr_t address) { return reinterpret_cast<F>(address); }

// End of the chain, an alias of it, and an alias of the alias.
struct AliasTest : testing::Test {
    DataType end{14, "End", dtSourceBuiltIn};
    AliasDataType middle{15, "Middle", dtSourceBuiltIn, &end, &end};
    AliasDataType alias{16, "Second", dtSourceOpaque, &middle, &end};
};

TEST_F(AliasTest, KnowsItsNeighbourAndItsEnd) {
    EXPECT_EQ(alias.getIdAliasedTo(), 15);
    EXPECT_EQ(alias.getIdAliasedThruTo(), 14);
    EXPECT_EQ(alias.dependsOn(), std::vector<int>{15});
    EXPECT_TRUE(alias.getIsAliasToLocked());
    EXPECT_FALSE(alias.getAliasedToLocked()) << "the field itself stays";
    EXPECT_EQ(alias.getType(), dtqUnspecified);
    EXPECT_EQ(alias.getDataTypeSource(), dtSourceOpaque);
    DataType other(17, "Other", dtSourceBuiltIn);
    alias.updateAliasedToType(&other);
    alias.updateAliasedThruToType(&other);
    EXPECT_EQ(alias.getIdAliasedTo(), 17);
    EXPECT_EQ(alias.getIdAliasedThruTo(), 17);
}

TEST_F(AliasTest, TakesSizeAndPlainFlagsOnce) {
    end.setSize(4);
    end.setConstructFcn(nullptr);
    const AliasDataType late(17, "Late", dtSourceBuiltIn, &end, &end);
    EXPECT_EQ(late.getSize(), 4);
    EXPECT_FALSE(late.getPlainConstruct());
    EXPECT_TRUE(late.getPlainCopy() && late.getPlainDestroy());
    EXPECT_EQ(alias.getSize(), -1) << "made before the size was set";
    EXPECT_TRUE(alias.getPlainConstruct());
}

TEST_F(AliasTest, CanBeMadeFromAnExistingRecord) {
    DataType existing(18, "Existing", dtSourceAnonymous);
    const AliasDataType made(&existing, &middle, &end);
    EXPECT_EQ(made.getId(), 18);
    EXPECT_STREQ(made.getName(), "Existing");
    EXPECT_EQ(made.getDataTypeSource(), dtSourceAnonymous);
    EXPECT_EQ(made.getIdAliasedTo(), 15);
}

TEST_F(AliasTest, ForwardsFunctionsAndTheirNames) {
#define NAMED_STEM(stem, literal, nameLiteral, forwards)                                                               \
    end.set##stem##Fcn(functionAt<stem##Fcn>(8));                                                                      \
    end.set##stem##FcnName(#stem);                                                                                     \
    EXPECT_EQ(alias.get##stem##Fcn(), forwards ? functionAt<stem##Fcn>(8) : nullptr) << #stem;                         \
    EXPECT_EQ(alias.get##stem##FcnName(), forwards ? #stem : "");
#define STEM(stem, literal)                                                                                            \
    end.set##stem##Fcn(functionAt<stem##Fcn>(8));                                                                      \
    EXPECT_EQ(alias.get##stem##Fcn(), functionAt<stem##Fcn>(8)) << #stem;
#include "tests/types/PropertyStems.def"
    end.setTargetToHostFcn(functionAt<TargetToHostFcn>(8));
    end.setHostToTargetFcn(functionAt<HostToTargetFcn>(8));
    EXPECT_EQ(alias.getTargetToHostFcn(), functionAt<TargetToHostFcn>(8));
    EXPECT_EQ(alias.getHostToTargetFcn(), functionAt<HostToTargetFcn>(8));
}

TEST_F(AliasTest, ForwardsProperties) {
    end.setSize(4);
    end.setGround("abcd");
    end.setConstructedGround(true);
    end.setPropertiesSize(4);
    end.setProperties("efgh");
    end.setContainedDataType(3);
    end.setContainedDataNumDims(2);
    end.setIsPointerType(true);
    end.setTargetSize(6);
    end.setStorageId(5);
    end.setIsAtomic(true);
    end.setGroundHasNonZeroStoredValue(false);
    end.setCanContainNegativeNumbers(false);
    EXPECT_EQ(alias.getGround(), end.getGround());
    EXPECT_FALSE(alias.getDefaultGround());
    EXPECT_TRUE(alias.getConstructedGround());
    EXPECT_EQ(alias.getProperties(), end.getProperties());
    EXPECT_EQ(alias.getPropertiesSize(), 4);
    EXPECT_EQ(alias.getContainedDataType(), 3);
    EXPECT_EQ(alias.getContainedDataNumDims(), 2u);
    EXPECT_EQ(alias.containedDataType(), -10) << "not virtual: the field of the alias";
    EXPECT_TRUE(alias.getIsPointerType());
    EXPECT_EQ(alias.getTargetSize(), 6);
    EXPECT_EQ(alias.getStorageId(), 5);
    EXPECT_TRUE(alias.isAtomic());
    EXPECT_FALSE(alias.groundHasNonZeroStoredValue());
    EXPECT_FALSE(alias.canContainNegativeNumbers());
    end.setConstructedGround(false);
}

TEST(AliasDataType, ForwardsClassifiers) {
    struct Marked : DataType {
        Marked() : DataType(14, "sfix8", dtSourceFixpt) {}
        bool isImage() const override { return true; }
        bool isDynamicMatrix() const override { return true; }
    } marked;
    marked.setType(dtqFixpt);
    const AliasDataType alias(16, "Second", dtSourceBuiltIn, &marked, &marked);
    EXPECT_TRUE(alias.isImage() && alias.isDynamicMatrix());
    EXPECT_TRUE(alias.isNumericOrBool() && alias.isNumericNotBool() && alias.isNumericNotBuiltInClassic9());
    EXPECT_TRUE(alias.hasFxpDataTypeProp());
    EXPECT_TRUE(alias.isNumericOrBoolAndContainerCouldStoreNegatives() && alias.isSignedFixptDT());
    EXPECT_FALSE(alias.isRawNumericNotBuiltInClassic9()) << "speaks of the record itself";
    EXPECT_FALSE(alias.getIsType(dtqFixpt)) << "the kind is not forwarded";
    EXPECT_FALSE(alias.isHalf());
    EXPECT_EQ(alias.getFxpDataTypeProp(), nullptr);
    for (int id = 0; id <= 8; ++id) {
        SCOPED_TRACE(id);
        const DataType builtIn(id, "b", dtSourceBuiltIn);
        const AliasDataType other(16, "Second", dtSourceBuiltIn, &builtIn, &builtIn);
        EXPECT_EQ(other.isBool(), builtIn.isBool());
        EXPECT_TRUE(other.isBuiltInClassic9());
        EXPECT_EQ(other.isBuiltInIntClassic6(), builtIn.isBuiltInIntClassic6());
        EXPECT_EQ(other.isBuiltInIntUnsignedClassic3(), builtIn.isBuiltInIntUnsignedClassic3());
        EXPECT_EQ(other.isBuiltInIntSignedClassic3(), builtIn.isBuiltInIntSignedClassic3());
        EXPECT_EQ(other.isFloatDataType(), builtIn.isFloatDataType());
        EXPECT_EQ(other.isIntDataType(), builtIn.isIntDataType());
        EXPECT_EQ(other.isUnsignedIntDataType(), builtIn.isUnsignedIntDataType());
        EXPECT_EQ(other.isSignedIntDataType(), builtIn.isSignedIntDataType());
    }
    DataType color(14, "Color", dtSourceEnum);
    color.setType(dtqEnum);
    const AliasDataType enumAlias(16, "Second", dtSourceBuiltIn, &color, &color);
    EXPECT_TRUE(enumAlias.isEnum());
    EXPECT_FALSE(enumAlias.getIsType(dtqEnum));
}

TEST_F(AliasTest, ForwardsValueOperations) {
    end.setSize(4);
    end.setConstructFcn([](void* p, const void*) { return *static_cast<int*>(p) = 1; });
    end.setDestructFcn([](void* p) { return *static_cast<int*>(p) = 2; });
    end.setDeepCopyFcn([](void* d, const void* s) { return *static_cast<int*>(d) = *static_cast<const int*>(s) + 1; });
    end.setSerializeFcn([](void* d, const void*, unsigned long, unsigned long) { return *static_cast<int*>(d) = 4; });
    end.setDeserializeFcn([](void* d, const void*, unsigned long, unsigned long) { return *static_cast<int*>(d) = 5; });
    end.setSerializeSizeFcn([](const void*) { return 6ul; });
    int src = 9, dst = 0;
    alias.constructScalarElement(&dst);
    EXPECT_EQ(dst, 1);
    alias.destroyScalarElement(&dst);
    EXPECT_EQ(dst, 2);
    alias.deepCopyScalarElement(&src, &dst);
    EXPECT_EQ(dst, 10);
    alias.serializeScalarElement(&src, &dst, 0, 0);
    EXPECT_EQ(dst, 4);
    alias.deserializeScalarElement(&src, &dst, 0, 0);
    EXPECT_EQ(dst, 5);
    EXPECT_EQ(alias.serializeSizeScalarElement(&src), 6u);
}

TEST_F(AliasTest, RefusesWritesAndChangesNothing) {
    end.setSize(4);
    const std::string refused = "QuillaneTypes:general:CannotSetPropertyOfAliasType";
#define NAMED_STEM(stem, literal, nameLiteral, forwards)                                                               \
    EXPECT_RAISES(alias.set##stem##Fcn(functionAt<stem##Fcn>(8)), refused, literal, "Second");                         \
    EXPECT_RAISES(alias.set##stem##FcnName("f"), refused, nameLiteral, "Second");                                      \
    EXPECT_EQ(end.get##stem##Fcn(), nullptr);
#define STEM(stem, literal)                                                                                            \
    EXPECT_RAISES(alias.set##stem##Fcn(functionAt<stem##Fcn>(8)), refused, literal, "Second");                         \
    EXPECT_EQ(end.get##stem##Fcn(), nullptr);
#include "tests/types/PropertyStems.def"
    EXPECT_RAISES(alias.setSize(4), refused, "DataTypeSize", "Second"); // also the size that the target has
    EXPECT_RAISES(alias.setContainedDataType(3), refused, "ContainedDataType", "Second");
    EXPECT_RAISES(alias.setContainedDataNumDims(3), refused, "ContainedDataNumDims", "Second");
    EXPECT_RAISES(alias.setStorageId(3), refused, "StorageId", "Second");
    EXPECT_RAISES(alias.setGround("abcd"), refused, "Ground", "Second");
    EXPECT_RAISES(alias.setProperties("abcd"), refused, "Properties", "Second");
    EXPECT_RAISES(alias.setPropertiesSize(4), refused, "PropertiesSize", "Second");
    EXPECT_RAISES(alias.setIsAtomic(true), refused, "IsAtomic", "Second");
    EXPECT_RAISES(alias.setGroundHasNonZeroStoredValue(false), refused, "GroundHasNonZero", "Second");
    EXPECT_TRUE(end.getDefaultGround());
    EXPECT_FALSE(end.isAtomic());
}

TEST_F(AliasTest, SomeWritesHaveNoEffect) {
    end.setSize(4);
    alias.setIsPointerType(true);
    alias.setHostToTargetFcn(functionAt<HostToTargetFcn>(8));
    alias.setTargetToHostFcn(functionAt<TargetToHostFcn>(8));
    alias.setTargetSize(3);
    alias.setDefaultGround(false);
    alias.setConstructedGround(true);
    alias.setIdAliasedTo(3);
    alias.setIdAliasedThruTo(3);
    EXPECT_FALSE(end.getIsPointerType());
    EXPECT_EQ(end.getHostToTargetFcn(), nullptr);
    EXPECT_EQ(end.getTargetToHostFcn(), nullptr);
    EXPECT_EQ(end.getTargetSize(), 0);
    EXPECT_TRUE(end.getDefaultGround());
    EXPECT_FALSE(end.getConstructedGround());
    EXPECT_EQ(alias.getIdAliasedTo(), 15);
    EXPECT_EQ(alias.getIdAliasedThruTo(), 14);
}

TEST_F(AliasTest, KeepsItsOwnMarks) {
    alias.setIsValidFixptType(true);
    alias.setAliasedToLocked(true);
    alias.setIdAliasedToForTesting(7);
    auto* const cgType = reinterpret_cast<CG::Type*>(8);
    alias.setCGType(cgType);
    const unsigned int words[4] = {1, 2, 3, 4};
    alias.setChecksumElements(words);
    alias.setType(dtqImage);
    alias.setVisitFlag(true);
    EXPECT_TRUE(alias.getIsValidFixptType() && !end.getIsValidFixptType());
    EXPECT_TRUE(alias.getAliasedToLocked() && !end.getAliasedToLocked());
    EXPECT_EQ(alias.getIdAliasedToForTesting(), 7);
    EXPECT_EQ(alias.getCGType(), cgType);
    EXPECT_EQ(end.getCGType(), nullptr);
    EXPECT_EQ(alias.getChecksumElements()[3], 4u);
    EXPECT_EQ(end.getChecksumElements()[3], 0u);
    EXPECT_EQ(alias.getType(), dtqImage);
    EXPECT_EQ(end.getType(), dtqUnspecified);
    EXPECT_TRUE(alias.getVisitFlag() && !end.getVisitFlag());
}

} // namespace
