#include "tools/plot/CurvePicture.h"

#include "tools/plot/PlotStyle.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <vector>

namespace lumenkey::tools {

namespace {

constexpr double kSamplesPerPixel = 2;

/// Pixels between two keypoints above which discs don't touch.
constexpr double kRoomForDisc = 8;
/// The same for dots. Those closer than `kBetweenDots` to the last one drawn, along the curve, are left out.
constexpr double kRoomForSmallMark = 0.5;
constexpr double kBetweenDots = 3;

PlotRange extremesOf(std::vector<PlotPoint> const& points, PlotRange range) {
    for (PlotPoint const& point : points) {
        if (!std::isnan(point.y)) {
            range.low = std::min(range.low, point.y);
            range.high = std::max(range.high, point.y);
        }
    }
    return range;
}

std::vector<PlotPoint> pointsOf(std::vector<Tempus> const& times, std::vector<double> const& values) {
    std::vector<PlotPoint> points;
    points.reserve(times.size());
    for (std::size_t i = 0; i < times.size(); ++i) {
        points.push_back({TempusGetSeconds(times[i]), values[i]});
    }
    return points;
}

/// Adds what stays of the points `first` .. `last` of one column.
void keepOutline(std::vector<PlotPoint> const& points, std::size_t first, std::size_t last,
                 std::vector<PlotPoint>& kept) {
    auto const begin = points.begin() + static_cast<std::ptrdiff_t>(first);
    auto const end = points.begin() + static_cast<std::ptrdiff_t>(last) + 1;
    auto const [low, high] =
        std::minmax_element(begin, end, [](PlotPoint const& a, PlotPoint const& b) { return a.y < b.y; });
    auto places = {begin, std::min(low, high), std::max(low, high), end - 1};
    auto previous = points.end();
    for (auto const place : places) {
        if (place != previous) {
            kept.push_back(*place);
        }
        previous = place;
    }
}

std::vector<PlotPoint> thinned(std::vector<PlotPoint> const& points, double columnWidth) {
    std::vector<PlotPoint> kept;
    for (std::size_t first = 0; first < points.size();) {
        std::size_t last = first;
        while (last + 1 < points.size() && points[last + 1].x - points[first].x < columnWidth) {
            ++last;
        }
        keepOutline(points, first, last, kept);
        first = last + 1;
    }
    return kept;
}

bool isOneFunction(KFSpline& spline) {
    std::uint32_t type = 0;
    spline.getInterpolation(&type, nullptr, nullptr);
    return spline.getState()->parametric && !spline.getInterpolator(type)->useKeypoints();
}

/// From the first to the last keypoint.
std::vector<PlotPoint> traceFunction(KFSpline& spline, double first, double last, std::uint32_t samples) {
    Tempus const low = spline.getMinValueU(kTempusZero, true);
    Tempus const span = spline.getMaxValueU(kTempusZero, true) - low;
    std::vector<PlotPoint> points;
    for (std::uint32_t i = 0; i <= samples; ++i) {
        double const value = spline.getVertexValue(low + span * i / samples, kTempusZero, true);
        points.push_back({first + (last - first) * i / samples, value});
    }
    return points;
}

/// All keypoints, without the handles that lead out of the curve.
std::vector<Keypoint> readKeypoints(KFSpline& spline) {
    std::vector<Keypoint> keypoints;
    for (void* const handle : keypointHandles(spline)) {
        keypoints.push_back(readKeypoint(spline, handle));
    }
    if (!keypoints.empty() && !spline.isClosed()) {
        keypoints.front().in = {};
        keypoints.back().out = {};
    }
    return keypoints;
}

constexpr PlotPoint kBreak{std::numeric_limits<double>::quiet_NaN(),
                           std::numeric_limits<double>::quiet_NaN()};

/// What shapes the curve: handles, or the lines between control points.
void drawControls(PlotCanvas& canvas, PlotFrame const& frame, CurvePicture const& curve) {
    std::vector<PlotPoint> places;
    std::vector<PlotPoint> handles;
    std::vector<PlotPoint> ends;
    for (Keypoint const& key : curve.keypoints) {
        double const seconds = TempusGetSeconds(key.time);
        places.push_back(frame.at(seconds, key.value));
        for (KeypointHandle const& handle : {key.in, key.out}) {
            if (key.usesHandles && !handle.isFlat()) {
                ends.push_back(frame.at(seconds + handle.seconds, key.value + handle.value));
                handles.insert(handles.end(), {places.back(), ends.back(), kBreak});
            }
        }
    }
    PlotStroke const stroke{style::kHandle, 1, {}};
    canvas.polyline(handles, stroke);
    canvas.squares(ends, 2, style::kPaper, stroke);
    if (curve.isOneFunction) {
        canvas.polyline(places, {style::kHandle, 0.8, {2, 2}});
    }
}

void drawSmallMarks(PlotCanvas& canvas, PlotFrame const& frame, CurvePicture const& curve,
                    PlotStroke const& stroke) {
    std::vector<PlotPoint> drawn;
    PlotPoint last{-std::numeric_limits<double>::infinity(), 0};
    for (Keypoint const& key : curve.keypoints) {
        PlotPoint const place = frame.at(TempusGetSeconds(key.time), key.value);
        if (std::hypot(place.x - last.x, place.y - last.y) >= kBetweenDots) {
            drawn.push_back(place);
            last = place;
        }
    }
    canvas.dots(drawn, 1.1, stroke.colour, {stroke.colour, 0.5, {}});
}

} // namespace

PlotRange CurvePicture::valueRange() const {
    double const infinity = std::numeric_limits<double>::infinity();
    PlotRange range{infinity, -infinity};
    for (auto const* points : {&before, &inside, &after}) {
        range = extremesOf(*points, range);
    }
    for (Keypoint const& key : keypoints) {
        double const in = key.usesHandles ? key.in.value : 0;
        double const out = key.usesHandles ? key.out.value : 0;
        range = extremesOf({{0, key.value}, {0, key.value + in}, {0, key.value + out}}, range);
    }
    return range.low > range.high ? PlotRange::sound(0, 0) : PlotRange::sound(range.low, range.high);
}

CurvePicture traceCurve(KFSpline& spline, Tempus const& from, Tempus const& to, double pixels) {
    auto const samples = static_cast<std::uint32_t>(std::max(pixels * kSamplesPerPixel, 1.0));
    CurvePicture picture;
    picture.keypoints = readKeypoints(spline);
    picture.isOneFunction = !picture.keypoints.empty() && isOneFunction(spline);
    if (picture.isOneFunction) {
        picture.inside = traceFunction(spline, TempusGetSeconds(picture.keypoints.front().time),
                                       TempusGetSeconds(picture.keypoints.back().time), samples);
        return picture;
    }
    Tempus const step = (to - from) / samples;
    auto const trace = [&](Tempus const& start, Tempus const& end) {
        std::vector<Tempus> times;
        std::vector<double> values;
        if (start < end) {
            spline.sampleSplineSegments(start, end, step, &times, &values);
        }
        return thinned(pointsOf(times, values), TempusGetSeconds(step));
    };
    if (picture.keypoints.empty()) {
        picture.before = trace(from, to);
        return picture;
    }
    Tempus const first = spline.getMinValueU(kTempusZero, true);
    Tempus const last = spline.getMaxValueU(kTempusZero, true);
    picture.before = trace(from, TempusMinimum(first, to));
    picture.inside = trace(TempusMaximum(first, from), TempusMinimum(last, to));
    picture.after = trace(TempusMaximum(last, from), to);
    std::erase_if(picture.keypoints, [&](Keypoint const& key) { return key.time < from || key.time > to; });
    return picture;
}

CurvePicture traceCurve(KFCurve& curve, Tempus const& from, Tempus const& to, double pixels) {
    if (curve.getSpline() != nullptr && curve.getNumberOfKeypoints() > 0) {
        return traceCurve(*curve.getSpline(), from, to, pixels);
    }
    CurvePicture picture;
    double const value = curve.getValue(from, 0.0);
    picture.before = {{TempusGetSeconds(from), value}, {TempusGetSeconds(to), value}};
    return picture;
}

PlotPoint PlotFrame::at(double second, double value) const {
    return {area.x + area.width * seconds.share(second), area.bottom() - area.height * values.share(value)};
}

KeypointMarks marksFor(CurvePicture const& curve, double pixels) {
    double const room = pixels / static_cast<double>(std::max<std::size_t>(curve.keypoints.size(), 1));
    return room > kRoomForDisc        ? KeypointMarks::Large
           : room > kRoomForSmallMark ? KeypointMarks::Small
                                      : KeypointMarks::None;
}

void drawCurve(PlotCanvas& canvas, PlotFrame const& frame, CurvePicture const& curve,
               PlotStroke const& stroke, KeypointMarks marks) {
    PlotStroke continuation = stroke;
    continuation.dashes.assign(style::kContinuationDashes.begin(), style::kContinuationDashes.end());
    auto const placed = [&frame](std::vector<PlotPoint> points) {
        for (PlotPoint& point : points) {
            point = frame.at(point.x, point.y);
        }
        return points;
    };
    drawControls(canvas, frame, curve);
    canvas.polyline(placed(curve.before), continuation);
    canvas.polyline(placed(curve.after), continuation);
    canvas.polyline(placed(curve.inside), stroke);
    if (marks == KeypointMarks::Small) {
        drawSmallMarks(canvas, frame, curve, stroke);
    }
    if (marks != KeypointMarks::Large) {
        return;
    }
    std::vector<PlotPoint> places;
    for (Keypoint const& key : curve.keypoints) {
        places.push_back(frame.at(TempusGetSeconds(key.time), key.value));
    }
    canvas.dots(places, 2.8, style::kPaper, {stroke.colour, 1.4, {}});
}

} // namespace lumenkey::tools
