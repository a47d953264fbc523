// Tables of random structures, nested in each other, under a seed that failures print.
#pragma once

#include <algorithm>
#include <random>
#include <string>
#include <vector>

#include "tests/structures/Builder.h"

namespace structures {

class RandomStructures : public Structures {
  public:
    explicit RandomStructures(unsigned seed) : random_(seed) {
        for (const int size : {1, 2, 3, 5, 6, 8, 12, 17})
            leaves.push_back(plain("P" + std::to_string(size), size));
        leaves.push_back(alias("AliasOfP3", leaves[2]));
        leaves.push_back(alias("AliasOfSingle", DATA_TYPE_ID_SINGLE));
        for (int id = -1; id <= DATA_TYPE_ID_BOOLEAN; ++id)
            leaves.push_back(id);
    }

    /// A number from `low` to `high`.
    long pick(long low, long high) { return std::uniform_int_distribution<long>(low, high)(random_); }
    template <class T> const T& oneOf(const std::vector<T>& all) {
        return all[static_cast<std::size_t>(pick(0, static_cast<long>(all.size()) - 1))];
    }
    bool chance(int percent) { return pick(1, 100) <= percent; }

    /// Any type that a next structure may have as element: leaves, finished structures, aliases of structures.
    int anyType(long mostNodes) {
        if (structures.empty() || chance(45)) return oneOf(leaves);
        const int id = chance(60) ? structures.back() : oneOf(structures);
        return record(id)->getNumDFSElements() > mostNodes ? oneOf(leaves) : id;
    }

    std::vector<long> dims() {
        switch (pick(0, 5)) {
        case 0:
            return {};
        case 1:
            return {1};
        case 2:
            return {pick(0, 5)};
        case 3:
            return {pick(1, 3), pick(1, 2)};
        case 4:
            return {1, 1, 1};
        default:
            return {pick(2, 5)};
        }
    }

    /// Defines and lays out one more structure; 0 where its layout failed. Every third gets an alias beside it.
    int addStructure(long mostNodes) {
        std::vector<Element> elements;
        for (long i = pick(1, 5); i > 0; --i)
            elements.push_back({"e" + std::to_string(i), anyType(mostNodes), dims(), chance(20)});
        if (chance(5)) elements.front().name.clear();
        const int id = define("S" + std::to_string(numDefined_++), elements);
        for (StructElement* e : record(id)->getElements()) {
            e->setUnitId(static_cast<int>(pick(0, 99)));
            if (chance(30)) e->setVarDimsOffset(pick(0, 1000));
            e->setSamplingMode(static_cast<int>(pick(0, 1)));
            e->setDimensionsMode(static_cast<int>(pick(0, 1)));
        }
        qlsvDiagnosticImpl* failed = DtComputeDerivedStructAttributes(&table, id);
        const bool isFine = !failed;
        qlsvDiscardDiagnostic(failed);
        if (!isFine) return 0;
        structures.push_back(id);
        if (chance(33)) structures.push_back(alias("A" + std::to_string(id), id));
        return id;
    }

    /// How deep structures are nested in each other, 1 for one without a nested structure.
    int depth(int id) {
        int deepest = 0;
        for (const StructElement* e : record(id)->getElements())
            if (DtIsStructType(&table, e->dataTypeId)) deepest = std::max(deepest, depth(e->dataTypeId));
        return deepest + 1;
    }

    std::vector<int> leaves;
    std::vector<int> structures; // laid out, with aliases

  private:
    std::mt19937 random_;
    int numDefined_ = 0;
};

} // namespace structures
