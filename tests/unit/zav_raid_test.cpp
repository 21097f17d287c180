// Level, state, members and rebuild progress of an array.
#include "harness.h"

#include <climits>

namespace {

using harness::record;
using harness::row;

constexpr zavDevice kNothing = {0, ZAV_MINDEV_HDD_SATA, 0, 0};
constexpr zavDevice kArray2 = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1};

constexpr const char *kIdle = "      \n";
constexpr const char *kRebuild =
    "      [==>..................]  recovery = 12.6% (1/8) finish=1.0min speed=1K/sec\n";

class Array : public harness::Appliance {
  protected:
    Array() { four_disk_model(); }

    int ask(zavDevice dev) {
        info = {9, {9, 9, 9, 9}, 9, 9, 9, {}, 9.0F};
        for (zavDevice &member : info.hdddev)
            member = {9, 9, 9, 9};
        const size_t open_before = open_descriptors();
        testing::internal::CaptureStdout();
        const int rc = zavGetStateRaid(&dev, &info);
        EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_FALSE(has_children());
        return rc;
    }

    // An array with its node, mdadm's answer and its block in /proc/mdstat.
    static void array(const std::string &level, int active, const std::string &status,
                      const std::string &third = kIdle) {
        put("/dev/swraid/disk2p1", "");
        mdadm("/dev/md1:\n     Raid Level : " + level +
              "\n   Raid Devices : 7\n Active Devices : " + std::to_string(active) + "\n");
        mdstat("md1 : active " + level + " sda2[0]\n      976896 blocks " + status + "\n" + third);
    }
    static void mdadm(const std::string &output) { tool("/sbin/mdadm", output); }
    static void mdstat(const std::string &blocks) {
        put("/proc/mdstat",
            "Personalities : [raid1] [raid5]\n" + blocks + "unused devices: <none>\n");
    }

    void expect_untouched() const {
        EXPECT_EQ(info.type, 9);
        EXPECT_EQ(info.dev, (zavDevice{9, 9, 9, 9}));
        EXPECT_EQ(info.state, 9);
        EXPECT_EQ(info.raidlevel, 9);
        EXPECT_EQ(info.raidcount, 9);
        EXPECT_EQ(info.hdddev[3], (zavDevice{9, 9, 9, 9}));
        EXPECT_EQ(info.resync, 9.0F);
    }

    void expect(const zavDevice &dev, int state, int level, int count, float resync) const {
        EXPECT_EQ(info.type, 15010);
        EXPECT_EQ(info.dev, dev);
        EXPECT_EQ(info.state, state);
        EXPECT_EQ(info.raidlevel, level);
        EXPECT_EQ(info.raidcount, count);
        EXPECT_EQ(info.resync, resync);
    }

    // The first `count` members are partition `part` of disks 1 to `count`.
    void expect_members(int count, int part) const {
        for (int i = 0; i < 4; ++i) {
            const zavDevice member = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, i + 1, part};
            EXPECT_EQ(info.hdddev[i], i < count ? member : kNothing) << i;
        }
    }

    zavRaidState info = {};
};

TEST_F(Array, ThatIsWholeIsNormal) {
    array("raid5", 4, "[4/4] [UUUU]");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 4, 0.0F);
    expect_members(4, 2);
    EXPECT_EQ(record().pcloses, 1);
    EXPECT_EQ(record().commands, std::vector<std::string>{"/sbin/mdadm --detail /dev/md1"});
    EXPECT_TRUE(record().log.empty());
    EXPECT_TRUE(record().sleeps.empty());
}

