#include "tests/tools/RunProgram.h"

#include "tests/tools/TestFolder.h"

#include <cstdlib>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

extern char** environ;

namespace lumenkey::tools {

namespace {

/// The environment of a child. The library that finds fonts keeps some of what it found until the process
/// ends; where a leak checker is built into the program, it hears of that.
std::vector<std::string> environmentWith(std::string const& suppressions) {
    std::vector<std::string> variables;
    for (char** variable = environ; *variable != nullptr; ++variable) {
        if (!std::string_view(*variable).starts_with("LSAN_OPTIONS=")) {
            variables.emplace_back(*variable);
        }
    }
    variables.push_back("LSAN_OPTIONS=print_suppressions=0:suppressions=" + suppressions);
    return variables;
}

/// As the system takes lists of words: pointers, and a null at the end.
std::vector<char*> pointersTo(std::vector<std::string>& words) {
    std::vector<char*> pointers;
    for (std::string& word : words) {
        pointers.push_back(word.data());
    }
    pointers.push_back(nullptr);
    return pointers;
}

} // namespace

std::string programPath() {
    char const* const path = std::getenv("LUMENKEY_PROGRAM");
    return path != nullptr ? path : LUMENKEY_PROGRAM;
}

Outcome runProgramFile(std::string const& program, std::vector<std::string> const& arguments,
                       std::string const& outTarget) {
    TestFolder const folder;
    std::string const out = outTarget.empty() ? folder.file("out") : outTarget;
    std::string const err = folder.file("err");
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
    posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, out.c_str(), O_WRONLY | O_CREAT, 0600);
    posix_spawn_file_actions_addopen(&actions, STDERR_FILENO, err.c_str(), O_WRONLY | O_CREAT, 0600);

    std::vector<std::string> words{program};
    words.insert(words.end(), arguments.begin(), arguments.end());
    std::vector<std::string> environment =
        environmentWith(folder.write("suppressions", "leak:libfontconfig\n"));
    Outcome outcome;
    pid_t child = 0;
    if (::posix_spawn(&child, program.c_str(), &actions, nullptr, pointersTo(words).data(),
                      pointersTo(environment).data()) == 0) {
        int status = 0;
        ::waitpid(child, &status, 0);
        outcome.exit = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }
    posix_spawn_file_actions_destroy(&actions);
    outcome.out = outTarget.empty() ? contentOf(out) : "";
    outcome.err = contentOf(err);
    return outcome;
}

Outcome runLumenkey(std::vector<std::string> const& arguments, std::string const& outTarget) {
    return runProgramFile(programPath(), arguments, outTarget);
}

std::string outputOf(std::vector<std::string> const& arguments, int exit) {
    Outcome const outcome = runLumenkey(arguments);
    EXPECT_EQ(outcome.exit, exit) << Json(arguments) << outcome.err;
    EXPECT_EQ(outcome.err, "");
    return outcome.out;
}

std::string complaintOf(std::vector<std::string> const& arguments, int exit) {
    Outcome const outcome = runLumenkey(arguments);
    EXPECT_EQ(outcome.exit, exit) << Json(arguments) << outcome.err;
    EXPECT_EQ(outcome.out, "");
    return outcome.err;
}

Json jsonOf(std::vector<std::string> arguments, int exit) {
    arguments.push_back("--json");
    return Json::parse(outputOf(arguments, exit), nullptr, false);
}

} // namespace lumenkey::tools
