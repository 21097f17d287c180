#include "model/sensors.hpp"

#include <algorithm>
#include <array>
#include <fmt/format.h>

namespace zavsim {

namespace {

using Kind = Action::Kind;

const std::string driver = "/proc/zav/sys/";
const std::string fan4_line = "gpio/ich9/27";

struct ProbeFacts {
    const char *reading; // file names below sensor/
    const char *status;
    double usual;
    double low; // between these two the board's controller sees nothing to raise an alarm for
    double high;
};

constexpr std::array<ProbeFacts, thermal_probes> thermal_facts = {{
    {"tempLT", "statusLT", 42, -40, 65},
    {"tempRT1", "statusRT1", 36, -40, 60},
    {"tempRT2", "statusRT2", 51, -40, 90},
}};

constexpr std::array<ProbeFacts, voltage_probes> voltage_facts = {{
    {"volVTT", "statusVTT", 1.2, 1.08, 1.32},
    {"vol18V", "status18V", 1.8, 1.62, 1.98},
    {"vol5V", "status5V", 5, 4.5, 5.5},
    {"vol12V", "status12V", 12, 10.8, 13.2},
    {"volVccp", "statusVccp", 1.1, 0.6, 1.6},
}};

struct FanFacts {
    const char *file;
    int usual;
};

// By the fans' numbers, which are not those of their files.
constexpr std::array<FanFacts, 3> fan_facts = {{{"fan2", 1400}, {"fan3", 2100}, {"fan1", 2100}}};

constexpr std::array<const char *, 18> gpio_lines = {"38", "39", "07", "23", "21", "22",
                                                     "10", "40", "04", "41", "02", "42",
                                                     "00", "43", "34", "35", "49", "27"};

template <typename Facts>
std::vector<Probe> usual_probes(const Facts &facts) {
    std::vector<Probe> probes;
    probes.reserve(facts.size());
    for (const ProbeFacts &each : facts)
        probes.push_back({each.usual, 0, false});
    return probes;
}

std::string set_probe(Probe &probe, const ProbeFacts &facts, const Action &action) {
    switch (action.kind) {
    case Kind::temperature_is:
    case Kind::voltage_is:
        probe.value = action.value;
        break;
    case Kind::temperature_latches:
    case Kind::voltage_latches:
        probe.status = 1;
        break;
    case Kind::temperature_faults:
    case Kind::voltage_faults:
        probe.status = 2;
        break;
    case Kind::sensor_is_missing:
    case Kind::sensor_works:
        probe.missing = action.kind == Kind::sensor_is_missing;
        break;
    default:
        probe = {facts.usual, 0, false};
    }
    return {};
}

std::string act_on_fan(State &state, const Action &action) {
    const auto index = static_cast<std::size_t>(action.number - 1);
    if (action.number == fans) {
        if (action.kind == Kind::fan_slows)
            return "fan 4 turns or stands still: it has no speed";
        state.registers[fan4_line] = action.kind == Kind::fan_stops ? "0" : "1";
        return {};
    }
    state.sensors.fans.at(index) = action.kind == Kind::fan_slows   ? static_cast<int>(action.value)
                                   : action.kind == Kind::fan_stops ? 0
                                                                    : fan_facts.at(index).usual;
    return {};
}

std::string show_degrees(double value) {
    return fmt::format("{}\n", value);
}
std::string show_volts(double value) {
    return fmt::format("{:.2f}\n", value);
}

template <typename Facts, typename Show>
void add_readings(std::vector<DriverFile> &files, const Facts &facts,
                  const std::vector<Probe> &probes, const Show &show) {
    for (std::size_t i = 0; i < facts.size(); ++i)
        files.push_back(
            {driver + "sensor/" + facts.at(i).reading,
             probes.at(i).missing ? std::nullopt : std::optional(show(probes.at(i).value))});
}

template <typename Facts>
void add_statuses(std::vector<DriverFile> &files, const Facts &facts,
                  const std::vector<Probe> &probes) {
    for (std::size_t i = 0; i < facts.size(); ++i)
        files.push_back({driver + "sensor/" + facts.at(i).status,
                         probes.at(i).missing
                             ? std::nullopt
                             : std::optional(fmt::format("{}\n", probes.at(i).status))});
}

// A zero clears the alarm, unless what raised it lasts: then it is raised anew at once.
template <typename Facts>
bool clear_alarm(std::vector<Probe> &probes, const Facts &facts, const std::string &path) {
    for (std::size_t i = 0; i < facts.size(); ++i) {
        if (path != driver + "sensor/" + facts.at(i).status)
            continue;
        Probe &probe = probes.at(i);
        if (probe.value > facts.at(i).low && probe.value < facts.at(i).high)
            probe.status = 0;
        return true;
    }
    return false;
}

bool fits_register(const std::string &name, const std::string &value) {
    const bool is_line = name.rfind("gpio/", 0) == 0;
    const char *digits = is_line ? "0123456789" : "0123456789ABCDEFabcdef";
    return !value.empty() && value.size() <= (is_line ? 1U : 2U) &&
           value.find_first_not_of(digits) == std::string::npos;
}

} // namespace

Sensors new_sensors() {
    Sensors sensors;
    sensors.temperatures = usual_probes(thermal_facts);
    sensors.voltages = usual_probes(voltage_facts);
    for (const FanFacts &fan : fan_facts)
        sensors.fans.push_back(fan.usual);
    return sensors;
}

Registers new_registers() {
    Registers registers;
    for (const char *line : gpio_lines)
        registers[fmt::format("gpio/ich9/{}", line)] = "0";
    registers[fan4_line] = "1";
    registers["serio/out"] = "00";
    return registers;
}

std::string act_on_sensors(State &state, const Action &action) {
    if (action.kind == Kind::input_is) {
        state.sensors.input = action.number;
        return {};
    }
    const auto index = static_cast<std::size_t>(action.number - 1);
    if (action.kind >= Kind::fan_slows)
        return act_on_fan(state, action);
    if (action.kind >= Kind::voltage_is)
        return set_probe(state.sensors.voltages.at(index), voltage_facts.at(index), action);
    return set_probe(state.sensors.temperatures.at(index), thermal_facts.at(index), action);
}

std::vector<DriverFile> reading_files(const State &state) {
    std::vector<DriverFile> files;
    add_readings(files, thermal_facts, state.sensors.temperatures, show_degrees);
    add_readings(files, voltage_facts, state.sensors.voltages, show_volts);
    for (std::size_t i = 0; i < fan_facts.size(); ++i)
        files.push_back({driver + "sensor/" + fan_facts.at(i).file,
                         fmt::format("{}\n", state.sensors.fans.at(i))});
    files.push_back({driver + "dev/serio/in", fmt::format("{:02X}\n", state.sensors.input)});
    return files;
}

std::vector<DriverFile> writable_files(const State &state) {
    std::vector<DriverFile> files;
    add_statuses(files, thermal_facts, state.sensors.temperatures);
    add_statuses(files, voltage_facts, state.sensors.voltages);
    for (const auto &[name, value] : state.registers)
        files.push_back({fmt::format("{}dev/{}", driver, name), value + "\n"});
    return files;
}

void take_written(State &state, const std::string &path, const std::string &text) {
    const std::string value = text.substr(0, text.find_last_not_of(" \t\n") + 1);
    const std::string devices = driver + "dev/";
    if (path.rfind(devices, 0) == 0) {
        const std::string name = path.substr(devices.size());
        if (fits_register(name, value))
            state.registers[name] = value;
    } else if (value == "0") {
        clear_alarm(state.sensors.temperatures, thermal_facts, path) ||
            clear_alarm(state.sensors.voltages, voltage_facts, path);
    }
}

} // namespace zavsim
