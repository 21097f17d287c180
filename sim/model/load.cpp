#include "model/load.hpp"

#include "model/texts.hpp"

#include <cstdint>
#include <fmt/format.h>

namespace zavsim {

namespace {

using Kind = Action::Kind;

constexpr int usual_processor_load = 3;

// Counters of the time before this start, in hundredths of seconds, so that none begins at zero.
constexpr std::int64_t user_before = 21034;
constexpr std::int64_t system_before = 9011;
constexpr std::int64_t idle_before = 412037;
constexpr double user_share = 0.7; // of the time in which the processor works

// Sizes of which a percent is a whole number.
constexpr int swap_kib = 2000000;
constexpr int file_system_kib = 4000000;

std::int64_t ticks(double seconds) {
    return static_cast<std::int64_t>(seconds * 100);
}

// Since the start.
double busy_seconds(const State &state) {
    return state.load.busy_before + (state.now - state.load.since) * state.load.processor / 100;
}

void set_processor_load(State &state, int percent) {
    state.load.busy_before = busy_seconds(state);
    state.load.since = state.now;
    state.load.processor = percent;
}

int available_kib(int size_kib, int percent) {
    return size_kib / 100 * (100 - percent);
}

} // namespace

Load new_load() {
    Load load;
    load.processor = usual_processor_load;
    load.file_systems = {
        {"/", 41}, {"/etc/Kiru", 12}, {"/var", 37}, {"/tmp", 5}, {"/mnt/buffer", 22}};
    return load;
}

const std::vector<std::string> &own_file_systems() {
    static const std::vector<std::string> list = {"/", "/etc/Kiru", "/var", "/tmp", "/mnt/buffer"};
    return list;
}

std::string act_on_load(State &state, const Action &action) {
    if (action.kind == Kind::processor_load_is)
        set_processor_load(state, action.percent);
    else if (action.kind == Kind::swap_use_is)
        state.load.swap = action.percent;
    else
        state.load.file_systems[action.text] = action.percent;
    return {};
}

std::string stat_text(const State &state) {
    const double busy = busy_seconds(state);
    const std::int64_t user = user_before + ticks(busy * user_share);
    const std::int64_t system = system_before + ticks(busy * (1 - user_share));
    const std::int64_t idle = idle_before + ticks(state.now - busy);
    const std::string counters = fmt::format("{} 0 {} {} 0 0 0 0 0 0", user, system, idle);
    return fmt::format("cpu  {}\ncpu0 {}\nintr 0\nctxt {}\nbtime {}\nprocesses 1204\n"
                       "procs_running 1\nprocs_blocked 0\n",
                       counters, counters, user + system,
                       static_cast<std::int64_t>(start_of_time) -
                           (user_before + idle_before) / 100);
}

std::string meminfo_text(const State &state) {
    const std::pair<const char *, int> lines[] = {
        {"MemTotal:", 2060000},
        {"MemFree:", 824000},
        {"MemAvailable:", 1450000},
        {"Buffers:", 96000},
        {"Cached:", 640000},
        {"SwapCached:", 0},
        {"Active:", 610000},
        {"Inactive:", 420000},
        {"SwapTotal:", swap_kib},
        {"SwapFree:", available_kib(swap_kib, state.load.swap)},
        {"Dirty:", 120},
        {"Writeback:", 0},
        {"Slab:", 88000},
    };
    std::string text;
    for (const auto &[name, kib] : lines)
        text += fmt::format("{:<16}{:>8} kB\n", name, kib);
    return text;
}

std::string own_mounts_text() {
    std::string text;
    for (const std::string &path : own_file_systems())
        text += fmt::format("tmpfs {} tmpfs rw,relatime 0 0\n", path);
    return text;
}

// The deeper ones come first: the first line that fits a path tells its numbers.
std::string own_usage_text(const State &state) {
    std::string text;
    for (const std::string &path : own_file_systems()) {
        const int available = available_kib(file_system_kib, state.load.file_systems.at(path));
        text.insert(0,
                    fmt::format("{} 1024 {} {} {}\n", path, file_system_kib, available, available));
    }
    return text;
}

} // namespace zavsim
