// What is said of temperatures, voltages and fans.
#include "core/sensor_report.h"

#include "zav_api.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

SensorReport reading(const std::string &word, double value, int state = ZAV_SENSOR_NORMAL) {
    SensorReport report;
    report.sensor = find_sensor(word);
    report.value = value;
    report.state = state;
    doubt_reading(report);
    return report;
}

SensorReport unreadable(const std::string &word) {
    SensorReport report;
    report.sensor = find_sensor(word);
    report.failure = Failure{ZAV_RC_ERR_EACCES, "ZAV_RC_ERR_EACCES", "its file cannot be read"};
    return report;
}

std::string summary_of(const Section &section) {
    return summary(Answer{"sensor list", "", {section}});
}

std::string screen_of(const Section &section) {
    return section_text(section, Style());
}

bool holds(const std::string &text, const std::string &part) {
    return text.find(part) != std::string::npos;
}

} // namespace

TEST(Sensor, IsNamedByOneWord) {
    ASSERT_NE(find_sensor("volt-5"), nullptr);
    EXPECT_EQ(find_sensor("volt-5")->kind, SensorKind::volt);
    EXPECT_EQ(find_sensor("volt-5")->number, 5);
    for (const char *word : {"", "thermal", "thermal-0", "thermal-5", "volt-6", "fan-5", "fan-1x"})
        EXPECT_EQ(find_sensor(word), nullptr) << word;
}

TEST(Sensor, EveryWordNamesItsOwnSensor) {
    EXPECT_EQ(all_sensors().size(), 13U);
    for (const Sensor &sensor : all_sensors())
        EXPECT_EQ(find_sensor(word_of(sensor)), &sensor);
}

TEST(Sensor, TemperaturesAndVoltagesOfTheBoardAloneLatchAlarms) {
    EXPECT_TRUE(latches(*find_sensor("thermal-3")));
    EXPECT_TRUE(latches(*find_sensor("volt-1")));
    EXPECT_FALSE(latches(*find_sensor("thermal-4")));
    EXPECT_FALSE(latches(*find_sensor("fan-1")));
}

TEST(SensorReport, StatesHaveTheirSeverity) {
    EXPECT_EQ(severity(reading("thermal-1", 45)), Severity::ok);
    EXPECT_EQ(severity(reading("thermal-1", 66, ZAV_SENSOR_WARNING)), Severity::warning);
    EXPECT_EQ(severity(reading("thermal-1", 78, ZAV_SENSOR_CRITICAL)), Severity::critical);
    EXPECT_EQ(severity(reading("volt-1", 1.2, ZAV_SENSOR_ERR)), Severity::unknown);
    EXPECT_EQ(severity(unreadable("volt-1")), Severity::unknown);
}

TEST(SensorReport, ReadingsHaveTheirUnit) {
    EXPECT_EQ(value_text(reading("thermal-1", 45)), "45.0 C");
    EXPECT_EQ(value_text(reading("volt-4", 12.05)), "12.05 V");
    EXPECT_EQ(value_text(reading("fan-2", 2400)), "2400 rpm");
    EXPECT_EQ(value_text(unreadable("fan-2")), "-");
}

TEST(SensorReport, FanFourTellsOnlyWhetherItTurns) {
    EXPECT_EQ(value_text(reading("fan-4", 1)), "turning");
    EXPECT_EQ(value_text(reading("fan-4", 0, ZAV_SENSOR_CRITICAL)), "still");
}

TEST(SensorReport, AnAlarmThatTheReadingDoesNotExplainIsLatched) {
    EXPECT_TRUE(is_latched(reading("thermal-1", 45, ZAV_SENSOR_CRITICAL)));
    EXPECT_TRUE(is_latched(reading("volt-1", 1.2, ZAV_SENSOR_CRITICAL)));
    EXPECT_FALSE(is_latched(reading("thermal-1", 75, ZAV_SENSOR_CRITICAL)));
    EXPECT_FALSE(is_latched(reading("volt-1", 0.96, ZAV_SENSOR_CRITICAL)));
    EXPECT_FALSE(is_latched(reading("fan-1", 0, ZAV_SENSOR_CRITICAL)));
    EXPECT_FALSE(is_latched(reading("thermal-1", 45)));
}

