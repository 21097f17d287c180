// The reports that are read line by line. Of a file the whole call is measured, its commands
// answered without being run; of what a command prints its reader, with the call's line buffer.
#include "appliance.h"
#include "cdburn/zav_cdburn_media.h"
#include "cdburn/zav_cdburn_progress_parse.h"
#include "commands.h"
#include "common/raid_report.h"
#include "growth.h"
#include "nic/zav_nic_parse.h"
#include "require.h"
#include "storage/zav_hwraid_cascade.h"
#include "storage/zav_raid_parse.h"
#include "texts.h"
#include "zav_api.h"

#include <algorithm>
#include <cstdio>

namespace bench {

namespace {

// That many lines, the last ones being `last`.
std::string lines_before(const std::string &filler, int lines, const std::string &last) {
    const auto own = static_cast<int>(std::count(last.begin(), last.end(), '\n'));
    return repeated(filler, lines - own) + last;
}

// Feeds a reader as a stream is read: lines longer than the buffer come in pieces.
template <int Buffer, class Take>
void feed(std::string text, const Take &take) {
    FILE *stream = fmemopen(text.data(), text.size(), "r");
    char line[Buffer];
    while (fgets(line, sizeof line, stream) != nullptr)
        take(line);
    fclose(stream);
}

// ---- Whole calls that read a file ----

// Writes the file before the call is timed.
std::function<Action(int)> of_file(const char *path, const std::function<std::string(int)> &text,
                                   const Action &call) {
    return [=](int lines) {
        put(path, text(lines));
        return call;
    };
}

constexpr const char *kReport = "/etc/Kiru/zav/.raidinfo";

// Eight lines of a unit: its marker, identity, set, volume, disk, readings.
const std::string unit_lines = "RBOD#1\nM:HBQE-T500\nS:Y101\nI:\nR:1:Raid Set # 01:4000.0:4:12:0\n"
                               "V:1:UNIT1:3:3000.0:0:1\nD:1:1000.2:1\nH:45.0:3200:11.9:5.1:1.20\n";

std::string report_before_unit(int lines) {
    return lines_before("D:1:500.1:1\n", lines, unit_lines);
}

std::string report_of_long_section(int lines) {
    return "RBOD#1\nR:1:Raid Set # 01:4000.0:4:12:0\n" +
           lines_before("D:1:1000.2:1\n", lines - 2, "");
}

void read_enclosure() {
    zavDevice unit = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, 0x101, 0};
    sRaidSetInfo report;
    require(updateData(&unit, &report) == ZAV_RC_OK && report.sDiskInfo[0].status == 1,
            "updateData");
}

void read_monitor() {
    float degrees = 0;
    require(zavGetRBODHwMon(1, 0, &degrees) == ZAV_RC_OK && degrees == 45.0F, "zavGetRBODHwMon");
}

void read_ability() {
    require(zavIsComboDrive() == 0, "zavIsComboDrive");
}

void read_memory() {
    float usage = 0;
    require(meminfo(2, &usage) == ZAV_RC_OK && usage == 50.0F, "meminfo");
}

void read_mounts() {
    float usage = 0;
    require(fsinfo(4, &usage) == ZAV_RC_OK, "fsinfo");
}

void read_ups() {
    zavUpsState state;
    require(zavGetStateUPS(&state) == ZAV_RC_OK && state.state == ZAV_UPS_ONLINE, "zavGetStateUPS");
}

std::string ups_and_more(int lines) {
    return ups_text + repeated("XFERS    : 0\n", lines - 7);
}

void read_array() {
    zavDevice array = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1};
    zavRaidState state;
    require(zavGetStateRaid(&array, &state) == ZAV_RC_OK && state.state == ZAV_RAID_NORMAL,
            "zavGetStateRaid");
}

std::string mdstat_of(int lines) {
    return lines_before("unused devices: <none>\n", lines,
                        "md1 : active raid5 sdd2[3] sdc2[2] sdb2[1] sda2[0]\n"
                        "      1465151808 blocks level 5, 64k chunk, algorithm 2 [4/4] [UUUU]\n"
                        "      \n");
}

void map_time_zone() {
    require(zavMapArcTimeZone() >= 9, "zavMapArcTimeZone");
}

// ---- Readers of what a command prints ----

Action identity_of(int lines) {
    return [text = report_before_unit(lines)] {
        zav::IdentityReader reader(1);
        sRBODMap unit = {};
        bool more = true;
        feed<zav::kIdentityPiece>(text,
                                  [&](char *piece) { more = more && reader.take(piece, unit); });
        require(std::string(unit.sn) == "Y101", "IdentityReader");
    };
}

