// Names of codes, trimming, conversion of codes, traces.
#include "zav_api.h"

#include <benchmark/benchmark.h>
#include <cstring>

namespace {

using NameFunction = char *(int, char *);

void name_of_code(benchmark::State &state, NameFunction *name, int code) {
    char text[128];
    for (auto _ : state) {
        benchmark::DoNotOptimize(name(code, text));
        benchmark::ClobberMemory();
    }
}

// The last name of each table, or all of them: the longest way.
BENCHMARK_CAPTURE(name_of_code, zav_raidleveldef_to_str, zav_raidleveldef_to_str, ZAV_RAIDLVL_JBOD);
BENCHMARK_CAPTURE(name_of_code, zav_raidstatedef_to_str, zav_raidstatedef_to_str, 31);
BENCHMARK_CAPTURE(name_of_code, zav_diskstatedef_to_str, zav_diskstatedef_to_str, 7);
BENCHMARK_CAPTURE(name_of_code, zav_lvmstatedef_to_str, zav_lvmstatedef_to_str, 63);
BENCHMARK_CAPTURE(name_of_code, zav_netstatedef_to_str, zav_netstatedef_to_str, ZAV_NET_ERR);
BENCHMARK_CAPTURE(name_of_code, zav_rbodstatedef_to_str, zav_rbodstatedef_to_str, ZAV_RBOD_EXIST);
BENCHMARK_CAPTURE(name_of_code, zav_rbodid_to_str, zav_rbodid_to_str, ZAV_RBOD_VOLT_CPU);
BENCHMARK_CAPTURE(name_of_code, zav_vgdef_to_str, zav_vgdef_to_str, 12);
BENCHMARK_CAPTURE(name_of_code, zav_typedef_to_str, zav_typedef_to_str, ZAV_EVENT_RBOD);
BENCHMARK_CAPTURE(name_of_code, zav_rcdef_to_str, zav_rcdef_to_str, ZAV_RC_ERR_NIC);

// Trimming works in place, so each round gets the text anew.
template <typename Trim>
void trim_text(benchmark::State &state, const Trim &cut) {
    static constexpr char kText[] = " \t  a value between blanks, of a line's length   \t \n";
    char text[sizeof kText];
    for (auto _ : state) {
        memcpy(text, kText, sizeof kText);
        cut(text);
        benchmark::DoNotOptimize(text);
    }
}

char blanks[] = " \t\n";
BENCHMARK_CAPTURE(trim_text, trim, [](char *text) { trim(text); });
BENCHMARK_CAPTURE(trim_text, rtrim, [](char *text) { rtrim(text, blanks); });
BENCHMARK_CAPTURE(trim_text, ltrim, [](char *text) { ltrim(text, blanks); });

void convert_code(benchmark::State &state, int (*convert)(int)) {
    for (auto _ : state)
        if (convert(ZAV_RC_ERR_ESTRPIPE) != ZAV_RC_ERR_ESTRPIPE)
            state.SkipWithError("another code");
}
BENCHMARK_CAPTURE(convert_code, zavRCSysToZav, zavRCSysToZav);
BENCHMARK_CAPTURE(convert_code, zavRCZavToSys, zavRCZavToSys);

// What each trace costs that is not printed.
void stay_silent(benchmark::State &state) {
    for (auto _ : state)
        zavdbgmsg(2, 1, "%s() - %d\n", "query", 1);
}
BENCHMARK(stay_silent)->Name("zavdbgmsg, silent");

} // namespace
