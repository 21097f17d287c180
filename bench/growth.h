// Time against the size of what is read: does it grow faster than that?
#pragma once

#include "paired.h"

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

namespace bench {

struct Growth {
    std::string name;
    const char *unit;
    std::vector<int> sizes; // three at least
    // Makes everything ready for that size, which is not timed, and gives the call to be timed.
    std::function<Action(int size)> at;
    std::size_t rounds = 7;
};

// The subjects.
std::vector<Growth> growth_of_reports();
std::vector<Growth> growth_of_groups();
std::vector<Growth> growth_of_processes();

// Prints a table of each; false if one grows faster than what is read.
bool report_growth();

} // namespace bench
