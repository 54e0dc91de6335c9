#pragma once

#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace lumenkey::tools {

using Json = nlohmann::json;

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

/// What the program says where it exits so, without a complaint.
std::string outputOf(std::vector<std::string> const& arguments, int exit = 0);
/// What it complains of where it exits so and says nothing else.
std::string complaintOf(std::vector<std::string> const& arguments, int exit = 1);
/// What it says for a verb with `--json`.
Json jsonOf(std::vector<std::string> arguments, int exit = 0);

} // namespace lumenkey::tools
