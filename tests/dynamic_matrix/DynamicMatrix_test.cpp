#include <cstddef>
#include <cstring>
#include <limits>
#include <memory>
#include <new>
#include <random>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "qltypes/dynamic_matrix/DynamicMatrix.h"
#include "qltypes/dynamic_matrix/DynamicMatrixMemoryManager.h"
#include "tests/support/FailingNew.h"

namespace {

using QLTypeSys::DynamicMatrix;
using Manager = QLTypeSys::DynamicMatrixMemoryManager;
using testing::ElementsAre;

constexpr long cUnknown = -1;
constexpr long cInfinite = std::numeric_limits<long>::max();
constexpr unsigned long cUnknownUnsigned = 0xfffffffffffffffe;
constexpr unsigned long cInfiniteUnsigned = 0xffffffffffffffff;

Manager& manager() { return Manager::GetMemoryManager(); }

void update(DynamicMatrix& m, std::vector<unsigned long> dims, unsigned long elementSize = 8) {
    DynamicMatrix::updateDataDimsFcn(dims.size(), dims.data(), elementSize, &m);
}

void construct(DynamicMatrix& m, std::vector<unsigned long> dims, unsigned long elementSize, const void* data) {
    EXPECT_EQ(DynamicMatrix::dataConstructFcn(dims.size(), dims.data(), elementSize, data, &m), 1);
}

std::vector<int> narrowDims(const DynamicMatrix& m) { return {m.intDims, m.intDims + m.dims.size()}; }

std::vector<unsigned long> dimsOf(const DynamicMatrix& m) {
    std::vector<unsigned long> dims(m.dims.size());
    DynamicMatrix::getDataDimsFcn(&m, dims.data());
    return dims;
}

bool isManaged(const DynamicMatrix& m) { return manager().IsManaging({&m, m.rawData}); }

TEST(DynamicMatrix, FieldsStandInTheirOrderAndANewRecordIsZero) {
    EXPECT_EQ(offsetof(DynamicMatrix, rawData), 0u);
    EXPECT_EQ(offsetof(DynamicMatrix, dims), 8u);
    EXPECT_EQ(offsetof(DynamicMatrix, intDims), 32u);
    EXPECT_EQ(offsetof(DynamicMatrix, elementSize), 40u);
    EXPECT_EQ(offsetof(DynamicMatrix, width), 48u);
    EXPECT_EQ(sizeof(DynamicMatrix), 104u);
    EXPECT_EQ(DynamicMatrix::getSizeFcn(), 104u);

    alignas(DynamicMatrix) unsigned char memory[sizeof(DynamicMatrix)];
    std::memset(memory, 0xAB, sizeof memory);
    EXPECT_EQ(DynamicMatrix::constructFcn(memory, "ignored"), 1);
    const unsigned char zeros[sizeof(DynamicMatrix)] = {};
    EXPECT_EQ(std::memcmp(memory, zeros, sizeof memory), 0);
    EXPECT_EQ(DynamicMatrix::destructFcn(memory), 1);
}

TEST(DynamicMatrix, TheFirstDimensionsOnlyShapeTheRecord) {
    DynamicMatrix m;
    m.elementSize = 8;
    m.setDims({2, 3, 4});
    EXPECT_THAT(m.dims, ElementsAre(2, 3, 4));
    EXPECT_THAT(narrowDims(m), ElementsAre(0, 0, 0));
    EXPECT_EQ(m.width, 24u);
    EXPECT_EQ(m.rawData, nullptr);
    m.setDims({2, 3, 4}); // the same again is no second time
    EXPECT_THAT(narrowDims(m), ElementsAre(0, 0, 0));
    EXPECT_EQ(m.rawData, nullptr);
    m.setDims({2, 3, 5});
    EXPECT_THAT(narrowDims(m), ElementsAre(2, 3, 5));
    EXPECT_EQ(m.width, 30u);
    EXPECT_TRUE(isManaged(m));
    std::memset(m.rawData, 1, 30 * 8);
}

TEST(DynamicMatrix, SettingTheSameChangesNothing) {
    DynamicMatrix m;
    update(m, {10, 10});
    void* const before = m.rawData;
    testsupport::failNothrowNewAt(1);
    m.setDims({10, 10});
    m.setDim(0, 10);
    DynamicMatrix::updateDataDimFcn(1, 10, &m);
    update(m, {10, 10}, 999); // the element size is not looked at
    testsupport::failNothrowNewAt(0);
    EXPECT_EQ(m.rawData, before);
    EXPECT_EQ(m.elementSize, 8u);
    EXPECT_TRUE(isManaged(m));
    EXPECT_THAT(narrowDims(m), ElementsAre(0, 0)); // still as the first shaping left it
}

TEST(DynamicMatrix, ASmallChangeKeepsTheBuffer) {
    struct Row {
        unsigned long dim;
        bool stays;
    };
    for (const Row& row : {Row{150, true}, Row{151, false}, Row{66, true}, Row{65, false}, Row{99, true}}) {
        SCOPED_TRACE(row.dim);
        DynamicMatrix m;
        update(m, {100}, 1);
        void* const before = m.rawData;
        std::memset(m.rawData, 7, 100);
        testsupport::failNothrowNewAt(1); // a buffer that moves is a buffer that fails
        DynamicMatrix::updateDataDimFcn(0, row.dim, &m);
        testsupport::failNothrowNewAt(0);
        EXPECT_EQ(m.rawData, row.stays ? before : nullptr);
        if (row.stays) {
            EXPECT_EQ(static_cast<const unsigned char*>(m.rawData)[65], 7);
        }
        manager().Deallocate({&m, nullptr});
    }
    EXPECT_EQ(manager().numBlocks(), 0u);
}

TEST(DynamicMatrix, AWidthOfZeroGivesTheBufferBack) {
    DynamicMatrix m;
    update(m, {3, 4});
    EXPECT_EQ(manager().numBlocks(), 1u);
    DynamicMatrix::updateDataDimFcn(1, 0, &m);
    EXPECT_EQ(m.width, 0u);
    EXPECT_EQ(DynamicMatrix::getDataFcn(&m), nullptr);
    EXPECT_EQ(manager().numBlocks(), 0u);
    DynamicMatrix::updateDataDimFcn(0, 7, &m); // still 0
    EXPECT_EQ(m.rawData, nullptr);
    EXPECT_EQ(manager().numBlocks(), 0u);
    DynamicMatrix::updateDataDimFcn(1, 2, &m);
    EXPECT_EQ(m.width, 14u);
    EXPECT_EQ(DynamicMatrix::getDataFcn(&m), m.rawData);
    EXPECT_TRUE(isManaged(m));
}

TEST(DynamicMatrix, FillingAsksForABlockOfZeroBytesWhereResizingDoesNot) {
    DynamicMatrix m;
    construct(m, {0, 5}, 8, nullptr);
    EXPECT_EQ(m.width, 0u);
    EXPECT_NE(m.rawData, nullptr);
    EXPECT_TRUE(isManaged(m));
    update(m, {0, 6}); // by resizing
    EXPECT_EQ(m.rawData, nullptr);
}

TEST(DynamicMatrix, UpdatingANewRecordAllocates) {
    DynamicMatrix m;
    update(m, {2, 5}, 4);
    EXPECT_EQ(m.elementSize, 4u);
    EXPECT_EQ(m.width, 10u);
    EXPECT_TRUE(isManaged(m));
    EXPECT_THAT(narrowDims(m), ElementsAre(0, 0));
    update(m, {4, 5}, 999);
    EXPECT_EQ(m.elementSize, 4u);
    EXPECT_THAT(narrowDims(m), ElementsAre(4, 5));
    std::memset(m.rawData, 1, 4 * 5 * 4);
}

TEST(DynamicMatrix, InitialDataIsCopied) {
    const double data[] = {1, 2, 3, 4, 5, 6};
    DynamicMatrix m;
    construct(m, {2, 3}, sizeof(double), data);
    EXPECT_NE(m.rawData, data);
    EXPECT_EQ(std::memcmp(m.rawData, data, sizeof data), 0);
    EXPECT_THAT(dimsOf(m), ElementsAre(2u, 3u));
    construct(m, {3, 1}, sizeof(float), data); // a live record is filled anew
    EXPECT_EQ(m.elementSize, sizeof(float));
    EXPECT_EQ(std::memcmp(m.rawData, data, 3 * sizeof(float)), 0);
}

TEST(DynamicMatrix, ARecordWithoutDimensionsIsAScalar) {
    const int data = 42;
    DynamicMatrix m;
    construct(m, {}, sizeof data, &data);
    EXPECT_EQ(m.width, 1u);
    EXPECT_EQ(std::memcmp(m.rawData, &data, sizeof data), 0);
    update(m, {});
    EXPECT_EQ(m.width, 1u);
}

TEST(DynamicMatrix, SentinelsAreTranslatedAtTheBoundary) {
    struct Row {
        unsigned long outside;
        long inside;
        int narrow;
    };
    const Row rows[] = {
        {cUnknownUnsigned, cUnknown, -1},
        {cInfiniteUnsigned, cInfinite, 0x7ffffffe},
        {0, 0, 0},
        {5, 5, 5},
        {0x7fffffff, 0x7fffffff, 0x7fffffff},
        {0x100000005, 0x100000005, 5},
        {0xfffffffffffffffd, -3, -3},
        {0x7ffffffffffffffe, 0x7ffffffffffffffe, -2},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.outside);
        DynamicMatrix m;
        m.setDims({1, 0}); // the 0 keeps the width, so no buffer is asked for
        DynamicMatrix::updateDataDimFcn(0, row.outside, &m);
        EXPECT_EQ(m.dims[0], row.inside);
        EXPECT_EQ(m.intDims[0], row.narrow);
        EXPECT_EQ(dimsOf(m)[0], row.outside);

        DynamicMatrix constructed;
        construct(constructed, {row.outside, 0}, 8, nullptr);
        EXPECT_EQ(constructed.dims[0], row.inside);
        EXPECT_EQ(dimsOf(constructed)[0], row.outside);
        update(constructed, {0, row.outside}); // by the second path
        EXPECT_EQ(constructed.dims[1], row.inside);
        EXPECT_EQ(constructed.intDims[1], row.narrow);
    }
}