TEST_F(Array, IsNamedOneBelowItsNumber) {
    for (int number = 1; number <= 4; ++number) {
        const std::string name = "md" + std::to_string(number - 1);
        const zavDevice dev = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, number, 1};
        put("/dev/swraid/disk" + std::to_string(number) + "p1", "");
        mdadm("     Raid Level : raid1\n Active Devices : 4\n");
        mdstat(name + " : active raid1\n      8 blocks [4/4] [UUUU]\n" + kIdle);
        record().commands.clear();
        EXPECT_EQ(ask(dev), ZAV_RC_OK);
        expect(dev, ZAV_RAID_NORMAL, ZAV_RAIDLVL_1, 4, 0.0F);
        expect_members(4, number);
        EXPECT_EQ(record().commands, std::vector<std::string>{"/sbin/mdadm --detail /dev/" + name});
    }
}

TEST_F(Array, LosesItsRedundancyBeforeItFails) {
    array("raid5", 3, "[4/3] [UUU_]");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_5, 4, 0.0F);
    expect_members(4, 2); // the lost one included
    array("raid5", 2, "[4/2] [UU__]");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_FAILED, ZAV_RAIDLVL_5, 4, 0.0F);
}

TEST_F(Array, CountsTheModelsMembersNotMdadms) {
    two_disk_model();
    array("raid1", 1, "[2/1] [U_]");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_1, 2, 0.0F);
    expect_members(2, 2);
}

TEST_F(Array, WithoutActiveDevicesLineHasNone) {
    two_disk_model();
    array("raid5", 2, "[2/1] [U_]");
    mdadm("     Raid Level : raid5\n");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_FAILED, ZAV_RAIDLVL_5, 2, 0.0F);
}

TEST_F(Array, ThatRebuildsIsInResyncWhateverIsLost) {
    for (const char *status : {"[4/4] [UUUU]", "[4/3] [UUU_]", "[4/1] [U___]"}) {
        array("raid5", 1, status, kRebuild);
        EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
        expect(kArray2, ZAV_RAID_RESYNC, ZAV_RAIDLVL_5, 4, 12.0F);
        expect_members(4, 2);
    }
}

TEST_F(Array, ThatWaitsForAnotherIsInResync) {
    array("raid5", 3, "[4/3] [UUU_]", "      \tresync=DELAYED\n");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_RESYNC, ZAV_RAIDLVL_5, 4, 0.0F);
    array("raid0", 4, "512k chunks", "      \tresync=DELAYED\n");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_RESYNC, ZAV_RAIDLVL_0, 4, 100.0F);
}

TEST_F(Array, WithoutRedundancyIsComplete) {
    array("raid0", 4, "super 1.2 512k chunks");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_NORMAL, ZAV_RAIDLVL_0, 4, 100.0F);
    array("linear", 4, "super 1.2 0k rounding");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_NORMAL, ZAV_RAIDLVL_JBOD, 4, 100.0F);
}

TEST_F(Array, OfStripedMirrorsFailsWithAPair) {
    array("raid10", 2, "[4/2] [U__U]");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_10, 4, 0.0F);
    array("raid10", 2, "[4/2] [UU__]");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_FAILED, ZAV_RAIDLVL_10, 4, 0.0F);
}

