// Every allocation of elements, layouts and questions to views fails once: what a structure says afterwards is what it
// said before, and the next attempt gets the answers that a structure without failures gives.
#include <functional>

#include <gtest/gtest.h>

#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/StructChecksum.h"
#include "tests/structures/RandomStructures.h"
#include "tests/support/EachAllocation.h"
#include "tests/support/TableState.h"

namespace {

using namespace structures;
using namespace QLTypeSys;
using testsupport::failEach;
using testsupport::Leaves;

const std::string longName = "a_name_that_is_too_long_to_be_held_without_memory_of_its_own";

void pass(qlsvDiagnosticImpl* diagnostic) {
    if (diagnostic) qlsvThrowIExceptionFromDiagnostic(diagnostic, nullptr);
}

/// The worked example, an alias of it, a structure of both, and one that has no layout yet.
struct Nested : Example {
    int alias_ = alias("Alias", outer);
    int whole = laidOut("Whole", {{"n", inner, {2}}, {"m", alias_}, {"f", DATA_TYPE_ID_INT8, {2, 2}, true}});
    int open = define("Open", {{"a", DATA_TYPE_ID_INT8}, {"b", inner, {2}}, {"c", DATA_TYPE_ID_DOUBLE, {2}, true}});
    int empty = define("Empty", {});

    std::vector<std::string> state() {
        std::vector<std::string> lines = testsupport::stateOf(table, {});
        for (const int id : {inner, outer, alias_, whole})
            for (std::string& line : testsupport::answersOf(table, id))
                lines.push_back(std::move(line));
        return lines;
    }
};

struct Row {
    const char* name;
    std::function<void(Nested&)> work;
    Leaves leaves = Leaves::Nothing;
};

void failEachRow(const std::vector<Row>& rows) {
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        EXPECT_GT(failEach<Nested>(row.work, row.leaves), 0u);
        if (testing::Test::HasFailure()) return;
    }
}

TEST(StructMemory, ElementsAreMade) {
    failEachRow({
        {"all", [](Nested& n) { n.record(n.empty)->setNumElements(5); }},
        {"by id", [](Nested& n) { pass(DtSetDataTypeNumElements(&n.table, "block", n.empty, 3)); }},
        {"none, which is refused", [](Nested& n) { pass(DtSetDataTypeNumElements(&n.table, "block", n.empty, 0)); }},
        {"name", [](Nested& n) { n.element(n.open, 0)->setName(longName.c_str()); }},
        {"dimensions",
         [](Nested& n) {
             n.element(n.open, 1)->setNumDimensions(3);
             n.element(n.open, 1)->setDimension(2, 4);
         }},
        {"dimensions of 32 bits", [](Nested& n) { n.element(n.whole, 2)->getDimensionsAsInt({}); }},
        {"flat indices",
         [](Nested& n) {
             n.record(n.open)->setDFSIdxFromFlatIdx({1, 2, 3, 4, 5});
         }},
    });
}

TEST(StructMemory, AStructureIsLaidOut) {
    failEachRow({
        {"for the first time", [](Nested& n) { pass(DtComputeDerivedStructAttributes(&n.table, n.open)); }},
        {"with other elements",
         [](Nested& n) {
             n.element(n.inner, 0)->setDataTypeId(DATA_TYPE_ID_INT32);
             n.element(n.inner, 0)->setNumDimensions(2);
             n.element(n.inner, 0)->setDimension(0, 3);
             n.element(n.inner, 0)->setDimension(1, 2);
             for (const int id : {n.inner, n.outer, n.whole})
                 pass(DtComputeDerivedStructAttributes(&n.table, id));
         },
         Leaves::Parts},
        {"grown beyond its size", // refused
         [](Nested& n) {
             n.element(n.inner, 0)->setNumDimensions(0);
             pass(DtComputeDerivedStructAttributes(&n.table, n.inner));
         },
         Leaves::Parts},
        {"too large",
         [](Nested& n) {
             n.element(n.open, 2)->setDimension(0, 0x7fffffff);
             pass(DtComputeDerivedStructAttributes(&n.table, n.open));
         },
         Leaves::Parts},
        {"with an element without a type",
         [](Nested& n) {
             n.element(n.open, 1)->setDataTypeId(-10);
             pass(DtComputeDerivedStructAttributes(&n.table, n.open));
         },
         Leaves::Parts},
    });
}

