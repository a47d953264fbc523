// Failures: one message behind three forms. An exception, a diagnostic that is returned, or false.
#include <cstdio>

#include <boost/variant/get.hpp>

#include "qlplatform/services/Diagnostics.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

int main() {
    QLTypeSys::DataTypeTable table;
    const int id = table.registerDataType("Torque", DataTypeSource(2), nullptr);

    std::puts("Members throw:");
    try {
        table.registerDataType("Torque", DataTypeSource(7), nullptr);
    } catch (const foundation::core::except::IException& e) {
        std::printf("%s\n%s\n", e.diagnostic()->item(0).identifier().c_str(), e.what());
    }

    std::puts("\nFlat functions return a diagnostic, which the caller discards; null is success:");
    if (qlsvDiagnosticImpl* failed = DtSetDataTypeSize(&table, "model/Gain", id, -3)) {
        for (std::size_t i = 0; i < failed->numItems(); ++i)
            std::printf("%zu: %s\n   %s\n", i, failed->item(i).identifier().c_str(), failed->text(i).c_str());
        std::printf("the first names %s and %ld\n", boost::get<std::string>(failed->item(0).arguments[0]).c_str(),
                    boost::get<long>(failed->item(0).arguments[1]));
        qlsvDiscardDiagnostic(failed);
    }

    std::puts("\nOperations on values also come with a status:");
    DtSetDataTypeSize(&table, "", id, 8);
    table.getDataTypeAliasedThruTo(id)->setConstructFcn([](void*, const void*) { return 0; });
    double value;
    std::printf("construct: %s\n", table.constructWithStatus(id, &value) ? "done" : "failed");

    std::puts("\nWhat is refused changes nothing:");
    const int types = table.getNumDataTypes();
    try {
        table.registerStructDataType("no identifier", DataTypeSource(2), nullptr);
    } catch (const foundation::core::except::IException& e) {
        std::printf("%s\n%d new types\n", e.what(), table.getNumDataTypes() - types);
    }
}
