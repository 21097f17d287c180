// The agent that writes the RAID controller's report, as far as files and processes go.
#pragma once

#include "model/state.hpp"

namespace zavsim {

// Writes the report where its text has changed; false when somebody holds the semaphore, so that
// it stands as it was.
bool publish_report(const State &state);

} // namespace zavsim
