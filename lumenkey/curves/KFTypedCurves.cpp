#include "lumenkey/curves/KFTypedCurves.h"

#include "lumenkey/splines/KFInterpolation.h"

#include <limits>

namespace {

constexpr int kSettingsRank = 200;
constexpr double kHighest = std::numeric_limits<double>::max();
constexpr double kHighestUnsigned = 4294967295.0;

/// What a boolean curve still takes for 0.
constexpr double kFalseTolerance = 1e-7;

} // namespace

#define KF_DEFINE_SPLINE_STATE(Name, interpolation, deriveTangents)                                          \
    Name::Name()                                                                                             \
        : BXSingleton(kSettingsRank),                                                                        \
          KFSplineState(false, true, deriveTangents, true, interpolation, 0, 0, false) {}                    \
    Name::~Name() = default;                                                                                 \
    Name& Name::getInstance() { return BXSingletonInstance<Name>(); }

#define KF_DEFINE_TYPED_CURVE(Name, minimum, maximum, keyframable)                                           \
    Name::Name(double value) : KFCurve(minimum, maximum, value) {                                            \
        setSplineState(&Name##SplineState::getInstance());                                                   \
        KFCurve::setCurveKeyframable(keyframable);                                                           \
    }                                                                                                        \
    Name::Name(Name const& other, bool cloneChain) : KFCurve(other, cloneChain) {}                           \
    Name::~Name() = default;                                                                                 \
    KFCurveInterface* Name::getCurveWorkingCopy() { return new Name(*this, true); }                          \
    KFCurveInterface* Name::cloneCurve() { return new Name(*this, false); }

// clang-format off
//                     class                       new keypoints             tangents follow
KF_DEFINE_SPLINE_STATE(KFCurveDoubleSplineState,   kKFInterpolationLinear,   true)
KF_DEFINE_SPLINE_STATE(KFCurveIntSplineState,      kKFInterpolationLinear,   true)
KF_DEFINE_SPLINE_STATE(KFCurveBoolSplineState,     kKFInterpolationConstant, false)
KF_DEFINE_SPLINE_STATE(KFCurveAngleSplineState,    kKFInterpolationLinear,   true)
KF_DEFINE_SPLINE_STATE(KFCurveEnumSplineState,     kKFInterpolationConstant, false)
KF_DEFINE_SPLINE_STATE(KFCurvePercentSplineState,  kKFInterpolationLinear,   true)

//                    class           minimum    maximum           keyframable
KF_DEFINE_TYPED_CURVE(KFCurveDouble,  -kHighest, kHighest,         true)
KF_DEFINE_TYPED_CURVE(KFCurveInt,     0.0,       kHighestUnsigned, true)
KF_DEFINE_TYPED_CURVE(KFCurveBool,    0.0,       1.0,              true)
KF_DEFINE_TYPED_CURVE(KFCurveAngle,   -kHighest, kHighest,         true)
KF_DEFINE_TYPED_CURVE(KFCurveEnum,    0.0,       kHighestUnsigned, false)
KF_DEFINE_TYPED_CURVE(KFCurvePercent, 0.0,       1.0,              true)
// clang-format on

#undef KF_DEFINE_SPLINE_STATE
#undef KF_DEFINE_TYPED_CURVE

namespace {

double booleanOf(double value) noexcept {
    return value > -kFalseTolerance && value < kFalseTolerance ? 0.0 : 1.0;
}

} // namespace

bool KFCurveBool::isCurveBoolean() { return true; }

double KFCurveBool::getValue(Tempus const& t, void* node) { return booleanOf(KFCurve::getValue(t, node)); }

double KFCurveBool::getValue(Tempus const& t, double operand) {
    return booleanOf(KFCurve::getValue(t, operand));
}
