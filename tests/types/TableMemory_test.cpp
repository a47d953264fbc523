// Every allocation of whatever changes a table fails once: the table stays as it was, and the next attempt succeeds.
#include <functional>

#include <gtest/gtest.h>

#include "qltypes/date_time/DateTimeType.h"
#include "qltypes/host/FeatureFlags.h"
#include "qltypes/image/ImageDataType.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "tests/support/EachAllocation.h"
#include "tests/support/TableState.h"
#include "tests/types/ClientTable.h"

namespace {

using namespace QLTypeSys;
using testsupport::ClientTable;
using testsupport::failEach;
using testsupport::Leaves;

constexpr auto client = static_cast<DataTypeSource>(2);
const std::string longName = "a_name_that_is_too_long_to_be_held_without_memory_of_its_own";

/// A table as an engine derives it, with buses and custom types.
struct EngineTable : ClientTable {
    int registerBusDataType(const char* name, DataTypeSource source, const char*) override {
        validateDataTypeName(name);
        auto record = std::make_unique<BusDataType>(getNumDataTypes() - 1, name, source);
        addDataType(record.get());
        return record.release()->getId();
    }
};

int registerCustom(DataTypeTable* table, const char* name) { return table->registerStringDataType(5, name); }

/// A table with types of all kinds that name each other, so full that its next record has to move the others.
struct Filled {
    Filled() {
        check = table.install();
        plain = table.registerDataType("Plain", client, nullptr);
        table.getDataTypeAt(static_cast<unsigned long>(plain + 1))->setSize(4);
        open = table.registerDataType(longName.c_str(), client, nullptr);
        fixpt = table.registerDataType("sfix16_En7", dtSourceFixpt, nullptr);
        alias = table.registerAliasDataType("Alias", client, plain, nullptr);
        aliasOfAlias = table.registerAliasDataType("AliasOfAlias", client, alias, nullptr);
        aliasOfOpen = table.registerAliasDataType("AliasOfOpen", client, open, nullptr);
        inner = structure("Inner", {plain, DATA_TYPE_ID_DOUBLE});
        outer = structure("Outer", {DATA_TYPE_ID_INT8, inner, aliasOfAlias});
        text = table.registerStringDataType(17, "Text");
        matrix = table.registerDynamicMatrixDataType(DATA_TYPE_ID_INT8, 2);
        table.insertCustomDataTypeCallback("Custom", registerCustom);
        table.insertCustomDataTypeHeaderFilePair("Custom", "custom.h");
        while (table.getNumDataTypes() < 32)
            table.registerDataType(("Filler" + std::to_string(table.getNumDataTypes())).c_str(), client, nullptr);
    }

    int structure(const char* name, const std::vector<int>& types) {
        const int id = table.registerStructDataType(name, client, nullptr);
        StructDataType* const record = DtGetStructDataTypeObject(&table, id);
        record->setNumElements(static_cast<long>(types.size()));
        for (std::size_t i = 0; i < types.size(); ++i) {
            record->getElements()[i]->setName(("e" + std::to_string(i)).c_str());
            record->getElements()[i]->setDataTypeId(types[i]);
        }
        EXPECT_EQ(DtComputeDerivedStructAttributes(&table, id), nullptr);
        return id;
    }

    std::vector<std::string> state() {
        std::vector<std::string> lines =
            stateOf(table, {"New", "str9", "character", "Custom", "Other", "sfix8_En2", "Plain", "Inner", longName});
        for (const int id : {inner, outer})
            if (table.getDataTypeAt(static_cast<unsigned long>(id + 1))->getIsType(dtqStruct))
                for (std::string& line : testsupport::answersOf(table, id))
                    lines.push_back(std::move(line));
        return lines;
    }

    DataType& at(int id) { return *table.getDataTypeAt(static_cast<unsigned long>(id + 1)); }

    EngineTable table;
    boost::shared_ptr<testsupport::RecordingClient> check;
    int plain, open, fixpt, alias, aliasOfAlias, aliasOfOpen, inner, outer, text, matrix;
};

/// The same, where what is registered again replaces what is there.
struct Declining : Filled {
    Declining() {
        for (const int id : {inner, outer}) // views have read what is replaced
            testsupport::answersOf(table, id);
        table.declines = true;
    }
};

struct Row {
    const char* name;
    std::function<void(Filled&)> work;
    Leaves leaves = Leaves::Nothing;
};

template <class Subject> void failEachRow(const std::vector<Row>& rows) {
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        EXPECT_GT(failEach<Subject>(row.work, row.leaves), 0u);
        if (testing::Test::HasFailure()) return;
    }
}

