#include "tools/cli/Progress.h"

#include "tools/output/StandardOutput.h"

#include <algorithm>
#include <condition_variable>
#include <cstdlib>
#include <mutex>
#include <system_error>
#include <unistd.h>
#include <utility>

namespace lumenkey::tools {

namespace {

using std::chrono::milliseconds;

constexpr milliseconds kPatience{1'000};
constexpr milliseconds kBetweenDrawings{100};
constexpr int kCells = 40;
/// Of the mark that moves.
constexpr int kCellsOfMark = 8;

/// Whether a bar has the line.
std::atomic<bool> isLineTaken = false;

thread_local ProgressPart* partOfThread = nullptr;

bool takesLine(ProgressOf kind, ProgressScreen const& screen) {
    return partOfThread == nullptr && screen.isSeen && (kind == ProgressOf::Work || !screen.showsResults) &&
           !isLineTaken.exchange(true);
}

milliseconds patienceLeft(ProgressScreen const& screen) {
    auto const waited = std::chrono::duration_cast<milliseconds>(screen.now() - screen.begin);
    return std::max(kPatience - waited, kBetweenDrawings);
}

bool waitUnlessStopped(std::stop_token const& stop, milliseconds time) {
    std::mutex mutex;
    std::condition_variable_any nothing;
    std::unique_lock lock(mutex);
    nothing.wait_for(lock, stop, time, [] { return false; });
    return !stop.stop_requested();
}

} // namespace

ProgressScreen const& ProgressScreen::real() {
    static ProgressScreen const screen{::isatty(STDERR_FILENO) == 1,
                                       ::isatty(STDOUT_FILENO) == 1,
                                       Clock::now(),
                                       [] { return Clock::now(); },
                                       waitUnlessStopped,
                                       [](std::string_view text) { writeFully(STDERR_FILENO, text); }};
    return screen;
}

Progress::Progress(std::string what, ProgressOf kind, ProgressScreen const& screen)
    : _screen(screen), _what(std::move(what)), _part(partOfThread), _hasLine(takesLine(kind, screen)) {
    if (!_hasLine) {
        return;
    }
    try {
        _drawing = std::jthread([this](std::stop_token const& stop) { drawUntil(stop); });
    } catch (std::system_error const&) {
        // No thread is to be had: the work is done all the same.
    }
}

Progress::~Progress() {
    if (_part != nullptr) {
        _part->_done += (1 - _part->_done) / 2;
    }
    if (_hasLine) {
        _drawing = {};
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
    _share.store(share, std::memory_order_relaxed);
}

void Progress::drawUntil(std::stop_token const& stop) const {
    ProgressScreen::Clock::time_point const start = _screen.now();
    bool isShown = false;
    milliseconds pause = patienceLeft(_screen);
    for (int drawing = 0; _screen.wait(stop, pause); ++drawing) {
        pause = kBetweenDrawings;
        auto const seconds = std::chrono::duration_cast<std::chrono::seconds>(_screen.now() - start);
        _screen.write("\r" + _what + " " + cells(drawing) + " " + std::to_string(seconds.count()) +
                      " s\x1B[K");
        isShown = true;
    }
    if (isShown) {
        _screen.write("\r\x1B[K");
    }
}

/// `[####....] 50%`, or `[..####..]` as long as nobody knows.
std::string Progress::cells(int drawing) const {
    double const share = _share.load(std::memory_order_relaxed);
    std::string bar(kCells, '.');
    if (share >= 0) {
        std::fill_n(bar.begin(), static_cast<int>(share * kCells), '#');
        return "[" + bar + "] " + std::to_string(static_cast<int>(share * 100)) + "%,";
    }
    constexpr int way = kCells - kCellsOfMark;
    std::fill_n(bar.begin() + (way - std::abs(drawing % (2 * way) - way)), kCellsOfMark, '#');
    return "[" + bar + "]";
}

ProgressPart::ProgressPart(std::function<void(double)> whole)
    : _whole(std::move(whole)), _outer(std::exchange(partOfThread, this)) {}

ProgressPart::~ProgressPart() { partOfThread = _outer; }

} // namespace lumenkey::tools
