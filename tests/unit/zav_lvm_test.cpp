// State of logical and physical volumes, mount points and usage.
#include "harness.h"

#include <cfloat>
#include <climits>
#include <sys/stat.h>

namespace {

using harness::exits;
using harness::no_start;
using harness::prints;
using harness::record;
using harness::row;
using harness::ScriptedShell;

constexpr zavDevice kVolume = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 2, 1};
constexpr zavDevice kPhysical = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 1, 1};
const std::string kNode = "/dev/DataVG1/LogVol2";
const std::string kLvs = "/usr/sbin/lvs " + kNode + " &> /dev/null";
const std::string kSize = "lvdisplay -c " + kNode + " 2>/dev/null";
const std::string kWake = "ls -la /mnt/internal/data1-2 &> /dev/null";
const std::string kAvailable =
    "/usr/sbin/lvdisplay " + kNode + " 2>/dev/null | grep \"NOT available\" &>/dev/null";

void file_system(unsigned long blocks, unsigned long available) {
    record().file_system.emplace();
    record().file_system->f_blocks = blocks;
    record().file_system->f_bavail = available;
    record().file_system->f_bfree = available + 5;
}

std::string lvdisplay(const std::string &sectors) {
    return "  /dev/DataVG1/LogVol2:DataVG1:3:1:-1:1:" + sectors + ":32:-1:0:-1:252:0\n";
}

// ---- The entry ----

class LvmQuery : public harness::Appliance {
  protected:
    LvmQuery() { record().shell = ScriptedShell{}; }

    static void expect_refusal(zavDevice *dev, zavLVMState *info, const std::string &text) {
        record().log.clear();
        EXPECT_EQ(zavGetStateLVM(dev, info), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(record().log, std::vector{row("zavGetStateLVM", 1, text)});
    }
};

TEST_F(LvmQuery, NeedsItsArguments) {
    zavDevice dev = kVolume;
    zavLVMState info = {};
    const std::string text = "[1] Input arguments can't be null. Return ZAV_RC_ERR_EINVAL.";
    expect_refusal(nullptr, &info, text);
    expect_refusal(&dev, nullptr, text);
    expect_refusal(nullptr, nullptr, text);
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(LvmQuery, RefusesOtherDevicesBeforeItLooksForTheTools) {
    zavDevice dev = {ZAV_DEV_RAID, ZAV_MINDEV_LVM_VG, 1, 0};
    zavLVMState info = {.type = 9, .dev = {}, .state = 9};
    expect_refusal(&dev, &info, "[2] Devie's type is not ZAV_DEV_LVM. Return ZAV_RC_ERR_EINVAL.");
    EXPECT_EQ(info.type, 9);
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(LvmQuery, RefusesOtherMinorTypesAfterwards) {
    zavDevice dev = {ZAV_DEV_LVM, ZAV_MINDEV_HDD_SATA, 1, 0};
    zavLVMState info = {.type = 9, .dev = {}, .state = 9};
    expect_refusal(&dev, &info,
                   "[3] Device's minor type is not ZAV_MINDEV_LVM_VG/ZAV_MINDEV_LVM_PV/"
                   "ZAV_MINDEV_LVM_LV. Return ZAV_RC_ERR_EINVAL.");
    EXPECT_EQ(info.type, 9);
    EXPECT_EQ(record().commands.size(), 6U);
}

TEST_F(LvmQuery, NeedsTheTools) {
    record().shell->first("ls /usr/sbin/pvs ", exits(2));
    zavDevice dev = {ZAV_DEV_LVM, ZAV_MINDEV_HDD_SATA, 1, 0};
    zavLVMState info = {.type = 9, .dev = {}, .state = 9};
    EXPECT_EQ(zavGetStateLVM(&dev, &info), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(info.type, 9);
    EXPECT_EQ(record().log,
              std::vector{row("zavCheckExeFile", 1, "[2] Error: Utility pvs doesn't exist")});
}

TEST_F(LvmQuery, GoesByTheMinorType) {
    zavLVMState info = {};
    zavDevice group = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, -1, 0};
    EXPECT_EQ(zavGetStateLVM(&group, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().log.back().ident, "zavgetStateLVMVG");
    zavDevice physical = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 1, -1};
    EXPECT_EQ(zavGetStateLVM(&physical, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().log.back().ident, "zavgetStateLVMPV");
    zavDevice logical = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 0, 1};
    info.dev.lvmtype = 9;
    EXPECT_EQ(zavGetStateLVM(&logical, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(info.dev.lvmtype, ZAV_MINDEV_LVM_LV);
}

// ---- Logical volumes ----

class LogicalVolume : public harness::Appliance {
  protected:
    LogicalVolume() {
        record().shell = ScriptedShell{{kSize, prints(lvdisplay("4194304"))}};
        put(kNode, "");
        file_system(1000, 600);
    }

    int ask(zavDevice dev = kVolume) {
        memset(&info, 0x55, sizeof info);
        const size_t open_before = open_descriptors();
        const int rc = zavgetStateLVMLV(&dev, &info);
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_FALSE(has_children());
        return rc;
    }

    const lvmLV &volume() const { return info.dev.lvmlvdev; }

    void expect_presets(const zavDevice &dev, int state) const {
        EXPECT_EQ(info.type, 18010);
        EXPECT_EQ(volume().lvmtype, dev.minor_type);
        EXPECT_EQ(volume().lvmdev, dev);
        EXPECT_EQ(+volume().size, 0U);
        EXPECT_EQ(volume().usage, 0.0F);
        EXPECT_EQ(volume().vgdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, dev.part, 0}));
        EXPECT_EQ(info.state, state);
    }

    zavLVMState info = {};
};

TEST_F(LogicalVolume, ThatIsHealthyHasNoStateBit) {
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, 0);
    EXPECT_EQ(+volume().size, 3U);
    EXPECT_EQ(volume().usage, 40.0F);
    EXPECT_EQ(volume().lvmdev, kVolume);
    EXPECT_EQ(volume().vgdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 1, 0}));
    EXPECT_EQ(record().steps, (std::vector<std::string>{kLvs, kSize, kWake}));
    EXPECT_EQ(record().measured, "/mnt/internal/data1-2");
    EXPECT_TRUE(record().log.empty());
}

