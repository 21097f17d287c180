// zav_bench: what the library costs. Run it with bench/run.
#include "appliance.h"
#include "footprint.h"
#include "growth.h"
#include "queries.h"
#include "reads.h"

#include <algorithm>
#include <benchmark/benchmark.h>
#include <cstdio>
#include <exception>
#include <vector>

namespace {

// Short, as there are many; the command line may say otherwise. False for an option there is not.
bool run_microbenchmarks(int argc, char **argv) {
    char least[] = "--benchmark_min_time=0.05";
    std::vector<char *> words(argv, argv + argc);
    words.insert(words.begin() + std::min(argc, 1), least);
    words.push_back(nullptr);
    int count = argc + 1;
    benchmark::Initialize(&count, words.data());
    if (benchmark::ReportUnrecognizedArguments(count, words.data()))
        return false;
    benchmark::RunSpecifiedBenchmarks();
    fflush(stdout);
    return true;
}

int run(int argc, char **argv) {
    if (!bench::set_up_appliance())
        return 1;
    if (!run_microbenchmarks(argc, argv))
        return 64;
    bench::report_footprint();
    bench::compare_reads();
    const bench::Verdict queries = bench::compare_queries();
    const bool linear = bench::report_growth();
    if (queries == bench::Verdict::kBroken || !linear)
        return 1;
    return queries == bench::Verdict::kNotKnown ? 2 : 0;
}

} // namespace

int main(int argc, char **argv) {
    try {
        return run(argc, argv);
    } catch (const std::exception &error) {
        fprintf(stderr, "zav_bench: %s\n", error.what());
        return 1;
    }
}
