// The views on the worked example and on random structures, against the slow reference.
#include "qltypes/structures/ElementAccess.h"
#include "tests/structures/RandomStructures.h"
#include "tests/structures/SlowViews.h"
#include "tests/support/Rounds.h"

namespace {

using namespace structures;
using namespace QLTypeSys;

/// Compares all that the views say about one structure with the reference.
class Comparison {
  public:
    Comparison(const DataTypeTable& table, SlowViews& slow, int id)
        : slow_(slow), id_(id), immediate_(&table, id), dfs_(&table, id), flat_(&table, id), raw_(&table, id) {}

    void node(long idx) {
        SCOPED_TRACE("node " + std::to_string(idx));
        SlowViews::Place place;
        dfs_.computeDataTypeIdAndIndex(idx, &place.immediate, &place.instance, &place.typeId, &place.base);
        ASSERT_EQ(place, slow_.place(id_, idx));
        element(idx);
        ASSERT_EQ(dfs_.getOffset(idx), slow_.offset(id_, idx));
        ASSERT_EQ(dfs_.getVarDimsOffset(idx), slow_.varDimsOffset(id_, idx));
        SlowViews::Parent parent;
        dfs_.getImmediateParentDTypeIdAndOffset(idx, parent.typeId, parent.element);
        ASSERT_EQ(parent, slow_.parent(id_, idx));
        for (const bool fromRoot : {false, true}) {
            SlowViews::Path path;
            dfs_.getFullPath(idx, fromRoot, path);
            const SlowViews::Path expected = slow_.path(id_, idx, fromRoot);
            ASSERT_EQ(path, expected);
            const std::string text = SlowViews::text(expected, "");
            ASSERT_EQ(StructElementAccess::convertFullPathToString(path, ""), text);
            ASSERT_EQ(dfs_.getFullPathAsString(idx, fromRoot), std::u16string(text.begin(), text.end()));
        }
    }

    void element(long idx) {
        const StructElement* const expected = slow_.element(id_, idx);
        const StructElement* const made = dfs_.getStructElement(idx);
        if (!slow_.isMade(expected)) {
            ASSERT_EQ(made, expected);
        }
        ASSERT_EQ(made->name, expected->name);
        ASSERT_EQ(made->dataTypeId, expected->dataTypeId);
        ASSERT_EQ(made->unitId, expected->unitId);
        ASSERT_EQ(made->symbDimsId, expected->symbDimsId);
        ASSERT_EQ(std::vector<long>(made->dims, made->dims + made->numDims),
                  std::vector<long>(expected->dims, expected->dims + expected->numDims));
        ASSERT_EQ(made->signalType, expected->signalType);
        ASSERT_EQ(made->samplingMode, expected->samplingMode);
        ASSERT_EQ(made->dimensionsMode, expected->dimensionsMode);
        ASSERT_EQ(made->min, expected->min);
        ASSERT_EQ(made->max, expected->max);
    }

    void rawOfNode(long idx) { ASSERT_EQ(dfs_.getRawElementIdx(idx), slow_.rawElementIdx(id_, idx)) << "node " << idx; }
    void flatOfNode(long idx) {
        ASSERT_EQ(dfs_.getFlatElementIdx(idx), slow_.flatElementIdx(id_, idx)) << "node " << idx;
    }
    void leaf(long flatIdx) {
        ASSERT_EQ(flat_.getDFSIdx(flatIdx), slow_.dfsIdx(id_, flatIdx)) << "leaf " << flatIdx;
        ASSERT_EQ(flat_.getOffset(flatIdx), slow_.offset(id_, std::max(0L, slow_.dfsIdx(id_, flatIdx))));
    }
    void value(long rawIdx) {
        SCOPED_TRACE("value " + std::to_string(rawIdx));
        SlowViews::Place place{0, 0, -10, 0};
        raw_.computeDataTypeIdAndIndex(rawIdx, place.immediate, place.typeId, place.base);
        ASSERT_EQ(place, slow_.rawPlace(id_, rawIdx));
        ASSERT_EQ(raw_.getDataTypeId(rawIdx), slow_.rawTypeId(id_, rawIdx));
        ASSERT_EQ(raw_.getUnitId(rawIdx), slow_.rawUnitId(id_, rawIdx));
        ASSERT_EQ(raw_.getOffset(rawIdx), slow_.rawOffset(id_, rawIdx));
    }
    void child(long element) {
        ASSERT_EQ(immediate_.getRawElementIdx(element), slow_.immediateRawIdx(id_, element));
        ASSERT_EQ(immediate_.getPadding(element), slow_.padding(id_, element));
    }

