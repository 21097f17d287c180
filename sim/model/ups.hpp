// The UPS, its daemon's status file and the appliance's own hook.
#pragma once

#include "model/action.hpp"
#include "model/state.hpp"

#include <string>

namespace zavsim {

Ups new_ups();

std::string act_on_ups(State &state, const Action &action);

// Battery charge at this moment, in percent.
double charge_of(const State &state);

// When the daemon writes its status the next time; never while it is silent.
double next_status(const State &state);
void write_due_status(State &state);

// /var/log/apcupsd.status as it was last written.
std::string ups_status_text(const State &state);

// /var/log/zavapcupsd.event; empty before the first power event.
std::string ups_event_text(const State &state);

} // namespace zavsim
