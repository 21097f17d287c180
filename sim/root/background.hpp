// The background process of a simulated appliance: lets its clock run, takes what is written to
// its control files, and keeps its system log.
#pragma once

namespace zavsim {

void start_background();

} // namespace zavsim
