// What depth-first views answered once they answer until clearDFSCache, whatever changes in between: random questions
// and changes, held against the slow reference, which keeps each answer.
#include "qltypes/structures/ElementAccess.h"
#include "tests/structures/RandomStructures.h"
#include "tests/structures/SlowViews.h"

namespace {

using namespace structures;
using namespace QLTypeSys;

class Session {
  public:
    explicit Session(unsigned seed) : random_(seed), slow_(random_.table) {
        while (random_.structures.size() < 8)
            random_.addStructure(40);
    }

    void run(int numSteps) {
        for (int step = 0; step < numSteps && !testing::Test::HasFailure(); ++step) {
            SCOPED_TRACE("step " + std::to_string(step));
            if (random_.chance(85))
                ask();
            else
                change();
        }
    }

  private:
    int anyStructure() { return random_.oneOf(random_.structures); }

    void ask() {
        const int id = anyStructure();
        const long n = random_.record(id)->getNumDFSElements();
        const long idx = random_.chance(80) ? random_.pick(0, n) : random_.pick(0, 4 * n);
        const DFSElementAccess dfs(&random_.table, id);
        SCOPED_TRACE("structure " + std::to_string(id) + " index " + std::to_string(idx));
        switch (random_.pick(0, 8)) {
        case 0:
        case 1:
            compareElement(dfs.getStructElement(idx), slow_.element(id, idx));
            break;
        case 2:
        case 3:
            EXPECT_EQ(dfs.getOffset(idx), slow_.offset(id, idx));
            break;
        case 4:
            EXPECT_EQ(dfs.getVarDimsOffset(idx), slow_.varDimsOffset(id, idx));
            break;
        case 5: {
            SlowViews::Path path;
            dfs.getFullPath(idx, false, path);
            EXPECT_EQ(path, slow_.path(id, idx, false));
            break;
        }
        case 6: {
            SlowViews::Place place;
            dfs.computeDataTypeIdAndIndex(idx, &place.immediate, &place.instance, &place.typeId, &place.base);
            EXPECT_EQ(place, slow_.place(id, idx));
            break;
        }
        case 7:
            if (random_.chance(30)) {
                EXPECT_EQ(dfs.getRawElementIdx(idx), slow_.rawElementIdx(id, idx));
            }
            break;
        default:
            if (random_.chance(20)) {
                EXPECT_EQ(dfs.getFlatElementIdx(idx), slow_.flatElementIdx(id, idx));
            }
            if (random_.chance(20)) random_.record(id)->getCachedElement(idx); // an entry, which then must fill
        }
    }

    void compareElement(const StructElement* made, const StructElement* expected) {
        if (!slow_.isMade(expected)) {
            EXPECT_EQ(made, expected);
        }
        EXPECT_EQ(made->name, expected->name);
        EXPECT_EQ(made->dataTypeId, expected->dataTypeId);
        EXPECT_EQ(made->getWidth(), expected->getWidth());
    }

    // Types that keep structures from containing themselves: leaves, and structures defined before.
    int typeFor(int id) {
        const int other = anyStructure();
        return random_.chance(50) || other >= random_.record(id)->getId() ? random_.oneOf(random_.leaves) : other;
    }

    void change() {
        const int id = anyStructure();
        StructDataType* const record = random_.record(id);
        StructElement* const e = random_.oneOf(record->getElements());
        switch (random_.pick(0, 9)) {
        case 0:
            e->setOffset(random_.pick(0, 1000));
            break;
        case 1:
            e->offset += 8; // also behind the setters' back
            break;
        case 2:
            e->setVarDimsOffset(random_.pick(-1, 1000));
            break;
        case 3:
            e->setName(("n" + std::to_string(random_.pick(0, 9))).c_str());
            break;
        case 4:
            e->setSignalType(static_cast<int>(random_.pick(0, 1)));
            break;
        case 5:
            e->setNumDimensions(1);
            e->setDimension(0, random_.pick(0, 4));
            break;
        case 6:
            e->setDataTypeId(typeFor(record->getId()));
            break;
        case 7: { // the counts change; the size may not
            qlsvDiagnosticImpl* failed = DtComputeDerivedStructAttributes(&random_.table, id);
            qlsvDiscardDiagnostic(failed);
            if (record->getNumDFSElements() > 4000) record->setNumDFSElements(4000);
            break;
        }
        default:
            record->clearDFSCache();
            slow_.clear(id);
        }
    }

    RandomStructures random_;
    SlowViews slow_;
};

TEST(FrozenAnswers, RandomQuestionsAndChanges) {
    for (unsigned seed = 1; seed <= 400 && !HasFailure(); ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        Session(seed).run(400);
    }
}

} // namespace
