// When a disk may be taken out of service, and what that does.
#include "exchange_facts.h"

#include <cerrno>
#include <gtest/gtest.h>

using namespace zavctl;
using Words = std::vector<std::string>;
using Hold = ArrayMember::Hold;

namespace {

Plan plan_of(const ExchangeFacts &facts, const Consent &consent = {}) {
    return removal_plan(facts, consent);
}

// The data array alone, at another level.
ExchangeFacts at_level(const std::string &level) {
    ExchangeFacts facts = sound_facts();
    facts.partitions = {partition(2, level)};
    return facts;
}

ExchangeFacts with_group(ExchangeFacts facts) {
    GroupReport group;
    group.number = 1;
    group.name = "DataVG1";
    group.state = ZAV_LVM_NORMAL;
    group.lv_count = 1;
    VolumeFact volume;
    volume.report.id = {1, 2};
    volume.report.size = 3;
    volume.report.usage = 40;
    volume.report.mounted = true;
    volume.report.mount_point = "/mnt/internal/data1-2";
    facts.partitions.back().group = group;
    facts.partitions.back().volumes = {volume};
    return facts;
}

#define EXPECT_REFUSED(plan, why) EXPECT_TRUE(refused_for(plan, why)) << all_refusals(plan)

} // namespace

TEST(RemovePlan, EveryArrayLosesItsMemberFromTheLastPartitionOn) {
    const Plan plan = plan_of(sound_facts());
    EXPECT_FALSE(plan.refused()) << all_refusals(plan);
    EXPECT_EQ(words_of(plan), (Words{"take_out", "take_out", "take_out", "detach"}));
    EXPECT_EQ(plan.steps[0].array, 3);
    EXPECT_EQ(plan.steps[0].redundant_after, true);
    EXPECT_EQ(plan.steps[1].redundant_after, false); // RAID5
    EXPECT_EQ(plan.steps[1].severity, Severity::warning);
    EXPECT_EQ(plan.seconds, 5 + 3 * 3);
    EXPECT_TRUE(plan.warnings.empty());
}

TEST(RemovePlan, AHealthyDiskIsAskedAbout) {
    ExchangeFacts facts = sound_facts();
    facts.target.state = ZAV_HDD_FOUND;
    EXPECT_EQ(plan_of(facts).warnings.size(), 1U);
}

TEST(RemovePlan, ADiskThatIsInNoArrayIsOnlyDetached) {
    ExchangeFacts facts = sound_facts();
    for (PartitionFact &fact : facts.partitions)
        lose(fact, 3);
    EXPECT_EQ(words_of(plan_of(facts)), (Words{"detach"}));
}

TEST(RemovePlan, AMachineThatLacksWhatTheCommandsNeedIsRefused) {
    ExchangeFacts facts = sound_facts();
    facts.platform.shell_false.status = 0;
    EXPECT_REFUSED(plan_of(facts), "/bin/sh");
    facts = sound_facts();
    facts.platform.scsi.error = ENOENT;
    EXPECT_REFUSED(plan_of(facts), "/proc/scsi/scsi");
    facts = sound_facts();
    facts.platform.sata_hosts.clear();
    EXPECT_REFUSED(plan_of(facts), "none for slot 3");
    facts.platform.sata_hosts = {"host0", "host1"};
    EXPECT_REFUSED(plan_of(facts), "none for slot 3");
    facts = sound_facts();
    facts.platform.model.data_raid_type = -1;
    EXPECT_REFUSED(plan_of(facts), "raidtype");
    facts = sound_facts();
    facts.missing_tools = {"/sbin/mdadm"};
    EXPECT_REFUSED(plan_of(facts), "/sbin/mdadm is missing");
    facts = sound_facts();
    facts.platform.model.code = ZAV_MODEL_SOLVANE_2980;
    EXPECT_REFUSED(plan_of(facts), "RAID controller");
}

TEST(RemovePlan, WithoutALevelWordALiveMemberWouldBeDetached) {
    ExchangeFacts facts = sound_facts();
    facts.partitions[1].scan = "ARRAY /dev/md/MD1  metadata=1.2 UUID=1:2:3:4 name=appliance:MD1\n";
    EXPECT_REFUSED(plan_of(facts), "no level");
    lose(facts.partitions[1], 3); // where the disk is no member nothing is missed
    EXPECT_FALSE(plan_of(facts).refused());
}

TEST(RemovePlan, ALevelThatTheLibraryDoesNotKnowIsRefused) {
    EXPECT_REFUSED(plan_of(at_level("raid6")), "no level");
}

TEST(RemovePlan, ANameThatLeadsElsewhereIsRefused) {
    ExchangeFacts facts = sound_facts();
    facts.partitions[1].leads_to = "";
    EXPECT_REFUSED(plan_of(facts), "leads to no array");
    facts.partitions[1].leads_to = "md127";
    EXPECT_REFUSED(plan_of(facts), "leads to md127");
}

