// Taking a disk's partitions out of the arrays, and putting another's in.
#include "storage/zav_disk_members_parse.h"

#include "harness.h"

#include <algorithm>
#include <cerrno>

namespace {

using harness::exits;
using harness::no_start;
using harness::prints;
using harness::record;
using harness::row;
using harness::ScriptedShell;
using Steps = std::vector<std::string>;

// ---- What mdadm says ----

std::string query(std::string text) {
    const zav::ArrayQuery query = zav::read_array_query(text.data());
    return std::string(query.array) + "|" + query.level + (query.is_redundant() ? "|r" : "");
}

TEST(ArrayOfAPartition, IsNamedWithItsLevel) {
    EXPECT_EQ(
        query("ARRAY /dev/md/MD1 level=raid5 metadata=1.2 num-devices=4 UUID=a:b name=x:MD1\n"),
        "/dev/md/MD1|raid5|r");
    EXPECT_EQ(query("ARRAY /dev/md0 level=raid1 num-devices=4\n"), "/dev/md0|raid1|r");
    EXPECT_EQ(query("ARRAY\t/dev/md/MD1\tlevel=raid10\r\n"), "/dev/md/MD1|raid10|r");
    EXPECT_EQ(query("ARRAY /dev/md/MD1 metadata=1.2\n   level=raid0"), "/dev/md/MD1|raid0");
    EXPECT_EQ(query("/dev/md/MD1 linear"), "/dev/md/MD1|linear");
}

TEST(ArrayOfAPartition, MayNotBeTold) {
    EXPECT_EQ(query(""), "||r");
    EXPECT_EQ(query("mdadm: No md superblock detected on /dev/sda1.\n"), "||r");
    EXPECT_EQ(query("level=raid5 /dev/sda1"), "||r");
    EXPECT_EQ(query("level=raid5 /dev/md/MD1"), "/dev/md/MD1||r") << "the level comes behind";
    EXPECT_EQ(query("ARRAY /dev/md/MD1 level=raid6"), "/dev/md/MD1||r");
    EXPECT_EQ(query("ARRAY /dev/md/MD1 level=raid50 raid1x"), "/dev/md/MD1||r");
    EXPECT_EQ(query(harness::data("captures/healthy-4disk/examine-scan-disk1p2.txt")),
              "/dev/md/MD1||r")
        << "a current mdadm tells no level";
}

TEST(ArrayOfAPartition, TakesTheFirstArrayAndTheFirstLevelBehindIt) {
    EXPECT_EQ(query("/dev/md/MD0 /dev/md/MD1 x=raid1 raid5"), "/dev/md/MD0|raid1|r");
}

TEST(ArrayOfAPartition, NamesAreNeverCut) {
    const std::string name = "/dev/md/" + std::string(23, 'x');
    EXPECT_EQ(query(name + " raid1"), name + "|raid1|r");
    EXPECT_EQ(query(name + "x raid1"), "||r");
}

std::string numbers(std::string text) {
    zav::DeviceNumbers numbers = {7, 7};
    if (!zav::read_member_numbers(text.data(), numbers))
        return "none";
    return std::to_string(numbers.major) + ":" + std::to_string(numbers.minor);
}

TEST(NumbersOfAMember, AreTheSecondAndThirdColumn) {
    EXPECT_EQ(numbers("       4       8       49        -      faulty spare   /dev/sdd1\n"),
              "8:49");
    EXPECT_EQ(numbers("4 259 1048575"), "259:1048575");
    EXPECT_EQ(numbers("   -   8   50 faulty spare\n  - 9 51 faulty spare\n"), "8:50");
    EXPECT_EQ(numbers(""), "none");
    EXPECT_EQ(numbers("\n"), "none");
    EXPECT_EQ(numbers("4 8"), "none");
}

TEST(Creation, IsMadeOfPartition2OfEveryDisk) {
    const std::string begin = "echo 'y' | mdadm --create %s --force --level=%s --raid-devices=";
    const std::string middle = " --metadata=1.2 --name=MD1 /dev/sata/disk1p2 /dev/sata/disk2p2";
    char form[zav::kLongestCreation];
    ASSERT_TRUE(zav::creation_form(form, 2));
    EXPECT_EQ(form, begin + "2" + middle + " &>/dev/null");
    ASSERT_TRUE(zav::creation_form(form, 3));
    EXPECT_EQ(form, begin + "3" + middle + " /dev/sata/disk3p2 &>/dev/null");
    ASSERT_TRUE(zav::creation_form(form, 4));
    EXPECT_EQ(form, begin + "4" + middle + " /dev/sata/disk3p2 /dev/sata/disk4p2 &>/dev/null");
}

TEST(Creation, IsKnownForTwoToFourDisks) {
    for (const int disks : {-1, 0, 1, 5, 1000}) {
        char form[zav::kLongestCreation] = "untouched";
        EXPECT_FALSE(zav::creation_form(form, disks));
        EXPECT_STREQ(form, "untouched");
    }
}

// ---- Taking out ----

constexpr zavDevice kSource = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 1, 0};
constexpr zavDevice kTarget = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0};

