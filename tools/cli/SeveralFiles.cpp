#include "tools/cli/SeveralFiles.h"

#include "tools/cli/Program.h"
#include "tools/cli/Progress.h"
#include "tools/cli/UsageError.h"
#include "tools/import/InputError.h"
#include "tools/output/StandardOutput.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <atomic>
#include <mutex>
#include <optional>
#include <thread>
#include <unistd.h>

namespace lumenkey::tools {

namespace {

struct Result {
    StringSink said;
    std::string complaint;
    std::optional<UsageError> usage;
    int exit = kExitDone;
};

void workOn(std::string const& file, std::function<int(std::string const&, OutputSink&)> const& work,
            Result& result) {
    result.exit = kExitFailed;
    try {
        result.exit = work(file, result.said);
    } catch (InputError const& error) {
        result.complaint = error.text();
    } catch (OutputError const& error) {
        result.complaint = printableText(error.target) + ": " + error.what;
    } catch (UsageError const& error) {
        result.usage = error;
    } catch (std::exception const& error) {
        result.complaint = printableText(file) + ": " + error.what();
    }
}

} // namespace

int forSeveralFiles(std::vector<std::string> const& files, OutputSink& out,
                    std::function<int(std::string const&, OutputSink&)> const& work) {
    if (files.size() == 1) {
        return work(files.front(), out);
    }
    std::vector<Result> results(files.size());
    std::atomic<std::size_t> next = 0;
    std::atomic<std::size_t> done = 0;
    std::mutex barMutex;
    Progress bar("files");
    auto const takeFiles = [&] {
        for (std::size_t i = next++; i < files.size(); i = next++) {
            workOn(files[i], work, results[i]);
            std::lock_guard const guard(barMutex);
            bar.update(static_cast<double>(++done) / static_cast<double>(files.size()));
        }
    };
    {
        std::size_t const processors = std::max(1U, std::thread::hardware_concurrency());
        std::vector<std::jthread> others;
        for (std::size_t i = 1; i < std::min(files.size(), processors); ++i) {
            others.emplace_back(takeFiles);
        }
        takeFiles();
    }
    int exit = kExitDone;
    for (Result const& result : results) {
        if (result.usage) {
            throw *result.usage;
        }
        out.write(result.said.text());
        if (!result.complaint.empty()) {
            writeFully(STDERR_FILENO, "lumenkey: " + result.complaint + "\n");
        }
        exit = std::max(exit, result.exit);
    }
    return exit;
}

} // namespace lumenkey::tools
