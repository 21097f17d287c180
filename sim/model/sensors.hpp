// The main board's sensors and the driver's files that show them.
#pragma once

#include "model/action.hpp"
#include "model/state.hpp"

#include <optional>
#include <string>
#include <vector>

namespace zavsim {

constexpr int thermal_probes = 3;
constexpr int voltage_probes = 5;
constexpr int fans = 4;

// As they are on a healthy machine in a cool room.
Sensors new_sensors();
Registers new_registers();

// Answers why it could not be, or nothing.
std::string act_on_sensors(State &state, const Action &action);

// What the driver makes of them: readings, and states in the library's codes.
double thermal_reading(const State &state, int number);
double voltage_reading(const State &state, int number);
double fan_speed(const State &state, int number);
int thermal_condition(const State &state, int number);
int voltage_condition(const State &state, int number);
int fan_condition(const State &state, int number);

// A file of the driver; without a text it is not there.
struct DriverFile {
    std::string path;
    std::optional<std::string> text;
};

// Files that programs read only.
std::vector<DriverFile> reading_files(const State &state);

// Files that programs write as well.
std::vector<DriverFile> writable_files(const State &state);

// A program wrote that into one of the latter. What the driver does not understand changes nothing.
void take_written(State &state, const std::string &path, const std::string &text);

} // namespace zavsim
