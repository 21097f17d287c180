// What is said of processor, memory, swap and file systems.
#include "core/load_report.h"

#include "zav_api.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

LoadReport load(const std::string &name, double used) {
    LoadReport report;
    report.used = used;
    for (const LoadProbe &probe : all_load_probes()) {
        LoadReport candidate;
        candidate.probe = &probe;
        if (load_name(candidate) == name)
            report.probe = &probe;
    }
    return report;
}

LoadReport not_mounted(const std::string &path) {
    LoadReport report = load(path, 0);
    report.mounted = false;
    return report;
}

std::string summary_of(const LoadReport &report) {
    return summary(Answer{"load", "", {load_section({report})}});
}

} // namespace

TEST(Load, LimitsAreExceededNotReached) {
    for (const char *name : {"processor", "/", "/var", "/tmp", "/mnt/buffer"}) {
        EXPECT_EQ(load_state_word(load(name, 90)), "normal") << name;
        EXPECT_EQ(load_state_word(load(name, 90.1)), "warning") << name;
        EXPECT_EQ(load_state_word(load(name, 95)), "warning") << name;
        EXPECT_EQ(load_state_word(load(name, 95.1)), "critical") << name;
    }
}

TEST(Load, SwapIsToBeEmpty) {
    EXPECT_EQ(severity(load("swap", 0)), Severity::ok);
    EXPECT_EQ(severity(load("swap", 0.1)), Severity::warning);
    EXPECT_EQ(severity(load("swap", 10.1)), Severity::critical);
    EXPECT_EQ(summary_of(load("swap", 12)), "CRITICAL: swap is 12.0 % in use");
}

TEST(Load, MemoryAndTheConfigurationHaveNoState) {
    for (const char *name : {"memory", "/etc/Kiru"}) {
        EXPECT_EQ(load_state_word(load(name, 99)), "") << name;
        EXPECT_EQ(severity(load(name, 99)), Severity::ok) << name;
    }
}

TEST(Load, AFullFileSystemIsToldWithItsPath) {
    EXPECT_EQ(summary_of(load("/var", 96)), "CRITICAL: file system /var is 96.0 % full");
}

TEST(Load, WhatIsNoFileSystemOfItsOwnIsWell) {
    EXPECT_EQ(load_state_word(not_mounted("/mnt/buffer")), "not mounted");
    EXPECT_EQ(severity(not_mounted("/mnt/buffer")), Severity::ok);
    EXPECT_TRUE(load_json(not_mounted("/mnt/buffer"))["used_percent"].is_null());
}

TEST(Load, WhatShouldBeMountedAndIsNotIsAWarning) {
    LoadReport report = not_mounted("/var");
    report.expected = true;
    EXPECT_EQ(summary_of(report), "WARNING: file system /var is not mounted");
}

TEST(Load, AFailureCannotBeTold) {
    LoadReport report = load("processor", 0);
    report.failure = Failure{ZAV_RC_ERR_EACCES, "ZAV_RC_ERR_EACCES", "/proc/stat cannot be read"};
    EXPECT_EQ(summary_of(report), "COULD NOT TELL: the use of the processor cannot be told");
    EXPECT_EQ(load_json(report)["state"], "unknown");
    EXPECT_TRUE(load_json(report)["used_percent"].is_null());
}

TEST(Load, TheProcessorsTimeIsSplit) {
    LoadReport report = load("processor", 12.5);
    report.shares = ProcessorShares{8, 0.5, 4, 87.5};
    EXPECT_EQ(section_text(load_section({report}), Style()),
              "    WHAT       USED    STATE   NOTE\n"
              "    processor  12.5 %  normal  user 8.0 %, nice 0.5 %, system 4.0 %, idle 87.5 %\n");
    EXPECT_EQ(load_json(report)["processor"]["idle"], 87.5);
}

TEST(Load, TheOverviewLeavesOutWhatNeedNotBeMounted) {
    LoadReport missed = not_mounted("/var");
    missed.expected = true;
    const Section section =
        load_overview_section({load("/", 40), not_mounted("/mnt/buffer"), missed});
    EXPECT_EQ(section_text(section, Style()),
              "    WHAT  USED    STATE        NOTE\n"
              "    /     40.0 %  normal\n"
              " !  /var  -       not mounted  /etc/fstab has it mounted when the machine starts\n");
    EXPECT_EQ(section.records.size(), 3U);
}

TEST(Load, TheRecordHasItsFields) {
    const Json json = load_json(load("/var", 12.5));
    EXPECT_EQ(json["kind"], "load");
    EXPECT_EQ(json["probe"], "file system");
    EXPECT_EQ(json["path"], "/var");
    EXPECT_EQ(json["used_percent"], 12.5);
    EXPECT_EQ(json["state"], "normal");
    EXPECT_EQ(json["severity"], "ok");
    EXPECT_TRUE(load_json(load("swap", 0))["path"].is_null());
}

TEST(Fstab, NamesWhatIsMountedWhenTheMachineStarts) {
    const std::string fstab = "# /dev/sda9 /tmp ext3 defaults 0 0\n"
                              "/dev/sda1 / ext3 defaults 1 1\n"
                              "/dev/sda5\t/var\text3\tdefaults\t1 2\n"
                              "/dev/sda7 /mnt/buffer ext3 rw,noauto,user 0 0\n"
                              "broken\n";
    EXPECT_TRUE(is_in_fstab(fstab, "/"));
    EXPECT_TRUE(is_in_fstab(fstab, "/var"));
    EXPECT_FALSE(is_in_fstab(fstab, "/tmp"));
    EXPECT_FALSE(is_in_fstab(fstab, "/mnt/buffer"));
    EXPECT_FALSE(is_in_fstab(fstab, "/var/log"));
    EXPECT_FALSE(is_in_fstab("", "/"));
}