TEST_F(LogicalVolume, NumbersGoTo6InTheSystemGroupAndTo4InADataGroup) {
    const std::pair<zavDevice, int> numbers[] = {
        {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 0, 0}, ZAV_RC_ERR_EINVAL},
        {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 1, 0}, ZAV_RC_OK},
        {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 6, 0}, ZAV_RC_OK},
        {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 7, 0}, ZAV_RC_ERR_EINVAL},
        {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, -1, 1}, ZAV_RC_ERR_EINVAL},
        {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 0, 1}, ZAV_RC_ERR_EINVAL},
        {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 1, 1}, ZAV_RC_OK},
        {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 4, 1}, ZAV_RC_OK},
        {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 5, 1}, ZAV_RC_ERR_EINVAL},
        {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 5, 2}, ZAV_RC_ERR_EINVAL}};
    for (const auto &[dev, expected] : numbers) {
        record().steps.clear();
        EXPECT_EQ(ask(dev), expected) << dev;
        if (expected != ZAV_RC_OK) {
            expect_presets(dev, ZAV_LVM_NORMAL);
            EXPECT_TRUE(record().steps.empty());
        }
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(LogicalVolume, WithoutAPathIsTold) {
    const zavDevice dev = {ZAV_DEV_HDD, ZAV_MINDEV_LVM_LV, 2, 1};
    EXPECT_EQ(ask(dev), ZAV_RC_ERR_EINVAL);
    expect_presets(dev, ZAV_LVM_NORMAL);
    char text[128];
    snprintf(text, sizeof text, "[0] zavDevToStr() returns 0x16. dev[0x%x, 0x%x, 0x2, 0x1, ] ",
             ZAV_DEV_HDD, ZAV_MINDEV_LVM_LV);
    EXPECT_EQ(record().log, std::vector{row("zavgetStateLVMLV", 4, text)});
}

TEST_F(LogicalVolume, WithoutNodeThatLvmKnowsIsInactive) {
    remove(kNode);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect_presets(kVolume, ZAV_LVM_INACTIVE);
    EXPECT_EQ(record().steps, (std::vector<std::string>{"sleep 10", "sleep 10", kAvailable}));
    EXPECT_TRUE(record().log.empty());
}

TEST_F(LogicalVolume, WithoutNodeThatLvmDoesNotKnowDoesNotExist) {
    remove(kNode);
    record().shell->first("NOT available", exits(1));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect_presets(kVolume, ZAV_LVM_NOT_EXIST);
}

TEST_F(LogicalVolume, IsFoundInactiveInWhatLvdisplayPrints) {
    remove(kNode);
    record().shell.reset();
    put("/scratch/inactive", harness::data("captures/lv-inactive/lvdisplay-DataVG1-LogVol2.txt"));
    script("/usr/sbin/lvdisplay", "cat /scratch/inactive\n");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_INACTIVE);
}