TEST(RemovePlan, TheLastHealthyDiskStays) {
    ExchangeFacts facts = sound_facts();
    facts.source = 0;
    facts.partitions.clear();
    EXPECT_REFUSED(plan_of(facts), "no other healthy disk");
}

TEST(RemovePlan, ADegradedRaid5KeepsEveryMember) {
    ExchangeFacts facts = at_level("raid5");
    lose(facts.partitions[0], 2);
    EXPECT_REFUSED(plan_of(facts), "cannot do without disk 3");
    member(facts.partitions[0], 3).hold = Hold::faulty; // which it does already
    EXPECT_FALSE(plan_of(facts).refused());
}

TEST(RemovePlan, AMirrorKeepsItsLastCopy) {
    ExchangeFacts facts = at_level("raid1");
    lose(facts.partitions[0], 1);
    lose(facts.partitions[0], 2);
    Plan plan = plan_of(facts);
    EXPECT_FALSE(plan.refused()) << all_refusals(plan);
    EXPECT_EQ(plan.steps[0].redundant_after, false);
    lose(facts.partitions[0], 4);
    EXPECT_REFUSED(plan_of(facts), "cannot do without disk 3");
}

TEST(RemovePlan, Raid10KeepsOneOfEveryPair) {
    ExchangeFacts facts = at_level("raid10");
    EXPECT_FALSE(plan_of(facts).refused());
    lose(facts.partitions[0], 2); // of the other pair
    EXPECT_FALSE(plan_of(facts).refused());
    lose(facts.partitions[0], 4); // its partner
    EXPECT_REFUSED(plan_of(facts), "cannot do without disk 3");
}

TEST(RemovePlan, ARebuildOntoAnotherDiskIsWaitedFor) {
    ExchangeFacts facts = at_level("raid10");
    member(facts.partitions[0], 2).hold = Hold::rebuilding;
    EXPECT_REFUSED(plan_of(facts), "being rebuilt");
    facts = at_level("raid5");
    facts.partitions[0].array.state = ZAV_RAID_RESYNC;
    EXPECT_REFUSED(plan_of(facts), "being rebuilt");
    member(facts.partitions[0], 3).hold = Hold::rebuilding; // onto the disk itself
    EXPECT_FALSE(plan_of(facts).refused());
}

TEST(RemovePlan, AnInconsistentSuperblockIsRefused) {
    ExchangeFacts facts = sound_facts();
    facts.partitions[0].mismatch = true;
    EXPECT_REFUSED(plan_of(facts), "mismatch");
}

TEST(RemovePlan, AVanishedDisksFaultyMembersAreTakenOut) {
    ExchangeFacts facts = sound_facts();
    facts.target = disk_report(3, ZAV_HDD_ABSENT);
    for (PartitionFact &fact : facts.partitions) {
        fact.on_target = false;
        member(fact, 3).hold = Hold::faulty;
        member(fact, 3).slot = 0;
    }
    const Plan plan = plan_of(facts);
    EXPECT_FALSE(plan.refused()) << all_refusals(plan);
    EXPECT_EQ(words_of(plan), (Words{"take_out", "take_out", "take_out"}));
    EXPECT_NE(plan.steps[1].text.find("sdc2"), std::string::npos);
}

TEST(RemovePlan, AVanishedDiskThatTheKernelStillCountsOnIsRefused) {
    ExchangeFacts facts = at_level("raid5");
    facts.target = disk_report(3, ZAV_HDD_ABSENT);
    facts.partitions[0].on_target = false;
    member(facts.partitions[0], 3).slot = 0;
    EXPECT_REFUSED(plan_of(facts), "has not noticed yet");
}

TEST(RemovePlan, AVanishedDiskThatIsInNoArrayLeavesNothingToDo) {
    ExchangeFacts facts = at_level("raid5");
    facts.target = disk_report(3, ZAV_HDD_ABSENT);
    facts.partitions[0].on_target = false;
    lose(facts.partitions[0], 3);
    EXPECT_REFUSED(plan_of(facts), "nothing is to remove");
}

TEST(RemovePlan, ADiskWithFewerPartitionsWouldBeTakenForVanished) {
    ExchangeFacts facts = sound_facts();
    facts.partitions[2].on_target = false;
    lose(facts.partitions[2], 3);
    EXPECT_NE(all_refusals(plan_of(facts)).find("lacks a partition"), std::string::npos);
    EXPECT_EQ(plan_of(facts).refusals.size(), 2U); // of arrays 2 and 1
}

TEST(RemovePlan, AnArrayWithoutRedundancyNeedsConsent) {
    for (const char *level : {"raid0", "linear"}) {
        const ExchangeFacts facts = with_group(at_level(level));
        const Plan without = plan_of(facts);
        EXPECT_REFUSED(without, "volumes 1-2 (<3 GB, 40 % used, mounted at");
        EXPECT_EQ(without.refusals[0].option, "--destroy-data");
        const Plan with = plan_of(facts, {.destroy = true, .recreate = false});
        EXPECT_FALSE(with.refused()) << all_refusals(with);
        EXPECT_EQ(words_of(with), (Words{"destroy", "detach"}));
        EXPECT_EQ(with.steps[0].severity, Severity::critical);
    }
}

