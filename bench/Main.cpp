// Runs all benchmarks, then prints what became of the bounds and writes the same to a file.
//
//     lumenkey_bench [--quick] [--json PATH] [options of Google Benchmark]

#include "bench/Benchmarks.h"
#include "bench/Contest.h"

#include <climits>
#include <cstring>
#include <iostream>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>
#include <malloc.h>

namespace {

struct Options {
    bool quick = false;
    std::string json = LUMENKEY_BENCH_JSON;
    /// The others, for Google Benchmark.
    std::vector<char*> rest;
};

bool parse(int argc, char** argv, Options& options) {
    options.rest.push_back(argv[0]);
    for (int i = 1; i < argc; ++i) {
        if (std::strcmp(argv[i], "--quick") == 0) {
            options.quick = true;
        } else if (std::strcmp(argv[i], "--json") == 0) {
            if (++i == argc)
                return false;
            options.json = argv[i];
        } else {
            options.rest.push_back(argv[i]);
        }
    }
    return true;
}

/// What one pass frees the next one takes. If it went back to the system, rows would measure how pages are
/// handed out again, and the more so the tidier a heap is left.
void keepFreedMemory() {
    constexpr int mostThatMayBeAsked = 32 << 20;
    mallopt(M_MMAP_THRESHOLD, mostThatMayBeAsked);
    mallopt(M_TRIM_THRESHOLD, INT_MAX);
}

} // namespace

int main(int argc, char** argv) {
    Options options;
    if (!parse(argc, argv, options)) {
        std::cerr << "lumenkey_bench: --json needs a path\n";
        return 2;
    }
    int rest = static_cast<int>(options.rest.size());
    options.rest.push_back(nullptr);
    keepFreedMemory();
    benchmark::Initialize(&rest, options.rest.data());
    if (benchmark::ReportUnrecognizedArguments(rest, options.rest.data()))
        return 2;

    Bench bench;
    if (options.quick)
        bench.setQuick();
    registerEvaluation(bench);
    registerEditing(bench);
    registerReshaping(bench);
    registerMemory(bench);
    registerThreads(bench);
    registerTree(bench);
    registerRecording(bench);
    registerDocuments(bench);
    registerGsl(bench);
    registerGStreamer(bench);
    registerMlt(bench);

    std::cout << "Time: one evaluation, sample or key of ours. CPU: a whole repetition, the limit's turn "
                 "included.\n";
    benchmark::RunSpecifiedBenchmarks();
    if (bench.report.empty())
        return 0;
    std::cout << '\n';
    bench.report.printTable(std::cout);
    if (!bench.report.writeJson(options.json)) {
        std::cerr << "lumenkey_bench: cannot write " << options.json << '\n';
        return 1;
    }
    return 0;
}
