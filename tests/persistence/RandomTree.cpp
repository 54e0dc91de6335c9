#include "tests/persistence/RandomTree.h"

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/Channels/KFFactory.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineState.h"
#include "lumenkey/splines/KFVertex.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <limits>

namespace {

using Random = std::mt19937_64;

std::uint64_t below(Random& random, std::uint64_t end) { return random() % end; }
bool oneIn(Random& random, std::uint64_t n) { return below(random, n) == 0; }

/// What a document of its own would not give back: class, initialisation, and children that it leaves out.
constexpr KFChannelFlags kFixedFlags = kChannelFlagIsFolder | kChannelFlagIsObjectRoot |
                                       kChannelFlagNotSaved | kChannelFlagNameUnset | kChannelFlagLocked;

/// Either part of a handle is far above what is too small to be written.
double handlePart(Random& random) {
    double const part = std::ldexp(static_cast<double>(random() >> 11), -50);
    return part + 1e-3;
}

void addKeypoints(Random& random, KFChannel& channel) {
    KFCurve& curve = *channel.createLocalChannelImplementation()->getCurve();
    constexpr std::uint32_t kTypes[] = {0, 1, 4, 6, 7, 8, 10, 12, 13, 14, 15, 16, 17, 18, 19, 20, 21, 99};
    std::vector<Tempus> times;
    for (std::uint64_t i = below(random, 6) + 1; i > 0; --i)
        times.push_back(randomTime(random));
    std::sort(times.begin(), times.end());
    for (Tempus const& time : times) {
        curve.appendKeypointNoTangents(time, randomNumber(random), true);
        if (curve.getSpline() == nullptr)
            return; // takes no keypoints
        void* const handle = curve.getSpline()->getLastVertex();
        curve.setKeypointInterpolation(handle, kTypes[below(random, std::size(kTypes))], true);
        curve.setKeypointBiasLinear(handle, oneIn(random, 2) ? 1.0 : handlePart(random));
        if (oneIn(random, 3))
            curve.setKeypointNormal(handle, handlePart(random), true);
        if (oneIn(random, 2))
            curve.setKeypointInputNormalizedTangents(handle, -handlePart(random), handlePart(random), true);
        if (oneIn(random, 2)) {
            curve.setKeypointOutputNormalizedTangents(handle, handlePart(random), -handlePart(random), true);
            bool const keepsHandles = curve.isCurveDeriveTangents();
            if (keepsHandles && oneIn(random, 2))
                curve.enableKeypoint(handle, false, true);
        }
        curve.setKeypointFlags(handle, static_cast<std::uint32_t>(random()) & ~0x20U, true);
    }
    if (oneIn(random, 6))
        curve.closeCurve();
}

/// They may have crossed, also infinitely far. Where a class has none they may be infinite too; that others
/// are taken off, no document tells.
void setLimits(Random& random, KFCurve& curve) {
    constexpr double kNone = std::numeric_limits<double>::max();
    double classMin = 0.0;
    double classMax = 0.0;
    curve.getAbsoluteMinValueV(&classMin);
    curve.getAbsoluteMaxValueV(&classMax);
    double const sign = oneIn(random, 4) ? -1 : 1;
    double const low = oneIn(random, 4) ? HUGE_VAL : 1e6 * handlePart(random);
    double const high = oneIn(random, 4) ? HUGE_VAL : 1e6 * handlePart(random);
    if (sign < 0 || std::isfinite(low) || classMin == -kNone)
        curve.setAbsoluteMinValueV(-sign * low);
    if (sign < 0 || std::isfinite(high) || classMax == kNone)
        curve.setAbsoluteMaxValueV(sign * high);
}

void fillChannel(Random& random, KFChannel& channel) {
    KFCurve& curve = *channel.createLocalChannelImplementation()->getCurve();
    curve.setCurveDefaultValue(randomNumber(random));
    curve.setCurveInitialValue(randomNumber(random));
    if (oneIn(random, 3))
        channel.setParametric(true);
    if (oneIn(random, 3))
        channel.setDiscrete(false, false);
    curve.setRetimingExtrapolation(oneIn(random, 3));
    curve.setCurveExtrapolation(static_cast<std::uint32_t>(below(random, 7)), 0);
    curve.setCurveExtrapolation(static_cast<std::uint32_t>(below(random, 7)), 1);
    if (!curve.isCurveBoolean() && oneIn(random, 3))
        setLimits(random, curve);
    if (oneIn(random, 3)) {
        channel.setFadeInOffset(TempusAbsoluteValue(randomTime(random)), false);
        channel.setFadeOutCurve(static_cast<unsigned>(below(random, 4)));
    }
    if (oneIn(random, 2))
        addKeypoints(random, channel);
}

/// All classes that can be made, in one order everywhere.
std::vector<KFChannelFactory*> const& factoriesThatMake() {
    static std::vector<KFChannelFactory*> const all = [] {
        std::vector<KFChannelFactory*> makers;
        for (auto const& [uuid, factory] : KFFactories::getInstance().factories()) {
            auto* const maker = dynamic_cast<KFChannelFactory*>(factory);
            std::unique_ptr<KFChannelBase> const made(maker == nullptr ? nullptr
                                                                       : maker->createChannel("", 1));
            if (made != nullptr)
                makers.push_back(maker);
        }
        return makers;
    }();
    return all;
}

void fillFolder(Random& random, KFChannelFolder& folder, int depth);

void fill(Random& random, KFChannelBase& channel, int depth) {
    if (auto* const value = dynamic_cast<KFChannel*>(&channel))
        fillChannel(random, *value);
    if (auto* const root = dynamic_cast<KFChannelObjectRootBase*>(&channel)) {
        root->setTimeOffset(randomTime(random), true);
        root->setTimeExtent({randomTime(random), TempusAbsoluteValue(randomTime(random))}, true);
    }
    if (auto* const folder = dynamic_cast<KFChannelFolder*>(&channel))
        fillFolder(random, *folder, depth);
    channel.setFlags((channel.getFlags() & kFixedFlags & ~kChannelFlagNotSaved) | (random() & ~kFixedFlags));
    if (oneIn(random, 4))
        channel.lock(true, false);
}

void fillFolder(Random& random, KFChannelFolder& folder, int depth) {
    folder.setFoldFlags(static_cast<std::uint32_t>(random()) & ~(kFoldFlagChildrenNotSaved | 0x2220000U));
    if (folder.isCompoundChannel()) {
        if (folder.getDescendants() == nullptr)
            return;
        for (KFChannelBase* const component : *folder.getDescendants())
            fill(random, *component, depth + 1);
        return;
    }
    unsigned id = 1;
    for (std::uint64_t i = depth < 4 ? below(random, 6) : 0; i > 0; --i) {
        auto const& makers = factoriesThatMake();
        KFChannelBase* const child = makers[below(random, makers.size())]->createChannel(
            BXString(randomName(random)), id += static_cast<unsigned>(below(random, 1000)) + 1);
        folder.push_back(child);
        fill(random, *child, depth + 1);
    }
}

} // namespace

