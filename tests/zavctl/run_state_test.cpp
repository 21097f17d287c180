// What is shown of the model, disks and arrays.
#include "run.h"

TEST(RunStatus, AHealthyApplianceIsShownAndExitsWithZero) {
    const Outcome run = on_zav("zavctl status");
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.err, "");
    EXPECT_EQ(run.out, "Solvane 2860, 4 disks (product SV-2860, serial AB1234)\n"
                       "\n"
                       "Disks\n"
                       "    DISK  STATE  DEVICE\n"
                       "    1     found  /dev/sata/disk1\n"
                       "    2     found  /dev/sata/disk2\n"
                       "    3     found  /dev/sata/disk3\n"
                       "    4     found  /dev/sata/disk4\n"
                       "\n"
                       "Arrays\n"
                       "    ARRAY  LEVEL  STATE   MEMBERS\n"
                       "    1 md0  RAID1  normal  disk1p1 disk2p1 disk3p1 disk4p1\n"
                       "    2 md1  RAID5  normal  disk1p2 disk2p2 disk3p2 disk4p2\n"
                       "    3 md2  RAID1  normal  disk1p3 disk2p3 disk3p3 disk4p3\n"
                       "\n"
                       "Volume groups\n"
                       "    GROUP          STATE   SIZE   VOLUMES  ON\n"
                       "    0 PrimaryOSVG  normal  <1 GB  2        array 1\n"
                       "    1 DataVG1      normal  <1 GB  2        array 2\n"
                       "\n"
                       "Physical volumes\n"
                       "    VOLUME  STATE   SIZE   GROUP        ON\n"
                       "    0-1     normal  <1 GB  PrimaryOSVG  array 1 (/dev/swraid/disk1p1)\n"
                       "    1-1     normal  <1 GB  DataVG1      array 2 (/dev/swraid/disk2p1)\n"
                       "\n"
                       "Logical volumes\n"
                       "    VOLUME                   STATE   SIZE   USED  MOUNTED AT\n"
                       "    0-1 PrimaryOSVG/LogVol1  normal  <1 GB  9 %   /mnt/prios/disk1p1\n"
                       "    0-2 PrimaryOSVG/LogVol2  normal  <1 GB  8 %   /mnt/prios/disk1p2\n"
                       "    1-1 DataVG1/LogVol1      normal  <1 GB  8 %   /mnt/internal/data1-1\n"
                       "    1-2 DataVG1/LogVol2      normal  <1 GB  8 %   /mnt/internal/data1-2\n"
                       "\n"
                       "Sensors\n"
                       "    KIND     STATE   READINGS\n"
                       "    thermal  normal  LT: 42.0 C, RT1: 36.0 C, RT2: 51.0 C\n"
                       "    volt     normal  VTT: 1.20 V, 1.8 V: 1.80 V, 5 V: 5.00 V, 12 V: 12.00 "
                       "V, Vccp: 1.10 V\n"
                       "    fan      normal  1: 1400 rpm, 2: 2100 rpm, 3: 2100 rpm, 4: turning\n"
                       "\n"
                       "Network\n"
                       "    PORT   LINK  SPEED\n"
                       "    eth0   up    1000 Mbit/s\n"
                       "    eth1   up    1000 Mbit/s\n"
                       "    bond0  up    1000 Mbit/s\n"
                       "\n"
                       "UPS\n"
                       "    STATE   CHARGE\n"
                       "    online  100.0 %\n"
                       "\n"
                       "Load\n"
                       "    WHAT         USED    STATE   NOTE\n"
                       "    memory       60.0 %  -       buffers and caches count as used\n"
                       "    swap         0.0 %   normal\n"
                       "    /            41.0 %  normal\n"
                       "    /etc/Kiru    12.0 %  -\n"
                       "    /var         37.0 %  normal\n"
                       "    /tmp         5.0 %   normal\n"
                       "    /mnt/buffer  22.0 %  normal\n"
                       "\n"
                       "OK: 4 disks found, 3 arrays normal, 2 volume groups normal, 2 physical "
                       "volumes normal, 4 volumes normal, 12 sensors normal, 3 network ports up, "
                       "UPS on line, load normal\n");
}

TEST(RunStatus, AFailedDiskIsCriticalAndItsArraysDegraded) {
    const Outcome run = on_zav("zavsim act disk 3 fails; zavctl status");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, " X  3     failed  /dev/sata/disk3  its health check")) << run.out;
    EXPECT_TRUE(holds(run.out, "degraded  disk1p1 disk2p1 disk3p1(failed) disk4p1")) << run.out;
    EXPECT_TRUE(holds(run.out, "CRITICAL: disk 3 has failed; arrays 1 (md0), 2 (md1) and 3 (md2) "
                               "are degraded\n"))
        << run.out;
}

constexpr const char *three_slots_empty = "for n in 2 3 4; do zavsim act disk $n vanishes; done; ";

