#include "event_states.h"

#include "text.h"

#include "zav_event.h"

#include <algorithm>
#include <cctype>
#include <vector>

namespace zavctl {

namespace {

constexpr Severity ok = Severity::ok;
constexpr Severity warning = Severity::warning;
constexpr Severity unknown = Severity::unknown;
constexpr Severity critical = Severity::critical;

constexpr StateWord types[] = {
    {ZAV_EVENT_INIT, "init", ok},       {ZAV_EVENT_FAN, "fan", ok},
    {ZAV_EVENT_THERMAL, "thermal", ok}, {ZAV_EVENT_VOLTAGE, "volt", ok},
    {ZAV_EVENT_UPS, "ups", ok},         {ZAV_EVENT_RAID, "array", ok},
    {ZAV_EVENT_HDD, "disk", ok},        {ZAV_EVENT_DISC, "media", ok},
    {ZAV_EVENT_LVM, "lvm", ok},         {ZAV_EVENT_NET, "nic", ok},
    {ZAV_EVENT_SYSINFO, "load", ok},    {ZAV_EVENT_RBOD, "unit", ok},
};

constexpr StateWord sensors[] = {
    {ZAV_SENSOR_NORMAL, "normal", ok},
    {ZAV_SENSOR_WARNING, "warning", warning},
    {ZAV_SENSOR_CRITICAL, "critical", critical},
    {ZAV_SENSOR_ERR, "unknown", unknown},
};

constexpr StateWord ups[] = {
    {ZAV_UPS_ONLINE, "online", ok},
    {ZAV_UPS_ONBATT, "on battery", warning},
    {ZAV_UPS_OTHER, "other", warning},
};

constexpr StateWord disks[] = {
    {ZAV_HDD_FOUND, "found", ok},
    {ZAV_HDD_ABSENT, "absent", critical},
    {ZAV_HDD_FAILED, "failed", critical},
};

constexpr StateWord arrays[] = {
    {ZAV_RAID_NORMAL, "normal", ok},
    {ZAV_RAID_DEGRADED, "degraded", warning},
    {ZAV_RAID_RESYNC, "resync", warning},
    {ZAV_RAID_FAILED, "failed", critical},
    {ZAV_RAID_NOT_EXIST, "not_exist", critical},
};

constexpr StateWord groups[] = {
    {ZAV_LVM_NORMAL, "normal", ok},       {ZAV_LVM_DEGRADED, "degraded", warning},
    {ZAV_LVM_FAILED, "failed", critical}, {ZAV_LVM_NOT_EXIST, "not_exist", critical},
    {ZAV_LVM_FULL, "full", warning},      {ZAV_LVM_INACTIVE, "inactive", warning},
};

constexpr StateWord volumes[] = {
    {0, "normal", ok},
    {ZAV_LVM_NORMAL, "normal", ok},
    {ZAV_LVM_DEGRADED, "degraded", warning},
    {ZAV_LVM_FAILED, "failed", critical},
    {ZAV_LVM_NOT_EXIST, "not_exist", critical},
    {ZAV_LVM_FULL, "full", warning},
    {ZAV_LVM_INACTIVE, "inactive", warning},
};

constexpr StateWord networks[] = {
    {ZAV_NET_UP, "up", ok},
    {ZAV_NET_DOWN, "down", warning},
    {ZAV_NET_NOT_EXIST, "not_exist", warning},
    {ZAV_NET_ERR, "unknown", unknown},
};

constexpr StateWord loads[] = {
    {ZAV_SYSINFO_NORMAL, "normal", ok},
    {ZAV_SYSINFO_WARNING, "warning", warning},
    {ZAV_SYSINFO_CRITICAL, "critical", critical},
    {ZAV_SYSINFO_ERR, "unknown", unknown},
};

constexpr StateWord units[] = {
    {ZAV_RBOD_NORMAL, "normal", ok},          {ZAV_RBOD_WARN, "warning", warning},
    {ZAV_RBOD_ALARM, "alarm", critical},      {ZAV_RBOD_FAIL, "failed", critical},
    {ZAV_RBOD_NOTEXIST, "missing", critical}, {ZAV_RBOD_EXIST, "present", ok},
};

constexpr StateWord levels[] = {
    {ZAV_RAIDLVL_NONE, "none", ok},   {ZAV_RAIDLVL_0, "raid0", ok},
    {ZAV_RAIDLVL_1, "raid1", ok},     {ZAV_RAIDLVL_5, "raid5", ok},
    {ZAV_RAIDLVL_6, "raid6", ok},     {ZAV_RAIDLVL_10, "raid10", ok},
    {ZAV_RAIDLVL_50, "raid50", ok},   {ZAV_RAIDLVL_60, "raid60", ok},
    {ZAV_RAIDLVL_JBOD, "linear", ok},
};

constexpr StateWord kinds_of_disc[] = {
    {ZAV_DVD_ROM, "DVD-ROM", ok},
    {ZAV_DVD_MINUS_R_SEQ, "DVD-R", ok},
    {ZAV_DVD_RAM, "DVD-RAM", ok},
    {ZAV_DVD_MINUS_RW_RES, "DVD-RW restricted overwrite", ok},
    {ZAV_DVD_MINUS_RW_SEQ, "DVD-RW sequential", ok},
    {ZAV_DVD_PLUS_RW, "DVD+RW", ok},
    {ZAV_DVD_PLUS_R, "DVD+R", ok},
    {ZAV_DVD_PLUS_R_DOUBLE, "DVD+R double layer", ok},
    {ZAV_CD_RW, "CD-RW", ok},
    {ZAV_CD_R, "CD-R", ok},
    {ZAV_DISC_NONE, "none", ok},
    {ZAV_DISC_UNKNOWN, "unknown", unknown},
};

constexpr StateWord states_of_disc[] = {
    {ZAV_DISC_BLANK, "blank", ok},
    {ZAV_DISC_COMPLETE, "complete", ok},
    {ZAV_DISC_APPENDABLE, "appendable", ok},
    {ZAV_DISC_STATE_UNKNOWN, "unknown", unknown},
};

// The numbers of zavGetStateSysinfo.
constexpr StateWord probes[] = {
    {0x101, "processor", ok}, {0x102, "swap", ok}, {0x103, "/", ok},
    {0x105, "/var", ok},      {0x106, "/tmp", ok}, {0x107, "/mnt/buffer", ok},
};

constexpr StateWord parts_of_unit[] = {
    {ZAV_RBOD_EXPANDER, "expander", ok},
    {ZAV_RBOD_TEMP_CPU, "temperature", ok},
    {ZAV_RBOD_VOLT_CPU, "voltage", ok},
};

char folded(char c) {
    if (c == '-' || c == '_')
        return ' ';
    return static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
}

bool same_word(std::string_view a, std::string_view b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                      [](char one, char other) { return folded(one) == folded(other); });
}

const StateWord *find(const States &states, int code) {
    const auto found = std::find_if(states.words.begin(), states.words.end(),
                                    [code](const StateWord &state) { return state.code == code; });
    return found == states.words.end() ? nullptr : &*found;
}

const StateWord *find(const States &states, std::string_view word) {
    const auto found =
        std::find_if(states.words.begin(), states.words.end(),
                     [word](const StateWord &state) { return same_word(state.word, word); });
    return found == states.words.end() ? nullptr : &*found;
}

// The entries of a code's bits, null for what has none.
std::vector<const StateWord *> entries(const States &states, int code) {
    if (!states.bits || code == 0)
        return {find(states, code)};
    std::vector<const StateWord *> found;
    unsigned rest = static_cast<unsigned>(code);
    for (const StateWord &state : states.words) {
        const unsigned bit = static_cast<unsigned>(state.code);
        if (bit != 0 && (rest & bit) == bit) {
            found.push_back(&state);
            rest &= ~bit;
        }
    }
    if (rest != 0)
        found.push_back(nullptr);
    return found;
}

} // namespace

