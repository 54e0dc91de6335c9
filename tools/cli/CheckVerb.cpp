#include "tools/cli/Verbs.h"

#include "tools/check/DocumentCheck.h"
#include "tools/cli/ChannelInput.h"
#include "tools/cli/Progress.h"
#include "tools/cli/SeveralFiles.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <memory>

namespace lumenkey::tools {

namespace {

struct CheckOptions {
    std::vector<std::string> files;
};

/// What stops the reading of a file; nothing where it can be opened.
std::optional<InputError> faultOf(std::string const& file, ChannelFormat* format) {
    try {
        *format = openChannelFile(file, Progress("reading").teller()).format;
        return std::nullopt;
    } catch (InputError const& error) {
        return error;
    }
}

bool isFoundToo(InputError const& fault) {
    return fault.what.find("document type") != std::string::npos ||
           fault.what.starts_with("the class of the channel ");
}

int check(std::string const& file, OutputSink& out) {
    ChannelFormat format = channelFormatNamed(file).value_or(ChannelFormat::Motion);
    std::optional<InputError> const fault = faultOf(file, &format);
    std::vector<DocumentFinding> findings;
    if (format == ChannelFormat::Document) {
        findings = checkDocument(file, Progress("checking").teller());
    }
    // What stops the reading has mostly been found already, perhaps in other words.
    bool isTold = !fault || (!findings.empty() && isFoundToo(*fault));
    for (DocumentFinding const& finding : findings) {
        isTold = isTold || finding.what == fault->what;
        out.write(printableText(file) + ":" + std::to_string(finding.place.line) + ":" +
                  std::to_string(finding.place.column) + ": " + printableText(finding.what) + "\n");
    }
    if (!isTold) {
        out.write(fault->text() + "\n");
    }
    return fault || !findings.empty() ? kExitFailed : kExitDone;
}

} // namespace

Verb declareCheck(CLI::App& program) {
    auto const options = std::make_shared<CheckOptions>();
    CLI::App* const verb = program.add_subcommand("check", "Tell what is wrong or odd in files");
    verb->add_option("FILE", options->files, kFileHelp)->option_text("...")->required();
    verb->footer(
        "A line for each finding, FILE:LINE:COLUMN: what it is; nothing is changed. Of documents: text that "
        "is no XML,\nelements and classes that are unknown and so passed over, values that can't be read or "
        "are "
        "out of limits,\nkeypoints out of order. Exits 0 where there is nothing, else 1.\n\n"
        "Example: lumenkey check *.lumen");
    Verb declared{verb, "FILE...", {}};
    declared.runForExit = [options](OutputSink& out) { return forSeveralFiles(options->files, out, check); };
    return declared;
}

} // namespace lumenkey::tools