TEST(RunStatus, EmptySlotsAreToldTogether) {
    const Outcome run = on_zav(std::string(three_slots_empty) + "zavctl disk list");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "disks 2, 3 and 4 are absent")) << run.out;
}

TEST(RunStatus, ThreeEmptySlotsAreWaitedForAtOnce) {
    // The clock nearly stands still: asked one after the other, the second would never be reached.
    // 230 is the number of clock_nanosleep, in which a thread of the library waits; 219 is that of
    // restart_syscall, in which it goes on after a signal that was none of its own.
    const Outcome run =
        on_zav(std::string(three_slots_empty) +
                   "zavctl disk list >/dev/null & pid=$!; "
                   "for i in {1..3000}; do "
                   "waiting=$(cat /proc/$pid/task/*/syscall | grep -c -E '^(230|219) '); "
                   "[ $waiting -ge 3 ] && break; done; "
                   "echo $waiting; kill $pid",
               {"--time-scale", "0.01"});
    EXPECT_EQ(run.out, "3\n");
}

TEST(RunStatus, ARebuildIsAWarningWithItsProgress) {
    const Outcome run = on_zav("zavsim act disk 3 vanishes; zavsim act disk 3 appears; "
                               "zavsim act disk 3 joins; zavctl array list --json");
    EXPECT_EQ(run.status, 1);
    const nlohmann::json arrays = parsed(run.out)["arrays"];
    ASSERT_EQ(arrays.size(), 3U);
    EXPECT_EQ(arrays[1]["state"], "resync");
    EXPECT_EQ(arrays[1]["state_bits"], 4);
    EXPECT_TRUE(arrays[1]["rebuild_percent"].is_number());
    EXPECT_EQ(arrays[1]["severity"], "warning");
}

TEST(RunDisk, TheJsonHoldsEveryField) {
    const Outcome run = on_zav("zavctl disk show 2 --json");
    EXPECT_EQ(run.status, 0);
    const nlohmann::json disk = parsed(run.out)["disks"][0];
    EXPECT_EQ(disk["kind"], "disk");
    EXPECT_EQ(disk["slot"], 2);
    EXPECT_EQ(disk["address"], nlohmann::json({{"type", "hdd"},
                                               {"minor_type", "sata"},
                                               {"disk", 2},
                                               {"part", 0},
                                               {"path", "/dev/sata/disk2"}}));
    EXPECT_EQ(disk["state"], "found");
    EXPECT_EQ(disk["state_bits"], 1);
    EXPECT_EQ(disk["expected"], true);
    EXPECT_EQ(disk["error"], nullptr);
}

TEST(RunDisk, ListsAsJsonLinesHaveOneRecordEach) {
    const Outcome run = on_zav("zavctl disk list --jsonl");
    std::istringstream lines(run.out);
    int slot = 0;
    for (std::string line; std::getline(lines, line);)
        EXPECT_EQ(parsed(line)["slot"], ++slot);
    EXPECT_EQ(slot, 4);
}

TEST(RunDisk, AnUnusedSlotIsNotAskedUnlessAllAre) {
    const Outcome few = on_zav("zavctl disk list", {"--model", "2860-2"});
    EXPECT_EQ(few.status, 0);
    EXPECT_FALSE(holds(few.out, "disk3")) << few.out;
    const Outcome all = on_zav("zavctl disk list --all", {"--model", "2860-2"});
    EXPECT_EQ(all.status, 0);
    EXPECT_TRUE(holds(all.out, "    3     empty  /dev/sata/disk3")) << all.out;
}

TEST(RunDisk, ASlotBeyondTheModelsCannotBeTold) {
    const Outcome run = on_zav("zavctl disk show 9 --json");
    EXPECT_EQ(run.status, 3);
    const nlohmann::json disk = parsed(run.out)["disks"][0];
    EXPECT_EQ(disk["state"], "unknown");
    EXPECT_EQ(disk["error"]["code"], 22);
    EXPECT_EQ(disk["error"]["name"], "ZAV_RC_ERR_EINVAL");
}

TEST(RunDisk, WithoutSmartctlNoStateIsBelieved) {
    const Outcome run = on_zav("zavsim act tool smartctl is missing; zavctl disk list");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "smartctl is not on the PATH")) << run.out;
}

TEST(RunDisk, UnderAShellThatIsNotBashNoStateIsBelieved) {
    const Outcome run = on_zav("zavctl disk list", {"--shell", "dash"});
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, " ?  1     unknown")) << run.out;
}

TEST(RunDisk, AToolThatHangsIsLeftAfterTheTimeLimit) {
    const Outcome run = on_zav("zavsim act tool smartctl hangs 100000s; "
                               "zavctl disk list --timeout 2 --json; status=$?; sleep 20; "
                               "ps ax | grep -c '[s]martctl -H'; exit $status");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "no answer within 2 s")) << run.out;
    EXPECT_TRUE(run.out.ends_with("\n0\n")) << run.out; // and no tool is left behind
}

