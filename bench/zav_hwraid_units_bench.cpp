// The expansion units' places in the cascade.
#include "zav_api.h"

#include <benchmark/benchmark.h>
#include <cstdio>
#include <cstring>

namespace {

void address_of_line(benchmark::State &state) {
    char line[] = "  phy   4:S:attached:[500605B000C7F540:02  i(SSP+STP+SMP)]\n";
    char address[20];
    for (auto _ : state) {
        getsasaddr(line, address);
        benchmark::DoNotOptimize(address);
    }
}
BENCHMARK(address_of_line)->Name("getsasaddr");

// A full tree of seven, listed from its leaves on.
void number_units(benchmark::State &state) {
    sExpander cascade[7] = {};
    for (int i = 0; i < 7; ++i) {
        const int place = 7 - i;
        snprintf(cascade[i].sasaddr, sizeof cascade[i].sasaddr, "%016d800", place);
        snprintf(cascade[i].upperchild, sizeof cascade[i].upperchild, "%016d800", 2 * place);
        snprintf(cascade[i].lowerchild, sizeof cascade[i].lowerchild, "%016d800", 2 * place + 1);
    }
    cascade[6].id = 1;
    for (auto _ : state)
        SetRBODID(cascade, nullptr, 0);
    if (cascade[0].id != 7)
        state.SkipWithError("not numbered");
}
BENCHMARK(number_units)->Name("SetRBODID, seven units");

} // namespace
