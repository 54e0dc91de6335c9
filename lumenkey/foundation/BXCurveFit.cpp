#include "lumenkey/foundation/BXCurveFit.h"

#include <algorithm>
#include <cmath>
#include <cstddef>

namespace {

using Point = BXVector2<double>;

/// Improvements of the parameters tried on a piece before it is cut (Schneider's number).
constexpr int kImprovementLimit = 4;
/// A piece farther off than this many tolerances is cut at once: improving it seldom helps (Schneider's
/// number).
constexpr double kHopelessFactor = 4.0;
/// Ordered points: the part of a piece's x range that a handle may take. Below 1, x keeps rising along the
/// piece by a good measure, and the y at a given x is well defined.
constexpr double kLongestHandle = 0.95;
/// Cuts at the worst point may shave off one point at a time; below this depth they halve.
constexpr int kWorstPointDepth = 32;
/// Stretches of more points than the second are first looked at through the first number of their points: far
/// too long ones, as most are at the beginning of a long row, so cost little. Tuned.
constexpr std::size_t kProbePoints = 64;
constexpr std::size_t kLongestUnprobed = 256;
/// A least-squares handle below this part of the chord is degenerate (Schneider's number).
constexpr double kShortestHandle = 1e-6;

struct Cubic {
    Point p[4];

    Point at(double t) const noexcept {
        double const s = 1.0 - t;
        return p[0] * (s * s * s) + p[1] * (3.0 * s * s * t) + p[2] * (3.0 * s * t * t) + p[3] * (t * t * t);
    }
    Point firstDerivative(double t) const noexcept {
        double const s = 1.0 - t;
        return ((p[1] - p[0]) * (s * s) + (p[2] - p[1]) * (2.0 * s * t) + (p[3] - p[2]) * (t * t)) * 3.0;
    }
    Point secondDerivative(double t) const noexcept {
        return ((p[2] - p[1] * 2.0 + p[0]) * (1.0 - t) + (p[3] - p[2] * 2.0 + p[1]) * t) * 6.0;
    }
};

/// The points first .. last, with the directions in which the curve leaves the one and the other.
struct Stretch {
    std::size_t first;
    std::size_t last;
    Point leaving;
    Point entering;
    int depth;
};

struct Deviation {
    double distance = 0.0;
    std::size_t index = 0;
};

Point direction(Point const& from, Point const& to) noexcept {
    Point const way = to - from;
    double const length = way.length();
    return length > 0.0 && std::isfinite(length) ? way / length : Point{};
}

class Fitter {
public:
    Fitter(std::vector<Point> const& points, double tolerance, bool ordered)
        : _points(points), _tolerance(tolerance), _ordered(ordered), _parameters(points.size()) {}

    void run(std::vector<Point>& result) {
        std::size_t const last = _points.size() - 1;
        result.push_back(_points[0]);
        _pending.push_back(
            {0, last, direction(_points[0], _points[1]), direction(_points[last], _points[last - 1]), 0});
        while (!_pending.empty()) {
            Stretch const stretch = _pending.back();
            _pending.pop_back();
            std::size_t cutAt = 0;
            Cubic piece;
            if (!isHopeless(stretch, cutAt) && fit(stretch, piece, cutAt)) {
                result.insert(result.end(), piece.p + 1, piece.p + 4);
            } else {
                cut(stretch, cutAt);
            }
        }
    }

private:
    std::size_t cutOf(Stretch const& s, std::size_t worst) const noexcept {
        return s.depth < kWorstPointDepth ? worst : s.first + (s.last - s.first) / 2;
    }

    /// Whether a long stretch is so far from its piece, by a few of its points, that it must be cut at
    /// `cutAt`.
    bool isHopeless(Stretch const& s, std::size_t& cutAt) const {
        std::size_t const length = s.last - s.first;
        if (length <= kLongestUnprobed) {
            return false;
        }
        auto const indexOf = [&](std::size_t probe) { return s.first + length * probe / kProbePoints; };
        std::vector<Point> points;
        points.reserve(kProbePoints + 1);
        for (std::size_t i = 0; i <= kProbePoints; ++i) {
            points.push_back(_points[indexOf(i)]);
        }
        Fitter probe(points, _tolerance, _ordered);
        Stretch const whole{0, kProbePoints, s.leaving, s.entering, 0};
        probe.placeParameters(whole);
        Deviation const worst = probe.measure(whole, probe.leastSquares(whole));
        cutAt = cutOf(s, indexOf(worst.index));
        return !(worst.distance <= kHopelessFactor * _tolerance);
    }

