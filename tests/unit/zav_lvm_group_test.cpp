// State and layout of a volume group.
#include "harness.h"

namespace {

using harness::exits;
using harness::no_start;
using harness::prints;
using harness::record;
using harness::row;
using harness::ScriptedShell;

constexpr int kKey = 0x6911;
const std::string kIdent = "zavgetStateLVMVG";
const std::string kListed = "cat /etc/Kiru/zav/.vgs | grep DataVG1 &>/dev/null";

const std::vector<std::string> kCommands = {
    "/usr/sbin/vgs &> /etc/Kiru/zav/.vgs",
    kListed,
    "/usr/sbin/vgs DataVG1 &>/dev/null",
    "/usr/sbin/vgdisplay DataVG1 &> /etc/Kiru/zav/.vgdisplay.DataVG1",
    "cat /etc/Kiru/zav/.vgdisplay.DataVG1 | grep \"Cur PV\" | cut -c 12- ",
    "cat /etc/Kiru/zav/.vgdisplay.DataVG1 | grep \"Cur LV\" | cut -c 12- ",
    "/usr/sbin/vgdisplay -c DataVG1 2>/dev/null | cut -d ':' -f 12",
    "/usr/sbin/vgcfgbackup -f /etc/Kiru/zav/DataVG1 DataVG1 &> /dev/null",
};
const std::vector<std::string> kToolChecks = {
    "ls /usr/sbin/vgs &> /dev/null",       "ls /usr/sbin/lvs &> /dev/null",
    "ls /usr/sbin/pvs &> /dev/null",       "ls /usr/sbin/vgdisplay &> /dev/null",
    "ls /usr/sbin/lvdisplay &> /dev/null", "ls /usr/sbin/pvdisplay &> /dev/null"};
const std::string kArrayLink = "echo /dev/`udevinfo -q symlink -p /block/md1`";

std::string backup(const std::string &device, const std::string &volumes = "") {
    return "DataVG1 {\nextent_size = 8192\nphysical_volumes {\npv0 {\ndevice = \"" + device +
           "\" # Hint only\ndev_size = 4194304\n}\n}\nlogical_volumes {\n" + volumes + "}\n}\n";
}

std::string volume(int number) {
    return "LogVol" + std::to_string(number) +
           " {\nsegment_count = 1\nsegment1 {\nextent_count = 256\n}\n}\n";
}

class VolumeGroup : public harness::Appliance {
  protected:
    VolumeGroup() {
        record().shell = ScriptedShell{{"Cur PV", prints(" 1\n")},
                                       {"Cur LV", prints("   0\n")},
                                       {"vgdisplay -c", prints("1048576\n")},
                                       {"/block/md1", prints("/dev/swraid/disk2p1\n")}};
        put("/etc/Kiru/zav/DataVG1", backup("/dev/md1"));
    }

    int ask(int group = 1) {
        zavDevice dev = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, group, 5};
        memset(&info, 0x55, sizeof info);
        const size_t open_before = open_descriptors();
        const int rc = zavgetStateLVMVG(&dev, &info);
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_FALSE(has_children());
        return rc;
    }

    const lvmVG &group() const { return info.dev.lvmvgdev; }

