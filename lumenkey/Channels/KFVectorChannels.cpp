#include "lumenkey/Channels/KFVectorChannels.h"

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/splines/KFInterpolation.h"

namespace {

enum ComponentID : unsigned int { kX = 1, kY = 2, kZ = 3 };

BXString nameOf(ComponentID id) {
    return BXString(BXStringKey(id == kX ? "Channel X" : id == kY ? "Channel Y" : "Channel Z"));
}

/// What `setValue` needs so that the value behind the processing nodes becomes `target`.
double offsetByBehaviors(KFChannel const& channel, Tempus const& t, double target) {
    double const delta = target - channel.getValueAsDouble(t, 0.0);
    return channel.getCurveValue(channel.globalToLocalTime(t), false) + delta;
}

void read(KFChannel const& channel, Tempus const& t, double input, double* value) {
    if (value != nullptr) {
        *value = channel.getValueAsDouble(t, input);
    }
}

bool isOn(KFChannel const& channel, Tempus const& t, double input) {
    return channel.getValueAsDouble(t, input) != 0.0;
}

void read(KFChannel const& channel, Tempus const& t, double input, bool* on) {
    if (on != nullptr) {
        *on = isOn(channel, t, input);
    }
}

void write(KFChannel& channel, Tempus const& t, bool on) { channel.setValue(t, on ? 1.0 : 0.0, false); }

// Keypoints in curve time ------------------------------------------------------------------------------------

/// On a local record, where handles are others than on the shared one. Null if locked or without a keypoint.
void* keypointToEdit(KFChannel& channel, Tempus const& t) {
    if (!channel.canModifyChannelData() || channel.getKeyframe(t) == nullptr) {
        return nullptr;
    }
    channel.createLocalChannelImplementation();
    return channel.getKeyframe(t);
}

void flatten(KFChannel& channel, Tempus const& t) {
    if (void* const handle = keypointToEdit(channel, t)) {
        channel.setKeyframeOutputTangents(handle, 0.0, 0.0, true);
        channel.setKeyframeInputTangents(handle, 0.0, 0.0, true);
        channel.setKeyframeTangentsBroken(handle, false);
    }
}

void setLinear(KFChannel& channel, Tempus const& t) {
    if (void* const handle = keypointToEdit(channel, t)) {
        channel.setKeyframeInterpolation(handle, kKFInterpolationLinear);
    }
}

struct Neighbour {
    bool exists = false;
    Tempus t = kTempusZero;
    double value = 0.0;
};

/// A component of a path around one of its points.
struct PathComponent {
    KFChannel& channel;
    double value;
    Neighbour previous{};
    Neighbour next{};
};

/// Keys the channel at its value if it has no keypoint there.
PathComponent keyedComponent(KFChannel& channel, Tempus const& t) {
    PathComponent component{channel, 0.0};
    if (!channel.getKeyframe(channel.getKeyframe(t), nullptr, &component.value)) {
        component.value = channel.getCurveValue(t, true);
        channel.setKeyframe(t, component.value, true);
    }
    Neighbour& previous = component.previous;
    Neighbour& next = component.next;
    previous.exists = channel.getPreviousKeyframe(t, &previous.t, &previous.value);
    next.exists = channel.getNextKeyframe(t, &next.t, &next.value);
    return component;
}

/// Where one of two components has a neighbour and the other has none, the other's is its value there. False if
/// neither has one.
bool pairUp(KFChannel const& a, Neighbour& ofA, KFChannel const& b, Neighbour& ofB) {
    if (ofA.exists && !ofB.exists) {
        ofB.value = b.getCurveValue(ofA.t, true);
    } else if (ofB.exists && !ofA.exists) {
        ofA.value = a.getCurveValue(ofB.t, true);
    }
    return ofA.exists || ofB.exists;
}

/// The value part of the handles of a path that passes its point parallel to the line through the neighbours, or
/// towards the only one there is.
double handleRise(PathComponent const& component, bool hasPrevious, bool hasNext) {
    double const from = hasPrevious ? component.previous.value : component.value;
    double const to = hasNext ? component.next.value : component.value;
    return (to - from) / (hasPrevious && hasNext ? 6.0 : 3.0);
}

void setHandleRise(KFChannel& channel, Tempus const& t, double rise) {
    void* const handle = keypointToEdit(channel, t);
    if (handle == nullptr) {
        return;
    }
    double width = 0.0;
    channel.getKeyframeOutputTangents(handle, &width, nullptr, true);
    channel.setKeyframeOutputTangents(handle, width, rise, true);
    channel.getKeyframeInputTangents(handle, &width, nullptr, true);
    channel.setKeyframeInputTangents(handle, width, -rise, true);
}

} // namespace

