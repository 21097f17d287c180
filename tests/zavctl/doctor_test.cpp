#include "core/doctor.h"

#include <cerrno>
#include <gtest/gtest.h>

using namespace zavctl;

namespace {

RunResult exited(int status, std::string output = "") {
    return {RunResult::End::exited, status, std::move(output)};
}

// An appliance on which everything is as it should be.
PlatformFacts sound() {
    PlatformFacts facts;
    facts.model.code = 0x204;
    facts.model.disk_slots = facts.model.disk_count = 4;
    facts.model.data_raid_type = 5;
    facts.model.product_name = "SV-2860";
    facts.model.serial = "AB1234";
    facts.shell_path = "/bin/bash";
    facts.shell_false = exited(1);
    facts.tools = {{"smartctl", "/usr/sbin/smartctl", "disks", "all failed"},
                   {"/sbin/mdadm", "/sbin/mdadm", "arrays", "nothing told"}};
    facts.smartctl_no_device = exited(2);
    facts.examined = "/dev/sata/disk1p1";
    facts.examine = exited(0, "ARRAY /dev/md/MD0 level=raid1 num-devices=4\n");
    facts.raidtype.text = "raidtype=5;0;4\n";
    facts.controller_report.text = "PCI\nR:1:SET:1:4:1234:0\n";
    facts.nvram_bytes = 114;
    facts.sata_nodes = {"disk1", "disk1p1"};
    facts.swraid_nodes = {"disk1p1"};
    facts.sata_hosts = {"host0"};
    facts.locale_known = facts.log_socket = true;
    facts.decimal_point = ".";
    return facts;
}

Severity verdict(const PlatformFacts &facts, const std::string &name) {
    Severity worst = Severity::ok;
    bool seen = false;
    for (const Check &check : platform_checks(facts)) {
        seen = seen || check.name == name;
        if (check.name == name)
            worst = worse(worst, check.severity);
        else
            EXPECT_EQ(check.severity, Severity::ok) << check.name << ": " << check.found;
    }
    EXPECT_TRUE(seen) << name;
    return worst;
}

} // namespace

TEST(Doctor, ASoundApplianceHasNothingToComplainAbout) {
    for (const Check &check : platform_checks(sound())) {
        EXPECT_EQ(check.severity, Severity::ok) << check.name;
        EXPECT_EQ(check.means, "") << check.name;
    }
}

TEST(Doctor, AShellThatHidesFailuresIsCritical) {
    PlatformFacts facts = sound();
    facts.shell_false = exited(0);
    EXPECT_EQ(verdict(facts, "shell"), Severity::critical);
    facts.shell_false = {};
    EXPECT_EQ(verdict(facts, "shell"), Severity::critical);
}

TEST(Doctor, AMissingToolIsCritical) {
    PlatformFacts facts = sound();
    facts.tools[0].found = "";
    EXPECT_EQ(verdict(facts, "smartctl"), Severity::critical);
    facts = sound();
    facts.tools[1].found = "";
    EXPECT_EQ(verdict(facts, "mdadm"), Severity::critical);
}

TEST(Doctor, AToolThatOnlySomeWorkNeedsIsAWarning) {
    PlatformFacts facts = sound();
    facts.tools.push_back({"udevinfo", "", "addresses", "no disk is added", Severity::warning});
    EXPECT_EQ(verdict(facts, "udevinfo"), Severity::warning);
}

TEST(Doctor, GroupsNeedAPlaceForTheirFiles) {
    PlatformFacts facts = sound();
    facts.volume_files_error = EROFS;
    EXPECT_EQ(verdict(facts, "volume-files"), Severity::critical);
}

TEST(Doctor, TheHardwareRaidModelNeedsTheControllersReport) {
    PlatformFacts facts = sound();
    facts.model.code = 0x300;
    facts.controller_report.text = "PCI\nR:1:SET:1:4:1234:0\n";
    EXPECT_EQ(verdict(facts, "raid-report"), Severity::ok);
    facts.controller_report.text = "RBOD#1\n";
    EXPECT_EQ(verdict(facts, "raid-report"), Severity::critical);
    facts.controller_report = {ENOENT, ""};
    EXPECT_EQ(verdict(facts, "raid-report"), Severity::critical);
}

TEST(Doctor, OtherModelsNeedNoControllersReport) {
    PlatformFacts facts = sound();
    facts.controller_report.error = ENOENT;
    for (const Check &check : platform_checks(facts))
        EXPECT_NE(check.name, "raid-report");
}

