// What a channel answers about a stretch of time: its extremes, and the times at which it has a value.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFChannelSegmentVisitor.h"
#include "lumenkey/Channels/KFSegmentWalk.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineExtremes.h"

#include <utility>

namespace {

using Time = Tempus const&;

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
    void visitBezier(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd, Time,
                     Time, double valueOffset) override {
        include<KFBezierInterpolator>(spline, first, second, sourceStart, sourceEnd, valueOffset);
    }
    void visitCatmullRom(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd, Time,
                         Time, double valueOffset) override {
        include<KFCatmullRomInterpolator>(spline, first, second, sourceStart, sourceEnd, valueOffset);
    }
    void visitEaseIn(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd, Time,
                     Time, double valueOffset) override {
        include<KFEaseInInterpolator>(spline, first, second, sourceStart, sourceEnd, valueOffset);
    }
    void visitEaseOut(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd, Time,
                      Time, double valueOffset) override {
        include<KFEaseOutInterpolator>(spline, first, second, sourceStart, sourceEnd, valueOffset);
    }
    void visitEase(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd, Time, Time,
                   double valueOffset) override {
        include<KFEaseInterpolator>(spline, first, second, sourceStart, sourceEnd, valueOffset);
    }
    void visitAccelerate(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd, Time,
                         Time, double valueOffset) override {
        include<KFAccelerateInterpolator>(spline, first, second, sourceStart, sourceEnd, valueOffset);
    }
    void visitDecelerate(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd, Time,
                         Time, double valueOffset) override {
        include<KFDecelerateInterpolator>(spline, first, second, sourceStart, sourceEnd, valueOffset);
    }
    void visitExponential(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd, Time,
                          Time, double valueOffset) override {
        include<KFExponentialInterpolator>(spline, first, second, sourceStart, sourceEnd, valueOffset);
    }
    void visitLogarithmic(KFSpline& spline, void* first, void* second, Time sourceStart, Time sourceEnd, Time,
                          Time, double valueOffset) override {
        include<KFLogarithmicInterpolator>(spline, first, second, sourceStart, sourceEnd, valueOffset);
    }

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
