// When a disk may be brought into service, and what that does.
#include "exchange_facts.h"

#include <gtest/gtest.h>

using namespace zavctl;
using Words = std::vector<std::string>;
using Hold = ArrayMember::Hold;

namespace {

Plan plan_of(const ExchangeFacts &facts, const Consent &consent = {}) {
    return addition_plan(facts, consent);
}

ExchangeFacts with_lost_data_array(int state) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.partitions[1].array.state = state;
    if (state == ZAV_RAID_NOT_EXIST) {
        facts.partitions[1].holder = facts.partitions[1].leads_to = "";
        facts.partitions[1].table = {};
    }
    return facts;
}

#define EXPECT_REFUSED(plan, why) EXPECT_TRUE(refused_for(plan, why)) << all_refusals(plan)

} // namespace

TEST(AddPlan, TheDiskIsWipedAndJoinsEveryDegradedArray) {
    const Plan plan = plan_of(facts_with_new_disk());
    EXPECT_FALSE(plan.refused()) << all_refusals(plan);
    EXPECT_EQ(words_of(plan), (Words{"wipe", "join", "join", "join"}));
    EXPECT_EQ(plan.steps[1].array, 1);
    EXPECT_EQ(plan.seconds, 6);
    EXPECT_TRUE(plan.warnings.empty());
}

TEST(AddPlan, ADiskWithoutADeviceIsLookedForFirst) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.target = disk_report(3, ZAV_HDD_ABSENT);
    const Plan plan = plan_of(facts);
    EXPECT_FALSE(plan.refused()) << all_refusals(plan);
    EXPECT_EQ(plan.steps[0].does, "attach");
    EXPECT_EQ(plan.seconds, 16);
}

TEST(AddPlan, WhatTheDiskHoldsIsSaid) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.content = {{1, 2, 3}, true, true, true};
    const Plan plan = plan_of(facts);
    EXPECT_FALSE(plan.refused());
    ASSERT_EQ(plan.warnings.size(), 2U);
    EXPECT_EQ(plan.warnings[0], "it is not empty, and will be: it holds 3 partitions, members of "
                                "an array and the mark of an appliance's disk");
    EXPECT_NE(plan.warnings[1].find("smaller than disk 1"), std::string::npos);
}

TEST(AddPlan, ADiskInServiceIsRefused) {
    for (const Hold hold : {Hold::active, Hold::rebuilding, Hold::spare, Hold::faulty}) {
        ExchangeFacts facts = facts_with_new_disk();
        facts.partitions[1].table.members.push_back({hold, 4, 2, "sde2", 3});
        EXPECT_REFUSED(plan_of(facts), word(hold) + " in array 2 (md1, RAID5)");
    }
    ExchangeFacts facts = facts_with_new_disk();
    facts.groups_on_target = {"DataVG2"};
    EXPECT_REFUSED(plan_of(facts), "DataVG2");
}

TEST(AddPlan, WhatTheKernelHoldsAndMdadmDoesNotTellIsRefused) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.memberships = {{2, "md1"}};
    EXPECT_REFUSED(plan_of(facts), "a member of md1");
    facts = facts_with_new_disk();
    facts.partitions[1].scan = "";
    EXPECT_REFUSED(plan_of(facts), "mdadm tells nothing of it");
}

TEST(AddPlan, AnUnhealthyDiskIsRefused) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.target.state = ZAV_HDD_FAILED;
    EXPECT_REFUSED(plan_of(facts), "not healthy");
    facts.target = disk_report(3);
    facts.target.doubt = "smartctl is not on the PATH";
    EXPECT_REFUSED(plan_of(facts), "smartctl");
}

TEST(AddPlan, ASlotThatNoArrayUsesIsRefused) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.target.expected = false;
    facts.platform.model.disk_count = 2;
    EXPECT_REFUSED(plan_of(facts), "slots 1 to 2");
}

TEST(AddPlan, WithoutASourceNothingIsWiped) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.source = 3;
    EXPECT_REFUSED(plan_of(facts), "first active member");
    facts.source = 0;
    facts.partitions.clear();
    EXPECT_REFUSED(plan_of(facts), "no disk is found");
}

TEST(AddPlan, AMachineThatLacksWhatTheCommandsNeedIsRefused) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.missing_tools = {"udevinfo", "/sbin/sfdisk"};
    EXPECT_REFUSED(plan_of(facts), "udevinfo and /sbin/sfdisk are missing");
    facts = facts_with_new_disk();
    facts.platform.sata_hosts.clear();
    EXPECT_REFUSED(plan_of(facts), "none for slot 3");
}

TEST(AddPlan, WithoutALevelWordTheDiskWouldJoinNothing) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.partitions[0].scan = "ARRAY /dev/md/MD0  metadata=1.2\n";
    EXPECT_REFUSED(plan_of(facts), "no level");
    facts.partitions[0].scan = "ARRAY /dev/md127 level=raid1\n";
    EXPECT_REFUSED(plan_of(facts), "none of the appliance's");
}

TEST(AddPlan, AnArrayThatCannotBeToldIsRefused) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.partitions[1].array.failure = Failure{128, "ZAV_RC_ERR", "a step failed"};
    EXPECT_REFUSED(plan_of(facts), "no answer to trust");
}

TEST(AddPlan, WhereNoArrayLacksAMemberTheDiskIsNotWiped) {
    ExchangeFacts facts = facts_with_new_disk();
    for (PartitionFact &fact : facts.partitions)
        fact.array.state = ZAV_RAID_NORMAL;
    EXPECT_REFUSED(plan_of(facts), "wiped for nothing");
}

