// Simplifying the path of two components as one.

#include "lumenkey/Channels/KFVectorChannels.h"
#include "lumenkey/curves/KFCurve.h"

#include <algorithm>
#include <map>
#include <set>

namespace {

std::vector<Tempus> keyframeTimes(KFChannel const& channel) {
    std::vector<Tempus> times;
    for (void* const handle : channel.getKeyframes(false)) {
        channel.getKeyframe(handle, &times.emplace_back(), nullptr);
    }
    return times;
}

/// Keys `other` where the one with `times` has keypoints in the range and it has none.
void align(KFChannel const& channel, std::vector<Tempus> const& times, KFChannel& other, Tempus const& from,
           Tempus const& to) {
    for (Tempus const& time : times) {
        if (!(time < from) && !(time > to) && !other.hasKeypointAt(channel.localToGlobalTime(time), 0)) {
            other.setKeyframe(time);
        }
    }
}

/// The global times at which some, but not all, of the components have keypoints.
std::vector<Tempus> timesNotSharedByAll(KFChannelFolder const& compound) {
    std::map<Tempus, std::set<KFChannel const*>> keyed;
    std::vector<Tempus> times;
    std::size_t count = 0;
    if (compound.getDescendants() == nullptr) {
        return times;
    }
    for (KFChannelBase const* const child : *compound.getDescendants()) {
        if (auto const* const channel = dynamic_cast<KFChannel const*>(child)) {
            ++count;
            for (Tempus const& time : keyframeTimes(*channel)) {
                keyed[channel->localToGlobalTime(time)].insert(channel);
            }
        }
    }
    for (auto const& [time, channels] : keyed) {
        if (channels.size() < count) {
            times.push_back(time);
        }
    }
    return times;
}

/// The keypoints of both components at one place of the path.
struct PathPoint {
    void* ofX = nullptr;
    void* ofY = nullptr;
    Tempus time{};
    double x = 0.0;
    double y = 0.0;

    double slopeTo(PathPoint const& next) const { return (next.y - y) / (next.x - x); }
};

std::vector<PathPoint> pathOf(KFChannel const& x, KFChannel const& y) {
    std::vector<void*> const ofX = x.getKeyframes(false);
    std::vector<void*> const ofY = y.getKeyframes(false);
    std::vector<PathPoint> path(std::min(ofX.size(), ofY.size()));
    for (std::size_t i = 0; i < path.size(); ++i) {
        path[i].ofX = ofX[i];
        path[i].ofY = ofY[i];
        x.getKeyframe(ofX[i], &path[i].time, &path[i].x);
        y.getKeyframe(ofY[i], nullptr, &path[i].y);
    }
    return path;
}

bool turns(double before, double behind) {
    return (before > 0.0 && behind < 0.0) || (before < 0.0 && behind > 0.0);
}

void keepTurningPoints(KFChannel& x, KFChannel& y, Tempus const& from, Tempus const& to) {
    std::vector<PathPoint> const path = pathOf(x, y);
    if (path.size() < 3) {
        return;
    }
    PathPoint const* previous = &path[0];
    for (std::size_t i = 1; i + 1 < path.size(); ++i) {
        PathPoint const& point = path[i];
        PathPoint const& next = path[i + 1];
        if (point.time < from || point.time > to || turns(previous->slopeTo(point), point.slopeTo(next))) {
            previous = &point;
            continue;
        }
        x.deleteKeyframe(point.ofX);
        y.deleteKeyframe(point.ofY);
        for (PathPoint const* const neighbour : {previous, &next}) {
            x.deriveKeyframe(neighbour->ofX);
            y.deriveKeyframe(neighbour->ofY);
        }
        ++i; // so the one behind stays, and is never a `previous`
    }
}

} // namespace

void KFChannel2D::simplify(Tempus const& a, Tempus const& b, Tempus const& step, double percent,
                           unsigned int mode1, unsigned int mode2, bool clampToCoarse) {
    if (mode1 == KFCurve::kSimplifyToExtremes) {
        for (Tempus const& time : timesNotSharedByAll(*this)) {
            addKeypointAt(time);
        }
        keepTurningPoints(x, y, a, b);
        return;
    }
    KFChannelFolder::simplify(a, b, step, percent, mode1, mode2, clampToCoarse);
    std::vector<Tempus> const timesOfX = keyframeTimes(x);
    std::vector<Tempus> const timesOfY = keyframeTimes(y);
    align(x, timesOfX, y, a, b);
    align(y, timesOfY, x, a, b);
}
