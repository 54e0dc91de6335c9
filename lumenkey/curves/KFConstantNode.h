#pragma once

#include "lumenkey/curves/KFCurveNode.h"
#include "lumenkey/foundation/BXRelaxed.h"

/// A root with one value at all times.
///
/// Threads: the two numbers may be read beside one thread that writes them.
class LUMENKEY_API KFConstantNode : public KFCurveNode {
public:
    /// `value` becomes the default as well.
    explicit KFConstantNode(double value) noexcept : _value(value), _defaultValue(value) {}
    ~KFConstantNode() override;

    double solveNode(Tempus const& t, double operand, double input) override;
    void solveNode(KFCurveNodeParam& param) override;
    /// The start of `range` where the value lies within 1e-7.
    bool getUForValue(double value, std::vector<Tempus>& times, BXTimeRange& range, Tempus& step,
                      std::uint32_t flags) override;
    void setValue(Tempus const& t, double value, bool withTangents) override;
    void setDefaultValue(double value) override;
    double getDefaultValue() const override;
    void setInitialValue(double value) override;
    double getInitialValue() const override;
    void getNeededRange(KFCurveNodeParam* param) override;
    KFCurveNode* cloneNode() const override;
    /// Equal values and defaults.
    bool compare(KFCurveNode const* other) const override;
    double getMaxValue(bool withTangents) override;
    double getMinValue(bool withTangents) override;
    /// The value becomes the default.
    void reset() override;

    // For the curve, which keeps its two embedded nodes in step.
    double value() const noexcept { return _value; }
    void storeValue(double value) noexcept { _value = value; }

protected:
    BXRelaxed<double> _value;
    BXRelaxed<double> _defaultValue;
};
