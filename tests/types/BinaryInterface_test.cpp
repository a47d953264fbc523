// The order of virtual operations and of fields is part of what clients are compiled against.
#include <cstddef>
#include <cstring>
#include <vector>

#include <gtest/gtest.h>

#include "qltypes/types/AliasDataType.h"
#include "qltypes/types/BuiltInDataType.h"
#include "qltypes/types/DataTypeTable.h"
#include "tests/support/Slots.h"

namespace {

using namespace QLTypeSys;
using testsupport::expectAscending;
using testsupport::offsetOfMember;
using testsupport::slotOf;

// Slots 0 and 1 are the two forms of the destructor.
void expectConsecutive(const std::vector<std::size_t>& slots, std::size_t first) {
    for (std::size_t i = 0; i < slots.size(); ++i)
        EXPECT_EQ(slots[i], first + i) << "operation " << i;
}

// clang-format off
TEST(BinaryInterface, SlotsOfDataType) {
    expectConsecutive({
        slotOf(&DataType::getId),
        slotOf(&DataType::getName),
        slotOf(&DataType::getShortName),
        slotOf(&DataType::setIsValidFixptType),
        slotOf(&DataType::getIsValidFixptType),
        slotOf(&DataType::getDataTypeSource),
        slotOf(&DataType::setSize),
        slotOf(&DataType::setAliasedToLocked),
        slotOf(&DataType::getAliasedToLocked),
        slotOf(&DataType::getConvertBetweenFcn),
        slotOf(&DataType::getConstructFcn),
        slotOf(&DataType::getConstructFcnName),
        slotOf(&DataType::getDestructFcn),
        slotOf(&DataType::getDestructFcnName),
        slotOf(&DataType::getDeepCopyFcn),
        slotOf(&DataType::getDeepCopyFcnName),
        slotOf(&DataType::getSerializeFcn),
        slotOf(&DataType::getSerializeFcnName),
        slotOf(&DataType::getDeserializeFcn),
        slotOf(&DataType::getDeserializeFcnName),
        slotOf(&DataType::getSerializeSizeFcn),
        slotOf(&DataType::getSerializeSizeFcnName),
        slotOf(&DataType::getSizeOfFcn),
        slotOf(&DataType::getSizeOfFcnName),
        slotOf(&DataType::getContainedDataFcn),
        slotOf(&DataType::getContainedDataFcnName),
        slotOf(&DataType::getContainedDataType),
        slotOf(&DataType::getContainedDataNumDims),
        slotOf(&DataType::getContainedDataDimsFcn),
        slotOf(&DataType::getContainedDataDimsFcnName),
        slotOf(&DataType::getUpdateContainedDataDimsFcn),
        slotOf(&DataType::getUpdateContainedDataDimsFcnName),
        slotOf(&DataType::getUpdateContainedDataDimFcn),
        slotOf(&DataType::getUpdateContainedDataDimFcnName),
        slotOf(&DataType::getCoderPropertiesFcn),
        slotOf(&DataType::getCoderPropertiesFcnName),
        slotOf(&DataType::getDataConstructFcn),
        slotOf(&DataType::getDataConstructFcnName),
        slotOf(&DataType::getIsPositiveFcn),
        slotOf(&DataType::getIsNegativeFcn),
        slotOf(&DataType::getGreaterThanFcn),
        slotOf(&DataType::getGreaterEqualFcn),
        slotOf(&DataType::setConvertBetweenFcn),
        slotOf(&DataType::setConstructFcn),
        slotOf(&DataType::setConstructFcnName),
        slotOf(&DataType::setDestructFcn),
        slotOf(&DataType::setDestructFcnName),
        slotOf(&DataType::setDeepCopyFcn),
        slotOf(&DataType::setDeepCopyFcnName),
        slotOf(&DataType::setSerializeFcn),
        slotOf(&DataType::setSerializeFcnName),
        slotOf(&DataType::setDeserializeFcn),
        slotOf(&DataType::setDeserializeFcnName),
        slotOf(&DataType::setSerializeSizeFcn),
        slotOf(&DataType::setSerializeSizeFcnName),
        slotOf(&DataType::setSizeOfFcn),
        slotOf(&DataType::setSizeOfFcnName),
        slotOf(&DataType::setContainedDataFcn),
        slotOf(&DataType::setContainedDataFcnName),
        slotOf(&DataType::setContainedDataType),
        slotOf(&DataType::setContainedDataNumDims),
        slotOf(&DataType::setContainedDataDimsFcn),
        slotOf(&DataType::setContainedDataDimsFcnName),
        slotOf(&DataType::setUpdateContainedDataDimsFcn),
        slotOf(&DataType::setUpdateContainedDataDimsFcnName),
        slotOf(&DataType::setUpdateContainedDataDimFcn),
        slotOf(&DataType::setUpdateContainedDataDimFcnName),
        slotOf(&DataType::setCoderPropertiesFcn),
        slotOf(&DataType::setCoderPropertiesFcnName),
        slotOf(&DataType::setDataConstructFcn),
        slotOf(&DataType::setDataConstructFcnName),
        slotOf(&DataType::setGreaterThanFcn),
        slotOf(&DataType::setGreaterEqualFcn),
        slotOf(&DataType::setIsNegativeFcn),
        slotOf(&DataType::setIsPositiveFcn),
        slotOf(&DataType::setIsPointerType),
        slotOf(&DataType::getIsPointerType),
        slotOf(&DataType::getIdAliasedTo),
        slotOf(&DataType::getIdAliasedThruTo),
        slotOf(&DataType::getHostToTargetFcn),
        slotOf(&DataType::getTargetToHostFcn),
        slotOf(&DataType::getTargetSize),
        slotOf(&DataType::setHostToTargetFcn),
        slotOf(&DataType::setTargetToHostFcn),
        slotOf(&DataType::setTargetSize),
        slotOf(&DataType::getStorageId),
        slotOf(&DataType::setStorageId),
        slotOf(&DataType::getIdAliasedToForTesting),
        slotOf(&DataType::setIdAliasedToForTesting),
        slotOf(&DataType::getGround),
        slotOf(&DataType::setGround),
        slotOf(&DataType::getDefaultGround),
        slotOf(&DataType::setDefaultGround),
        slotOf(&DataType::getConstructedGround),
        slotOf(&DataType::setConstructedGround),
        slotOf(&DataType::getProperties),
        slotOf(&DataType::setProperties),
        slotOf(&DataType::getPropertiesSize),
        slotOf(&DataType::setPropertiesSize),
        slotOf(&DataType::hasFxpDataTypeProp),
        slotOf(&DataType::isBool),
        slotOf(&DataType::isNumericOrBool),
        slotOf(&DataType::isNumericNotBool),
        slotOf(&DataType::isNumericNotBuiltInClassic9),
        slotOf(&DataType::isRawNumericNotBuiltInClassic9),
        slotOf(&DataType::isEnum),
        slotOf(&DataType::getFxpDataTypeProp),
        slotOf(&DataType::isHalf),
        slotOf(&DataType::isImage),
        slotOf(&DataType::isDynamicMatrix),
        slotOf(&DataType::isBuiltInClassic9),
        slotOf(&DataType::isBuiltInIntClassic6),
        slotOf(&DataType::isBuiltInIntUnsignedClassic3),
        slotOf(&DataType::isBuiltInIntSignedClassic3),
        slotOf(&DataType::isNumericOrBoolAndContainerCouldStoreNegatives),
        slotOf(&DataType::isFloatDataType),
        slotOf(&DataType::isIntDataType),
        slotOf(&DataType::isUnsignedIntDataType),
        slotOf(&DataType::isSignedIntDataType),
        slotOf(&DataType::isSignedFixptDT),
        slotOf(&DataType::canContainNegativeNumbers),
        slotOf(&DataType::getCGType),
        slotOf(&DataType::setCGType),
        slotOf(&DataType::getChecksumElements),
        slotOf(&DataType::setChecksumElements),
        slotOf(&DataType::getInterface),
        slotOf(&DataType::setInterface),
        slotOf(&DataType::getIsType),
        slotOf(&DataType::getType),
        slotOf(&DataType::setType),
        slotOf(&DataType::print),
        slotOf(&DataType::isAtomic),
        slotOf(&DataType::setIsAtomic),
        slotOf(&DataType::groundHasNonZeroStoredValue),
        slotOf(&DataType::setGroundHasNonZeroStoredValue),
        slotOf(&DataType::dependsOn),
        slotOf(&DataType::deepCopyScalarElement),
        slotOf(&DataType::serializeScalarElement),
        slotOf(&DataType::deserializeScalarElement),
        slotOf(&DataType::serializeSizeScalarElement),
        slotOf(&DataType::constructScalarElement),
        slotOf(&DataType::destroyScalarElement),
        slotOf(&DataType::getVisitFlag),
        slotOf(&DataType::setVisitFlag),
        slotOf(&DataType::getIsAliasToLocked),
        slotOf(&DataType::setIsAliasToLocked),
        slotOf(&DataType::updateAliasedToType),
        slotOf(&DataType::updateAliasedThruToType),
    }, 2);
}

TEST(BinaryInterface, SlotsThatTheAliasAdds) {
    const std::size_t last = slotOf(&DataType::updateAliasedThruToType);
    expectConsecutive({slotOf(&AliasDataType::setIdAliasedTo), slotOf(&AliasDataType::setIdAliasedThruTo)}, last + 1);
}

TEST(BinaryInterface, SlotsOfDataTypeTable) {
    expectConsecutive({
        slotOf(&DataTypeTable::CreateDTTable),
        slotOf(&DataTypeTable::resetToBuiltin),
        slotOf(&DataTypeTable::registerDataType),
        slotOf(&DataTypeTable::registerAliasDataType),
        slotOf(&DataTypeTable::registerStructDataType),
        slotOf(&DataTypeTable::registerStringDataType),
        slotOf(&DataTypeTable::registerDateTimeDataType),
        slotOf(&DataTypeTable::registerOpaqueDataType),
        slotOf(&DataTypeTable::registerDynamicMatrixDataType),
        slotOf(&DataTypeTable::registerImageDataType),
        slotOf(&DataTypeTable::registerBusDataType),
        slotOf(&DataTypeTable::shortCircuitRegistration),
        slotOf(&DataTypeTable::getParameterUnderflowDiagnostic),
        slotOf(&DataTypeTable::getParameterOverflowDiagnostic),
        slotOf(&DataTypeTable::getParameterPrecisionLossDiagnostic),
        slotOf(&DataTypeTable::getFixptConstUnderflowDiagnostic),
        slotOf(&DataTypeTable::getFixptConstOverflowDiagnostic),
        slotOf(&DataTypeTable::getFixptConstPrecisionLossDiagnostic),
        slotOf(&DataTypeTable::getDataOverflowDiagnostic),
        slotOf(&DataTypeTable::getDataSaturationDiagnostic),
        slotOf(&DataTypeTable::getUseIntDivNetSlopeOpt),
        slotOf(&DataTypeTable::print),
        slotOf(&DataTypeTable::getDataTypeProperties),
        slotOf(&DataTypeTable::getOrdinalValuesFromEnumObject),
        slotOf(&DataTypeTable::isOverriddenObjectName),
        slotOf(&DataTypeTable::getEnumTypeStringFromValue),
        slotOf(&DataTypeTable::getEnumTypeStringFromIndex),
        slotOf(&DataTypeTable::setSkipForCodeGen),
        slotOf(&DataTypeTable::getSkipForCodeGen),
        slotOf(&DataTypeTable::getResolvingDataTypeForOverrideUtils),
        slotOf(&DataTypeTable::getObjectOverrideUtils),
        slotOf(&DataTypeTable::addObjectOverrideUtils),
        slotOf(&DataTypeTable::addOverriddenObject),
        slotOf(&DataTypeTable::registerBuiltInDataType),
        slotOf(&DataTypeTable::registerInternalExtraDataType),
    }, 2);
}

struct RecordProbe : DataType {
    using DataType::DataType;
    static void expectOrder() {
        expectAscending({
            offsetOfMember(&RecordProbe::id_),
            offsetOfMember(&RecordProbe::name_),
            offsetOfMember(&RecordProbe::shortName_),
            offsetOfMember(&RecordProbe::source_),
            offsetOfMember(&RecordProbe::size_),
            offsetOfMember(&RecordProbe::isAtomic_),
            offsetOfMember(&RecordProbe::groundHasNonZeroStoredValue_),
            offsetOfMember(&RecordProbe::needRegisterIdentifier_),
            offsetOfMember(&RecordProbe::isValidFixptType_),
            offsetOfMember(&RecordProbe::canContainNegativeNumbers_),
            offsetOfMember(&RecordProbe::plainCopy_),
            offsetOfMember(&RecordProbe::plainConstruct_),
            offsetOfMember(&RecordProbe::plainDestroy_),
            offsetOfMember(&RecordProbe::storageId_),
            offsetOfMember(&RecordProbe::idAliasedTo_),
            offsetOfMember(&RecordProbe::ground_),
            offsetOfMember(&RecordProbe::defaultGround_),
            offsetOfMember(&RecordProbe::constructedGround_),
            offsetOfMember(&RecordProbe::properties_),
            offsetOfMember(&RecordProbe::propertiesSize_),
            offsetOfMember(&RecordProbe::cgType_),
            offsetOfMember(&RecordProbe::interface_),
            offsetOfMember(&RecordProbe::convertBetweenFcn_),
            offsetOfMember(&RecordProbe::constructFcn_),
            offsetOfMember(&RecordProbe::constructFcnName_),
            offsetOfMember(&RecordProbe::destructFcn_),
            offsetOfMember(&RecordProbe::destructFcnName_),
            offsetOfMember(&RecordProbe::deepCopyFcn_),
            offsetOfMember(&RecordProbe::deepCopyFcnName_),
            offsetOfMember(&RecordProbe::serializeFcn_),
            offsetOfMember(&RecordProbe::serializeFcnName_),
            offsetOfMember(&RecordProbe::deserializeFcn_),
            offsetOfMember(&RecordProbe::deserializeFcnName_),
            offsetOfMember(&RecordProbe::serializeSizeFcn_),
            offsetOfMember(&RecordProbe::serializeSizeFcnName_),
            offsetOfMember(&RecordProbe::sizeOfFcn_),
            offsetOfMember(&RecordProbe::sizeOfFcnName_),
            offsetOfMember(&RecordProbe::containedDataFcn_),
            offsetOfMember(&RecordProbe::containedDataFcnName_),
            offsetOfMember(&RecordProbe::containedDataType_),
            offsetOfMember(&RecordProbe::containedDataNumDims_),
            offsetOfMember(&RecordProbe::containedDataDimsFcn_),
            offsetOfMember(&RecordProbe::containedDataDimsFcnName_),
            offsetOfMember(&RecordProbe::updateContainedDataDimsFcn_),
            offsetOfMember(&RecordProbe::updateContainedDataDimsFcnName_),
            offsetOfMember(&RecordProbe::updateContainedDataDimFcn_),
            offsetOfMember(&RecordProbe::updateContainedDataDimFcnName_),
            offsetOfMember(&RecordProbe::coderPropertiesFcn_),
            offsetOfMember(&RecordProbe::coderPropertiesFcnName_),
            offsetOfMember(&RecordProbe::dataConstructFcn_),
            offsetOfMember(&RecordProbe::dataConstructFcnName_),
            offsetOfMember(&RecordProbe::isPositiveFcn_),
            offsetOfMember(&RecordProbe::isNegativeFcn_),
            offsetOfMember(&RecordProbe::greaterThanFcn_),
            offsetOfMember(&RecordProbe::greaterEqualFcn_),
            offsetOfMember(&RecordProbe::checksumElements_),
            offsetOfMember(&RecordProbe::visitFlag_),
            offsetOfMember(&RecordProbe::qualifier_),
            offsetOfMember(&RecordProbe::aliasedToLocked_),
            offsetOfMember(&RecordProbe::isPointerType_),
            offsetOfMember(&RecordProbe::targetToHostFcn_),
            offsetOfMember(&RecordProbe::hostToTargetFcn_),
            offsetOfMember(&RecordProbe::targetSize_),
        });
    }
};

TEST(BinaryInterface, FieldsOfDataType) { RecordProbe::expectOrder(); }

struct TableProbe : DataTypeTable {
    static void expectOrder() {
        expectAscending({
            offsetOfMember(&TableProbe::clientDataTypeCheckCallback_),
            offsetOfMember(&TableProbe::overrideObjects_),
            offsetOfMember(&TableProbe::dataTypes_),
            offsetOfMember(&TableProbe::dataTypeIdsByName_),
            offsetOfMember(&TableProbe::anonymousTypeCount_),
            offsetOfMember(&TableProbe::anonymousTypeName_),
            offsetOfMember(&TableProbe::dataTypeAccess_),
            offsetOfMember(&TableProbe::reservedPointer_),
            offsetOfMember(&TableProbe::reservedIndex_),
            offsetOfMember(&TableProbe::dtaErrorQueue_),
            offsetOfMember(&TableProbe::secondReservedPointer_),
            offsetOfMember(&TableProbe::fixptAtomicWordLengths_),
            offsetOfMember(&TableProbe::customDataTypeCallbacks_),
            offsetOfMember(&TableProbe::customDataTypeHeaderFiles_),
        });
    }
};

TEST(BinaryInterface, FieldsOfDataTypeTable) { TableProbe::expectOrder(); }
// clang-format on

TEST(BinaryInterface, FieldsOfThePlainRecords) {
    expectAscending({offsetof(fxpDataTypeProp, DataTypeMode), offsetof(fxpDataTypeProp, Signedness),
                     offsetof(fxpDataTypeProp, WordLength), offsetof(fxpDataTypeProp, ExponentLength),
                     offsetof(fxpDataTypeProp, FixedExponent), offsetof(fxpDataTypeProp, SlopeAdjustmentFactor),
                     offsetof(fxpDataTypeProp, Bias), offsetof(fxpDataTypeProp, DataTypeOverrideOff)});
    EXPECT_EQ(offsetof(_qlDataTypeAccess_tag, table), 0u);
    EXPECT_EQ(offsetof(_qlDataTypeAccess_tag, getFxpDataTypeProp), 7 * sizeof(void*));
    static_assert(sizeof(BuiltInDataType) == sizeof(DataType) && sizeof(AutoDataType) == sizeof(DataType));
    static_assert(sizeof(AliasDataType) == sizeof(DataType) + 2 * sizeof(void*));
}

} // namespace
