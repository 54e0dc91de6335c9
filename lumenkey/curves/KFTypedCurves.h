#pragma once

#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/foundation/BXSingleton.h"
#include "lumenkey/splines/KFSplineState.h"

// The curves that channels hold: each fixes the range of a kind of value and shares one settings record with all
// curves of its class, until one of them changes a setting.
//
//     class            minimum                     maximum                    new keypoints
//     KFCurveDouble    -1.7976931348623157e308     1.7976931348623157e308     Linear
//     KFCurveInt       0                           4294967295                 Linear
//     KFCurveBool      0                           1                          Constant, no derived tangents
//     KFCurveAngle     -1.7976931348623157e308     1.7976931348623157e308     Linear
//     KFCurveEnum      0                           4294967295                 Constant, no derived tangents
//     KFCurvePercent   0                           1                          Linear
//
// Each has one constructor from its initial value. `getCurveWorkingCopy` is a copy with the processing nodes,
// `cloneCurve` one without; the caller owns either.

/// The settings that the curves of one class share: made on first use by any thread, never written afterwards.
#define KF_DECLARE_SPLINE_STATE(Name)                                                                        \
    class LUMENKEY_API Name : public BXSingleton, public KFSplineState {                                     \
    public:                                                                                                  \
        static Name& getInstance();                                                                          \
                                                                                                             \
    private:                                                                                                 \
        Name();                                                                                              \
        ~Name() override;                                                                                    \
        template <class T> friend T& BXSingletonInstance();                                                  \
    }

KF_DECLARE_SPLINE_STATE(KFCurveDoubleSplineState);
KF_DECLARE_SPLINE_STATE(KFCurveIntSplineState);
KF_DECLARE_SPLINE_STATE(KFCurveBoolSplineState);
KF_DECLARE_SPLINE_STATE(KFCurveAngleSplineState);
KF_DECLARE_SPLINE_STATE(KFCurveEnumSplineState);
KF_DECLARE_SPLINE_STATE(KFCurvePercentSplineState);
#undef KF_DECLARE_SPLINE_STATE

#define KF_DECLARE_TYPED_CURVE(Name)                                                                         \
    class LUMENKEY_API Name : public KFCurve {                                                               \
    public:                                                                                                  \
        explicit Name(double value);                                                                         \
        Name(Name const& other, bool cloneChain);                                                            \
        ~Name() override;                                                                                    \
        KFCurveInterface* getCurveWorkingCopy() override;                                                    \
        KFCurveInterface* cloneCurve() override;                                                             \
    }

KF_DECLARE_TYPED_CURVE(KFCurveDouble);
KF_DECLARE_TYPED_CURVE(KFCurveInt);
KF_DECLARE_TYPED_CURVE(KFCurveAngle);
/// Takes no keypoints until `setCurveKeyframable(true)`.
KF_DECLARE_TYPED_CURVE(KFCurveEnum);
KF_DECLARE_TYPED_CURVE(KFCurvePercent);
#undef KF_DECLARE_TYPED_CURVE

/// Answers exactly 0 or 1 by both forms of `getValue`: 0 within 1e-7 of 0, else 1, also for a not-a-number.
/// `getPointWithoutBehavior` gives the raw value of the root.
class LUMENKEY_API KFCurveBool : public KFCurve {
public:
    explicit KFCurveBool(double value);
    KFCurveBool(KFCurveBool const& other, bool cloneChain);
    ~KFCurveBool() override;
    KFCurveInterface* getCurveWorkingCopy() override;
    KFCurveInterface* cloneCurve() override;
    bool isCurveBoolean() override;
    double getValue(Tempus const& t, void* node) override;
    double getValue(Tempus const& t, double operand) override;
};
