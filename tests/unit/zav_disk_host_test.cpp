// Attaching and detaching the disks of the SATA controller.
#include "storage/zav_disk_pipeline.h"

#include "harness.h"

#include <climits>
#include <filesystem>
#include <unistd.h>

namespace {

using harness::record;
using harness::row;
using harness::ScriptedShell;

constexpr const char *kController = "/sys/devices/pci0000:00/0000:00:1f.2/";
constexpr zavDevice kDisk1 = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 1, 0};
constexpr zavDevice kDisk3 = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0};

// ---- The pipelines ----

const std::string kHosts = "`ls -d /sys/devices/pci0000:00/0000:00:1f.2/host? | "
                           "sed -n 's/host/ /pg' | awk '{print $2}' | ";
const char *const kDetach[] = {"sed -e '2,6d'", "sed -e '1d' -e '3,6d'", "sed -e '1,2d' -e '4,6d'",
                               "sed -e '1,3d' -e '5,6d'"};
const char *const kAttach[] = {"sed -e '2,6d'", "sed -e '1d' -e '3,6d'", "sed -e '1,2d' -e'4,6d'",
                               "sed -e '1,3d' -e'5,6d'"};

std::string detach_line(int slot) {
    return "echo \"scsi remove-single-device " + kHosts + kDetach[slot - 1] +
           "` 0 0 0\" > /proc/scsi/scsi 2>/dev/null";
}

std::string attach_line(int slot) {
    return "echo \"scsi add-single-device " + kHosts + kAttach[slot - 1] +
           "` 0 0 0\" > /proc/scsi/scsi";
}

std::string pipeline(zav::HostAction action, int slot) {
    char text[zav::kLongestPipeline] = "untouched";
    return zav::host_pipeline(text, action, slot) ? text : std::string("refused ") + text;
}

TEST(HostPipeline, OfDetachingSlot1IsThis) {
    EXPECT_EQ(pipeline(zav::HostAction::kDetach, 1),
              "echo \"scsi remove-single-device `ls -d /sys/devices/pci0000:00/0000:00:1f.2/host? "
              "| sed -n 's/host/ /pg' | awk '{print $2}' | sed -e '2,6d'` 0 0 0\" > "
              "/proc/scsi/scsi 2>/dev/null");
}

TEST(HostPipeline, HasAFilterForEachSlot) {
    for (int slot = 1; slot <= 4; ++slot) {
        EXPECT_EQ(pipeline(zav::HostAction::kDetach, slot), detach_line(slot));
        EXPECT_EQ(pipeline(zav::HostAction::kAttach, slot), attach_line(slot));
    }
}

TEST(HostPipeline, IsThereForFourSlotsOnly) {
    for (const int slot : {INT_MIN, -1, 0, 5, INT_MAX})
        EXPECT_EQ(pipeline(zav::HostAction::kDetach, slot), "refused untouched");
}

// ---- Through the hosts' directory ----

class SataHost : public harness::Appliance {
  protected:
    SataHost() {
        four_disk_model();
        put("/proc/scsi/scsi", "Attached devices:\n");
    }

    static void host(const std::string &name) {
        std::filesystem::create_directories(kController + name);
    }
    static void hosts(std::initializer_list<int> numbers) {
        for (const int number : numbers)
            host("host" + std::to_string(number));
    }

    static int command(int cmd, zavDevice dev) {
        const size_t open_before = open_descriptors();
        const int rc = zavHotCmd(cmd, &dev);
        EXPECT_EQ(open_descriptors(), open_before);
        return rc;
    }

    static std::string written() { return get("/proc/scsi/scsi"); }

