// qltypes table: the fixed types of a fresh table.
#include "Commands.h"

#include "output/Json.h"
#include "output/Output.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace inspector {
namespace {

struct FixedType {
    int id;
    std::string name;
    int size;
    const char* kind;
};

std::vector<FixedType> fixedTypes() {
    QLTypeSys::DataTypeTable table;
    std::vector<FixedType> types;
    for (int id = DATA_TYPE_ID_AUTO; id < table.getNumDataTypes() - 1; ++id) {
        const char* const kind = id == DATA_TYPE_ID_AUTO    ? "auto"
                                 : IsPredefinedDataType(id) ? "predefined"
                                                            : "built-in";
        types.push_back({id, DtGetDataTypeName(&table, id), DtGetDataTypeSize(&table, id), kind});
    }
    return types;
}

std::string tableText(const Colours& colours) {
    TextTable text({{"id", Align::Right}, {"name", Align::Left}, {"size", Align::Right}, {"kind", Align::Left}});
    for (const FixedType& type : fixedTypes())
        text.addRow({std::to_string(type.id), type.name, std::to_string(type.size), type.kind});
    return text.text("", colours);
}

std::string tableJson() {
    nlohmann::ordered_json types = nlohmann::ordered_json::array();
    for (const FixedType& type : fixedTypes())
        types.push_back({{"id", type.id}, {"name", type.name}, {"size", type.size}, {"kind", type.kind}});
    return jsonText({{"types", types}});
}

} // namespace

void addTableCommand(CommandLine& line) {
    const auto asJson = std::make_shared<bool>(false);
    Subcommand command = line.subcommand("table", "Lists the fixed types that every table begins with");
    command.flag("--json", *asJson, "Print JSON with stable keys");
    command.footer("Sizes are in bytes.\n"
                   "Examples:\n"
                   "  qltypes table\n"
                   "  qltypes table --json | jq '.types[] | select(.kind == \"predefined\")'");
    command.run([asJson] { print(*asJson ? tableJson() : tableText(coloursOfOutput())); });
}

} // namespace inspector
