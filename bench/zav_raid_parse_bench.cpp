// The pure part of the software arrays' state.
#include "storage/zav_raid_parse.h"

#include "texts.h"
#include "zav_api.h"

#include <benchmark/benchmark.h>
#include <cstring>
#include <string>
#include <vector>

namespace {

void decide(benchmark::State &state, int level, int active, const char *status) {
    for (auto _ : state) {
        const auto decision = zav::decide_raid_state(level, 4, active, status);
        if (!decision.known)
            state.SkipWithError("no rule");
        benchmark::DoNotOptimize(decision);
    }
}

constexpr const char *kHealthy =
    "      1465151808 blocks level 5, 64k chunk, algorithm 2 [4/4] [UUUU]\n";
constexpr const char *kOneLost =
    "      1465151808 blocks level 5, 64k chunk, algorithm 2 [4/3] [UUU_]\n";
constexpr const char *kTwoLost = "      976896 blocks 64K chunks 2 near-copies [4/2] [_UU_]\n";

BENCHMARK_CAPTURE(decide, raid0, ZAV_RAIDLVL_0, 4, kHealthy);
BENCHMARK_CAPTURE(decide, raid1_normal, ZAV_RAIDLVL_1, 4, kHealthy);
BENCHMARK_CAPTURE(decide, raid1_degraded, ZAV_RAIDLVL_1, 3, kOneLost);
BENCHMARK_CAPTURE(decide, raid5_normal, ZAV_RAIDLVL_5, 4, kHealthy);
BENCHMARK_CAPTURE(decide, raid5_degraded, ZAV_RAIDLVL_5, 3, kOneLost);
BENCHMARK_CAPTURE(decide, raid10_two_lost, ZAV_RAIDLVL_10, 2, kTwoLost);

void read_third_line(benchmark::State &state, const char *line, zav::RebuildLine expected) {
    for (auto _ : state) {
        int percent = 0;
        if (zav::read_rebuild_line(line, percent) != expected)
            state.SkipWithError("read as another line");
        benchmark::DoNotOptimize(percent);
    }
}

BENCHMARK_CAPTURE(read_third_line, idle, "      \n", zav::RebuildLine::kIdle);
BENCHMARK_CAPTURE(read_third_line, delayed, "      \tresync=DELAYED\n", zav::RebuildLine::kDelayed);
BENCHMARK_CAPTURE(read_third_line, running,
                  "      [======>..............]  recovery = 34.7% (169000000/488383936) "
                  "finish=61.2min",
                  zav::RebuildLine::kRunning);
BENCHMARK_CAPTURE(read_third_line, unexpected, "      bitmap: 1/4 pages [4KB], 65536KB chunk\n",
                  zav::RebuildLine::kUnexpected);

std::vector<std::string> lines_of(const std::string &text) {
    std::vector<std::string> lines;
    for (size_t at = 0; at < text.size();) {
        const size_t end = text.find('\n', at) + 1;
        lines.push_back(text.substr(at, end - at));
        at = end;
    }
    return lines;
}

// All lines of an array's detail report; they are split in place, so each round copies them.
void read_detail(benchmark::State &state) {
    const std::vector<std::string> lines = lines_of(bench::detail_text);
    for (auto _ : state) {
        zav::RaidDetail detail = {ZAV_RAIDLVL_NONE, 0, 0};
        for (const std::string &line : lines) {
            char copy[80];
            memcpy(copy, line.c_str(), line.size() + 1);
            if (!zav::read_detail_line(copy, detail))
                state.SkipWithError("refused");
        }
        if (detail.level != ZAV_RAIDLVL_5 || detail.active_devices != 4)
            state.SkipWithError("not read");
        benchmark::DoNotOptimize(detail);
    }
}
BENCHMARK(read_detail)->Name("read_detail_line/whole_report");

} // namespace
