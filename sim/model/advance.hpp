// Lets time pass in the model.
#pragma once

#include "model/state.hpp"

namespace zavsim {

// Brings the state to `now` (appliance time): scenario events happen at their times, rebuilds go
// on and end. A `now` before the state's own changes nothing.
void advance(State &state, double now);

} // namespace zavsim
