// What any node does with the keypoints in a range, by the operations in global time.

#include "lumenkey/Channels/KFChannel.h"

#include <algorithm>

namespace {

/// Only ever forward: a walk over channels whose converters reverse or hold the time would go round for ever.
bool stepForward(KFChannelBase const& node, Tempus& t, unsigned int mask) {
    Tempus next = t;
    if (!node.nextKeypoint(&next, mask) || !(next > t))
        return false;
    t = next;
    return true;
}

} // namespace

std::vector<Tempus> KFChannelBase::keypointTimesInRange(Tempus const& from, Tempus const& to) const {
    std::vector<Tempus> times;
    if (hasKeypointAt(from, 0))
        times.push_back(from);
    Tempus time = from;
    while (stepForward(*this, time, 0) && !(time > to))
        times.push_back(time);
    return times;
}

std::vector<Tempus> KFChannelBase::keypoints(TempusRange range, bool withNeighbours, unsigned int mask) {
    std::vector<Tempus> times;
    Tempus const end = TempusRangeGetEnd(range);
    if (hasKeypointAt(range.start, mask))
        times.push_back(range.start);
    Tempus time = range.start;
    if (withNeighbours && previousKeypoint(&time, mask))
        times.push_back(time);
    while (stepForward(*this, time, mask) && !(time > end))
        times.push_back(time);
    time = end;
    if (withNeighbours && nextKeypoint(&time, mask))
        times.push_back(time);
    return times;
}

std::vector<Tempus> KFChannelBase::visibleKeypoints(TempusRange range, bool withNeighbours,
                                                    unsigned int mask) {
    return keypoints(range, withNeighbours, mask);
}

// --- Moving ---

Tempus KFChannelBase::offsetKeyframesInRange(Tempus const& start, Tempus const& end, Tempus const& offset,
                                             Tempus const& gap, bool a, bool constrain) {
    std::vector<Tempus> times = keypointTimesInRange(start, end);
    if (times.empty())
        return kTempusZero;
    Tempus applied = offset;
    if (constrain && applied < kTempusZero) {
        Tempus previous = times.front();
        if (previousKeypoint(&previous, 0))
            applied = TempusMaximum(applied, previous + gap - times.front());
    }
    if (constrain && applied > kTempusZero) {
        Tempus next = times.back();
        if (nextKeypoint(&next, 0))
            applied = TempusMinimum(applied, next - gap - times.back());
    }
    if (applied == kTempusZero)
        return applied;
    if (applied > kTempusZero) // so that none runs over the next one to be moved
        std::reverse(times.begin(), times.end());
    for (Tempus const& time : times)
        moveKeypointTo(time, time + applied, a, constrain);
    return applied;
}

// --- Gathering and pasting ---

void KFChannelBase::keyframesWithChannelRef(TempusRange range, KeyframesByRef& out) {
    KeyframesByChannel gathered;
    keyframesWithChannels(range, gathered);
    for (auto& [channel, keyframes] : gathered)
        out.insert_or_assign(KFChannelRef(channel, this), std::move(keyframes));
}

void KFChannelBase::setKeyframesWithChannelRef(Tempus const& t, Tempus const&,
                                               KeyframesByRef const& keyframes, bool clear) {
    Tempus earliest = kTempusPositiveInfinity;
    Tempus latest = kTempusNegativeInfinity;
    for (auto const& [ref, records] : keyframes) {
        for (_KFKeyframeInfo const& record : records) {
            earliest = TempusMinimum(earliest, record.time);
            latest = TempusMaximum(latest, record.time);
        }
    }
    for (auto const& [ref, records] : keyframes) {
        auto* const channel = dynamic_cast<KFChannel*>(ref.getChannel(this));
        if (channel == nullptr || records.empty())
            continue;
        if (clear)
            channel->deleteKeypoints(t, t + (latest - earliest));
        channel->setKeyframesWithInfo(t + (records.front().time - earliest), records);
    }
}