TEST(RemovePlan, NoConsentHelpsWhatWouldStopHalfway) {
    const Consent all{.destroy = true, .recreate = true};
    ExchangeFacts facts = with_group(at_level("raid0"));
    facts.partitions[0].volumes[0].used_by = "bash (812)";
    EXPECT_REFUSED(plan_of(facts, all), "in use by bash (812)");
    facts = with_group(at_level("raid0"));
    facts.partitions[0].group->lv_count = 7;
    EXPECT_REFUSED(plan_of(facts, all), "7 volumes");
    facts = with_group(at_level("raid0"));
    facts.partitions[0].group->failure = Failure{128, "ZAV_RC_ERR", "a step failed"};
    EXPECT_REFUSED(plan_of(facts, all), "cannot be asked");
    facts = with_group(at_level("raid0"));
    facts.partitions[0].leads_to = "";
    EXPECT_REFUSED(plan_of(facts, all), "could not stop it");
}

TEST(RemovePlan, AGroupOnTheDiskItselfIsRefused) {
    ExchangeFacts facts = sound_facts();
    facts.groups_on_target = {"DataVG2"};
    EXPECT_REFUSED(plan_of(facts), "DataVG2 lies on the disk itself");
}

TEST(RemovePlan, WhatTheKernelHoldsAndMdadmDoesNotTellIsRefused) {
    ExchangeFacts facts = sound_facts();
    facts.memberships = {{1, "md0"}, {2, "md1"}, {3, "md2"}};
    EXPECT_FALSE(plan_of(facts).refused()) << all_refusals(plan_of(facts));
    facts.memberships.push_back({4, "md7"}); // of a partition that the healthy disk lacks
    EXPECT_REFUSED(plan_of(facts), "disk3p4 is in md7");
    facts.memberships.pop_back();
    facts.partitions[0].table = {};
    facts.partitions[0].scan = "";
    EXPECT_REFUSED(plan_of(facts), "disk3p1 is in md0");
}

TEST(RemovePlan, HostileNamesAreMadeSafe) {
    ExchangeFacts facts = sound_facts();
    facts.partitions[1].scan = "ARRAY /dev/md/\033[31m level=raid5\n";
    facts.partitions[1].leads_to = "";
    EXPECT_REFUSED(plan_of(facts), "\\x1b[31m");
}

TEST(RemoveOutcome, TheArraysDecide) {
    const ExchangeFacts before = sound_facts();
    const Plan plan = plan_of(before);
    Aftermath after;
    after.partitions = before.partitions;
    for (PartitionFact &fact : after.partitions)
        lose(fact, 3);
    EXPECT_EQ(removal_outcome(plan, before, after, std::nullopt).word, "done");
    EXPECT_TRUE(removal_outcome(plan, before, after, std::nullopt).findings.empty());

    const Failure failure{22, "ZAV_RC_ERR_EINVAL", "refused"};
    const Outcome warned = removal_outcome(plan, before, after, failure);
    EXPECT_EQ(warned.word, "done");
    ASSERT_EQ(warned.findings.size(), 1U);
    EXPECT_EQ(warned.findings[0].severity, Severity::warning);

    after.node_present = true;
    EXPECT_EQ(removal_outcome(plan, before, after, std::nullopt).word, "incomplete");
    EXPECT_EQ(removal_outcome(plan, before, after, failure).word, "failed");
}

TEST(RemoveOutcome, AMemberThatIsStillThereIsCritical) {
    const ExchangeFacts before = sound_facts();
    Aftermath after;
    after.partitions = before.partitions;
    member(after.partitions[1], 3).hold = Hold::faulty;
    member(after.partitions[1], 3).slot = 0; // its node is gone with the disk
    lose(after.partitions[0], 3);
    lose(after.partitions[2], 3);
    const Outcome outcome = removal_outcome(plan_of(before), before, after, std::nullopt);
    EXPECT_EQ(outcome.word, "incomplete");
    ASSERT_EQ(outcome.findings.size(), 1U);
    EXPECT_EQ(outcome.findings[0].text, "sdc2 is still a faulty member in array 2 (md1, RAID5)");
    EXPECT_EQ(outcome.advice, (Words{"mdadm /dev/md1 --remove faulty"}));
}

TEST(RemoveOutcome, WhatWasToBeDestroyedAndIsNotIsCritical) {
    const ExchangeFacts before = with_group(at_level("raid0"));
    const Plan plan = plan_of(before, {.destroy = true, .recreate = false});
    Aftermath after;
    after.partitions = before.partitions;
    after.groups = {0, 1};
    EXPECT_EQ(removal_outcome(plan, before, after, std::nullopt).findings.size(), 2U);
    after.partitions[0].holder = "";
    after.groups = {0};
    EXPECT_EQ(removal_outcome(plan, before, after, std::nullopt).word, "done");
}