std::string scan(int partition) {
    return "/sbin/mdadm --query --examine --scan /dev/sata/disk1p" + std::to_string(partition) +
           " 2>&1";
}

harness::Answer array(const std::string &name, const std::string &level) {
    return prints("ARRAY " + name + " level=" + level + " metadata=1.2\n");
}

std::string fail(const std::string &name, const std::string &member) {
    return "/sbin/mdadm " + name + " -f " + member + " 2>&1";
}
std::string take(const std::string &name, const std::string &member) {
    return "/sbin/mdadm " + name + " -r " + member + " 2>&1";
}
std::string faulty(const std::string &name) {
    return "/sbin/mdadm --detail " + name + " | grep \"faulty spare\" 2>&1";
}

class Members : public harness::Appliance {
  protected:
    Members() {
        four_disk_model();
        record().shell = ScriptedShell{};
    }

    static void partition(int disk, int number) {
        put("/dev/sata/disk" + std::to_string(disk) + "p" + std::to_string(number), "");
    }
    static void partitions(std::initializer_list<int> disks, std::initializer_list<int> numbers) {
        for (const int disk : disks)
            for (const int number : numbers)
                partition(disk, number);
    }

    template <class Function>
    static int run(Function function) {
        zavDevice source = kSource;
        zavDevice target = kTarget;
        const size_t open_before = open_descriptors();
        const int rc = function(&source, &target);
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_FALSE(has_children());
        EXPECT_EQ(source, kSource) << "the caller's addresses stay";
        EXPECT_EQ(target, kTarget);
        return rc;
    }
};

class MemberRemoval : public Members {
  protected:
    static int remove_members() { return run(zavRmSWRaidDev); }
};

TEST_F(MemberRemoval, FailsAndRemovesFromThe15thPartitionDown) {
    partitions({1, 3}, {1, 2, 15});
    partition(1, 16);
    record().shell = ScriptedShell{{scan(15), array("/dev/md/MD2", "raid1")},
                                   {scan(2), array("/dev/md/MD1", "raid5")},
                                   {scan(1), array("/dev/md0", "raid10")}};
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(record().steps, (Steps{scan(15), fail("/dev/md/MD2", "/dev/sata/disk3p15"), "sleep 2",
                                     take("/dev/md/MD2", "/dev/sata/disk3p15"), "sleep 1", //
                                     scan(2), fail("/dev/md/MD1", "/dev/sata/disk3p2"), "sleep 2",
                                     take("/dev/md/MD1", "/dev/sata/disk3p2"), "sleep 1", //
                                     scan(1), fail("/dev/md0", "/dev/sata/disk3p1"), "sleep 2",
                                     take("/dev/md0", "/dev/sata/disk3p1"), "sleep 1"}));
    EXPECT_TRUE(record().log.empty());
}

TEST_F(MemberRemoval, GoesByTheSourcesPartitions) {
    partition(1, 2);
    partitions({3}, {1, 2, 3});
    record().shell = ScriptedShell{{scan(2), array("/dev/md/MD1", "raid5")}};
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(record().commands, (Steps{scan(2), fail("/dev/md/MD1", "/dev/sata/disk3p2"),
                                        take("/dev/md/MD1", "/dev/sata/disk3p2")}));
}

TEST_F(MemberRemoval, SkipsPartitionsWithoutArrayOrLevel) {
    partitions({1, 3}, {1, 2, 3, 4});
    record().shell =
        ScriptedShell{{scan(4), prints("")},
                      {scan(3), prints("mdadm: No md superblock detected on /dev/sata/disk1p3.\n")},
                      {scan(2), prints("ARRAY /dev/md/MD1 metadata=1.2\n")},
                      {scan(1), array("/dev/md/MD1", "raid6")}};
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(record().steps, (Steps{scan(4), scan(3), scan(2), scan(1)}));
}

TEST_F(MemberRemoval, WithNothingToDoIsWell) {
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_TRUE(record().steps.empty());
}

TEST_F(MemberRemoval, ReadsTheFirst1023BytesOfTheQuery) {
    partitions({1, 3}, {1});
    const std::string text = "/dev/md0 raid1";
    record().shell = ScriptedShell{{scan(1), prints(std::string(1023 - 14, ' ') + text)}};
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(record().commands.size(), 3U);
    record().commands.clear();
    record().shell = ScriptedShell{{scan(1), prints(std::string(1024 - 14, ' ') + text)}};
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(record().commands.size(), 1U) << "raid is no level";
}

