// Structures in few words: Element{"a", DATA_TYPE_ID_DOUBLE, {3}} ..., defined in a table of the fixture.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "qlplatform/services/Diagnostics.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "tests/support/Raises.h"

namespace structures {

/// A diagnostic as text; discards it.
inline std::string described(qlsvDiagnosticImpl* diagnostic) {
    const std::string text = testsupport::describe(diagnostic);
    qlsvDiscardDiagnostic(diagnostic);
    return text;
}

inline const std::string fine = "no diagnostic";

/// One element to be.
struct Element {
    std::string name;
    int typeId;
    std::vector<long> dims = {};
    bool isComplex = false;
};

/// A table with shorthands.
class Structures {
  public:
    QLTypeSys::DataTypeTable table;

    StructDataType* record(int id) { return DtGetStructDataTypeObject_AliasedThruIfNeeded(&table, id); }
    StructElement* element(int id, long index) { return record(id)->getElements()[static_cast<std::size_t>(index)]; }

    static void fill(StructElement& element, const Element& from) {
        element.setName(from.name.c_str());
        element.setDataTypeId(from.typeId);
        element.setNumDimensions(static_cast<long>(from.dims.size()));
        for (std::size_t i = 0; i < from.dims.size(); ++i)
            element.setDimension(static_cast<long>(i), from.dims[i]);
        element.setSignalType(from.isComplex ? 1 : 0);
    }

    /// Registers a structure and fills in its elements, without a layout.
    int define(const std::string& name, const std::vector<Element>& elements) {
        const int id = table.registerStructDataType(name.c_str(), static_cast<DataTypeSource>(2), nullptr);
        if (elements.empty()) return id;
        EXPECT_EQ(described(DtSetDataTypeNumElements(&table, "", id, static_cast<long>(elements.size()))), fine);
        for (std::size_t i = 0; i < elements.size(); ++i)
            fill(*element(id, static_cast<long>(i)), elements[i]);
        return id;
    }

    /// The same, laid out.
    int laidOut(const std::string& name, const std::vector<Element>& elements) {
        const int id = define(name, elements);
        EXPECT_EQ(described(DtComputeDerivedStructAttributes(&table, id)), fine) << name;
        return id;
    }

    /// A plain client type of `size` bytes.
    int plain(const std::string& name, int size) {
        const int id = table.registerDataType(name.c_str(), static_cast<DataTypeSource>(2), nullptr);
        table.getDataTypeAt(static_cast<unsigned long>(id + 1))->setSize(size);
        return id;
    }

    int alias(const std::string& name, int target) {
        return table.registerAliasDataType(name.c_str(), static_cast<DataTypeSource>(2), target, nullptr);
    }
};

/// The two structures of the worked example: Inner of double a(3) and complex single b; Outer of int8 x, Inner y(2) and
/// Inner z.
class Example : public Structures {
  public:
    int inner = laidOut("Inner", {{"a", DATA_TYPE_ID_DOUBLE, {3}}, {"b", DATA_TYPE_ID_SINGLE, {1}, true}});
    int outer = laidOut("Outer", {{"x", DATA_TYPE_ID_INT8, {1}}, {"y", inner, {2}}, {"z", inner, {1}}});
};

} // namespace structures
