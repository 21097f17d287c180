// What can happen to a RAID controller, its disks and its expansion units.
#pragma once

#include "model/action.hpp"
#include "model/state.hpp"

#include <string>

namespace zavsim {

// Answers why it could not be, or nothing.
std::string act_on_controller(State &state, const Action &action);

} // namespace zavsim
