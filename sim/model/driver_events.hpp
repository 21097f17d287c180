// What the appliance's driver tells of in events: states of sensors, UPS, disks, arrays and ports.
#pragma once

#include "model/action.hpp"
#include "model/state.hpp"

#include <string>
#include <vector>

namespace zavsim {

// Every thing that the driver watches, in its present state.
std::vector<DriverEvent> watched_states(const State &state);

// The driver looks: an event for each state that is not the one it knows.
void look_for_changes(State &state);

// The driver knows how things are, and has told nobody.
void know_everything(State &state);

// "fan 1", "ups": puts an event about that as it is now. Answers why it could not, or nothing.
std::string put_event(State &state, const Action &action);

// The record of an event as it stands in the driver's queue.
std::string event_record(const DriverEvent &event);

} // namespace zavsim
