// The files of the UPS daemon and of the appliance's hook.
#pragma once

#include "model/state.hpp"

namespace zavsim {

void publish_ups(const State &state);

} // namespace zavsim
