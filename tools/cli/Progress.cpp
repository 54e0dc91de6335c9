#include "tools/cli/Progress.h"

#include "tools/output/StandardOutput.h"

#include <algorithm>
#include <atomic>
#include <unistd.h>
#include <utility>

namespace lumenkey::tools {

namespace {

constexpr std::chrono::milliseconds kPatience{1'000};
constexpr std::chrono::milliseconds kBetweenDrawings{100};
constexpr int kBarWidth = 40;

/// Whether a bar has the line.
std::atomic<bool> isLineTaken = false;

bool takesLine(ProgressOf kind) {
    bool const isSeen = ::isatty(STDERR_FILENO) == 1;
    return isSeen && (kind == ProgressOf::Work || ::isatty(STDOUT_FILENO) != 1) &&
           !isLineTaken.exchange(true);
}

} // namespace

Progress::Progress(std::string what, ProgressOf kind)
    : _what(std::move(what)), _hasLine(takesLine(kind)), _nextDrawing(Clock::now() + kPatience) {}

Progress::~Progress() {
    if (_isShown) {
        writeFully(STDERR_FILENO, "\r\x1B[K");
    }
    if (_hasLine) {
        isLineTaken = false;
    }
}

std::function<void(double)> Progress::teller() {
    if (!_hasLine) {
        return {};
    }
    return [this](double share) { update(share); };
}

void Progress::update(double share) {
    if (!_hasLine || Clock::now() < _nextDrawing) {
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
