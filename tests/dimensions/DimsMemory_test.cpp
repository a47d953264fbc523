// Every allocation of a table of symbolic dimensions fails once: what it said of its dimensions it still says, and the
// next attempt succeeds. Expressions that were made on the way may stay.
#include <functional>
#include <set>
#include <sstream>

#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "tests/support/EachAllocation.h"

class QLBlock {};

namespace {

using namespace QLTypeSys;
using testsupport::failEach;
using testsupport::Leaves;

const std::string longName = "A_name_that_is_too_long_to_be_held_without_memory_of_its_own";

struct Dims {
    Dims() {
        n = SymbolicDimsString(table, "N").getId();
        m = SymbolicDimsString(table, longName).getId();
        one = table.registerSymbolicDims(1);
        quotient = (table.getSymbolicDims(n) / table.getSymbolicDims(m)).getId();
        list = SymbolicDimsND(table, {n, m, one, quotient, one}).getId();
        table.registerValue("N", 12);
        table.registerValue(longName, 4);
        table.registerHeaderFile(n, "n.h");
        table.addGreaterThanRelation(n, m, &block);
        table.addRange(m, 2, 9, &block, generateBothBounds);
        for (const int id : {n, m, one, quotient, list})
            known.push_back(id);
    }

    std::vector<std::string> state() {
        std::vector<std::string> lines;
        for (const int id : known) {
            if (!table.isSymbolicDimsIdValid(id)) {
                lines.push_back(std::to_string(id) + " is gone");
                continue;
            }
            std::ostringstream out;
            out << id << ' ' << table.getDisplayString(id) << ' ' << table.getTorvexExpr(id) << ' ' << table.isOne(id)
                << table.isVector(id) << table.isaSymbolicDimension(id) << " values";
            for (const double value : table.eval(id))
                out << ' ' << value;
            std::set<std::string> files;
            table.getHeaderFiles(id, files);
            for (const std::string& file : files)
                out << ' ' << file;
            const SymbDimsRange range = table.getRange(id);
            out << " range " << range.min << ' ' << range.max;
            for (const int other : known)
                if (table.isSymbolicDimsIdValid(other))
                    out << table.hasGreaterThanRelation(id, other) << table.hasEqualRelation(id, other);
            lines.push_back(out.str());
        }
        std::vector<SymbolicDimsCGConstraint> divisions; // each expression is there once
        table.getDivisionConstraints(divisions);
        std::set<std::pair<int, int>> pairs;
        for (const SymbolicDimsCGConstraint& division : divisions)
            lines.push_back(pairs.insert({division.first, division.second}).second ? "" : "twice");
        std::erase(lines, "");
        return lines;
    }

    SymbolicDims at(int id) { return table.getSymbolicDims(id); }

    SymbolicDimsTable table;
    QLBlock block;
    int n, m, one, quotient, list;
    std::vector<int> known;
};

struct Row {
    const char* name;
    std::function<void(Dims&)> work;
};

void failEachRow(const std::vector<Row>& rows) {
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        EXPECT_GT(failEach<Dims>(row.work), 0u);
        if (testing::Test::HasFailure()) return;
    }
}

TEST(DimsMemory, ATableIsMade) {
    struct Nothing {
        std::vector<std::string> state() { return {}; }
    };
    EXPECT_GT(failEach<Nothing>([](Nothing&) { SymbolicDimsTable table; }), 10u);
}

TEST(DimsMemory, ADimensionIsMade) {
    failEachRow({
        {"numbers",
         [](Dims& d) {
             for (int i = 100; i < 300; ++i) // more than the table has room for
                 d.table.registerSymbolicDims(i);
         }},
        {"symbol", [](Dims& d) { SymbolicDimsString(d.table, longName + "2"); }},
        {"symbols",
         [](Dims& d) {
             for (int i = 0; i < 70; ++i)
                 SymbolicDimsString(d.table, longName + std::to_string(i));
         }},
        {"list",
         [](Dims& d) {
             SymbolicDimsND(d.table, {d.one, d.n, d.one, d.m});
         }},
        {"sum", [](Dims& d) { (void)(d.at(d.n) + d.at(d.m)); }},
        {"difference", [](Dims& d) { (void)(d.at(d.n) - d.at(d.m)); }},
        {"product", [](Dims& d) { (void)(d.at(d.quotient) * d.at(d.m)); }},
        {"quotient", [](Dims& d) { (void)(d.at(d.quotient) / d.at(d.n)); }},
        {"remainder", [](Dims& d) { (void)(d.at(d.n) % d.at(d.m)); }},
        {"size", [](Dims& d) { d.at(d.list).getSize(); }},
        {"width", [](Dims& d) { d.table.getWidthSymbolicDimsId(d.list); }},
        {"without ones at the end", [](Dims& d) { d.table.removeTrailingOnes(d.list, 2); }},
        {"collapsed", [](Dims& d) { d.table.collapseDimensions(d.list, 1); }},
        {"amended",
         [](Dims& d) {
             d.table.amendSymbolicDims(d.list, {12, 1, 4, 1, 3, 1});
         }},
        {"of another table",
         [](Dims& d) {
             static const Dims other;
             d.table.importSymbolicDims(other.table, other.list, &d.block);
         }},
    });
}

TEST(DimsMemory, AFactIsEntered) {
    failEachRow({
        {"value", [](Dims& d) { d.table.registerValue(longName + "3", 5); }},
        {"value of a number", [](Dims& d) { d.table.registerValue(longName + "4", 0.5); }},
        {"header file", [](Dims& d) { d.table.registerHeaderFile(d.m, longName); }},
        {"equality", [](Dims& d) { d.table.equalSymbolicDims(static_cast<unsigned long>(d.n + 1), 3); }},
    });
}

TEST(DimsMemory, AQuestionIsAsked) {
    failEachRow({
        {"text", [](Dims& d) { d.table.getDisplayString(d.list); }},
        {"text of the host language", [](Dims& d) { d.table.getTorvexExpr(d.list); }},
        {"values", [](Dims& d) { d.table.eval(d.list); }},
        {"numbers", [](Dims& d) { d.table.getNumericDims(d.list); }},
        {"symbols",
         [](Dims& d) {
             std::vector<std::string> names;
             d.table.getSymbolicDimsSymbols(d.list, names);
         }},
        {"dimensions",
         [](Dims& d) {
             std::vector<std::string> texts;
             d.table.getSymbolicDimensions(d.list, texts);
         }},
        {"header files",
         [](Dims& d) {
             std::set<std::string> files;
             d.table.getHeaderFiles(d.list, files);
         }},
        {"whether it is a number", [](Dims& d) { d.table.isNumericalDimension(d.list); }},
    });
}

TEST(DimsMemory, ATableIsReset) {
    EXPECT_GT(failEach<Dims>([](Dims& d) { d.table.resetToBuiltin(); }), 10u);
    Dims d;
    d.table.resetToBuiltin();
    const SymbolicDimsTable fresh;
    EXPECT_EQ(d.table.getNumSymbolicDimss(), fresh.getNumSymbolicDimss());
}

} // namespace
