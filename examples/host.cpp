// A small host, piece by piece as docs/host-guide.md tells it: a root of its own that announces changes into an undo
// list, a behaviour as a processing node, and a second thread that evaluates while this one edits keypoints.

#include "lumenkey/lumenkey.h"

#include <atomic>
#include <cmath>
#include <iostream>
#include <memory>
#include <string>
#include <thread>
#include <vector>

// [root]
/// An object of the host. Every change of a channel below is announced here, before it is made.
class Layer : public KFChannelObjectRootBase {
public:
    explicit Layer(char const* name) : KFChannelObjectRootBase(name, nullptr, 1, 0, 0) {}

    /// One step that can be undone: a copy of the channel as it was.
    struct UndoStep {
        KFChannelBase* channel;
        std::unique_ptr<KFChannelBase> before;
    };

    void willModifyChannel(KFChannelBase* channel, unsigned int kind) override {
        if (_undoing || (kind & kModifyData) == 0) {
            return;
        }
        _undo.push_back({channel, std::unique_ptr<KFChannelBase>(channel->clone())});
    }

    /// Takes the last change back; false when there is none.
    bool undo() {
        if (_undo.empty()) {
            return false;
        }
        UndoStep const step = std::move(_undo.back());
        _undo.pop_back();
        _undoing = true; // taking a change back is announced like any other
        step.channel->copy(step.before.get(), false);
        _undoing = false;
        return true;
    }

    /// The first value set while animating leaves the old one at the start of the layer.
    bool shouldAddKeypointAt0(Tempus const& t) override { return t > getTimeExtent().start; }

    Tempus getFrameDuration() const override { return TempusMake(1, 24); }

    std::size_t undoSteps() const { return _undo.size(); }

private:
    std::vector<UndoStep> _undo;
    bool _undoing = false;
};
// [root]

// [node]
/// A behaviour: swings around the value that comes in. Nodes run behind the keypoints, in the order of the chain.
class Swing : public KFCurveNode {
public:
    explicit Swing(double amount) : _amount(amount) {}

    double solveNode(Tempus const& t, double, double input) override {
        return input + _amount * std::sin(TempusGetSeconds(t) * 6.283185307179586);
    }
    /// The same for a row of samples, in place.
    void solveNode(KFCurveNodeParam& param) override {
        Tempus t = param.outputStart;
        for (std::uint32_t i = 0; i < param.outputCount; ++i) {
            param.outputValues[i] = solveNode(t, param.operand, param.inputValues[i]);
            t = BX_TempusSaferAdd(t, param.outputStep);
        }
    }
    void getNeededRange(KFCurveNodeParam* param) override { param->needSameRange(); }
    bool getUForValue(double, std::vector<Tempus>&, BXTimeRange&, Tempus&, std::uint32_t) override {
        return false;
    }
    KFCurveNode* cloneNode() const override { return new Swing(*this); }
    bool compare(KFCurveNode const* other) const override {
        auto const* const swing = dynamic_cast<Swing const*>(other);
        return swing != nullptr && swing->_amount == _amount;
    }

private:
    double _amount;
};
// [node]

static bool check(bool condition, char const* what) {
    std::cout << (condition ? "yes: " : "NO: ") << what << '\n';
    return condition;
}

int main() {
    bool good = true;

    // [tree]
    Layer layer("Layer");
    layer.setTimeExtent({kTempusZero, TempusMake(10, 1)}, true);
    KFChannelFolder transform("Transform", &layer, 1, 0, 0);
    KFChannelDouble x("X", &transform, 1, 0);
    KFChannelAngle rotation("Rotation", &transform, 2, 0);
    layer.finishInitializing();
    // [tree]

    // [edit]
    KFCoreGlobals::getInstance().animate = true;
    x.setValue(TempusMake(2, 1), 100.0, false);
    KFCoreGlobals::getInstance().animate = false;
    // [edit]
    good &= check(x.getNumberOfKeyframes() == 2, "the old value stays at the start of the layer");
    good &= check(layer.undoSteps() == 1, "the change went into the undo list");

    // [behaviour]
    rotation.appendCurveProcessingNode(new Swing(0.25)); // the curve owns it now
    // [behaviour]
    good &= check(std::abs(rotation.getValueAsDouble(TempusMake(1, 4), 0.0) - 0.25) < 1e-12,
                  "the behaviour swings");
    good &=
        check(rotation.getCurveValue(TempusMake(1, 4), false) == 0.0, "the keypoints below it are untouched");

    // [threads]
    // The keypoints of a channel may be edited while others read it: each read sees the curve before or after an
    // edit. What must not run beside reads is creating the first keypoint, deleting the last, and changing the chain.
    std::atomic<bool> stop{false};
    std::atomic<bool> finite{true};
    std::thread reader([&] {
        for (int frame = 0; !stop; frame = (frame + 1) % 240) {
            if (!std::isfinite(x.getValueAsDouble(TempusMake(frame, 24), 0.0))) {
                finite = false;
            }
        }
    });
    KFCoreGlobals::getInstance().animate = true;
    for (int frame = 1; frame < 200; ++frame) {
        x.setValue(TempusMake(frame, 24), frame * 0.5, true); // silently: one undo step for the whole stroke
    }
    KFCoreGlobals::getInstance().animate = false;
    stop = true;
    reader.join();
    // [threads]
    good &= check(finite, "the second thread read whole values while keypoints were set");

    // [take]
    // The user drags a slider while the project plays: what is set is recorded, can be read at once, and becomes
    // keypoints at the end. Here it runs into the old curve over one frame on both sides.
    x.beginPlayback(TempusMake(5, 1), kKFRecordingScopeTouch, 0, TempusMake(1, 24));
    x.beginRecording(TempusMake(5, 1));
    for (int frame = 121; frame < 144; ++frame) {
        x.setValue(TempusMake(frame, 24), 20.0, true);
    }
    x.endRecording(TempusMake(6, 1));
    x.endPlayback(TempusMake(6, 1));
    // [take]
    good &= check(x.getValueAsDouble(TempusMake(11, 2), 0.0) == 20.0, "the take has become keypoints");

    // [save]
    // A blob that a host puts into its own files. What is read replaces keypoints and values, and leaves alone what the
    // document doesn't mention.
    BXData const saved = layer.createChannelState(true, true);
    auto const digest = layer.getHash();
    x.setValue(TempusMake(11, 2), 0.0, true);
    bool const unsaved = layer.getHash() != digest;
    bool const read = layer.configureWithState(saved);
    // [save]
    good &= check(unsaved && read && layer.getHash() == digest, "the saved state comes back");

    // [undo]
    while (layer.undo()) {
    }
    // [undo]
    good &= check(x.getNumberOfKeyframes() == 0 && x.getValueAsDouble(TempusMake(2, 1), 0.0) == 0.0,
                  "undo brings back the channel as it was made");
    return good ? 0 : 1;
}
