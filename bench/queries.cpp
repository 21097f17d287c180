#include "queries.h"

#include "appliance.h"
#include "commands.h"
#include "paired.h"
#include "require.h"
#include "texts.h"
#include "zav_api.h"

#include <algorithm>
#include <cstdio>
#include <string>
#include <vector>

namespace bench {

namespace {

// ---- The library's calls ----

void ask_disk() {
    zavDevice disk = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 1, 0};
    zavHddState info;
    require(zavGetStateDisk(&disk, &info) == ZAV_RC_OK && info.state == ZAV_HDD_FOUND,
            "zavGetStateDisk");
}

void ask_array() {
    zavDevice array = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1};
    zavRaidState info;
    require(zavGetStateRaid(&array, &info) == ZAV_RC_OK && info.state == ZAV_RAID_NORMAL &&
                info.raidlevel == ZAV_RAIDLVL_5,
            "zavGetStateRaid");
}

void ask_group() {
    zavDevice group = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 1, 0};
    zavLVMState info;
    require(zavgetStateLVMVG(&group, &info) == ZAV_RC_OK && info.state == ZAV_LVM_NORMAL &&
                info.dev.lvmvgdev.pvdev[0].dev.disk == 2,
            "zavgetStateLVMVG");
}

void ask_physical_volume() {
    zavDevice volume = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 1, 1};
    zavLVMState info;
    require(zavgetStateLVMPV(&volume, &info) == ZAV_RC_OK && info.state == ZAV_LVM_NORMAL &&
                info.dev.lvmpvdev.dev.disk == 2,
            "zavgetStateLVMPV");
}

void ask_logical_volume() {
    zavDevice volume = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 1, 1};
    zavLVMState info;
    require(zavgetStateLVMLV(&volume, &info) == ZAV_RC_OK && info.state == 0 &&
                info.dev.lvmlvdev.size == 1,
            "zavgetStateLVMLV");
}

void look_for_volume_tools() {
    require(zavCheckExeFile() == ZAV_RC_OK, "zavCheckExeFile");
}

void ask_group_of_array() {
    char array[] = "/dev/md1";
    char group[128] = "";
    require(zavGetPVsVG(array, group) == ZAV_RC_OK && std::string(group) == "DataVG1",
            "zavGetPVsVG");
}

void ask_usage() {
    zavDevice volume = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 1, 1};
    float usage = -1;
    require(zavgetFSusage(&volume, &usage) == ZAV_RC_OK && usage >= 0, "zavgetFSusage");
}

void ask_units() {
    sRBODSet units;
    require(zavGetRBODSet(&units) == ZAV_RC_OK && units.RBOD[0].iExist == 1 &&
                units.RBOD[1].iExist == 0 && *units.RBOD[0].sn != '\0',
            "zavGetRBODSet");
}

void ask_identity() {
    sRBODMap unit = {};
    unit.rbodid = 1;
    require(zavGetRBODSN(&unit) == ZAV_RC_OK && std::string(unit.sn) == "Y101", "zavGetRBODSN");
}

void ask_unit_temperature() {
    sRBOD unit = {};
    unit.id = 1;
    zavRBODState info;
    require(zavGetStateRBOD(&unit, ZAV_RBOD_TEMP_CPU, &info) == ZAV_RC_OK && info.value == 45.0F,
            "zavGetStateRBOD");
}

void ask_interface(int minor_type) {
    zavDevice interface = {ZAV_DEV_NIC, minor_type, 1, 0};
    zavNetState info;
    require(zavGetStateNic(&interface, &info) == ZAV_RC_OK && info.state == ZAV_NET_UP &&
                info.value == 1000,
            "zavGetStateNic");
}

void ask_port() {
    ask_interface(ZAV_MINDEV_NIC_ETH);
}

void ask_bond() {
    ask_interface(ZAV_MINDEV_NIC_BOND);
}

void ask_disc(int type) {
    zavMediaInfo info;
    require(zavQueryDisc(&info, 0) == ZAV_RC_OK && info.discType == type &&
                info.discAvailableSize > 0,
            "zavQueryDisc");
}

void lay_in_dvd() {
    put_tool("/usr/bin/dvd+rw-mediainfo", dvd_text);
}

void ask_dvd() {
    ask_disc(ZAV_DVD_PLUS_RW);
}

void lay_in_cd() {
    put_tool("/usr/bin/dvd+rw-mediainfo", "exit 252\n:-( non-DVD media mounted, exiting...\n");
}

void ask_cd() {
    ask_disc(ZAV_CD_R);
}

void look_for_burner_tools() {
    require(checkExternalBin() == ZAV_RC_OK, "checkExternalBin");
}

void ask_progress() {
    require(zavCDProgress() == 34, "zavCDProgress");
}

void count_disks() {
    int count = 0;
    require(get_diskcount(&count) == ZAV_RC_OK && count == 1, "get_diskcount");
}

void synchronise() {
    require(zavSyncConf() == ZAV_RC_OK, "zavSyncConf");
}

void map_time_zone() {
    require(zavMapArcTimeZone() == 1, "zavMapArcTimeZone");
}