Action cascade_of(int lines) {
    return [text = lines_before("phy   1:D:attached:[5001B4D5008FF01F800:00]\n", lines,
                                cascade_text)] {
        zav::Cascade cascade;
        feed<128>(text, [&](const char *line) { cascade.take(line); });
        require(cascade.current == 1, "Cascade");
    };
}

Action detail_of(int lines) {
    return [text = lines_before("     Used Dev Size : 488383936 (465.76 GiB 500.11 GB)\n", lines,
                                "        Raid Level : raid5\n    Active Devices : 4\n")] {
        zav::RaidDetail detail = {};
        feed<80>(text, [&](char *line) { zav::read_detail_line(line, detail); });
        require(detail.active_devices == 4, "read_detail_line");
    };
}

Action port_of(int lines) {
    return [text = lines_before("\tSupported ports: [ TP ]\n", lines, port_text)] {
        zavNetState info = {};
        feed<80>(text, [&](const char *line) { zav::read_port_line(line, info); });
        require(info.state == ZAV_NET_UP, "read_port_line");
    };
}

Action dvd_of(int lines) {
    return [text = lines_before(" Number of Sessions:    1\n", lines, dvd_text)] {
        zavMediaInfo info = {};
        feed<80>(text, [&](char *line) { zav::read_dvd_line(line, info); });
        require(info.discType == ZAV_DVD_PLUS_RW, "read_dvd_line");
    };
}

Action cd_of(int lines) {
    return [text = lines_before("  Is not unrestricted\n", lines, cd_text)] {
        zavMediaInfo info = {};
        feed<80>(text, [&](char *line) { zav::read_atip_line(line, info); });
        require(info.discTotalSize == 719692, "read_atip_line");
    };
}

Action progress_of(int lines) {
    return [text = lines_before("  12.34% done, estimate finish Mon Mar  2 12:13:14 2020\n", lines,
                                "100")] {
        zav::Progress progress;
        feed<80>(text, [&](char *line) { progress.read_line(line); });
        require(progress.percent() == 100, "Progress");
    };
}

} // namespace

std::vector<Growth> growth_of_reports() {
    const std::vector<int> sizes = {10, 100, 1000, 10000};
    std::vector<Growth> all;
    const auto add = [&](const char *name, std::function<Action(int)> at) {
        all.push_back({name, "line", sizes, std::move(at)});
    };
    add("updateData: the RAID controller's report, a unit at its end",
        of_file(kReport, report_before_unit, read_enclosure));
    add("updateData: a section of so many disks; four are taken, the rest is read and left out",
        of_file(kReport, report_of_long_section, read_enclosure));
    add("zavGetRBODHwMon: the same report, a unit at its end",
        of_file(kReport, report_before_unit, read_monitor));
    add("zavGetRBODSN: the same report, its reader", identity_of);
    add("zavGetRBODSet: the cascade's listing, its reader; seven expanders are taken", cascade_of);
    add("zavGetStateRaid: mdadm's report, its reader", detail_of);
    add("zavGetStateRaid: /proc/mdstat, the array at its end",
        of_file("/proc/mdstat", mdstat_of, answered(detail_text, read_array)));
    add("zavGetStateNic: ethtool's report, its reader", port_of);
    add("zavQueryDisc: dvd+rw-mediainfo's report, its reader", dvd_of);
    add("zavQueryDisc: cdrecord's report, its reader", cd_of);
    add("zavCDProgress: the progress file, its reader", progress_of);
    add("zavIsComboDrive: the kernel's table of drives",
        of_file(
            "/proc/sys/dev/cdrom/info",
            [](int lines) {
                return lines_before("Can write CD-R:\t\t1\n", lines, "Can write DVD-R:\t0\n");
            },
            read_ability));
    add("meminfo: /proc/meminfo",
        of_file(
            "/proc/meminfo",
            [](int lines) {
                return lines_before("HugePages_Total:       0\n", lines,
                                    "SwapTotal:       1048572 kB\nSwapFree:  524286 kB\n");
            },
            read_memory));
    add("fsinfo: the mounted file systems",
        of_file(
            "/etc/mtab",
            [](int lines) {
                return lines_before("proc /proc proc rw 0 0\n", lines, "tmpfs /tmp tmpfs rw\n");
            },
            read_mounts));
    add("zavMapArcTimeZone: the list of time zones",
        of_file(
            "/etc/arecaTimeZone.list",
            [](int lines) { return lines_before("Europe/Oslo\n", lines, "Asia/Tokyo\n"); },
            answered("Tokyo\n", map_time_zone)));
    add("zavGetStateUPS: the daemon's status; 4,095 bytes are read, the rest is not",
        of_file("/var/log/apcupsd.status", ups_and_more, read_ups));
    return all;
}

} // namespace bench
