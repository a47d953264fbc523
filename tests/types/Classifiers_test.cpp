// What each classifier says of a type of each kind, and of an alias of it.
#include <gtest/gtest.h>

#include "qltypes/date_time/DateTimeType.h"
#include "qltypes/fixed_point/IdentifierString.h"
#include "qltypes/image/ImageDataType.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace {

using namespace QLTypeSys;

using Classifier = bool (*)(const DataTypeTable* table, int id);

struct Letter {
    char letter;
    Classifier says;
};

constexpr Letter letters[] = {
    {'B', [](const DataTypeTable*, int id) { return DtCheckForBuiltInDataType(id); }},
    {'P', [](const DataTypeTable*, int id) { return IsPredefinedDataType(id); }},
    {'N', DataTypeNumericNonBoolean},
    {'O', DataTypeNumericOrBoolean},
    {'i', DtIsIntDtype},
    {'u', DtIsUnsignedIntDtype},
    {'s', DtIsSignedIntDtype},
    {'f', DtIsFloatDtype},
    {'F', DtIsBuiltInOrCustomFloat},
    {'h', DtIsHalfPrecisionType},
    {'n', DtCanContainNegativeNumbers},
    {'g', DtIsSignedFixptDT},
    {'x', DtIsFixptDT},
    {'d', DtIsFixptDTNotScaledDouble},
    {'1', DtIsUFix1},
    {'b', DtIsBooleanOrUFix1},
    {'U', DtIsBuiltInOrUFix1},
    {'6', [](const DataTypeTable* table, int id) { return table->Is64BitType(id); }},
    {'E', DtIsEnumType},
    {'S', DtIsStructType},
    {'Y', DtIsAnonymousStructType},
    {'Z', DtGetDataTypeIsBus},
    {'T', [](const DataTypeTable* table, int id) { return table->IsStringDataType(id); }},
    {'M', DtIsDynamicMatrixType},
    {'D', DtIsImplementedAsDynamicMatrixType},
    {'I', DtIsImageType},
    {'a', DtIsAtomic},
    {'c', DtNeedCustomInitialization},
    {'C', DtHasDefaultConstructFcnOnly},
};

class Kinds {
  public:
    DataTypeTable table;

    int fixpt(const char* name) {
        const int id = table.registerDataType(name, dtSourceFixpt, nullptr);
        DataType* const record = table.getDataTypeAliasedThruTo(id);
        record->setPropertiesSize(sizeof(fxpDataTypeProp));
        record->setProperties(&identifierStringToFxpDataType(name));
        return id;
    }
    int structure(const char* name, DataTypeSource source) {
        return table.registerStructDataType(name, source, nullptr);
    }
    int bus() {
        const int id = GetNumDataTypes(&table);
        table.addDataType(new BusDataType(id, "Bus", dtSourceBuiltIn));
        return id;
    }
    int image() {
        return table.registerImageDataType(3, SSImageColorFormat_RGB, SSImageDataLayout_RowMajorInterleaved,
                                           DATA_TYPE_ID_UINT8);
    }
    int time() { return table.registerDateTimeDataType(QLDateTime::DateTimeType(), nullptr); }

    std::string said(int id) const {
        std::string made;
        for (const Letter& l : letters)
            if (l.says(&table, id)) made += l.letter;
        return made;
    }
};

TEST(Classifiers, OfEachKind) {
    Kinds k;
    const struct {
        int id;
        const char* expected;
    } rows[] = {
        {-1, "BNOnU"},
        {0, "BNOfFngU"},
        {1, "BNOfFngU"},
        {2, "BNOisngU"},
        {3, "BNOiuU"},
        {4, "BNOisngU"},
        {5, "BNOiuU"},
        {6, "BNOisngU"},
        {7, "BNOiuU"},
        {8, "BObU"},
        {9, "Pn"},
        {13, "Pn"},
        {k.table.registerDataType("Plain", dtSourceBuiltIn, nullptr), "n"},
        {k.fixpt("sfix16_En7"), "NOngxd"},
        {k.fixpt("ufix1"), "NOnxd1bU"},
        {k.fixpt("ufix1_E1"), "NOnxd"},
        {k.fixpt("flts16_En7"), "NOngx"},
        {k.fixpt("half"), "NOFhngxd"},
        {k.fixpt("int64"), "NOngxd6"},
        {k.fixpt("uint64"), "NOnxd6"},
        {k.table.registerDataType("Color", dtSourceEnum, nullptr), "nE"},
        {k.structure("S", dtSourceBuiltIn), "nS"},
        {k.structure("rtt_0", dtSourceAnonymous), "nSY"},
        {k.bus(), "nSZ"},
        {k.table.registerStringDataType(7, nullptr), "nTc"},
        {k.table.registerStringDataType(0, nullptr), "nTc"},
        {k.time(), "n"},
        {k.table.registerDynamicMatrixDataType(0, 2), "nMDc"},
        {k.image(), "nDIc"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(DtGetDataTypeName(&k.table, row.id));
        EXPECT_FALSE(DtIsAliasType(&k.table, row.id));
        EXPECT_EQ(k.said(row.id), row.expected);
        const std::string name = "AliasOf" + std::to_string(row.id + 1);
        const int alias = k.table.registerAliasDataType(name.c_str(), dtSourceBuiltIn, row.id, nullptr);
        EXPECT_TRUE(DtIsAliasType(&k.table, alias));
        std::string ofAlias = row.expected;
        std::erase_if(ofAlias, [](char c) { return std::string_view("BPY").find(c) != std::string_view::npos; });
        EXPECT_EQ(k.said(alias), ofAlias) << "what is asked of the identifier or the record itself, an alias is not";
    }
}

} // namespace