TEST_F(MemberRemoval, OfAVanishedDiskGoesByTheNumbersOfTheFaultySpare) {
    partitions({1}, {1, 2});
    record().shell = ScriptedShell{
        {scan(2), array("/dev/md/MD1", "raid5")},
        {scan(1), array("/dev/md/MD0", "raid1")},
        {faulty("/dev/md/MD1"),
         prints("       4       8       34        -      faulty spare   /dev/sdc2\n")},
        {faulty("/dev/md/MD0"),
         prints("       4       8       33        -      faulty spare   /dev/sdc1\n")}};
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    const std::string node = "/dev/sata/hotrmtmp";
    EXPECT_EQ(record().steps,
              (Steps{scan(2), faulty("/dev/md/MD1"), "mknod " + node + " b 8 34",
                     fail("/dev/md/MD1", node), take("/dev/md/MD1", node), "rm " + node, //
                     scan(1), faulty("/dev/md/MD0"), "mknod " + node + " b 8 33",
                     fail("/dev/md/MD0", node), take("/dev/md/MD0", node), "rm " + node}));
}

TEST_F(MemberRemoval, TakesAllLowerPartitionsForVanishedOnceOneIs) {
    partitions({1}, {1, 2, 3});
    partitions({3}, {1, 3});
    for (int i = 1; i <= 3; ++i)
        record().shell->first(scan(i), array("/dev/md" + std::to_string(i), "raid1"));
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(record().commands, (Steps{scan(3), fail("/dev/md3", "/dev/sata/disk3p3"),
                                        take("/dev/md3", "/dev/sata/disk3p3"), scan(2),
                                        faulty("/dev/md2"), scan(1), faulty("/dev/md1")}));
}

TEST_F(MemberRemoval, WithoutFaultySpareMakesNoNode) {
    partitions({1}, {1});
    record().shell = ScriptedShell{{scan(1), array("/dev/md0", "raid1")}};
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(record().steps, (Steps{scan(1), faulty("/dev/md0")}));
}

TEST_F(MemberRemoval, ReplacesANodeThatWasLeftBehind) {
    partitions({1}, {1});
    put("/dev/sata/hotrmtmp", "left");
    record().shell = ScriptedShell{{scan(1), array("/dev/md0", "raid1")},
                                   {"grep", prints("4 8 33 faulty spare\n")}};
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_FALSE(exists("/dev/sata/hotrmtmp"));
}

