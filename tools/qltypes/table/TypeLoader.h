// Registers the types of a description in a table and lays its structures out.
//
//   QLTypeSys::DataTypeTable table;
//   TypeLoader loader(table);
//   loader.load(description);
//   const Layout layout = loader.layout(description);
#pragma once

#include <string>
#include <unordered_map>
#include <vector>

#include "description/Description.h"
#include "output/Layout.h"
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/types/DataTypeTable.h"

namespace inspector {

class TypeLoader {
  public:
    /// Loads into `table`, which must live longer.
    explicit TypeLoader(QLTypeSys::DataTypeTable& table) : table_(table) {}

    /// Registers all types of the description, those that others need first, and computes the layout of each
    /// structure. Throws InputError at the place concerned for a description that is inconsistent and for whatever the
    /// table refuses.
    void load(const Description& description);

    /// What the table says of the types of a description that was loaded.
    Layout layout(const Description& description) const;

    /// The name for people of a registered type.
    std::string labelOf(const std::string& name) const;

  private:
    int idOf(const TypeReference& reference);
    int registerNumberType(const TypeReference& reference);
    void registerType(const TypeDescription& type);
    void registerUnderOwnName(const TypeDescription& type);
    void registerEnumeration(const TypeDescription& type, const EnumerationDescription& enumeration);
    void registerStructure(const TypeDescription& type, const StructureDescription& structure);
    void fillElement(int structureId, long index, const ElementDescription& element);
    int unitIdOf(const std::string& unit);

    ElementLayout elementLayout(const QLTypeSys::ImmediateElementAccess& view, long index,
                                std::int64_t endOfElementBefore) const;
    StructureLayout structureLayout(const TypeDescription& type) const;
    OtherType otherType(const std::string& name, const char* kind) const;

    QLTypeSys::DataTypeTable& table_;
    std::vector<std::string> numberTypes_; ///< registered because an element or alias names them
    std::vector<std::string> units_;       ///< position is the unit's id
    std::unordered_map<std::string, std::string> labelsByName_;
};

} // namespace inspector
