// What gdb is to print: one of each kind, in the local variables of a function where it is stopped.
#include "qlplatform/symbolic/NodeStore_internal.h" // for the debug information of a whole expression table
#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qltypes/dimensions/SymbolicDims.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "qltypes/fixed_point/FixPointDefs.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructElement.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/AliasDataType.h"
#include "qltypes/types/DataType.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

class ClientTable : public QLTypeSys::DataTypeTable {
  public:
    const QLTypeSys::DataType* record(int id) const { return dataTypes_[static_cast<std::size_t>(id + 1)]; }
};

[[gnu::noinline]] void stop(const void*) { asm volatile(""); } // where a debugger looks one level up

int main() {
    ClientTable table;
    const int inner = table.registerStructDataType("Inner", DataTypeSource(2), nullptr);
    DtSetDataTypeNumElements(&table, nullptr, inner, 2);
    const auto& innerElements = DtGetStructDataTypeObject(&table, inner)->getElements();
    innerElements[0]->setName("a");
    innerElements[0]->setDataTypeId(DATA_TYPE_ID_DOUBLE);
    innerElements[0]->setNumDimensions(1);
    innerElements[0]->setDimension(0, 3);
    innerElements[1]->setName("b");
    innerElements[1]->setDataTypeId(DATA_TYPE_ID_SINGLE);
    innerElements[1]->setSignalType(1);
    DtComputeDerivedStructAttributes(&table, inner);
    const int alias = table.registerAliasDataType("Pair", DataTypeSource(2), inner, nullptr);
    const int unsized = table.registerDataType("Later", DataTypeSource(2), nullptr);

    const QLTypeSys::DataType* const structureRecord = table.record(inner);
    const auto* const knownAlias = static_cast<const QLTypeSys::AliasDataType*>(table.record(alias));
    const QLTypeSys::DataType* const aliasRecord = knownAlias;
    const QLTypeSys::DataType* const unsizedRecord = table.record(unsized);
    const QLTypeSys::DataType* const builtIn = table.record(DATA_TYPE_ID_INT16);
    StructElement unset;
    unset.setName("unset");

    const fxpDataTypeProp plain{FXP_DT_FIXPT, 1, 16, 0, -7, 1.0, 0.0, 0};
    const fxpDataTypeProp scaled{FXP_DT_SCALED_DOUBLE, 0, 8, 0, 3, 1.25, -2.5, 0};
    const fxpDataTypeProp half{FXP_DT_CUSTOM_FLOAT, 1, 16, 5, 0, 1.0, 0.0, 0};

    QLTypeSys::SymbolicDimsTable dims;
    const QLTypeSys::SymbolicDimsString k(dims, "K");
    const QLTypeSys::SymbolicDims twice(k * QLTypeSys::SymbolicDimsQLSizeValue(dims, 2));
    const QLTypeSys::SymbolicDimsND shape(dims, {k.getId(), twice.getId(), dims.registerSymbolicDims(-7), k.getId()});
    const QLTypeSys::SymbolicDims none(&dims, 0);
    const QL::SymbolicExpr expression = dims.getSymbolicExpr(static_cast<unsigned long>(twice.getId() + 1));

    const void* const looked[] = {&table,  structureRecord, aliasRecord, unsizedRecord, builtIn, &unset,      &plain,
                                  &scaled, &half,           &k,          &shape,        &none,   &expression, &twice};
    stop(looked);
}
