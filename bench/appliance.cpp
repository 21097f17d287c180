#include "appliance.h"

#include "answers.h"

#include <cstdio>
#include <filesystem>
#include <fstream>

namespace fs = std::filesystem;

namespace bench {

const std::string detail_text = R"(/dev/md1:
           Version : 1.2
     Creation Time : Mon Mar  2 10:11:12 2020
        Raid Level : raid5
        Array Size : 1465151808 (1397.28 GiB 1500.32 GB)
     Used Dev Size : 488383936 (465.76 GiB 500.11 GB)
      Raid Devices : 4
     Total Devices : 4
       Persistence : Superblock is persistent

       Update Time : Mon Mar  2 12:13:14 2020
             State : clean
    Active Devices : 4
   Working Devices : 4
    Failed Devices : 0
     Spare Devices : 0

            Layout : left-symmetric
        Chunk Size : 64K

              Name : appliance:1
              UUID : 5a1b2c3d:4e5f6a7b:8c9dae0f:1a2b3c4d
            Events : 42

    Number   Major   Minor   RaidDevice State
       0       8        2        0      active sync   /dev/sda2
       1       8       18        1      active sync   /dev/sdb2
       2       8       34        2      active sync   /dev/sdc2
       3       8       50        3      active sync   /dev/sdd2
)";

const std::string mdstat_text = R"(Personalities : [raid1] [raid6] [raid5] [raid4]
md0 : active raid1 sdd1[3] sdc1[2] sdb1[1] sda1[0]
      9767424 blocks [4/4] [UUUU]
      
md1 : active raid5 sdd2[3] sdc2[2] sdb2[1] sda2[0]
      1465151808 blocks level 5, 64k chunk, algorithm 2 [4/4] [UUUU]
      
unused devices: <none>
)";

namespace {

void put(const fs::path &path, const std::string &text) {
    fs::create_directories(path.parent_path());
    std::ofstream file(path, std::ios::binary);
    file << text;
    file.exceptions(std::ios::failbit | std::ios::badbit);
    file.close();
}

void put_tool(const fs::path &path, const std::string &answer) {
    fs::remove(path);
    fs::create_symlink(fs::read_symlink("/proc/self/exe").parent_path() / "zav_bench_tool", path);
    if (!answer.empty())
        put(fs::path(BENCH_ANSWERS) / path.filename(), answer);
}

} // namespace

bool set_up_appliance() {
    if (!fs::exists("/run/zavsim")) {
        fputs("zav_bench: run me in a private root: bench/run BUILD-DIRECTORY\n", stderr);
        return false;
    }
    put("/sys/class/dmi/id/product_name", "SV-2860\n");
    put("/etc/Kiru/raidtype", "raidtype=5;0;4\n");
    put("/etc/sysconfig/clock", "ZONE=\"Asia/Tokyo\"\n");
    put("/etc/arecaTimeZone.list", "Asia/Seoul\nAsia/Tokyo\n");
    put("/proc/mdstat", mdstat_text);
    put("/proc/scsi/scsi", "Attached devices:\n"
                           "Host: scsi0 Channel: 00 Id: 00 Lun: 00\n"
                           "  Vendor: ATA      Model: DISK             Rev: 0001\n"
                           "  Type:   Direct-Access                    ANSI  SCSI revision: 05\n");
    put("/dev/sata/disk1", "");
    put("/dev/swraid/disk2p1", "");
    put_tool("/usr/bin/smartctl", "");
    put_tool("/usr/bin/syncConf.sh", "");
    put_tool("/usr/sbin/mdadm", detail_text);
    return true;
}

} // namespace bench