    static void expect_refused(int cmd, zavDevice *dev, const std::string &text) {
        record().log.clear();
        EXPECT_EQ(zavHotCmd(cmd, dev), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(record().log, std::vector{row("zavHotCmd", 1, "[22] " + text)});
        EXPECT_EQ(written(), "Attached devices:\n");
    }
};

TEST_F(SataHost, OfASlotIsTheOneAtItsPlace) {
    hosts({2, 0, 1, 3});
    EXPECT_EQ(command(1, kDisk1), ZAV_RC_OK);
    EXPECT_EQ(written(), "scsi add-single-device 0 0 0 0");
    EXPECT_EQ(command(2, kDisk3), ZAV_RC_OK);
    EXPECT_EQ(written(), "scsi remove-single-device 2 0 0 0");
    EXPECT_EQ(command(2, {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 4, 7}), ZAV_RC_OK);
    EXPECT_EQ(written(), "scsi remove-single-device 3 0 0 0");
    EXPECT_TRUE(record().log.empty());
    EXPECT_TRUE(record().commands.empty());
    EXPECT_TRUE(record().sleeps.empty());
}

TEST_F(SataHost, NumbersAreOrderedAsNumbers) {
    hosts({10, 9, 11, 2});
    EXPECT_EQ(command(2, kDisk3), ZAV_RC_OK);
    EXPECT_EQ(written(), "scsi remove-single-device 10 0 0 0");
}

TEST_F(SataHost, OtherEntriesAreNoHosts) {
    hosts({4, 5, 6});
    for (const char *name : {"ata1", "hos", "host", "hostx", "power", "ghost1"})
        host(name);
    EXPECT_EQ(command(1, kDisk1), ZAV_RC_OK);
    EXPECT_EQ(written(), "scsi add-single-device 4 0 0 0");
}

TEST_F(SataHost, MoreThanSixStayInsideTheTable) {
    hosts({0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16, 17, 18, 19});
    EXPECT_EQ(command(1, kDisk1), ZAV_RC_OK);
    EXPECT_EQ(written().substr(0, 23), "scsi add-single-device ");
}

TEST_F(SataHost, OfASlotBeyondTheHostsIsRefused) {
    hosts({0, 1});
    EXPECT_EQ(command(2, kDisk3), ZAV_RC_ERR_ENODEV);
    EXPECT_EQ(written(), "Attached devices:\n");
    EXPECT_EQ(record().log, std::vector{row("zavHotCmd", 1, "[19] dev->disk 3 has no host")});
}

TEST_F(SataHost, WithoutControllerIsNotThere) {
    EXPECT_EQ(command(2, kDisk3), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(written(), "Attached devices:\n");
    EXPECT_EQ(record().log, std::vector{row("zavHotCmd", 1,
                                            "[2] No entry - /sys/devices/pci0000:00/0000:00:1f.2. "
                                            "Return ZAV_RC_ERR_ENOENT.")});
}

TEST_F(SataHost, CommandChecksItsArgumentsInThisOrder) {
    hosts({0, 1, 2, 3});
    const std::string device = "Invaild Device: just support ZAV_DEV_HDD/ZAV_MINDEV_HDD_SATA.";
    expect_refused(9, nullptr, device);
    zavDevice raid = {ZAV_DEV_RAID, ZAV_MINDEV_HDD_SATA, 0, 0};
    expect_refused(9, &raid, device);
    zavDevice sas = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 0, 0};
    expect_refused(9, &sas, device);
    for (const int cmd : {-1, 0, 3, 9}) {
        zavDevice slot0 = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 0, 0};
        expect_refused(cmd, &slot0, "Unknown Command");
    }
    for (const int slot : {INT_MIN, 0, 5, INT_MAX}) {
        zavDevice dev = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0};
        expect_refused(1, &dev, "dev->disk must between 1 and 4");
    }
}

TEST_F(SataHost, CommandThatCannotBeWrittenIsOnlyLogged) {
    hosts({0});
    remove("/proc/scsi/scsi");
    std::filesystem::create_directories("/proc/scsi/scsi");
    EXPECT_EQ(command(1, kDisk1), ZAV_RC_OK);
    EXPECT_EQ(record().log,
              std::vector{row("zavScsiCmd", 1, "[9984] open /proc/scsi/scsi failed")});
    remove("/proc/scsi/scsi");
    std::filesystem::create_symlink("/dev/full", "/proc/scsi/scsi");
    record().log.clear();
    EXPECT_EQ(command(1, kDisk1), ZAV_RC_OK);
    EXPECT_EQ(record().log,
              std::vector{row("zavScsiCmd", 1, "[9984] write /proc/scsi/scsi failed")});
    remove("/proc/scsi/scsi");
}

TEST_F(SataHost, LinesCarryTheirFourNumbers) {
    zavScsiCmd(1, 11, 2, 3, 4);
    EXPECT_EQ(written(), "scsi add-single-device 11 2 3 4");
    zavScsiCmd(2, -1, 0, INT_MAX, 1);
    EXPECT_EQ(written(), "scsi remove-single-device -1 0 2147483647 1");
    EXPECT_TRUE(record().log.empty());
    const size_t open_before = open_descriptors();
    zavScsiCmd(3, 1, 0, 0, 0);
    EXPECT_EQ(open_descriptors(), open_before);
    EXPECT_EQ(record().log, std::vector{row("zavScsiCmd", 1, "[22] Unknown Command")});
}

