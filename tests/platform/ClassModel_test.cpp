#include <stdexcept>

#include <gtest/gtest.h>

#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/classes/ClassModel.h"
#include "qlplatform/classes/Objects.h"
#include "tests/support/FailingAllocations.h"

namespace {

using namespace tcos;

struct NamedClass : COSClass {
    explicit NamedClass(const char* given) : name(given) {}
    const char* getName() const override { return name; }
    const char* name;
};

struct OneClassSource : COSClassSource {
    explicit OneClassSource(const char* given) : known(std::make_shared<NamedClass>(given)) {}
    COSInterfacePtr findClass(const internal::Interned& name) override {
        ++numCalls;
        return std::string(name.text()) == known->name ? COSInterfacePtr(known) : COSInterfacePtr();
    }
    std::shared_ptr<NamedClass> known;
    int numCalls = 0;
};

struct ThrowingSource : COSClassSource {
    COSInterfacePtr findClass(const internal::Interned&) override { throw std::runtime_error("source is gone"); }
};

COSInterfacePtr find(const char* name) { return COSClass::getClassInterface(internal::makeInterned(name)); }

TEST(ClassModel, ABareClassIsNoEnumerationAndHasNothing) {
    NamedClass bare("Bare");
    EXPECT_FALSE(bare.isEnumeration());
    EXPECT_FALSE(bare.getSuperclasses().hasMoreElements());
    EXPECT_FALSE(bare.getEnumerationMembers().hasMoreElements());
    EXPECT_EQ(bare.getPackage(), nullptr);
    EXPECT_EQ(cosiToClass(&bare), &bare);
    EXPECT_EQ(cosiToEnum(&bare), nullptr);
    EXPECT_EQ(cosiToClass(nullptr), nullptr);
    EXPECT_EQ(cosiToEnum(nullptr), nullptr);
    COSPackage package("control");
    EXPECT_EQ(cosiToClass(&package), nullptr);
    EXPECT_EQ(package.getName(), "control");
}

TEST(ClassModel, HandlesCountTheirObjects) {
    auto object = std::make_shared<NamedClass>("Bare");
    {
        const COSInterfacePtr handle = object;
        const COSInterfacePtr copy = handle; // NOLINT(performance-unnecessary-copy-initialization)
        EXPECT_EQ(object.use_count(), 3);
        EXPECT_EQ(static_cast<COSInterface*>(copy), object.get());
        EXPECT_EQ(copy->asClass(), object.get());
    }
    EXPECT_EQ(object.use_count(), 1);
    EXPECT_EQ(COSInterfacePtr(), nullptr);
    EXPECT_EQ(COSInterfacePtr(nullptr), nullptr);
}

TEST(ClassModel, ListsAreReadOnceToTheirEnd) {
    const COSSuperclassList absent;
    EXPECT_FALSE(absent.hasMoreElements());
    EXPECT_THROW(absent.nextElement(), ENoElements);
    const COSSuperclassList list(std::vector<std::string>{"First", "Second"});
    EXPECT_EQ(list.nextElement(), "First");
    const COSSuperclassList samePlace = list; // NOLINT(performance-unnecessary-copy-initialization)
    EXPECT_EQ(samePlace.nextElement(), "Second");
    EXPECT_FALSE(list.hasMoreElements());
    EXPECT_THROW(list.nextElement(), ENoElements);
    EXPECT_STREQ(ENoElements().what(), "the list has no further elements");
}

TEST(ClassModel, AListOfAClientsOwn) {
    struct Countdown : COSSequence<std::string> {
        bool hasMoreElements() const override { return left > 0; }
        std::string nextElement() override { return std::to_string(left--); }
        int left = 2;
    };
    const COSSuperclassList list(std::make_shared<Countdown>());
    EXPECT_EQ(list.nextElement(), "2");
    EXPECT_EQ(list.nextElement(), "1");
    EXPECT_THROW(list.nextElement(), ENoElements);
}

TEST(ClassModel, EqualNamesAreOneInternedName) {
    const auto gear = internal::makeInterned("Gear");
    EXPECT_EQ(gear, internal::makeInterned(std::string("Ge") + "ar"));
    EXPECT_EQ(gear.text(), internal::makeInterned("Gear").text());
    EXPECT_FALSE(gear == internal::makeInterned("gear"));
    EXPECT_FALSE(gear.isEmpty());
    EXPECT_EQ(internal::makeInterned(""), internal::Interned());
    EXPECT_TRUE(internal::Interned().isEmpty());
    EXPECT_STREQ(internal::Interned().text(), "");
}

TEST(ClassModel, TheNewestSourceIsAskedFirst) {
    const auto older = std::make_shared<OneClassSource>("Shade");
    const auto newer = std::make_shared<OneClassSource>("Shade");
    const auto other = std::make_shared<OneClassSource>("Tone");
    addClassSource(older);
    addClassSource(newer);
    addClassSource(other);
    EXPECT_EQ(cosiToClass(find("Shade")), newer->known.get());
    EXPECT_EQ(older->numCalls, 0);
    EXPECT_EQ(cosiToClass(find("Tone")), other->known.get());
    EXPECT_EQ(find("NoSuchClass"), nullptr);
    EXPECT_EQ(older->numCalls, 1);
    removeClassSource(newer.get());
    EXPECT_EQ(cosiToClass(find("Shade")), older->known.get());
    removeClassSource(newer.get());
    removeClassSource(older.get());
    removeClassSource(other.get());
    EXPECT_EQ(find("Shade"), nullptr);
    EXPECT_EQ(older.use_count(), 1);
}

TEST(ClassModel, ASourceMayRemoveItselfWhileItIsAsked) {
    struct Leaving : COSClassSource {
        COSInterfacePtr findClass(const internal::Interned&) override {
            removeClassSource(this);
            return {};
        }
    };
    addClassSource(std::make_shared<Leaving>());
    EXPECT_EQ(find("Anything"), nullptr);
}

TEST(ClassModel, ExceptionsOfSourcesPass) {
    const auto source = std::make_shared<ThrowingSource>();
    addClassSource(source);
    EXPECT_THROW(find("Anything"), std::runtime_error);
    removeClassSource(source.get());
}

TEST(ClassModel, AValueSharesItsArray) {
    const std::size_t before = txGetNumLiveArrays();
    {
        const COSValue value(txArrayPtr(txCreateDoubleScalar(4)));
        const COSValue copy = value; // NOLINT(performance-unnecessary-copy-initialization)
        EXPECT_EQ(copy.getHostArray(), value.getHostArray());
        EXPECT_EQ(COSValue(nullptr).getHostArray(), nullptr);
    }
    EXPECT_EQ(txGetNumLiveArrays(), before);
}

TEST(Objects, AnObjectArrayHasTheShapeOfItsValues) {
    const txArrayPtr objects(omCreateObjectArray("Gear", txCreateNumericMatrix(2, 3, txClassInt8, false)));
    EXPECT_EQ(txGetClassID(objects.get()), txClassObject);
    EXPECT_EQ(static_cast<int>(txGetClassID(objects.get())), 17);
    EXPECT_STREQ(txGetClassName(objects.get()), "Gear");
    EXPECT_EQ(txGetNumRows(objects.get()), 2u);
    EXPECT_EQ(txGetNumColumns(objects.get()), 3u);
    EXPECT_FALSE(txIsComplex(objects.get()));
    EXPECT_EQ(txGetData(objects.get()), nullptr);
    EXPECT_EQ(txGetClassID(omGetUnderlyingArray(objects.get())), txClassInt8);
    const txArrayPtr copy = TxArrayUtil::SafeCreateSharedCopy(objects.get());
    EXPECT_STREQ(txGetClassName(copy.get()), "Gear");
    EXPECT_EQ(omGetUnderlyingArray(copy.get()), omGetUnderlyingArray(objects.get()));
}

TEST(Objects, AnyOtherArrayIsItsOwnUnderlyingArray) {
    const txArrayPtr number(txCreateDoubleScalar(1));
    EXPECT_EQ(omGetUnderlyingArray(number.get()), number.get());
    EXPECT_EQ(omGetUnderlyingArray(nullptr), nullptr);
}

TEST(Objects, MemoryThatRunsOutLeavesNothingBehind) {
    EXPECT_EQ(testsupport::failEachAllocation([] { txArrayPtr(omCreateObjectArray("Gear", txCreateDoubleScalar(1))); }),
              4u);
}

} // namespace
