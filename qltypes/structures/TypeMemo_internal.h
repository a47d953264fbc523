// What a pass over many elements needs of their types, worked out once for each of the few types that they have.
#pragma once

#include <array>
#include <optional>

namespace QLTypeSys::structures {

/// Facts by type id, while no type changes. `Facts` is made from a table and an id.
template <class Facts, class Table> class TypeMemo {
  public:
    explicit TypeMemo(Table table) : table_(table) {}

    const Facts& of(int typeId) {
        Slot& slot = slots_[static_cast<unsigned>(typeId) % slots_.size()];
        if (!slot.facts || slot.typeId != typeId) {
            slot.facts.reset();
            slot.facts.emplace(table_, typeId);
            slot.typeId = typeId;
        }
        return *slot.facts;
    }

  private:
    struct Slot {
        int typeId;
        std::optional<Facts> facts;
    };

    Table table_;
    std::array<Slot, 16> slots_;
};

} // namespace QLTypeSys::structures
