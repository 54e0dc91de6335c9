// Where a virtual operation stands in its class's table, as a subclass in a host compiles it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

#include <gtest/gtest.h>

// The Itanium C++ ABI writes a pointer to a virtual member as its offset in the table, plus one; ARM puts the one
// elsewhere.
#if defined(__GNUC__) && defined(__x86_64__)
#define LUMENKEY_KNOWS_SLOTS

template <class Member> std::size_t slotOf(Member member) {
    std::uintptr_t offset = 0;
    static_assert(sizeof member >= sizeof offset);
    std::memcpy(&offset, &member, sizeof offset);
    return (offset - 1) / sizeof(void*);
}

/// Expects the members to stand in this order, behind the two slots of the destructor.
template <class... Members> void expectSlots(Members... members) {
    std::size_t expected = 2;
    for (std::size_t const slot : {slotOf(members)...}) {
        EXPECT_EQ(slot, expected);
        ++expected;
    }
}
#endif