TEST_F(Array, WithAnUnreadableRebuildLineIsAnErrorInResync) {
    for (const char *third :
         {"      \tresync=PENDING\n", "      [=>..................]  recovery\n"}) {
        array("raid5", 3, "[4/3] [UUU_]", third);
        EXPECT_EQ(ask(kArray2), ZAV_RC_ERR) << third;
        expect(kArray2, ZAV_RAID_RESYNC, ZAV_RAIDLVL_5, 4, 0.0F);
        expect_members(0, 0);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Array, WithAnUnexpectedThirdLineIsAnErrorInItsState) {
    for (const char *third : {"      bitmap: 1/1 pages [4KB], 65536KB chunk\n", "       \n", "\n",
                              "      [>....]  check =  0.4% (1920/325632) finish=8.3min\n"}) {
        array("raid5", 3, "[4/3] [UUU_]", third);
        EXPECT_EQ(ask(kArray2), ZAV_RC_ERR) << third;
        expect(kArray2, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_5, 4, 0.0F);
        expect_members(0, 0);
    }
}

TEST_F(Array, WhoseBlockEndsEarlyIsAnError) {
    array("raid5", 4, "");
    put("/proc/mdstat", "md1 : active raid5 sda2[0]\n      8 blocks [4/3] [UUU_]\n");
    EXPECT_EQ(ask(kArray2), ZAV_RC_ERR);
    expect(kArray2, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 4, 0.0F);
    expect_members(0, 0);
    for (const char *text : {"md1 : active raid5 sda2[0]\n", "md1"}) {
        put("/proc/mdstat", text);
        EXPECT_EQ(ask(kArray2), ZAV_RC_ERR) << text;
        expect(kArray2, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 4, 0.0F);
    }
    mdadm("     Raid Level : raid5\n Active Devices : 3\n");
    EXPECT_EQ(ask(kArray2), ZAV_RC_ERR);
    expect(kArray2, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_5, 4, 0.0F);
    // The status line is not taken for the third.
    put("/proc/mdstat", "md1 : active raid5\n" + std::string(kRebuild));
    EXPECT_EQ(ask(kArray2), ZAV_RC_ERR);
    expect(kArray2, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_5, 4, 0.0F);
}

TEST_F(Array, MissingFromMdstatDoesNotExistButHasMembers) {
    array("raid5", 4, "[4/4] [UUUU]");
    for (const char *blocks : {"", "md0 : active raid1\n      8 blocks [4/4] [UUUU]\n      \n"}) {
        mdstat(blocks);
        EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
        expect(kArray2, ZAV_RAID_NOT_EXIST, ZAV_RAIDLVL_NONE, 4, 0.0F);
        expect_members(4, 2);
    }
    put("/proc/mdstat", "");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_NOT_EXIST, ZAV_RAIDLVL_NONE, 4, 0.0F);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Array, AnEmptyMdstatDoesNotRepeatMdadmsLastLine) {
    array("raid5", 4, "[4/4] [UUUU]");
    mdadm("     Raid Level : raid5\n/dev/md1:\n");
    put("/proc/mdstat", "");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_RAID_NOT_EXIST);
}

TEST_F(Array, IsAlsoFoundInALongerName) {
    array("raid5", 4, "[4/4] [UUUU]");
    mdstat("md127 : active raid1\n      8 blocks [4/3] [UUU_]\n" + std::string(kRebuild) +
           "md1 : active raid5\n      8 blocks [4/4] [UUUU]\n" + kIdle);
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_RESYNC, ZAV_RAIDLVL_5, 4, 12.0F);
}

TEST_F(Array, LinesAreReadInPiecesOf79Characters) {
    // The name stands in the second piece of a long line: the third piece is then the status line.
    array("raid5", 3, "");
    mdstat(std::string(79, 'x') + "md1 : " + std::string(73, 'y') + "[UUUU]\n" + kIdle);
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 4, 0.0F);
    // A status line of 79 characters leaves its line feed for the third.
    mdstat("md1 : active\n" + std::string(73, ' ') + "[UUUU]\n" + kIdle);
    EXPECT_EQ(ask(kArray2), ZAV_RC_ERR);
    // mdadm's lines are read so too: the count behind the 79th character is a line of its own.
    mdstat("md1 : active\n      [4/3] [UUU_]\n" + std::string(kIdle));
    mdadm("     Raid Level : raid5\n" + std::string(79, ' ') + "Active Devices : 4\n");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 4, 0.0F);
}

TEST_F(Array, WithoutMdstatIsLogged) {
    array("raid5", 4, "");
    remove("/proc/mdstat");
    EXPECT_EQ(ask(kArray2), ZAV_RC_ERR_ENOENT);
    expect(kArray2, 0, ZAV_RAIDLVL_5, 4, 0.0F);
    expect_members(0, 0);
    EXPECT_EQ(record().log, std::vector{row("getRaidStateSW", 1, "[2] open /proc/mdstat failed!")});
}

