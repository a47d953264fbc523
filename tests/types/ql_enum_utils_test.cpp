#include <functional>
#include <stdexcept>

#include <gtest/gtest.h>

#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/classes/DefinedClass.h"
#include "qlplatform/classes/Objects.h"
#include "qlplatform/services/HostFunctions.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "qltypes/types/ql_enum_utils.h"
#include "tests/support/FailingAllocations.h"
#include "tests/support/FlagState.h"

namespace {

using testsupport::FlagState;
using namespace tcos;
using Pair = std::complex<std::int32_t>;

/// The report of the check as text; discards it.
std::string checked(COSInterfacePtr interface) {
    qlsvDiagnosticImpl* d = qlCheckForValidEnumDataType(std::move(interface));
    const std::string text = testsupport::describe(d);
    qlsvDiscardDiagnostic(d);
    return text;
}

std::string report(const char* leaf, const char* name) {
    return std::string("Quillane:DataType:") + leaf + "('" + name + "')";
}
constexpr const char* passed = "no diagnostic";
constexpr const char* notAClass = "Quillane:DataType:EnumTypeNotAClass()";

struct Colour : COSEnum {
    explicit Colour(std::function<txArrayPtr()> given) : value(std::move(given)) {}
    const char* getName() const override { return "Red"; }
    txArrayPtr getValue() const override { return value(); }
    std::function<txArrayPtr()> value;
};

/// A class that answers as told, notes the order of the questions, and throws at one of them.
struct ScriptedClass : COSClass {
    template <class Answer> Answer asked(const char* question, Answer answer) const {
        questions += std::string(questions.empty() ? "" : " ") + question;
        if (failAt == question) fail();
        return answer;
    }
    bool isEnumeration() const override { return asked("isEnumeration", isEnum); }
    const char* getName() const override { return asked("name", name); }
    COSSuperclassList getSuperclasses() const override {
        return asked("superclasses", COSSuperclassList(superclasses));
    }
    COSInterfacePtr getPackage() const override { return asked("package", package); }
    COSIterator getEnumerationMembers() const override { return asked("members", COSIterator(members)); }

    void addMember(std::function<txArrayPtr()> value) { members.push_back(std::make_shared<Colour>(std::move(value))); }

