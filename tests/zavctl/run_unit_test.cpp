// Disks, arrays and expansion units of the hardware-RAID model.
#include "run.h"

namespace {

const std::vector<std::string> five_units = {"--model", "2980", "--units", "5"};

Outcome on_cascade(const std::string &script) {
    return on_zav(script, five_units);
}

nlohmann::json status_after(const std::string &script) {
    return parsed(on_cascade(script + " zavctl status --json").out);
}

} // namespace

TEST(RunUnit, TheTreeIsDrawnInTheCharactersOfTheLocale) {
    const Outcome ascii = on_cascade("unset LC_CTYPE LANG; LC_ALL=C zavctl unit list");
    EXPECT_EQ(ascii.status, 0) << ascii.out << ascii.err;
    EXPECT_TRUE(holds(ascii.out, "    RAID controller")) << ascii.out;
    EXPECT_TRUE(holds(ascii.out, "    `-- unit 1          HBQE-T500  HQ25U00301  present  45.0 C "
                                 "normal  1.20 V normal"))
        << ascii.out;
    EXPECT_TRUE(holds(ascii.out, "        |   `-- unit 5  ")) << ascii.out;
    EXPECT_TRUE(holds(ascii.out, "OK: 5 expansion units present\n")) << ascii.out;
    const Outcome unicode = on_cascade("LC_ALL=C.UTF-8 zavctl unit list");
    EXPECT_TRUE(holds(unicode.out, "        │   └── unit 5  ")) << unicode.out;
}

TEST(RunUnit, TheJsonTellsUnitsAndController) {
    const nlohmann::json json = parsed(on_cascade("zavctl unit list --json").out);
    EXPECT_EQ(json["controller"]["raid_set"]["name"], "MAINSET");
    EXPECT_EQ(json["controller"]["readings"].size(), 4U);
    ASSERT_EQ(json["units"].size(), 5U);
    const nlohmann::json unit = json["units"][1];
    EXPECT_EQ(unit["unit"], 2);
    EXPECT_EQ(unit["parent"], 1);
    EXPECT_EQ(unit["upper_child"], 4);
    EXPECT_EQ(unit["temperature"]["value"], 46.0);
    EXPECT_EQ(unit["voltage"]["value"], 1.2);
    EXPECT_EQ(unit["raid_set"]["name"], "UNIT2SET");
    EXPECT_EQ(unit["disks"].size(), 4U);
}

TEST(RunUnit, ShowTellsTheReadingsAndTheRaidSet) {
    const Outcome run = on_cascade("zavctl unit show 2");
    EXPECT_EQ(run.status, 0) << run.out;
    EXPECT_TRUE(holds(run.out, "Hangs on                  unit 1")) << run.out;
    EXPECT_TRUE(holds(run.out, "Reading 4 (processor, V)  1.20")) << run.out;
    EXPECT_TRUE(holds(run.out, "\"UNIT2VOL\" RAID10 2000.4 status 1 (normal)")) << run.out;
}

TEST(RunUnit, AUnitThatIsNotThereIsCritical) {
    const Outcome run = on_cascade("zavctl unit show 7");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "CRITICAL: unit 7 is not there\n")) << run.out;
}

TEST(RunUnit, AVanishedUnitTakesItsChildrenWithIt) {
    const Outcome run = on_cascade("zavsim act unit 2 vanishes; zavctl unit list --json");
    EXPECT_EQ(parsed(run.out)["units"].size(), 2U) << run.out;
    const Outcome shown = on_cascade("zavsim act unit 2 vanishes; zavctl unit show 4");
    EXPECT_EQ(shown.status, 2);
}

TEST(RunUnit, TemperatureAndVoltageHaveTheirSeverity) {
    const Outcome warm = on_cascade("zavsim act unit 2 temperature 78; zavctl unit list");
    EXPECT_EQ(warm.status, 1);
    EXPECT_TRUE(holds(warm.out, "unit 2 has temperature 78.0 C (warning)")) << warm.out;
    const Outcome hot = on_cascade("zavsim act unit 2 temperature 88; zavctl status");
    EXPECT_EQ(hot.status, 2);
    EXPECT_TRUE(holds(hot.out, "unit 2 has temperature 88.0 C (alarm)")) << hot.out;
    const Outcome low = on_cascade("zavsim act unit 3 voltage 0.9; zavctl unit show 3");
    EXPECT_EQ(low.status, 2);
    EXPECT_TRUE(holds(low.out, "unit 3 has voltage 0.90 V (alarm)")) << low.out;
}

