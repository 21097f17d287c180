#include "texts.h"

#include <cstdint>
#include <cstring>

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

const std::string cascade_text = "  phy   0:D:attached:[5001B4D5008FF01F800:00]\n"
                                 "  phy   4:S:attached:[500605B000C7F540:02  i(SSP+STP+SMP)]\n"
                                 "  phy   8:S:attached:[0000000000000000:00]\n"
                                 "  phy  10:S:attached:[0000000000000000:00]\n";

// Of use to all readers of vgdisplay: the twelfth field and the two counts.
const std::string display_text = "  DataVG1:r/w:772:-1:0:0:0:-1:0:1:1:974848:4096\n"
                                 "  Cur LV                0\n"
                                 "  Cur PV                1\n";

const std::string dvd_text = R"(INQUIRY:                [VENDOR  ][DVD RECORDER    ][1.00]
GET [CURRENT] CONFIGURATION:
 Mounted Media:         1Ah, DVD+RW
 Media ID:              RICOHJPN/W11
READ DISC INFORMATION:
 Disc status:           complete
 Number of Sessions:    1
 State of Last Session: complete
READ CAPACITY:          2295104*2048=4700372992
)";

// cdrecord's sheet, with the session's offsets as its last line.
const std::string cd_text = R"(Device type    : Removable CD-ROM
ATIP info from disk:
  Indicated writing power: 5
  Is not unrestricted
  Is not erasable
  ATIP start of lead in:  -11634 (97:26/66)
  ATIP start of lead out: 359846 (79:59/71)
0,11702
)";

const std::string port_text = "Settings for eth0:\n"
                              "\tSpeed: 1000Mb/s\n"
                              "\tDuplex: Full\n"
                              "\tAuto-negotiation: on\n"
                              "\tLink detected: yes\n";

const std::string ups_text = "APC      : 001,036,0879\nDATE     : 2020-03-02\nSTATUS   : ONLINE \n"
                             "LINEV    : 230.0 Volts\nLOADPCT  :  12.0 Percent\n"
                             "BCHARGE  : 97.5 Percent\nEND APC  : 2020-03-02\n";

std::string firmware_image() {
    constexpr uint32_t kTable = 0xE0000;
    constexpr std::size_t kEntry = 0xF8000;
    static constexpr char kStructures[] = "\x00\x05\x00\x00\x01"
                                          "firmware\0\0"
                                          "\x01\x08\x01\x00\x01\x02\x03\x04"
                                          "maker\0SV-2860\0\0";
    constexpr uint16_t kLength = sizeof kStructures - 1;
    std::string image(0x100000, '\0');
    image.replace(kTable, kLength, kStructures, kLength);
    image.replace(kEntry, 4, "_SM_");
    image.replace(kEntry + 16, 5, "_DMI_");
    memcpy(&image[kEntry + 16 + 6], &kLength, sizeof kLength);
    memcpy(&image[kEntry + 16 + 8], &kTable, sizeof kTable);
    return image;
}

namespace {

std::string physical_volume(int number) {
    return "\t\tpv" + std::to_string(number) +
           " {\n\t\t\tid = \"vmyUWQ-cyWC-aoX8-jkP8-QDGE-MmCz-udw6CN\"\n"
           "\t\t\tdevice = \"/dev/md1\"\t# Hint only\n\n\t\t\tstatus = [\"ALLOCATABLE\"]\n"
           "\t\t\tdev_size = 1953792\t# 954 Megabytes\n\t\t\tpe_start = 3072\n\t\t}\n";
}

std::string logical_volume(int number, int segments) {
    std::string text = "\t\tLogVol" + std::to_string(number) +
                       " {\n\t\t\tid = \"4ySs0e-hvol-i3Ow-vpAi-q3Y5-HbM0-SrHN6i\"\n"
                       "\t\t\tsegment_count = " +
                       std::to_string(segments) + "\n\n";
    for (int segment = 1; segment <= segments; ++segment)
        text += "\t\t\tsegment" + std::to_string(segment) +
                " {\n\t\t\t\tstart_extent = 0\n"
                "\t\t\t\textent_count = 32\t# 128 Megabytes\n\n\t\t\t\tstripes = [\n"
                "\t\t\t\t\t\"pv0\", 0\n\t\t\t\t]\n\t\t\t}\n";
    return text + "\t\t}\n";
}

} // namespace

std::string backup_text(int physical, int logical, int segments) {
    std::string text =
        "# Generated by LVM2\n\ncontents = \"Text Format Volume Group\"\nversion = 1\n\n"
        "DataVG1 {\n\tid = \"x3B5pD-HEag-lVgr-HbmD-aUIG-lXuP-I79soW\"\n"
        "\textent_size = 8192\t\t# 4 Megabytes\n\n\tphysical_volumes {\n\n";
    for (int number = 0; number < physical; ++number)
        text += physical_volume(number);
    text += "\t}\n\n\tlogical_volumes {\n\n";
    for (int number = 1; number <= logical; ++number)
        text += logical_volume(number, segments);
    return text + "\t}\n}\n";
}

std::string report_text(int lines_before) {
    return "PCI\nM:HBRC-R16\nS:Y001\nI:\nR:1:Raid Set # 00:2000.0:4:1234:0\n" +
           repeated("D:1:500.1:1\n", lines_before) +
           "H:38:1:2:3\nRBOD#1\nM:HBQE-T500\nS:Y101\nI:\nR:1:Raid Set # 01:4000.0:4:1234:0\n"
           "V:1:UNIT1:3:3000.0:0:1\nD:1:1000.2:1\nD:2:1000.2:1\nD:3:1000.2:1\n"
           "D:4:1000.2:1\nH:45.0:3200:11.9:5.1:1.20\n";
}

std::string repeated(const std::string &line, int times) {
    std::string text;
    for (int i = 0; i < times; ++i)
        text += line;
    return text;
}

} // namespace bench
