// An event record in words.
#pragma once

#include "event_states.h"

#include "zav_event.h"

#include <cstring>
#include <optional>
#include <string>

namespace zavctl {

// A record as the event driver carries it: the rest of the room is zero.
template <class Record>
zavSystemEvent event_of(const Record &record) {
    static_assert(sizeof(Record) <= sizeof(zavSystemEvent));
    zavSystemEvent event;
    std::memset(static_cast<void *>(&event), 0, sizeof event);
    std::memcpy(static_cast<void *>(&event), &record, sizeof record);
    return event;
}

// The record if the library answered with ZAV_RC_OK.
template <class Record>
std::optional<zavSystemEvent> answered_event(int result, const Record &record) {
    return result == 0 ? std::optional(event_of(record)) : std::nullopt;
}

// "fan", "disk", "unknown".
std::string event_type_word(const zavSystemEvent &event);

// What it is about, by the name that the thing has everywhere: "fan 2", "disk 2-3", "volume 1-2",
// "eth0", "UPS".
std::string event_subject(const zavSystemEvent &event);

// "fan 2: critical, 0 rpm", "disk 3 of the machine: failed".
std::string event_text(const zavSystemEvent &event);

Severity event_severity(const zavSystemEvent &event);

// The words of the states that this record's `state` has.
const States &states_of(const zavSystemEvent &event);

// The record's `state`; 0 for a type that has none.
int state_of(const zavSystemEvent &event);
void set_state(zavSystemEvent &event, int state);

} // namespace zavctl
