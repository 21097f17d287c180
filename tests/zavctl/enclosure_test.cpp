// Disks and arrays that the RAID controller's report tells of.
#include "core/array_report.h"
#include "core/raid_set.h"
#include "core/slot_id.h"

#include "zav_api.h"

#include <cmath>
#include <cstring>
#include <gtest/gtest.h>

using namespace zavctl;

namespace {

sRaidSetInfo set_of_three() {
    sRaidSetInfo set = {};
    set.raidnum = 1;
    std::strcpy(set.raidname, "UNIT2SET");
    set.diskcount = 3;
    std::strcpy(set.diskmember, "123");
    for (int slot = 1; slot <= 4; ++slot)
        set.sDiskInfo[slot - 1] = {slot, slot == 4 ? 0.0F : 1000.2F, slot == 4 ? 2 : 1};
    sVolSetInfo &volume = set.sVolInfo[0];
    volume.volnum = 1;
    std::strcpy(volume.volname, "UNIT2VOL");
    volume.raidlevel = 3;
    volume.volsize = 2000.4F;
    return set;
}

DiskReport disk(int slot, int state) {
    DiskReport report;
    report.unit = 2;
    report.slot = slot;
    report.address = {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, packed({2, slot}), 0}, "/dev/sas/r2disk3"};
    report.state = state;
    report.expected = true;
    return report;
}

DiskReport told(int slot, int state, int result = ZAV_RC_OK) {
    DiskReport report = disk(slot, state);
    tell_enclosure(report, result, set_of_three());
    return report;
}

ArrayReport array(int state) {
    ArrayReport report;
    report.unit = 2;
    report.number = 1;
    report.address = {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, packed({2, 1}), 0},
                      "/dev/sasraid/r2disk1"};
    report.node_present = true;
    report.state = state;
    report.level = ZAV_RAIDLVL_5;
    report.resync = 37;
    report.members = {{{{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, packed({2, 3}), 0}, "/dev/sas/r2disk3"}}};
    return report;
}

ArrayReport told_array(int state, int result = ZAV_RC_OK) {
    ArrayReport report = array(state);
    tell_enclosure(report, result, set_of_three());
    return report;
}

} // namespace

TEST(SlotId, AreWrittenAloneOrBehindTheirUnit) {
    EXPECT_EQ(slot_id("3")->number, 3);
    EXPECT_EQ(slot_id("3")->unit, 0);
    EXPECT_EQ(slot_id("2-3")->unit, 2);
    EXPECT_EQ(slot_id("2-3")->number, 3);
    EXPECT_EQ(in_words(SlotId{2, 3}), "2-3");
    EXPECT_EQ(in_words(SlotId{0, 3}), "3");
}

TEST(SlotId, OtherWordsAreNone) {
    for (const char *word : {"", "-", "x", "2-", "-3", "0-1", "2-3-4", "2-x", "300-1", "1-300",
                             "99999999999", " 3", "3 "})
        EXPECT_FALSE(slot_id(word)) << word;
}

TEST(SlotId, AnAddressHoldsBothOnlyBehindAUnit) {
    EXPECT_EQ(in_words(slot_id({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 0x203, 0})), "2-3");
    EXPECT_EQ(in_words(slot_id({ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 3, 0})), "3");
    EXPECT_EQ(packed({2, 3}), 0x203);
}

TEST(RaidSet, NumbersAreShownAsTheyWereWritten) {
    EXPECT_EQ(as_written(500.1F), 500.1);
    EXPECT_FALSE(as_written(NAN));
    EXPECT_EQ(reported_size(4000), "4000.0");
    EXPECT_EQ(reported_size(0), "-");
}

TEST(RaidSet, LevelsAreTheControllersOwn) {
    EXPECT_EQ(reported_level(0, 4), "RAID0");
    EXPECT_EQ(reported_level(1, 2), "RAID1");
    EXPECT_EQ(reported_level(1, 4), "RAID10");
    EXPECT_EQ(reported_level(3, 4), "RAID5");
    EXPECT_EQ(reported_level(7, 4), "level 7");
}

TEST(RaidSet, MembersAreToldBySlotsOrByTheirCount) {
    sRaidSetInfo set = set_of_three();
    std::strcpy(set.diskmember, "124");
    EXPECT_FALSE(is_member(set, 3));
    EXPECT_TRUE(is_member(set, 4));
    set.diskmember[0] = '\0';
    EXPECT_TRUE(is_member(set, 3));
    EXPECT_FALSE(is_member(set, 4));
}

TEST(ReportedDisk, IsNamedWithItsUnitAndHasASize) {
    const DiskReport report = told(3, ZAV_HDD_FOUND);
    EXPECT_EQ(severity(report), Severity::ok);
    const Json json = disk_json(report);
    EXPECT_EQ(json["id"], "2-3");
    EXPECT_EQ(json["slot"], 3);
    EXPECT_EQ(json["unit"], 2);
    EXPECT_EQ(json["size"], 1000.2);
    EXPECT_EQ(json["raid_set"], "UNIT2SET");
}