    // The record before anything is read.
    void expect_presets(int number) const {
        EXPECT_EQ(info.type, 18010);
        EXPECT_EQ(group().lvmtype, ZAV_MINDEV_LVM_VG);
        EXPECT_EQ(group().lvmdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, number, 0}));
        EXPECT_EQ(+group().size, 0U);
        EXPECT_EQ(group().pvcount, 0);
        EXPECT_EQ(group().lvcount, 0);
        for (int i = 0; i < 9; ++i)
            expect_preset_pv(i, number);
        for (const lvmLV &volume : group().lvdev)
            expect_preset_lv(volume, number);
    }

    void expect_preset_pv(int index, int number) const {
        const lvmPV &volume = group().pvdev[index];
        EXPECT_EQ(volume.lvmtype, ZAV_MINDEV_LVM_PV);
        EXPECT_EQ(volume.lvmdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 0, number}));
        EXPECT_EQ(+volume.size, 0U);
        EXPECT_EQ(volume.vgdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, number, 0}));
        EXPECT_EQ(volume.dev, (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 0, 0}));
    }

    static void expect_preset_lv(const lvmLV &volume, int number) {
        EXPECT_EQ(volume.lvmtype, ZAV_MINDEV_LVM_LV);
        EXPECT_EQ(volume.lvmdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 0, number}));
        EXPECT_EQ(+volume.size, 0U);
        EXPECT_EQ(volume.usage, 0.0F);
        EXPECT_EQ(volume.vgdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, number, 0}));
    }

    // Its devices cannot be found: the lock is given up once for each and once more.
    void expect_unmapped(const std::string &text) {
        EXPECT_EQ(ask(), ZAV_RC_ERR);
        ASSERT_FALSE(record().log.empty());
        EXPECT_EQ(record().log[0], row(kIdent, 4, text));
        EXPECT_EQ(semaphore_value(kKey), 2);
        EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
        EXPECT_EQ(+group().size, 2U);
        EXPECT_EQ(group().pvdev[0].lvmdev.disk, 1);
        EXPECT_EQ(+group().pvdev[0].size, 3U);
        EXPECT_EQ(group().pvdev[0].dev, (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 0, 0}));
    }

    void expect_failure(int rc, const std::string &log, int commands) {
        EXPECT_EQ(ask(), rc);
        if (log.empty())
            EXPECT_TRUE(record().log.empty());
        else
            EXPECT_EQ(record().log, std::vector{row(kIdent, 4, log)});
        EXPECT_EQ(record().commands.size(), static_cast<size_t>(commands));
        EXPECT_EQ(semaphore_value(kKey), 1);
        EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
    }

    zavLVMState info = {};
};

TEST_F(VolumeGroup, IsAskedWithTheseCommands) {
    EXPECT_EQ(ask(), ZAV_RC_OK);
    std::vector<std::string> commands = kCommands;
    commands.push_back(kArrayLink);
    EXPECT_EQ(record().commands, commands);
    EXPECT_TRUE(record().log.empty());
    EXPECT_EQ(semaphore_value(kKey), 1);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
    EXPECT_EQ(+group().size, 2U);
    EXPECT_EQ(group().pvcount, 1);
    EXPECT_EQ(group().lvcount, 0);
    EXPECT_EQ(group().pvdev[0].dev, (zavDevice{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1}));
    EXPECT_EQ(group().pvdev[0].lvmdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 1, 1}));
    EXPECT_EQ(+group().pvdev[0].size, 3U);
    for (int i = 1; i < 9; ++i)
        expect_preset_pv(i, 1);
}

// The tools' real texts, cut and searched by the real shell.
TEST_F(VolumeGroup, IsReadFromWhatTheToolsPrint) {
    record().shell.reset();
    const std::string captures = "captures/lvm-commands/";
    put("/scratch/vgs", harness::data(captures + "vgs.txt"));
    put("/scratch/vgdisplay", harness::data(captures + "vgdisplay-DataVG2.txt"));
    put("/scratch/vgdisplay-c", harness::data(captures + "vgdisplay-c-DataVG2.txt"));
    put("/scratch/backup", harness::data(captures + "vgcfgbackup-file-DataVG2.txt"));
    script("/usr/sbin/vgs", "cat /scratch/vgs\n");
    script("/usr/sbin/vgdisplay",
           "[ \"$1\" = -c ] && cat /scratch/vgdisplay-c || cat /scratch/vgdisplay\n");
    script("/usr/sbin/vgcfgbackup", "cp /scratch/backup \"$2\"\n");
    script("/usr/sbin/udevinfo", "case $4 in /block/md0) echo swraid/disk1p1;; /block/sdb/sdb3) "
                                 "echo disk/by-id/x sata/disk1p3;; esac\n");
    for (const char *tool : {"lvs", "pvs", "lvdisplay", "pvdisplay"})
        script(std::string("/usr/sbin/") + tool, "");
    put("/dev/DataVG2/LogVol1", "");
    put("/dev/DataVG2/LogVol2", "");
    testing::internal::CaptureStdout();
    EXPECT_EQ(ask(2), ZAV_RC_ERR) << "sdb3 has neither 1 nor 2 and counts as a whole disk";
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
    ASSERT_EQ(record().log.size(), 2U);
    EXPECT_EQ(record().log[0], row(kIdent, 4, "[7] udev path not found! [/dev/sdb3]"));
    EXPECT_EQ(record().log[1].ident, "semaphore_v") << "the second release";
    EXPECT_EQ(group().pvcount, 2);
    EXPECT_EQ(group().lvcount, 2);
    EXPECT_EQ(+group().size, 1U);
    EXPECT_EQ(group().pvdev[0].dev, (zavDevice{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 1, 1}));
    EXPECT_EQ(group().lvdev[1].lvmdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 2, 2}));
    EXPECT_EQ(get("/etc/Kiru/zav/.vgs"), harness::data(captures + "vgs.txt"));
    EXPECT_EQ(get("/etc/Kiru/zav/.vgdisplay.DataVG2"), get("/scratch/vgdisplay"));
    EXPECT_EQ(get("/etc/Kiru/zav/DataVG2"), get("/scratch/backup"));
}