// --- Questions to views ----------------------------------------------------------------------------------------------

/// Structures of which nothing was asked: each view makes all that it keeps.
struct Unasked : Nested {
    std::vector<std::string> state() {
        std::vector<std::string> lines = testsupport::answersOf(table, whole);
        for (std::string& line : testsupport::answersOf(table, alias_))
            lines.push_back(std::move(line));
        return lines;
    }
};

using Question = std::function<void(Unasked&, int id)>;

const std::vector<std::pair<const char*, Question>> questions = {
    {"name", [](Unasked& u, int id) { DFSElementAccess(&u.table, id).getName(9); }},
    {"element", [](Unasked& u, int id) { DFSElementAccess(&u.table, id).getStructElement(4); }},
    {"root", [](Unasked& u, int id) { DFSElementAccess(&u.table, id).getStructElement(0); }},
    {"past the end", [](Unasked& u, int id) { DFSElementAccess(&u.table, id).getStructElement(1000000); }},
    {"offset", [](Unasked& u, int id) { DFSElementAccess(&u.table, id).getOffset(9); }},
    {"offset of dimensions", [](Unasked& u, int id) { DFSElementAccess(&u.table, id).getVarDimsOffset(9); }},
    {"values in front", [](Unasked& u, int id) { DFSElementAccess(&u.table, id).getRawElementIdx(9); }},
    {"flat index", [](Unasked& u, int id) { DFSElementAccess(&u.table, id).getFlatElementIdx(9); }},
    {"text of a path", [](Unasked& u, int id) { DFSElementAccess(&u.table, id).getFullPathAsString(9, true); }},
    {"flat", [](Unasked& u, int id) { FlatElementAccess(&u.table, id).getOffset(5); }},
    {"flat name", [](Unasked& u, int id) { DtGetDataTypeFlatElementName(&u.table, id, 5); }},
    {"flat path", [](Unasked& u, int id) { DtGetDataTypeFlatElementFullPath(&u.table, id, 5); }},
    {"raw", [](Unasked& u, int id) { RawElementAccess(&u.table, id).getOffset(7); }},
    {"immediate", [](Unasked& u, int id) { ImmediateElementAccess(&u.table, id).getRawElementIdx(1); }},
    {"cached element", [](Unasked& u, int id) { u.record(id)->getCachedElement(4); }},
    {"cached element that was asked",
     [](Unasked& u, int id) {
         DFSElementAccess(&u.table, id).getStructElement(4);
         DFSElementAccess(&u.table, id).getOffset(4);
         u.record(id)->getCachedElement(4);
     }},
    {"everything", [](Unasked& u, int id) { testsupport::answersOf(u.table, id); }},
    {"offsets of the hierarchy",
     [](Unasked& u, int id) {
         DtGetDataTypeFullHierarchyOffset(&u.table, id, {3, 2});
     }},
    {"dependencies", [](Unasked& u, int id) { u.record(id)->dependsOn(); }},
};

TEST(StructMemory, AViewIsAsked) {
    for (const auto& [name, question] : questions)
        for (int Unasked::*const which :
             {static_cast<int Unasked::*>(&Unasked::alias_), static_cast<int Unasked::*>(&Unasked::whole)}) {
            SCOPED_TRACE(name);
            EXPECT_GT(failEach<Unasked>([&question = question, which](Unasked& u) { question(u, u.*which); }), 0u);
            if (HasFailure()) return;
        }
}

TEST(StructMemory, APathIsAppendedWhollyOrNotAtAll) {
    struct Path : Nested {
        StructElementAccess::Path path = {{longName, 7}};
        std::vector<std::string> state() { return {StructElementAccess::convertFullPathToString(path, longName)}; }
    };
    EXPECT_GT(failEach<Path>([](Path& p) { DFSElementAccess(&p.table, p.whole).getFullPath(9, true, p.path); }), 3u);
    EXPECT_GT(failEach<Path>([](Path& p) { FlatElementAccess(&p.table, p.whole).getFullPath(9, true, p.path); }), 3u);
}

