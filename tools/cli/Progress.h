#pragma once

#include <chrono>
#include <functional>
#include <string>

namespace lumenkey::tools {

enum class ProgressOf {
    Work,
    /// Of writing results to standard output: no bar is drawn into results that go to the terminal.
    Output,
};

/// A bar on standard error while work lasts over a second and a person sits at the terminal; nothing
/// otherwise, nor while another one lives: work that is a part of other work shows nothing of its own. It is
/// wiped away at the end.
class Progress {
public:
    explicit Progress(std::string what, ProgressOf kind = ProgressOf::Work);
    ~Progress();
    Progress(Progress const&) = delete;
    Progress& operator=(Progress const&) = delete;

    /// The share of the work done, 0 .. 1. Cheap enough to be called in a loop.
    void update(double share);
    /// The same as a function, for as long as the bar lives; empty where nothing is ever drawn.
    std::function<void(double)> teller();

private:
    using Clock = std::chrono::steady_clock;

    std::string _what;
    bool _hasLine;
    bool _isShown = false;
    Clock::time_point _nextDrawing;
};

} // namespace lumenkey::tools
