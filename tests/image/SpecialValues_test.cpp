// Values of structures with strings, matrices and images, handled by identifier against a plain model.
#include <cstring>
#include <memory>
#include <optional>
#include <random>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "qlplatform/strings/DynamicStringPool.h"
#include "qltypes/dynamic_matrix/DynamicMatrixMemoryManager.h"
#include "qltypes/image/ImageDataType.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/types/StringDataType.h"
#include "tests/structures/Builder.h"

namespace {

using QLTypeSys::DataTypeTable;
using QLTypeSys::DynamicMatrixMemoryManager;
using QLTypeSys::StringDataType;

struct Leaf {
    int typeId;
    std::size_t offset;
};

std::size_t numTexts() {
    using stringutil::DynamicStringPool;
    return DynamicStringPool::GetPool(DynamicStringPool::GlobalPoolName).size();
}

std::size_t numBlocks() { return DynamicMatrixMemoryManager::GetMemoryManager().numBlocks(); }

// A number, texts alone and in an array, matrices, an image, and a nested structure twice.
class Frame : public structures::Structures {
  public:
    const int text = table.registerStringDataType(0, nullptr);
    const int label = table.registerStringDataType(16, nullptr);
    const int samples = table.registerDynamicMatrixDataType(DATA_TYPE_ID_INT32, 2);
    const int aliasOfSamples = alias("Samples", samples);
    const int image = table.registerImageDataType(3, SSImageColorFormat_RGB, SSImageDataLayout_RowMajorInterleaved,
                                                  DATA_TYPE_ID_UINT8);
    const int inner = laidOut("Inner", {{"name", label}, {"values", samples}});
    const int outer = laidOut("Outer", {{"time", DATA_TYPE_ID_DOUBLE},
                                        {"tags", text, {3}},
                                        {"parts", inner, {2}},
                                        {"picture", image},
                                        {"last", aliasOfSamples}});

    std::size_t size() { return static_cast<std::size_t>(record(outer)->getSize()); }

    /// All scalar leaves with their offsets from the start of the outer structure.
    std::vector<Leaf> leaves() {
        std::vector<Leaf> found;
        collect(outer, 0, found);
        return found;
    }

  private:
    void collect(int structure, std::size_t base, std::vector<Leaf>& found) {
        for (const StructElement* element : record(structure)->getElements()) {
            const auto size = static_cast<std::size_t>(DtGetDataTypeSize(&table, element->dataTypeId));
            for (long i = 0; i < element->getWidth(); ++i) {
                const std::size_t at =
                    base + static_cast<std::size_t>(element->offset) + static_cast<std::size_t>(i) * size;
                if (DtIsStructType(&table, element->dataTypeId))
                    collect(element->dataTypeId, at, found);
                else
                    found.push_back({element->dataTypeId, at});
            }
        }
    }
};

TEST(SpecialValues, TheLeavesOfTheStructureLieWhereTheLayoutSays) {
    Frame frame;
    EXPECT_EQ(frame.size(), 8u + 3 * 8 + 2 * (8 + 104) + 104 + 104);
    const std::vector<Leaf> leaves = frame.leaves();
    ASSERT_EQ(leaves.size(), 10u);
    const std::size_t offsets[] = {0, 8, 16, 24, 32, 40, 144, 152, 256, 360};
    for (std::size_t i = 0; i < leaves.size(); ++i)
        EXPECT_EQ(leaves[i].offset, offsets[i]) << i;
}

TEST(SpecialValues, AStructureIsBuiltCopiedAndTakenDownLeafByLeaf) {
    Frame frame;
    const std::vector<Leaf> leaves = frame.leaves();
    std::vector<unsigned char> from(frame.size()), to(frame.size());
    for (const Leaf& leaf : leaves) {
        frame.table.construct(leaf.typeId, &from[leaf.offset]);
        frame.table.construct(leaf.typeId, &to[leaf.offset]);
    }
    EXPECT_EQ(numTexts(), 10u);
    StringDataType::writeUStringScalarToVoidPtrOutput(u"left", &from[leaves[1].offset], 0);
    const int data[] = {1, 2, 3, 4, 5, 6};
    const unsigned long dims[] = {2, 3};
    EXPECT_TRUE(frame.table.dataConstruct(frame.aliasOfSamples, 2, dims, sizeof(int), data, &from[leaves[9].offset]));
    for (const Leaf& leaf : leaves)
        frame.table.deepCopy(leaf.typeId, &to[leaf.offset], &from[leaf.offset]);
    for (const Leaf& leaf : leaves)
        frame.table.destruct(leaf.typeId, &from[leaf.offset]);
    EXPECT_EQ(StringDataType::getUStringScalarFromVoidPtrInput(&to[leaves[1].offset]), u"left");
    EXPECT_EQ(std::memcmp(frame.table.containedData(frame.samples, &to[leaves[9].offset]), data, sizeof data), 0);
    for (const Leaf& leaf : leaves)
        frame.table.destruct(leaf.typeId, &to[leaf.offset]);
    EXPECT_EQ(numTexts(), 0u);
    EXPECT_EQ(numBlocks(), 0u);
}

// What a leaf is expected to hold. Contents are not known after a change of size.
struct Expected {
    double number = 0;
    std::u16string text;
    std::vector<unsigned long> dims;
    std::optional<std::vector<unsigned char>> contents;
};

class Instances {
  public:
    explicit Instances(unsigned seed) : random_(seed) {
        for (Instance& instance : instances_)
            instance.memory = std::make_unique<unsigned char[]>(frame_.size());
    }

