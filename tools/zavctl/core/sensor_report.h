// What the library says about the sensors of the machine itself, judged and shown.
#pragma once

#include "answer.h"
#include "sensor.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

struct SensorReport {
    const Sensor *sensor = nullptr;
    std::optional<double> value; // none: it is no number, or was not told
    int state = 0;               // ZAV_SENSOR_*
    std::optional<Failure> failure;
    std::string doubt; // why the answer cannot be trusted, "" if it can
};

// What a reading is worth that no sensor gives. To be called with every answer.
void doubt_reading(SensorReport &report);

// What it is worth beside what the status file of its alarm holds: the library takes a temperature
// as it stands.
void doubt_status(SensorReport &report, const std::string &status);

// "normal", "warning", "critical", "unknown".
std::string sensor_state_word(const SensorReport &report);
Severity severity(const SensorReport &report);

// The reading does not account for the alarm.
bool is_latched(const SensorReport &report);

// "45.0 C", "1.20 V", "2400 rpm", "turning".
std::string value_text(const SensorReport &report);
std::string sensor_note(const SensorReport &report);

Json sensor_json(const SensorReport &report);

Section sensor_list_section(const std::vector<SensorReport> &reports);
Section sensor_show_section(const std::vector<SensorReport> &reports);

// A row per kind of sensor, for a screen that shows more than sensors; the records are the list's.
Section sensor_overview_section(const std::vector<SensorReport> &reports);

// What became of clearing an alarm, and what the sensor says since.
struct SensorReset {
    SensorReport after;
    std::optional<Failure> failure; // of clearing
};
Section sensor_reset_section(const std::vector<SensorReset> &resets);

} // namespace zavctl
