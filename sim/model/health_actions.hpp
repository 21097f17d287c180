// What can happen to sensors, load, UPS, network and events.
#pragma once

#include "model/action.hpp"
#include "model/state.hpp"

#include <string>

namespace zavsim {

bool is_about_health(Action::Kind kind);

// Answers why it could not be, or nothing.
std::string act_on_health(State &state, const Action &action);

} // namespace zavsim