// ---- Through the pipelines ----

TEST_F(SataHost, IsDetachedByItsPipeline) {
    record().shell = ScriptedShell{};
    for (int slot = 1; slot <= 4; ++slot) {
        record().steps.clear();
        record().log.clear();
        zavDevice dev = {9, 9, slot, 9}; // neither type nor model matters
        zavSATARemove(&dev);
        EXPECT_EQ(record().steps, (std::vector<std::string>{detach_line(slot), "sleep 10"}));
        EXPECT_EQ(record().log,
                  std::vector{row("zavSATARemove", 1,
                                  "[0] [zavSATARemove Disk " + std::to_string(slot) + "]\n")});
    }
}

TEST_F(SataHost, OfNoSlotIsLoggedAndLeftAlone) {
    for (const int slot : {0, 5, -1}) {
        zavDevice dev = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0};
        zavSATARemove(&dev);
    }
    zavSATARemove(nullptr);
    EXPECT_EQ(record().log.size(), 3U);
    EXPECT_TRUE(record().steps.empty());
}

TEST_F(SataHost, OfTheSlotIsFoundByTheRealShell) {
    hosts({0, 1, 2, 3, 4, 5, 10});
    for (int slot = 1; slot <= 4; ++slot) {
        zavDevice dev = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0};
        zavSATARemove(&dev);
        EXPECT_EQ(written(), "scsi remove-single-device " + std::to_string(slot - 1) + " 0 0 0\n");
        put("/dev/sata/disk" + std::to_string(slot), std::string(512, '\0'));
        EXPECT_EQ(zavSATARescan(&dev), 0);
        EXPECT_EQ(written(), "scsi add-single-device " + std::to_string(slot - 1) + " 0 0 0\n");
    }
}

// ---- Attaching with a look at the mark ----

class Rescan : public harness::Appliance {
  protected:
    Rescan() {
        four_disk_model();
        record().shell = ScriptedShell{};
        disk("\x01\x02\x03\x04");
    }

    static void disk(const std::string &signature, size_t size = 512) {
        std::string content(size, '\xEE');
        content.replace(std::min<size_t>(440, size), signature.size(), signature);
        put("/dev/sata/disk3", content.substr(0, std::max(size, 440 + signature.size())));
    }

    static int rescan(zavDevice dev = kDisk3) {
        const size_t open_before = open_descriptors();
        const int rc = zavSATARescan(&dev);
        EXPECT_EQ(open_descriptors(), open_before);
        return rc;
    }

    static harness::LogRow told(const std::string &text) {
        return row("zavSATARescan", 1, "[0] " + text);
    }
    static harness::LogRow removed() {
        return row("zavSATARemove", 1, "[0] [zavSATARemove Disk 3]\n");
    }
    static std::vector<std::string> attached_only() { return {attach_line(3), "sleep 20"}; }
    static std::vector<std::string> attached_and_detached() {
        return {attach_line(3), "sleep 20", detach_line(3), "sleep 10"};
    }
};

