#pragma once

namespace lumenkey::tools {

/// What the program exits with.
enum ExitCode {
    kExitDone = 0,
    /// The input is at fault, or the output can't be written.
    kExitFailed = 1,
    kExitWrongArguments = 2,
};

/// Everything that the program does. Results go to standard output; whatever else is said goes to standard
/// error.
int runProgram(int argc, char const* const* argv);

} // namespace lumenkey::tools
