#include "tools/cli/Verbs.h"

#include "tools/cli/ChannelInput.h"
#include "tools/cli/EditVerb.h"
#include "tools/cli/Progress.h"
#include "tools/cli/UsageError.h"
#include "tools/compare/TreeDifference.h"
#include "tools/export/ChannelFileWriter.h"
#include "tools/output/JsonWriter.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <memory>

namespace lumenkey::tools {

namespace {

struct DiffOptions {
    InputOptions before;
    std::string after;
    bool json = false;
};

constexpr int kExitDifferent = 1;

std::string_view nameOf(DifferenceKind kind) {
    switch (kind) {
    case DifferenceKind::Added:
        return "added";
    case DifferenceKind::Removed:
        return "removed";
    default:
        return "changed";
    }
}

void writeLine(NodeDifference const& difference, OutputSink& out) {
    std::string text(nameOf(difference.kind));
    text.resize(8, ' ');
    text += printableText(difference.name);
    std::string separator = ": ";
    if (difference.curve) {
        text += separator + "by up to " + tableText(difference.curve->most) + " " + difference.unit +
                ", at " + timeText(difference.curve->at) + " s";
        separator = "; ";
    }
    for (std::string const& detail : difference.details) {
        text += separator + printableText(detail);
        separator = "; ";
    }
    out.write(text + "\n");
}

void writeJson(std::vector<NodeDifference> const& all, OutputSink& out) {
    JsonWriter json(out);
    json.beginObject();
    json.key("differences");
    json.beginArray();
    for (NodeDifference const& difference : all) {
        json.beginObject(JsonLayout::Inline);
        json.key("kind");
        json.string(nameOf(difference.kind));
        json.key("channel");
        json.string(difference.name);
        if (difference.curve) {
            json.key("worst");
            json.number(difference.curve->most);
            json.key("at");
            json.string(timeText(difference.curve->at));
        }
        json.key("details");
        json.beginArray();
        for (std::string const& detail : difference.details) {
            json.string(detail);
        }
        json.endArray();
        json.endObject();
    }
    json.endArray();
    json.endObject();
    json.finish();
}

bool isDocument(ChannelInput const& input) { return input.file().format == ChannelFormat::Document; }

/// A file of another kind beside a document counts as the document that it converts to.
void makeAlike(ChannelInput& input, ChannelInput const& other, std::string const& file) {
    if (isDocument(other) && !isDocument(input)) {
        input = ChannelInput(asDocument(input.file(), file + ".lumen"));
    }
}

int runDiff(DiffOptions const& options, OutputSink& out) {
    std::string const& rate = options.before.frameRate;
    ChannelInput before(InputOptions{options.before.file, rate, true});
    ChannelInput after(InputOptions{options.after, rate, true});
    if (!rate.empty() && !isDocument(before) && !isDocument(after)) {
        throw UsageError{"--frame-rate is for documents, and neither file is one"};
    }
    bool const areDocuments = isDocument(before) && isDocument(after);
    makeAlike(before, after, options.before.file);
    makeAlike(after, before, options.after);
    TimeSpan const span{TempusMinimum(before.file().firstTime, after.file().firstTime),
                        TempusMaximum(before.file().lastTime, after.file().lastTime)};
    Tempus const step = TempusMinimum(comparedStep(before.file(), span, std::nullopt),
                                      comparedStep(after.file(), span, std::nullopt));
    std::vector<NodeDifference> const all = differencesBetween(before.tree(), after.tree(), areDocuments,
                                                               span, step, Progress("comparing").teller());
    if (options.json) {
        writeJson(all, out);
    } else {
        for (NodeDifference const& difference : all) {
            writeLine(difference, out);
        }
    }
    return all.empty() ? kExitDone : kExitDifferent;
}

} // namespace

Verb declareDiff(CLI::App& program) {
    auto const options = std::make_shared<DiffOptions>();
    CLI::App* const verb = program.add_subcommand("diff", "Tell how two files differ");
    verb->add_option("A", options->before.file, kFileHelp)->option_text(" ")->required();
    verb->add_option("B", options->after,
                     "Likewise; the two need not be of one kind: beside a document "
                     "any other is taken as the document that it converts to")
        ->option_text(" ")
        ->required();
    options->before.addFrameRate(*verb);
    verb->add_flag("--json", options->json, "For programs: every number in full");
    verb->footer(
        "A line for each channel that was added, removed or changed; for a changed curve, how far it lies "
        "off at most,\nand where, looked at ten times in each frame (at half a million times where that is "
        "more than 20 million), at the\nkeypoints and beside them. Exits 0 where the files hold the same, 1 "
        "where they differ, and 2 in trouble.\n\n"
        "Example: lumenkey diff walk.lumen edited.lumen");
    Verb declared{verb, "A B [--frame-rate R] [--json]", {}};
    declared.runForExit = [options](OutputSink& out) { return runDiff(*options, out); };
    declared.exitInTrouble = kExitWrongArguments;
    return declared;
}

} // namespace lumenkey::tools