TEST_F(Rescan, TakesADiskWithoutMark) {
    EXPECT_EQ(rescan(), 0);
    EXPECT_EQ(record().steps, attached_only());
    EXPECT_TRUE(record().log.empty());
    for (const char *signature : {"\x10\x4D\x4D\x10", "\x4D\x11zz", "\x4C\x10zz"}) {
        disk(signature);
        EXPECT_EQ(rescan(), 0);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Rescan, DetachesADiskWithTheMarkAndTellsTheLogOnly) {
    disk("\x4D\x10\xCD\xAB");
    EXPECT_EQ(rescan(), 0);
    EXPECT_EQ(record().steps, attached_and_detached());
    EXPECT_EQ(
        record().log,
        (std::vector{told("[Initialized by HBQ-2XXX /dev/sata/disk3 0xABCD104D]\n"), removed()}));
}

TEST_F(Rescan, AttachesEverySlotByItsPipeline) {
    for (int slot = 1; slot <= 4; ++slot) {
        put("/dev/sata/disk" + std::to_string(slot), std::string(512, '\0'));
        record().steps.clear();
        EXPECT_EQ(rescan({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0}), 0);
        EXPECT_EQ(record().steps, (std::vector<std::string>{attach_line(slot), "sleep 20"}));
    }
}

TEST_F(Rescan, DetachesADiskThatTook30Seconds) {
    record().times = {1000, 1029};
    EXPECT_EQ(rescan(), 0);
    EXPECT_EQ(record().steps, attached_only());
    record().steps.clear();
    record().times = {1000, 1030};
    EXPECT_EQ(rescan(), 0);
    EXPECT_EQ(record().steps, attached_and_detached());
    EXPECT_EQ(record().log, (std::vector{told("[Timeout /dev/sata/disk3]\n"), removed()}));
}

TEST_F(Rescan, WithoutClockTellsTheNegatedError) {
    record().times = {-1};
    EXPECT_EQ(rescan(), -EFAULT);
    EXPECT_TRUE(record().steps.empty());
    record().times = {1000, -1};
    EXPECT_EQ(rescan(), -EFAULT);
    EXPECT_EQ(record().steps, std::vector{attach_line(3)});
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Rescan, WithoutNodeTellsTheErrorAndDetaches) {
    remove("/dev/sata/disk3");
    EXPECT_EQ(rescan(), ENOENT);
    EXPECT_EQ(record().steps, attached_and_detached());
    EXPECT_EQ(
        record().log,
        (std::vector{told("[open /dev/sata/disk3 2 No such file or directory]\n"), removed()}));
}

TEST_F(Rescan, OfANodeThatCannotSeekTellsTheErrorAndDetaches) {
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    remove("/dev/sata/disk3");
    std::filesystem::create_symlink("/proc/self/fd/" + std::to_string(ends[0]), "/dev/sata/disk3");
    EXPECT_EQ(rescan(), ESPIPE);
    close(ends[0]);
    close(ends[1]);
    EXPECT_EQ(record().steps, attached_and_detached());
    EXPECT_EQ(record().log, (std::vector{told("[lseek /dev/sata/disk3 29]\n"), removed()}));
}

TEST_F(Rescan, OfANodeThatCannotBeReadDetaches) {
    remove("/dev/sata/disk3");
    std::filesystem::create_directories("/dev/sata/disk3");
    EXPECT_EQ(rescan(), 0);
    EXPECT_EQ(record().steps, attached_and_detached());
    EXPECT_EQ(record().log, (std::vector{told("[read 21]\n"),
                                         told("[Read Failed /dev/sata/disk3]\n"), removed()}));
}

TEST_F(Rescan, OfADiskThatIsTooShortDetaches) {
    put("/dev/sata/disk3", std::string(443, '\0'));
    EXPECT_EQ(rescan(), 0);
    EXPECT_EQ(record().steps, attached_and_detached());
    EXPECT_EQ(record().log, (std::vector{told("[read 0]\n"),
                                         told("[Read Failed /dev/sata/disk3]\n"), removed()}));
}

TEST_F(Rescan, RefusesWhatIsNoSlotWithoutAWord) {
    EXPECT_EQ(zavSATARescan(nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(rescan({ZAV_DEV_RAID, ZAV_MINDEV_HDD_SATA, 3, 0}), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(rescan({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 3, 0}), ZAV_RC_ERR_EINVAL);
    for (const int slot : {0, -1, 5})
        EXPECT_EQ(rescan({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0}), ZAV_RC_ERR_EINVAL);
    model("SV-2740\n", "raidtype=0;0;0\n"); // one slot, or the slots of the model's configuration
    int known = 0;
    int slots = 0;
    int count = 0;
    ASSERT_EQ(zavGetModelConfig(&known, &slots, &count), ZAV_RC_OK);
    EXPECT_EQ(rescan({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slots + 1, 0}), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().steps.empty());
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Rescan, OfAPartitionThatCannotBeIsTold) {
    EXPECT_EQ(rescan({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, -1}), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().log, std::vector{told("[zavDevToStr 22]\n")});
    EXPECT_TRUE(record().steps.empty());
}

TEST_F(Rescan, OnAnUnknownModelGetsItsCode) {
    model("unknown\n", "raidtype=5;0;4\n");
    EXPECT_EQ(rescan(), 0x1301);
    EXPECT_TRUE(record().steps.empty());
}

} // namespace
