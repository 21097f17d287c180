// Making, extending and dismantling volume groups.
#include "harness.h"

#include <cerrno>

namespace {

using harness::exits;
using harness::no_start;
using harness::prints;
using harness::record;
using harness::row;
using harness::ScriptedShell;

constexpr zavDevice kGroup2 = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 2, 0};
constexpr zavDevice kDisk3 = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0};
constexpr zavDevice kArray2 = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1};
const std::string kHealth = "smartctl -H -d ata /dev/sata/disk3 &>/dev/null";
const std::string kLabel = "/usr/sbin/pvcreate /dev/sata/disk3 &> /dev/null";
const std::string kExists = "/usr/sbin/vgs DataVG2 &>/dev/null";
const std::string kCreate = "/usr/sbin/vgcreate DataVG2 /dev/sata/disk3";
const std::string kExtend = "/usr/sbin/vgextend DataVG2 /dev/sata/disk3";

class HotAdd : public harness::Appliance {
  protected:
    HotAdd() {
        four_disk_model();
        record().shell = ScriptedShell{};
        put("/dev/sata/disk3", "");
    }

    static int add(zavDevice dev = kDisk3, zavDevice group = kGroup2) {
        const size_t open_before = open_descriptors();
        const int rc = zavLVMHotAdd(&dev, &group);
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_FALSE(has_children());
        EXPECT_EQ(semaphore_value(0x3231), -1) << "takes no lock";
        return rc;
    }

    static void expect_refused(const zavDevice &dev, const zavDevice &group,
                               const std::string &text) {
        record().log.clear();
        record().commands.clear();
        EXPECT_EQ(add(dev, group), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(record().log, std::vector{row("zavLVMHotAdd", 1, text)});
        EXPECT_TRUE(record().commands.empty());
    }
};

TEST_F(HotAdd, ExtendsAGroupThatExists) {
    EXPECT_EQ(add(), ZAV_RC_OK);
    EXPECT_EQ(record().commands, (std::vector{kHealth, kLabel, kExists, kExtend}));
    EXPECT_TRUE(record().log.empty());
}

TEST_F(HotAdd, CreatesAGroupThatDoesNot) {
    record().shell->first(kExists, exits(5));
    EXPECT_EQ(add(), ZAV_RC_OK);
    EXPECT_EQ(record().commands, (std::vector{kHealth, kLabel, kExists, kCreate}));
    EXPECT_TRUE(record().log.empty());
}

TEST_F(HotAdd, TakesAnArray) {
    put("/dev/swraid/disk2p1", "");
    put("/proc/mdstat", harness::data("captures/healthy-4disk/mdstat.txt"));
    record().shell->first("--detail",
                          prints(harness::data("captures/healthy-4disk/mdadm-detail-md1.txt")));
    EXPECT_EQ(add(kArray2), ZAV_RC_OK);
    EXPECT_EQ(record().commands[1], "/usr/sbin/pvcreate /dev/swraid/disk2p1 &> /dev/null");
    EXPECT_EQ(record().commands.back(), "/usr/sbin/vgextend DataVG2 /dev/swraid/disk2p1");
}

TEST_F(HotAdd, TakesADeviceWhateverItsStateIs) {
    record().shell->first("smartctl", exits(8));
    EXPECT_EQ(add(), ZAV_RC_OK);
    put("/dev/iscsiraid/disk1", "");
    EXPECT_EQ(add({ZAV_DEV_RAID, ZAV_MINDEV_RAID_ISCSI, 1, 0}), ZAV_RC_OK);
    EXPECT_EQ(add({ZAV_DEV_RAID, ZAV_MINDEV_RAID_ISCSI, 2, 0}), ZAV_RC_OK) << "missing is a state";
}

TEST_F(HotAdd, NeedsItsArguments) {
    zavDevice dev = kDisk3;
    EXPECT_EQ(zavLVMHotAdd(nullptr, &dev), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavLVMHotAdd(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().log, (std::vector{row("zavLVMHotAdd", 1, "[0] Arguments can't be null."),
                                         row("zavLVMHotAdd", 1, "[0] Arguments can't be null.")}));
}

TEST_F(HotAdd, ChecksItsArgumentsInThisOrder) {
    const zavDevice bad_type = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 1, 0};
    const zavDevice bad_minor = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 1, 0};
    const zavDevice bad_group = {ZAV_DEV_HDD, ZAV_MINDEV_LVM_PV, 1, 0};
    const zavDevice bad_group_minor = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 1, 0};
    expect_refused(bad_type, bad_group,
                   "[1] Input device's type is not ZAV_DEV_LVM. Return ZAV_RC_ERR_EINVAL.");
    expect_refused(bad_minor, bad_group,
                   "[2] Input device's minor_type is not acceptable. Return ZAV_RC_ERR_EINVAL.");
    expect_refused(kDisk3, bad_group,
                   "[3] lvmdev's type is not ZAV_DEV_LVM. Return ZAV_RC_ERR_EINVAL.");
    expect_refused(kDisk3, bad_group_minor,
                   "[4] lvmdev's minor_type is not ZAV_MINDEV_LVM_VG. Return ZAV_RC_ERR_EINVAL.");
}

