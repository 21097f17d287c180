// What the driver's own watching makes of the readings.
#include "model/sensors.hpp"

#include "zav_event.h"

#include <array>

namespace zavsim {

namespace {

struct Limits {
    double outer_low;
    double inner_low;
    double inner_high;
    double outer_high;
};

constexpr double no_low = -1000; // no probe reads that

constexpr std::array<Limits, thermal_probes> thermal_limits = {
    {{no_low, no_low, 65, 75}, {no_low, no_low, 60, 70}, {no_low, no_low, 90, 100}}};

constexpr std::array<Limits, voltage_probes> voltage_limits = {{{0.96, 1.08, 1.32, 1.44},
                                                                {1.44, 1.62, 1.98, 2.16},
                                                                {4.0, 4.5, 5.5, 6.0},
                                                                {9.6, 10.8, 13.2, 14.4},
                                                                {0.54, 0.6, 1.6, 1.76}}};

constexpr std::array<double, fans> least_speeds = {800, 1500, 1500, 0};

std::size_t index_of(int number) {
    return static_cast<std::size_t>(number - 1);
}

int condition(const Probe &probe, const Limits &limits) {
    if (probe.missing || probe.status > 1)
        return ZAV_SENSOR_ERR;
    if (probe.status == 1 || probe.value <= limits.outer_low || probe.value >= limits.outer_high)
        return ZAV_SENSOR_CRITICAL;
    return probe.value <= limits.inner_low || probe.value >= limits.inner_high ? ZAV_SENSOR_WARNING
                                                                               : ZAV_SENSOR_NORMAL;
}

} // namespace

double thermal_reading(const State &state, int number) {
    return state.sensors.temperatures.at(index_of(number)).value;
}

double voltage_reading(const State &state, int number) {
    return state.sensors.voltages.at(index_of(number)).value;
}

double fan_speed(const State &state, int number) {
    return number == fans ? std::stod(state.registers.at("gpio/ich9/27"))
                          : state.sensors.fans.at(index_of(number));
}

int thermal_condition(const State &state, int number) {
    return condition(state.sensors.temperatures.at(index_of(number)),
                     thermal_limits.at(index_of(number)));
}

int voltage_condition(const State &state, int number) {
    return condition(state.sensors.voltages.at(index_of(number)),
                     voltage_limits.at(index_of(number)));
}

int fan_condition(const State &state, int number) {
    const double speed = fan_speed(state, number);
    if (speed > least_speeds.at(index_of(number)))
        return ZAV_SENSOR_NORMAL;
    return speed > 0 ? ZAV_SENSOR_WARNING : ZAV_SENSOR_CRITICAL;
}

} // namespace zavsim
