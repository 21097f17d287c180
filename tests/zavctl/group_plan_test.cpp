// When a volume group may be made, extended or dismantled.
#include "core/group_plan.h"
#include "core/name_report.h"
#include "exchange_facts.h"

#include <gtest/gtest.h>

using namespace zavctl;
using Words = std::vector<std::string>;

namespace {

GroupReport group(int number, int state) {
    GroupReport report;
    report.number = number;
    report.name = group_name(number);
    report.state = state;
    report.pv_count = 1;
    return report;
}

// An array that is free.
DeviceFact array_fact() {
    DeviceFact device;
    device.address = {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 3, 1}, "/dev/swraid/disk3p1"};
    device.node_present = device.usable = true;
    device.state = "normal";
    return device;
}

GroupFacts addition(int state = ZAV_LVM_NOT_EXIST) {
    GroupFacts facts;
    facts.group = group(2, state);
    facts.devices = {array_fact()};
    return facts;
}

GroupFacts removal() {
    GroupFacts facts;
    facts.group = group(1, ZAV_LVM_NORMAL);
    facts.group.lv_count = 1;
    facts.devices = {array_fact()};
    facts.devices[0].in_group = "DataVG1";
    VolumeFact volume;
    volume.report.id = {1, 1};
    volume.report.size = 3;
    volume.report.usage = 40;
    volume.report.mounted = true;
    volume.report.mount_point = "/mnt/internal/data1-1";
    facts.volumes = {volume};
    return facts;
}

#define EXPECT_REFUSED(plan, why) EXPECT_TRUE(refused_for(plan, why)) << all_refusals(plan)

std::string complaint(const Words &words) {
    try {
        device_words_given(words);
    } catch (const BadWords &bad) {
        return bad.what();
    }
    return "";
}

} // namespace

TEST(GroupPlan, TheRaidControllersArraysAreLeftAlone) {
    GroupFacts more = addition();
    more.hardware_raid = true;
    EXPECT_REFUSED(group_addition_plan(more), "are the RAID controller's");
    GroupFacts less = removal();
    less.hardware_raid = true;
    EXPECT_REFUSED(group_removal_plan(less, false), "are the RAID controller's");
}

TEST(GroupAddition, TheGroupIsCreatedOrExtended) {
    EXPECT_EQ(words_of(group_addition_plan(addition())), (Words{"label", "create"}));
    const Plan extended = group_addition_plan(addition(ZAV_LVM_NORMAL));
    EXPECT_EQ(words_of(extended), (Words{"label", "extend"}));
    EXPECT_FALSE(extended.refused()) << all_refusals(extended);
}

TEST(GroupAddition, ADegradedArrayIsAWarning) {
    GroupFacts facts = addition();
    facts.devices[0].state = "degraded";
    EXPECT_EQ(group_addition_plan(facts).warnings.size(), 1U);
    EXPECT_FALSE(group_addition_plan(facts).refused());
}

TEST(GroupAddition, ADeviceInUseIsRefused) {
    GroupFacts facts = addition();
    facts.devices[0].in_group = "DataVG1";
    EXPECT_REFUSED(group_addition_plan(facts), "physical volume of group DataVG1");
    facts.devices[0].in_group = ""; // a physical volume of no group
    EXPECT_FALSE(group_addition_plan(facts).refused());
    facts.devices[0].mounted_at = "/mnt/x\033";
    EXPECT_REFUSED(group_addition_plan(facts), "mounted at /mnt/x\\x1b");
    facts = addition();
    facts.devices[0].memberships = {{1, "md0"}};
    facts.devices[0].partitions = {1, 2};
    EXPECT_REFUSED(group_addition_plan(facts), "a member of md0");
    facts.devices[0].memberships.clear();
    EXPECT_REFUSED(group_addition_plan(facts), "2 partitions");
}

TEST(GroupAddition, ADeviceThatCannotCarryDataIsRefused) {
    GroupFacts facts = addition();
    facts.devices[0].node_present = false;
    EXPECT_REFUSED(group_addition_plan(facts), "does not exist");
    facts = addition();
    facts.devices[0].usable = false;
    facts.devices[0].state = "failed";
    EXPECT_REFUSED(group_addition_plan(facts), "its state is: failed");
    facts.devices[0].trouble = "a bitmap";
    EXPECT_REFUSED(group_addition_plan(facts), "cannot be told: a bitmap");
    facts = addition();
    facts.devices[0].address = {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 2}, "/dev/sata/disk3p2"};
    EXPECT_REFUSED(group_addition_plan(facts), "whole SATA disk or on an array");
}

