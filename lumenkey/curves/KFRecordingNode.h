#pragma once

#include "lumenkey/curves/KFCurveNode.h"
#include "lumenkey/foundation/BXLocks.h"
#include "lumenkey/foundation/BXRelaxed.h"

#include <memory>

class KFRecordedPoints;
class KFSplineNode;

/// How the values of a take stand beside the keypoints around them, and when they become keypoints.
enum KFRecordingScope : std::uint32_t {
    /// The take joins the neighbouring keypoints by straight lines. It becomes keypoints at `endRecording`.
    kKFRecordingScopeJoin = 0,
    /// From here on the take runs into the old curve over one step on both sides, by a guard point each; it begins with
    /// the curve's value and ends with the last recorded one. This one becomes keypoints at `endRecording`,
    kKFRecordingScopeTouch = 1,
    /// this one at `endPlayback`,
    kKFRecordingScopeLatch = 2,
    /// and so does this one, which begins at `beginPlayback`, with the value that the spline has there.
    kKFRecordingScopeWrite = 3,
};

/// The root of a curve while values are recorded into it: the points of a take, over the spline of the curve.
///
/// What was recorded can be read at once; on the lines between the points the curve is straight. Outside the take the
/// spline is read. At the end the points take the place of the keypoints in that stretch (`commitChanges`), or are
/// dropped if the take was begun with a mode that isn't 0.
///
/// With a scope above 0 the first and the last point are guards: the spline's old value one step (`resolution`) before
/// the first and one behind the last recorded point. They become keypoints too.
///
/// Times are those of the curve. One that is no number is recorded nowhere and read from the spline. A take only runs
/// forward: a value before the last one is dropped, one at the very same time replaces it.
///
/// Threads: a spin lock guards the points, so any number of threads may read while one records, and while a take
/// begins, ends and becomes keypoints. The lock of the spline is taken inside it. Copying and comparing hold the
/// locks of both nodes one after the other.
///
/// Cost: a point is O(1), whatever the length of the take; reading is O(log n), extremes O(1) beside the spline's.
class LUMENKEY_API KFRecordingNode : public KFCurveNode {
public:
    /// The node of the same curve that holds the keypoints; not null, not owned, and it outlives this one.
    explicit KFRecordingNode(KFSplineNode* splineNode);
    /// How a take is made, without what was recorded, and not playing.
    KFRecordingNode(KFRecordingNode const& other);
    KFRecordingNode(KFRecordingNode const& other, KFSplineNode* splineNode);
    /// What was recorded as well; not whether it plays. The spline node stays.
    KFRecordingNode& operator=(KFRecordingNode const& other);
    ~KFRecordingNode() override;

    /// What was recorded; outside it the spline, or with scope 0 the line to the next enabled keypoint on that side.
    double solveNode(Tempus const& t, double operand, double input) override;
    /// Sample by sample. Nothing without a buffer.
    void solveNode(KFCurveNodeParam& param) override;
    /// Of the spline: what was recorded isn't looked at.
    bool getUForValue(double value, std::vector<Tempus>& times, BXTimeRange& range, Tempus& step,
                      std::uint32_t flags) override;
    /// Records a value; the last argument isn't used.
    void setValue(Tempus const& t, double value, bool withTangents) override;
    // Of the spline node.
    void setDefaultValue(double value) override;
    double getDefaultValue() const override;
    void setInitialValue(double value) override;
    double getInitialValue() const override;
    void getNeededRange(KFCurveNodeParam* param) override;
    Tempus getCurrentRange() override;
    /// A copy over the same spline node, which it must not outlive.
    KFCurveNode* cloneNode() const override;
    /// Equal scopes, modes, points, start times and resolutions, start and last values within 1e-7.
    bool compare(KFCurveNode const* other) const override;
    /// The extremes of the spline's keypoints and of what was recorded.
    double getMaxValue(bool withTangents) override;
    double getMinValue(bool withTangents) override;
    Tempus getMaxValueU() override;
    Tempus getMinValueU() override;

    // A take: `beginPlayback`, `beginRecording`, any number of `setValue` and `updateCurrentTime`, `endRecording`,
    // `endPlayback`. The curve makes this node its root between `beginRecording` and `endRecording`.

    /// Forgets an earlier take that is still open. False, with nothing changed, for a scope above 3, a time that is no
    /// number, and a resolution that is none or is negative.
    bool beginPlayback(Tempus const& t, std::uint32_t scope, std::uint32_t mode, Tempus const& resolution);
    void endPlayback(Tempus const& t);
    void beginRecording(Tempus const& t);
    void endRecording(Tempus const& t);
    /// Time runs on while the last value is held: records it again at `t`. Nothing with scope 0, before the first
    /// value, and for a time before the last one.
    void updateCurrentTime(Tempus const& t);

    bool isPlaying() const noexcept { return _playing; }
    /// Each output may be null.
    void getTake(std::uint32_t* scope, std::uint32_t* mode, Tempus* resolution) const;
    /// The value recorded last; before the first one, what the spline has at the start.
    double getLastValue() const;

private:
    bool hasGuards() const noexcept { return _scope > kKFRecordingScopeJoin; }
    double splineValue(Tempus const& t) const;
    double splineOrJoin(Tempus const& t, bool before) const;
    // The caller holds the lock.
    void record(Tempus const& t, double value);
    void recordBehind(Tempus const& t, double value);
    void commitChanges();
    void copyTake(KFRecordingNode const& other);

    std::uint32_t _scope = 0;
    std::uint32_t _mode = 0;
    BXRelaxed<bool> _playing{false};
    double _lastValue = 0.0;
    Tempus _startTime{};
    double _startValue = 0.0;
    Tempus _resolution = TempusMake(1, 1);
    KFSplineNode* _splineNode;
    std::unique_ptr<KFRecordedPoints> _points;
    mutable BXSpinLock _lock;
};
