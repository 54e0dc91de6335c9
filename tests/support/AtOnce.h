#pragma once

#include <barrier>
#include <thread>
#include <vector>

/// Runs `work(0)` to `work(count - 1)`, each in a thread, all on one start signal; comes back when all are done.
template <class Work> void atOnce(int count, Work work) {
    std::barrier start(count);
    std::vector<std::thread> threads;
    for (int i = 0; i < count; ++i) {
        threads.emplace_back([&, i] {
            start.arrive_and_wait();
            work(i);
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
}
