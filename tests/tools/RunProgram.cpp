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

    // As the system takes lists of words: pointers, and a null at the end.
    std::vector<char*> words{const_cast<char*>(program.c_str())};
    for (std::string const& argument : arguments) {
        words.push_back(const_cast<char*>(argument.c_str()));
    }
    words.push_back(nullptr);
    Outcome outcome;
    pid_t child = 0;
    if (::posix_spawn(&child, program.c_str(), &actions, nullptr, words.data(), environ) == 0) {
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
