#pragma once

#include <cstddef>
#include <functional>
#include <string>
#include <string_view>

namespace lumenkey::tools {

/// The largest file that is read.
inline constexpr std::size_t kLargestInput = std::size_t{2} << 30;

/// Told the share of the work done, 0 .. 1, now and then.
using ReadingProgress = std::function<void(double)>;

/// All of a file; of what doesn't begin as a document does, up to a zero byte and what was read with it.
/// Throws `InputError` where it can't be read, and for one that is too large.
std::string readInputText(std::string const& file);

/// The text without a byte-order mark. Throws `InputError` for an empty one and for one with a zero byte;
/// `file` is only its name.
std::string_view checkedInputText(std::string_view text, std::string const& file);

} // namespace lumenkey::tools