TEST(DynamicMatrix, TheWidthWrapsAndSentinelsMultiplyAsTheyAre) {
    DynamicMatrix m;
    m.setDims({cUnknown, 2});
    EXPECT_EQ(m.width, 0xfffffffffffffffeu);
    m.dims = {1l << 40, 1l << 40};
    m.computeWidth();
    EXPECT_EQ(m.width, 0u);
    m.dims.clear();
    m.computeWidth();
    EXPECT_EQ(m.width, 1u);
}

// The bytes asked for show in the bounds of the block that they got, which is null for the large ones.
TEST(DynamicMatrix, AnUnknownOrInfiniteWidthMultipliesAsTheLargeNumberItIs) {
    struct Row {
        unsigned long dim;
        unsigned long elementSize;
        unsigned long bytes;
    };
    const Row rows[] = {
        {cUnknownUnsigned, 1, 0xfffffffffffffffe}, {cInfiniteUnsigned, 1, 0xffffffffffffffff}, {cUnknownUnsigned, 0, 0},
        {cInfiniteUnsigned, 1ul << 63, 1ul << 63}, {cUnknownUnsigned, 1ul << 63, 0},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(testing::Message() << row.dim << " of " << row.elementSize);
        DynamicMatrix m;
        construct(m, {row.dim}, row.elementSize, nullptr);
        EXPECT_EQ(m.rawData == nullptr, row.bytes != 0);
        EXPECT_TRUE(isManaged(m));
        const Manager::Key key(&m, m.rawData);
        EXPECT_EQ(manager().GetOrAllocate(key, row.bytes), key);
        manager().Deallocate(key);
        m.rawData = nullptr;

        DynamicMatrix resized;
        resized.elementSize = row.elementSize;
        resized.setDims({0});
        DynamicMatrix::updateDataDimFcn(0, row.dim, &resized);
        EXPECT_EQ(resized.rawData == nullptr, row.bytes != 0);
        EXPECT_TRUE(isManaged(resized));
        manager().Deallocate({&resized, resized.rawData});
        resized.rawData = nullptr;
    }
    EXPECT_EQ(manager().numBlocks(), 0u);
}