/// Random structures that views were asked of, changed since: the next question reads anew and writes answers down.
struct Changed : RandomStructures {
    explicit Changed(unsigned seed) : RandomStructures(seed) {
        while (structures.size() < 6)
            addStructure(30);
        for (int i = 0; i < 25; ++i)
            ask(oneOf(structures));
        for (int i = 0; i < 6; ++i)
            change(oneOf(structures));
    }

    void ask(int id) {
        const DFSElementAccess dfs(&table, id);
        const long idx = pick(0, 2 * record(id)->getNumDFSElements());
        switch (pick(0, 3)) {
        case 0:
            dfs.getStructElement(idx);
            break;
        case 1:
            dfs.getOffset(idx);
            break;
        case 2:
            dfs.getVarDimsOffset(idx);
            break;
        default:
            dfs.getRawElementIdx(idx);
        }
    }

    void change(int id) {
        StructElement* const e = oneOf(record(id)->getElements());
        switch (pick(0, 4)) {
        case 0:
            e->setOffset(pick(0, 1000));
            break;
        case 1:
            e->setVarDimsOffset(pick(0, 1000));
            break;
        case 2:
            e->setName((longName + std::to_string(pick(0, 9))).c_str());
            break;
        case 3:
            e->setNumDimensions(1);
            e->setDimension(0, pick(0, 4));
            break;
        default:
            e->setDataTypeId(oneOf(leaves));
        }
    }
};

template <unsigned seed> struct ChangedBy : Changed {
    ChangedBy() : Changed(seed) {}
    std::vector<std::string> state() {
        std::vector<std::string> lines;
        for (const int id : structures)
            for (std::string& line : testsupport::answersOf(table, id))
                lines.push_back(std::move(line));
        return lines;
    }
};

template <unsigned seed> void failQuestionsOf() {
    SCOPED_TRACE("seed " + std::to_string(seed));
    using Subject = ChangedBy<seed>;
    unsigned long numAllocations = 0;
    const auto askAll = [](Subject& s, int id) {
        const DFSElementAccess dfs(&s.table, id);
        for (long i = 0; i < s.record(id)->getNumDFSElements() + 1; ++i) {
            dfs.getOffset(i);
            dfs.getVarDimsOffset(i);
            dfs.getStructElement(i);
            dfs.getRawElementIdx(i);
        }
        dfs.getFlatElementIdx(1);
    };
    numAllocations += failEach<Subject>([&](Subject& s) { askAll(s, s.structures.back()); });
    numAllocations += failEach<Subject>([&](Subject& s) { askAll(s, s.structures.front()); });
    EXPECT_GT(numAllocations, 0u);
}

TEST(StructMemory, AViewReadsAnew) {
    [&]<unsigned... seeds>(std::integer_sequence<unsigned, seeds...>) {
        ((HasFailure() ? void() : failQuestionsOf<seeds + 1>()), ...);
    }
    (std::make_integer_sequence<unsigned, 12>());
}

// --- Checksums -------------------------------------------------------------------------------------------------------

TEST(StructMemory, AnElementEntersAChecksum) {
    struct Type : StructElemTypeDesc {
        const char* getText() const override { return longName.c_str(); }
    };
    struct Checksum {
        Type type;
        SymbolicDimsTable dimensions;
        int shape = SymbolicDimsND(dimensions, {SymbolicDimsString(dimensions, longName).getId(),
                                                SymbolicDimsString(dimensions, "N").getId()})
                        .getId();
        qlChecksumRec rec;

        std::vector<std::string> state() {
            std::string text;
            for (const unsigned word : rec.value().words)
                text += std::to_string(word) + ' ';
            return {text};
        }
        StructElemDesc element(int symbDimsId) { return {longName, &type, &dimensions, symbDimsId, {3, 4, 5}, true}; }
    };
    EXPECT_GT(failEach<Checksum>([](Checksum& c) { addStructElementToChecksum(c.rec, c.element(0)); }), 1u);
    EXPECT_GT(failEach<Checksum>([](Checksum& c) { addStructElementToChecksum(c.rec, c.element(c.shape)); }), 1u);
}

} // namespace
