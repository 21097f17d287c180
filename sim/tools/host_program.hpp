// The host's own program in place of the simulated one of the same name.
#pragma once

#include <string>
#include <vector>

namespace zavsim {

// Answers only when it cannot be run: a status.
int exec_host_program(const std::string &name, const std::vector<std::string> &words);

} // namespace zavsim
