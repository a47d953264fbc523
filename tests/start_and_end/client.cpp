// A library that calls the interface while it is loaded, before main, and once more when the program ends, after all
// that main made has gone. Everything that is made on first use must outlive it, also what main was the first to use.
#include <cstdio>
#include <cstdlib>
#include <string>

#include "qlplatform/services/IException.h"
#include "qltypes/conversion/CheckedConversion.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "qltypes/fixed_point/IdentifierString.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "tests/start_and_end/client.h"

namespace {

void require(bool holds, const char* what, const char* when) {
    if (holds) return;
    std::fprintf(stderr, "%s: %s\n", when, what);
    std::_Exit(1);
}

struct AsLongAsTheLibrary {
    AsLongAsTheLibrary() { useEverything("before main"); }
    ~AsLongAsTheLibrary() { useEverything("after main"); }
} asLongAsTheLibrary;

} // namespace

void useEverything(const char* when) {
    QLTypeSys::DataTypeTable table;
    const int id = table.registerStructDataType("Sample", static_cast<DataTypeSource>(2), nullptr);
    DtSetDataTypeNumElements(&table, nullptr, id, 1);
    DtGetStructDataTypeObject(&table, id)->getElements()[0]->setDataTypeId(DATA_TYPE_ID_DOUBLE);
    require(!DtComputeDerivedStructAttributes(&table, id), "layout", when);
    require(DtGetDataTypeSize(&table, id) == 8, "size of a structure", when);

    std::string told;
    const int plain = table.registerDataType("Plain", dtSourceBuiltIn, nullptr);
    try {
        table.getDataTypeAliasedThruTo(plain)->setSize(4);
        table.getDataTypeAliasedThruTo(plain)->setSize(8);
    } catch (const foundation::core::except::IException& e) {
        told = e.what();
    }
    require(told.find("Plain") != std::string::npos, "a refusal with its text", when);

    const fxpDataTypeProp& number = identifierStringToFxpDataType(std::string("sfix16_En4"));
    require(fxpDataTypeToIdentifierString(&number) == "sfix16_En4", "identifier text", when);
    require(table.registerDynamicMatrixDataType(DATA_TYPE_ID_DOUBLE, 2) > plain, "matrix type", when);
    const int textType = table.registerStringDataType(20, "Text");
    alignas(8) unsigned char slot[64] = {};
    table.construct(textType, slot);
    table.destruct(textType, slot);

    const double value = 300;
    signed char converted = 0;
    qlConvertBuiltInDTypeVectWithCheck(&value, 1, DATA_TYPE_ID_DOUBLE, false, &converted, 1, DATA_TYPE_ID_INT8, false,
                                       FXP_OVERFLOW_SATURATE, FXP_ROUND_FLOOR, true);
    require(converted == 127, "conversion", when);

    QLTypeSys::SymbolicDimsTable dims;
    const QLTypeSys::SymbolicDimsString k(dims, "K"), l(dims, "L");
    dims.addGreaterThanRelation(k.getId(), l.getId(), nullptr);
    require(dims.hasGreaterThanRelation(k.getId(), l.getId()), "symbolic dimensions", when);
}
