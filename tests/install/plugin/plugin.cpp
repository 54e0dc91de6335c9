// Classes of a host, derived from the installed ones.

#include "plugin.h"

namespace {

class HostRoot : public KFChannelObjectRootBase {
public:
    HostRoot() : KFChannelObjectRootBase("Host", nullptr, 1, 0, 0) {}

    Tempus getTimeOffset() const override { return TempusMake(1, 2); }
    Tempus getFrameDuration() const override { return TempusMake(1, 25); }
};

class HostChannel : public KFChannelDouble {
public:
    HostChannel() : KFChannelDouble("Value", nullptr, 2, 0) {}

    double getSliderMax() const override { return 7.0; }
};

class HostNode : public KFCurveNode {
public:
    double solveNode(Tempus const&, double, double input) override { return 2 * input; }
    void solveNode(KFCurveNodeParam& param) override {
        for (std::uint32_t i = 0; i < param.outputCount; ++i) {
            param.outputValues[i] = 2 * param.inputValues[i];
        }
    }
    bool getUForValue(double, std::vector<Tempus>&, BXTimeRange&, Tempus&, std::uint32_t) override {
        return false;
    }
    void getNeededRange(KFCurveNodeParam* param) override { param->needSameRange(); }
    KFCurveNode* cloneNode() const override { return new HostNode(*this); }
    bool compare(KFCurveNode const*) const override { return false; }
};

class HostVisitor : public KFChannelSegmentVisitor {
public:
    void visitConstant(double value, Tempus const&, Tempus const&) override { last = value; }
    double last = 0.0;
};

} // namespace

extern "C" __attribute__((visibility("default"))) PluginInterface const* lumenkeyPlugin() {
    static HostRoot root;
    static HostChannel channel;
    static HostVisitor visitor;
    static PluginInterface const made{
        &root, &channel, [] { return static_cast<KFCurveNode*>(new HostNode()); }, &visitor, &visitor.last};
    return &made;
}
