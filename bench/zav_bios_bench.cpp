// Strings of an SMBIOS structure.
#include "zav_api.h"
#include "zav_private.h"

#include <benchmark/benchmark.h>
#include <cstring>

namespace {

void string_of_structure(benchmark::State &state) {
    alignas(smbios_header) char entry[] = "\x01\x04\x00\x00"
                                          "maker\0product\0version\0serial\0";
    auto *header = reinterpret_cast<smbios_header *>(entry);
    for (auto _ : state) {
        const char *text = smbios_string(header, 4);
        benchmark::DoNotOptimize(text);
        if (strcmp(text, "serial") != 0)
            state.SkipWithError("another string");
    }
}
BENCHMARK(string_of_structure)->Name("smbios_string");

} // namespace
