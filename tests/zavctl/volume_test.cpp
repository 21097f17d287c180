// Volume groups, logical and physical volumes: judged and shown.
#include "core/group_report.h"
#include "core/pv_report.h"
#include "core/volume_report.h"

#include "zav_event.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

const Failure refused{ZAV_RC_ERR, "ZAV_RC_ERR", "a step failed"};

GroupReport group(int state) {
    GroupReport report;
    report.number = 1;
    report.name = "DataVG1";
    report.address = {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 1, 0}, "/dev/DataVG1"};
    report.state = state;
    report.size = 3;
    report.pv_count = 1;
    report.lv_count = 2;
    report.devices = {{{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1}, "/dev/swraid/disk2p1"}};
    report.volumes = {1, 2};
    report.expected = true;
    return report;
}

VolumeReport volume(int state, double usage = 40) {
    VolumeReport report;
    report.id = {1, 2};
    report.address = {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 2, 1}, "/dev/DataVG1/LogVol2"};
    report.state = state;
    report.size = 2;
    report.usage = usage;
    report.mount_point = "/mnt/internal/data1-2";
    report.mounted = true;
    return report;
}

PvReport pv(int state) {
    PvReport report;
    report.id = {1, 1};
    report.address = {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 1, 1}, ""};
    report.state = state;
    report.size = 3;
    report.device = {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1}, "/dev/swraid/disk2p1"};
    return report;
}

} // namespace

TEST(GroupReport, StatesHaveTheirSeverity) {
    EXPECT_EQ(severity(group(ZAV_LVM_NORMAL)), Severity::ok);
    EXPECT_EQ(severity(group(ZAV_LVM_NORMAL | ZAV_LVM_INACTIVE)), Severity::warning);
    EXPECT_EQ(severity(group(ZAV_LVM_FAILED)), Severity::critical);
    EXPECT_EQ(severity(group(ZAV_LVM_NOT_EXIST)), Severity::warning);
    EXPECT_EQ(severity(group(0)), Severity::unknown);
}

TEST(GroupReport, AGroupThatNobodyExpectsMayBeMissing) {
    GroupReport report = group(ZAV_LVM_NOT_EXIST);
    report.expected = false;
    EXPECT_EQ(severity(report), Severity::ok);
    EXPECT_EQ(shown_state(report), "missing");
}

TEST(GroupReport, ADoubtOrAFailureIsUnknown) {
    GroupReport report = group(ZAV_LVM_NORMAL);
    report.doubt = "no bash";
    EXPECT_EQ(severity(report), Severity::unknown);
    report = group(ZAV_LVM_NORMAL);
    report.failure = refused;
    EXPECT_EQ(severity(report), Severity::unknown);
    EXPECT_EQ(group_json(report)["size_gb"], nullptr);
    EXPECT_EQ(group_json(report)["error"]["code"], 128);
}

TEST(GroupReport, TheListSaysWhatItLiesOn) {
    EXPECT_EQ(group_list_section({group(ZAV_LVM_NORMAL)}).table.text({}),
              "    GROUP      STATE   SIZE   VOLUMES  ON\n"
              "    1 DataVG1  normal  <3 GB  2        array 2\n");
}

TEST(GroupReport, CountsMayExceedWhatTheLibraryNames) {
    GroupReport report = group(ZAV_LVM_NORMAL);
    report.pv_count = 11;
    report.lv_count = 7;
    const std::string text = group_show_section({report}).details[0].text({});
    EXPECT_NE(text.find("11 on array 2 and 10 more"), std::string::npos) << text;
    EXPECT_NE(text.find("7: LogVol1, LogVol2 and 5 more"), std::string::npos) << text;
}

TEST(GroupReport, ADeviceWithoutAnAddressIsSaid) {
    GroupReport report = group(ZAV_LVM_NORMAL);
    report.devices = {{{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 0, 0}, "/dev/sata/disk0"}};
    EXPECT_NE(group_list_section({report}).table.text({}).find("a device without an address"),
              std::string::npos);
    EXPECT_EQ(group_json(report)["devices"][0], nullptr);
}

TEST(GroupReport, TheGroupsOfTheApplianceAreFoundInTheList) {
    EXPECT_EQ(groups_in_list("  VG          #PV #LV #SN Attr   VSize   VFree \n"
                             "  DataVG12      1   2   0 wz--n- 120.00m 40.00m\n"
                             "  PrimaryOSVG   1   2   0 wz--n- 120.00m 40.00m\n"
                             "  DataVG        1   2   0 wz--n- 120.00m 40.00m\n"
                             "  DataVG01      1   2   0 wz--n- 120.00m 40.00m\n"
                             "  MyDataVG1     1   2   0 wz--n- 120.00m 40.00m"),
              (std::vector<int>{12, 0}));
    EXPECT_TRUE(groups_in_list("").empty());
}

