// What a channel answers about a stretch of time: its extremes, and the times at which it has a value.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFChannelSegmentVisitor.h"
#include "lumenkey/Channels/KFSegmentWalk.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineExtremes.h"

namespace {

using Time = Tempus const&;

/// Those between two keypoints differ in nothing but whom they ask.
#define VISIT_BY_INTERPOLATOR(Type)                                                                          \
    void visit##Type(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd, Time,    \
                     Time, double valueOffset) override {                                                    \
        include<KF##Type##Interpolator>(spline, first, second, sourceStart, sourceEnd, valueOffset);         \
    }

class MinMaxValuesVisitor : public KFChannelSegmentVisitor {
public:
    KFValueExtremes extremes;

    void visitConstant(double value, Time, Time) override { extremes.include(value, value); }
    void visitLinear(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd,
                     Time targetStart, Time targetEnd, double valueOffset) override {
        if (first == nullptr || second == nullptr) {
            include(spline.getVertexValue(targetStart, kTempusZero, true));
            include(spline.getVertexValue(targetEnd, kTempusZero, true));
            return;
        }
        KFLinearInterpolator linear;
        for (Tempus const& source : {sourceStart, sourceEnd})
            include(linear.interpolate(spline, kTempusZero, first, second, source, false, false) +
                    valueOffset);
    }
    VISIT_BY_INTERPOLATOR(Bezier)
    VISIT_BY_INTERPOLATOR(CatmullRom)
    VISIT_BY_INTERPOLATOR(EaseIn)
    VISIT_BY_INTERPOLATOR(EaseOut)
    VISIT_BY_INTERPOLATOR(Ease)
    VISIT_BY_INTERPOLATOR(Accelerate)
    VISIT_BY_INTERPOLATOR(Decelerate)
    VISIT_BY_INTERPOLATOR(Exponential)
    VISIT_BY_INTERPOLATOR(Logarithmic)

private:
    void include(double value) { extremes.include(value, value); }
    template <class Interpolator>
    void include(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd,
                 double valueOffset) {
        KFValueExtremes const of =
            KFExtremesOfSegment<Interpolator>(spline, first, second, TempusMinimum(sourceStart, sourceEnd),
                                              TempusMaximum(sourceStart, sourceEnd));
        extremes.include(of.lowest + valueOffset, of.highest + valueOffset);
    }
};

#undef VISIT_BY_INTERPOLATOR

} // namespace

bool KFChannel::getCurrentMinAndMax(Tempus const& from, Tempus const& to, double* minimum, double* maximum) {
    if (minimum == nullptr && maximum == nullptr)
        return false;
    MinMaxValuesVisitor visitor;
    if (KFCurve* const used = getCurveInterface())
        KFSegmentWalk::overCurve(*used, from, to, visitor, &visitor.extremes);
    if (minimum != nullptr)
        *minimum = visitor.extremes.lowest;
    if (maximum != nullptr)
        *maximum = visitor.extremes.highest;
    return true;
}

bool KFChannel::getTimeForValue(double value, std::vector<Tempus>& times, BXTimeRange const& range,
                                Tempus const& fallbackFrameDuration, unsigned int flags) const {
    if (getCurveInterface() == nullptr)
        return false;
    KFChannelObjectRootBase const* const root = getChannelRootBase();
    Tempus frameDuration = root == nullptr ? fallbackFrameDuration : root->getFrameDuration();
    BXTimeRange local{globalToLocalTime(range.start), range.duration};
    std::vector<Tempus> found;
    if (!curve().getUForValue(value, found, local, frameDuration, flags))
        return false;
    for (Tempus const& t : found)
        times.push_back(localToGlobalTime(t));
    return true;
}