TEST(Doctor, SmartctlMustTellAMissingDevice) {
    PlatformFacts facts = sound();
    facts.smartctl_no_device = exited(0);
    EXPECT_EQ(verdict(facts, "smartctl-status"), Severity::critical);
    facts.smartctl_no_device = {RunResult::End::timed_out, 0, ""};
    EXPECT_EQ(verdict(facts, "smartctl-status"), Severity::critical);
}

TEST(Doctor, MdadmWithoutLevelWordsIsAWarning) {
    PlatformFacts facts = sound();
    facts.examine = exited(0, "ARRAY /dev/md/MD0 metadata=1.2 UUID=1\n");
    EXPECT_EQ(verdict(facts, "mdadm-level"), Severity::warning);
    facts.examine = exited(1, "");
    EXPECT_EQ(verdict(facts, "mdadm-level"), Severity::warning);
}

TEST(Doctor, AnUnreadableMdstatIsCriticalAnOddArrayAWarning) {
    PlatformFacts facts = sound();
    facts.mdstat.error = ENOENT;
    EXPECT_EQ(verdict(facts, "mdstat"), Severity::critical);
    facts = sound();
    facts.mdstat.text = "md1 : active raid1 a[0]\n      1 blocks [1/1] [U]\n      bitmap: 0/1\n";
    EXPECT_EQ(verdict(facts, "mdstat"), Severity::warning);
}

TEST(Doctor, MissingDeviceNamesAreCritical) {
    PlatformFacts facts = sound();
    facts.sata_nodes.clear();
    EXPECT_EQ(verdict(facts, "disk-nodes"), Severity::critical);
    facts = sound();
    facts.swraid_nodes.clear();
    EXPECT_EQ(verdict(facts, "array-nodes"), Severity::critical);
}

TEST(Doctor, AControllerWithoutHostsIsAWarning) {
    PlatformFacts facts = sound();
    facts.sata_hosts.clear();
    facts.nested_hosts = {"ata1/host0"};
    EXPECT_EQ(verdict(facts, "sata-hosts"), Severity::warning);
    facts.nested_hosts.clear();
    EXPECT_EQ(verdict(facts, "sata-hosts"), Severity::warning);
    facts.sata_controller.error = ENOENT;
    EXPECT_EQ(verdict(facts, "sata-hosts"), Severity::warning);
}

TEST(Doctor, AnUnknownModelIsCritical) {
    PlatformFacts facts = sound();
    facts.model.code = 0;
    facts.model.failure = Failure{0x1301, "", "no known model"};
    bool model = false;
    for (const Check &check : platform_checks(facts))
        model = model || (check.name == "model" && check.severity == Severity::critical);
    EXPECT_TRUE(model);
}

TEST(Doctor, TheSmallerMattersAreWarnings) {
    PlatformFacts facts = sound();
    facts.scsi.error = ENOENT;
    EXPECT_EQ(verdict(facts, "scsi"), Severity::warning);
    facts = sound();
    facts.nvram_error = EIO;
    EXPECT_EQ(verdict(facts, "nvram"), Severity::warning);
    facts = sound();
    facts.nvram_bytes = 20;
    EXPECT_EQ(verdict(facts, "nvram"), Severity::warning);
    facts = sound();
    facts.log_socket = false;
    EXPECT_EQ(verdict(facts, "syslog"), Severity::warning);
    facts = sound();
    facts.raidtype.error = ENOENT;
    EXPECT_EQ(verdict(facts, "raidtype"), Severity::warning);
}

TEST(Doctor, UnusableSemaphoresAreCritical) {
    PlatformFacts facts = sound();
    facts.semaphore_error = ENOSYS;
    EXPECT_EQ(verdict(facts, "semaphores"), Severity::critical);
}

TEST(Doctor, ADecimalCommaIsFine) {
    PlatformFacts facts = sound();
    facts.locale = "LC_ALL=de_DE.UTF-8";
    facts.decimal_point = ",";
    EXPECT_EQ(verdict(facts, "locale"), Severity::ok);
}

TEST(Doctor, TheHardwareRaidModelNeedsNoSoftwareRaid) {
    PlatformFacts facts = sound();
    facts.model.code = 0x300;
    facts.sata_nodes.clear();
    facts.swraid_nodes.clear();
    facts.mdstat.error = ENOENT;
    EXPECT_EQ(verdict(facts, "software-raid"), Severity::ok);
}
