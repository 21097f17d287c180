// The driver's files as programs meet them: read, written, put back.
#include "sim_runner.hpp"

#include <gtest/gtest.h>

namespace {

// A script that stands in the driver's directory. until COMMAND... waits for the model's tick.
Outcome at_the_driver(const std::string &script, std::vector<std::string> options = {}) {
    return on_appliance("cd /proc/zav/sys\n" + script, std::move(options));
}

Outcome library(const std::string &script, std::vector<std::string> options = {}) {
    return on_appliance("probe=" HEALTH_PROBE "\n" + script, std::move(options));
}

TEST(DriverFiles, AreThereOnEveryModel) {
    for (const char *model : {"2740", "2860-4", "2980"})
        EXPECT_EQ(
            at_the_driver("cat sensor/tempLT dev/gpio/ich9/27 dev/serio/in", {"--model", model})
                .out,
            "42\n1\n00\n")
            << model;
}

TEST(DriverFiles, ShowAtOnceWhatWasActed) {
    EXPECT_EQ(at_the_driver("zavsim act temperature 1 is 78; cat sensor/tempLT\n"
                            "zavsim act fan 4 stops; cat dev/gpio/ich9/27")
                  .out,
              "78\n0\n");
}

TEST(DriverFiles, PlayAScenario) {
    const ScratchFile scenario("at 5s voltage 3 is 5.6\nat 5s input is 3F\n");
    EXPECT_EQ(at_the_driver("until grep -q 5.60 sensor/vol5V; do sleep 1; done; cat dev/serio/in",
                            {"--scenario", scenario.path(), "--time-scale", "20"})
                  .out,
              "3F\n");
}

TEST(DriverFiles, KeepWhatAProgramWritesToALine) {
    EXPECT_EQ(at_the_driver("printf 2 > dev/gpio/ich9/21; printf 3F > dev/serio/out\n"
                            "until zavsim state | grep -q '\"serio/out\": \"3F\"'; do :; done\n"
                            "zavsim act fan 1 stops; cat dev/gpio/ich9/21 dev/serio/out")
                  .out,
              "23F");
}

TEST(DriverFiles, ClearALatchedAlarmForAProgram) {
    EXPECT_EQ(at_the_driver("zavsim act temperature 1 latches; cat sensor/statusLT\n"
                            "printf 0 > sensor/statusLT; zavsim act fan 1 stops\n"
                            "zavsim state > /tmp/state; cat sensor/statusLT")
                  .out,
              "1\n0");
}

TEST(DriverFiles, RaiseAnAlarmAnewWhoseReasonLasts) {
    EXPECT_EQ(at_the_driver("zavsim act voltage 3 is 6.1; zavsim act voltage 3 latches\n"
                            "printf 0 > sensor/status5V; zavsim act fan 1 stops\n"
                            "cat sensor/status5V")
                  .out,
              "1\n");
}

TEST(DriverFiles, GetTheirTextBackWhenAProgramOnlyEmptiesThem) {
    EXPECT_EQ(at_the_driver("printf 1 > dev/gpio/ich9/38; zavsim act fan 1 stops\n"
                            ": > dev/gpio/ich9/38\n"
                            "until [ -s dev/gpio/ich9/38 ]; do sleep 0.1; done\n"
                            "cat dev/gpio/ich9/38")
                  .out,
              "1\n");
}

TEST(DriverFiles, AreGoneWithAMissingSensor) {
    EXPECT_EQ(at_the_driver("zavsim act sensor 2 is missing; ls sensor | grep -c RT1\n"
                            "zavsim act sensor 2 works again; cat sensor/tempRT1 sensor/statusRT1")
                  .out,
              "0\n36\n0\n");
}

TEST(SensorReaders, SeeAHealthyBoard) {
    EXPECT_EQ(library("$probe sensors", {"--time-scale", "20"}).out,
              "thermal 1: 0 42.0 normal\nthermal 2: 0 36.0 normal\nthermal 3: 0 51.0 normal\n"
              "voltage 1: 0 1.2 normal\nvoltage 2: 0 1.8 normal\nvoltage 3: 0 5.0 normal\n"
              "voltage 4: 0 12.0 normal\nvoltage 5: 0 1.1 normal\n"
              "fan 1: 0 1400.0 normal\nfan 2: 0 2100.0 normal\nfan 3: 0 2100.0 normal\n"
              "fan 4: 0 1.0 normal\n");
}

TEST(SensorReaders, SeeWarningsAlarmsAndFaults) {
    const Outcome run =
        library("for words in 'temperature 1 is 66' 'temperature 2 is 70' 'temperature 3 latches' "
                "'sensor 1 works again' 'voltage 1 is 1.4' 'voltage 2 latches' 'voltage 3 faults' "
                "'fan 1 slows 700' 'fan 2 stops' 'fan 4 stops'; do zavsim act $words; done\n"
                "$probe sensors | grep -v normal",
                {"--time-scale", "100"});
    EXPECT_EQ(run.out, "thermal 1: 0 66.0 warning\nthermal 2: 0 70.0 critical\n"
                       "thermal 3: 0 51.0 critical\nvoltage 1: 0 1.4 warning\n"
                       "voltage 2: 0 1.8 critical\nvoltage 3: 0 5.0 error\nfan 1: 0 700.0 warning\n"
                       "fan 2: 0 0.0 critical\nfan 4: 0 0.0 critical\n");
}

TEST(SensorReaders, AreToldOfAMissingSensor) {
    EXPECT_EQ(library("zavsim act sensor 3 is missing; $probe sensors | grep 'thermal 3'",
                      {"--time-scale", "100"})
                  .out,
              "thermal 3: 13 0.0 error\n");
}

TEST(SensorReaders, ResetAnAlarm) {
    EXPECT_EQ(library("zavsim act temperature 2 latches; zavsim act voltage 4 latches\n"
                      "$probe reset; zavsim act fan 1 recovers; $probe sensors | grep -v normal",
                      {"--time-scale", "100"})
                  .out,
              "reset thermal 2: 0\nreset voltage 4: 0\n");
}

TEST(LedsAndPorts, KeepWhatTheLibrarySets) {
    EXPECT_EQ(library("zavsim act input is 3F; $probe leds\n"
                      "until zavsim state | grep -q '\"serio/out\": \"A5\"'; do :; done\n"
                      "cat /proc/zav/sys/dev/serio/out")
                  .out,
              "led 5: 0 2502\nled 1: 0 2501\ndisk led 8: 0 2507\nin 3F\nout 0\nA5");
}

} // namespace