void nothing() {}

// ---- Which of them are measured ----

struct Query {
    const char *name;
    void (*call)();
    void (*prepare)() = nothing;
};

// Not repeated, because they are one of these and a check or another: zavGetStateLVM
// (zavCheckExeFile, and the reader of the minor type), zavGetPVsVGDev (zavGetPVsVG), fillinfo
// (zavGetRBODSN), and the exported readers (getDiskStateSATA, getRaidStateSW, getNicStateETH,
// getNicStateBOND). The other sensors of zavGetStateRBOD differ by one line of arithmetic.
constexpr Query kQueries[] = {
    {"zavGetStateDisk, SATA disk", ask_disk},
    {"zavGetStateRaid, software array", ask_array},
    {"zavgetStateLVMVG, one PV", ask_group},
    {"zavgetStateLVMPV, on an array", ask_physical_volume},
    {"zavgetStateLVMLV", ask_logical_volume},
    {"zavCheckExeFile", look_for_volume_tools},
    {"zavGetPVsVG", ask_group_of_array},
    {"zavgetFSusage", ask_usage},
    {"zavGetRBODSet, one unit", ask_units},
    {"zavGetRBODSN", ask_identity},
    {"zavGetStateRBOD, temperature", ask_unit_temperature},
    {"zavGetStateNic, Ethernet port", ask_port},
    {"zavGetStateNic, bond", ask_bond},
    {"zavQueryDisc, DVD", ask_dvd, lay_in_dvd},
    {"zavQueryDisc, CD", ask_cd, lay_in_cd},
    {"checkExternalBin", look_for_burner_tools},
    {"zavCDProgress", ask_progress},
    {"get_diskcount", count_disks},
    {"zavMapArcTimeZone", map_time_zone},
    {"zavSyncConf", synchronise},
};

// ---- Measuring ----

constexpr std::size_t kWarmUp = 3;
constexpr std::size_t kLeastPairs = 40;
constexpr std::size_t kMostPairs = 400;
constexpr double kSeconds = 3.0;      // for each query
constexpr double kMoreSeconds = 12.0; // for one that is over the limit, perhaps by chance

bool not_known(const Comparison &row) {
    return row.time.median > kLimit && row.time.low <= kLimit;
}

// What other programs' load hides, the processor time may tell.
Verdict verdict_of(const Comparison &row) {
    if (row.time.median <= kLimit)
        return Verdict::kKept;
    if (!not_known(row))
        return Verdict::kBroken;
    return row.processor.high <= kLimit ? Verdict::kKept : Verdict::kNotKnown;
}

const char *word_for(const Comparison &row) {
    switch (verdict_of(row)) {
    case Verdict::kKept:
        return not_known(row) ? "OK (processor)" : "OK";
    case Verdict::kNotKnown:
        return "NOT KNOWN";
    default:
        return "OVER";
    }
}

// The same process for both: what starting a command costs depends on who starts it.
Comparison compare(const std::vector<Command> &commands, const Action &call) {
    Pairs pairs([&] { run_bare(commands); }, call);
    pairs.measure(kWarmUp);
    const std::size_t first = pairs.fitting(kSeconds, kLeastPairs, kMostPairs);
    const std::size_t more = pairs.fitting(kMoreSeconds, kLeastPairs, 4 * kMostPairs);
    pairs.forget();
    pairs.measure(first);
    // What was measured counts on: a row is not tried until it fits.
    if (not_known(pairs.compared()))
        pairs.measure(more);
    return pairs.compared();
}

Verdict print(const char *name, std::size_t commands, const Comparison &row) {
    printf("%-34s %8zu %6zu %9.1f %9.1f %6.3f %5.3f .. %5.3f %6.3f %5.3f .. %5.3f  %s\n", name,
           commands, row.pairs, row.bare, row.call, row.time.median, row.time.low, row.time.high,
           row.processor.median, row.processor.low, row.processor.high, word_for(row));
    fflush(stdout);
    return verdict_of(row);
}

// What the machine makes of two that are the same.
void print_noise() {
    const std::vector<Command> commands = commands_of(ask_disk);
    print("(one bare command beside itself)", commands.size(),
          compare(commands, [&] { run_bare(commands); }));
}

Verdict measure(const Query &query) {
    query.prepare();
    const std::vector<Command> commands = commands_of(query.call);
    require(!commands.empty(), query.name);
    return print(query.name, commands.size(), compare(commands, query.call));
}

} // namespace

Verdict compare_queries() {
    printf(
        "\nWhole calls beside their commands run bare (medians of pairs timed in turn, with 95 %% "
        "intervals; limit %.2f)\n%-34s %8s %6s %9s %9s %6s %14s %6s\n",
        kLimit, "query", "commands", "pairs", "bare us", "call us", "ratio", "",
        "of processor time");
    Verdict worst = Verdict::kKept;
    print_noise();
    for (const Query &query : kQueries)
        worst = std::max(worst, measure(query));
    if (worst == Verdict::kNotKnown)
        puts("NOT KNOWN: the limit lies within the interval; measure again on a quieter machine.");
    return worst;
}

} // namespace bench