// KFChannel2D -------------------------------------------------------------------------------------------------

KFChannel2D::KFChannel2D(BXString const& name, KFChannelFolder* parent, unsigned int id, unsigned int flags,
                         unsigned int capacity, KFChannelImpl* impl, KFChannelInfo* info)
    : KFChannel2D(getKFChannel2D_FactoryBase(), name, parent, id, flags, capacity, impl, info) {}

KFChannel2D::KFChannel2D(BXString const& xName, BXString const& yName, BXString const& name,
                         KFChannelFolder* parent, unsigned int id, unsigned int flags, unsigned int capacity,
                         KFChannelImpl* impl, KFChannelInfo* info)
    : KFCompoundChannel(getKFChannel2D_FactoryBase(), name, parent, id, flags, false, capacity),
      x(xName, this, kX, 0, impl, info),
      y(yName, this, kY, 0, KFChannelImpl::sharedOrCopied(impl), KFChannelInfo::sharedOrCopied(info)) {}

KFChannel2D::KFChannel2D(KFFactory* factory, BXString const& name, unsigned int id, unsigned int capacity,
                         KFChannelImpl* impl, KFChannelInfo* info)
    : KFCompoundChannel(factory, name, id, capacity), x(nameOf(kX), this, kX, 0, impl, info),
      y(nameOf(kY), this, kY, 0, KFChannelImpl::sharedOrCopied(impl), KFChannelInfo::sharedOrCopied(info)) {}

KFChannel2D::KFChannel2D(KFFactory* factory, BXString const& name, KFChannelFolder* parent, unsigned int id,
                         unsigned int flags, unsigned int capacity, KFChannelImpl* impl, KFChannelInfo* info)
    : KFCompoundChannel(factory, name, parent, id, flags, false, capacity),
      x(nameOf(kX), this, kX, 0, impl, info),
      y(nameOf(kY), this, kY, 0, KFChannelImpl::sharedOrCopied(impl), KFChannelInfo::sharedOrCopied(info)) {}

KFChannel2D::KFChannel2D(KFChannel2D const& other) : KFChannel2D(other, nullptr) {}

KFChannel2D::KFChannel2D(KFChannel2D const& other, KFChannelFolder* parent)
    : KFCompoundChannel(other, parent), x(other.x, this), y(other.y, this) {}

KFChannel2D::~KFChannel2D() = default;

char const* KFChannel2D::getFacadeWrapperName() { return "KWChannel2D"; }

KFChannelBase* KFChannel2D::clone() const { return new KFChannel2D(*this, nullptr); }

void KFChannel2D::copy(KFChannelBase const* other, bool silent) {
    KFCompoundChannel::copy(other, silent);
    if (auto const* const source = dynamic_cast<KFChannel2D const*>(other)) {
        x.KFChannel::copy(&source->x, silent);
        y.KFChannel::copy(&source->y, silent);
    }
}

void KFChannel2D::flattenAtTime(Tempus const& t) {
    flatten(x, t);
    flatten(y, t);
}

void KFChannel2D::setLinearAtTime(Tempus const& t) {
    setLinear(x, t);
    setLinear(y, t);
}

void KFChannel2D::deriveChannel(Tempus const& t) {
    PathComponent ofX = keyedComponent(x, t);
    PathComponent ofY = keyedComponent(y, t);
    bool const hasPrevious = pairUp(x, ofX.previous, y, ofY.previous);
    bool const hasNext = pairUp(x, ofX.next, y, ofY.next);
    for (PathComponent const* component : {&ofX, &ofY}) {
        if (void* const handle = keypointToEdit(component->channel, t)) {
            component->channel.deriveKeyframe(handle);
        }
    }
    if (hasPrevious || hasNext) {
        setHandleRise(x, t, handleRise(ofX, hasPrevious, hasNext));
        setHandleRise(y, t, handleRise(ofY, hasPrevious, hasNext));
    }
}

