// The views again, slow and obvious: each answer by its own walk, each depth-first answer kept in a map. What the
// library's views answer is held against it.
#pragma once

#include <map>
#include <memory>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include "qltypes/structures/StructDataType.h"
#include "qltypes/types/DataTypeTable.h"

namespace structures {

class SlowViews {
  public:
    struct Place {
        long immediate, instance;
        int typeId;
        long base;
        bool operator==(const Place&) const = default;
    };
    struct Parent {
        int typeId;
        long element;
        bool operator==(const Parent&) const = default;
    };
    using Path = std::vector<std::pair<std::string, long>>;

    explicit SlowViews(const QLTypeSys::DataTypeTable& table) : table_(table) {}

    // Immediate.
    long immediateRawIdx(int id, long element) const;
    int padding(int id, long element) const;

    // Depth-first.
    Place place(int id, long idx) const;
    const StructElement* element(int id, long idx);
    long offset(int id, long idx);
    long varDimsOffset(int id, long idx);
    long rawElementIdx(int id, long idx);
    Parent parent(int id, long idx) const;
    Path path(int id, long idx, bool fromRoot) const;
    long flatElementIdx(int id, long idx);
    long descendant(int id, long ancestor, long idx);

    // Flat.
    long dfsIdx(int id, long flatIdx);

    // Raw.
    Place rawPlace(int id, long rawIdx) const;
    int rawTypeId(int id, long rawIdx) const;
    int rawUnitId(int id, long rawIdx) const;
    long rawOffset(int id, long rawIdx) const;

    static std::string text(const Path& path, const std::string& prefix);

    /// Whether the element was made for a node rather than declared.
    bool isMade(const StructElement* element) const { return made_.count(element) > 0; }
    /// Forgets what was answered for a structure.
    void clear(int id);
    /// The same for all structures.
    void clearAll() { answers_.clear(); }
    /// Forgets the leaves of a record that was deleted; any type's.
    void forgetLeaves(const QLTypeSys::DataType* record);

  private:
    struct Answer {
        const StructElement* element = nullptr;
        long offset = -1;
        long varDimsOffset = -1;
    };

    const StructDataType& record(int id) const;
    bool isLeaf(int typeId) const;
    int sizeOf(int typeId) const;
    long numDFS(int typeId) const { return record(typeId).getNumDFSElements(); }
    Answer& answer(int id, long idx) { return answers_[{&record(id), id}][idx]; }
    const StructElement* make(std::unique_ptr<StructElement> element);
    const std::vector<long>& leaves(int id);

    const QLTypeSys::DataTypeTable& table_;
    std::map<std::pair<const StructDataType*, int>, std::unordered_map<long, Answer>> answers_;
    std::map<const StructDataType*, std::vector<long>> leaves_;
    std::map<const StructElement*, std::unique_ptr<StructElement>> made_;
};

} // namespace structures
