// The programs that the appliance's software runs: which are simulated, and which of the host's
// must never be reached.
#pragma once

#include <string>
#include <vector>

namespace zavsim {

struct Tool {
    const char *name;
    const char *path;
    int (*run)(const std::vector<std::string> &words);
};

const std::vector<Tool> &simulated_tools();
const Tool *find_tool(const std::string &name);

// Applies the tool's faults, then runs it.
int run_tool(const Tool &tool, int argc, char **argv);

bool hidden_from_host(const std::string &name);

// "zavsim act ..." and "zavsim state", which work inside the private root.
bool is_inner_command(const std::string &word);
int run_inner_command(int argc, char **argv);

} // namespace zavsim
