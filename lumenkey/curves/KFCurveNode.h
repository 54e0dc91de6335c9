#pragma once

#include "lumenkey/curves/KFCurveNodeParam.h"
#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/Tempus.h"

#include <cstdint>
#include <vector>

/// One stage of a curve: the root produces a value, and each processing node behind it may change that value.
///
/// A host derives from this for its processing nodes (its behaviours) and installs them through a channel. A node
/// that overrides only what is pure passes its input on, point by point, at the time of its output. Times are
/// those of the curve. The curve calls nodes on whatever thread evaluates it; a node that keeps data of its own
/// guards them itself.
///
/// The order of the virtual operations is fixed: hosts are built against it.
class LUMENKEY_API KFCurveNode {
public:
    virtual ~KFCurveNode();

    // The value at a time. `operand` is the caller's number, the same for all nodes; `input` the value of the stage
    // in front (0 for the root).
    virtual double solveNode(Tempus const& t, double operand, double input);
    /// A row of samples: reads `param.inputValues`, writes `param.outputValues` and may lower `outputCount`.
    virtual void solveNode(KFCurveNodeParam& param) = 0;

    /// Appends the times in `range` at which the node has `value`; false, with `times` untouched, if there are none.
    virtual bool getUForValue(double value, std::vector<Tempus>& times, BXTimeRange& range, Tempus& step,
                              std::uint32_t flags) = 0;

    // Distances along a path. False here; nothing in the library overrides them.
    virtual bool getTimeAndDistanceAlongCurve(Tempus const& t, Tempus* time, double* distance);
    virtual bool getTimeAndDistanceAlongCurve(Tempus const& t, unsigned int index, Tempus* time,
                                              double* distance);
    virtual bool getParametricValueAndDoubleValueForTime(Tempus const& t, Tempus* parameter, double* value);

    // The value that a root keeps. Here nothing is kept, and the getters answer 0.
    virtual void setValue(Tempus const& t, double value, bool withTangents);
    virtual void setDefaultValue(double value);
    virtual double getDefaultValue() const;
    virtual void setInitialValue(double value);
    virtual double getInitialValue() const;

    /// Fills the input fields of `param` from its output fields: what this node needs from the one in front.
    virtual void getNeededRange(KFCurveNodeParam* param) = 0;
    virtual Tempus getCurrentRange();
    /// The time at which this node reads the stage in front of it, for its output at `t`.
    virtual Tempus getNeededTime(Tempus const& t);

    /// An equal node, which the caller owns.
    virtual KFCurveNode* cloneNode() const = 0;
    /// False for null and for a node of another class.
    virtual bool compare(KFCurveNode const* other) const = 0;

    virtual double getMaxValue(bool withTangents);
    virtual double getMinValue(bool withTangents);
    virtual Tempus getMaxValueU();
    virtual Tempus getMinValueU();

    /// The value at one time depends on the stage in front at one time only.
    virtual bool isPointToPoint() const;
    /// `getNeededTime` may answer another time than it was given. A node that shifts time and answers false here
    /// breaks its contract.
    virtual bool isRemappingTime() const;
    /// A row stops at this node: what stands between the root and it is not run.
    virtual bool isPassThrough() const;

    virtual void reset();
};
