// Structures in structures: one is laid out after the other, then the outer one is read in its four numberings.
#include <cstdio>

#include "qlplatform/services/Diagnostics.h"
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace {

struct Member {
    const char* name;
    int typeId;
    long width;
    bool isComplex = false;
};

int define(QLTypeSys::DataTypeTable& table, const char* name, std::initializer_list<Member> members) {
    const int id = table.registerStructDataType(name, DataTypeSource(2), nullptr);
    DtSetDataTypeNumElements(&table, "example", id, static_cast<long>(members.size()));
    long i = 0;
    for (const Member& member : members) {
        StructElement* const element =
            DtGetStructDataTypeObject(&table, id)->getElements()[static_cast<std::size_t>(i)];
        element->setName(member.name);
        element->setDataTypeId(member.typeId);
        DtSetDataTypeElementNumDimensions(&table, "example", id, i, 1);
        DtSetDataTypeElementDimension(&table, "example", id, i, 0, member.width);
        DtSetDataTypeElementSignalType(&table, "example", id, i, member.isComplex ? 1 : 0);
        ++i;
    }
    if (qlsvDiagnosticImpl* failed = DtComputeDerivedStructAttributes(&table, id)) {
        std::puts(failed->text().c_str());
        qlsvDiscardDiagnostic(failed);
    }
    return id;
}

} // namespace

int main() {
    QLTypeSys::DataTypeTable table;
    const int inner = define(table, "Inner", {{"a", DATA_TYPE_ID_DOUBLE, 3}, {"b", DATA_TYPE_ID_SINGLE, 1, true}});
    const int outer = define(table, "Outer", {{"x", DATA_TYPE_ID_INT8, 1}, {"y", inner, 2}, {"z", inner, 1}});

    std::printf("%s: %d bytes, %ld leaves, %ld values, %ld nodes\n\n", DtGetDataTypeName(&table, outer),
                DtGetDataTypeSize(&table, outer), DtGetDataTypeNumFlatElements(&table, outer),
                DtGetDataTypeNumRawElements(&table, outer), DtGetDataTypeNumDFSElements(&table, outer));

    std::puts("node  path    type    offset  leaf  first value");
    const QLTypeSys::DFSElementAccess nodes(&table, outer);
    for (long node = 0; node < nodes.getNumElements(); ++node) {
        const std::string path = DtGetDataTypeDFSElementQRTPathFromIdx(&table, outer, node);
        const long leaf = nodes.getFlatElementIdx(node);
        std::printf("%4ld  %-6s  %-6s  %6ld", node, path.c_str(), DtGetDataTypeName(&table, nodes.getDataTypeId(node)),
                    nodes.getOffset(node));
        if (leaf >= 0) std::printf("  %4ld  %11ld", leaf, nodes.getRawElementIdx(node));
        std::puts("");
    }

    // An index past the end lies in the next structure of an array of them.
    const QLTypeSys::FlatElementAccess leaves(&table, outer);
    std::printf("\nleaf 8 is %s at %ld\n", DtGetDataTypeFlatElementFullPath(&table, outer, 8).c_str(),
                leaves.getOffset(8));
    std::printf("node 8 is %ld nodes behind the array y that it is part of\n",
                DtIsDFSElementDescendant(&table, outer, 2, 8));
}
