// Temperatures, voltages, fans and the digital sensor ports, from the files of the appliance's
// driver.
#include "common/diag.h"
#include "common/owner.h"
#include "common/text.h"
#include "zav_api.h"

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iterator>
#include <unistd.h>

namespace {

constexpr const char *kPortIn = "/proc/zav/sys/dev/serio/in";
constexpr const char *kPortOut = "/proc/zav/sys/dev/serio/out";

// ---- The sensors ----

struct Files {
    const char *reading;
    const char *status;
};

struct ThermalProbe {
    Files files; // none for the RAID controller's
    float warning;
    float critical;
};

constexpr ThermalProbe kThermal[] = {
    {{"/proc/zav/sys/sensor/tempLT", "/proc/zav/sys/sensor/statusLT"}, 65.0F, 75.0F},
    {{"/proc/zav/sys/sensor/tempRT1", "/proc/zav/sys/sensor/statusRT1"}, 60.0F, 70.0F},
    {{"/proc/zav/sys/sensor/tempRT2", "/proc/zav/sys/sensor/statusRT2"}, 90.0F, 100.0F},
    {{nullptr, nullptr}, 90.0F, 95.0F},
};

struct VoltageProbe {
    Files files;
    float outer_low;
    float inner_low;
    float inner_high;
    float outer_high;
};

constexpr VoltageProbe kVoltage[] = {
    {{"/proc/zav/sys/sensor/volVTT", "/proc/zav/sys/sensor/statusVTT"}, 0.96F, 1.08F, 1.32F, 1.44F},
    {{"/proc/zav/sys/sensor/vol18V", "/proc/zav/sys/sensor/status18V"}, 1.44F, 1.62F, 1.98F, 2.16F},
    {{"/proc/zav/sys/sensor/vol5V", "/proc/zav/sys/sensor/status5V"}, 4.0F, 4.5F, 5.5F, 6.0F},
    {{"/proc/zav/sys/sensor/vol12V", "/proc/zav/sys/sensor/status12V"}, 9.6F, 10.8F, 13.2F, 14.4F},
    {{"/proc/zav/sys/sensor/volVccp", "/proc/zav/sys/sensor/statusVccp"}, 0.54F, 0.6F, 1.6F, 1.76F},
};

struct Fan {
    const char *file;
    float minimum;
    unsigned wait;     // seconds between two readings
    bool stops_at_low; // a line that is high or low: only a negative reading is read again
};

// Fans are not numbered as their files are.
constexpr Fan kFans[] = {
    {"/proc/zav/sys/sensor/fan2", 800.0F, 3, false},
    {"/proc/zav/sys/sensor/fan3", 1500.0F, 3, false},
    {"/proc/zav/sys/sensor/fan1", 1500.0F, 3, false},
    {"/proc/zav/sys/dev/gpio/ich9/27", 0.0F, 1, true},
};
constexpr int kFanReadings = 3; // at most

// Probes are counted from 1; null if there is none of that number.
template <class Table>
auto probe_of(const Table &table, int number) {
    return number < 1 || number > static_cast<int>(std::size(table)) ? nullptr : &table[number - 1];
}

// ---- Reading ----

bool read_number(zav::File &file, char (&text)[20]) {
    return file.line(text, sizeof text);
}

int no_sensor(const char *function) {
    zavlogd(const_cast<char *>(function), zav::kAlert, ENOENT, "%s", strerror(ENOENT));
    return ZAV_RC_ERR_EACCES;
}

int read_probe(const char *function, const Files &files, float &value, int &status) {
    zav::File reading(files.reading, "re");
    zav::File alarm(files.status, "re");
    char value_text[20];
    char status_text[20];
    if (!reading || !alarm || !read_number(reading, value_text) || !read_number(alarm, status_text))
        return no_sensor(function);
    value = static_cast<float>(zav::to_double(value_text));
    status = zav::to_int(status_text);
    return ZAV_RC_OK;
}

int read_controller(float &value) {
    if (zavGetModel() != ZAV_MODEL_SOLVANE_2980)
        return ZAV_RC_ERR_ENODEV;
    double degrees = 0;
    if (zavGetRaidCardHwMon(0, &degrees) != ZAV_RC_OK)
        return ZAV_RC_ERR_EACCES;
    value = static_cast<float>(degrees);
    return ZAV_RC_OK;
}

// ---- Judging ----

constexpr int kLatched = 1; // of the status files

int thermal_state(const ThermalProbe &probe, float value, int status) {
    if (status == kLatched || value >= probe.critical)
        return ZAV_SENSOR_CRITICAL;
    return value >= probe.warning ? ZAV_SENSOR_WARNING : ZAV_SENSOR_NORMAL;
}

int voltage_state(const VoltageProbe &probe, float value, int status) {
    if (status == kLatched)
        return ZAV_SENSOR_CRITICAL;
    if (status != 0)
        return ZAV_SENSOR_ERR;
    if (value >= probe.outer_high || value <= probe.outer_low)
        return ZAV_SENSOR_CRITICAL;
    return value >= probe.inner_high || value <= probe.inner_low ? ZAV_SENSOR_WARNING
                                                                 : ZAV_SENSOR_NORMAL;
}

int fan_state(const Fan &fan, float value) {
    if (value > fan.minimum)
        return ZAV_SENSOR_NORMAL;
    return value > 0 ? ZAV_SENSOR_WARNING : ZAV_SENSOR_CRITICAL;
}

bool counts_at_once(const Fan &fan, float value) {
    return fan.stops_at_low ? value >= 0 : value > fan.minimum;
}

// A fan that seems to stand still is given time.
int read_fan_patiently(int number, const Fan &fan, float &value) {
    for (int reading = 1;; ++reading) {
        if (const int rc = zavReadFanSpeed(number, &value); rc != ZAV_RC_OK)
            return rc;
        if (counts_at_once(fan, value) || reading == kFanReadings)
            return ZAV_RC_OK;
        sleep(fan.wait);
    }
}

// Clears a latched alarm.
int reset(const char *function, const Files &files) {
    zav::File alarm(files.status, "we");
    if (!alarm)
        return no_sensor(function);
    return fprintf(alarm.get(), "0") == 1 && alarm.flush() ? ZAV_RC_OK : ZAV_RC_ERR_EACCES;
}

int refuse_port(const char *function, const char *name) {
    zavlogd(const_cast<char *>(function), zav::kAlert, ZAV_RC_ERR_EACCES,
            "Can't open \"serio/%s\".", name);
    return ZAV_RC_ERR_EACCES;
}

} // namespace

