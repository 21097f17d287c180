#include "core/array_report.h"
#include "core/bios_report.h"
#include "core/disk_report.h"
#include "core/model_report.h"

#include "zav_api.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

DiskReport disk(int state, bool expected = true, bool node = true) {
    DiskReport report;
    report.slot = 3;
    report.address = {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0}, "/dev/sata/disk3"};
    report.state = state;
    report.expected = expected;
    report.node_present = node;
    return report;
}

ArrayReport array(int state, int level = ZAV_RAIDLVL_5) {
    ArrayReport report;
    report.number = 2;
    report.kernel_name = "md1";
    report.address = {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1}, "/dev/swraid/disk2p1"};
    report.state = state;
    report.level = level;
    report.expected = true;
    for (int slot = 1; slot <= 2; ++slot)
        report.members.push_back({{{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 2},
                                   "/dev/sata/disk" + std::to_string(slot) + "p2"},
                                  "active"});
    return report;
}

const Failure refused{ZAV_RC_ERR_EINVAL, "ZAV_RC_ERR_EINVAL", "refused"};

std::string list_text(const ArrayReport &report, const std::vector<DiskReport> &disks = {}) {
    return array_list_section({report}, disks).table.text({});
}

} // namespace

TEST(DiskReport, StatesHaveTheirSeverity) {
    EXPECT_EQ(severity(disk(ZAV_HDD_FOUND)), Severity::ok);
    EXPECT_EQ(severity(disk(ZAV_HDD_FAILED)), Severity::critical);
    EXPECT_EQ(severity(disk(ZAV_HDD_ABSENT, true, false)), Severity::critical);
    EXPECT_EQ(severity(disk(0)), Severity::unknown);
}

TEST(DiskReport, AnUnusedEmptySlotIsWell) {
    const DiskReport empty = disk(ZAV_HDD_ABSENT, false, false);
    EXPECT_EQ(severity(empty), Severity::ok);
    EXPECT_EQ(shown_state(empty), "empty");
    EXPECT_EQ(disk_json(empty)["state"], "absent");
}

TEST(DiskReport, ADiskThatCannotBeOpenedIsNoEmptySlot) {
    const DiskReport broken = disk(ZAV_HDD_ABSENT, false, true);
    EXPECT_EQ(severity(broken), Severity::critical);
    EXPECT_EQ(shown_state(broken), "absent");
}

TEST(DiskReport, AnErrorOfTheLibraryIsUnknown) {
    DiskReport report = disk(ZAV_HDD_ABSENT);
    report.failure = refused;
    EXPECT_EQ(severity(report), Severity::unknown);
    EXPECT_EQ(disk_json(report)["state"], "unknown");
    EXPECT_EQ(disk_json(report)["error"]["code"], 22);
    EXPECT_EQ(disk_json(report)["error"]["name"], "ZAV_RC_ERR_EINVAL");
}

TEST(DiskReport, AnAnswerInDoubtIsUnknownWhateverItSays) {
    for (const int state : {ZAV_HDD_FOUND, ZAV_HDD_FAILED}) {
        DiskReport report = disk(state);
        report.doubt = "no bash";
        EXPECT_EQ(severity(report), Severity::unknown);
        EXPECT_EQ(shown_state(report), "unknown");
        EXPECT_EQ(disk_json(report)["doubt"], "no bash");
    }
}

TEST(DiskReport, AMissingNodeNeedsNoToolToBeBelieved) {
    DiskReport report = disk(ZAV_HDD_ABSENT, true, false);
    report.doubt = "no bash";
    EXPECT_EQ(severity(report), Severity::critical);
}

TEST(ArrayReport, StatesHaveTheirSeverity) {
    EXPECT_EQ(severity(array(ZAV_RAID_NORMAL)), Severity::ok);
    EXPECT_EQ(severity(array(ZAV_RAID_DEGRADED)), Severity::warning);
    EXPECT_EQ(severity(array(ZAV_RAID_RESYNC)), Severity::warning);
    EXPECT_EQ(severity(array(ZAV_RAID_FAILED)), Severity::critical);
    EXPECT_EQ(severity(array(ZAV_RAID_NOT_EXIST)), Severity::critical);
    EXPECT_EQ(severity(array(3)), Severity::unknown);
}

TEST(ArrayReport, AnArrayThatNoDiskIsReadyForMayBeMissing) {
    ArrayReport report = array(ZAV_RAID_NOT_EXIST, ZAV_RAIDLVL_NONE);
    report.expected = false;
    EXPECT_EQ(severity(report), Severity::ok);
}

