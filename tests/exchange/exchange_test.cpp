// Whole exchanges on the simulated appliance, also with a tool that fails at each step. What counts
// is what the arrays, the nodes and the mark say afterwards, beside the code.
#include "sim_runner.hpp"

#include <gtest/gtest.h>
#include <vector>

namespace {

using Options = std::vector<std::string>;

const std::string kProbe = EXCHANGE_PROBE;
const std::string kAllNodes =
    "nodes disk1 marked disk1p1 disk1p2 disk1p3 disk2 marked disk2p1 disk2p2 disk2p3 disk3 marked "
    "disk3p1 disk3p2 disk3p3 disk4 marked disk4p1 disk4p2 disk4p3\n";
const std::string kThreeDisks =
    "nodes disk1 marked disk1p1 disk1p2 disk1p3 disk2 marked disk2p1 disk2p2 disk2p3 disk3 marked "
    "disk3p1 disk3p2 disk3p3\n";

// With a new disk that is neither partitioned nor marked.
const std::string kNewDisk = kThreeDisks.substr(0, kThreeDisks.size() - 1) + " disk4\n";

// The script's P is the probe; one real second is `scale` of the appliance's.
std::string run(const std::string &script, Options options = {}, const char *scale = "500") {
    options.insert(options.end(), {"--time-scale", scale});
    const Outcome outcome = on_appliance("P=" + kProbe + "; " + script, options);
    EXPECT_EQ(outcome.status, 0) << outcome.err;
    return outcome.out;
}

std::string arrays(const std::string &data_level, const std::string &first, const std::string &data,
                   const std::string &third) {
    return "array 1 ZAV_RAIDLVL_1[ZAV_RAID_" + first + "]\narray 2 " +
           (data_level.empty() ? "ZAV_RAIDLVL_NONE" : "ZAV_RAIDLVL_" + data_level) + "[ZAV_RAID_" +
           data + "]\narray 3 ZAV_RAIDLVL_1[ZAV_RAID_" + third + "]\n";
}

std::string arrays(const std::string &data_level, const std::string &state) {
    return arrays(data_level, state, state, state);
}

const std::string kGroups = "group 0 ZAV_LVM_NORMAL, 1 pv 2 lv\ngroup 1 ZAV_LVM_NORMAL, 1 pv 2 lv\n"
                            "group 2 ZAV_LVM_NOT_EXIST, 0 pv 0 lv\n";
const std::string kNoData = "group 0 ZAV_LVM_NORMAL, 1 pv 2 lv\ngroup 1 ZAV_LVM_NOT_EXIST, 0 pv 0 "
                            "lv\ngroup 2 ZAV_LVM_NOT_EXIST, 0 pv 0 lv\n";

// ---- Exchanges that go well ----

class RedundantLevel : public testing::TestWithParam<const char *> {};

TEST_P(RedundantLevel, ExchangesADiskThatIsThere) {
    const std::string level = GetParam();
    EXPECT_EQ(
        run("$P remove 4 gone 4 state; zavsim act disk 4 vanishes; zavsim act disk 4 appears; "
            "$P add 4 settle state leftovers",
            {"--level", "raid" + level}),
        "remove 4: 0\n" + arrays(level, "DEGRADED") + kGroups + kThreeDisks + "add 4: 0\n" +
            arrays(level, "NORMAL") + kGroups + kAllNodes + "nothing left\n");
}

TEST_P(RedundantLevel, ExchangesADiskThatHasVanished) {
    const std::string level = GetParam();
    EXPECT_EQ(run("zavsim act disk 4 vanishes; $P remove 4 state; grep -c F /proc/mdstat; "
                  "zavsim act disk 4 appears; $P add 4 settle state leftovers",
                  {"--level", "raid" + level}),
              "remove 4: 0\n" + arrays(level, "DEGRADED") + kGroups + kThreeDisks +
                  "0\nadd 4: 0\n" + arrays(level, "NORMAL") + kGroups + kAllNodes +
                  "nothing left\n");
}

INSTANTIATE_TEST_SUITE_P(Levels, RedundantLevel, testing::Values("1", "5", "10"));

class PlainLevel : public testing::TestWithParam<std::pair<const char *, const char *>> {};

TEST_P(PlainLevel, LosesItsVolumesAndIsCreatedAnew) {
    const auto [option, level] = GetParam();
    EXPECT_EQ(
        run("$P remove 4 gone 4 state; zavsim act disk 4 vanishes; zavsim act disk 4 appears; "
            "$P add 4 settle state leftovers | grep -v ^hbqSetup",
            {"--level", option}),
        "remove 4: 0\n" + arrays("", "DEGRADED", "NOT_EXIST", "DEGRADED") + kNoData + kThreeDisks +
            "add 4: 0\n" + arrays(level, "NORMAL") + kGroups + kAllNodes + "nothing left\n");
}

TEST_P(PlainLevel, StaysWhereAVolumeIsInUse) {
    const auto [option, level] = GetParam();
    const std::string out = run(
        "zavsim act volume 1-2 is busy; $P remove 4 state | grep -v ^umount", {"--level", option});
    EXPECT_EQ(out, "Error: /dev/md/MD1 Device or resource busy\n\nremove 4: 16\n" +
                       arrays(level, "NORMAL", "NORMAL", "DEGRADED") +
                       "group 0 ZAV_LVM_NORMAL, 1 pv 2 lv\ngroup 1 ZAV_LVM_NORMAL, 1 pv 1 lv\n"
                       "group 2 ZAV_LVM_NOT_EXIST, 0 pv 0 lv\n" +
                       kAllNodes);
}

INSTANTIATE_TEST_SUITE_P(Levels, PlainLevel,
                         testing::Values(std::pair("raid0", "0"), std::pair("linear", "JBOD")));

TEST(Exchange, OfTheFirstDiskTakesTheSecondForItsPattern) {
    EXPECT_EQ(run("$P remove 1 gone 1; zavsim act disk 1 vanishes; zavsim act disk 1 appears; "
                  "$P add 1 settle state"),
              "remove 1: 0\nadd 1: 0\n" + arrays("5", "NORMAL") + kGroups + kAllNodes);
}

TEST(Exchange, OfATwoDiskModelEndsWithBothDisks) {
    EXPECT_EQ(run("$P remove 2 gone 2; zavsim act disk 2 vanishes; zavsim act disk 2 appears; "
                  "$P add 2 settle state",
                  {"--model", "2740-2", "--level", "raid1"}),
              "remove 2: 0\nadd 2: 0\n" + arrays("1", "NORMAL") + kGroups +
                  "nodes disk1 marked disk1p1 disk1p2 disk1p3 disk2 marked disk2p1 disk2p2 "
                  "disk2p3\n");
}

TEST(Exchange, OfADiskThatOnlyWasDetachedTakesItBack) {
    EXPECT_EQ(run("$P remove 4 gone 4 add 4 settle state"),
              "remove 4: 0\nadd 4: 0\n" + arrays("5", "NORMAL") + kGroups + kAllNodes);
}

TEST(Exchange, AFailedArrayIsCreatedAnewOnceAllDisksAreThere) {
    EXPECT_EQ(
        run("zavsim act disk 3 vanishes; zavsim act disk 4 vanishes; zavsim act disk 3 appears;"
            "$P add 3 | tail -n 1; zavsim act disk 4 appears; "
            "/bin/umount /mnt/internal/data1-1; /bin/umount /mnt/internal/data1-2; "
            "/usr/sbin/vgchange -an DataVG1 >/dev/null 2>&1; "
            "$P add 4 settle state 2>&1 | tail -n 7"),
        "add 3: 0\n" + arrays("5", "NORMAL") + kGroups + kAllNodes);
}

TEST(Exchange, OfAMarkedDiskIsRefusedByARescan) {
    EXPECT_EQ(run("$P remove 4 gone 4 rescan 4 gone 4 state; "
                  "grep -c 'Initialized by HBQ-2XXX /dev/sata/disk4' /var/log/messages"),
              "remove 4: 0\nrescan 4: 0\n" + arrays("5", "DEGRADED") + kGroups + kThreeDisks +
                  "1\n");
    EXPECT_EQ(run("$P remove 4 gone 4; zavsim act disk 4 vanishes; zavsim act disk 4 appears; "
                  "$P rescan 4; ls /dev/sata/disk4"),
              "remove 4: 0\nrescan 4: 0\n/dev/sata/disk4\n");
}

// ---- Removals that fail ----

std::string remove_with(const std::string &act) {
    return run(act + "; $P remove 4 state");
}

const std::string kUntouched = arrays("5", "NORMAL") + kGroups + kAllNodes;

TEST(Removal, WithoutSmartctlFindsNoHealthyDisk) {
    EXPECT_EQ(remove_with("zavsim act tool smartctl is missing"), "remove 4: 22\n" + kUntouched);
}

TEST(Removal, OfTheLastHealthyDiskIsRefused) {
    EXPECT_EQ(
        run("for d in 1 2 3; do zavsim act disk $d fails; done; $P remove 4; ls /dev/sata/disk4"),
        "remove 4: 22\n/dev/sata/disk4\n");
}

TEST(Removal, WithAnInconsistentSourceIsRefused) {
    EXPECT_EQ(run("zavsim act tool mdadm prints '\"device mismatch\\n\"'; $P remove 4; "
                  "zavsim act tool mdadm works again; $P state"),
              "remove 4: 128\n" + kUntouched);
}

// The code tells nothing of members that stay: the disk is detached under the array.
TEST(Removal, WithAnMdadmThatSaysNothingDetachesALiveMember) {
    EXPECT_EQ(run("zavsim act tool mdadm is missing; $P remove 4; "
                  "zavsim act tool mdadm works again; $P gone 4 state"),
              "remove 4: 0\n" + arrays("5", "DEGRADED") + kGroups + kThreeDisks);
}

// Its scan tells no level.
TEST(Removal, OnATodaysSystemDetachesALiveMember) {
    const std::string out =
        run("$P remove 4 gone 4; grep -c F /proc/mdstat", {"--tools", "current"});
    EXPECT_EQ(out, "remove 4: 0\n3\n");
}

TEST(Removal, WithoutHostsStopsBeforeTheDetaching) {
    EXPECT_EQ(run("$P remove 4 state", {"--hosts", "ata"}),
              "remove 4: 19\n" + arrays("5", "DEGRADED") + kGroups + kAllNodes);
}

// ---- Additions that fail ----

// A fresh disk 4 in a degraded machine, and something wrong with it.
std::string add_with(const std::string &act, const std::string &afterwards = "true") {
    return run("$P remove 4 gone 4 >/dev/null; zavsim act disk 4 vanishes; "
               "zavsim act disk 4 appears; " +
               act + "; $P add 4; " + afterwards + "; $P settle state");
}

TEST(Addition, WithoutSourceChangesNothing) {
    for (const char *tool : {"mdadm", "udevinfo"}) {
        const std::string act = std::string("zavsim act tool ") + tool;
        EXPECT_EQ(add_with(act + " is missing", act + " works again"),
                  "add 4: 22\n" + arrays("5", "DEGRADED") + kGroups + kNewDisk)
            << tool;
    }
}

TEST(Addition, WithoutHostsCannotAttach) {
    EXPECT_EQ(run("zavsim act disk 4 detaches; $P gone 4 add 4 state", {"--hosts", "ata"}),
              "add 4: 19\n" + arrays("5", "DEGRADED") + kGroups + kThreeDisks);
}

// The disk is wiped and marked, and joins nothing: only the arrays tell.
TEST(Addition, WithoutPartitionTableJoinsNothing) {
    for (const char *fault : {"is missing", "exits 3", "prints \"garbage\\n\""})
        EXPECT_EQ(add_with(std::string("zavsim act tool sfdisk ") + fault),
                  "add 4: 0\n" + arrays("5", "DEGRADED") + kGroups +
                      kNewDisk.substr(0, kNewDisk.size() - 1) + " marked\n")
            << fault;
}

// The mark is part of the disk's signature, which comes with the partition table.
TEST(Addition, WithoutDdIsMarkedByTheCopiedTable) {
    EXPECT_EQ(add_with("zavsim act tool dd is missing"),
              "add 4: 0\n" + arrays("5", "NORMAL") + kGroups + kAllNodes);
}

// As dd does anywhere: a caller has to know that there is a disk.
TEST(Addition, OfAnEmptySlotLeavesAFileInPlaceOfTheNode) {
    EXPECT_EQ(run("$P remove 4 gone 4 >/dev/null; zavsim act disk 4 vanishes; $P add 4 state"),
              "add 4: 0\n" + arrays("5", "DEGRADED") + kGroups +
                  kNewDisk.substr(0, kNewDisk.size() - 1) + " marked\n");
}

// ---- Volume groups ----

TEST(VolumeGroup, IsMadeOnAFreeArrayAndDismantled) {
    const std::string before =
        "group 0 ZAV_LVM_NORMAL, 1 pv 2 lv\ngroup 1 ZAV_LVM_NORMAL, 1 pv 2 lv\n";
    EXPECT_EQ(run("$P group-add 3 2 2>&1 | tail -n 1; $P state | grep group; "
                  "$P group-remove 2 leftovers; $P state | grep group"),
              "group-add 2: 0\n" + before + "group 2 ZAV_LVM_NORMAL, 1 pv 0 lv\n" +
                  "group-remove 2: 0\nnothing left\n" + before +
                  "group 2 ZAV_LVM_NOT_EXIST, 0 pv 0 lv\n");
}

TEST(VolumeGroup, ThatExistsIsExtended) {
    EXPECT_EQ(
        run("$P group-add 3 1 2>&1 | tail -n 1; $P state | grep 'group 1'; pvs | grep -c DataVG1"),
        "group-add 1: 0\ngroup 1 ZAV_LVM_NORMAL, 2 pv 2 lv\n2\n");
}

TEST(VolumeGroup, IsNotMadeOnAnArrayInUse) {
    EXPECT_EQ(run("$P group-add 2 2; $P state | grep 'group [12]'"),
              "group-add 2: 128\ngroup 1 ZAV_LVM_NORMAL, 1 pv 2 lv\n"
              "group 2 ZAV_LVM_NOT_EXIST, 0 pv 0 lv\n");
}

TEST(VolumeGroup, IsDismantledWithItsVolumes) {
    EXPECT_EQ(
        run("$P group-remove 1 leftovers state; ls /dev | grep DataVG; df | grep internal; true"),
        "group-remove 1: 0\nnothing left\n" + arrays("5", "NORMAL") + kNoData + kAllNodes);
}

TEST(VolumeGroup, ThatIsNotThereIsTold) {
    EXPECT_EQ(run("$P group-remove 2 leftovers"), "group-remove 2: 19\nnothing left\n");
}

TEST(VolumeGroup, WithABusyVolumeLosesTheOthersOnly) {
    EXPECT_EQ(run("zavsim act volume 1-2 is busy; $P group-remove 1 leftovers; "
                  "$P state | grep 'group 1'"),
              "group-remove 1: 128\nnothing left\ngroup 1 ZAV_LVM_NORMAL, 1 pv 1 lv\n");
}

TEST(VolumeGroup, SurvivesEachToolThatFails) {
    for (const char *tool : {"lvremove", "vgremove", "pvremove"}) {
        const std::string out =
            run(std::string("zavsim act tool ") + tool + " exits 5; $P group-remove 1 leftovers");
        EXPECT_EQ(out, "group-remove 1: 128\nnothing left\n") << tool;
    }
    for (const char *tool : {"pvcreate", "vgcreate"}) {
        const std::string out =
            run(std::string("zavsim act tool ") + tool + " exits 5; $P group-add 3 2 leftovers");
        EXPECT_EQ(out, "group-add 2: 128\nnothing left\n") << tool;
    }
    for (const char *tool : {"vgs", "vgdisplay", "vgcfgbackup"}) {
        const std::string out = run(std::string("zavsim act tool ") + tool +
                                    " prints \"garbage\\n\"; $P state leftovers | tail -n 1");
        EXPECT_EQ(out, "nothing left\n") << tool;
    }
}

// ---- Again and again ----

TEST(Exchange, LeavesTheSameMachineAgainAndAgain) {
    const std::string count = std::to_string(EXCHANGE_ROUNDS);
    EXPECT_EQ(run("$P rounds " + count, {}, "5000"), count + " rounds\n");
}

} // namespace
