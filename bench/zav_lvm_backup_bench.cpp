// The pure part of a volume group's query: its metadata backup.
#include "backup_source.h"
#include "texts.h"

#include <benchmark/benchmark.h>
#include <string>

namespace {

void read(benchmark::State &state) {
    const int physical = static_cast<int>(state.range(0));
    const int logical = static_cast<int>(state.range(1));
    const std::string text = bench::backup_text(physical, logical);
    for (auto _ : state) {
        lvmVG group = {};
        group.pvcount = physical;
        group.lvcount = logical;
        bench::BackupText source(text);
        if (zav::read_backup(source, group) != ZAV_RC_OK ||
            group.lvdev[logical - 1].lvmdev.disk != logical)
            state.SkipWithError("read as another group");
        benchmark::DoNotOptimize(group);
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}
BENCHMARK(read)->Name("read_backup")->Args({1, 2})->Args({9, 6});

} // namespace
