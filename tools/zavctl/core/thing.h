// The things that an appliance consists of, each with its state: what is watched, and compared.
#pragma once

#include "answer.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

// A disk, an array, a sensor...
struct Thing {
    std::string key;     // of the records that hold it: "disks"
    std::string subject; // its name, as events have it: "disk 2-3", "fan 2", "volume 1-2"
    std::string state;   // the record's word, "not to be trusted" behind it where that is so
    Severity severity = Severity::ok;
};

// Of a whole appliance's answer, in the order of its sections. What no object lists is left out.
std::vector<Thing> things_of(const Answer &answer);

// The events that tell of the things as they are: the library's records, and those that follow
// from what an object shows.
std::vector<zavSystemEvent> events_of(const Answer &answer);

// A thing whose state is another, that is new, or that is no longer there.
struct Change {
    std::string key;
    std::string subject;
    std::optional<std::string> before; // none: it is new
    std::optional<std::string> after;  // none: it is no longer listed
    Severity severity = Severity::ok;  // now; a warning for what is no longer listed
};

std::vector<Change> changes(const std::vector<Thing> &before, const std::vector<Thing> &after);

// "fan 2: normal -> critical".
std::string change_text(const Change &change);

// {"kind": "change", "time", "subject", "before", "after", "severity", "text"}.
Json change_json(const Change &change, const std::string &time);

} // namespace zavctl
