#pragma once

#include "tools/cli/Program.h"
#include "tools/output/OutputSink.h"

#include <functional>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace lumenkey::tools {

/// A verb of the program, declared to the parser of arguments.
struct Verb {
    CLI::App* arguments = nullptr;
    /// `FILE CHANNEL... [--slope]`: what follows the verb's name in its usage.
    std::string usage;
    /// What it does once its arguments are read. Throws `InputError`, `OutputError` or `UsageError`.
    std::function<void(OutputSink&)> run;
    /// In the place of `run`, for a verb that says by its exit code what it found.
    std::function<int(OutputSink&)> runForExit = {};
    /// What it exits with where an input is at fault or an output can't be written.
    int exitInTrouble = kExitFailed;
};

Verb declareInfo(CLI::App& program);
Verb declareTree(CLI::App& program);
Verb declareKeys(CLI::App& program);
Verb declareSample(CLI::App& program);
Verb declarePlot(CLI::App& program);
Verb declareGallery(CLI::App& program);

Verb declareConvert(CLI::App& program);

Verb declareHash(CLI::App& program);
Verb declareDiff(CLI::App& program);
Verb declareCheck(CLI::App& program);
Verb declareUpgrade(CLI::App& program);
Verb declareTypes(CLI::App& program);

// Those that tell about the program itself; `verbs` are all others, and live as long as the program.
Verb declareCompletion(CLI::App& program, std::vector<Verb> const& verbs);
Verb declareManual(CLI::App& program, std::vector<Verb> const& verbs);

// Those that make documents channel by channel: see `AuthorOptions`.
Verb declareNew(CLI::App& program);
Verb declareAdd(CLI::App& program);
Verb declareSet(CLI::App& program);
Verb declareRemove(CLI::App& program);

// Those that edit curves: see `EditVerb`.
Verb declareSimplify(CLI::App& program);
Verb declareBake(CLI::App& program);
Verb declareSmooth(CLI::App& program);
Verb declareReverse(CLI::App& program);
Verb declareOffset(CLI::App& program);
Verb declareScale(CLI::App& program);
Verb declareRetime(CLI::App& program);

} // namespace lumenkey::tools
