#include "tools/cli/Program.h"

#include "lumenkey/version.h"
#include "tools/cli/NearMatch.h"
#include "tools/cli/UsageError.h"
#include "tools/cli/Verbs.h"
#include "tools/import/InputError.h"
#include "tools/output/StandardOutput.h"
#include "tools/output/TextForms.h"

#include <CLI/CLI.hpp>
#include <exception>
#include <map>
#include <new>
#include <unistd.h>
#include <vector>

namespace lumenkey::tools {

namespace {

using UsageOfVerbs = std::map<std::string, std::string>;

std::string usageOf(CLI::App const& app, UsageOfVerbs const& usages) {
    auto const found = usages.find(app.get_name());
    return found == usages.end() ? "lumenkey VERB ...\n"
                                 : "lumenkey " + found->first + " " + found->second + "\n";
}

/// Help with the usage that we word ourselves.
class HelpFormatter : public CLI::Formatter {
public:
    explicit HelpFormatter(UsageOfVerbs const& usages) : _usages(usages) {}
    std::string make_usage(CLI::App const* app, std::string) const override {
        return "Usage: " + usageOf(*app, _usages);
    }

private:
    UsageOfVerbs const& _usages;
};

void complain(std::string const& text) { writeFully(STDERR_FILENO, "lumenkey: " + text + "\n"); }

/// An empty text would count as 0, or as if the option weren't there.
void refuseEmptyTexts(CLI::App& verb) {
    CLI::Validator const isSaid([](std::string& text) { return text.empty() ? "it is empty" : ""; }, "");
    for (CLI::Option* const option :
         verb.get_options([](CLI::Option* each) { return each->get_items_expected_max() > 0; })) {
        option->check(isSaid);
    }
}

class Program {
public:
    Program() {
        _app.name("lumenkey");
        _app.description("Reads, samples, draws and edits animation curves.");
        _app.set_version_flag("--version", std::string("lumenkey ") + LumenkeyVersionString);
        _app.require_subcommand(1);
        _app.footer(
            "lumenkey VERB --help tells more, with an example.\n"
            "It exits 0 when done, 1 when an input is at fault or an output can't be written, and 2 for "
            "wrong arguments;\ndiff as diff does.");
        _verbs = {declareInfo(_app),     declareTree(_app),    declareKeys(_app),    declareSample(_app),
                  declarePlot(_app),     declareGallery(_app), declareConvert(_app), declareHash(_app),
                  declareDiff(_app),     declareCheck(_app),   declareUpgrade(_app), declareTypes(_app),
                  declareNew(_app),      declareAdd(_app),     declareSet(_app),     declareRemove(_app),
                  declareSimplify(_app), declareBake(_app),    declareSmooth(_app),  declareReverse(_app),
                  declareOffset(_app),   declareScale(_app),   declareRetime(_app)};
        _verbs.push_back(declareCompletion(_app, _verbs));
        _verbs.push_back(declareManual(_app, _verbs));
        for (Verb const& verb : _verbs) {
            _usages[verb.arguments->get_name()] = verb.usage;
            verb.arguments->formatter(std::make_shared<HelpFormatter>(_usages));
            refuseEmptyTexts(*verb.arguments);
        }
        _app.formatter(std::make_shared<HelpFormatter>(_usages));
    }

    int run(int argc, char const* const* argv) {
        StandardOutput out;
        int exit = kExitDone;
        try {
            checkVerb(argc, argv);
            _app.parse(argc, argv);
            exit = runVerb(chosenVerb(), out);
        } catch (CLI::CallForHelp const&) {
            out.write(chosenApp().help());
        } catch (CLI::CallForVersion const& version) {
            out.write(std::string(version.what()) + "\n");
        } catch (CLI::ParseError const& error) {
            return wrongArguments(error.what());
        } catch (UsageError const& error) {
            return wrongArguments(error.what);
        }
        out.flush();
        return exit;
    }

private:
    static int runVerb(Verb const& verb, StandardOutput& out) {
        try {
            int exit = kExitDone;
            if (verb.runForExit) {
                exit = verb.runForExit(out);
            } else {
                verb.run(out);
            }
            out.flush();
            return exit;
        } catch (InputError const& error) {
            complain(error.text());
        } catch (OutputError const& error) {
            complain(printableText(error.target) + ": " + error.what);
        } catch (std::bad_alloc const&) {
            complain("out of memory");
        } catch (std::exception const& error) {
            complain(printableText(error.what()));
        }
        return verb.exitInTrouble;
    }

    int wrongArguments(std::string const& what) {
        complain(printableText(what));
        writeFully(STDERR_FILENO, "usage: " + usageOf(chosenApp(), _usages) + "see: lumenkey " +
                                      (&chosenApp() == &_app ? "" : chosenApp().get_name() + " ") +
                                      "--help\n");
        return kExitWrongArguments;
    }

    /// The parser only says that some verb is missing.
    void checkVerb(int argc, char const* const* argv) const {
        std::string const word = argc > 1 ? argv[1] : "";
        if (word.empty() || word.starts_with('-') || _usages.contains(word)) {
            return;
        }
        NearMatch match(word);
        for (auto const& [verb, usage] : _usages) {
            match.offer(verb);
        }
        throw UsageError{"there is no verb '" + word + "'" +
                         (match.best().empty() ? "" : "; did you mean '" + match.best() + "'?")};
    }

    /// The app of the verb among the arguments, or the whole program's.
    CLI::App& chosenApp() {
        for (Verb const& verb : _verbs) {
            if (verb.arguments->parsed()) {
                return *verb.arguments;
            }
        }
        return _app;
    }

    Verb const& chosenVerb() {
        for (Verb const& verb : _verbs) {
            if (verb.arguments->parsed()) {
                return verb;
            }
        }
        throw UsageError{"a verb is required"};
    }

    CLI::App _app;
    std::vector<Verb> _verbs;
    UsageOfVerbs _usages;
};

} // namespace

int runProgram(int argc, char const* const* argv) {
    try {
        return Program().run(argc, argv);
    } catch (OutputError const& error) { // at the end of standard output
        complain(printableText(error.target) + ": " + error.what);
    } catch (std::bad_alloc const&) {
        complain("out of memory");
    }
    return kExitFailed;
}

} // namespace lumenkey::tools
