#include "lumenkey/foundation/BXLocks.h"

#include <mutex>
#include <thread>

#include <gtest/gtest.h>

#include "tests/support/AtOnce.h"

TEST(BXSpinLock, ThreadsExcludeEachOther) {
    BXSpinLock lock;
    constexpr int turns = 100000;
    // A plain variable: the thread sanitizer must see the lock as what orders them.
    long count = 0;
    atOnce(4, [&](int thread) {
        for (int i = 0; i < turns; ++i) {
            if (thread == 0) {
                while (!lock.tryLock()) {
                    std::this_thread::yield();
                }
                ++count;
                lock.unlock();
            } else {
                BXLockSentry const sentry(lock);
                ++count;
            }
        }
    });
    EXPECT_EQ(count, 4L * turns);
}

TEST(BXSpinLock, SentriesHoldForAScope) {
    BXSpinLock lock;
    {
        BXLockSentry sentry(&lock);
        EXPECT_FALSE(lock.tryLock());
        sentry.release();
        EXPECT_TRUE(lock.tryLock());
        sentry.release();
        EXPECT_FALSE(lock.tryLock()) << "a second release leaves the lock alone";
        lock.unlock();
    }
    {
        BXLockSentry<BXSpinLock> const nothing(nullptr);
        std::lock_guard const guard(lock);
        EXPECT_FALSE(lock.try_lock());
    }
    EXPECT_TRUE(lock.tryLock());
    lock.unlock();
}