TEST(VolumeReport, StatesHaveTheirSeverity) {
    EXPECT_EQ(severity(volume(0)), Severity::ok);
    EXPECT_EQ(severity(volume(ZAV_LVM_FULL, 95)), Severity::warning);
    EXPECT_EQ(severity(volume(ZAV_LVM_INACTIVE)), Severity::warning);
    EXPECT_EQ(severity(volume(ZAV_LVM_FAILED)), Severity::critical);
    EXPECT_EQ(severity(volume(ZAV_LVM_NOT_EXIST)), Severity::critical);
    EXPECT_EQ(severity(volume(64)), Severity::unknown);
    EXPECT_EQ(volume_json(volume(0))["state"], "normal");
}

TEST(VolumeReport, TheListShowsUsageAndMountPoint) {
    EXPECT_EQ(volume_list_section({volume(ZAV_LVM_FULL, 95.4)}, 3).table.text({}),
              "    VOLUME               STATE  SIZE   USED  MOUNTED AT\n"
              " !  1-2 DataVG1/LogVol2  full   <2 GB  95 %  /mnt/internal/data1-2\n");
    EXPECT_EQ(volume_list_section({volume(0)}, 3).lines.size(), 1U);
    EXPECT_TRUE(volume_list_section({volume(0)}, 0).lines.empty());
}

TEST(VolumeReport, AMountPointThatCannotBeMeasuredIsNoError) {
    VolumeReport report = volume(0);
    report.failure = Failure{volume_not_measured, "", "cannot be measured"};
    EXPECT_EQ(severity(report), Severity::ok);
    EXPECT_EQ(volume_note(report), "not mounted");
    EXPECT_EQ(volume_json(report)["usage_percent"], nullptr);
}

TEST(VolumeReport, TheUsageOfAnotherFileSystemIsNotTold) {
    VolumeReport report = volume(ZAV_LVM_FULL, 99); // of the system's own, as nothing is mounted
    report.mounted = false;
    EXPECT_EQ(severity(report), Severity::ok);
    EXPECT_EQ(shown_state(report), "normal");
    EXPECT_EQ(usage_percent(report), std::nullopt);
    EXPECT_EQ(volume_json(report)["state_bits"], ZAV_LVM_FULL);
}

TEST(VolumeReport, AnotherErrorIsUnknown) {
    VolumeReport report = volume(0);
    report.failure = refused;
    EXPECT_EQ(severity(report), Severity::unknown);
    EXPECT_EQ(volume_json(report)["state"], "unknown");
}

TEST(VolumeReport, TheLargestSizeMeansAtLeast) {
    VolumeReport report = volume(0);
    report.size = 1024;
    EXPECT_NE(volume_list_section({report}, 0).table.text({}).find(">1023 GB"), std::string::npos);
}

TEST(VolumeReport, VolumesAreNamedByNumbersOrByPath) {
    const auto words = [](const std::string &word) {
        const auto id = volume_id(word);
        return id ? in_words(*id) : "none";
    };
    EXPECT_EQ(words("1-2"), "1-2");
    EXPECT_EQ(words("0-6"), "0-6");
    EXPECT_EQ(words("/dev/DataVG1/LogVol2"), "1-2");
    EXPECT_EQ(words("/dev/PrimaryOSVG/LogVol3"), "0-3");
    for (const char *wrong : {"", "1", "1-", "-1", "1-2-3", "a-b", "1--2", "/dev/sda/LogVol1",
                              "/dev/DataVG1", "/dev/DataVG1/LogVol", "/dev/DataVG1/home"})
        EXPECT_EQ(words(wrong), "none") << wrong;
}

TEST(PvReport, StatesHaveTheirSeverity) {
    EXPECT_EQ(severity(pv(ZAV_LVM_NORMAL)), Severity::ok);
    EXPECT_EQ(severity(pv(ZAV_LVM_FAILED)), Severity::critical);
    EXPECT_EQ(severity(pv(ZAV_LVM_NOT_EXIST)), Severity::critical);
    EXPECT_EQ(severity(pv(0)), Severity::unknown);
}

TEST(PvReport, TheListSaysWhatItLiesOn) {
    EXPECT_EQ(pv_list_section({pv(ZAV_LVM_NORMAL)}, 0).table.text({}),
              "    VOLUME  STATE   SIZE   GROUP    ON\n"
              "    1-1     normal  <3 GB  DataVG1  array 2 (/dev/swraid/disk2p1)\n");
}