TEST_F(Array, OfAnUnsupportedLevelIsRefused) {
    array("raid6", 4, "[4/4] [UUUU]");
    EXPECT_EQ(ask(kArray2), ZAV_RC_ERR_EINVAL);
    expect(kArray2, 0, ZAV_RAIDLVL_NONE, 0, 0.0F);
    expect_members(0, 0);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Array, AnUnsupportedLevelEndsTheReadingOfMdadm) {
    array("raid6", 4, "");
    // More than a pipe holds: mdadm must not be left writing to it.
    script("/sbin/mdadm",
           "echo '     Raid Level : raid6'; head -c 300000 /dev/zero | tr '\\0' x\n");
    EXPECT_EQ(ask(kArray2), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().pcloses, 0); // it is closed like a file
}

TEST_F(Array, OfAnUnsupportedLevelKeepsTheCountReadBeforeIt) {
    array("raid6", 4, "");
    mdadm("   Raid Devices : 7\n     Raid Level : raid6\n");
    EXPECT_EQ(ask(kArray2), ZAV_RC_ERR_EINVAL);
    expect(kArray2, 0, ZAV_RAIDLVL_NONE, 7, 0.0F);
}

TEST_F(Array, WithoutALevelLineHasNoRule) {
    array("raid5", 4, "[4/4] [UUUU]");
    mdadm(" Active Devices : 4\n");
    EXPECT_EQ(ask(kArray2), ZAV_RC_ERR_EINVAL);
    expect(kArray2, ZAV_RAID_NORMAL, ZAV_RAIDLVL_NONE, 4, 0.0F);
    expect_members(0, 0);
    // ... but one that is missing from mdstat does not exist all the same.
    mdstat("");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_NOT_EXIST, ZAV_RAIDLVL_NONE, 4, 0.0F);
}

TEST_F(Array, WithoutAShellIsLogged) {
    array("raid5", 4, "");
    record().popen_fails = true;
    EXPECT_EQ(ask(kArray2), ZAV_RC_ERR);
    expect(kArray2, 0, ZAV_RAIDLVL_NONE, 0, 0.0F);
    EXPECT_EQ(record().log,
              std::vector{
                  row("getRaidStateSW", 1, "[2] command failed! [/sbin/mdadm --detail /dev/md1]")});
}

TEST_F(Array, WhoseNodeIsMissingDoesNotExistAfterTwoGraceWaits) {
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_NOT_EXIST, ZAV_RAIDLVL_NONE, 0, 0.0F);
    expect_members(0, 0);
    EXPECT_EQ(record().sleeps, (std::vector{10U, 10U}));
    EXPECT_TRUE(record().commands.empty());
    EXPECT_EQ(record().log,
              std::vector{row("getRaidStateSW", 4,
                              "[19] md /dev/swraid/disk2p1 not found[1]. ErrCode[0x2] "
                              "No such file or directory")});
}

TEST_F(Array, WhoseNodeComesUpDuringAGraceWaitIsRead) {
    array("raid5", 4, "[4/4] [UUUU]");
    remove("/dev/swraid/disk2p1");
    record().during_sleep = [](size_t waits) {
        if (waits == 2)
            put("/dev/swraid/disk2p1", "");
    };
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 4, 0.0F);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Array, WhoseNodeIsInaccessibleIsAnError) {
    remove("/dev/swraid");
    put("/dev/swraid", "");
    EXPECT_EQ(ask(kArray2), ZAV_RC_ERR);
    expect(kArray2, ZAV_RAID_NOT_EXIST, ZAV_RAIDLVL_NONE, 0, 0.0F);
    ASSERT_EQ(record().log.size(), 3U);
    EXPECT_EQ(record().log[2], row("getRaidStateSW", 4,
                                   "[19] access device /dev/swraid/disk2p1 failed for 3 times. "
                                   "ErrCode[0x14] Not a directory"));
    EXPECT_EQ(record().sleeps, (std::vector{10U, 10U}));
}

