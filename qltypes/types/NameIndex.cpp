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

} // namespace

std::uint32_t NameIndex::hashOf(std::string_view name) {
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
    return static_cast<std::uint32_t>(mixed(h, k2) >> 32);
}

std::string_view NameIndex::Slot::name() const {
    if (kind != isLong) return {bytes, kind - 1u};
    std::string_view text;
    std::memcpy(&text, bytes, sizeof text);
    return text;
}

void NameIndex::Slot::setName(std::string_view name) {
    if (name.size() <= inlineCapacity) {
        std::memcpy(bytes, name.data(), name.size());
        kind = static_cast<std::uint8_t>(1 + name.size());
        return;
    }
    char* const text = new char[name.size()];
    std::memcpy(text, name.data(), name.size());
    const std::string_view kept(text, name.size());
    std::memcpy(bytes, &kept, sizeof kept);
    kind = isLong;
}

void NameIndex::Slot::releaseName() {
    if (kind == isLong) delete[] name().data();
    kind = isFree;
}

NameIndex::Slot* NameIndex::findSlot(std::string_view name, std::uint32_t hash) const {
    if (slots_.empty()) return nullptr;
    const std::size_t mask = slots_.size() - 1;
    for (std::size_t i = hash & mask; slots_[i].isUsed(); i = (i + 1) & mask)
        if (slots_[i].hash == hash && slots_[i].name() == name) return const_cast<Slot*>(&slots_[i]);
    return nullptr;
}

int NameIndex::find(std::string_view name, int absent) const {
    const Slot* slot = findSlot(name, hashOf(name));
    return slot ? slot->id : absent;
}

void NameIndex::insert(std::string_view name, int id) {
    const std::uint32_t hash = hashOf(name);
    if (!findSlot(name, hash)) enter(name, hash, id);
}

void NameIndex::assign(std::string_view name, int id) {
    const std::uint32_t hash = hashOf(name);
    if (Slot* slot = findSlot(name, hash))
        slot->id = id;
    else
        enter(name, hash, id);
}

void NameIndex::enter(std::string_view name, std::uint32_t hash, int id) {
    if (used_ * 4 >= slots_.size() * 3) grow();
    Slot made{};
    made.hash = hash;
    made.id = id;
    made.setName(name);
    const std::size_t mask = slots_.size() - 1;
    std::size_t i = hash & mask;
    while (slots_[i].isUsed())
        i = (i + 1) & mask;
    slots_[i] = made;
    ++used_;
}

void NameIndex::grow() {
    std::vector<Slot> larger(slots_.empty() ? 32 : slots_.size() * 2);
    const std::size_t mask = larger.size() - 1;
    for (const Slot& slot : slots_) {
        if (!slot.isUsed()) continue;
        std::size_t i = slot.hash & mask;
        while (larger[i].isUsed())
            i = (i + 1) & mask;
        larger[i] = slot;
    }
    slots_.swap(larger);
}

void NameIndex::erase(std::string_view name) {
    Slot* found = findSlot(name, hashOf(name));
    if (!found) return;
    found->releaseName();
    --used_;
    // Close the gap: entries behind it move up unless they would leave their own run.
    const std::size_t mask = slots_.size() - 1;
    std::size_t gap = static_cast<std::size_t>(found - slots_.data());
    for (std::size_t i = (gap + 1) & mask; slots_[i].isUsed(); i = (i + 1) & mask) {
        const std::size_t home = slots_[i].hash & mask;
        if (((i - home) & mask) >= ((i - gap) & mask)) {
            slots_[gap] = slots_[i];
            gap = i;
        }
    }
    slots_[gap].kind = isFree;
}

void NameIndex::clear() {
    for (Slot& slot : slots_)
        slot.releaseName();
    slots_.clear();
    used_ = 0;
}

} // namespace QLTypeSys
