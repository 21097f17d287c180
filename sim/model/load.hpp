// The load of the appliance's own computer: processor, swap, file systems.
#pragma once

#include "model/action.hpp"
#include "model/state.hpp"

#include <string>
#include <vector>

namespace zavsim {

Load new_load();

// Mount points of the file systems that the appliance has besides its volumes.
const std::vector<std::string> &own_file_systems();

std::string act_on_load(State &state, const Action &action);

// The whole of /proc/stat and of /proc/meminfo.
std::string stat_text(const State &state);
std::string meminfo_text(const State &state);

// Their lines in the table of mounts, and in the list of what statfs tells.
std::string own_mounts_text();
std::string own_usage_text(const State &state);

} // namespace zavsim
