// A type table as told in words: names, aliases, sizes, layouts and grounds, each worked out again from the beginning
// when it is asked. What a table does is held against it, step by step.
#pragma once

#include <map>
#include <optional>
#include <string>
#include <vector>

#include "qltypes/types/DataTypeTable.h"

namespace fuzz {

using Ground = std::vector<unsigned char>;

struct ModelElement {
    std::string name;
    int typeId = DATA_TYPE_ID_INVALID;
    std::vector<long> dims;
    int signalType = -1;
    int samplingMode = -1;
    int dimensionsMode = -1;
    long offset = -1;

    long width() const;
    long complexWidth() const { return width() * (signalType == 1 ? 2 : 1); }
};

/// The memo of derived flags.
struct ModelFlags {
    bool frames = false, varDims = false, arrays = false, complex = false;
};

struct ModelType {
    enum class Kind { plain, alias, structure };

    Kind kind = Kind::plain;
    std::string name;
    DataTypeSource source{};
    QLTypeSys::DataTypeQualifier qualifier = QLTypeSys::dtqUnspecified;
    int size = -1;
    bool isLocked = false;
    int storageId = 0;
    int aliasedTo = DATA_TYPE_ID_INVALID; // of an alias, as the next
    int thru = DATA_TYPE_ID_INVALID;
    bool hasDefaultGround = false;
    bool groundHasNonZero = true;
    Ground ground; // once

    // Of a structure.
    std::vector<ModelElement> elements;
    long numFlat = 0, numRaw = 0, numDFS = 0;
    std::optional<ModelFlags> flags;
};

/// How a step ends: the leaf of the message that says why not, or empty.
using Refusal = std::string;

/// Each operation does what the table's does, and says how it ends.
class TableModel {
  public:
    TableModel();

    std::vector<ModelType> types; ///< position is the identifier plus one
    bool declines = false;        ///< whether registering an existing name replaces its record
    std::string vetoed;           ///< the name that the client refuses
    int resets = 0;

    ModelType& at(int id) { return types[static_cast<std::size_t>(id + 1)]; }
    const ModelType& at(int id) const { return types[static_cast<std::size_t>(id + 1)]; }
    bool isValid(int id) const { return id >= DATA_TYPE_ID_AUTO && id < numTypes() - 1; }
    int numTypes() const { return static_cast<int>(types.size()); }
    int idOf(const std::string& name) const;
    int end(int id) const; ///< of the alias chain, where no alias is
    bool isStructure(int id) const { return id != DATA_TYPE_ID_AUTO && at(end(id)).kind == ModelType::Kind::structure; }
    int storageOf(int id) const;
    const ModelType& holderOf(int id) const { return at(end(id)); }
    /// Whether a value of the type contains one of the other, through aliases and elements.
    bool reaches(int id, int other) const;
    bool chainPasses(int id, int other) const;
    /// Whether an alias of the target would come back to itself, by what it names or by where it ends.
    bool isLoop(int target, int id) const;
    int commonAncestor(int a, int b) const;
    std::vector<int> dependsOn(int id) const;
    /// Whether every element, also of nested structures, has a type of the table.
    bool isComplete(int id) const;
    /// Whether the counts are those of the elements as they are, also of nested structures.
    bool isCounted(int id) const;

    Refusal registerPlain(const char* name, DataTypeSource source, int& id);
    Refusal registerStructure(const char* name, DataTypeSource source, int& id);
    Refusal registerAlias(const char* name, DataTypeSource source, int target, int& id);
    Refusal registerOpaque(const std::string& name, int size, int& id);
    Refusal setAliasedTo(int id, int target);
    Refusal setSize(int id, int size);
    Refusal setGround(int id, unsigned char byte);
    Refusal setStorageId(int id, int storageId);
    Refusal layOut(int id);
    void reset();

    /// What a layout would give: bytes, and nodes in depth-first order; 0 where it would fail.
    struct Extent {
        unsigned long size;
        long numDFS;
    };
    Extent extentOf(int id) const;

  private:
    struct Pass;

    Refusal startRegistration(const char* name, DataTypeSource source, int& existing, int& id) const;
    Refusal enter(ModelType type, int existing, int& id);
    Refusal memoise(int id);
    Pass passOver(int id) const;

    std::map<std::string, int> idsByName_;
};

} // namespace fuzz
