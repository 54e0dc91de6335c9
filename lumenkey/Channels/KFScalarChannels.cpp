// The scalar types: one table of their constants, and what their constructors do.

#include "lumenkey/Channels/KFScalarChannels.h"

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFClassRecords.h"

#include <cmath>

namespace {

constexpr double kUnbounded = 3.4028234663852886e38;
constexpr double kQuarterTurn = 1.5707963267948966;
constexpr double kDegree = 0.017453292519943295;
constexpr double kHundredthOfDegree = 0.00017453292519943296;
constexpr double kDegreesPerRadian = 57.29577951308232;
constexpr char const* kDegreeSign = "\xC2\xB0";

} // namespace

static_assert(sizeof(KFChannelDouble) <= 192, "a project holds very many channels at their class's state");

// clang-format off
//                 class                        curve           type value  slider min    slider max    coarse   fine                scale              suffix
KF_CLASS_CONSTANTS(KFChannelDouble,             KFCurveDouble,  1,   0.0,   0.0,          100.0,        1.0,     0.01,               1.0,               "")
KF_CLASS_CONSTANTS(KFChannelAngle,              KFCurveAngle,   1,   0.0,   -kUnbounded,  kUnbounded,   kDegree, kHundredthOfDegree, kDegreesPerRadian, kDegreeSign)
KF_CLASS_CONSTANTS(KFChannelShearAngle,         KFCurveAngle,   1,   0.0,   -kQuarterTurn, kQuarterTurn, kDegree, kHundredthOfDegree, kDegreesPerRadian, kDegreeSign)
KF_CLASS_CONSTANTS(KFChannelPercent,            KFCurvePercent, 1,   1.0,   0.0,          1.0,          0.01,    0.0001,             100.0,             "%")
KF_CLASS_CONSTANTS(KFChannelUint32,             KFCurveInt,     1,   0.0,   0.0,          4294967295.0, 1.0,     1.0,                1.0,               "")
KF_CLASS_CONSTANTS(KFChannelUint16,             KFCurveInt,     1,   0.0,   0.0,          65535.0,      1.0,     1.0,                1.0,               "")
KF_CLASS_CONSTANTS(KFChannelBool,               KFCurveBool,    0,   0.0,   0.0,          1.0,          1.0,     1.0,                1.0,               "")
KF_CLASS_CONSTANTS(KFChannelSeed,               KFCurveEnum,    0,   0.0,   0.0,          4294967295.0, 1.0,     1.0,                1.0,               "")
KF_CLASS_CONSTANTS(KFChannelDecibel,            KFCurveDouble,  1,   0.0,   0.0,          4.0,          1.0,     0.1,                1.0,               "dB")
KF_CLASS_CONSTANTS(KFChannelFrame,              KFCurveDouble,  1,   0.0,   0.0,          100.0,        1.0,     0.01,               1.0,               "")
KF_CLASS_CONSTANTS(KFChannelTimecode,           KFCurveDouble,  1,   0.0,   0.0,          100.0,        1.0,     0.01,               1.0,               "")
KF_CLASS_CONSTANTS(KFChannelAspectRatio,        KFCurveDouble,  0,   1.0,   0.0,          3.0,          0.0001,  0.1,                1.0,               "")
KF_CLASS_CONSTANTS(KFChannelAspectRatioFootage, KFCurveDouble,  0,   1.0,   0.0,          3.0,          0.0001,  0.1,                1.0,               "")
KF_CLASS_CONSTANTS(KFChannelGammaFootage,       KFCurveDouble,  0,   0.0,   0.0,          3.0,          0.0001,  0.1,                1.0,               "")
KF_CLASS_CONSTANTS(KFChannelProgress,           KFCurveDouble,  0,   0.0,   0.0,          0.0,          1.0,     1.0,                1.0,               "")
// clang-format on

