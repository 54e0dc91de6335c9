// Classes of a host, derived from the installed ones. Each overrides operations from the beginning, the middle and
// the end of its table, so that a slot that moves is noticed.

#include "plugin.h"

namespace {

PluginJournal lastAsked = "";

void note(char const* operation) { lastAsked = operation; }

class HostRoot : public KFChannelObjectRootBase {
public:
    HostRoot() : KFChannelObjectRootBase("Host", nullptr, 1, 0, 0) {}

    unsigned int getInstanceID() const override { return note("getInstanceID"), 1; }
    void finishInitializing() override { note("finishInitializing"); }
    void copy(KFChannelBase const*, bool) override { note("copy"); }
    Tempus getTimeOffset() const override { return note("getTimeOffset"), TempusMake(1, 2); }
    bool hasBeenModified(bool*) override { return note("hasBeenModified"), true; }
    bool hasKeypoints(unsigned int) const override { return note("hasKeypoints"), false; }
    bool shouldIgnoreDynamicIDs() const override { return note("shouldIgnoreDynamicIDs"), false; }
    void resetTimeIndependentFlagIfNeeded(bool, bool) override { note("resetTimeIndependentFlagIfNeeded"); }
    BXTimeRange getTimeExtent() const override { return note("getTimeExtent"), BXTimeRange{}; }
    void willModifyChannel(KFChannelBase*, unsigned int) override { note("willModifyChannel"); }
    bool checkSolo() override { return note("checkSolo"), false; }
    Tempus getFrameDuration() const override { return note("getFrameDuration"), TempusMake(1, 25); }
};

class HostChannel : public KFChannelDouble {
public:
    HostChannel() : KFChannelDouble("Value", nullptr, 2, 0) {}