    /// False if the stretch must be cut at `cutAt`, a point between its ends.
    bool fit(Stretch const& s, Cubic& piece, std::size_t& cutAt) {
        if (s.last - s.first == 1) {
            piece = withHandles(s, -1.0, -1.0);
            return true;
        }
        placeParameters(s);
        Deviation worst;
        for (int improvements = 0;; ++improvements) {
            piece = leastSquares(s);
            worst = measure(s, piece);
            if (worst.distance <= _tolerance) {
                return true;
            }
            if (improvements == kImprovementLimit || !(worst.distance <= kHopelessFactor * _tolerance)) {
                break;
            }
            improveParameters(s, piece);
        }
        cutAt = cutOf(s, worst.index);
        return false;
    }

    void cut(Stretch const& s, std::size_t at) {
        Point forward = direction(_points[at - 1], _points[at + 1]);
        if (forward == Point{}) {
            forward = direction(_points[at - 1], _points[at]);
        }
        _pending.push_back({at, s.last, forward, s.entering, s.depth + 1});
        _pending.push_back({s.first, at, s.leaving, -forward, s.depth + 1});
    }

    /// Relative positions along the chords, or along x for ordered points.
    void placeParameters(Stretch const& s) {
        double travelled = 0.0;
        for (std::size_t i = s.first; i < s.last; ++i) {
            _parameters[i] = travelled;
            travelled += (_points[i + 1] - _points[i]).length();
        }
        _parameters[s.last] = travelled;
        _wayAlongPoints = travelled;
        double const start = _ordered ? _points[s.first].x : 0.0;
        double const length = _ordered ? _points[s.last].x - start : travelled;
        bool const usable = length > 0.0 && std::isfinite(length);
        for (std::size_t i = s.first; i <= s.last; ++i) {
            double const place = _ordered ? _points[i].x - start : _parameters[i];
            _parameters[i] = usable
                                 ? place / length
                                 : static_cast<double>(i - s.first) / static_cast<double>(s.last - s.first);
        }
    }

    /// The handle lengths that leave the least sum of squared distances at the present parameters.
    Cubic leastSquares(Stretch const& s) const noexcept {
        Point const& from = _points[s.first];
        Point const& to = _points[s.last];
        double c00 = 0.0, c01 = 0.0, c11 = 0.0, x0 = 0.0, x1 = 0.0;
        for (std::size_t i = s.first; i <= s.last; ++i) {
            double const t = _parameters[i];
            double const u = 1.0 - t;
            Point const leaving = s.leaving * (3.0 * u * u * t);
            Point const entering = s.entering * (3.0 * u * t * t);
            Point const rest = _points[i] - from * (u * u * (u + 3.0 * t)) - to * (t * t * (t + 3.0 * u));
            c00 += leaving.dot(leaving);
            c01 += leaving.dot(entering);
            c11 += entering.dot(entering);
            x0 += leaving.dot(rest);
            x1 += entering.dot(rest);
        }
        double const determinant = c00 * c11 - c01 * c01;
        if (!(std::fabs(determinant) > 1e-12 * c00 * c11)) {
            return withHandles(s, -1.0, -1.0);
        }
        return withHandles(s, (x0 * c11 - x1 * c01) / determinant, (c00 * x1 - c01 * x0) / determinant);
    }

    /// The piece with handles of these lengths; if one of them is degenerate both take a third of the chord.
    /// So is a handle longer than the way along the points: least squares of few points may send the curve
    /// far out and back between two of them.
    Cubic withHandles(Stretch const& s, double leaving, double entering) const noexcept {
        Point const& from = _points[s.first];
        Point const& to = _points[s.last];
        double const chord = (to - from).length();
        auto const isSound = [&](double length) {
            return length >= kShortestHandle * chord && length <= _wayAlongPoints;
        };
        if (!isSound(leaving) || !isSound(entering)) {
            leaving = entering = chord / 3.0;
        }
        if (_ordered) {
            double const longest = kLongestHandle * (to.x - from.x);
            leaving = leaving * s.leaving.x > longest ? longest / s.leaving.x : leaving;
            entering = entering * -s.entering.x > longest ? longest / -s.entering.x : entering;
        }
        Cubic piece{{from, from + s.leaving * leaving, to + s.entering * entering, to}};
        if (_ordered) {
            piece.p[1].x = std::clamp(piece.p[1].x, from.x, to.x);
            piece.p[2].x = std::clamp(piece.p[2].x, from.x, to.x);
        }
        return piece;
    }

