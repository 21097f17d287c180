// Shows the state: files under /proc, nodes under /dev, ports in sysfs, tools in their places.
#pragma once

#include "model/state.hpp"

#include <string>

namespace zavsim {

// `taken_command` is what was found in /proc/scsi/scsi and acted on; another one that has come
// since stays there for the next turn. False when something could not be shown yet.
bool publish(const State &state, const std::string &taken_command);

} // namespace zavsim