TEST(ArrayReport, LevelsHaveStableWords) {
    EXPECT_EQ(level_word(ZAV_RAIDLVL_NONE), "none");
    EXPECT_EQ(level_word(ZAV_RAIDLVL_0), "raid0");
    EXPECT_EQ(level_word(ZAV_RAIDLVL_1), "raid1");
    EXPECT_EQ(level_word(ZAV_RAIDLVL_5), "raid5");
    EXPECT_EQ(level_word(ZAV_RAIDLVL_6), "raid6");
    EXPECT_EQ(level_word(ZAV_RAIDLVL_10), "raid10");
    EXPECT_EQ(level_word(ZAV_RAIDLVL_JBOD), "linear");
    EXPECT_EQ(level_word(10), "unknown");
    EXPECT_EQ(level_word(-1), "unknown");
}

TEST(ArrayReport, OnlyARebuildHasAProgress) {
    ArrayReport report = array(ZAV_RAID_RESYNC);
    report.resync = 37;
    EXPECT_EQ(array_json(report)["rebuild_percent"], 37.0);
    report.state = ZAV_RAID_NORMAL;
    report.resync = 100; // what the library gives for a level without redundancy
    EXPECT_TRUE(array_json(report)["rebuild_percent"].is_null());
}

TEST(ArrayReport, TheListShowsARebuildAsABar) {
    ArrayReport report = array(ZAV_RAID_RESYNC);
    report.resync = 37;
    EXPECT_EQ(list_text(report), "    ARRAY  LEVEL  STATE       MEMBERS\n"
                                 " !  2 md1  RAID5  rebuilding  disk1p2 disk2p2\n"
                                 "                              [=======>............]  37 %\n");
}

TEST(ArrayReport, TheListMarksMembersThatDoNotWork) {
    ArrayReport report = array(ZAV_RAID_DEGRADED);
    report.members[1].state = "faulty";
    EXPECT_NE(list_text(report).find("disk1p2 disk2p2(faulty)"), std::string::npos);
    DiskReport gone = disk(ZAV_HDD_ABSENT);
    gone.slot = 2;
    EXPECT_NE(list_text(report, {gone}).find("disk1p2 disk2p2(absent)"), std::string::npos);
}

TEST(ArrayReport, ARefusalIsExplained) {
    ArrayReport report = array(ZAV_RAID_NORMAL);
    report.failure = Failure{128, "ZAV_RC_ERR", "a step failed"};
    report.refusal = "a bitmap";
    EXPECT_EQ(array_note(report), "a step failed (ZAV_RC_ERR, code 128): a bitmap");
    EXPECT_EQ(array_json(report)["state"], "unknown");
    EXPECT_EQ(array_json(report)["state_bits"], 1);
}

TEST(ModelReport, AModelCodeOutsideTheTableHasNoName) {
    const Failure none{0x1301, "", "no known model"};
    EXPECT_EQ(in_words(none), "no known model (code 0x1301)");
    EXPECT_EQ(to_json(std::optional<Failure>(none))["name"], nullptr);
}

TEST(ModelReport, EveryModelHasAWord) {
    EXPECT_EQ(model_word(ZAV_MODEL_SOLVANE_2740), "2740");
    EXPECT_EQ(model_word(ZAV_MODEL_SOLVANE_2860), "2860");
    EXPECT_EQ(model_word(ZAV_MODEL_SOLVANE_2860_4HDD), "2860_4hdd");
    EXPECT_EQ(model_word(ZAV_MODEL_SOLVANE_2980), "2980");
    EXPECT_EQ(model_word(0), "none");
    EXPECT_EQ(model_word(0x777), "unknown");
}

TEST(BiosReport, AnImageHas114BytesAndIsNotAllZeros) {
    EXPECT_EQ(image_refusal(std::string(114, 'x')), "");
    EXPECT_NE(image_refusal(std::string(113, 'x')), "");
    EXPECT_NE(image_refusal(std::string(115, 'x')), "");
    EXPECT_NE(image_refusal(std::string(114, '\0')), "");
}

TEST(BiosReport, ALoadIsJudgedByWhatTheDeviceHolds) {
    const std::string image(114, 'x');
    std::string other = image;
    EXPECT_EQ(load_verdict("f", image, {0, image}).severity, Severity::ok);
    other[33] = 'y'; // the checksum, which the kernel writes itself
    EXPECT_EQ(load_verdict("f", image, {0, other}).severity, Severity::warning);
    other[34] = 'y';
    EXPECT_EQ(load_verdict("f", image, {0, other}).severity, Severity::critical);
    EXPECT_EQ(load_verdict("f", image, {5, ""}).severity, Severity::unknown);
}