TEST(DynamicMatrix, ABadIndexThrows) {
    DynamicMatrix m;
    m.setDims({2, 3});
    for (const auto& set : {+[](DynamicMatrix& x) { x.setDim(2, 1); },
                            +[](DynamicMatrix& x) { DynamicMatrix::updateDataDimFcn(2, 1, &x); }}) {
        try {
            set(m);
            FAIL();
        } catch (const std::out_of_range& e) {
            EXPECT_STREQ(e.what(), "vector::_M_range_check: __n (which is 2) >= this->size() (which is 2)");
        }
    }
    EXPECT_THAT(m.dims, ElementsAre(2, 3));
}

TEST(DynamicMatrix, TooManyDimensionsThrow) {
    DynamicMatrix m;
    const unsigned long dim = 1;
    EXPECT_THROW(DynamicMatrix::dataConstructFcn(0x1000000000000000, &dim, 1, nullptr, &m), std::bad_array_new_length);
    EXPECT_THROW(DynamicMatrix::updateDataDimsFcn(0x1000000000000000, &dim, 1, &m), std::bad_array_new_length);
    EXPECT_TRUE(m.dims.empty());
    update(m, {1});
    EXPECT_THROW(DynamicMatrix::updateDataDimsFcn(~0ul, &dim, 1, &m), std::bad_array_new_length);
    EXPECT_THAT(m.dims, ElementsAre(1));
}

