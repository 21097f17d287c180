// Taking a disk out of service and bringing another in.
#include "run.h"

namespace {

// What the machine holds, without what time alone changes.
const std::string machine = "cat /proc/mdstat /etc/mtab; ls /dev/sata /dev/swraid /dev/mapper; "
                            "vgs; lvs; pvs; ";

// Runs the command between two looks at the machine, which must be the same.
Outcome without_effect(const std::string &before, const std::string &command,
                       const std::vector<std::string> &options = {}) {
    Outcome run = on_zav(before + "look() { " + machine + " }; look >a; " + command +
                             "; status=$?; look >b; cmp a b >&2 || status=99; exit $status",
                         options);
    EXPECT_NE(run.status, 99) << run.err;
    return run;
}

constexpr const char *replaced = "zavsim act disk 3 fails; zavctl disk remove 3 --yes >/dev/null "
                                 "2>&1; zavsim act disk 3 vanishes; zavsim act disk 3 appears; ";

} // namespace

TEST(RunExchange, AFailedDiskIsTakenOut) {
    const Outcome run = on_zav("zavsim act disk 3 fails; zavctl disk remove 3 --yes; status=$?; "
                               "ls /dev/sata | grep disk3; cat /proc/mdstat; exit $status");
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_TRUE(run.out.starts_with("OK: disk 3 is out of arrays 1, 2 and 3; it can be pulled "
                                    "out\nPersonalities"))
        << run.out;
    EXPECT_FALSE(holds(run.out, "sdc")) << run.out;
    EXPECT_TRUE(holds(run.err, "array 2 (md1, RAID5): disk3p2 (faulty) is taken out")) << run.err;
    EXPECT_TRUE(holds(run.err, " s  disk3p2 is out of md1\n")) << run.err;
    EXPECT_TRUE(holds(run.err, " s  /dev/sata/disk3 is gone\n")) << run.err;
}

TEST(RunExchange, AHealthyDiskIsTakenOutWithAWarning) {
    const Outcome run = on_zav("zavctl disk remove 3 --yes --json");
    EXPECT_EQ(run.status, 0) << run.err;
    const nlohmann::json answer = parsed(run.out);
    EXPECT_EQ(answer["outcome"]["outcome"], "done");
    EXPECT_EQ(answer["plan"]["steps"].size(), 4U);
    EXPECT_EQ(answer["plan"]["steps"][1]["redundant_after"], false);
    EXPECT_EQ(answer["plan"]["warnings"].size(), 1U);
}

TEST(RunExchange, ANewDiskJoinsTheArrays) {
    const Outcome run = on_zav(replaced + std::string("zavctl disk add 3 --yes; status=$?; "
                                                      "zavctl array list --json; exit $status"));
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_TRUE(run.out.starts_with("OK: disk 3 is in arrays 1, 2 and 3.")) << run.out;
    EXPECT_TRUE(holds(run.err, " s  disk3p2 is in md1\n")) << run.err;
    const nlohmann::json answer = parsed(run.out.substr(run.out.find('{')));
    for (const nlohmann::json &array : answer["arrays"])
        EXPECT_EQ(array["members"][2]["state"], "active") << array;
}

TEST(RunExchange, AVanishedDiskIsTakenOutAndAnEmptySlotIsTold) {
    const Outcome run = on_zav("zavsim act disk 3 vanishes; zavctl disk remove 3 --yes && "
                               "zavctl disk add 3 --yes; status=$?; ls /dev/sata/disk3; "
                               "exit $status");
    EXPECT_EQ(run.status, 2) << run.err;
    EXPECT_TRUE(holds(run.out, "OK: disk 3 is out of arrays 1, 2 and 3")) << run.out;
    EXPECT_TRUE(holds(run.out, "no disk appeared in slot 3")) << run.out;
    EXPECT_TRUE(holds(run.err, "cannot access '/dev/sata/disk3'")) << run.err; // not made as a file
}

TEST(RunExchange, ADetachedDiskIsAttachedAndAdded) {
    const Outcome run = on_zav("zavctl disk remove 3 --yes >/dev/null; zavctl disk add 3 --yes");
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_TRUE(holds(run.err, " s  /dev/sata/disk3 is there\n")) << run.err;
}

TEST(RunExchange, ADryRunChangesNothing) {
    for (const char *verb : {"remove 3", "remove 3 --json"}) {
        const Outcome run = without_effect("zavsim act disk 3 fails; ",
                                           std::string("zavctl disk ") + verb + " --dry-run");
        EXPECT_EQ(run.status, 0) << run.out;
    }
    const Outcome add = without_effect(replaced, "zavctl disk add 3 --dry-run --json");
    EXPECT_EQ(parsed(add.out)["outcome"]["outcome"], "dry_run");
    EXPECT_EQ(parsed(add.out)["plan"]["steps"][0]["does"], "wipe");
}

