// An event made of words, as the command line gives them.
#pragma once

#include "event_json.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

struct EventWords {
    std::vector<std::string> words;   // "fan", "2"
    std::optional<std::string> state; // "critical", "degraded,resync"
    std::optional<double> value;
    std::optional<double> charge;
    std::optional<double> progress;
    std::optional<int> speed;
};

// The record. Disks and arrays without a unit are those of the RAID controller where the model has
// one. Throws NoEvent with what is wrong with the words.
zavSystemEvent event_of_words(const EventWords &given, bool hardware_raid);

} // namespace zavctl
