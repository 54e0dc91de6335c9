#include "tools/cli/Verbs.h"

#include "tools/cli/AuthorOptions.h"
#include "tools/cli/TimeArgument.h"
#include "tools/cli/UsageError.h"
#include "tools/curve/Keypoint.h"
#include "tools/import/MotionTree.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <memory>
#include <optional>

namespace lumenkey::tools {

namespace {

struct SetOptions {
    AuthorOptions author;
    std::string channel;
    std::string at;
    double value = 0;
    CLI::Option* valueOption = nullptr;
    std::string interpolation;
    bool remove = false;

    bool hasValue() const { return !valueOption->empty(); }
};

/// One run of the verb.
class SetRun {
public:
    explicit SetRun(SetOptions const& options) : _options(options) {}

    void run(OutputSink& out) {
        readOptions();
        ChannelInput const input(_options.author.input);
        ChannelTree::Node const node = input.channelNamed(_options.channel);
        KFChannel& channel = input.tree().channel(node);
        if (channel.isLocked(true)) {
            refuse("is locked");
        }
        checkTarget(input.file(), node);
        std::string told = input.tree().dottedName(node);
        if (_at) {
            Tempus const time = _at->resolve(input.file().frameDuration);
            _options.remove ? removeAt(channel, time) : keyAt(channel, time);
            told += " at " + timeText(time) + " s: " +
                    (_options.remove ? "no keypoint"
                                     : tableText(channel.getCurveInterface()->getValue(time, 0.0)));
        } else {
            setConstant(channel);
            told += ": " + tableText(channel.getInitialValue());
        }
        _options.author.write(input);
        out.write(printableText(told) + "\n");
    }

private:
    [[noreturn]] void refuse(std::string const& why) const {
        throw UsageError{"'" + _options.channel + "' " + why};
    }

    void readOptions() {
        _options.author.check();
        _at = TimeArgument::parseIfGiven(_options.at);
        if (!_options.remove && !_options.hasValue() && _options.interpolation.empty()) {
            throw UsageError{"say what to set: --value, --interpolation or --delete"};
        }
        if (!_at && !(_options.hasValue() && _options.interpolation.empty())) {
            throw UsageError{"say the time of the keypoint: --at"};
        }
        if (!_options.interpolation.empty()) {
            _interpolation = interpolationNamed(_options.interpolation);
            if (!_interpolation) {
                throw UsageError{"there is no interpolation '" + _options.interpolation + "'; there are " +
                                 interpolationNames()};
            }
        }
    }

    /// Motions and tables don't hold everything that can be said of a channel.
    void checkTarget(ChannelFile const& file, ChannelTree::Node node) const {
        ChannelFormat const format = _options.author.output.formatFor(file.format);
        if (format == ChannelFormat::Document) {
            return;
        }
        bool const isMotion = format == ChannelFormat::Motion;
        std::string const such = isMotion ? "a BVH" : "a CSV";
        if (_interpolation) {
            refuseFor(file, such + " holds no interpolations");
        }
        if (isMotion && isFrameTime(*file.tree, node)) {
            refuseFor(file, "its frames last as long as those of '" + file.file + "'");
        }
        if (isMotion && _at && isOffset(*file.tree, file.tree->parent(node))) {
            refuseFor(file, "an offset is the same in every frame");
        }
        if (_at && !_options.remove && isDisabledAt(file, node)) {
            refuseFor(file, "the keypoint is disabled, and " + such + " has what is seen");
        }
        if (isMotion && _options.remove) {
            refuseFor(file, "a BVH has a value in every frame");
        }
        // The pose of a document is a frame.
        if (!_at && !(isMotion && file.format == ChannelFormat::Document)) {
            refuseFor(file, such + " holds no values without a time");
        }
        if (isMotion && _at && !isFrame(_at->resolve(file.frameDuration), file.frameDuration)) {
            refuseFor(file, "a BVH has values at its frames alone, which are " +
                                timeText(file.frameDuration) + " s apart");
        }
    }

    bool isDisabledAt(ChannelFile const& file, ChannelTree::Node node) const {
        void* const handle = keypointAt(file.tree->channel(node), _at->resolve(file.frameDuration));
        return handle != nullptr && !readKeypoint(*file.tree->spline(node), handle).enabled;
    }

    static bool isFrame(Tempus const& time, Tempus const& duration) {
        return duration * TempusMake(TempusFloorQuotient(time, duration), 1) == time;
    }

