#include "lumenkey/foundation/BXSingleton.h"

#include <atomic>
#include <cstdlib>
#include <iostream>
#include <vector>

#include <gtest/gtest.h>

#include "tests/support/AtOnce.h"

namespace {

template <char Name, int Rank> class Reporting : public BXSingleton {
public:
    Reporting() : BXSingleton(Rank) {}
    ~Reporting() override { std::cerr << Name; }
};

/// Makes another singleton while it is destroyed, and one more of a lower rank.
class Late : public BXSingleton {
public:
    Late() : BXSingleton(1) {}
    ~Late() override {
        std::cerr << 'L';
        BXSingletonInstance<Reporting<'y', -9>>();
        BXSingletonInstance<Reporting<'x', 9>>();
    }
};

class Counted : public BXSingleton {
public:
    Counted() : BXSingleton(0) { ++made; }
    static inline std::atomic<int> made = 0;
};

[[noreturn]] void makeSeveralAndExit() {
    BXSingletonInstance<Reporting<'a', 0>>();
    BXSingletonInstance<Reporting<'b', 5>>();
    BXSingletonInstance<Late>();
    BXSingletonInstance<Reporting<'c', 5>>();
    BXSingletonInstance<Reporting<'d', -2>>();
    BXSingletonInstance<Reporting<'b', 5>>();
    std::exit(0);
}

} // namespace

TEST(BXSingletonDeathTest, TearsDownByRank) {
    EXPECT_EXIT(makeSeveralAndExit(), ::testing::ExitedWithCode(0), "^daLycbx$");
}

TEST(BXSingleton, ThreadsShareOneInstance) {
    std::vector<BXSingleton*> seen(4);
    atOnce(4, [&seen](int i) { seen[static_cast<std::size_t>(i)] = &BXSingletonInstance<Counted>(); });
    EXPECT_EQ(Counted::made, 1);
    EXPECT_EQ(seen, std::vector<BXSingleton*>(4, &BXSingletonInstance<Counted>()));
}
