// Which operation of the services makes a diagnostic. This program stands in for the one that names a component, as a
// platform of an engine's own would.
#include <gtest/gtest.h>

#include "qltypes/date_time/DateTimeStruct.h"
#include "qltypes/date_time/TimeSystem.h"
#include "qltypes/date_time/TimeZone.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "tests/support/Raises.h"

namespace {

std::vector<std::string> components; // of each call

} // namespace

qlsvDiagnosticImpl* qlsvCreateDiagnostic(const resource_core::BaseMsgID& message, const std::string& component) {
    components.push_back(component);
    return qlsvCreateDiagnosticFromMessageID(message);
}

namespace {

using namespace QLTypeSys;

class ReplacedServices : public testing::Test {
  protected:
    ReplacedServices() {
        plain = table.registerDataType("Plain", dtSourceBuiltIn, nullptr);
        alias = table.registerAliasDataType("Second", dtSourceBuiltIn, plain, nullptr);
        structure = table.registerStructDataType("S", dtSourceBuiltIn, nullptr);
        components.clear();
    }

    /// The components named while `work` ran, whose diagnostic, if any, has `numItems` messages.
    template <class Work> std::vector<std::string> named(int numItems, Work work) {
        components.clear();
        qlsvDiagnosticImpl* made = work();
        EXPECT_EQ(made ? qlsvGetNumItemsInDiagnostic(made) : 0, numItems);
        qlsvDiscardDiagnostic(made);
        return components;
    }

    DataTypeTable table;
    int plain, alias, structure;
};

const std::vector<std::string> none;
const std::vector<std::string> once{""};

TEST_F(ReplacedServices, WhatIsReturnedNamesNoComponent) {
    int size;
    EXPECT_EQ(named(1, [&] { return DtCheckForInvalidDataTypeSize(&table); }), once);
    EXPECT_EQ(named(1, [&] { return DtGetDataTypeSizeWithCheck(&table, plain, &size); }), once);
    EXPECT_EQ(named(1, [&] { return DtCheckDataTypeElementIndex(&table, "b", 99, 0); }), once);
    EXPECT_EQ(named(1, [&] { return DtCheckDataTypeElementIndex(&table, "b", structure, 0); }), once);
    EXPECT_EQ(named(1, [&] { return DtSetDataTypeNumElements(&table, "b", structure, 0); }), once);
    EXPECT_EQ(named(0, [&] { return DtSetDataTypeNumElements(&table, "b", structure, 1); }), none);
    StructElement* const element = DtGetStructDataTypeObject(&table, structure)->getElements()[0];
    element->setDataTypeId(DATA_TYPE_ID_DOUBLE);
    element->setNumDimensions(1);
    element->setDimension(0, 1L << 30);
    EXPECT_EQ(named(1, [&] { return DtComputeDerivedStructAttributes(&table, structure); }), once);
}

TEST_F(ReplacedServices, WhatIsRaisedIsMadeOfTheMessageAlone) {
    EXPECT_EQ(named(1, [&] { return DtSetSerializeFcn(&table, alias, nullptr); }), none);
    EXPECT_EQ(named(1, [&] { return DtSetDataTypeSize(&table, "", alias, 4); }), none);
    EXPECT_EQ(named(2, [&] { return DtSetDataTypeSize(&table, "b", alias, 4); }), once) << "the block alone";
    EXPECT_EQ(named(2, [&] { return DtCheckDataTypeId(&table, "b", 99); }), once);
    int id;
    EXPECT_EQ(named(2, [&] { return DtRegisterDataType(&table, "b", "1x", dtSourceBuiltIn, &id); }), none);
}

TEST_F(ReplacedServices, TimesRaiseWhatNamesNoComponent) {
    using namespace QLDateTime;
    const double noZone[] = {99, 0};
    EXPECT_RAISES(TimeZone::validateAndConvertToVector(noZone), "Quillane:DateTime:InvalidTimeZoneValue");
    EXPECT_EQ(components, once);
    const double noTime[] = {2000, 13, 1, 0, 0, 0, 0};
    EXPECT_RAISES(DateTimeStruct::validateAndConvertToTimeVector(noTime), "Quillane:DateTime:InvalidTimeValue");
    EXPECT_EQ(components.size(), 2u);
    TimeSystem gps(AbsoluteTimeScale::GPS);
    const DateTimeStruct early(1900, 1, 1, 0, 0, 0, 0.0), late(2000, 1, 1, 0, 0, 0, 0.0);
    EXPECT_EQ(testsupport::raisedBy([&] { gps.setEpoch(early); }).rfind("Quillane:DateTime:InvalidTimeEpoch", 0), 0u);
    EXPECT_EQ(components.size(), 3u);
    EXPECT_EQ(testsupport::raisedBy([&] { gps.setRange({late, early}); }), "Quillane:DateTime:InvalidRange()");
    EXPECT_EQ(components.size(), 4u);
    EXPECT_EQ(testsupport::raisedBy([&] {
                  gps.setRange({early, late});
              }).rfind("Quillane:DateTime:InvalidTimeRange", 0),
              0u);
    EXPECT_EQ(components, std::vector<std::string>(5, ""));
}

} // namespace
