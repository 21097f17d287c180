// The files of the appliance's own driver. Some of them programs write as well.
#pragma once

#include "model/state.hpp"

#include <map>
#include <string>

namespace zavsim {

using DriverTexts = std::map<std::string, std::string>; // by path

// Acts on what programs wrote, and answers what stood in the files then.
DriverTexts take_driver_files(State &state);

// What programs wrote since it was taken stays.
void publish_driver_files(const State &state, const DriverTexts &taken);

} // namespace zavsim
