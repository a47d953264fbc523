// The map from type name to identifier.
//
// A flat hash set of 4-byte places, small enough for the nearest caches, over a pool in which the names stand one
// behind the other, each behind its id and length: one hash and one far cache line a lookup. Lookups allocate nothing.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

#include <boost/unordered/unordered_flat_set.hpp>

namespace QLTypeSys {

class NameIndex {
  public:
    NameIndex();
    NameIndex(const NameIndex&) = delete;
    NameIndex& operator=(const NameIndex&) = delete;

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
    // An entry is a head word, id below and length above, then the name with zeros up to a full word. Its place is the
    // index of its head.
    using Place = std::uint32_t;
    using Pool = std::vector<std::uint64_t>;

    struct Hash {
        using is_transparent = void;
        using is_avalanching = void;
        std::size_t operator()(std::string_view name) const;
        std::size_t operator()(Place place) const;
        const Pool* pool;
    };
    struct Equal {
        using is_transparent = void;
        bool operator()(std::string_view name, Place place) const;
        bool operator()(Place place, std::string_view name) const { return operator()(name, place); }
        bool operator()(Place a, Place b) const { return operator()(nameAt(*pool, a), b); }
        const Pool* pool;
    };

    static std::string_view nameAt(const Pool& pool, Place place);
    void closeHoles();

    Pool pool_;
    boost::unordered_flat_set<Place, Hash, Equal> places_;
    std::size_t wasted_ = 0; // words of the pool that erased entries left behind
};

} // namespace QLTypeSys
