// What can happen to the appliance, from outside it.
#pragma once

#include "model/action.hpp"
#include "model/state.hpp"

#include <string>

namespace zavsim {

// Carries out one action at the state's present moment; answers why it could not, or nothing.
std::string perform(State &state, const Action &action);

// The same for a sentence; notes the outcome in the state.
std::string perform_sentence(State &state, const std::string &sentence);

// A line written into /proc/scsi/scsi: "scsi remove-single-device 3 0 0 0" and its counterpart.
void scsi_command(State &state, const std::string &line);

} // namespace zavsim
