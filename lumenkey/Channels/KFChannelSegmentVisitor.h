#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/Tempus.h"

class KFChannel;
class KFSpline;

/// Looks at a channel's curve over a stretch of time, piece by piece and without sampling: each piece is a constant or a
/// part of one segment between two keypoints. A host derives from it, overrides the visits that it needs, and calls
/// `visitSegments`; here all visits do nothing. `KFChannel::getCurrentMinAndMax` is made so.
///
/// What is told apart: a piece of a segment has a source, which lies on the spline's own line of time and within the
/// segment, and a target, where that piece is seen. The two differ outside the keypoints, where the curve repeats. Where
/// a ping-pong runs backwards `sourceEnd` is before `sourceStart`. `valueOffset` is to be added to the segment's values;
/// it isn't 0 in the progressive repeat alone. The vertices are handles of the spline, good until it is edited.
class LUMENKEY_API KFChannelSegmentVisitor {
public:
    virtual ~KFChannelSegmentVisitor();

    // The order of the virtual operations is fixed: hosts are built against it.

    /// A value that holds from `start` to `end`; a keypoint where the two are the same.
    virtual void visitConstant(double value, Tempus const& start, Tempus const& end);
    /// The continuation along a slope has one vertex: the second, before the keypoints, or the first, after them; the
    /// other is null, and source and target are the same.
    virtual void visitLinear(KFSpline& spline, void* first, void* second, Tempus const& sourceStart,
                             Tempus const& sourceEnd, Tempus const& targetStart, Tempus const& targetEnd,
                             double valueOffset);
    virtual void visitBezier(KFSpline& spline, void* first, void* second, Tempus const& sourceStart,
                             Tempus const& sourceEnd, Tempus const& targetStart, Tempus const& targetEnd,
                             double valueOffset);
    virtual void visitCatmullRom(KFSpline& spline, void* first, void* second, Tempus const& sourceStart,
                                 Tempus const& sourceEnd, Tempus const& targetStart, Tempus const& targetEnd,
                                 double valueOffset);
    virtual void visitEaseIn(KFSpline& spline, void* first, void* second, Tempus const& sourceStart,
                             Tempus const& sourceEnd, Tempus const& targetStart, Tempus const& targetEnd,
                             double valueOffset);
    virtual void visitEaseOut(KFSpline& spline, void* first, void* second, Tempus const& sourceStart,
                              Tempus const& sourceEnd, Tempus const& targetStart, Tempus const& targetEnd,
                              double valueOffset);
    virtual void visitEase(KFSpline& spline, void* first, void* second, Tempus const& sourceStart,
                           Tempus const& sourceEnd, Tempus const& targetStart, Tempus const& targetEnd,
                           double valueOffset);
    virtual void visitAccelerate(KFSpline& spline, void* first, void* second, Tempus const& sourceStart,
                                 Tempus const& sourceEnd, Tempus const& targetStart, Tempus const& targetEnd,
                                 double valueOffset);
    virtual void visitDecelerate(KFSpline& spline, void* first, void* second, Tempus const& sourceStart,
                                 Tempus const& sourceEnd, Tempus const& targetStart, Tempus const& targetEnd,
                                 double valueOffset);
    virtual void visitExponential(KFSpline& spline, void* first, void* second, Tempus const& sourceStart,
                                  Tempus const& sourceEnd, Tempus const& targetStart, Tempus const& targetEnd,
                                  double valueOffset);
    virtual void visitLogarithmic(KFSpline& spline, void* first, void* second, Tempus const& sourceStart,
                                  Tempus const& sourceEnd, Tempus const& targetStart, Tempus const& targetEnd,
                                  double valueOffset);

    /// Visits the curve's pieces from `start` to `end`, in order of target times. Both are curve times, and counted in.
    ///
    /// - A constant curve, and one with a single keypoint, is one constant, whatever the times. A channel without a
    ///   curve, and one whose root is neither a constant nor a spline, has no pieces.
    /// - Elsewhere an `end` before `start` is an empty stretch.
    /// - A keypoint in the stretch is visited as a point, then the segment behind it as far as the stretch goes. All
    ///   keypoints cut, also those that are disabled; the value of a point is that of the curve there. A stretch
    ///   without length inside a segment is a piece without length.
    /// - A segment of a type for which there is no visit (SCurve, Convex, Concave, the whole-curve types, numbers of no
    ///   type) is left out, so that its keypoints alone are visited. A Constant segment has the value in its middle.
    /// - Outside the keypoints, extrapolation: one constant, one line with a single vertex, or, in the modes that
    ///   repeat, the pieces and points of cycle after cycle. The first and the last keypoint themselves aren't points of
    ///   these cycles. An unknown mode has no pieces. A keypoint at which two cycles meet is one point. A ping-pong
    ///   after the keypoints with `retimingExtrapolation` has no points, nor does a stretch without length that lies
    ///   between two of them have a piece.
    /// - The modes that repeat need numbers: a stretch outside that is infinite, or in another epoch than the keypoints,
    ///   has no pieces. Keypoints that are all at one time continue as a constant. A cycle is the part of the curve
    ///   between its first and its last valid keypoint, whatever is disabled outside, and the rise of a progressive
    ///   repeat is that from the one to the other.
    ///
    /// The curve's limits, its processing nodes and a custom interpolator are left out of account. There are about two
    /// visits for each vertex that is touched, times the number of cycles; nothing is allocated.
    ///
    /// Threads: no lock is held during a visit, so a visit may read the curve. The caller sees to it that nobody edits
    /// the curve meanwhile.
    static void visitSegments(KFChannel& channel, Tempus const& start, Tempus const& end,
                              KFChannelSegmentVisitor& visitor);

    // Where a time outside the keypoints, which span `minTime` to `maxTime`, is read by the modes that repeat. A time
    // inside is read where it is. For a `t` that is no number, and a span that isn't above 0, the answer is `minTime`,
    // in cycle 0 and not reversed. All is exact where the result can be written; the targets may be null.

    /// A ping-pong. With `retiming`, from `maxTime` on the last frame, `step` before the end, isn't shown twice at a turn:
    /// backwards it is read from there down to `minTime`, forwards from one step behind that up to `maxTime`. A span of
    /// one step is read at `minTime` then, and a shorter one as without retiming.
    static Tempus mapPingPong(Tempus const& t, Tempus const& minTime, Tempus const& maxTime,
                              Tempus const& step, bool retiming, bool* reversed);
    /// A repeat; with `retiming` `maxTime` itself is read at `minTime`.
    static Tempus mapRepeat(Tempus const& t, Tempus const& minTime, Tempus const& maxTime, bool retiming);
    /// The same. `cycles` is how many times the curve ran through on the way from the keypoints to `t`: 0 inside, from 1
    /// on outside. Before the keypoints a cycle is left at its start: there `maxTime` of the next one is read.
    static Tempus mapProgressiveRepeat(Tempus const& t, Tempus const& minTime, Tempus const& maxTime,
                                       bool retiming, long* cycles);
};
