// Running a command with a limited time, for what zavctl asks itself.
#pragma once

#include "../core/doctor.h"

#include <chrono>
#include <string>
#include <vector>

namespace zavctl {

// Runs a program (found on the PATH unless it is a path) with standard output and error read, input
// from /dev/null. When the time is over it is killed, with everything that it started.
RunResult run(const std::vector<std::string> &command, std::chrono::milliseconds limit);

// The executable of that name on the PATH, or the path itself if it is executable; "" if none.
std::string find_tool(const std::string &name);

// Ends the commands that this process has started and that still run, with all that they started.
void kill_descendants();

} // namespace zavctl
