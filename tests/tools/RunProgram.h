#pragma once

#include <string>
#include <vector>

namespace lumenkey::tools {

/// How a program ended, and what it said.
struct Outcome {
    /// What it exited with; -1 when a signal ended it.
    int exit = -1;
    std::string out;
    std::string err;
};

/// Where the real program is: the environment's LUMENKEY_PROGRAM, else what the build says.
std::string programPath();

/// Runs a program to its end. Its standard output goes to `outTarget` where one is named, such as a full
/// device.
Outcome runProgramFile(std::string const& program, std::vector<std::string> const& arguments,
                       std::string const& outTarget = "");
Outcome runLumenkey(std::vector<std::string> const& arguments, std::string const& outTarget = "");

} // namespace lumenkey::tools