TEST(RunUnit, ALostLinkCannotBeToldAndIsSaidOnce) {
    const nlohmann::json json = status_after("zavsim act unit 3 loses its link;");
    EXPECT_EQ(json["exit_status"], 3);
    ASSERT_EQ(json["findings"].size(), 1U) << json["findings"];
    EXPECT_TRUE(holds(json["findings"][0]["text"], "the expansion units cannot be told"));
    EXPECT_EQ(json["disks"].size(), 4U);
}

TEST(RunUnit, AMissingScriptIsNotTakenForNoUnits) {
    const Outcome run = on_cascade("zavsim act tool query_sas.sh is missing; zavctl unit list");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "/usr/bin/query_sas.sh is missing")) << run.out;
}

TEST(RunUnit, AScriptThatHangsIsLeftAfterTheTimeLimit) {
    const Outcome run = on_cascade("zavsim act tool query_sas.sh hangs 100000s; "
                                   "zavctl status --timeout 2 --json");
    const nlohmann::json json = parsed(run.out);
    EXPECT_EQ(json["exit_status"], 3);
    EXPECT_TRUE(holds(json["summary"], "no answer within 2 s")) << json["summary"];
    EXPECT_EQ(json["disks"][0]["state"], "found");
}

TEST(RunUnit, WithoutUnitsNothingIsWrong) {
    const Outcome run = on_zav("zavctl unit list", {"--model", "2980", "--units", "0"});
    EXPECT_EQ(run.status, 0);
    EXPECT_TRUE(holds(run.out, "OK: 0 expansion units present\n")) << run.out;
}

TEST(RunUnit, OtherModelsHaveNone) {
    const Outcome run = on_zav("zavctl unit list");
    EXPECT_EQ(run.status, 64);
    EXPECT_TRUE(holds(run.err, "has no expansion units")) << run.err;
    EXPECT_EQ(on_zav("zavctl disk show 2-3").status, 64);
    EXPECT_EQ(on_zav("zavctl array show /dev/sasraid/r2disk1").status, 64);
}

TEST(RunEnclosure, AHealthyCascadeIsShownAndExitsWithZero) {
    const Outcome run = on_cascade("zavctl status");
    EXPECT_EQ(run.status, 0) << run.out << run.err;
    EXPECT_TRUE(holds(run.out, "\nExpansion units\n")) << run.out;
    EXPECT_TRUE(holds(run.out, "    1     found  500.1   /dev/hwsata/disk1\n")) << run.out;
    EXPECT_TRUE(holds(run.out, "    5-4   found  1000.2  /dev/sas/r5disk4\n")) << run.out;
    EXPECT_TRUE(holds(run.out, "    2-1 UNIT2VOL  RAID10  normal  2000.4  r2disk1 r2disk2 r2disk3 "
                               "r2disk4\n"))
        << run.out;
    EXPECT_TRUE(holds(run.out, "OK: 5 expansion units present, 24 disks found, 7 arrays normal"))
        << run.out;
}

TEST(RunEnclosure, AFailedDiskOfAUnitIsCriticalAndItsArrayDegraded) {
    const nlohmann::json json = status_after("zavsim act unit 2 disk 3 fails;");
    EXPECT_EQ(json["summary"], "CRITICAL: disk 2-3 has failed; array 2-1 is degraded");
}

TEST(RunEnclosure, AVanishedDiskOfTheControllerIsAbsent) {
    const nlohmann::json json = status_after("zavsim act disk 3 vanishes;");
    EXPECT_EQ(json["disks"][2]["state"], "absent");
    EXPECT_EQ(json["disks"][2]["severity"], "critical");
}

TEST(RunEnclosure, ARebuildHasItsProgress) {
    const Outcome run = on_cascade("zavsim act unit 2 volume rebuilds; zavctl array show 2-1 "
                                   "--json");
    EXPECT_EQ(run.status, 1) << run.out;
    const nlohmann::json array = parsed(run.out)["arrays"][0];
    EXPECT_EQ(array["state"], "resync");
    EXPECT_TRUE(array["rebuild_percent"].is_number());
    EXPECT_EQ(array["volume_name"], "UNIT2VOL");
}

TEST(RunEnclosure, AFailedVolumeOfTheControllerIsCritical) {
    const Outcome run = on_cascade("zavsim act controller volume 2 fails; zavctl array list");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "array 2 has failed")) << run.out;
}

