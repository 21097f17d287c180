// Volume groups by number and name, mount points, and lines of the metadata.
#include "zav_api.h"

#include <benchmark/benchmark.h>
#include <cstring>

namespace {

void name_of_group(benchmark::State &state) {
    char name[18];
    for (auto _ : state) {
        if (zavMapVGToStr(12, name) != ZAV_RC_OK)
            state.SkipWithError("no name");
        benchmark::DoNotOptimize(name);
    }
}
BENCHMARK(name_of_group)->Name("zavMapVGToStr");

void group_of_name(benchmark::State &state) {
    char name[] = "DataVG12";
    int number = 0;
    for (auto _ : state)
        if (zavMapStrToVG(name, &number) != ZAV_RC_OK || number != 12)
            state.SkipWithError("no number");
}
BENCHMARK(group_of_name)->Name("zavMapStrToVG");

void mount_point(benchmark::State &state) {
    zavDevice volume = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 3, 12};
    char path[42];
    for (auto _ : state) {
        if (zavDevToMnt(&volume, path) != ZAV_RC_OK)
            state.SkipWithError("no path");
        benchmark::DoNotOptimize(path);
    }
}
BENCHMARK(mount_point)->Name("zavDevToMnt");

void value_of_line(benchmark::State &state) {
    static constexpr char kLine[] = "\t\t\t\textent_count = 32\t# 128 Megabytes\n";
    char line[sizeof kLine];
    for (auto _ : state) {
        memcpy(line, kLine, sizeof kLine); // it is split in place
        zavParserLine1(line);
        benchmark::DoNotOptimize(line);
    }
}
BENCHMARK(value_of_line)->Name("zavParserLine1");

} // namespace
