// The queue of the appliance's event driver, which the preloaded shim hands out to programs.
#pragma once

#include "model/state.hpp"

namespace zavsim {

// Puts the state's new events into the queue. What finds it full is lost, and noted.
void hand_over_events(State &state);

} // namespace zavsim
