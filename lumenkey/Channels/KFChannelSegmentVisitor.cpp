#include "lumenkey/Channels/KFChannelSegmentVisitor.h"

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFSegmentWalk.h"

#include <limits>

using Time = Tempus const&;
using Visitor = KFChannelSegmentVisitor;

KFChannelSegmentVisitor::~KFChannelSegmentVisitor() = default;

void Visitor::visitConstant(double, Time, Time) {}
void Visitor::visitLinear(KFSpline&, void*, void*, Time, Time, Time, Time, double) {}
void Visitor::visitBezier(KFSpline&, void*, void*, Time, Time, Time, Time, double) {}
void Visitor::visitCatmullRom(KFSpline&, void*, void*, Time, Time, Time, Time, double) {}
void Visitor::visitEaseIn(KFSpline&, void*, void*, Time, Time, Time, Time, double) {}
void Visitor::visitEaseOut(KFSpline&, void*, void*, Time, Time, Time, Time, double) {}
void Visitor::visitEase(KFSpline&, void*, void*, Time, Time, Time, Time, double) {}
void Visitor::visitAccelerate(KFSpline&, void*, void*, Time, Time, Time, Time, double) {}
void Visitor::visitDecelerate(KFSpline&, void*, void*, Time, Time, Time, Time, double) {}
void Visitor::visitExponential(KFSpline&, void*, void*, Time, Time, Time, Time, double) {}
void Visitor::visitLogarithmic(KFSpline&, void*, void*, Time, Time, Time, Time, double) {}

void KFChannelSegmentVisitor::visitSegments(KFChannel& channel, Tempus const& start, Tempus const& end,
                                            KFChannelSegmentVisitor& visitor) {
    if (KFCurve* const curve = channel.getCurveInterface())
        KFSegmentWalk::overCurve(*curve, start, end, visitor, nullptr);
}

namespace {

/// The keypoints' span, above 0.
struct Span {
    Tempus minTime, maxTime, range;

    Span(Time minTimeIn, Time maxTimeIn) : minTime(minTimeIn), maxTime(maxTimeIn), range(maxTime - minTime) {}
    bool canMap(Time t) const noexcept {
        return TempusIsNumeric(range) && range > kTempusZero && TempusIsNumeric(t);
    }
};

struct Mapped {
    Tempus time;
    bool reversed = false;
    std::int64_t cycles = 0;
};

Mapped pingPong(Time t, Span const& span, Time step, bool retiming) {
    Tempus const& range = span.range;
    Tempus const twice = range * 2;
    if (t < span.minTime) {
        Tempus const m = TempusModulo(span.minTime - t, twice);
        if (m == kTempusZero)
            return {span.minTime};
        return m > range ? Mapped{twice - m + span.minTime} : Mapped{m + span.minTime, true};
    }
    if (t < span.maxTime)
        return {t};
    if (!retiming || range < step) {
        Tempus const m = TempusModulo(t - span.minTime, twice);
        return m < range ? Mapped{m + span.minTime} : Mapped{twice - m + span.minTime, true};
    }
    Tempus const shown = range - step;
    if (shown == kTempusZero)
        return {span.minTime};
    Tempus const m = TempusModulo(t - span.maxTime, shown * 2);
    return m < shown ? Mapped{shown - m + span.minTime, true} : Mapped{m - shown + step + span.minTime};
}

Mapped progressiveRepeat(Time t, Span const& span, bool retiming) {
    if (t < span.minTime) {
        constexpr std::int64_t most = std::numeric_limits<std::int64_t>::max();
        Tempus const distance = span.minTime - t;
        std::int64_t const whole = TempusFloorQuotient(distance, span.range);
        return {span.maxTime - TempusModulo(distance, span.range), false, whole < most ? whole + 1 : most};
    }
    if (t > span.maxTime || (retiming && t == span.maxTime)) {
        Tempus const distance = t - span.minTime;
        return {span.minTime + TempusModulo(distance, span.range), false,
                TempusFloorQuotient(distance, span.range)};
    }
    return {t};
}

/// A time that can't be mapped, as one of another epoch, is read at the start.
Mapped orStart(Mapped const& mapped, Span const& span) {
    return TempusIsNumeric(mapped.time) ? mapped : Mapped{span.minTime};
}

} // namespace

Tempus KFChannelSegmentVisitor::mapPingPong(Tempus const& t, Tempus const& minTime, Tempus const& maxTime,
                                            Tempus const& step, bool retiming, bool* reversed) {
    Span const span(minTime, maxTime);
    Mapped const mapped = span.canMap(t) ? orStart(pingPong(t, span, step, retiming), span) : Mapped{minTime};
    if (reversed != nullptr)
        *reversed = mapped.reversed;
    return mapped.time;
}

Tempus KFChannelSegmentVisitor::mapRepeat(Tempus const& t, Tempus const& minTime, Tempus const& maxTime,
                                          bool retiming) {
    return mapProgressiveRepeat(t, minTime, maxTime, retiming, nullptr);
}

Tempus KFChannelSegmentVisitor::mapProgressiveRepeat(Tempus const& t, Tempus const& minTime,
                                                     Tempus const& maxTime, bool retiming, long* cycles) {
    Span const span(minTime, maxTime);
    Mapped const mapped =
        span.canMap(t) ? orStart(progressiveRepeat(t, span, retiming), span) : Mapped{minTime};
    if (cycles != nullptr)
        *cycles = static_cast<long>(mapped.cycles);
    return mapped.time;
}