TEST(RunExchange, WithoutATerminalNothingIsDoneUnlessYes) {
    const Outcome run = without_effect("", "echo y | zavctl disk remove 3");
    EXPECT_EQ(run.status, 64);
    EXPECT_EQ(run.out, "");
    EXPECT_TRUE(holds(run.err, "--yes")) << run.err;
}

TEST(RunExchange, AtATerminalTheAnswerDecides) {
    const std::string at_terminal = "TERM=dumb script -qec 'zavctl disk remove 3' /dev/null";
    const Outcome no = without_effect("", "echo n | " + at_terminal + " | tail -n 1");
    EXPECT_TRUE(holds(no.out, "not confirmed, nothing was changed")) << no.out;
    const Outcome yes = on_zav("echo y | " + at_terminal);
    EXPECT_TRUE(holds(yes.out, "OK: disk 3 is out of arrays 1, 2 and 3")) << yes.out;
}

TEST(RunExchange, ASlotThatTheModelLacksIsWrongUsage) {
    EXPECT_EQ(on_zav("zavctl disk remove 5 --yes").status, 64);
    EXPECT_EQ(on_zav("zavctl disk add 0 --yes").status, 64);
}

TEST(RunExchange, TodaysToolsAreRefused) {
    const Outcome remove = without_effect("", "zavctl disk remove 3 --yes", {"--tools", "current"});
    EXPECT_EQ(remove.status, 2);
    EXPECT_TRUE(holds(remove.out, "mdadm tells no level for disk1p2")) << remove.out;
    const Outcome add = without_effect("zavsim act disk 3 vanishes; zavsim act disk 3 appears; ",
                                       "zavctl disk add 3 --yes", {"--tools", "current"});
    EXPECT_EQ(add.status, 2);
    EXPECT_TRUE(holds(add.out, "mdadm tells no level for disk1p2")) << add.out;
}

TEST(RunExchange, AMachineThatWouldMissTheDiskIsRefused) {
    const auto refusal = [](const std::string &before, std::vector<std::string> options = {}) {
        const Outcome run = without_effect(before, "zavctl disk remove 3 --yes", options);
        EXPECT_EQ(run.status, 2) << before;
        return run.out;
    };
    EXPECT_TRUE(holds(refusal("", {"--hosts", "ata"}), "none for slot 3"));
    EXPECT_TRUE(holds(refusal("", {"--shell", "dash"}), "/bin/sh"));
    EXPECT_TRUE(holds(refusal("rm /etc/Kiru/raidtype; "), "raidtype"));
}

TEST(RunExchange, ASilentMdadmDoesNotLetALiveMemberBeDetached) {
    for (const char *fault : {"exits 1", "prints '\"\\n\"'", "prints '\"garbage\\n\"'"}) {
        const Outcome run = without_effect(
            std::string("zavsim act tool mdadm ") + fault + "; ",
            "zavctl disk remove 3 --yes; status=$?; zavctl disk add 3 --yes --recreate || "
            "exit $status");
        EXPECT_EQ(run.status, 2) << fault << run.out;
        EXPECT_TRUE(holds(run.out, "disk3p1 is in md0, but mdadm does not tell")) << run.out;
    }
}

TEST(RunExchange, AMissingToolIsRefusedBeforeTheDiskIsWiped) {
    for (const char *tool : {"udevinfo", "sfdisk", "dd"}) {
        const Outcome run =
            without_effect(replaced + std::string("zavsim act tool ") + tool + " is missing; ",
                           "zavctl disk add 3 --yes");
        EXPECT_EQ(run.status, 2);
        EXPECT_TRUE(holds(run.out, "missing")) << run.out;
    }
}

TEST(RunExchange, ADiskWhoseTableIsNotCopiedJoinsNothing) {
    const Outcome run =
        on_zav(replaced + std::string("zavsim act tool sfdisk exits 1; zavctl disk add 3 --yes"));
    EXPECT_EQ(run.status, 2) << run.err;
    EXPECT_TRUE(holds(run.out, "its table was not copied")) << run.out;
    EXPECT_TRUE(holds(run.out, "disk3p2 did not join array 2 (md1, RAID5)")) << run.out;
    EXPECT_TRUE(holds(run.out, "run 'zavctl disk add 3' again")) << run.out;
}

TEST(RunExchange, AnArrayThatNeedsTheDiskKeepsIt) {
    const Outcome run = without_effect("zavsim act disk 2 vanishes; zavctl disk remove 2 --yes "
                                       ">/dev/null 2>&1; ",
                                       "zavctl disk remove 3 --yes --json");
    EXPECT_EQ(run.status, 2);
    const nlohmann::json answer = parsed(run.out);
    EXPECT_EQ(answer["outcome"]["outcome"], "refused");
    ASSERT_EQ(answer["plan"]["refusals"].size(), 1U);
    EXPECT_TRUE(holds(answer["plan"]["refusals"][0]["text"], "cannot do without disk 3"));
}