TEST(AddPlan, ALostDataArrayIsCreatedAnewWithConsentOnly) {
    for (const int state : {ZAV_RAID_FAILED, ZAV_RAID_NOT_EXIST}) {
        const ExchangeFacts facts = with_lost_data_array(state);
        const Plan without = plan_of(facts);
        EXPECT_REFUSED(without, "CREATED ANEW");
        EXPECT_EQ(without.refusals[0].option, "--recreate");
        const Plan with = plan_of(facts, {.destroy = false, .recreate = true});
        EXPECT_FALSE(with.refused()) << all_refusals(with);
        EXPECT_EQ(words_of(with), (Words{"wipe", "join", "recreate", "join"}));
        EXPECT_EQ(with.steps[2].severity, Severity::critical);
    }
}

TEST(AddPlan, ALostDataArrayStaysWhileADiskIsMissing) {
    ExchangeFacts facts = with_lost_data_array(ZAV_RAID_FAILED);
    facts.ata_disks = 3;
    const Plan plan = plan_of(facts);
    EXPECT_FALSE(plan.refused()) << all_refusals(plan);
    EXPECT_EQ(words_of(plan), (Words{"wipe", "join", "none", "join"}));
    EXPECT_EQ(plan.warnings.size(), 1U);
    facts.target = disk_report(3, ZAV_HDD_ABSENT); // which the attached disk completes
    EXPECT_REFUSED(plan_of(facts), "CREATED ANEW");
}

TEST(AddPlan, AnotherArrayThatIsLostWouldBeReplacedByADataArray) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.partitions[2].array.state = ZAV_RAID_NOT_EXIST;
    EXPECT_REFUSED(plan_of(facts, {.destroy = true, .recreate = true}), "mdadm --assemble");
}

TEST(AddPlan, APartitionInNoArrayLetsTheSetupScriptRun) {
    ExchangeFacts facts = facts_with_new_disk();
    facts.partitions[1].scan = facts.partitions[1].holder = "";
    EXPECT_REFUSED(plan_of(facts), "createraid, then lvmrestore");
    facts.platform.model.data_raid_type = 1;
    EXPECT_REFUSED(plan_of(facts), "(lvmrestore)");
    EXPECT_EQ(words_of(plan_of(facts, {.destroy = false, .recreate = true})),
              (Words{"wipe", "join", "set_up", "join"}));
}

namespace {

Aftermath all_joined(const ExchangeFacts &before) {
    Aftermath after;
    after.node_present = true;
    after.content.partitions = {1, 2, 3};
    after.content.marked = true;
    after.partitions = before.partitions;
    for (PartitionFact &fact : after.partitions)
        fact.table.members.push_back({Hold::rebuilding, 4, 2, node(3, fact.number), 3});
    return after;
}

} // namespace

TEST(AddOutcome, EveryArrayMustHaveTheDisk) {
    const ExchangeFacts before = facts_with_new_disk();
    const Plan plan = plan_of(before);
    Aftermath after = all_joined(before);
    EXPECT_EQ(addition_outcome(plan, before, after, std::nullopt).word, "done");
    EXPECT_TRUE(addition_outcome(plan, before, after, std::nullopt).findings.empty());

    lose(after.partitions[1], 3);
    const Outcome missed = addition_outcome(plan, before, after, std::nullopt);
    EXPECT_EQ(missed.word, "incomplete");
    EXPECT_EQ(missed.findings[0].text, "disk3p2 did not join array 2 (md1, RAID5)");
    EXPECT_EQ(missed.findings[0].severity, Severity::critical);
    EXPECT_EQ(missed.advice, (Words{"mdadm /dev/md1 --add /dev/sata/disk3p2"}));
}

TEST(AddOutcome, ADiskThatJoinedNothingMayBeAddedAgain) {
    const ExchangeFacts before = facts_with_new_disk();
    Aftermath after = all_joined(before);
    for (PartitionFact &fact : after.partitions)
        lose(fact, 3);
    const Outcome outcome = addition_outcome(plan_of(before), before, after, std::nullopt);
    EXPECT_EQ(outcome.word, "incomplete");
    EXPECT_EQ(outcome.findings.size(), 3U);
    ASSERT_EQ(outcome.advice.size(), 1U);
    EXPECT_NE(outcome.advice[0].find("'zavctl disk add 3' again"), std::string::npos);
}

TEST(AddOutcome, ADiskThatWasNotPreparedIsTold) {
    const ExchangeFacts before = facts_with_new_disk();
    Aftermath after = all_joined(before);
    after.content.marked = false;
    EXPECT_EQ(addition_outcome(plan_of(before), before, after, std::nullopt).findings.size(), 1U);
    after.content.partitions = {1};
    EXPECT_EQ(addition_outcome(plan_of(before), before, after, std::nullopt).findings.size(), 2U);
    after.node_present = false;
    EXPECT_EQ(addition_outcome(plan_of(before), before, after, std::nullopt).findings[0].text,
              "/dev/sata/disk3 is not there");
}

TEST(AddOutcome, ARecreationThatFailedIsTold) {
    const ExchangeFacts before = with_lost_data_array(ZAV_RAID_FAILED);
    const Plan plan = plan_of(before, {.destroy = false, .recreate = true});
    Aftermath after = all_joined(before);
    lose(after.partitions[1], 3);
    const Outcome outcome = addition_outcome(plan, before, after, std::nullopt);
    EXPECT_EQ(outcome.findings[0].text, "array 2 was not created anew");
}
