// Fills the private root with what every appliance program expects, model or not.
#pragma once

#include "launcher/options.hpp"

namespace zavsim {

// Program links, /etc, /proc, /sys and the empty directories of the appliance.
void populate_root(const Options &options);

// The files of the appliance that do not change: identity, configuration, NVRAM.
void populate_appliance(const Options &options);

} // namespace zavsim