    const char* name = "Colour";
    bool isEnum = true;
    std::vector<std::string> superclasses = {"Quillane.IntEnumType"};
    COSInterfacePtr package;
    std::vector<COSInterfacePtr> members;
    std::string failAt;
    std::function<void()> fail = [] {};
    mutable std::string questions;
};

std::shared_ptr<ScriptedClass> validClass() {
    auto made = std::make_shared<ScriptedClass>();
    made->addMember([] { return txArrayPtr(txCreateRow<std::int32_t>({1})); });
    return made;
}

/// Everything wrong at once; repairing in order shows the order of the checks.
TEST(EnumCheck, ChecksComeInTheirOrder) {
    auto cls = std::make_shared<ScriptedClass>();
    cls->isEnum = false;
    cls->superclasses = {"Base", "Other"};
    cls->package = std::make_shared<COSPackage>("paint");
    EXPECT_EQ(checked(cls), report("EnumTypeNotAnEnumerationClass", "Colour"));
    cls->isEnum = true;
    EXPECT_EQ(checked(cls), report("EnumTypeWithInvalidSuperclass", "Colour"));
    cls->superclasses = {"Quillane.IntEnumType", "Other"};
    EXPECT_EQ(checked(cls), report("EnumTypeWithMultipleInheritance", "Colour"));
    cls->superclasses.pop_back();
    EXPECT_EQ(checked(cls), report("EnumTypeInsidePackage", "Colour"));
    cls->package = nullptr;
    EXPECT_EQ(checked(cls), report("EnumTypeWithNoEnumStrings", "Colour"));
    cls->addMember([] { return txArrayPtr(txCreateRow<std::int32_t>({1})); });
    cls->addMember([] { return txArrayPtr(txCreateRow<Pair>({{1, 2}})); });
    EXPECT_EQ(checked(cls), report("EnumTypeWithComplexValues", "Colour"));
    cls->members.pop_back();
    cls->questions.clear();
    EXPECT_EQ(checked(cls), passed);
    EXPECT_EQ(cls->questions, "name isEnumeration superclasses package members");
    EXPECT_TRUE(qlIsValidEnumDataType(cls));
}

TEST(EnumCheck, NothingIsAskedPastTheFirstFault) {
    auto cls = validClass();
    cls->superclasses = {};
    EXPECT_EQ(checked(cls), report("EnumTypeWithInvalidSuperclass", "Colour"));
    EXPECT_EQ(cls->questions, "name isEnumeration superclasses");
}

TEST(EnumCheck, WhatIsNoEnumerationIsNotCheckedFurther) {
    auto cls = validClass();
    cls->isEnum = false;
    EXPECT_FALSE(qlIsValidEnumDataType(cls));
    EXPECT_EQ(cls->questions, "isEnumeration");
}

TEST(EnumCheck, SuperclassesByTheFeature) {
    struct Row {
        const char* superclass;
        bool whenOff;
        bool whenOn;
    };
    constexpr Row rows[] = {
        {"Quillane.IntEnumType", true, true},
        {"int8", false, true},
        {"uint8", false, true},
        {"int16", false, true},
        {"uint16", false, true},
        {"int32", false, true},
        {"uint32", false, false}, // does not fit a signed value of 32 bits
        {"int64", false, false},
        {"double", false, false},
        {"Int8", false, false},
        {"IntEnumType", false, false},
        {"Quillane.IntEnumType2", false, false},
        {"", false, false},
    };
    for (const int state : {0, 1, 17}) {
        const FlagState feature(QLFEAT_ControlStorageTypeForEnums, state);
        for (const Row& row : rows) {
            SCOPED_TRACE(std::string(row.superclass) + " with the feature at " + std::to_string(state));
            auto cls = validClass();
            cls->superclasses = {row.superclass};
            const bool isAllowed = state ? row.whenOn : row.whenOff;
            EXPECT_EQ(checked(cls), isAllowed ? passed : report("EnumTypeWithInvalidSuperclass", "Colour"));
            EXPECT_EQ(qlIsValidEnumDataType(cls), isAllowed);
        }
    }
}

TEST(EnumCheck, TheFirstSuperclassIsJudgedBeforeTheirNumber) {
    auto cls = validClass();
    cls->superclasses = {"Base", "Quillane.IntEnumType"};
    EXPECT_EQ(checked(cls), report("EnumTypeWithInvalidSuperclass", "Colour"));
    cls->superclasses = {"Quillane.IntEnumType", "Quillane.IntEnumType"};
    EXPECT_EQ(checked(cls), report("EnumTypeWithMultipleInheritance", "Colour"));
}

TEST(EnumCheck, ComplexValuesByTheFeature) {
    struct Row {
        const char* superclass;
        int preserve;
        bool passes;
    };
    constexpr Row rows[] = {{"Quillane.IntEnumType", 0, false},
                            {"Quillane.IntEnumType", 1, true},
                            {"int32", 0, false},
                            {"int32", 1, false}};
    const FlagState storage(QLFEAT_ControlStorageTypeForEnums, 1);
    for (const Row& row : rows) {
        SCOPED_TRACE(std::string(row.superclass) + ", preserve " + std::to_string(row.preserve));
        const FlagState preserve(QlFeature::find("PreserveEnumsWithDuplicateValues"), row.preserve);
        auto cls = validClass();
        cls->superclasses = {row.superclass};
        cls->addMember([] { return txArrayPtr(omCreateObjectArray("Colour", txCreateRow<Pair>({{1, 2}}))); });
        EXPECT_EQ(checked(cls), row.passes ? passed : report("EnumTypeWithComplexValues", "Colour"));
    }
}

TEST(EnumCheck, MembersWithoutAValueAreNotComplex) {
    auto cls = validClass();
    cls->addMember([] { return txArrayPtr(); });
    cls->members.push_back(validClass()); // no enumeration member at all
    cls->members.push_back(nullptr);
    EXPECT_EQ(checked(cls), passed);
}

TEST(EnumCheck, EmptyAndMissingNamesAreReportedAsEmpty) {
    auto cls = validClass();
    cls->superclasses = {};
    for (const char* name : {"", static_cast<const char*>(nullptr)}) {
        cls->name = name;
        EXPECT_EQ(checked(cls), report("EnumTypeWithInvalidSuperclass", ""));
    }
}

TEST(EnumCheck, WhatIsNoClass) {
    EXPECT_EQ(checked(nullptr), notAClass);
    EXPECT_FALSE(qlIsValidEnumDataType(nullptr));
    const COSInterfacePtr package = std::make_shared<COSPackage>("paint");
    EXPECT_EQ(checked(package), notAClass);
    EXPECT_FALSE(qlIsValidEnumDataType(package));
    struct NoClass : COSInterface {
        COSClass* asClass() override { throw std::runtime_error("no class"); }
    };
    EXPECT_EQ(checked(std::make_shared<NoClass>()), notAClass);
    EXPECT_FALSE(qlIsValidEnumDataType(std::make_shared<NoClass>()));
}

[[noreturn]] void throwReport() {
    qlsvDiagnosticImpl* d = qlsvCreateDiagnosticFromMessageID(resource_core::BaseMsgID("Client", "ClassIsLocked", 0));
    qlsvThrowIExceptionFromDiagnostic(d, nullptr);
}

TEST(EnumCheck, ExceptionsOfEveryKindAtEveryQuestion) {
    struct ForeignReport : foundation::core::except::IException {
        const char* what() const noexcept override { return "no details"; }
        const qlsvDiagnosticImpl* diagnostic() const noexcept override { return nullptr; }
    };
    struct Kind {
        std::function<void()> fail;
        const char* expected;
    };
    const Kind kinds[] = {
        {throwReport, "Client:ClassIsLocked()"},
        {[] { throw ForeignReport(); }, "Quillane:Services:ForeignException('no details')"},
        {[] { throw ENoElements(); }, notAClass},
        {[] { throw std::runtime_error("broken"); }, notAClass},
        {[] { throw std::bad_alloc(); }, notAClass},
        {[] { throw 42; }, notAClass},
    };
    for (const char* question : {"name", "isEnumeration", "superclasses", "package", "members"}) {
        for (const Kind& kind : kinds) {
            SCOPED_TRACE(std::string(question) + " gives " + kind.expected);
            auto cls = validClass();
            cls->failAt = question;
            cls->fail = kind.fail;
            EXPECT_EQ(checked(cls), kind.expected);
            EXPECT_FALSE(qlIsValidEnumDataType(cls));
            EXPECT_EQ(cls.use_count(), 1);
        }
    }
    for (const Kind& kind : kinds) {
        SCOPED_TRACE(std::string("a member's value gives ") + kind.expected);
        auto cls = validClass();
        cls->addMember([&kind]() -> txArrayPtr {
            kind.fail();
            return nullptr;
        });
        EXPECT_EQ(checked(cls), kind.expected);
        EXPECT_FALSE(qlIsValidEnumDataType(cls));
    }
}

TEST(EnumCheck, ListsThatThrow) {
    struct Throwing : COSSequence<std::string> {
        explicit Throwing(int remaining) : left(remaining) {}
        bool hasMoreElements() const override {
            if (left == 0) throw std::runtime_error("list is gone");
            return true;
        }
        std::string nextElement() override {
            --left;
            return "Quillane.IntEnumType";
        }
        int left;
    };
    struct WithList : ScriptedClass {
        COSSuperclassList getSuperclasses() const override {
            return COSSuperclassList(std::make_shared<Throwing>(remaining));
        }
        int remaining = 0;
    };
    auto cls = std::make_shared<WithList>();
    for (cls->remaining = 0; cls->remaining < 2; ++cls->remaining) {
        EXPECT_EQ(checked(cls), notAClass);
        EXPECT_FALSE(qlIsValidEnumDataType(cls));
    }
}

TEST(EnumCheck, CyclesAmongSuperclassesEnd) {
    const auto first = std::make_shared<DefinedClass>("First", ClassKind::enumeration);
    const auto second = std::make_shared<DefinedClass>("Second", ClassKind::enumeration);
    first->derivesFrom("Second").addMember("A", 1);
    second->derivesFrom("First").addMember("B", 1);
    const auto itself = std::make_shared<DefinedClass>("Itself", ClassKind::enumeration);
    itself->derivesFrom("Itself").addMember("C", 1);
    for (const auto& cls : {first, second, itself}) {
        defineClass(cls);
        EXPECT_EQ(checked(cls), report("EnumTypeWithInvalidSuperclass", cls->getName()));
    }
    for (const char* name : {"First", "Second", "Itself"})
        removeClass(name);
}

TEST(EnumCheck, MemoryThatRunsOutIsReported) {
    DefinedClass gear("Gear", ClassKind::enumeration);
    gear.derivesFrom("Quillane.IntEnumType").addMember("Park", 0).addMember("Drive", 1);
    const std::shared_ptr<DefinedClass> shared(&gear, [](DefinedClass*) {});
    int numReported = 0;
    EXPECT_EQ(testsupport::failEachAllocation(
                  [&] {
                      const std::string text = checked(shared);
                      if (text != passed) {
                          EXPECT_EQ(text, "Quillane:Services:OutOfMemory()");
                          ++numReported;
                      }
                  },
                  true),
              2u);
    EXPECT_EQ(numReported, 2);
}

TEST(EnumObject, OnlyObjectsOfValidClasses) {
    const auto gear = std::make_shared<DefinedClass>("Gear", ClassKind::enumeration);
    gear->derivesFrom("Quillane.IntEnumType").addMember("Park", 0);
    defineClass(gear);
    const auto makeObject = [](const char* className) {
        return txArrayPtr(omCreateObjectArray(className, txCreateRow<std::int32_t>({0})));
    };
    for (const auto isValid : {qlIsValidEnumObject, txIsValidEnumObject}) {
        EXPECT_FALSE(isValid(nullptr));
        EXPECT_TRUE(isValid(makeObject("Gear").get()));
        EXPECT_FALSE(isValid(makeObject("NoSuchClass").get()));
        EXPECT_FALSE(isValid(makeObject("").get()));
        EXPECT_FALSE(isValid(txArrayPtr(txCreateString("Gear")).get()));
        EXPECT_FALSE(isValid(txArrayPtr(txCreateRow<std::int32_t>({0})).get()));
    }
    gear->derivesFrom("Other");
    EXPECT_FALSE(qlIsValidEnumObject(makeObject("Gear").get()));
    removeClass("Gear");
}

TEST(EnumObject, AThrowingClassSourceMeansNo) {
    struct Throwing : COSClassSource {
        COSInterfacePtr findClass(const internal::Interned& name) override {
            names += name.isEmpty() ? "[empty]" : name.text();
            throw std::runtime_error("source is gone");
        }
        std::string names;
    };
    const auto source = std::make_shared<Throwing>();
    addClassSource(source);
    for (const char* name : {"Gear", ""})
        EXPECT_FALSE(qlIsValidEnumObject(txArrayPtr(omCreateObjectArray(name, txCreateDoubleScalar(0))).get()));
    removeClassSource(source.get());
    EXPECT_EQ(source->names, "Gear[empty]");
}

TEST(EnumStorage, FiveIntegers) {
    for (const char* name : {"int8", "int16", "int32", "uint8", "uint16"})
        EXPECT_TRUE(qlIsValidEnumStorageType(name)) << name;
    for (const char* name : {"uint32", "int64", "uint64", "double", "boolean", "", "int8 ", "INT8", "int"})
        EXPECT_FALSE(qlIsValidEnumStorageType(name)) << name;
}

TEST(EnumStoredIntegers, RealValuesAreSharedAndComplexOnesReduced) {
    const txArrayPtr real(omCreateObjectArray("Gear", txCreateRow<std::int16_t>({3, -4})));
    const txArrayPtr shared = qlGetStoredIntTxArrayFromEnumObject(real.get());
    EXPECT_EQ(txGetData(shared.get()), txGetData(omGetUnderlyingArray(real.get())));
    EXPECT_NE(shared.get(), omGetUnderlyingArray(real.get()));

    const txArrayPtr complex(omCreateObjectArray("Gear", txCreateRow<Pair>({{3, 1}, {-4, 2}})));
    const txArrayPtr reduced = qlGetStoredIntTxArrayFromEnumObject(complex.get());
    ASSERT_TRUE(txHasElements<std::int32_t>(reduced.get()));
    EXPECT_EQ(txGetElements<std::int32_t>(reduced.get())[0], 3);
    EXPECT_EQ(txGetElements<std::int32_t>(reduced.get())[1], -4);

    EXPECT_EQ(qlGetStoredIntTxArrayFromEnumObject(nullptr), nullptr);
    EXPECT_EQ(testsupport::failEachAllocation([&] { qlGetStoredIntTxArrayFromEnumObject(complex.get()); }), 2u);
    EXPECT_EQ(testsupport::failEachAllocation([&] { qlGetStoredIntTxArrayFromEnumObject(real.get()); }), 1u);
}

TEST(EnumStoredIntegers, WhatTheHostReportsIsRaised) {
    const txArrayPtr complex(omCreateObjectArray("Gear", txCreateRow<Pair>({{3, 1}})));
    qlsvHostFunction before = qlsvSetHostFunction("real", [](qlsvOutputs, qlsvInputs) { throwReport(); });
    EXPECT_RAISES(qlGetStoredIntTxArrayFromEnumObject(complex.get()), "Client:ClassIsLocked");
    qlsvSetHostFunction("real", std::move(before));
}

TEST(EnumValues, AreReadByTheStorageType) {
    QLTypeSys::DataTypeTable table;
    const int id = table.registerDataType("Gear", dtSourceEnum, nullptr);
    alignas(8) const unsigned char data[] = {0xff, 0x80, 0xfe, 0xff, 0x01, 0x80, 0xff, 0xff, 0xff, 0xff, 0xff, 0x80};
    struct Row {
        int storageId;
        unsigned long index;
        int expected;
    };
    constexpr Row rows[] = {
        {2, 0, -1},     {2, 1, -128},  {2, 4, 1},     {3, 0, 255},    {3, 1, 128},         {4, 1, -2},
        {4, 2, -32767}, {5, 1, 65534}, {5, 2, 32769}, {6, 0, -98049}, {6, 2, -2130706433}, {7, 0, -98049},
        {7, 1, -32767}, {0, 0, 0},     {1, 0, 0},     {8, 0, 0},      {9, 0, 0},           {-1, 0, 0},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE("storage " + std::to_string(row.storageId) + ", index " + std::to_string(row.index));
        table.getDataTypeAt(static_cast<unsigned long>(id + 1))->setStorageId(row.storageId);
        EXPECT_EQ(DtGetEnumTypeValueFromVoidPtr(&table, id, data, row.index), row.expected);
    }
}

TEST(EnumValues, AnUnstoredEnumerationReadsAsZero) {
    QLTypeSys::DataTypeTable table;
    const int id = table.registerDataType("Gear", dtSourceEnum, nullptr);
    EXPECT_EQ(DtGetEnumTypeValueFromVoidPtr(&table, id, nullptr, 7), 0);
}

TEST(EnumType, WhetherAnIdServesForAName) {
    QLTypeSys::DataTypeTable table;
    const int gear = table.registerDataType("Gear", dtSourceEnum, nullptr);
    const int plain = table.registerDataType("Plain", static_cast<DataTypeSource>(2), nullptr);
    struct Row {
        int id;
        const char* name;
        bool answer;
        int result;
    };
    const Row rows[] = {
        {gear, "Gear", true, gear},  {gear, "gear", true, -10},       {gear, "", false, -10},
        {gear, nullptr, false, -10}, {plain, "Plain", true, -10},     {plain + 1, "Gear", true, -10},
        {-10, "Gear", true, -10},    {2147483647, "Gear", true, -10}, {0, "double", true, -10},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(std::to_string(row.id) + " for " + (row.name ? row.name : "null"));
        int result = 99;
        EXPECT_EQ(DtIsValidEnumType(&table, row.id, row.name, &result), row.answer);
        EXPECT_EQ(result, row.result);
    }
    EXPECT_TRUE(DtIsEnumType(&table, gear));
    EXPECT_FALSE(DtIsEnumType(&table, plain));
    EXPECT_EQ(DtGetEnumTypeStringFromValue(&table, gear, 0), nullptr);
}

} // namespace
