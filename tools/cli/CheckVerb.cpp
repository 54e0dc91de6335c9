#include "tools/cli/Verbs.h"

#include "tools/check/DocumentCheck.h"
#include "tools/cli/ChannelInput.h"
#include "tools/cli/Progress.h"
#include "tools/cli/SeveralFiles.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <filesystem>
#include <memory>
#include <optional>

namespace lumenkey::tools {

namespace {

struct CheckOptions {
    std::vector<std::string> files;
};

/// A file is read twice, but into memory once where that isn't possible, as with a pipe, or where only its
/// content tells what it is.
class CheckedFile {
public:
    explicit CheckedFile(std::string const& file) : _file(file) {}

    std::vector<DocumentFinding> findings() {
        ChannelFormat format = channelFormatNamed(_file).value_or(ChannelFormat::Motion);
        std::optional<InputError> const fault = faultOfReading(&format);
        std::vector<DocumentFinding> found;
        if (format == ChannelFormat::Document) {
            Progress bar("checking");
            found = _text ? checkDocumentText(*_text, bar.teller()) : checkDocument(_file, bar.teller());
        }
        if (fault && !isAmong(*fault, found)) {
            found.push_back({{fault->line, fault->column}, fault->what});
            sortByPlace(found);
        }
        return found;
    }

private:
    /// What stops the reading; nothing where the file can be opened.
    std::optional<InputError> faultOfReading(ChannelFormat* format) {
        Progress bar("reading");
        std::error_code missing;
        try {
            if (channelFormatNamed(_file) && std::filesystem::is_regular_file(_file, missing)) {
                openChannelFile(_file, bar.teller());
            } else {
                _text = readInputText(_file);
                *format = channelFormatOf(*_text, _file);
                openChannelText(*_text, _file, bar.teller());
            }
            return std::nullopt;
        } catch (InputError const& error) {
            return error;
        }
    }

    /// Whether a fault has been found already, perhaps in other words.
    static bool isAmong(InputError const& fault, std::vector<DocumentFinding> const& found) {
        bool const hasOtherWords = fault.what.find("document type") != std::string::npos ||
                                   fault.what.starts_with("the class of the channel ");
        return (hasOtherWords && !found.empty()) ||
               std::any_of(found.begin(), found.end(),
                           [&](DocumentFinding const& finding) { return finding.what == fault.what; });
    }

    std::string const& _file;
    std::optional<std::string> _text;
};

int check(std::string const& file, OutputSink& out) {
    std::vector<DocumentFinding> const findings = CheckedFile(file).findings();
    for (DocumentFinding const& finding : findings) {
        out.write(printableText(file) + ":" + std::to_string(finding.place.line) + ":" +
                  std::to_string(finding.place.column) + ": " + printableText(finding.what) + "\n");
    }
    return findings.empty() ? kExitDone : kExitFailed;
}

} // namespace

Verb declareCheck(CLI::App& program) {
    auto const options = std::make_shared<CheckOptions>();
    CLI::App* const verb = program.add_subcommand("check", "Tell what is wrong or odd in files");
    verb->add_option("FILE", options->files, kFileHelp)->option_text("...")->required();
    verb->footer(
        "A line for each finding, FILE:LINE:COLUMN: what it is; nothing is changed. Of documents: text that "
        "is no XML,\nelements and classes that are unknown and so passed over, values and attributes that "
        "can't be read or are out of\nlimits, keypoints out of order or without a time or a value, what is "
        "there twice or contradicts itself, a version\nthat is unknown. Exits 0 where there is nothing, else "
        "1.\n\n"
        "Example: lumenkey check *.lumen");
    Verb declared{verb, "FILE...", {}};
    declared.runForExit = [options](OutputSink& out) { return forSeveralFiles(options->files, out, check); };
    return declared;
}

} // namespace lumenkey::tools
