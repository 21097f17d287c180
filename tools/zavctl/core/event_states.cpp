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
    {"init", ZAV_EVENT_INIT, ok},       {"fan", ZAV_EVENT_FAN, ok},
    {"thermal", ZAV_EVENT_THERMAL, ok}, {"volt", ZAV_EVENT_VOLTAGE, ok},
    {"ups", ZAV_EVENT_UPS, ok},         {"array", ZAV_EVENT_RAID, ok},
    {"disk", ZAV_EVENT_HDD, ok},        {"media", ZAV_EVENT_DISC, ok},
    {"lvm", ZAV_EVENT_LVM, ok},         {"nic", ZAV_EVENT_NET, ok},
    {"load", ZAV_EVENT_SYSINFO, ok},    {"unit", ZAV_EVENT_RBOD, ok},
};

constexpr StateWord sensors[] = {
    {"normal", ZAV_SENSOR_NORMAL, ok},
    {"warning", ZAV_SENSOR_WARNING, warning},
    {"critical", ZAV_SENSOR_CRITICAL, critical},
    {"unknown", ZAV_SENSOR_ERR, unknown},
};

constexpr StateWord ups[] = {
    {"online", ZAV_UPS_ONLINE, ok},
    {"on battery", ZAV_UPS_ONBATT, warning},
    {"other", ZAV_UPS_OTHER, warning},
};

constexpr StateWord disks[] = {
    {"found", ZAV_HDD_FOUND, ok},
    {"absent", ZAV_HDD_ABSENT, critical},
    {"failed", ZAV_HDD_FAILED, critical},
};

constexpr StateWord arrays[] = {
    {"normal", ZAV_RAID_NORMAL, ok},
    {"degraded", ZAV_RAID_DEGRADED, warning},
    {"resync", ZAV_RAID_RESYNC, warning},
    {"failed", ZAV_RAID_FAILED, critical},
    {"not_exist", ZAV_RAID_NOT_EXIST, critical},
};

constexpr StateWord groups[] = {
    {"normal", ZAV_LVM_NORMAL, ok},       {"degraded", ZAV_LVM_DEGRADED, warning},
    {"failed", ZAV_LVM_FAILED, critical}, {"not_exist", ZAV_LVM_NOT_EXIST, critical},
    {"full", ZAV_LVM_FULL, warning},      {"inactive", ZAV_LVM_INACTIVE, warning},
};

constexpr StateWord volumes[] = {
    {"normal", 0, ok},
    {"normal", ZAV_LVM_NORMAL, ok},
    {"degraded", ZAV_LVM_DEGRADED, warning},
    {"failed", ZAV_LVM_FAILED, critical},
    {"not_exist", ZAV_LVM_NOT_EXIST, critical},
    {"full", ZAV_LVM_FULL, warning},
    {"inactive", ZAV_LVM_INACTIVE, warning},
};

constexpr StateWord networks[] = {
    {"up", ZAV_NET_UP, ok},
    {"down", ZAV_NET_DOWN, warning},
    {"not_exist", ZAV_NET_NOT_EXIST, warning},
    {"unknown", ZAV_NET_ERR, unknown},
};

constexpr StateWord loads[] = {
    {"normal", ZAV_SYSINFO_NORMAL, ok},
    {"warning", ZAV_SYSINFO_WARNING, warning},
    {"critical", ZAV_SYSINFO_CRITICAL, critical},
    {"unknown", ZAV_SYSINFO_ERR, unknown},
};

constexpr StateWord units[] = {
    {"normal", ZAV_RBOD_NORMAL, ok},          {"warning", ZAV_RBOD_WARN, warning},
    {"alarm", ZAV_RBOD_ALARM, critical},      {"failed", ZAV_RBOD_FAIL, critical},
    {"missing", ZAV_RBOD_NOTEXIST, critical}, {"present", ZAV_RBOD_EXIST, ok},
};

constexpr StateWord levels[] = {
    {"none", ZAV_RAIDLVL_NONE, ok},   {"raid0", ZAV_RAIDLVL_0, ok},
    {"raid1", ZAV_RAIDLVL_1, ok},     {"raid5", ZAV_RAIDLVL_5, ok},
    {"raid6", ZAV_RAIDLVL_6, ok},     {"raid10", ZAV_RAIDLVL_10, ok},
    {"raid50", ZAV_RAIDLVL_50, ok},   {"raid60", ZAV_RAIDLVL_60, ok},
    {"linear", ZAV_RAIDLVL_JBOD, ok},
};

constexpr StateWord kinds_of_disc[] = {
    {"DVD-ROM", ZAV_DVD_ROM, ok},
    {"DVD-R", ZAV_DVD_MINUS_R_SEQ, ok},
    {"DVD-RAM", ZAV_DVD_RAM, ok},
    {"DVD-RW restricted overwrite", ZAV_DVD_MINUS_RW_RES, ok},
    {"DVD-RW sequential", ZAV_DVD_MINUS_RW_SEQ, ok},
    {"DVD+RW", ZAV_DVD_PLUS_RW, ok},
    {"DVD+R", ZAV_DVD_PLUS_R, ok},
    {"DVD+R double layer", ZAV_DVD_PLUS_R_DOUBLE, ok},
    {"CD-RW", ZAV_CD_RW, ok},
    {"CD-R", ZAV_CD_R, ok},
    {"none", ZAV_DISC_NONE, ok},
    {"unknown", ZAV_DISC_UNKNOWN, unknown},
};

constexpr StateWord states_of_disc[] = {
    {"blank", ZAV_DISC_BLANK, ok},
    {"complete", ZAV_DISC_COMPLETE, ok},
    {"appendable", ZAV_DISC_APPENDABLE, ok},
    {"unknown", ZAV_DISC_STATE_UNKNOWN, unknown},
};

// The numbers of zavGetStateSysinfo.
constexpr StateWord probes[] = {
    {"processor", 0x101, ok}, {"swap", 0x102, ok}, {"/", 0x103, ok},
    {"/var", 0x105, ok},      {"/tmp", 0x106, ok}, {"/mnt/buffer", 0x107, ok},
};

constexpr StateWord parts_of_unit[] = {
    {"expander", ZAV_RBOD_EXPANDER, ok},
    {"temperature", ZAV_RBOD_TEMP_CPU, ok},
    {"voltage", ZAV_RBOD_VOLT_CPU, ok},
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