TEST(RunEnclosure, ItsPathNamesADiskAndAnArray) {
    const Outcome run = on_cascade("zavctl disk show /dev/sas/r2disk3 2-3 --json; "
                                   "zavctl array show /dev/sasraid/r2disk1 --jsonl");
    EXPECT_TRUE(holds(run.out, "\"id\":\"2-1\"")) << run.out;
    const nlohmann::json disks = parsed(run.out.substr(0, run.out.rfind("\n}\n") + 3))["disks"];
    ASSERT_EQ(disks.size(), 2U);
    EXPECT_EQ(disks[0], disks[1]);
}

TEST(RunEnclosure, AUnitThatIsNotThereHasNoEmptySlots) {
    const Outcome run = on_cascade("zavctl disk show 7-1");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "has no section of unit 7")) << run.out;
}

TEST(RunEnclosure, AMissingReportCannotBeTold) {
    const Outcome run = on_cascade("zavsim act report is missing; zavctl disk list --json");
    EXPECT_EQ(run.status, 3);
    const nlohmann::json disk = parsed(run.out)["disks"][0];
    EXPECT_EQ(disk["state"], "unknown");
    EXPECT_EQ(disk["error"]["name"], "ZAV_RC_ERR_READINFOFAIL");
}

TEST(RunEnclosure, ATruncatedReportHidesEnclosuresNotDisks) {
    const nlohmann::json json = status_after("zavsim act report is truncated;");
    EXPECT_EQ(json["exit_status"], 3) << json["summary"];
    const nlohmann::json last = json["disks"].back();
    EXPECT_EQ(last["id"], "5-4");
    EXPECT_EQ(last["severity"], "unknown");
    EXPECT_FALSE(last["doubt"].is_null());
}

TEST(RunEnclosure, GarbageIsNeverWell) {
    const nlohmann::json json = status_after("zavsim act report is garbled;");
    EXPECT_NE(json["exit_status"], 0) << json["summary"];
}

TEST(RunEnclosure, ChangesAreForSoftwareRaidAlone) {
    for (const char *change : {"disk remove 3", "disk add 3", "vg add array 2 --group 2",
                               "vg add /dev/hwraid/disk2 --group 2", "vg remove 1"}) {
        const Outcome run = on_cascade("zavctl " + std::string(change) + " --yes");
        EXPECT_EQ(run.status, 2) << change;
        EXPECT_TRUE(holds(run.out + run.err, "are the RAID controller's")) << run.out << run.err;
    }
}

TEST(RunReport, TheAppliancesOwnReportIsClean) {
    const Outcome run = on_cascade("zavctl report check");
    EXPECT_EQ(run.status, 0) << run.out;
    EXPECT_TRUE(holds(run.out, "unit 2: volume 1 \"UNIT2VOL\" RAID10 2000.4 status 1 (normal)\n"))
        << run.out;
}

TEST(RunReport, ADamagedReportIsTold) {
    const Outcome run = on_cascade("zavsim act report is garbled; zavctl report check --json");
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(parsed(run.out)["severity"], "critical");
}

TEST(RunReport, StandardInputIsReadOnAnyMachine) {
    const Outcome run =
        on_zav("printf 'PCI\\nR:1:A:1:1:1:0\\nD:1:1:1\\nH:1:2:3:4\\n' | zavctl report check -");
    EXPECT_EQ(run.status, 0) << run.out;
    EXPECT_TRUE(holds(run.out, "the controller: disk 1 1.0 status 1 (found)")) << run.out;
}

TEST(RunReport, AFileThatCannotBeReadCannotBeTold) {
    const Outcome run = on_zav("zavctl report check /nowhere");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "/nowhere: No such file or directory")) << run.out;
}

TEST(RunDoctor, TheHardwareRaidModelNeedsReportAndScript) {
    const auto severity_of = [](const std::string &script, const std::string &name) {
        const nlohmann::json answer = parsed(on_cascade(script + " zavctl doctor --json").out);
        for (const auto &check : answer["checks"])
            if (check["check"] == name)
                return check["severity"].get<std::string>();
        return std::string("none");
    };
    EXPECT_EQ(severity_of("", "raid-report"), "ok");
    EXPECT_EQ(severity_of("", "query_sas.sh"), "ok");
    EXPECT_EQ(severity_of("zavsim act report is missing;", "raid-report"), "critical");
    EXPECT_EQ(severity_of("zavsim act tool query_sas.sh is missing;", "query_sas.sh"), "critical");
}
