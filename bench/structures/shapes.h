// Large structures of three shapes, with about as many nodes as asked for.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTable.h"

namespace shapes {

enum class Kind { wide, arrays, deep };

inline const char* nameOf(Kind kind) { return kind == Kind::wide ? "wide" : kind == Kind::arrays ? "arrays" : "deep"; }

inline constexpr int leafTypes[] = {DATA_TYPE_ID_DOUBLE, DATA_TYPE_ID_INT8,  DATA_TYPE_ID_INT32,
                                    DATA_TYPE_ID_SINGLE, DATA_TYPE_ID_INT16, DATA_TYPE_ID_BOOLEAN};

struct Member {
    std::string name;
    int typeId;
    long width;
};

/// A table with one large structure.
class Shape {
  public:
    Shape(Kind kind, long numNodes) {
        if (kind == Kind::wide) {
            id = define("Wide", leaves(numNodes - 1));
        } else if (kind == Kind::arrays) {
            const int inner = define("Inner", leaves(5));
            const int middle = define("Middle", {{"x", DATA_TYPE_ID_DOUBLE, 1}, {"in", inner, 9}});
            id = define("Outer", {{"mid", middle, numNodes / 57}});
        } else {
            constexpr long depth = 200;
            std::vector<Member> members = leaves(numNodes / depth - 1);
            id = define("Level0", members);
            for (long level = 1; level < depth; ++level) {
                members.resize(static_cast<std::size_t>(numNodes / depth - 1));
                members.push_back({"next", id, 1});
                id = define("Level" + std::to_string(level), members);
            }
        }
    }

    QLTypeSys::DataTypeTable table;
    int id = 0;

    StructDataType* record() { return DtGetStructDataTypeObject(&table, id); }
    long numNodes() { return record()->getNumDFSElements(); }
    long numLeaves() { return record()->getNumFlatElements(); }
    long numValues() { return record()->getNumRawElements(); }

  private:
    static std::vector<Member> leaves(long count) {
        std::vector<Member> made;
        for (long i = 0; i < count; ++i)
            made.push_back({"e" + std::to_string(i), leafTypes[i % std::ssize(leafTypes)], 1});
        return made;
    }

    int define(const std::string& name, const std::vector<Member>& members) {
        const int made = table.registerStructDataType(name.c_str(), static_cast<DataTypeSource>(2), nullptr);
        StructDataType* const structure = DtGetStructDataTypeObject(&table, made);
        structure->setNumElements(std::ssize(members));
        for (std::size_t i = 0; i < members.size(); ++i) {
            StructElement* const e = structure->getElements()[i];
            e->setName(members[i].name.c_str());
            e->setDataTypeId(members[i].typeId);
            e->setNumDimensions(1);
            e->setDimension(0, members[i].width);
        }
        if (DtComputeDerivedStructAttributes(&table, made)) std::abort();
        return made;
    }
};

} // namespace shapes
