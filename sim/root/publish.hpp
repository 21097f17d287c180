// Shows the state: files under /proc, nodes under /dev, ports in sysfs, tools in their places.
#pragma once

#include "model/state.hpp"

namespace zavsim {

void publish(const State &state);

} // namespace zavsim
