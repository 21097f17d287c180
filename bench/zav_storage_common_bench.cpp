// The locks between processes: system calls, part of the queries that take turns.
#include "zav_api.h"

#include <benchmark/benchmark.h>

namespace {

constexpr int kKey = 0x7a42;

void look_up(benchmark::State &state) {
    int id = 0;
    for (auto _ : state)
        if (semaphore_get(kKey, &id) != 0)
            state.SkipWithError("no semaphore");
}
BENCHMARK(look_up)->Name("semaphore_get");

void read_value(benchmark::State &state) {
    int id = 0;
    semaphore_get(kKey, &id);
    int value = 0;
    for (auto _ : state)
        if (semaphore_getvalue(id, kKey, &value) != 0 || value != 1)
            state.SkipWithError("not free");
}
BENCHMARK(read_value)->Name("semaphore_getvalue");

void take_and_release(benchmark::State &state) {
    int id = 0;
    semaphore_get(kKey, &id);
    for (auto _ : state)
        if (semaphore_p(id, kKey) != 0 || semaphore_v(id, kKey) != 0)
            state.SkipWithError("not taken");
}
BENCHMARK(take_and_release)->Name("semaphore_p, semaphore_v");

} // namespace
