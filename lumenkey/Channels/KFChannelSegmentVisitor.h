#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/Tempus.h"

class KFChannel;
class KFSpline;

/// Looks at a channel's curve over a stretch of time, piece by piece and without sampling: each piece is a
/// constant or a part of one segment between two keypoints. A host derives from it, overrides the visits that
/// it needs, and calls `visitSegments`; here all visits do nothing. `KFChannel::getCurrentMinAndMax` is made
/// so.
///
/// A piece of a segment has two stretches of the same length. Its source lies on the spline's own line of
/// time, within the segment; its target is where that is seen. The two differ outside the keypoints, where
/// the curve repeats. Where a ping-pong runs backwards, `sourceEnd` is before `sourceStart`. `valueOffset` is
/// to be added to the segment's values; only a progressive repeat has another than 0. `first` and `second`
/// are the vertices of the segment, as handles of the spline, good until it is edited.
class LUMENKEY_API KFChannelSegmentVisitor {
public:
    /// The signature of the visits of a piece, one for each type of interpolation.
    using SegmentVisit = void(KFSpline& spline, void* first, void* second, Tempus const& sourceStart,
                              Tempus const& sourceEnd, Tempus const& targetStart, Tempus const& targetEnd,
                              double valueOffset);

    virtual ~KFChannelSegmentVisitor();

    // The order of the virtual operations is fixed: hosts are built against it.

    /// A value that holds from `start` to `end`; a keypoint where the two are the same.
    virtual void visitConstant(double value, Tempus const& start, Tempus const& end);
    /// The continuation along a slope has one vertex, and the other is null: before the keypoints it is
    /// `second`, after them `first`. Source and target are the same then, and the values are those of the
    /// spline there.
    virtual SegmentVisit visitLinear;
    virtual SegmentVisit visitBezier;
    virtual SegmentVisit visitCatmullRom;
    virtual SegmentVisit visitEaseIn;
    virtual SegmentVisit visitEaseOut;
    virtual SegmentVisit visitEase;
    virtual SegmentVisit visitAccelerate;
    virtual SegmentVisit visitDecelerate;
    virtual SegmentVisit visitExponential;
    virtual SegmentVisit visitLogarithmic;

    /// Visits the pieces from `start` to `end`, both curve times and counted in, in the order of their
    /// targets.
    ///
    /// - A constant curve, and one with a single keypoint, is one constant, whatever the times. A channel
    ///   without a curve has no pieces, nor has one whose root is neither a constant nor a spline.
    /// - Else an `end` before `start` is an empty stretch.
    /// - A keypoint in the stretch is visited as a point, with the value that the curve has there, then the
    ///   segment behind it as far as the stretch goes. All keypoints cut, the disabled ones too, although the
    ///   curve passes these by. Several at one time are one point, and the last of them begins the segment
    ///   behind, as in the curve. A stretch without length inside a segment is a piece without length.
    /// - A Constant segment is a constant with the value in its middle. A segment of a type that has no visit
    ///   is left out, so that its keypoints alone are visited: SCurve, Convex, Concave,
    ///   `kKFInterpolationLinearToo`, the types that draw a whole curve, and numbers that name no type.
    /// - Outside the keypoints, by the mode of that side (of a closed spline too): one constant; one line;
    ///   or, where it repeats, the points and pieces of one cycle after the other. An unknown mode has none.
    ///
    /// In the modes that repeat:
    ///
    /// - A cycle is the part between the first and the last valid keypoint, and the rise of a progressive
    ///   repeat is that from the one to the other. Keypoints that are all at one time go on as a constant.
    /// - A keypoint at which two cycles meet is one point; the one at which the repeats begin belongs to the
    ///   inside. An instant between two points has no piece.
    /// - A ping-pong after the keypoints with `retimingExtrapolation` has no points, and its pieces lie where
    ///   `mapPingPong` says; on the way back the value of the curve is one step ahead of that.
    /// - Cycles are counted, so a stretch outside that has no end, or is of another epoch than the keypoints,
    ///   has none.
    ///
    /// The curve's limits and its processing nodes are left out of account. There are about two visits for
    /// each vertex, times the number of cycles; nothing is allocated.
    ///
    /// Threads: no lock is held during a visit, so a visit may read the curve. The caller sees to it that
    /// nobody edits the curve meanwhile.
    static void visitSegments(KFChannel& channel, Tempus const& start, Tempus const& end,
                              KFChannelSegmentVisitor& visitor);

    // Where the modes that repeat read a time outside the keypoints, which span `minTime` to `maxTime`; a
    // time inside is read where it is. The answer is exact where it can be written. It is `minTime`, not
    // reversed, in cycle 0, for a `t` that is no number or of another epoch, and for a span that isn't above
    // 0. Targets may be null.

    /// A ping-pong. With `retiming`, from `maxTime` on, the frame at a turn, `step` long, isn't shown twice:
    /// backwards it runs from `step` before the end down to the start, forwards from `step` behind the start
    /// up to the end. A span of one step is read at `minTime` then; for a shorter one `retiming` changes
    /// nothing.
    static Tempus mapPingPong(Tempus const& t, Tempus const& minTime, Tempus const& maxTime,
                              Tempus const& step, bool retiming, bool* reversed);
    /// A repeat; with `retiming` `maxTime` itself is read at `minTime`.
    static Tempus mapRepeat(Tempus const& t, Tempus const& minTime, Tempus const& maxTime, bool retiming);
    /// The same; `cycles` gets the number of the cycle that is read, from 1 on outside, counted from the
    /// keypoints. Where two cycles meet before the keypoints, it is the end of the one farther out.
    static Tempus mapProgressiveRepeat(Tempus const& t, Tempus const& minTime, Tempus const& maxTime,
                                       bool retiming, long* cycles);
};
