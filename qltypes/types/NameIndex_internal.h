// The map from type name to identifier: one hash of the text and, for names of up to 23 bytes, one cache line a lookup.
//
// Open addressing with linear probing; a slot keeps the name beside its hash. Lookups take a view and allocate nothing.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

namespace QLTypeSys {

class NameIndex {
  public:
    NameIndex() = default;
    NameIndex(const NameIndex&) = delete;
    NameIndex& operator=(const NameIndex&) = delete;
    ~NameIndex() { clear(); }

    /// The id entered under `name`, or `absent`.
    int find(std::string_view name, int absent) const;

    /// Enters `id` under `name` unless the name is there; an existing entry stays. Strong guarantee.
    void insert(std::string_view name, int id);

    /// Enters `id` under `name`, over an existing entry. Strong guarantee.
    void assign(std::string_view name, int id);

    /// Removes the entry of `name` if there is one.
    void erase(std::string_view name);

    void clear();

  private:
    static constexpr std::size_t inlineCapacity = 23;

    // 32 bytes. `bytes` holds the text itself or, of a longer one, where it stands on the heap; its last byte says
    // which.
    struct alignas(32) Slot {
        std::uint32_t hash;
        int id;
        char bytes[inlineCapacity];
        std::uint8_t kind; // isFree, 1 + length of the text, or isLong

        bool isUsed() const { return kind != isFree; }
        std::string_view name() const;
        void setName(std::string_view name);
        void releaseName();
    };
    static constexpr std::uint8_t isFree = 0;
    static constexpr std::uint8_t isLong = 255;
    static_assert(sizeof(Slot) == 32);

    static std::uint32_t hashOf(std::string_view name);
    Slot* findSlot(std::string_view name, std::uint32_t hash) const;
    void grow();
    void enter(std::string_view name, std::uint32_t hash, int id);

    std::vector<Slot> slots_; // a power of two of them, or none
    std::size_t used_ = 0;
};

} // namespace QLTypeSys
