// What the kernel shows of the optical drive, and its disc's files.
#pragma once

#include "model/state.hpp"

namespace zavsim {

void publish_drive(const State &state);

// A job whose process has ended without a word, killed or crashed, is broken off.
void notice_ended_job(State &state);

} // namespace zavsim
