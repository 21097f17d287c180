// The simulated tools and the inner commands, one function each: words in, exit status out.
#pragma once

#include <string>
#include <vector>

namespace zavsim {

int run_mdadm(const std::vector<std::string> &words);
int run_smartctl(const std::vector<std::string> &words);
int run_mknod(const std::vector<std::string> &words);

int run_act(const std::vector<std::string> &words);
int run_state(const std::vector<std::string> &words);

} // namespace zavsim
