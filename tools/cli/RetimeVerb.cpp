#include "tools/cli/EditVerb.h"

#include "tools/cli/UsageError.h"
#include "tools/time/ExactDecimal.h"
#include "tools/time/TimeFraction.h"

#include <CLI/CLI.hpp>

namespace lumenkey::tools {

namespace {

/// `2`, `0.8`, `24/25`: exact, and above 0.
Tempus factorOf(std::string const& text) {
    Tempus factor = timeFromFraction(text);
    if (std::optional<ExactDecimal> const number = ExactDecimal::parse(text)) {
        factor = number->toTempus();
    }
    if (!TempusIsNumeric(factor) || !(factor > kTempusZero)) {
        throw UsageError{"'" + text +
                         "' is no factor of time: write a number above 0, such as 2, 0.8 or 24/25"};
    }
    return factor;
}

class Retime : public EditVerb {
public:
    EditWords words() const override {
        EditWords words;
        words.name = "retime";
        words.description = "Make curves last longer or shorter";
        words.usage = "--factor F [--about T]";
        words.notes = "A factor above 1 makes them slower. Keypoints of the stretch replace those that lie "
                      "where they come to.\n";
        words.example = "lumenkey retime walk.bvh --factor 2 -o slow.bvh";
        return words;
    }

    void addOptions(CLI::App& verb) override {
        verb.add_option(
                "--factor", _factorText,
                "What times are multiplied with, exactly where exact time can hold that: a decimal, or a "
                "fraction such as 24/25")
            ->option_text("F")
            ->required();
        verb.add_option("--about", _aboutText, "The time that stays (else the first of the stretch)")
            ->option_text("T");
    }

    void readOptions() override {
        _factor = factorOf(_factorText);
        _wantedAbout = TimeArgument::parseIfGiven(_aboutText);
    }

    void prepare(ChannelFile const& file, TimeSpan const& span) override {
        Tempus const about = _wantedAbout ? _wantedAbout->resolve(file.frameDuration) : span.from;
        _offset = about - about * _factor;
    }

    void apply(KFChannel& channel, TimeSpan const& span) override {
        editKeypointsWithin(channel, span,
                            [this](KFCurve& curve) { curve.forceRetimeCurve(_factor, _offset); });
    }

    TimeSpan arrivalOf(TimeSpan const& span) const override {
        return {span.from * _factor + _offset, span.to * _factor + _offset};
    }

private:
    std::string _factorText;
    std::string _aboutText;
    Tempus _factor{};
    std::optional<TimeArgument> _wantedAbout;
    Tempus _offset{};
};

} // namespace

Verb declareRetime(CLI::App& program) { return declareEdit(program, std::make_shared<Retime>()); }

} // namespace lumenkey::tools