TEST_F(Array, NumbersGoFromOneToFour) {
    for (const int number : {0, 5, -1, INT_MAX}) {
        record().log.clear();
        const zavDevice dev = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, number, 2};
        EXPECT_EQ(ask(dev), ZAV_RC_ERR_EINVAL);
        expect(dev, 0, ZAV_RAIDLVL_NONE, 0, 0.0F);
        expect_members(0, 0);
        EXPECT_EQ(
            record().log,
            std::vector{row("getRaidStateSW", 1,
                            "[22] Input device's disk argu. < 1! Return ZAV_RC_ERR_EINVAL.")});
    }
}

TEST_F(Array, ThePartitionIsOne) {
    for (const int part : {0, 2, -1}) {
        const zavDevice dev = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, part};
        EXPECT_EQ(ask(dev), ZAV_RC_ERR_EINVAL);
        expect(dev, 0, ZAV_RAIDLVL_NONE, 0, 0.0F);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Array, ReaderFindsNoNodeForAnAddressWithoutAName) {
    zavDevice dev = {0, ZAV_MINDEV_RAID_SW, 2, 1};
    EXPECT_EQ(checked([&] { return getRaidStateSW(&dev, &info); }), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_RAID_NOT_EXIST);
    EXPECT_EQ(record().log, std::vector{row("getRaidStateSW", 4,
                                            "[19] md  not found[1]. ErrCode[0x2] No such file or "
                                            "directory")});
}