void KFChannel2D::setValue(Tempus const& t, double xValue, double yValue, bool silent) {
    x.setValue(t, xValue, silent);
    y.setValue(t, yValue, silent);
}

void KFChannel2D::setValueOffsetByBehaviors(Tempus const& t, double xValue, double yValue) {
    double const newX = offsetByBehaviors(x, t, xValue);
    double const newY = offsetByBehaviors(y, t, yValue);
    x.setValue(t, newX, false);
    y.setValue(t, newY, false);
}

// KFChannel3D -------------------------------------------------------------------------------------------------

KFChannel3D::KFChannel3D(BXString const& name, KFChannelFolder* parent, unsigned int id, unsigned int flags,
                         unsigned int capacity, KFChannelImpl* impl, KFChannelInfo* info)
    : KFChannel3D(getKFChannel3D_FactoryBase(), name, parent, id, flags, capacity, impl, info) {}

KFChannel3D::KFChannel3D(KFFactory* factory, BXString const& name, unsigned int id, unsigned int capacity,
                         KFChannelImpl* impl, KFChannelInfo* info)
    : KFChannel2D(factory, name, id, capacity, impl, info),
      z(nameOf(kZ), this, kZ, 0, KFChannelImpl::sharedOrCopied(impl), KFChannelInfo::sharedOrCopied(info)) {}

KFChannel3D::KFChannel3D(KFFactory* factory, BXString const& name, KFChannelFolder* parent, unsigned int id,
                         unsigned int flags, unsigned int capacity, KFChannelImpl* impl, KFChannelInfo* info)
    : KFChannel2D(factory, name, parent, id, flags, capacity, impl, info),
      z(nameOf(kZ), this, kZ, 0, KFChannelImpl::sharedOrCopied(impl), KFChannelInfo::sharedOrCopied(info)) {}

KFChannel3D::KFChannel3D(KFChannel3D const& other) : KFChannel3D(other, nullptr) {}

KFChannel3D::KFChannel3D(KFChannel3D const& other, KFChannelFolder* parent)
    : KFChannel2D(other, parent), z(other.z, this) {}

KFChannel3D::~KFChannel3D() = default;

char const* KFChannel3D::getFacadeWrapperName() { return "KWChannel3D"; }

KFChannelBase* KFChannel3D::clone() const { return new KFChannel3D(*this, nullptr); }

void KFChannel3D::copy(KFChannelBase const* other, bool silent) {
    KFChannel2D::copy(other, silent);
    if (auto const* const source = dynamic_cast<KFChannel3D const*>(other)) {
        z.KFChannel::copy(&source->z, silent);
    }
}

void KFChannel3D::simplify(double, double, double, unsigned int, bool) {}

void KFChannel3D::deriveChannel(Tempus const&) {}

void KFChannel3D::setValue(Tempus const& t, double xValue, double yValue, double zValue) {
    KFChannel2D::setValue(t, xValue, yValue, false);
    z.setValue(t, zValue, false);
}

void KFChannel3D::setValueOffsetByBehaviors(Tempus const& t, double xValue, double yValue, double zValue) {
    double const newX = offsetByBehaviors(x, t, xValue);
    double const newY = offsetByBehaviors(y, t, yValue);
    double const newZ = offsetByBehaviors(z, t, zValue);
    KFChannel3D::setValue(t, newX, newY, newZ);
}

void KFChannel3D::getValue(Tempus const& t, double* xValue, double* yValue, double* zValue,
                           double input) const {
    read(x, t, input, xValue);
    read(y, t, input, yValue);
    read(z, t, input, zValue);
}

// KFChannelBool3D ---------------------------------------------------------------------------------------------

KFChannelBool3D::KFChannelBool3D(BXString const& name, KFChannelFolder* parent, unsigned int id,
                                 unsigned int flags, unsigned int capacity, KFChannelImpl* impl,
                                 KFChannelInfo* info)
    : KFChannelBool3D(getKFChannelBool3D_FactoryBase(), name, parent, id, flags, capacity, impl, info) {}