TEST(SensorReport, ALatchedAlarmSaysHowToClearIt) {
    EXPECT_EQ(sensor_note(reading("thermal-1", 45, ZAV_SENSOR_CRITICAL)),
              "latched alarm: the reading is normal again, 'zavctl sensor reset thermal-1' clears "
              "it");
    EXPECT_EQ(sensor_note(reading("thermal-1", 66, ZAV_SENSOR_CRITICAL)),
              "latched alarm: the reading is no longer critical, 'zavctl sensor reset "
              "thermal-1' clears it");
}

TEST(SensorReport, ATemperatureOfZeroIsNotBelieved) {
    EXPECT_EQ(severity(reading("thermal-2", 0)), Severity::unknown);
    EXPECT_EQ(severity(reading("volt-2", 0, ZAV_SENSOR_CRITICAL)), Severity::critical);
}

TEST(SensorReport, AReadingThatIsNoNumberIsNotBelieved) {
    SensorReport report;
    report.sensor = find_sensor("volt-2");
    report.state = ZAV_SENSOR_NORMAL;
    doubt_reading(report);
    EXPECT_EQ(severity(report), Severity::unknown);
    EXPECT_TRUE(sensor_json(report)["value"].is_null());
}

TEST(SensorReport, AStatusThatIsNeitherZeroNorOneIsNotBelieved) {
    SensorReport report = reading("thermal-2", 45);
    doubt_status(report, "1\n");
    EXPECT_EQ(severity(report), Severity::ok);
    doubt_status(report, "2\n");
    EXPECT_EQ(severity(report), Severity::unknown);
    EXPECT_EQ(sensor_note(report),
              "its status file holds '2', neither 0 nor 1: the probe may be faulty");
}

TEST(SensorReport, AnAnswerThatIsNotBelievedIsShownAsUnknown) {
    const SensorReport report = reading("thermal-2", 0);
    EXPECT_FALSE(holds(screen_of(sensor_list_section({report})), "normal"));
    EXPECT_TRUE(holds(screen_of(sensor_overview_section({report})), "RT1: 0.0 C (unknown)"));
    EXPECT_EQ(sensor_json(report)["state"], "normal"); // as the library says
}

TEST(SensorReport, TheListHasOneLinePerSensor) {
    const Section section = sensor_list_section({reading("thermal-1", 45), reading("volt-1", 1.2),
                                                 reading("fan-1", 2400), reading("fan-4", 1)});
    EXPECT_EQ(screen_of(section),
              "    SENSOR     VALUE     WARNING AT        CRITICAL AT       STATE   NOTE\n"
              "    thermal-1  45.0 C    >= 65             >= 75             normal  LT\n"
              "    volt-1     1.20 V    <= 1.08, >= 1.32  <= 0.96, >= 1.44  normal  VTT\n"
              "    fan-1      2400 rpm  <= 800            still             normal\n"
              "    fan-4      turning   -                 still             normal\n");
    EXPECT_EQ(summary_of(section), "OK: 4 sensors normal");
}

TEST(SensorReport, WhatIsNotNormalIsToldWithItsReading) {
    EXPECT_EQ(summary_of(sensor_list_section({reading("thermal-1", 78, ZAV_SENSOR_CRITICAL),
                                              reading("fan-2", 900, ZAV_SENSOR_WARNING),
                                              reading("volt-3", 5, ZAV_SENSOR_CRITICAL)})),
              "CRITICAL: sensor thermal-1 (LT) reads 78.0 C (critical); sensor volt-3 (5 V) has a "
              "latched alarm; sensor fan-2 reads 900 rpm (warning)");
}