TEST_F(VolumeGroup, ThatIsNotListedDoesNotExist) {
    record().shell->first(kListed, exits(1));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_NOT_EXIST);
    expect_presets(1);
    EXPECT_EQ(record().commands.size(), 2U);
    EXPECT_TRUE(record().log.empty());
    EXPECT_EQ(semaphore_value(kKey), 1);
}

TEST_F(VolumeGroup, IsFoundByASubstringOfTheList) {
    record().shell.reset();
    script("/usr/sbin/vgs", "echo '  DataVG12   1   0   0 wz--n- 4.00m 0'; [ -z \"$1\" ]\n");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_FAILED);
}

TEST_F(VolumeGroup, ThatDoesNotAnswerHasFailed) {
    record().shell->first("/usr/sbin/vgs DataVG1", exits(5));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_FAILED);
    expect_presets(1);
    EXPECT_EQ(record().commands.size(), 3U);
    EXPECT_TRUE(record().log.empty());
    EXPECT_EQ(semaphore_value(kKey), 1);
}

TEST_F(VolumeGroup, ZeroIsTheSystemGroup) {
    record().shell->first("grep", exits(1));
    EXPECT_EQ(ask(0), ZAV_RC_OK);
    expect_presets(0);
    EXPECT_EQ(record().commands[1], "cat /etc/Kiru/zav/.vgs | grep PrimaryOSVG &>/dev/null");
}

TEST_F(VolumeGroup, MinusOneIsRefused) {
    EXPECT_EQ(ask(-1), ZAV_RC_ERR_EINVAL);
    expect_presets(-1);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
    EXPECT_TRUE(record().commands.empty());
    EXPECT_EQ(record().log,
              std::vector{row(kIdent, 4,
                              "[1] Problem with getting VGName from zavMapVGToStr(). vgnum: -1")});
    EXPECT_EQ(semaphore_value(kKey), 1);
}

