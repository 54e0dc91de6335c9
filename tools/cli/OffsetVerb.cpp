#include "tools/cli/EditVerb.h"

#include "tools/cli/UsageError.h"

#include <CLI/CLI.hpp>
#include <cmath>

namespace lumenkey::tools {

namespace {

class Offset : public EditVerb {
public:
    EditWords words() const override {
        EditWords words;
        words.name = "offset";
        words.description = "Move curves in time, in value, or in both";
        words.usage = "[--by T] [--value X]";
        words.notes = "Keypoints of the stretch replace those that lie where they come to in time. Values "
                      "stay\nwithin the limits of the channel.\n";
        words.example = "lumenkey offset walk.bvh LeftArm --by -6f -o earlier.bvh";
        return words;
    }

    void addOptions(CLI::App& verb) override {
        verb.add_option("--by", _by, "How much later; earlier, where it is negative")->option_text("T");
        _valueOption =
            verb.add_option("--value", _value,
                            "What is added to values, in the unit of the channel: radians, or units")
                ->option_text("X");
    }

    void readOptions() override {
        _wanted = TimeArgument::parseIfGiven(_by);
        if (!_wanted && _valueOption->empty()) {
            throw UsageError{"say how far: --by, --value or both"};
        }
        if (!std::isfinite(_value)) {
            throw UsageError{"--value must be a finite number"};
        }
    }

    void prepare(ChannelFile const& file, TimeSpan const&) override {
        _delay = _wanted ? _wanted->resolve(file.frameDuration) : kTempusZero;
    }

    void apply(KFChannel& channel, TimeSpan const& span) override {
        KFCurve& curve = *channel.getCurveInterface();
        if (_value != 0 && curve.isCurveKeyframable()) {
            for (void* const keypoint : keypointsWithin(curve, span)) {
                double value = 0;
                curve.getKeypoint(keypoint, nullptr, &value);
                curve.setKeypointValue(keypoint, value + _value, true);
            }
        }
        if (_delay != kTempusZero) {
            editKeypointsWithin(channel, span,
                                [this](KFCurve& moved) { moved.forceRetimeCurve(TempusMake(1, 1), _delay); });
        }
    }

    TimeSpan arrivalOf(TimeSpan const& span) const override { return {span.from + _delay, span.to + _delay}; }

private:
    std::string _by;
    double _value = 0;
    CLI::Option* _valueOption = nullptr;
    std::optional<TimeArgument> _wanted;
    Tempus _delay = kTempusZero;
};

} // namespace

Verb declareOffset(CLI::App& program) { return declareEdit(program, std::make_shared<Offset>()); }

} // namespace lumenkey::tools
