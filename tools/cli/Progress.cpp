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

thread_local ProgressPart* partOfThread = nullptr;

bool takesLine(ProgressOf kind, ProgressScreen const& screen) {
    return partOfThread == nullptr && screen.isSeen && (kind == ProgressOf::Work || !screen.showsResults) &&
           !isLineTaken.exchange(true);
}

} // namespace

ProgressScreen const& ProgressScreen::real() {
    static ProgressScreen const screen{::isatty(STDERR_FILENO) == 1, ::isatty(STDOUT_FILENO) == 1,
                                       [] { return Clock::now(); },
                                       [](std::string_view text) { writeFully(STDERR_FILENO, text); }};
    return screen;
}

Progress::Progress(std::string what, ProgressOf kind, ProgressScreen const& screen)
    : _screen(screen), _what(std::move(what)), _part(partOfThread), _hasLine(takesLine(kind, screen)) {
    if (_hasLine) {
        _nextDrawing = _screen.now() + kPatience;
    }
}

Progress::~Progress() {
    if (_part != nullptr) {
        _part->_done += (1 - _part->_done) / 2;
    }
    if (_isShown) {
        _screen.write("\r\x1B[K");
    }
    if (_hasLine) {
        isLineTaken = false;
    }
}

std::function<void(double)> Progress::teller() {
    if (!_hasLine && _part == nullptr) {
        return {};
    }
    return [this](double share) { update(share); };
}

void Progress::update(double share) {
    share = share > 0 ? std::min(share, 1.0) : 0; // 0 for what is no number
    if (_part != nullptr) {
        _part->_whole(_part->_done + (1 - _part->_done) / 2 * share);
        return;
    }
    if (!isDue()) {
        return;
    }
    _nextDrawing = _screen.now() + kBetweenDrawings;
    _isShown = true;
    auto const done = static_cast<std::size_t>(share * kBarWidth);
    std::string const bar = std::string(done, '#') + std::string(kBarWidth - done, '.');
    std::string const percent = std::to_string(static_cast<int>(share * 100));
    _screen.write("\r" + _what + " [" + bar + "] " + percent + "%\x1B[K");
}

ProgressPart::ProgressPart(std::function<void(double)> whole)
    : _whole(std::move(whole)), _outer(std::exchange(partOfThread, this)) {}

ProgressPart::~ProgressPart() { partOfThread = _outer; }

} // namespace lumenkey::tools