const States &event_types() {
    static const States states{types, false};
    return states;
}

const States &sensor_states() {
    static const States states{sensors, false};
    return states;
}

const States &ups_states() {
    static const States states{ups, false};
    return states;
}

const States &disk_states() {
    static const States states{disks, true};
    return states;
}

const States &array_states() {
    static const States states{arrays, true};
    return states;
}

const States &group_states() {
    static const States states{groups, true};
    return states;
}

const States &volume_states() {
    static const States states{volumes, true};
    return states;
}

const States &network_states() {
    static const States states{networks, false};
    return states;
}

const States &load_states() {
    static const States states{loads, false};
    return states;
}

const States &unit_states() {
    static const States states{units, false};
    return states;
}

const States &array_levels() {
    static const States states{levels, false};
    return states;
}

const States &disc_types() {
    static const States states{kinds_of_disc, false};
    return states;
}

const States &disc_states() {
    static const States states{states_of_disc, false};
    return states;
}

const States &load_probes() {
    static const States states{probes, false};
    return states;
}

const States &unit_sensors() {
    static const States states{parts_of_unit, false};
    return states;
}

std::string word_of(const States &states, int code) {
    std::string words;
    for (const StateWord *state : entries(states, code))
        words +=
            (words.empty() ? "" : ",") + std::string(state == nullptr ? "unknown" : state->word);
    return words;
}

std::optional<int> code_of(const States &states, std::string_view words) {
    if (!states.bits || words.find(',') == std::string_view::npos) {
        const StateWord *state = find(states, trimmed(words));
        return state == nullptr ? std::nullopt : std::optional(state->code);
    }
    const std::size_t comma = words.find(',');
    const std::optional<int> first = code_of(states, words.substr(0, comma));
    const std::optional<int> rest = code_of(states, words.substr(comma + 1));
    return first && rest ? std::optional(*first | *rest) : std::nullopt;
}

Severity severity_of(const States &states, int code) {
    Severity worst = Severity::ok;
    for (const StateWord *state : entries(states, code))
        worst = worse(worst, state == nullptr ? Severity::unknown : state->severity);
    return worst;
}

std::string known_words(const States &states) {
    std::vector<std::string> words;
    words.reserve(states.words.size());
    for (const StateWord &state : states.words)
        if (std::find(words.begin(), words.end(), state.word) == words.end())
            words.emplace_back(state.word);
    return listed(words);
}

} // namespace zavctl