int zavGetStateThermal(int probeno, zavThermalState *info) {
    const ThermalProbe *probe = probe_of(kThermal, probeno);
    if (info == nullptr || probe == nullptr)
        return ZAV_RC_ERR_EINVAL;
    *info = {.type = ZAV_EVENT_THERMAL, .id = probeno, .value = 0.0F, .state = ZAV_SENSOR_ERR};
    int status = 0;
    const int rc = probe->files.reading != nullptr
                       ? read_probe(__func__, probe->files, info->value, status)
                       : read_controller(info->value);
    if (rc == ZAV_RC_OK)
        info->state = thermal_state(*probe, info->value, status);
    return rc;
}

int zavResetThermal(int probeno) {
    const ThermalProbe *probe = probe_of(kThermal, probeno);
    if (probe == nullptr)
        return ZAV_RC_ERR_EINVAL;
    if (probe->files.status != nullptr)
        return reset(__func__, probe->files);
    // The controller has no alarm to clear; whether it can be asked is all that there is to tell.
    zavThermalState state;
    return zavGetStateThermal(probeno, &state) == ZAV_RC_OK ? ZAV_RC_OK : ZAV_RC_ERR_EACCES;
}

int zavGetStateVolt(int probeno, zavVoltageState *info) {
    const VoltageProbe *probe = probe_of(kVoltage, probeno);
    if (info == nullptr || probe == nullptr)
        return ZAV_RC_ERR_EINVAL;
    *info = {.type = ZAV_EVENT_VOLTAGE, .id = probeno, .value = 0.0F, .state = ZAV_SENSOR_ERR};
    int status = 0;
    const int rc = read_probe(__func__, probe->files, info->value, status);
    if (rc == ZAV_RC_OK)
        info->state = voltage_state(*probe, info->value, status);
    return rc;
}

int zavResetVolt(int probeno) {
    const VoltageProbe *probe = probe_of(kVoltage, probeno);
    return probe == nullptr ? ZAV_RC_ERR_EINVAL : reset(__func__, probe->files);
}

int zavReadFanSpeed(int fan, float *fanspeed) {
    const Fan *known = probe_of(kFans, fan);
    if (known == nullptr || fanspeed == nullptr)
        return ZAV_RC_ERR_EINVAL;
    zav::File file(known->file, "re");
    char text[20];
    if (!file || !read_number(file, text))
        return no_sensor(__func__);
    *fanspeed = static_cast<float>(zav::to_double(text));
    return ZAV_RC_OK;
}

int zavGetStateFan(int fan, zavFanState *info) {
    const Fan *known = probe_of(kFans, fan);
    if (known == nullptr || info == nullptr)
        return ZAV_RC_ERR_EINVAL;
    *info = {.type = ZAV_EVENT_FAN, .id = fan, .value = 0.0F, .state = ZAV_SENSOR_ERR};
    const int rc = read_fan_patiently(fan, *known, info->value);
    if (rc == ZAV_RC_OK)
        info->state = fan_state(*known, info->value);
    return rc;
}

int zavGetSensorIn(unsigned char *state) {
    if (state == nullptr)
        return ZAV_RC_ERR_EINVAL;
    const zav::File port(kPortIn, "re");
    if (!port)
        return refuse_port(__func__, "in");
    char text[64];
    text[fread(text, 1, sizeof text - 1, port.get())] = '\0';
    char *end = text;
    const unsigned long long bits = strtoull(text, &end, 16);
    if (end == text)
        return ZAV_RC_ERR_EACCES;
    *state = static_cast<unsigned char>(std::min<unsigned long long>(bits, UINT32_MAX));
    return ZAV_RC_OK;
}

// NOLINTNEXTLINE(readability-non-const-parameter): the interface's type
int zavSetSensorOut(unsigned char *state) {
    if (state == nullptr)
        return ZAV_RC_ERR_EINVAL;
    zav::File port(kPortOut, "we");
    if (!port || fprintf(port.get(), "%X", static_cast<unsigned>(*state)) < 0 || !port.flush())
        return refuse_port(__func__, "out");
    return ZAV_RC_OK;
}
