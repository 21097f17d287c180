// What is shown of volume groups, logical and physical volumes.
#include "run.h"

namespace {

nlohmann::json volume(const std::string &script, const std::string &id) {
    const Outcome run = on_zav(script + " zavctl lv show " + id + " --json");
    return parsed(run.out)["logical_volumes"][0];
}

} // namespace

TEST(RunVolume, TheJsonHoldsEveryField) {
    const nlohmann::json group = parsed(on_zav("zavctl vg show 1 --json").out)["volume_groups"][0];
    EXPECT_EQ(group["kind"], "volume_group");
    EXPECT_EQ(group["name"], "DataVG1");
    EXPECT_EQ(group["state"], "normal");
    EXPECT_EQ(group["physical_volumes"], 1);
    EXPECT_EQ(group["logical_volumes"], 2);
    EXPECT_EQ(group["devices"][0]["path"], "/dev/swraid/disk2p1");
    const nlohmann::json lv = volume("", "/dev/DataVG1/LogVol2");
    EXPECT_EQ(lv["volume"], "1-2");
    EXPECT_EQ(lv["state_bits"], 0);
    EXPECT_EQ(lv["mount_point"], "/mnt/internal/data1-2");
    EXPECT_EQ(lv["mounted"], true);
    EXPECT_TRUE(lv["usage_percent"].is_number());
    EXPECT_EQ(lv["error"], nullptr);
    const nlohmann::json pv = parsed(on_zav("zavctl pv show 0-1 --json").out);
    EXPECT_EQ(pv["physical_volumes"][0]["device"]["path"], "/dev/swraid/disk1p1");
    EXPECT_EQ(pv["exit_status"], 0);
}

TEST(RunVolume, AFullVolumeIsAWarning) {
    const nlohmann::json lv = volume("zavsim act volume 1-2 fills 95%;", "1-2");
    EXPECT_EQ(lv["state"], "full");
    EXPECT_EQ(lv["severity"], "warning");
    const Outcome run = on_zav("zavsim act volume 1-2 fills 95%; zavctl status");
    EXPECT_EQ(run.status, 1);
    EXPECT_TRUE(holds(run.out, " !  1-2 DataVG1/LogVol2      full    <1 GB  95 %")) << run.out;
    EXPECT_TRUE(holds(run.out, "WARNING: volume 1-2 is 95 % full\n")) << run.out;
}

TEST(RunVolume, AnInactiveVolumeIsAWarningOfItsGroupToo) {
    const Outcome run = on_zav("zavsim act volume 1-2 is inactive; zavctl status --json");
    EXPECT_EQ(run.status, 1);
    const nlohmann::json answer = parsed(run.out);
    EXPECT_EQ(answer["volume_groups"][1]["state"], "inactive");
    EXPECT_EQ(answer["logical_volumes"][3]["state"], "inactive");
    EXPECT_EQ(answer["logical_volumes"][3]["usage_percent"], nullptr);
}

TEST(RunVolume, AVolumeThatIsNotMountedIsWellButNotMeasured) {
    const nlohmann::json lv = volume("umount /mnt/internal/data1-2;", "1-2");
    EXPECT_EQ(lv["state"], "normal");
    EXPECT_EQ(lv["mounted"], false);
    EXPECT_EQ(lv["usage_percent"], nullptr);
    EXPECT_EQ(lv["note"], "not mounted");
    const nlohmann::json gone =
        volume("umount /mnt/internal/data1-2; rmdir /mnt/internal/data1-2;", "1-2");
    EXPECT_EQ(gone["state"], "normal");
    EXPECT_EQ(gone["error"]["code"], 0x2801);
    EXPECT_EQ(gone["severity"], "ok");
}

TEST(RunVolume, AVolumeThatDoesNotExistIsCritical) {
    const Outcome run = on_zav("zavctl lv show 1-3");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "missing")) << run.out;
}

TEST(RunVolume, AMissingGroupIsAWarningWhereThereAreArrays) {
    const std::string without =
        "for n in 1 2; do umount /mnt/internal/data1-$n; lvremove -f /dev/DataVG1/LogVol$n; done "
        ">/dev/null; vgremove DataVG1 >/dev/null; zavctl vg list";
    const Outcome run = on_zav(without);
    EXPECT_EQ(run.status, 1);
    EXPECT_TRUE(holds(run.out, "WARNING: volume group DataVG1 does not exist\n")) << run.out;
    EXPECT_EQ(on_zav("zavctl vg list", {"--model", "2740"}).status, 0);
}

TEST(RunVolume, AFailedArrayFailsItsPhysicalVolume) {
    const Outcome run = on_zav("zavsim act disk 3 vanishes; zavsim act disk 4 vanishes; "
                               "zavctl pv show 1-1 --json");
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(parsed(run.out)["physical_volumes"][0]["state"], "failed");
}

TEST(RunVolume, WithoutAToolNothingIsTold) {
    const Outcome run = on_zav("zavsim act tool lvdisplay is missing; zavctl lv list");
    EXPECT_EQ(run.status, 3);
    const Outcome group = on_zav("zavsim act tool lvdisplay is missing; zavctl vg show 1");
    EXPECT_EQ(group.status, 3);
    EXPECT_TRUE(holds(group.out, "/usr/sbin/lvdisplay is missing")) << group.out;
}

TEST(RunVolume, UnderAShellThatIsNotBashNothingIsBelieved) {
    EXPECT_EQ(on_zav("zavctl vg list", {"--shell", "dash"}).status, 3);
    EXPECT_EQ(on_zav("zavctl lv show 1-1", {"--shell", "dash"}).status, 3);
}

TEST(RunVolume, ADeviceWithoutAnAddressCannotBeTold) {
    const Outcome run = on_zav("zavsim act tool udevinfo is missing; zavctl vg show 1");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "unknown")) << run.out;
}

TEST(RunVolume, ManyAtOnceDoNotDisturbEachOther) {
    const Outcome run =
        on_zav("for i in {1..6}; do { zavctl status --timeout 600 >/dev/null; echo $?; } & done; "
               "wait");
    EXPECT_EQ(run.out, "0\n0\n0\n0\n0\n0\n");
}
