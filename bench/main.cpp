// zav_bench: what the library costs. Run it with bench/run.
#include "appliance.h"
#include "paired.h"
#include "queries.h"

#include <benchmark/benchmark.h>
#include <cstdio>
#include <exception>
#include <vector>

namespace {

constexpr double kLimit = 1.05;
constexpr size_t kWarmUp = 10;
constexpr size_t kPairs = 400;

bool compare_queries() {
    std::vector<bench::Comparison> comparisons;
    for (const bench::Query &query : bench::queries()) {
        bench::compare(query, kWarmUp);
        comparisons.push_back(bench::compare(query, kPairs));
    }
    return bench::report(comparisons, kLimit);
}

int run(int argc, char **argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 64;
    if (!bench::set_up_appliance())
        return 1;
    benchmark::RunSpecifiedBenchmarks();
    fflush(stdout);
    return compare_queries() ? 0 : 1;
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
