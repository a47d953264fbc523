// A structure of two elements is registered, laid out and asked where its elements lie.
#include <cstdio>

#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

int main() {
    QLTypeSys::DataTypeTable table;
    const int id = table.registerStructDataType("Sample", DataTypeSource(2), nullptr);
    DtSetDataTypeNumElements(&table, nullptr, id, 2);
    const auto& elements = DtGetStructDataTypeObject(&table, id)->getElements();
    elements[0]->setName("valid");
    elements[0]->setDataTypeId(DATA_TYPE_ID_BOOLEAN);
    elements[1]->setName("value");
    elements[1]->setDataTypeId(DATA_TYPE_ID_DOUBLE);
    DtComputeDerivedStructAttributes(&table, id);

    for (long i = 0; i < DtGetDataTypeNumElements(&table, id); ++i) {
        std::printf("%-6s at %ld, %d bytes of padding behind it\n", DtGetDataTypeElementName(&table, id, i),
                    DtGetDataTypeElementOffset(&table, id, i), DtGetDataTypeElementPadding(&table, id, i));
    }
    std::printf("%s has %d bytes\n", DtGetDataTypeName(&table, id), DtGetDataTypeSize(&table, id));
}
