#include "tools/cli/Program.h"
#include "tools/output/TemporaryFiles.h"

#include <csignal>
#include <cstdio>
#include <exception>

int main(int argc, char** argv) {
    // A closed pipe and a limit on the size of files are told like any other failure to write.
    std::signal(SIGPIPE, SIG_IGN);
    std::signal(SIGXFSZ, SIG_IGN);
    lumenkey::tools::removeTemporariesOnSignals();
    try {
        return lumenkey::tools::runProgram(argc, argv);
    } catch (std::exception const& error) {
        std::fputs("lumenkey: ", stderr);
        std::fputs(error.what(), stderr);
        std::fputs("\n", stderr);
    } catch (...) {
        std::fputs("lumenkey: something went wrong that has no name\n", stderr);
    }
    return lumenkey::tools::kExitFailed;
}