TEST_F(LogicalVolume, ThatComesUpInAGraceWaitIsHealthy) {
    for (const size_t wait : {1U, 2U}) {
        remove(kNode);
        record().sleeps.clear();
        record().during_sleep = [=](size_t waits) {
            if (waits == wait)
                put(kNode, "");
        };
        EXPECT_EQ(ask(), ZAV_RC_OK);
        EXPECT_EQ(info.state, 0);
        EXPECT_EQ(record().sleeps.size(), wait);
    }
}

TEST_F(LogicalVolume, WhoseNodeIsNotAccessibleIsAnError) {
    remove("/dev/DataVG1");
    put("/dev/DataVG1", ""); // a file where a directory should be: ENOTDIR
    EXPECT_EQ(ask(), ZAV_RC_ERR);
    expect_presets(kVolume, ZAV_LVM_NOT_EXIST);
    EXPECT_EQ(record().sleeps, (std::vector{10U, 10U}));
    EXPECT_TRUE(record().commands.empty());
    ASSERT_EQ(record().log.size(), 3U);
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(record().log[static_cast<size_t>(i)],
                  row("zavgetStateLVMLV", 4,
                      "[19] access device /dev/DataVG1/LogVol2 failed for " +
                          std::to_string(i + 1) + " times. ErrCode[0x14] Not a directory"));
}

TEST_F(LogicalVolume, ThatLvsRefusesHasFailed) {
    record().shell->first(kLvs, exits(5));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect_presets(kVolume, ZAV_LVM_FAILED);
    EXPECT_EQ(record().commands, std::vector{kLvs});
}

TEST_F(LogicalVolume, WithoutSizePipeIsTold) {
    record().shell->first(kSize, no_start());
    EXPECT_EQ(ask(), ZAV_RC_ERR_ESTRPIPE);
    expect_presets(kVolume, 0);
    EXPECT_EQ(record().log,
              std::vector{row("zavgetStateLVMLV", 4, "[1] Failed on popen[" + kSize + "]\n")});
}

TEST_F(LogicalVolume, WithoutSizeLineHasSizeZero) {
    record().shell->first(kSize, {});
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(+volume().size, 0U);
    EXPECT_EQ(volume().usage, 40.0F);
    record().shell->first(kSize, prints("a:b:c\n"));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(+volume().size, 0U);
}