TEST_F(Array, ArgumentsMustNotBeNull) {
    zavDevice dev = kArray2;
    EXPECT_EQ(zavGetStateRaid(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavGetStateRaid(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    const auto refused = row("zavGetStateRaid", 1, "[22] Arguments can't be null.");
    EXPECT_EQ(record().log, (std::vector{refused, refused}));
}

TEST_F(Array, OtherDeviceTypesAreRefused) {
    EXPECT_EQ(ask({ZAV_DEV_HDD, ZAV_MINDEV_RAID_SW, 2, 1}), ZAV_RC_ERR_EINVAL);
    expect_untouched();
    EXPECT_EQ(record().log, std::vector{row("zavGetStateRaid", 1,
                                            "[22] Input device's type is not ZAV_DEV_RAID. Return "
                                            "ZAV_RC_ERR_EINVAL.")});
}

TEST_F(Array, OtherMinorTypesAreRefusedWithoutAWord) {
    for (const int minor : {ZAV_MINDEV_HDD_SATA, 0x205, 0}) {
        EXPECT_EQ(ask({ZAV_DEV_RAID, minor, 2, 1}), ZAV_RC_ERR_EINVAL);
        expect_untouched();
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Array, WithoutAKnownModelIsUndecided) {
    model("SV-3000\n", "t;0;4\n");
    for (const int minor :
         {ZAV_MINDEV_RAID_SW, ZAV_MINDEV_RAID_HW, ZAV_MINDEV_RAID_SAS, ZAV_MINDEV_RAID_ISCSI, 0}) {
        EXPECT_EQ(ask({ZAV_DEV_RAID, minor, 2, 1}), 0x1301);
        expect_untouched();
    }
    EXPECT_TRUE(record().log.empty());
    zavDevice dev = kArray2;
    EXPECT_EQ(getRaidStateSW(&dev, &info), 0x1301);
    expect_untouched();
}

TEST_F(Array, OfTheHardwareModelMayBeSoftwareToo) {
    model("SV-2980\n", "t;0;4\n");
    array("raid5", 4, "[4/4] [UUUU]");
    EXPECT_EQ(ask(kArray2), ZAV_RC_OK);
    expect(kArray2, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 4, 0.0F);
}

TEST_F(Array, BehindTheControllerNeedsTheHardwareModel) {
    EXPECT_EQ(ask({ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, 1, 0}), ZAV_RC_ERR_EINVAL);
    expect_untouched();
    EXPECT_EQ(record().log,
              std::vector{row("zavGetStateRaid", 1,
                              "[22] Get HW raid state just be supported on model 2980. Return "
                              "ZAV_RC_ERR_EINVAL.")});
}

class IscsiTarget : public Array {
  protected:
    static constexpr zavDevice kTarget = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_ISCSI, 7, 0};

    void expect_target(int state) const {
        expect(kTarget, state, ZAV_RAIDLVL_NONE, 0, 0.0F);
        for (const zavDevice &member : info.hdddev)
            EXPECT_EQ(member, (zavDevice{0, 0, 0, 0}));
    }
};

TEST_F(IscsiTarget, ThatExistsHasNoStateBits) {
    put("/dev/iscsiraid/disk7", "");
    EXPECT_EQ(ask(kTarget), ZAV_RC_OK);
    expect_target(0);
    EXPECT_TRUE(record().log.empty());
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(IscsiTarget, ReaderAnswersByItself) {
    put("/dev/iscsiraid/disk7", "");
    zavDevice dev = kTarget;
    EXPECT_EQ(checked([&] { return getRaidStateISCSI(&dev, &info); }), ZAV_RC_OK);
    expect_target(0);
}

TEST_F(IscsiTarget, ReadersTakeNoNullPointers) {
    zavDevice dev = kTarget;
    for (const auto reader : {getRaidStateISCSI, getRaidStateSW}) {
        EXPECT_EQ(reader(nullptr, &info), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(reader(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    }
}

TEST_F(IscsiTarget, ReaderNeedsAnAddressThatHasAName) {
    zavDevice dev = {0, ZAV_MINDEV_RAID_ISCSI, 7, 0};
    EXPECT_EQ(checked([&] { return getRaidStateISCSI(&dev, &info); }), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().sleeps.empty());
    EXPECT_TRUE(record().log.empty());
}

TEST_F(IscsiTarget, ThatIsMissingDoesNotExistAfterTwoGraceWaits) {
    EXPECT_EQ(ask(kTarget), ZAV_RC_OK);
    expect_target(ZAV_RAID_NOT_EXIST);
    EXPECT_EQ(record().sleeps, (std::vector{10U, 10U}));
    EXPECT_EQ(record().log,
              std::vector{row("getRaidStateISCSI", 4,
                              "[19] Device /dev/iscsiraid/disk7 not found[1]. ErrCode[0x2] No such "
                              "file or directory")});
}

TEST_F(IscsiTarget, WhoseNodeIsInaccessibleIsAnError) {
    remove("/dev/iscsiraid");
    put("/dev/iscsiraid", "");
    EXPECT_EQ(ask(kTarget), ZAV_RC_ERR);
    expect_target(ZAV_RAID_NOT_EXIST);
    ASSERT_EQ(record().log.size(), 3U);
    EXPECT_EQ(record().log[0], row("getRaidStateISCSI", 4,
                                   "[19] access device /dev/iscsiraid/disk7 failed for 1 times. "
                                   "ErrCode[0x14] Not a directory"));
}

TEST_F(IscsiTarget, OtherNumbersAreRefusedWithoutAWord) {
    const zavDevice refused[] = {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_ISCSI, 0, 0},
                                 {ZAV_DEV_RAID, ZAV_MINDEV_RAID_ISCSI, -1, 0},
                                 {ZAV_DEV_RAID, ZAV_MINDEV_RAID_ISCSI, 1, 1}};
    for (const zavDevice &dev : refused) {
        EXPECT_EQ(ask(dev), ZAV_RC_ERR_EINVAL);
        expect_untouched();
    }
    EXPECT_TRUE(record().log.empty());
}

} // namespace