TEST_F(MemberRemoval, WithoutPipeStopsWith32) {
    partitions({1, 3}, {1, 2});
    const std::string member = "/dev/sata/disk3p2";
    const std::pair<std::string, Steps> cases[] = {
        {fail("/dev/md1", member), {scan(2), fail("/dev/md1", member)}},
        {take("/dev/md1", member),
         {scan(2), fail("/dev/md1", member), "sleep 2", take("/dev/md1", member)}}};
    for (const auto &[command, steps] : cases) {
        record().steps.clear();
        record().shell = ScriptedShell{{command, no_start()},
                                       {scan(2), array("/dev/md1", "raid1")},
                                       {scan(1), array("/dev/md0", "raid1")}};
        EXPECT_EQ(remove_members(), 32);
        EXPECT_EQ(record().steps, steps);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(MemberRemoval, WithoutPipeForTheQueryTellsTheLog) {
    partitions({1, 3}, {1, 2});
    record().shell = ScriptedShell{{scan(2), no_start()}};
    EXPECT_EQ(remove_members(), 32);
    EXPECT_EQ(record().steps, Steps{scan(2)});
    EXPECT_EQ(record().log,
              std::vector{row("zavRmSWRaidDev", 1, "[3] popen()" + scan(2) + " failed.")});
}

TEST_F(MemberRemoval, OfAVanishedDiskWithoutPipeLeavesNoNode) {
    partitions({1}, {1, 2});
    const std::string node = "/dev/sata/hotrmtmp";
    for (const std::string &command :
         {faulty("/dev/md1"), fail("/dev/md1", node), take("/dev/md1", node)}) {
        record().steps.clear();
        record().shell = ScriptedShell{{command, no_start()},
                                       {scan(2), array("/dev/md1", "raid1")},
                                       {"grep", prints("4 8 33 faulty spare\n")}};
        EXPECT_EQ(remove_members(), 32);
        EXPECT_EQ(record().steps.back(), command);
        EXPECT_FALSE(exists(node));
    }
}

TEST_F(MemberRemoval, LeavesNoNodeWhereAPipeFails) {
    partitions({1}, {1});
    record().shell.reset();
    script("/sbin/mdadm", "case $1 in --query) echo ARRAY /dev/md0 level=raid1;; --detail) "
                          "echo 4 8 33 faulty spare;; *) touch /scratch/mdadm-$2;; esac\n");
    script("/usr/bin/mknod", "touch \"$1\"\n");
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_TRUE(exists("/scratch/mdadm--f"));
    EXPECT_TRUE(exists("/scratch/mdadm--r"));
    EXPECT_FALSE(exists("/dev/sata/hotrmtmp"));
}

TEST_F(MemberRemoval, NeedsTheDataRaidType) {
    remove("/etc/Kiru/raidtype");
    partitions({1, 3}, {1});
    EXPECT_EQ(remove_members(), ZAV_RC_ERR);
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(MemberRemoval, NeedsMemory) {
    partitions({1, 3}, {1});
    zavDevice source = kSource;
    zavDevice target = kTarget;
    record().calloc_fails = true;
    const int rc = zavRmSWRaidDev(&source, &target);
    record().calloc_fails = false;
    EXPECT_EQ(rc, ZAV_RC_ERR_ENOMEM);
    EXPECT_TRUE(record().commands.empty());
    EXPECT_EQ(record().log,
              std::vector{row("zavRmSWRaidDev", 1,
                              "[22] Memory allocation failed. Return ZAV_RC_ERR_ENOMEM.")});
}

TEST_F(MemberRemoval, NullsAreRefused) {
    zavDevice dev = kSource;
    EXPECT_EQ(zavRmSWRaidDev(nullptr, &dev), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavRmSWRaidDev(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavAddSWRaidDev(nullptr, &dev), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavAddSWRaidDev(&dev, nullptr), ZAV_RC_ERR_EINVAL);
}

// ---- Tearing down an array without redundancy ----

const std::string kStop = "/sbin/mdadm --manage --stop /dev/md/MD1 &>/dev/null";

class TearDown : public MemberRemoval {
  protected:
    TearDown() {
        partitions({1, 3}, {1, 2});
        for (const char *tool : {"/dev/DataVG1/LogVol1", "/dev/DataVG1/LogVol2"})
            put(tool, "");
        put("/etc/Kiru/zav/DataVG1", "physical_volumes {\npv0 {\n}\n}\nlogical_volumes {\n"
                                     "LogVol1 {\n}\nLogVol2 {\n}\n}\n");
        record().shell = ScriptedShell{{scan(2), array("/dev/md/MD1", "raid0")},
                                       {scan(1), array("/dev/md0", "raid1")},
                                       {"VG Name", prints("  VG Name               DataVG1\n")},
                                       {"Cur PV", prints("1\n")},
                                       {"Cur LV", prints("2\n")},
                                       {"vgdisplay -c", prints("1048576\n")}};
    }

    // What was run to change anything, from the array's query to its end.
    static Steps changes() {
        Steps found;
        for (const std::string &step : record().steps) {
            constexpr const char *kParts[] = {"umount", "remove", "--stop", "/sbin/mdadm /dev",
                                              "sleep 2"};
            if (std::any_of(std::begin(kParts), std::end(kParts),
                            [&](const char *part) { return step.find(part) != std::string::npos; }))
                found.push_back(step);
        }
        return found;
    }

    const Steps volume1 = {"/bin/umount /mnt/internal/data1-1 2>&1",
                           "/usr/sbin/lvremove -f /dev/DataVG1/LogVol1 2>&1", "usleep 200"};
    const Steps volume2 = {"/bin/umount /mnt/internal/data1-2 2>&1",
                           "/usr/sbin/lvremove -f /dev/DataVG1/LogVol2 2>&1", "usleep 200"};
    const Steps group = {"/usr/sbin/vgremove DataVG1 >/dev/null 2>&1",
                         "/usr/sbin/pvremove /dev/md/MD1 >/dev/null 2>&1"};
    const Steps end = {"sleep 2", kStop};
    const Steps next = {fail("/dev/md0", "/dev/sata/disk3p1"), "sleep 2",
                        take("/dev/md0", "/dev/sata/disk3p1")};

    static Steps join(std::initializer_list<Steps> parts) {
        Steps all;
        for (const Steps &part : parts)
            all.insert(all.end(), part.begin(), part.end());
        return all;
    }
};

TEST_F(TearDown, RemovesVolumesGroupAndLabelAndStopsTheArray) {
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), join({volume1, volume2, group, end, next}));
    EXPECT_TRUE(record().log.empty());
}

TEST_F(TearDown, IsDoneForLinearArraysToo) {
    record().shell->first(scan(2), array("/dev/md/MD1", "linear"));
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), join({volume1, volume2, group, end, next}));
}

TEST_F(TearDown, IsDoneForAVanishedDiskToo) {
    remove("/dev/sata/disk3p2");
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), join({volume1, volume2, group, end}));
}

TEST_F(TearDown, OfAnArrayWithoutGroupStopsItOnly) {
    record().shell->first("pvdisplay -c", exits(5));
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), join({end, next}));
}