TEST(RunExchange, ARebuildIsWaitedFor) {
    const Outcome run = on_zav(replaced + std::string("zavctl disk add 3 --yes >/dev/null 2>&1; "
                                                      "zavctl disk remove 2 --yes"),
                               {"--time-scale", "20"});
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "is being rebuilt")) << run.out;
}

TEST(RunExchange, Raid10LosesOneOfAPairAndNotItsPartner) {
    const std::vector<std::string> raid10 = {"--level", "raid10"};
    const Outcome run = on_zav("zavctl disk remove 3 --yes && zavctl disk remove 4 --yes", raid10);
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "OK: disk 3 is out of arrays")) << run.out;
    EXPECT_TRUE(holds(run.out, "array 2 (md1, RAID10) cannot do without disk 4")) << run.out;
}

TEST(RunExchange, VolumesWithoutRedundancyAreDestroyedWithConsentOnly) {
    const std::vector<std::string> raid0 = {"--level", "raid0"};
    const Outcome without = without_effect("", "zavctl disk remove 3 --yes", raid0);
    EXPECT_EQ(without.status, 2);
    EXPECT_TRUE(holds(without.out, "--destroy-data")) << without.out;
    const Outcome with = on_zav("zavctl disk remove 3 --yes --destroy-data; status=$?; vgs; "
                                "exit $status",
                                raid0);
    EXPECT_EQ(with.status, 0) << with.err;
    EXPECT_TRUE(holds(with.out, "destroyed: array 2")) << with.out;
    EXPECT_FALSE(holds(with.out, "DataVG1")) << with.out;
}

TEST(RunExchange, ABusyVolumeIsRefusedOrToldAfterwards) {
    const std::vector<std::string> raid0 = {"--level", "raid0"};
    const Outcome seen =
        without_effect("cd /mnt/internal/data1-1; ",
                       "zavctl disk remove 3 --yes --destroy-data 2>/tmp/here/err", raid0);
    EXPECT_EQ(seen.status, 2);
    EXPECT_TRUE(holds(seen.out, "volume 1-1 is in use by ")) << seen.out;
    const Outcome unseen = on_zav("zavsim act volume 1-1 is busy; "
                                  "zavctl disk remove 3 --yes --destroy-data",
                                  raid0);
    EXPECT_EQ(unseen.status, 2);
    EXPECT_TRUE(holds(unseen.out, "array 2 (md1, RAID0) is still running")) << unseen.out;
    EXPECT_TRUE(holds(unseen.out, "ZAV_RC_ERR_EBUSY")) << unseen.out;
}

TEST(RunExchange, AFailedDataArrayIsCreatedAnewWithConsentOnly) {
    const std::string lost = "for n in 3 4; do zavsim act disk $n vanishes; done; "
                             "for n in 3 4; do zavsim act disk $n appears; done; ";
    const Outcome without = without_effect(lost, "zavctl disk add 3 --yes");
    EXPECT_EQ(without.status, 2);
    EXPECT_TRUE(holds(without.out, "CREATED ANEW")) << without.out;
    EXPECT_TRUE(holds(without.out, "--recreate")) << without.out;
}

TEST(RunExchange, ADestroyedDataArrayComesBackEmptyWithConsent) {
    const Outcome run =
        on_zav("zavctl disk remove 3 --yes --destroy-data >/dev/null 2>&1; "
               "zavctl disk add 3 --yes; zavctl disk add 3 --yes --recreate; status=$?; "
               "zavctl vg show 1 >/dev/null && exit $status",
               {"--level", "raid0"});
    EXPECT_EQ(run.status, 0) << run.out << run.err;
    EXPECT_TRUE(holds(run.out, "--recreate makes it anew")) << run.out;
    EXPECT_TRUE(holds(run.out, "OK: disk 3 is in arrays 1, 2 and 3.")) << run.out;
    EXPECT_TRUE(holds(run.err, " s  md1 runs\n")) << run.err;
}

TEST(RunExchange, AnInterruptDoesNotStopAChange) {
    const Outcome run = on_zav("zavsim act disk 3 fails; zavctl disk remove 3 --yes & pid=$!; "
                               "until ! grep -q sdc3 /proc/mdstat; do :; done; "
                               "kill -INT $pid; kill -TERM $pid; kill -HUP $pid; wait $pid",
                               {"--time-scale", "5"});
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_TRUE(holds(run.out, "OK: disk 3 is out of arrays 1, 2 and 3")) << run.out;
    EXPECT_TRUE(holds(run.err, "zavctl: the change is finished first")) << run.err;
}

TEST(RunExchange, TheHardwareRaidModelHasNoSuchDisks) {
    EXPECT_EQ(on_zav("zavctl disk remove 1 --yes", {"--model", "2980"}).status, 2);
    EXPECT_EQ(on_zav("zavctl disk add 1 --yes", {"--model", "2980"}).status, 2);
}
