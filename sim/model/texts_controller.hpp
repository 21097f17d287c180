// What the RAID controller's agent writes, and what the expanders' script prints.
#pragma once

#include "model/state.hpp"

#include <cstddef>
#include <optional>
#include <string>

namespace zavsim {

// The report as the agent knows it, and what stands in its file, if there is one.
std::string report_text(const State &state);
std::optional<std::string> report_file(const State &state);

// Half of a text, ending within a line.
std::string first_half(const std::string &text);

// The SAS topology, expanders by address.
std::string topology_text(const State &state);

} // namespace zavsim
