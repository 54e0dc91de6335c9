#include "tools/cli/EditVerb.h"

#include "tools/cli/UsageError.h"

#include <CLI/CLI.hpp>
#include <cmath>

namespace lumenkey::tools {

namespace {

class Scale : public EditVerb {
public:
    EditWords words() const override {
        EditWords words;
        words.name = "scale";
        words.description = "Multiply values";
        words.usage = "--factor X";
        words.notes = "Values stay within the limits of the channel.\n";
        words.example = "lumenkey scale walk.bvh Hips.Yposition --factor 0.01 -o metres.bvh";
        return words;
    }

    void addOptions(CLI::App& verb) override {
        verb.add_option("--factor", _factor, "What values are multiplied with")->option_text("X")->required();
    }

    void readOptions() override {
        if (!std::isfinite(_factor)) {
            throw UsageError{"--factor must be a finite number"};
        }
    }

    void apply(KFChannel& channel, TimeSpan const& span) override {
        editKeypointsWithin(channel, span, [this](KFCurve& curve) { curve.scaleCurve(_factor); });
    }

private:
    double _factor = 1;
};

} // namespace

Verb declareScale(CLI::App& program) { return declareEdit(program, std::make_shared<Scale>()); }

} // namespace lumenkey::tools
