// The first step inside the private root: fills it and runs COMMAND there.
#pragma once

#include <string>

namespace zavsim {

// The descriptors (as text) are zavsim's real standard error and where to report the start; the
// options come as JSON. Answers the exit status of COMMAND.
int run_inside(const std::string &real_stderr, const std::string &started,
               const std::string &options);

} // namespace zavsim