TEST(GroupAddition, AGroupThatDoesNotAnswerIsRefused) {
    EXPECT_REFUSED(group_addition_plan(addition(ZAV_LVM_FAILED)), "does not answer");
    GroupFacts facts = addition();
    facts.group.doubt = "a shell that is not bash";
    EXPECT_REFUSED(group_addition_plan(facts), "not bash");
    facts = addition();
    facts.missing_tools = {"/usr/sbin/pvcreate"};
    EXPECT_REFUSED(group_addition_plan(facts), "pvcreate is missing");
}

TEST(GroupAddition, TheOutcomeIsWhatDeviceAndGroupSay) {
    const GroupFacts before = addition();
    GroupFacts after = addition(ZAV_LVM_NORMAL);
    after.devices[0].in_group = "DataVG2";
    EXPECT_EQ(group_addition_outcome(before, after, std::nullopt).word, "done");
    after.devices[0].in_group = "";
    const Outcome left = group_addition_outcome(before, after, std::nullopt);
    EXPECT_EQ(left.word, "incomplete");
    EXPECT_EQ(left.advice, (Words{"pvremove /dev/swraid/disk3p1"}));
    after.devices[0].in_group.reset();
    const Failure failure{128, "ZAV_RC_ERR", "a step failed"};
    EXPECT_EQ(group_addition_outcome(before, after, failure).word, "failed");
}

TEST(GroupRemoval, EveryVolumeIsNamedBeforeItIsDestroyed) {
    const Plan plan = group_removal_plan(removal(), false);
    EXPECT_FALSE(plan.refused()) << all_refusals(plan);
    EXPECT_EQ(words_of(plan), (Words{"destroy", "remove", "unlabel"}));
    EXPECT_NE(plan.steps[0].text.find("1-1 (<3 GB, 40 % used, mounted at"), std::string::npos);
}

TEST(GroupRemoval, WhatWouldStopHalfwayIsRefused) {
    GroupFacts facts = removal();
    facts.volumes[0].used_by = "bash (12)";
    EXPECT_REFUSED(group_removal_plan(facts, false), "in use by bash (12)");
    facts = removal();
    facts.group.lv_count = 8;
    EXPECT_REFUSED(group_removal_plan(facts, false),
                   "has 8 volumes, of which the library removes 1");
}

TEST(GroupRemoval, AGroupThatIsMissingOrSilentIsRefused) {
    GroupFacts facts = removal();
    facts.volumes.clear();
    facts.group = group(1, ZAV_LVM_NOT_EXIST);
    EXPECT_REFUSED(group_removal_plan(facts, false), "there is no volume group DataVG1");
    facts.group = group(1, ZAV_LVM_FAILED);
    EXPECT_REFUSED(group_removal_plan(facts, false), "does not answer");
}

TEST(GroupRemoval, TheSystemsGroupNeedsItsOption) {
    GroupFacts facts = removal();
    facts.group.number = 0;
    facts.group.name = "PrimaryOSVG";
    EXPECT_REFUSED(group_removal_plan(facts, false), "--system-group");
    EXPECT_FALSE(group_removal_plan(facts, true).refused());
}

TEST(GroupRemoval, TheOutcomeSaysWhatIsLeft) {
    const GroupFacts before = removal();
    GroupFacts after = removal();
    EXPECT_EQ(group_removal_outcome(before, after, std::nullopt).findings[0].text,
              "DataVG1 is still there, with volumes 1-1");
    after.group.state = ZAV_LVM_NOT_EXIST;
    after.volumes.clear();
    EXPECT_EQ(group_removal_outcome(before, after, std::nullopt).findings[0].text,
              "array 3 still carries the label of a physical volume");
    after.devices[0].in_group.reset();
    EXPECT_EQ(group_removal_outcome(before, after, std::nullopt).word, "done");
}

TEST(GroupDevice, IsGivenByNumberPathOrAddress) {
    const auto device = [](const Words &words) {
        return in_words(std::get<zavDevice>(device_words_given(words)));
    };
    EXPECT_EQ(device({"array", "3"}), "partition 1 of software array 3");
    EXPECT_EQ(device({"disk", "4"}), "SATA disk 4");
    EXPECT_EQ(device({"raid", "sw", "2", "1"}), "partition 1 of software array 2");
    EXPECT_EQ(std::get<std::string>(device_words_given({"/dev/swraid/disk3p1"})),
              "/dev/swraid/disk3p1");
    EXPECT_NE(complaint({"/dev/sata/disk1", "/dev/sata/disk2"}), "");
    EXPECT_NE(complaint({"hdd", "sata"}), "");
}
