// A change of the machine by the library: run to its end, watched meanwhile.
#pragma once

#include "../core/watch.h"
#include "streams.h"

#include <functional>
#include <string>
#include <vector>

namespace zavctl {

// Runs the call in a thread of its own and returns its result. Meanwhile what changes among the
// sights is told on standard error, and what tools and library print, line by line and made safe.
// Interrupts are told of and have no other effect until the call has returned.
int run_change(const Streams &streams, const std::function<int()> &call,
               const std::function<std::vector<Sight>()> &look);

// The arrays with their members, called by these names, and the device.
std::vector<Sight> sights_of(const std::string &device, const NodeNames &names);

} // namespace zavctl
