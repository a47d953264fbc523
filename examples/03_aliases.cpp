// Aliases: further names for a type. They answer for the type at the end of the chain and cannot be defined themselves.
#include <cstdio>

#include "qlplatform/services/Diagnostics.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace {

constexpr DataTypeSource client = DataTypeSource(2);

void tell(const char* what, qlsvDiagnosticImpl* failed) {
    std::printf("%s: %s\n", what, failed ? failed->text().c_str() : "accepted");
    qlsvDiscardDiagnostic(failed);
}

} // namespace

int main() {
    QLTypeSys::DataTypeTable table;
    const int length = table.registerAliasDataType("Length", client, DATA_TYPE_ID_DOUBLE, nullptr);
    const int width = table.registerAliasDataType("Width", client, length, nullptr);
    std::printf(
        "Width is %s, in the end %s, of %d bytes\n", DtGetDataTypeName(&table, DtGetDataTypeIdAliasedTo(&table, width)),
        DtGetDataTypeName(&table, DtGetDataTypeIdAliasedThruTo(&table, width)), DtGetDataTypeSize(&table, width));
    tell("a ground for Width", DtSetDataTypeGround(&table, "", width, DtGetDataTypeGround(&table, width)));

    // A name that is in use already becomes an alias under its identifier, as long as nothing was defined for it.
    const int later = table.registerDataType("Later", client, nullptr);
    table.setDataTypeIdAliasedTo(later, DATA_TYPE_ID_INT16);
    std::printf("\nLater is still %d, and now %s\n", later,
                DtGetDataTypeName(&table, DtGetDataTypeIdAliasedThruTo(&table, later)));

    const int defined = table.registerDataType("Defined", client, nullptr);
    DtSetDataTypeSize(&table, "", defined, 4);
    const int loop = table.registerDataType("Loop", client, nullptr);
    const int back = table.registerAliasDataType("Back", client, loop, nullptr);
    const struct {
        const char* what;
        int id, target;
    } refused[] = {{"a defined type", defined, DATA_TYPE_ID_INT16}, {"a loop", loop, back}, {"no type", loop, 99}};
    for (const auto& row : refused) {
        try {
            table.setDataTypeIdAliasedTo(row.id, row.target);
        } catch (const foundation::core::except::IException& e) {
            std::printf("%s: %s\n", row.what, e.what());
        }
    }
}
