#include <gtest/gtest.h>

#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qltypes/dimensions/ParamSymbolicExprTable.h"
#include "tests/support/Slots.h"

namespace {

using QLTypeSys::ParamSymbolicExprTable;
using testsupport::slotOf;

TEST(ParamSymbolicExprTable, DataTypesOfSymbols) {
    ParamSymbolicExprTable table;
    EXPECT_EQ(table.findDataTypeId("K"), -10);
    table.addSymbolDataTypeInformation("K", 3);
    table.addSymbolDataTypeInformation("K", 4); // the first stays
    EXPECT_EQ(table.findDataTypeId("K"), 3);
    EXPECT_EQ(table.findDataTypeId("L"), -10);
    table.addSymbolDataTypeInformation("L", -10);
    table.addSymbolDataTypeInformation("L", 4);
    EXPECT_EQ(table.findDataTypeId("L"), -10); // recorded is recorded
}

TEST(ParamSymbolicExprTable, Expressions) {
    ParamSymbolicExprTable table;
    QL::SymbolicExprTable& exprs = table.getExprTable();
    EXPECT_EQ(exprs.getNumExprs(), 0U);
    EXPECT_EQ(table.convertExprId2ValidExprId(0), ~0UL);
    const unsigned long k = exprs.addSymbol("K");
    const unsigned long half = exprs.add(QL::SymbolicOp::Multiply, exprs.addDouble(1.0), k);
    EXPECT_EQ(table.get(half).getRight(), k);
    EXPECT_EQ(table.convertExprId2ValidExprId(half), half);
    EXPECT_EQ(table.convertExprId2ValidExprId(exprs.getNumExprs()), ~0UL);
    EXPECT_EQ(table.convertExprId2ValidExprId(~0UL), ~0UL);
}

TEST(ParamSymbolicExprTable, DisplayStringsHaveTheLastOfABoundChain) {
    ParamSymbolicExprTable table;
    QL::SymbolicExprTable& exprs = table.getExprTable();
    using enum QL::SymbolicOp;
    const unsigned long k = exprs.addSymbol("K");
    const unsigned long l = exprs.addSymbol("L");
    const unsigned long shown = exprs.add(Fix, exprs.add(Modulo, exprs.add(Multiply, exprs.addDouble(1.0), k), l));
    EXPECT_EQ(table.getDisplayString(shown), "trunc(1*K % L)"); // numbers alone are of the host language
    exprs.registerValueId("K", exprs.addSymbol("gain"));
    EXPECT_EQ(table.getDisplayString(shown), "trunc(1*gain % L)");
    exprs.registerValueId("L", exprs.addInt(3));
    EXPECT_EQ(table.getDisplayString(k), "gain");
    EXPECT_EQ(table.getDisplayString(l), "L");
}

TEST(ParamSymbolicExprTable, Slots) {
    using Table = ParamSymbolicExprTable;
    using Registration = QL::SymbolRegistry::Registration;
    const std::size_t slots[] = {
        slotOf(static_cast<Registration (Table::*)(const std::string&, const QLBlock*, const QlDims&)>(
            &Table::registerSymbolicTExpr)),
        slotOf(static_cast<Registration (Table::*)(const std::u16string&, const QLRootBD*, QlWorkspace*, QlEvalClient*,
                                                   std::vector<double>&)>(&Table::registerSymbolicTExpr)),
        slotOf(&Table::getSymbolsFromExpressionId),
        slotOf(&Table::addSymbolDataTypeInformation),
        slotOf(static_cast<Registration (Table::*)(const std::u16string&, QL::SymbolValidator&, std::vector<double>&)>(
            &Table::registerSymbolicTExpr)),
        slotOf(&Table::CreateParamSymbolicExprTable),
    };
    for (std::size_t i = 0; i < std::size(slots); ++i)
        EXPECT_EQ(slots[i], i + 2) << "operation " << i + 1; // behind the two forms of the destructor
    EXPECT_EQ(Table().CreateParamSymbolicExprTable(nullptr), nullptr);
}

} // namespace
