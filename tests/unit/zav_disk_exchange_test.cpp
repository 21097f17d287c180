// Taking a disk out of service and bringing another in.
#include "harness.h"

#include <climits>
#include <filesystem>

namespace {

using harness::exits;
using harness::no_start;
using harness::prints;
using harness::record;
using harness::row;
using harness::ScriptedShell;
using Steps = std::vector<std::string>;

zavDevice disk_address(int slot) {
    return {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0};
}

std::string node(int slot) {
    return "/dev/sata/disk" + std::to_string(slot);
}
std::string health(int slot) {
    return "smartctl -H -d ata " + node(slot) + " &>/dev/null";
}
std::string check(int slot, int partition) {
    return "/sbin/mdadm --misc --query " + node(slot) + "p" + std::to_string(partition) + " 2>&1";
}
std::string scan(int slot, int partition) {
    return "/sbin/mdadm --query --examine --scan " + node(slot) + "p" + std::to_string(partition) +
           " 2>&1";
}

class Exchange : public harness::Appliance {
  protected:
    Exchange() {
        four_disk_model();
        record().shell = ScriptedShell{};
        for (int host = 0; host < 4; ++host)
            std::filesystem::create_directories("/sys/devices/pci0000:00/0000:00:1f.2/host" +
                                                std::to_string(host));
        put("/proc/scsi/scsi", "untouched");
        for (int slot = 1; slot <= 4; ++slot)
            insert(slot);
    }

    static void insert(int slot) {
        put(node(slot), "");
        put(node(slot) + "p1", "");
    }
    static void pull(int slot) {
        remove(node(slot));
        remove(node(slot) + "p1");
    }

    static std::string written() { return get("/proc/scsi/scsi"); }

    template <class Function>
    static int run(Function function, zavDevice dev) {
        const zavDevice before = dev;
        const size_t open_before = open_descriptors();
        const int rc = function(&dev);
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_FALSE(has_children());
        EXPECT_EQ(dev, before) << "the caller's address stays";
        return rc;
    }

