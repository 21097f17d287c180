// The pure part of the hardware-RAID queries: the controller's report.
#include "common/raid_report.h"

#include "texts.h"

#include <benchmark/benchmark.h>
#include <cstdio>
#include <string>

namespace {

void read(benchmark::State &state) {
    std::string text = bench::report_text(static_cast<int>(state.range(0)));
    for (auto _ : state) {
        FILE *report = fmemopen(text.data(), text.size(), "r");
        zav::EnclosureReader reader(zav::Marker::unit(1));
        char piece[zav::kReportPiece];
        while (!reader.ended() && fgets(piece, sizeof piece, report) != nullptr)
            reader.take(piece);
        fclose(report);
        sRaidSetInfo info;
        if (!reader.fill(info) || info.sDiskInfo[3].status != 1)
            state.SkipWithError("read as another report");
        benchmark::DoNotOptimize(info);
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}
BENCHMARK(read)->Name("EnclosureReader, lines before")->Arg(10)->Arg(100)->Arg(1000)->Arg(10000);

} // namespace