TEST_F(LogicalVolume, SizeIsTheSeventhFieldInGbAndOneMore) {
    const std::pair<const char *, unsigned long long> sizes[] = {
        {"2097152", 2},
        {"2097151", 1},
        {"0", 1},
        {" 2097152\t", 2},
        {"2147483647", 1024},
        {"2147483648", 1024},
        {"99999999999", 1024},
        {"x", 1},
        {"-2097152", 0},
        {"-99999999999", static_cast<zavSize>(-1023)}};
    for (const auto &[sectors, gb] : sizes) {
        record().shell->first(kSize, prints(lvdisplay(sectors)));
        EXPECT_EQ(ask(), ZAV_RC_OK);
        EXPECT_EQ(+volume().size, gb) << sectors;
    }
    record().shell->first(kSize, prints("::a::b:c:d:e:f:4194304"));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(+volume().size, 3U) << "runs of colons are one";
}

TEST_F(LogicalVolume, IsFullStrictlyAbove90Percent) {
    file_system(1000, 100);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(volume().usage, 90.0F);
    EXPECT_EQ(info.state, 0);
    file_system(1000, 45);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(volume().usage, 95.5F);
    EXPECT_EQ(info.state, ZAV_LVM_FULL);
}

TEST_F(LogicalVolume, ThatCannotBeMeasuredKeepsItsState) {
    record().file_system.reset();
    EXPECT_EQ(ask(), 0x2801);
    EXPECT_EQ(info.state, 0);
    EXPECT_EQ(+volume().size, 3U);
    EXPECT_EQ(volume().usage, 0.0F);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(LogicalVolume, NullsAreRefused) {
    zavDevice dev = kVolume;
    EXPECT_EQ(zavgetStateLVMLV(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavgetStateLVMLV(&dev, nullptr), ZAV_RC_ERR_EINVAL);
}

// ---- Physical volumes ----

const std::string kLink = "echo /dev/`udevinfo -q symlink -p /block/md1`";

class PhysicalVolume : public harness::Appliance {
  protected:
    PhysicalVolume() {
        four_disk_model();
        record().shell =
            ScriptedShell{{"Cur PV", prints("2\n")},
                          {"Cur LV", prints("0\n")},
                          {"vgdisplay -c", prints("1048576\n")},
                          {kLink, prints("/dev/swraid/disk2p1\n")},
                          {"/sys/block/sdc", prints("/dev/sata/disk3\n")},
                          {"mdadm --detail", prints(harness::data("captures/healthy-4disk/"
                                                                  "mdadm-detail-md1.txt"))}};
        put("/etc/Kiru/zav/DataVG1", "physical_volumes {\n"
                                     "pv0 {\ndevice = \"/dev/md1\"\ndev_size = 4194304\n}\n"
                                     "pv1 {\ndevice = \"/dev/sdc\"\ndev_size = 2097152\n}\n}\n");
        put("/dev/swraid/disk2p1", "");
        put("/dev/sata/disk3", "");
        mdstat("[4/4] [UUUU]");
    }

    static void mdstat(const std::string &members) {
        put("/proc/mdstat",
            "md1 : active raid5 sda2[0]\n      974848 blocks level 5 " + members + "\n      \n");
    }

    int ask(zavDevice dev = kPhysical) {
        memset(&info, 0x55, sizeof info);
        const size_t open_before = open_descriptors();
        const int rc = zavgetStateLVMPV(&dev, &info);
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_FALSE(has_children());
        EXPECT_EQ(semaphore_value(0x6911), 1);
        return rc;
    }

    const lvmPV &volume() const { return info.dev.lvmpvdev; }

    void expect_presets(const zavDevice &dev, int state) const {
        EXPECT_EQ(info.type, 18010);
        EXPECT_EQ(volume().lvmtype, dev.minor_type);
        EXPECT_EQ(volume().lvmdev, dev);
        EXPECT_EQ(+volume().size, 0U);
        EXPECT_EQ(volume().vgdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, dev.part, 0}));
        EXPECT_EQ(volume().dev, (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 0, 0}));
        EXPECT_EQ(info.state, state);
    }

    zavLVMState info = {};
};