TEST_F(TearDown, OfAGroupThatGivesNoAnswerStopsWithItsCode) {
    record().shell->first("ls /usr/sbin/vgs", exits(2));
    EXPECT_EQ(remove_members(), ZAV_RC_ERR_ENOENT);
    EXPECT_TRUE(changes().empty());
}

TEST_F(TearDown, OfAForeignGroupRemovesItByItsName) {
    record().shell->first("VG Name", prints("  VG Name   other\n"));
    record().shell->first("grep DataVG99", exits(1));
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(changes()[0], "/usr/sbin/vgremove other >/dev/null 2>&1");
}

TEST_F(TearDown, AtABusyUnmountLeavesTheOtherVolumes) {
    for (const harness::Answer &busy : {exits(16), exits(32, EBUSY)}) {
        record().steps.clear();
        record().log.clear();
        record().shell->first(volume1[0], busy);
        EXPECT_EQ(remove_members(), ZAV_RC_OK);
        EXPECT_EQ(changes(), join({{volume1[0]}, group, end, next}));
        EXPECT_EQ(record().log,
                  std::vector{row("zavRmSWRaidDev", 1,
                                  "[1] Failed on umount(/bin/umount /mnt/internal/data1-1 2>&1). "
                                  "errno: 0x10 Device or resource busy")});
    }
}

TEST_F(TearDown, PassesOverAnyOtherFailureToUnmount) {
    record().shell->first(volume1[0], exits(32, ECHILD));
    record().shell->first(volume2[0], exits(0, EBUSY));
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), join({volume1, volume2, group, end, next}));
    EXPECT_TRUE(record().log.empty());
}

TEST_F(TearDown, AtABusyVolumeLeavesTheOthers) {
    record().shell->first(volume1[1], prints("  Can't remove: device is busy\n"));
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), join({{volume1[0], volume1[1]}, group, end, next}));
    record().steps.clear();
    record().shell->first(volume1[1], no_start());
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), join({{volume1[0], volume1[1]}, group, end, next}));
}

TEST_F(TearDown, AtAVolumeWithoutAPathLeavesTheOthers) {
    put("/etc/Kiru/zav/DataVG1", "physical_volumes {\npv0 {\n}\n}\nlogical_volumes {\n"
                                 "LogVol-1 {\n}\nLogVol2 {\n}\n}\n");
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), join({{"/bin/umount /mnt/internal/data1--1 2>&1"}, group, end, next}));
}

TEST_F(TearDown, WithoutPipeForTheNameStopsWithItsCode) {
    int asked = 0;
    record().during_short_sleep = [&] {
        if (++asked == 2) // behind the last volume
            record().shell->first("VG Name", no_start());
    };
    EXPECT_EQ(remove_members(), 32);
    EXPECT_EQ(changes(), join({volume1, volume2}));
}

TEST_F(TearDown, OfAnArrayInUseIsBusy) {
    record().shell->first(kStop, exits(1));
    testing::internal::CaptureStdout();
    EXPECT_EQ(remove_members(), ZAV_RC_ERR_EBUSY);
    EXPECT_EQ(testing::internal::GetCapturedStdout(),
              "Error: /dev/md/MD1 Device or resource busy\n\n");
    EXPECT_EQ(changes(), join({volume1, volume2, group, end}));
}

TEST_F(TearDown, OfAnArrayThatCannotBeStoppedIsAnError) {
    for (const harness::Answer &answer : {exits(2), exits(127), no_start()}) {
        record().shell->first(kStop, answer);
        testing::internal::CaptureStdout();
        EXPECT_EQ(remove_members(), ZAV_RC_ERR);
        EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
    }
}

TEST_F(TearDown, WithMoreVolumesThanTheTablesHoldStaysInside) {
    record().shell->first("Cur LV", prints("2147483647\n"));
    put("/etc/Kiru/zav/DataVG1", "");
    EXPECT_EQ(remove_members(), ZAV_RC_OK);
    EXPECT_EQ(changes().size(), 3U * 6 + 2 + 2 + 3);
}

// ---- Names that disks carry ----

const char *const kHostile[] = {"/dev/md$(touch${IFS}/scratch/r)", "/dev/md`touch${IFS}/scratch/r`",
                                "/dev/md;touch${IFS}/scratch/r",   "/dev/md'\"|touch>/scratch/r",
                                "/dev/md/MD1&touch>/scratch/r",    "/dev/md\\`>/scratch/r\\`"};

class HostileNames : public Members {
  protected:
    HostileNames() {
        record().shell.reset();
        partitions({1, 3}, {1});
        script("/sbin/mdadm", "case $1 in --query) cat /scratch/query;; "
                              "*) printf '[%s]' \"$@\" >>/scratch/asked;; esac\n");
    }
};

