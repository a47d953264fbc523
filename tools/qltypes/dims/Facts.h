// What a dims script stated of its dimensions, and which of it a refused statement contradicts.
#pragma once

#include <deque>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "dims/Script.h"
#include "qltypes/dimensions/QLSymbolicDimsConstraints.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

/// Who states a fact. The library knows blocks by their addresses only.
class QLBlock {
  public:
    std::string name;
};

namespace inspector {

/// A statement of a fact.
struct Fact {
    Verb verb = Verb::StateEqual;
    int first = 0;
    int second = 0; ///< not of a range
    int min = 0;    ///< of a range
    int max = 0;
    QLTypeSys::GenerateCodeFlags flags = QLTypeSys::generateBothBounds;
    const QLBlock* block = nullptr;
    ScriptPart statement;
};

/// Why a fact was refused.
struct Contradiction {
    std::string message;    ///< the library's
    std::string identifier; ///< "category:leaf"
    std::vector<ScriptPart>
        against; ///< earlier statements, in order, that refuse it together and of which none can be left out
};

class Facts {
  public:
    /// The table is not owned.
    explicit Facts(QLTypeSys::SymbolicDimsTable& table) : table_(table), known_(&table) {}

    /// Tells the library the fact; what it refuses changes nothing that is known.
    std::optional<Contradiction> state(const Fact& fact);

    const QLTypeSys::SymbolicDimsConstraints& known() const { return known_; }
    const std::vector<Fact>& stated() const { return stated_; }

    /// The block of that name, which is made when it is new.
    const QLBlock* block(const std::string& name);

  private:
    bool isRefused(const Fact& fact, const std::vector<const Fact*>& after) const;
    std::vector<ScriptPart> contradicted(const Fact& fact) const;

    QLTypeSys::SymbolicDimsTable& table_;
    QLTypeSys::SymbolicDimsConstraints known_;
    std::vector<Fact> stated_; // in order, refused ones too: a refused one may have linked some dimensions of a list
    std::map<std::string, QLBlock> blocks_;
};

} // namespace inspector