KFChannelBool3D::KFChannelBool3D(KFFactory* factory, BXString const& name, unsigned int id,
                                 unsigned int capacity, KFChannelImpl* impl, KFChannelInfo* info)
    : KFCompoundChannel(factory, name, id, capacity), x(nameOf(kX), this, kX, 0, impl, info),
      y(nameOf(kY), this, kY, 0, KFChannelImpl::sharedOrCopied(impl), KFChannelInfo::sharedOrCopied(info)),
      z(nameOf(kZ), this, kZ, 0, KFChannelImpl::sharedOrCopied(impl), KFChannelInfo::sharedOrCopied(info)) {}

KFChannelBool3D::KFChannelBool3D(KFFactory* factory, BXString const& name, KFChannelFolder* parent,
                                 unsigned int id, unsigned int flags, unsigned int capacity,
                                 KFChannelImpl* impl, KFChannelInfo* info)
    : KFCompoundChannel(factory, name, parent, id, flags, false, capacity),
      x(nameOf(kX), this, kX, 0, impl, info),
      y(nameOf(kY), this, kY, 0, KFChannelImpl::sharedOrCopied(impl), KFChannelInfo::sharedOrCopied(info)),
      z(nameOf(kZ), this, kZ, 0, KFChannelImpl::sharedOrCopied(impl), KFChannelInfo::sharedOrCopied(info)) {}

KFChannelBool3D::KFChannelBool3D(KFChannelBool3D const& other) : KFChannelBool3D(other, nullptr) {}

KFChannelBool3D::KFChannelBool3D(KFChannelBool3D const& other, KFChannelFolder* parent)
    : KFCompoundChannel(other, parent), x(other.x, this), y(other.y, this), z(other.z, this) {}

KFChannelBool3D::~KFChannelBool3D() = default;

char const* KFChannelBool3D::getFacadeWrapperName() { return "KWChannelBool3D"; }

KFChannelBase* KFChannelBool3D::clone() const { return new KFChannelBool3D(*this, nullptr); }

void KFChannelBool3D::copy(KFChannelBase const* other, bool silent) {
    KFCompoundChannel::copy(other, silent);
    if (auto const* const source = dynamic_cast<KFChannelBool3D const*>(other)) {
        x.KFChannel::copy(&source->x, silent);
        y.KFChannel::copy(&source->y, silent);
        z.KFChannel::copy(&source->z, silent);
    }
}

bool KFChannelBool3D::getX(Tempus const& t, double input) const { return isOn(x, t, input); }
bool KFChannelBool3D::getY(Tempus const& t, double input) const { return isOn(y, t, input); }
bool KFChannelBool3D::getZ(Tempus const& t, double input) const { return isOn(z, t, input); }

void KFChannelBool3D::getValue(Tempus const& t, bool* xOn, bool* yOn, bool* zOn, double input) const {
    read(x, t, input, xOn);
    read(y, t, input, yOn);
    read(z, t, input, zOn);
}

void KFChannelBool3D::getValue(Tempus const& t, BXVector3<double>* value, double input) const {
    if (value != nullptr) {
        *value = {getX(t, input) ? 1.0 : 0.0, getY(t, input) ? 1.0 : 0.0, getZ(t, input) ? 1.0 : 0.0};
    }
}

void KFChannelBool3D::setX(Tempus const& t, bool on) { write(x, t, on); }
void KFChannelBool3D::setY(Tempus const& t, bool on) { write(y, t, on); }
void KFChannelBool3D::setZ(Tempus const& t, bool on) { write(z, t, on); }

void KFChannelBool3D::setValue(Tempus const& t, bool xOn, bool yOn, bool zOn) {
    setX(t, xOn);
    setY(t, yOn);
    setZ(t, zOn);
}

void KFChannelBool3D::setValue(Tempus const& t, BXVector3<double> const& value) {
    setValue(t, value.x != 0.0, value.y != 0.0, value.z != 0.0);
}

void KFChannelBool3D::setDefaultValue(bool xOn, bool yOn, bool zOn) {
    x.setDefaultValue(xOn ? 1.0 : 0.0);
    y.setDefaultValue(yOn ? 1.0 : 0.0);
    z.setDefaultValue(zOn ? 1.0 : 0.0);
}
