// The model: two small files read, no command. Part of every query.
#include "zav_api.h"

#include <benchmark/benchmark.h>

namespace {

void get_model(benchmark::State &state) {
    for (auto _ : state)
        if (zavGetModel() != ZAV_MODEL_SOLVANE_2860_4HDD)
            state.SkipWithError("another model");
}
BENCHMARK(get_model)->Name("zavGetModel");

} // namespace