    void step() {
        Instance& instance = any();
        if (!instance.isAlive) {
            build(instance);
            return;
        }
        const std::size_t leaf = random_() % leaves_.size();
        switch (random_() % 8) {
        case 0:
            if (random_() % 4 == 0) takeDown(instance);
            break;
        case 1:
            if (Instance& from = any(); from.isAlive)
                for (std::size_t i = 0; i < leaves_.size(); ++i)
                    copy(from, instance, i);
            break;
        case 2:
        case 3:
            if (Instance& from = any(); from.isAlive) copy(from, instance, leaf);
            break;
        case 4:
            rebuild(instance, leaf);
            break;
        default:
            change(instance, leaf);
        }
        check(instance, leaf);
    }

    void takeDownAll() {
        for (Instance& instance : instances_)
            if (instance.isAlive) takeDown(instance);
    }

  private:
    struct Instance {
        std::unique_ptr<unsigned char[]> memory;
        bool isAlive = false;
        std::vector<Expected> expected;
    };

    Instance& any() { return instances_[random_() % std::size(instances_)]; }
    unsigned char* at(const Instance& instance, std::size_t leaf) { return &instance.memory[leaves_[leaf].offset]; }
    int typeOf(std::size_t leaf) const { return leaves_[leaf].typeId; }
    bool isNumber(std::size_t leaf) const { return typeOf(leaf) == DATA_TYPE_ID_DOUBLE; }
    bool isText(std::size_t leaf) const { return table().IsStringDataType(typeOf(leaf)); }
    const DataTypeTable& table() const { return frame_.table; }

    // A matrix is shaped by its construction, an image by its first change.
    Expected fresh(std::size_t leaf) const {
        Expected expected;
        if (DtIsDynamicMatrixType(&table(), typeOf(leaf))) expected.dims = {0, 0};
        return expected;
    }

    void build(Instance& instance) {
        instance.expected.assign(leaves_.size(), {});
        for (std::size_t i = 0; i < leaves_.size(); ++i)
            construct(instance, i);
        instance.isAlive = true;
    }

    void construct(Instance& instance, std::size_t leaf) {
        if (isNumber(leaf)) std::memset(at(instance, leaf), 0, sizeof(double)); // no construction touches it
        table().construct(typeOf(leaf), at(instance, leaf));
        instance.expected[leaf] = fresh(leaf);
    }

    void takeDown(Instance& instance) {
        for (std::size_t i = 0; i < leaves_.size(); ++i) {
            check(instance, i);
            table().destruct(typeOf(i), at(instance, i));
        }
        instance.isAlive = false;
    }