TEST_F(HostileNames, ReachMdadmAsOneWord) {
    for (const std::string name : kHostile) {
        for (const char *level : {"raid1", "raid0"}) {
            put("/scratch/query", "ARRAY " + name + " level=" + level + "\n");
            remove("/scratch/asked");
            script("/usr/sbin/pvdisplay", "exit 5\n");
            testing::internal::CaptureStdout();
            run(zavRmSWRaidDev);
            testing::internal::GetCapturedStdout();
            EXPECT_NE(get("/scratch/asked").find("[" + name + "]"), std::string::npos) << name;
            EXPECT_FALSE(exists("/scratch/r")) << name;
        }
    }
}

TEST_F(HostileNames, OfGroupsReachLvmAsOneWord) {
    put("/scratch/query", "ARRAY /dev/md/MD1 level=raid0\n");
    put("/etc/Kiru/zav/.vgs", "");
    script("/usr/sbin/pvdisplay", "cat /scratch/group\n");
    for (const char *tool : {"vgs", "lvs", "pvs", "vgdisplay", "lvdisplay"})
        script(std::string("/usr/sbin/") + tool, "");
    for (const char *tool : {"vgremove", "pvremove"})
        script(std::string("/usr/sbin/") + tool,
               "printf '[%s]' \"$@\" >>/scratch/asked-${0##*/}\n");
    for (const std::string name : {"$(touch${IFS}/scratch/r)", "`touch${IFS}/scratch/r`",
                                   ";touch${IFS}/scratch/r", "a'b\"c", "a\tb"}) {
        put("/scratch/group", "  VG Name   " + name + "\n");
        remove("/scratch/asked-vgremove");
        EXPECT_EQ(run(zavRmSWRaidDev), ZAV_RC_OK);
        EXPECT_EQ(get("/scratch/asked-vgremove"), "[" + name + "]");
        EXPECT_FALSE(exists("/scratch/r")) << name;
    }
    put("/scratch/group", "  VG Name   --force\n");
    remove("/scratch/asked-vgremove");
    EXPECT_EQ(run(zavRmSWRaidDev), ZAV_RC_OK);
    EXPECT_FALSE(exists("/scratch/asked-vgremove")) << "no group of that name is ever made";
}

TEST_F(HostileNames, ThatHoldAnArraysNameReachMdadmAsOneWord) {
    const std::string name = "/dev/md/MD0$(touch${IFS}/x)";
    put("/scratch/query", "ARRAY " + name + " level=raid1\n");
    put("/dev/swraid/disk1p1", "");
    script("/sbin/mdadm",
           "case $1 in --query) cat /scratch/query;; --detail) cat /scratch/detail;; "
           "*) printf '[%s]' \"$@\" >>/scratch/asked;; esac\n");
    put("/scratch/detail", harness::data("captures/healthy-4disk/mdadm-detail-md0.txt"));
    put("/proc/mdstat", harness::data("captures/degraded-3disk/mdstat.txt"));
    put("/scratch/detail", harness::data("captures/degraded-3disk/mdadm-detail-md0.txt"));
    put("/proc/scsi/scsi", harness::data("captures/healthy-4disk/scsi.txt"));
    EXPECT_EQ(run(zavAddSWRaidDev), ZAV_RC_OK);
    EXPECT_EQ(get("/scratch/asked"), "[" + name + "][-a][/dev/sata/disk3p1]");
    EXPECT_FALSE(exists("/x"));
}

// ---- Putting in ----

const std::string kDegradedDetail = "captures/degraded-3disk/mdadm-detail-md1.txt";

std::string add(const std::string &name, const std::string &member) {
    return "/sbin/mdadm " + name + " -a " + member + " 2>&1";
}

class MemberAddition : public Members {
  protected:
    MemberAddition() {
        partitions({1, 3}, {1, 2});
        put("/dev/swraid/disk1p1", "");
        put("/dev/swraid/disk2p1", "");
        degraded();
        record().shell =
            ScriptedShell{{scan(1), array("/dev/md/MD0", "raid1")},
                          {scan(2), array("/dev/md/MD1", "raid5")},
                          {"--detail /dev/md0",
                           prints(harness::data("captures/degraded-3disk/mdadm-detail-md0.txt"))},
                          {"--detail /dev/md1", prints(harness::data(kDegradedDetail))},
                          {"/proc/scsi/scsi", prints("4\n")}};
    }

    static void degraded() {
        put("/proc/mdstat", harness::data("captures/degraded-3disk/mdstat.txt"));
    }
    // Only array 2's block, with that many members of four.
    static void raid5(const std::string &members) {
        put("/proc/mdstat",
            "md1 : active raid5 sda2[0]\n      978432 blocks level 5 " + members + "\n      \n");
    }

    static int add_members() { return run(zavAddSWRaidDev); }