TEST(DynamicMatrix, ACopyIsDeep) {
    const short data[] = {1, 2, 3, 4, 5, 6};
    DynamicMatrix from;
    construct(from, {2, 3}, sizeof(short), data);
    DynamicMatrix to;
    EXPECT_EQ(DynamicMatrix::copyFcn(&to, &from), 1);
    EXPECT_NE(to.rawData, from.rawData);
    EXPECT_EQ(to.elementSize, sizeof(short));
    EXPECT_EQ(to.width, 6u);
    EXPECT_THAT(to.dims, ElementsAre(2, 3));
    EXPECT_EQ(std::memcmp(to.rawData, data, sizeof data), 0);
    static_cast<short*>(to.rawData)[0] = 9;
    EXPECT_EQ(static_cast<const short*>(from.rawData)[0], 1);

    update(to, {40, 50}); // and back to the smaller size
    EXPECT_EQ(DynamicMatrix::copyFcn(&to, &from), 1);
    EXPECT_EQ(std::memcmp(to.rawData, data, sizeof data), 0);
    EXPECT_THAT(narrowDims(to), ElementsAre(2, 3));

    void* const before = to.rawData;
    EXPECT_EQ(DynamicMatrix::copyFcn(&to, &to), 1); // onto itself
    EXPECT_EQ(to.rawData, before);
    EXPECT_EQ(std::memcmp(to.rawData, data, sizeof data), 0);
}

TEST(DynamicMatrix, ACopyOfASourceWithoutABufferIsAllocatedAndUnset) {
    DynamicMatrix from;
    from.elementSize = 8;
    from.setDims({2, 3});
    DynamicMatrix to;
    update(to, {2, 3}, 8);
    void* const before = to.rawData;
    DynamicMatrix::copyFcn(&to, &from);
    EXPECT_EQ(to.rawData, before);
    DynamicMatrix fresh;
    DynamicMatrix::copyFcn(&fresh, &from);
    EXPECT_TRUE(isManaged(fresh));
    std::memset(fresh.rawData, 1, 48);

    const DynamicMatrix empty; // without dimensions too: a scalar of no bytes
    DynamicMatrix scalar;
    DynamicMatrix::copyFcn(&scalar, &empty);
    EXPECT_TRUE(isManaged(scalar));
}

TEST(DynamicMatrix, ACopyOfAnUnshapedSourceIsAllocatedAtItsNextUpdate) {
    const DynamicMatrix unshaped;
    DynamicMatrix to;
    update(to, {2, 3}, 8);
    DynamicMatrix::copyFcn(&to, &unshaped);
    EXPECT_TRUE(to.dims.empty());
    EXPECT_NE(to.rawData, nullptr);
    update(to, {40, 5}, 8);
    EXPECT_EQ(to.elementSize, 8u);
    EXPECT_TRUE(isManaged(to));
    std::memset(to.rawData, 1, 40 * 5 * 8);
}

TEST(DynamicMatrix, AByteWiseCopyCannotReleaseTheBufferOfItsOwner) {
    alignas(DynamicMatrix) unsigned char ownerMemory[sizeof(DynamicMatrix)];
    alignas(DynamicMatrix) unsigned char copyMemory[sizeof(DynamicMatrix)];
    DynamicMatrix::constructFcn(ownerMemory, nullptr);
    auto& owner = *reinterpret_cast<DynamicMatrix*>(ownerMemory);
    construct(owner, {4}, 1, "abc");
    void* const block = owner.rawData;

    std::memcpy(copyMemory, ownerMemory, sizeof ownerMemory);
    auto& copy = *reinterpret_cast<DynamicMatrix*>(copyMemory);
    EXPECT_FALSE(isManaged(copy));
    DynamicMatrix::updateDataDimFcn(0, 5, &copy); // a block of its own
    EXPECT_NE(copy.rawData, block);
    EXPECT_TRUE(isManaged(copy));
    EXPECT_STREQ(static_cast<const char*>(block), "abc");
    DynamicMatrix::updateDataDimFcn(0, 0, &copy);
    copy.rawData = block;

    DynamicMatrix::destructFcn(copyMemory); // takes the dimensions with it, and not the block
    EXPECT_TRUE(manager().IsManaging({ownerMemory, block}));
    EXPECT_STREQ(static_cast<const char*>(block), "abc");
    manager().Deallocate({ownerMemory, block});
    EXPECT_EQ(manager().numBlocks(), 0u);
}