    void rebuild(Instance& instance, std::size_t leaf) {
        table().destruct(typeOf(leaf), at(instance, leaf));
        construct(instance, leaf);
    }

    void copy(const Instance& from, Instance& to, std::size_t leaf) {
        table().deepCopy(typeOf(leaf), at(to, leaf), at(from, leaf));
        to.expected[leaf] = from.expected[leaf];
    }

    void change(Instance& instance, std::size_t leaf) {
        Expected& expected = instance.expected[leaf];
        if (isNumber(leaf)) {
            expected.number = static_cast<double>(random_());
            std::memcpy(at(instance, leaf), &expected.number, sizeof(double));
        } else if (isText(leaf)) {
            expected.text.assign(random_() % 40, static_cast<char16_t>(random_()));
            StringDataType::writeUStringScalarToVoidPtrOutput(std::u16string(expected.text), at(instance, leaf), 0);
        } else {
            resize(instance, leaf);
        }
    }

    void resize(Instance& instance, std::size_t leaf) {
        Expected& expected = instance.expected[leaf];
        const unsigned long numDims = DtGetContainedDataNumDims(&table(), typeOf(leaf));
        const auto elementSize =
            static_cast<unsigned long>(DtGetDataTypeSize(&table(), DtGetContainedDataType(&table(), typeOf(leaf))));
        std::vector<unsigned long> dims(numDims);
        std::size_t numBytes = elementSize;
        for (unsigned long& dim : dims)
            numBytes *= dim = random_() % 6;
        if (random_() % 2) {
            std::vector<unsigned char> contents(numBytes);
            for (unsigned char& byte : contents)
                byte = static_cast<unsigned char>(random_());
            ASSERT_TRUE(table().dataConstruct(typeOf(leaf), numDims, dims.data(), elementSize, contents.data(),
                                              at(instance, leaf)));
            expected = {0, u"", dims, contents};
        } else {
            DtGetUpdateContainedDataDimsFcn(&table(), typeOf(leaf))(numDims, dims.data(), elementSize,
                                                                    at(instance, leaf));
            if (dims != expected.dims) expected = {0, u"", dims, std::nullopt};
            void* data = table().containedData(typeOf(leaf), at(instance, leaf));
            if (numBytes > 0 && !expected.contents) { // all of it is there to be used
                ASSERT_NE(data, nullptr);
                std::memset(data, 0x5A, numBytes);
                expected.contents.emplace(numBytes, 0x5A);
            }
        }
    }

    void check(Instance& instance, std::size_t leaf) {
        if (!instance.isAlive) return;
        const Expected& expected = instance.expected[leaf];
        if (isNumber(leaf)) {
            ASSERT_EQ(std::memcmp(at(instance, leaf), &expected.number, sizeof(double)), 0);
        } else if (isText(leaf)) {
            ASSERT_EQ(StringDataType::getUStringScalarFromVoidPtrInput(at(instance, leaf)), expected.text);
        } else {
            std::vector<unsigned long> dims(expected.dims.size());
            table().containedDataDims(typeOf(leaf), at(instance, leaf), dims.data());
            ASSERT_EQ(dims, expected.dims);
            if (expected.contents && !expected.contents->empty()) {
                ASSERT_EQ(std::memcmp(table().containedData(typeOf(leaf), at(instance, leaf)),
                                      expected.contents->data(), expected.contents->size()),
                          0);
            }
        }
    }

    Frame frame_;
    const std::vector<Leaf> leaves_ = frame_.leaves();
    Instance instances_[6];
    std::mt19937 random_;
};

TEST(SpecialValues, AgreeWithAPlainModelOverARandomSequence) {
    constexpr unsigned seed = 64;
    Instances instances(seed);
    for (int step = 0; step < 100000; ++step) {
        instances.step();
        ASSERT_FALSE(testing::Test::HasFailure()) << "seed " << seed << ", step " << step;
    }
    instances.takeDownAll();
    EXPECT_EQ(numTexts(), 0u);
    EXPECT_EQ(numBlocks(), 0u);
}

} // namespace
