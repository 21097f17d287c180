// The command line: from words to an action, or to help, or to a hint at what was meant.
#pragma once

#include "objects/session.h"

#include <string>
#include <vector>

namespace zavctl {

struct Parsed {
    bool run = false;    // session.action is to be run
    int status = 0;      // otherwise: the exit status
    std::string out;     // for standard output: help that was asked for
    std::string message; // for standard error: what is wrong
};

// Sets session.action or says why not.
Parsed parse(Session &session, std::vector<std::string> words);

} // namespace zavctl