    long numNodes() const { return dfs_.getNumElements(); }
    long numLeaves() const { return flat_.getNumElements(); }
    long numValues() const { return raw_.getNumElements(); }
    long numChildren() const { return immediate_.getNumElements(); }

  private:
    SlowViews& slow_;
    int id_;
    ImmediateElementAccess immediate_;
    DFSElementAccess dfs_;
    FlatElementAccess flat_;
    RawElementAccess raw_;
};

#define STOP_ON_FAILURE(expression)                                                                                    \
    expression;                                                                                                        \
    if (testing::Test::HasFatalFailure()) return

void compareAll(const DataTypeTable& table, SlowViews& slow, int id) {
    Comparison compare(table, slow, id);
    const long n = compare.numNodes();
    for (long idx = 0; idx < 2 * n + 3; ++idx) {
        STOP_ON_FAILURE(compare.node(idx));
    }
    for (const long idx : {7 * n, 7 * n + n / 2, 1000000 * n - 1}) {
        STOP_ON_FAILURE(compare.node(idx));
    }
    for (long idx = 0; idx < std::min(2 * n + 3, 80L); ++idx) {
        STOP_ON_FAILURE(compare.rawOfNode(idx));
        STOP_ON_FAILURE(compare.flatOfNode(idx));
    }
    STOP_ON_FAILURE(compare.rawOfNode(n - 1));
    STOP_ON_FAILURE(compare.rawOfNode(n));
    STOP_ON_FAILURE(compare.rawOfNode(3 * n - 1));
    for (long flatIdx = 0; flatIdx < 2 * compare.numLeaves() + 3; ++flatIdx) {
        STOP_ON_FAILURE(compare.leaf(flatIdx));
    }
    for (long rawIdx = 0; rawIdx < std::min(compare.numValues(), 300L); ++rawIdx) {
        STOP_ON_FAILURE(compare.value(rawIdx));
    }
    for (long element = 0; element < compare.numChildren(); ++element) {
        STOP_ON_FAILURE(compare.child(element));
    }
}

TEST(ElementViews, WideStructuresAtEveryIndex) {
    for (unsigned seed = 1; seed <= 10; ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        RandomStructures random(seed);
        SlowViews slow(random.table);
        const int small = random.laidOut("Small", {{"a", random.oneOf(random.leaves)}, {"b", DATA_TYPE_ID_INT8, {2}}});
        std::vector<Element> elements;
        for (long i = random.pick(8, 250); i > 0; --i) {
            const bool isNested = random.chance(seed % 2 ? 10 : 60);
            elements.push_back({"e" + std::to_string(i), isNested ? small : random.oneOf(random.leaves),
                                isNested && i % 50 == 1 ? std::vector{200L} : random.dims(), random.chance(10)});
        }
        STOP_ON_FAILURE(compareAll(random.table, slow, random.laidOut("Wide", elements)));
    }
}

TEST(ElementViews, RandomStructuresAtEveryIndex) {
    const int numSeeds = testsupport::rounds(300);
    long numStructures = 0;
    int deepest = 0;
    for (int seed = 1; seed <= numSeeds; ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        RandomStructures random(static_cast<unsigned>(seed));
        SlowViews slow(random.table);
        for (int i = 0; i < 12; ++i)
            random.addStructure(seed % 4 == 0 ? 300 : 60);
        for (const int id : random.structures) {
            SCOPED_TRACE("structure " + std::to_string(id));
            STOP_ON_FAILURE(compareAll(random.table, slow, id));
            ++numStructures;
            deepest = std::max(deepest, random.depth(id));
        }
    }
    EXPECT_GT(numStructures, 6 * numSeeds);
    EXPECT_GE(deepest, 7);
}

} // namespace
