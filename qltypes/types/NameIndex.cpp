#include "qltypes/types/NameIndex_internal.h"

#include <cstring>

namespace QLTypeSys {

namespace {

__extension__ using Wide = unsigned __int128;

std::uint64_t mixed(std::uint64_t a, std::uint64_t b) {
    const auto product = static_cast<Wide>(a) * b;
    return static_cast<std::uint64_t>(product) ^ static_cast<std::uint64_t>(product >> 64);
}

template <class Word> std::uint64_t load(const char* p) {
    Word word;
    std::memcpy(&word, p, sizeof word);
    return word;
}

// Up to 8 bytes as one word that tells texts of one length apart.
std::uint64_t loadTail(const char* p, std::size_t n) {
    if (n >= 4) return load<std::uint32_t>(p) | load<std::uint32_t>(p + n - 4) << 32;
    if (n == 0) return 0;
    return load<std::uint8_t>(p) | load<std::uint8_t>(p + n / 2) << 8 | load<std::uint8_t>(p + n - 1) << 16;
}

int idOf(std::uint64_t head) { return static_cast<int>(static_cast<std::uint32_t>(head)); }
std::size_t lengthOf(std::uint64_t head) { return head >> 32; }
std::uint64_t headOf(int id, std::size_t length) { return static_cast<std::uint32_t>(id) | length << 32; }
std::size_t wordsOf(std::size_t length) { return 1 + (length + 7) / 8; }

} // namespace

std::size_t NameIndex::Hash::operator()(std::string_view name) const {
    // Digits of pi and e: odd numbers with no pattern.
    constexpr std::uint64_t k0 = 0x243f6a8885a308d3, k1 = 0x13198a2e03707345, k2 = 0xb7e151628aed2a6b;
    const char* p = name.data();
    std::size_t n = name.size();
    std::uint64_t h = k0 ^ n;
    for (; n > 16; p += 16, n -= 16)
        h = mixed(load<std::uint64_t>(p) ^ k1, load<std::uint64_t>(p + 8) ^ h);
    if (n > 8)
        h = mixed(load<std::uint64_t>(p) ^ k1, load<std::uint64_t>(p + n - 8) ^ h);
    else
        h = mixed(loadTail(p, n) ^ k1, h);
    return mixed(h, k2);
}

std::size_t NameIndex::Hash::operator()(Place place) const { return operator()(nameAt(*pool, place)); }

bool NameIndex::Equal::operator()(std::string_view name, Place place) const {
    const std::uint64_t* entry = pool->data() + place;
    if (lengthOf(*entry) != name.size()) return false;
    const char* p = name.data();
    std::size_t n = name.size();
    for (; n >= 8; p += 8, n -= 8)
        if (load<std::uint64_t>(p) != *++entry) return false;
    std::uint64_t rest = 0;
    std::memcpy(&rest, p, n);
    return n == 0 || rest == *++entry;
}

std::string_view NameIndex::nameAt(const Pool& pool, Place place) {
    return {reinterpret_cast<const char*>(pool.data() + place + 1), lengthOf(pool[place])};
}

NameIndex::NameIndex() : places_(0, Hash{&pool_}, Equal{&pool_}) {}

int NameIndex::find(std::string_view name, int absent) const {
    const auto found = places_.find(name);
    return found != places_.end() ? idOf(pool_[*found]) : absent;
}

void NameIndex::assign(std::string_view name, int id) {
    const auto found = places_.find(name);
    if (found != places_.end())
        pool_[*found] = headOf(id, name.size());
    else
        insert(name, id);
}

// One search: the entry goes to the end of the pool and leaves again when its name has a place already.
void NameIndex::insert(std::string_view name, int id) {
    const std::size_t place = pool_.size();
    pool_.resize(place + wordsOf(name.size()));
    pool_[place] = headOf(id, name.size());
    std::memcpy(pool_.data() + place + 1, name.data(), name.size());
    try {
        if (!places_.insert(static_cast<Place>(place)).second) pool_.resize(place);
    } catch (...) {
        pool_.resize(place);
        throw;
    }
}

void NameIndex::erase(std::string_view name) {
    const auto found = places_.find(name);
    if (found == places_.end()) return;
    wasted_ += wordsOf(name.size());
    places_.erase(found);
    if (wasted_ > 4096 && wasted_ * 2 > pool_.size()) closeHoles();
}

// Moves the entries of the pool together. Without memory for that the holes stay.
void NameIndex::closeHoles() {
    try {
        Pool pool;
        pool.reserve(pool_.size() - wasted_);
        boost::unordered_flat_set<Place, Hash, Equal> places(places_.size(), Hash{&pool}, Equal{&pool});
        for (const Place old : places_) {
            const auto entry = pool_.begin() + old;
            pool.insert(pool.end(), entry, entry + static_cast<std::ptrdiff_t>(wordsOf(lengthOf(*entry))));
            places.insert(static_cast<Place>(pool.size() - wordsOf(lengthOf(*entry))));
        }
        pool_.swap(pool);
        places_.clear();
        for (const Place place : places)
            places_.insert(place);
        wasted_ = 0;
    } catch (const std::bad_alloc&) {
    }
}

void NameIndex::clear() {
    places_.clear();
    pool_.clear();
    wasted_ = 0;
}

} // namespace QLTypeSys
