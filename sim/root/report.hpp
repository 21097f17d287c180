// The agent that writes the RAID controller's report, as far as files and processes go.
#pragma once

#include "model/state.hpp"

namespace zavsim {

// Writes the report where its text has changed; false when somebody holds the semaphore, so that
// it stands as it was.
bool publish_report(const State &state);

// Has a process of its own rewrite the report slowly: half of it, a while later the rest.
void start_slow_rewrite(const State &state);

// Whether the first half is written of the rewrite of that number, or of a later one.
bool slow_rewrite_has_begun(int number);

} // namespace zavsim
