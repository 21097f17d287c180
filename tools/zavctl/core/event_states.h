// The words for the types and states of event records, both ways.
#pragma once

#include "severity.h"

#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace zavctl {

struct StateWord {
    const char *word;
    int code;
    Severity severity;
};

// Single values, or bits that combine.
struct States {
    std::span<const StateWord> words;
    bool bits;
};

// Types by their first word, such as "fan" for ZAV_EVENT_FAN.
const States &event_types();

const States &sensor_states();
const States &ups_states();
const States &disk_states();
const States &array_states();
const States &group_states();  // of volume groups and physical volumes
const States &volume_states(); // of logical volumes: no bit at all is well
const States &network_states();
const States &load_states();
const States &unit_states();
const States &array_levels();
const States &disc_types();
const States &disc_states();

// What a load record, or a unit's, is about.
const States &load_probes();
const States &unit_sensors();

// "critical"; of bits "degraded,resync". "unknown" for a code, or a bit, without a word.
std::string word_of(const States &states, int code);

// The code of a word, of several joined by commas for bits. Case is ignored, and a blank, '-' and
// '_' are one: "on-battery". None for another word.
std::optional<int> code_of(const States &states, std::string_view words);

// The worst of the code's words; a code without a word is unknown.
Severity severity_of(const States &states, int code);

// "normal, warning and critical", for the one who typed another.
std::string known_words(const States &states);

} // namespace zavctl
