// Making, extending and dismantling volume groups.
#include "run.h"

TEST(RunGroup, AGroupIsMadeOnAnArrayAndDismantled) {
    const Outcome run =
        on_zav("zavctl vg add array 3 --group 2 --yes && zavctl vg show 2 --json >made && "
               "zavctl vg remove 2 --yes; status=$?; cat made >&2; vgs; pvs; exit $status");
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_TRUE(run.out.starts_with("OK: array 3 is in DataVG2")) << run.out;
    EXPECT_TRUE(holds(run.out, "OK: DataVG2 is gone\n")) << run.out;
    EXPECT_TRUE(holds(run.err, "\"path\": \"/dev/swraid/disk3p1\"")) << run.err;
    EXPECT_FALSE(holds(run.out, "  DataVG2 ")) << run.out;
    EXPECT_FALSE(holds(run.out, "/dev/md2")) << run.out;
    EXPECT_TRUE(holds(run.err, "| Volume group \"DataVG2\" successfully created")) << run.err;
}

TEST(RunGroup, AGroupIsExtended) {
    const Outcome run = on_zav("zavctl vg add /dev/swraid/disk3p1 --group 1 --yes --json");
    EXPECT_EQ(run.status, 0) << run.err;
    const nlohmann::json answer = parsed(run.out);
    EXPECT_EQ(answer["outcome"]["outcome"], "done");
    EXPECT_EQ(answer["plan"]["steps"][1]["does"], "extend");
}

TEST(RunGroup, ADryRunChangesNothing) {
    for (const char *command : {"vg add array 3 --group 2", "vg remove 1"}) {
        const Outcome run = on_zav("look() { vgs; pvs; lvs; cat /etc/mtab; }; look >a; zavctl " +
                                   std::string(command) +
                                   " --dry-run; status=$?; look >b; cmp a b && exit $status");
        EXPECT_EQ(run.status, 0) << run.out;
        EXPECT_TRUE(holds(run.out, "nothing was changed")) << run.out;
    }
}

TEST(RunGroup, ADeviceInUseIsRefused) {
    const Outcome pv = on_zav("zavctl vg add array 2 --group 2 --yes");
    EXPECT_EQ(pv.status, 2);
    EXPECT_TRUE(holds(pv.out, "it is a physical volume of group DataVG1")) << pv.out;
    const Outcome member = on_zav("zavctl vg add disk 3 --group 2 --yes");
    EXPECT_EQ(member.status, 2);
    EXPECT_TRUE(holds(member.out, "it is in use: a member of md0")) << member.out;
    EXPECT_EQ(on_zav("zavctl vg add disk 9 --group 2 --yes").status, 2);
    EXPECT_EQ(on_zav("zavctl vg add array 3 --group -1 --yes").status, 64);
    EXPECT_EQ(on_zav("zavctl vg add nothing --group 1 --yes").status, 64);
}

TEST(RunGroup, AFailedToolLeavesItsTraceInTheOutcome) {
    const Outcome run =
        on_zav("zavsim act tool vgcreate exits 5; zavctl vg add array 3 --group 2 --yes");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "array 3 is not in DataVG2")) << run.out;
    EXPECT_TRUE(holds(run.out, "pvremove /dev/swraid/disk3p1")) << run.out;
    EXPECT_TRUE(holds(run.out, "ZAV_RC_ERR")) << run.out;
}

TEST(RunGroup, ABusyVolumeIsRefusedOrToldAfterwards) {
    const Outcome seen = on_zav("cd /mnt/internal/data1-2; zavctl vg remove 1 --yes; status=$?; "
                                "lvs; exit $status");
    EXPECT_EQ(seen.status, 2);
    EXPECT_TRUE(holds(seen.out, "volume 1-2 is in use by ")) << seen.out;
    EXPECT_TRUE(holds(seen.out, "LogVol1 DataVG1")) << seen.out;
    const Outcome unseen = on_zav("zavsim act volume 1-2 is busy; zavctl vg remove 1 --yes");
    EXPECT_EQ(unseen.status, 2);
    EXPECT_TRUE(holds(unseen.out, "DataVG1 is still there, with volumes 1-2")) << unseen.out;
    EXPECT_TRUE(holds(unseen.err, "/dev/DataVG1/LogVol1 is gone")) << unseen.err;
}

TEST(RunGroup, TheSystemsGroupAndAMissingOneAreRefused) {
    const Outcome run = on_zav("zavctl vg remove 0 --yes; vgs");
    EXPECT_TRUE(holds(run.out, "--system-group")) << run.out;
    EXPECT_TRUE(holds(run.out, "  PrimaryOSVG")) << run.out;
    EXPECT_EQ(on_zav("zavctl vg remove 7 --yes").status, 2);
}

TEST(RunGroup, WithoutATerminalNothingIsDoneUnlessYes) {
    const Outcome run = on_zav("zavctl vg remove 1; echo $?; vgs");
    EXPECT_TRUE(run.out.starts_with("64\n")) << run.out;
    EXPECT_TRUE(holds(run.out, "  DataVG1 ")) << run.out;
}

TEST(RunGroup, UnderAShellThatIsNotBashNothingIsChanged) {
    EXPECT_EQ(on_zav("zavctl vg remove 1 --yes", {"--shell", "dash"}).status, 2);
    EXPECT_EQ(on_zav("zavctl vg add array 3 --group 2 --yes", {"--shell", "dash"}).status, 2);
}
