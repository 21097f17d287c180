// Temperatures, voltages and fans of the simulated appliance.
#include "run.h"

TEST(RunSensor, ACoolMachineIsWell) {
    const Outcome run = on_zav("zavctl sensor list");
    EXPECT_EQ(run.status, 0) << run.out << run.err;
    EXPECT_TRUE(holds(run.out, "    SENSOR     VALUE ")) << run.out;
    EXPECT_TRUE(holds(run.out, "OK: 12 sensors normal\n")) << run.out;
}

TEST(RunSensor, AHotProbeIsCritical) {
    const Outcome run = on_zav("zavsim act temperature 1 is 78; zavctl sensor list");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "CRITICAL: sensor thermal-1 (LT) reads 78.0 C (critical)\n"))
        << run.out;
}

TEST(RunSensor, AWarmProbeIsAWarning) {
    const Outcome run = on_zav("zavsim act voltage 3 is 5.6; zavctl sensor show volt-3 --json");
    EXPECT_EQ(run.status, 1);
    EXPECT_EQ(parsed(run.out)["sensors"][0]["value"], 5.6) << run.out;
}

TEST(RunSensor, ALatchedAlarmStaysUntilItIsReset) {
    const Outcome run =
        on_zav("zavsim act temperature 2 latches; zavctl sensor show thermal-2 --json; "
               "zavctl sensor reset thermal-2 >/dev/null; echo $?; zavctl sensor list");
    EXPECT_TRUE(holds(run.out, "\"latched\": true")) << run.out;
    EXPECT_TRUE(holds(run.out, "\n0\n")) << run.out;
    EXPECT_EQ(run.status, 0) << run.out;
}

TEST(RunSensor, ResetOfAProbeThatIsStillHotIsCritical) {
    const Outcome run = on_zav("zavsim act temperature 1 is 78; zavsim act temperature 1 latches; "
                               "zavctl sensor reset --all");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "thermal-1  cleared  78.0 C   critical")) << run.out;
    EXPECT_TRUE(holds(run.out, "volt-5     cleared")) << run.out;
}

TEST(RunSensor, AProbeThatReportsAFaultIsNotBelieved) {
    const Outcome run = on_zav("zavsim act temperature 1 faults; zavctl sensor list");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "the probe may be faulty")) << run.out;
}

TEST(RunSensor, AFanThatStandsStillIsCritical) {
    const Outcome run =
        on_zav("zavsim act fan 2 stops; zavsim act fan 4 stops; zavctl sensor list");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(holds(run.out, "sensor fan-2 reads 0 rpm (critical)")) << run.out;
    EXPECT_TRUE(holds(run.out, "sensor fan-4 reads still (critical)")) << run.out;
}

TEST(RunSensor, WithoutTheDriverNothingCanBeTold) {
    const Outcome run = on_zav("zavctl sensor list --json", {"--bare"});
    EXPECT_EQ(run.status, 3);
    const nlohmann::json json = parsed(run.out);
    EXPECT_EQ(json["findings"].size(), 2U) << json["findings"]; // fan 4 has a line of its own
    EXPECT_EQ(json["sensors"].size(), 12U);
    EXPECT_TRUE(json["sensors"][0]["value"].is_null());
    EXPECT_EQ(json["sensors"][0]["error"]["name"], "ZAV_RC_ERR_EACCES");
}

TEST(RunSensor, AFileThatIsMissingIsNamed) {
    const Outcome run = on_zav("zavsim act sensor 2 is missing; zavctl sensor list");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "/proc/zav/sys/sensor/tempRT1")) << run.out;
    EXPECT_TRUE(holds(run.out, "COULD NOT TELL: sensor thermal-2 gives no answer to trust\n"))
        << run.out;
}

TEST(RunSensor, TheControllersThermometerIsAskedOnItsModel) {
    const Outcome run =
        on_zav("zavctl sensor show thermal-4 --json", {"--model", "2980", "--units", "1"});
    EXPECT_EQ(run.status, 0) << run.out;
    EXPECT_EQ(parsed(run.out)["sensors"][0]["place"], "RAID controller");
    const Outcome foreign = on_zav("zavctl sensor show thermal-4");
    EXPECT_EQ(foreign.status, 64);
    EXPECT_TRUE(holds(foreign.err, "has no thermal-4")) << foreign.err;
}

TEST(RunSensor, WhatLatchesNoAlarmCannotBeReset) {
    for (const char *words : {"fan-1", "thermal-4", "thermal-9", "", "--all volt-1"})
        EXPECT_EQ(on_zav("zavctl sensor reset " + std::string(words)).status, 64) << words;
}
