#include "appliance.h"

#include "answers.h"
#include "texts.h"

#include <cstdio>
#include <filesystem>
#include <fstream>

namespace fs = std::filesystem;

namespace bench {

std::string build_directory() {
    return fs::read_symlink("/proc/self/exe").parent_path();
}

void put(const std::string &path, const std::string &text) {
    fs::create_directories(fs::path(path).parent_path());
    if (fs::is_symlink(path))
        fs::remove(path);
    std::ofstream file(path, std::ios::binary);
    file << text;
    file.exceptions(std::ios::failbit | std::ios::badbit);
    file.close();
}

void put_tool(const std::string &path, const std::string &answer) {
    fs::remove(path);
    fs::create_symlink(build_directory() + "/zav_bench_tool", path);
    if (!answer.empty())
        put(fs::path(BENCH_ANSWERS) / fs::path(path).filename(), answer);
}

void become(const char *product) {
    put("/sys/class/dmi/id/product_name", product);
}

namespace {

void put_settings() {
    become(kSoftwareRaid);
    put("/sys/class/dmi/id/product_serial", "12345678\n");
    put("/etc/Kiru/raidtype", "raidtype=5;0;4\n");
    put("/etc/sysconfig/clock", "ZONE=\"Asia/Tokyo\"\n");
    put("/etc/arecaTimeZone.list", "Asia/Seoul\nAsia/Tokyo\n");
    put("/etc/Kiru/zav/DataVG1", backup_text(1, 0));
    put("/etc/Kiru/zav/.raidinfo", report_text(4));
    put("/tmp/progress.outfile", "0% done, estimate finish\n34% done, estimate finish\n");
}

void put_kernel_files() {
    put("/proc/mdstat", mdstat_text);
    put("/proc/scsi/scsi", "Attached devices:\n"
                           "Host: scsi0 Channel: 00 Id: 00 Lun: 00\n"
                           "  Vendor: ATA      Model: DISK             Rev: 0001\n"
                           "  Type:   Direct-Access                    ANSI  SCSI revision: 05\n");
    put("/proc/stat", "cpu  10132153 290696 3084719 46828483 16683 0 25195 0 175628 0\n"
                      "cpu0 1393280 32966 572056 13343292 6130 0 17875 0 23933 0\n");
    put("/proc/meminfo", "MemTotal:        2059304 kB\nMemFree:          541212 kB\n"
                         "Buffers:           48144 kB\nCached:           905372 kB\n"
                         "SwapTotal:       1048572 kB\nSwapFree:        1048572 kB\n");
    put("/etc/mtab", "/dev/root / ext4 rw 0 0\nproc /proc proc rw 0 0\ntmpfs /tmp tmpfs rw 0 0\n");
    put("/proc/sys/dev/cdrom/info",
        "drive name:\t\tsr0\nCan write CD-R:\t\t1\nCan write DVD-R:\t1\n");
    put("/proc/net/bonding/bond0", "Bonding Mode: fault-tolerance (active-backup)\n"
                                   "Currently Active Slave: eth0\nMII Status: up\n");
}

void put_sensors() {
    const std::string sensors = "/proc/zav/sys/sensor/";
    put(sensors + "tempLT", "41.5\n");
    put(sensors + "statusLT", "0\n");
    put(sensors + "volVTT", "1.2\n");
    put(sensors + "statusVTT", "0\n");
    put(sensors + "fan2", "1500\n");
    const std::string lines = "/proc/zav/sys/dev/gpio/ich9/";
    for (const char *line : {"38", "10", "40"})
        put(lines + line, "0\n");
    put("/proc/zav/sys/dev/serio/in", "3F\n");
}

void put_devices() {
    for (const char *node :
         {"/dev/sata/disk1", "/dev/swraid/disk2p1", "/dev/hwraid/disk1", "/dev/iscsiraid/disk1",
          "/dev/DataVG1/LogVol1", "/dev/scd0", "/dev/cdrom", "/dev/zavevent0", "/dev/zavledevent"})
        put(node, "");
    put("/dev/sasraid/r1disk1", std::string(512, '\0'));
    put("/dev/mem", firmware_image());
    fs::create_directories("/mnt/internal/data1-1");
    fs::create_directories("/media/cdrom");
}

void put_tools() {
    put_tool("/usr/sbin/vgs", "  DataVG1   1   0   0 wz--n- 952.00m 760.00m\n");
    put_tool("/usr/sbin/vgdisplay", display_text);
    put_tool("/usr/sbin/lvdisplay",
             "  /dev/DataVG1/LogVol1:DataVG1:3:1:-1:0:262144:32:-1:0:-1:253:0\n");
    put_tool("/usr/sbin/pvdisplay", "  PV Name               /dev/md1\n"
                                    "  VG Name               DataVG1\n");
    put_tool("/usr/sbin/udevinfo", "swraid/disk2p1\n");
    put_tool("/usr/bin/query_sas.sh", cascade_text);
    put_tool("/usr/sbin/mdadm", detail_text);
    put_tool("/usr/sbin/ethtool", port_text);
    for (const char *silent :
         {"/usr/sbin/lvs", "/usr/sbin/pvs", "/usr/sbin/vgcfgbackup", "/usr/bin/smartctl",
          "/usr/bin/syncConf.sh", "/usr/bin/mkisofs", "/usr/bin/growisofs",
          "/usr/bin/dvd+rw-format", "/usr/bin/cdrwtool", "/usr/bin/pktsetup", "/usr/bin/mkudffs"})
        put_tool(silent, "");
    put_tool("/usr/bin/cdrecord", cd_text);
    put_tool("/usr/bin/dvd+rw-mediainfo", dvd_text);
}

} // namespace

bool set_up_appliance() {
    if (!fs::exists("/run/zavsim")) {
        fputs("zav_bench: run me in a private root: bench/run BUILD-DIRECTORY\n", stderr);
        return false;
    }
    put_settings();
    put_kernel_files();
    put_sensors();
    put_devices();
    put_tools();
    return true;
}

} // namespace bench