    void willBeModified(unsigned int) override { note("willBeModified"); }
    void parentWillBeModified(unsigned int) override { note("parentWillBeModified"); }
    double getSliderMax() const override { return note("getSliderMax"), 7.0; }
    unsigned int getNumberOfKeyframes() const override { return note("getNumberOfKeyframes"), 0; }
    bool moveKeyframe(void*, Tempus const&, bool, bool) override { return note("moveKeyframe"), true; }
};

class HostNode : public KFCurveNode {
public:
    double solveNode(Tempus const&, double, double input) override { return note("solveNode"), 2 * input; }
    void solveNode(KFCurveNodeParam& param) override {
        for (std::uint32_t i = 0; i < param.outputCount; ++i) {
            param.outputValues[i] = 2 * param.inputValues[i];
        }
    }
    bool getUForValue(double, std::vector<Tempus>&, BXTimeRange&, Tempus&, std::uint32_t) override {
        return note("getUForValue"), false;
    }
    void getNeededRange(KFCurveNodeParam* param) override { param->needSameRange(); }
    KFCurveNode* cloneNode() const override { return new HostNode(*this); }
    bool compare(KFCurveNode const*) const override { return note("compare"), false; }
    bool isPointToPoint() const override { return note("isPointToPoint"), true; }
    void reset() override { note("reset"); }
};

class HostVisitor : public KFChannelSegmentVisitor {
public:
    void visitConstant(double, Tempus const&, Tempus const&) override { note("visitConstant"); }
    void visitEase(KFSpline&, void*, void*, Tempus const&, Tempus const&, Tempus const&, Tempus const&,
                   double) override {
        note("visitEase");
    }
    void visitLogarithmic(KFSpline&, void*, void*, Tempus const&, Tempus const&, Tempus const&, Tempus const&,
                          double) override {
        note("visitLogarithmic");
    }
};

template <class Result, class... Arguments>
void callAs(void* object, unsigned int slot, Arguments... arguments) {
    using Operation = Result (*)(void*, Arguments...);
    auto const* const table = *static_cast<Operation* const*>(object);
    table[slot](object, arguments...);
}

template <class Result> void callInto(Result& result, void* object, unsigned int slot) {
    using Operation = Result* (*)(Result*, void*);
    (*static_cast<Operation* const*>(object))[slot](&result, object);
}

Tempus const zero = kTempusZero;

HostRoot root;
HostChannel channel;
HostNode node;
HostVisitor visitor;

PluginInterface makeInterface() {
    auto const onNothing = [](void* object, unsigned int slot) { callAs<void>(object, slot); };
    auto const onPointers = [](void* object, unsigned int slot) {
        callAs<bool, void*, void*>(object, slot, nullptr, nullptr);
    };
    auto const onKind = [](void* object, unsigned int slot) {
        callAs<void, unsigned int>(object, slot, kModifyData);
    };
    // A result in memory: its address comes first.
    auto const answersTime = [](void* object, unsigned int slot) {
        Tempus result;
        callInto(result, object, slot);
    };
    auto const answersRange = [](void* object, unsigned int slot) {
        BXTimeRange result;
        callInto(result, object, slot);
    };
    auto const movesKeyframe = [](void* object, unsigned int slot) {
        callAs<bool, void*, Tempus const*, bool, bool>(object, slot, nullptr, &zero, false, false);
    };
    auto const solves = [](void* object, unsigned int slot) {
        callAs<double, Tempus const*, double, double>(object, slot, &zero, 0.0, 1.0);
    };
    auto const asksForTimes = [](void* object, unsigned int slot) {
        callAs<bool, double, void*, void*, void*, unsigned>(object, slot, 0, nullptr, nullptr, nullptr, 0);
    };

    auto const visitsConstant = [](void* object, unsigned int slot) {
        callAs<void, double, Tempus const*, Tempus const*>(object, slot, 0.0, &zero, &zero);
    };
    auto const visitsPiece = [](void* object, unsigned int slot) {
        callAs<void, void*, void*, void*, Tempus const*, Tempus const*, Tempus const*, Tempus const*, double>(
            object, slot, nullptr, nullptr, nullptr, &zero, &zero, &zero, &zero, 0.0);
    };

    // The destructors of channels are slots 0 and 1.
    std::vector<PluginSlot> const slots = {
        {"getInstanceID", 7, &root, onNothing},
        {"finishInitializing", 10, &root, onNothing},
        {"copy", 29, &root, onPointers},
        {"getTimeOffset", 40, &root, answersTime},
        {"willBeModified", 58, &channel, onKind},
        {"hasBeenModified", 59, &root, onPointers},
        {"hasKeypoints", 69, &root, onKind},
        {"shouldIgnoreDynamicIDs", 87, &root, onNothing},
        {"resetTimeIndependentFlagIfNeeded", 88, &root, onPointers},
        {"getTimeExtent", 89, &root, answersRange},
        {"willModifyChannel", 97, &root, onPointers},
        {"checkSolo", 99, &root, onNothing},
        {"getFrameDuration", 110, &root, answersTime},
        {"parentWillBeModified", 88, &channel, onKind},
        {"getSliderMax", 101, &channel, onNothing},
        {"getNumberOfKeyframes", 104, &channel, onNothing},
        {"moveKeyframe", 105, &channel, movesKeyframe},
        {"solveNode", 2, &node, solves},
        {"getUForValue", 4, &node, asksForTimes},
        {"compare", 17, &node, onPointers},
        {"isPointToPoint", 22, &node, onNothing},
        {"reset", 25, &node, onNothing},
        {"visitConstant", 2, &visitor, visitsConstant},
        {"visitEase", 8, &visitor, visitsPiece},
        {"visitLogarithmic", 12, &visitor, visitsPiece},
    };
    return {slots, &lastAsked, &root, &channel, [] { return static_cast<KFCurveNode*>(new HostNode()); }};
}

} // namespace

extern "C" __attribute__((visibility("default"))) PluginInterface const* lumenkeyPluginSlots() {
    static PluginInterface const made = makeInterface();
    return &made;
}
