// The machine's own clock, out of the preloaded shim's reach.
#pragma once

namespace zavsim {

double machine_seconds();

// Whether a shim scales the caller's sleeps or not, these are the machine's seconds.
void sleep_unscaled(double seconds);

} // namespace zavsim