TEST_F(PhysicalVolume, OnAnArrayIsTheGroupsEntry) {
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
    EXPECT_EQ(volume().lvmdev, kPhysical);
    EXPECT_EQ(+volume().size, 3U);
    EXPECT_EQ(volume().dev, (zavDevice{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1}));
    EXPECT_EQ(volume().vgdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 1, 0}));
    EXPECT_EQ(record().commands.back(), "/usr/sbin/pvs /dev/swraid/disk2p1 &> /dev/null");
    EXPECT_TRUE(record().log.empty());
}

TEST_F(PhysicalVolume, OnADegradedOrRebuildingArrayIsNormal) {
    mdstat("[4/3] [UUU_]");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
}

TEST_F(PhysicalVolume, OnAFailedArrayHasFailed) {
    record().shell->first("mdadm --detail",
                          prints(harness::data("captures/raid5-two-lost/mdadm-detail-md1.txt")));
    mdstat("[4/2] [UU__]");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_FAILED);
    EXPECT_NE(record().commands.back(), "/usr/sbin/pvs /dev/swraid/disk2p1 &> /dev/null");
}

TEST_F(PhysicalVolume, OnAMissingArrayDoesNotExist) {
    remove("/dev/swraid/disk2p1");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_NOT_EXIST);
    EXPECT_EQ(record().sleeps, (std::vector{10U, 10U}));
}

TEST_F(PhysicalVolume, OnAnArrayThatGivesNoAnswerGetsItsCode) {
    remove("/proc/mdstat");
    EXPECT_EQ(ask(), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
    EXPECT_EQ(+volume().size, 3U);
}

TEST_F(PhysicalVolume, OnADiskGoesByTheDisk) {
    const zavDevice second = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 2, 1};
    EXPECT_EQ(ask(second), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
    EXPECT_EQ(volume().dev, (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0}));
    EXPECT_EQ(record().commands.back(), "/usr/sbin/pvs /dev/sata/disk3 &> /dev/null");
    for (const int status : {2, 8}) { // absent, failed
        record().shell->first("smartctl", exits(status));
        EXPECT_EQ(ask(second), ZAV_RC_OK);
        EXPECT_EQ(info.state, ZAV_LVM_FAILED);
    }
    record().shell->first("smartctl", no_start());
    EXPECT_EQ(ask(second), ZAV_RC_ERR);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
}

TEST_F(PhysicalVolume, ThatPvsRefusesHasFailed) {
    record().shell->first("/usr/sbin/pvs", exits(5));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_FAILED);
}

TEST_F(PhysicalVolume, ThatTheGroupDoesNotHaveDoesNotExist) {
    const zavDevice third = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 3, 1};
    EXPECT_EQ(ask(third), ZAV_RC_OK);
    expect_presets(third, ZAV_LVM_NOT_EXIST);
}

TEST_F(PhysicalVolume, IsLookedForInsideTheTable) {
    record().shell->first("Cur PV", prints("2147483647\n"));
    const zavDevice third = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 3, 1};
    EXPECT_EQ(ask(third), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_NOT_EXIST);
}

TEST_F(PhysicalVolume, OfAGroupWithoutAnyAsksDiskZero) {
    record().shell->first("Cur PV", prints("0\n"));
    EXPECT_EQ(ask(), ZAV_RC_ERR_EINVAL);
    expect_presets(kPhysical, ZAV_LVM_NORMAL);
    EXPECT_EQ(record().log.back().text, "[22] dev->disk(0) is not acceptable.");
}

TEST_F(PhysicalVolume, OfAGroupThatGivesNoAnswerGetsItsCode) {
    record().shell->first("Cur LV", no_start());
    EXPECT_EQ(ask(), ZAV_RC_ERR_ESTRPIPE);
    expect_presets(kPhysical, ZAV_LVM_NORMAL);
    EXPECT_EQ(record().log.back(), row("zavgetStateLVMPV", 4, "[0] zavgetStateLVMVG() failed."));
}