    // The commands without those of the state queries.
    static Steps changes() {
        Steps found;
        for (const std::string &step : record().steps)
            if (step.find("--detail") == std::string::npos &&
                step.find("/proc/scsi/scsi") == std::string::npos)
                found.push_back(step);
        return found;
    }

    static void lost_two() {
        record().shell->first(scan(1), prints("nothing\n"));
        record().shell->first(
            "--detail /dev/md1",
            prints(harness::data("captures/raid5-two-lost/mdadm-detail-md1.txt")));
        raid5("[4/2] [UU__]");
    }
};

const std::string kDd = "/bin/dd if=/dev/zero of=/dev/sata/disk3p2 bs=1M count=1 &>/dev/null";
const std::string kRestore = "/usr/bin/hbqSetup.sh lvmrestore 2>&1";
const std::string kCreateRaid = "/usr/bin/hbqSetup.sh createraid 2>&1";
const std::string kMdStop = "mdadm --stop /dev/md/MD1 &>/dev/null";

std::string create(const std::string &level, int disks) {
    std::string command = "echo 'y' | mdadm --create /dev/md/MD1 --force --level=" + level +
                          " --raid-devices=" + std::to_string(disks) +
                          " --metadata=1.2 --name=MD1 /dev/sata/disk1p2 /dev/sata/disk2p2";
    if (disks >= 3)
        command += " /dev/sata/disk3p2";
    if (disks == 4)
        command += " /dev/sata/disk4p2";
    return command + " &>/dev/null";
}

TEST_F(MemberAddition, AddsToEachDegradedArrayFromTheFirstPartitionUp) {
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), (Steps{scan(1), add("/dev/md/MD0", "/dev/sata/disk3p1"), scan(2),
                                add("/dev/md/MD1", "/dev/sata/disk3p2")}));
    EXPECT_TRUE(record().log.empty());
}

TEST_F(MemberAddition, AddsToARebuildingArray) {
    put("/proc/mdstat", harness::data("captures/resyncing/mdstat.txt"));
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes().size(), 4U);
}

TEST_F(MemberAddition, NeedsBothPartitions) {
    remove("/dev/sata/disk3p1");
    remove("/dev/sata/disk1p2");
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_TRUE(record().steps.empty());
}

TEST_F(MemberAddition, LooksAtFifteenPartitions) {
    partitions({1, 3}, {15, 16});
    record().shell->first("--scan", prints("x\n"));
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(record().steps, (Steps{scan(1), scan(2), scan(15)}));
}

TEST_F(MemberAddition, LeavesANormalArrayAlone) {
    put("/proc/mdstat", harness::data("captures/healthy-4disk/mdstat.txt"));
    record().shell->first("--detail /dev/md0",
                          prints(harness::data("captures/healthy-4disk/mdadm-detail-md0.txt")));
    record().shell->first("--detail /dev/md1",
                          prints(harness::data("captures/healthy-4disk/mdadm-detail-md1.txt")));
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), (Steps{scan(1), scan(2)}));
}

TEST_F(MemberAddition, SkipsAnArrayWithoutLevel) {
    record().shell->first(scan(2), prints("ARRAY /dev/md/MD1 metadata=1.2\n"));
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), (Steps{scan(1), add("/dev/md/MD0", "/dev/sata/disk3p1"), scan(2)}));
    EXPECT_NE(record().steps.back(), scan(2)) << "the state is asked before the level is looked at";
}

TEST_F(MemberAddition, SkipsAnArrayThatIsNotTheAppliances) {
    record().shell->first(scan(1), array("/dev/md/other", "raid1"));
    record().shell->first(scan(2), array("/dev/md0", "raid1"));
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(record().steps, (Steps{scan(1), scan(2)}));
}

TEST_F(MemberAddition, SkipsAnArrayThatGivesNoAnswerAndTellsItsCode) {
    record().shell->first("--detail /dev/md1", no_start());
    EXPECT_EQ(add_members(), ZAV_RC_ERR);
    EXPECT_EQ(changes().size(), 3U);
    // A later success makes it good.
    record().shell->first("--detail /dev/md1", prints(harness::data(kDegradedDetail)));
    record().shell->first("--detail /dev/md0", no_start());
    EXPECT_EQ(add_members(), ZAV_RC_OK);
}

TEST_F(MemberAddition, SkipsAnArrayWhereDisksCannotBeCounted) {
    record().shell->first("/proc/scsi/scsi", no_start());
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), (Steps{scan(1), scan(2)}));
}

TEST_F(MemberAddition, WithoutPipeStopsWith32) {
    record().shell->first(add("/dev/md/MD0", "/dev/sata/disk3p1"), no_start());
    EXPECT_EQ(add_members(), 32);
    EXPECT_EQ(record().steps.back(), add("/dev/md/MD0", "/dev/sata/disk3p1"));
    record().steps.clear();
    record().shell->first(scan(1), no_start());
    EXPECT_EQ(add_members(), 32);
    EXPECT_EQ(record().steps, Steps{scan(1)});
    EXPECT_TRUE(record().log.empty());
}