    static void expect_refused(int rc, const std::string &ident, int priority,
                               const std::string &text) {
        EXPECT_EQ(rc, ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(record().log, std::vector{row(ident, priority, "[22] " + text)});
        EXPECT_TRUE(record().steps.empty());
        record().log.clear();
    }
};

// ---- Removing ----

class DiskRemoval : public Exchange {
  protected:
    static int remove_disk(int slot) { return run(zavDiskHotRemove, disk_address(slot)); }
};

TEST_F(DiskRemoval, ChecksTheSourceTakesTheMembersOutAndDetaches) {
    put(node(1) + "p15", "");
    record().shell->first(scan(1, 1), prints("ARRAY /dev/md0 level=raid1\n"));
    EXPECT_EQ(remove_disk(3), ZAV_RC_OK);
    EXPECT_EQ(record().steps,
              (Steps{health(1), check(1, 1), check(1, 15), scan(1, 15), scan(1, 1),
                     "/sbin/mdadm --detail /dev/md0 | grep \"faulty spare\" 2>&1", "sleep 5"}));
    EXPECT_EQ(written(), "scsi remove-single-device 2 0 0 0");
    EXPECT_TRUE(record().log.empty());
}

TEST_F(DiskRemoval, WithItsNodesFailsItsMembers) {
    record().shell->first(scan(1, 1), prints("ARRAY /dev/md0 level=raid1\n"));
    EXPECT_EQ(remove_disk(3), ZAV_RC_OK);
    EXPECT_EQ(
        record().steps,
        (Steps{health(1), check(1, 1), scan(1, 1), "/sbin/mdadm /dev/md0 -f /dev/sata/disk3p1 2>&1",
               "sleep 2", "/sbin/mdadm /dev/md0 -r /dev/sata/disk3p1 2>&1", "sleep 1", "sleep 5"}));
}

TEST_F(DiskRemoval, TakesTheFirstOtherHealthyDiskForTheSource) {
    EXPECT_EQ(remove_disk(1), ZAV_RC_OK);
    EXPECT_EQ(record().steps, (Steps{health(1), health(2), check(2, 1), scan(2, 1), "sleep 5"}));
    EXPECT_EQ(written(), "scsi remove-single-device 0 0 0 0");

    record().steps.clear();
    record().shell->first(health(1), exits(8)); // failing
    record().shell->first(health(2), exits(2)); // not readable
    EXPECT_EQ(remove_disk(3), ZAV_RC_OK);
    EXPECT_EQ(record().steps, (Steps{health(1), health(2), health(3), health(4), check(4, 1),
                                     scan(4, 1), "sleep 5"}));
}

TEST_F(DiskRemoval, PassesOverADiskThatCannotBeAsked) {
    record().shell->first(health(1), no_start());
    EXPECT_EQ(remove_disk(3), ZAV_RC_OK);
    EXPECT_EQ(record().steps[1], health(2));
}

TEST_F(DiskRemoval, LooksAtTheModelsDisksOnly) {
    model("SV-2740\n", "raidtype=1;0;2\n");
    int known = 0;
    int slots = 0;
    int count = 0;
    ASSERT_EQ(zavGetModelConfig(&known, &slots, &count), ZAV_RC_OK);
    ASSERT_EQ(count, 2);
    record().shell->first(health(2), exits(8));
    EXPECT_EQ(remove_disk(1), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().steps, (Steps{health(1), health(2)}));
}

TEST_F(DiskRemoval, OfTheLastDiskIsRefusedWithoutAWord) {
    for (const int slot : {1, 2, 4})
        pull(slot);
    EXPECT_EQ(remove_disk(3), ZAV_RC_ERR_EINVAL);
    Steps steps(6, "sleep 10");
    steps.insert(steps.begin() + 4, health(3));
    EXPECT_EQ(record().steps, steps);
    EXPECT_EQ(written(), "untouched");
    for (const auto &line : record().log)
        EXPECT_EQ(line.ident, "getDiskStateSATA");
}

TEST_F(DiskRemoval, OfADiskThatHasVanishedGoesOn) {
    pull(3);
    record().shell->first(scan(1, 1), prints("ARRAY /dev/md0 level=raid1\n"));
    EXPECT_EQ(remove_disk(3), ZAV_RC_OK);
    EXPECT_EQ(record().steps[3], "/sbin/mdadm --detail /dev/md0 | grep \"faulty spare\" 2>&1");
    EXPECT_EQ(written(), "scsi remove-single-device 2 0 0 0");
}

TEST_F(DiskRemoval, NeedsASourceThatCanBeOpened) {
    // Gone between the health check and the opening.
    record().shell.reset();
    script("/usr/bin/smartctl", "rm -f /dev/sata/disk1\n");
    EXPECT_EQ(remove_disk(3), ZAV_RC_ERR);
    remove("/usr/bin/smartctl");
    EXPECT_EQ(record().steps, Steps{health(1)});
    EXPECT_EQ(written(), "untouched");
}

TEST_F(DiskRemoval, OfASourceThatIsNotConsistentIsRefused) {
    put(node(1) + "p2", "");
    record().shell->first(check(1, 2),
                          prints("/dev/sata/disk1p2: device 0 in 4 device mismatch raid1"));
    EXPECT_EQ(remove_disk(3), ZAV_RC_ERR);
    EXPECT_EQ(record().steps, (Steps{health(1), check(1, 1), check(1, 2)}));
    EXPECT_EQ(written(), "untouched");
    EXPECT_TRUE(record().log.empty());
}

TEST_F(DiskRemoval, ReadsTheFirst1023BytesOfTheCheck) {
    record().shell->first(check(1, 1), prints(std::string(1015, ' ') + "mismatch"));
    EXPECT_EQ(remove_disk(3), ZAV_RC_ERR);
    record().shell->first(check(1, 1), prints(std::string(1016, ' ') + "mismatch"));
    EXPECT_EQ(remove_disk(3), ZAV_RC_OK);
}

TEST_F(DiskRemoval, WhereTheCheckCannotBeStartedIs32) {
    record().shell->first(check(1, 1), no_start());
    EXPECT_EQ(remove_disk(3), 32);
    EXPECT_EQ(record().steps, (Steps{health(1), check(1, 1)}));
    EXPECT_EQ(written(), "untouched");
}

TEST_F(DiskRemoval, WhoseMembersStayDoesNotDetach) {
    record().shell->first(scan(1, 1), no_start());
    EXPECT_EQ(remove_disk(3), 32);
    EXPECT_EQ(written(), "untouched");
    EXPECT_EQ(record().steps.back(), scan(1, 1));
}

TEST_F(DiskRemoval, TellsThatItCannotDetach) {
    remove("/sys/devices/pci0000:00");
    EXPECT_EQ(remove_disk(3), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(record().steps.back(), "sleep 5");
}

TEST_F(DiskRemoval, OfASlotTheModelDoesNotHaveIsRefusedWithoutAWord) {
    for (const int slot : {INT_MIN, 0, 5})
        EXPECT_EQ(remove_disk(slot), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().steps.empty());
    EXPECT_TRUE(record().log.empty());
}

TEST_F(DiskRemoval, ChecksItsArgumentInThisOrder) {
    const std::string ident = "zavDiskHotRemove";
    expect_refused(zavDiskHotRemove(nullptr), ident, 1,
                   "Error: argu diskdev is NULL. Return ZAV_RC_ERR_EINVAL.");
    expect_refused(run(zavDiskHotRemove, {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 9, 9}), ident, 1,
                   "Error: diskdev.type(0x2) is not ZAV_DEV_HDD. Return ZAV_RC_ERR_EINVAL");
    expect_refused(run(zavDiskHotRemove, {ZAV_DEV_HDD, 77, 9, 9}), ident, 1,
                   "Error: diskdev->minor_type(77) is not ZAV_MINDEV_HDD_SATA. "
                   "Return ZAV_RC_ERR_EINVAL");
    expect_refused(run(zavDiskHotRemove, {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 9, 7}), ident, 1,
                   "Error: diskdev->part(7) must be 0. Return ZAV_RC_ERR_EINVAL\n");
}

TEST_F(DiskRemoval, NeedsAModel) {
    model("unknown\n", "raidtype=5;0;4\n");
    EXPECT_EQ(zavDiskHotRemove(nullptr), 0x1301) << "the model comes first";
    EXPECT_EQ(zavDiskHotAdd(nullptr), 0x1301);
}

TEST_F(DiskRemoval, NeedsMemory) {
    zavDevice dev = disk_address(3);
    record().calloc_fails = true;
    const int rc = zavDiskHotRemove(&dev);
    record().calloc_fails = false;
    EXPECT_EQ(rc, ZAV_RC_ERR_ENOMEM);
    EXPECT_EQ(record().log,
              std::vector{row("zavDiskHotRemove", 1,
                              "[12] memory allocation failure! Return ZAV_RC_ERR_ENOMEM")});
    EXPECT_TRUE(record().steps.empty());
}

// ---- Adding ----

const std::string kFirstMember = " mdadm --detail /dev/md0 | sed -n \"/active sync/p\" | "
                                 "sed -n '1p' | awk '{print $7}'";

std::string links(const std::string &kernel_name) {
    return "echo /dev/`udevinfo -q symlink -p /sys/block/" + kernel_name +
           " | sed -n 's/ /\\n/gp' | sed '/^$/d' | sed '/^disk/d'`";
}

const Steps kPrepare = {
    "mdadm --zero-superblock /dev/sata/disk3 &>/dev/null",
    "/bin/dd if=/dev/zero of=/dev/sata/disk3 bs=2M count=1 &>/dev/null",
    "sleep 1",
    "/sbin/sfdisk -d /dev/sata/disk1 | sfdisk /dev/sata/disk3 &>/dev/null",
    "sleep 5",
    "echo -ne \"\\x4D\\x10\" | dd of=/dev/sata/disk3 bs=1 seek=440 count=2 &>/dev/null",
};

class DiskAddition : public Exchange {
  protected:
    DiskAddition() {
        record().shell = ScriptedShell{{kFirstMember, prints("/dev/sdb1\n")},
                                       {links("sdb"), prints("/dev/sata/disk1\n")}};
    }

    static int add_disk(int slot = 3) { return run(zavDiskHotAdd, disk_address(slot)); }

    static Steps begun(const Steps &more = {}) {
        Steps steps = {kFirstMember, links("sdb")};
        steps.insert(steps.end(), more.begin(), more.end());
        return steps;
    }

    static void expect_no_source(size_t steps) {
        EXPECT_EQ(add_disk(), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(record().steps.size(), steps);
        record().steps.clear();
    }
};

TEST_F(DiskAddition, PreparesTheDiskLikeAHealthyOneAndAddsItsPartitions) {
    record().shell->first(scan(1, 1), prints("nothing\n"));
    EXPECT_EQ(add_disk(), ZAV_RC_OK);
    Steps steps = begun(kPrepare);
    steps.push_back(scan(1, 1));
    EXPECT_EQ(record().steps, steps);
    EXPECT_EQ(written(), "untouched") << "the kernel knows the disk already";
    EXPECT_TRUE(record().log.empty());
}

TEST_F(DiskAddition, AttachesADiskThatTheKernelDoesNotKnow) {
    pull(3);
    EXPECT_EQ(add_disk(), ZAV_RC_OK);
    EXPECT_EQ(written(), "scsi add-single-device 2 0 0 0");
    Steps steps = begun({"sleep 10"});
    steps.insert(steps.end(), kPrepare.begin(), kPrepare.end());
    EXPECT_EQ(record().steps, steps);
}

TEST_F(DiskAddition, ThatCannotAttachStopsThere) {
    pull(3);
    remove("/sys/devices/pci0000:00");
    EXPECT_EQ(add_disk(), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(record().steps, begun());
}

TEST_F(DiskAddition, DoesNotLookAtTheExitStatusesOfItsTools) {
    for (const char *part : {"--zero", "/bin/dd", "sfdisk", "seek=440"})
        record().shell->first(part, exits(1));
    EXPECT_EQ(add_disk(), ZAV_RC_OK);
    EXPECT_EQ(record().steps.size(), 2 + kPrepare.size() + 3) << "none of them ends it";
}

TEST_F(DiskAddition, GivesTheCodeOfTheArrays) {
    record().shell->first(scan(1, 1), no_start());
    EXPECT_EQ(add_disk(), 32);
}

TEST_F(DiskAddition, OfTheOnlyActiveMemberIsRefused) {
    EXPECT_EQ(add_disk(1), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().steps, begun());
    EXPECT_TRUE(record().log.empty());
}

TEST_F(DiskAddition, NeedsASourceThatCanBeOpened) {
    pull(1);
    EXPECT_EQ(add_disk(), ZAV_RC_ERR);
    EXPECT_EQ(record().steps, begun());
}

TEST_F(DiskAddition, WithoutAnActiveMemberIsRefused) {
    for (const char *line : {"", "\n", "set-A\n", "-\n", "/dev/\n", "/dev/x\n", "x/dev/sdb1\n"}) {
        record().shell->first(kFirstMember, prints(line));
        expect_no_source(1);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(DiskAddition, WithoutPipesIsTold) {
    record().shell->first(links("sdb"), no_start());
    expect_no_source(2);
    record().shell->first(kFirstMember, no_start());
    expect_no_source(1);
    EXPECT_EQ(record().log,
              (std::vector{row("zavDiskHotAdd", 4, "[0] popen failed. [" + links("sdb") + "]"),
                           row("zavDiskHotAdd", 4, "[0] popen failed. [" + kFirstMember + "]")}));
}

TEST_F(DiskAddition, WithoutLinkIsRefused) {
    for (const char *line : {"/dev/\n", "/dev/sata/disk1 sata/x\n", "/dev/sdb\n"}) {
        record().shell->first(links("sdb"), prints(line));
        expect_no_source(2);
    }
    EXPECT_TRUE(record().log.empty());
    record().shell->first(links("sdb"), prints(""));
    expect_no_source(2);
    EXPECT_EQ(record().log,
              std::vector{row("zavDiskHotAdd", 4, "[0] no popen result [" + links("sdb") + "]")});
}

TEST_F(DiskAddition, FromADiskWithoutANameIsRefused) {
    record().shell->first(links("sdb"), prints("/dev/sas/r8388608disk1\n")); // a negative number
    expect_no_source(2);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(DiskAddition, DropsTheLastCharacterOfTheMember) {
    record().shell->first(kFirstMember, prints(" /dev/sdaa12 \n"));
    expect_no_source(2);
    record().shell->first(links("sdaa1"), prints("/dev/sata/disk2\n"));
    EXPECT_EQ(add_disk(), ZAV_RC_OK);
    EXPECT_EQ(record().steps[5],
              "/sbin/sfdisk -d /dev/sata/disk2 | sfdisk /dev/sata/disk3 &>/dev/null");
}

// What today's and the appliance's mdadm print, cut by the real tools.
TEST_F(DiskAddition, FindsTheSourceInWhatTheToolsPrint) {
    record().shell.reset();
    put("/scratch/detail", harness::data("captures/degraded-3disk/mdadm-detail-md0.txt"));
    script("/sbin/mdadm", "[ \"$1\" = --detail ] && cat /scratch/detail\n");
    script("/usr/sbin/udevinfo",
           "[ \"$4\" = /sys/block/sda ] && echo disk/by-id/ata-x disk/by-path/y sata/disk1\n");
    script("/usr/sbin/sfdisk", "echo \"$@\" >>/scratch/sfdisk; cat >/dev/null\n");
    put(node(3), std::string(4096, '\xEE'));
    EXPECT_EQ(add_disk(), ZAV_RC_OK);
    EXPECT_EQ(get("/scratch/sfdisk").size(),
              std::string("-d /dev/sata/disk1\n/dev/sata/disk3\n").size());
    const std::string content = get(node(3));
    ASSERT_GE(content.size(), 442U);
    EXPECT_EQ(content.substr(440, 2), "\x4D\x10");
    remove("/usr/sbin/sfdisk");
}

TEST_F(DiskAddition, RunsNothingThatAMembersNameHolds) {
    record().shell.reset();
    script("/usr/sbin/udevinfo", "printf '%s' \"$4\" >/scratch/asked\n");
    for (const std::string name : {"sd$(touch${IFS}/scratch/r)1", "sd`touch${IFS}/scratch/r`1",
                                   "sd;touch${IFS}/scratch/r;1", "sd'\"\\`1"}) {
        put("/scratch/detail", "0 8 1 0 active sync /dev/" + name + "\n");
        script("/sbin/mdadm", "cat /scratch/detail\n");
        EXPECT_EQ(add_disk(), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(get("/scratch/asked"), "/sys/block/" + name.substr(0, name.size() - 1));
        EXPECT_FALSE(exists("/scratch/r")) << name;
    }
}

TEST_F(DiskAddition, ChecksItsArgumentInThisOrder) {
    const std::string ident = "zavDiskHotAdd";
    expect_refused(zavDiskHotAdd(nullptr), ident, 1,
                   "Error: argu diskdev is NULL. Return ZAV_RC_ERR_EINVAL.");
    for (const int slot : {INT_MIN, 0, 5})
        expect_refused(run(zavDiskHotAdd, {9, 9, slot, 9}), ident, 4,
                       "diskdev->disk(" + std::to_string(slot) + ") is not acceptable.");
    expect_refused(run(zavDiskHotAdd, {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 3, 9}), ident, 1,
                   "Error: diskdev.type(0x2) is not ZAV_DEV_HDD. Return ZAV_RC_ERR_EINVAL");
    expect_refused(run(zavDiskHotAdd, {ZAV_DEV_HDD, 77, 3, 9}), ident, 1,
                   "Error: diskdev->minor_type(0x4d) is not ZAV_MINDEV_HDD_SATA. "
                   "Return ZAV_RC_ERR_EINVAL");
    expect_refused(run(zavDiskHotAdd, {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 7}), ident, 1,
                   "Error: diskdev->part(7) must be 0. Return ZAV_RC_ERR_EINVAL");
}

TEST_F(DiskAddition, NeedsMemory) {
    zavDevice dev = disk_address(3);
    record().calloc_fails = true;
    const int rc = zavDiskHotAdd(&dev);
    record().calloc_fails = false;
    EXPECT_EQ(rc, ZAV_RC_ERR_ENOMEM);
    EXPECT_EQ(record().log,
              std::vector{row("zavDiskHotAdd", 1,
                              "[22] Memory allocation failed. Return ZAV_RC_ERR_ENOMEM")});
    EXPECT_TRUE(record().steps.empty());
}

} // namespace
