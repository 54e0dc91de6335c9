#pragma once

#include <cstddef>
#include <functional>

namespace lumenkey::tools {

/// How many stretches `count` pieces of work are worth: one for each processor, but none shorter than
/// `least`.
std::size_t stretchesFor(std::size_t count, std::size_t least);

/// Calls `work(i, begin, end)` for each of so many even stretches of `0 .. count`, side by side on threads of
/// their own, and waits for all. What one of them throws is thrown again here.
void forStretches(std::size_t count, std::size_t stretches,
                  std::function<void(std::size_t, std::size_t, std::size_t)> const& work);

} // namespace lumenkey::tools