TEST_F(MemberAddition, SetsUpWhereTheSourceHasNoArray) {
    record().shell->first(scan(1), prints(""));
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), (Steps{scan(1), kCreateRaid, kRestore, scan(2),
                                add("/dev/md/MD1", "/dev/sata/disk3p2")}));
}

TEST_F(MemberAddition, SetsUpVolumesOnlyForDataRaidType1) {
    model("SV-2860\n", "raidtype=1;0;4\n");
    record().shell->first(scan(1), prints(""));
    record().shell->first(scan(2), prints(""));
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), (Steps{scan(1), kRestore, scan(2), kRestore}));
}

TEST_F(MemberAddition, CreatesAFailedArrayAnew) {
    lost_two();
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(),
              (Steps{scan(1), scan(2), kMdStop, kDd, create("raid5", 4), "sleep 10", kRestore}));
}

TEST_F(MemberAddition, CreatesAMissingArrayAnewWithoutStoppingIt) {
    record().shell->first(scan(1), prints("nothing\n"));
    record().shell->first(scan(2), array("/dev/md/MD1", "raid10"));
    put("/proc/mdstat", "Personalities :\nunused devices: <none>\n");
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), (Steps{scan(1), scan(2), kDd, create("raid10", 4), "sleep 10", kRestore}));
}

TEST_F(MemberAddition, CreatesFromTheDisksOfATwoDiskModel) {
    two_disk_model();
    record().shell->first(scan(1), prints("nothing\n"));
    record().shell->first(scan(2), array("/dev/md/MD1", "raid0"));
    record().shell->first("/proc/scsi/scsi", prints("2\n"));
    put("/proc/mdstat", "unused devices: <none>\n");
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), (Steps{scan(1), scan(2), kDd, create("raid0", 2), "sleep 10", kRestore}));
}

TEST_F(MemberAddition, TakesPartitions2AndMd1WhicheverArrayItIs) {
    record().shell->first(scan(2), prints("nothing\n"));
    put("/proc/mdstat", "unused devices: <none>\n");
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes()[1], "/bin/dd if=/dev/zero of=/dev/sata/disk3p1 bs=1M count=1 &>/dev/null");
    std::string command = create("raid1", 4);
    command.replace(command.find("/dev/md/MD1"), 11, "/dev/md/MD0");
    EXPECT_EQ(changes()[2], command);
}

TEST_F(MemberAddition, CreatesNothingWhileADiskIsMissing) {
    lost_two();
    for (const char *disks : {"3\n", "5\n", "0\n"}) {
        record().shell->first("/proc/scsi/scsi", prints(disks));
        record().steps.clear();
        EXPECT_EQ(add_members(), ZAV_RC_OK);
        EXPECT_EQ(changes(), (Steps{scan(1), scan(2)}));
    }
}

TEST_F(MemberAddition, CreatesNothingOnAOneDiskModel) {
    model("SV-2740\n", "raidtype=0;0;1\n");
    record().shell->first(scan(1), prints("nothing\n"));
    record().shell->first(scan(2), array("/dev/md/MD1", "raid0"));
    record().shell->first("/proc/scsi/scsi", prints("1\n"));
    put("/proc/mdstat", "unused devices: <none>\n");
    EXPECT_EQ(add_members(), ZAV_RC_OK);
    EXPECT_EQ(changes(), (Steps{scan(1), scan(2)}));
}

TEST_F(MemberAddition, WithoutPipeForTheCreationStopsWith32) {
    lost_two();
    record().shell->first("--create", no_start());
    EXPECT_EQ(add_members(), 32);
    EXPECT_EQ(record().steps.back(), create("raid5", 4));
}

TEST_F(MemberAddition, NeedsRaidTypeModelAndMemory) {
    zavDevice source = kSource;
    zavDevice target = kTarget;
    record().calloc_fails = true;
    const int rc = zavAddSWRaidDev(&source, &target);
    record().calloc_fails = false;
    EXPECT_EQ(rc, ZAV_RC_ERR_ENOMEM);
    EXPECT_EQ(record().log,
              std::vector{row("zavAddSWRaidDev", 1,
                              "[22] Memory allocation failed. Return ZAV_RC_ERR_ENOMEM.")});
    model("unknown\n", "raidtype=5;0;4\n");
    EXPECT_EQ(add_members(), 0x1301);
    remove("/etc/Kiru/raidtype");
    EXPECT_EQ(add_members(), ZAV_RC_ERR);
    EXPECT_TRUE(record().commands.empty());
}

} // namespace
