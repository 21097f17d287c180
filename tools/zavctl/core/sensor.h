// The sensors of the machine itself: their names, where they sit, and their limits.
#pragma once

#include <limits>
#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

enum class SensorKind { thermal, volt, fan };

constexpr double no_lower_limit = -std::numeric_limits<double>::infinity();
constexpr double no_upper_limit = std::numeric_limits<double>::infinity();

// At a limit, or beyond it, a reading is not normal any more.
struct Limits {
    double critical_low = no_lower_limit;
    double warning_low = no_lower_limit;
    double warning_high = no_upper_limit;
    double critical_high = no_upper_limit;
};

struct Sensor {
    SensorKind kind;
    int number;
    const char *place; // what it measures, or where
    Limits limits;
    const char *file;   // of its reading, below /proc/zav/sys; "" for the RAID controller's
    const char *status; // of its alarm: 0, or 1 while one is latched; "" if it latches none
};

// Every sensor, in the order in which they are shown. The limits are the library's own.
const std::vector<Sensor> &all_sensors();

// "thermal-1": the sensor's one word on the command line. Null for another word.
const Sensor *find_sensor(std::string_view word);
std::string word_of(const Sensor &sensor);

// "thermal", "volt", "fan"; "celsius", "volt", "rpm".
std::string kind_word(SensorKind kind);
std::string unit_word(SensorKind kind);

// The RAID controller's thermometer, which only one model has.
bool is_controllers(const Sensor &sensor);

// Its line is high while it turns: there is no speed.
bool tells_only_turning(const Sensor &sensor);

// An alarm of it stays until it is cleared.
bool latches(const Sensor &sensor);

} // namespace zavctl
