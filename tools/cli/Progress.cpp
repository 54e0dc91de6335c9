#include "tools/cli/Progress.h"

#include "tools/output/StandardOutput.h"

#include <algorithm>
#include <unistd.h>
#include <utility>

namespace lumenkey::tools {

namespace {

constexpr std::chrono::milliseconds kPatience{1'000};
constexpr std::chrono::milliseconds kBetweenDrawings{100};
constexpr int kBarWidth = 40;

} // namespace

Progress::Progress(std::string what, ProgressOf kind)
    : _what(std::move(what)),
      _isTerminal(::isatty(STDERR_FILENO) == 1 && (kind == ProgressOf::Work || ::isatty(STDOUT_FILENO) != 1)),
      _nextDrawing(Clock::now() + kPatience) {}

Progress::~Progress() {
    if (_isShown) {
        writeFully(STDERR_FILENO, "\r\x1B[K");
    }
}

void Progress::update(double share) {
    if (!_isTerminal || Clock::now() < _nextDrawing) {
        return;
    }
    _nextDrawing = Clock::now() + kBetweenDrawings;
    _isShown = true;
    auto const done = static_cast<std::size_t>(std::clamp(share, 0.0, 1.0) * kBarWidth);
    std::string const bar = std::string(done, '#') + std::string(kBarWidth - done, '.');
    std::string const percent = std::to_string(static_cast<int>(std::clamp(share, 0.0, 1.0) * 100));
    writeFully(STDERR_FILENO, "\r" + _what + " [" + bar + "] " + percent + "%\x1B[K");
}

} // namespace lumenkey::tools