void deleteBelow(KFChannelFolder& folder) {
    if (folder.isCompoundChannel() || folder.getDescendants() == nullptr)
        return;
    std::vector<KFChannelBase*> const children = *folder.getDescendants();
    folder.removeAllDescendants(true);
    for (KFChannelBase* const child : children) {
        if (auto* const below = dynamic_cast<KFChannelFolder*>(child))
            deleteBelow(*below);
        delete child;
    }
}

double randomNumber(Random& random) {
    switch (below(random, 6)) {
    case 0:
        return oneIn(random, 2) ? 0.0 : -0.0;
    case 1:
        return static_cast<double>(static_cast<std::int64_t>(below(random, 2001)) - 1000);
    case 2:
        return static_cast<double>(random() >> 11) * 0x1p-53;
    default:
        break;
    }
    double const any = std::bit_cast<double>(random());
    return std::isnan(any) ? -0.0 : oneIn(random, 10) ? std::copysign(HUGE_VAL, any) : any;
}

Tempus randomTime(Random& random) {
    constexpr std::int32_t kTimescales[] = {1, 24, 30, 600, 24000, 30000, 60000, 0x40000, 2147483647};
    Tempus time = TempusMake(static_cast<std::int64_t>(below(random, 2000000)) - 1000000,
                             kTimescales[below(random, std::size(kTimescales))]);
    if (oneIn(random, 8))
        time.flags |= kTempusFlagHasBeenRounded;
    if (oneIn(random, 20))
        time.epoch = static_cast<std::int64_t>(random());
    return time;
}

std::string randomName(Random& random) {
    constexpr char const* kPieces[] = {"Size",
                                       " ",
                                       "Gr\u00F6\u00DFe",
                                       "\xE5\xA4\xA7\xE3\x81\x8D\xE3\x81\x95",
                                       "\n",
                                       "\t",
                                       "\r",
                                       "<&>\"'",
                                       "\\x41",
                                       "\\",
                                       "\xFF",
                                       "\x01",
                                       "]]>",
                                       "\xEF\xBF\xBE",
                                       "\xF0\x9F\x8E\xA5",
                                       "."};
    std::string name;
    for (std::uint64_t i = below(random, 5); i > 0; --i)
        name += kPieces[below(random, std::size(kPieces))];
    if (oneIn(random, 10))
        name += '\0';
    return name;
}

OwnedTree randomTree(std::uint64_t seed) {
    Random random(seed);
    OwnedTree tree(
        new KFChannelObjectRootBase("Root", nullptr, static_cast<unsigned>(below(random, 100)), 0, 0));
    fill(random, *tree, 0);
    return tree;
}

std::string documentOf(KFChannelBase& channel, bool children, bool all) {
    BXData const data = channel.createChannelState(children, all);
    return {data.begin(), data.end()};
}

bool readDocument(KFChannelBase& channel, std::string const& text) {
    return channel.configureWithState(BXData(text.begin(), text.end()));
}