TEST_F(VolumeGroup, NullsAreRefused) {
    zavDevice dev = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 1, 0};
    EXPECT_EQ(zavgetStateLVMVG(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavgetStateLVMVG(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(semaphore_value(kKey), -1);
}

TEST_F(VolumeGroup, WithoutSemaphoreIsAnError) {
    record().semget_fails = true;
    EXPECT_EQ(ask(), ZAV_RC_ERR);
    EXPECT_EQ(info.type, 0x55555555);
    EXPECT_TRUE(record().commands.empty());
    ASSERT_EQ(record().log.size(), 1U) << "nothing beyond what semaphore_get tells";
    EXPECT_EQ(record().log[0].ident, "semaphore_get");
}

TEST_F(VolumeGroup, WhoseSemaphoreCannotBeTakenIsAnError) {
    record().semop_fails = [](short operation) { return operation < 0; };
    EXPECT_EQ(ask(), ZAV_RC_ERR);
    EXPECT_EQ(info.type, 0x55555555);
    EXPECT_TRUE(record().commands.empty());
    ASSERT_EQ(record().log.size(), 2U);
    EXPECT_NE(record().log[0].text.find("key[0x6911]"), std::string::npos) << record().log[0];
    EXPECT_EQ(record().log[1], row(kIdent, 1, "[3] semaphore_p [26897] failed!!"));
    EXPECT_EQ(semaphore_value(kKey), 1);
}

TEST_F(VolumeGroup, WhoseSemaphoreCannotBeReleasedIsAnErrorWithACompleteRecord) {
    record().semop_fails = [](short operation) { return operation > 0; };
    EXPECT_EQ(ask(), ZAV_RC_ERR);
    EXPECT_EQ(+group().pvdev[0].size, 3U);
    ASSERT_EQ(record().log.size(), 2U);
    EXPECT_NE(record().log[0].text.find("key[0x1]"), std::string::npos) << record().log[0];
    EXPECT_EQ(record().log[1], row(kIdent, 1, "[3] semaphore_v [26897] failed!!"));
}

TEST_F(VolumeGroup, CountPipesThatCannotBeOpenedAreTold) {
    record().shell->first("Cur PV", no_start());
    expect_failure(ZAV_RC_ERR_ESTRPIPE, "[3] popen failed. [" + kCommands[4] + "]", 5);
    expect_presets(1);
}

TEST_F(VolumeGroup, SecondCountPipeThatCannotBeOpenedIsTold) {
    record().shell->first("Cur LV", no_start());
    expect_failure(ZAV_RC_ERR_ESTRPIPE, "[4] popen failed. [" + kCommands[5] + "]", 6);
    EXPECT_EQ(group().pvcount, 1);
}

TEST_F(VolumeGroup, SizePipeThatCannotBeOpenedIsTold) {
    record().shell->first("-f 12", no_start());
    expect_failure(ZAV_RC_ERR, "[5] popen failed. [" + kCommands[6] + "]", 7);
    EXPECT_EQ(group().pvcount, 1);
    EXPECT_EQ(+group().size, 0U);
}

TEST_F(VolumeGroup, PipesWithoutALineAreErrorsWithoutAWord) {
    int commands = 5;
    for (const char *part : {"Cur PV", "Cur LV", "-f 12"}) {
        const ScriptedShell before = *record().shell;
        record().shell->first(part, {});
        record().commands.clear();
        expect_failure(ZAV_RC_ERR, "", commands++);
        record().shell = before;
    }
}

TEST_F(VolumeGroup, BackupThatFailsIsTold) {
    record().shell->first("vgcfgbackup", exits(5));
    expect_failure(ZAV_RC_ERR, "[11] Command failed.[" + kCommands[7] + "]", 8);
    EXPECT_EQ(+group().size, 2U);
    expect_preset_pv(0, 1);
}

TEST_F(VolumeGroup, BackupThatCannotBeOpenedIsTold) {
    remove("/etc/Kiru/zav/DataVG1");
    expect_failure(ZAV_RC_ERR, "[6] fopen failed. [ /etc/Kiru/zav/DataVG1 ]", 8);
    EXPECT_EQ(+group().size, 2U);
}

TEST_F(VolumeGroup, SizesAreKilobytesInGbAndOneMore) {
    const std::pair<const char *, unsigned long long> sizes[] = {
        {"1048576", 2},       {"1048575", 1}, {" 0 ", 1},
        {"5368709120", 5121}, {"none", 1},    {"-1", (static_cast<zavSize>(-1) >> 20) + 1}};
    for (const auto &[text, gb] : sizes) {
        record().shell->first("-f 12", prints(text));
        EXPECT_EQ(ask(), ZAV_RC_OK);
        EXPECT_EQ(+group().size, gb) << text;
    }
}

// ---- Where its physical volumes lie ----

TEST_F(VolumeGroup, OnAPartitionIsFoundByTheDisksDirectory) {
    put("/etc/Kiru/zav/DataVG1", backup("/dev/sdb1"));
    record().shell->first("udevinfo", prints("/dev/sata/disk2p1\n"));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(record().commands.back(),
              "echo /dev/sata/`udevinfo -q symlink -p /block/sdb/sdb1 | sed -n 's/sata\\//\\t/gp' "
              "| awk -F'\\t' '{print $2}' | awk '{print $1}'`");
    EXPECT_EQ(group().pvdev[0].dev, (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 2, 1}));
}

TEST_F(VolumeGroup, OnAWholeDiskIsFoundByItsLinks) {
    put("/etc/Kiru/zav/DataVG1", backup("/dev/sdc"));
    record().shell->first("udevinfo", prints("/dev/sata/disk3\n"));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(record().commands.back(),
              "echo /dev/`udevinfo -q symlink -p /sys/block/sdc | sed -n 's/ /\\n/gp' | "
              "sed '/^$/d' | sed '/^disk/d'`");
    EXPECT_EQ(group().pvdev[0].dev, (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0}));
}

