// Reads the binary interface back: the slot of a virtual operation, the offset of a field.
#pragma once

#include <cstddef>
#include <cstring>
#include <vector>

#include <gtest/gtest.h>

namespace testsupport {

/// The slot of a virtual member: the first word of a pointer to one is its byte offset in the table, plus 1.
template <class Member> std::size_t slotOf(Member member) {
    std::size_t word;
    std::memcpy(&word, &member, sizeof word);
    EXPECT_EQ(word % sizeof(void*), 1u) << "not a virtual operation";
    return word / sizeof(void*);
}

/// The byte offset of a data member.
template <class Class, class T> std::size_t offsetOfMember(T Class::*member) {
    std::size_t offset;
    std::memcpy(&offset, &member, sizeof offset);
    return offset;
}

inline void expectAscending(const std::vector<std::size_t>& offsets) {
    for (std::size_t i = 1; i < offsets.size(); ++i)
        EXPECT_LT(offsets[i - 1], offsets[i]) << "field " << i;
}

} // namespace testsupport
