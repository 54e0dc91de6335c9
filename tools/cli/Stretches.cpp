#include "tools/cli/Stretches.h"

#include <algorithm>
#include <future>
#include <thread>
#include <vector>

namespace lumenkey::tools {

std::size_t stretchesFor(std::size_t count, std::size_t least) {
    constexpr std::size_t most = 8; // more gain little beside the file that all of it goes to
    std::size_t const processors = std::clamp<std::size_t>(std::thread::hardware_concurrency(), 1, most);
    return std::clamp<std::size_t>(count / std::max<std::size_t>(least, 1), 1, processors);
}

void forStretches(std::size_t count, std::size_t stretches,
                  std::function<void(std::size_t, std::size_t, std::size_t)> const& work) {
    auto const begin = [=](std::size_t i) { return count * i / stretches; };
    std::vector<std::future<void>> others;
    for (std::size_t i = 1; i < stretches; ++i) {
        others.push_back(
            std::async(std::launch::async, [&work, &begin, i] { work(i, begin(i), begin(i + 1)); }));
    }
    work(0, 0, begin(1));
    for (std::future<void>& other : others) {
        other.get();
    }
}

} // namespace lumenkey::tools
