#pragma once

#include "lumenkey/curves/KFConstantNode.h"
#include "lumenkey/splines/KFSplineOwner.h"

class KFCurve;
class KFSpline;
class KFSplineState;

/// The root of a curve with keypoints: a constant node that may own a spline.
///
/// While it owns none, or while that spline has no vertex, it behaves in all respects as a constant node, so that a
/// curve passes from constant to animated and back without its channel noticing. `_value` survives all of that and
/// is what the node answers once the spline is gone.
///
/// Threads: the node has no lock of its own; the spline takes `_customLock`, or else its own, for each access.
/// Creating or destroying the spline must not run beside a read of the same curve, and comparing two nodes not beside
/// an edit of either.
class LUMENKEY_API KFSplineNode : public KFConstantNode, public KFSplineOwner {
public:
    /// Value and default 0, no spline. `curve` is the one that embeds the node; it isn't owned and may be null.
    explicit KFSplineNode(KFCurve* curve) noexcept;
    /// Takes a deep copy of `spline` unless that is null. Value and default 0.
    KFSplineNode(KFSpline* spline, KFCurve* curve);
    /// Value, default and a deep copy of the spline; custom interpolator and lock start null.
    KFSplineNode(KFSplineNode const& other, KFCurve* curve);
    /// The same without a curve.
    KFSplineNode(KFSplineNode const& other);
    /// The constant part, the custom interpolator, and a deep copy of the spline in place of the own one, with the
    /// settings of the own curve. The custom lock and the suppression of refreshes stay.
    KFSplineNode& operator=(KFSplineNode const& other);
    ~KFSplineNode() override;

    double solveNode(Tempus const& t, double operand, double input) override;
    void solveNode(KFCurveNodeParam& param) override;
    bool getUForValue(double value, std::vector<Tempus>& times, BXTimeRange& range, Tempus& step,
                      std::uint32_t flags) override;
    /// Adds a keypoint; the first one creates the spline.
    void setValue(Tempus const& t, double value, bool withTangents) override;
    double getInitialValue() const override { return KFConstantNode::getInitialValue(); }
    void getNeededRange(KFCurveNodeParam* param) override;
    Tempus getCurrentRange() override;
    /// An equal node with a deep copy of the spline. It belongs to no curve and so has the default settings: it may
    /// outlive the curve that it came from, but continues its keypoints as a new curve does.
    KFCurveNode* cloneNode() const override;
    /// Both without a spline, or both with equal splines: vertex by vertex, by all that they hold, and both open or
    /// both closed. Settings aren't compared.
    bool compare(KFCurveNode const* other) const override;
    /// The extremes of the enabled keypoints, `withTangents` of the ends of their handles as well; the constant where
    /// there are none.
    double getMaxValue(bool withTangents) override;
    double getMinValue(bool withTangents) override;
    Tempus getMaxValueU() override;
    Tempus getMinValueU() override;
    /// Destroys the spline; the value becomes the default.
    void reset() override;

    /// The curve's frame duration; 1/30 s without a curve.
    Tempus getFrameDuration() const override;

    KFSpline* getSpline() const noexcept { return _spline; }
    void createSpline();
    /// Makes the spline, as a copy of `from` unless that is null, with the settings of the curve at that moment; the
    /// curve hands later records to the spline. An earlier spline isn't freed: call it only while there is none.
    void allocKFSpline(KFSpline* from);
    /// Destroys the spline without touching the value.
    void destroySpline() noexcept;

    /// Takes no lock; may run beside one thread that edits.
    bool hasVertices() const;

    /// What applies to a spline whose curve is null or has no settings record: the defaults, shared.
    static KFSplineState& defaultSettings();

private:
    KFSpline* _spline = nullptr;
    KFCurve* _curve;
};