KF_DEFINE_SCALAR_CHANNEL(KFChannelDouble, "KWChannelDouble")
KF_DEFINE_SCALAR_CHANNEL(KFChannelAngle, "KWChannelAngle")
KF_DEFINE_SCALAR_CHANNEL(KFChannelShearAngle, "KWChannelShearAngle")
KF_DEFINE_SCALAR_CHANNEL(KFChannelUint32, "KWChannelUint32")
KF_DEFINE_SCALAR_CHANNEL(KFChannelUint16, "KWChannelUint16")
KF_DEFINE_SCALAR_CHANNEL(KFChannelSeed, "KWChannelSeed")
KF_DEFINE_SCALAR_CHANNEL(KFChannelDecibel, "KWChannelDecibel")
KF_DEFINE_SCALAR_CHANNEL(KFChannelFrame, "KWChannelFrame")
KF_DEFINE_SCALAR_CHANNEL(KFChannelTimecode, "KWChannelTimecode")
KF_DEFINE_SCALAR_CHANNEL(KFChannelAspectRatio, "KWChannelAspectRatio")
KF_DEFINE_SCALAR_CHANNEL(KFChannelAspectRatioFootage, "KWChannelAspectRatioFootage")
KF_DEFINE_SCALAR_CHANNEL(KFChannelGammaFootage, "KWChannelGammaFootage")

// --- More forms ---

KF_DEFINE_FACTORY_WITH_PARENT_FORM(KFChannelDouble, createKFChannelDoubleImpl(), )
KF_DEFINE_FACTORY_WITH_PARENT_FORM(KFChannelAngle, createKFChannelAngleImpl(), )
KF_DEFINE_VALUE_FORM(KFChannelDouble, double, createKFChannelDoubleImpl())
KF_DEFINE_VALUE_FORM(KFChannelAngle, double, createKFChannelAngleImpl())
KF_DEFINE_VALUE_FORM(KFChannelShearAngle, double, createKFChannelShearAngleImpl())

KFCurve* KFChannelDouble::createKFChannelDoubleCurve(double value) {
    return KFNewClassCurve<KFChannelDouble>(value);
}
KFCurve* KFChannelAngle::createKFChannelAngleCurve(double value) {
    return KFNewClassCurve<KFChannelAngle>(value);
}

// --- Several records for one class ---

namespace {

/// The record of a class at `Percent` hundredths.
template <class Channel, int Percent> class RecordAt final : public KFChannelImpl, public BXSingleton {
public:
    RecordAt()
        : KFChannelImpl(KFNewClassCurve<Channel>(Percent / 100.0), Percent / 100.0,
                        KFClassConstantsOf<Channel>::constants.curveType, true),
          BXSingleton(kClassRecordRank) {}
};

template <class Channel, int Percent> KFChannelImpl* recordAt() {
    return &BXSingletonInstance<RecordAt<Channel, Percent>>();
}

KFChannelImpl* percentRecordFor(double value) {
    constexpr double tolerance = 1e-7;
    if (std::fabs(value - 1.0) < tolerance)
        return KFChannelPercent::createKFChannelPercent100Impl();
    return std::fabs(value) < tolerance ? KFChannelPercent::createKFChannelPercent0Impl()
                                        : KFChannelPercent::createKFChannelPercent50Impl();
}

KFChannelImpl* boolRecordFor(int value) {
    return value != 0 ? KFChannelBool::createKFChannelBoolTrueImpl()
                      : KFChannelBool::createKFChannelBoolFalseImpl();
}

} // namespace

KFChannelImpl* KFChannelPercent::createKFChannelPercent100Impl() { return recordAt<KFChannelPercent, 100>(); }
KFChannelImpl* KFChannelPercent::createKFChannelPercent50Impl() { return recordAt<KFChannelPercent, 50>(); }
KFChannelImpl* KFChannelPercent::createKFChannelPercent0Impl() { return recordAt<KFChannelPercent, 0>(); }