TEST(TableMemory, ATableIsMade) {
    struct Nothing {
        std::vector<std::string> state() { return {}; }
    };
    EXPECT_GT(failEach<Nothing>([](Nothing&) { DataTypeTable table; }), 30u);
}

const std::vector<Row> registrations = {
    {"plain", [](Filled& f) { f.table.registerDataType("New", client, "block"); }},
    {"fixed point", [](Filled& f) { f.table.registerDataType("sfix8_En2", dtSourceFixpt, "block"); }},
    {"enumeration", [](Filled& f) { f.table.registerDataType("New", dtSourceEnum, "block"); }},
    {"alias", [](Filled& f) { f.table.registerAliasDataType("New", client, f.aliasOfAlias, "block"); }},
    {"structure", [](Filled& f) { f.table.registerStructDataType("New", client, "block"); }},
    {"bus", [](Filled& f) { f.table.registerBusDataType("New", client, "block"); }},
    {"named string", [](Filled& f) { f.table.registerStringDataType(9, "New"); }},
    {"matrix", [](Filled& f) { f.table.registerDynamicMatrixDataType(DATA_TYPE_ID_SINGLE, 3); }},
    {"matrix of structures", [](Filled& f) { f.table.registerDynamicMatrixDataType(f.outer, 1); }},
    {"date-time", [](Filled& f) { f.table.registerDateTimeDataType(QLDateTime::DateTimeType(), nullptr); }},
    {"string", [](Filled& f) { f.table.registerStringDataType(9, nullptr); }, Leaves::Parts},
    {"image",
     [](Filled& f) {
         f.table.registerImageDataType(3, SSImageColorFormat_RGB, SSImageDataLayout_ColumnMajorPlanar,
                                       DATA_TYPE_ID_UINT8);
     },
     Leaves::Parts},
    {"opaque",
     [](Filled& f) {
         DataType source(7, longName + "2", client);
         source.setSize(16);
         source.setConstructFcnName(longName);
         source.setSerializeFcnName(longName);
         f.table.registerOpaqueDataType(&source, "block");
     }},
    {"by a diagnostic",
     [](Filled& f) {
         int id = -1;
         qlsvDiagnosticImpl* diagnostic = DtRegisterDataType(&f.table, "block", "New", client, &id);
         if (diagnostic) qlsvThrowIExceptionFromDiagnostic(diagnostic, nullptr);
     }},
};

TEST(TableMemory, ATypeIsRegistered) { failEachRow<Filled>(registrations); }

TEST(TableMemory, ARegistrationIsRefused) {
    failEachRow<Filled>({
        {"no name", [](Filled& f) { f.table.registerDataType("no name", client, nullptr); }},
        {"of another source", [](Filled& f) { f.table.registerDataType("Plain", dtSourceEnum, nullptr); }},
        {"of a fixed-point name", [](Filled& f) { f.table.registerDataType("sfix8_En2", client, nullptr); }},
        {"of no target", [](Filled& f) { f.table.registerAliasDataType("New", client, 999, nullptr); }},
        {"by the client",
         [](Filled& f) {
             f.check->vetoed = longName + "3";
             f.table.registerDataType(f.check->vetoed.c_str(), client, "block");
         }},
        {"as a diagnostic",
         [](Filled& f) {
             int id = -1;
             qlsvDiagnosticImpl* diagnostic =
                 DtRegisterDataType(&f.table, longName.c_str(), "Plain", dtSourceEnum, &id);
             if (diagnostic) qlsvThrowIExceptionFromDiagnostic(diagnostic, nullptr);
         }},
    });
}

TEST(TableMemory, ATypeIsReplaced) {
    failEachRow<Declining>({
        {"plain", [](Filled& f) { f.table.registerDataType("Plain", client, "block"); }},
        {"by an alias", [](Filled& f) { f.table.registerAliasDataType("Plain", client, f.text, "block"); }},
        {"by a structure", [](Filled& f) { f.table.registerStructDataType("Plain", client, "block"); }},
        {"fixed point", [](Filled& f) { f.table.registerDataType("sfix16_En7", dtSourceFixpt, "block"); }},
        {"alias", [](Filled& f) { f.table.registerAliasDataType("Alias", client, f.text, "block"); }},
        {"structure", [](Filled& f) { f.table.registerStructDataType("Inner", client, "block"); }},
        {"string", [](Filled& f) { f.table.registerStringDataType(3, "Text"); }},
        {"matrix", [](Filled& f) { f.table.registerDynamicMatrixDataType(DATA_TYPE_ID_INT8, 2); }},
        {"under another name",
         [](Filled& f) {
             auto record = std::make_unique<DataType>(f.table.getNumDataTypes() - 1, longName + "4", client);
             f.table.addDataType(record.get());
             DataType* const added = record.release();
             try {
                 f.table.replaceDataType(&f.at(f.plain), added);
             } catch (...) {
                 f.table.removeDataType(added);
                 throw;
             }
         }},
    });
}

