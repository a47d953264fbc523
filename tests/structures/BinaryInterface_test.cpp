// Slots of virtual operations and order of fields, which are the binary interface.
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/StructDataType.h"
#include "tests/support/Slots.h"

namespace {

using namespace QLTypeSys;
using testsupport::expectAscending;
using testsupport::offsetOfMember;
using testsupport::slotOf;

void expectConsecutive(const std::vector<std::size_t>& slots, std::size_t first) {
    for (std::size_t i = 0; i < slots.size(); ++i)
        EXPECT_EQ(slots[i], first + i) << "operation " << i;
}

// clang-format off
TEST(BinaryInterface, SlotsThatTheStructureAdds) {
    expectConsecutive({
        slotOf(&StructDataType::getNumElements),
        slotOf(&StructDataType::setNumElements),
        slotOf(&StructDataType::getNumFlatElements),
        slotOf(&StructDataType::setNumFlatElements),
        slotOf(&StructDataType::getNumRawElements),
        slotOf(&StructDataType::setNumRawElements),
        slotOf(&StructDataType::getNumDFSElements),
        slotOf(&StructDataType::setNumDFSElements),
        slotOf(&StructDataType::getElements),
        slotOf(&StructDataType::getDFSIdxFromFlatIdx),
        slotOf(&StructDataType::getFlatIdxFromDFSIdx),
        slotOf(&StructDataType::setDFSIdxFromFlatIdx),
        slotOf(&StructDataType::getDtChecksumValue),
        slotOf(&StructDataType::setDtChecksumValue),
        slotOf(&StructDataType::isBusType),
    }, slotOf(&DataType::updateAliasedThruToType) + 1);
}

TEST(BinaryInterface, SlotsOfTheViews) {
    expectConsecutive({
        slotOf(&StructElementAccess::getNumElements),
        slotOf(&StructElementAccess::getName),
        slotOf(&StructElementAccess::getDataTypeId),
        slotOf(&StructElementAccess::getUnitId),
        slotOf(&StructElementAccess::getNumDimensions),
        slotOf(&StructElementAccess::getDimensions),
        slotOf(&StructElementAccess::getWidth),
        slotOf(&StructElementAccess::getComplexWidth),
        slotOf(&StructElementAccess::getOffset),
        slotOf(&StructElementAccess::getVarDimsOffset),
        slotOf(&StructElementAccess::getSignalType),
        slotOf(&StructElementAccess::getSamplingMode),
        slotOf(&StructElementAccess::getDimensionsMode),
        slotOf(&StructElementAccess::getMin),
        slotOf(&StructElementAccess::getMax),
        slotOf(&StructElementAccess::isIdxValid),
    }, 2); // behind the two forms of the destructor
}

struct StructureProbe : StructDataType {
    using StructDataType::StructDataType;
    static void expectOrder() {
        expectAscending({
            offsetOfMember(&StructureProbe::targetSize_), // the last of the base
            offsetOfMember(&StructureProbe::numFlatElements_),
            offsetOfMember(&StructureProbe::numRawElements_),
            offsetOfMember(&StructureProbe::numDFSElements_),
            offsetOfMember(&StructureProbe::dfsIdxFromFlatIdx_),
            offsetOfMember(&StructureProbe::elements_),
            offsetOfMember(&StructureProbe::dtChecksumValue_),
            offsetOfMember(&StructureProbe::emitPadding_),
            offsetOfMember(&StructureProbe::propertiesCached_),
            offsetOfMember(&StructureProbe::derived_),
            offsetOfMember(&StructureProbe::cachedElements_),
        });
    }
};
// clang-format on

TEST(BinaryInterface, FieldsOfTheStructure) { StructureProbe::expectOrder(); }

TEST(BinaryInterface, FieldsOfTheFlags) {
    using Flags = FrequentlyAccessedProperties;
    expectAscending({offsetof(Flags, hasFrameBasedElements), offsetof(Flags, hasVarDims), offsetof(Flags, hasAOB),
                     offsetof(Flags, hasComplexData), offsetof(Flags, hasStringData), offsetof(Flags, hasConstructFcn),
                     offsetof(Flags, hasDestructFcn), offsetof(Flags, hasDeepCopyFcn),
                     offsetof(Flags, hasHalfPrecisionData)});
    static_assert(sizeof(Flags) == 9);
}

TEST(BinaryInterface, FieldsOfTheBusAndTheCachedElement) {
    expectAscending({sizeof(StructDataType) - 1, offsetOfMember(&BusDataType::sameMinValForAllLeaf),
                     offsetOfMember(&BusDataType::sameMaxValForAllLeaf),
                     offsetOfMember(&BusDataType::hasLeafWithSymbolicDimensions)});
    expectAscending({offsetOfMember(&CachedElement::element), offsetOfMember(&CachedElement::ownsElement),
                     offsetOfMember(&CachedElement::offset), offsetOfMember(&CachedElement::varDimsOffset)});
}

} // namespace