TEST_F(PhysicalVolume, OnADeviceWithoutAPathIsTold) {
    record().shell->first(kLink, prints("/dev/sas/r8388608disk1\n")); // a negative number
    EXPECT_EQ(ask(), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
    EXPECT_EQ(record().log, std::vector{row("zavgetStateLVMPV", 4, "[1] zavDevToStr() failed.")});
    EXPECT_EQ(record().commands.back().find("/usr/sbin/pvs"), std::string::npos);
}

TEST_F(PhysicalVolume, OnADeviceOfAnotherKindIsAskedOfPvsAlone) {
    record().shell->first(kLink, prints("/dev/iscsiraid/disk3\n"));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
    EXPECT_EQ(record().commands.back(), "/usr/sbin/pvs /dev/iscsiraid/disk3 &> /dev/null");
}

TEST_F(PhysicalVolume, NullsAreRefused) {
    zavDevice dev = kPhysical;
    EXPECT_EQ(zavgetStateLVMPV(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavgetStateLVMPV(&dev, nullptr), ZAV_RC_ERR_EINVAL);
}

// ---- Mount points and usage ----

std::string mount_point(int number, int group) {
    zavDevice dev = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, number, group};
    char path[42];
    EXPECT_EQ(zavDevToMnt(&dev, path), ZAV_RC_OK);
    return path;
}

TEST(MountPoint, GoesByGroupAndNumber) {
    EXPECT_EQ(mount_point(2, 0), "/mnt/prios/disk1p2");
    EXPECT_EQ(mount_point(1, 0), "/mnt/prios/disk1p1");
    EXPECT_EQ(mount_point(3, 1), "/mnt/internal/data1-3");
    EXPECT_EQ(mount_point(3, 2), "/mnt/internal/data2-3");
    EXPECT_EQ(mount_point(INT_MIN, INT_MIN), "/mnt/internal/data-2147483648--2147483648");
}

TEST(MountPoint, NullsAreRefused) {
    zavDevice dev = kVolume;
    char path[42] = "untouched";
    EXPECT_EQ(zavDevToMnt(nullptr, path), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavDevToMnt(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_STREQ(path, "untouched");
}

class Usage : public harness::Appliance {
  protected:
    Usage() { record().shell = ScriptedShell{}; }

    static float measure(unsigned long blocks, unsigned long available) {
        file_system(blocks, available);
        zavDevice dev = kVolume;
        float usage = 77.0F;
        EXPECT_EQ(zavgetFSusage(&dev, &usage), ZAV_RC_OK);
        return usage;
    }
};

TEST_F(Usage, IsWhatUnprivilegedUsersCannotHave) {
    EXPECT_EQ(measure(1000, 1000), 0.0F);
    EXPECT_EQ(measure(1000, 0), 100.0F);
    EXPECT_EQ(measure(3, 1), static_cast<float>((1.0L - 1.0L / 3.0L) * 100.0L));
    EXPECT_EQ(measure(16777217, 1), static_cast<float>((1.0L - 1.0L / 16777217.0L) * 100.0L));
    EXPECT_EQ(record().commands[0], kWake);
    EXPECT_EQ(record().measured, "/mnt/internal/data1-2");
}

TEST_F(Usage, OfNoBlocksIsZero) {
    EXPECT_EQ(measure(0, 0), 0.0F);
    EXPECT_EQ(measure(0, 5), 0.0F);
}

TEST_F(Usage, ThatCannotBeMeasuredIsNotWritten) {
    record().shell->first("ls", exits(2));
    zavDevice dev = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 2, 0};
    float usage = 77.0F;
    EXPECT_EQ(zavgetFSusage(&dev, &usage), 0x2801);
    EXPECT_EQ(usage, 77.0F);
    EXPECT_EQ(record().commands,
              std::vector<std::string>{"ls -la /mnt/prios/disk1p2 &> /dev/null"});
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Usage, NullsAreRefused) {
    zavDevice dev = kVolume;
    float usage = 77.0F;
    EXPECT_EQ(zavgetFSusage(nullptr, &usage), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavgetFSusage(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().commands.empty());
}

} // namespace