    [[noreturn]] void refuseFor(ChannelFile const& file, std::string const& why) const {
        throw UsageError{"'" + _options.author.output.target(file.file) + "' can't hold that: " + why +
                         (file.format == ChannelFormat::Document
                              ? "; write a document"
                              : "; make a document of it with lumenkey convert")};
    }

    void* unlockedKeypointAt(KFChannel& channel, Tempus const& time) const {
        void* const handle = keypointAt(channel, time);
        bool isLocked = false;
        if (handle != nullptr && channel.getCurveInterface()->isLockedKeypoint(handle, &isLocked) &&
            isLocked) {
            refuse("can't change: the keypoint at " + timeText(time) + " s is locked");
        }
        return handle;
    }

    static void* keypointAt(KFChannel& channel, Tempus const& time) {
        void* handle = nullptr;
        KFCurve& curve = *channel.getCurveInterface();
        return curve.getNumberOfKeypoints() > 0 && curve.getKeypointHandle(time, &handle) ? handle : nullptr;
    }

    void removeAt(KFChannel& channel, Tempus const& time) const {
        void* const handle = unlockedKeypointAt(channel, time);
        if (handle == nullptr) {
            refuse("has no keypoint at " + timeText(time) + " s");
        }
        channel.deleteKeyframe(handle);
    }

    /// A new keypoint on the curve leaves its shape as it is; a value then moves it.
    void keyAt(KFChannel& channel, Tempus const& time) const {
        channel.createLocalChannelImplementation();
        if (!channel.getCurveInterface()->isCurveKeyframable()) {
            refuse("takes no keypoints: its class has one value for all times. Leave out --at");
        }
        if (unlockedKeypointAt(channel, time) == nullptr && !_options.hasValue()) {
            refuse("has no keypoint at " + timeText(time) + " s; with --value one is made");
        }
        if (_options.hasValue()) {
            channel.setKeyframe(time, _options.value, true);
        }
        void* const handle = keypointAt(channel, time);
        if (handle == nullptr) {
            refuse("didn't take a keypoint at " + timeText(time) + " s");
        }
        if (_interpolation) {
            channel.setKeyframeInterpolation(handle, *_interpolation);
        }
        double kept = _options.value;
        channel.getCurveInterface()->getKeypoint(handle, nullptr, &kept);
        if (_options.hasValue() && kept != _options.value) {
            refuse(limitsText(channel, _options.value));
        }
    }

    void setConstant(KFChannel& channel) const {
        if (channel.getNumberOfKeyframes() > 0) {
            refuse("has keypoints: say which with --at");
        }
        lumenkey::tools::setConstant(channel, _options.value, _options.channel);
    }

    SetOptions const& _options;
    std::optional<TimeArgument> _at;
    std::optional<std::uint32_t> _interpolation;
};

} // namespace

Verb declareSet(CLI::App& program) {
    auto const options = std::make_shared<SetOptions>();
    CLI::App* const verb =
        program.add_subcommand("set", "Set a keypoint, or the value of a channel without any");
    options->author.add(*verb);
    verb->add_option("CHANNEL", options->channel, "A name, the end of one, or a path of IDs")
        ->option_text(" ")
        ->required();
    verb->add_option("--at", options->at, "The time of the keypoint, which is made where there is none")
        ->option_text("T");
    options->valueOption =
        verb->add_option("--value", options->value, "In the unit of the channel: radians, or units")
            ->option_text("V");
    auto* const interpolation =
        verb->add_option("--interpolation", options->interpolation, "How the curve leaves the keypoint")
            ->option_text("NAME");
    verb->add_flag("--delete", options->remove, "Take the keypoint away")
        ->excludes(options->valueOption)
        ->excludes(interpolation);
    options->author.addRest(*verb);
    verb->footer("A time is VALUE/TIMESCALE (1001/24000), seconds (0.5) or frames of the file "
                 "(12f).\nInterpolations: " +
                 interpolationNames() +
                 ".\n\nExample: lumenkey set ball.lumen Height --at 1/2 --value 0 "
                 "--interpolation linear");
    return {verb,
            "FILE CHANNEL [--at T] (--value V [--interpolation NAME] | --interpolation NAME | --delete) "
            "[-o OUT | --in-place] [--force] [--frame-rate R]",
            [options](OutputSink& out) { SetRun(*options).run(out); }};
}

} // namespace lumenkey::tools
