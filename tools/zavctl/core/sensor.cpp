#include "sensor.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

constexpr int controllers_probe = 4;
constexpr int line_fan = 4;

constexpr Limits heat(double warning, double critical) {
    return {no_lower_limit, no_lower_limit, warning, critical};
}

constexpr Limits slowness(double warning) {
    return {0, warning, no_upper_limit, no_upper_limit};
}

} // namespace

const std::vector<Sensor> &all_sensors() {
    constexpr SensorKind thermal = SensorKind::thermal;
    constexpr SensorKind volt = SensorKind::volt;
    constexpr SensorKind fan = SensorKind::fan;
    static const std::vector<Sensor> sensors = {
        {thermal, 1, "LT", heat(65, 75), "sensor/tempLT", "sensor/statusLT"},
        {thermal, 2, "RT1", heat(60, 70), "sensor/tempRT1", "sensor/statusRT1"},
        {thermal, 3, "RT2", heat(90, 100), "sensor/tempRT2", "sensor/statusRT2"},
        {thermal, controllers_probe, "RAID controller", heat(90, 95), "", ""},
        {volt, 1, "VTT", {0.96, 1.08, 1.32, 1.44}, "sensor/volVTT", "sensor/statusVTT"},
        {volt, 2, "1.8 V", {1.44, 1.62, 1.98, 2.16}, "sensor/vol18V", "sensor/status18V"},
        {volt, 3, "5 V", {4.0, 4.5, 5.5, 6.0}, "sensor/vol5V", "sensor/status5V"},
        {volt, 4, "12 V", {9.6, 10.8, 13.2, 14.4}, "sensor/vol12V", "sensor/status12V"},
        {volt, 5, "Vccp", {0.54, 0.6, 1.6, 1.76}, "sensor/volVccp", "sensor/statusVccp"},
        {fan, 1, "", slowness(800), "sensor/fan2", ""},
        {fan, 2, "", slowness(1500), "sensor/fan3", ""},
        {fan, 3, "", slowness(1500), "sensor/fan1", ""},
        {fan, line_fan, "", slowness(0), "dev/gpio/ich9/27", ""},
    };
    return sensors;
}

const Sensor *find_sensor(std::string_view word) {
    for (const Sensor &sensor : all_sensors())
        if (word_of(sensor) == word)
            return &sensor;
    return nullptr;
}

std::string word_of(const Sensor &sensor) {
    return fmt::format("{}-{}", kind_word(sensor.kind), sensor.number);
}

std::string kind_word(SensorKind kind) {
    switch (kind) {
    case SensorKind::thermal:
        return "thermal";
    case SensorKind::volt:
        return "volt";
    case SensorKind::fan:
        break;
    }
    return "fan";
}

std::string unit_word(SensorKind kind) {
    switch (kind) {
    case SensorKind::thermal:
        return "celsius";
    case SensorKind::volt:
        return "volt";
    case SensorKind::fan:
        break;
    }
    return "rpm";
}

bool is_controllers(const Sensor &sensor) {
    return sensor.kind == SensorKind::thermal && sensor.number == controllers_probe;
}

bool tells_only_turning(const Sensor &sensor) {
    return sensor.kind == SensorKind::fan && sensor.number == line_fan;
}

bool latches(const Sensor &sensor) {
    return *sensor.status != '\0';
}

} // namespace zavctl