TEST(TableMemory, ATypeBecomesAnAlias) {
    failEachRow<Filled>({
        {"of a plain type", [](Filled& f) { f.table.setDataTypeIdAliasedTo(f.open, f.plain); }},
        {"of an alias", [](Filled& f) { f.table.setDataTypeIdAliasedTo(f.open, f.aliasOfAlias); }},
        {"of a structure", [](Filled& f) { f.table.setDataTypeIdAliasedTo(f.open, f.outer); }},
        {"of what is an alias of it", [](Filled& f) { f.table.setDataTypeIdAliasedTo(f.open, f.aliasOfOpen); }},
        {"although it is defined", [](Filled& f) { f.table.setDataTypeIdAliasedTo(f.plain, f.text); }},
        {"again, of another", [](Filled& f) { f.table.setDataTypeIdAliasedTo(f.alias, f.text); }},
    });
}

int addOne(void*, const void*) { return 1; }

TEST(TableMemory, ATypeIsDefined) {
    failEachRow<Filled>({
        {"size", [](Filled& f) { f.at(f.open).setSize(80); }},
        {"properties",
         [](Filled& f) {
             const double bytes[] = {1, 2};
             f.at(f.plain).setPropertiesSize(sizeof bytes);
             f.at(f.plain).setProperties(bytes);
         },
         Leaves::Parts}, // the size of the block
        {"names of functions",
         [](Filled& f) {
             f.at(f.open).setConstructFcnName(longName);
             f.at(f.open).setConstructFcn(addOne);
         }},
        {"short name", [](Filled& f) { f.at(f.open).setShortName(longName + "5"); }},
        {"refused twice over",
         [](Filled& f) {
             qlsvDiagnosticImpl* diagnostic = DtSetDataTypeSize(&f.table, longName.c_str(), f.plain, 5);
             if (diagnostic) qlsvThrowIExceptionFromDiagnostic(diagnostic, nullptr);
         }},
        {"storage", [](Filled& f) { f.table.setDataTypeStorageId(f.plain, f.outer); }},
    });
}

TEST(TableMemory, ACustomTypeIsEntered) {
    failEachRow<Filled>({
        {"function", [](Filled& f) { f.table.insertCustomDataTypeCallback(longName.c_str(), registerCustom); }},
        {"header", [](Filled& f) { f.table.insertCustomDataTypeHeaderFilePair("Other", longName); }},
        {"type", [](Filled& f) { EXPECT_GT(DtGetOrRegisterKnownCustomDataTypeId(&f.table, "Custom"), 14); }},
    });
}

TEST(TableMemory, AnImageIsStoredAsACustomType) {
    QLTH_ImageTypeImplementation->setState(1);
    failEachRow<Filled>({{"image",
                          [](Filled& f) {
                              f.table.insertCustomDataTypeCallback("cv_Mat", registerCustom);
                              f.table.registerImageDataType(4, SSImageColorFormat_CMYK,
                                                            SSImageDataLayout_RowMajorInterleaved, DATA_TYPE_ID_SINGLE);
                          },
                          Leaves::Parts}}); // the type that stores it
    QLTH_ImageTypeImplementation->setState(0);
}

TEST(TableMemory, AResetNeedsNone) {
    EXPECT_EQ(failEach<Filled>([](Filled& f) {
                  f.table.resetToBuiltin();
                  f.inner = f.outer = DATA_TYPE_ID_DOUBLE;
              }),
              0u);
}

TEST(TableMemory, AQuestionIsAsked) {
    const auto asking = [](auto question) { return [question](Filled& f) { question(f.table, f); }; };
    using Table = EngineTable;
    failEachRow<Filled>({
        {"name for display", asking([](Table& t, Filled& f) { DtGetDataTypeNameStripDTOPrefix(&t, f.open); })},
        {"expression", asking([](Table& t, Filled& f) { (void)(t.getDTACompliantString(f.open) + longName); })},
        {"custom types", asking([](Table& t, Filled&) { t.getAllCustomDataTypeName(); })},
        {"dependencies", asking([](Table& t, Filled& f) {
             std::vector<unsigned int> ids;
             DtGetDataTypeDependenciesVector(&t, f.outer, ids);
         })},
        {"offsets of the hierarchy", asking([](Table& t, Filled& f) {
             DtGetDataTypeFullHierarchyOffset(&t, f.outer, {2, 3});
         })},
        {"an invalid id", asking([](Table& t, Filled&) { t.checkDataTypeId(999); })},
    });
}

} // namespace