// The pipelines as the real shell and its tools run them.
TEST_F(VolumeGroup, LinksAreCutOutByTheRealShell) {
    record().shell.reset();
    script("/usr/sbin/udevinfo", "case $4 in /block/md1) echo swraid/disk2p1;; "
                                 "/block/sdb/sdb1) echo disk/by-id/a-part1 sata/disk2p1 x;; "
                                 "/sys/block/sdc) echo disk/by-id/a sata/disk3;; esac\n");
    script("/usr/sbin/vgs", "echo DataVG1\n");
    script("/usr/sbin/vgdisplay", "[ \"$1\" = -c ] && echo a:b:c:d:e:f:g:h:i:j:k:1048576:z; "
                                  "echo '  Cur PV                1'; "
                                  "echo '  Cur LV                0'\n");
    script("/usr/sbin/vgcfgbackup", "cp /scratch/backup \"$2\"\n");
    const std::pair<const char *, zavDevice> devices[] = {
        {"/dev/md1", {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1}},
        {"/dev/sdb1", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 2, 1}},
        {"/dev/sdc", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0}}};
    for (const auto &[path, dev] : devices) {
        put("/scratch/backup", backup(path));
        EXPECT_EQ(ask(), ZAV_RC_OK) << path;
        EXPECT_EQ(group().pvdev[0].dev, dev);
        EXPECT_EQ(+group().size, 2U);
        EXPECT_EQ(group().pvcount, 1);
    }
}

TEST_F(VolumeGroup, OnAnotherNodeTakesTheNameItself) {
    put("/etc/Kiru/zav/DataVG1", backup("/dev/swraid/disk3p1"));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(record().commands, kCommands);
    EXPECT_EQ(group().pvdev[0].dev, (zavDevice{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 3, 1}));
}

TEST_F(VolumeGroup, OnANodeWithoutAddressIsTold) {
    put("/etc/Kiru/zav/DataVG1", backup("/dev/hda1"));
    expect_unmapped("[10] zavStrToDev failed. pv: /dev/hda1");
}

TEST_F(VolumeGroup, OnADeviceWithoutLinkIsTold) {
    record().shell->first("/block/md1", prints("/dev/\n"));
    expect_unmapped("[7] udev path not found! [/dev/md1]");
}

TEST_F(VolumeGroup, OnADeviceWithAStrangeLinkIsTold) {
    record().shell->first("/block/md1", prints("/dev/md/MD1 swraid/disk2p1\n"));
    expect_unmapped("[8] zavStrToDev failed. pv: /dev/md/MD1 swraid/disk2p1");
}

TEST_F(VolumeGroup, WhoseLinkPipeCannotBeOpenedIsTold) {
    record().shell->first("/block/md1", no_start());
    expect_unmapped("[7] popen failed. [" + kArrayLink + "]");
    EXPECT_EQ(group().pvcount, 1);
}

TEST_F(VolumeGroup, WhoseLinkPipeIsEmptyLosesItsPhysicalVolumes) {
    record().shell->first("/block/md1", {});
    expect_unmapped("[9] popen failed. [" + kArrayLink + "]");
    EXPECT_EQ(group().pvcount, 0);
}

TEST_F(VolumeGroup, IsReleasedOnceMoreForEachDeviceNotFound) {
    record().shell->first("Cur PV", prints("2\n"));
    record().shell->first("/block/md1", prints("/dev/\n"));
    put("/etc/Kiru/zav/DataVG1", "physical_volumes {\npv0 {\ndevice = \"/dev/md1\"\n}\npv1 "
                                 "{\ndevice = \"/dev/hda1\"\n}\n}\n");
    EXPECT_EQ(ask(), ZAV_RC_ERR);
    EXPECT_EQ(semaphore_value(kKey), 3);
    EXPECT_EQ(group().pvdev[1].lvmdev.disk, 2);
}

TEST_F(VolumeGroup, RunsNothingThatADeviceNameHolds) {
    script("/usr/sbin/udevinfo", "printf '%s\\n' \"$4\" >>/scratch/asked\n");
    record().shell.reset();
    script("/usr/sbin/vgs", "echo DataVG1\n");
    script("/usr/sbin/vgdisplay",
           "echo '  Cur PV                1'; echo ' Cur LV               0'\n");
    script("/usr/sbin/vgcfgbackup", "cp /scratch/backup \"$2\"\n");
    for (const std::string &name :
         {std::string("md1$(touch${IFS}/scratch/ran)"), std::string("md1`touch${IFS}/scratch/ran`"),
          std::string("md1;touch${IFS}/scratch/ran"), std::string("md1'`x`'"),
          std::string("md1\\`touch${IFS}/scratch/ran\\`"), std::string("md1|touch>/scratch/ran"),
          std::string("sd`touch${IFS}/scratch/ran`1"),
          std::string("sd$(touch${IFS}/scratch/ran)")}) {
        put("/scratch/backup", backup("/dev/" + name));
        remove("/scratch/asked");
        EXPECT_EQ(ask(), ZAV_RC_ERR);
        EXPECT_NE(get("/scratch/asked").find(name), std::string::npos) << name;
        EXPECT_FALSE(exists("/scratch/ran")) << name;
    }
}