TEST_F(HotAdd, TakesTheseMinorTypesOnly) {
    for (int minor = 0; minor < 0x100; ++minor) {
        record().log.clear();
        const bool block = minor == ZAV_MINDEV_HDD_SATA ||
                           (minor >= ZAV_MINDEV_RAID_SW && minor <= ZAV_MINDEV_RAID_ISCSI);
        if (block)
            continue;
        EXPECT_EQ(add({ZAV_DEV_HDD, minor, 3, 0}), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(record().log.back().text.substr(0, 3), "[2]") << minor;
    }
}

TEST_F(HotAdd, NeedsADeviceThatAnswers) {
    expect_refused({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 1}, kGroup2,
                   "[5] dev is not a available device. Return ZAV_RC_ERR_EINVAL.");
    expect_refused({ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, 3, 1}, kGroup2,
                   "[5] dev is not a available device. Return ZAV_RC_ERR_EINVAL.");
}

TEST_F(HotAdd, ThatPvcreateRefusesIsTold) {
    record().shell->first("pvcreate", exits(5));
    EXPECT_EQ(add(), ZAV_RC_ERR);
    EXPECT_EQ(record().log,
              std::vector{row("zavLVMHotAdd", 4, "[7] pvcreate failed. [" + kLabel + "]")});
    EXPECT_EQ(record().commands.back(), kLabel);
}

TEST_F(HotAdd, ToNoGroupIsToldAfterTheLabelIsMade) {
    EXPECT_EQ(add(kDisk3, {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, -1, 0}), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().commands.back(), kLabel);
    EXPECT_EQ(record().log, std::vector{row("zavLVMHotAdd", 4,
                                            "[8] Problem with getting VGName from zavMapVGToStr(). "
                                            "Return ZAV_RC_ERR_EINVAL.")});
}

TEST_F(HotAdd, ThatVgcreateOrVgextendRefusesIsTold) {
    record().shell->first("vgextend", exits(5));
    EXPECT_EQ(add(), ZAV_RC_ERR);
    record().shell->first("vgcreate", exits(5));
    record().shell->first(kExists, exits(5));
    EXPECT_EQ(add(), ZAV_RC_ERR);
    EXPECT_EQ(record().log,
              (std::vector{row("zavLVMHotAdd", 4, "[10] vgextend failed. [" + kExtend + "]"),
                           row("zavLVMHotAdd", 4, "[9] vgcreate failed. [" + kCreate + "]")}));
}

// ---- Removing ----

const std::string kIdent = "zavLVMHotRemove";

class HotRemove : public harness::Appliance {
  protected:
    HotRemove() {
        record().shell = ScriptedShell{{"Cur PV", prints("2\n")},
                                       {"Cur LV", prints("2\n")},
                                       {"vgdisplay -c", prints("1048576\n")},
                                       {"/block/md1", prints("/dev/swraid/disk2p1\n")},
                                       {"/block/sdc", prints("/dev/sata/disk3\n")}};
        put("/etc/Kiru/zav/DataVG2",
            "physical_volumes {\npv0 {\ndevice = \"/dev/md1\"\n}\npv1 {\ndevice = \"/dev/sdc\"\n}\n"
            "}\nlogical_volumes {\nLogVol1 {\n}\nLogVol3 {\n}\n}\n");
        for (int i = 1; i <= 3; ++i)
            put("/dev/DataVG2/LogVol" + std::to_string(i), "");
    }

    ~HotRemove() override { remove("/dev/DataVG2"); }

    static int remove_group(zavDevice group = kGroup2) {
        const size_t open_before = open_descriptors();
        const int rc = zavLVMHotRemove(&group);
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_FALSE(has_children());
        EXPECT_NE(semaphore_value(kKey), 0);
        EXPECT_LT(semaphore_value(kKey), 2);
        return rc;
    }

    // What was run to change anything.
    static std::vector<std::string> changes() {
        std::vector<std::string> found;
        for (const std::string &command : record().commands)
            if (command.starts_with("df") || command.starts_with("/bin/umount") ||
                command.find("remove ") != std::string::npos)
                found.push_back(command);
        return found;
    }

    static void expect_refused(zavDevice *group, const std::string &text) {
        record().log.clear();
        EXPECT_EQ(zavLVMHotRemove(group), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(record().log, std::vector{row(kIdent, 1, text)});
        EXPECT_EQ(semaphore_value(kKey), -1);
    }

    static constexpr int kKey = 0x3231;
    const std::vector<std::string> volume1 = {
        "df | grep \"/mnt/internal/data2-1\" &> /dev/null", "/bin/umount /mnt/internal/data2-1",
        "/usr/sbin/lvremove -f /dev/DataVG2/LogVol1 &>/dev/null"};
    const std::vector<std::string> volume3 = {
        "df | grep \"/mnt/internal/data2-3\" &> /dev/null", "/bin/umount /mnt/internal/data2-3",
        "/usr/sbin/lvremove -f /dev/DataVG2/LogVol3 &>/dev/null"};
    const std::string vgremove = "/usr/sbin/vgremove DataVG2 &>/dev/null";
    const std::string label1 = "/usr/sbin/pvremove -f /dev/swraid/disk2p1 &>/dev/null";
    const std::string label2 = "/usr/sbin/pvremove -f /dev/sata/disk3 &>/dev/null";
};

TEST_F(HotRemove, TakesTheVolumesThenTheGroupThenTheLabels) {
    EXPECT_EQ(remove_group(), ZAV_RC_OK);
    EXPECT_EQ(changes(), (std::vector{volume1[0], volume1[1], volume1[2], volume3[0], volume3[1],
                                      volume3[2], vgremove, label1, label2}));
    EXPECT_TRUE(record().log.empty());
    EXPECT_EQ(semaphore_value(0x6911), 1);
}

TEST_F(HotRemove, DoesNotUnmountWhatIsNotMounted) {
    record().shell->first(volume1[0], exits(1));
    EXPECT_EQ(remove_group(), ZAV_RC_OK);
    EXPECT_EQ(changes()[1], volume1[2]);
    EXPECT_EQ(changes()[3], volume3[1]);
}

TEST_F(HotRemove, OfAGroupThatDoesNotExistRunsNothing) {
    record().shell->first("/.vgs | grep", exits(1));
    EXPECT_EQ(remove_group(), ZAV_RC_ERR_ENODEV);
    EXPECT_TRUE(changes().empty());
    EXPECT_TRUE(record().log.empty());
}

TEST_F(HotRemove, OfAFailedGroupGoesOn) {
    record().shell->first("/usr/sbin/vgs DataVG2", exits(5));
    EXPECT_EQ(remove_group(), ZAV_RC_OK);
    EXPECT_EQ(changes(), std::vector{vgremove});
}

TEST_F(HotRemove, OfAGroupThatGivesNoAnswerRunsNothing) {
    record().shell->first("Cur PV", no_start());
    EXPECT_EQ(remove_group(), ZAV_RC_ERR_ESTRPIPE);
    EXPECT_TRUE(changes().empty());
    EXPECT_EQ(record().log.back(), row(kIdent, 1, "[4] zavgetStateLVMVG() failed. rc: 0x56"));
}

TEST_F(HotRemove, NeedsAGroup) {
    expect_refused(nullptr, "[1] Arguments can't be null.");
    zavDevice raid = {ZAV_DEV_RAID, ZAV_MINDEV_LVM_PV, 2, 0};
    expect_refused(&raid, "[2] lvmdev's type is not ZAV_DEV_LVM. Return ZAV_RC_ERR_EINVAL.");
    zavDevice physical = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 2, 0};
    expect_refused(&physical, "[3] Input device's minor_type is not ZAV_MINDEV_LVM_VG. "
                              "Return ZAV_RC_ERR_EINVAL.");
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(HotRemove, OfGroupMinusOneFailsInTheQuery) {
    EXPECT_EQ(remove_group({ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, -1, 0}), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().log.back(), row(kIdent, 1, "[4] zavgetStateLVMVG() failed. rc: 0x16"));
}

TEST_F(HotRemove, WithoutSemaphoreIsAnError) {
    record().semget_fails = true;
    zavDevice group = kGroup2;
    EXPECT_EQ(zavLVMHotRemove(&group), ZAV_RC_ERR);
    EXPECT_EQ(record().log.back(), row(kIdent, 1, "[3] Get Semaphore failed!!"));
}

TEST_F(HotRemove, WhoseSemaphoreCannotBeTakenIsAnError) {
    record().semop_fails = [](short operation) { return operation < 0; };
    EXPECT_EQ(remove_group(), ZAV_RC_ERR);
    ASSERT_EQ(record().log.size(), 2U);
    EXPECT_NE(record().log[0].text.find("key[0x1]"), std::string::npos) << record().log[0];
    EXPECT_EQ(record().log[1], row(kIdent, 1, "[3] semaphore_p [12849] failed!!"));
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(HotRemove, WhoseSemaphoreCannotBeReleasedIsAnError) {
    int releases = 0;
    record().semop_fails = [&](short operation) { return operation > 0 && ++releases == 2; };
    zavDevice group = kGroup2;
    EXPECT_EQ(zavLVMHotRemove(&group), ZAV_RC_ERR);
    EXPECT_EQ(changes().back(), label2);
    ASSERT_EQ(record().log.size(), 2U);
    EXPECT_NE(record().log[0].text.find("key[0x3231]"), std::string::npos) << record().log[0];
    EXPECT_EQ(record().log[1], row(kIdent, 1, "[3] semaphore_v [12849] failed!!"));
}

TEST_F(HotRemove, HoldsItsLockBeforeAndAfterTheQuery) {
    remove("/dev/DataVG2/LogVol1");
    int outer = -1;
    int inner = -1;
    record().during_sleep = [&](size_t) {
        outer = semaphore_value(0x3231);
        inner = semaphore_value(0x6911);
    };
    EXPECT_EQ(remove_group(), ZAV_RC_OK);
    EXPECT_EQ(outer, 0);
    EXPECT_EQ(inner, 0);
}

TEST_F(HotRemove, GoesOnWhereAVolumeStaysAndTellsInTheEnd) {
    record().shell->first("LogVol1 &>", exits(5));
    EXPECT_EQ(remove_group(), ZAV_RC_ERR);
    EXPECT_EQ(changes().size(), 9U);
    EXPECT_EQ(record().log, std::vector{row(kIdent, 1, "[6] command failed.[" + volume1[2] + "]")});
}

TEST_F(HotRemove, StopsWhereTheGroupStays) {
    record().shell->first("vgremove", exits(5));
    EXPECT_EQ(remove_group(), ZAV_RC_ERR);
    EXPECT_EQ(changes().back(), vgremove);
    EXPECT_EQ(record().log,
              std::vector{
                  row(kIdent, 1, "[8] command failed.[" + vgremove + "] [5 Input/output error ]")});
}

TEST_F(HotRemove, GoesOnWhereALabelStaysAndTellsInTheEnd) {
    record().shell->first("disk2p1 &>", exits(5));
    EXPECT_EQ(remove_group(), ZAV_RC_ERR);
    EXPECT_EQ(changes().back(), label2);
    EXPECT_EQ(
        record().log,
        std::vector{row(kIdent, 1, "[6] command failed.[" + label1 + "] [5 Input/output error ]")});
}

// The error number is read like an exit status: in its second byte.
TEST_F(HotRemove, StopsAtABusyUnmount) {
    record().shell->first(volume3[1], exits(32, EBUSY << 8));
    EXPECT_EQ(remove_group(), ZAV_RC_ERR_EBUSY);
    EXPECT_EQ(changes().back(), volume3[1]);
    EXPECT_EQ(record().log, std::vector{row(kIdent, 1,
                                            "[5] Failed on umount(" + volume3[1] +
                                                "). errno: 0x10 Device or resource busy")});
}

TEST_F(HotRemove, PassesOverAnyOtherFailureToUnmount) {
    record().shell->first(volume1[1], exits(32, EBUSY));
    record().shell->first(volume3[1], exits(0, EBUSY << 8));
    EXPECT_EQ(remove_group(), ZAV_RC_OK);
    EXPECT_EQ(changes().size(), 9U);
}

TEST_F(HotRemove, WithMoreVolumesThanTheTablesHoldStaysInside) {
    record().shell->first("Cur PV", prints("2147483647\n"));
    record().shell->first("Cur LV", prints("2147483647\n"));
    put("/etc/Kiru/zav/DataVG2", "");
    EXPECT_EQ(remove_group(), ZAV_RC_OK);
    EXPECT_EQ(changes().size(), 6 * 3 + 1 + 9U);
}

} // namespace
