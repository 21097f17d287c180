// Time and members in the model.
#include "model/actions.hpp"
#include "model/advance.hpp"
#include "model/arrays.hpp"
#include "model/devices.hpp"
#include "model/disks.hpp"
#include "model/factory.hpp"
#include "model/json.hpp"
#include "model/texts.hpp"

#include <algorithm>
#include <gtest/gtest.h>

using namespace zavsim;

namespace {

State appliance(const std::string &level = "", const std::string &model = "2860-4") {
    return new_appliance({model, level, false, 1});
}

void act(State &state, const std::string &sentence) {
    ASSERT_EQ(perform_sentence(state, sentence), "") << sentence;
    advance(state, state.now);
}

Array &array(State &state, int minor) {
    return *find_array(state, minor);
}

State replaced_disk() {
    State state = appliance();
    for (const char *sentence :
         {"disk 3 fails", "disk 3 vanishes", "disk 3 appears", "disk 3 joins"})
        act(state, sentence);
    return state;
}

bool has_node(const State &state, const std::string &path) {
    const auto nodes = device_nodes(state);
    return std::any_of(nodes.begin(), nodes.end(),
                       [&path](const Node &node) { return node.path == path; });
}

TEST(SimulatedArrays, AFailedDiskIsFaultyInEveryArrayAndStaysListed) {
    State state = appliance();
    act(state, "disk 3 fails");
    for (const Array &each : state.arrays) {
        EXPECT_EQ(find_member(each, "c", each.minor + 1)->role, Role::faulty);
        EXPECT_TRUE(is_degraded(each));
        EXPECT_FALSE(is_broken(each));
    }
}

TEST(SimulatedArrays, AReplacementRebuildsOneArrayAfterAnother) {
    State state = replaced_disk();
    EXPECT_TRUE(array(state, 0).sync.running);
    EXPECT_FALSE(array(state, 1).sync.running);
    EXPECT_FALSE(array(state, 2).sync.running);
    advance(state, 80);
    EXPECT_FALSE(is_degraded(array(state, 0)));
    EXPECT_TRUE(array(state, 1).sync.running);
    EXPECT_FALSE(array(state, 2).sync.running);
}

TEST(SimulatedArrays, TheDataArrayRebuildsInFourMinutes) {
    State state = replaced_disk();
    advance(state, 71.6);
    EXPECT_TRUE(is_degraded(array(state, 0)));
    advance(state, 71.8);
    EXPECT_FALSE(is_degraded(array(state, 0)));
    const double start = array(state, 1).sync.started;
    advance(state, start + 239.9);
    EXPECT_TRUE(is_degraded(array(state, 1)));
    advance(state, start + 240.1);
    EXPECT_FALSE(is_degraded(array(state, 1)));
}

TEST(SimulatedArrays, TimeInOneLeapOrInStepsComesToTheSame) {
    State leap = replaced_disk();
    State steps = leap;
    advance(leap, 200);
    for (int i = 1; i <= 2000; ++i)
        advance(steps, i * 0.1);
    EXPECT_EQ(mdstat_text(leap), mdstat_text(steps));
}

TEST(SimulatedArrays, TheClockNeverGoesBack) {
    State state = replaced_disk();
    advance(state, 100);
    const std::string before = mdstat_text(state);
    advance(state, 50);
    EXPECT_EQ(mdstat_text(state), before);
}

TEST(SimulatedArrays, RecoveryStandsBehindTheBarAndTwoBlanks) {
    State state = replaced_disk();
    advance(state, 30);
    const std::string text = mdstat_text(state);
    const std::size_t word = text.find("recovery");
    ASSERT_NE(word, std::string::npos);
    EXPECT_EQ(word - (text.rfind('\n', word) + 1), 6U + 23U + 2U);
}

TEST(SimulatedArrays, FinishAndSpeedAgreeWithTheClock) {
    State state = replaced_disk();
    advance(state, 30);
    EXPECT_NE(mdstat_text(state).find("recovery = 41.3% (40704/97280) finish=0.6min "
                                      "speed=1356K/sec"),
              std::string::npos)
        << mdstat_text(state);
}

TEST(SimulatedArrays, TheLastCopyOfAMirrorIsNeverGivenUp) {
    State state = appliance();
    Array &mirror = array(state, 0);
    for (const char *letter : {"a", "b", "c"})
        EXPECT_EQ(fail_member(state, mirror, letter, 1), Refusal::none);
    EXPECT_EQ(fail_member(state, mirror, "d", 1), Refusal::busy);
    EXPECT_EQ(count_members(mirror, Role::in_sync), 1);
}

TEST(SimulatedArrays, AStripeCannotLoseAMember) {
    State state = appliance("raid0");
    EXPECT_EQ(fail_member(state, array(state, 1), "a", 2), Refusal::busy);
}

TEST(SimulatedArrays, ARaid10WithAPairHalfLostRefusesItsOtherHalf) {
    State state = appliance("raid10");
    Array &data = array(state, 1);
    EXPECT_EQ(fail_member(state, data, "c", 2), Refusal::none);
    EXPECT_EQ(fail_member(state, data, "d", 2), Refusal::busy);
    EXPECT_EQ(fail_member(state, data, "a", 2), Refusal::none);
}

TEST(SimulatedArrays, ARaid5OfTwoMembersIsBrokenAndTakesNoneIn) {
    State state = appliance();
    act(state, "disk 3 fails");
    act(state, "disk 4 vanishes");
    act(state, "disk 4 appears");
    act(state, "disk 4 joins");
    EXPECT_TRUE(is_broken(array(state, 1)));
    EXPECT_EQ(array(state, 1).sync.kind, SyncKind::none);
    EXPECT_EQ(array(state, 0).sync.kind, SyncKind::recovery);
}

TEST(SimulatedArrays, AnActiveMemberCannotBeRemovedOrAddedTwice) {
    State state = appliance();
    EXPECT_EQ(remove_member(state, array(state, 0), "a", 1), Refusal::busy);
    EXPECT_EQ(add_member(state, array(state, 0), "a", 1), Refusal::busy);
    EXPECT_EQ(add_member(state, array(state, 0), "x", 1), Refusal::no_such_device);
}

TEST(SimulatedArrays, ACheckWaitsForTheRebuildOfItsDisks) {
    State state = replaced_disk();
    advance(state, 400);
    ASSERT_FALSE(is_degraded(array(state, 2)));
    act(state, "array 2 checks");
    act(state, "array 1 checks");
    EXPECT_TRUE(array(state, 1).sync.running);
    EXPECT_FALSE(array(state, 0).sync.running);
    EXPECT_NE(mdstat_text(state).find("check =  0.0%"), std::string::npos);
    advance(state, 400 + 241);
    EXPECT_EQ(array(state, 1).sync.kind, SyncKind::none);
    EXPECT_TRUE(array(state, 0).sync.running);
}

TEST(SimulatedArrays, ADegradedArrayIsNotChecked) {
    State state = appliance();
    act(state, "disk 2 fails");
    EXPECT_NE(perform_sentence(state, "array 2 checks"), "");
}

TEST(SimulatedArrays, ScenarioEventsHappenAtTheirTimes) {
    State state = appliance();
    state.scenario = {{10, "disk 3 fails"}, {20, "tool mdadm is missing"}};
    advance(state, 9.9);
    EXPECT_FALSE(find_disk(state, 3)->failing);
    advance(state, 10);
    EXPECT_TRUE(find_disk(state, 3)->failing);
    EXPECT_DOUBLE_EQ(array(state, 1).updated, 10);
    EXPECT_TRUE(state.faults.empty());
    advance(state, 100);
    ASSERT_EQ(state.faults.size(), 1U);
    EXPECT_TRUE(state.faults.front().missing);
}

TEST(SimulatedDisks, AVanishedDiskTakesItsNodesWithItAndAReplacementIsBlank) {
    State state = appliance();
    act(state, "disk 3 vanishes");
    EXPECT_FALSE(has_node(state, "/dev/sata/disk3"));
    EXPECT_FALSE(has_node(state, "/dev/sdc2"));
    act(state, "disk 3 appears");
    EXPECT_TRUE(has_node(state, "/dev/sata/disk3"));
    EXPECT_FALSE(has_node(state, "/dev/sata/disk3p1"));
}

TEST(SimulatedDisks, ANameStaysTakenWhileAnArrayHoldsIt) {
    State state = appliance();
    act(state, "disk 3 vanishes");
    act(state, "disk 3 appears");
    EXPECT_EQ(find_disk(state, 3)->letter, "e");
    act(state, "disk 2 vanishes");
    for (Array &each : state.arrays)
        EXPECT_EQ(remove_member(state, each, "b", each.minor + 1), Refusal::none);
    act(state, "disk 2 appears");
    EXPECT_EQ(find_disk(state, 2)->letter, "b");
}

TEST(SimulatedDisks, TheKernelsCommandsDetachAndAttachTheSameDisk) {
    State state = appliance();
    const int serial = find_disk(state, 4)->serial;
    scsi_command(state, "scsi remove-single-device 3 0 0 0");
    EXPECT_FALSE(has_node(state, "/dev/sata/disk4"));
    EXPECT_TRUE(is_degraded(array(state, 1)));
    scsi_command(state, "scsi add-single-device 3 0 0 0\n");
    EXPECT_TRUE(has_node(state, "/dev/sata/disk4p2"));
    EXPECT_EQ(find_disk(state, 4)->serial, serial);
}

TEST(SimulatedDisks, AnEmptySlotTakesNoCommand) {
    State state = appliance();
    act(state, "disk 4 vanishes");
    const std::string before = scsi_text(state);
    scsi_command(state, "scsi add-single-device 3 0 0 0");
    EXPECT_EQ(scsi_text(state), before);
}

TEST(SimulatedDisks, WhatCannotHappenIsRefused) {
    State state = appliance();
    EXPECT_NE(perform_sentence(state, "disk 3 appears"), "");
    act(state, "disk 3 vanishes");
    EXPECT_NE(perform_sentence(state, "disk 3 vanishes"), "");
    EXPECT_NE(perform_sentence(state, "disk 3 fails"), "");
    EXPECT_NE(perform_sentence(state, "disk 3 joins"), "");
    State small = appliance("", "2860-2");
    EXPECT_NE(perform_sentence(small, "disk 3 fails"), "");
}

TEST(SimulatedDisks, KernelNumbersAreThoseOfTheScsiDisks) {
    EXPECT_EQ(device_number("a", 1).minor, 1);
    EXPECT_EQ(device_number("e", 2).minor, 66);
    EXPECT_EQ(device_number("z", 0).minor, 400);
    EXPECT_EQ(device_number("aa", 0).minor, 416);
}

TEST(SimulatedDisks, OnlyKernelNamesAreTakenForDisks) {
    EXPECT_EQ(parse_kernel_name("sdb2")->partition, 2);
    EXPECT_EQ(parse_kernel_name("sdaa")->letter, "aa");
    for (const char *name : {"sd", "sd1", "sda1x", "sdabc", "sda123", "hda", "stdin", "stderr"})
        EXPECT_FALSE(parse_kernel_name(name)) << name;
}

TEST(SimulatedModels, HaveTheirDisksAndLevels) {
    EXPECT_EQ(appliance("", "2740").disks.size(), 1U);
    EXPECT_EQ(appliance("", "2740-4").disks.size(), 4U);
    EXPECT_TRUE(appliance("", "2980").arrays.empty());
    EXPECT_EQ(raidtype_line("2860-4", ""), "raidtype=5;0;4");
    EXPECT_EQ(raidtype_line("2860-2", ""), "raidtype=1;0;2");
    EXPECT_EQ(raidtype_line("2860-4", "raid10"), "raidtype=10;0;4");
    EXPECT_EQ(level_problem("2860-4", "raid6"), "");
    EXPECT_NE(level_problem("2860-2", "raid5"), "");
    EXPECT_NE(level_problem("2980", "raid1"), "");
}

TEST(SimulatedState, SurvivesItsFile) {
    State state = replaced_disk();
    act(state, "tool mdadm prints \"a\\nb\"");
    state.scenario = {{1000, "disk 1 fails"}};
    advance(state, 33.3);
    const State back = state_from_text(to_text(state));
    EXPECT_EQ(to_text(back), to_text(state));
    EXPECT_EQ(mdstat_text(back), mdstat_text(state));
    EXPECT_EQ(back.faults.front().prints, "a\nb");
}

TEST(ApplianceTexts, TheOldMdadmNamesTheLevelInItsScan) {
    const State state = appliance();
    const std::string text = examine_scan_text(state, *find_partition(*find_disk(state, 1), 2));
    EXPECT_EQ(text, "ARRAY /dev/md/MD1 level=raid5 metadata=1.2 num-devices=4 "
                    "UUID=953d5f52:dc5d34c8:027751d9:b410e1a2 name=appliance:MD1\n");
}

TEST(ApplianceTexts, TheOldMdadmCallsAFailedMemberAFaultySpare) {
    State state = appliance();
    act(state, "disk 4 fails");
    const std::string text = detail_text(state, array(state, 1), "/dev/md1");
    EXPECT_NE(text.find("       3       8       50        -      faulty spare   /dev/sdd2\n"),
              std::string::npos)
        << text;
    EXPECT_NE(text.find("     Raid Level : raid5\n"), std::string::npos);
    EXPECT_NE(text.find(" Active Devices : 3\n"), std::string::npos);
    EXPECT_NE(text.find("   Raid Devices : 4\n"), std::string::npos);
}

TEST(ApplianceTexts, AVanishedFaultyMemberKeepsItsNumbers) {
    State state = appliance();
    act(state, "disk 4 vanishes");
    const std::string text = detail_text(state, array(state, 0), "/dev/md0");
    EXPECT_NE(text.find("       3       8       49        -      faulty spare\n"),
              std::string::npos)
        << text;
}

TEST(ApplianceTexts, TheOldKernelListsMembersByPlace) {
    const State state = appliance();
    EXPECT_EQ(mdstat_text(state),
              "Personalities : [linear] [raid0] [raid1] [raid10] [raid6] [raid5] [raid4] \n"
              "md2 : active raid1 sda3[0] sdb3[1] sdc3[2] sdd3[3]\n"
              "      96256 blocks super 1.2 [4/4] [UUUU]\n"
              "      \n"
              "md1 : active raid5 sda2[0] sdb2[1] sdc2[2] sdd2[3]\n"
              "      976896 blocks super 1.2 level 5, 512k chunk, algorithm 2 [4/4] [UUUU]\n"
              "      \n"
              "md0 : active raid1 sda1[0] sdb1[1] sdc1[2] sdd1[3]\n"
              "      97280 blocks super 1.2 [4/4] [UUUU]\n"
              "      \n"
              "unused devices: <none>\n");
}

} // namespace
