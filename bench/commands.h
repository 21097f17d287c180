// The commands of a query, as the library gives them to the shell, and the same commands without
// it.
#pragma once

#include "paired.h"

#include <string>
#include <vector>

namespace bench {

struct Command {
    std::string text;
    bool piped; // its output was read, or else its status asked for
    int status; // if that was asked for
};

// What the action has the shell run, in order.
std::vector<Command> commands_of(const Action &action);

// The action with that text in place of what every command prints that it reads from; none is run.
Action answered(const std::string &text, const Action &action);

// Runs them as a program without the library would. They must end as they did for the library.
void run_bare(const std::vector<Command> &commands);

} // namespace bench
