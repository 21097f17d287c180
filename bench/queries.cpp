#include "queries.h"

#include "zav_api.h"

#include <cstdio>
#include <cstdlib>

namespace bench {

namespace {

// A wrong answer is often a quick one: it must not be measured.
void require(bool right, const char *what) {
    if (right)
        return;
    fprintf(stderr, "zav_bench: %s did not give the expected answer\n", what);
    exit(1);
}

// ---- The bare commands, as a program without the library would run them. ----

void run(const char *command) {
    require(system(command) == 0, command);
}

void read_all(const char *command) {
    FILE *output = popen(command, "r");
    require(output != nullptr, command);
    char text[4096];
    size_t length = 0;
    for (size_t got = 0; (got = fread(text, 1, sizeof text, output)) > 0;)
        length += got;
    require(pclose(output) == 0 && length > 0, command);
}

// The commands of a volume group's query.
void read_group(const char * /*they are these*/) {
    run("/usr/sbin/vgs &> /etc/Kiru/zav/.vgs");
    run("cat /etc/Kiru/zav/.vgs | grep DataVG1 &>/dev/null");
    run("/usr/sbin/vgs DataVG1 &>/dev/null");
    run("/usr/sbin/vgdisplay DataVG1 &> /etc/Kiru/zav/.vgdisplay.DataVG1");
    read_all("cat /etc/Kiru/zav/.vgdisplay.DataVG1 | grep \"Cur PV\" | cut -c 12- ");
    read_all("cat /etc/Kiru/zav/.vgdisplay.DataVG1 | grep \"Cur LV\" | cut -c 12- ");
    read_all("/usr/sbin/vgdisplay -c DataVG1 2>/dev/null | cut -d ':' -f 12");
    run("/usr/sbin/vgcfgbackup -f /etc/Kiru/zav/DataVG1 DataVG1 &> /dev/null");
    read_all("echo /dev/`udevinfo -q symlink -p /block/md1`");
}

// The commands of the expansion units' query, of which there is one.
void find_units(const char * /*they are these*/) {
    read_all("/usr/bin/query_sas.sh");
    read_all("cat /etc/Kiru/zav/.raidinfo");
}

void read_port(const char * /*they are these*/) {
    run("/sbin/ethtool eth0 > /dev/null  2>&1");
    read_all("/sbin/ethtool eth0 2>&1");
}

// ---- The library's calls. ----

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

void ask_units() {
    sRBODSet units;
    require(zavGetRBODSet(&units) == ZAV_RC_OK && units.RBOD[0].iExist == 1 &&
                units.RBOD[1].iExist == 0 && *units.RBOD[0].sn != '\0',
            "zavGetRBODSet");
}

void ask_port() {
    zavDevice port = {ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 1, 0};
    zavNetState info;
    require(zavGetStateNic(&port, &info) == ZAV_RC_OK && info.state == ZAV_NET_UP &&
                info.value == 1000,
            "zavGetStateNic");
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

} // namespace

const std::vector<Query> &queries() {
    static const std::vector<Query> all = {
        {"zavGetStateDisk, healthy disk", "smartctl -H -d ata /dev/sata/disk1 &>/dev/null", run,
         ask_disk},
        {"zavGetStateRaid, software array", "/sbin/mdadm --detail /dev/md1", read_all, ask_array},
        {"zavgetStateLVMVG, one PV", "", read_group, ask_group},
        {"zavGetRBODSet, one unit", "", find_units, ask_units},
        {"zavGetStateNic, Ethernet port", "", read_port, ask_port},
        {"get_diskcount", "cat /proc/scsi/scsi | grep \"Vendor: ATA\" | wc -l", read_all,
         count_disks},
        {"zavMapArcTimeZone",
         R"(cat /etc/sysconfig/clock | grep "ZONE=" | cut -d "\"" -f 2 | cut -d "/" -f 2)",
         read_all, map_time_zone},
        {"zavSyncConf", "/usr/bin/syncConf.sh", run, synchronise},
    };
    return all;
}

} // namespace bench