TEST(DynamicMatrix, AFailedAllocationLeavesARecordWithoutABuffer) {
    const char data[] = "0123456789";
    DynamicMatrix m;
    testsupport::failNothrowNewAt(1);
    construct(m, {10}, 1, data); // nothing is written
    EXPECT_EQ(m.rawData, nullptr);
    EXPECT_THAT(m.dims, ElementsAre(10));
    EXPECT_TRUE(isManaged(m));
    update(m, {16}, 1); // past the bounds of the failed request a block is asked for again
    EXPECT_NE(m.rawData, nullptr);
    construct(m, {10}, 1, data);
    EXPECT_EQ(std::memcmp(m.rawData, data, 10), 0);

    testsupport::failNothrowNewAt(1);
    DynamicMatrix to;
    DynamicMatrix::copyFcn(&to, &m);
    EXPECT_EQ(to.rawData, nullptr);
    EXPECT_EQ(std::memcmp(m.rawData, data, 10), 0);
    manager().Deallocate({&to, nullptr});
}

// Against a plain vector, with the n-th allocation failing every now and then.
TEST(DynamicMatrix, AgreesWithAPlainModelOverARandomSequence) {
    constexpr unsigned seed = 63;
    constexpr std::size_t numMatrices = 20;
    SCOPED_TRACE(testing::Message() << "seed " << seed);
    struct Model {
        std::vector<unsigned long> dims = {0, 0};
        std::vector<int> contents;
        bool isKnown = true; // contents are unset after a block moved
    };
    std::mt19937 random(seed);
    std::vector<DynamicMatrix> matrices(numMatrices);
    std::vector<Model> models(numMatrices);
    for (DynamicMatrix& m : matrices) {
        m.setDims({0, 0});
        m.elementSize = sizeof(int);
    }
    for (int step = 0; step < 100000; ++step) {
        const std::size_t at = random() % numMatrices;
        DynamicMatrix& m = matrices[at];
        Model& model = models[at];
        ASSERT_EQ(dimsOf(m), model.dims) << "step " << step;
        ASSERT_EQ(m.width, model.dims[0] * model.dims[1]) << "step " << step;
        if (m.rawData && model.isKnown && !model.contents.empty()) {
            ASSERT_EQ(std::memcmp(m.rawData, model.contents.data(), model.contents.size() * sizeof(int)), 0)
                << "step " << step;
        }

        const std::vector<unsigned long> dims = {random() % 6, random() % 6};
        std::vector<int> contents(dims[0] * dims[1]);
        for (int& value : contents)
            value = static_cast<int>(random());
        switch (random() % 5) {
        case 0:
            update(m, dims, sizeof(int));
            model.isKnown = model.isKnown && dims == model.dims;
            model.dims = dims;
            break;
        case 1: {
            const unsigned long i = random() % 2;
            DynamicMatrix::updateDataDimFcn(i, dims[i], &m);
            model.isKnown = model.isKnown && dims[i] == model.dims[i];
            model.dims[i] = dims[i];
            break;
        }
        case 2:
            if (random() % 50 == 0) testsupport::failNothrowNewAt(1);
            construct(m, dims, sizeof(int), contents.data());
            testsupport::failNothrowNewAt(0);
            if (!m.rawData) manager().Deallocate({&m, nullptr}); // a failed request would bind later ones
            model = {dims, contents, m.rawData != nullptr};
            break;
        case 3: {
            const std::size_t from = random() % numMatrices;
            DynamicMatrix::copyFcn(&m, &matrices[from]);
            if (from != at) {
                const bool isFilled = matrices[from].rawData && models[from].isKnown;
                model = {models[from].dims, models[from].contents, isFilled};
            }
            break;
        }
        case 4:
            m.~DynamicMatrix();
            new (&m) DynamicMatrix;
            m.setDims({0, 0});
            m.elementSize = sizeof(int);
            model = {};
            break;
        }
    }
    matrices.clear();
    EXPECT_EQ(manager().numBlocks(), 0u);
}

} // namespace