TEST(RunDisk, AnInterruptEndsItWithItsToolsAndNoAnswer) {
    for (const auto &[name, status] : {std::pair("INT", 130), std::pair("TERM", 143)}) {
        const Outcome run = on_zav("zavsim act tool smartctl hangs 100000s; "
                                   "timeout --preserve-status -s " +
                                   std::string(name) +
                                   " 2 zavctl disk list; status=$?; sleep 20; "
                                   "ps ax | grep -c '[s]martctl -H'; exit $status");
        EXPECT_EQ(run.status, status);
        EXPECT_EQ(run.out, "0\n");
    }
}

TEST(RunArray, ADegradedArrayIsAWarning) {
    const Outcome run = on_zav("zavsim act disk 3 vanishes; zavctl array show 2");
    EXPECT_EQ(run.status, 1);
    EXPECT_TRUE(holds(run.out, " !  State    degraded")) << run.out;
    EXPECT_TRUE(holds(run.out, "disk3p2(none)")) << run.out;
    EXPECT_TRUE(holds(run.out, "Kernel   md1 : active raid5")) << run.out;
}

TEST(RunArray, ALevelThatLostTooManyHasFailed) {
    const Outcome run =
        on_zav("zavsim act disk 3 vanishes; zavsim act disk 4 vanishes; zavctl array list");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "array 2 (md1) has failed")) << run.out;
}

TEST(RunArray, AMissingArrayIsNotAskedUnlessAllAre) {
    const Outcome all = on_zav("zavctl array list --all");
    EXPECT_EQ(all.status, 0);
    EXPECT_TRUE(holds(all.out, "    4 md3  -      missing")) << all.out;
    EXPECT_FALSE(holds(on_zav("zavctl array list").out, "md3"));
}

TEST(RunArray, WithoutMdadmNoArrayCanBeTold) {
    const Outcome run = on_zav("zavsim act tool mdadm is missing; zavctl array list");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "/sbin/mdadm is missing")) << run.out;
}

TEST(RunArray, GarbageOfMdadmIsNoAnswer) {
    const Outcome run = on_zav("zavsim act tool mdadm prints '\"garbage\\n\"'; "
                               "zavctl array list --json");
    EXPECT_EQ(run.status, 3);
    EXPECT_EQ(parsed(run.out)["arrays"][0]["state"], "unknown");
}

TEST(RunArray, ACheckIsExplained) {
    const Outcome run = on_zav("zavsim act array 2 checks; zavctl array show 2 --json");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(parsed(run.out)["arrays"][0]["note"], "check =")) << run.out;
}

TEST(RunModel, EveryModelIsNamed) {
    const auto model = [](const char *name) {
        return parsed(on_zav("zavctl model --json", {"--model", name}).out)["model"]["model"];
    };
    EXPECT_EQ(model("2740"), "2740");
    EXPECT_EQ(model("2740-2"), "2740_2hdd");
    EXPECT_EQ(model("2740-4"), "2740_4hdd");
    EXPECT_EQ(model("2860-2"), "2860");
    EXPECT_EQ(model("2860-4"), "2860_4hdd");
    EXPECT_EQ(model("2980"), "2980");
}

TEST(RunModel, AnUnknownModelCannotBeTold) {
    const Outcome run = on_zav("zavctl status", {"--product", "Toaster"});
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "no known model (code 0x1301)")) << run.out;
}

TEST(RunModel, TheHardwareRaidModelIsAskedForItsOwnDisks) {
    const nlohmann::json json = parsed(on_zav("zavctl status --json", {"--model", "2980"}).out);
    EXPECT_EQ(json["disks"][0]["address"]["minor_type"], "hwsata");
    EXPECT_EQ(json["arrays"][0]["address"]["minor_type"], "hw");
}

TEST(RunName, PathsAndAddressesAreTurnedIntoEachOther) {
    const Outcome run = on_zav("zavctl name /dev/sata/disk3p2 lvm lv 3 2 nic eth 1 --json");
    EXPECT_EQ(run.status, 0);
    const nlohmann::json names = parsed(run.out)["names"];
    EXPECT_EQ(names[0]["address"]["disk"], 3);
    EXPECT_EQ(names[0]["address"]["part"], 2);
    EXPECT_EQ(names[1]["address"]["path"], "/dev/DataVG2/LogVol3");
    EXPECT_EQ(names[2]["address"]["path"], "eth0");
}

TEST(RunName, ARefusedPathCannotBeTold) {
    const Outcome run = on_zav("zavctl name /dev/sata/disk-1 eth0 --json");
    EXPECT_EQ(run.status, 3);
    const nlohmann::json names = parsed(run.out)["names"];
    EXPECT_EQ(names[0]["error"]["name"], "ZAV_RC_ERR_EINVAL");
    EXPECT_EQ(names[0]["address"], nullptr);
    EXPECT_EQ(names[1]["error"], nullptr);
}