TEST(SensorReport, AMissingDriverIsOneFinding) {
    const Section section = sensor_list_section({unreadable("thermal-1"), unreadable("fan-1")});
    EXPECT_EQ(section.findings.size(), 1U);
    EXPECT_EQ(summary_of(section), "COULD NOT TELL: no sensor can be read: the files of the "
                                   "appliance's driver, in /proc/zav/sys/sensor, are missing");
}

TEST(SensorReport, WhatHasNoFileOfTheDriverIsToldBesides) {
    const Section section = sensor_list_section(
        {unreadable("thermal-1"), unreadable("fan-1"), reading("fan-4", 0, ZAV_SENSOR_CRITICAL)});
    EXPECT_EQ(section.findings.size(), 2U);
    EXPECT_TRUE(holds(summary_of(section), "sensor fan-4 reads still (critical)"));
}

TEST(SensorReport, AMissingFileIsToldWithItsName) {
    const Section section = sensor_list_section({unreadable("thermal-1"), reading("fan-1", 2400)});
    EXPECT_EQ(summary_of(section), "COULD NOT TELL: sensor thermal-1 gives no answer to trust");
    EXPECT_TRUE(holds(screen_of(section), "its file cannot be read")) << screen_of(section);
}

TEST(SensorReport, TheOverviewHasOneLinePerKind) {
    const Section section = sensor_overview_section({reading("thermal-1", 45),
                                                     reading("thermal-2", 40, ZAV_SENSOR_CRITICAL),
                                                     reading("fan-1", 2400), reading("fan-4", 1)});
    EXPECT_EQ(screen_of(section), "    KIND     STATE     READINGS\n"
                                  " X  thermal  critical  LT: 45.0 C, RT1: 40.0 C (latched alarm)\n"
                                  "    fan      normal    1: 2400 rpm, 4: turning\n");
    EXPECT_EQ(section.records.size(), 4U);
}

TEST(SensorReport, TheRecordHasItsFields) {
    const Json json = sensor_json(reading("thermal-1", 45.5, ZAV_SENSOR_CRITICAL));
    EXPECT_EQ(json["sensor"], "thermal 1");
    EXPECT_EQ(json["kind"], "thermal");
    EXPECT_EQ(json["number"], 1);
    EXPECT_EQ(json["place"], "LT");
    EXPECT_EQ(json["value"], 45.5);
    EXPECT_EQ(json["unit"], "celsius");
    EXPECT_EQ(json["state"], "critical");
    EXPECT_EQ(json["latched"], true);
    EXPECT_EQ(json["limits"]["warning_high"], 65);
    EXPECT_TRUE(json["limits"]["warning_low"].is_null());
    EXPECT_EQ(json["severity"], "critical");
    EXPECT_TRUE(json["error"].is_null());
}

TEST(SensorReset, AClearedAlarmAndAnotherStateAreBothTold) {
    const Section section =
        sensor_reset_section({{reading("thermal-1", 45), std::nullopt},
                              {reading("volt-1", 1.1, ZAV_SENSOR_WARNING), std::nullopt}});
    EXPECT_EQ(summary_of(section), "WARNING: sensor volt-1 (VTT) reads 1.10 V (warning)");
    EXPECT_EQ(section.records[0]["reset"], "cleared");
    EXPECT_TRUE(holds(screen_of(section), "thermal-1  cleared")) << screen_of(section);
}

TEST(SensorReset, AnAlarmThatWasNotClearedIsCritical) {
    const Failure failure{ZAV_RC_ERR_EACCES, "ZAV_RC_ERR_EACCES", "cannot be written"};
    const Section section = sensor_reset_section({{reading("thermal-1", 45), failure}});
    EXPECT_EQ(summary_of(section),
              "CRITICAL: sensor thermal-1 keeps an alarm that could not be cleared");
    EXPECT_EQ(section.records[0]["reset"], "failed");
    EXPECT_EQ(section.records[0]["reset_error"]["code"], ZAV_RC_ERR_EACCES);
}
