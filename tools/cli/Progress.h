#pragma once

#include <atomic>
#include <chrono>
#include <functional>
#include <string>
#include <string_view>
#include <thread>

namespace lumenkey::tools {

enum class ProgressOf {
    Work,
    /// Of writing results to standard output: no bar is drawn into results that go to the terminal.
    Output,
};

/// Where bars are drawn, and the clock that they go by.
struct ProgressScreen {
    using Clock = std::chrono::steady_clock;

    bool isSeen = false;
    /// Results go there too.
    bool showsResults = false;
    /// When the first work began: bars wait for a second from then on only.
    Clock::time_point begin{};
    std::function<Clock::time_point()> now;
    /// For so long, or until a stop is asked for: whether it wasn't.
    std::function<bool(std::stop_token const&, std::chrono::milliseconds)> wait;
    std::function<void(std::string_view)> write;

    /// Standard error.
    static ProgressScreen const& real();
};

class ProgressPart;

/// A bar on standard error while work lasts over a second, that before it counted too, and a person sits at
/// the terminal; nothing otherwise, nor while another one lives: work that is a part of other work shows
/// nothing of its own. It is wiped away at the end.
///
/// A thread of its own draws it, so that it stands there whatever the work is busy with. Where nobody tells a
/// share, a mark moves to and fro.
class Progress {
public:
    explicit Progress(std::string what, ProgressOf kind = ProgressOf::Work,
                      ProgressScreen const& screen = ProgressScreen::real());
    ~Progress();
    Progress(Progress const&) = delete;
    Progress& operator=(Progress const&) = delete;

    /// The share of the work done, 0 .. 1. Cheap enough to be called in a loop, and from any thread.
    void update(double share);
    /// The same as a function, for as long as the bar lives; empty where nothing is ever drawn.
    std::function<void(double)> teller();

    /// Whether anything is ever drawn.
    bool hasLine() const { return _hasLine; }

private:
    void drawUntil(std::stop_token const& stop) const;
    std::string cells(int drawing) const;

    ProgressScreen const& _screen;
    std::string _what;
    /// Where this is a part of other work: who is told instead.
    ProgressPart* _part;
    bool _hasLine;
    /// Below 0 until one is told.
    std::atomic<double> _share = -1;
    std::jthread _drawing;
};

/// While it lives, the bars of this thread draw nothing and tell `whole` what share of the thread's work is
/// done: each takes the next half of what is left, since nobody knows how many there will be.
class ProgressPart {
public:
    explicit ProgressPart(std::function<void(double)> whole);
    ~ProgressPart();
    ProgressPart(ProgressPart const&) = delete;
    ProgressPart& operator=(ProgressPart const&) = delete;

private:
    friend class Progress;

    std::function<void(double)> _whole;
    /// What the bars before took.
    double _done = 0;
    ProgressPart* _outer;
};

} // namespace lumenkey::tools
