// Slots of virtual operations and order of fields, which are the binary interface.
#include "qltypes/dimensions/NumericDims.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "tests/support/Slots.h"

namespace {

using namespace QLTypeSys;
using testsupport::slotOf;

using Table = SymbolicDimsTable;
using Registry = QL::SymbolRegistry;
using Token = Table::DimsRegistration (Table::*)(const char*, const QLBlock*);

// clang-format off
TEST(BinaryInterface, SlotsOfTheTableOfDimensions) {
    const std::vector<std::size_t> slots = {
        slotOf(static_cast<Registry::Registration (Registry::*)(const std::string&, const QLBlock*, const QlDims&)>(&Registry::registerSymbolicTExpr)),
        slotOf(static_cast<Registry::Registration (Registry::*)(const std::u16string&, const QLRootBD*, QlWorkspace*, QlEvalClient*, std::vector<double>&)>(&Registry::registerSymbolicTExpr)),
        slotOf(&Registry::getSymbolsFromExpressionId),
        slotOf(&Registry::addSymbolDataTypeInformation),
        slotOf(static_cast<Registry::Registration (Table::*)(const std::u16string&, QL::SymbolValidator&, std::vector<double>&)>(&Table::registerSymbolicTExpr)),
        slotOf(&Table::getOriginalBlock),
        slotOf(&Table::CreateSymbolicDimsTable),
        slotOf(&Table::resetToBuiltin),
        slotOf(static_cast<Token>(&Table::registerSymbolicDims)),
        slotOf(static_cast<Token>(&Table::registerSymbolicDimsExpr)),
        slotOf(&Table::reportLossOfSymbolicDimensions),
        slotOf(&Table::isLossOfSymbolicDimsDiagEnabled),
        slotOf(&Table::registerReferencedSymbolInParamTable),
        slotOf(static_cast<Registry::Registration (Table::*)(const std::string&, const NumericDims&, QL::SymbolValidator&)>(&Table::registerSymbolicTExpr)),
    };
    for (std::size_t i = 0; i < slots.size(); ++i)
        EXPECT_EQ(slots[i], 2 + i) << "operation " << i + 1; // behind the two forms of the destructor
}
// clang-format on

// Access to private fields: an explicit instantiation may name them.
template <class Field, auto member> struct Reveal {
    friend constexpr auto memberOf(Field) { return member; }
};
#define QLTYPES_REVEAL(name)                                                                                           \
    struct Field_##name {                                                                                              \
        friend constexpr auto memberOf(Field_##name);                                                                  \
    };                                                                                                                 \
    template struct Reveal<Field_##name, &SymbolicDimsTable::name>
QLTYPES_REVEAL(constraints_);
QLTYPES_REVEAL(displayStrings_);
QLTYPES_REVEAL(headerFiles_);
QLTYPES_REVEAL(oneIntExprId_);
QLTYPES_REVEAL(oneDoubleExprId_);
QLTYPES_REVEAL(symbolsRegistered_);
QLTYPES_REVEAL(torvexExprs_);
QLTYPES_REVEAL(lossOfSymbolicDimsDiag_);

TEST(BinaryInterface, FieldsOfTheTableOfDimensions) {
    using testsupport::offsetOfMember;
    EXPECT_EQ(offsetOfMember(memberOf(Field_constraints_())), sizeof(QL::SymbolRegistry)); // the first
    testsupport::expectAscending({
        offsetOfMember(memberOf(Field_constraints_())),
        offsetOfMember(memberOf(Field_displayStrings_())),
        offsetOfMember(memberOf(Field_headerFiles_())),
        offsetOfMember(memberOf(Field_oneIntExprId_())),
        offsetOfMember(memberOf(Field_oneDoubleExprId_())),
        offsetOfMember(memberOf(Field_symbolsRegistered_())),
        offsetOfMember(memberOf(Field_torvexExprs_())),
        offsetOfMember(memberOf(Field_lossOfSymbolicDimsDiag_())),
    });
}

TEST(BinaryInterface, SlotsOfNumericDims) {
    EXPECT_EQ(slotOf(&NumericDims::getNumDims), 2u);
    EXPECT_EQ(slotOf(&NumericDims::getDim), 3u);
    EXPECT_EQ(slotOf(&NumericDims::getWidth), 4u);
}

TEST(BinaryInterface, TheStoreIsAPointer) {
    EXPECT_FALSE(std::is_polymorphic_v<SymbolicDimsConstraints>);
    EXPECT_EQ(sizeof(SymbolicDimsConstraints), sizeof(void*));
    EXPECT_FALSE(std::is_polymorphic_v<SymbolicDims>);
}

} // namespace
