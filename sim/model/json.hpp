// The state as JSON: the file in the private root, and what "zavsim state" prints.
#pragma once

#include "model/state.hpp"

#include <string>

namespace zavsim {

std::string to_text(const State &state);
State state_from_text(const std::string &text);

} // namespace zavsim