KF_DEFINE_CLASS_INFO(KFChannelPercent)
KF_DEFINE_NAMED_FORM(KFChannelPercent, createKFChannelPercent100Impl(), )
KF_DEFINE_FACTORY_FORM(KFChannelPercent, createKFChannelPercent0Impl(), )
KF_DEFINE_FACTORY_WITH_PARENT_FORM(KFChannelPercent, createKFChannelPercent100Impl(), )
KF_DEFINE_VALUE_FORM(KFChannelPercent, double, percentRecordFor(value))
KF_DEFINE_COPIES_AND_NAME(KFChannelPercent, "KWChannelPercent", )

KFChannelImpl* KFChannelBool::createKFChannelBoolTrueImpl() { return recordAt<KFChannelBool, 100>(); }
KFChannelImpl* KFChannelBool::createKFChannelBoolFalseImpl() { return recordAt<KFChannelBool, 0>(); }
KFCurve* KFChannelBool::createKFChannelBoolCurve(double value) {
    return KFNewClassCurve<KFChannelBool>(value);
}

KF_DEFINE_CLASS_INFO(KFChannelBool)
KF_DEFINE_NAMED_FORM(KFChannelBool, createKFChannelBoolFalseImpl(), )
KF_DEFINE_FACTORY_FORM(KFChannelBool, createKFChannelBoolFalseImpl(), )
KF_DEFINE_FACTORY_WITH_PARENT_FORM(KFChannelBool, createKFChannelBoolFalseImpl(), )
KF_DEFINE_VALUE_FORM(KFChannelBool, int, boolRecordFor(value))
KF_DEFINE_COPIES_AND_NAME(KFChannelBool, "KWChannelBool", )

// --- Never saved ---

KF_DEFINE_CLASS_INFO(KFChannelProgress)
KF_DEFINE_CLASS_IMPL(KFChannelProgress)

KF_DEFINE_FACTORY_FORM(KFChannelProgress, createKFChannelProgressImpl(),
                       storeFlags(getFlags() | kChannelFlagNotSaved))
KF_DEFINE_FACTORY_WITH_PARENT_FORM(KFChannelProgress, createKFChannelProgressImpl(),
                                   storeFlags(getFlags() | kChannelFlagNotSaved))

KFChannelProgress::KFChannelProgress(BXString const& name, KFChannelFolder* parent, unsigned int id,
                                     unsigned int flags)
    : KFChannelProgress(getKFChannelProgress_FactoryBase(), name, parent, id, flags) {}
KFChannelProgress::KFChannelProgress(double, BXString const& name, KFChannelFolder* parent, unsigned int id,
                                     unsigned int flags, KFChannelImpl* impl, KFChannelInfo* info)
    : KFChannelProgress(getKFChannelProgress_FactoryBase(), name, parent, id, flags, impl, info) {}
KFChannelProgress::KFChannelProgress(KFChannelProgress const& other)
    : KFChannel(other), _hostOptions{other._hostOptions[0], other._hostOptions[1]} {
    storeFlags(getFlags() | kChannelFlagNotSaved);
}
KFChannelProgress::KFChannelProgress(KFChannelProgress const& other, KFChannelFolder* parent)
    : KFChannel(other, parent), _hostOptions{other._hostOptions[0], other._hostOptions[1]} {
    storeFlags(getFlags() | kChannelFlagNotSaved);
}
KFChannelProgress& KFChannelProgress::operator=(KFChannelProgress const& other) {
    KFChannelBase::operator=(other);
    return *this;
}
KFChannelProgress::~KFChannelProgress() = default;

char const* KFChannelProgress::getFacadeWrapperName() { return "KWChannelProgress"; }
KFChannelBase* KFChannelProgress::clone() const { return new KFChannelProgress(*this, nullptr); }

void KFChannelProgress::setHostOption(unsigned int index, bool on) noexcept {
    if (index < 2)
        _hostOptions[index] = on;
}