    /// How far the piece misses the points between its ends. Ordered points first get the parameters of their
    /// x.
    Deviation measure(Stretch const& s, Cubic const& piece) noexcept {
        Deviation worst{0.0, s.first + (s.last - s.first) / 2};
        // From the piece's own start: far along x, rounding would keep the search from coming to an end.
        double const start = piece.p[0].x;
        Cubic fromStart = piece;
        for (Point& point : fromStart.p) {
            point.x -= start;
        }
        for (std::size_t i = s.first + 1; i < s.last; ++i) {
            if (_ordered) {
                _parameters[i] = parameterOfX(fromStart, _points[i].x - start, _parameters[i]);
            }
            Point const miss = piece.at(_parameters[i]) - _points[i];
            double const distance = _ordered ? std::fabs(miss.y) : miss.length();
            if (!(distance <= worst.distance)) {
                worst = {distance, i};
            }
        }
        return worst;
    }

    /// One step of Newton-Raphson toward the nearest place of the piece. Ordered points have their places
    /// already.
    void improveParameters(Stretch const& s, Cubic const& piece) noexcept {
        if (_ordered) {
            return;
        }
        for (std::size_t i = s.first + 1; i < s.last; ++i) {
            double const t = _parameters[i];
            Point const miss = piece.at(t) - _points[i];
            Point const d1 = piece.firstDerivative(t);
            double const improved = t - miss.dot(d1) / (d1.dot(d1) + miss.dot(piece.secondDerivative(t)));
            if (std::isfinite(improved)) {
                _parameters[i] = std::clamp(improved, 0.0, 1.0);
            }
        }
    }

    /// Where the piece, whose x rises from 0 on, has this x: Newton's steps, kept inside a shrinking bracket.
    static double parameterOfX(Cubic const& piece, double x, double guess) noexcept {
        constexpr int stepLimit = 60;
        double low = 0.0;
        double high = 1.0;
        double t = guess;
        for (int step = 0; step < stepLimit; ++step) {
            double const miss = piece.at(t).x - x;
            if (std::fabs(miss) <= 0x1p-53 * piece.p[3].x) {
                break;
            }
            (miss < 0.0 ? low : high) = t;
            double next = t - miss / piece.firstDerivative(t).x;
            if (!(next > low && next < high)) {
                next = 0.5 * (low + high);
            }
            if (std::fabs(next - t) <= 0x1p-52) {
                break;
            }
            t = next;
        }
        return t;
    }

    std::vector<Point> const& _points;
    double const _tolerance;
    bool const _ordered;             // x strictly ascending
    std::vector<double> _parameters; // of each point within the piece at work
    double _wayAlongPoints = 0.0;    // the length of the chords of the piece at work
    std::vector<Stretch> _pending;   // rightmost first
};

} // namespace

BXCurveFit::BXCurveFit() noexcept : BXSingleton(0) {}
BXCurveFit::~BXCurveFit() = default;

BXCurveFit& BXCurveFit::getInstance() { return BXSingletonInstance<BXCurveFit>(); }

void BXCurveFit::FitCurve(std::vector<BXVector2<double>> const& points,
                          std::vector<BXVector2<double>>& result, double tolerance) const {
    auto const isFinite = [](Point const& p) { return std::isfinite(p.x) && std::isfinite(p.y); };
    if (&points == &result || !std::all_of(points.begin(), points.end(), isFinite)) {
        std::vector<Point> usable;
        std::copy_if(points.begin(), points.end(), std::back_inserter(usable), isFinite);
        FitCurve(usable, result, tolerance);
        return;
    }
    result.clear();
    if (points.size() < 2) {
        result = points;
        return;
    }
    auto const isNotAscending = [](Point const& a, Point const& b) { return !(a.x < b.x); };
    bool const ordered = std::adjacent_find(points.begin(), points.end(), isNotAscending) == points.end();
    Fitter(points, tolerance > 0.0 ? tolerance : 0.0, ordered).run(result);
}
