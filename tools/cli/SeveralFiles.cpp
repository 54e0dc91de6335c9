#include "tools/cli/SeveralFiles.h"

#include "tools/cli/Program.h"
#include "tools/cli/Progress.h"
#include "tools/cli/UsageError.h"
#include "tools/import/InputError.h"
#include "tools/output/StandardOutput.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <atomic>
#include <exception>
#include <new>
#include <thread>
#include <unistd.h>
#include <utility>

namespace lumenkey::tools {

namespace {

using Work = std::function<int(std::string const&, OutputSink&)>;

struct Result {
    StringSink said;
    std::string complaint;
    int exit = kExitDone;

    void fail(std::string what, int with = kExitFailed) {
        said.clear();
        complaint = std::move(what);
        exit = with;
    }
};

void workOn(std::string const& file, Work const& work, Result& result) {
    try {
        result.exit = work(file, result.said);
    } catch (InputError const& error) {
        result.fail(error.text());
    } catch (OutputError const& error) {
        result.fail(printableText(error.target) + ": " + error.what);
    } catch (UsageError const& error) {
        result.fail(printableText(error.what), kExitWrongArguments);
    } catch (std::bad_alloc const&) {
        result.fail(printableText(file) + ": out of memory");
    } catch (std::exception const& error) {
        result.fail(printableText(file) + ": " + printableText(error.what()));
    }
}

/// The one bar of all files, fed from several threads.
class CommonBar {
public:
    explicit CommonBar(std::size_t files) : _shares(files) {}

    bool isSeen() const { return _bar.hasLine(); }

    /// Of one file, by the one thread that works on it.
    void tell(std::size_t file, double share) {
        double const more = share - std::exchange(_shares[file], share);
        _bar.update((_done += more) / static_cast<double>(_shares.size()));
    }

private:
    std::vector<double> _shares;
    std::atomic<double> _done = 0;
    Progress _bar{"files"};
};

void workWithin(CommonBar& bar, std::size_t i, std::string const& file, Work const& work, Result& result) {
    if (!bar.isSeen()) {
        workOn(file, work, result);
        return;
    }
    {
        ProgressPart const part([&](double share) { bar.tell(i, share); });
        workOn(file, work, result);
    }
    bar.tell(i, 1);
}

int writeResults(std::vector<Result> const& results, SeveralTexts const& texts, OutputSink& out) {
    int exit = kExitDone;
    bool isFirst = true;
    out.write(texts.before);
    for (Result const& result : results) {
        if (std::string const& said = result.said.text(); !said.empty()) {
            out.write(isFirst ? "" : texts.between);
            out.write(said);
            isFirst = false;
        }
        if (!result.complaint.empty()) {
            writeFully(STDERR_FILENO, "lumenkey: " + result.complaint + "\n");
        }
        exit = std::max(exit, result.exit);
    }
    out.write(texts.after);
    return exit;
}

} // namespace

int forSeveralFiles(std::vector<std::string> const& files, OutputSink& out, Work const& work,
                    SeveralTexts const& texts) {
    if (files.size() == 1) {
        return work(files.front(), out);
    }
    std::vector<Result> results(files.size());
    {
        CommonBar bar(files.size());
        std::atomic<std::size_t> next = 0;
        auto const takeFiles = [&] {
            for (std::size_t i = next++; i < files.size(); i = next++) {
                workWithin(bar, i, files[i], work, results[i]);
            }
        };
        std::size_t const processors = std::max(1U, std::thread::hardware_concurrency());
        std::vector<std::jthread> others;
        for (std::size_t i = 1; i < std::min(files.size(), processors); ++i) {
            others.emplace_back(takeFiles);
        }
        takeFiles();
    }
    return writeResults(results, texts, out);
}

} // namespace lumenkey::tools
