#include <gtest/gtest.h>

#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/classes/DefinedClass.h"
#include "qlplatform/classes/Objects.h"
#include "qlplatform/services/HostFunctions.h"
#include "tests/support/FailingAllocations.h"

namespace {

using namespace tcos;

std::shared_ptr<DefinedClass> makeGear(const char* superclass = "Quillane.IntEnumType") {
    auto gear = std::make_shared<DefinedClass>("Gear", ClassKind::enumeration);
    gear->derivesFrom(superclass).addMember("Park", 0).addMember("Reverse", -1).addMember("Drive", 1);
    return gear;
}

COSInterfacePtr find(const char* name) { return COSClass::getClassInterface(internal::makeInterned(name)); }

TEST(DefinedClass, AnswersWhatItWasGiven) {
    const auto gear = makeGear();
    gear->derivesFrom("handle").insidePackage("vehicle");
    EXPECT_STREQ(gear->getName(), "Gear");
    EXPECT_TRUE(gear->isEnumeration());
    const COSSuperclassList superclasses = gear->getSuperclasses();
    EXPECT_EQ(superclasses.nextElement(), "Quillane.IntEnumType");
    EXPECT_EQ(superclasses.nextElement(), "handle");
    EXPECT_FALSE(superclasses.hasMoreElements());
    const COSInterfacePtr package = gear->getPackage();
    EXPECT_EQ(dynamic_cast<COSPackage&>(*package).getName(), "vehicle");
    std::string members;
    for (const COSIterator all = gear->getEnumerationMembers(); all.hasMoreElements();) {
        const COSInterfacePtr member = all.nextElement();
        const txArrayPtr value = cosiToEnum(member)->getValue();
        EXPECT_STREQ(txGetClassName(value.get()), "Gear");
        members += cosiToEnum(member)->getName();
        members += std::to_string(txGetElements<std::int32_t>(omGetUnderlyingArray(value.get()))[0]);
        EXPECT_EQ(cosiToClass(member), nullptr);
    }
    EXPECT_EQ(members, "Park0Reverse-1Drive1");
    EXPECT_FALSE(DefinedClass("Plain", ClassKind::plain).isEnumeration());
}

TEST(DefinedClass, ValuesAreOfTheFirstSuperclass) {
    struct Row {
        const char* superclass;
        txClassID storage;
    };
    constexpr Row rows[] = {{"int8", txClassInt8},   {"uint8", txClassUint8},
                            {"int16", txClassInt16}, {"uint16", txClassUint16},
                            {"int32", txClassInt32}, {"uint32", txClassInt32},
                            {"Base", txClassInt32},  {"Quillane.IntEnumType", txClassInt32}};
    for (const Row& row : rows) {
        SCOPED_TRACE(row.superclass);
        DefinedClass mode("Mode", ClassKind::enumeration);
        mode.derivesFrom(row.superclass).derivesFrom("int8").addMember("On", 1);
        const txArrayPtr value = cosiToEnum(mode.getEnumerationMembers().nextElement())->getValue();
        EXPECT_EQ(txGetClassID(omGetUnderlyingArray(value.get())), row.storage);
    }
}

TEST(DefinedClass, AMemberNeedsANumber) {
    DefinedClass mode("Mode", ClassKind::enumeration);
    EXPECT_RAISES(mode.addMember("On", nullptr), "Quillane:Classes:NoMemberValue", "Mode", "On");
    EXPECT_RAISES(mode.addMember("On", txArrayPtr(txCreateString("x"))), "Quillane:Classes:NoMemberValue", "Mode",
                  "On");
    EXPECT_RAISES(mode.addMember("On", txArrayPtr(txCreateRow<double>({1, 2}))), "Quillane:Classes:NoMemberValue",
                  "Mode", "On");
    EXPECT_RAISES(mode.addMember("On", txArrayPtr(txCreateCellMatrix(1, 1))), "Quillane:Classes:NoMemberValue", "Mode",
                  "On");
    EXPECT_FALSE(mode.getEnumerationMembers().hasMoreElements());
}

TEST(DefinedClass, DefinedClassesAreFoundAndMakeObjects) {
    EXPECT_EQ(find("Gear"), nullptr);
    const auto gear = makeGear("int16");
    defineClass(gear);
    EXPECT_EQ(cosiToClass(find("Gear")), gear.get());

    const txArrayPtr numbers(txCreateRow<double>({1, 0, -1, 1}));
    txArray_tag* input = numbers.get();
    txArray_tag* output = nullptr;
    EXPECT_EQ(qlsvFEVAL_NoThrow(1, &output, 1, &input, "Gear", true, nullptr), nullptr);
    const txArrayPtr gears(output);
    EXPECT_STREQ(txGetClassName(gears.get()), "Gear");
    const auto values = txGetElements<std::int16_t>(omGetUnderlyingArray(gears.get()));
    EXPECT_EQ(std::vector<std::int16_t>(values.begin(), values.end()), (std::vector<std::int16_t>{1, 0, -1, 1}));

    const auto redefined = makeGear();
    defineClass(redefined);
    EXPECT_EQ(cosiToClass(find("Gear")), redefined.get());
    EXPECT_EQ(gear.use_count(), 1);
    removeClass("Gear");
    EXPECT_EQ(find("Gear"), nullptr);
    qlsvDiagnosticImpl* d = qlsvFEVAL_NoThrow(1, &output, 1, &input, "Gear", true, nullptr);
    EXPECT_EQ(testsupport::describe(d), "Quillane:HostFunctions:UnknownHostFunction('Gear')");
    qlsvDiscardDiagnostic(d);
    EXPECT_EQ(redefined.use_count(), 1);
    removeClass("Gear");
}

TEST(DefinedClass, APlainClassMakesNoObjects) {
    defineClass(makeGear());
    defineClass(std::make_shared<DefinedClass>("Gear", ClassKind::plain));
    txArray_tag* input = nullptr;
    txArray_tag* output = nullptr;
    qlsvDiagnosticImpl* d = qlsvFEVAL_NoThrow(1, &output, 1, &input, "Gear", true, nullptr);
    EXPECT_EQ(testsupport::describe(d), "Quillane:HostFunctions:UnknownHostFunction('Gear')");
    qlsvDiscardDiagnostic(d);
    removeClass("Gear");
}

TEST(DefinedClass, ObjectsNeedMembers) {
    const auto gear = makeGear();
    const txArrayPtr two(txCreateRow<std::uint8_t>({1, 2}));
    EXPECT_RAISES(gear->objectsFrom(two.get()), "Quillane:Classes:NoSuchMember", "Gear", "2");
    const txArrayPtr half(txCreateDoubleScalar(0.5));
    EXPECT_RAISES(gear->objectsFrom(half.get()), "Quillane:Classes:NoSuchMember", "Gear", "0.5");
    const txArrayPtr cells(txCreateCellMatrix(1, 1));
    EXPECT_RAISES(gear->objectsFrom(cells.get()), "Quillane:Arrays:CannotCast", "cell", "double");
    const txArrayPtr none(txCreateNumericMatrix(0, 0, txClassDouble, false));
    EXPECT_EQ(txGetNumberOfElements(gear->objectsFrom(none.get()).get()), 0u);
    const txArrayPtr objects = gear->objectsFrom(txArrayPtr(txCreateRow<double>({1, -1})).get());
    const txArrayPtr again = gear->objectsFrom(objects.get());
    EXPECT_EQ(txGetElements<std::int32_t>(omGetUnderlyingArray(again.get()))[1], -1);
}

TEST(DefinedClass, RealPartsCountWhereValuesAreComplex) {
    using Pair = std::complex<std::int32_t>;
    DefinedClass mode("Mode", ClassKind::enumeration);
    mode.addMember("Off", 0)
        .addMember("On", txArrayPtr(txCreateRow<Pair>({{1, 5}})))
        .addMember("Running", txArrayPtr(txCreateRow<Pair>({{1, 6}})));
    const txArrayPtr objects = mode.objectsFrom(txArrayPtr(txCreateRow<double>({1, 0})).get());
    const auto values = txGetElements<Pair>(omGetUnderlyingArray(objects.get()));
    ASSERT_EQ(values.size(), 2u);
    EXPECT_EQ(values[0], Pair(1, 5));
    EXPECT_EQ(values[1], Pair(0, 0));
}

TEST(DefinedClass, TheFirstMemberSaysHowObjectsAreStored) {
    DefinedClass mode("Mode", ClassKind::enumeration);
    mode.addMember("Off", txArrayPtr(txCreateRow<std::int8_t>({0}))).addMember("On", 1);
    const txArrayPtr objects = mode.objectsFrom(txArrayPtr(txCreateDoubleScalar(1)).get());
    EXPECT_EQ(txGetClassID(omGetUnderlyingArray(objects.get())), txClassInt8);
}

TEST(DefinedClass, ConstructorsTakeOneArray) {
    defineClass(makeGear());
    txArray_tag* inputs[2] = {};
    txArray_tag* output = nullptr;
    qlsvDiagnosticImpl* d = qlsvFEVAL_NoThrow(1, &output, 2, inputs, "Gear", true, nullptr);
    EXPECT_EQ(testsupport::describe(d), "Quillane:Classes:WrongNumberOfArguments('Gear', 2)");
    qlsvDiscardDiagnostic(d);
    d = qlsvFEVAL_NoThrow(0, nullptr, 1, inputs, "Gear", true, nullptr);
    EXPECT_EQ(testsupport::describe(d), "Quillane:Classes:WrongNumberOfArguments('Gear', 1)");
    qlsvDiscardDiagnostic(d);
    removeClass("Gear");
}

TEST(DefinedClass, MemoryThatRunsOutLeavesNothingBehind) {
    const auto gear = makeGear();
    const txArrayPtr numbers(txCreateRow<double>({1, 0}));
    EXPECT_GT(testsupport::failEachAllocation([&] { gear->objectsFrom(numbers.get()); }), 10u);
    EXPECT_GT(testsupport::failEachAllocation([] { makeGear("int8"); }), 10u);
}

} // namespace