// ---- Its logical volumes ----

TEST_F(VolumeGroup, MeasuresItsVolumesWhileItReadsThem) {
    record().shell->first("Cur LV", prints(" 1\n"));
    record().file_system.emplace();
    record().file_system->f_blocks = 1000;
    record().file_system->f_bavail = 250;
    put("/dev/DataVG1/LogVol2", "");
    put("/etc/Kiru/zav/DataVG1", backup("/dev/md1", volume(2)));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(group().lvcount, 1);
    EXPECT_EQ(group().lvdev[0].lvmdev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 2, 1}));
    EXPECT_EQ(group().lvdev[0].usage, 75.0F);
    EXPECT_EQ(+group().lvdev[0].size, 2U);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
    std::vector<std::string> commands = kCommands;
    commands.push_back(kArrayLink);
    commands.push_back("ls -la /mnt/internal/data1-2 &> /dev/null");
    commands.insert(commands.end(), kToolChecks.begin(), kToolChecks.end());
    commands.push_back("/usr/sbin/lvs /dev/DataVG1/LogVol2 &> /dev/null");
    commands.push_back("lvdisplay -c /dev/DataVG1/LogVol2 2>/dev/null");
    commands.push_back("ls -la /mnt/internal/data1-2 &> /dev/null");
    EXPECT_EQ(record().commands, commands);
    for (int i = 1; i < 6; ++i)
        expect_preset_lv(group().lvdev[i], 1);
}

TEST_F(VolumeGroup, WithAnInactiveVolumeIsMarkedSo) {
    record().shell->first("Cur LV", prints(" 2\n"));
    put("/dev/DataVG1/LogVol1", "");
    put("/etc/Kiru/zav/DataVG1", backup("/dev/md1", volume(1) + volume(2)));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL | ZAV_LVM_INACTIVE);
    EXPECT_EQ(group().lvdev[0].usage, 0.0F) << "a volume that cannot be measured";
}

TEST_F(VolumeGroup, TakesNoOtherStateFromItsVolumes) {
    record().shell->first("Cur LV", prints(" 2\n"));
    record().shell->first("NOT available", exits(1));
    record().shell->first("/usr/sbin/lvs /dev/DataVG1/LogVol1", exits(5));
    put("/dev/DataVG1/LogVol1", "");
    put("/etc/Kiru/zav/DataVG1", backup("/dev/md1", volume(1) + volume(2)));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_LVM_NORMAL);
}

TEST_F(VolumeGroup, HoldsItsLockUntilTheEnd) {
    record().shell->first("Cur LV", prints(" 1\n"));
    put("/etc/Kiru/zav/DataVG1", backup("/dev/md1", volume(1)));
    int during = -1;
    record().during_sleep = [&](size_t) { during = semaphore_value(kKey); };
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(during, 0);
    EXPECT_EQ(semaphore_value(kKey), 1);
}

TEST_F(VolumeGroup, WithMoreVolumesThanTheTablesHoldStaysInside) {
    record().shell->first("Cur PV", prints("2147483647\n"));
    record().shell->first("Cur LV", prints("2147483647\n"));
    std::string text = "physical_volumes {\n";
    for (int i = 0; i < 12; ++i)
        text += "pv" + std::to_string(i) + " {\ndevice = \"/dev/md1\"\n}\n";
    text += "}\nlogical_volumes {\n";
    for (int i = 1; i < 9; ++i)
        text += volume(i);
    put("/etc/Kiru/zav/DataVG1", text);
    for (int i = 1; i < 9; ++i)
        put("/dev/DataVG1/LogVol" + std::to_string(i), "");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(group().pvdev[8].lvmdev.disk, 9);
    EXPECT_EQ(group().lvdev[5].lvmdev.disk, 6);
}

} // namespace