TEST(ReportedDisk, IsMissedByItsRaidSetAlone) {
    const DiskReport member = told(3, ZAV_HDD_ABSENT);
    EXPECT_EQ(shown_state(told(4, ZAV_HDD_ABSENT)), "empty");
    EXPECT_EQ(severity(told(4, ZAV_HDD_ABSENT)), Severity::ok);
    DiskReport lost = disk(3, ZAV_HDD_ABSENT);
    sRaidSetInfo set = set_of_three();
    set.sDiskInfo[2] = {3, 0.0F, 2};
    tell_enclosure(lost, ZAV_RC_OK, set);
    EXPECT_EQ(severity(lost), Severity::critical);
    EXPECT_EQ(severity(member), Severity::unknown) << "the report has a disk there by now";
}

TEST(ReportedDisk, AnEnclosureThatTheReportLacksIsNoEmptySlot) {
    const DiskReport report = told(3, ZAV_HDD_ABSENT, ZAV_RC_ERR_ENODEV);
    EXPECT_EQ(severity(report), Severity::unknown);
    EXPECT_EQ(report.doubt,
              "the RAID controller's report has no section of unit 2, or no RAID set in it");
}

TEST(ReportedDisk, AStatusWithoutAMeaningIsUnknownWithItsNumber) {
    const DiskReport report = told(3, 9);
    EXPECT_EQ(severity(report), Severity::unknown);
    EXPECT_EQ(disk_json(report)["state"], "unknown");
    EXPECT_EQ(disk_note(report), "the library says 9, which is no known state");
}

TEST(ReportedDisk, AFailureIsTheControllersWord) {
    EXPECT_EQ(disk_note(told(3, ZAV_HDD_FAILED)), "the RAID controller reports it as failed");
}

TEST(ReportedDisk, TheListHasSizes) {
    const std::string text = disk_list_section({told(3, ZAV_HDD_FOUND)}).table.text({});
    EXPECT_EQ(text, "    DISK  STATE  SIZE    DEVICE\n"
                    "    2-3   found  1000.2  /dev/sas/r2disk3\n");
}

TEST(ReportedArray, HasNameSizeAndRaidSet) {
    const Json json = array_json(told_array(ZAV_RAID_NORMAL));
    EXPECT_EQ(json["id"], "2-1");
    EXPECT_EQ(json["array"], 1);
    EXPECT_EQ(json["unit"], 2);
    EXPECT_EQ(json["volume_name"], "UNIT2VOL");
    EXPECT_EQ(json["size"], 2000.4);
    EXPECT_EQ(json["raid_set"], "UNIT2SET");
    EXPECT_EQ(json["kernel_name"], nullptr);
    EXPECT_EQ(json["members"][0]["state"], "active");
    EXPECT_EQ(json["severity"], "ok");
}

TEST(ReportedArray, EveryStatusHasItsSeverity) {
    EXPECT_EQ(severity(told_array(ZAV_RAID_DEGRADED)), Severity::warning);
    EXPECT_EQ(severity(told_array(ZAV_RAID_RESYNC)), Severity::warning);
    EXPECT_EQ(rebuild_percent(told_array(ZAV_RAID_RESYNC)), 37);
    EXPECT_EQ(severity(told_array(ZAV_RAID_FAILED)), Severity::critical);
    EXPECT_EQ(severity(told_array(ZAV_RAID_NOT_EXIST)), Severity::critical);
    for (const int status : {0, 3, 5, 32})
        EXPECT_EQ(severity(told_array(status)), Severity::unknown) << status;
    EXPECT_EQ(array_note(told_array(5)), "the library says 5, which is no known state");
}

TEST(ReportedArray, AMissingSectionIsNoMissingVolume) {
    const ArrayReport report = told_array(ZAV_RAID_NOT_EXIST, ZAV_RC_ERR_ENODEV);
    EXPECT_EQ(severity(report), Severity::unknown);
    EXPECT_EQ(array_note(report), report.doubt);
}

TEST(ReportedArray, AMissingDeviceOfAReportedVolumeIsCritical) {
    ArrayReport report = told_array(ZAV_RAID_NOT_EXIST);
    report.node_present = false;
    EXPECT_EQ(severity(report), Severity::critical);
    EXPECT_EQ(array_note(report), "the RAID controller's report has it, but its device is missing");
}

TEST(ReportedArray, AVolumeThatTheReportLacksIsToldApart) {
    ArrayReport report = array(0);
    sRaidSetInfo set = set_of_three();
    set.sVolInfo[0] = {};
    tell_enclosure(report, ZAV_RC_OK, set);
    EXPECT_EQ(severity(report), Severity::unknown);
    EXPECT_EQ(array_note(report),
              "the RAID controller's report has no such volume, though its device is there");
}

TEST(ReportedArray, TheListNamesItWithItsUnit) {
    const std::string text = array_list_section({told_array(ZAV_RAID_NORMAL)}, {}).table.text({});
    EXPECT_EQ(text, "    ARRAY         LEVEL  STATE   SIZE    MEMBERS\n"
                    "    2-1 UNIT2VOL  RAID5  normal  2000.4  r2disk3\n");
}
